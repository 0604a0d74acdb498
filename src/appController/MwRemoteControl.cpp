#include "MwRemoteControl.h"

#include <cstring>
#include <string>
#include <utility>

#include "MwLog.h"
#include "MwModel.h"

MwRemoteControl::MwRemoteControl(const MwModel* model, Seek seek)
    : _model(model)
    , _seek(std::move(seek))
{
    const remote_player_callbacks_s callbacks = {_remoteTrackCb, _remotePositionCb, _remoteSeekCb};
    MW_CALL(remote_player_set_callbacks, &callbacks, this);
}

MwRemoteControl::~MwRemoteControl() { MW_CALL(remote_player_set_callbacks, nullptr, nullptr); }

bool MwRemoteControl::_remoteTrackCb(remote_player_track_s* track, void* userData)
{
    return static_cast<const MwRemoteControl*>(userData)->_remoteTrack(*track);
}

int MwRemoteControl::_remotePositionCb(void* userData)
{
    const MwModel& model = *static_cast<const MwRemoteControl*>(userData)->_model;
    const bool records = mwIsRecordingOrPaused(model.getRecorderState());
    return records ? static_cast<int>(model.getElapsedTime()) : static_cast<int>(model.getCurrentPlayPosition());
}

void MwRemoteControl::_remoteSeekCb(int position, void* userData)
{
    const auto* self = static_cast<const MwRemoteControl*>(userData);
    if (self->_model->getPlayerState() != PLAY_STATE_NONE)
        self->_seek(static_cast<unsigned int>(position));
}

// The name of the file without its extension.
bool MwRemoteControl::_remoteTrack(remote_player_track_s& track) const
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
