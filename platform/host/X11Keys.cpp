#include "X11Keys.h"

#include <Ecore_Input.h>
#include <Ecore_X.h>

#include <utility>

namespace host {

namespace {

    constexpr std::string_view PREFIX = "XF86Audio";
    constexpr const char* KEYS[] = {"XF86AudioPlay", "XF86AudioStop", "XF86AudioPause", "XF86AudioPrev",
        "XF86AudioNext", "XF86AudioForward", "XF86AudioRewind", "XF86AudioMedia", "XF86AudioRecord"};

}

X11Keys::X11Keys(Pressed pressed)
    : _pressed(std::move(pressed))
{
    if (ecore_x_display_get() == nullptr)
        return;
    const Ecore_X_Window root = ecore_x_window_root_first_get();
    for (const char* key : KEYS)
        if (ecore_x_keysym_keycode_get(key) > 0) {
            ecore_x_window_key_grab(root, key, 0, 0);
            _grabbed.emplace_back(key);
        }
    _down = ecore_event_handler_add(
        ECORE_EVENT_KEY_DOWN,
        [](void* self, int, void* event) -> Eina_Bool {
            static_cast<X11Keys*>(self)->_key(static_cast<Ecore_Event_Key*>(event)->keyname, true);
            return ECORE_CALLBACK_PASS_ON;
        },
        this);
    _up = ecore_event_handler_add(
        ECORE_EVENT_KEY_UP,
        [](void* self, int, void* event) -> Eina_Bool {
            static_cast<X11Keys*>(self)->_key(static_cast<Ecore_Event_Key*>(event)->keyname, false);
            return ECORE_CALLBACK_PASS_ON;
        },
        this);
}

X11Keys::~X11Keys()
{
    if (_down == nullptr)
        return;
    ecore_event_handler_del(_down);
    ecore_event_handler_del(_up);
    if (ecore_x_display_get() == nullptr)
        return;
    for (const std::string& key : _grabbed)
        ecore_x_window_key_ungrab(ecore_x_window_root_first_get(), key.c_str(), 0, 0);
}

void X11Keys::_key(const char* name, bool down)
{
    const std::string_view key = name != nullptr ? name : "";
    if (!key.starts_with(PREFIX))
        return;
    const std::string shortName(key.substr(PREFIX.size()));
    if (down ? !_held.insert(shortName).second : _held.erase(shortName) == 0)
        return; // the keyboard repeats
    const Pressed copy = _pressed; // it may end this object
    copy(shortName, down);
}

}
