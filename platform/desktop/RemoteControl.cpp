#include "desktop/RemoteControl.h"

#include "app.h"
#include "launch/Toolkit.h"
#include "state/Trees.h"
#include <MainLoop.h>
#include <StateKeys.h>

#include <atomic>
#include <utility>

namespace platform {

namespace {

    struct Named {
        const char* name;
        media_key_e key;
    };

    constexpr Named METHODS[] = {
        {.name = "Play", .key = MEDIA_KEY_PLAY},
        {.name = "Pause", .key = MEDIA_KEY_PAUSE},
        {.name = "PlayPause", .key = MEDIA_KEY_PLAYPAUSE},
        {.name = "Stop", .key = MEDIA_KEY_STOP},
        {.name = "Next", .key = MEDIA_KEY_NEXT},
        {.name = "Previous", .key = MEDIA_KEY_PREVIOUS},
    };

    // Keyboards have one key for play and pause; it bears the name of play.
    constexpr Named KEYBOARD[] = {
        {.name = "Play", .key = MEDIA_KEY_PLAYPAUSE},
        {.name = "Pause", .key = MEDIA_KEY_PAUSE},
        {.name = "Stop", .key = MEDIA_KEY_STOP},
        {.name = "Next", .key = MEDIA_KEY_NEXT},
        {.name = "Prev", .key = MEDIA_KEY_PREVIOUS},
        {.name = "Forward", .key = MEDIA_KEY_FASTFORWARD},
        {.name = "Rewind", .key = MEDIA_KEY_REWIND},
        {.name = "Media", .key = MEDIA_KEY_MEDIA},
        {.name = "Record", .key = MEDIA_KEY_RECORD},
    };

    template <size_t Count>
    std::optional<media_key_e> keyNamed(const Named (&table)[Count], const std::string& name)
    {
        for (const Named& entry : table)
            if (name == entry.name)
                return entry.key;
        return std::nullopt;
    }

    enum RecorderState : int { RECORDING = 2, RECORDING_PAUSED = 3 };

}

RemoteControl& RemoteControl::instance()
{
    static auto* control = new RemoteControl;
    return *control;
}

void RemoteControl::reserve(media_key_event_cb callback, void* userData)
{
    _callback = callback;
    _userData = userData;
    if (_keys != nullptr)
        return;
    _keys = std::make_unique<host::X11Keys>([this](const std::string& name, bool down) {
        if (const auto key = keyNamed(KEYBOARD, name))
            _send(*key, down ? MEDIA_KEY_STATUS_PRESSED : MEDIA_KEY_STATUS_RELEASED);
    });
    if (host::BusInLoop* bus = host::sessionBus())
        _mpris = std::make_unique<host::Mpris>(*bus,
            host::Mpris::Handlers{[this](const std::string& method) { _called(method); },
                [this] { return _playback.position(_playbackData); },
                [this](int milliseconds) { _playback.seek(milliseconds, _playbackData); }});
    _recorderWatch = stateTree().watch(VCONFKEY_MEWLO_RECORDER_STATE, [this](const std::string&) { _update(); });
    _titleWatch = stateTree().watch(VCONFKEY_MEWLO_TITLE, [this](const std::string&) { _update(); });
    _update();
}

void RemoteControl::release()
{
    _callback = nullptr;
    if (_keys == nullptr)
        return;
    stateTree().unwatch(std::exchange(_recorderWatch, 0));
    stateTree().unwatch(std::exchange(_titleWatch, 0));
    _mpris.reset();
    _keys.reset();
}

void RemoteControl::setPlayerState(bt_avrcp_player_state_e state)
{
    _player = state;
    _update();
}

// After the bus call or the key event has been dealt with: a receiver may release the keys at once.
void RemoteControl::_called(const std::string& method)
{
    if (method == "Raise")
        return raiseMainWindow();
    if (method == "Quit")
        return later([] { ui_app_close(); });
    if (const auto key = keyNamed(METHODS, method))
        later([this, key = *key] { _press(key); });
}

void RemoteControl::_press(media_key_e key)
{
    _send(key, MEDIA_KEY_STATUS_PRESSED);
    _send(key, MEDIA_KEY_STATUS_RELEASED);
}

void RemoteControl::_send(media_key_e key, media_key_event_e status)
{
    if (_callback != nullptr)
        _callback(key, status, _userData);
}

void RemoteControl::setPlayer(const remote_player_callbacks_s* callbacks, void* userData)
{
    _playback = callbacks != nullptr ? *callbacks : remote_player_callbacks_s{};
    _playbackData = userData;
    _update();
}

void RemoteControl::tellSeeked(int milliseconds)
{
    if (_mpris != nullptr)
        _mpris->tellSeeked(milliseconds);
}

host::Mpris::State RemoteControl::_recorderState(int recorder) const
{
    host::Mpris::State state;
    state.status = recorder == RECORDING ? "Playing" : "Paused";
    state.title = stateTree().read(VCONFKEY_MEWLO_TITLE).value_or("");
    state.canSkip = false;
    state.hasPosition = _playback.position != nullptr;
    return state;
}

host::Mpris::State RemoteControl::_playerState() const
{
    constexpr const char* STATUS[] = {"Stopped", "Playing", "Paused"};
    host::Mpris::State state;
    state.status = STATUS[_player];
    remote_player_track_s track{};
    if (_player == BT_AVRCP_PLAYER_STATE_STOPPED || _playback.track == nullptr
        || !_playback.track(&track, _playbackData)) {
        state.title = stateTree().read(VCONFKEY_MEWLO_TITLE).value_or("");
        return state;
    }
    state.title = track.title;
    state.length = track.duration;
    state.canSeek = true;
    state.hasPosition = true;
    return state;
}

void RemoteControl::_update()
{
    if (_mpris == nullptr)
        return;
    const int recorder = stateInt(VCONFKEY_MEWLO_RECORDER_STATE).value_or(0);
    const bool records = recorder == RECORDING || recorder == RECORDING_PAUSED;
    _mpris->setState(records ? _recorderState(recorder) : _playerState());
}

}

using platform::RemoteControl;

// The command worker reserves keys, too, and must not wait for the main loop. A release that overtakes a reservation
// on its way cancels it: its receiver may be gone.
namespace {

std::atomic<uint64_t> lastOrder{0};

}

int media_key_reserve(media_key_event_cb callback, void* user_data)
{
    constexpr int INVALID_PARAMETER = -22;
    if (callback == nullptr)
        return INVALID_PARAMETER;
    platform::onMainLoop([callback, user_data, order = ++lastOrder] {
        if (order == lastOrder)
            RemoteControl::instance().reserve(callback, user_data);
    });
    return 0;
}

int media_key_release(void)
{
    ++lastOrder;
    platform::onMainLoop([] { RemoteControl::instance().release(); });
    return 0;
}

int remote_player_set_callbacks(const remote_player_callbacks_s* callbacks, void* user_data)
{
    constexpr int INVALID_PARAMETER = -22;
    if (callbacks != nullptr && (!callbacks->track || !callbacks->position || !callbacks->seek))
        return INVALID_PARAMETER;
    RemoteControl::instance().setPlayer(callbacks, user_data);
    return 0;
}

int remote_player_seeked(int position)
{
    platform::onMainLoop([position] { RemoteControl::instance().tellSeeked(position); });
    return 0;
}
