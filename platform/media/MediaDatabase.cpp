#include "media/MediaDatabase.h"

#include "media/DatabaseSalvage.h"

#include <dlog.h>

#include <sys/stat.h>
#include <unistd.h>

#include <cstdio>
#include <ctime>
#include <filesystem>
#include <iterator>
#include <utility>

namespace media {

namespace {

    constexpr auto SCHEMA = R"(
CREATE TABLE IF NOT EXISTS media(
  MEDIA_ID TEXT PRIMARY KEY NOT NULL, MEDIA_PATH TEXT COLLATE NOCASE NOT NULL,
  MEDIA_DISPLAY_NAME TEXT COLLATE NOCASE NOT NULL, MEDIA_MIME_TYPE TEXT COLLATE NOCASE NOT NULL,
  MEDIA_MODE INTEGER NOT NULL DEFAULT 0, MEDIA_STORAGE INTEGER NOT NULL DEFAULT 0, MEDIA_SIZE INTEGER NOT NULL DEFAULT 0,
  MEDIA_ADDED_TIME INTEGER NOT NULL DEFAULT 0, MEDIA_MODIFIED_TIME INTEGER NOT NULL DEFAULT 0,
  MEDIA_TIMELINE INTEGER NOT NULL, MEDIA_DURATION INTEGER NOT NULL DEFAULT -1,
  UNIQUE(MEDIA_PATH COLLATE BINARY)) WITHOUT ROWID;
CREATE INDEX IF NOT EXISTS media_path ON media(MEDIA_PATH);
CREATE INDEX IF NOT EXISTS media_timeline ON media(MEDIA_TIMELINE DESC);
CREATE TABLE IF NOT EXISTS bookmark(
  BOOKMARK_ID INTEGER PRIMARY KEY, MEDIA_ID TEXT NOT NULL REFERENCES media ON DELETE CASCADE,
  BOOKMARK_MARKED_TIME INTEGER NOT NULL, BOOKMARK_THUMBNAIL_PATH TEXT, BOOKMARK_NAME TEXT);
CREATE INDEX IF NOT EXISTS bookmark_media ON bookmark(MEDIA_ID, BOOKMARK_MARKED_TIME);
)";

    // A cache: how loud recordings are. Goes with the recording, follows its path, and is bounded.
    constexpr auto WAVEFORM_SCHEMA = R"(
CREATE TABLE IF NOT EXISTS waveform(
  WAVEFORM_ID INTEGER PRIMARY KEY AUTOINCREMENT, WAVEFORM_PATH TEXT UNIQUE NOT NULL, WAVEFORM_SIZE INTEGER NOT NULL,
  WAVEFORM_TIME INTEGER NOT NULL, WAVEFORM_SAMPLES BLOB NOT NULL);
CREATE TRIGGER IF NOT EXISTS waveform_goes AFTER DELETE ON media BEGIN
  DELETE FROM waveform WHERE WAVEFORM_PATH = OLD.MEDIA_PATH; END;
CREATE TRIGGER IF NOT EXISTS waveform_follows AFTER UPDATE OF MEDIA_PATH ON media BEGIN
  UPDATE OR REPLACE waveform SET WAVEFORM_PATH = NEW.MEDIA_PATH WHERE WAVEFORM_PATH = OLD.MEDIA_PATH; END;
CREATE TRIGGER IF NOT EXISTS waveform_bound AFTER INSERT ON waveform BEGIN
  DELETE FROM waveform WHERE WAVEFORM_ID <= NEW.WAVEFORM_ID - 1500; END;
)";

    // What brings a database from one version (PRAGMA user_version) to the next, without losing a row.
    constexpr const char* MIGRATIONS[] = {SCHEMA, WAVEFORM_SCHEMA};
    constexpr int VERSION = std::size(MIGRATIONS);

    constexpr auto MEDIA_COLUMNS
        = "MEDIA_ID, MEDIA_PATH, MEDIA_DISPLAY_NAME, MEDIA_MIME_TYPE, MEDIA_MODE, MEDIA_STORAGE, "
          "MEDIA_SIZE, MEDIA_ADDED_TIME, MEDIA_MODIFIED_TIME, MEDIA_TIMELINE, MEDIA_DURATION";

    bool isDamage(int code) { return (code & 0xff) == SQLITE_CORRUPT || (code & 0xff) == SQLITE_NOTADB; }

    // Anything but a file, and but nothing at all: opening some of it would wait for ever.
    bool isSomethingElse(const std::string& path)
    {
        struct stat status { };
        if (::lstat(path.c_str(), &status) != 0)
            return false;
        return ::stat(path.c_str(), &status) != 0 || !S_ISREG(status.st_mode);
    }

    bool exists(const std::string& path)
    {
        struct stat status { };
        return ::lstat(path.c_str(), &status) == 0;
    }

    // A file without a byte, which SQLite takes for a new one.
    bool isEmptied(const std::string& path)
    {
        struct stat status { };
        return ::stat(path.c_str(), &status) == 0 && S_ISREG(status.st_mode) && status.st_size == 0;
    }

    std::string tailOf(const Query& query)
    {
        std::string sql;
        if (!query.condition.empty())
            sql += " AND (" + query.condition + ")";
        if (!query.order.empty())
            sql += " ORDER BY " + query.order;
        return sql + " LIMIT " + std::to_string(query.count) + " OFFSET " + std::to_string(query.offset);
    }

}

