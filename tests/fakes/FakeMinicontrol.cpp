// Control windows without a desktop: ordinary windows, seen when the test says so.
#include <Elementary.h>

#include "fakes/Answer.h"

namespace fakes {

std::map<int, ControlWindow> controlWindows;

void setSeen(int viewer, bool seen)
{
    controlWindows[viewer].isSeen = seen;
    evas_object_smart_callback_call(controlWindows[viewer].window, MINICONTROL_SEEN_CHANGED, nullptr);
}

}

bool minicontrol_is_supported(minicontrol_viewer_e) { return true; }

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
