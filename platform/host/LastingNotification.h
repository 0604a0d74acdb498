// One notification with actions that stays until it is withdrawn, changed in place. Main loop only.
#pragma once

#include "BusInLoop.h"

#include <functional>
#include <optional>
#include <string>
#include <vector>

namespace host {

class LastingNotification {
public:
    struct Action {
        std::string key;
        std::string label;
        bool operator==(const Action&) const = default;
    };
    struct Content {
        std::string title;
        std::string text; // plain
        std::vector<Action> actions;
        bool operator==(const Content&) const = default;
    };
    struct Handlers {
        std::function<void()> supportChanged;
        std::function<void(const std::string& key)> pressed;
    };

    // On the session bus; asks the service at once, and each one that follows it.
    explicit LastingNotification(Handlers handlers);
    ~LastingNotification();
    LastingNotification(const LastingNotification&) = delete;
    LastingNotification& operator=(const LastingNotification&) = delete;

    // Whether the service offers actions; false until it has said so.
    [[nodiscard]] bool isSupported() const { return _isSupported; }
    void show(const Content& content);
    void withdraw();

private:
    void _askCapabilities();
    void _readCapabilities(sd_bus_message* reply);
    void _setSupported(bool supported);
    void _ownerChanged(sd_bus_message* signal);
    void _closed(sd_bus_message* signal);
    void _pressed(sd_bus_message* signal);
    void _send();
    void _sent(sd_bus_message* reply);
    void _takeAway();

    Handlers _handlers;
    std::optional<Content> _wanted;
    Content _told; // what the service was last told
    uint32_t _id = 0; // of the notification on the screen
    bool _isSupported = false;
    bool _readsMarkup = false;
    Slot _question;
    Slot _call; // at most one is under way
    std::vector<Slot> _signals;
};

}
