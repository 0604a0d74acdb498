#include "MwSoundSessionImpl.h"

#include <sound_manager.h>

#include <utility>

#include "MwErrorName.h"
#include "MwLog.h"

namespace {

constexpr int RECORDING_SESSION_TYPE = 1;
constexpr int RECORDING_SESSION_OPTION = 2;
constexpr int RECORDING_SESSION_MODE = 12;

// One for the process: it is the process that records.
sound_multi_session_h recordSession = nullptr;

constexpr MwErrorName ERROR_NAMES[] = {
    MW_ERROR_NAME(SOUND_MANAGER_ERROR_OUT_OF_MEMORY),
    MW_ERROR_NAME(SOUND_MANAGER_ERROR_INVALID_PARAMETER),
    MW_ERROR_NAME(SOUND_MANAGER_ERROR_INVALID_OPERATION),
    MW_ERROR_NAME(SOUND_MANAGER_ERROR_PERMISSION_DENIED),
    MW_ERROR_NAME(SOUND_MANAGER_ERROR_NOT_SUPPORTED),
    MW_ERROR_NAME(SOUND_MANAGER_ERROR_NO_DATA),
    MW_ERROR_NAME(SOUND_MANAGER_ERROR_INTERNAL),
    MW_ERROR_NAME(SOUND_MANAGER_ERROR_POLICY),
    MW_ERROR_NAME(SOUND_MANAGER_ERROR_NO_PLAYING_SOUND),
    MW_ERROR_NAME(SOUND_MANAGER_ERROR_NO_OPERATION),
    MW_ERROR_NAME(SOUND_MANAGER_ERROR_POLICY_BLOCKED_BY_CALL),
    MW_ERROR_NAME(SOUND_MANAGER_ERROR_POLICY_BLOCKED_BY_ALARM),
    MW_ERROR_NAME(SOUND_MANAGER_ERROR_CAPTURE_ONLY),
};

MwSoundSession::Result toResult(int code)
{
    if (code == SOUND_MANAGER_ERROR_POLICY_BLOCKED_BY_CALL)
        return MwSoundSession::SESSION_RESULT_BLOCKED_BY_CALL;
    if (code == SOUND_MANAGER_ERROR_POLICY_BLOCKED_BY_ALARM)
        return MwSoundSession::SESSION_RESULT_BLOCKED_BY_ALARM;
    return MwSoundSession::SESSION_RESULT_FAILED;
}

}

_MwSoundSessionImpl::_MwSoundSessionImpl()
{
    _succeeded(sound_manager_set_session_type(SOUND_SESSION_TYPE_MEDIA), "sound_manager_set_session_type");
    _succeeded(sound_manager_set_media_session_option(
                   SOUND_SESSION_OPTION_PAUSE_OTHERS_WHEN_START, SOUND_SESSION_OPTION_INTERRUPTIBLE_DURING_PLAY),
        "sound_manager_set_media_session_option");
    _lifeCycleListener = MwSignalMgr::getInstance()->getLifeCycleSignal().addListener(_lifeCycleChanged);
}

_MwSoundSessionImpl::~_MwSoundSessionImpl()
{
    if (recordSession != nullptr)
        _succeeded(sound_manager_multi_session_destroy(std::exchange(recordSession, nullptr)),
            "sound_manager_multi_session_destroy");
    if (MwSignalMgr* signals = MwSignalMgr::existing(); signals != nullptr && _lifeCycleListener != 0)
        signals->getLifeCycleSignal().removeListener(std::exchange(_lifeCycleListener, 0));
}

void _MwSoundSessionImpl::_lifeCycleChanged(MwSignalMgr::LifeCycle lifeCycle)
{
    MW_LOGI("Life Cycle : [%d]", lifeCycle);
    switch (lifeCycle) {
    case MwSignalMgr::RESUME:
        _succeeded(sound_manager_set_current_sound_type(SOUND_TYPE_MEDIA), "sound_manager_set_current_sound_type");
        break;
    case MwSignalMgr::PAUSE:
    case MwSignalMgr::TERMINATE:
        _succeeded(sound_manager_unset_current_sound_type(), "sound_manager_unset_current_sound_type");
        break;
    }
}

int _MwSoundSessionImpl::_setRecordSoundSession()
{
    if (recordSession == nullptr
        && !_succeeded(sound_manager_multi_session_create(RECORDING_SESSION_TYPE, &recordSession),
            "sound_manager_multi_session_create"))
        return MwSoundSession::SESSION_RESULT_FAILED;
    int result = sound_manager_multi_session_set_option(recordSession, RECORDING_SESSION_OPTION);
    if (!_succeeded(result, "sound_manager_multi_session_set_option"))
        return toResult(result);
    result = sound_manager_multi_session_set_mode(recordSession, RECORDING_SESSION_MODE);
    if (!_succeeded(result, "sound_manager_multi_session_set_mode"))
        return toResult(result);
    return MwSoundSession::SESSION_RESULT_NONE;
}

void _MwSoundSessionImpl::_unsetRecordSoundSession()
{
    if (recordSession == nullptr)
        return;
    if (_succeeded(sound_manager_multi_session_destroy(recordSession), "sound_manager_multi_session_destroy"))
        recordSession = nullptr;
}

bool _MwSoundSessionImpl::_succeeded(int code, const char* call) { return mwSucceededByName(ERROR_NAMES, code, call); }
