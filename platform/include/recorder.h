// The audio recorder. Operations may be called from any thread, one at a time for a handle; callbacks arrive on the
// main loop. Times are milliseconds, sizes bytes, levels decibels below full scale (-300 to 0), limits kilobytes and
// seconds. While a recording runs a size journal beside the file keeps every captured frame rescuable.
#pragma once

typedef struct recorder_s* recorder_h;

enum recorder_error_e : int {
    RECORDER_ERROR_NONE = 0,
    RECORDER_ERROR_INVALID_PARAMETER = -22,
    RECORDER_ERROR_OUT_OF_MEMORY = -12,
    RECORDER_ERROR_PERMISSION_DENIED = -13,
    RECORDER_ERROR_DEVICE = static_cast<int>(0xFE6B0014u),
    RECORDER_ERROR_INVALID_STATE = static_cast<int>(0xFE6B0015u),
    RECORDER_ERROR_INVALID_OPERATION = static_cast<int>(0xFE6B0016u),
    RECORDER_ERROR_SECURITY_RESTRICTED = static_cast<int>(0xFE6B0017u),
    RECORDER_ERROR_SOUND_POLICY_BY_CALL = static_cast<int>(0xFE6B0018u),
    RECORDER_ERROR_SOUND_POLICY_BY_ALARM = static_cast<int>(0xFE6B0019u),
    RECORDER_ERROR_ESD = static_cast<int>(0xFE6B001Au),
    RECORDER_ERROR_OUT_OF_STORAGE = static_cast<int>(0xFE6B001Bu),
    RECORDER_ERROR_STORAGE = static_cast<int>(0xFE6B001Cu), // it fails, but the recording goes on
};
enum recorder_state_e {
    RECORDER_STATE_NONE,
    RECORDER_STATE_CREATED,
    RECORDER_STATE_READY,
    RECORDER_STATE_RECORDING,
    RECORDER_STATE_PAUSED
};
// What recordings of speech are made with: hertz and bits per second.
inline constexpr int RECORDER_AAC_SAMPLE_RATE = 44100;
inline constexpr int RECORDER_AAC_BIT_RATE = 288000;
inline constexpr int RECORDER_AMR_SAMPLE_RATE = 8000; // AMR knows no other
inline constexpr int RECORDER_AMR_BIT_RATE = 12200;

enum recorder_audio_device_e { RECORDER_AUDIO_DEVICE_MIC = 0 };
enum recorder_audio_codec_e { RECORDER_AUDIO_CODEC_AMR = 0, RECORDER_AUDIO_CODEC_AAC = 1 };
enum recorder_file_format_e { RECORDER_FILE_FORMAT_MP4 = 1, RECORDER_FILE_FORMAT_AMR = 2 };
enum recorder_recording_limit_type_e {
    RECORDER_RECORDING_LIMIT_TIME,
    RECORDER_RECORDING_LIMIT_SIZE,
    RECORDER_RECORDING_LIMIT_FREE_SPACE
};
enum recorder_policy_e {
    RECORDER_POLICY_NONE,
    RECORDER_POLICY_SOUND,
    RECORDER_POLICY_DEVICE_LOST,
    RECORDER_POLICY_STORAGE
};

typedef void (*recorder_error_cb)(int error, recorder_state_e state, void* user_data);
typedef void (*recorder_interrupted_cb)(
    recorder_policy_e policy, recorder_state_e previous, recorder_state_e current, void* user_data);
typedef void (*recorder_state_changed_cb)(
    recorder_state_e previous, recorder_state_e current, bool by_policy, void* user_data);
typedef void (*recorder_recording_limit_reached_cb)(recorder_recording_limit_type_e type, void* user_data);
typedef void (*recorder_recording_status_cb)(unsigned long long elapsed, unsigned long long file_size, void* user_data);

extern "C" {
int recorder_create_audiorecorder(recorder_h* recorder);
// A recording that still runs is ended and left beside its journal for a later rescue, never deleted.
int recorder_destroy(recorder_h recorder);
int recorder_get_state(recorder_h recorder, recorder_state_e* state);

int recorder_set_error_cb(recorder_h recorder, recorder_error_cb callback, void* user_data);
int recorder_unset_error_cb(recorder_h recorder);
// An interruption is reported after the file is complete and the recorder back in the ready state.
int recorder_set_interrupted_cb(recorder_h recorder, recorder_interrupted_cb callback, void* user_data);
int recorder_unset_interrupted_cb(recorder_h recorder);
int recorder_set_state_changed_cb(recorder_h recorder, recorder_state_changed_cb callback, void* user_data);
int recorder_unset_state_changed_cb(recorder_h recorder);
int recorder_set_recording_limit_reached_cb(
    recorder_h recorder, recorder_recording_limit_reached_cb callback, void* user_data);
int recorder_unset_recording_limit_reached_cb(recorder_h recorder);
int recorder_set_recording_status_cb(recorder_h recorder, recorder_recording_status_cb callback, void* user_data);
int recorder_unset_recording_status_cb(recorder_h recorder);

int recorder_attr_set_audio_device(recorder_h recorder, recorder_audio_device_e device);
int recorder_set_audio_encoder(recorder_h recorder, recorder_audio_codec_e codec);
int recorder_set_file_format(recorder_h recorder, recorder_file_format_e format);
int recorder_attr_set_audio_samplerate(recorder_h recorder, int hertz);
int recorder_attr_set_audio_encoder_bitrate(recorder_h recorder, int bits_per_second);
int recorder_attr_set_size_limit(recorder_h recorder, int kilobytes);
int recorder_attr_set_time_limit(recorder_h recorder, int seconds);
int recorder_attr_set_audio_tuning(recorder_h recorder, int tuning);
int recorder_attr_set_recording_type_tag(recorder_h recorder, int tag);
// The temporary file. A file of an earlier run found there is moved aside by recorder_start, never overwritten.
int recorder_set_filename(recorder_h recorder, const char* path);

int recorder_prepare(recorder_h recorder);
int recorder_unprepare(recorder_h recorder);
// Starts or resumes. A start returns when the first sample has been captured or the reason why it cannot be is known.
int recorder_start(recorder_h recorder);
int recorder_pause(recorder_h recorder);
// Completes the file (its index written and flushed) and returns to the ready state.
int recorder_commit(recorder_h recorder);
// Ends and deletes the recording.
int recorder_cancel(recorder_h recorder);
// Whether somebody watches the recording: without, its status is told five times a second instead of with every bit of
// sound. For all recorders of the process; true at first.
void recorder_set_watched(bool watched);
// The largest peak since the last read, -300 to 0.
int recorder_get_audio_level(recorder_h recorder, double* level);
// Whether another recorder captures sound now (with PREFERENCE_STRICT_RECORDERS, any program). Kind 0 is audio, 1 video
// (always false: no such query).
int recorder_is_in_recording(int kind, bool* in_recording);
}
