#include "ShareWays.h"

#include <glib.h>

#include <cstdlib>
#include <memory>

#include <spawn.h>
#include <unistd.h>

namespace share {

namespace {

    using Text = std::unique_ptr<char, void (*)(void*)>;

    std::string adopt(char* text)
    {
        const std::unique_ptr<char, decltype(&std::free)> owner(text, &std::free);
        return text != nullptr ? text : "";
    }

    std::string pathOf(const std::string& uriOrPath)
    {
        if (!uriOrPath.starts_with("file:"))
            return uriOrPath;
        const Text path(g_filename_from_uri(uriOrPath.c_str(), nullptr, nullptr), g_free);
        return path != nullptr ? path.get() : "";
    }

    bool isInstalled(const char* program) { return Text(g_find_program_in_path(program), g_free) != nullptr; }

    std::string directoryOf(const std::string& path) { return path.substr(0, path.rfind('/') + 1); }

    Way eMail(const std::vector<std::string>& paths)
    {
        Way way{"IDS_MW_OPT_SEND_BY_EMAIL", {"xdg-email"}};
        for (const std::string& path : paths) {
            way.command.emplace_back("--attach");
            way.command.push_back(path);
        }
        return way;
    }

    Way bluetooth(const char* program, const std::vector<std::string>& paths)
    {
        Way way{"IDS_MW_OPT_SEND_BY_BLUETOOTH", {program}};
        way.command.insert(way.command.end(), paths.begin(), paths.end());
        return way;
    }

}

std::vector<std::string> pathsOf(app_control_h request)
{
    std::vector<std::string> named;
    char** values = nullptr;
    int count = 0;
    if (app_control_get_extra_data_array(request, APP_CONTROL_DATA_PATH, &values, &count) == 0) {
        for (int i = 0; i < count; ++i)
            named.push_back(adopt(values[i]));
        std::free(static_cast<void*>(values));
    }
    char* uri = nullptr;
    if (named.empty() && app_control_get_uri(request, &uri) == 0)
        named.push_back(adopt(uri));
    std::vector<std::string> paths;
    for (const std::string& name : named) {
        const std::string path = pathOf(name);
        if (path.starts_with('/') && ::access(path.c_str(), R_OK) == 0)
            paths.push_back(path);
    }
    return paths;
}

std::vector<Way> waysFor(const std::vector<std::string>& paths)
{
    std::vector<Way> ways;
    if (isInstalled("xdg-email"))
        ways.push_back(eMail(paths));
    for (const char* program : {"bluetooth-sendto", "blueman-sendto"}) {
        if (!isInstalled(program))
            continue;
        ways.push_back(bluetooth(program, paths));
        break;
    }
    if (isInstalled("xdg-open"))
        ways.push_back({"IDS_MW_OPT_OPEN_FOLDER", {"xdg-open", directoryOf(paths.front())}});
    ways.push_back({paths.size() == 1 ? "IDS_MW_OPT_COPY_FILE" : "IDS_MW_OPT_COPY_FILES", {}});
    return ways;
}

std::string uriListOf(const std::vector<std::string>& paths)
{
    std::string list;
    for (const std::string& path : paths) {
        const Text uri(g_filename_to_uri(path.c_str(), nullptr, nullptr), g_free);
        list += (uri != nullptr ? std::string(uri.get()) : path) + "\r\n";
    }
    return list;
}

bool start(const std::vector<std::string>& command)
{
    std::vector<char*> words;
    words.reserve(command.size() + 1);
    for (const std::string& word : command)
        words.push_back(const_cast<char*>(word.c_str())); // the interface of exec, which does not write
    words.push_back(nullptr);
    posix_spawnattr_t attributes;
    posix_spawnattr_init(&attributes);
    posix_spawnattr_setflags(&attributes, POSIX_SPAWN_SETSID); // outlives the window
    pid_t process = -1;
    const int error = posix_spawnp(&process, words[0], nullptr, &attributes, words.data(), environ);
    posix_spawnattr_destroy(&attributes);
    return error == 0;
}

}
