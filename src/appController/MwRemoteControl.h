#pragma once

#include <remote_player.h>

#include <functional>

class MwModel;

// The application as the player that remote controls show and seek in: it tells them title, length and position from
// the model. The model is borrowed; what comes from the controls comes on the main loop. Main loop only.
class MwRemoteControl {
public:
    // Milliseconds; not called while nothing is loaded.
    using Seek = std::function<void(unsigned int position)>;

    // Connects.
    MwRemoteControl(const MwModel* model, Seek seek);
    // Disconnects.
    ~MwRemoteControl();
    MwRemoteControl(const MwRemoteControl&) = delete;
    MwRemoteControl& operator=(const MwRemoteControl&) = delete;

private:
    static bool _remoteTrackCb(remote_player_track_s* track, void* userData);
    static int _remotePositionCb(void* userData);
    static void _remoteSeekCb(int position, void* userData);
    bool _remoteTrack(remote_player_track_s& track) const;

    const MwModel* _model;
    Seek _seek;
};
