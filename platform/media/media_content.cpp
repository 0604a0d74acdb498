#include <Mutex.h>
#include <media_content.h>

#include <storage.h>
#include <vconf.h>

#include <algorithm>
#include <cstdlib>
#include <cstring>
#include <memory>
#include <optional>
#include <string>
#include <sys/stat.h>
#include <thread>
#include <unistd.h>
#include <utility>
#include <vector>

#include "media/FolderWatch.h"
#include "media/MediaDatabase.h"
#include "media/MediaFile.h"
#include "media/MediaNotice.h"
#include "media/MediaScan.h"
#include "media/Rescanner.h"
#include "media/WaveformCache.h"
#include "state/Trees.h"

struct media_info_s {
    media::MediaRow row;
};
struct audio_meta_s {
    int duration;
};
struct filter_s {
    media::Query query;
};
struct media_bookmark_s {
    media::BookmarkRow row;
};
struct files_lock_s : media::FilesLock {
    using FilesLock::FilesLock;
};

namespace {

struct Connection {
    explicit Connection(const std::string& path)
        : database(path)
        , notice(path + ".changed")
    {
    }
    ~Connection()
    {
        stopWatching();
        if (opener.joinable())
            opener.join();
        database.keepCopy();
    }
    Connection(const Connection&) = delete;
    Connection& operator=(const Connection&) = delete;

    void stopWatching()
    {
        platform::stateTree().unwatch(std::exchange(cardWatch, 0));
        folders.reset();
        rescanner.reset();
    }

