#pragma once

#include "host/PulseWatch.h"

namespace media {

// Whether somebody is on the telephone: by the modem, or by a stream of that role. Any thread.
bool isCallLive(const host::PulseSnapshot& sound);

}
