#include "MwPlaySlider.h"

#include <Elementary.h>

#include <cmath>
#include <utility>

#include <panekit/WAccessibility.h>

#include "MwModel.h"
#include "MwPlayRules.h"

using panekit::WTimer;

namespace {

constexpr auto SLIDER_PART = "slider";
constexpr auto SLIDER_STYLE = "mewlo/player";
constexpr auto POSITION_PART = "slider_text_playing";
constexpr auto TOTAL_PART = "slider_text_total";

// Texts change once a second; the panel looks fifty times.
void showText(Evas_Object* view, const char* part, const std::string& text)
{
    const char* shown = elm_object_part_text_get(view, part);
    if (!shown || text != shown)
        elm_object_part_text_set(view, part, text.c_str());
}

bool movesByAPixel(Evas_Object* slider, double value)
{
    int width = 0;
    evas_object_geometry_get(slider, nullptr, nullptr, &width, nullptr);
    return std::abs(value - elm_slider_value_get(slider)) * width >= 1.0;
}

}

MwPlaySlider::MwPlaySlider(Evas_Object* layout, MwModel* model, Panel panel)
    : _layout(layout)
    , _model(model)
    , _panel(std::move(panel))
{
}

void MwPlaySlider::stop() { WTimer::destroy(_sliderJob); }

void MwPlaySlider::refresh(Draw draw)
{
    _refreshSlider(draw);
    showText(_layout, TOTAL_PART, mwPlayTotalText(_duration));
    if (!_isSliding)
        _refreshPosition();
}

void MwPlaySlider::_refreshSlider(Draw draw)
{
    if (!elm_object_part_content_get(_layout, SLIDER_PART))
        _createSlider();
    if (_isSliding)
        return;
    Evas_Object* slider = elm_object_part_content_get(_layout, SLIDER_PART);
    if (draw == Draw::Everything)
        _adaptSlider(slider);
    const double value = mwPlayRatio(_model->getCurrentPlayPosition(), _duration);
    if (draw == Draw::Everything || movesByAPixel(slider, value))
        elm_slider_value_set(slider, value);
}

// Its own keys and the wheel move as far as the keys of the list; nothing moves in a recording of unknown length.
void MwPlaySlider::_adaptSlider(Evas_Object* slider) const
{
    elm_object_disabled_set(slider, _duration == 0);
    if (_duration > 0)
        elm_slider_step_set(slider, mwPlayRatio(KEY_STEP, _duration));
}

void MwPlaySlider::_refreshPosition()
{
    showText(_layout, POSITION_PART, mwPlayPositionText(_model->getCurrentPlayPosition(), _duration));
}

void MwPlaySlider::_createSlider()
{
    Evas_Object* slider = elm_slider_add(_layout);
    elm_object_style_set(slider, SLIDER_STYLE);
    evas_object_size_hint_weight_set(slider, EVAS_HINT_EXPAND, 0.0);
    evas_object_size_hint_align_set(slider, EVAS_HINT_FILL, 0.5);
    elm_slider_min_max_set(slider, 0.0, 1.0);
    panekit::setAccessibleName(slider, "IDS_MW_BODY_POSITION");
    elm_object_focus_move_policy_set(slider, ELM_FOCUS_MOVE_POLICY_KEY_ONLY);
    using Self = MwPlaySlider;
    const auto changed = [](void* data, Evas_Object*, void*) { static_cast<Self*>(data)->_sliderChanged(); };
    const auto pressed = [](void* data, Evas*, Evas_Object*, void*) { static_cast<Self*>(data)->_sliderPressed(); };
    const auto released = [](void* data, Evas*, Evas_Object*, void*) { static_cast<Self*>(data)->_sliderReleased(); };
    evas_object_smart_callback_add(slider, "changed", changed, this);
    evas_object_event_callback_add(slider, EVAS_CALLBACK_MOUSE_DOWN, pressed, this);
    evas_object_event_callback_add(slider, EVAS_CALLBACK_MOUSE_UP, released, this);
    elm_object_part_content_set(_layout, SLIDER_PART, slider);
    evas_object_show(slider);
}

void MwPlaySlider::_takeSliderPosition()
{
    const Evas_Object* slider = elm_object_part_content_get(_layout, SLIDER_PART);
    _model->setCurrentPlayPosition(static_cast<unsigned int>(elm_slider_value_get(slider) * _duration));
}

// A tap on the line moves the knob before it is reported as pressed. What is still not held a moment later was moved by
// a key or the wheel, and nobody will let it go.
void MwPlaySlider::_sliderChanged()
{
    _takeSliderPosition();
    _refreshPosition();
    WTimer::destroy(_sliderJob);
    if (_isSliding)
        return;
    const unsigned int position = _model->getCurrentPlayPosition();
    _sliderJob = WTimer::addJob([this, position](void*) {
        if (!_isSliding)
            _panel.moved(position);
    });
}

void MwPlaySlider::_sliderPressed()
{
    _isSliding = true;
    _panel.pressed();
    _refreshPosition();
}

void MwPlaySlider::_sliderReleased()
{
    if (!std::exchange(_isSliding, false))
        return;
    _takeSliderPosition();
    const auto released = _panel.released; // outlives the panel
    released();
}
