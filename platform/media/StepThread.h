#pragma once

#include <Mutex.h>

#include <chrono>
#include <condition_variable>
#include <deque>
#include <functional>
#include <memory>

namespace media {

// Runs steps one after the other in a thread of its own, for work that may hang: nobody has to wait for its end, not
// even the owner. Any thread.
class StepThread : public std::enable_shared_from_this<StepThread> {
public:
    using Step = std::function<void()>;

    static std::shared_ptr<StepThread> create();
    void add(Step step);
    // Waits until all steps so far are done; answers whether that was in time.
    bool wait(std::chrono::milliseconds limit);
    // The thread ends with the steps added so far.
    void finish();

private:
    StepThread() = default;
    void _work();

    platform::Mutex _mutex;
    std::condition_variable_any _changed;
    std::deque<Step> _steps GUARDED_BY(_mutex);
    bool _isBusy GUARDED_BY(_mutex) = false;
    bool _isFinished GUARDED_BY(_mutex) = false;
};

}
