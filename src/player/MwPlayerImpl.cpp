#include "MwPlayerImpl.h"

#include <sound_manager.h>

#include "MwErrorName.h"
#include "MwLog.h"
#include "MwModel.h"

namespace {

constexpr int LONG_RECORDING_MS = 300000;
constexpr double SHORT_INTERVAL = 0.02; // seconds
constexpr double LONG_INTERVAL = 0.2;

constexpr MwErrorName ERROR_NAMES[] = {
    MW_ERROR_NAME(PLAYER_ERROR_OUT_OF_MEMORY),
    MW_ERROR_NAME(PLAYER_ERROR_INVALID_PARAMETER),
    MW_ERROR_NAME(PLAYER_ERROR_NO_SUCH_FILE),
    MW_ERROR_NAME(PLAYER_ERROR_INVALID_OPERATION),
    MW_ERROR_NAME(PLAYER_ERROR_FILE_NO_SPACE_ON_DEVICE),
    MW_ERROR_NAME(PLAYER_ERROR_FEATURE_NOT_SUPPORTED_ON_DEVICE),
    MW_ERROR_NAME(PLAYER_ERROR_SEEK_FAILED),
    MW_ERROR_NAME(PLAYER_ERROR_INVALID_STATE),
    MW_ERROR_NAME(PLAYER_ERROR_NOT_SUPPORTED_FILE),
    MW_ERROR_NAME(PLAYER_ERROR_INVALID_URI),
    MW_ERROR_NAME(PLAYER_ERROR_SOUND_POLICY),
    MW_ERROR_NAME(PLAYER_ERROR_CONNECTION_FAILED),
    MW_ERROR_NAME(PLAYER_ERROR_VIDEO_CAPTURE_FAILED),
    MW_ERROR_NAME(PLAYER_ERROR_DRM_EXPIRED),
    MW_ERROR_NAME(PLAYER_ERROR_DRM_NO_LICENSE),
    MW_ERROR_NAME(PLAYER_ERROR_DRM_FUTURE_USE),
    MW_ERROR_NAME(PLAYER_ERROR_DRM_NOT_PERMITTED),
    MW_ERROR_NAME(PLAYER_ERROR_RESOURCE_LIMIT),
    MW_ERROR_NAME(PLAYER_ERROR_PERMISSION_DENIED),
};

}

_MwPlayerImpl::_MwPlayerImpl(MwModel* model)
    : _model(model)
{
}

_MwPlayerImpl::~_MwPlayerImpl()
{
    if (_handle != nullptr && !_destroyPlayerHandle())
        MW_LOGE("destroyPlayerHandle failed!!!");
}

bool _MwPlayerImpl::_createPlayerHandle()
{
    if (_handle != nullptr) {
        MW_LOGE("player handle is already created");
        return false;
    }
    return _succeeded(player_create(&_handle), "player_create")
        && _succeeded(player_set_safety_volume(_handle), "player_set_safety_volume")
        && _succeeded(player_set_sound_type(_handle, SOUND_TYPE_MEDIA), "player_set_sound_type")
        && _succeeded(player_set_completed_cb(_handle, _completedCb, this), "player_set_completed_cb")
        && _succeeded(player_set_interrupted_cb(_handle, _interruptedCb, this), "player_set_interrupted_cb")
        && _succeeded(player_set_error_cb(_handle, _errorCb, this), "player_set_error_cb");
}

bool _MwPlayerImpl::_start()
{
    MW_LOGW("BEGIN");
    if (_model == nullptr) {
        MW_LOGE("_model is nullptr");
        return false;
    }
    if (_handle == nullptr) {
        MW_LOGI("_handle == nullptr!!! create player handle!!!");
        if (!_createPlayerHandle()) {
            MW_LOGE("createPlayerHandle failed!!!");
            return false;
        }
    }
    const std::string path = _model->getCurrentPlayPath();
    if (path.empty()) {
        MW_LOGE("current play path is empty!!!");
        return false;
    }
    if (!_succeeded(player_set_uri(_handle, path.c_str()), "player_set_uri")
        || !_succeeded(player_prepare(_handle), "player_prepare"))
        return false;
    int duration = 0;
    if (!_succeeded(player_start(_handle), "player_start")
        || !_succeeded(player_get_duration(_handle, &duration), "player_get_duration"))
        return _stopAfterFailedStart();
    _model->setPlayerState(PLAY_STATE_PLAYING);
    _startPlayerTimer();
    MW_LOGW("END");
    return true;
}

bool _MwPlayerImpl::_stopAfterFailedStart()
{
    if (!_stop())
        MW_LOGE("_stop failed!!!");
    return false;
}

bool _MwPlayerImpl::_pause()
{
    MW_LOGW("BEGIN");
    if (_handle == nullptr) {
        MW_LOGE("_handle is nullptr");
        return false;
    }
    if (!_succeeded(player_pause(_handle), "player_pause"))
        return false;
    _model->setPlayerState(PLAY_STATE_PAUSED);
    _stopPlayerTimer();
    MW_LOGW("END");
    return true;
}

bool _MwPlayerImpl::_resume()
{
    MW_LOGW("BEGIN");
    if (_handle == nullptr) {
        MW_LOGE("_handle is nullptr");
        return false;
    }
    if (const int result = player_start(_handle); result != 0) {
        MW_LOGE("player_start(resume) failed : [%d]!!!", result);
        _printError(result);
        return false;
    }
    // A position chosen while paused takes effect now.
    if (!_setPlayPosition(static_cast<int>(_model->getCurrentPlayPosition()))) {
        MW_LOGE("setPlayPosition failed!!!");
        return false;
    }
    _model->setPlayerState(PLAY_STATE_PLAYING);
    _startPlayerTimer();
    MW_LOGW("END");
    return true;
}

