#include "PortalWatch.h"

#include <StateKeys.h>

namespace host {

namespace {

    constexpr auto SERVICE = "org.freedesktop.portal.Desktop";
    constexpr auto PATH = "/org/freedesktop/portal/desktop";
    constexpr auto SETTINGS = "org.freedesktop.portal.Settings";
    constexpr auto APPEARANCE = "org.freedesktop.appearance";
    constexpr auto COLOR_SCHEME = "color-scheme";
    constexpr auto INTERFACE_SPACE = "org.gnome.desktop.interface";
    constexpr auto CLOCK_FORMAT = "clock-format";

}

void PortalWatch::start()
{
    BusInLoop* bus = sessionBus();
    if (bus == nullptr)
        return;
    _slots.push_back(onSignal(bus->get(), SERVICE, PATH, SETTINGS, "SettingChanged", [this](sd_bus_message* message) {
        const char* space = nullptr;
        const char* key = nullptr;
        if (sd_bus_message_read(message, "ss", &space, &key) < 0)
            return;
        const std::string spaceText = space;
        const std::string keyText = key;
        if (const auto value = anyText(message))
            _report(spaceText, keyText, *value);
    }));
    _read(APPEARANCE, COLOR_SCHEME);
    _read(INTERFACE_SPACE, CLOCK_FORMAT);
}

void PortalWatch::_read(const char* space, const char* key)
{
    sd_bus* bus = sessionBus()->get();
    const Message call = newCall(bus, SERVICE, PATH, SETTINGS, "Read");
    if (call == nullptr || sd_bus_message_append(call.get(), "ss", space, key) < 0)
        return;
    _slots.push_back(callAsync(bus, call, [this, space, key](sd_bus_message* reply) {
        if (sd_bus_message_is_method_error(reply, nullptr) > 0)
            return;
        if (const auto value = anyText(reply)) // some portals wrap the variant twice
            _report(space, key, *value);
    }));
}

void PortalWatch::_report(const std::string& space, const std::string& key, const std::string& value)
{
    if (space == APPEARANCE && key == COLOR_SCHEME)
        _sink(platform::KEY_THEME, value == "1" ? "dark" : "light"); // 1 prefers dark, 2 light, 0 nothing
    else if (space == INTERFACE_SPACE && key == CLOCK_FORMAT)
        _sink(platform::KEY_CLOCK_24H, value == "24h" ? "1" : "0");
}

}
