#include "MwAppController.h"

#include <app.h>
#include <message_port.h>
#include <panekit/WPopupController.h>
#include <panekit/WWindowController.h>
#include <recorder.h>

#include "MwAsyncCmdControl.h"
#include "MwAvrcp.h"
#include "MwLog.h"
#include "MwMediaKeys.h"
#include "MwModel.h"
#include "MwRemoteControl.h"
#include "MwSoundSession.h"
#include "MwSystemMgr.h"
#include "MwText.h"

namespace {

constexpr auto INDICATOR_APP_ID = "com.tovanic.indicator";
constexpr auto INDICATOR_PORT = "mewlo_indicator_port";
constexpr auto INDICATOR_KEY = "mewlo_indicator_data";

// What the indicator is to show; nothing while the window itself can be seen.
const char* indicatorValue(const MwModel& model)
{
    if (model.getAppState() != MwModel::APP_STATE_PAUSED)
        return "mewlo_none";
    if (model.getRecorderState() == REC_STATE_RECORDING)
        return "bg_recording_start";
    if (model.getRecorderState() == REC_STATE_PAUSED)
        return "bg_recording_pause";
    if (model.getPlayerState() == PLAY_STATE_PLAYING)
        return "bg_playing_start";
    if (model.getPlayerState() == PLAY_STATE_PAUSED)
        return "bg_playing_pause";
    return "mewlo_none";
}

bool sendToIndicator(const char* value)
{
    bundle* message = bundle_create();
    if (message == nullptr) {
        MW_LOGE("bundle_create failed!!!");
        return false;
    }
    if (const int result = bundle_add_str(message, INDICATOR_KEY, value); result != 0) {
        MW_LOGE("bundle_add_str failed : [%d]!!!", result);
    } else if (message_port_check_remote_port(INDICATOR_APP_ID, INDICATOR_PORT) == 0) {
        const int sent = message_port_send_message(INDICATOR_APP_ID, INDICATOR_PORT, message);
        if (sent != 0 && sent != MESSAGE_PORT_ERROR_PORT_NOT_FOUND)
            MW_LOGE("messageport_send_message failed : [%d]!!!", sent);
    }
    if (const int result = bundle_free(message); result != 0) {
        MW_LOGE("bundle_free failed : [%d]!!!", result);
        return false;
    }
    return true;
}

}

MwAppController::MwAppController() = default;

MwAppController::~MwAppController() = default;

bool MwAppController::initialize(MwModel* model, panekit::WWindowController* windowController)
{
    MW_LOGW("BEGIN");
    if (model == nullptr) {
        MW_LOGE("model is nullptr");
        return false;
    }
    if (windowController == nullptr) {
        MW_LOGE("windowController is nullptr");
        return false;
    }
    _model = model;
    _windowController = windowController;
    _lifeCycleListener = MwSignalMgr::getInstance()->getLifeCycleSignal().addListener(
        [this](MwSignalMgr::LifeCycle lifeCycle) { _lifeCycleChanged(lifeCycle); });
    _systemInfoListener = MwSignalMgr::getInstance()->getSystemInfoSignal().addListener(
        [this](MwSignalMgr::SystemInfo info) { _systemInfoChanged(info); });
    _initAsyncCmdControl();
    _createMediaKeys();
    if (!_soundSession)
        _soundSession = std::make_unique<MwSoundSession>();
    if (!_avrcp)
        _avrcp = std::make_unique<MwAvrcp>();
    if (!_createRecorder()) {
        MW_LOGE("_createRecorder failed");
        return false;
    }
    if (!_createPlayer()) {
        MW_LOGE("_createPlayer failed");
        return false;
    }
    _remoteControl
        = std::make_unique<MwRemoteControl>(_model, [this](unsigned int position) { _seekByRemote(position); });
    MW_LOGW("END");
    return true;
}

void MwAppController::_createMediaKeys()
{
    MwMediaKeys::Controller controller;
    controller.dispatch = [this](Command command) { return dispatchCommand(command); };
    controller.stopRecording = [this] { _emitSignalAfterStopRecording(false); };
    controller.onMainLoop = [this](std::function<void()> call) { _callSafetyMainThread(std::move(call)); };
    _mediaKeys = std::make_unique<MwMediaKeys>(_model, std::move(controller));
}

void MwAppController::_seekByRemote(unsigned int position)
{
    _model->setCurrentPlayPosition(position);
    if (!dispatchCommand(SET_PLAYER_POSITION))
        MW_LOGE("set play position failed!");
    _emitPlayerUpdatedSignal();
}

