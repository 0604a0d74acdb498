#pragma once

#include <Mutex.h>

#include <chrono>
#include <condition_variable>
#include <functional>
#include <map>
#include <memory>
#include <set>
#include <string>

struct pa_threaded_mainloop;
struct pa_context;

namespace host {

// What the sound server tells about the world. Streams of this process are left out.
struct PulseSnapshot {
    bool isConnected = false;
    bool hasCall = false; // an active stream of the role phone
    bool hasAlarm = false;
    bool hasNotification = false; // roles event and notification
    bool othersRecord = false; // a recorder captures sound now, by its role or its name
    bool othersListen = false; // any application does
    bool isHeadsetOut = false; // the default output is a wired headset or headphone
    bool isHeadsetIn = false;
    bool isHeadsetPlugged = false;
    std::string defaultSink;
    std::set<std::string> microphones; // names of the sources that are no monitor of an output

    bool operator==(const PulseSnapshot&) const = default;
};

// Watches the sound server in a thread of its own. Connects when first asked, and again after the server went; without
// one everything answers quickly with "nothing". Any thread, but not from inside a listener.
class PulseWatch {
public:
    using Listener = std::function<void(const PulseSnapshot& before, const PulseSnapshot& now)>;

    static PulseWatch& instance();
    PulseWatch(const PulseWatch&) = delete;
    PulseWatch& operator=(const PulseWatch&) = delete;

    // The last known state, at once.
    PulseSnapshot snapshot();
    // Asks the server again; waits for the answer at most that long.
    PulseSnapshot refresh(std::chrono::milliseconds limit = std::chrono::milliseconds(200));
    // The listener runs on the watch's thread and must be quick. Connects, and reconnects by itself from now on.
    int addListener(Listener listener);
    // No call is running any more when this returns.
    void removeListener(int id);

private:
    struct Query;
    PulseWatch();
    ~PulseWatch();
    void _connect(); // with the loop locked
    void _disconnect();
    void _query();
    void _finish();
    void _publish(const PulseSnapshot& now);
    void _scheduleReconnect();
    bool _start();
    bool _isConnectionOld() const;

    platform::Mutex _startMutex;
    pa_threaded_mainloop* _loop = nullptr;
    pa_context* _context = nullptr; // guarded by the loop's lock, as the next five
    std::string _server;
    bool _isReady = false;
    std::unique_ptr<Query> _current; // the look at the server that is under way
    bool _isDirty = false;
    bool _isReconnectDue = false;
    std::chrono::steady_clock::time_point _lastAttempt{};

    platform::Mutex _stateMutex;
    std::condition_variable_any _answered;
    PulseSnapshot _now GUARDED_BY(_stateMutex);
    unsigned _answers GUARDED_BY(_stateMutex) = 0;
    unsigned _asked = 0; // guarded by the loop's lock

    platform::Mutex _listenerMutex; // held during calls
    std::map<int, Listener> _listeners GUARDED_BY(_listenerMutex);
    int _lastId GUARDED_BY(_listenerMutex) = 0;
};

}
