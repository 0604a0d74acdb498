#include "MwAsyncCmdControl.h"

#include "MwLog.h"

MwAppController::AsyncCmdControl::AsyncCmdControl(platform::RecursiveMutex& commandMutex, Execute execute)
    : _mutex(commandMutex)
    , _execute(std::move(execute))
    , _thread([this] { _work(); })
{
}

MwAppController::AsyncCmdControl::~AsyncCmdControl()
{
    {
        const platform::Lock lock(_mutex);
        auto request = std::make_unique<AsyncRequest>();
        request->exit = true;
        _queue.push_back(std::move(request));
        _condition.notify_one();
    }
    _thread.join();
}

void MwAppController::AsyncCmdControl::queue(std::unique_ptr<AsyncRequest> request)
{
    const platform::Lock lock(_mutex);
    if (!_queue.empty() && !_queue.front()->exit && _queue.front()->command == request->command) {
        MW_LOGI("same as previous command. so skip this");
        return;
    }
    _queue.push_back(std::move(request));
    _condition.notify_one();
}

void MwAppController::AsyncCmdControl::_work()
{
    MW_LOGI("async command control worker callback");
    platform::Lock lock(_mutex);
    for (;;) {
        _condition.wait(lock, [this]() REQUIRES(_mutex) { return !_queue.empty(); });
        std::unique_ptr<AsyncRequest> request = std::move(_queue.front());
        _queue.pop_front();
        if (request->exit) {
            MW_LOGI("request exit asyncCommand");
            return;
        }
        _execute(std::move(request));
    }
}
