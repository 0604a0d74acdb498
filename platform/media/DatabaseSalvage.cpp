#include "media/DatabaseSalvage.h"

#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <map>
#include <memory>
#include <set>

namespace media {

namespace {

    constexpr long long MOST_PROBES = 200000; // of numbers in a gap
    constexpr int LONGEST_VALUE = 1 << 20; // bytes; no name is longer

    using Handle = std::unique_ptr<sqlite3, int (*)(sqlite3*)>;

    Handle openForReading(const std::string& path)
    {
        struct stat status { };
        sqlite3* database = nullptr;
        if (::stat(path.c_str(), &status) == 0 && S_ISREG(status.st_mode)
            && sqlite3_open_v2(path.c_str(), &database, SQLITE_OPEN_READWRITE, nullptr) == SQLITE_OK) {
            sqlite3_limit(database, SQLITE_LIMIT_LENGTH, LONGEST_VALUE);
            sqlite3_exec(database, "PRAGMA cell_size_check=ON; PRAGMA trusted_schema=OFF", nullptr, nullptr, nullptr);
        }
        return {database, sqlite3_close};
    }

    std::string textOf(sqlite3_stmt* statement, int column)
    {
        const auto* text = reinterpret_cast<const char*>(sqlite3_column_text(statement, column));
        return text != nullptr ? text : "";
    }

    // Calls back with every row that can be reached; false when something in between could not.
    template <typename Visitor>
    bool visit(sqlite3* database, const std::string& sql, const Visitor& visitor)
    {
        sqlite3_stmt* statement = nullptr;
        int code = sqlite3_prepare_v2(database, sql.c_str(), -1, &statement, nullptr);
        while (code == SQLITE_OK || code == SQLITE_ROW) {
            code = sqlite3_step(statement);
            if (code == SQLITE_ROW)
                visitor(statement);
        }
        sqlite3_finalize(statement);
        return code == SQLITE_DONE;
    }

    bool isSound(sqlite3* database)
    {
        std::string verdict;
        return visit(database, "PRAGMA integrity_check(1)", [&](sqlite3_stmt* s) { verdict = textOf(s, 0); })
            && verdict == "ok";
    }

    std::set<std::string> columnsOf(sqlite3* database, const std::string& table)
    {
        std::set<std::string> columns;
        visit(database, "PRAGMA table_info(" + table + ")",
            [&](sqlite3_stmt* statement) { columns.insert(textOf(statement, 1)); });
        return columns;
    }

    struct Column {
        const char* name;
        const char* absent;
    };

    // The columns by name, or what stands for those that the table does not have.
    template <size_t Count>
    std::string selection(const std::set<std::string>& known, const Column (&columns)[Count])
    {
        std::string sql;
        for (const Column& column : columns)
            sql += (sql.empty() ? "" : ", ") + std::string(known.contains(column.name) ? column.name : column.absent);
        return "SELECT " + sql;
    }

    constexpr Column MEDIA[] = {
        {.name = "MEDIA_ID", .absent = "''"},
        {.name = "MEDIA_PATH", .absent = "''"},
        {.name = "MEDIA_DISPLAY_NAME", .absent = "''"},
        {.name = "MEDIA_MIME_TYPE", .absent = "''"},
        {.name = "MEDIA_MODE", .absent = "0"},
        {.name = "MEDIA_STORAGE", .absent = "0"},
        {.name = "MEDIA_SIZE", .absent = "0"},
        {.name = "MEDIA_ADDED_TIME", .absent = "0"},
        {.name = "MEDIA_MODIFIED_TIME", .absent = "0"},
        {.name = "MEDIA_TIMELINE", .absent = "0"},
        {.name = "MEDIA_DURATION", .absent = "-1"},
    };
    constexpr Column BOOKMARK[] = {
        {.name = "BOOKMARK_ID", .absent = "0"},
        {.name = "MEDIA_ID", .absent = "''"},
        {.name = "BOOKMARK_MARKED_TIME", .absent = "0"},
        {.name = "BOOKMARK_NAME", .absent = "''"},
    };

    class Reader {
    public:
        explicit Reader(const std::string& path)
            : _database(openForReading(path))
        {
        }

        Salvage run()
        {
            if (!_database)
                return {{}, {}, false};
            _readMedia();
            _readBookmarks();
            // Rows can be missing or wrong without any read that fails.
            if (!isSound(_database.get()))
                _salvage.isComplete = false;
            for (auto& [id, row] : _rows)
                _salvage.rows.push_back(std::move(row));
            for (auto& [id, bookmark] : _bookmarks)
                _salvage.bookmarks.push_back(std::move(bookmark));
            return std::move(_salvage);
        }

    private:
        // From both ends, in each order that an index offers: a damaged page hides what lies behind it.
        template <typename Visitor>
        void _readBothWays(const std::string& select, std::initializer_list<const char*> orders, const Visitor& visitor)
        {
            for (const char* order : orders) {
                if (visit(_database.get(), select + " ORDER BY " + order, visitor))
                    return;
                _salvage.isComplete = false;
                visit(_database.get(), select + " ORDER BY " + order + " DESC", visitor);
            }
        }

