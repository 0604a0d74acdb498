#pragma once

#include <string>
#include <vector>

#include <Evas.h>

#include "MwSavedBookmarks.h"

// A canvas object that marks the bookmarks of a recording along its width: one image for each, in the order of the
// list. Belongs to the layout it is put into and takes its list along when it goes. Main loop only.
class MwBookmarkWidget {
public:
    struct Point {
        int x;
        int y;
    };

    // duration: milliseconds. The list is by rising time.
    static Evas_Object* add(Evas* canvas, std::vector<MwSavedBookmark> bookmarks, unsigned int duration);
    // The image of the next bookmark.
    static void addMarker(Evas_Object* widget, Evas_Object* image);
    // Whether this is what the widget shows.
    static bool shows(Evas_Object* widget, const std::vector<MwSavedBookmark>& bookmarks, unsigned int duration);
    // Borrowed while the widget lives; null for another object.
    static const std::vector<MwSavedBookmark>* getBookmarks(Evas_Object* widget);
    // Where a marker of a size goes within the area.
    static Point place(const Eina_Rectangle& area, int size, unsigned int second, unsigned int duration);

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
