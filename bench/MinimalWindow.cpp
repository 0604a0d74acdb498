// The least Elementary program there is: a window with one button. Prints "first frame" when it has drawn it, then
// stays. With an argument it covers the screen.
#include <Efreet.h>
#include <Elementary.h>

#include <cstdio>

namespace {

void renderedCb(void*, Evas* canvas, void*)
{
    evas_event_callback_del(canvas, EVAS_CALLBACK_RENDER_POST, renderedCb);
    std::puts("first frame");
    std::fflush(stdout);
}

}

int main(int argc, char** argv)
{
    efreet_cache_disable();
    ecore_app_no_system_modules();
    elm_init(argc, argv);
    elm_policy_set(ELM_POLICY_QUIT, ELM_POLICY_QUIT_LAST_WINDOW_CLOSED);
    Evas_Object* window = elm_win_util_standard_add("minimal", "Minimal");
    elm_win_autodel_set(window, EINA_TRUE);
    Evas_Object* button = elm_button_add(window);
    elm_object_text_set(button, "Hello");
    evas_object_size_hint_weight_set(button, EVAS_HINT_EXPAND, EVAS_HINT_EXPAND);
    elm_win_resize_object_add(window, button);
    evas_object_show(button);
    evas_event_callback_add(evas_object_evas_get(window), EVAS_CALLBACK_RENDER_POST, renderedCb, nullptr);
    evas_object_resize(window, 360, 640);
    elm_win_fullscreen_set(window, argc > 1);
    evas_object_show(window);
    elm_run();
    elm_shutdown();
    return 0;
}
