// A status icon in the desktop's tray (StatusNotifierItem). Main loop only. Appears as soon as a tray exists, also
// when that starts later.
#pragma once

#include "host/BusInLoop.h"

#include <functional>
#include <string>
#include <vector>

class TrayIcon {
public:
    // An empty icon hides the item.
    struct Look {
        std::string icon;
        std::string title;
    };
    TrayIcon(host::BusInLoop& bus, std::function<void()> activated);
    TrayIcon(const TrayIcon&) = delete;
    TrayIcon& operator=(const TrayIcon&) = delete;

    void setLook(const Look& look);
    [[nodiscard]] const Look& look() const { return _look; }
    void activate() const { _activated(); }

private:
    void _register();

    host::BusInLoop& _bus;
    std::function<void()> _activated;
    Look _look;
    std::string _name;
    std::vector<host::Slot> _slots;
};
