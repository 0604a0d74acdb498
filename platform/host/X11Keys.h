// The media keys of the keyboard, whichever window has the focus. Main loop only; works while the toolkit shows
// windows on X11, does nothing otherwise.
#pragma once

#include <functional>
#include <set>
#include <string>
#include <vector>

#include <Ecore.h>

namespace host {

class X11Keys {
public:
    // The key is one of Play, Stop, Pause, Prev, Next, Forward, Rewind, Media. A held key is reported once.
    using Pressed = std::function<void(const std::string& key, bool down)>;
    explicit X11Keys(Pressed pressed);
    ~X11Keys();
    X11Keys(const X11Keys&) = delete;
    X11Keys& operator=(const X11Keys&) = delete;

private:
    void _key(const char* name, bool down);

    Pressed _pressed;
    std::vector<std::string> _grabbed;
    std::set<std::string> _held;
    Ecore_Event_Handler* _down = nullptr;
    Ecore_Event_Handler* _up = nullptr;
};

}
