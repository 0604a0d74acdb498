// Facts read from a file itself. Any thread. Values are newly allocated decimal texts; durations are milliseconds.
#pragma once

typedef struct metadata_extractor_s* metadata_extractor_h;
enum metadata_extractor_error_e {
    METADATA_EXTRACTOR_ERROR_NONE = 0,
    METADATA_EXTRACTOR_ERROR_INVALID_PARAMETER = -22,
    METADATA_EXTRACTOR_ERROR_FILE_EXISTS = -17,
    METADATA_EXTRACTOR_ERROR_OPERATION_FAILED = -1
};
enum metadata_extractor_attr_e { METADATA_DURATION = 0 };

extern "C" {
int metadata_extractor_create(metadata_extractor_h* extractor);
int metadata_extractor_destroy(metadata_extractor_h extractor);
int metadata_extractor_set_path(metadata_extractor_h extractor, const char* path);
int metadata_extractor_get_metadata(metadata_extractor_h extractor, metadata_extractor_attr_e attribute, char** value);
}
