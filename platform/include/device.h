// Power locks and the display. Locks may be taken and released from any thread; they are counted by kind (a second
// request is no second lock). Callbacks on the main loop.
#pragma once

enum power_lock_e { POWER_LOCK_CPU = 0, POWER_LOCK_DISPLAY = 1, POWER_LOCK_DISPLAY_DIM = 2 };
enum display_state_e { DISPLAY_STATE_NORMAL = 0, DISPLAY_STATE_SCREEN_DIM = 1, DISPLAY_STATE_SCREEN_OFF = 2 };
enum device_callback_e { DEVICE_CALLBACK_DISPLAY_STATE = 3 };
// For the display state the value is a display_state_e, cast to a pointer.
typedef void (*device_changed_cb)(device_callback_e type, void* value, void* user_data);

extern "C" {
// A time-out of 0 milliseconds holds the lock until it is released.
int device_power_request_lock(power_lock_e lock, int timeout);
int device_power_release_lock(power_lock_e lock);
int device_power_wakeup(bool dim);
int device_display_get_state(display_state_e* state);
int device_add_callback(device_callback_e type, device_changed_cb callback, void* user_data);
int device_remove_callback(device_callback_e type, device_changed_cb callback);
}
