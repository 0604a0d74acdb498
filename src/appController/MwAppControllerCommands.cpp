#include "MwAppController.h"

#include "MwAvrcp.h"
#include "MwLog.h"
#include "MwMediaKeys.h"
#include "MwModel.h"
#include "MwText.h"

bool MwAppController::dispatchCommand(Command command)
{
    // The main loop waits for the worker's running command here, and the worker for a command of the main loop.
    const platform::Lock lock(_commandMutex);
    MW_LOGI("BEGIN - command[%d]", static_cast<int>(command));
    if (!_recorder) {
        MW_LOGE("recorder is nullptr");
        return false;
    }
    if (!_player) {
        MW_LOGE("player is nullptr");
        return false;
    }
    if (!_avrcp) {
        MW_LOGE("avrcp is nullptr");
        return false;
    }
    if (!_execute(command))
        return false;
    MW_LOGI("END");
    return true;
}

bool MwAppController::_execute(Command command)
{
    switch (command) {
    case START_RECORDING:
        return _executeStart();
    case PAUSE_RECORDING:
        return _executePauseRecording();
    case RESUME_RECORDING:
        return _executeResumeRecording();
    case CANCEL_RECORDING:
        return _executeCancel();
    case STOP_RECORDING:
        return _executeStop(false);
    case STOP_RECORDING_INTERRUPTED:
        return _executeStop(true);
    case START_PLAYING:
        return _executeStartPlaying();
    case PAUSE_PLAYING:
        return _executePausePlaying();
    case RESUME_PLAYING:
        return _executeResumePlaying();
    case STOP_PLAYING:
        return _executeStopPlaying();
    case PLAY_PREVIOUS:
        return _executePlayPrevious();
    case PLAY_NEXT:
        return _executePlayNext();
    case SET_PLAYER_POSITION:
        if (_setPlayerPosition(_model->getCurrentPlayPosition()))
            return true;
        MW_LOGE("_setPlayerPosition failed");
        return false;
    case RESTART_PLAYING:
        return _executeRestartPlaying();
    }
    MW_LOGE("invalid command");
    return false;
}

bool MwAppController::_executeStart()
{
    if (!_startRecording()) {
        MW_LOGE("_startRecording failed");
        _emitRecorderUpdatedSignal();
        return false;
    }
    _mediaKeys->grab();
    _sendMessagePort();
    _emitRecorderUpdatedSignal();
    return true;
}

bool MwAppController::_executePauseRecording()
{
    if (!_pauseRecording()) {
        MW_LOGE("_pauseRecording failed");
        return false;
    }
    _emitRecorderUpdatedSignal();
    _sendMessagePort();
    return true;
}

bool MwAppController::_executeResumeRecording()
{
    if (!_resumeRecording()) {
        MW_LOGE("_resumeRecording failed");
        return false;
    }
    _emitRecorderUpdatedSignal();
    _sendMessagePort();
    return true;
}

bool MwAppController::_executeCancel()
{
    if (_isOver() && _wasDiscarded)
        return true;
    _mediaKeys->release();
    if (!_cancelRecording(false)) {
        MW_LOGE("_cancelRecording failed");
        _emitRecorderUpdatedSignal();
        return false;
    }
    _emitRecorderUpdatedSignal();
    _sendMessagePort();
    return true;
}

bool MwAppController::_executeStop(bool interrupted)
{
    if (_isOver()) {
        MW_LOGI("the recording is over already");
        return true;
    }
    _mediaKeys->release();
    bool stopped = false;
    if (_model->isTooShort()) {
        mwPost("IDS_MW_TPOP_COULDNT_SAVE_RECORDING_RECODING_TOO_SHORT");
        stopped = _cancelRecording(interrupted);
    } else {
        stopped = _stopRecording(interrupted);
    }
    _emitRecorderUpdatedSignal();
    _sendMessagePort();
    if (!stopped)
        MW_LOGE("_stopRecording(interrupted : [%d]) failed", interrupted);
    return stopped;
}

bool MwAppController::_executeStartPlaying()
{
    if (!_startPlaying()) {
        MW_LOGE("_startPlaying failed");
        return false;
    }
    _mediaKeys->grab();
    _emitPlayerUpdatedSignal();
    _sendMessagePort();
    _avrcp->setAvrcpState(MwAvrcp::PLAYING);
    return true;
}

bool MwAppController::_executePausePlaying()
{
    if (!_pausePlaying()) {
        MW_LOGE("_pausePlaying failed");
        return false;
    }
    _emitPlayerUpdatedSignal();
    _sendMessagePort();
    _avrcp->setAvrcpState(MwAvrcp::PAUSED);
    return true;
}

bool MwAppController::_executeResumePlaying()
{
    if (!_resumePlaying()) {
        MW_LOGE("_resumePlaying failed");
        return false;
    }
    _mediaKeys->release();
    _mediaKeys->grab();
    _emitPlayerUpdatedSignal();
    _sendMessagePort();
    _avrcp->setAvrcpState(MwAvrcp::PLAYING);
    return true;
}

bool MwAppController::_executeStopPlaying()
{
    _mediaKeys->release();
    _avrcp->setAvrcpState(MwAvrcp::STOPPED);
    if (!_stopPlaying()) {
        MW_LOGE("_stopPlaying failed");
        return false;
    }
    _emitPlayerUpdatedSignal();
    _sendMessagePort();
    return true;
}

bool MwAppController::_executeRestartPlaying()
{
    if (!_stopPlaying()) {
        MW_LOGE("_stopPlaying failed");
        return false;
    }
    _mediaKeys->release();
    const bool started = _startPlaying();
    if (started)
        _mediaKeys->grab();
    else
        MW_LOGE("_startPlaying failed");
    _sendMessagePort();
    _avrcp->setAvrcpState(started ? MwAvrcp::PLAYING : MwAvrcp::STOPPED);
    _emitPlayerUpdatedSignal();
    return started;
}
