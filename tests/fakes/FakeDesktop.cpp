#include "fakes/Answer.h"

#include <bluetooth.h>
#include <callmgr.h>
#include <device.h>
#include <message_port.h>
#include <notification.h>
#include <tovanic_log_manager.h>

using fakes::desktop;

struct tovanic_log_manager_s { };

namespace {

std::mutex messageMutex;
tovanic_log_manager_s theManager;

std::string field(bundle* record, const char* key)
{
    const char* value = bundle_get_str(record, key);
    return std::string(key) + "=" + (value != nullptr ? value : "-");
}

}

extern "C" {

FAKE(media_key_reserve, (media_key_event_cb callback, void* data), desktop.mediaKey = callback;
     desktop.mediaKeyData = data)
FAKE(media_key_release, (void), )

int remote_player_set_callbacks(const remote_player_callbacks_s* callbacks, void* data)
{
    desktop.remote = callbacks != nullptr ? *callbacks : remote_player_callbacks_s{};
    desktop.remoteData = data;
    return 0;
}
FAKE(remote_player_seeked, (int position), desktop.seekedTo = position)

FAKE(bt_initialize, (void), )
FAKE(bt_deinitialize, (void), )
FAKE(bt_avrcp_target_initialize, (bt_avrcp_target_connection_state_changed_cb, void*), )
FAKE(bt_avrcp_target_deinitialize, (void), )
FAKE(bt_avrcp_target_notify_player_state, (bt_avrcp_player_state_e state), , state)

FAKE(message_port_check_remote_port, (const char*, const char*), )
FAKE(message_port_send_message, (const char* application, const char* port, bundle* message),
    desktop.indicator.push_back(bundle_get_str(message, "mewlo_indicator_data")), application, port)
int message_port_register(const char*, message_port_message_cb, void*) { return 1; }

int notification_status_message_post(const char* message)
{
    const std::lock_guard lock(messageMutex);
    desktop.lastMessage = message;
    return fakes::answer("post", message);
}
const char* notification_status_message_last(void) { return desktop.lastMessage.c_str(); }

FAKE(device_power_request_lock, (power_lock_e lock, int), , lock)
FAKE(device_power_release_lock, (power_lock_e lock), , lock)
FAKE(device_power_wakeup, (bool), )
FAKE(device_display_get_state, (display_state_e * state), *state = DISPLAY_STATE_NORMAL)
FAKE(device_add_callback, (device_callback_e, device_changed_cb, void*), )
FAKE(device_remove_callback, (device_callback_e, device_changed_cb), )

FAKE(cm_init, (cm_client_h * client), *client = nullptr)
FAKE(cm_get_call_status, (cm_client_h, cm_call_status_e* status),
    *status = static_cast<cm_call_status_e>(desktop.liveCalls))
FAKE(cm_deinit, (cm_client_h), )

FAKE(tovanic_log_manager_create, (tovanic_log_manager_h * manager), *manager = &theManager)
int tovanic_log_manager_insert(
    tovanic_log_manager_h, const char*, bundle* record, tovanic_log_manager_cb, void*, int* request)
{
    *request = 1;
    return fakes::answer(
        "usage", field(record, "app_id"), field(record, "feature"), field(record, "extra"), field(record, "value"));
}
FAKE(tovanic_log_manager_destroy, (tovanic_log_manager_h), )
}
