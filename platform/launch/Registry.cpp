#include "launch/Registry.h"

#include "launch/Identity.h"
#include "state/Directories.h"
#include "state/Log.h"
#include "storage.h"

#include <glib.h>

#include <algorithm>
#include <cstdlib>
#include <filesystem>
#include <memory>
#include <set>

#include <unistd.h>

namespace platform {

namespace {

    namespace fs = std::filesystem;

    constexpr auto GROUP = "Application";

    std::vector<std::string> registryDirectories()
    {
        std::vector<std::string> all;
        if (const char* named = std::getenv("MEWLO_APPS_DIR"); named != nullptr && *named != '\0')
            all.emplace_back(named);
        if (const std::string share = resourceDirectory(); !share.empty())
            all.push_back(share + "apps");
        all.push_back(dataDirectory() + "/apps");
        const char* dirs = std::getenv("XDG_DATA_DIRS");
        std::string list = dirs != nullptr && *dirs != '\0' ? dirs : "/usr/local/share:/usr/share";
        list += ':';
        for (size_t start = 0, end; (end = list.find(':', start)) != std::string::npos; start = end + 1)
            if (list[start] == '/')
                all.push_back(list.substr(start, end - start) + "/mewlo-lite/apps");
        return all;
    }

    std::string textOf(GKeyFile* file, const char* key)
    {
        const std::unique_ptr<char, void (*)(void*)> text(g_key_file_get_string(file, GROUP, key, nullptr), g_free);
        return text != nullptr ? text.get() : std::string();
    }

    std::vector<std::string> listOf(GKeyFile* file, const char* key)
    {
        const std::unique_ptr<char*, void (*)(char**)> list(
            g_key_file_get_string_list(file, GROUP, key, nullptr, nullptr), g_strfreev);
        std::vector<std::string> all;
        for (char** entry = list.get(); entry != nullptr && *entry != nullptr; ++entry)
            all.emplace_back(*entry);
        return all;
    }

    std::optional<AppEntry> load(const std::string& path, const std::string& id)
    {
        const std::unique_ptr<GKeyFile, void (*)(GKeyFile*)> file(g_key_file_new(), g_key_file_free);
        if (!g_key_file_load_from_file(file.get(), path.c_str(), G_KEY_FILE_NONE, nullptr))
            return std::nullopt;
        AppEntry entry{id, textOf(file.get(), "Exec"), listOf(file.get(), "Operations")};
        const std::string reply = textOf(file.get(), "Reply");
        entry.reply = reply == "none" ? ReplyKind::NONE : reply == "exit" ? ReplyKind::EXIT : ReplyKind::PROTOCOL;
        if (!entry.exec.empty())
            return entry;
        PLATFORM_LOGE("%s has no Exec", path.c_str());
        return std::nullopt;
    }

    bool isProgram(const std::string& path)
    {
        std::error_code error;
        return ::access(path.c_str(), X_OK) == 0 && fs::is_regular_file(path, error);
    }

    std::string resolved(const std::string& program)
    {
        if (program[0] == '/')
            return program;
        const std::string beside = executableDirectory() + "/" + program;
        if (isProgram(beside))
            return beside;
        const std::unique_ptr<char, void (*)(void*)> found(g_find_program_in_path(program.c_str()), g_free);
        return found != nullptr ? found.get() : program;
    }

    std::vector<std::string> expanded(const std::string& word, const app_control_s& request)
    {
        if (word == "%F") {
            const auto* paths = request.extras.find(APP_CONTROL_DATA_PATH);
            return paths != nullptr ? *paths : std::vector<std::string>();
        }
        if (word == "%u")
            return {request.fields.text("uri")};
        if (word == "%f")
            return {request.extras.text(APP_CONTROL_DATA_PATH)};
        if (word == "%d")
            return {storage_device_root()};
        return {word};
    }

}

std::optional<AppEntry> findApp(const std::string& id)
{
    if (!isAppId(id))
        return std::nullopt;
    for (const std::string& directory : registryDirectories())
        if (auto entry = load(directory + "/" + id + ".app", id))
            return entry;
    return std::nullopt;
}

std::optional<AppEntry> findAppByOperation(const std::string& operation)
{
    for (const std::string& directory : registryDirectories()) {
        std::error_code error;
        std::set<fs::path> files; // in a fixed order
        for (fs::directory_iterator file(directory, error), end; !error && file != end; file.increment(error))
            if (file->path().extension() == ".app" && isAppId(file->path().stem()))
                files.insert(file->path());
        for (const fs::path& file : files) {
            auto entry = load(file, file.stem());
            if (entry
                && std::find(entry->operations.begin(), entry->operations.end(), operation) != entry->operations.end())
                return entry;
        }
    }
    return std::nullopt;
}

std::vector<std::string> commandOf(const AppEntry& entry, const app_control_s& request)
{
    char** words = nullptr;
    int count = 0;
    if (!g_shell_parse_argv(entry.exec.c_str(), &count, &words, nullptr))
        return {};
    std::vector<std::string> command = {resolved(words[0])};
    for (int i = 1; i < count; ++i)
        for (std::string& word : expanded(words[i], request))
            command.push_back(std::move(word));
    g_strfreev(words);
    return command;
}

}
