// The user's language and region: "db/menu_widget/language" and "db/menu_widget/regionformat", such as "de_DE". From
// the environment; where that says nothing, from the system's own setting and its changes.
#pragma once

#include "BusInLoop.h"
#include "KeySink.h"

#include <vector>

namespace host {

class LocaleWatch {
public:
    explicit LocaleWatch(KeySink sink)
        : _sink(std::move(sink))
    {
    }
    void start();
    void stop() { _slots.clear(); }

    // Without codeset and modifier; "C" and "POSIX" are American English.
    static std::string plainLocale(const std::string& locale);
    // The same with the script that a modifier names: "sr_RS@latin" is "sr_Latn_RS".
    static std::string regionOf(const std::string& locale);

private:
    void _readSystem(sd_bus_message* message);

    KeySink _sink;
    std::vector<Slot> _slots;
    bool _languageIsOpen = false; // the environment says nothing
    bool _regionIsOpen = false;
};

}