bool _MwPlayerImpl::_stop()
{
    MW_LOGW("BEGIN");
    if (_handle == nullptr) {
        MW_LOGE("_handle is nullptr");
        return false;
    }
    _succeeded(player_stop(_handle), "player_stop");
    if (!_unprepare())
        MW_LOGE("_unprepare failed!!!");
    if (!_destroyPlayerHandle())
        MW_LOGE("_destroyPlayerHandle failed!!!");
    _stopPlayerTimer();
    _model->setCurrentPlayPosition(0);
    MW_LOGW("END");
    return true;
}

bool _MwPlayerImpl::_unprepare()
{
    if (_handle == nullptr) {
        MW_LOGE("_handle is nullptr");
        return false;
    }
    return _succeeded(player_unprepare(_handle), "player_unprepare");
}

bool _MwPlayerImpl::_destroyPlayerHandle()
{
    if (_handle == nullptr) {
        MW_LOGE("_handle is nullptr");
        return false;
    }
    if (_model == nullptr) {
        MW_LOGE("_model is nullptr");
        return false;
    }
    const int result = player_destroy(_handle);
    _handle = nullptr;
    _setSeeking(false); // no seek outlives its player
    if (!_succeeded(result, "player_destroy"))
        return false;
    _stopPlayerTimer();
    _model->setCurrentPlayPosition(0);
    _model->setPlayerState(PLAY_STATE_NONE);
    return true;
}

bool _MwPlayerImpl::_setPlayPosition(int milliseconds)
{
    if (_handle == nullptr) {
        MW_LOGE("_handle is nullptr");
        return false;
    }
    // Set before the call: the seek may complete on another thread before it returns.
    _setSeeking(true);
    if (!_succeeded(player_set_play_position(_handle, milliseconds, false, _seekCompletedCb, this),
            "player_set_play_position")) {
        _setSeeking(false);
        return false;
    }
    _model->setCurrentPlayPosition(static_cast<unsigned int>(milliseconds));
    return true;
}

bool _MwPlayerImpl::_isSeeking()
{
    const platform::Lock lock(_seekingMutex);
    return _seeking;
}

void _MwPlayerImpl::_setSeeking(bool seeking)
{
    const platform::Lock lock(_seekingMutex);
    _seeking = seeking;
}

void _MwPlayerImpl::_seekCompletedCb(void* userData)
{
    MW_LOGW("BEGIN _setPlayPosition");
    static_cast<_MwPlayerImpl*>(userData)->_setSeeking(false);
    MW_LOGW("END _setPlayPosition");
}

void _MwPlayerImpl::_startPlayerTimer()
{
    if (_handle == nullptr) {
        MW_LOGE("_handle is nullptr");
        return;
    }
    _stopPlayerTimer();
    int duration = 0;
    if (!_succeeded(player_get_duration(_handle, &duration), "player_get_duration"))
        return;
    const double interval = duration <= LONG_RECORDING_MS ? SHORT_INTERVAL : LONG_INTERVAL;
    _playerTimer = panekit::WTimer::addTimer(interval, _playerTimerCb, this);
}

bool _MwPlayerImpl::_playerTimerCb(void* userData)
{
    auto* self = static_cast<_MwPlayerImpl*>(userData);
    if (self == nullptr) {
        MW_LOGE("userData is nullptr!!!");
        return false;
    }
    if (self->_model == nullptr) {
        MW_LOGE("_model is nullptr!!!");
        return false;
    }
    if (self->_handle == nullptr) {
        MW_LOGE("_handle is nullptr!!!");
        return false;
    }
    int position = 0;
    if (_succeeded(player_get_play_position(self->_handle, &position), "player_get_play_position"))
        self->_model->setCurrentPlayPosition(static_cast<unsigned int>(position));
    return true;
}

void _MwPlayerImpl::_stopPlayerTimer()
{
    if (!_playerTimer.expired())
        panekit::WTimer::destroy(_playerTimer);
    _playerTimer.reset();
}

void _MwPlayerImpl::_completedCb(void* userData)
{
    auto* self = static_cast<_MwPlayerImpl*>(userData);
    if (!self->_stop())
        MW_LOGE("stop failed!!!");
    self->completedSignal.emit();
}

void _MwPlayerImpl::_interruptedCb(player_interrupted_code_e code, void* userData)
{
    auto* self = static_cast<_MwPlayerImpl*>(userData);
    player_state_e state = PLAYER_STATE_NONE;
    _succeeded(player_get_state(self->_handle, &state), "player_get_state");
    if (state == PLAYER_STATE_PAUSED) {
        self->_model->setPlayerState(PLAY_STATE_PAUSED);
    } else {
        MW_LOGE("player state  : [%d]", state);
        if (!self->_destroyPlayerHandle())
            MW_LOGE("_destroyPlayerHandle failed!!!");
    }
    MW_LOGI("interrupted code : [%d]", code);
    self->interruptedSignal.emit(code);
}

void _MwPlayerImpl::_errorCb(int error, void* userData)
{
    MW_LOGE("error code : [%d]", error);
    _printError(error);
    static_cast<_MwPlayerImpl*>(userData)->errorSignal.emit(MwPlayer::PLAYBACK_ERROR);
}

bool _MwPlayerImpl::_succeeded(int code, const char* call) { return mwSucceededByName(ERROR_NAMES, code, call); }

void _MwPlayerImpl::_printError(int code) { mwPrintError(ERROR_NAMES, code); }
