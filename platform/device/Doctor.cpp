#include "doctor.h"

#include "host/BusInLoop.h"
#include "host/DisplayServer.h"
#include "host/PulseWatch.h"
#include "state/Directories.h"
#include "storage.h"

#include <cstdlib>
#include <string>
#include <string_view>

#include <unistd.h>

namespace {

constexpr auto ABSENT = "not found";

class Report {
public:
    using Line = void (*)(const char*, const char*, const char*, void*);
    Report(Line line, void* userData)
        : _line(line)
        , _userData(userData)
    {
    }

    void add(const char* service, bool found, const std::string& what, const char* fallback)
    {
        _missing += found ? 0 : 1;
        _line(service, found ? what.c_str() : ABSENT, found ? "" : fallback, _userData);
    }

    // A service that runs, or that the bus would start.
    void addName(const char* service, host::BusInLoop* bus, const char* name, const char* fallback)
    {
        const bool running = bus != nullptr && host::hasOwner(bus->get(), name);
        const bool startable = !running && bus != nullptr && isActivatable(bus->get(), name);
        add(service, running || startable, std::string(name) + (running ? " runs" : " can be started"), fallback);
    }

    [[nodiscard]] int missing() const { return _missing; }

private:
    static bool isActivatable(sd_bus* bus, const std::string& name)
    {
        char** names = nullptr;
        bool found = false;
        if (sd_bus_list_names(bus, nullptr, &names) < 0) // the second list is of those that can be started
            return false;
        for (char** entry = names; entry != nullptr && *entry != nullptr; ++entry) {
            found = found || name == *entry;
            std::free(*entry);
        }
        std::free(names);
        return found;
    }

    Line _line;
    void* _userData;
    int _missing = 0;
};

bool offersActions(host::BusInLoop* session)
{
    sd_bus_message* reply = nullptr;
    bool found = false;
    if (session == nullptr
        || sd_bus_call_method(session->get(), "org.freedesktop.Notifications", "/org/freedesktop/Notifications",
               "org.freedesktop.Notifications", "GetCapabilities", nullptr, &reply, nullptr)
            < 0)
        return false;
    char** capabilities = nullptr;
    if (sd_bus_message_read_strv(reply, &capabilities) >= 0)
        for (char** each = capabilities; each != nullptr && *each != nullptr; ++each) {
            found = found || std::string_view(*each) == "actions";
            std::free(*each);
        }
    std::free(capabilities);
    sd_bus_message_unref(reply);
    return found;
}

void addBuses(Report& report)
{
    host::BusInLoop* session = host::sessionBus();
    host::BusInLoop* system = host::systemBus();
    report.add("session bus", session != nullptr, "connected", "no media keys of the desktop, no second start");
    report.add("system bus", system != nullptr, "connected", "state keys keep their defaults");
    report.addName("logind", system, "org.freedesktop.login1", "power locks are only remembered, no lock state");
    report.addName("UPower", system, "org.freedesktop.UPower", "the battery counts as full");
    report.addName("ModemManager", system, "org.freedesktop.ModemManager1", "no telephone calls");
    report.addName(
        "notifications", session, "org.freedesktop.Notifications", "messages in the background go to the log");
    report.add("notification control", offersActions(session),
        "buttons while recording in the background, where no control window is possible or wanted",
        "media controls (MPRIS) only");
    report.addName("portal", session, "org.freedesktop.portal.Desktop", "light theme, clock of the region");
    report.add("MPRIS", session != nullptr, "available",
        host::displayServer() == "x11" ? "keys of the keyboard only" : "no media keys");
}

std::string rootText(const char* root) { return std::string(root) + (::access(root, W_OK) == 0 ? "" : " (read only)"); }

void addPlaces(Report& report)
{
    const std::string server = host::displayServer();
    report.add("display", !server.empty(), server == "wl" ? "Wayland" : server, "no window");
    const bool x11 = server == "x11";
    report.add("control windows", x11, "for the panel; over lock screens that let windows through",
        "a notification, where those have buttons");
    const bool device = ::access(storage_device_root(), W_OK) == 0;
    report.add("device storage", device, rootText(storage_device_root()), "recordings cannot be saved");
    const bool card = ::access(storage_card_root(), F_OK) == 0;
    report.add("memory card", card, rootText(storage_card_root()), "device storage only");
    const bool own = ::access(storage_private_root(), F_OK) == 0;
    report.add("private storage", own, rootText(storage_private_root()), "no private recordings");
    const std::string keys = platform::runtimeDirectory();
    report.add("state keys", !keys.empty(), keys, "all states keep their defaults");
    const bool kept = platform::makeDirectories(platform::configDirectory(), 0700);
    report.add("preferences", kept, platform::configDirectory(), "settings are lost at the end");
}

}

int platform_doctor(
    void (*line)(const char* service, const char* found, const char* fallback, void* user_data), void* user_data)
{
    if (line == nullptr)
        return 0;
    Report report(line, user_data);
    addBuses(report);
    const auto sound = host::PulseWatch::instance().refresh(std::chrono::milliseconds(1000));
    report.add("sound server", sound.isConnected, sound.defaultSink.empty() ? "connected" : sound.defaultSink,
        "no recording and no playback");
    addPlaces(report);
    return report.missing();
}
