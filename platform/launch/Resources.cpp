#include "app.h"
#include "launch/Identity.h"

#include <cstring>
#include <filesystem>
#include <string>

namespace {

char* resourcePath()
{
    const std::string path = platform::resourceDirectory();
    return path.empty() ? nullptr : ::strdup(path.c_str());
}

bool staysBelow(const std::filesystem::path& name)
{
    if (name.empty() || name.is_absolute())
        return false;
    for (const auto& part : name)
        if (part == "..")
            return false;
    return true;
}

}

char* app_get_resource_path(void) { return resourcePath(); }

char* app_get_shared_resource_path(void) { return resourcePath(); }

int app_resource_manager_init(void)
{
    return platform::resourceDirectory().empty() ? APP_ERROR_NOT_FOUND : APP_ERROR_NONE;
}

int app_resource_manager_get(app_resource_e, const char* name, char** path)
{
    if (name == nullptr || path == nullptr || !staysBelow(name))
        return APP_ERROR_INVALID_PARAMETER;
    *path = nullptr;
    const std::string found = platform::resourceDirectory() + name;
    std::error_code error;
    if (found[0] != '/' || !std::filesystem::is_regular_file(found, error))
        return APP_ERROR_NOT_FOUND;
    *path = ::strdup(found.c_str());
    return APP_ERROR_NONE;
}

int app_resource_manager_release(void) { return APP_ERROR_NONE; }
