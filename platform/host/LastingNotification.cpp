#include "LastingNotification.h"

#include <chrono>
#include <string_view>
#include <utility>

namespace host {

namespace {

    constexpr auto SERVICE = "org.freedesktop.Notifications";
    constexpr auto PATH = "/org/freedesktop/Notifications";
    constexpr auto APPLICATION = "com.tovanic.mewlo-lite";
    constexpr int32_t NEVER_EXPIRES = 0;
    constexpr uint8_t LOW = 0;
    constexpr std::chrono::milliseconds LAST_ANSWER(500);

    Message newServiceCall(const char* member)
    {
        BusInLoop* bus = sessionBus();
        return bus != nullptr ? newCall(bus->get(), SERVICE, PATH, SERVICE, member) : nullptr;
    }

    std::string escaped(const std::string& text)
    {
        std::string result;
        for (const char c : text)
            result += c == '&' ? "&amp;" : c == '<' ? "&lt;" : c == '>' ? "&gt;" : std::string(1, c);
        return result;
    }

    bool appendActions(sd_bus_message* call, const std::vector<LastingNotification::Action>& actions)
    {
        if (sd_bus_message_open_container(call, 'a', "s") < 0)
            return false;
        for (const LastingNotification::Action& action : actions)
            if (sd_bus_message_append(call, "ss", action.key.c_str(), action.label.c_str()) < 0)
                return false;
        return sd_bus_message_close_container(call) >= 0;
    }

    // "resident": an action leaves it on the screen.
    bool appendHints(sd_bus_message* call)
    {
        return sd_bus_message_append(call, "a{sv}i", 4, "urgency", "y", LOW, "resident", "b", 1, "suppress-sound", "b",
                   1, "desktop-entry", "s", APPLICATION, NEVER_EXPIRES)
            >= 0;
    }

}

LastingNotification::LastingNotification(Handlers handlers)
    : _handlers(std::move(handlers))
{
    BusInLoop* bus = sessionBus();
    if (bus == nullptr)
        return;
    const auto listen = [&](const char* signal, void (LastingNotification::*receive)(sd_bus_message*)) {
        _signals.push_back(onSignal(bus->get(), SERVICE, PATH, SERVICE, signal,
            [this, receive](sd_bus_message* message) { (this->*receive)(message); }));
    };
    listen("ActionInvoked", &LastingNotification::_pressed);
    listen("NotificationClosed", &LastingNotification::_closed);
    _signals.push_back(onSignal(bus->get(), "org.freedesktop.DBus", "/org/freedesktop/DBus", "org.freedesktop.DBus",
        "NameOwnerChanged", [this](sd_bus_message* message) { _ownerChanged(message); }));
    _askCapabilities();
}

// One that is on its way to the screen cannot be taken away before the service has given it a number.
LastingNotification::~LastingNotification()
{
    _signals.clear();
    _question.reset();
    withdraw();
    const auto end = std::chrono::steady_clock::now() + LAST_ANSWER;
    while (_call != nullptr && sessionBus() != nullptr && std::chrono::steady_clock::now() < end) {
        sd_bus* bus = sessionBus()->get();
        if (sd_bus_process(bus, nullptr) < 0)
            return;
        if (_call != nullptr)
            sd_bus_wait(bus, std::chrono::microseconds(LAST_ANSWER).count() / 10);
    }
}

void LastingNotification::_askCapabilities()
{
    const Message call = newServiceCall("GetCapabilities");
    if (call != nullptr)
        _question = callAsync(
            sessionBus()->get(), call, [this](sd_bus_message* reply) { _readCapabilities(reply); }, FOREVER);
}

void LastingNotification::_readCapabilities(sd_bus_message* reply)
{
    _question.reset();
    bool hasActions = false;
    _readsMarkup = false;
    if (sd_bus_message_is_method_error(reply, nullptr) <= 0 && sd_bus_message_enter_container(reply, 'a', "s") > 0) {
        const char* capability = nullptr;
        while (sd_bus_message_read(reply, "s", &capability) > 0) {
            hasActions = hasActions || std::string_view(capability) == "actions";
            _readsMarkup = _readsMarkup || std::string_view(capability) == "body-markup";
        }
    }
    _setSupported(hasActions);
}

void LastingNotification::_setSupported(bool supported)
{
    if (_isSupported == supported)
        return;
    _isSupported = supported;
    if (supported)
        _send();
    _handlers.supportChanged(); // may end this object
}

// What another service showed went with it.
void LastingNotification::_ownerChanged(sd_bus_message* signal)
{
    const char* name = nullptr;
    const char* former = nullptr;
    const char* next = nullptr;
    if (sd_bus_message_read(signal, "sss", &name, &former, &next) < 0 || std::string_view(name) != SERVICE)
        return;
    if (*former != '\0') {
        _call.reset();
        _question.reset();
        _id = 0;
    }
    // The question that started the service is under way, or an old answer does not count any more.
    if (*next != '\0' && _question == nullptr)
        _askCapabilities();
    if (*former != '\0')
        _setSupported(false); // last: may end this object
}

void LastingNotification::_pressed(sd_bus_message* signal)
{
    uint32_t id = 0;
    const char* key = nullptr;
    if (sd_bus_message_read(signal, "us", &id, &key) >= 0 && id != 0 && id == _id)
        _handlers.pressed(key);
}

void LastingNotification::_closed(sd_bus_message* signal)
{
    uint32_t id = 0;
    if (sd_bus_message_read(signal, "u", &id) >= 0 && id == _id)
        _id = 0;
}

void LastingNotification::show(const Content& content)
{
    if (_wanted == content)
        return;
    _wanted = content;
    if (_isSupported && _call == nullptr)
        _send();
}

void LastingNotification::withdraw()
{
    _wanted.reset();
    if (_call == nullptr)
        _takeAway();
}

void LastingNotification::_send()
{
    if (!_wanted)
        return;
    _told = *_wanted;
    const Message call = newServiceCall("Notify");
    const std::string text = _readsMarkup ? escaped(_told.text) : _told.text;
    if (call == nullptr
        || sd_bus_message_append(call.get(), "susss", "Mewlo Lite", _id, APPLICATION, _told.title.c_str(), text.c_str())
            < 0
        || !appendActions(call.get(), _told.actions) || !appendHints(call.get()))
        return;
    _call = callAsync(sessionBus()->get(), call, [this](sd_bus_message* reply) { _sent(reply); });
}

void LastingNotification::_sent(sd_bus_message* reply)
{
    _call.reset();
    if (sd_bus_message_is_method_error(reply, nullptr) > 0 || sd_bus_message_read(reply, "u", &_id) < 0)
        _id = 0;
    if (!_wanted)
        _takeAway();
    else if (*_wanted != _told)
        _send();
}

void LastingNotification::_takeAway()
{
    if (_id == 0)
        return;
    const Message call = newServiceCall("CloseNotification");
    if (call != nullptr && sd_bus_message_append(call.get(), "u", std::exchange(_id, 0)) >= 0)
        (void)send(sessionBus()->get(), call);
}

}
