// Decides where recordings live. Pure questions to the environment and the disk, nothing remembered.
#pragma once

#include <string>

namespace platform {

std::string resolveDeviceRoot();
std::string resolveCardRoot();
// Never inside the device root, nor around it: the application tells the two apart by path.
std::string resolvePrivateRoot(const std::string& deviceRoot);

}
