#pragma once

#include <Mutex.h>

#include <condition_variable>
#include <deque>
#include <thread>

// Shows remote controls whether playback is stopped, playing or paused. The service may block, so it is called on a
// worker only; setAvrcpState never waits for it.
class MwAvrcp {
public:
    static constexpr int STOPPED = 0, PLAYING = 1, PAUSED = 2;

    MwAvrcp();
    // Waits until the worker has shut the service down.
    ~MwAvrcp();
    MwAvrcp(const MwAvrcp&) = delete;
    MwAvrcp& operator=(const MwAvrcp&) = delete;

    void setAvrcpState(int state);

private:
    void _initialize();
    void _deinitialize();
    void _queue(int command);
    void _work();
    void _handleCommands();
    static bool _startService(void* userData);
    static void _stopService();
    static void _notify(int state);
    static void _connectionStateChangedCb(bool connected, const char* remoteAddress, void* userData);

    std::thread _thread;
    platform::Mutex _mutex;
    std::condition_variable_any _condition;
    std::deque<int> _commandQueue GUARDED_BY(_mutex);
};
