#include "PropertyWatch.h"

namespace host {

namespace {

    constexpr auto PROPERTIES = "org.freedesktop.DBus.Properties";

}

void PropertyWatch::start(BusInLoop* bus)
{
    if (bus == nullptr)
        return;
    _slots.push_back(onSignal(
        bus->get(), _service.c_str(), _path.c_str(), PROPERTIES, "PropertiesChanged", [this](sd_bus_message* message) {
            const char* interface = nullptr;
            if (sd_bus_message_read(message, "s", &interface) >= 0 && _interface == interface)
                _read(message);
        }));
    const Message call = newCall(bus->get(), _service.c_str(), _path.c_str(), PROPERTIES, "GetAll");
    if (call == nullptr || sd_bus_message_append(call.get(), "s", _interface.c_str()) < 0)
        return;
    _slots.push_back(callAsync(bus->get(), call, [this](sd_bus_message* reply) {
        if (sd_bus_message_is_method_error(reply, nullptr) <= 0)
            _read(reply);
    }));
}

void PropertyWatch::_read(sd_bus_message* dictionary)
{
    forEachProperty(dictionary, [this](const std::string& name, sd_bus_message* value) {
        if (const auto text = anyText(value))
            _changed(name, *text);
    });
}

}
