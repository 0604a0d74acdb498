#pragma once

#include <string>

typedef struct _Eo_Opaque Eo;
typedef Eo Evas_Object;

// The buttons of the player panel and how they look. Main loop only.
namespace MwPlayButton {

enum class Tint { NORMAL, PRESSED, DISABLED };

struct Look {
    const char* part;
    bool isLarge;
    const char* icon;
    const char* label; // null for none
    const char* accessibleName;
};

// Puts a button into its part of the layout; null without its picture.
Evas_Object* create(Evas_Object* layout, const Look& look);
// Another picture, with another name.
void change(Evas_Object* button, const char* icon, const char* accessibleName);
// The button may be null.
[[nodiscard]] std::string iconOf(Evas_Object* button);
void tint(Evas_Object* button, Tint tint);
void tintWhilePressed(Evas_Object* button);

}
