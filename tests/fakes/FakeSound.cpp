#include "fakes/Answer.h"

using fakes::sound;

struct sound_multi_session_s { };

namespace {

sound_multi_session_s theSession;

}

extern "C" {

FAKE(sound_manager_set_session_type, (sound_session_type_e type), , type)
FAKE(sound_manager_set_media_session_option,
    (sound_session_option_starting_e starting, sound_session_option_during_play_e during), , starting, during)
FAKE(sound_manager_set_current_sound_type, (sound_type_e type), , type)
FAKE(sound_manager_unset_current_sound_type, (void), )

FAKE(sound_manager_multi_session_create, (int type, sound_multi_session_h* session), *session = &theSession, type)
FAKE(sound_manager_multi_session_set_option, (sound_multi_session_h, int option), , option)
FAKE(sound_manager_multi_session_set_mode, (sound_multi_session_h, int mode), , mode)
FAKE(sound_manager_multi_session_destroy, (sound_multi_session_h), )

int sound_manager_get_active_route(sound_device_in_e* in, sound_device_out_e* out)
{
    if (in != nullptr)
        *in = SOUND_DEVICE_IN_MIC;
    if (out != nullptr)
        *out = sound.route;
    return fakes::answer(__func__);
}
FAKE(sound_manager_set_active_device_changed_cb, (sound_manager_active_device_changed_cb callback, void* data),
     sound.deviceChanged = callback;
     sound.userData = data)
FAKE(sound_manager_unset_active_device_changed_cb, (void), )
}
