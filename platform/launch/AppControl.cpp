#include "launch/AppControl.h"

#include <algorithm>
#include <array>
#include <cstdlib>
#include <cstring>
#include <string_view>

namespace {

constexpr std::array<std::string_view, 4> FIELDS = {"operation", "uri", "mime", "launch-mode"};

bool isField(std::string_view key) { return std::find(FIELDS.begin(), FIELDS.end(), key) != FIELDS.end(); }

int setField(app_control_h control, const char* field, const char* value)
{
    if (control == nullptr || value == nullptr)
        return APP_CONTROL_ERROR_INVALID_PARAMETER;
    control->fields.set(field, {value});
    return APP_CONTROL_ERROR_NONE;
}

int getText(const bundle_s& from, const char* key, char** value)
{
    const char* text = bundle_get_str(&from, key);
    *value = text != nullptr ? ::strdup(text) : nullptr;
    return text != nullptr ? APP_CONTROL_ERROR_NONE : APP_CONTROL_ERROR_KEY_NOT_FOUND;
}

int getField(app_control_h control, const char* field, char** value)
{
    if (control == nullptr || value == nullptr)
        return APP_CONTROL_ERROR_INVALID_PARAMETER;
    return getText(control->fields, field, value);
}

// Names of fields cannot be names of extras: both travel in one dictionary.
bool isExtra(const char* key) { return key != nullptr && *key != '\0' && !isField(key); }

}

bundle_s app_control_s::toWire() const
{
    bundle_s wire = fields;
    for (const auto& [key, values] : extras.entries)
        wire.set(key, values);
    return wire;
}

void app_control_s::fromWire(const bundle_s& wire)
{
    for (const auto& [key, values] : wire.entries)
        (isField(key) ? fields : extras).set(key, values);
}

int app_control_create(app_control_h* control)
{
    if (control == nullptr)
        return APP_CONTROL_ERROR_INVALID_PARAMETER;
    *control = new app_control_s;
    return APP_CONTROL_ERROR_NONE;
}

int app_control_destroy(app_control_h control)
{
    if (control == nullptr)
        return APP_CONTROL_ERROR_INVALID_PARAMETER;
    delete control;
    return APP_CONTROL_ERROR_NONE;
}

int app_control_clone(app_control_h* clone, app_control_h control)
{
    if (clone == nullptr || control == nullptr)
        return APP_CONTROL_ERROR_INVALID_PARAMETER;
    *clone = new app_control_s(*control);
    return APP_CONTROL_ERROR_NONE;
}

int app_control_set_operation(app_control_h control, const char* operation)
{
    return setField(control, "operation", operation);
}

int app_control_get_operation(app_control_h control, char** operation)
{
    return getField(control, "operation", operation);
}

int app_control_set_uri(app_control_h control, const char* uri) { return setField(control, "uri", uri); }

int app_control_get_uri(app_control_h control, char** uri) { return getField(control, "uri", uri); }

int app_control_set_mime(app_control_h control, const char* mime) { return setField(control, "mime", mime); }

int app_control_get_mime(app_control_h control, char** mime) { return getField(control, "mime", mime); }

int app_control_set_app_id(app_control_h control, const char* app_id)
{
    if (control == nullptr || app_id == nullptr)
        return APP_CONTROL_ERROR_INVALID_PARAMETER;
    control->appId = app_id;
    return APP_CONTROL_ERROR_NONE;
}

int app_control_set_launch_mode(app_control_h control, app_control_launch_mode_e mode)
{
    return setField(control, "launch-mode", mode == APP_CONTROL_LAUNCH_MODE_GROUP ? "group" : "single");
}

int app_control_add_extra_data(app_control_h control, const char* key, const char* value)
{
    if (control == nullptr || !isExtra(key) || value == nullptr)
        return APP_CONTROL_ERROR_INVALID_PARAMETER;
    control->extras.set(key, {value});
    return APP_CONTROL_ERROR_NONE;
}

int app_control_add_extra_data_array(app_control_h control, const char* key, const char* values[], int count)
{
    if (control == nullptr || !isExtra(key) || values == nullptr || count < 0
        || std::any_of(values, values + count, [](const char* value) { return value == nullptr; }))
        return APP_CONTROL_ERROR_INVALID_PARAMETER;
    control->extras.set(key, std::vector<std::string>(values, values + count));
    return APP_CONTROL_ERROR_NONE;
}

int app_control_get_extra_data(app_control_h control, const char* key, char** value)
{
    if (control == nullptr || key == nullptr || value == nullptr)
        return APP_CONTROL_ERROR_INVALID_PARAMETER;
    return getText(control->extras, key, value);
}

int app_control_get_extra_data_array(app_control_h control, const char* key, char*** values, int* count)
{
    if (control == nullptr || key == nullptr || values == nullptr || count == nullptr)
        return APP_CONTROL_ERROR_INVALID_PARAMETER;
    const auto* found = control->extras.find(key);
    if (found == nullptr)
        return APP_CONTROL_ERROR_KEY_NOT_FOUND;
    *count = static_cast<int>(found->size());
    *values = static_cast<char**>(std::calloc(found->size() + 1, sizeof(char*)));
    if (*values == nullptr)
        return APP_CONTROL_ERROR_OUT_OF_MEMORY;
    for (size_t i = 0; i < found->size(); ++i)
        (*values)[i] = ::strdup((*found)[i].c_str());
    return APP_CONTROL_ERROR_NONE;
}

int app_control_enable_app_started_result_event(app_control_h control)
{
    if (control == nullptr)
        return APP_CONTROL_ERROR_INVALID_PARAMETER;
    control->wantsStarted = true;
    return APP_CONTROL_ERROR_NONE;
}

int app_control_reply_to_launch_request(app_control_h reply, app_control_h request, app_control_result_e result)
{
    if (request == nullptr)
        return APP_CONTROL_ERROR_INVALID_PARAMETER;
    if (request->pending == nullptr)
        return APP_CONTROL_ERROR_NO_REPLY_EXPECTED;
    return request->pending->answer(result, reply != nullptr ? reply->extras : bundle_s());
}
