// Open message ports of this process. Main loop only.
#pragma once

#include "launch/Bundle.h"

namespace platform {

bool deliverToPort(const std::string& port, const bundle_s& message); // false when no such port is open

}
