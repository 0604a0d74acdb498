// The process as an application, for screens that run in a test: exits and launch requests are recorded only.
#include <app.h>
#include <app_control.h>

#include <cstring>
#include <map>
#include <string>

#include "FakeApp.h"
#include "fakes/Fakes.h"

using fakes::calls;

struct app_control_s {
    std::map<std::string, std::string> extras;
};

namespace ui {

std::vector<Launch> launches;

void answer(const Launch& launch, app_control_result_e result, const std::map<std::string, std::string>& extras)
{
    app_control_s request;
    app_control_s reply{extras};
    if (launch.callback)
        launch.callback(&request, &reply, result, launch.userData);
}

}

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
int app_control_set_uri(app_control_h, const char* uri) { return calls.record(__func__, uri); }
int app_control_set_operation(app_control_h, const char* operation) { return calls.record(__func__, operation); }
int app_control_add_extra_data_array(app_control_h, const char* key, const char* values[], int count)
{
    std::string all = std::string(key) + "=";
    for (int i = 0; i < count; ++i)
        all += std::string(i > 0 ? "," : "") + values[i];
    return calls.record(__func__, all);
}
int app_control_get_extra_data(app_control_h control, const char* key, char** value)
{
    const auto found = control->extras.find(key);
    if (found == control->extras.end())
        return APP_CONTROL_ERROR_KEY_NOT_FOUND;
    *value = ::strdup(found->second.c_str());
    return APP_CONTROL_ERROR_NONE;
}
int app_control_enable_app_started_result_event(app_control_h) { return calls.record(__func__); }
int app_control_send_terminate_request(app_control_h) { return calls.record(__func__); }
int app_control_send_launch_request(app_control_h, app_control_reply_cb callback, void* data)
{
    ui::launches.push_back({callback, data});
    return calls.record(__func__);
}
}
