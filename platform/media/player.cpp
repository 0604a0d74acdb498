#include <player.h>

#include "host/PulseWatch.h"
#include "media/FileDuration.h"
#include "media/LiveCall.h"
#include "media/PlayerPipeline.h"
#include "media/Slot.h"
#include "state/Trees.h"
#include <MainLoopMailbox.h>
#include <StateKeys.h>

#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <memory>
#include <new>
#include <string>
#include <utility>

using media::PlayerPipeline;
using media::Slot;

namespace {

player_interrupted_code_e interruptionCode(const host::PulseSnapshot& sound)
{
    if (media::isCallLive(sound))
        return PLAYER_INTERRUPTED_BY_CALL;
    if (sound.hasAlarm)
        return PLAYER_INTERRUPTED_BY_ALARM;
    return sound.hasNotification ? PLAYER_INTERRUPTED_BY_NOTIFICATION : PLAYER_INTERRUPTED_BY_MEDIA;
}

int fileError(const std::string& path)
{
    if (access(path.c_str(), R_OK) == 0)
        return PLAYER_ERROR_NONE;
    return errno == EACCES ? PLAYER_ERROR_PERMISSION_DENIED : PLAYER_ERROR_NO_SUCH_FILE;
}

}

// Main loop only. Every callback is the last step of the function that makes it: it may destroy the player.
struct player_s {
    player_s();
    ~player_s()
    {
        host::PulseWatch::instance().removeListener(_soundListener);
        platform::stateTree().unwatch(_callWatch);
    }
    player_s(const player_s&) = delete;
    player_s& operator=(const player_s&) = delete;

    int setUri(const char* path);
    int prepare();
    int unprepare();
    int start();
    int pause();
    int stop();
    [[nodiscard]] int duration() const;
    int position();
    int seek(int milliseconds, bool isAccurate, Slot<player_seek_completed_cb> done);

    player_state_e state = PLAYER_STATE_IDLE;
    Slot<player_completed_cb> completed;
    Slot<player_interrupted_cb> interrupted;
    Slot<player_error_cb> failed;

private:
    PlayerPipeline::Events _events();
    void _interrupt(player_interrupted_code_e code);
    void _onRequested(bool shallPause);
    void _yield(bool isBusy);
    void _onFailed(bool isSink);
    void _onSeekDone();
    int _open();
    void _close();

    std::string _path;
    int _fileDuration = -1;
    std::unique_ptr<PlayerPipeline> _pipeline;
    bool _isSeeking = false; // until the first "done" of a burst; the rest belongs to it
    Slot<player_seek_completed_cb> _seekDone;
    int _lastPosition = 0;
    bool _isInterrupted = false; // paused for another stream
    int _soundListener = 0;
    platform::KeyTree::WatchId _callWatch = 0;
    platform::MainLoopMailbox _mailbox;
};

player_s::player_s()
{
    _soundListener = host::PulseWatch::instance().addListener([this](const auto& before, const auto& now) {
        if (before.isHeadsetOut && now.isConnected && !now.isHeadsetOut)
            _mailbox.post([this] { _interrupt(PLAYER_INTERRUPTED_BY_EARJACK_UNPLUG); });
        // Not every sound server asks for a pause itself.
        const bool isBusy = now.hasCall || now.hasAlarm;
        if (isBusy != (before.hasCall || before.hasAlarm))
            _mailbox.post([this, isBusy] { _yield(isBusy); });
    });
    // The modem knows of calls that no stream tells.
    _callWatch = platform::stateTree().watch(platform::KEY_CALL_STATUS, [this](const std::string&) {
        const auto sound = host::PulseWatch::instance().snapshot();
        const bool isBusy = media::isCallLive(sound) || sound.hasAlarm;
        _mailbox.post([this, isBusy] { _yield(isBusy); });
    });
}

int player_s::setUri(const char* path)
{
    if (state != PLAYER_STATE_IDLE)
        return PLAYER_ERROR_INVALID_STATE;
    if (path == nullptr || *path == '\0')
        return PLAYER_ERROR_INVALID_PARAMETER;
    _path = path;
    return PLAYER_ERROR_NONE;
}

PlayerPipeline::Events player_s::_events()
{
    return {[this] { completed(); }, [this] { _onSeekDone(); }, [this](bool shallPause) { _onRequested(shallPause); },
        [this](bool isSink, const std::string&) { _onFailed(isSink); }};
}

