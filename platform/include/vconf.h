// State keys: facts about the outside world, written by the host watchers, by companions or by hand
// (mewlo-tool state set). Reads and writes from any thread; callbacks on the main loop. 0 is success, -1 failure.
#pragma once

#include <StateKeys.h>

typedef struct keynode_s keynode_t;
typedef void (*vconf_callback_fn)(keynode_t* node, void* user_data);

extern "C" {
int vconf_get_int(const char* key, int* value);
int vconf_set_int(const char* key, int value);
int vconf_get_bool(const char* key, int* value);
int vconf_set_bool(const char* key, int value);
// Newly allocated, null when absent.
char* vconf_get_str(const char* key);
int vconf_set_str(const char* key, const char* value);
int vconf_notify_key_changed(const char* key, vconf_callback_fn callback, void* user_data);
int vconf_ignore_key_changed(const char* key, vconf_callback_fn callback);
// The value a callback was called with; 0 when it is no number.
int vconf_keynode_get_int(const keynode_t* node);
}
