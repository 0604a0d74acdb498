#include "system_settings.h"

#include "state/Keys.h"
#include "state/Trees.h"

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
    const size_t line = region.find('_');
    const std::string territory = line != std::string::npos ? region.substr(line + 1, 2) : "US";
    return !region.starts_with("fr_")
        && std::find(TERRITORIES.begin(), TERRITORIES.end(), territory) != TERRITORIES.end();
}

std::string zoneOfLocaltime()
{
    std::error_code error;
    const std::string target = std::filesystem::read_symlink("/etc/localtime", error);
    constexpr std::string_view MARK = "zoneinfo/";
    const size_t at = target.find(MARK);
    return at != std::string::npos ? target.substr(at + MARK.size()) : "UTC";
}

std::string timeZone()
{
    if (auto known = stateTree().read(platform::KEY_TIME_ZONE); known && !known->empty())
        return *known;
    const char* variable = std::getenv("TZ");
    const std::string_view zone = variable != nullptr ? variable : "";
    const bool named = !zone.empty() && zone.find_first_of(":,<") == std::string_view::npos;
    return named ? std::string(zone) : zoneOfLocaltime();
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
