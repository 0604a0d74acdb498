#include <recorder.h>

#include <preference.h>

#include "host/PulseWatch.h"
#include "media/Recorder.h"

#include <new>

struct recorder_s : media::Recorder { };

namespace {

constexpr int KIND_AUDIO = 0;

// Changes one setting of a recorder at rest.
template <typename Change>
int change(recorder_h recorder, bool isValid, const Change& apply)
{
    if (recorder == nullptr || !isValid)
        return RECORDER_ERROR_INVALID_PARAMETER;
    auto* settings = recorder->settings();
    if (settings == nullptr)
        return RECORDER_ERROR_INVALID_STATE;
    apply(*settings);
    return RECORDER_ERROR_NONE;
}

template <typename Slot, typename Function>
int setCallback(recorder_h recorder, Slot media::RecorderCallbacks::*slot, Function function, void* data)
{
    if (recorder == nullptr || function == nullptr)
        return RECORDER_ERROR_INVALID_PARAMETER;
    recorder->callbacks().*slot = {function, data};
    return RECORDER_ERROR_NONE;
}

template <typename Slot>
int unsetCallback(recorder_h recorder, Slot media::RecorderCallbacks::*slot)
{
    if (recorder == nullptr)
        return RECORDER_ERROR_INVALID_PARAMETER;
    recorder->callbacks().*slot = {};
    return RECORDER_ERROR_NONE;
}

int run(recorder_h recorder, int (media::Recorder::*operation)())
{
    return recorder != nullptr ? (recorder->*operation)() : static_cast<int>(RECORDER_ERROR_INVALID_PARAMETER);
}

}

using media::RecorderCallbacks;
using media::RecorderSettings;

int recorder_create_audiorecorder(recorder_h* recorder)
{
    if (recorder == nullptr)
        return RECORDER_ERROR_INVALID_PARAMETER;
    *recorder = new (std::nothrow) recorder_s;
    return *recorder != nullptr ? RECORDER_ERROR_NONE : RECORDER_ERROR_OUT_OF_MEMORY;
}

int recorder_destroy(recorder_h recorder)
{
    if (recorder == nullptr)
        return RECORDER_ERROR_INVALID_PARAMETER;
    delete recorder;
    return RECORDER_ERROR_NONE;
}

int recorder_get_state(recorder_h recorder, recorder_state_e* state)
{
    if (recorder == nullptr || state == nullptr)
        return RECORDER_ERROR_INVALID_PARAMETER;
    *state = recorder->state();
    return RECORDER_ERROR_NONE;
}

int recorder_set_error_cb(recorder_h recorder, recorder_error_cb callback, void* user_data)
{
    return setCallback(recorder, &RecorderCallbacks::error, callback, user_data);
}

int recorder_unset_error_cb(recorder_h recorder) { return unsetCallback(recorder, &RecorderCallbacks::error); }

int recorder_set_interrupted_cb(recorder_h recorder, recorder_interrupted_cb callback, void* user_data)
{
    return setCallback(recorder, &RecorderCallbacks::interrupted, callback, user_data);
}

int recorder_unset_interrupted_cb(recorder_h recorder)
{
    return unsetCallback(recorder, &RecorderCallbacks::interrupted);
}

int recorder_set_state_changed_cb(recorder_h recorder, recorder_state_changed_cb callback, void* user_data)
{
    return setCallback(recorder, &RecorderCallbacks::stateChanged, callback, user_data);
}

int recorder_unset_state_changed_cb(recorder_h recorder)
{
    return unsetCallback(recorder, &RecorderCallbacks::stateChanged);
}

int recorder_set_recording_limit_reached_cb(
    recorder_h recorder, recorder_recording_limit_reached_cb callback, void* user_data)
{
    return setCallback(recorder, &RecorderCallbacks::limitReached, callback, user_data);
}

int recorder_unset_recording_limit_reached_cb(recorder_h recorder)
{
    return unsetCallback(recorder, &RecorderCallbacks::limitReached);
}

