#include "MwRecorder.h"

#include <array>

#include "MwLog.h"
#include "MwModel.h"

namespace {

constexpr int AUDIO_TUNING = 3;
constexpr int RECORDING_TYPE_TAG = 1;
constexpr int STATUS_CALLBACKS_PER_LEVEL = 9;
constexpr double LEVEL_OFFSET = 5.0; // decibels

// By code minus RECORDER_ERROR_SECURITY_RESTRICTED.
constexpr std::array<MwRecorder::ErrorType, 6> ERROR_TYPES = {
    MwRecorder::ERROR_SECURITY_RESTRICTED,
    MwRecorder::ERROR_BLOCKED_BY_CALL,
    MwRecorder::ERROR_UNKNOWN,
    MwRecorder::ERROR_UNKNOWN,
    MwRecorder::ERROR_OUT_OF_STORAGE,
    MwRecorder::ERROR_STORAGE,
};

MwRecorder::ErrorType toErrorType(int code)
{
    const auto index = static_cast<unsigned int>(code) - static_cast<unsigned int>(RECORDER_ERROR_SECURITY_RESTRICTED);
    return index < ERROR_TYPES.size() ? ERROR_TYPES[index] : MwRecorder::ERROR_UNKNOWN;
}

MwRecorder::ErrorType toRefusal(int code)
{
    if (code == RECORDER_ERROR_SECURITY_RESTRICTED)
        return MwRecorder::ERROR_SECURITY_RESTRICTED;
    return code == RECORDER_ERROR_SOUND_POLICY_BY_CALL ? MwRecorder::ERROR_BLOCKED_BY_CALL : MwRecorder::ERROR_UNKNOWN;
}

}

MwRecorder::~MwRecorder()
{
    if (_handle == nullptr)
        return;
    MW_LOGE("handle is not destroyed");
    destroyHandle();
}

bool MwRecorder::createHandle(MwModel* model)
{
    MW_LOGW("BEGIN");
    if (_handle != nullptr) {
        MW_LOGE("_handle is already created");
        return false;
    }
    if (model == nullptr) {
        MW_LOGE("model is nullptr");
        return false;
    }
    _model = model;
    if (!MW_CALL(recorder_create_audiorecorder, &_handle) || !_setCallbacks())
        return false;
    MW_LOGW("END");
    return true;
}

bool MwRecorder::_setCallbacks()
{
    return MW_CALL(recorder_set_error_cb, _handle, _errorCb, this)
        && MW_CALL(recorder_set_interrupted_cb, _handle, _interruptedCb, this)
        && MW_CALL(recorder_set_state_changed_cb, _handle, _stateChangedCb, this)
        && MW_CALL(recorder_set_recording_limit_reached_cb, _handle, _limitReachedCb, this)
        && MW_CALL(recorder_set_recording_status_cb, _handle, _statusCb, this);
}

bool MwRecorder::_unsetCallbacks()
{
    return MW_CALL(recorder_unset_error_cb, _handle) && MW_CALL(recorder_unset_interrupted_cb, _handle)
        && MW_CALL(recorder_unset_state_changed_cb, _handle)
        && MW_CALL(recorder_unset_recording_limit_reached_cb, _handle)
        && MW_CALL(recorder_unset_recording_status_cb, _handle);
}

bool MwRecorder::destroyHandle()
{
    MW_LOGW("BEGIN");
    if (_handle == nullptr) {
        MW_LOGE("_handle is already destroyed");
        return false;
    }
    recorder_state_e state = RECORDER_STATE_NONE;
    if (!_unsetCallbacks() || !_getState(state))
        return false;
    if (state == RECORDER_STATE_READY && !MW_CALL(recorder_unprepare, _handle))
        return false;
    const bool destroyed = MW_CALL(recorder_destroy, _handle);
    _handle = nullptr;
    MW_LOGW("END");
    return destroyed;
}

bool MwRecorder::_getState(recorder_state_e& state) const { return MW_CALL(recorder_get_state, _handle, &state); }

