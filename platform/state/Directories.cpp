#include "state/Directories.h"

#include "state/Log.h"

#include <cerrno>
#include <cstdlib>

#include <pwd.h>
#include <sys/stat.h>
#include <unistd.h>

namespace platform {

namespace {

    std::string absoluteFromEnvironment(const char* name)
    {
        const char* value = std::getenv(name);
        return value != nullptr && value[0] == '/' ? value : std::string();
    }

    std::string baseDirectory(const char* variable, const char* belowHome)
    {
        std::string base = absoluteFromEnvironment(variable);
        return !base.empty() ? base : homeDirectory() + belowHome;
    }

    bool isDirectory(const std::string& path)
    {
        struct stat info = {};
        return ::stat(path.c_str(), &info) == 0 && S_ISDIR(info.st_mode);
    }

    // Somebody else may have put a directory or a link of this name into the common /tmp.
    bool isOursAlone(const std::string& path)
    {
        struct stat info = {};
        return ::lstat(path.c_str(), &info) == 0 && S_ISDIR(info.st_mode) && info.st_uid == ::geteuid()
            && (info.st_mode & 077) == 0;
    }

    bool isPlaceForFiles(const std::string& path)
    {
        return isDirectory(path) && ::access(path.c_str(), W_OK | X_OK) == 0;
    }

}

std::string homeDirectory()
{
    std::string home = absoluteFromEnvironment("HOME");
    if (!home.empty())
        return home;
    struct passwd entry = {};
    struct passwd* found = nullptr;
    char buffer[4096];
    if (::getpwuid_r(::getuid(), &entry, buffer, sizeof(buffer), &found) == 0 && found != nullptr)
        return entry.pw_dir;
    return "/";
}

std::string configDirectory() { return baseDirectory("XDG_CONFIG_HOME", "/.config") + "/" + APP_ID; }

std::string dataDirectory() { return baseDirectory("XDG_DATA_HOME", "/.local/share") + "/mewlo-lite"; }

std::string stateDirectory() { return baseDirectory("XDG_STATE_HOME", "/.local/state") + "/mewlo-lite"; }

std::string runtimeDirectory()
{
    const std::string base = absoluteFromEnvironment("XDG_RUNTIME_DIR");
    const bool session = !base.empty() && isPlaceForFiles(base);
    const std::string path
        = session ? base + "/" + APP_ID : std::string("/tmp/") + APP_ID + "-" + std::to_string(::geteuid());
    if (::mkdir(path.c_str(), 0700) != 0 && errno != EEXIST)
        return {};
    if (isOursAlone(path))
        return path;
    PLATFORM_LOGE("%s belongs to somebody else or is open to others: not used", path.c_str());
    return {};
}

bool makeDirectories(const std::string& path, unsigned mode)
{
    if (path.empty())
        return false;
    for (size_t slash = path.find('/', 1);; slash = path.find('/', slash + 1)) {
        ::mkdir(path.substr(0, slash).c_str(), mode);
        if (slash == std::string::npos)
            return isDirectory(path);
    }
}

}
