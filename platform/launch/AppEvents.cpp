#include "app.h"

#include "state/Trees.h"
#include "vconf.h"
#include <StateKeys.h>

#include <cstring>

struct app_event_info_s {
    std::string language;
};

struct app_event_handler_s {
    platform::KeyTree::WatchId watch;
};

namespace {

using platform::stateTree;

constexpr int BATTERY_LOW = 2; // 1 is critical, 3 normal

const char* keyOf(app_event_type_e type)
{
    switch (type) {
    case APP_EVENT_LOW_BATTERY:
        return VCONFKEY_SYSMAN_BATTERY_STATUS_LOW;
    case APP_EVENT_LANGUAGE_CHANGED:
        return platform::KEY_LANGUAGE;
    case APP_EVENT_REGION_FORMAT_CHANGED:
        return platform::KEY_REGION;
    }
    return nullptr;
}

void report(app_event_type_e type, app_event_cb callback, void* userData)
{
    if (type == APP_EVENT_LOW_BATTERY) {
        const auto level = platform::stateInt(VCONFKEY_SYSMAN_BATTERY_STATUS_LOW);
        if (!level || *level > BATTERY_LOW)
            return;
    }
    app_event_info_s info{stateTree().read(platform::KEY_LANGUAGE).value_or("")};
    callback(&info, userData);
}

}

int app_add_event_handler(app_event_handler_h* handler, app_event_type_e type, app_event_cb callback, void* user_data)
{
    if (handler == nullptr || callback == nullptr || keyOf(type) == nullptr)
        return APP_ERROR_INVALID_PARAMETER;
    const auto watch = stateTree().watch(keyOf(type), [=](const std::string&) { report(type, callback, user_data); });
    if (watch == 0)
        return APP_ERROR_FAILED;
    *handler = new app_event_handler_s{watch};
    return APP_ERROR_NONE;
}

int app_remove_event_handler(app_event_handler_h handler)
{
    if (handler == nullptr)
        return APP_ERROR_INVALID_PARAMETER;
    stateTree().unwatch(handler->watch);
    delete handler;
    return APP_ERROR_NONE;
}

int app_event_get_language(app_event_info_h info, char** language)
{
    if (info == nullptr || language == nullptr || info->language.empty())
        return APP_ERROR_INVALID_PARAMETER;
    *language = ::strdup(info->language.c_str());
    return APP_ERROR_NONE;
}
