// Whether the display is lit: "memory/device/display_state" (0 normal, 1 dimmed, 2 off), from the X server's screen
// saver and power management.
#pragma once

#include "KeySink.h"

#include <Ecore.h>

namespace host {

class DisplayWatch {
public:
    explicit DisplayWatch(KeySink sink)
        : _sink(std::move(sink))
    {
    }
    ~DisplayWatch() { stop(); }
    DisplayWatch(const DisplayWatch&) = delete;
    DisplayWatch& operator=(const DisplayWatch&) = delete;
    void start(); // after the toolkit has opened the display; does nothing without one
    void stop();

private:
    void _poll();
    void _report();

    KeySink _sink;
    Ecore_Event_Handler* _saver = nullptr;
    Ecore_Timer* _timer = nullptr;
    bool _saverIsOn = false;
    bool _powerIsOff = false;
};

}
