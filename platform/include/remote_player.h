// What remote controls (MPRIS) show of playback beside its state, and their wish to go to another place. While nothing
// is played the callbacks are not asked, and while a recording runs only the position is: its length so far. Main loop,
// except remote_player_seeked. Milliseconds.
#pragma once

typedef struct {
    char title[256]; // UTF-8
    int duration; // 0 when unknown
} remote_player_track_s;

typedef struct {
    bool (*track)(remote_player_track_s* track, void* user_data); // false: none
    int (*position)(void* user_data);
    void (*seek)(int position, void* user_data); // within the duration
} remote_player_callbacks_s;

extern "C" {
// The callbacks are copied; null forgets them.
int remote_player_set_callbacks(const remote_player_callbacks_s* callbacks, void* user_data);
// Playback has jumped to another place. Any thread.
int remote_player_seeked(int position);
}
