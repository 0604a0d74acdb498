#include "MwAppController.h"

#include <remote_player.h>

#include "MwAvrcp.h"
#include "MwLog.h"
#include "MwMediaKeys.h"
#include "MwModel.h"
#include "MwSystemMgr.h"
#include "MwText.h"

namespace {

constexpr int AUDIO = 0, VIDEO = 1; // kinds of recording asked about
constexpr unsigned int RESTART_THRESHOLD_MS = 3000;

bool endsByItself(player_interrupted_code_e code)
{
    return code == PLAYER_INTERRUPTED_BY_CALL || code == PLAYER_INTERRUPTED_BY_ALARM
        || code == PLAYER_INTERRUPTED_BY_EMERGENCY || code == PLAYER_INTERRUPTED_BY_NOTIFICATION;
}

}

bool MwAppController::_refusedByRecording()
{
    if (_recorder->isInRecording(AUDIO)) {
        MW_LOGE("Other audio recordings");
        mwPost("IDS_MW_TPOP_CANT_PLAY_RECORDINGS_WHILE_RECORDING_AUDIO");
        return true;
    }
    if (_recorder->isInRecording(VIDEO)) {
        MW_LOGE("Other vedio recordings");
        mwPost("IDS_FM_TPOP_CANT_PLAY_RECORDINGS_WHILE_RECORDING_VIDEO");
        return true;
    }
    return false;
}

bool MwAppController::_isPlayingAllowed()
{
    if (!_soundSession) {
        MW_LOGE("soundMgr is nullptr");
        return false;
    }
    if (!_player) {
        MW_LOGE("_player is nullptr");
        return false;
    }
    if (!_recorder) {
        MW_LOGE("_recorder is nullptr");
        return false;
    }
    if (MwSystemMgr::getInstance()->isCallConnected()) {
        MW_LOGE("call is connected");
        mwPost("IDS_FM_TPOP_CANT_PLAY_RECORDINGS_DURING_CALLS");
        return false;
    }
    return !_refusedByRecording();
}

bool MwAppController::_startPlaying()
{
    if (!_isPlayingAllowed())
        return false;
    if (!_player->start()) {
        MW_LOGE("play start failed");
        mwPost("IDS_MW_POP_UNABLE_TO_PLAY");
        return false;
    }
    _resumeAfterInterruption = false;
    MwSystemMgr::getInstance()->requestLockCPU();
    return true;
}

bool MwAppController::_pausePlaying()
{
    if (!_player) {
        MW_LOGE("_player is nullptr");
        return false;
    }
    if (_player->isSeeking()) {
        MW_LOGE("Can`t pause. Seeking!!!");
        return false;
    }
    if (!_player->pause()) {
        MW_LOGE("play pause failed");
        return false;
    }
    MwSystemMgr::getInstance()->releaseLockCPU();
    return true;
}

bool MwAppController::_resumePlaying()
{
    if (!_isPlayingAllowed())
        return false;
    if (_player->isSeeking()) {
        MW_LOGE("Can`t resume. Seeking!!!");
        return false;
    }
    if (!_player->resume()) {
        MW_LOGE("play resume failed");
        mwPost("IDS_MW_POP_UNABLE_TO_PLAY");
        return false;
    }
    MwSystemMgr::getInstance()->requestLockCPU();
    return true;
}

bool MwAppController::_stopPlaying()
{
    if (_model == nullptr) {
        MW_LOGE("_model is nullptr");
        return false;
    }
    if (!_player) {
        MW_LOGE("_player is nullptr");
        return false;
    }
    const auto state = _model->getPlayerState();
    if (state != PLAY_STATE_PLAYING && state != PLAY_STATE_PAUSED) {
        MW_LOGI("playing state : [%d]!!!", mwNumber(state));
    } else if (!_player->stop()) {
        MW_LOGE("play stop failed");
        return false;
    }
    MwSystemMgr::getInstance()->releaseLockCPU();
    return true;
}

