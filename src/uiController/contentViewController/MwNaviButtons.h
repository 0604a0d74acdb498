#pragma once

typedef struct _Eo_Opaque Eo;
typedef Eo Evas_Object;

// Buttons in the title bar of a screen, item being the screen's item in the naviframe. Main loop only.

using MwNaviCallback = void (*)(void* data, Evas_Object* button, void* info);

// The arrow in front of the title. Answers the button, null on failure.
Evas_Object* mwSetBackButton(Evas_Object* item, MwNaviCallback clicked, void* data);
// A word before or behind the title: part "title_left_btn" or "title_right_btn", style "naviframe/title_left" or
// "naviframe/title_right". textId: a string identifier.
Evas_Object* mwSetTitleButton(
    Evas_Object* item, const char* part, const char* style, const char* textId, MwNaviCallback clicked, void* data);
// Removes the button of a part, if there is one.
void mwRemoveNaviButton(Evas_Object* item, const char* part);
