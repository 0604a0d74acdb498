// Session lock and shut-down as logind reports them: "memory/idle_lock/state" and "memory/sysman/power_off".
// While busy, a delay lock gives the application a few seconds before the machine goes down.
#pragma once

#include "Inhibitor.h"
#include "KeySink.h"

#include <memory>
#include <vector>

namespace host {

class LogindWatch {
public:
    explicit LogindWatch(KeySink sink)
        : _sink(std::move(sink))
    {
    }
    void start();
    void stop();
    void setBusy(bool busy);
    // Best effort: the session's own locker decides.
    void unlock();

private:
    void _watchSession(const std::string& path);
    void _reportLock(bool locked);

    KeySink _sink;
    std::string _session;
    std::vector<Slot> _slots;
    std::unique_ptr<Inhibitor> _delay;
    bool _wentDown = false;
};

}
