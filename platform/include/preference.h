// Preferences of the package: survive restarts and power cuts, shared by all its instances. Reads and writes from
// any thread; change callbacks on the main loop, also for unchanged values and for writes of this process.
#pragma once

enum preference_error_e {
    PREFERENCE_ERROR_NONE = 0,
    PREFERENCE_ERROR_INVALID_PARAMETER = -22,
    PREFERENCE_ERROR_NO_KEY = -126,
    PREFERENCE_ERROR_IO_ERROR = -5
};
typedef void (*preference_changed_cb)(const char* key, void* user_data);

// Whether, and how, the user has set up the private storage: 0 not at all. Told to every session as a state key.
#define PREFERENCE_PRIVATE_METHOD "PrivateStorageMethod"
// Whether any program that listens counts as another recorder, which refuses a start.
#define PREFERENCE_STRICT_RECORDERS "StrictRecorders"
// Whether a notification with buttons shows a recording in the background where a control window could.
#define PREFERENCE_USE_NOTIFICATION_CONTROL "UseNotificationControl"

extern "C" {
int preference_get_int(const char* key, int* value);
int preference_set_int(const char* key, int value);
int preference_get_boolean(const char* key, bool* value);
int preference_set_boolean(const char* key, bool value);
int preference_set_changed_cb(const char* key, preference_changed_cb callback, void* user_data);
int preference_unset_changed_cb(const char* key, preference_changed_cb callback);
}