        void _readMedia()
        {
            const auto known = columnsOf(_database.get(), "media");
            if (!known.contains("MEDIA_ID") || !known.contains("MEDIA_PATH")) {
                _salvage.isComplete = false;
                return;
            }
            const auto take = [&](sqlite3_stmt* s) {
                MediaRow row{textOf(s, 0), textOf(s, 1), textOf(s, 2), textOf(s, 3), sqlite3_column_int(s, 4),
                    sqlite3_column_int(s, 5), sqlite3_column_int64(s, 6), sqlite3_column_int64(s, 7),
                    sqlite3_column_int64(s, 8), sqlite3_column_int64(s, 9), sqlite3_column_int(s, 10)};
                // A path that a bit was flipped in is no path.
                if (!row.id.empty() && row.path.starts_with('/') && row.path.find('\n') == std::string::npos)
                    _rows.emplace(row.id, std::move(row));
            };
            const std::string select = selection(known, MEDIA) + " FROM media";
            _readBothWays(select, {"MEDIA_ID", "MEDIA_TIMELINE", "MEDIA_PATH"}, take);
        }

        void _readBookmarks()
        {
            const auto known = columnsOf(_database.get(), "bookmark");
            if (!known.contains("MEDIA_ID") || !known.contains("BOOKMARK_MARKED_TIME")) {
                _salvage.isComplete = false;
                return;
            }
            const auto take = [&](sqlite3_stmt* s) {
                const int id = sqlite3_column_int(s, 0);
                const long long time = sqlite3_column_int64(s, 2);
                if (time >= 0 && time <= INT32_MAX)
                    _bookmarks.insert_or_assign(
                        id, std::pair(textOf(s, 1), BookmarkRow{0, static_cast<unsigned int>(time), textOf(s, 3)}));
            };
            const std::string select = selection(known, BOOKMARK) + " FROM bookmark";
            if (visit(_database.get(), select + " ORDER BY BOOKMARK_ID", take))
                return;
            _salvage.isComplete = false;
            const int last = _bookmarks.empty() ? 0 : _bookmarks.rbegin()->first;
            visit(_database.get(), select + " ORDER BY BOOKMARK_ID DESC", take);
            visit(_database.get(), select + " ORDER BY MEDIA_ID", take);
            visit(_database.get(), select + " ORDER BY MEDIA_ID DESC", take);
            _probeBookmarks(select, last, take);
        }

        // Between the two ends: each number leads to its page by another way.
        template <typename Visitor>
        void _probeBookmarks(const std::string& select, long long first, const Visitor& take)
        {
            sqlite3_stmt* statement = nullptr;
            const std::string sql = select + " WHERE BOOKMARK_ID = ?";
            const long long end = _bookmarks.empty() ? MOST_PROBES : _bookmarks.rbegin()->first;
            if (sqlite3_prepare_v2(_database.get(), sql.c_str(), -1, &statement, nullptr) != SQLITE_OK)
                return;
            for (long long id = first + 1; id < std::min(end, first + MOST_PROBES); ++id) {
                sqlite3_bind_int64(statement, 1, id);
                if (sqlite3_step(statement) == SQLITE_ROW)
                    take(statement);
                sqlite3_reset(statement);
            }
            sqlite3_finalize(statement);
        }

        Handle _database;
        Salvage _salvage;
        std::map<std::string, MediaRow> _rows;
        std::map<int, std::pair<std::string, BookmarkRow>> _bookmarks;
    };

}

// A row that this one has under another identifier, or at another path, is a new one or a renamed one - or a damaged
// one: its marks still name it as it was, its file is still where it was.
void Salvage::fillFrom(const Salvage& other)
{
    std::map<std::string, MediaRow*> byId;
    std::map<std::string, MediaRow*> byPath;
    for (MediaRow& row : rows) {
        byId.emplace(row.id, &row);
        byPath.emplace(row.path, &row);
    }
    std::set<std::string> marked;
    std::set<std::pair<std::string, unsigned int>> marks;
    for (const auto& [id, bookmark] : bookmarks) {
        marked.insert(id);
        marks.emplace(id, bookmark.markedTime);
    }
    std::vector<MediaRow> missing;
    for (const MediaRow& row : other.rows) {
        const auto sameId = byId.find(row.id);
        const auto samePath = byPath.find(row.path);
        if (sameId == byId.end() && samePath == byPath.end())
            missing.push_back(row);
        else if (sameId == byId.end() && marked.contains(row.id) && !marked.contains(samePath->second->id))
            samePath->second->id = row.id;
        else if (samePath == byPath.end() && ::access(sameId->second->path.c_str(), F_OK) != 0
            && ::access(row.path.c_str(), F_OK) == 0)
            *sameId->second = row;
    }
    rows.insert(rows.end(), missing.begin(), missing.end());
    for (const auto& each : other.bookmarks) {
        if (marks.emplace(each.first, each.second.markedTime).second)
            bookmarks.push_back(each);
    }
}

Salvage salvageDatabase(const std::string& path) { return Reader(path).run(); }

}
