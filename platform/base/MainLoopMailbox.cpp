#include "MainLoopMailbox.h"

#include "MainLoop.h"
#include "Mutex.h"

#include <deque>
#include <utility>

namespace platform {

struct MainLoopMailbox::Box {
    Mutex mutex;
    std::deque<std::function<void()>> calls GUARDED_BY(mutex);
    bool isScheduled GUARDED_BY(mutex) = false;
    bool isClosed GUARDED_BY(mutex) = false;

    std::function<void()> next()
    {
        const Lock lock(mutex);
        if (calls.empty()) {
            isScheduled = false;
            return {};
        }
        auto call = std::move(calls.front());
        calls.pop_front();
        return call;
    }
};

MainLoopMailbox::MainLoopMailbox()
    : _box(std::make_shared<Box>())
{
}

void MainLoopMailbox::post(std::function<void()> call)
{
    {
        const Lock lock(_box->mutex);
        if (_box->isClosed)
            return;
        _box->calls.push_back(std::move(call));
        if (std::exchange(_box->isScheduled, true))
            return;
    }
    // The mailbox may be gone by the time of the delivery, or go in the middle of it.
    const auto deliver = [waiting = std::weak_ptr<Box>(_box)] {
        const auto box = waiting.lock();
        if (!box)
            return;
        while (const auto next = box->next())
            next();
    };
    if (isOnMainLoop())
        later(deliver);
    else
        onMainLoop(deliver);
}

void MainLoopMailbox::call(std::function<void()> call)
{
    if (!isOnMainLoop())
        return post(std::move(call));
    {
        const Lock lock(_box->mutex);
        if (_box->isClosed)
            return;
    }
    call();
}

void MainLoopMailbox::close()
{
    const Lock lock(_box->mutex);
    _box->isClosed = true;
    _box->calls.clear();
}

}
