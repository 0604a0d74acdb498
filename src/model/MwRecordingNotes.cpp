#include "MwRecordingNotes.h"

#include <glib.h>
#include <recorder_leftover.h>

#include <cstdio>
#include <fcntl.h>
#include <memory>
#include <sys/stat.h>
#include <unistd.h>

#include "MwHandle.h"
#include "MwLog.h"
#include "MwText.h"

namespace {

constexpr auto GROUP_RECORDING = "recording";
constexpr auto GROUP_BOOKMARKS = "bookmarks";
constexpr auto KEY_NAME = "name";
constexpr mode_t OWNER_ONLY = 0600;
constexpr off_t MOST_BYTES = 1024 * 1024;

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

// What somebody else put there, such as a link, is neither written through nor kept.
bool writeNew(const std::string& path, const std::string& text)
{
    ::unlink(path.c_str());
    const int handle = ::open(path.c_str(), O_WRONLY | O_CREAT | O_EXCL | O_NOFOLLOW | O_CLOEXEC, OWNER_ONLY);
    if (handle < 0)
        return false;
    const bool written = ::fchmod(handle, OWNER_ONLY) == 0
        && ::write(handle, text.data(), text.size()) == static_cast<ssize_t>(text.size());
    return ::close(handle) == 0 && written;
}

// Empty when it is not a regular file of a credible size.
std::string readOrdinary(const std::string& path)
{
    const int handle = ::open(path.c_str(), O_RDONLY | O_NOFOLLOW | O_NONBLOCK | O_CLOEXEC);
    if (handle < 0)
        return {};
    struct stat status { };
    std::string text;
    if (::fstat(handle, &status) == 0 && S_ISREG(status.st_mode) && status.st_size <= MOST_BYTES) {
        text.resize(static_cast<size_t>(status.st_size));
        const ssize_t count = ::read(handle, text.data(), text.size());
        text.resize(count > 0 ? static_cast<size_t>(count) : 0);
    }
    ::close(handle);
    return text;
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
    // loop; the recorder flushes them with the sound.
    const std::string beside = notesPath + "~";
    const std::string text = takeText(g_key_file_to_data(file.get(), nullptr, nullptr));
    if (writeNew(beside, text) && std::rename(beside.c_str(), notesPath.c_str()) == 0)
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
    const std::string text = readOrdinary(notesPath);
    if (text.empty() || !g_key_file_load_from_data(file.get(), text.data(), text.size(), G_KEY_FILE_NONE, nullptr))
        return std::nullopt;
    Content content;
    content.name = takeText(g_key_file_get_string(file.get(), GROUP_RECORDING, KEY_NAME, nullptr));
    loadBookmarks(file.get(), content.bookmarks);
    return content;
}

void remove(const std::string& notesPath) { ::unlink(notesPath.c_str()); }

}