    // Held from finding a database damaged until it is filled again, so that nobody reads it empty in between.
    platform::Mutex mutex;
    media::Database database;
    media::Notice notice;
    media_content_db_updated_cb callback = nullptr;
    void* userData = nullptr;
    std::thread opener;
    platform::KeyTree::WatchId cardWatch = 0;
    std::unique_ptr<media::Rescanner> rescanner;
    std::unique_ptr<media::FolderWatch> folders;
};

platform::Mutex connectionMutex;
std::shared_ptr<Connection> connection GUARDED_BY(connectionMutex);
int connectionCount GUARDED_BY(connectionMutex) = 0;

std::shared_ptr<Connection> current()
{
    const platform::Lock lock(connectionMutex);
    return connection;
}

std::string databasePath()
{
    if (const char* path = std::getenv("MEWLO_MEDIA_DB"); path != nullptr && *path != '\0')
        return path;
    const char* data = std::getenv("XDG_DATA_HOME");
    const char* home = std::getenv("HOME");
    const std::string root
        = data != nullptr && *data == '/' ? data : std::string(home != nullptr ? home : "/tmp") + "/.local/share";
    return root + "/mewlo-lite/media.db";
}

int toError(int code)
{
    switch (code & 0xff) {
    case SQLITE_OK:
        return MEDIA_CONTENT_ERROR_NONE;
    case SQLITE_BUSY:
    case SQLITE_LOCKED:
        return MEDIA_CONTENT_ERROR_DB_BUSY;
    case SQLITE_NOMEM:
        return MEDIA_CONTENT_ERROR_OUT_OF_MEMORY;
    default:
        return MEDIA_CONTENT_ERROR_DB_FAILED;
    }
}

char* copyText(const std::string& text)
{
    auto* copy = static_cast<char*>(std::malloc(text.size() + 1));
    if (copy != nullptr)
        std::memcpy(copy, text.c_str(), text.size() + 1);
    return copy;
}

int giveText(const std::string& text, char** result)
{
    if (result == nullptr)
        return MEDIA_CONTENT_ERROR_INVALID_PARAMETER;
    *result = copyText(text);
    return *result != nullptr ? MEDIA_CONTENT_ERROR_NONE : MEDIA_CONTENT_ERROR_OUT_OF_MEMORY;
}

// A recording on a card that is out cannot be used; its row waits for the card, bookmarks and all.
class AwayRows {
public:
    bool contains(const media::MediaRow& row) const
    {
        return row.storage == ON_CARD && !(_isMounted && row.path.starts_with(_root));
    }

private:
    static constexpr int ON_CARD = 1;
    static bool isMounted()
    {
        int status = 0;
        return vconf_get_int(VCONFKEY_SYSMAN_MMC_STATUS, &status) == 0 && status == 1;
    }
    bool _isMounted = isMounted();
    std::string _root = std::string(storage_card_root()) + "/";
};

// Another process committed, or this one did (it is told too; who does not care compares the process id).
void committed(int pid)
{
    const auto held = current();
    if (!held || held->callback == nullptr)
        return;
    held->callback(MEDIA_CONTENT_ERROR_NONE, pid, MEDIA_ITEM_DIRECTORY, MEDIA_CONTENT_UPDATE, MEDIA_CONTENT_TYPE_SOUND,
        nullptr, nullptr, nullptr, held->userData);
}

void refill(Connection& held);

// Reads; when that found the database damaged and replaced it, once more from the refilled one.
template <typename Work>
int read(Connection& held, const Work& work)
{
    const platform::Lock lock(held.mutex);
    const int result = work(held.database);
    if (!held.database.takeReplaced())
        return result;
    refill(held);
    return work(held.database);
}

// Common to all writes: run, then tell everybody; after a damaged database was replaced, fill the new one first.
template <typename Work>
int write(const Work& work)
{
    const auto held = current();
    if (!held)
        return MEDIA_CONTENT_ERROR_INVALID_OPERATION;
    const platform::Lock lock(held->mutex);
    const int result = work(held->database);
    if (held->database.takeReplaced())
        refill(*held);
    if (result == SQLITE_OK)
        held->notice.touch(::getpid());
    return toError(result);
}

platform::Mutex rememberedMutex;
uint64_t rememberedInode GUARDED_BY(rememberedMutex) = 0;
media::Loudness remembered GUARDED_BY(rememberedMutex);

// The file at the path may be the one that was recorded last.
void keepRemembered(const std::string& path)
{
    media::Loudness loudness;
    {
        struct stat status { };
        const platform::Lock lock(rememberedMutex);
        if (rememberedInode == 0 || ::stat(path.c_str(), &status) != 0 || status.st_ino != rememberedInode)
            return;
        rememberedInode = 0;
        loudness = std::move(remembered);
    }
    media::cacheLoudness(path, loudness);
}

std::vector<media::BookmarkRow> bookmarkRows(const media_bookmark_entry_s* bookmarks, int count)
{
    std::vector<media::BookmarkRow> rows;
    rows.reserve(static_cast<size_t>(count));
    for (int i = 0; i < count; ++i)
        rows.push_back({0, bookmarks[i].marked_time, bookmarks[i].name != nullptr ? bookmarks[i].name : ""});
    return rows;
}

int scan(Connection& held, const std::vector<std::string>& folders, media::ScanCount& count,
    media::Lengths lengths = media::Lengths::KNOWN)
{
    const int code = media::scanFolders(held.database, folders, lengths, count);
    // The finds are nobody's own change: process id 0 makes every listener reload.
    if (code == SQLITE_OK && count.changed > 0)
        held.notice.touch(0);
    return toError(code);
}

// After a damaged database was set aside: the new one gets what the files tell.
void refill(Connection& held)
{
    media::ScanCount count;
    scan(held, media::recordingFolders(), count);
}

void openNow(Connection& held)
{
    {
        const platform::Lock lock(held.mutex);
        held.database.open();
        if (held.database.takeReplaced())
            refill(held);
    }
    held.database.keepCopy();
    const platform::Lock lock(held.mutex);
    if (held.database.takeReplaced())
        refill(held);
}

// From now on what other programs do to the files arrives by itself.
void watchFolders(Connection& held)
{
    held.folders
        = std::make_unique<media::FolderWatch>(media::recordingFolders(), [&held] { held.rescanner->request(); });
}

void startWatching(Connection& held)
{
    held.rescanner = std::make_unique<media::Rescanner>([&held] {
        media::ScanCount count;
        scan(held, media::recordingFolders(), count);
    });
    watchFolders(held);
    held.cardWatch = platform::stateTree().watch(VCONFKEY_SYSMAN_MMC_STATUS, [&held](const std::string&) {
        watchFolders(held);
        held.rescanner->request();
        held.notice.touch(0); // its rows come or go, changed or not
    });
}

}

