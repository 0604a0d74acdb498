#include "MwRecordingStartStop.h"

#include <utility>

#include <app.h>
#include <panekit/WPopupController.h>

#include "MwLog.h"
#include "MwMemoryFullPopup.h"
#include "MwModel.h"
#include "MwSystemMgr.h"
#include "MwText.h"

using panekit::WPopupController;

MwRecordingStartStop::MwRecordingStartStop(
    Evas_Object* window, MwModel* model, MwAppController* appController, Screen screen)
    : _window(window)
    , _model(model)
    , _appController(appController)
    , _screen(std::move(screen))
{
}

// The result comes back on the main loop.
bool MwRecordingStartStop::_dispatchAsync(MwAppController::Command command, Finished finished)
{
    const std::weak_ptr<void> alive = _token;
    return _appController->dispatchCommandAsync(
        command,
        [alive, finished](MwAppController::Command, MwAppController::Result result, void* userData) {
            if (alive.expired())
                return;
            (static_cast<MwRecordingStartStop*>(userData)->*finished)(result);
        },
        this);
}

void MwRecordingStartStop::_recordButtonClicked()
{
    const auto state = _model->getRecorderState();
    if (state != REC_STATE_READY) {
        MW_LOGW("current recorder state is [%d]!! can't start recording", mwNumber(state));
        return;
    }
    if (MwSystemMgr::getInstance()->isCallConnected()) {
        MW_LOGW("call is connected");
        mwPost("IDS_MW_TPOP_CANT_RECORD_VOICE_DURING_CALLS");
        return;
    }
    if (MwSystemMgr::getInstance()->isStorageFull()) {
        MW_LOGW("not enough memory!!");
        mwCreateMemoryFullPopup(_window, _model->getStorageType());
        return;
    }
    _startRecording();
}

void MwRecordingStartStop::_startRecording()
{
    if (!_dispatchAsync(MwAppController::START_RECORDING, &MwRecordingStartStop::_recordingStarted)) {
        MW_LOGE("Record start failed!");
        return;
    }
    _screen.accepted();
}

void MwRecordingStartStop::_recordingStarted(MwAppController::Result result)
{
    MW_LOGW("async Command[START RECORDING] result is [%d]", result);
    // Also after a failure: the button has been deaf since the tap.
    _screen.started();
    if (result != MwAppController::SUCCESS) {
        MW_LOGE("START_RECORDING failed");
        return;
    }
    if (MwSystemMgr::getInstance()->isEarjackInserted())
        mwPost("IDS_MW_TPOP_RECORDING_WITH_EXTERNAL_MICROPHONE");
}

void MwRecordingStartStop::_stopButtonClicked()
{
    if (!mwIsRecordingOrPaused(_model->getRecorderState())) {
        MW_LOGW("current recorder state is [%d]!! can't stop recording", mwNumber(_model->getRecorderState()));
        return;
    }
    if (_isStopping)
        return;
    if (_model->isTooShort())
        _cancelTooShortRecording();
    else
        _stop(MwAppController::STOP_RECORDING, &MwRecordingStartStop::_stopFinished);
}

void MwRecordingStartStop::_cancelTooShortRecording()
{
    MW_LOGW("current elapsedTime is under 1 sec");
    mwPost("IDS_MW_TPOP_COULDNT_SAVE_RECORDING_RECODING_TOO_SHORT");
    _stop(MwAppController::CANCEL_RECORDING, &MwRecordingStartStop::_tooShortCancelled);
}

void MwRecordingStartStop::_tooShortCancelled(MwAppController::Result result)
{
    _isStopping = false;
    MW_LOGW("async Command[STOP_RECORDING] result is [%d]", result);
    if (result == MwAppController::FAIL)
        _createRecordingFailedPopup();
}

void MwRecordingStartStop::stopForRemovedCard()
{
    if (!_isStopping)
        _isStopping = _dispatchAsync(MwAppController::STOP_RECORDING, &MwRecordingStartStop::_stoppedByRemovedCard);
}

// The controller has told what became of a recording that could not be saved.
void MwRecordingStartStop::_stoppedByRemovedCard(MwAppController::Result result)
{
    _isStopping = false;
    if (result != MwAppController::SUCCESS || _appController->getLastSavedPath().empty())
        return;
    _screen.saved();
    mwPost("IDS_MW_TPOP_RECORDING_INTERRUPTED_WHAT_WAS_RECORDED_IS_SAVED");
}

void MwRecordingStartStop::_stop(MwAppController::Command command, Finished finished)
{
    if (!_dispatchAsync(command, finished)) {
        MW_LOGE("Record stop failed!");
        return;
    }
    _isStopping = true;
    _screen.accepted();
}

void MwRecordingStartStop::_stopFinished(MwAppController::Result result)
{
    _isStopping = false;
    MW_LOGW("async Command result [%d]", result);
    if (result == MwAppController::SUCCESS)
        _screen.saved();
    else
        _createRecordingFailedPopup();
}

void MwRecordingStartStop::_createRecordingFailedPopup()
{
    auto* popup = new WPopupController();
    popup->setContent("IDS_MW_POP_RECORDING_FAILED_M_VOICE");
    popup->addButton("IDS_MW_BUTTON_OK", [](WPopupController*) {
        MW_LOGW("terminate app...");
        ui_app_exit();
    });
    popup->create(_window);
}