// A prepared statement; finalized with the object. Binding and stepping keep the first error.
class Database::Statement {
public:
    Statement(sqlite3* db, const std::string& sql)
    {
        _code = sqlite3_prepare_v2(db, sql.c_str(), static_cast<int>(sql.size()), &_statement, nullptr);
        if (_code != SQLITE_OK)
            __dlog_print(LOG_ID_MAIN, DLOG_ERROR, "MEWLO", "media database: %s", sqlite3_errmsg(db));
    }
    ~Statement() { sqlite3_finalize(_statement); }
    Statement(const Statement&) = delete;
    Statement& operator=(const Statement&) = delete;

    Statement& bind(const std::string& text)
    {
        return _keep(
            sqlite3_bind_text(_statement, ++_parameter, text.data(), static_cast<int>(text.size()), SQLITE_TRANSIENT));
    }
    Statement& bindBytes(const std::string& bytes)
    {
        return _keep(sqlite3_bind_blob(
            _statement, ++_parameter, bytes.data(), static_cast<int>(bytes.size()), SQLITE_TRANSIENT));
    }
    Statement& bind(long long value) { return _keep(sqlite3_bind_int64(_statement, ++_parameter, value)); }

    // True while there is a row.
    bool step()
    {
        if (_code != SQLITE_OK)
            return false;
        const int result = sqlite3_step(_statement);
        if (result != SQLITE_ROW && result != SQLITE_DONE)
            _code = result;
        return result == SQLITE_ROW;
    }
    int run()
    {
        while (step()) { }
        return _code;
    }
    [[nodiscard]] int code() const { return _code; }
    [[nodiscard]] std::string text(int column) const
    {
        const auto* data = reinterpret_cast<const char*>(sqlite3_column_text(_statement, column));
        return data != nullptr ? std::string(data, static_cast<size_t>(sqlite3_column_bytes(_statement, column)))
                               : std::string();
    }
    [[nodiscard]] std::string bytes(int column) const
    {
        const auto* data = static_cast<const char*>(sqlite3_column_blob(_statement, column));
        return data != nullptr ? std::string(data, static_cast<size_t>(sqlite3_column_bytes(_statement, column)))
                               : std::string();
    }
    [[nodiscard]] long long number(int column) const { return sqlite3_column_int64(_statement, column); }
    // Of a selection of MEDIA_COLUMNS.
    [[nodiscard]] MediaRow mediaRow() const
    {
        return {text(0), text(1), text(2), text(3), static_cast<int>(number(4)), static_cast<int>(number(5)), number(6),
            number(7), number(8), number(9), static_cast<int>(number(10))};
    }

private:
    Statement& _keep(int code)
    {
        if (_code == SQLITE_OK)
            _code = code;
        return *this;
    }