bool MwRecorder::start(ErrorType& error)
{
    MW_LOGW("BEGIN");
    error = ERROR_UNKNOWN;
    if (_handle == nullptr) {
        MW_LOGE("_handle is nullptr");
        return false;
    }
    if (_model == nullptr) {
        MW_LOGE("model is nullptr");
        return false;
    }
    if (!_isInState(RECORDER_STATE_CREATED, RECORDER_STATE_CREATED, "can't start in current fw state")
        || !_setAttributes())
        return false;
    if (const int result = recorder_prepare(_handle);
        !mwSucceeded(result, "recorder_prepare", __FILE_NAME__, __func__, __LINE__)) {
        error = toRefusal(result);
        return false;
    }
    if (const int result = recorder_start(_handle);
        !mwSucceeded(result, "recorder_start", __FILE_NAME__, __func__, __LINE__)) {
        if (result == RECORDER_ERROR_OUT_OF_STORAGE)
            error = ERROR_OUT_OF_STORAGE;
        return false;
    }
    error = ERROR_NONE;
    MW_LOGW("END");
    return true;
}

bool MwRecorder::_setAttributes()
{
    const int timeLimit = _model->getEstimatedRecordingMaxTime();
    return MW_CALL(recorder_attr_set_audio_device, _handle, RECORDER_AUDIO_DEVICE_MIC)
        && MW_CALL(recorder_set_audio_encoder, _handle, static_cast<recorder_audio_codec_e>(_model->getAudioCodec()))
        && MW_CALL(recorder_set_file_format, _handle, static_cast<recorder_file_format_e>(_model->getFileFormat()))
        && MW_CALL(recorder_attr_set_audio_samplerate, _handle, _model->getSampleRate())
        && MW_CALL(recorder_attr_set_audio_encoder_bitrate, _handle, _model->getBitRate())
        && MW_CALL(recorder_attr_set_size_limit, _handle, _model->getSizeLimit())
        && (timeLimit <= 0 || MW_CALL(recorder_attr_set_time_limit, _handle, timeLimit))
        && MW_CALL(recorder_set_filename, _handle, _model->getTemporaryFilePath().c_str())
        && MW_CALL(recorder_attr_set_audio_tuning, _handle, AUDIO_TUNING)
        && MW_CALL(recorder_attr_set_recording_type_tag, _handle, RECORDING_TYPE_TAG);
}

// Whether the service recorder is in one of two states; logs the refusal of the action otherwise.
bool MwRecorder::_isInState(recorder_state_e first, recorder_state_e second, const char* refusal) const
{
    if (_handle == nullptr) {
        MW_LOGE("_handle is nullptr");
        return false;
    }
    recorder_state_e state = RECORDER_STATE_NONE;
    if (!_getState(state))
        return false;
    if (state != first && state != second)
        MW_LOGE("%s[%d]", refusal, state);
    return state == first || state == second;
}

bool MwRecorder::pause()
{
    MW_LOGW("BEGIN");
    return _isInState(RECORDER_STATE_RECORDING, RECORDER_STATE_RECORDING, "can't pause in current fw state")
        && MW_CALL(recorder_pause, _handle);
}

bool MwRecorder::resume(ErrorType& error)
{
    MW_LOGW("BEGIN");
    error = ERROR_UNKNOWN;
    if (!_isInState(RECORDER_STATE_PAUSED, RECORDER_STATE_PAUSED, "can't resume in current fw state"))
        return false;
    const int result = recorder_start(_handle);
    error = result == 0 ? ERROR_NONE : toRefusal(result);
    return mwSucceeded(result, "recorder_start", __FILE_NAME__, __func__, __LINE__);
}

bool MwRecorder::cancel()
{
    MW_LOGW("BEGIN");
    return _isInState(RECORDER_STATE_RECORDING, RECORDER_STATE_PAUSED, "can't cancel in current fw state")
        && MW_CALL(recorder_cancel, _handle) && MW_CALL(recorder_unprepare, _handle);
}

