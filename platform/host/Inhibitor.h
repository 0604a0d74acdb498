// Holds the machine awake: what logind and the screen saver are asked for. Main loop only.
#pragma once

#include "BusInLoop.h"

#include <string>

namespace host {

// One logind inhibitor lock, released with the object; the answer may come after the release. When the first kind
// is refused, the second is tried (null for none).
class Inhibitor {
public:
    struct Wish {
        const char* what; // "sleep", "idle", "shutdown"
        const char* mode; // "block", "delay"
    };
    Inhibitor(const char* why, Wish first, const Wish* second = nullptr);
    ~Inhibitor();
    Inhibitor(const Inhibitor&) = delete;
    Inhibitor& operator=(const Inhibitor&) = delete;
    [[nodiscard]] bool isHeld() const { return _descriptor >= 0; }

private:
    bool _ask(Wish wish, const std::function<void()>& refused);

    std::string _why;
    int _descriptor = -1;
    Slot _call;
};

// The desktop's and the X server's screen saver stay off while the object lives.
class ScreenSaverInhibitor {
public:
    ScreenSaverInhibitor();
    ~ScreenSaverInhibitor();
    ScreenSaverInhibitor(const ScreenSaverInhibitor&) = delete;
    ScreenSaverInhibitor& operator=(const ScreenSaverInhibitor&) = delete;

private:
    uint32_t _cookie = 0;
    Slot _call;
};

void wakeDisplay();

}
