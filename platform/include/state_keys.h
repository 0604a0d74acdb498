// State keys and preferences as a whole, for the command-line tool. Main loop for watching, any thread otherwise.
#pragma once

extern "C" {
typedef void (*state_key_cb)(const char* key, const char* value, bool pinned, void* user_data);
typedef void (*power_lock_cb)(int process, const char* locks, void* user_data);

// All keys in order with their present values.
void state_keys_list(state_key_cb callback, void* user_data);
void preference_keys_list(state_key_cb callback, void* user_data);
// Every later change; the value is null when the key was removed. 0 is success. One watcher at a time, null ends it.
int state_keys_watch(state_key_cb callback, void* user_data);

// A pinned value hides whatever the desktop reports until it is unpinned. 0 is success, -1 failure.
int state_key_pin(const char* key, const char* value);
int state_key_unpin(const char* key);
// Any text, as it stands. Newly allocated (free), null when absent.
int preference_key_set(const char* key, const char* value);
char* preference_key_get(const char* key);

// The power locks held by every living process, such as "cpu display_dim".
void power_locks_list(power_lock_cb callback, void* user_data);

// Where the usage log lies; newly allocated (free).
char* usage_log_path(void);
}
