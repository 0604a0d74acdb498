#pragma once

#include <Elementary.h>

#include <functional>
#include <utility>

namespace panekit {

// The keyboard leaves first: while its buttons go one by one, the toolkit would hand it to one that has gone already.
inline void deletePopup(Evas_Object* popup)
{
    elm_object_tree_focus_allow_set(popup, EINA_FALSE);
    evas_object_del(popup);
}

// Who wants to know that a popup is gone: the screen that it is attached to, then whoever opened it. Told once.
struct PopupEnd {
    std::function<void()> onDetached;
    std::function<void()> onDestroyed;

    void tell()
    {
        const auto detached = std::exchange(onDetached, nullptr);
        const auto destroyed = std::exchange(onDestroyed, nullptr);
        if (detached)
            detached();
        if (destroyed)
            destroyed();
    }
};

}
