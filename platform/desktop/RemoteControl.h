// Media keys and the play state that remote controls show: one MPRIS object and the keyboard's keys, both there only
// while a receiver has reserved the keys. Main loop only.
#pragma once

#include "bluetooth.h"
#include "host/Mpris.h"
#include "host/X11Keys.h"
#include "media_key.h"
#include "remote_player.h"
#include "state/KeyTree.h"

#include <memory>
#include <optional>

namespace platform {

class RemoteControl {
public:
    static RemoteControl& instance();

    void reserve(media_key_event_cb callback, void* userData);
    void release();
    void setPlayerState(bt_avrcp_player_state_e state);
    void setPlayer(const remote_player_callbacks_s* callbacks, void* userData);
    void tellSeeked(int milliseconds);

private:
    void _called(const std::string& method);
    void _press(media_key_e key);
    void _send(media_key_e key, media_key_event_e status);
    void _update();
    [[nodiscard]] host::Mpris::State _recorderState(int recorder) const;
    [[nodiscard]] host::Mpris::State _playerState() const;

    media_key_event_cb _callback = nullptr;
    void* _userData = nullptr;
    remote_player_callbacks_s _playback{};
    void* _playbackData = nullptr;
    bt_avrcp_player_state_e _player = BT_AVRCP_PLAYER_STATE_STOPPED;
    std::unique_ptr<host::Mpris> _mpris;
    std::unique_ptr<host::X11Keys> _keys;
    KeyTree::WatchId _recorderWatch = 0;
    KeyTree::WatchId _titleWatch = 0;
};

}
