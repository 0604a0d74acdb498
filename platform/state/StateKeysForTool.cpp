#include "state_keys.h"

#include "state/Directories.h"
#include "state/Trees.h"
#include <StateKeys.h>

#include <cerrno>
#include <csignal>
#include <cstring>
#include <utility>

namespace {

using platform::KeyTree;
using platform::preferenceTree;
using platform::stateTree;

constexpr int SUCCESS = 0;
constexpr int FAILURE = -1;

int statusOf(bool done) { return done ? SUCCESS : FAILURE; }

void report(const KeyTree& tree, const std::string& key, state_key_cb callback, void* userData)
{
    const auto value = tree.read(key);
    callback(key.c_str(), value ? value->c_str() : nullptr, tree.isPinned(key), userData);
}

void list(const KeyTree& tree, state_key_cb callback, void* userData)
{
    if (callback == nullptr)
        return;
    for (const std::string& key : tree.keys())
        report(tree, key, callback, userData);
}

bool isAlive(int process) { return ::kill(process, 0) == 0 || errno == EPERM; }

}

void state_keys_list(state_key_cb callback, void* user_data) { list(stateTree(), callback, user_data); }

void preference_keys_list(state_key_cb callback, void* user_data) { list(preferenceTree(), callback, user_data); }

int state_keys_watch(state_key_cb callback, void* user_data)
{
    static KeyTree::WatchId watch = 0;
    if (watch != 0)
        stateTree().unwatch(std::exchange(watch, 0));
    if (callback == nullptr)
        return SUCCESS;
    watch = stateTree().watch("", [=](const std::string& key) { report(stateTree(), key, callback, user_data); });
    return statusOf(watch != 0);
}

int state_key_pin(const char* key, const char* value)
{
    return statusOf(key != nullptr && value != nullptr && stateTree().pin(key, value));
}

int state_key_unpin(const char* key) { return statusOf(key != nullptr && stateTree().unpin(key)); }

int preference_key_set(const char* key, const char* value)
{
    return statusOf(key != nullptr && value != nullptr && preferenceTree().write(key, value));
}

char* preference_key_get(const char* key)
{
    const auto value = key != nullptr ? preferenceTree().read(key) : std::nullopt;
    return value ? ::strdup(value->c_str()) : nullptr;
}

// A process that was killed leaves its key behind.
void power_locks_list(power_lock_cb callback, void* user_data)
{
    const std::string prefix = platform::KEY_LOCKS;
    for (const std::string& key : stateTree().keys()) {
        if (!key.starts_with(prefix))
            continue;
        const auto process = platform::parseInt(key.substr(prefix.size()));
        const auto locks = stateTree().read(key);
        if (process && locks && isAlive(*process))
            callback(*process, locks->c_str(), user_data);
        else
            stateTree().remove(key);
    }
}

char* usage_log_path(void) { return ::strdup((platform::stateDirectory() + "/usage.jsonl").c_str()); }
