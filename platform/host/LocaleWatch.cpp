#include "LocaleWatch.h"

#include <StateKeys.h>

#include <algorithm>
#include <cstdlib>
#include <map>

namespace host {

namespace {

    constexpr auto SERVICE = "org.freedesktop.locale1";
    constexpr auto PATH = "/org/freedesktop/locale1";
    constexpr auto PROPERTIES = "org.freedesktop.DBus.Properties";

    std::string firstSet(std::initializer_list<const char*> names)
    {
        for (const char* name : names)
            if (const char* value = std::getenv(name); value != nullptr && *value != '\0')
                return value;
        return {};
    }

    // "LANG=de_DE.UTF-8" and the like.
    std::map<std::string, std::string> assignments(sd_bus_message* variant)
    {
        std::map<std::string, std::string> all;
        if (sd_bus_message_enter_container(variant, SD_BUS_TYPE_VARIANT, "as") < 0)
            return all;
        const char* text = nullptr;
        sd_bus_message_enter_container(variant, SD_BUS_TYPE_ARRAY, "s");
        while (sd_bus_message_read_basic(variant, SD_BUS_TYPE_STRING, &text) > 0) {
            const std::string line = text;
            if (const size_t equals = line.find('='); equals != std::string::npos)
                all[line.substr(0, equals)] = line.substr(equals + 1);
        }
        sd_bus_message_exit_container(variant);
        sd_bus_message_exit_container(variant);
        return all;
    }

}

std::string LocaleWatch::plainLocale(const std::string& locale)
{
    const std::string plain = locale.substr(0, locale.find_first_of(".@:"));
    return plain.empty() || plain == "C" || plain == "POSIX" ? "en_US" : plain;
}

std::string LocaleWatch::regionOf(const std::string& locale)
{
    static const std::map<std::string, std::string> SCRIPTS
        = {{"arabic", "Arab"}, {"cyrillic", "Cyrl"}, {"devanagari", "Deva"}, {"iqtelif", "Latn"}, {"latin", "Latn"}};
    std::string plain = plainLocale(locale);
    const size_t at = locale.find('@');
    const auto script
        = SCRIPTS.find(at != std::string::npos ? locale.substr(at + 1, locale.find(':', at) - at - 1) : "");
    if (script == SCRIPTS.end())
        return plain;
    return plain.insert(std::min(plain.find('_'), plain.size()), "_" + script->second);
}

void LocaleWatch::start()
{
    const std::string language = firstSet({"LANGUAGE", "LC_ALL", "LC_MESSAGES", "LANG"});
    const std::string region = firstSet({"LC_ALL", "LC_TIME", "LANG"});
    _languageIsOpen = language.empty();
    _regionIsOpen = region.empty();
    if (!_languageIsOpen)
        _sink(platform::KEY_LANGUAGE, plainLocale(language));
    if (!_regionIsOpen)
        _sink(platform::KEY_REGION, regionOf(region));
    BusInLoop* bus = systemBus();
    if (bus == nullptr || (!_languageIsOpen && !_regionIsOpen))
        return;
    _slots.push_back(
        onSignal(bus->get(), SERVICE, PATH, PROPERTIES, "PropertiesChanged", [this](sd_bus_message* message) {
            if (sd_bus_message_skip(message, "s") >= 0)
                _readSystem(message);
        }));
    const Message call = newCall(bus->get(), SERVICE, PATH, PROPERTIES, "GetAll");
    if (call == nullptr || sd_bus_message_append(call.get(), "s", SERVICE) < 0)
        return;
    _slots.push_back(callAsync(bus->get(), call, [this](sd_bus_message* reply) {
        if (sd_bus_message_is_method_error(reply, nullptr) <= 0)
            _readSystem(reply);
    }));
}

void LocaleWatch::_readSystem(sd_bus_message* message)
{
    forEachProperty(message, [this](const std::string& name, sd_bus_message* value) {
        if (name != "Locale")
            return;
        auto all = assignments(value);
        const std::string common = all["LANG"];
        if (_languageIsOpen)
            _sink(platform::KEY_LANGUAGE, plainLocale(all["LC_MESSAGES"].empty() ? common : all["LC_MESSAGES"]));
        if (_regionIsOpen)
            _sink(platform::KEY_REGION, regionOf(all["LC_TIME"].empty() ? common : all["LC_TIME"]));
    });
}

}
