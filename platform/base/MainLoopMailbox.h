#pragma once

#include <functional>
#include <memory>

namespace platform {

// Hands calls from any thread to the main loop, in order. Never waits for the loop, so it may be used while a lock is
// held. Nothing is delivered after close() or the destructor when those run on the main loop.
class MainLoopMailbox {
public:
    MainLoopMailbox();
    ~MainLoopMailbox() { close(); }
    MainLoopMailbox(const MainLoopMailbox&) = delete;
    MainLoopMailbox& operator=(const MainLoopMailbox&) = delete;

    // Never calls at once.
    void post(std::function<void()> call);
    // Calls at once on the main loop, also before what was posted.
    void call(std::function<void()> call);
    void close();

private:
    struct Box;
    std::shared_ptr<Box> _box;
};

}
