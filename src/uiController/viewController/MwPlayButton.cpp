#include "MwPlayButton.h"

#include <array>
#include <libintl.h>

#include <Elementary.h>

#include <panekit/WAccessibility.h>
#include <uxt_theme.h>

#include "MwPartImage.h"

namespace {

constexpr auto ICON_PART = "elm.icon.normal";
constexpr auto LABEL_PART = "elm.text";
constexpr std::array COLORS = {"AO024", "AO024P", "AO024D"};

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
    if (!mwSetPartImage(button, ICON_PART, look.icon, COLORS.front())) {
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
    mwSetPartImage(button, ICON_PART, icon, COLORS.front());
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
