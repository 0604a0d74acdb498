#pragma once

#include <functional>
#include <string>

#include <Evas.h>

#include "MwTrimRange.h"

// The three bars over the waveform, what they shade, and how they are moved: by finger on one touch area above them
// all, by keys on the focused one, by a screen reader. Belongs to the panel; its objects to the panel's layout, which
// keeps the bars in place when it changes its size. Main loop only.
class MwTrimBars {
public:
    struct Callbacks {
        std::function<unsigned int()> getPosition; // of playing, milliseconds
        std::function<void()> onRangeMoved;
        // A finger holds the play bar, or has let it go.
        std::function<void(unsigned int position)> onPositionMoved;
        std::function<void(unsigned int position)> onPositionChosen;
        std::function<void(MwTrimRange::Press bar)> onPressed; // and NONE
    };

    // The range is borrowed.
    MwTrimBars(Evas_Object* layout, MwTrimRange& range, Callbacks callbacks);
    ~MwTrimBars();
    MwTrimBars(const MwTrimBars&) = delete;
    MwTrimBars& operator=(const MwTrimBars&) = delete;

    // Puts the bars where range and position say.
    void update();
    [[nodiscard]] MwTrimRange::Press getPressed() const { return _press; }
    void focus();

private:
    enum Bar { START, END, PLAY, BAR_COUNT };
    struct Handle {
        MwTrimBars* bars;
        Bar bar;
        Evas_Object* slider;
    };

    void _initTrimBar();
    void _createBar(Bar bar);
    void _createShadows();
    void _createTouchArea();
    void _updateGeometry();
    void _setValue(Bar bar, long long time);
    bool _takeKey(Bar bar, const std::string& key, bool hasShift);
    [[nodiscard]] long long _valueOf(Bar bar) const;
    void _pressedWaveform(const Evas_Event_Mouse_Down& event);
    void _movedWaveform(const Evas_Event_Mouse_Move& event);
    void _unpressedWaveform();
    [[nodiscard]] double _stepOf(const Evas_Event_Mouse_Move& event);

    template <auto Operation, typename Event>
    static void _eventCb(void* data, Evas*, Evas_Object*, void* info)
    {
        (static_cast<MwTrimBars*>(data)->*Operation)(*static_cast<Event*>(info));
    }
    static void _releasedCb(void* data, Evas*, Evas_Object*, void*)
    {
        static_cast<MwTrimBars*>(data)->_unpressedWaveform();
    }
    static void _resizedCb(void* data, Evas*, Evas_Object*, void*) { static_cast<MwTrimBars*>(data)->update(); }
    static void _touchDeletedCb(void* data, Evas*, Evas_Object*, void*)
    {
        static_cast<MwTrimBars*>(data)->_touch = nullptr;
    }
    static void _changedCb(void* data, Evas_Object* slider, void*);
    static void _keyCb(void* data, Evas*, Evas_Object*, void* info);

    Evas_Object* _layout;
    MwTrimRange& _range;
    Callbacks _callbacks;
    Evas_Object* _touch = nullptr;
    Evas_Object* _trimStartBar = nullptr;
    Evas_Object* _trimEndBar = nullptr;
    Evas_Object* _trimPlayBar = nullptr;
    Evas_Object* _trimStartShadow = nullptr;
    Evas_Object* _trimEndShadow = nullptr;
    Handle _handles[BAR_COUNT];
    MwTrimRange::Press _press = MwTrimRange::NONE;
    double _playRest = 0; // milliseconds that a slow finger has not yet made
    unsigned int _dragPosition = 0;
    unsigned int _lastMove = 0; // milliseconds of the canvas
};
