#include "storage/Roots.h"

#include "state/Directories.h"
#include "state/Log.h"
#include "state/Trees.h"
#include "vconf.h"
#include <StateKeys.h>

#include <cstdlib>
#include <filesystem>
#include <fstream>

#include <sys/stat.h>
#include <unistd.h>

namespace platform {

namespace {

    namespace fs = std::filesystem;

    constexpr auto FIXED_DEVICE_ROOT = "/opt/usr/media";
    constexpr auto FIXED_CARD_ROOT = "/opt/storage/sdcard";
    constexpr auto FIXED_PRIVATE_ROOT = "/opt/storage/PrivateStorage";

    std::string withoutSlashAtEnd(std::string path)
    {
        while (path.size() > 1 && path.back() == '/')
            path.pop_back();
        return path;
    }

    bool isWritableDirectory(const std::string& path)
    {
        std::error_code error;
        return fs::is_directory(path, error) && ::access(path.c_str(), W_OK | X_OK) == 0;
    }

    // The answer of a variable, made when missing; empty when unset or of no use.
    std::string fromEnvironment(const char* name, unsigned mode)
    {
        const char* value = std::getenv(name);
        if (value == nullptr || *value == '\0')
            return {};
        const std::string path = withoutSlashAtEnd(value);
        if (path[0] == '/' && makeDirectories(path, mode))
            return path;
        PLATFORM_LOGE("%s: %s is no usable directory", name, value);
        return {};
    }

    // The line XDG_MUSIC_DIR="$HOME/..." of user-dirs.dirs; a value of "$HOME/" means that the user wants none.
    std::string musicDirectory()
    {
        const fs::path config = fs::path(configDirectory()).parent_path() / "user-dirs.dirs";
        constexpr std::string_view START = "XDG_MUSIC_DIR=\"";
        const std::string home = homeDirectory();
        std::ifstream file(config);
        for (std::string line; std::getline(file, line);) {
            if (!line.starts_with(START) || line.find('"', START.size()) == std::string::npos)
                continue;
            std::string value = line.substr(START.size(), line.find('"', START.size()) - START.size());
            if (value.starts_with("$HOME"))
                value.replace(0, 5, home);
            value = withoutSlashAtEnd(value);
            if (value.starts_with('/') && value != home)
                return value;
        }
        return home + "/Music";
    }

    bool contains(const std::string& outer, const std::string& inner)
    {
        std::error_code error;
        const std::string from = fs::weakly_canonical(outer, error).string() + "/";
        return (fs::weakly_canonical(inner, error).string() + "/").starts_with(from);
    }

    bool isApart(const std::string& privateRoot, const std::string& deviceRoot)
    {
        if (!contains(deviceRoot, privateRoot) && !contains(privateRoot, deviceRoot))
            return true;
        PLATFORM_LOGE("private root %s refused: not apart from %s", privateRoot.c_str(), deviceRoot.c_str());
        return false;
    }

}

std::string resolveDeviceRoot()
{
    if (const std::string named = fromEnvironment("MEWLO_DEVICE_ROOT", 0777); !named.empty())
        return named;
    if (isWritableDirectory(FIXED_DEVICE_ROOT))
        return FIXED_DEVICE_ROOT;
    const std::string music = musicDirectory();
    makeDirectories(music, 0755);
    return music;
}

std::string resolveCardRoot()
{
    if (const std::string named = fromEnvironment("MEWLO_CARD_ROOT", 0777); !named.empty())
        return named;
    if (isWritableDirectory(FIXED_CARD_ROOT))
        return FIXED_CARD_ROOT;
    const auto path = stateTree().read(KEY_CARD_PATH);
    if (stateInt(VCONFKEY_SYSMAN_MMC_STATUS) == 1 && path && path->starts_with('/') && path->size() > 1)
        return withoutSlashAtEnd(*path);
    return FIXED_CARD_ROOT; // matches and contains nothing
}

std::string resolvePrivateRoot(const std::string& deviceRoot)
{
    const std::string named = fromEnvironment("MEWLO_PRIVATE_ROOT", 0700);
    if (!named.empty() && isApart(named, deviceRoot))
        return named;
    if (isWritableDirectory(FIXED_PRIVATE_ROOT))
        return FIXED_PRIVATE_ROOT;
    const std::string own = dataDirectory() + "/PrivateStorage";
    if (!isApart(own, deviceRoot) || !makeDirectories(own, 0700))
        return FIXED_PRIVATE_ROOT;
    ::chmod(own.c_str(), 0700);
    return own;
}

}
