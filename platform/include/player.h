// The media player. Main loop only; the seek-completed callback may come from another thread. Milliseconds.
#pragma once

typedef struct player_s* player_h;

enum player_error_e : int {
    PLAYER_ERROR_NONE = 0,
    PLAYER_ERROR_OUT_OF_MEMORY = -12,
    PLAYER_ERROR_INVALID_PARAMETER = -22,
    PLAYER_ERROR_NO_SUCH_FILE = -2,
    PLAYER_ERROR_INVALID_OPERATION = -38,
    PLAYER_ERROR_FILE_NO_SPACE_ON_DEVICE = -28,
    PLAYER_ERROR_PERMISSION_DENIED = -13,
    PLAYER_ERROR_FEATURE_NOT_SUPPORTED_ON_DEVICE = -95,
    PLAYER_ERROR_SEEK_FAILED = static_cast<int>(0xFE690001u),
    PLAYER_ERROR_INVALID_STATE = static_cast<int>(0xFE690002u),
    PLAYER_ERROR_NOT_SUPPORTED_FILE = static_cast<int>(0xFE690003u),
    PLAYER_ERROR_INVALID_URI = static_cast<int>(0xFE690004u),
    PLAYER_ERROR_SOUND_POLICY = static_cast<int>(0xFE690005u),
    PLAYER_ERROR_CONNECTION_FAILED = static_cast<int>(0xFE690006u),
    PLAYER_ERROR_VIDEO_CAPTURE_FAILED = static_cast<int>(0xFE690007u),
    PLAYER_ERROR_DRM_EXPIRED = static_cast<int>(0xFE690008u),
    PLAYER_ERROR_DRM_NO_LICENSE = static_cast<int>(0xFE690009u),
    PLAYER_ERROR_DRM_FUTURE_USE = static_cast<int>(0xFE69000Au),
    PLAYER_ERROR_DRM_NOT_PERMITTED = static_cast<int>(0xFE69000Bu),
    PLAYER_ERROR_RESOURCE_LIMIT = static_cast<int>(0xFE69000Cu),
};
enum player_state_e {
    PLAYER_STATE_NONE,
    PLAYER_STATE_IDLE,
    PLAYER_STATE_READY,
    PLAYER_STATE_PLAYING,
    PLAYER_STATE_PAUSED
};
enum player_interrupted_code_e {
    PLAYER_INTERRUPTED_COMPLETED = 0,
    PLAYER_INTERRUPTED_BY_MEDIA = 1,
    PLAYER_INTERRUPTED_BY_CALL = 2,
    PLAYER_INTERRUPTED_BY_EARJACK_UNPLUG = 3,
    PLAYER_INTERRUPTED_BY_RESOURCE_CONFLICT = 4,
    PLAYER_INTERRUPTED_BY_ALARM = 5,
    PLAYER_INTERRUPTED_BY_EMERGENCY = 6,
    PLAYER_INTERRUPTED_BY_NOTIFICATION = 7,
};
typedef void (*player_completed_cb)(void* user_data);
typedef void (*player_interrupted_cb)(player_interrupted_code_e code, void* user_data);
typedef void (*player_error_cb)(int error, void* user_data);
typedef void (*player_seek_completed_cb)(void* user_data);

extern "C" {
int player_create(player_h* player);
int player_destroy(player_h player);
int player_get_state(player_h player, player_state_e* state);
int player_set_safety_volume(player_h player);
int player_set_sound_type(player_h player, int sound_type);
int player_set_completed_cb(player_h player, player_completed_cb callback, void* user_data);
int player_set_interrupted_cb(player_h player, player_interrupted_cb callback, void* user_data);
int player_set_error_cb(player_h player, player_error_cb callback, void* user_data);
int player_set_uri(player_h player, const char* path);
int player_prepare(player_h player);
int player_unprepare(player_h player);
int player_start(player_h player);
int player_pause(player_h player);
int player_stop(player_h player);
// 0 when the file does not tell it.
int player_get_duration(player_h player, int* milliseconds);
int player_get_play_position(player_h player, int* milliseconds);
int player_set_play_position(
    player_h player, int milliseconds, bool accurate, player_seek_completed_cb callback, void* user_data);
}
