// Recordings that a crash or a power cut left unfinished. The recorder holds a lock on the journal beside its
// temporary file from start until recorder_release_temporary, so one program never takes another's running (or
// finished but not yet saved) recording for a leftover. Any thread.
#pragma once

#include <recorder.h>

enum recorder_leftover_e {
    RECORDER_LEFTOVER_REBUILT, // an ordinary, complete file again
    RECORDER_LEFTOVER_EMPTY, // nothing had been captured; files removed
    RECORDER_LEFTOVER_BEYOND_RESCUE, // kept aside under another hidden name
};

// path: the rebuilt file, still under a hidden name of its own in the same directory, flushed; the application moves
// it to its final place. sidecar: the application's own notes found beside it (null when none); delete it when done.
// Both are borrowed for the call.
typedef void (*recorder_leftover_cb)(recorder_leftover_e outcome, const char* path, recorder_file_format_e format,
    int duration_ms, const char* sidecar, void* user_data);

extern "C" {
// Rebuilds every leftover of temporary_path (the temporary file itself unless a live process holds it, and files that
// an earlier start moved aside) and reports each. Answers the number of leftovers found or a negative error.
int recorder_rescue_leftovers(const char* temporary_path, recorder_leftover_cb callback, void* user_data);
// The application's notes about a running recording: "<temporary path>.notes". They travel with the recording when it
// is moved aside.
#define RECORDER_NOTES_SUFFIX ".notes"
// Whether the recording that this process made there is complete: RECORDER_ERROR_NONE, or an error when its completion
// failed. Then it is neither to be moved nor released, so that a rescue finds it with its journal.
int recorder_check_temporary(const char* temporary_path);
// Ends this process's claim on the temporary path after its file was moved away or deleted: removes the journal.
int recorder_release_temporary(const char* temporary_path);
}
