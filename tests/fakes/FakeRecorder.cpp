#include "fakes/Fakes.h"

using fakes::calls;
using fakes::recorder;

struct recorder_s { };

namespace {

recorder_s theRecorder;

// Records the call; on success the recorder takes the new state.
int enter(const char* call, recorder_state_e state)
{
    const int result = calls.record(call);
    if (result == 0)
        recorder.state = state;
    return result;
}

}

extern "C" {

int recorder_create_audiorecorder(recorder_h* handle)
{
    const int result = calls.record(__func__);
    if (result != 0)
        return result;
    *handle = &theRecorder;
    recorder.state = RECORDER_STATE_CREATED;
    return 0;
}

int recorder_destroy(recorder_h) { return calls.record(__func__); }

int recorder_get_state(recorder_h, recorder_state_e* state)
{
    *state = recorder.state;
    return calls.record(__func__);
}

int recorder_set_error_cb(recorder_h, recorder_error_cb callback, void* data)
{
    recorder.error = callback;
    recorder.userData = data;
    return calls.record(__func__);
}
int recorder_set_interrupted_cb(recorder_h, recorder_interrupted_cb callback, void*)
{
    recorder.interrupted = callback;
    return calls.record(__func__);
}
int recorder_set_state_changed_cb(recorder_h, recorder_state_changed_cb callback, void*)
{
    recorder.stateChanged = callback;
    return calls.record(__func__);
}
int recorder_set_recording_limit_reached_cb(recorder_h, recorder_recording_limit_reached_cb callback, void*)
{
    recorder.limitReached = callback;
    return calls.record(__func__);
}
int recorder_set_recording_status_cb(recorder_h, recorder_recording_status_cb callback, void*)
{
    recorder.status = callback;
    return calls.record(__func__);
}
int recorder_unset_error_cb(recorder_h) { return calls.record(__func__); }
int recorder_unset_interrupted_cb(recorder_h) { return calls.record(__func__); }
int recorder_unset_state_changed_cb(recorder_h) { return calls.record(__func__); }
int recorder_unset_recording_limit_reached_cb(recorder_h) { return calls.record(__func__); }
int recorder_unset_recording_status_cb(recorder_h) { return calls.record(__func__); }

int recorder_attr_set_audio_device(recorder_h, recorder_audio_device_e device)
{
    return calls.record(__func__, std::to_string(device));
}
int recorder_set_audio_encoder(recorder_h, recorder_audio_codec_e codec)
{
    return calls.record(__func__, std::to_string(codec));
}
int recorder_set_file_format(recorder_h, recorder_file_format_e format)
{
    return calls.record(__func__, std::to_string(format));
}
int recorder_attr_set_audio_samplerate(recorder_h, int value) { return calls.record(__func__, std::to_string(value)); }
int recorder_attr_set_audio_encoder_bitrate(recorder_h, int value)
{
    return calls.record(__func__, std::to_string(value));
}
int recorder_attr_set_size_limit(recorder_h, int value) { return calls.record(__func__, std::to_string(value)); }
int recorder_attr_set_time_limit(recorder_h, int value) { return calls.record(__func__, std::to_string(value)); }
int recorder_attr_set_audio_tuning(recorder_h, int value) { return calls.record(__func__, std::to_string(value)); }
int recorder_attr_set_recording_type_tag(recorder_h, int value)
{
    return calls.record(__func__, std::to_string(value));
}
int recorder_set_filename(recorder_h, const char* path)
{
    recorder.fileName = path;
    return calls.record(__func__, path);
}

int recorder_prepare(recorder_h) { return enter(__func__, RECORDER_STATE_READY); }
int recorder_unprepare(recorder_h) { return enter(__func__, RECORDER_STATE_CREATED); }
int recorder_start(recorder_h)
{
    const int result = enter(__func__, RECORDER_STATE_RECORDING);
    if (result == 0 && recorder.onStart)
        recorder.onStart();
    return result;
}
int recorder_pause(recorder_h) { return enter(__func__, RECORDER_STATE_PAUSED); }
int recorder_commit(recorder_h)
{
    const int result = enter(__func__, RECORDER_STATE_READY);
    if (result == 0 && recorder.onCommit)
        recorder.onCommit();
    return result;
}
int recorder_cancel(recorder_h) { return enter(__func__, RECORDER_STATE_READY); }

int recorder_get_audio_level(recorder_h, double* level)
{
    *level = recorder.level;
    return calls.record(__func__);
}
int recorder_is_in_recording(int kind, bool* inRecording)
{
    *inRecording = recorder.someoneRecords && kind == 0;
    return calls.record(__func__, std::to_string(kind));
}

int recorder_rescue_leftovers(const char* path, recorder_leftover_cb callback, void* data)
{
    const int result = calls.record(__func__, path);
    return result != 0 || !recorder.onRescue ? result : recorder.onRescue(path, callback, data);
}
int recorder_release_temporary(const char* path) { return calls.record(__func__, path); }
}
