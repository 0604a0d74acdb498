// The process as an application: requests hold what is put into them, launches and exits are recorded only.
#include <app.h>

#include <cstring>

#include "fakes/Answer.h"
#include "ui/FakeApp.h"

struct app_control_s {
    std::string operation;
    std::string mime;
    std::map<std::string, std::string> extras;
};

namespace {

void* window = nullptr;

int give(const std::string& text, char** result)
{
    if (text.empty())
        return APP_CONTROL_ERROR_KEY_NOT_FOUND;
    *result = ::strdup(text.c_str());
    return 0;
}

std::string listed(const char* key, const char* values[], int count)
{
    std::string all = std::string(key) + "=";
    for (int i = 0; i < count; ++i)
        all += std::string(i > 0 ? "," : "") + values[i];
    return all;
}

}

namespace fakes {

app_control_h makeRequest(const char* operation, const char* mime, const char* size)
{
    auto* request = new app_control_s{operation != nullptr ? operation : "", mime != nullptr ? mime : "", {}};
    if (size != nullptr)
        request->extras["SIZE"] = size;
    return request;
}

}

namespace ui {

std::vector<Launch> launches;

void answer(const Launch& launch, app_control_result_e result, const std::map<std::string, std::string>& extras)
{
    app_control_s request;
    app_control_s reply{"", "", extras};
    if (launch.callback)
        launch.callback(&request, &reply, result, launch.userData);
}

}

extern "C" {

FAKE(ui_app_main, (int, char**, const ui_app_lifecycle_s*, void*), )
void ui_app_exit(void) { fakes::answer(__func__); }
void ui_app_close(void) { fakes::answer(__func__); }
void ui_app_set_window_visible(bool visible) { fakes::answer(__func__, visible); }
void ui_app_set_window(void* object) { window = object; }

int app_control_create(app_control_h* control)
{
    const int result = fakes::answer(__func__);
    *control = result == 0 ? new app_control_s : nullptr;
    return result;
}
FAKE(app_control_destroy, (app_control_h control), delete control)
FAKE(app_control_clone, (app_control_h * clone, app_control_h control), *clone = new app_control_s(*control))
int app_control_get_operation(app_control_h control, char** operation) { return give(control->operation, operation); }
int app_control_get_mime(app_control_h control, char** mime) { return give(control->mime, mime); }
int app_control_get_extra_data(app_control_h control, const char* key, char** value)
{
    return give(control->extras[key], value);
}
FAKE(app_control_set_app_id, (app_control_h, const char* id), , id)
FAKE(app_control_set_uri, (app_control_h, const char* uri), , uri)
FAKE(app_control_set_operation, (app_control_h, const char* operation), , operation)
FAKE(app_control_set_launch_mode, (app_control_h, app_control_launch_mode_e mode), , mode)
FAKE(app_control_add_extra_data, (app_control_h control, const char* key, const char* value),
    control->extras[key] = value, std::string(key) + "=" + value)
FAKE(app_control_add_extra_data_array, (app_control_h, const char* key, const char* values[], int count), ,
    listed(key, values, count))
FAKE(app_control_enable_app_started_result_event, (app_control_h), )
FAKE(app_control_reply_to_launch_request, (app_control_h reply, app_control_h, app_control_result_e given),
     fakes::reply.result = given;
     fakes::reply.extras = reply->extras, given)
FAKE(app_control_send_launch_request, (app_control_h, app_control_reply_cb callback, void* data),
    ui::launches.push_back({callback, data}))
FAKE(app_control_send_terminate_request, (app_control_h), )
FAKE(app_manager_get_app_context, (const char* id, app_context_h*), , id)
FAKE(app_manager_resume_app, (app_context_h), )
FAKE(app_manager_context_destroy, (app_context_h), )
}
