#include "vconf.h"

#include "state/Trees.h"

#include <algorithm>
#include <cstring>
#include <utility>
#include <vector>

struct keynode_s {
    std::optional<std::string> value;
};

namespace {

using platform::KeyTree;
using platform::stateTree;

constexpr int SUCCESS = 0;
constexpr int FAILURE = -1;

struct Registration {
    std::string key;
    vconf_callback_fn callback;
    KeyTree::WatchId watch;
};

std::vector<Registration>& registrations()
{
    static std::vector<Registration> all;
    return all;
}

template <typename Value, typename Parsed>
int answer(const std::optional<Parsed>& parsed, Value* value)
{
    if (!parsed || value == nullptr)
        return FAILURE;
    *value = *parsed;
    return SUCCESS;
}

int store(const char* key, const std::string& value)
{
    return key != nullptr && stateTree().write(key, value) ? SUCCESS : FAILURE;
}

// What holds while nothing has reported otherwise: no card, unlocked, staying on, no headset, a full battery.
constexpr std::pair<const char*, const char*> DEFAULTS[] = {
    {VCONFKEY_SYSMAN_MMC_STATUS, "0"},
    {VCONFKEY_IDLE_LOCK_STATE, "0"},
    {VCONFKEY_SYSMAN_POWER_OFF_STATUS, "0"},
    {VCONFKEY_SETAPPL_PSMODE, "0"},
    {VCONFKEY_SYSMAN_EARJACK, "0"},
    {VCONFKEY_CALL_RECORDING_REJECT, "0"},
    {VCONFKEY_SYSMAN_BATTERY_STATUS_LOW, "3"},
};

std::optional<std::string> load(const char* key)
{
    if (key == nullptr)
        return std::nullopt;
    auto value = stateTree().read(key);
    for (const auto& [known, standard] : DEFAULTS) {
        if (!value && std::strcmp(key, known) == 0)
            value = standard;
    }
    return value;
}

}

int vconf_get_int(const char* key, int* value) { return answer(platform::parseInt(load(key)), value); }

int vconf_set_int(const char* key, int value) { return store(key, std::to_string(value)); }

int vconf_get_bool(const char* key, int* value) { return answer(platform::parseBool(load(key)), value); }

int vconf_set_bool(const char* key, int value) { return store(key, value != 0 ? "1" : "0"); }

char* vconf_get_str(const char* key)
{
    const auto value = load(key);
    return value ? ::strdup(value->c_str()) : nullptr;
}

int vconf_set_str(const char* key, const char* value) { return value != nullptr ? store(key, value) : FAILURE; }

int vconf_notify_key_changed(const char* key, vconf_callback_fn callback, void* user_data)
{
    if (key == nullptr || *key == '\0' || callback == nullptr)
        return FAILURE;
    const auto watch = stateTree().watch(key, [callback, user_data](const std::string& changed) {
        keynode_s node{stateTree().read(changed)};
        callback(&node, user_data);
    });
    if (watch == 0)
        return FAILURE;
    registrations().push_back({key, callback, watch});
    return SUCCESS;
}

int vconf_ignore_key_changed(const char* key, vconf_callback_fn callback)
{
    if (key == nullptr || callback == nullptr)
        return FAILURE;
    auto& all = registrations();
    const auto first = std::stable_partition(all.begin(), all.end(),
        [&](const Registration& entry) { return entry.key != key || entry.callback != callback; });
    const bool any = first != all.end();
    for (auto entry = first; entry != all.end(); ++entry)
        stateTree().unwatch(entry->watch);
    all.erase(first, all.end());
    return any ? SUCCESS : FAILURE;
}

int vconf_keynode_get_int(const keynode_t* node)
{
    if (node == nullptr)
        return 0;
    return platform::parseInt(node->value).value_or(platform::parseBool(node->value).value_or(false) ? 1 : 0);
}
