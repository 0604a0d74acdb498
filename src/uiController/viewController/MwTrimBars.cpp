#include "MwTrimBars.h"

#include <Elementary.h>

#include <algorithm>
#include <array>
#include <cmath>
#include <utility>

#include <panekit/WAccessibility.h>

#include "MwLog.h"
#include "MwResourceMgr.h"

namespace {

constexpr auto LAYOUT_FILE = "edje/MwTrimView.edj";
constexpr auto SIDE_BAR_GROUP = "trim_side_bar";
constexpr auto PLAY_BAR_GROUP = "trim_playing_point_bar";
constexpr auto SHADOW_GROUP = "trim_shadow";
constexpr auto WAVEFORM_PART = "waveform";
constexpr auto TOUCH_PART = "touch_area";
constexpr auto SLIDER_STYLE = "mewlo/trim_bar";
constexpr int SIDE_BAR = 17; // design units
constexpr int PLAY_BAR = 5;
constexpr long long KEY_STEP = 100; // milliseconds
constexpr long long LONG_KEY_STEP = 1000;

struct BarLook {
    const char* part;
    const char* place; // what moves
    const char* sliderPart;
    const char* group;
    const char* name;
};
constexpr std::array<BarLook, 3> LOOKS = {{
    {.part = "start_bar",
        .place = "start_place",
        .sliderPart = "start_slider",
        .group = SIDE_BAR_GROUP,
        .name = "IDS_MW_BODY_TRIM_START"},
    {.part = "end_bar",
        .place = "end_place",
        .sliderPart = "end_slider",
        .group = SIDE_BAR_GROUP,
        .name = "IDS_MW_BODY_TRIM_END"},
    {.part = "play_bar",
        .place = "play_place",
        .sliderPart = "play_slider",
        .group = PLAY_BAR_GROUP,
        .name = "IDS_MW_BODY_POSITION"},
}};

int scaled(int units) { return static_cast<int>(units * elm_config_scale_get() / elm_app_base_scale_get()); }

Evas_Object* addGroup(Evas_Object* layout, const char* part, const char* group)
{
    std::string path;
    Evas_Object* object = elm_layout_add(layout);
    if (!MwResourceMgr::getInstance()->getEdjPath(LAYOUT_FILE, path)
        || elm_layout_file_set(object, path.c_str(), group) == EINA_FALSE)
        MW_LOGE("getEdjPath fail");
    evas_object_pass_events_set(object, EINA_TRUE);
    elm_object_part_content_set(layout, part, object);
    evas_object_show(object);
    return object;
}

}

MwTrimBars::MwTrimBars(Evas_Object* layout, MwTrimRange& range, Callbacks callbacks)
    : _layout(layout)
    , _range(range)
    , _callbacks(std::move(callbacks))
    , _handles{{this, START, nullptr}, {this, END, nullptr}, {this, PLAY, nullptr}}
{
    _initTrimBar();
}

MwTrimBars::~MwTrimBars()
{
    if (_touch)
        evas_object_del(_touch);
    for (const Handle& handle : _handles)
        evas_object_del(handle.slider);
}

void MwTrimBars::_initTrimBar()
{
    _createShadows();
    for (const Bar bar : {START, END, PLAY})
        _createBar(bar);
    _createTouchArea();
    update();
}

void MwTrimBars::_createShadows()
{
    _trimStartShadow = addGroup(_layout, "start_shadow", SHADOW_GROUP);
    _trimEndShadow = addGroup(_layout, "end_shadow", SHADOW_GROUP);
}