void MwAppController::deinitialize()
{
    MW_LOGW("BEGIN");
    if (_model == nullptr)
        return;
    _remoteControl.reset();
    const auto playerState = _model->getPlayerState();
    const bool plays = playerState == PLAY_STATE_PLAYING || playerState == PLAY_STATE_PAUSED;
    if (_player && plays && !dispatchCommand(STOP_PLAYING))
        MW_LOGE("player stop failed");
    {
        // A command of the worker is waited for, so the state read here is the final one.
        const platform::Lock lock(_commandMutex);
        const auto recorderState = _model->getRecorderState();
        const bool records = mwIsRecordingOrPaused(recorderState);
        if (_recorder && records && !dispatchCommand(STOP_RECORDING))
            MW_LOGE("recording stop failed");
    }
    // Whatever closed the window: a saved recording is the answer.
    if (_model->getRequestHandle() != nullptr && !_model->getAnswerPath().empty())
        _replyWithRecording();
    if (!_destroyRecorder())
        MW_LOGE("recorder destroy filaed");
    if (!_destroyPlayer())
        MW_LOGE("player destroy filaed");
    _deinitAsyncCmdControl();
    _soundSession.reset();
    _avrcp.reset();
    _releaseLock();
    if (MwSignalMgr* signals = MwSignalMgr::existing(); signals != nullptr) {
        mwForget(signals->getLifeCycleSignal(), _lifeCycleListener);
        mwForget(signals->getSystemInfoSignal(), _systemInfoListener);
    }
    _playerUpdatedSignal.removeAll();
    _recorderUpdatedSignal.removeAll();
    _mailbox.close(); // nobody waits for what is still on its way
    MW_LOGW("END");
}

void MwAppController::_initAsyncCmdControl()
{
    if (_asyncCmdControl) {
        MW_LOGE("aync command control already created");
        return;
    }
    _asyncCmdControl = std::make_unique<AsyncCmdControl>(
        _commandMutex, [this](std::unique_ptr<AsyncRequest> request) { _executeAsyncRequest(std::move(request)); });
}

void MwAppController::_deinitAsyncCmdControl() { _asyncCmdControl.reset(); }

// On the worker, with the command mutex held.
void MwAppController::_executeAsyncRequest(std::unique_ptr<AsyncRequest> request)
{
    if (dispatchCommand(request->command)) {
        MW_LOGI("command[%d] success", static_cast<int>(request->command));
        request->result = SUCCESS;
    } else {
        MW_LOGE("command[%d] failed", static_cast<int>(request->command));
        request->result = FAIL;
    }
    _callSafetyMainThread([this, done = std::shared_ptr<AsyncRequest>(std::move(request))] {
        if (_asyncCmdControl)
            done->callback(done->command, done->result, done->userData);
    });
}

bool MwAppController::dispatchCommandAsync(Command command, AsyncCallback callback, void* userData)
{
    MW_LOGI("BEGIN - request async command [%d]", static_cast<int>(command));
    if (!_asyncCmdControl) {
        MW_LOGE("aync command control is not working");
        return false;
    }
    _asyncCmdControl->queue(
        std::make_unique<AsyncRequest>(AsyncRequest{command, SUCCESS, std::move(callback), userData, false}));
    return true;
}

// At once on the main loop.
void MwAppController::_callSafetyMainThread(std::function<void()> closure) { _mailbox.call(std::move(closure)); }

bool MwAppController::_createRecorder()
{
    if (_recorder) {
        MW_LOGE("recorder is already created");
        return false;
    }
    _recorder = std::make_unique<MwRecorder>();
    _model->setRecorderState(REC_STATE_READY);
    _recorderErrorListener
        = _recorder->errorSignal.addListener([this](MwRecorder::ErrorType type) { _recorderErrorOccurred(type); });
    _recorderInterruptedListener = _recorder->interruptedSignal.addListener([this] { _recorderInterrupted(); });
    _recorderLimitListener = _recorder->limitReachedSignal.addListener(
        [this](MwRecorder::LimitType type) { _recorderLimitReached(type); });
    return true;
}

bool MwAppController::_destroyRecorder()
{
    const platform::Lock lock(_commandMutex);
    if (!_recorder)
        return false;
    mwForget(_recorder->errorSignal, _recorderErrorListener);
    mwForget(_recorder->interruptedSignal, _recorderInterruptedListener);
    mwForget(_recorder->limitReachedSignal, _recorderLimitListener);
    _recorder.reset();
    _model->setRecorderState(REC_STATE_NONE);
    return true;
}