    sqlite3_stmt* _statement = nullptr;
    int _parameter = 0;
    int _code = SQLITE_OK;
};

Database::Database(std::string path)
    : _path(std::move(path))
    , _readers(_path)
{
}

Database::~Database() { _close(); }

int Database::open()
{
    const platform::Lock lock(_mutex);
    return _openIfClosed();
}

int Database::_openIfClosed()
{
    if (_db != nullptr)
        return SQLITE_OK;
    std::error_code ignored;
    std::filesystem::create_directories(std::filesystem::path(_path).parent_path(), ignored);
    const bool isLost = isEmptied(_path) || (!exists(_path) && exists(_copyPath()));
    int result = _openOnce();
    if (isDamage(result)) {
        result = _replace();
    } else if (result == SQLITE_OK && isLost) {
        _replaced = true;
        _restore({});
    }
    return result;
}

int Database::_openOnce()
{
    if (isSomethingElse(_path))
        return SQLITE_NOTADB;
    int result = sqlite3_open_v2(
        _path.c_str(), &_db, SQLITE_OPEN_READWRITE | SQLITE_OPEN_CREATE | SQLITE_OPEN_FULLMUTEX, nullptr);
    if (result == SQLITE_OK) {
        sqlite3_busy_timeout(_db, DatabaseReaders::BUSY_TIMEOUT_MS);
        // A row is written after its file was flushed; losing the last rows in a power cut only means that the next
        // start catalogues those files again. Bookmarks have no second copy, hence FULL and not NORMAL.
        result = sqlite3_exec(_db, "PRAGMA journal_mode=WAL; PRAGMA synchronous=FULL; PRAGMA foreign_keys=ON;", nullptr,
            nullptr, nullptr);
    }
    if (result == SQLITE_OK)
        result = _migrate();
    if (result == SQLITE_OK)
        result = _checkTables();
    if (result != SQLITE_OK) {
        __dlog_print(LOG_ID_MAIN, DLOG_ERROR, "MEWLO", "media database cannot be opened: %s", sqlite3_errstr(result));
        _close();
    } else {
        _readers.allow();
    }
    return result;
}

void Database::_close()
{
    _readers.close();
    sqlite3_close_v2(std::exchange(_db, nullptr));
}

int Database::_migrate()
{
    const auto version = [this]() REQUIRES(_mutex) {
        Statement statement(_db, "PRAGMA user_version");
        return statement.step() ? static_cast<int>(statement.number(0)) : -1;
    };
    if (version() == VERSION)
        return SQLITE_OK;
    // Another process may be at it as well: what counts is the version under the lock.
    int result = sqlite3_exec(_db, "BEGIN IMMEDIATE", nullptr, nullptr, nullptr);
    if (result != SQLITE_OK)
        return result;
    int known = version();
    // A later version of this program, or somebody else's database.
    if (known < 0 || known > VERSION)
        result = SQLITE_NOTADB;
    for (; result == SQLITE_OK && known < VERSION; ++known) {
        result = sqlite3_exec(_db, MIGRATIONS[known], nullptr, nullptr, nullptr);
        // Tables of that name which are not ours.
        if (result == SQLITE_ERROR)
            result = SQLITE_NOTADB;
    }
    if (result == SQLITE_OK)
        result
            = sqlite3_exec(_db, ("PRAGMA user_version=" + std::to_string(VERSION)).c_str(), nullptr, nullptr, nullptr);
    const int end = sqlite3_exec(_db, result == SQLITE_OK ? "COMMIT" : "ROLLBACK", nullptr, nullptr, nullptr);
    return result != SQLITE_OK ? result : end;
}

