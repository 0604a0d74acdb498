#include "support/PrivateBus.h"

#include "host/BusInLoop.h"

#include <cstdlib>

#include <systemd/sd-bus.h>

namespace support {

namespace {

    bool isOwned(const std::string& address, const std::string& name)
    {
        sd_bus* bus = nullptr;
        sd_bus_new(&bus);
        sd_bus_set_address(bus, address.c_str());
        sd_bus_set_bus_client(bus, 1);
        const bool owned = sd_bus_start(bus) >= 0 && host::hasOwner(bus, name.c_str());
        sd_bus_close(bus);
        sd_bus_unref(bus);
        return owned;
    }

    std::string configuration(const std::string& socket)
    {
        return "<!DOCTYPE busconfig PUBLIC \"-//freedesktop//DTD D-Bus Bus Configuration 1.0//EN\" "
               "\"http://www.freedesktop.org/standards/dbus/1.0/busconfig.dtd\"><busconfig><type>session</type>"
               "<listen>unix:path="
            + socket
            + "</listen><policy context=\"default\"><allow send_destination=\"*\" eavesdrop=\"true\"/>"
              "<allow eavesdrop=\"true\"/><allow own=\"*\"/></policy></busconfig>";
    }

}

PrivateBus::PrivateBus(BusKind kind)
    : _variable(kind == BusKind::SESSION ? "DBUS_SESSION_BUS_ADDRESS" : "DBUS_SYSTEM_BUS_ADDRESS")
{
    const std::string socket = _directory.file("bus");
    writeFile(_directory.file("bus.conf"), configuration(socket));
    _daemon = Program({"dbus-daemon", "--nofork", "--config-file=" + _directory.file("bus.conf")});
    _address = "unix:path=" + socket;
    // The socket appears before anybody listens on it.
    waitFor([&] { return isOwned(_address, "org.freedesktop.DBus"); }, 20.0);
    const char* before = ::getenv(_variable);
    _before = before != nullptr ? before : "";
    ::setenv(_variable, _address.c_str(), 1);
}

PrivateBus::~PrivateBus() { ::setenv(_variable, _before.c_str(), 1); }

bool PrivateBus::waitForName(const std::string& name, double limit) const
{
    return waitFor([&] { return isOwned(_address, name); }, limit);
}

void PrivateBus::stop() { _daemon.end(); }

}
