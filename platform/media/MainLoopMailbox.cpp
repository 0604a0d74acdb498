#include "media/MainLoopMailbox.h"

#include <Ecore.h>

#include <deque>
#include <mutex>
#include <utility>

namespace media {

struct MainLoopMailbox::Box {
    std::mutex mutex;
    std::deque<std::function<void()>> calls;
    bool scheduled = false;
    bool closed = false;

    std::function<void()> next()
    {
        const std::scoped_lock lock(mutex);
        if (calls.empty()) {
            scheduled = false;
            return {};
        }
        auto call = std::move(calls.front());
        calls.pop_front();
        return call;
    }
};

namespace {

    // The loop owns this record until it delivers; the mailbox may be gone by then.
    template <typename Box>
    void deliver(void* data)
    {
        const std::unique_ptr<std::weak_ptr<Box>> waiting(static_cast<std::weak_ptr<Box>*>(data));
        const auto box = waiting->lock();
        if (!box)
            return;
        while (auto call = box->next())
            call();
    }

}

MainLoopMailbox::MainLoopMailbox()
    : _box(std::make_shared<Box>())
{
}

void MainLoopMailbox::post(std::function<void()> call)
{
    {
        const std::scoped_lock lock(_box->mutex);
        if (_box->closed)
            return;
        _box->calls.push_back(std::move(call));
        if (std::exchange(_box->scheduled, true))
            return;
    }
    auto* waiting = new std::weak_ptr<Box>(_box);
    // On the main loop itself a thread-safe call would be made at once; a job waits for the next turn.
    if (eina_main_loop_is())
        ecore_job_add(deliver<Box>, waiting);
    else
        ecore_main_loop_thread_safe_call_async(deliver<Box>, waiting);
}

void MainLoopMailbox::close()
{
    const std::scoped_lock lock(_box->mutex);
    _box->closed = true;
    _box->calls.clear();
}

}
