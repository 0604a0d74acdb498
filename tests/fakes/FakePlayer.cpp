#include "fakes/Fakes.h"

using fakes::calls;
using fakes::player;

struct player_s { };

namespace {

player_s thePlayer;

int enter(const char* call, player_state_e state)
{
    const int result = calls.record(call);
    if (result == 0)
        player.state = state;
    return result;
}

}

extern "C" {

int player_create(player_h* handle)
{
    const int result = enter(__func__, PLAYER_STATE_IDLE);
    if (result == 0)
        *handle = &thePlayer;
    return result;
}
int player_destroy(player_h) { return enter(__func__, PLAYER_STATE_NONE); }
int player_get_state(player_h, player_state_e* state)
{
    *state = player.state;
    return 0;
}
int player_set_safety_volume(player_h) { return calls.record(__func__); }
int player_set_sound_type(player_h, int type) { return calls.record(__func__, std::to_string(type)); }
int player_set_completed_cb(player_h, player_completed_cb callback, void* data)
{
    player.completed = callback;
    player.userData = data;
    return calls.record(__func__);
}
int player_set_interrupted_cb(player_h, player_interrupted_cb callback, void*)
{
    player.interrupted = callback;
    return calls.record(__func__);
}
int player_set_error_cb(player_h, player_error_cb callback, void*)
{
    player.error = callback;
    return calls.record(__func__);
}
int player_set_uri(player_h, const char* path) { return calls.record(__func__, path); }
int player_prepare(player_h) { return enter(__func__, PLAYER_STATE_READY); }
int player_unprepare(player_h) { return enter(__func__, PLAYER_STATE_IDLE); }
int player_start(player_h) { return enter(__func__, PLAYER_STATE_PLAYING); }
int player_pause(player_h) { return enter(__func__, PLAYER_STATE_PAUSED); }
int player_stop(player_h) { return enter(__func__, PLAYER_STATE_READY); }
int player_get_duration(player_h, int* milliseconds)
{
    *milliseconds = player.duration;
    return calls.record(__func__);
}
int player_get_play_position(player_h, int* milliseconds)
{
    *milliseconds = player.position;
    return calls.record(__func__);
}
int player_set_play_position(player_h, int milliseconds, bool, player_seek_completed_cb callback, void*)
{
    player.seekCompleted = callback;
    return calls.record(__func__, std::to_string(milliseconds));
}
}
