#include "BatteryWatch.h"

#include <StateKeys.h>

namespace host {

namespace {

    // UPower: 0 unknown, 1 none, 2 discharging, 3 low, 4 critical, 5 action.
    const char* levelOf(const std::string& warning)
    {
        if (warning == "4" || warning == "5")
            return "1";
        return warning == "3" ? "2" : "3";
    }

}

BatteryWatch::BatteryWatch(KeySink sink)
    : _sink(std::move(sink))
    , _properties("org.freedesktop.UPower", "/org/freedesktop/UPower/devices/DisplayDevice",
          "org.freedesktop.UPower.Device", [this](const std::string& name, const std::string& value) {
              if (name == "WarningLevel")
                  _sink(VCONFKEY_SYSMAN_BATTERY_STATUS_LOW, levelOf(value));
          })
{
}

}
