#include "launch/Identity.h"

#include "app.h"
#include "state/Directories.h"

#include <algorithm>
#include <cstdlib>
#include <cstring>
#include <filesystem>

namespace platform {

namespace {

    std::string& currentId()
    {
        static auto* id = new std::string(APP_ID);
        return *id;
    }

    bool isNameCharacter(char c)
    {
        return (c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z') || (c >= '0' && c <= '9') || c == '_';
    }

}

const std::string& appId() { return currentId(); }

void setAppId(const std::string& id) { currentId() = id; }

// Also the name of a file: no separators, nothing hidden.
bool isAppId(const std::string& id)
{
    return !id.empty() && id.size() < 128 && id[0] != '.' && id.back() != '.' && id.find('.') != std::string::npos
        && id.find("..") == std::string::npos
        && std::all_of(id.begin(), id.end(), [](char c) { return isNameCharacter(c) || c == '.' || c == '-'; });
}

std::string busNameOf(const std::string& appId)
{
    std::string name = appId;
    std::replace(name.begin(), name.end(), '-', '_');
    return name;
}

std::string portNameOf(const std::string& appId, const std::string& port)
{
    std::string name = port;
    std::replace_if(
        name.begin(), name.end(), [](char c) { return !isNameCharacter(c); }, '_');
    return busNameOf(appId) + ".Port_" + name;
}

std::string executableDirectory()
{
    std::error_code error;
    return std::filesystem::read_symlink("/proc/self/exe", error).parent_path();
}

std::string resourceDirectory()
{
    namespace fs = std::filesystem;
    std::error_code error;
    const char* named = std::getenv("MEWLO_RESOURCE_DIR");
    std::string path = named != nullptr && *named != '\0'
        ? std::string(named)
        : (fs::path(executableDirectory()).parent_path() / "share" / APP_ID).string();
    if (!fs::is_directory(path, error))
        return {};
    if (path.back() != '/')
        path += '/';
    return path;
}

}

int app_set_id(const char* id)
{
    if (id == nullptr || !platform::isAppId(id))
        return APP_ERROR_INVALID_PARAMETER;
    platform::setAppId(id);
    return APP_ERROR_NONE;
}

int app_get_id(char** id)
{
    if (id == nullptr)
        return APP_ERROR_INVALID_PARAMETER;
    *id = ::strdup(platform::appId().c_str());
    return APP_ERROR_NONE;
}
