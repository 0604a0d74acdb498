// The receiving side of launch requests: the object that others call, on the session bus and on an inherited
// socket. Main loop only. One set of receivers for the process, set before anything is exported.
#pragma once

#include "launch/AppControl.h"

#include <functional>
#include <string>

namespace platform {

struct LaunchReceivers {
    std::function<void(app_control_s& request)> launch;
    std::function<void()> terminate;
};

void setLaunchReceivers(LaunchReceivers receivers);
// Exports the object on the connection, for as long as the connection lives.
bool openLaunchDoor(sd_bus* bus);

}
