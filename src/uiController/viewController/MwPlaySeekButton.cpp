#include "MwPlaySeekButton.h"

#include <utility>

#include <Elementary.h>

#include "MwPlayButton.h"

using panekit::WTimer;

namespace {

constexpr double FIRST_INTERVAL = 0.3; // seconds
constexpr double NEXT_INTERVAL = 0.5;
constexpr unsigned int STEP_GROWTH = 3000; // milliseconds
constexpr double CLICK_AFTER_RELEASE = 0.1; // seconds

bool contains(Evas_Object* object, const Evas_Coord_Point& point)
{
    Eina_Rectangle area;
    evas_object_geometry_get(object, &area.x, &area.y, &area.w, &area.h);
    return eina_rectangle_coords_inside(&area, point.x, point.y);
}

}

MwPlaySeekButton::MwPlaySeekButton(Evas_Object* layout, Direction direction, Panel panel)
    : _layout(layout)
    , _direction(direction)
    , _panel(std::move(panel))
    , _part(direction == Direction::Rewind ? "rew_btn" : "ff_btn")
{
}

void MwPlaySeekButton::load()
{
    if (elm_object_part_content_get(_layout, _part))
        return;
    const bool goesBack = _direction == Direction::Rewind;
    Evas_Object* button = MwPlayButton::create(_layout,
        {_part, true, goesBack ? "mainView/full_player_button_prev.png" : "mainView/full_player_button_next.png",
            nullptr, goesBack ? "IDS_MW_BUTTON_PREVIOUS" : "IDS_MW_BUTTON_NEXT"});
    if (!button)
        return;
    using Self = MwPlaySeekButton;
    const auto pressed = [](void* data, Evas_Object*, void*) { static_cast<Self*>(data)->_press(); };
    const auto unpressed = [](void* data, Evas_Object*, void*) { static_cast<Self*>(data)->_release(); };
    const auto clicked = [](void* data, Evas_Object*, void*) { static_cast<Self*>(data)->_click(); };
    evas_object_smart_callback_add(button, "pressed", pressed, this);
    evas_object_smart_callback_add(button, "unpressed", unpressed, this);
    evas_object_smart_callback_add(button, "clicked", clicked, this);
    evas_object_event_callback_add(button, EVAS_CALLBACK_MOUSE_MOVE, _heldMoveCb, this);
}

void MwPlaySeekButton::stop() { WTimer::destroy(_timer); }

void MwPlaySeekButton::_press()
{
    MwPlayButton::tint(elm_object_part_content_get(_layout, _part), MwPlayButton::Tint::PRESSED);
    WTimer::destroy(_timer);
    _timer = WTimer::addTimer(FIRST_INTERVAL, [this](void*) { return _seekTick(); });
}

bool MwPlaySeekButton::_seekTick()
{
    _seekStep += STEP_GROWTH;
    if (auto* timer = static_cast<Ecore_Timer*>(wuitimer_get_timer_handle(_timer)); timer)
        ecore_timer_interval_set(timer, NEXT_INTERVAL);
    const auto seek = _panel.seek; // outlives the panel
    return seek(_direction == Direction::Rewind ? -static_cast<long long>(_seekStep) : _seekStep);
}

bool MwPlaySeekButton::_endHold()
{
    MwPlayButton::tint(elm_object_part_content_get(_layout, _part), MwPlayButton::Tint::NORMAL);
    auto* timer = static_cast<Ecore_Timer*>(wuitimer_get_timer_handle(_timer));
    const bool wasShort = timer && ecore_timer_interval_get(timer) < NEXT_INTERVAL;
    WTimer::destroy(_timer);
    _seekStep = 0;
    return wasShort;
}

void MwPlaySeekButton::_release()
{
    _releaseTime = ecore_loop_time_get();
    if (_endHold())
        _changeFile();
}

// A click that no release came before is the keyboard's or a screen reader's.
void MwPlaySeekButton::_click()
{
    if (ecore_loop_time_get() - _releaseTime > CLICK_AFTER_RELEASE)
        _changeFile();
}

void MwPlaySeekButton::_changeFile()
{
    const auto changeFile = _panel.changeFile; // outlives the panel
    changeFile(_direction);
}

// Whoever slides off the button means neither to seek on nor to change the file.
void MwPlaySeekButton::_heldMoveCb(void* data, Evas*, Evas_Object* button, void* info)
{
    auto* self = static_cast<MwPlaySeekButton*>(data);
    const auto* event = static_cast<Evas_Event_Mouse_Move*>(info);
    if (!self->_timer.expired() && !contains(button, event->cur.canvas))
        self->_endHold();
}
