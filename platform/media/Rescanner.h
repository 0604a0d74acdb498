#pragma once

#include <Mutex.h>

#include <condition_variable>
#include <functional>
#include <thread>

namespace media {

// Runs one piece of work on a thread of its own whenever it is asked to; requests during the work make one more run.
// The end waits for a running one.
class Rescanner {
public:
    explicit Rescanner(std::function<void()> work)
        : _work(std::move(work))
        , _thread([this](const std::stop_token& stop) { _run(stop); })
    {
    }

    void request()
    {
        const platform::Lock lock(_mutex);
        _requested = true;
        _condition.notify_one();
    }

private:
    void _run(const std::stop_token& stop)
    {
        platform::Lock lock(_mutex);
        while (_condition.wait(lock, stop, [this]() REQUIRES(_mutex) { return _requested; })) {
            _requested = false;
            lock.unlock();
            _work();
            lock.lock();
        }
    }

    std::function<void()> _work;
    platform::Mutex _mutex;
    std::condition_variable_any _condition;
    bool _requested GUARDED_BY(_mutex) = false;
    std::jthread _thread; // last: ends first
};

}
