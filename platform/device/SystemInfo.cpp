#include "system_info.h"

#include "state/KeyFile.h"

#include <cstdlib>
#include <cstring>
#include <string>

namespace {

constexpr int NONE = 0;
constexpr int INVALID_PARAMETER = -22;

std::string modelName()
{
    if (const char* named = std::getenv("MEWLO_MODEL"); named != nullptr && *named != '\0')
        return named;
    for (const char* path : {"/sys/class/dmi/id/product_name", "/proc/device-tree/model"})
        if (const auto name = platform::readKeyFile(path); name && !name->empty())
            return name->c_str(); // the device tree ends its texts with a NUL
    return "unknown";
}

}

int system_info_get_platform_string(const char* key, char** value)
{
    if (key == nullptr || value == nullptr || std::strcmp(key, SYSTEM_INFO_KEY_MODEL) != 0)
        return INVALID_PARAMETER;
    *value = ::strdup(modelName().c_str());
    return NONE;
}
