#pragma once

#include <condition_variable>
#include <functional>
#include <mutex>
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
        const std::lock_guard lock(_mutex);
        _requested = true;
        _condition.notify_one();
    }

private:
    void _run(const std::stop_token& stop)
    {
        std::unique_lock lock(_mutex);
        while (_condition.wait(lock, stop, [this] { return _requested; })) {
            _requested = false;
            lock.unlock();
            _work();
            lock.lock();
        }
    }

    std::function<void()> _work;
    std::mutex _mutex;
    std::condition_variable_any _condition;
    bool _requested = false;
    std::jthread _thread; // last: ends first
};

}
