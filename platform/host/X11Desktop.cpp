#include "X11Desktop.h"

#include <algorithm>
#include <array>
#include <cstdlib>
#include <utility>

#include <unistd.h>

namespace host {

namespace {

    constexpr unsigned int ALL_DESKTOPS = 0xFFFFFFFF;

    Ecore_X_Window root() { return ecore_x_window_root_first_get(); }

    bool hasState(Ecore_X_Window window, Ecore_X_Window_State wanted)
    {
        unsigned int count = 0;
        Ecore_X_Window_State* states = nullptr;
        ecore_x_netwm_window_state_get(window, &states, &count);
        const bool has = states != nullptr && std::find(states, states + count, wanted) != states + count;
        std::free(states);
        return has;
    }

    std::vector<unsigned int> numbersOf(Ecore_X_Window window, Ecore_X_Atom property)
    {
        unsigned int* values = nullptr;
        const int count = ecore_x_window_prop_card32_list_get(window, property, &values);
        std::vector<unsigned int> numbers(values, values + std::max(0, count));
        std::free(values);
        return numbers;
    }

    Ecore_X_Window activeWindow()
    {
        Ecore_X_Window window = 0;
        return ecore_x_window_prop_window_get(root(), ECORE_X_ATOM_NET_ACTIVE_WINDOW, &window, 1) > 0 ? window : 0;
    }

    ScreenArea intersection(const ScreenArea& a, const ScreenArea& b)
    {
        const int left = std::max(a.x, b.x);
        const int top = std::max(a.y, b.y);
        const ScreenArea common{
            left, top, std::min(a.x + a.width, b.x + b.width) - left, std::min(a.y + a.height, b.y + b.height) - top};
        return common.width > 0 && common.height > 0 ? common : a;
    }

    ScreenArea monitorWithPointer()
    {
        int x = 0;
        int y = 0;
        ecore_x_pointer_xy_get(root(), &x, &y);
        const int count = ecore_x_xinerama_screen_count_get();
        for (int screen = 0; screen < count; ++screen) {
            ScreenArea area;
            if (ecore_x_xinerama_screen_geometry_get(screen, &area.x, &area.y, &area.width, &area.height) != EINA_FALSE
                && x >= area.x && x < area.x + area.width && y >= area.y && y < area.y + area.height)
                return area;
        }
        ScreenArea whole;
        ecore_x_window_size_get(root(), &whole.width, &whole.height);
        return whole;
    }

}

X11Desktop::X11Desktop(std::function<void()> changed)
    : _changed(std::move(changed))
{
    ecore_x_event_mask_set(root(), ECORE_X_EVENT_MASK_WINDOW_PROPERTY);
    ecore_x_randr_events_select(root(), EINA_TRUE);
    _handlers = {ecore_event_handler_add(ECORE_X_EVENT_WINDOW_PROPERTY, _propertyCb, this),
        ecore_event_handler_add(ECORE_X_EVENT_WINDOW_SHOW, _screenCb, this),
        ecore_event_handler_add(ECORE_X_EVENT_WINDOW_HIDE, _screenCb, this),
        ecore_event_handler_add(ECORE_X_EVENT_SCREEN_CHANGE, _screenCb, this),
        ecore_event_handler_add(ECORE_X_EVENT_RANDR_CRTC_CHANGE, _screenCb, this)};
    _followActive();
}

X11Desktop::~X11Desktop()
{
    for (Ecore_Event_Handler* handler : _handlers)
        ecore_event_handler_del(handler);
}

Eina_Bool X11Desktop::_propertyCb(void* data, int, void* event)
{
    auto* self = static_cast<X11Desktop*>(data);
    const auto* property = static_cast<Ecore_X_Event_Window_Property*>(event);
    if (property->win == root() && property->atom == ECORE_X_ATOM_NET_ACTIVE_WINDOW)
        self->_followActive();
    const std::array<Ecore_X_Atom, 6> watched = {ECORE_X_ATOM_NET_ACTIVE_WINDOW, ECORE_X_ATOM_NET_CURRENT_DESKTOP,
        ECORE_X_ATOM_NET_WORKAREA, ECORE_X_ATOM_NET_WM_STATE, ECORE_X_ATOM_NET_WM_DESKTOP, ECORE_X_ATOM_WM_STATE};
    if (std::find(watched.begin(), watched.end(), property->atom) != watched.end())
        self->_changed();
    return ECORE_CALLBACK_PASS_ON;
}

Eina_Bool X11Desktop::_screenCb(void* data, int, void*)
{
    static_cast<X11Desktop*>(data)->_changed();
    return ECORE_CALLBACK_PASS_ON;
}

// Another program's window tells only those who ask.
void X11Desktop::_followActive()
{
    const Ecore_X_Window active = activeWindow();
    if (active == _active)
        return;
    _active = active;
    int process = 0;
    if (active != 0 && (ecore_x_netwm_pid_get(active, &process) == EINA_FALSE || process != ::getpid()))
        ecore_x_event_mask_set(active, ECORE_X_EVENT_MASK_WINDOW_PROPERTY);
}

ScreenArea X11Desktop::workArea()
{
    constexpr size_t NUMBERS = 4; // of each desktop
    const ScreenArea monitor = monitorWithPointer();
    const auto areas = numbersOf(root(), ECORE_X_ATOM_NET_WORKAREA);
    const auto current = numbersOf(root(), ECORE_X_ATOM_NET_CURRENT_DESKTOP);
    const size_t at = (current.empty() ? 0 : current[0]) * NUMBERS;
    if (areas.size() < at + NUMBERS)
        return monitor;
    return intersection(monitor,
        {static_cast<int>(areas[at]), static_cast<int>(areas[at + 1]), static_cast<int>(areas[at + 2]),
            static_cast<int>(areas[at + 3])});
}

bool X11Desktop::isInView(Ecore_X_Window window)
{
    if (ecore_x_window_visible_get(window) == EINA_FALSE || hasState(window, ECORE_X_WINDOW_STATE_HIDDEN))
        return false;
    const auto its = numbersOf(window, ECORE_X_ATOM_NET_WM_DESKTOP);
    const auto current = numbersOf(root(), ECORE_X_ATOM_NET_CURRENT_DESKTOP);
    return its.empty() || current.empty() || its[0] == ALL_DESKTOPS || its[0] == current[0];
}

bool X11Desktop::isCoveredByFullScreen() const
{
    int process = 0;
    if (_active == 0 || (ecore_x_netwm_pid_get(_active, &process) != EINA_FALSE && process == ::getpid()))
        return false;
    return hasState(_active, ECORE_X_WINDOW_STATE_FULLSCREEN);
}

void X11Desktop::makeAccessory(Ecore_X_Window window)
{
    std::array<Ecore_X_Window_State, 4> states = {ECORE_X_WINDOW_STATE_ABOVE, ECORE_X_WINDOW_STATE_STICKY,
        ECORE_X_WINDOW_STATE_SKIP_TASKBAR, ECORE_X_WINDOW_STATE_SKIP_PAGER};
    ecore_x_netwm_window_type_set(window, ECORE_X_WINDOW_TYPE_UTILITY);
    ecore_x_netwm_window_state_set(window, states.data(), states.size());
    ecore_x_netwm_desktop_set(window, ALL_DESKTOPS);
    unsigned int never = 0; // when the user last did something in it: it is not focused for coming
    ecore_x_window_prop_card32_set(window, ecore_x_atom_get("_NET_WM_USER_TIME"), &never, 1);
    ecore_x_event_mask_set(window, ECORE_X_EVENT_MASK_WINDOW_VISIBILITY);
}

}
