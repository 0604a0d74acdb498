// One lasting desktop notification of low urgency with actions: the control surface of desktops where no window of ours
// can be one. Changed in place, without a sound. Main loop only.
#pragma once

// The notification itself was clicked.
#define NOTIFICATION_CONTROL_OPENED "default"

struct notification_control_action_s {
    const char* key;
    const char* label; // translated
};

// Support has come or gone.
typedef void (*notification_control_changed_cb)(void* user_data);
// With an action's key, or NOTIFICATION_CONTROL_OPENED. May post and withdraw.
typedef void (*notification_control_pressed_cb)(const char* key, void* user_data);

extern "C" {
// Finds out, now and whenever the desktop's notification service comes, whether it is supported. One watcher at a
// time. 0, or a negative error number when there is no session bus or somebody watches.
int notification_control_watch(notification_control_changed_cb changed, void* user_data);
// Takes away what is shown, too.
void notification_control_unwatch(void);
// Whether the service answers and offers actions; false until the answer is there.
bool notification_control_is_supported(void);
// Shows, or changes what is shown. Texts are plain, and copied. One that its user has closed comes back with the next
// change. A service that starts anew gets it anew. 0, or a negative error number when it is not supported.
int notification_control_post(const char* title, const char* text, const notification_control_action_s* actions,
    int count, notification_control_pressed_cb pressed, void* user_data);
// Without effect when nothing is shown.
void notification_control_withdraw(void);
}
