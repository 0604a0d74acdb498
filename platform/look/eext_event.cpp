#include <eext_event.h>

#include <algorithm>
#include <cstring>
#include <vector>

#include <Ecore_Input.h>
#include <Elementary.h>

#include <dlog.h>

#include "look/FocusMark.h"

namespace {

constexpr auto ARMED_KEY = "eext.keys";
constexpr unsigned int MOUSE_BACK_BUTTON = 8;

struct Registration {
    Evas_Object* object; // borrowed; its deletion removes the record
    Eext_Callback_Type type;
    Eext_Event_Cb callback;
    void* userData;
    bool operator==(const Registration&) const = default;
};

std::vector<Registration>& registrations()
{
    static std::vector<Registration> all;
    return all;
}

std::vector<Evas_Object*>& armedWindows()
{
    static std::vector<Evas_Object*> windows;
    return windows;
}

// The content of a covered screen stays visible itself: its smart parents and clippers tell.
bool isEffectivelyVisible(Evas_Object* object)
{
    for (Evas_Object* parent = object; parent; parent = evas_object_smart_parent_get(parent)) {
        if (!evas_object_visible_get(parent))
            return false;
        for (Evas_Object* clip = evas_object_clip_get(parent); clip; clip = evas_object_clip_get(clip)) {
            if (!evas_object_visible_get(clip))
                return false;
        }
    }
    return true;
}

Evas_Object* topmost(Evas* canvas, Eext_Callback_Type type)
{
    const auto& all = registrations();
    const auto found = std::find_if(all.rbegin(), all.rend(), [canvas, type](const Registration& each) {
        return each.type == type && evas_object_evas_get(each.object) == canvas && isEffectivelyVisible(each.object);
    });
    return found == all.rend() ? nullptr : found->object;
}

void dispatch(Evas* canvas, Eext_Callback_Type type)
{
    const Evas_Object* top = topmost(canvas, type);
    if (!top)
        return;
    // Callbacks may delete objects and change the registrations.
    for (const Registration& each : std::vector(registrations())) {
        const auto& now = registrations();
        if (each.object == top && each.type == type && std::ranges::find(now, each) != now.end())
            each.callback(each.userData, each.object, nullptr);
    }
}

void keyUpCb(void*, Evas* canvas, Evas_Object*, void* info)
{
    const char* key = static_cast<Evas_Event_Key_Up*>(info)->key;
    if (!std::strcmp(key, "Escape") || !std::strcmp(key, "XF86Back"))
        dispatch(canvas, EEXT_CALLBACK_BACK);
    else if (!std::strcmp(key, "Menu") || !std::strcmp(key, "F10"))
        dispatch(canvas, EEXT_CALLBACK_MORE);
}

// On the way down, for Alt is often released before Left.
void keyDownCb(void*, Evas* canvas, Evas_Object*, void* info)
{
    const auto* event = static_cast<Evas_Event_Key_Down*>(info);
    if (!std::strcmp(event->key, "Left") && evas_key_modifier_is_set(event->modifiers, "Alt"))
        dispatch(canvas, EEXT_CALLBACK_BACK);
}

// The back button of a mouse, wherever the pointer is in the window.
Eina_Bool mouseUpCb(void*, int, void* info)
{
    const auto* event = static_cast<Ecore_Event_Mouse_Button*>(info);
    if (event->buttons != MOUSE_BACK_BUTTON)
        return ECORE_CALLBACK_PASS_ON;
    for (Evas_Object* window : std::vector(armedWindows())) {
        const auto id = elm_win_window_id_get(window);
        if (id == event->event_window || id == event->window) {
            dispatch(evas_object_evas_get(window), EEXT_CALLBACK_BACK);
            break;
        }
    }
    return ECORE_CALLBACK_PASS_ON;
}

void objectDeletedCb(void*, Evas*, Evas_Object* object, void*)
{
    std::erase_if(registrations(), [object](const Registration& each) { return each.object == object; });
}

void windowDeletedCb(void* data, Evas*, Evas_Object* window, void*)
{
    std::erase(armedWindows(), window);
    ecore_event_handler_del(static_cast<Ecore_Event_Handler*>(data));
}

// The parents of a widget walk on into a parent window: the last one of the same canvas is the window.
Evas_Object* windowOf(Evas_Object* object)
{
    Evas_Object* window = object;
    for (Evas_Object* parent = elm_object_parent_widget_get(window);
         parent && evas_object_evas_get(parent) == evas_object_evas_get(object);
         parent = elm_object_parent_widget_get(window))
        window = parent;
    return window;
}

}

// Exclusive grabs, so that widgets with an Escape of their own (naviframe, entry) do not react as well.
void eext_window_arm(Evas_Object* object)
{
    Evas_Object* window = object ? windowOf(object) : nullptr;
    if (!window || evas_object_data_get(window, ARMED_KEY))
        return;
    evas_object_data_set(window, ARMED_KEY, window);
    look::watchFocusMark();
    bool grabbed = true;
    for (const char* key : {"Escape", "XF86Back", "Menu", "F10"})
        grabbed = evas_object_key_grab(window, key, 0, 0, EINA_TRUE) && grabbed;
    const auto alt = evas_key_modifier_mask_get(evas_object_evas_get(window), "Alt");
    grabbed = evas_object_key_grab(window, "Left", alt, 0, EINA_TRUE) && grabbed;
    if (!grabbed)
        __dlog_print(LOG_ID_MAIN, DLOG_WARN, "LOOK", "a back or more key is taken already");
    evas_object_event_callback_add(window, EVAS_CALLBACK_KEY_UP, keyUpCb, nullptr);
    evas_object_event_callback_add(window, EVAS_CALLBACK_KEY_DOWN, keyDownCb, nullptr);
    Ecore_Event_Handler* mouse = ecore_event_handler_add(ECORE_EVENT_MOUSE_BUTTON_UP, mouseUpCb, nullptr);
    armedWindows().push_back(window);
    evas_object_event_callback_add(window, EVAS_CALLBACK_DEL, windowDeletedCb, mouse);
}

void eext_object_event_callback_add(
    Evas_Object* object, Eext_Callback_Type type, Eext_Event_Cb callback, void* userData)
{
    if (!object || !callback)
        return;
    eext_window_arm(object);
    evas_object_event_callback_del(object, EVAS_CALLBACK_DEL, objectDeletedCb);
    evas_object_event_callback_add(object, EVAS_CALLBACK_DEL, objectDeletedCb, nullptr);
    registrations().push_back({object, type, callback, userData});
}
