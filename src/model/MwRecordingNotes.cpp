#include "MwRecordingNotes.h"

#include <glib.h>
#include <recorder_leftover.h>

#include <cstdio>
#include <fstream>
#include <memory>
#include <unistd.h>

#include "MwHandle.h"
#include "MwLog.h"
#include "MwText.h"

namespace {

constexpr auto GROUP_RECORDING = "recording";
constexpr auto GROUP_BOOKMARKS = "bookmarks";
constexpr auto KEY_NAME = "name";

using KeyFile = MwHandle<GKeyFile*, g_key_file_unref>;

std::string takeText(char* text)
{
    const std::string result = text != nullptr ? text : "";
    g_free(text);
    return result;
}

void loadBookmarks(GKeyFile* file, std::vector<MwBookmark>& bookmarks)
{
    gsize count = 0;
    char** keys = g_key_file_get_keys(file, GROUP_BOOKMARKS, &count, nullptr);
    for (gsize i = 0; i < count && i < MwModel::MAX_BOOKMARKS; ++i) {
        char* end = nullptr;
        const unsigned long second = std::strtoul(keys[i], &end, 10);
        if (end == keys[i] || *end != '\0')
            continue;
        bookmarks.push_back({static_cast<int>(bookmarks.size()), static_cast<unsigned int>(second),
            takeText(g_key_file_get_string(file, GROUP_BOOKMARKS, keys[i], nullptr))});
    }
    g_strfreev(keys);
}

}

namespace MwRecordingNotes {

std::string pathFor(const std::string& temporaryPath) { return temporaryPath + RECORDER_NOTES_SUFFIX; }

std::string pathForSaved(const std::string& recordingPath)
{
    const size_t name = recordingPath.rfind('/') + 1;
    return recordingPath.substr(0, name) + "." + recordingPath.substr(name) + RECORDER_NOTES_SUFFIX;
}

bool save(const std::string& notesPath, const Content& content)
{
    const KeyFile file(g_key_file_new());
    g_key_file_set_string(file.get(), GROUP_RECORDING, KEY_NAME, content.name.c_str());
    for (const MwBookmark& bookmark : content.bookmarks)
        g_key_file_set_string(
            file.get(), GROUP_BOOKMARKS, std::to_string(bookmark.markedTime).c_str(), bookmark.name.c_str());
    // Written beside and renamed: a crash leaves the old notes or the new ones. No flush here, this runs on the main
    // loop; file systems order a replacing rename after the data.
    const std::string beside = notesPath + "~";
    const std::string text = takeText(g_key_file_to_data(file.get(), nullptr, nullptr));
    std::ofstream out(beside, std::ios::binary | std::ios::trunc);
    out << text;
    out.close();
    if (out && std::rename(beside.c_str(), notesPath.c_str()) == 0)
        return true;
    MW_LOGE("notes of the recording cannot be written");
    ::unlink(beside.c_str());
    return false;
}

bool keepFor(const std::string& notesPath, const std::string& recordingPath)
{
    const std::string kept = pathForSaved(recordingPath);
    remove(kept);
    if (::link(notesPath.c_str(), kept.c_str()) == 0)
        return true;
    const auto content = load(notesPath);
    return content && save(kept, *content);
}

std::optional<Content> load(const std::string& notesPath)
{
    const KeyFile file(g_key_file_new());
    if (!g_key_file_load_from_file(file.get(), notesPath.c_str(), G_KEY_FILE_NONE, nullptr))
        return std::nullopt;
    Content content;
    content.name = takeText(g_key_file_get_string(file.get(), GROUP_RECORDING, KEY_NAME, nullptr));
    loadBookmarks(file.get(), content.bookmarks);
    return content;
}

void remove(const std::string& notesPath) { ::unlink(notesPath.c_str()); }

}
