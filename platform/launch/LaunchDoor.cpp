#include "launch/LaunchDoor.h"

#include "launch/Identity.h"
#include "launch/Ports.h"

namespace platform {

namespace {

    LaunchReceivers& receivers()
    {
        static auto* all = new LaunchReceivers;
        return *all;
    }

    int launchCalled(sd_bus_message* call, void*, sd_bus_error* error)
    {
        bundle_s wire;
        if (!wire.readFrom(call))
            return sd_bus_error_set(error, SD_BUS_ERROR_INVALID_ARGS, "a{sas} expected");
        if (!receivers().launch)
            return sd_bus_error_set(error, SD_BUS_ERROR_NOT_SUPPORTED, "not an application");
        app_control_s request;
        request.fromWire(wire);
        if (sd_bus_message_get_expect_reply(call) > 0)
            request.pending = std::make_shared<PendingReply>(call);
        receivers().launch(request);
        return 1; // answered later through the request
    }

    int terminateCalled(sd_bus_message* call, void*, sd_bus_error*)
    {
        const int result = sd_bus_reply_method_return(call, nullptr);
        if (receivers().terminate)
            receivers().terminate();
        return result;
    }

    int messageCalled(sd_bus_message* call, void*, sd_bus_error* error)
    {
        const char* port = nullptr;
        bundle_s message;
        if (sd_bus_message_read_basic(call, SD_BUS_TYPE_STRING, &port) < 0 || !message.readFrom(call))
            return sd_bus_error_set(error, SD_BUS_ERROR_INVALID_ARGS, "s a{sas} expected");
        if (!deliverToPort(port, message))
            return sd_bus_error_setf(error, SD_BUS_ERROR_INVALID_ARGS, "no port %s", port);
        return sd_bus_reply_method_return(call, nullptr);
    }

    const sd_bus_vtable DOOR[] = {
        SD_BUS_VTABLE_START(0),
        SD_BUS_METHOD("Launch", "a{sas}", "ia{sas}", launchCalled, SD_BUS_VTABLE_UNPRIVILEGED),
        SD_BUS_METHOD("Terminate", "", "", terminateCalled, SD_BUS_VTABLE_UNPRIVILEGED),
        SD_BUS_METHOD("SendPortMessage", "sa{sas}", "", messageCalled, SD_BUS_VTABLE_UNPRIVILEGED),
        SD_BUS_VTABLE_END,
    };

}

void setLaunchReceivers(LaunchReceivers all) { receivers() = std::move(all); }

bool openLaunchDoor(sd_bus* bus)
{
    return sd_bus_add_object_vtable(bus, nullptr, OBJECT_PATH, INTERFACE, DOOR, nullptr) >= 0;
}

}
