// The desktop's screen saver and locker as "memory/idle_lock/state".
#pragma once

#include "BusInLoop.h"
#include "KeySink.h"

#include <vector>

namespace host {

class ScreenSaverWatch {
public:
    explicit ScreenSaverWatch(KeySink sink)
        : _sink(std::move(sink))
    {
    }
    void start();
    void stop() { _slots.clear(); }

private:
    KeySink _sink;
    std::vector<Slot> _slots;
};

}
