#include "device/HostWatchers.h"

namespace platform {

void startHostWatchers() { }

void stopHostWatchers() { }

}
