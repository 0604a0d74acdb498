// Sound arbitration: sessions, the current sound type, routes. Any thread; the device callback may come from a thread
// of the service.
#pragma once

enum sound_manager_error_e : int {
    SOUND_MANAGER_ERROR_NONE = 0,
    SOUND_MANAGER_ERROR_OUT_OF_MEMORY = -12,
    SOUND_MANAGER_ERROR_INVALID_PARAMETER = -22,
    SOUND_MANAGER_ERROR_INVALID_OPERATION = -38,
    SOUND_MANAGER_ERROR_PERMISSION_DENIED = -13,
    SOUND_MANAGER_ERROR_NOT_SUPPORTED = -95,
    SOUND_MANAGER_ERROR_NO_DATA = -61,
    SOUND_MANAGER_ERROR_INTERNAL = static_cast<int>(0xFE6A0001u),
    SOUND_MANAGER_ERROR_POLICY = static_cast<int>(0xFE6A0002u),
    SOUND_MANAGER_ERROR_NO_PLAYING_SOUND = static_cast<int>(0xFE6A0003u),
    SOUND_MANAGER_ERROR_NO_OPERATION = static_cast<int>(0xFE6A0004u),
    SOUND_MANAGER_ERROR_POLICY_BLOCKED_BY_CALL = static_cast<int>(0xFE6A0005u),
    SOUND_MANAGER_ERROR_POLICY_BLOCKED_BY_ALARM = static_cast<int>(0xFE6A0006u),
    SOUND_MANAGER_ERROR_CAPTURE_ONLY = static_cast<int>(0xFE6A0007u),
};
enum sound_type_e { SOUND_TYPE_MEDIA = 4 };
enum sound_session_type_e { SOUND_SESSION_TYPE_MEDIA = 0 };
enum sound_session_option_starting_e {
    SOUND_SESSION_OPTION_MIX_WITH_OTHERS_WHEN_START = 0,
    SOUND_SESSION_OPTION_PAUSE_OTHERS_WHEN_START = 1
};
enum sound_session_option_during_play_e { SOUND_SESSION_OPTION_INTERRUPTIBLE_DURING_PLAY = 0 };
enum sound_device_in_e { SOUND_DEVICE_IN_NONE = 0, SOUND_DEVICE_IN_MIC = 1, SOUND_DEVICE_IN_WIRED_ACCESSORY = 2 };
enum sound_device_out_e {
    SOUND_DEVICE_OUT_NONE = 0,
    SOUND_DEVICE_OUT_SPEAKER = 1,
    SOUND_DEVICE_OUT_WIRED_ACCESSORY = 2
};
typedef struct sound_multi_session_s* sound_multi_session_h;
typedef void (*sound_manager_active_device_changed_cb)(sound_device_in_e in, sound_device_out_e out, void* user_data);

extern "C" {
int sound_manager_set_session_type(sound_session_type_e type);
int sound_manager_set_media_session_option(
    sound_session_option_starting_e starting, sound_session_option_during_play_e during_play);
int sound_manager_set_current_sound_type(sound_type_e type);
int sound_manager_unset_current_sound_type(void);

// A recording session. Setting option or mode is where a call or an alarm refuses it.
int sound_manager_multi_session_create(int type, sound_multi_session_h* session);
int sound_manager_multi_session_set_option(sound_multi_session_h session, int option);
int sound_manager_multi_session_set_mode(sound_multi_session_h session, int mode);
int sound_manager_multi_session_destroy(sound_multi_session_h session);

// Either pointer may be null.
int sound_manager_get_active_route(sound_device_in_e* in, sound_device_out_e* out);
int sound_manager_set_active_device_changed_cb(sound_manager_active_device_changed_cb callback, void* user_data);
int sound_manager_unset_active_device_changed_cb(void);
}
