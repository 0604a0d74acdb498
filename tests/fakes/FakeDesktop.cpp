#include "fakes/Fakes.h"

#include <bluetooth.h>
#include <callmgr.h>
#include <device.h>
#include <message_port.h>
#include <notification.h>
#include <tovanic_log_manager.h>

using fakes::calls;
using fakes::desktop;

namespace {

std::mutex messageMutex;

std::string field(bundle* record, const char* key)
{
    const char* value = bundle_get_str(record, key);
    return std::string(key) + "=" + (value != nullptr ? value : "-");
}

}

struct cm_client_s { };
struct tovanic_log_manager_s { };

extern "C" {

int media_key_reserve(media_key_event_cb callback, void* data)
{
    desktop.mediaKey = callback;
    desktop.mediaKeyData = data;
    return calls.record(__func__);
}
int media_key_release(void) { return calls.record(__func__); }

int remote_player_set_callbacks(const remote_player_callbacks_s* callbacks, void* data)
{
    desktop.remote = callbacks != nullptr ? *callbacks : remote_player_callbacks_s{};
    desktop.remoteData = data;
    return 0;
}
int remote_player_seeked(int position)
{
    desktop.seekedTo = position;
    return 0;
}

int bt_initialize(void) { return calls.record(__func__); }
int bt_deinitialize(void) { return calls.record(__func__); }
int bt_avrcp_target_initialize(bt_avrcp_target_connection_state_changed_cb, void*) { return calls.record(__func__); }
int bt_avrcp_target_deinitialize(void) { return calls.record(__func__); }
int bt_avrcp_target_notify_player_state(bt_avrcp_player_state_e state)
{
    return calls.record(__func__, std::to_string(state));
}

int message_port_check_remote_port(const char*, const char*) { return calls.record(__func__); }
int message_port_send_message(const char* application, const char* port, bundle* message)
{
    const std::string value = bundle_get_str(message, "mewlo_indicator_data");
    desktop.indicator.push_back(value);
    return calls.record(__func__, std::string(application) + " " + port);
}
int message_port_register(const char*, message_port_message_cb, void*) { return 1; }

int notification_status_message_post(const char* message)
{
    const std::lock_guard lock(messageMutex);
    desktop.lastMessage = message;
    return calls.record("post", message);
}
const char* notification_status_message_last(void) { return desktop.lastMessage.c_str(); }

int device_power_request_lock(power_lock_e lock, int) { return calls.record(__func__, std::to_string(lock)); }
int device_power_release_lock(power_lock_e lock) { return calls.record(__func__, std::to_string(lock)); }
int device_power_wakeup(bool) { return calls.record(__func__); }
int device_display_get_state(display_state_e* state)
{
    *state = DISPLAY_STATE_NORMAL;
    return calls.record(__func__);
}
int device_add_callback(device_callback_e, device_changed_cb, void*) { return calls.record(__func__); }
int device_remove_callback(device_callback_e, device_changed_cb) { return calls.record(__func__); }

int cm_init(cm_client_h* client)
{
    *client = nullptr;
    return calls.record(__func__);
}
int cm_get_call_status(cm_client_h, cm_call_status_e* status)
{
    *status = static_cast<cm_call_status_e>(desktop.liveCalls);
    return calls.record(__func__);
}
int cm_deinit(cm_client_h) { return calls.record(__func__); }

int tovanic_log_manager_create(tovanic_log_manager_h* manager)
{
    static tovanic_log_manager_s theManager;
    *manager = &theManager;
    return calls.record(__func__);
}
int tovanic_log_manager_insert(
    tovanic_log_manager_h, const char*, bundle* record, tovanic_log_manager_cb, void*, int* request)
{
    *request = 1;
    return calls.record("usage",
        field(record, "app_id") + " " + field(record, "feature") + " " + field(record, "extra") + " "
            + field(record, "value"));
}
int tovanic_log_manager_destroy(tovanic_log_manager_h) { return calls.record(__func__); }
}
