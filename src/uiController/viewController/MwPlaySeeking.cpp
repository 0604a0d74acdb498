// The player panel: buttons that seek while they are held, and seeking by keys.
#include "MwPlayViewController.h"

#include <Elementary.h>

#include <uxt_theme.h>

#include "MwModel.h"
#include "MwPlayRules.h"

using panekit::WTimer;

namespace {

constexpr auto ICON_PART = "elm.icon.normal";
constexpr auto COLOR = "AO024";
constexpr auto PRESSED_COLOR = "AO024P";
constexpr double FIRST_INTERVAL = 0.3; // seconds
constexpr double NEXT_INTERVAL = 0.5;
constexpr unsigned int STEP_GROWTH = 3000; // milliseconds
constexpr double CLICK_AFTER_RELEASE = 0.1; // seconds

void tint(Evas_Object* view, const char* part, const char* color)
{
    Evas_Object* button = elm_object_part_content_get(view, part);
    if (Evas_Object* icon = button ? elm_object_part_content_get(button, ICON_PART) : nullptr; icon)
        uxt_theme_object_set_color(icon, color);
}

bool contains(Evas_Object* object, const Evas_Coord_Point& point)
{
    Eina_Rectangle area;
    evas_object_geometry_get(object, &area.x, &area.y, &area.w, &area.h);
    return eina_rectangle_coords_inside(&area, point.x, point.y);
}

}

// While nothing is loaded into the player, the position waits for the play button.
void MwPlayViewController::_seekTo(unsigned int position)
{
    const std::weak_ptr<void> panel = _token;
    _model->setCurrentPlayPosition(position);
    if (_model->getPlayerState() != PLAY_STATE_NONE)
        (void)_send(MwAppController::SET_PLAYER_POSITION, "set play position failed!");
    if (panel.expired())
        return;
    _refreshSlider(Draw::Everything);
    _refreshTimes();
}

void MwPlayViewController::seekBy(int milliseconds)
{
    if (!_model->getCurrentPlayPath().empty() && _duration > 0 && !_isSliding)
        _seekTo(mwSoughtPosition(_model->getCurrentPlayPosition(), milliseconds, _duration));
}

bool MwPlayViewController::takeKey(const std::string& key)
{
    if (key == "Left" || key == "Right")
        seekBy(key == "Left" ? -KEY_STEP : KEY_STEP);
    else if (key == "space")
        togglePlay();
    else
        return false;
    return true;
}

void MwPlayViewController::_pressRewButton() { _press(_rewind); }

void MwPlayViewController::_unpressRewButton() { _release(_rewind); }

void MwPlayViewController::_clickRewButton() { _click(_rewind); }

void MwPlayViewController::_pressFFButton() { _press(_fastForward); }

void MwPlayViewController::_unpressFFButton() { _release(_fastForward); }

void MwPlayViewController::_clickFFButton() { _click(_fastForward); }

void MwPlayViewController::_press(SeekButton& held)
{
    tint(getEvasObject(), held.part, PRESSED_COLOR);
    WTimer::destroy(held.timer);
    const auto tick = [](void* userData) {
        auto* button = static_cast<SeekButton*>(userData);
        if (!button) {
            MW_LOGE("userData == nullptr");
            return false;
        }
        return button->panel->_seekTick(*button);
    };
    held.timer = WTimer::addTimer(FIRST_INTERVAL, tick, &held);
}

bool MwPlayViewController::_seekTick(SeekButton& held)
{
    _seekStep += STEP_GROWTH;
    if (auto* timer = static_cast<Ecore_Timer*>(wuitimer_get_timer_handle(held.timer)); timer)
        ecore_timer_interval_set(timer, NEXT_INTERVAL);
    const long long step = held.direction == Direction::Rewind ? -static_cast<long long>(_seekStep) : _seekStep;
    _model->setCurrentPlayPosition(mwSoughtPosition(_model->getCurrentPlayPosition(), step, _duration));
    const std::weak_ptr<void> panel = _token;
    (void)_send(MwAppController::SET_PLAYER_POSITION, "set play position failed!");
    if (panel.expired())
        return false;
    _refreshSlider(Draw::Everything);
    _refreshTimes();
    return true;
}

bool MwPlayViewController::_endHold(SeekButton& held)
{
    tint(getEvasObject(), held.part, COLOR);
    auto* timer = static_cast<Ecore_Timer*>(wuitimer_get_timer_handle(held.timer));
    const bool wasShort = timer && ecore_timer_interval_get(timer) < NEXT_INTERVAL;
    WTimer::destroy(held.timer);
    _seekStep = 0;
    return wasShort;
}

void MwPlayViewController::_release(SeekButton& held)
{
    held.releaseTime = ecore_loop_time_get();
    if (_endHold(held))
        _changeFile(held.direction);
}

// A click that no release came before is the keyboard's or a screen reader's.
void MwPlayViewController::_click(const SeekButton& held)
{
    if (ecore_loop_time_get() - held.releaseTime > CLICK_AFTER_RELEASE)
        _changeFile(held.direction);
}

// Whoever slides off the button means neither to seek on nor to change the file.
void MwPlayViewController::_heldMoveCb(void* data, Evas*, Evas_Object* button, void* info)
{
    auto* held = static_cast<SeekButton*>(data);
    const auto* event = static_cast<Evas_Event_Mouse_Move*>(info);
    if (!held->timer.expired() && !contains(button, event->cur.canvas))
        held->panel->_endHold(*held);
}

void MwPlayViewController::_changeFile(Direction direction)
{
    // A redraw puts the markers of the new file in place of these.
    Evas_Object* widget = _bookmarkWidget();
    if (direction == Direction::Rewind) {
        if (!_model->getPreviousPlayPath()) {
            MW_LOGE("getPreviousPlayPath failed!!!");
            return;
        }
        if (!_send(MwAppController::PLAY_PREVIOUS, "play previous failed!"))
            return;
    } else if (!_send(MwAppController::PLAY_NEXT, "play next failed!")) {
        return;
    }
    if (widget && widget == _bookmarkWidget())
        evas_object_hide(widget);
    if (_playViewType == REPORTS_FILE_CHANGES)
        _eventSignal.emit(FILE_CHANGED);
}
