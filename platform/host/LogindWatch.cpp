#include "LogindWatch.h"

#include <StateKeys.h>

#include <cstdlib>

#include <unistd.h>

namespace host {

namespace {

    constexpr auto SERVICE = "org.freedesktop.login1";
    constexpr auto MANAGER_PATH = "/org/freedesktop/login1";
    constexpr auto MANAGER = "org.freedesktop.login1.Manager";
    constexpr auto SESSION = "org.freedesktop.login1.Session";
    constexpr auto PROPERTIES = "org.freedesktop.DBus.Properties";

    // By its id where the environment knows it: a program started by a service belongs to no session.
    Message askForSession(sd_bus* bus)
    {
        const char* id = std::getenv("XDG_SESSION_ID");
        const bool named = id != nullptr && *id != '\0';
        Message call = newCall(bus, SERVICE, MANAGER_PATH, MANAGER, named ? "GetSession" : "GetSessionByPID");
        if (call == nullptr)
            return nullptr;
        const int result = named ? sd_bus_message_append(call.get(), "s", id)
                                 : sd_bus_message_append(call.get(), "u", static_cast<uint32_t>(::getpid()));
        return result >= 0 ? std::move(call) : nullptr;
    }

}

void LogindWatch::start()
{
    BusInLoop* bus = systemBus();
    if (bus == nullptr)
        return;
    _slots.push_back(
        onSignal(bus->get(), SERVICE, MANAGER_PATH, MANAGER, "PrepareForShutdown", [this](sd_bus_message* message) {
            int goesDown = 0;
            if (sd_bus_message_read(message, "b", &goesDown) < 0 || (goesDown == 0 && !_wentDown))
                return;
            _wentDown = goesDown != 0;
            _sink(VCONFKEY_SYSMAN_POWER_OFF_STATUS, goesDown != 0 ? "2" : "0");
        }));
    _slots.push_back(callAsync(bus->get(), askForSession(bus->get()), [this](sd_bus_message* reply) {
        const char* path = nullptr;
        if (sd_bus_message_is_method_error(reply, nullptr) <= 0 && sd_bus_message_read(reply, "o", &path) >= 0)
            _watchSession(path);
    }));
}

void LogindWatch::_watchSession(const std::string& path)
{
    _session = path;
    sd_bus* bus = systemBus()->get();
    _slots.push_back(
        onSignal(bus, SERVICE, path.c_str(), PROPERTIES, "PropertiesChanged", [this](sd_bus_message* message) {
            const char* interface = nullptr;
            if (sd_bus_message_read(message, "s", &interface) < 0)
                return;
            forEachProperty(message, [this](const std::string& name, sd_bus_message* value) {
                if (name == "LockedHint")
                    _reportLock(anyText(value) == "1");
            });
        }));
    const Message call = newCall(bus, SERVICE, path.c_str(), PROPERTIES, "Get");
    if (call == nullptr || sd_bus_message_append(call.get(), "ss", SESSION, "LockedHint") < 0)
        return;
    _slots.push_back(callAsync(bus, call, [this](sd_bus_message* reply) {
        if (sd_bus_message_is_method_error(reply, nullptr) <= 0)
            _reportLock(anyText(reply) == "1");
    }));
}

void LogindWatch::_reportLock(bool locked) { _sink(VCONFKEY_IDLE_LOCK_STATE, locked ? "1" : "0"); }

void LogindWatch::stop()
{
    _slots.clear();
    _delay.reset();
}

void LogindWatch::setBusy(bool busy)
{
    if (!busy)
        _delay.reset();
    else if (_delay == nullptr)
        _delay = std::make_unique<Inhibitor>("The recording is saved", Inhibitor::Wish{"shutdown", "delay"});
}

void LogindWatch::unlock()
{
    BusInLoop* bus = systemBus();
    if (bus != nullptr && !_session.empty())
        send(bus->get(), newCall(bus->get(), SERVICE, _session.c_str(), SESSION, "Unlock"));
}

}
