#include "media/MediaFile.h"

#include <metadata_extractor.h>
#include <storage.h>

#include <glib.h>

#include <cstdlib>
#include <ctime>
#include <filesystem>
#include <sys/stat.h>

namespace media {

namespace {

    // The mode of recordings made by this program, told by where they are kept.
    constexpr int MODE_RECORDING = 10;

    struct Kind {
        const char* extension;
        const char* mimeType;
    };
    constexpr Kind KINDS[] = {
        {.extension = ".m4a", .mimeType = "audio/mp4"},
        {.extension = ".amr", .mimeType = "audio/AMR"},
        {.extension = ".3ga", .mimeType = "audio/3gpp"},
    };

    const char* mimeTypeOf(const std::string& path)
    {
        for (const Kind& kind : KINDS) {
            const size_t length = g_utf8_strlen(kind.extension, -1);
            if (path.size() > length && g_ascii_strcasecmp(path.c_str() + path.size() - length, kind.extension) == 0)
                return kind.mimeType;
        }
        return nullptr;
    }

    bool startsWith(const std::string& path, const std::string& root)
    {
        return !root.empty() && path.compare(0, root.size(), root) == 0 && path[root.size()] == '/';
    }

    int readDuration(const std::string& path)
    {
        metadata_extractor_h extractor = nullptr;
        if (metadata_extractor_create(&extractor) != 0)
            return -1;
        char* text = nullptr;
        int duration = -1;
        if (metadata_extractor_set_path(extractor, path.c_str()) == 0
            && metadata_extractor_get_metadata(extractor, METADATA_DURATION, &text) == 0 && text != nullptr)
            duration = static_cast<int>(std::strtol(text, nullptr, 10));
        std::free(text);
        metadata_extractor_destroy(extractor);
        return duration;
    }

}

bool isRecordingName(const std::string& name)
{
    return !name.empty() && name.front() != '.' && mimeTypeOf(name) != nullptr;
}

void describePath(MediaRow& row, const std::string& path)
{
    row.path = path;
    row.displayName = path.substr(path.rfind('/') + 1);
    row.storage = startsWith(path, storage_card_root()) ? 1 : 0;
    const bool ours = path.find(std::string("/") + RECORDINGS_DIRECTORY + "/") != std::string::npos
        || startsWith(path, storage_private_root());
    row.mode = ours ? MODE_RECORDING : 0;
}

std::optional<MediaRow> describeFile(const std::string& path)
{
    struct stat status { };
    if (::stat(path.c_str(), &status) != 0 || !S_ISREG(status.st_mode))
        return std::nullopt;
    MediaRow row;
    describePath(row, path);
    char* id = g_uuid_string_random();
    row.id = id;
    g_free(id);
    const char* mimeType = mimeTypeOf(path);
    row.mimeType = mimeType != nullptr ? mimeType : "application/octet-stream";
    row.size = status.st_size;
    row.addedTime = std::time(nullptr);
    row.modifiedTime = status.st_mtim.tv_sec;
    row.timeline = status.st_mtim.tv_sec * 1000LL + status.st_mtim.tv_nsec / 1000000;
    row.duration = readDuration(path);
    return row;
}

}
