#pragma once

#include <vector>

#include <Evas.h>

#include "MwSavedBookmarks.h"

// A canvas object that marks the bookmarks of a recording over its waveform: for each an image and a line below it.
// Belongs to the layout it is put into. Main loop only.
class MwTrimBookmarkWidget {
public:
    struct Mark {
        Eina_Rectangle icon;
        Eina_Rectangle line;
    };
    struct Sizes { // pixels
        int iconWidth;
        int iconHeight;
        int gap;
        int lineHeight;
    };

    // duration: milliseconds.
    static Evas_Object* add(Evas* canvas, std::vector<MwSavedBookmark> bookmarks, unsigned int duration);
    // The two parts of the next bookmark.
    static void addMark(Evas_Object* widget, Evas_Object* icon, Evas_Object* line);
    // Where they go within the area.
    static Mark place(const Eina_Rectangle& area, const Sizes& sizes, unsigned int second, unsigned int duration);

private:
    struct Data;
    static Data* _dataOf(Evas_Object* widget);
    static Evas_Smart* _smart();
    static void _addCb(Evas_Object* widget);
    static void _delCb(Evas_Object* widget);
    static void _moveCb(Evas_Object* widget, Evas_Coord x, Evas_Coord y);
    static void _resizeCb(Evas_Object* widget, Evas_Coord width, Evas_Coord height);
    static void _showCb(Evas_Object* widget);
    static void _hideCb(Evas_Object* widget);
    static void _clipSetCb(Evas_Object* widget, Evas_Object* clip);
    static void _clipUnsetCb(Evas_Object* widget);
    static void _calculateCb(Evas_Object* widget);
};
