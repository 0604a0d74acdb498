#pragma once

#include <Mutex.h>

#include <condition_variable>
#include <deque>
#include <memory>
#include <thread>

#include "MwAppController.h"

struct MwAppController::AsyncRequest {
    Command command;
    Result result;
    AsyncCallback callback;
    void* userData;
    bool exit; // ends the worker instead of being a command
};

// The command worker: a queue and the thread that executes it, one command at a time under the command mutex, which is
// only let go while the thread waits. Whoever needs the worker's commands not to run takes that mutex.
class MwAppController::AsyncCmdControl {
public:
    using Execute = std::function<void(std::unique_ptr<AsyncRequest> request)>;

    AsyncCmdControl(platform::RecursiveMutex& commandMutex, Execute execute);
    // Executes what is queued, then ends the thread.
    ~AsyncCmdControl();
    AsyncCmdControl(const AsyncCmdControl&) = delete;
    AsyncCmdControl& operator=(const AsyncCmdControl&) = delete;

    // Drops a request whose command already waits at the head of the queue.
    void queue(std::unique_ptr<AsyncRequest> request);

private:
    void _work();

    platform::RecursiveMutex& _mutex;
    Execute _execute;
    std::condition_variable_any _condition;
    std::deque<std::unique_ptr<AsyncRequest>> _queue GUARDED_BY(_mutex);
    std::thread _thread;
};
