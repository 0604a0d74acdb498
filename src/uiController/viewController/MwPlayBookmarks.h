#pragma once

#include <functional>

typedef struct _Eo_Opaque Eo;
typedef Eo Evas_Object;
class MwModel;

// The bookmarks of the recording in the player panel: their markers over the slider, and the button that adds one.
// Layout and model are borrowed. Main loop only.
class MwPlayBookmarks {
public:
    MwPlayBookmarks(Evas_Object* layout, MwModel* model, std::function<void()> added);

    // Of the recording, milliseconds.
    void setDuration(unsigned int duration) { _duration = duration; }
    // Button and markers as the database has them.
    void load();
    // The markers' widget, null for none: it changes with the recording.
    [[nodiscard]] Evas_Object* _bookmarkWidget() const;
    void hide();
    void _removeBookmarkWidget();

private:
    void _loadBookmarkButton();
    void _clickBookmarkButton();
    void _loadBookmark();
    void _addMarkers(Evas_Object* widget);

    Evas_Object* _layout;
    MwModel* _model;
    std::function<void()> _added;
    unsigned int _duration = 0;
};