bool MwAppController::_createPlayer()
{
    if (_player) {
        MW_LOGE("player is already created");
        return false;
    }
    _player = std::make_unique<MwPlayer>(_model);
    _playerCompletedListener = _player->getCompletedSignal().addListener([this] { _playerCompleted(); });
    _playerInterruptedListener = _player->getInterruptedSignal().addListener(
        [this](player_interrupted_code_e code) { _playerInterrupted(code); });
    _playerErrorListener
        = _player->getErrorSignal().addListener([this](MwPlayer::PlayerErrorType type) { _playerErrorOccurred(type); });
    return true;
}

bool MwAppController::_destroyPlayer()
{
    const platform::Lock lock(_commandMutex);
    if (!_player)
        return false;
    mwForget(_player->getCompletedSignal(), _playerCompletedListener);
    mwForget(_player->getInterruptedSignal(), _playerInterruptedListener);
    mwForget(_player->getErrorSignal(), _playerErrorListener);
    _player.reset();
    return true;
}

void MwAppController::_lifeCycleChanged(MwSignalMgr::LifeCycle lifeCycle)
{
    MW_LOGI("Life Cycle : [%d]", lifeCycle);
    switch (lifeCycle) {
    case MwSignalMgr::RESUME:
        recorder_set_watched(true);
        _sendMessagePort();
        break;
    case MwSignalMgr::PAUSE:
        recorder_set_watched(false);
        if (_model->isRequestMode())
            _pauseInRequestMode();
        else
            _sendMessagePort();
        break;
    case MwSignalMgr::TERMINATE:
        deinitialize();
        _sendMessagePort();
        break;
    }
}

void MwAppController::_recorderErrorOccurred(MwRecorder::ErrorType type)
{
    MW_LOGE("Error signal: [%d]", type);
    if (type == MwRecorder::ERROR_STORAGE) {
        mwPost("IDS_MW_TPOP_STORAGE_FAILS_RECORDING_MAY_BE_LOST");
        return;
    }
    _createErrorPopup("Interal Error!");
    _mediaKeys->release();
    _releaseLock();
    const auto state = _model->getRecorderState();
    if (mwIsRecordingOrPaused(state) && _recorder->hasEnded())
        _emitSignalAfterStopRecording(true);
}

void MwAppController::_createErrorPopup(const char* text)
{
    if (_errorPopup != nullptr)
        _errorPopup->destroy();
    Evas_Object* window = _windowController->getEvasObject();
    if (window == nullptr)
        return; // a program without a window has the log line
    using panekit::WPopupController;
    _errorPopup = new WPopupController;
    _errorPopup->setTitle("Alert", WPopupController::Text::Plain);
    _errorPopup->setContent(text, WPopupController::Text::Plain);
    _errorPopup->addButton("IDS_MW_BUTTON_OK", [](WPopupController* popup) { popup->destroy(); });
    _errorPopup->setOnDestroyed([this] { _errorPopup = nullptr; });
    if (!_errorPopup->create(window) && _errorPopup != nullptr)
        _errorPopup->destroy();
}

void MwAppController::_emitPlayerUpdatedSignal()
{
    _callSafetyMainThread([this] { _playerUpdatedSignal.emit(); });
}

void MwAppController::_emitRecorderUpdatedSignal()
{
    _callSafetyMainThread([this] { _recorderUpdatedSignal.emit(); });
}

bool MwAppController::_sendMessagePort() { return _model != nullptr && sendToIndicator(indicatorValue(*_model)); }

void MwAppController::_requestLock()
{
    if (_model == nullptr) {
        MW_LOGE("_model is nullptr");
        return;
    }
    MwSystemMgr::getInstance()->requestLockCPU();
    if (_model->isRequestMode())
        MwSystemMgr::getInstance()->requestLockDisplayDim();
}

void MwAppController::_releaseLock()
{
    if (_model == nullptr) {
        MW_LOGE("_model is nullptr");
        return;
    }
    MwSystemMgr::getInstance()->releaseLockCPU();
    if (_model->isRequestMode())
        MwSystemMgr::getInstance()->releaseLockDisplayDim();
}

void MwAppController::openRecordings()
{
    if (_model != nullptr && _model->getRequestHandle() != nullptr && !_model->getAnswerPath().empty()
        && !_model->hasRequestChoice())
        return replyAndExit();
    if (_recordingsOpener)
        _recordingsOpener();
}

std::string MwAppController::getLastSavedPath() const
{
    const platform::Lock lock(_commandMutex);
    return _lastSavedPath;
}
