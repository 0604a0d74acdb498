#pragma once

#include <media_content.h>

#include <cstdlib>
#include <string>

#include "MwText.h"
#include "support/TempDir.h"

namespace support {

inline std::string deviceRoot() { return std::getenv("MEWLO_DEVICE_ROOT"); }
inline std::string recordingsDirectory() { return deviceRoot() + "/Sounds/Mewlo"; }
inline std::string recordingPath(const std::string& file) { return recordingsDirectory() + "/" + file; }

// Puts a file into the recordings directory and its row into the database; answers the media id.
inline std::string addRecording(const std::string& file, const std::string& content = "x")
{
    writeFile(recordingPath(file), content);
    media_info_h media = nullptr;
    char* id = nullptr;
    if (media_info_insert_to_db(recordingPath(file).c_str(), &media) != 0)
        return {};
    media_info_get_media_id(media, &id);
    media_info_destroy(media);
    return mwAdopt(id);
}

}
