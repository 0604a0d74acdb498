#include "media/LiveCall.h"

#include "state/Trees.h"
#include <StateKeys.h>

namespace media {

bool isCallLive(const host::PulseSnapshot& sound)
{
    return sound.hasCall || platform::stateInt(platform::KEY_CALL_STATUS).value_or(0) > 0;
}

}
