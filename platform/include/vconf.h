// State keys: facts about the outside world, written by the host watchers, by companions or by hand
// (mewlo-tool state set). Reads and writes from any thread; callbacks on the main loop. 0 is success, -1 failure.
#pragma once

#define VCONFKEY_SYSMAN_MMC_STATUS "memory/sysman/mmc"
#define VCONFKEY_IDLE_LOCK_STATE "memory/idle_lock/state"
#define VCONFKEY_SYSMAN_POWER_OFF_STATUS "memory/sysman/power_off"
#define VCONFKEY_SETAPPL_PSMODE "db/setting/psmode"
#define VCONFKEY_SYSMAN_EARJACK "memory/sysman/earjack"
#define VCONFKEY_CALL_RECORDING_REJECT "memory/call/recording_reject"
#define VCONFKEY_SYSMAN_BATTERY_STATUS_LOW "memory/sysman/battery_status_low"
// Written by the application: what it records (recorder states 0 none, 1 ready, 2 recording, 3 paused) and the name of
// what is recorded or played. Remote controls show them, and the shut-down waits for a recording.
#define VCONFKEY_MEWLO_RECORDER_STATE "memory/mewlo/recorder_state"
#define VCONFKEY_MEWLO_TITLE "memory/mewlo/title"
#define VCONFKEY_PRIVATE_STORAGE_OPEN "memory/setting/personal" // bool
#define VCONFKEY_MEWLO_MICROPHONE "memory/mewlo/microphone" // 0 none there, 1 there

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
