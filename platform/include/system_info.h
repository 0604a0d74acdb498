// The device model: MEWLO_MODEL, else what the firmware says. Newly allocated (free). Any thread.
#pragma once

#define SYSTEM_INFO_KEY_MODEL "model_name"

extern "C" {
int system_info_get_platform_string(const char* key, char** value);
}