bool MwAppController::_setPlayerPosition(unsigned int position)
{
    MW_LOGI("BEGIN - position : [%d]", static_cast<int>(position));
    if (!_player) {
        MW_LOGE("_player is nullptr");
        return false;
    }
    if (!_player->setPlayPosition(static_cast<int>(position))) {
        MW_LOGE("setPlayPosition failed");
        return false;
    }
    remote_player_seeked(static_cast<int>(position));
    return true;
}

// Plays another recording of the list after playback was stopped.
bool MwAppController::_playOther(const std::string& path)
{
    _model->setCurrentPlayPath(path);
    if (!_startPlaying()) {
        MW_LOGE("_startPlaying failed");
        _model->setCurrentPlayPosition(0);
        _emitPlayerUpdatedSignal();
        return false;
    }
    _mediaKeys->release();
    _mediaKeys->grab();
    _sendMessagePort();
    _avrcp->setAvrcpState(MwAvrcp::PLAYING);
    return true;
}

void MwAppController::_closePlayView()
{
    if (!_model->isPlayViewShown())
        return;
    _model->setPlayViewShown(false);
    _callSafetyMainThread([] { MwSignalMgr::getInstance()->getPlayViewClosedSignal().emit(); });
}

bool MwAppController::_executePlayPrevious()
{
    if (_refusedByRecording())
        return false;
    if (_model->getCurrentPlayPosition() > RESTART_THRESHOLD_MS) {
        _model->setCurrentPlayPosition(0);
        if (!_setPlayerPosition(0)) {
            MW_LOGE("_setPlayerPosition failed");
            return false;
        }
        _emitPlayerUpdatedSignal();
        return true;
    }
    const auto previous = _model->getPreviousPlayPath();
    if (!_stopPlaying()) {
        MW_LOGE("_stopPlaying failed");
        return false;
    }
    if (!previous) {
        MW_LOGE("getPreviousPlayPath failed!!!");
        return false;
    }
    if (!_playOther(*previous))
        return false;
    _closePlayView();
    _emitPlayerUpdatedSignal();
    return true;
}

bool MwAppController::_executePlayNext()
{
    if (_refusedByRecording())
        return false;
    const auto next = _model->getNextPlayPath();
    if (!_stopPlaying()) {
        MW_LOGE("_stopPlaying failed");
        return false;
    }
    if (!next)
        MW_LOGE("getNextPlayPath failed!!!");
    else if (!_playOther(*next))
        return false;
    _closePlayView();
    _emitPlayerUpdatedSignal();
    return true;
}

void MwAppController::_playerCompleted()
{
    _sendMessagePort();
    _mediaKeys->release();
    _avrcp->setAvrcpState(MwAvrcp::STOPPED);
    _emitPlayerUpdatedSignal();
    MwSystemMgr::getInstance()->releaseLockCPU();
    _mediaKeys->stopSeeking();
}

void MwAppController::_playerInterrupted(player_interrupted_code_e code)
{
    MW_LOGI("BEGIN - player_interrupted_code_e code : [%d]", code);
    _sendMessagePort();
    const bool ended = code == PLAYER_INTERRUPTED_COMPLETED;
    if (_model->getPlayerState() != PLAY_STATE_PAUSED) {
        _mediaKeys->release();
        _avrcp->setAvrcpState(MwAvrcp::STOPPED);
    } else if (!ended) {
        _avrcp->setAvrcpState(MwAvrcp::PAUSED);
    }
    if (endsByItself(code))
        _resumeAfterInterruption = true;
    if (ended && std::exchange(_resumeAfterInterruption, false)) {
        // Playing again, with a lock of its own: the one below is for playback that stays interrupted.
        if (dispatchCommand(RESUME_PLAYING))
            return;
        MW_LOGE("play resume failed!!!");
    } else {
        _emitPlayerUpdatedSignal();
    }
    MwSystemMgr::getInstance()->releaseLockCPU();
}

void MwAppController::_playerErrorOccurred(MwPlayer::PlayerErrorType type)
{
    MW_LOGI("BEGIN - error type : [%d]", type);
    _sendMessagePort();
    _mediaKeys->release();
    _callSafetyMainThread([this] { _createErrorPopup("Interal Error by player!"); });
    MwSystemMgr::getInstance()->releaseLockCPU();
}
