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
        int length = 0; // milliseconds, 0 when unknown
        bool canSkip = true; // to the next and the previous one
        bool canSeek = false;
        bool hasPosition = false;
        bool operator==(const State&) const = default;
    };
    struct Handlers {
        // With the name of a method: Play, Pause, PlayPause, Stop, Next, Previous, Raise, Quit.
        std::function<void(const std::string& method)> called;
        std::function<int()> position; // milliseconds
        std::function<void(int milliseconds)> seek;
    };

    Mpris(BusInLoop& bus, Handlers handlers);
    ~Mpris();
    Mpris(const Mpris&) = delete;
    Mpris& operator=(const Mpris&) = delete;

    [[nodiscard]] bool isOpen() const { return !_name.empty(); }
    void setState(const State& state); // tells the listeners when it differs
    [[nodiscard]] const State& state() const { return _state; }
    [[nodiscard]] const Handlers& handlers() const { return _handlers; }
    [[nodiscard]] std::string trackId() const;
    void seekTo(int milliseconds) const; // nothing while there is nothing to seek in
    void tellSeeked(int milliseconds);

private:
    bool _add(const char* interface, const sd_bus_vtable* table);

    BusInLoop& _bus;
    Handlers _handlers;
    State _state;
    unsigned int _track = 0; // counts the changes of title and length
    std::string _name;
    std::vector<Slot> _slots;
};

}
