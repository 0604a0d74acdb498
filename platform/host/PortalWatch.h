// Settings of the desktop from its portal: "db/setting/theme" (dark, light) and "db/setting/clock_24h" (0, 1).
#pragma once

#include "BusInLoop.h"
#include "KeySink.h"

#include <vector>

namespace host {

class PortalWatch {
public:
    explicit PortalWatch(KeySink sink)
        : _sink(std::move(sink))
    {
    }
    void start();
    void stop() { _slots.clear(); }

private:
    void _read(const char* space, const char* key);
    void _report(const std::string& space, const std::string& key, const std::string& value);

    KeySink _sink;
    std::vector<Slot> _slots;
};

}