// A bar is what is seen; the slider in the same place is what the keyboard and a screen reader find.
void MwTrimBars::_createBar(Bar bar)
{
    const BarLook& look = LOOKS[bar];
    Evas_Object* shown = addGroup(_layout, look.part, look.group);
    (bar == START ? _trimStartBar : bar == END ? _trimEndBar : _trimPlayBar) = shown;
    Evas_Object* slider = elm_slider_add(_layout);
    elm_object_style_set(slider, SLIDER_STYLE);
    panekit::setAccessibleName(slider, look.name);
    elm_slider_min_max_set(slider, 0, std::max(1U, _range.getDuration()) / 1000.0);
    elm_slider_step_set(slider, static_cast<double>(KEY_STEP) / std::max(1U, _range.getDuration()));
    elm_object_focus_move_policy_set(slider, ELM_FOCUS_MOVE_POLICY_KEY_ONLY);
    evas_object_pass_events_set(slider, EINA_TRUE);
    _handles[bar].slider = slider;
    evas_object_smart_callback_add(slider, "changed", _changedCb, &_handles[bar]);
    // Before the slider makes steps of its own.
    for (Evas_Object* object : {slider, elm_layout_edje_get(slider)})
        evas_object_event_callback_priority_add(
            object, EVAS_CALLBACK_KEY_DOWN, EVAS_CALLBACK_PRIORITY_BEFORE, _keyCb, &_handles[bar]);
    elm_object_part_content_set(_layout, look.sliderPart, slider);
    evas_object_show(slider);
}

void MwTrimBars::_createTouchArea()
{
    _touch = evas_object_rectangle_add(evas_object_evas_get(_layout));
    evas_object_color_set(_touch, 0, 0, 0, 0);
    using Self = MwTrimBars;
    evas_object_event_callback_add(
        _touch, EVAS_CALLBACK_MOUSE_DOWN, _eventCb<&Self::_pressedWaveform, Evas_Event_Mouse_Down>, this);
    evas_object_event_callback_add(
        _touch, EVAS_CALLBACK_MOUSE_MOVE, _eventCb<&Self::_movedWaveform, Evas_Event_Mouse_Move>, this);
    evas_object_event_callback_add(_touch, EVAS_CALLBACK_MOUSE_UP, _releasedCb, this);
    evas_object_event_callback_add(_touch, EVAS_CALLBACK_RESIZE, _resizedCb, this);
    evas_object_event_callback_add(_touch, EVAS_CALLBACK_DEL, _touchDeletedCb, this);
    elm_object_part_content_set(_layout, TOUCH_PART, _touch);
    evas_object_show(_touch);
}

void MwTrimBars::_updateGeometry()
{
    int width = 0;
    edje_object_part_geometry_get(elm_layout_edje_get(_layout), WAVEFORM_PART, nullptr, nullptr, &width, nullptr);
    _range.setGeometry({static_cast<double>(width), static_cast<double>(scaled(SIDE_BAR)),
        static_cast<double>(std::max(1, scaled(PLAY_BAR)))});
}

void MwTrimBars::update()
{
    _updateGeometry();
    const MwTrimRange::Geometry& geometry = _range.getGeometry();
    const unsigned int position
        = _press == MwTrimRange::PLAY_POSITION_BAR_PRESSED ? _dragPosition : _callbacks.getPosition();
    const double whole = geometry.waveform + 2 * geometry.sideBar;
    const auto move = [&](Bar bar, double x, double width) {
        const double share = whole > width ? x / (whole - width) : 0;
        edje_object_part_drag_value_set(elm_layout_edje_get(_layout), LOOKS[bar].place, share, 0);
        const double value = static_cast<double>(_valueOf(bar)) / 1000;
        if (std::abs(elm_slider_value_get(_handles[bar].slider) - value) >= 0.001)
            elm_slider_value_set(_handles[bar].slider, value);
    };
    move(START, _range.getStartX(), geometry.sideBar);
    move(END, _range.getEndX(), geometry.sideBar);
    move(PLAY, _range.getPlayX(position), geometry.playBar);
}

long long MwTrimBars::_valueOf(Bar bar) const
{
    switch (bar) {
    case START:
        return _range.getBegin();
    case END:
        return _range.getEnd();
    case PLAY:
    case BAR_COUNT:
        break;
    }
    return _press == MwTrimRange::PLAY_POSITION_BAR_PRESSED ? _dragPosition : _callbacks.getPosition();
}

void MwTrimBars::_setValue(Bar bar, long long time)
{
    if (bar == PLAY)
        return _callbacks.onPositionChosen(_range.confine(time));
    bar == START ? _range.setBegin(time) : _range.setEnd(time);
    _callbacks.onRangeMoved();
}

