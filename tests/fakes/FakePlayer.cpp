#include "fakes/Answer.h"

using fakes::player;

struct player_s { };

namespace {

player_s thePlayer;

}

extern "C" {

FAKE(player_create, (player_h * handle), *handle = &thePlayer; player.state = PLAYER_STATE_IDLE)
FAKE(player_destroy, (player_h), player.state = PLAYER_STATE_NONE)
int player_get_state(player_h, player_state_e* state)
{
    *state = player.state;
    return 0;
}
FAKE(player_set_safety_volume, (player_h), )
FAKE(player_set_sound_type, (player_h, int type), , type)
FAKE(player_set_completed_cb, (player_h, player_completed_cb callback, void* data), player.completed = callback;
     player.userData = data)
FAKE(player_set_interrupted_cb, (player_h, player_interrupted_cb callback, void*), player.interrupted = callback)
FAKE(player_set_error_cb, (player_h, player_error_cb callback, void*), player.error = callback)
FAKE(player_set_uri, (player_h, const char* path), , path)
FAKE(player_prepare, (player_h), player.state = PLAYER_STATE_READY)
FAKE(player_unprepare, (player_h), player.state = PLAYER_STATE_IDLE)
FAKE(player_start, (player_h), player.state = PLAYER_STATE_PLAYING)
FAKE(player_pause, (player_h), player.state = PLAYER_STATE_PAUSED)
FAKE(player_stop, (player_h), player.state = PLAYER_STATE_READY)
FAKE(player_get_duration, (player_h, int* milliseconds), *milliseconds = player.duration)
FAKE(player_get_play_position, (player_h, int* milliseconds), *milliseconds = player.position)
FAKE(player_set_play_position, (player_h, int milliseconds, bool, player_seek_completed_cb callback, void*),
    player.seekCompleted = callback, milliseconds)
}
