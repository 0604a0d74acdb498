#pragma once

#include <functional>

typedef struct _Eo_Opaque Eo;
typedef Eo Evas_Object;
class MwContentViewController;
struct MwRecordingsMode;

// Title and title buttons of the recordings screen, as its mode asks. Nothing happens before the screen has its place
// in the naviframe. The screen owns it. Main loop only.
class MwRecordingsTitle {
public:
    struct Actions {
        std::function<void()> back; // also Cancel
        std::function<void()> done;
        std::function<void()> more;
    };

    MwRecordingsTitle(MwContentViewController& screen, Actions actions);

    // count: of the checked rows.
    void _loadTitle(const MwRecordingsMode& mode, bool isEmpty, size_t count);
    void _loadTitleButtons(const MwRecordingsMode& mode, bool isEmpty);
    void _loadMoreButton(bool hasMenu);
    void _enableDoneButton(bool isPossible);

private:
    using Clicked = void (*)(void* data, Evas_Object* button, void* info);
    void _setTitleButton(const char* part, const char* style, const char* textId, Clicked clicked);

    MwContentViewController& _screen;
    Actions _actions;
};
