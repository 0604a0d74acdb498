#define EFL_BETA_API_SUPPORT 1
#include "ControlWindow.h"

#include "device.h"
#include "launch/Toolkit.h"
#include "preference.h"
#include "state/Trees.h"
#include "vconf.h"
#include <MainLoop.h>
#include <StateKeys.h>

#include <Ecore_Input.h>
#include <Elementary.h>
#include <efl_access_object.eo.h>

#include <algorithm>
#include <cstring>
#include <utility>

namespace platform {

namespace {

    constexpr auto DATA_KEY = "minicontrol";
    constexpr int WHOLE = 1000; // places are thousandths of the free room

    // Where the user dragged it last; kept in thousandths, so that it is right on every monitor.
    struct Place {
        int x;
        int y;
    };

    std::string preferenceOf(minicontrol_viewer_e viewer, const char* side)
    {
        return (viewer == MINICONTROL_VIEWER_PANEL ? "PanelControl" : "LockscreenControl") + std::string(side);
    }

    Place placeOf(minicontrol_viewer_e viewer)
    {
        Place place = viewer == MINICONTROL_VIEWER_PANEL ? Place{WHOLE / 2, 0} : Place{WHOLE / 2, WHOLE * 4 / 5};
        preference_get_int(preferenceOf(viewer, "X").c_str(), &place.x);
        preference_get_int(preferenceOf(viewer, "Y").c_str(), &place.y);
        return {std::clamp(place.x, 0, WHOLE), std::clamp(place.y, 0, WHOLE)};
    }

    bool isDisplayOn()
    {
        return stateInt(KEY_DISPLAY_STATE).value_or(DISPLAY_STATE_NORMAL) != DISPLAY_STATE_SCREEN_OFF;
    }

    bool isLocked() { return stateInt(VCONFKEY_IDLE_LOCK_STATE).value_or(0) != 0; }

