#include "media/StepThread.h"

#include <thread>
#include <utility>

namespace media {

std::shared_ptr<StepThread> StepThread::create()
{
    std::shared_ptr<StepThread> self(new StepThread);
    std::thread([self] { self->_work(); }).detach();
    return self;
}

void StepThread::add(Step step)
{
    {
        const platform::Lock lock(_mutex);
        _steps.push_back(std::move(step));
    }
    _changed.notify_all();
}

bool StepThread::wait(std::chrono::milliseconds limit)
{
    platform::Lock lock(_mutex);
    return _changed.wait_for(lock, limit, [this]() REQUIRES(_mutex) { return _steps.empty() && !_isBusy; });
}

void StepThread::finish()
{
    {
        const platform::Lock lock(_mutex);
        _isFinished = true;
    }
    _changed.notify_all();
}

void StepThread::_work()
{
    platform::Lock lock(_mutex);
    for (;;) {
        _changed.wait(lock, [this]() REQUIRES(_mutex) { return !_steps.empty() || _isFinished; });
        if (_steps.empty())
            return;
        Step step = std::move(_steps.front());
        _steps.pop_front();
        _isBusy = true;
        lock.unlock();
        step();
        step = nullptr; // with what it holds, before anybody is told
        lock.lock();
        _isBusy = false;
        _changed.notify_all();
    }
}

}
