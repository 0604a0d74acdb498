#include "launch/Ports.h"

#include "host/BusInLoop.h"
#include "launch/Identity.h"
#include "launch/LaunchDoor.h"
#include "message_port.h"
#include <MainLoop.h>

#include <map>

namespace {

struct Port {
    int id;
    message_port_message_cb callback;
    void* userData;
};

std::map<std::string, Port>& ports()
{
    static std::map<std::string, Port> all;
    return all;
}

bool isAddress(const char* appId, const char* port)
{
    return appId != nullptr && platform::isAppId(appId) && port != nullptr && *port != '\0';
}

// From a worker the main loop's connection is out of reach, and waiting for the main loop is forbidden.
bool isOpen(const std::string& name)
{
    if (!platform::isOnMainLoop())
        return host::hasOwnerOnSessionBus(name.c_str());
    host::BusInLoop* bus = host::sessionBus();
    return bus != nullptr && host::hasOwner(bus->get(), name.c_str());
}

bool sendNow(const std::string& name, const std::string& port, const bundle_s& message)
{
    host::BusInLoop* bus = host::sessionBus();
    if (bus == nullptr)
        return false;
    const auto call
        = host::newCall(bus->get(), name.c_str(), platform::OBJECT_PATH, platform::INTERFACE, "SendPortMessage");
    if (call == nullptr || sd_bus_message_append_basic(call.get(), SD_BUS_TYPE_STRING, port.c_str()) < 0
        || !message.appendTo(call.get()))
        return false;
    sd_bus_message_set_auto_start(call.get(), 0);
    return host::send(bus->get(), call);
}

}

bool platform::deliverToPort(const std::string& port, const bundle_s& message)
{
    const auto found = ports().find(port);
    if (found == ports().end())
        return false;
    const Port target = found->second;
    target.callback(target.id, &message, target.userData);
    return true;
}

int message_port_check_remote_port(const char* app_id, const char* port)
{
    if (!isAddress(app_id, port))
        return MESSAGE_PORT_ERROR_INVALID_PARAMETER;
    return isOpen(platform::portNameOf(app_id, port)) ? MESSAGE_PORT_ERROR_NONE : MESSAGE_PORT_ERROR_PORT_NOT_FOUND;
}

int message_port_send_message(const char* app_id, const char* port, bundle* message)
{
    if (!isAddress(app_id, port) || message == nullptr)
        return MESSAGE_PORT_ERROR_INVALID_PARAMETER;
    const std::string name = platform::portNameOf(app_id, port);
    if (!isOpen(name))
        return MESSAGE_PORT_ERROR_PORT_NOT_FOUND;
    if (platform::isOnMainLoop())
        return sendNow(name, port, *message) ? MESSAGE_PORT_ERROR_NONE : MESSAGE_PORT_ERROR_IO_ERROR;
    const bool posted
        = platform::onMainLoop([=, text = std::string(port), copy = *message] { sendNow(name, text, copy); });
    return posted ? MESSAGE_PORT_ERROR_NONE : MESSAGE_PORT_ERROR_IO_ERROR;
}

int message_port_register(const char* port, message_port_message_cb callback, void* user_data)
{
    if (port == nullptr || *port == '\0' || callback == nullptr)
        return MESSAGE_PORT_ERROR_INVALID_PARAMETER;
    host::BusInLoop* bus = host::sessionBus();
    if (bus == nullptr)
        return MESSAGE_PORT_ERROR_IO_ERROR;
    if (ports().empty())
        platform::openLaunchDoor(bus->get()); // refused when it is open already
    const std::string name = platform::portNameOf(platform::appId(), port);
    if (!ports().contains(port) && sd_bus_request_name(bus->get(), name.c_str(), 0) < 0)
        return MESSAGE_PORT_ERROR_IO_ERROR;
    static int lastId = 0;
    ports()[port] = {++lastId, callback, user_data};
    return lastId;
}
