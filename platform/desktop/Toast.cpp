#include "desktop/Toast.h"

#include "launch/Toolkit.h"

#include <Elementary.h>

#include <algorithm>

namespace platform {

namespace {

    constexpr auto GROUP = "mewlo/toast"; // of the application's theme
    constexpr auto TEXT_PART = "text";
    constexpr double SHOWN_FOR = 3.0; // seconds
    constexpr double FADES_FOR = 0.3;
    // Design units.
    constexpr int LARGEST_WIDTH = 640;
    constexpr int PADDING = 40; // of the text, on each side
    constexpr int MARGIN = 40;
    constexpr int ABOVE_BOTTOM = 226; // where the last row of buttons begins

    // A picture on top of what the window shows now: it takes neither focus nor clicks, and the next popup covers it.
    struct Toast {
        Evas_Object* plate = nullptr; // goes with the canvas
        Evas_Object* window = nullptr;
        Ecore_Timer* timer = nullptr;
    };

    Toast& current()
    {
        static Toast toast;
        return toast;
    }

    int scaled(int units) { return static_cast<int>(units * elm_config_scale_get() / elm_app_base_scale_get()); }

    int heightFor(int width)
    {
        int leastWidth = 0;
        int height = 0;
        edje_object_size_min_restricted_calc(current().plate, &leastWidth, &height, width, 0);
        return height;
    }

    // One line is as wide as it needs; the lines of a longer text are about equally long.
    int widthFor(int textWidth, int room)
    {
        const int padding = 2 * scaled(PADDING) + 2;
        if (textWidth + padding <= room)
            return textWidth + padding;
        const int lines = textWidth / std::max(room - padding, 1) + 1;
        const int even = textWidth / lines * 6 / 5 + padding;
        return even < room && heightFor(even) <= heightFor(room) ? even : room;
    }

    void place()
    {
        Evas_Object* plate = current().plate;
        int windowWidth = 0;
        int windowHeight = 0;
        evas_object_geometry_get(current().window, nullptr, nullptr, &windowWidth, &windowHeight);
        const int room = std::max(std::min(windowWidth - 2 * scaled(MARGIN), scaled(LARGEST_WIDTH)), 1);
        evas_object_resize(plate, room, 1);
        int textWidth = 0;
        evas_object_textblock_size_native_get(edje_object_part_object_get(plate, TEXT_PART), &textWidth, nullptr);
        const int width = widthFor(textWidth, room);
        const int height = heightFor(width);
        evas_object_resize(plate, width, height);
        evas_object_move(plate, (windowWidth - width) / 2, std::max(windowHeight - scaled(ABOVE_BOTTOM) - height, 0));
    }

    void resizedCb(void*, Evas*, Evas_Object*, void*) { place(); }

    void windowGoneCb(void*, Evas*, Evas_Object*, void*) { evas_object_del(current().plate); }

    void goneCb(void*, Evas*, Evas_Object*, void*)
    {
        evas_object_event_callback_del(current().window, EVAS_CALLBACK_RESIZE, resizedCb);
        evas_object_event_callback_del(current().window, EVAS_CALLBACK_DEL, windowGoneCb);
        ecore_timer_del(current().timer);
        current() = {};
    }

    Eina_Bool fadedCb(void*)
    {
        evas_object_del(current().plate);
        return ECORE_CALLBACK_CANCEL;
    }

    Eina_Bool shownCb(void*)
    {
        edje_object_signal_emit(current().plate, "hide", "");
        current().timer = ecore_timer_add(FADES_FOR, fadedCb, nullptr);
        return ECORE_CALLBACK_CANCEL;
    }

    Evas_Object* addPlate(Evas_Object* window, const std::string& text)
    {
        const char* file = elm_theme_group_path_find(nullptr, GROUP);
        if (file == nullptr)
            return nullptr;
        Evas_Object* plate = edje_object_add(evas_object_evas_get(window));
        edje_object_file_set(plate, file, GROUP);
        edje_object_part_text_unescaped_set(plate, TEXT_PART, text.c_str());
        evas_object_name_set(plate, GROUP);
        evas_object_pass_events_set(plate, EINA_TRUE);
        return plate;
    }

}

bool showToast(const std::string& text)
{
    auto* window = static_cast<Evas_Object*>(mainWindow());
    if (window == nullptr)
        return false;
    if (current().plate != nullptr)
        evas_object_del(current().plate);
    Evas_Object* plate = addPlate(window, text);
    if (plate == nullptr)
        return false;
    current() = {plate, window, ecore_timer_add(SHOWN_FOR, shownCb, nullptr)};
    evas_object_event_callback_add(plate, EVAS_CALLBACK_DEL, goneCb, nullptr);
    evas_object_event_callback_add(window, EVAS_CALLBACK_RESIZE, resizedCb, nullptr);
    evas_object_event_callback_add(window, EVAS_CALLBACK_DEL, windowGoneCb, nullptr);
    place();
    evas_object_show(plate);
    return true;
}

}
