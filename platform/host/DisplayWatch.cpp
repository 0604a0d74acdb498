#include "DisplayWatch.h"

#include <StateKeys.h>

#include <Ecore_X.h>

#include <utility>

#include <X11/Xlib.h>
#include <X11/extensions/dpms.h>

namespace host {

namespace {

    constexpr double POLL_INTERVAL = 2.0; // seconds; the server has no events for its power levels

}

void DisplayWatch::start()
{
    auto* display = static_cast<Display*>(ecore_x_display_get());
    if (display == nullptr)
        return;
    ecore_x_screensaver_event_listen_set(EINA_TRUE);
    _saver = ecore_event_handler_add(
        ECORE_X_EVENT_SCREENSAVER_NOTIFY,
        [](void* data, int, void* event) -> Eina_Bool {
            auto* self = static_cast<DisplayWatch*>(data);
            self->_saverIsOn = static_cast<Ecore_X_Event_Screensaver_Notify*>(event)->on == EINA_TRUE;
            self->_report();
            return ECORE_CALLBACK_PASS_ON;
        },
        this);
    int event = 0;
    int error = 0;
    if (DPMSQueryExtension(display, &event, &error) == False || DPMSCapable(display) == False)
        return;
    _timer = ecore_timer_add(
        POLL_INTERVAL,
        [](void* self) -> Eina_Bool {
            static_cast<DisplayWatch*>(self)->_poll();
            return ECORE_CALLBACK_RENEW;
        },
        this);
}

void DisplayWatch::stop()
{
    if (_saver != nullptr)
        ecore_event_handler_del(std::exchange(_saver, nullptr));
    if (_timer != nullptr)
        ecore_timer_del(std::exchange(_timer, nullptr));
}

void DisplayWatch::_poll()
{
    auto* display = static_cast<Display*>(ecore_x_display_get());
    CARD16 level = DPMSModeOn;
    BOOL enabled = False;
    if (display == nullptr || DPMSInfo(display, &level, &enabled) == False)
        return;
    if (std::exchange(_powerIsOff, enabled != False && level != DPMSModeOn) != _powerIsOff)
        _report();
}

void DisplayWatch::_report() { _sink(platform::KEY_DISPLAY_STATE, _saverIsOn || _powerIsOff ? "2" : "0"); }

}
