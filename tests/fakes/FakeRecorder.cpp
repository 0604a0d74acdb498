#include "fakes/Answer.h"

using fakes::recorder;

struct recorder_s { };

namespace {

recorder_s theRecorder;

void happen(const std::function<void()>& consequence)
{
    if (consequence)
        consequence();
}

}

extern "C" {

FAKE(recorder_create_audiorecorder, (recorder_h * handle), *handle = &theRecorder;
     recorder.state = RECORDER_STATE_CREATED)
FAKE(recorder_destroy, (recorder_h), )
FAKE(recorder_get_state, (recorder_h, recorder_state_e* state), *state = recorder.state)

FAKE(recorder_set_error_cb, (recorder_h, recorder_error_cb callback, void* data), recorder.error = callback;
     recorder.userData = data)
FAKE(
    recorder_set_interrupted_cb, (recorder_h, recorder_interrupted_cb callback, void*), recorder.interrupted = callback)
FAKE(recorder_set_state_changed_cb, (recorder_h, recorder_state_changed_cb, void*), )
FAKE(recorder_set_recording_limit_reached_cb, (recorder_h, recorder_recording_limit_reached_cb callback, void*),
    recorder.limitReached = callback)
FAKE(recorder_set_recording_status_cb, (recorder_h, recorder_recording_status_cb callback, void*),
    recorder.status = callback)
FAKE(recorder_unset_error_cb, (recorder_h), )
FAKE(recorder_unset_interrupted_cb, (recorder_h), )
FAKE(recorder_unset_state_changed_cb, (recorder_h), )
FAKE(recorder_unset_recording_limit_reached_cb, (recorder_h), )
FAKE(recorder_unset_recording_status_cb, (recorder_h), )

FAKE(recorder_attr_set_audio_device, (recorder_h, recorder_audio_device_e device), , device)
FAKE(recorder_set_audio_encoder, (recorder_h, recorder_audio_codec_e codec), , codec)
FAKE(recorder_set_file_format, (recorder_h, recorder_file_format_e format), , format)
FAKE(recorder_attr_set_audio_samplerate, (recorder_h, int value), , value)
FAKE(recorder_attr_set_audio_encoder_bitrate, (recorder_h, int value), , value)
FAKE(recorder_attr_set_size_limit, (recorder_h, int value), , value)
FAKE(recorder_attr_set_time_limit, (recorder_h, int value), , value)
FAKE(recorder_attr_set_audio_tuning, (recorder_h, int value), , value)
FAKE(recorder_attr_set_recording_type_tag, (recorder_h, int value), , value)
FAKE(recorder_set_filename, (recorder_h, const char* path), recorder.fileName = path, path)

FAKE(recorder_prepare, (recorder_h), recorder.state = RECORDER_STATE_READY)
FAKE(recorder_unprepare, (recorder_h), recorder.state = RECORDER_STATE_CREATED)
FAKE(recorder_start, (recorder_h), recorder.state = RECORDER_STATE_RECORDING; happen(recorder.onStart))
FAKE(recorder_pause, (recorder_h), recorder.state = RECORDER_STATE_PAUSED)
FAKE(recorder_commit, (recorder_h), recorder.state = RECORDER_STATE_READY; happen(recorder.onCommit))
FAKE(recorder_cancel, (recorder_h), recorder.state = RECORDER_STATE_READY)

FAKE(recorder_get_audio_level, (recorder_h, double* level), *level = recorder.level)
void recorder_set_watched(bool) { }
FAKE(recorder_is_in_recording, (int kind, bool* inRecording), *inRecording = recorder.someoneRecords && kind == 0, kind)

int recorder_rescue_leftovers(const char* path, recorder_leftover_cb callback, void* data)
{
    return recorder.onRescue ? recorder.onRescue(path, callback, data) : 0;
}
FAKE(recorder_check_temporary, (const char* path), , path)
FAKE(recorder_release_temporary, (const char* path), , path)
}
