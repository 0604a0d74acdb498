#include "Inhibitor.h"

#include <Ecore_X.h>

#include <utility>

#include <fcntl.h>
#include <unistd.h>

#include <X11/Xlib.h>
#include <X11/extensions/scrnsaver.h>

namespace host {

namespace {

    constexpr auto SCREEN_SAVER = "org.freedesktop.ScreenSaver";
    constexpr auto SCREEN_SAVER_PATH = "/org/freedesktop/ScreenSaver";

    Display* display() { return static_cast<Display*>(ecore_x_display_get()); }

    Message screenSaverCall(sd_bus* bus, const char* member)
    {
        Message call = newCall(bus, SCREEN_SAVER, SCREEN_SAVER_PATH, SCREEN_SAVER, member);
        if (call != nullptr)
            sd_bus_message_set_auto_start(call.get(), 0);
        return call;
    }

    // Does nothing on servers without the extension, which would answer with an error otherwise.
    void suspendServer(bool suspend)
    {
        int event = 0;
        int error = 0;
        if (display() != nullptr && XScreenSaverQueryExtension(display(), &event, &error) != 0) {
            XScreenSaverSuspend(display(), suspend ? True : False);
            XFlush(display());
        }
    }

}

Inhibitor::Inhibitor(const char* why, Wish first, const Wish* second)
    : _why(why)
{
    std::function<void()> refused;
    if (second != nullptr)
        refused = [this, wish = *second] { _ask(wish, nullptr); };
    _ask(first, refused);
}

Inhibitor::~Inhibitor()
{
    if (_descriptor >= 0)
        ::close(_descriptor);
}

bool Inhibitor::_ask(Wish wish, const std::function<void()>& refused)
{
    BusInLoop* bus = systemBus();
    if (bus == nullptr)
        return false;
    const Message call = newCall(
        bus->get(), "org.freedesktop.login1", "/org/freedesktop/login1", "org.freedesktop.login1.Manager", "Inhibit");
    if (call == nullptr
        || sd_bus_message_append(call.get(), "ssss", wish.what, "Mewlo Lite", _why.c_str(), wish.mode) < 0)
        return false;
    _call = callAsync(bus->get(), call, [this, refused](sd_bus_message* reply) {
        int descriptor = -1;
        if (sd_bus_message_is_method_error(reply, nullptr) <= 0 && sd_bus_message_read(reply, "h", &descriptor) >= 0)
            _descriptor = ::fcntl(descriptor, F_DUPFD_CLOEXEC, 3); // the message's own one goes with the message
        else if (refused)
            refused();
    });
    return _call != nullptr;
}

ScreenSaverInhibitor::ScreenSaverInhibitor()
{
    suspendServer(true);
    BusInLoop* bus = sessionBus();
    if (bus == nullptr)
        return;
    const Message call = screenSaverCall(bus->get(), "Inhibit");
    if (call == nullptr || sd_bus_message_append(call.get(), "ss", "Mewlo Lite", "Recording") < 0)
        return;
    _call = callAsync(bus->get(), call, [this](sd_bus_message* reply) {
        if (sd_bus_message_is_method_error(reply, nullptr) <= 0)
            sd_bus_message_read(reply, "u", &_cookie);
    });
}

ScreenSaverInhibitor::~ScreenSaverInhibitor()
{
    suspendServer(false);
    BusInLoop* bus = sessionBus();
    if (bus == nullptr || _cookie == 0)
        return;
    const Message call = screenSaverCall(bus->get(), "UnInhibit");
    if (call != nullptr && sd_bus_message_append(call.get(), "u", _cookie) >= 0)
        send(bus->get(), call);
}

void wakeDisplay()
{
    if (display() != nullptr) {
        XResetScreenSaver(display());
        XFlush(display());
    }
    if (BusInLoop* bus = sessionBus())
        send(bus->get(), screenSaverCall(bus->get(), "SimulateUserActivity"));
}

}
