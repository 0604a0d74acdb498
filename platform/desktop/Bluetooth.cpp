// Bluetooth headsets follow the MPRIS object: the desktop's Bluetooth service takes the state from there.
#include "bluetooth.h"

#include "desktop/RemoteControl.h"
#include <MainLoop.h>

#include <atomic>

namespace {

std::atomic<bool> initialized{false};
std::atomic<bool> targetInitialized{false};

}

int bt_initialize(void)
{
    initialized = true;
    return BT_ERROR_NONE;
}

int bt_deinitialize(void) { return initialized.exchange(false) ? BT_ERROR_NONE : BT_ERROR_NOT_INITIALIZED; }

int bt_avrcp_target_initialize(bt_avrcp_target_connection_state_changed_cb callback, void*)
{
    if (callback == nullptr)
        return BT_ERROR_INVALID_PARAMETER;
    if (!initialized)
        return BT_ERROR_NOT_INITIALIZED;
    targetInitialized = true;
    return BT_ERROR_NONE;
}

int bt_avrcp_target_deinitialize(void)
{
    return targetInitialized.exchange(false) ? BT_ERROR_NONE : BT_ERROR_NOT_INITIALIZED;
}

int bt_avrcp_target_notify_player_state(bt_avrcp_player_state_e state)
{
    if (state < BT_AVRCP_PLAYER_STATE_STOPPED || state > BT_AVRCP_PLAYER_STATE_PAUSED)
        return BT_ERROR_INVALID_PARAMETER;
    if (!targetInitialized)
        return BT_ERROR_NOT_INITIALIZED;
    platform::onMainLoop([=] { platform::RemoteControl::instance().setPlayerState(state); });
    return BT_ERROR_NONE;
}