void MwTrimBars::_changedCb(void* data, Evas_Object* slider, void*)
{
    const auto* handle = static_cast<Handle*>(data);
    handle->bars->_setValue(handle->bar, std::llround(elm_slider_value_get(slider) * 1000));
}

void MwTrimBars::_keyCb(void* data, Evas*, Evas_Object*, void* info)
{
    auto* event = static_cast<Evas_Event_Key_Down*>(info);
    const bool hasShift = evas_key_modifier_is_set(event->modifiers, "Shift") != EINA_FALSE;
    const auto* handle = static_cast<Handle*>(data);
    if ((event->event_flags & EVAS_EVENT_FLAG_ON_HOLD) == 0
        && handle->bars->_takeKey(handle->bar, event->key, hasShift))
        event->event_flags = static_cast<Evas_Event_Flags>(event->event_flags | EVAS_EVENT_FLAG_ON_HOLD);
}

bool MwTrimBars::_takeKey(Bar bar, const std::string& key, bool hasShift)
{
    const long long step = hasShift ? LONG_KEY_STEP : KEY_STEP;
    if (key == "Left" || key == "KP_Left")
        _setValue(bar, _valueOf(bar) - step);
    else if (key == "Right" || key == "KP_Right")
        _setValue(bar, _valueOf(bar) + step);
    else if (key == "Home" || key == "KP_Home")
        _setValue(bar, 0);
    else if (key == "End" || key == "KP_End")
        _setValue(bar, _range.getDuration());
    else
        return false;
    return true;
}

void MwTrimBars::focus() { elm_object_focus_set(_handles[START].slider, EINA_TRUE); }

void MwTrimBars::_pressedWaveform(const Evas_Event_Mouse_Down& event)
{
    if (event.button != 1)
        return;
    int left = 0;
    evas_object_geometry_get(_touch, &left, nullptr, nullptr, nullptr);
    _dragPosition = _callbacks.getPosition();
    _press = _range.press(event.canvas.x - left, _dragPosition);
    _playRest = 0;
    _lastMove = event.timestamp;
    if (_press != MwTrimRange::NONE)
        _callbacks.onPressed(_press);
}

// Finer the further the finger is off the waveform, and where it goes slowly.
double MwTrimBars::_stepOf(const Evas_Event_Mouse_Move& event)
{
    int top = 0;
    int height = 0;
    evas_object_geometry_get(_touch, nullptr, &top, nullptr, &height);
    const double away = std::max({0, top - event.cur.canvas.y, event.cur.canvas.y - top - height});
    const double elapsed = std::max(1U, event.timestamp - std::exchange(_lastMove, event.timestamp)) / 1000.0;
    return _range.stepOf(away, std::abs(event.cur.canvas.x - event.prev.canvas.x) / elapsed);
}

void MwTrimBars::_movedWaveform(const Evas_Event_Mouse_Move& event)
{
    if (_press == MwTrimRange::NONE)
        return;
    const double pixels = (event.cur.canvas.x - event.prev.canvas.x) * _stepOf(event);
    switch (_press) {
    case MwTrimRange::START_TRIM_BAR_PRESSED:
        _range.moveStart(pixels);
        return _callbacks.onRangeMoved();
    case MwTrimRange::END_TRIM_BAR_PRESSED:
        _range.moveEnd(pixels);
        return _callbacks.onRangeMoved();
    case MwTrimRange::PLAY_POSITION_BAR_PRESSED:
        // The bar stands on whole pixels: what a slow finger does in between adds up.
        _playRest += pixels;
        if (std::abs(_playRest) < 1)
            return;
        _dragPosition = _range.movePlay(_dragPosition, std::exchange(_playRest, 0));
        return _callbacks.onPositionMoved(_dragPosition);
    case MwTrimRange::NONE:
        return;
    }
}

void MwTrimBars::_unpressedWaveform()
{
    const MwTrimRange::Press released = std::exchange(_press, MwTrimRange::NONE);
    if (released == MwTrimRange::NONE)
        return;
    if (released == MwTrimRange::PLAY_POSITION_BAR_PRESSED)
        _callbacks.onPositionChosen(_dragPosition);
    _callbacks.onPressed(MwTrimRange::NONE);
}
