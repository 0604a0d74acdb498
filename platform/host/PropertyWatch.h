// Follows properties of one D-Bus object: reads them at the start and hears their changes. Main loop only.
#pragma once

#include "BusInLoop.h"

#include <functional>
#include <string>
#include <vector>

namespace host {

class PropertyWatch {
public:
    // The value as text; values that are no text, number or truth value are not reported.
    using Changed = std::function<void(const std::string& name, const std::string& value)>;
    PropertyWatch(const char* service, const char* path, const char* interface, Changed changed)
        : _service(service)
        , _path(path)
        , _interface(interface)
        , _changed(std::move(changed))
    {
    }
    void start(BusInLoop* bus); // a null bus is no error
    void stop() { _slots.clear(); }

private:
    void _read(sd_bus_message* dictionary);

    std::string _service;
    std::string _path;
    std::string _interface;
    Changed _changed;
    std::vector<Slot> _slots;
};

}
