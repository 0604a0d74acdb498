#pragma once

#include <Elementary.h>

namespace panekit {

// The keyboard leaves first: while its buttons go one by one, the toolkit would hand it to one that has gone already.
inline void deletePopup(Evas_Object* popup)
{
    elm_object_tree_focus_allow_set(popup, EINA_FALSE);
    evas_object_del(popup);
}

}