namespace media {

namespace {

    std::optional<Waveform> stateOf(const std::string& path)
    {
        struct stat status { };
        if (::stat(path.c_str(), &status) != 0)
            return {};
        constexpr long long SECOND = 1000000000;
        return Waveform{path, status.st_size, status.st_mtim.tv_sec * SECOND + status.st_mtim.tv_nsec};
    }

}

Loudness cachedLoudness(const std::string& path)
{
    const auto held = current();
    const auto key = stateOf(path);
    std::string samples;
    if (!held || !key
        || read(*held, [&](Database& database) { return database.selectWaveform(*key, samples); }) != SQLITE_OK)
        return {};
    Loudness loudness;
    for (size_t i = 0; i + 1 < samples.size(); i += 2)
        loudness.push_back(static_cast<uint32_t>(
            static_cast<unsigned char>(samples[i]) << 8 | static_cast<unsigned char>(samples[i + 1])));
    return loudness;
}

void rememberLoudness(uint64_t inode, Loudness loudness)
{
    const platform::Lock lock(rememberedMutex);
    rememberedInode = inode;
    remembered = std::move(loudness);
}

// Nobody needs to hear of this change.
void cacheLoudness(const std::string& path, const Loudness& loudness)
{
    const auto held = current();
    const auto key = stateOf(path);
    if (!held || !key || loudness.empty())
        return;
    std::string samples;
    for (const uint32_t value : loudness) {
        samples.push_back(static_cast<char>(value >> 8));
        samples.push_back(static_cast<char>(value));
    }
    read(*held, [&](Database& database) { return database.putWaveform(*key, samples); });
}

}

