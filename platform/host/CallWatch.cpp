#include "CallWatch.h"

#include <StateKeys.h>

namespace host {

namespace {

    constexpr auto SERVICE = "org.freedesktop.ModemManager1";
    constexpr auto ROOT = "/org/freedesktop/ModemManager1";
    constexpr auto VOICE = "org.freedesktop.ModemManager1.Modem.Voice";
    constexpr auto CALL = "org.freedesktop.ModemManager1.Call";
    constexpr auto PROPERTIES = "org.freedesktop.DBus.Properties";
    enum CallState : int { RINGING_IN = 3, TERMINATED = 7 };

    bool isError(sd_bus_message* reply) { return sd_bus_message_is_method_error(reply, nullptr) > 0; }

    // Object paths of the dictionary a{oa{sa{sv}}} that have the interface.
    std::vector<std::string> objectsWith(sd_bus_message* reply, const std::string& interface)
    {
        std::vector<std::string> found;
        sd_bus_message_enter_container(reply, 'a', "{oa{sa{sv}}}");
        while (sd_bus_message_enter_container(reply, 'e', "oa{sa{sv}}") > 0) {
            const char* path = nullptr;
            if (sd_bus_message_read(reply, "o", &path) < 0
                || sd_bus_message_enter_container(reply, 'a', "{sa{sv}}") < 0)
                break;
            while (sd_bus_message_enter_container(reply, 'e', "sa{sv}") > 0) {
                const char* name = nullptr;
                if (sd_bus_message_read(reply, "s", &name) >= 0 && interface == name)
                    found.emplace_back(path);
                sd_bus_message_skip(reply, "a{sv}");
                sd_bus_message_exit_container(reply);
            }
            sd_bus_message_exit_container(reply);
            sd_bus_message_exit_container(reply);
        }
        return found;
    }

}

void CallWatch::start()
{
    BusInLoop* bus = systemBus();
    if (bus == nullptr)
        return;
    const auto onPath = [this](void (CallWatch::*handler)(const std::string&)) {
        return [this, handler](sd_bus_message* message) {
            const char* path = nullptr;
            if (sd_bus_message_read(message, "o", &path) >= 0)
                (this->*handler)(path);
        };
    };
    _slots.push_back(onSignal(bus->get(), SERVICE, nullptr, VOICE, "CallAdded", onPath(&CallWatch::_added)));
    _slots.push_back(onSignal(bus->get(), SERVICE, nullptr, VOICE, "CallDeleted", onPath(&CallWatch::_removed)));
    _slots.push_back(onSignal(bus->get(), SERVICE, nullptr, CALL, "StateChanged", [this](sd_bus_message* message) {
        int before = 0;
        int state = 0;
        if (sd_bus_message_read(message, "ii", &before, &state) >= 0)
            _stateChanged(sd_bus_message_get_path(message), state);
    }));
    _listModems();
}

void CallWatch::stop()
{
    _slots.clear();
    _calls.clear();
}

void CallWatch::_listModems()
{
    sd_bus* bus = systemBus()->get();
    const Message call = newCall(bus, SERVICE, ROOT, "org.freedesktop.DBus.ObjectManager", "GetManagedObjects");
    _slots.push_back(callAsync(bus, call, [this](sd_bus_message* reply) {
        if (isError(reply))
            return;
        for (const std::string& modem : objectsWith(reply, VOICE))
            _listCalls(modem);
    }));
}

void CallWatch::_listCalls(const std::string& modem)
{
    sd_bus* bus = systemBus()->get();
    _slots.push_back(
        callAsync(bus, newCall(bus, SERVICE, modem.c_str(), VOICE, "ListCalls"), [this](sd_bus_message* reply) {
            if (isError(reply) || sd_bus_message_enter_container(reply, 'a', "o") < 0)
                return;
            const char* path = nullptr;
            while (sd_bus_message_read_basic(reply, 'o', &path) > 0)
                _added(path);
        }));
}

// A listed call may be over already, and one that was ringing before we looked may have to be rejected.
void CallWatch::_added(const std::string& path)
{
    BusInLoop* bus = systemBus();
    if (bus == nullptr || !_calls.insert(path).second)
        return;
    _report();
    const Message call = newCall(bus->get(), SERVICE, path.c_str(), PROPERTIES, "Get");
    if (call == nullptr || sd_bus_message_append(call.get(), "ss", CALL, "State") < 0)
        return;
    _slots.push_back(callAsync(bus->get(), call, [this, path](sd_bus_message* reply) {
        const auto state = isError(reply) ? std::nullopt : anyText(reply);
        if (state == std::to_string(TERMINATED))
            _stateChanged(path, TERMINATED);
        else if (state == std::to_string(RINGING_IN))
            _stateChanged(path, RINGING_IN);
    }));
}

void CallWatch::_removed(const std::string& path)
{
    if (_calls.erase(path) > 0)
        _report();
}

void CallWatch::_stateChanged(const std::string& path, int state)
{
    BusInLoop* bus = systemBus();
    if (state == TERMINATED)
        return _removed(path);
    if (_calls.insert(path).second)
        _report();
    if (state == RINGING_IN && bus != nullptr && _rejects())
        send(bus->get(), newCall(bus->get(), SERVICE, path.c_str(), CALL, "Hangup"));
}

void CallWatch::_report() { _sink(platform::KEY_CALL_STATUS, std::to_string(_calls.size())); }

}
