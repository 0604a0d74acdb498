#pragma once

#include <Ecore_Evas.h>
#include <Elementary.h>

#include <string>

#include "support/RunUntil.h"
#include "support/Screen.h"

namespace ui {

// The window in which a name is asked for, null when there is none.
inline Evas_Object* renameWindow(Evas_Object* mainWindow)
{
    Eina_List* all = ecore_evas_ecore_evas_list_get();
    void* each = nullptr;
    Evas_Object* found = nullptr;
    EINA_LIST_FREE(all, each)
    {
        auto* window = static_cast<Evas_Object*>(ecore_evas_data_get(static_cast<Ecore_Evas*>(each), "elm_win"));
        if (window && window != mainWindow)
            found = window;
    }
    return found;
}

// Types a name over the one that is there and confirms it.
inline void answerRename(Evas_Object* window, const std::string& name)
{
    support::runFor(0.2);
    Evas* canvas = evas_object_evas_get(window);
    evas_key_modifier_on(canvas, "Control");
    support::key(window, "a");
    evas_key_modifier_off(canvas, "Control");
    for (const char letter : name)
        support::key(window, std::string(1, letter).c_str(), std::string(1, letter).c_str());
    support::key(window, "Return");
    support::runFor(0.1);
}

}
