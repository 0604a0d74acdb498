// Look: colour and font tables with a light and a dark set, buttons and the edit field. Main loop only.
#pragma once

typedef struct _Eo_Opaque Eo;
typedef Eo Evas_Object;
typedef struct uxt_color_table_s* uxt_color_table_h;
typedef struct uxt_font_table_s* uxt_font_table_h;
typedef void (*uxt_theme_changed_cb)(void* user_data);

extern "C" {
// Null when the table cannot be read.
uxt_color_table_h uxt_theme_add_color_table(const char* path);
int uxt_theme_set_color_table(uxt_color_table_h table);
int uxt_theme_delete_color_table(uxt_color_table_h table);
uxt_font_table_h uxt_theme_add_font_table(const char* path);
int uxt_theme_set_font_table(uxt_font_table_h table);
int uxt_theme_delete_font_table(uxt_font_table_h table);
// The colour of a code such as "AO014" in the current table and theme, 0 to 255 each, not premultiplied.
// Answers false (and opaque white) for an unknown code.
bool uxt_theme_get_color(const char* code, int* red, int* green, int* blue, int* alpha);
// Tints an object and keeps it tinted when the theme changes.
int uxt_theme_object_set_color(Evas_Object* object, const char* code);
bool uxt_theme_is_dark(void);
int uxt_theme_add_changed_callback(uxt_theme_changed_cb callback, void* user_data);
int uxt_theme_remove_changed_callback(uxt_theme_changed_cb callback, void* user_data);

Evas_Object* uxt_button_add(Evas_Object* parent);
Evas_Object* uxt_button_add_with_style(Evas_Object* parent, const char* style);
// A layout with an entry; type 2 is the single-line field. The entry belongs to the layout.
Evas_Object* uxt_edit_field_layout_add(Evas_Object* parent, int type, Evas_Object** entry);
}
