#pragma once

#include <media_content.h>
#include <sqlite3.h>

#include <cstdlib>
#include <string>
#include <vector>

namespace support {

// A recording as the database has it; the file itself is not needed for being listed.
struct DatabaseRow {
    std::string path;
    int duration = 0; // milliseconds
    long long time = 0; // seconds since the epoch; the newest is listed first
};

inline std::string databasePath()
{
    const char* chosen = std::getenv("MEWLO_MEDIA_DB");
    return chosen != nullptr ? chosen : std::string(std::getenv("XDG_DATA_HOME")) + "/mewlo-lite/media.db";
}

// Changes the database past the media interface.
inline bool execute(const std::string& sql)
{
    sqlite3* database = nullptr;
    const bool done = sqlite3_open(databasePath().c_str(), &database) == SQLITE_OK
        && sqlite3_busy_timeout(database, 2000) == SQLITE_OK
        && sqlite3_exec(database, sql.c_str(), nullptr, nullptr, nullptr) == SQLITE_OK;
    sqlite3_close(database);
    return done;
}

// Enters rows past the media interface, thousands in a moment. The identifiers are the paths.
inline bool enterRows(const std::vector<DatabaseRow>& rows)
{
    int count = 0;
    media_info_get_bookmark_count_from_db("none", nullptr, &count); // has the database opened and its tables made
    sqlite3* database = nullptr;
    sqlite3_stmt* insert = nullptr;
    if (sqlite3_open(databasePath().c_str(), &database) != SQLITE_OK)
        return false;
    sqlite3_busy_timeout(database, 2000);
    sqlite3_exec(database, "BEGIN", nullptr, nullptr, nullptr);
    const bool prepared
        = sqlite3_prepare_v2(database,
              "INSERT INTO media(MEDIA_ID, MEDIA_PATH, MEDIA_DISPLAY_NAME, MEDIA_MIME_TYPE, MEDIA_MODE, "
              "MEDIA_MODIFIED_TIME, MEDIA_TIMELINE, MEDIA_DURATION) VALUES(?,?,?,?,10,?,?,?)",
              -1, &insert, nullptr)
        == SQLITE_OK;
    for (const DatabaseRow& row : rows) {
        const std::string name = row.path.substr(row.path.rfind('/') + 1);
        const char* mime = name.ends_with(".amr") ? "audio/AMR" : "audio/mp4";
        int column = 0;
        for (const std::string& text : {row.path, row.path, name, std::string(mime)})
            sqlite3_bind_text(insert, ++column, text.c_str(), static_cast<int>(text.size()), SQLITE_TRANSIENT);
        for (const long long number : {row.time, row.time * 1000, static_cast<long long>(row.duration)})
            sqlite3_bind_int64(insert, ++column, number);
        sqlite3_step(insert);
        sqlite3_reset(insert);
    }
    sqlite3_finalize(insert);
    const bool done = sqlite3_exec(database, "COMMIT", nullptr, nullptr, nullptr) == SQLITE_OK;
    sqlite3_close(database);
    return prepared && done;
}

}
