#include <Mutex.h>
#include <sound_manager.h>

#include "host/PulseWatch.h"
#include "media/LiveCall.h"
#include <MainLoopMailbox.h>

#include <memory>
#include <new>

struct sound_multi_session_s { };

namespace {

struct Route {
    sound_device_in_e in = SOUND_DEVICE_IN_MIC;
    sound_device_out_e out = SOUND_DEVICE_OUT_SPEAKER;

    bool operator==(const Route&) const = default;
};

Route routeOf(const host::PulseSnapshot& sound)
{
    return {sound.isHeadsetIn ? SOUND_DEVICE_IN_WIRED_ACCESSORY : SOUND_DEVICE_IN_MIC,
        sound.isHeadsetOut ? SOUND_DEVICE_OUT_WIRED_ACCESSORY : SOUND_DEVICE_OUT_SPEAKER};
}

// Tells the application of route changes, on the main loop.
class RouteNotifier {
public:
    RouteNotifier(sound_manager_active_device_changed_cb callback, void* userData)
        : _callback(callback)
        , _userData(userData)
    {
        _listener = host::PulseWatch::instance().addListener([this](const auto& before, const auto& now) {
            const Route route = routeOf(now);
            if (before.isConnected && now.isConnected && routeOf(before) != route)
                _mailbox.post([this, route] { _callback(route.in, route.out, _userData); });
        });
    }
    ~RouteNotifier() { host::PulseWatch::instance().removeListener(_listener); }
    RouteNotifier(const RouteNotifier&) = delete;
    RouteNotifier& operator=(const RouteNotifier&) = delete;

private:
    const sound_manager_active_device_changed_cb _callback;
    void* const _userData;
    platform::MainLoopMailbox _mailbox;
    int _listener = 0;
};

platform::Mutex notifierMutex;

// Made after the watch, so that it goes before it at the end of the process.
std::unique_ptr<RouteNotifier>& notifier() REQUIRES(notifierMutex)
{
    (void)host::PulseWatch::instance();
    static std::unique_ptr<RouteNotifier> current;
    return current;
}

int arbitrate()
{
    const auto sound = host::PulseWatch::instance().refresh();
    if (media::isCallLive(sound))
        return SOUND_MANAGER_ERROR_POLICY_BLOCKED_BY_CALL;
    return sound.hasAlarm ? SOUND_MANAGER_ERROR_POLICY_BLOCKED_BY_ALARM : SOUND_MANAGER_ERROR_NONE;
}

}

// The sound server arbitrates by the roles of the streams: ours are "music" and "production", which calls and alarms
// interrupt. Nothing has to be declared beforehand.
int sound_manager_set_session_type(sound_session_type_e type)
{
    return type == SOUND_SESSION_TYPE_MEDIA ? SOUND_MANAGER_ERROR_NONE : SOUND_MANAGER_ERROR_INVALID_PARAMETER;
}

int sound_manager_set_media_session_option(sound_session_option_starting_e, sound_session_option_during_play_e)
{
    return SOUND_MANAGER_ERROR_NONE;
}

// A desktop's volume keys act on the output device whatever is in front.
int sound_manager_set_current_sound_type(sound_type_e type)
{
    return type == SOUND_TYPE_MEDIA ? SOUND_MANAGER_ERROR_NONE : SOUND_MANAGER_ERROR_INVALID_PARAMETER;
}

int sound_manager_unset_current_sound_type(void) { return SOUND_MANAGER_ERROR_NONE; }

int sound_manager_multi_session_create(int, sound_multi_session_h* session)
{
    if (session == nullptr)
        return SOUND_MANAGER_ERROR_INVALID_PARAMETER;
    *session = new (std::nothrow) sound_multi_session_s;
    return *session != nullptr ? SOUND_MANAGER_ERROR_NONE : SOUND_MANAGER_ERROR_OUT_OF_MEMORY;
}

int sound_manager_multi_session_set_option(sound_multi_session_h session, int)
{
    return session != nullptr ? arbitrate() : static_cast<int>(SOUND_MANAGER_ERROR_INVALID_PARAMETER);
}

int sound_manager_multi_session_set_mode(sound_multi_session_h session, int)
{
    return session != nullptr ? arbitrate() : static_cast<int>(SOUND_MANAGER_ERROR_INVALID_PARAMETER);
}

int sound_manager_multi_session_destroy(sound_multi_session_h session)
{
    if (session == nullptr)
        return SOUND_MANAGER_ERROR_INVALID_PARAMETER;
    delete session;
    return SOUND_MANAGER_ERROR_NONE;
}

int sound_manager_get_active_route(sound_device_in_e* in, sound_device_out_e* out)
{
    const Route route = routeOf(host::PulseWatch::instance().refresh());
    if (in != nullptr)
        *in = route.in;
    if (out != nullptr)
        *out = route.out;
    return SOUND_MANAGER_ERROR_NONE;
}

int sound_manager_set_active_device_changed_cb(sound_manager_active_device_changed_cb callback, void* user_data)
{
    if (callback == nullptr)
        return SOUND_MANAGER_ERROR_INVALID_PARAMETER;
    const platform::Lock lock(notifierMutex);
    notifier().reset();
    notifier() = std::make_unique<RouteNotifier>(callback, user_data);
    return SOUND_MANAGER_ERROR_NONE;
}

int sound_manager_unset_active_device_changed_cb(void)
{
    const platform::Lock lock(notifierMutex);
    notifier().reset();
    return SOUND_MANAGER_ERROR_NONE;
}
