// Launch requests and their replies, and the bundles they carry. Any thread may build and send a request; replies
// and reply callbacks arrive on the main loop. Strings answered by a get are newly allocated (free).
#pragma once

typedef struct app_control_s* app_control_h;
typedef struct bundle_s bundle;

enum app_control_error_e {
    APP_CONTROL_ERROR_NONE = 0,
    APP_CONTROL_ERROR_INVALID_PARAMETER = -22,
    APP_CONTROL_ERROR_OUT_OF_MEMORY = -12,
    APP_CONTROL_ERROR_KEY_NOT_FOUND = -126,
    APP_CONTROL_ERROR_APP_NOT_FOUND = -2,
    APP_CONTROL_ERROR_LAUNCH_FAILED = -3,
    APP_CONTROL_ERROR_NO_REPLY_EXPECTED = -4,
};
enum app_control_result_e {
    APP_CONTROL_RESULT_APP_STARTED = 1,
    APP_CONTROL_RESULT_SUCCEEDED = 0,
    APP_CONTROL_RESULT_FAILED = -1
};
enum app_control_launch_mode_e { APP_CONTROL_LAUNCH_MODE_SINGLE = 0, APP_CONTROL_LAUNCH_MODE_GROUP = 1 };

#define APP_CONTROL_OPERATION_MAIN "com.tovanic.operation/main"
#define APP_CONTROL_OPERATION_DEFAULT "com.tovanic.operation/default"
#define APP_CONTROL_OPERATION_CREATE_CONTENT "com.tovanic.operation/create_content"
#define APP_CONTROL_OPERATION_SHARE "com.tovanic.operation/share"
#define APP_CONTROL_OPERATION_MULTI_SHARE "com.tovanic.operation/multi_share"
#define APP_CONTROL_DATA_SELECTED "com.tovanic.data/selected"
#define APP_CONTROL_DATA_PATH "com.tovanic.data/path"

typedef void (*app_control_reply_cb)(
    app_control_h request, app_control_h reply, app_control_result_e result, void* user_data);

extern "C" {
int app_control_create(app_control_h* control);
int app_control_destroy(app_control_h control);
// A clone of a received request shares its pending reply: the first reply wins.
int app_control_clone(app_control_h* clone, app_control_h control);

int app_control_set_operation(app_control_h control, const char* operation);
int app_control_get_operation(app_control_h control, char** operation);
int app_control_set_uri(app_control_h control, const char* uri);
int app_control_get_uri(app_control_h control, char** uri);
int app_control_set_mime(app_control_h control, const char* mime);
int app_control_get_mime(app_control_h control, char** mime);
int app_control_set_app_id(app_control_h control, const char* app_id);
int app_control_set_launch_mode(app_control_h control, app_control_launch_mode_e mode);
int app_control_add_extra_data(app_control_h control, const char* key, const char* value);
int app_control_add_extra_data_array(app_control_h control, const char* key, const char* values[], int count);
int app_control_get_extra_data(app_control_h control, const char* key, char** value);
// The array and its strings are newly allocated.
int app_control_get_extra_data_array(app_control_h control, const char* key, char*** values, int* count);
int app_control_enable_app_started_result_event(app_control_h control);

// Sends; the callback (may be null) runs once with the reply, or with the failed result when the target dies.
int app_control_send_launch_request(app_control_h control, app_control_reply_cb callback, void* user_data);
int app_control_send_terminate_request(app_control_h control);
// Answers a received request. Flushed before it returns.
int app_control_reply_to_launch_request(app_control_h reply, app_control_h request, app_control_result_e result);

bundle* bundle_create(void);
int bundle_add_str(bundle* bundle, const char* key, const char* value);
// Borrowed; null when absent.
const char* bundle_get_str(const bundle* bundle, const char* key);
int bundle_free(bundle* bundle);
}
