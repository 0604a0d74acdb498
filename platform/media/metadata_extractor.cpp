#include <metadata_extractor.h>

#include "media/FileDuration.h"

#include <unistd.h>

#include <cstring>
#include <new>
#include <string>

struct metadata_extractor_s {
    std::string path;
};

int metadata_extractor_create(metadata_extractor_h* extractor)
{
    if (extractor == nullptr)
        return METADATA_EXTRACTOR_ERROR_INVALID_PARAMETER;
    *extractor = new (std::nothrow) metadata_extractor_s;
    return *extractor != nullptr ? METADATA_EXTRACTOR_ERROR_NONE : METADATA_EXTRACTOR_ERROR_OPERATION_FAILED;
}

int metadata_extractor_destroy(metadata_extractor_h extractor)
{
    if (extractor == nullptr)
        return METADATA_EXTRACTOR_ERROR_INVALID_PARAMETER;
    delete extractor;
    return METADATA_EXTRACTOR_ERROR_NONE;
}

int metadata_extractor_set_path(metadata_extractor_h extractor, const char* path)
{
    if (extractor == nullptr || path == nullptr)
        return METADATA_EXTRACTOR_ERROR_INVALID_PARAMETER;
    extractor->path = path;
    return access(path, R_OK) == 0 ? METADATA_EXTRACTOR_ERROR_NONE : METADATA_EXTRACTOR_ERROR_FILE_EXISTS;
}

int metadata_extractor_get_metadata(metadata_extractor_h extractor, metadata_extractor_attr_e attribute, char** value)
{
    if (extractor == nullptr || value == nullptr || attribute != METADATA_DURATION)
        return METADATA_EXTRACTOR_ERROR_INVALID_PARAMETER;
    *value = nullptr;
    const auto duration = media::durationOf(extractor->path);
    if (!duration)
        return METADATA_EXTRACTOR_ERROR_OPERATION_FAILED;
    *value = strdup(std::to_string(*duration).c_str());
    return *value != nullptr ? METADATA_EXTRACTOR_ERROR_NONE : METADATA_EXTRACTOR_ERROR_OPERATION_FAILED;
}
