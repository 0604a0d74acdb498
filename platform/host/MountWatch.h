// Removable storage: the first writable mount below /run/media/<user> or /media/<user> is the memory card.
// "memory/storage/card_path" and "memory/sysman/mmc" (1 mounted, 0 none), in this order.
#pragma once

#include "KeySink.h"

#include <MainLoopMailbox.h>

#include <memory>
#include <optional>
#include <string>
#include <thread>
#include <vector>

namespace host {

class MountWatch {
public:
    // The places where cards are mounted; empty for the user's usual ones.
    explicit MountWatch(KeySink sink, std::vector<std::string> places = {});
    ~MountWatch() { stop(); }
    MountWatch(const MountWatch&) = delete;
    MountWatch& operator=(const MountWatch&) = delete;
    void start();
    void stop();

    // The mount point of the card in a table of the kernel's mountinfo format.
    static std::optional<std::string> findCard(const std::string& table, const std::vector<std::string>& places);

private:
    void _poll(int table, int end, platform::MainLoopMailbox& mailbox); // the thread
    void _report();

    KeySink _sink;
    std::vector<std::string> _places;
    std::thread _thread;
    int _end[2] = {-1, -1}; // pipe; closing it ends the thread
    std::unique_ptr<platform::MainLoopMailbox> _mailbox; // from start to stop
};

}
