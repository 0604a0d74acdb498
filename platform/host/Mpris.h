// The media player object that desktops, headsets and lock screens control: org.mpris.MediaPlayer2 on the session
// bus. Main loop only. It exists on the bus from construction to destruction.
#pragma once

#include "BusInLoop.h"

#include <functional>
#include <string>
#include <vector>

namespace host {

class Mpris {
public:
    struct State {
        std::string status = "Stopped"; // Playing, Paused, Stopped
        std::string title;
        bool canSkip = true; // to the next and the previous one
        bool operator==(const State&) const = default;
    };
    // Called with the name of a method: Play, Pause, PlayPause, Stop, Next, Previous, SeekForward, SeekBack, Raise,
    // Quit.
    using Called = std::function<void(const std::string& method)>;

    Mpris(BusInLoop& bus, Called called);
    ~Mpris();
    Mpris(const Mpris&) = delete;
    Mpris& operator=(const Mpris&) = delete;

    [[nodiscard]] bool isOpen() const { return !_name.empty(); }
    void setState(const State& state); // tells the listeners when it differs
    [[nodiscard]] const State& state() const { return _state; }
    void call(const std::string& method) const { _called(method); }

private:
    bool _add(const char* interface, const sd_bus_vtable* table);

    BusInLoop& _bus;
    Called _called;
    State _state;
    std::string _name;
    std::vector<Slot> _slots;
};

}
