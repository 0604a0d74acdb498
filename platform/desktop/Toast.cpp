#include "desktop/Toast.h"

#include "launch/Toolkit.h"

#include <Elementary.h>

#include <memory>

namespace platform {

namespace {

    constexpr double SHOWN_FOR = 3.0; // seconds
    constexpr double HEIGHT_ON_SCREEN = 0.92; // near the bottom, clear of the last row of buttons

    Evas_Object*& current()
    {
        static Evas_Object* toast = nullptr;
        return toast;
    }

    void goneCb(void*, Evas*, Evas_Object* toast, void*)
    {
        if (current() == toast)
            current() = nullptr;
    }

    void timeoutCb(void*, Evas_Object* toast, void*) { evas_object_del(toast); }

    // A dark rounded plate with light text can be read on a dark and on a light window alike.
    Evas_Object* addPlate(Evas_Object* parent, const std::string& text)
    {
        Evas_Object* table = elm_table_add(parent);
        Evas_Object* plate = evas_object_rectangle_add(evas_object_evas_get(parent));
        evas_object_color_set(plate, 38, 38, 38, 235);
        evas_object_size_hint_weight_set(plate, EVAS_HINT_EXPAND, EVAS_HINT_EXPAND);
        evas_object_size_hint_align_set(plate, EVAS_HINT_FILL, EVAS_HINT_FILL);
        elm_table_pack(table, plate, 0, 0, 1, 1);
        evas_object_show(plate);
        Evas_Object* label = elm_label_add(parent);
        const std::unique_ptr<char, void (*)(void*)> markup(elm_entry_utf8_to_markup(text.c_str()), ::free);
        elm_object_text_set(
            label, ("<font_size=16 color=#ffffff align=center>" + std::string(markup.get()) + "</>").c_str());
        elm_label_line_wrap_set(label, ELM_WRAP_MIXED);
        Evas_Coord width = 0;
        evas_object_geometry_get(static_cast<Evas_Object*>(mainWindow()), nullptr, nullptr, &width, nullptr);
        elm_label_wrap_width_set(label, width > 0 ? width * 4 / 5 : 280);
        evas_object_size_hint_padding_set(label, 14, 14, 10, 10);
        elm_table_pack(table, label, 0, 0, 1, 1);
        evas_object_show(label);
        evas_object_show(table);
        return table;
    }

}

bool showToast(const std::string& text)
{
    auto* window = static_cast<Evas_Object*>(mainWindow());
    if (window == nullptr)
        return false;
    if (current() != nullptr)
        evas_object_del(current());
    Evas_Object* toast = elm_notify_add(window);
    elm_notify_align_set(toast, 0.5, HEIGHT_ON_SCREEN);
    elm_notify_allow_events_set(toast, EINA_TRUE);
    elm_notify_timeout_set(toast, SHOWN_FOR);
    elm_object_content_set(toast, addPlate(toast, text));
    evas_object_event_callback_add(toast, EVAS_CALLBACK_DEL, goneCb, nullptr);
    evas_object_smart_callback_add(toast, "timeout", timeoutCb, nullptr);
    evas_object_show(toast);
    current() = toast;
    return true;
}

}
