// The play state shown to remote controls (Bluetooth AVRCP, MPRIS). Any thread; may block.
#pragma once

enum bt_error_e { BT_ERROR_NONE = 0, BT_ERROR_INVALID_PARAMETER = -22, BT_ERROR_NOT_INITIALIZED = -3 };
enum bt_avrcp_player_state_e {
    BT_AVRCP_PLAYER_STATE_STOPPED = 0,
    BT_AVRCP_PLAYER_STATE_PLAYING = 1,
    BT_AVRCP_PLAYER_STATE_PAUSED = 2,
};
typedef void (*bt_avrcp_target_connection_state_changed_cb)(
    bool connected, const char* remote_address, void* user_data);

extern "C" {
int bt_initialize(void);
int bt_deinitialize(void);
int bt_avrcp_target_initialize(bt_avrcp_target_connection_state_changed_cb callback, void* user_data);
int bt_avrcp_target_deinitialize(void);
int bt_avrcp_target_notify_player_state(bt_avrcp_player_state_e state);
}
