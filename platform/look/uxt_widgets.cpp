#include <uxt_theme.h>

#include <Elementary.h>

namespace {

constexpr int SINGLE_LINE_FIELD = 2;
constexpr auto FIELD_TEXT = "DEFAULT='font=Sans font_size=13'";
constexpr auto FIELD_PART = "elm.swallow.content";

}

Evas_Object* uxt_button_add(Evas_Object* parent) { return parent ? elm_button_add(parent) : nullptr; }

Evas_Object* uxt_button_add_with_style(Evas_Object* parent, const char* style)
{
    Evas_Object* button = uxt_button_add(parent);
    // A style that no theme defines keeps the default look.
    if (button && style && !elm_object_style_set(button, style))
        elm_object_style_set(button, "default");
    return button;
}

Evas_Object* uxt_edit_field_layout_add(Evas_Object* parent, int type, Evas_Object** entry)
{
    Evas_Object* layout = parent && entry ? elm_layout_add(parent) : nullptr;
    if (!layout)
        return nullptr;
    if (!elm_layout_theme_set(layout, "layout", "editfield/type.2", "default"))
        elm_layout_theme_set(layout, "layout", "application", "default");
    *entry = elm_entry_add(layout);
    elm_entry_single_line_set(*entry, type == SINGLE_LINE_FIELD);
    elm_entry_text_style_user_push(*entry, FIELD_TEXT);
    elm_entry_cnp_mode_set(*entry, ELM_CNP_MODE_PLAINTEXT);
    evas_object_size_hint_weight_set(*entry, EVAS_HINT_EXPAND, EVAS_HINT_EXPAND);
    evas_object_size_hint_align_set(*entry, EVAS_HINT_FILL, EVAS_HINT_FILL);
    elm_object_part_content_set(layout, FIELD_PART, *entry);
    return layout;
}
