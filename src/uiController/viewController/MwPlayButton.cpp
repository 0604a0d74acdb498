#include "MwPlayButton.h"

#include <array>
#include <libintl.h>

#include <Elementary.h>

#include <panekit/WAccessibility.h>
#include <uxt_theme.h>

#include "MwLog.h"
#include "MwResourceMgr.h"

namespace {

constexpr auto IMAGE_FILE = "edje/MwImages.edj";
constexpr auto ICON_PART = "elm.icon.normal";
constexpr auto LABEL_PART = "elm.text";
constexpr std::array COLORS = {"AO024", "AO024P", "AO024D"};

bool setIcon(Evas_Object* button, const char* image)
{
    std::string path;
    if (!MwResourceMgr::getInstance()->getEdjPath(IMAGE_FILE, path) || path.empty()) {
        MW_LOGE("getEdjPath fail");
        return false;
    }
    Evas_Object* icon = elm_image_add(button);
    elm_image_file_set(icon, path.c_str(), image);
    uxt_theme_object_set_color(icon, COLORS.front());
    elm_object_part_content_set(button, ICON_PART, icon);
    evas_object_show(icon);
    return true;
}

template <MwPlayButton::Tint TINT>
void tintCb(void*, Evas_Object* button, void*)
{
    MwPlayButton::tint(button, TINT);
}

}

Evas_Object* MwPlayButton::create(Evas_Object* layout, const Look& look)
{
    Evas_Object* button = uxt_button_add_with_style(
        layout, look.isLarge ? "mewlo/circle_button/large" : "mewlo/circle_button/player_small");
    if (!setIcon(button, look.icon)) {
        evas_object_del(button);
        return nullptr;
    }
    if (look.label)
        elm_object_domain_translatable_part_text_set(button, LABEL_PART, textdomain(nullptr), look.label);
    panekit::setAccessibleName(button, look.accessibleName);
    // Clicks leave the keyboard with the list.
    elm_object_focus_move_policy_set(button, ELM_FOCUS_MOVE_POLICY_KEY_ONLY);
    elm_object_part_content_set(layout, look.part, button);
    evas_object_show(button);
    return button;
}

void MwPlayButton::change(Evas_Object* button, const char* icon, const char* accessibleName)
{
    setIcon(button, icon);
    panekit::setAccessibleName(button, accessibleName);
}

std::string MwPlayButton::iconOf(Evas_Object* button)
{
    const char* image = nullptr;
    if (Evas_Object* icon = button ? elm_object_part_content_get(button, ICON_PART) : nullptr; icon)
        elm_image_file_get(icon, nullptr, &image);
    return image ? image : "";
}

void MwPlayButton::tint(Evas_Object* button, Tint tint)
{
    if (Evas_Object* icon = button ? elm_object_part_content_get(button, ICON_PART) : nullptr; icon)
        uxt_theme_object_set_color(icon, COLORS.at(static_cast<size_t>(tint)));
}

void MwPlayButton::tintWhilePressed(Evas_Object* button)
{
    evas_object_smart_callback_add(button, "pressed", tintCb<Tint::PRESSED>, nullptr);
    evas_object_smart_callback_add(button, "unpressed", tintCb<Tint::NORMAL>, nullptr);
}
