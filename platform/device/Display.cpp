#include "device.h"

#include "state/Trees.h"
#include <StateKeys.h>

#include <algorithm>
#include <vector>

namespace {

constexpr int NONE = 0;
constexpr int INVALID_PARAMETER = -22;
constexpr int OPERATION_FAILED = -1;

struct Registration {
    device_changed_cb callback;
    platform::KeyTree::WatchId watch;
};

std::vector<Registration>& registrations()
{
    static std::vector<Registration> all;
    return all;
}

display_state_e currentState()
{
    const int state = platform::stateInt(platform::KEY_DISPLAY_STATE).value_or(DISPLAY_STATE_NORMAL);
    const bool known = state >= DISPLAY_STATE_NORMAL && state <= DISPLAY_STATE_SCREEN_OFF;
    return known ? static_cast<display_state_e>(state) : DISPLAY_STATE_NORMAL;
}

}

int device_display_get_state(display_state_e* state)
{
    if (state == nullptr)
        return INVALID_PARAMETER;
    *state = currentState();
    return NONE;
}

int device_add_callback(device_callback_e type, device_changed_cb callback, void* user_data)
{
    if (type != DEVICE_CALLBACK_DISPLAY_STATE || callback == nullptr)
        return INVALID_PARAMETER;
    const auto watch = platform::stateTree().watch(platform::KEY_DISPLAY_STATE, [=](const std::string&) {
        callback(type, reinterpret_cast<void*>(static_cast<intptr_t>(currentState())), user_data);
    });
    if (watch == 0)
        return OPERATION_FAILED;
    registrations().push_back({callback, watch});
    return NONE;
}

int device_remove_callback(device_callback_e type, device_changed_cb callback)
{
    auto& all = registrations();
    const auto found
        = std::find_if(all.begin(), all.end(), [&](const auto& entry) { return entry.callback == callback; });
    if (type != DEVICE_CALLBACK_DISPLAY_STATE || found == all.end())
        return INVALID_PARAMETER;
    platform::stateTree().unwatch(found->watch);
    all.erase(found);
    return NONE;
}
