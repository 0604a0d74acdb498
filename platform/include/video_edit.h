// Cuts a time range out of a recording into a new file of the same kind, without decoding it. One export of the process
// at a time, on a thread of its own; operations from any thread, callbacks on the engine's thread. Times are
// milliseconds.
#pragma once

enum video_edit_error_e : int {
    VIDEO_EDIT_ERROR_NONE = 0,
    VIDEO_EDIT_ERROR_INVALID_PARAMETER = -22,
    VIDEO_EDIT_ERROR_INVALID_STATE = -38,
    VIDEO_EDIT_ERROR_NOT_SUPPORTED = -95, // of a kind that cannot be cut
    VIDEO_EDIT_ERROR_DAMAGED = -74, // the source, or what was written does not open or is not as long as asked for
    VIDEO_EDIT_ERROR_OUT_OF_STORAGE = -28,
    VIDEO_EDIT_ERROR_CANCELLED = -125,
    VIDEO_EDIT_ERROR_IO = -5,
};
enum video_edit_state_e {
    VIDEO_EDIT_STATE_NONE = 0,
    VIDEO_EDIT_STATE_INITIALIZED = 1,
    VIDEO_EDIT_STATE_PREPARED = 2,
    VIDEO_EDIT_STATE_EXPORTING = 3,
    VIDEO_EDIT_STATE_END_OF_STREAM = 6, // the export is complete and on the storage
};
enum video_edit_project_e { VIDEO_EDIT_PROJECT_SOUND = 2 };

typedef struct {
    const char* path;
    int duration; // of the whole
    int start;
    int end;
} video_edit_clip_s;
typedef struct {
    const video_edit_clip_s* clip;
} video_edit_project_s;

typedef void (*video_edit_error_received_cb)(int error);
typedef void (*video_edit_state_changed_cb)(int state);

extern "C" {
int video_edit_init(void);
// Forgets the callbacks as well. An export that runs is cancelled and waited for (50 ms at most, while the storage
// answers).
int video_edit_deinit(void);
int video_edit_set_error_received_cb(video_edit_error_received_cb callback);
int video_edit_set_state_changed_cb(video_edit_state_changed_cb callback);
// Opens the source, which stays the same one whatever happens to its name. The record is borrowed for the call.
int video_edit_prepare(int project, const video_edit_project_s* record);
int video_edit_unprepare(void);
// Starts to fill an existing, empty file of the caller's. Either the end of the stream or one error is reported.
int video_edit_export(const char* path);
// Nothing is reported any more when this returns. What was written is of no use. Not from a callback.
int video_edit_export_cancel(void);
// Of the running or last export, 0 to 100.
int video_edit_get_progress(int* percent);
}
