// Media keys: the keyboard's, a headset's, the lock screen's and any MPRIS controller's. One receiver at a time.
// Main loop only.
#pragma once

enum media_key_e {
    MEDIA_KEY_PLAY = 0,
    MEDIA_KEY_STOP = 1,
    MEDIA_KEY_PAUSE = 2,
    MEDIA_KEY_PREVIOUS = 3,
    MEDIA_KEY_NEXT = 4,
    MEDIA_KEY_FASTFORWARD = 5,
    MEDIA_KEY_REWIND = 6,
    MEDIA_KEY_PLAYPAUSE = 7,
    MEDIA_KEY_MEDIA = 8,
    MEDIA_KEY_RECORD = 9,
};
enum media_key_event_e { MEDIA_KEY_STATUS_PRESSED = 0, MEDIA_KEY_STATUS_RELEASED = 1 };
typedef void (*media_key_event_cb)(media_key_e key, media_key_event_e status, void* user_data);

extern "C" {
int media_key_reserve(media_key_event_cb callback, void* user_data);
int media_key_release(void);
}