int player_s::_open()
{
    PlayerPipeline::Opened opened = PlayerPipeline::Opened::OK;
    _pipeline = PlayerPipeline::open(_path, _events(), opened);
    switch (opened) {
    case PlayerPipeline::Opened::OK:
        return PLAYER_ERROR_NONE;
    case PlayerPipeline::Opened::NO_SOUND:
        return PLAYER_ERROR_CONNECTION_FAILED;
    case PlayerPipeline::Opened::UNREADABLE:
        break;
    }
    return PLAYER_ERROR_NOT_SUPPORTED_FILE;
}

void player_s::_close()
{
    _pipeline.reset();
    _lastPosition = 0;
    _isInterrupted = false;
    _isSeeking = false;
}

int player_s::prepare()
{
    if (state != PLAYER_STATE_IDLE)
        return PLAYER_ERROR_INVALID_STATE;
    if (_path.empty())
        return PLAYER_ERROR_INVALID_OPERATION;
    if (const int error = fileError(_path); error != PLAYER_ERROR_NONE)
        return error;
    _close();
    _fileDuration = media::durationOf(_path).value_or(-1);
    if (const int error = _open(); error != PLAYER_ERROR_NONE)
        return error;
    state = PLAYER_STATE_READY;
    return PLAYER_ERROR_NONE;
}

int player_s::unprepare()
{
    if (state == PLAYER_STATE_IDLE)
        return PLAYER_ERROR_INVALID_STATE;
    _close();
    state = PLAYER_STATE_IDLE;
    return PLAYER_ERROR_NONE;
}

int player_s::start()
{
    if (state != PLAYER_STATE_READY && state != PLAYER_STATE_PAUSED)
        return PLAYER_ERROR_INVALID_STATE;
    // After a stop the file is opened anew.
    if (!_pipeline)
        if (const int error = _open(); error != PLAYER_ERROR_NONE)
            return error;
    if (!_pipeline->play())
        return PLAYER_ERROR_INVALID_OPERATION;
    _isInterrupted = false;
    state = PLAYER_STATE_PLAYING;
    return PLAYER_ERROR_NONE;
}

int player_s::pause()
{
    if (state != PLAYER_STATE_PLAYING)
        return PLAYER_ERROR_INVALID_STATE;
    if (!_pipeline->pause())
        return PLAYER_ERROR_INVALID_OPERATION;
    state = PLAYER_STATE_PAUSED;
    return PLAYER_ERROR_NONE;
}

int player_s::stop()
{
    if (state != PLAYER_STATE_PLAYING && state != PLAYER_STATE_PAUSED)
        return PLAYER_ERROR_INVALID_STATE;
    _close();
    state = PLAYER_STATE_READY;
    return PLAYER_ERROR_NONE;
}

int player_s::duration() const
{
    if (_fileDuration >= 0 || !_pipeline)
        return _fileDuration;
    return _pipeline->duration();
}

int player_s::position()
{
    // No answer while a seek is in flight: then the last known place is its target.
    if (const int now = _pipeline && !_isSeeking ? _pipeline->position() : -1; now >= 0)
        _lastPosition = now;
    return _lastPosition;
}

int player_s::seek(int milliseconds, bool isAccurate, Slot<player_seek_completed_cb> done)
{
    if (!_pipeline)
        return PLAYER_ERROR_INVALID_STATE;
    if (milliseconds < 0)
        return PLAYER_ERROR_INVALID_PARAMETER;
    const int end = duration();
    const int target = end >= 0 ? std::min(milliseconds, end) : milliseconds;
    if (!_pipeline->seek(target, isAccurate))
        return PLAYER_ERROR_SEEK_FAILED;
    _isSeeking = true;
    _seekDone = done;
    _lastPosition = target;
    return PLAYER_ERROR_NONE;
}

void player_s::_onSeekDone()
{
    if (std::exchange(_isSeeking, false))
        std::exchange(_seekDone, {})();
}

void player_s::_interrupt(player_interrupted_code_e code)
{
    if (pause() == PLAYER_ERROR_NONE)
        interrupted(code);
}

void player_s::_onRequested(bool shallPause)
{
    if (shallPause && state == PLAYER_STATE_PLAYING) {
        _isInterrupted = true;
        return _interrupt(interruptionCode(host::PulseWatch::instance().refresh()));
    }
    if (!shallPause && std::exchange(_isInterrupted, false) && state == PLAYER_STATE_PAUSED)
        interrupted(PLAYER_INTERRUPTED_COMPLETED);
}

