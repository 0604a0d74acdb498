// Settings of the desktop. Main loop only.
#pragma once

enum system_settings_key_e {
    SYSTEM_SETTINGS_KEY_LOCALE_TIMEFORMAT_24HOUR = 14,
    SYSTEM_SETTINGS_KEY_LOCALE_TIMEZONE = 15,
    SYSTEM_SETTINGS_KEY_TIME_CHANGED = 16,
};
// The time zone of the C library, where it has no name; i18n_udate_create takes it as one.
#define SYSTEM_SETTINGS_TIMEZONE_LOCAL "localtime"

typedef void (*system_settings_changed_cb)(system_settings_key_e key, void* user_data);

extern "C" {
int system_settings_get_value_bool(system_settings_key_e key, bool* value);
int system_settings_get_value_string(system_settings_key_e key, char** value);
int system_settings_set_changed_cb(system_settings_key_e key, system_settings_changed_cb callback, void* user_data);
int system_settings_unset_changed_cb(system_settings_key_e key);
}