bool MwRecorder::stop()
{
    MW_LOGW("BEGIN");
    if (_handle == nullptr) {
        MW_LOGE("_handle is nullptr");
        return false;
    }
    recorder_state_e state = RECORDER_STATE_NONE;
    if (!_getState(state))
        return false;
    if (state == RECORDER_STATE_RECORDING || state == RECORDER_STATE_PAUSED) {
        if (!MW_CALL(recorder_commit, _handle))
            return false;
    } else {
        MW_LOGI("Unable to commit in current framework state: [%d]", state);
    }
    if (!_getState(state))
        return false;
    // A program that waits for its recording gets it, whatever becomes of the microphone.
    if (state == RECORDER_STATE_READY && !MW_CALL(recorder_unprepare, _handle) && !_model->isRequestMode())
        return false;
    MW_LOGW("END");
    return true;
}

bool MwRecorder::hasEnded() const
{
    recorder_state_e state = RECORDER_STATE_NONE;
    return _handle != nullptr && _getState(state) && state <= RECORDER_STATE_READY;
}

bool MwRecorder::isInRecording(int kind) const
{
    bool recording = false;
    if (const int result = recorder_is_in_recording(kind, &recording); result != 0) {
        MW_LOGE("recorder_is_in_recording failed : [%d]!!!", result);
        return false;
    }
    return recording;
}

double MwRecorder::_getAudioLevel() const
{
    if (_handle == nullptr) {
        MW_LOGE("_handle is nullptr");
        return MwModel::SILENCE;
    }
    double level = MwModel::SILENCE;
    return MW_CALL(recorder_get_audio_level, _handle, &level) ? level + LEVEL_OFFSET : MwModel::SILENCE;
}

void MwRecorder::_stateChangedCb(recorder_state_e previous, recorder_state_e current, bool, void* userData)
{
    if (userData == nullptr) {
        MW_LOGE("self is nullptr");
        return;
    }
    MW_LOGI("previous state[%d] current state[%d] by policy", previous, current);
}

void MwRecorder::_errorCb(int error, recorder_state_e state, void* userData)
{
    MW_LOGW("BEGIN");
    auto* self = static_cast<MwRecorder*>(userData);
    if (self == nullptr) {
        MW_LOGE("self is nullptr");
        return;
    }
    MW_LOGE("error[%0xd] current state[%d]", static_cast<unsigned int>(error), state);
    self->errorSignal.emit(toErrorType(error));
}

void MwRecorder::_interruptedCb(
    recorder_policy_e policy, recorder_state_e previous, recorder_state_e current, void* userData)
{
    auto* self = static_cast<MwRecorder*>(userData);
    if (self == nullptr) {
        MW_LOGE("self is nullptr");
        return;
    }
    MW_LOGE("policy[%d] previous state[%d] current state[%d]", policy, previous, current);
    self->interruptedSignal.emit();
}

void MwRecorder::_limitReachedCb(recorder_recording_limit_type_e type, void* userData)
{
    auto* self = static_cast<MwRecorder*>(userData);
    if (self == nullptr) {
        MW_LOGE("self is nullptr");
        return;
    }
    MW_LOGI("limit type[%d]", type);
    LimitType limit = LIMIT_NONE;
    if (type == RECORDER_RECORDING_LIMIT_TIME)
        limit = LIMIT_TIME;
    else if (type == RECORDER_RECORDING_LIMIT_SIZE)
        limit = LIMIT_SIZE;
    else if (type == RECORDER_RECORDING_LIMIT_FREE_SPACE)
        limit = LIMIT_FREE_SPACE;
    else
        MW_LOGE("invalid type!!");
    self->limitReachedSignal.emit(limit);
}

void MwRecorder::_statusCb(unsigned long long elapsed, unsigned long long, void* userData)
{
    auto* self = static_cast<MwRecorder*>(userData);
    if (self == nullptr) {
        MW_LOGE("self is nullptr");
        return;
    }
    if (self->_model == nullptr) {
        MW_LOGE("model is nullptr");
        return;
    }
    if (elapsed == 0) {
        MW_LOGI("START statusCb");
        self->_statusCount = 0;
    }
    self->_model->setElapsedTime(elapsed);
    if (++self->_statusCount <= STATUS_CALLBACKS_PER_LEVEL)
        return;
    self->_statusCount = 0;
    self->_model->setLevel(self->_getAudioLevel());
}
