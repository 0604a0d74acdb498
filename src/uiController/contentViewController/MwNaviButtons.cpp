#include "MwNaviButtons.h"

#include <Elementary.h>

#include <libintl.h>

#include <panekit/WAccessibility.h>
#include <uxt_theme.h>

#include "MwLog.h"

namespace {

constexpr auto BACK_PART = "prev_btn";
constexpr auto BACK_STYLE = "naviframe/back_btn/default";

Evas_Object* setButton(Evas_Object* item, const char* part, const char* style, MwNaviCallback clicked, void* data)
{
    Evas_Object* button = uxt_button_add_with_style(elm_object_item_widget_get(item), style);
    if (!button) {
        MW_LOGE("uxt_button_add fail");
        return nullptr;
    }
    // A click leaves the keyboard with the list.
    elm_object_focus_move_policy_set(button, ELM_FOCUS_MOVE_POLICY_KEY_ONLY);
    evas_object_smart_callback_add(button, "clicked", clicked, data);
    elm_object_item_part_content_set(item, part, button);
    evas_object_show(button);
    return button;
}

}

Evas_Object* mwSetBackButton(Evas_Object* item, MwNaviCallback clicked, void* data)
{
    Evas_Object* button = setButton(item, BACK_PART, BACK_STYLE, clicked, data);
    panekit::setAccessibleName(button, "IDS_MW_BUTTON_BACK");
    return button;
}

Evas_Object* mwSetTitleButton(
    Evas_Object* item, const char* part, const char* style, const char* textId, MwNaviCallback clicked, void* data)
{
    Evas_Object* button = setButton(item, part, style, clicked, data);
    if (button)
        elm_object_domain_translatable_part_text_set(button, nullptr, textdomain(nullptr), textId);
    return button;
}

void mwRemoveNaviButton(Evas_Object* item, const char* part)
{
    evas_object_del(elm_object_item_part_content_unset(item, part));
}
