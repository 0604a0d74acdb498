#include "Commands.h"

#include <Ecore.h>
#include <state_keys.h>
#include <vconf.h>

#include <algorithm>
#include <cstdio>

#include "MwText.h"

namespace {

int wrongUse(const char* text)
{
    std::fprintf(stderr, "usage: mewlo-tool %s\n", text);
    return tool::WRONG_USE;
}

int printValue(char* value, const std::string& key)
{
    if (value == nullptr) {
        std::fprintf(stderr, "mewlo-tool: no value for %s\n", key.c_str());
        return tool::FAILED;
    }
    std::puts(mwAdopt(value).c_str());
    return tool::OK;
}

int succeeded(int code, const std::string& key)
{
    if (code == 0)
        return tool::OK;
    std::fprintf(stderr, "mewlo-tool: %s cannot be written\n", key.c_str());
    return tool::FAILED;
}

void printKeyCb(const char* key, const char* value, bool pinned, void* userData)
{
    const auto* wanted = static_cast<const tool::Arguments*>(userData);
    if (wanted != nullptr && !wanted->empty() && std::find(wanted->begin(), wanted->end(), key) == wanted->end())
        return;
    std::printf("%s=%s%s\n", tool::escaped(key).c_str(), value != nullptr ? tool::escaped(value).c_str() : "",
        pinned ? " (pinned)" : "");
    std::fflush(stdout);
}

int watch(tool::Arguments keys)
{
    ecore_init();
    int status = tool::OK;
    if (state_keys_watch(printKeyCb, &keys) == 0) {
        ecore_event_handler_add(
            ECORE_EVENT_SIGNAL_EXIT,
            [](void*, int, void*) -> Eina_Bool {
                ecore_main_loop_quit();
                return ECORE_CALLBACK_DONE;
            },
            nullptr);
        ecore_main_loop_begin();
        state_keys_watch(nullptr, nullptr);
    } else {
        std::fputs("mewlo-tool: the keys cannot be watched\n", stderr);
        status = tool::FAILED;
    }
    ecore_shutdown();
    return status;
}

}

int tool::state(const Arguments& arguments)
{
    const std::string action = arguments.empty() ? "list" : arguments[0];
    const size_t count = arguments.size();
    if (action == "list" && count <= 1) {
        state_keys_list(printKeyCb, nullptr);
        return OK;
    }
    if (action == "get" && count == 2)
        return printValue(vconf_get_str(arguments[1].c_str()), arguments[1]);
    if (action == "set" && count == 3)
        return succeeded(vconf_set_str(arguments[1].c_str(), arguments[2].c_str()), arguments[1]);
    if (action == "pin" && count == 3)
        return succeeded(state_key_pin(arguments[1].c_str(), arguments[2].c_str()), arguments[1]);
    if (action == "unpin" && count == 2)
        return succeeded(state_key_unpin(arguments[1].c_str()), arguments[1]);
    if (action == "watch")
        return watch(Arguments(arguments.begin() + 1, arguments.end()));
    return wrongUse("state [get KEY | set KEY VALUE | pin KEY VALUE | unpin KEY | watch [KEY...]]");
}

int tool::preference(const Arguments& arguments)
{
    if (arguments.empty()) {
        preference_keys_list(printKeyCb, nullptr);
        return OK;
    }
    if (arguments[0] == "get" && arguments.size() == 2)
        return printValue(preference_key_get(arguments[1].c_str()), arguments[1]);
    if (arguments[0] == "set" && arguments.size() == 3)
        return succeeded(preference_key_set(arguments[1].c_str(), arguments[2].c_str()), arguments[1]);
    return wrongUse("pref [get KEY | set KEY VALUE]");
}

int tool::locks(const Arguments&)
{
    power_locks_list([](int process, const char* held, void*) { std::printf("%d\t%s\n", process, held); }, nullptr);
    return OK;
}

int tool::usage(const Arguments&)
{
    const std::string path = mwAdopt(usage_log_path());
    std::FILE* file = std::fopen(path.c_str(), "r");
    if (file == nullptr)
        return OK; // nothing counted yet
    char buffer[4096];
    for (size_t size = 0; (size = std::fread(buffer, 1, sizeof buffer, file)) > 0;)
        std::fwrite(buffer, 1, size, stdout);
    std::fclose(file);
    return OK;
}