// Whether the tables are ours, with every column.
int Database::_checkTables()
{
    const std::string media = std::string("SELECT ") + MEDIA_COLUMNS + " FROM media LIMIT 0";
    for (const std::string& sql :
        {media, std::string("SELECT BOOKMARK_ID, MEDIA_ID, BOOKMARK_MARKED_TIME, BOOKMARK_NAME FROM bookmark LIMIT 0"),
            std::string("SELECT WAVEFORM_PATH, WAVEFORM_SAMPLES FROM waveform LIMIT 0")}) {
        const int result = Statement(_db, sql).run();
        if (result != SQLITE_OK)
            return result == SQLITE_ERROR ? SQLITE_NOTADB : result;
    }
    return SQLITE_OK;
}

// A new database in the place of the damaged one, with what is left of it.
int Database::_replace()
{
    const std::string aside = _setAside();
    const int result = _openOnce();
    if (result == SQLITE_OK)
        _restore(aside);
    return result;
}

std::string Database::_setAside()
{
    _close();
    std::string aside = _path + ".damaged-" + std::to_string(std::time(nullptr));
    for (const char* suffix : {"", "-wal", "-shm"})
        std::rename((_path + suffix).c_str(), (aside + suffix).c_str());
    _replaced = true;
    __dlog_print(LOG_ID_MAIN, DLOG_ERROR, "MEWLO", "the media database is damaged and was set aside");
    return aside;
}

void Database::_restore(const std::string& aside)
{
    Salvage salvage = salvageDatabase(aside);
    if (!salvage.isComplete)
        salvage.fillFrom(salvageDatabase(_copyPath()));
    __dlog_print(LOG_ID_MAIN, DLOG_WARN, "MEWLO", "salvaged %zu rows and %zu bookmarks", salvage.rows.size(),
        salvage.bookmarks.size());
    sqlite3_exec(_db, "BEGIN IMMEDIATE", nullptr, nullptr, nullptr);
    // One by one: a row that does not fit keeps no other out.
    for (MediaRow& row : salvage.rows) {
        if (const std::string id = row.id; _putRow(row) == SQLITE_OK && id != row.id)
            row.id = id;
    }
    for (const auto& [id, bookmark] : salvage.bookmarks)
        _insertBookmark(id, bookmark.markedTime, bookmark.name);
    sqlite3_exec(_db, "COMMIT", nullptr, nullptr, nullptr);
}

// Also that indices agree with their tables: where they do not, rows are hidden and no call fails.
int Database::_verify()
{
    Statement check(_db, "PRAGMA integrity_check(1)");
    if (check.step() && check.text(0) == "ok")
        return SQLITE_OK;
    return check.code() == SQLITE_OK ? SQLITE_CORRUPT : check.code();
}

void Database::keepCopy()
{
    const platform::Lock lock(_mutex);
    struct stat status { };
    const bool hasCopy = ::stat(_copyPath().c_str(), &status) == 0;
    if (_db == nullptr || (_isVerified && !_isChanged && hasCopy))
        return;
    const int verdict = _verify();
    if (isDamage(verdict))
        _replace();
    _isVerified = verdict == SQLITE_OK;
    if (!_isVerified || (!_isChanged && hasCopy))
        return;
    const std::string fresh = _copyPath() + ".new";
    ::unlink(fresh.c_str());
    if (Statement(_db, "VACUUM INTO ?").bind(fresh).run() != SQLITE_OK)
        return;
    if (::chmod(fresh.c_str(), 0600) == 0 && std::rename(fresh.c_str(), _copyPath().c_str()) == 0)
        _isChanged = false;
}

bool Database::takeReplaced() { return _replaced.exchange(false); }

// Runs the work under the lock; a database found damaged is replaced and the work tried once more.
int Database::_guarded(const Work& work)
{
    const platform::Lock lock(_mutex);
    if (const int opened = _openIfClosed(); opened != SQLITE_OK)
        return opened;
    int result = work();
    if (isDamage(result)) {
        result = _replace();
        if (result == SQLITE_OK)
            result = work();
    }
    return result;
}

