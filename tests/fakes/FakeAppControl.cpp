#include "fakes/Fakes.h"

#include <app.h>

#include <cstring>

using fakes::calls;

struct app_control_s {
    std::string operation;
    std::string mime;
    std::map<std::string, std::string> extras;
};
struct bundle_s {
    std::map<std::string, std::string> values;
};

namespace {

int give(const std::string& text, char** result)
{
    if (text.empty())
        return APP_CONTROL_ERROR_KEY_NOT_FOUND;
    *result = ::strdup(text.c_str());
    return 0;
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

extern "C" {

int app_control_create(app_control_h* control)
{
    const int result = calls.record(__func__);
    if (result == 0)
        *control = new app_control_s;
    return result;
}
int app_control_destroy(app_control_h control)
{
    delete control;
    return 0;
}
int app_control_clone(app_control_h* clone, app_control_h control)
{
    *clone = new app_control_s(*control);
    return 0;
}
int app_control_get_operation(app_control_h control, char** operation) { return give(control->operation, operation); }
int app_control_get_mime(app_control_h control, char** mime) { return give(control->mime, mime); }
int app_control_get_extra_data(app_control_h control, const char* key, char** value)
{
    return give(control->extras[key], value);
}
int app_control_add_extra_data(app_control_h control, const char* key, const char* value)
{
    control->extras[key] = value;
    return 0;
}
int app_control_reply_to_launch_request(app_control_h reply, app_control_h, app_control_result_e result)
{
    fakes::reply.result = result;
    fakes::reply.extras = reply->extras;
    return calls.record(__func__, std::to_string(result));
}
void ui_app_exit(void) { calls.record(__func__); }
void ui_app_close(void) { calls.record(__func__); }
int ui_app_main(int, char**, const ui_app_lifecycle_s*, void*) { return calls.record(__func__); }
void ui_app_set_window_visible(bool) { }
void ui_app_set_window(void*) { }
void* ui_app_get_window(void) { return nullptr; }
int app_control_set_app_id(app_control_h, const char* id) { return calls.record(__func__, id); }
int app_control_set_operation(app_control_h control, const char* operation)
{
    control->operation = operation;
    return 0;
}
int app_control_set_launch_mode(app_control_h, app_control_launch_mode_e mode)
{
    return calls.record(__func__, std::to_string(mode));
}
int app_control_send_launch_request(app_control_h, app_control_reply_cb, void*) { return calls.record(__func__); }

bundle* bundle_create(void) { return calls.record(__func__) == 0 ? new bundle_s : nullptr; }
int bundle_add_str(bundle* target, const char* key, const char* value)
{
    target->values[key] = value;
    return calls.record(__func__);
}
const char* bundle_get_str(const bundle* source, const char* key)
{
    const auto found = source->values.find(key);
    return found != source->values.end() ? found->second.c_str() : nullptr;
}
int bundle_free(bundle* target)
{
    delete target;
    return calls.record(__func__);
}
}
