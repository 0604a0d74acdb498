#include "look/FocusMark.h"

#include "look/Theme.h"

#include <Ecore.h>
#include <Ecore_Input.h>

#include <algorithm>
#include <array>
#include <string_view>

namespace look {

namespace {

    constexpr std::array<std::string_view, 13> FOCUS_KEYS = {"Tab", "ISO_Left_Tab", "Left", "Right", "Up", "Down",
        "Return", "KP_Enter", "space", "Home", "End", "Menu", "F10"};

    bool shown = false;

    void setShown(bool show)
    {
        if (shown == show)
            return;
        shown = show;
        applyColorClass(FOCUS_COLOR);
    }

    Eina_Bool keyDownCb(void*, int, void* info)
    {
        const std::string_view key = static_cast<Ecore_Event_Key*>(info)->key;
        if (std::ranges::find(FOCUS_KEYS, key) != FOCUS_KEYS.end())
            setShown(true);
        return ECORE_CALLBACK_PASS_ON;
    }

    Eina_Bool mouseDownCb(void*, int, void*)
    {
        setShown(false);
        return ECORE_CALLBACK_PASS_ON;
    }

}

bool isFocusMarkShown() { return shown; }

void watchFocusMark()
{
    static Ecore_Event_Handler* keys = nullptr;
    if (keys)
        return;
    keys = ecore_event_handler_add(ECORE_EVENT_KEY_DOWN, keyDownCb, nullptr);
    ecore_event_handler_add(ECORE_EVENT_MOUSE_BUTTON_DOWN, mouseDownCb, nullptr);
}

}