// What finds damage is done again where damage is repaired.
int Database::_reading(const Reading& work)
{
    const std::optional<int> result = _readers.read(work);
    if (result && !isDamage(*result))
        return *result;
    return _guarded([&]() REQUIRES(_mutex) { return work(_db); }); // which opens it, or mends it
}

int Database::_transaction(const Work& work)
{
    return _guarded([&]() REQUIRES(_mutex) {
        int result = sqlite3_exec(_db, "BEGIN IMMEDIATE", nullptr, nullptr, nullptr);
        if (result != SQLITE_OK)
            return result;
        result = work();
        const int end = sqlite3_exec(_db, result == SQLITE_OK ? "COMMIT" : "ROLLBACK", nullptr, nullptr, nullptr);
        if (result == SQLITE_OK && end != SQLITE_OK)
            sqlite3_exec(_db, "ROLLBACK", nullptr, nullptr, nullptr);
        _isChanged = _isChanged || (result == SQLITE_OK && end == SQLITE_OK);
        return result != SQLITE_OK ? result : end;
    });
}

int Database::select(const Query& query, std::vector<MediaRow>& rows)
{
    return _reading([&](sqlite3* db) {
        rows.clear();
        Statement statement(db, std::string("SELECT ") + MEDIA_COLUMNS + " FROM media WHERE 1" + tailOf(query));
        while (statement.step())
            rows.push_back(statement.mediaRow());
        return statement.code();
    });
}

int Database::find(const std::string& mediaId, std::optional<MediaRow>& row)
{
    return _reading([&](sqlite3* db) {
        row.reset();
        Statement statement(db, std::string("SELECT ") + MEDIA_COLUMNS + " FROM media WHERE MEDIA_ID = ?");
        if (statement.bind(mediaId).step())
            row = statement.mediaRow();
        return statement.code();
    });
}

int Database::_putRow(MediaRow& row)
{
    {
        Statement known(_db, "SELECT MEDIA_ID, MEDIA_ADDED_TIME FROM media WHERE MEDIA_PATH = ? COLLATE BINARY");
        known.bind(row.path);
        if (known.step()) {
            row.id = known.text(0);
            row.addedTime = known.number(1);
        }
        if (known.code() != SQLITE_OK)
            return known.code();
    }
    Statement insert(_db,
        std::string("INSERT INTO media(") + MEDIA_COLUMNS
            + ") VALUES(?,?,?,?,?,?,?,?,?,?,?) ON CONFLICT(MEDIA_ID) DO UPDATE SET "
              "MEDIA_DISPLAY_NAME=excluded.MEDIA_DISPLAY_NAME, "
              "MEDIA_MIME_TYPE=excluded.MEDIA_MIME_TYPE, MEDIA_MODE=excluded.MEDIA_MODE, "
              "MEDIA_STORAGE=excluded.MEDIA_STORAGE, "
              "MEDIA_SIZE=excluded.MEDIA_SIZE, MEDIA_MODIFIED_TIME=excluded.MEDIA_MODIFIED_TIME, "
              "MEDIA_TIMELINE=excluded.MEDIA_TIMELINE, MEDIA_DURATION=excluded.MEDIA_DURATION");
    insert.bind(row.id).bind(row.path).bind(row.displayName).bind(row.mimeType).bind(row.mode).bind(row.storage);
    insert.bind(row.size).bind(row.addedTime).bind(row.modifiedTime).bind(row.timeline).bind(row.duration);
    const int result = insert.run();
    // No row has this path, and yet its index refuses it: they do not agree.
    return (result & 0xff) == SQLITE_CONSTRAINT ? SQLITE_CORRUPT : result;
}

int Database::put(MediaRow& row)
{
    return _transaction([&]() REQUIRES(_mutex) { return _putRow(row); });
}

int Database::_removePath(const std::string& path)
{
    Statement statement(_db, "DELETE FROM media WHERE MEDIA_PATH = ? COLLATE BINARY");
    return statement.bind(path).run();
}

