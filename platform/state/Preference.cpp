#include "preference.h"

#include "state/Trees.h"

#include <map>
#include <utility>

namespace {

using platform::KeyTree;
using platform::preferenceTree;

struct Registration {
    preference_changed_cb callback;
    KeyTree::WatchId watch;
};

// One callback for a key.
std::map<std::string, Registration>& registrations()
{
    static std::map<std::string, Registration> all;
    return all;
}

bool isKey(const char* key) { return key != nullptr && KeyTree::isValidKey(key); }

int store(const char* key, const std::string& value)
{
    if (!isKey(key))
        return PREFERENCE_ERROR_INVALID_PARAMETER;
    return preferenceTree().write(key, value) ? PREFERENCE_ERROR_NONE : PREFERENCE_ERROR_IO_ERROR;
}

template <typename Value>
int load(const char* key, Value* value, std::optional<Value> (*parse)(const std::optional<std::string>&))
{
    if (!isKey(key) || value == nullptr)
        return PREFERENCE_ERROR_INVALID_PARAMETER;
    const auto text = preferenceTree().read(key);
    if (!text)
        return PREFERENCE_ERROR_NO_KEY;
    const auto parsed = parse(text);
    if (!parsed)
        return PREFERENCE_ERROR_IO_ERROR;
    *value = *parsed;
    return PREFERENCE_ERROR_NONE;
}

}

int preference_get_int(const char* key, int* value) { return load<int>(key, value, platform::parseInt); }

int preference_set_int(const char* key, int value) { return store(key, std::to_string(value)); }

int preference_get_boolean(const char* key, bool* value) { return load<bool>(key, value, platform::parseBool); }

int preference_set_boolean(const char* key, bool value) { return store(key, value ? "true" : "false"); }

int preference_set_changed_cb(const char* key, preference_changed_cb callback, void* user_data)
{
    if (!isKey(key) || callback == nullptr)
        return PREFERENCE_ERROR_INVALID_PARAMETER;
    const auto watch = preferenceTree().watch(
        key, [callback, user_data](const std::string& changed) { callback(changed.c_str(), user_data); });
    if (watch == 0)
        return PREFERENCE_ERROR_IO_ERROR;
    const auto old = std::exchange(registrations()[key], Registration{callback, watch});
    if (old.watch != 0)
        preferenceTree().unwatch(old.watch);
    return PREFERENCE_ERROR_NONE;
}

int preference_unset_changed_cb(const char* key, preference_changed_cb callback)
{
    if (!isKey(key))
        return PREFERENCE_ERROR_INVALID_PARAMETER;
    const auto found = registrations().find(key);
    if (found == registrations().end() || (callback != nullptr && found->second.callback != callback))
        return PREFERENCE_ERROR_NO_KEY;
    preferenceTree().unwatch(found->second.watch);
    registrations().erase(found);
    return PREFERENCE_ERROR_NONE;
}
