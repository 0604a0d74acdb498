#pragma once

#include <optional>
#include <string>

#include "media/MediaDatabase.h"

namespace media {

// Whether a file name is one of a recording that is catalogued (by its extension; hidden files are not).
bool isRecordingName(const std::string& name);
// What the media table says about a file; nothing when there is no such file. Reads the duration from the file.
std::optional<MediaRow> describeFile(const std::string& path);
// Name, mode and storage follow from the path alone.
void describePath(MediaRow& row, const std::string& path);

}
