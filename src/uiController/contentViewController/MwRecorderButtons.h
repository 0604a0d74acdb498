#pragma once

#include <functional>
#include <initializer_list>

typedef struct _Eo_Opaque Eo;
typedef Eo Evas_Object;

// The buttons in a recorder screen's layout, which owns them: each redraw clears them and adds those that its state
// has. A click answers its button; so do the keys of the big button that stops: Space pauses and resumes, B drops a
// bookmark, where those buttons are. It outlives the layout. Main loop only.
class MwRecorderButtons {
public:
    enum Button { RECORD, RECORDINGS, STOP, BOOKMARK, PAUSE, RESUME, DISCARD, BUTTONS };
    using Clicked = std::function<void(Button)>;

    MwRecorderButtons(Evas_Object* layout, Clicked clicked);
    MwRecorderButtons(const MwRecorderButtons&) = delete;
    MwRecorderButtons& operator=(const MwRecorderButtons&) = delete;

    void clear();
    void add(std::initializer_list<Button> buttons);
    // Gives the keyboard to the big one.
    void focusMain();
    // A second tap must not send the command again; the next redraw builds a fresh button.
    void ignoreFurtherClicks(Button button);

private:
    struct Look;
    struct Slot {
        MwRecorderButtons* buttons;
        Button button;
    };

    static const Look& _look(Button button);
    Evas_Object* _get(Button button) const;
    void _create(Button button);
    static void _clickedCb(void* data, Evas_Object* object, void* info);
    static void _stopKeyCb(void* data, Eo* canvas, Evas_Object* object, void* info);

    Evas_Object* _layout;
    Clicked _clicked;
    Slot _slots[BUTTONS];
};
