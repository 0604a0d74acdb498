#pragma once

#include <Mutex.h>
#include <sqlite3.h>

#include <condition_variable>
#include <functional>
#include <optional>
#include <string>
#include <vector>

namespace media {

// The connections that only read a database in WAL mode: each reading has one to itself, so that nobody waits for
// another's thousands of rows. Any thread.
class DatabaseReaders {
public:
    static constexpr int BUSY_TIMEOUT_MS = 3000;

    explicit DatabaseReaders(std::string path)
        : _path(std::move(path))
    {
    }
    ~DatabaseReaders() { close(); }
    DatabaseReaders(const DatabaseReaders&) = delete;
    DatabaseReaders& operator=(const DatabaseReaders&) = delete;

    // From now on there is a sound file to read.
    void allow();
    // No connection is left when it returns: it waits for the readings that run, and there are none until they are
    // allowed again. Not from within a reading.
    void close();

    using Reading = std::function<int(sqlite3* db)>;
    // The reading's result, or SQLite's code when there is no connection to be had; nothing while closed.
    std::optional<int> read(const Reading& reading);

private:
    int _connect(sqlite3*& connection) const;
    void _giveBack(sqlite3* connection);

    const std::string _path;
    platform::Mutex _mutex;
    std::condition_variable_any _returned;
    bool _isAllowed GUARDED_BY(_mutex) = false;
    int _lent GUARDED_BY(_mutex) = 0;
    std::vector<sqlite3*> _idle GUARDED_BY(_mutex);
};

}
