#pragma once

#include <Elementary.h>

#include <string>
#include <vector>

#include "support/RunUntil.h"

namespace support {

// Waits until what was changed has been drawn: objects that never were get no input.
inline void settle(Evas_Object* window)
{
    bool drawn = false;
    Evas* canvas = evas_object_evas_get(window);
    const auto mark = [](void* data, Evas*, void*) { *static_cast<bool*>(data) = true; };
    runFor(0.02);
    evas_event_callback_add(canvas, EVAS_CALLBACK_RENDER_POST, mark, &drawn);
    evas_damage_rectangle_add(canvas, 0, 0, 1, 1);
    runUntil([&] { return drawn; }, 2.0);
    evas_event_callback_del_full(canvas, EVAS_CALLBACK_RENDER_POST, mark, &drawn);
}

inline unsigned int nextTime()
{
    static unsigned int time = 1000;
    return time += 50;
}

// A tap in the middle of an object.
inline void click(Evas_Object* object)
{
    Evas* canvas = evas_object_evas_get(object);
    int x = 0;
    int y = 0;
    int width = 0;
    int height = 0;
    evas_object_geometry_get(object, &x, &y, &width, &height);
    evas_event_feed_mouse_in(canvas, nextTime(), nullptr);
    evas_event_feed_mouse_move(canvas, x + width / 2, y + height / 2, nextTime(), nullptr);
    evas_event_feed_mouse_down(canvas, 1, EVAS_BUTTON_NONE, nextTime(), nullptr);
    evas_event_feed_mouse_up(canvas, 1, EVAS_BUTTON_NONE, nextTime(), nullptr);
    evas_event_feed_mouse_out(canvas, nextTime(), nullptr);
    // Layouts hand their signals on in the next pass of the main loop.
    runFor(0.02);
}

// Types one key; text is what it writes, null for keys that write nothing.
inline void key(Evas_Object* window, const char* name, const char* text = nullptr)
{
    Evas* canvas = evas_object_evas_get(window);
    evas_event_feed_key_down(canvas, name, name, text, nullptr, nextTime(), nullptr);
    evas_event_feed_key_up(canvas, name, name, text, nullptr, nextTime(), nullptr);
}

inline std::string text(Evas_Object* object, const char* part = nullptr)
{
    const char* found = elm_object_part_text_get(object, part);
    return found != nullptr ? found : "";
}

// The state of a part of a layout, such as "default", once pending signals have been handled.
inline std::string partState(Evas_Object* layout, const char* part)
{
    Evas_Object* edje = elm_layout_edje_get(layout);
    edje_object_message_signal_process(edje);
    const char* state = edje_object_part_state_get(edje, part, nullptr);
    return state != nullptr ? state : "";
}

inline Evas_Object* popupOf(Evas_Object* window)
{
    Evas_Object* found = nullptr;
    for (Evas_Object* each = evas_object_top_get(evas_object_evas_get(window)); each && !found;
         each = evas_object_below_get(each)) {
        if (evas_object_smart_type_check(each, "elm_popup") && !evas_object_smart_parent_get(each))
            found = each;
    }
    return found;
}

// The entries of the menu that is open, none without one.
inline std::vector<Evas_Object*> menuButtons(Evas_Object* window)
{
    Evas_Object* popup = popupOf(window);
    Evas_Object* box = popup ? elm_object_content_get(popup) : nullptr;
    std::vector<Evas_Object*> buttons;
    if (!box || !evas_object_smart_type_check(box, "elm_box"))
        return buttons;
    Eina_List* children = elm_box_children_get(box);
    void* child = nullptr;
    EINA_LIST_FREE(children, child)
    buttons.push_back(static_cast<Evas_Object*>(child));
    return buttons;
}

}
