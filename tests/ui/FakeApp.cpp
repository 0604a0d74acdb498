// The process as an application, for screens that run in a test: exits and launch requests are recorded only.
#include <app.h>
#include <app_control.h>

#include <string>

#include "fakes/Fakes.h"

using fakes::calls;

struct app_control_s { };

namespace {

void* window = nullptr;

}

extern "C" {

int ui_app_main(int, char**, const ui_app_lifecycle_s*, void*) { return calls.record(__func__); }
void ui_app_exit(void) { calls.record(__func__); }
void ui_app_close(void) { calls.record(__func__); }
void ui_app_set_window_visible(bool visible) { calls.record(__func__, visible ? "1" : "0"); }
void ui_app_set_window(void* object) { window = object; }
void* ui_app_get_window(void) { return window; }

int app_control_create(app_control_h* control)
{
    const int result = calls.record(__func__);
    *control = result == APP_CONTROL_ERROR_NONE ? new app_control_s : nullptr;
    return result;
}
int app_control_destroy(app_control_h control)
{
    delete control;
    return calls.record(__func__);
}
int app_control_clone(app_control_h* clone, app_control_h)
{
    *clone = new app_control_s;
    return APP_CONTROL_ERROR_NONE;
}
int app_control_set_app_id(app_control_h, const char* id) { return calls.record(__func__, id); }
int app_control_add_extra_data(app_control_h, const char* key, const char* value)
{
    return calls.record(__func__, std::string(key) + "=" + value);
}
int app_control_reply_to_launch_request(app_control_h, app_control_h, app_control_result_e result)
{
    return calls.record(__func__, std::to_string(result));
}
int app_control_set_launch_mode(app_control_h, app_control_launch_mode_e mode)
{
    return calls.record(__func__, std::to_string(mode));
}
int app_control_send_launch_request(app_control_h, app_control_reply_cb, void*) { return calls.record(__func__); }
}
