// Time zone ("db/setting/timezone") and steps of the clock ("memory/time_changed").
#pragma once

#include "KeySink.h"
#include "PropertyWatch.h"

namespace host {

class TimeWatch {
public:
    explicit TimeWatch(KeySink sink);
    ~TimeWatch() { stop(); }
    TimeWatch(const TimeWatch&) = delete;
    TimeWatch& operator=(const TimeWatch&) = delete;
    void start();
    void stop();

private:
    void _arm() const;
    void _fired();

    KeySink _sink;
    PropertyWatch _properties;
    int _timer = -1;
    Ecore_Fd_Handler* _handler = nullptr;
};

}
