#include "ScreenSaverWatch.h"

#include <StateKeys.h>

namespace host {

void ScreenSaverWatch::start()
{
    BusInLoop* bus = sessionBus();
    if (bus == nullptr)
        return;
    for (const char* interface : {"org.gnome.ScreenSaver", "org.freedesktop.ScreenSaver"})
        _slots.push_back(
            onSignal(bus->get(), nullptr, nullptr, interface, "ActiveChanged", [this](sd_bus_message* message) {
                int active = 0;
                if (sd_bus_message_read(message, "b", &active) >= 0)
                    _sink(VCONFKEY_IDLE_LOCK_STATE, active != 0 ? "1" : "0");
            }));
}

}