extern "C" {

int media_content_connect(void)
{
    const platform::Lock lock(connectionMutex);
    if (connectionCount++ > 0)
        return MEDIA_CONTENT_ERROR_NONE;
    connection = std::make_shared<Connection>(databasePath());
    // Opened beside the start of the program; whoever needs it first waits for it or opens it himself.
    connection->opener = std::thread([held = connection.get()] { openNow(*held); });
    return MEDIA_CONTENT_ERROR_NONE;
}

int media_content_disconnect(void)
{
    std::shared_ptr<Connection> last; // declared first, destroyed after the lock: it waits for its opener
    const platform::Lock lock(connectionMutex);
    if (connectionCount == 0)
        return MEDIA_CONTENT_ERROR_INVALID_OPERATION;
    if (--connectionCount == 0)
        last = std::exchange(connection, nullptr);
    return MEDIA_CONTENT_ERROR_NONE;
}

int media_content_set_db_updated_cb(media_content_db_updated_cb callback, void* user_data)
{
    const auto held = current();
    if (!held || callback == nullptr)
        return MEDIA_CONTENT_ERROR_INVALID_OPERATION;
    held->callback = callback;
    held->userData = user_data;
    held->stopWatching();
    startWatching(*held);
    return held->notice.watch(committed) ? MEDIA_CONTENT_ERROR_NONE : MEDIA_CONTENT_ERROR_DB_FAILED;
}

int media_content_unset_db_updated_cb(void)
{
    const auto held = current();
    if (!held)
        return MEDIA_CONTENT_ERROR_INVALID_OPERATION;
    held->stopWatching();
    held->notice.unwatch();
    held->callback = nullptr;
    return MEDIA_CONTENT_ERROR_NONE;
}

int media_content_scan_folder(const char* directory, int* added, int* removed)
{
    const auto held = current();
    if (!held)
        return MEDIA_CONTENT_ERROR_INVALID_OPERATION;
    if (directory == nullptr)
        return MEDIA_CONTENT_ERROR_INVALID_PARAMETER;
    media::ScanCount count;
    const int result = scan(*held, {directory}, count);
    if (added != nullptr)
        *added = count.added;
    if (removed != nullptr)
        *removed = count.removed;
    return result;
}

int media_content_scan_all(void)
{
    const auto held = current();
    if (!held)
        return MEDIA_CONTENT_ERROR_INVALID_OPERATION;
    media::ScanCount count;
    return scan(*held, media::recordingFolders(), count, media::Lengths::ASKED_AGAIN);
}

int media_content_scan_file(const char* path)
{
    if (path == nullptr)
        return MEDIA_CONTENT_ERROR_INVALID_PARAMETER;
    auto row = media::describeFile(path);
    return write([&](media::Database& database) { return row ? database.put(*row) : database.removeByPath(path); });
}

int media_content_lock_files(files_lock_h* lock)
{
    const auto held = current();
    if (!held)
        return MEDIA_CONTENT_ERROR_INVALID_OPERATION;
    if (lock == nullptr)
        return MEDIA_CONTENT_ERROR_INVALID_PARAMETER;
    auto attempt = std::make_unique<files_lock_s>(held->database.path());
    if (!attempt->isHeld())
        return MEDIA_CONTENT_ERROR_DB_BUSY;
    *lock = attempt.release();
    return MEDIA_CONTENT_ERROR_NONE;
}

int media_content_unlock_files(files_lock_h lock)
{
    delete lock;
    return MEDIA_CONTENT_ERROR_NONE;
}

char* media_content_escape(const char* text)
{
    std::string escaped;
    for (const char* c = text != nullptr ? text : ""; *c != '\0'; ++c) {
        if (*c == '"')
            escaped += '"';
        escaped += *c;
    }
    return copyText(escaped);
}

int media_filter_create(filter_h* filter)
{
    if (filter == nullptr)
        return MEDIA_CONTENT_ERROR_INVALID_PARAMETER;
    *filter = new filter_s;
    return MEDIA_CONTENT_ERROR_NONE;
}

int media_filter_destroy(filter_h filter)
{
    delete filter;
    return MEDIA_CONTENT_ERROR_NONE;
}

int media_filter_set_condition(filter_h filter, const char* condition, media_content_collation_e)
{
    // Comparison without regard to case is a property of the columns; both collations select the same.
    if (filter == nullptr || condition == nullptr)
        return MEDIA_CONTENT_ERROR_INVALID_PARAMETER;
    filter->query.condition = condition;
    return MEDIA_CONTENT_ERROR_NONE;
}

int media_filter_set_order(
    filter_h filter, media_content_order_e order, const char* keyword, media_content_collation_e collation)
{
    if (filter == nullptr || keyword == nullptr)
        return MEDIA_CONTENT_ERROR_INVALID_PARAMETER;
    filter->query.order = std::string(keyword) + (collation == MEDIA_CONTENT_COLLATE_NOCASE ? " COLLATE NOCASE" : "")
        + (order == MEDIA_CONTENT_ORDER_DESC ? " DESC" : " ASC");
    return MEDIA_CONTENT_ERROR_NONE;
}

int media_filter_set_offset(filter_h filter, int offset, int count)
{
    if (filter == nullptr || offset < 0 || count < -1)
        return MEDIA_CONTENT_ERROR_INVALID_PARAMETER;
    filter->query.offset = offset;
    filter->query.count = count;
    return MEDIA_CONTENT_ERROR_NONE;
}

int media_info_foreach_media_from_db(filter_h filter, media_info_cb callback, void* user_data)
{
    const auto held = current();
    if (!held)
        return MEDIA_CONTENT_ERROR_INVALID_OPERATION;
    if (callback == nullptr)
        return MEDIA_CONTENT_ERROR_INVALID_PARAMETER;
    std::vector<media::MediaRow> rows;
    const int result = read(*held, [&](media::Database& database) {
        return database.select(filter != nullptr ? filter->query : media::Query(), rows);
    });
    const AwayRows away;
    // The rows are copied first, so the callback may change the database.
    for (auto& row : rows) {
        if (away.contains(row))
            continue;
        media_info_s media{std::move(row)};
        if (!callback(&media, user_data))
            break;
    }
    return toError(result);
}

int media_info_foreach_media_from_db_with_media_mode(filter_h filter, media_info_cb callback, void* user_data)
{
    return media_info_foreach_media_from_db(filter, callback, user_data);
}

int media_info_insert_to_db(const char* path, media_info_h* media)
{
    if (path == nullptr || media == nullptr)
        return MEDIA_CONTENT_ERROR_INVALID_PARAMETER;
    *media = nullptr;
    auto row = media::describeFile(path);
    if (!row)
        return MEDIA_CONTENT_ERROR_INVALID_PARAMETER;
    const int result = write([&](media::Database& database) { return database.put(*row); });
    if (result != MEDIA_CONTENT_ERROR_NONE)
        return result;
    keepRemembered(path);
    *media = new media_info_s{std::move(*row)};
    return result;
}

int media_info_get_media_from_db(const char* media_id, media_info_h* media)
{
    if (media_id == nullptr || media == nullptr)
        return MEDIA_CONTENT_ERROR_INVALID_PARAMETER;
    *media = nullptr;
    const auto held = current();
    if (!held)
        return MEDIA_CONTENT_ERROR_INVALID_OPERATION;
    std::optional<media::MediaRow> row;
    const int result = read(*held, [&](media::Database& database) { return database.find(media_id, row); });
    if (result != SQLITE_OK)
        return toError(result);
    if (!row)
        return MEDIA_CONTENT_ERROR_INVALID_PARAMETER;
    *media = new media_info_s{std::move(*row)};
    return MEDIA_CONTENT_ERROR_NONE;
}

int media_info_delete_from_db(const char* media_id)
{
    if (media_id == nullptr)
        return MEDIA_CONTENT_ERROR_INVALID_PARAMETER;
    return media_info_delete_list_from_db(&media_id, 1);
}

int media_info_delete_list_from_db(const char* const* media_ids, int count)
{
    if (media_ids == nullptr || count < 0)
        return MEDIA_CONTENT_ERROR_INVALID_PARAMETER;
    const std::vector<std::string> ids(media_ids, media_ids + count);
    return write([&](media::Database& database) { return database.removeByIds(ids); });
}

int media_info_move_to_db(media_info_h media, const char* path)
{
    if (media == nullptr || path == nullptr)
        return MEDIA_CONTENT_ERROR_INVALID_PARAMETER;
    media::MediaRow row = media->row;
    media::describePath(row, path);
    const int result = write([&](media::Database& database) { return database.rename(row.id, row); });
    if (result == MEDIA_CONTENT_ERROR_NONE)
        media->row = std::move(row);
    return result;
}

int media_info_replace_in_db(
    const char* old_media_id, const char* path, const media_bookmark_entry_s* bookmarks, int count, char** new_media_id)
{
    if (path == nullptr || count < 0 || (count > 0 && bookmarks == nullptr))
        return MEDIA_CONTENT_ERROR_INVALID_PARAMETER;
    const auto row = media::describeFile(path);
    if (!row)
        return MEDIA_CONTENT_ERROR_INVALID_PARAMETER;
    const std::vector<media::BookmarkRow> marks = bookmarkRows(bookmarks, count);
    const int result = write([&](media::Database& database) {
        return database.replace(old_media_id != nullptr ? old_media_id : "", *row, marks);
    });
    return result == MEDIA_CONTENT_ERROR_NONE && new_media_id != nullptr ? giveText(row->id, new_media_id) : result;
}

int media_info_destroy(media_info_h media)
{
    delete media;
    return MEDIA_CONTENT_ERROR_NONE;
}

int media_info_get_media_id(media_info_h media, char** media_id)
{
    return media != nullptr ? giveText(media->row.id, media_id) : MEDIA_CONTENT_ERROR_INVALID_PARAMETER;
}

int media_info_get_file_path(media_info_h media, char** path)
{
    return media != nullptr ? giveText(media->row.path, path) : MEDIA_CONTENT_ERROR_INVALID_PARAMETER;
}

int media_info_get_display_name(media_info_h media, char** name)
{
    return media != nullptr ? giveText(media->row.displayName, name) : MEDIA_CONTENT_ERROR_INVALID_PARAMETER;
}

int media_info_get_modified_time(media_info_h media, time_t* time)
{
    if (media == nullptr || time == nullptr)
        return MEDIA_CONTENT_ERROR_INVALID_PARAMETER;
    *time = static_cast<time_t>(media->row.modifiedTime);
    return MEDIA_CONTENT_ERROR_NONE;
}

int media_info_get_audio(media_info_h media, audio_meta_h* audio)
{
    if (media == nullptr || audio == nullptr)
        return MEDIA_CONTENT_ERROR_INVALID_PARAMETER;
    *audio = new audio_meta_s{std::max(media->row.duration, 0)};
    return MEDIA_CONTENT_ERROR_NONE;
}

int audio_meta_get_duration(audio_meta_h audio, int* milliseconds)
{
    if (audio == nullptr || milliseconds == nullptr)
        return MEDIA_CONTENT_ERROR_INVALID_PARAMETER;
    *milliseconds = audio->duration;
    return MEDIA_CONTENT_ERROR_NONE;
}

int audio_meta_destroy(audio_meta_h audio)
{
    delete audio;
    return MEDIA_CONTENT_ERROR_NONE;
}

int media_bookmark_insert_to_db(const char* media_id, unsigned int marked_time, const char* name)
{
    if (media_id == nullptr || name == nullptr)
        return MEDIA_CONTENT_ERROR_INVALID_PARAMETER;
    return write([&](media::Database& database) { return database.insertBookmark(media_id, marked_time, name); });
}

int media_bookmark_insert_missing_to_db(const char* media_id, const media_bookmark_entry_s* bookmarks, int count)
{
    if (media_id == nullptr || count < 0 || (count > 0 && bookmarks == nullptr))
        return MEDIA_CONTENT_ERROR_INVALID_PARAMETER;
    const std::vector<media::BookmarkRow> marks = bookmarkRows(bookmarks, count);
    return write([&](media::Database& database) { return database.insertMissingBookmarks(media_id, marks); });
}

int media_bookmark_delete_from_db(int bookmark_id)
{
    return write([&](media::Database& database) { return database.removeBookmark(bookmark_id); });
}

int media_info_foreach_bookmark_from_db(
    const char* media_id, filter_h filter, media_bookmark_cb callback, void* user_data)
{
    const auto held = current();
    if (!held)
        return MEDIA_CONTENT_ERROR_INVALID_OPERATION;
    if (media_id == nullptr || callback == nullptr)
        return MEDIA_CONTENT_ERROR_INVALID_PARAMETER;
    std::vector<media::BookmarkRow> rows;
    const int result
        = held->database.selectBookmarks(media_id, filter != nullptr ? filter->query : media::Query(), rows);
    for (auto& row : rows) {
        media_bookmark_s bookmark{std::move(row)};
        if (!callback(&bookmark, user_data))
            break;
    }
    return toError(result);
}

int media_info_get_bookmark_count_from_db(const char* media_id, filter_h filter, int* count)
{
    if (count == nullptr)
        return MEDIA_CONTENT_ERROR_INVALID_PARAMETER;
    *count = 0;
    const auto counting = [](media_bookmark_h, void* user_data) {
        ++*static_cast<int*>(user_data);
        return true;
    };
    return media_info_foreach_bookmark_from_db(media_id, filter, counting, count);
}

int media_bookmark_get_bookmark_id(media_bookmark_h bookmark, int* id)
{
    if (bookmark == nullptr || id == nullptr)
        return MEDIA_CONTENT_ERROR_INVALID_PARAMETER;
    *id = bookmark->row.id;
    return MEDIA_CONTENT_ERROR_NONE;
}

int media_bookmark_get_marked_time(media_bookmark_h bookmark, unsigned int* time)
{
    if (bookmark == nullptr || time == nullptr)
        return MEDIA_CONTENT_ERROR_INVALID_PARAMETER;
    *time = bookmark->row.markedTime;
    return MEDIA_CONTENT_ERROR_NONE;
}

int media_bookmark_get_thumbnail_path(media_bookmark_h bookmark, char** name)
{
    return bookmark != nullptr ? giveText(bookmark->row.name, name) : MEDIA_CONTENT_ERROR_INVALID_PARAMETER;
}
}
