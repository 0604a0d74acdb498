#pragma once

#include <functional>

#include <panekit/WTimer.h>

typedef struct _Eo_Opaque Eo;
typedef Eo Evas_Object;
class MwModel;

// The slider of the player panel with its two times. It shows the model's position, unless the user holds the knob, and
// tells where the user wants it. Layout and model are borrowed. Main loop only.
class MwPlaySlider {
public:
    // What a key moves by, milliseconds.
    static constexpr int KEY_STEP = 5000;
    enum class Draw { Everything, WhatMoved };
    struct Panel {
        std::function<void()> pressed;
        std::function<void()> released; // the model has the position
        std::function<void(unsigned int position)> moved; // by a key or the wheel
    };

    MwPlaySlider(Evas_Object* layout, MwModel* model, Panel panel);
    MwPlaySlider(const MwPlaySlider&) = delete;
    MwPlaySlider& operator=(const MwPlaySlider&) = delete;

    // Of the recording that is loaded, milliseconds: asking the database with every tick would cost more than drawing.
    void setDuration(unsigned int duration) { _duration = duration; }
    void refresh(Draw draw);
    // The user holds the knob: nothing else may move it.
    [[nodiscard]] bool isHeld() const { return _isSliding; }
    void stop();

private:
    void _refreshSlider(Draw draw);
    void _refreshPosition();
    void _createSlider();
    void _adaptSlider(Evas_Object* slider) const;
    void _takeSliderPosition();
    void _sliderChanged();
    void _sliderPressed();
    void _sliderReleased();

    Evas_Object* _layout;
    MwModel* _model;
    Panel _panel;
    unsigned int _duration = 0;
    bool _isSliding = false;
    panekit::WTimer::Weak _sliderJob;
};
