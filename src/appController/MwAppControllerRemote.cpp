// The controller as the player that remote controls show and seek in.
#include "MwAppController.h"

#include <remote_player.h>

#include <cstring>

#include "MwLog.h"
#include "MwModel.h"

bool MwAppController::_remoteTrackCb(remote_player_track_s* track, void* userData)
{
    return static_cast<const MwAppController*>(userData)->_remoteTrack(*track);
}

int MwAppController::_remotePositionCb(void* userData)
{
    const MwModel& model = *static_cast<const MwAppController*>(userData)->_model;
    const MwRecorderState recorder = model.getRecorderState();
    const bool records = recorder == REC_STATE_RECORDING || recorder == REC_STATE_PAUSED;
    return records ? static_cast<int>(model.getElapsedTime()) : static_cast<int>(model.getCurrentPlayPosition());
}

void MwAppController::_remoteSeekCb(int position, void* userData)
{
    static_cast<MwAppController*>(userData)->_seekByRemote(static_cast<unsigned int>(position));
}

void MwAppController::_connectRemote()
{
    const remote_player_callbacks_s callbacks = {_remoteTrackCb, _remotePositionCb, _remoteSeekCb};
    MW_CALL(remote_player_set_callbacks, &callbacks, this);
}

void MwAppController::_disconnectRemote() { MW_CALL(remote_player_set_callbacks, nullptr, nullptr); }

// The name of the file without its extension.
bool MwAppController::_remoteTrack(remote_player_track_s& track) const
{
    const std::string path = _model->getCurrentPlayPath();
    if (path.empty())
        return false;
    const std::string name = path.substr(path.rfind('/') + 1);
    const std::string title = name.substr(0, name.rfind('.'));
    // The fields are zero already, and file names are shorter than the field.
    std::strncpy(track.title, title.c_str(), sizeof track.title - 1);
    track.duration = static_cast<int>(_model->getCurrentPlayDuration());
    return true;
}

void MwAppController::_seekByRemote(unsigned int position)
{
    if (_model->getPlayerState() == PLAY_STATE_NONE)
        return;
    _model->setCurrentPlayPosition(position);
    if (!dispatchCommand(SET_PLAYER_POSITION))
        MW_LOGE("set play position failed!");
    _emitPlayerUpdatedSignal();
}
