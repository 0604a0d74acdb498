// The warning level of UPower's display device as "memory/sysman/battery_status_low": 1 critical, 2 low, 3 normal.
#pragma once

#include "KeySink.h"
#include "PropertyWatch.h"

namespace host {

class BatteryWatch {
public:
    explicit BatteryWatch(KeySink sink);
    void start() { _properties.start(systemBus()); }
    void stop() { _properties.stop(); }

private:
    KeySink _sink;
    PropertyWatch _properties;
};

}
