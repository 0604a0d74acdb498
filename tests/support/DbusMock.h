// A mock of a daemon of the desktop (python-dbusmock) on a private bus, and calls to it.
#pragma once

#include "support/PrivateBus.h"

#include <systemd/sd-bus.h>

namespace support {

class DbusMock {
public:
    // The words after "python3 -m dbusmock", such as {"--template", "logind"}. Waits until the name is owned.
    DbusMock(const PrivateBus& bus, BusKind kind, const std::string& name, std::vector<std::string> arguments);
    ~DbusMock();
    DbusMock(const DbusMock&) = delete;
    DbusMock& operator=(const DbusMock&) = delete;

    static bool isInstalled();

    // Calls a method of the mock and waits; true when it succeeded.
    template <typename... Arguments>
    bool call(
        const std::string& path, const char* interface, const char* member, const char* types, Arguments... arguments)
    {
        sd_bus_message_unref(_last);
        _last = nullptr;
        return sd_bus_call_method(
                   _bus, _name.c_str(), path.c_str(), interface, member, nullptr, &_last, types, arguments...)
            >= 0;
    }
    // The mock's own interface.
    template <typename... Arguments>
    bool control(const std::string& path, const char* member, const char* types, Arguments... arguments)
    {
        return call(path, "org.freedesktop.DBus.Mock", member, types, arguments...);
    }
    // How often the method was called on the object.
    int callsOf(const std::string& path, const char* method);

private:
    std::string _name;
    Program _program;
    sd_bus* _bus = nullptr;
    sd_bus_message* _last = nullptr;
};

}