// By way of a place that no file has, for two rows may swap theirs.
int Database::_moveRows(const FileChanges& changes)
{
    int result = SQLITE_OK;
    for (auto row = changes.overwritten.begin(); result == SQLITE_OK && row != changes.overwritten.end(); ++row) {
        Statement statement(_db, "DELETE FROM media WHERE MEDIA_ID = ? AND MEDIA_PATH = ? COLLATE BINARY");
        result = statement.bind(row->id).bind(row->path).run();
    }
    for (auto move = changes.moved.begin(); result == SQLITE_OK && move != changes.moved.end(); ++move) {
        Statement statement(
            _db, "UPDATE media SET MEDIA_PATH = '?' || MEDIA_ID WHERE MEDIA_ID = ? AND MEDIA_PATH = ? COLLATE BINARY");
        result = statement.bind(move->second.id).bind(move->first).run();
    }
    for (auto move = changes.moved.begin(); result == SQLITE_OK && move != changes.moved.end(); ++move) {
        const MediaRow& row = move->second;
        Statement statement(_db,
            "UPDATE OR IGNORE media SET MEDIA_PATH = ?, MEDIA_DISPLAY_NAME = ?, MEDIA_MODE = ?, MEDIA_STORAGE = ? "
            "WHERE MEDIA_PATH = ? COLLATE BINARY");
        result
            = statement.bind(row.path).bind(row.displayName).bind(row.mode).bind(row.storage).bind("?" + row.id).run();
        // Somebody has entered the new path already.
        if (result == SQLITE_OK)
            result = _removePath("?" + row.id);
    }
    return result;
}

int Database::apply(const FileChanges& changes)
{
    return _transaction([&]() REQUIRES(_mutex) {
        int result = _moveRows(changes);
        for (auto put = changes.put.begin(); result == SQLITE_OK && put != changes.put.end(); ++put) {
            MediaRow row = *put;
            result = _putRow(row);
        }
        for (auto gone = changes.removed.begin(); result == SQLITE_OK && gone != changes.removed.end(); ++gone)
            result = _removePath(*gone);
        return result;
    });
}

int Database::removeByPath(const std::string& path)
{
    return _transaction([&]() REQUIRES(_mutex) { return _removePath(path); });
}

int Database::removeByIds(const std::vector<std::string>& mediaIds)
{
    return _transaction([&]() REQUIRES(_mutex) {
        int result = SQLITE_OK;
        for (auto id = mediaIds.begin(); result == SQLITE_OK && id != mediaIds.end(); ++id)
            result = Statement(_db, "DELETE FROM media WHERE MEDIA_ID = ?").bind(*id).run();
        return result;
    });
}

int Database::rename(const std::string& mediaId, const MediaRow& row)
{
    return _transaction([&]() REQUIRES(_mutex) {
        Statement replaced(_db, "DELETE FROM media WHERE MEDIA_PATH = ? COLLATE BINARY AND MEDIA_ID <> ?");
        if (const int result = replaced.bind(row.path).bind(mediaId).run(); result != SQLITE_OK)
            return result;
        Statement statement(_db,
            "UPDATE media SET MEDIA_PATH = ?, MEDIA_DISPLAY_NAME = ?, MEDIA_MODE = ?, MEDIA_STORAGE = ? "
            "WHERE MEDIA_ID = ?");
        return statement.bind(row.path).bind(row.displayName).bind(row.mode).bind(row.storage).bind(mediaId).run();
    });
}

int Database::replace(const std::string& formerId, const MediaRow& row, const std::vector<BookmarkRow>& bookmarks)
{
    return _transaction([&]() REQUIRES(_mutex) {
        int result = Statement(_db, "DELETE FROM media WHERE MEDIA_ID = ?").bind(formerId).run();
        if (result == SQLITE_OK)
            result = _removePath(row.path);
        MediaRow inserted = row;
        if (result == SQLITE_OK)
            result = _putRow(inserted);
        for (auto mark = bookmarks.begin(); result == SQLITE_OK && mark != bookmarks.end(); ++mark)
            result = _insertBookmark(inserted.id, mark->markedTime, mark->name);
        return result;
    });
}

