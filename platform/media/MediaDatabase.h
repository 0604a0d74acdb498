#pragma once

#include <Mutex.h>
#include <sqlite3.h>

#include <atomic>
#include <functional>
#include <memory>
#include <optional>
#include <string>
#include <utility>
#include <vector>

#include "media/DatabaseReaders.h"

namespace media {

// One row of the media table.
struct MediaRow {
    std::string id;
    std::string path;
    std::string displayName;
    std::string mimeType;
    int mode = 0;
    int storage = 0; // 0 device, 1 card
    long long size = 0; // bytes
    long long addedTime = 0; // seconds since the epoch
    long long modifiedTime = 0; // seconds since the epoch
    long long timeline = 0; // milliseconds since the epoch: the order of the list
    int duration = -1; // milliseconds, -1 when the file does not tell
};

struct BookmarkRow {
    int id = 0;
    unsigned int markedTime = 0; // seconds
    std::string name;
};

// A condition with its order and window, as SQL text.
struct Query {
    std::string condition;
    std::string order;
    int offset = 0;
    int count = -1; // all
};

// Which state of which file a waveform is of.
struct Waveform {
    std::string path;
    long long size = 0; // bytes
    long long time = 0; // of its last change, nanoseconds since the epoch
};

// What a look at the folders found, by path.
struct FileChanges {
    std::vector<MediaRow> overwritten; // rows whose path another file has now
    std::vector<MediaRow> put;
    std::vector<std::pair<std::string, MediaRow>> moved; // from the former path; the row keeps its identifier
    std::vector<std::string> removed;
};

// The SQLite file behind the media content interface: a connection that writes, shared by all threads under a lock, and
// those that read, so that nobody who reads waits for the thousand rows of a writer or of another reader. Whatever else
// is in its place (damage, another program's database, a folder) is set aside, and a new one gets what can be salvaged
// of it and of the last good copy beside it; the caller then compares it with the recordings.
class Database {
public:
    explicit Database(std::string path);
    ~Database();
    Database(const Database&) = delete;
    Database& operator=(const Database&) = delete;

    // 0, or SQLite's code. Creates the file and its folder as needed.
    int open();
    // Looks whether all of it is sound and replaces it otherwise; renews the good copy when something was changed
    // since. For a quiet moment.
    void keepCopy();
    [[nodiscard]] const std::string& path() const { return _path; }
    // Whether a damaged file was replaced since the last call.
    bool takeReplaced();

    int select(const Query& query, std::vector<MediaRow>& rows);
    int find(const std::string& mediaId, std::optional<MediaRow>& row);
    // Inserts the row, or refreshes the one of the same path and takes over its identifier.
    int put(MediaRow& row);
    // All or nothing.
    int apply(const FileChanges& changes);
    int removeByIds(const std::vector<std::string>& mediaIds);
    int removeByPath(const std::string& path);
    // A row that had the new path goes: its file was replaced.
    int rename(const std::string& mediaId, const MediaRow& row);

    // The row of an identifier (may be empty) and the one of the path go; the new one comes with its bookmarks.
    int replace(const std::string& formerId, const MediaRow& row, const std::vector<BookmarkRow>& bookmarks);

    int insertBookmark(const std::string& mediaId, unsigned int markedTime, const std::string& name);
    // Those whose time has no bookmark yet; all or nothing.
    int insertMissingBookmarks(const std::string& mediaId, const std::vector<BookmarkRow>& bookmarks);
    int removeBookmark(int bookmarkId);
    int selectBookmarks(const std::string& mediaId, const Query& query, std::vector<BookmarkRow>& rows);

    // Empty when there is none.
    int selectWaveform(const Waveform& key, std::string& samples);
    // Only that of a recording with a row is kept.
    int putWaveform(const Waveform& key, const std::string& samples);

private:
    class Statement;
    using Work = std::function<int()>;
    using Reading = DatabaseReaders::Reading;

    int _guarded(const Work& work);
    int _reading(const Reading& work);
    int _transaction(const Work& work);
    int _openIfClosed() REQUIRES(_mutex);
    int _openOnce() REQUIRES(_mutex);
    int _putRow(MediaRow& row) REQUIRES(_mutex);
    int _moveRows(const FileChanges& changes) REQUIRES(_mutex);
    int _removePath(const std::string& path) REQUIRES(_mutex);
    int _insertBookmark(const std::string& mediaId, unsigned int markedTime, const std::string& name) REQUIRES(_mutex);
    int _migrate() REQUIRES(_mutex);
    int _checkTables() REQUIRES(_mutex);
    int _verify() REQUIRES(_mutex);
    int _replace() REQUIRES(_mutex);
    std::string _setAside() REQUIRES(_mutex);
    void _restore(const std::string& aside) REQUIRES(_mutex);
    [[nodiscard]] std::string _copyPath() const { return _path + ".good"; }
    void _close() REQUIRES(_mutex);

    std::string _path;
    std::atomic<bool> _replaced = false;
    platform::Mutex _mutex;
    sqlite3* _db GUARDED_BY(_mutex) = nullptr;
    bool _isVerified GUARDED_BY(_mutex) = false; // once by this process
    bool _isChanged GUARDED_BY(_mutex) = false; // since the good copy
    DatabaseReaders _readers;
};

}