int recorder_set_recording_status_cb(recorder_h recorder, recorder_recording_status_cb callback, void* user_data)
{
    return setCallback(recorder, &RecorderCallbacks::status, callback, user_data);
}

int recorder_unset_recording_status_cb(recorder_h recorder)
{
    return unsetCallback(recorder, &RecorderCallbacks::status);
}

int recorder_attr_set_audio_device(recorder_h recorder, recorder_audio_device_e device)
{
    return change(recorder, device == RECORDER_AUDIO_DEVICE_MIC, [](RecorderSettings&) {});
}

int recorder_set_audio_encoder(recorder_h recorder, recorder_audio_codec_e codec)
{
    return change(recorder, codec == RECORDER_AUDIO_CODEC_AMR || codec == RECORDER_AUDIO_CODEC_AAC,
        [codec](RecorderSettings& settings) { settings.codec = codec; });
}

int recorder_set_file_format(recorder_h recorder, recorder_file_format_e format)
{
    return change(recorder, format == RECORDER_FILE_FORMAT_MP4 || format == RECORDER_FILE_FORMAT_AMR,
        [format](RecorderSettings& settings) { settings.format = format; });
}

int recorder_attr_set_audio_samplerate(recorder_h recorder, int hertz)
{
    return change(recorder, hertz > 0, [hertz](RecorderSettings& settings) { settings.sampleRate = hertz; });
}

int recorder_attr_set_audio_encoder_bitrate(recorder_h recorder, int bits_per_second)
{
    return change(recorder, bits_per_second > 0,
        [bits_per_second](RecorderSettings& settings) { settings.bitRate = bits_per_second; });
}

int recorder_attr_set_size_limit(recorder_h recorder, int kilobytes)
{
    return change(
        recorder, kilobytes >= 0, [kilobytes](RecorderSettings& settings) { settings.sizeLimitKb = kilobytes; });
}

int recorder_attr_set_time_limit(recorder_h recorder, int seconds)
{
    return change(recorder, seconds >= 0, [seconds](RecorderSettings& settings) { settings.timeLimit = seconds; });
}

// Tuning and tag choose sound processing and file notes of phones that have them.
int recorder_attr_set_audio_tuning(recorder_h recorder, int)
{
    return change(recorder, true, [](RecorderSettings&) {});
}

int recorder_attr_set_recording_type_tag(recorder_h recorder, int)
{
    return change(recorder, true, [](RecorderSettings&) {});
}

int recorder_set_filename(recorder_h recorder, const char* path)
{
    return change(
        recorder, path != nullptr && *path != '\0', [path](RecorderSettings& settings) { settings.path = path; });
}

int recorder_prepare(recorder_h recorder) { return run(recorder, &media::Recorder::prepare); }

int recorder_unprepare(recorder_h recorder) { return run(recorder, &media::Recorder::unprepare); }

int recorder_start(recorder_h recorder) { return run(recorder, &media::Recorder::start); }

int recorder_pause(recorder_h recorder) { return run(recorder, &media::Recorder::pause); }

int recorder_commit(recorder_h recorder) { return run(recorder, &media::Recorder::commit); }

int recorder_cancel(recorder_h recorder) { return run(recorder, &media::Recorder::cancel); }

int recorder_get_audio_level(recorder_h recorder, double* level)
{
    if (recorder == nullptr || level == nullptr)
        return RECORDER_ERROR_INVALID_PARAMETER;
    *level = recorder->level();
    return RECORDER_ERROR_NONE;
}

void recorder_set_watched(bool watched) { media::Recorder::setWatched(watched); }

int recorder_is_in_recording(int kind, bool* in_recording)
{
    if (in_recording == nullptr)
        return RECORDER_ERROR_INVALID_PARAMETER;
    const auto sound = host::PulseWatch::instance().refresh();
    bool isStrict = false;
    (void)preference_get_boolean(PREFERENCE_STRICT_RECORDERS, &isStrict);
    *in_recording = kind == KIND_AUDIO && (isStrict ? sound.othersListen : sound.othersRecord);
    return RECORDER_ERROR_NONE;
}
