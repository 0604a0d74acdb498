#pragma once

#include <functional>

#include <panekit/WTimer.h>

typedef struct _Eo_Opaque Eo;
typedef Eo Evas_Object;

// Previous or next in the player panel: a short press changes the file, a long one seeks, in steps that grow. The
// button lies in the layout, which is borrowed and owns it. Main loop only.
class MwPlaySeekButton {
public:
    enum class Direction { Rewind, FastForward };
    struct Panel {
        std::function<void(Direction direction)> changeFile;
        // By milliseconds, negative: back. False when the panel has gone over it, and this with it.
        std::function<bool(long long step)> seek;
    };

    MwPlaySeekButton(Evas_Object* layout, Direction direction, Panel panel);
    MwPlaySeekButton(const MwPlaySeekButton&) = delete;
    MwPlaySeekButton& operator=(const MwPlaySeekButton&) = delete;

    // Creates the button, if it is not there.
    void load();
    // Ends a hold.
    void stop();

private:
    void _press();
    void _release();
    void _click();
    // Answers whether the hold was a short one.
    bool _endHold();
    bool _seekTick();
    void _changeFile();
    static void _heldMoveCb(void* data, Eo* canvas, Evas_Object* button, void* info);

    Evas_Object* _layout;
    Direction _direction;
    Panel _panel;
    const char* _part;
    panekit::WTimer::Weak _timer; // runs while the button is held
    double _releaseTime = 0; // seconds of the loop
    unsigned int _seekStep = 0; // milliseconds, grows while the button is held
};
