#include "media/DatabaseReaders.h"

#include <utility>

namespace media {

void DatabaseReaders::allow()
{
    const platform::Lock lock(_mutex);
    _isAllowed = true;
}

void DatabaseReaders::close()
{
    platform::Lock lock(_mutex);
    _isAllowed = false;
    while (_lent > 0)
        _returned.wait(lock);
    for (sqlite3* connection : std::exchange(_idle, {}))
        sqlite3_close_v2(connection);
}

std::optional<int> DatabaseReaders::read(const Reading& reading)
{
    sqlite3* connection = nullptr;
    {
        const platform::Lock lock(_mutex);
        if (!_isAllowed)
            return std::nullopt;
        ++_lent;
        if (!_idle.empty()) {
            connection = _idle.back();
            _idle.pop_back();
        }
    }
    int result = connection == nullptr ? _connect(connection) : SQLITE_OK;
    if (result == SQLITE_OK)
        result = reading(connection);
    _giveBack(connection);
    return result;
}

// Null when it fails.
int DatabaseReaders::_connect(sqlite3*& connection) const
{
    const int result
        = sqlite3_open_v2(_path.c_str(), &connection, SQLITE_OPEN_READWRITE | SQLITE_OPEN_FULLMUTEX, nullptr);
    sqlite3_busy_timeout(connection, BUSY_TIMEOUT_MS);
    if (result != SQLITE_OK)
        sqlite3_close_v2(std::exchange(connection, nullptr));
    return result;
}

void DatabaseReaders::_giveBack(sqlite3* connection)
{
    const platform::Lock lock(_mutex);
    if (connection != nullptr)
        _idle.push_back(connection);
    --_lent;
    _returned.notify_all();
}

}
