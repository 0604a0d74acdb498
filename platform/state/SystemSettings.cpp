#include "system_settings.h"

#include "state/Trees.h"
#include <StateKeys.h>

#include <algorithm>
#include <array>
#include <cstdlib>
#include <cstring>
#include <filesystem>
#include <map>
#include <string_view>
#include <vector>

namespace {

using platform::KeyTree;
using platform::stateTree;

constexpr int NONE = 0;
constexpr int INVALID_PARAMETER = -22;
constexpr int IO_ERROR = -5;

std::map<system_settings_key_e, std::vector<KeyTree::WatchId>>& registrations()
{
    static std::map<system_settings_key_e, std::vector<KeyTree::WatchId>> all;
    return all;
}

std::vector<std::string> keysOf(system_settings_key_e key)
{
    switch (key) {
    case SYSTEM_SETTINGS_KEY_LOCALE_TIMEFORMAT_24HOUR:
        return {platform::KEY_CLOCK_24H};
    case SYSTEM_SETTINGS_KEY_LOCALE_TIMEZONE:
        return {platform::KEY_TIME_ZONE};
    case SYSTEM_SETTINGS_KEY_TIME_CHANGED:
        return {platform::KEY_TIME_CHANGED, platform::KEY_TIME_ZONE};
    }
    return {};
}

// Territories that write the time of day with twelve hours.
bool isTwelveHourRegion(const std::string& region)
{
    constexpr std::array<std::string_view, 34> TERRITORIES
        = {"US", "CA", "AU", "NZ", "IN", "PK", "BD", "PH", "MY", "SG", "KR", "EG", "SA", "AE", "KW", "QA", "BH", "OM",
            "JO", "IQ", "SY", "YE", "LY", "SD", "CO", "DO", "PR", "VE", "GR", "CY", "AL", "TW", "JM", "HK"};
    // A script of four letters may stand before the territory.
    size_t line = region.find('_');
    if (line != std::string::npos && region.find('_', line + 1) == line + 5)
        line += 5;
    const std::string territory = line != std::string::npos ? region.substr(line + 1, 2) : "US";
    return !region.starts_with("fr_")
        && std::find(TERRITORIES.begin(), TERRITORIES.end(), territory) != TERRITORIES.end();
}

// The name of a zone file, empty when it lies elsewhere.
std::string zoneOfFile(const std::string& path)
{
    constexpr std::string_view MARK = "zoneinfo/";
    const size_t at = path.find(MARK);
    return at != std::string::npos ? path.substr(at + MARK.size()) : std::string();
}

// Where the system's own time has no name (a copied zone file, a rule), the C library knows it all the same.
std::string zoneOfLocaltime()
{
    std::error_code error;
    if (!std::filesystem::exists("/etc/localtime", error))
        return "UTC";
    const std::string name = zoneOfFile(std::filesystem::read_symlink("/etc/localtime", error));
    return name.empty() ? SYSTEM_SETTINGS_TIMEZONE_LOCAL : name;
}

// TZ holds a name, a file, or a rule such as "CET-1CEST,M3.5.0,M10.5.0/3"; the first two with or without a colon.
std::string zoneOfVariable(std::string zone)
{
    zone.erase(0, zone.starts_with(':') ? 1 : 0);
    std::error_code error;
    if (zone.starts_with('/')) {
        std::string name = zoneOfFile(std::filesystem::canonical(zone, error));
        return name.empty() ? SYSTEM_SETTINGS_TIMEZONE_LOCAL : name;
    }
    const char* directory = std::getenv("TZDIR");
    const std::string file = std::string(directory != nullptr ? directory : "/usr/share/zoneinfo") + "/" + zone;
    const bool isRule = zone.find_first_of(",<") != std::string::npos;
    const bool isName = !isRule && (zone.find('/') != std::string::npos || std::filesystem::exists(file, error));
    return isName ? zone : SYSTEM_SETTINGS_TIMEZONE_LOCAL;
}

std::string timeZone()
{
    if (auto known = stateTree().read(platform::KEY_TIME_ZONE); known && !known->empty())
        return *known;
    const char* variable = std::getenv("TZ");
    return variable != nullptr && *variable != '\0' ? zoneOfVariable(variable) : zoneOfLocaltime();
}

}

int system_settings_get_value_bool(system_settings_key_e key, bool* value)
{
    if (key != SYSTEM_SETTINGS_KEY_LOCALE_TIMEFORMAT_24HOUR || value == nullptr)
        return INVALID_PARAMETER;
    const auto known = platform::parseBool(stateTree().read(platform::KEY_CLOCK_24H));
    *value = known ? *known : !isTwelveHourRegion(stateTree().read(platform::KEY_REGION).value_or("en_US"));
    return NONE;
}

int system_settings_get_value_string(system_settings_key_e key, char** value)
{
    if (key != SYSTEM_SETTINGS_KEY_LOCALE_TIMEZONE || value == nullptr)
        return INVALID_PARAMETER;
    *value = ::strdup(timeZone().c_str());
    return NONE;
}

int system_settings_set_changed_cb(system_settings_key_e key, system_settings_changed_cb callback, void* user_data)
{
    if (keysOf(key).empty() || callback == nullptr)
        return INVALID_PARAMETER;
    system_settings_unset_changed_cb(key);
    for (const std::string& name : keysOf(key)) {
        const auto watch = stateTree().watch(name, [=](const std::string&) { callback(key, user_data); });
        if (watch == 0)
            return IO_ERROR;
        registrations()[key].push_back(watch);
    }
    return NONE;
}

int system_settings_unset_changed_cb(system_settings_key_e key)
{
    const auto found = registrations().find(key);
    if (found == registrations().end())
        return keysOf(key).empty() ? INVALID_PARAMETER : NONE;
    const auto watches = std::move(found->second);
    registrations().erase(found);
    for (const auto watch : watches)
        stateTree().unwatch(watch);
    return NONE;
}