// Whoever tells first pauses, and once; as with the end.
void player_s::_yield(bool isBusy)
{
    if (isBusy && state == PLAYER_STATE_PLAYING) {
        _isInterrupted = true;
        return _interrupt(interruptionCode(host::PulseWatch::instance().snapshot()));
    }
    if (!isBusy && std::exchange(_isInterrupted, false) && state == PLAYER_STATE_PAUSED)
        interrupted(PLAYER_INTERRUPTED_COMPLETED);
}

void player_s::_onFailed(bool isSink)
{
    if (!isSink)
        return failed(static_cast<int>(PLAYER_ERROR_INVALID_OPERATION));
    // The loudspeaker or its server is gone; nothing is left to pause.
    _close();
    state = PLAYER_STATE_READY;
    interrupted(PLAYER_INTERRUPTED_BY_RESOURCE_CONFLICT);
}

namespace {

template <typename Function>
int setCallback(player_h player, Slot<Function> player_s::*slot, Function callback, void* userData)
{
    if (player == nullptr || callback == nullptr)
        return PLAYER_ERROR_INVALID_PARAMETER;
    player->*slot = {callback, userData};
    return PLAYER_ERROR_NONE;
}

int run(player_h player, int (player_s::*operation)())
{
    return player != nullptr ? (player->*operation)() : static_cast<int>(PLAYER_ERROR_INVALID_PARAMETER);
}

}

int player_create(player_h* player)
{
    if (player == nullptr)
        return PLAYER_ERROR_INVALID_PARAMETER;
    *player = new (std::nothrow) player_s;
    return *player != nullptr ? PLAYER_ERROR_NONE : PLAYER_ERROR_OUT_OF_MEMORY;
}

int player_destroy(player_h player)
{
    if (player == nullptr)
        return PLAYER_ERROR_INVALID_PARAMETER;
    delete player;
    return PLAYER_ERROR_NONE;
}

int player_get_state(player_h player, player_state_e* state)
{
    if (player == nullptr || state == nullptr)
        return PLAYER_ERROR_INVALID_PARAMETER;
    *state = player->state;
    return PLAYER_ERROR_NONE;
}

// The desktop's own volume rules protect the ears.
int player_set_safety_volume(player_h player)
{
    return player != nullptr ? PLAYER_ERROR_NONE : PLAYER_ERROR_INVALID_PARAMETER;
}

// Every stream of ours has the role music.
int player_set_sound_type(player_h player, int)
{
    return player != nullptr ? PLAYER_ERROR_NONE : PLAYER_ERROR_INVALID_PARAMETER;
}

int player_set_completed_cb(player_h player, player_completed_cb callback, void* user_data)
{
    return setCallback(player, &player_s::completed, callback, user_data);
}

int player_set_interrupted_cb(player_h player, player_interrupted_cb callback, void* user_data)
{
    return setCallback(player, &player_s::interrupted, callback, user_data);
}

int player_set_error_cb(player_h player, player_error_cb callback, void* user_data)
{
    return setCallback(player, &player_s::failed, callback, user_data);
}

int player_set_uri(player_h player, const char* path)
{
    return player != nullptr ? player->setUri(path) : static_cast<int>(PLAYER_ERROR_INVALID_PARAMETER);
}

int player_prepare(player_h player) { return run(player, &player_s::prepare); }

int player_unprepare(player_h player) { return run(player, &player_s::unprepare); }

int player_start(player_h player) { return run(player, &player_s::start); }

int player_pause(player_h player) { return run(player, &player_s::pause); }

int player_stop(player_h player) { return run(player, &player_s::stop); }

int player_get_duration(player_h player, int* milliseconds)
{
    if (player == nullptr || milliseconds == nullptr)
        return PLAYER_ERROR_INVALID_PARAMETER;
    if (player->state == PLAYER_STATE_IDLE)
        return PLAYER_ERROR_INVALID_STATE;
    *milliseconds = std::max(player->duration(), 0);
    return PLAYER_ERROR_NONE;
}

int player_get_play_position(player_h player, int* milliseconds)
{
    if (player == nullptr || milliseconds == nullptr)
        return PLAYER_ERROR_INVALID_PARAMETER;
    if (player->state == PLAYER_STATE_IDLE)
        return PLAYER_ERROR_INVALID_STATE;
    *milliseconds = player->position();
    return PLAYER_ERROR_NONE;
}

int player_set_play_position(
    player_h player, int milliseconds, bool accurate, player_seek_completed_cb callback, void* user_data)
{
    return player != nullptr ? player->seek(milliseconds, accurate, {callback, user_data})
                             : static_cast<int>(PLAYER_ERROR_INVALID_PARAMETER);
}
