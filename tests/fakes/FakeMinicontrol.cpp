// Control windows without a desktop: ordinary windows, seen when the test says so. And the notification in their place.
#include <Elementary.h>

#include <notification_control.h>

#include "fakes/Answer.h"

namespace fakes {

std::map<int, ControlWindow> controlWindows;
bool hasControlWindows = true;
Notification notification;

void setNotificationSupported(bool supported)
{
    notification.isSupported = supported;
    if (notification.changed)
        notification.changed(notification.changedData);
}

void setSeen(int viewer, bool seen)
{
    controlWindows[viewer].isSeen = seen;
    evas_object_smart_callback_call(controlWindows[viewer].window, MINICONTROL_SEEN_CHANGED, nullptr);
}

}

bool minicontrol_is_supported(minicontrol_viewer_e) { return fakes::hasControlWindows; }

Evas_Object* minicontrol_create_window(
    const char* name, minicontrol_viewer_e viewer, minicontrol_provider_event_cb callback)
{
    if (fakes::answer("minicontrol_create_window", name) != 0)
        return nullptr;
    Evas_Object* window = elm_win_add(nullptr, name, ELM_WIN_BASIC);
    fakes::controlWindows[viewer] = {window, callback, true};
    evas_object_event_callback_add(
        window, EVAS_CALLBACK_DEL,
        [](void*, Evas*, Evas_Object* gone, void*) {
            std::erase_if(fakes::controlWindows, [gone](const auto& each) { return each.second.window == gone; });
        },
        nullptr);
    return window;
}

bool minicontrol_is_seen(const Evas_Object* window)
{
    for (const auto& [viewer, each] : fakes::controlWindows)
        if (each.window == window)
            return each.isSeen;
    return false;
}

int notification_control_watch(notification_control_changed_cb changed, void* user_data)
{
    fakes::notification = {};
    fakes::notification.changed = changed;
    fakes::notification.changedData = user_data;
    return 0;
}

void notification_control_unwatch(void) { fakes::notification = {}; }

bool notification_control_is_supported(void) { return fakes::notification.isSupported; }

int notification_control_post(const char* title, const char* text, const notification_control_action_s* actions,
    int count, notification_control_pressed_cb pressed, void* user_data)
{
    fakes::Notification& shown = fakes::notification;
    shown.text = std::string(title) + "|" + text;
    for (int i = 0; i < count; ++i)
        shown.text += std::string("|") + actions[i].key;
    shown.press = [=](const char* key) { pressed(key, user_data); };
    return 0;
}

void notification_control_withdraw(void)
{
    fakes::notification.text.clear();
    fakes::notification.press = nullptr;
}
