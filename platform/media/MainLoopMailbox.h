#pragma once

#include <functional>
#include <memory>

namespace media {

// Hands calls from any thread to the main loop, in order. Never waits for the loop and never calls at once, so it may
// be used while a lock is held. Nothing is delivered after close() or the destructor when those run on the main loop.
class MainLoopMailbox {
public:
    MainLoopMailbox();
    ~MainLoopMailbox() { close(); }
    MainLoopMailbox(const MainLoopMailbox&) = delete;
    MainLoopMailbox& operator=(const MainLoopMailbox&) = delete;

    void post(std::function<void()> call);
    void close();

private:
    struct Box;
    std::shared_ptr<Box> _box;
};

}
