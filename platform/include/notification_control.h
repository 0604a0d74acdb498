// One lasting desktop notification of low urgency with actions: the control surface of desktops where no window of ours
// can be one. Updated in place, without sound. Main loop only.
#pragma once

// An action key given at the post, or NOTIFICATION_CONTROL_OPENED (the notification itself was clicked), or
// NOTIFICATION_CONTROL_DISMISSED (the user closed it; the next post shows it again).
typedef void (*notification_control_cb)(const char* action, void* user_data);
#define NOTIFICATION_CONTROL_OPENED "default"
#define NOTIFICATION_CONTROL_DISMISSED "dismissed"

struct notification_control_action_s {
    const char* key;
    const char* label; // translated
};

extern "C" {
// Whether the desktop's notification service answers and offers actions. Asked once, again when its owner changes;
// false until the answer is there.
bool notification_control_is_supported(void);
// Shows, or changes what is shown. Texts are copied. The callback may call post and withdraw. 0, or a negative error
// number.
int notification_control_post(const char* title, const char* text, const notification_control_action_s* actions,
    int count, notification_control_cb callback, void* user_data);
// Takes it away and forgets the callback. Without effect when nothing is shown.
void notification_control_withdraw(void);
}
