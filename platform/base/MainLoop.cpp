#include "MainLoop.h"

#include <Ecore.h>

#include <memory>

namespace platform {

namespace {

    void runAndDelete(void* data)
    {
        const std::unique_ptr<std::function<void()>> task(static_cast<std::function<void()>*>(data));
        (*task)();
    }

}

// This event type exists exactly while Ecore is initialised.
bool isMainLoopUp() { return ECORE_EXE_EVENT_ADD != 0; }

bool isOnMainLoop() { return isMainLoopUp() && eina_main_loop_is() == EINA_TRUE; }

bool onMainLoop(std::function<void()> task)
{
    if (!isMainLoopUp())
        return false;
    if (isOnMainLoop())
        task();
    else
        ecore_main_loop_thread_safe_call_async(runAndDelete, new std::function<void()>(std::move(task)));
    return true;
}

void later(std::function<void()> task) { ecore_job_add(runAndDelete, new std::function<void()>(std::move(task))); }

}