int Database::_insertBookmark(const std::string& mediaId, unsigned int markedTime, const std::string& name)
{
    Statement statement(_db, "INSERT INTO bookmark(MEDIA_ID, BOOKMARK_MARKED_TIME, BOOKMARK_NAME) VALUES(?,?,?)");
    return statement.bind(mediaId).bind(static_cast<long long>(markedTime)).bind(name).run();
}

int Database::insertBookmark(const std::string& mediaId, unsigned int markedTime, const std::string& name)
{
    return _transaction([&]() REQUIRES(_mutex) { return _insertBookmark(mediaId, markedTime, name); });
}

int Database::insertMissingBookmarks(const std::string& mediaId, const std::vector<BookmarkRow>& bookmarks)
{
    return _transaction([&]() REQUIRES(_mutex) {
        for (const BookmarkRow& mark : bookmarks) {
            Statement statement(_db,
                "INSERT INTO bookmark(MEDIA_ID, BOOKMARK_MARKED_TIME, BOOKMARK_NAME) SELECT ?1, ?2, ?3 WHERE NOT "
                "EXISTS "
                "(SELECT 1 FROM bookmark WHERE MEDIA_ID = ?1 AND BOOKMARK_MARKED_TIME = ?2)");
            const auto time = static_cast<long long>(mark.markedTime);
            if (const int result = statement.bind(mediaId).bind(time).bind(mark.name).run(); result != SQLITE_OK)
                return result;
        }
        return SQLITE_OK;
    });
}

int Database::removeBookmark(int bookmarkId)
{
    return _transaction([&]() REQUIRES(_mutex) {
        return Statement(_db, "DELETE FROM bookmark WHERE BOOKMARK_ID = ?")
            .bind(static_cast<long long>(bookmarkId))
            .run();
    });
}

int Database::selectBookmarks(const std::string& mediaId, const Query& query, std::vector<BookmarkRow>& rows)
{
    return _reading([&](sqlite3* db) {
        rows.clear();
        Query ordered = query;
        if (ordered.order.empty())
            ordered.order = "BOOKMARK_MARKED_TIME";
        Statement statement(db,
            "SELECT BOOKMARK_ID, BOOKMARK_MARKED_TIME, BOOKMARK_NAME FROM bookmark WHERE MEDIA_ID = ?"
                + tailOf(ordered));
        statement.bind(mediaId);
        while (statement.step())
            rows.push_back({static_cast<int>(statement.number(0)), static_cast<unsigned int>(statement.number(1)),
                statement.text(2)});
        return statement.code();
    });
}

int Database::selectWaveform(const Waveform& key, std::string& samples)
{
    return _reading([&](sqlite3* db) {
        samples.clear();
        Statement statement(db,
            "SELECT WAVEFORM_SAMPLES FROM waveform WHERE WAVEFORM_PATH = ? AND WAVEFORM_SIZE = ? AND WAVEFORM_TIME = "
            "?");
        if (statement.bind(key.path).bind(key.size).bind(key.time).step())
            samples = statement.bytes(0);
        return statement.code();
    });
}

int Database::putWaveform(const Waveform& key, const std::string& samples)
{
    return _transaction([&]() REQUIRES(_mutex) {
        Statement statement(_db,
            "INSERT OR REPLACE INTO waveform(WAVEFORM_PATH, WAVEFORM_SIZE, WAVEFORM_TIME, WAVEFORM_SAMPLES) "
            "SELECT ?1, ?2, ?3, ?4 WHERE EXISTS (SELECT 1 FROM media WHERE MEDIA_PATH = ?1 COLLATE BINARY)");
        return statement.bind(key.path).bind(key.size).bind(key.time).bindBytes(samples).run();
    });
}

}