    // Whether the pointer is on something that takes it for itself.
    bool isOnControl(Evas_Object* window, int x, int y)
    {
        Evas* canvas = evas_object_evas_get(window);
        for (Evas_Object* object = evas_object_top_at_xy_get(canvas, x, y, EINA_FALSE, EINA_FALSE); object != nullptr;
             object = evas_object_smart_parent_get(object)) {
            if (elm_object_widget_check(object) != EINA_FALSE
                && std::strcmp(elm_object_widget_type_get(object), "Efl.Ui.Button_Legacy") == 0)
                return true;
        }
        return false;
    }

}

Evas_Object* ControlWindow::create(
    const char* name, minicontrol_viewer_e viewer, minicontrol_provider_event_cb callback)
{
    Evas_Object* window = elm_win_add(nullptr, name, ELM_WIN_BASIC);
    if (window == nullptr)
        return nullptr;
    elm_win_title_set(window, name);
    elm_win_borderless_set(window, EINA_TRUE);
    elm_win_autodel_set(window, EINA_FALSE);
    auto* self = new ControlWindow(window, viewer, callback);
    evas_object_data_set(window, DATA_KEY, self);
    self->_listen();
    self->_showToScreenReaders(false);
    return window;
}

const ControlWindow* ControlWindow::of(const Evas_Object* window)
{
    return window != nullptr ? static_cast<const ControlWindow*>(evas_object_data_get(window, DATA_KEY)) : nullptr;
}

ControlWindow::ControlWindow(Evas_Object* window, minicontrol_viewer_e viewer, minicontrol_provider_event_cb callback)
    : _window(window)
    , _viewer(viewer)
    , _callback(callback)
{
}

ControlWindow::~ControlWindow()
{
    evas_object_intercept_show_callback_del(_window, _showCb);
    evas_object_intercept_hide_callback_del(_window, _hideCb);
    if (_job != nullptr)
        ecore_job_del(_job);
    for (Ecore_Event_Handler* handler : _handlers)
        ecore_event_handler_del(handler);
    for (const auto watch : _watches)
        stateTree().unwatch(watch);
}

void ControlWindow::_listen()
{
    evas_object_event_callback_add(
        _window, EVAS_CALLBACK_DEL,
        [](void* self, Evas*, Evas_Object*, void*) { delete static_cast<ControlWindow*>(self); }, this);
    evas_object_event_callback_add(
        _window, EVAS_CALLBACK_RESIZE,
        [](void* self, Evas*, Evas_Object*, void*) { static_cast<ControlWindow*>(self)->_place(); }, this);
    evas_object_smart_callback_add(
        _window, "delete,request",
        [](void* data, Evas_Object*, void*) {
            if (const auto callback = static_cast<ControlWindow*>(data)->_callback; callback != nullptr)
                callback(MINICONTROL_PROVIDER_EVENT_REQUEST_HIDE, nullptr);
        },
        this);
    evas_object_intercept_show_callback_add(_window, _showCb, this);
    evas_object_intercept_hide_callback_add(_window, _hideCb, this);
    for (const char* key : {VCONFKEY_IDLE_LOCK_STATE, KEY_DISPLAY_STATE})
        _watches.push_back(stateTree().watch(key, [this](const std::string&) { _apply(); }));
    if (elm_win_xwindow_get(_window) != 0)
        _listenToX11();
}

void ControlWindow::_listenToX11()
{
    _desktop = std::make_unique<host::X11Desktop>([this] { _later(); });
    _handlers.push_back(ecore_event_handler_add(
        ECORE_X_EVENT_WINDOW_VISIBILITY_CHANGE,
        [](void* data, int, void* event) -> Eina_Bool {
            auto* self = static_cast<ControlWindow*>(data);
            const auto* change = static_cast<Ecore_X_Event_Window_Visibility_Change*>(event);
            if (change->win == elm_win_xwindow_get(self->_window)) {
                self->_isCovered = change->fully_obscured != 0;
                self->_tellWhetherSeen();
            }
            return ECORE_CALLBACK_PASS_ON;
        },
        this));
    _listenToPointer();
}

// The window has no title bar: it is dragged by whatever of it takes no clicks.
void ControlWindow::_listenToPointer()
{
    _handlers.push_back(ecore_event_handler_add(
        ECORE_EVENT_MOUSE_BUTTON_DOWN,
        [](void* data, int, void* event) -> Eina_Bool {
            auto* self = static_cast<ControlWindow*>(data);
            const auto* press = static_cast<Ecore_Event_Mouse_Button*>(event);
            if (press->window == elm_win_xwindow_get(self->_window) && !isOnControl(self->_window, press->x, press->y))
                self->_beginDrag(press->x, press->y);
            return ECORE_CALLBACK_PASS_ON;
        },
        this));
    _handlers.push_back(ecore_event_handler_add(
        ECORE_EVENT_MOUSE_MOVE,
        [](void* self, int, void* event) -> Eina_Bool {
            const auto* move = static_cast<Ecore_Event_Mouse_Move*>(event);
            static_cast<ControlWindow*>(self)->_drag(move->root.x, move->root.y);
            return ECORE_CALLBACK_PASS_ON;
        },
        this));
    _handlers.push_back(ecore_event_handler_add(
        ECORE_EVENT_MOUSE_BUTTON_UP,
        [](void* self, int, void* event) -> Eina_Bool {
            const auto* release = static_cast<Ecore_Event_Mouse_Button*>(event);
            static_cast<ControlWindow*>(self)->_endDrag(release->root.x, release->root.y);
            return ECORE_CALLBACK_PASS_ON;
        },
        this));
}

void ControlWindow::_showCb(void* self, Evas_Object*) { static_cast<ControlWindow*>(self)->_wish(true); }

void ControlWindow::_hideCb(void* self, Evas_Object*) { static_cast<ControlWindow*>(self)->_wish(false); }

void ControlWindow::_wish(bool wanted)
{
    if (std::exchange(_isOurs, false)) {
        wanted ? evas_object_show(_window) : evas_object_hide(_window);
        return;
    }
    _isWanted = wanted;
    _apply();
}

// Many changes come together.
void ControlWindow::_later()
{
    if (_job != nullptr)
        return;
    _job = ecore_job_add(
        [](void* data) {
            auto* self = static_cast<ControlWindow*>(data);
            self->_job = nullptr;
            self->_apply();
            if (self->_isOnScreen)
                self->_place();
        },
        this);
}

void ControlWindow::_apply()
{
    _setOnScreen(_isWanted && _hasPlace());
    _tellWhetherSeen();
}

bool ControlWindow::_hasPlace() const
{
    if (!_desktop)
        return true; // no desktop at all, as in a test
    if (_viewer == MINICONTROL_VIEWER_LOCKSCREEN)
        return isLocked();
    if (_desktop->isCoveredByFullScreen())
        return false;
    auto* main = static_cast<Evas_Object*>(mainWindow());
    return main == nullptr || isLocked() || !host::X11Desktop::isInView(elm_win_xwindow_get(main));
}

void ControlWindow::_setOnScreen(bool on)
{
    if (on == _isOnScreen)
        return;
    _isOnScreen = on;
    _isCovered = false;
    if (on && _desktop)
        host::X11Desktop::makeAccessory(elm_win_xwindow_get(_window));
    if (on)
        _place();
    _showToScreenReaders(on);
    _isOurs = true; // what is intercepted next
    on ? evas_object_show(_window) : evas_object_hide(_window);
    _isOurs = false;
}

// Else it would be read out while nobody sees it.
void ControlWindow::_showToScreenReaders(bool on)
{
    efl_access_object_access_type_set(_window, on ? EFL_ACCESS_TYPE_REGULAR : EFL_ACCESS_TYPE_DISABLED);
}

void ControlWindow::_place()
{
    if (!_desktop || _isDragged)
        return;
    const host::ScreenArea area = host::X11Desktop::workArea();
    int width = 0;
    int height = 0;
    evas_object_geometry_get(_window, nullptr, nullptr, &width, &height);
    if (width > area.width && area.width > 0)
        return evas_object_resize(_window, area.width, height); // comes back here
    const Place place = placeOf(_viewer);
    const auto at = [](int share, int room) { return (std::max(0, room) * share + WHOLE / 2) / WHOLE; };
    evas_object_move(_window, area.x + at(place.x, area.width - width), area.y + at(place.y, area.height - height));
}

void ControlWindow::_tellWhetherSeen()
{
    const bool seen = _isOnScreen && !_isCovered && isDisplayOn();
    if (std::exchange(_isSeen, seen) != seen)
        evas_object_smart_callback_call(_window, MINICONTROL_SEEN_CHANGED, nullptr);
}

void ControlWindow::_beginDrag(int x, int y)
{
    _gripX = x;
    _gripY = y;
    _isDragged = true;
}

void ControlWindow::_drag(int x, int y)
{
    if (_isDragged)
        evas_object_move(_window, x - _gripX, y - _gripY);
}

// By the pointer: a window manager may still be busy with an earlier move.
void ControlWindow::_endDrag(int x, int y)
{
    if (!std::exchange(_isDragged, false))
        return;
    int width = 0;
    int height = 0;
    evas_object_geometry_get(_window, nullptr, nullptr, &width, &height);
    const host::ScreenArea area = host::X11Desktop::workArea();
    const auto share = [](int at, int room) { return room > 0 ? std::clamp(at * WHOLE / room, 0, WHOLE) : 0; };
    preference_set_int(preferenceOf(_viewer, "X").c_str(), share(x - _gripX - area.x, area.width - width));
    preference_set_int(preferenceOf(_viewer, "Y").c_str(), share(y - _gripY - area.y, area.height - height));
    _place();
}

}
