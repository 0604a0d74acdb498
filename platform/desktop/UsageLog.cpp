#include "tovanic_log_manager.h"

#include "launch/Bundle.h"
#include "state/Directories.h"
#include "state/Log.h"

#include <Mutex.h>

#include <cerrno>
#include <cstring>
#include <ctime>
#include <string>

#include <fcntl.h>
#include <sys/file.h>
#include <sys/stat.h>
#include <unistd.h>

struct tovanic_log_manager_s {
    platform::Mutex mutex;
    int lastRequest GUARDED_BY(mutex) = 0;
};

namespace {

constexpr int NONE = 0;
constexpr int INVALID_PARAMETER = -22;
constexpr int IO_ERROR = -5;
constexpr off_t LARGEST = 1024 * 1024;

std::string quoted(const std::string& text)
{
    std::string json = "\"";
    for (const char c : text) {
        if (c == '"' || c == '\\') {
            json += '\\';
            json += c;
        } else if (static_cast<unsigned char>(c) < 0x20) {
            char escape[8];
            std::snprintf(escape, sizeof(escape), "\\u%04x", static_cast<unsigned>(c));
            json += escape;
        } else {
            json += c;
        }
    }
    return json + '"';
}

std::string lineOf(const bundle_s& record)
{
    const std::time_t now = std::time(nullptr);
    std::tm utc = {};
    char time[32];
    ::gmtime_r(&now, &utc);
    std::strftime(time, sizeof(time), "%FT%TZ", &utc);
    std::string line = "{\"time\":" + quoted(time);
    for (const auto& [key, values] : record.entries)
        line += "," + quoted(key) + ":" + quoted(record.text(key));
    return line + "}\n";
}

// The file may be turned away by another process between open and lock: then it is opened anew.
int openLocked(const std::string& path)
{
    for (int attempt = 0; attempt < 10; ++attempt) {
        const int file = ::open(path.c_str(), O_WRONLY | O_APPEND | O_CREAT | O_CLOEXEC, 0600);
        struct stat opened = {};
        struct stat named = {};
        if (file < 0)
            return -1;
        if (::flock(file, LOCK_EX) == 0 && ::fstat(file, &opened) == 0 && ::stat(path.c_str(), &named) == 0
            && opened.st_ino == named.st_ino) {
            if (opened.st_size < LARGEST)
                return file;
            ::rename(path.c_str(), (path + ".1").c_str());
        }
        ::close(file);
    }
    return -1;
}

bool append(const std::string& line)
{
    const std::string directory = platform::stateDirectory();
    const int file = platform::makeDirectories(directory, 0700) ? openLocked(directory + "/usage.jsonl") : -1;
    if (file < 0)
        return false;
    const bool written = ::write(file, line.data(), line.size()) == static_cast<ssize_t>(line.size());
    ::close(file);
    return written;
}

}

int tovanic_log_manager_create(tovanic_log_manager_h* manager)
{
    if (manager == nullptr)
        return INVALID_PARAMETER;
    *manager = new tovanic_log_manager_s;
    return NONE;
}

int tovanic_log_manager_insert(tovanic_log_manager_h manager, const char* uri, bundle* record,
    tovanic_log_manager_cb callback, void* user_data, int* request)
{
    if (manager == nullptr || uri == nullptr || record == nullptr || std::strcmp(uri, TOVANIC_LOG_MANAGER_URI) != 0)
        return INVALID_PARAMETER;
    int id = 0;
    {
        const platform::Lock lock(manager->mutex);
        id = ++manager->lastRequest;
    }
    const int result = append(lineOf(*record)) ? NONE : IO_ERROR;
    if (result != NONE)
        PLATFORM_LOGE("the usage log cannot be written: %s", std::strerror(errno));
    if (request != nullptr)
        *request = id;
    if (callback != nullptr)
        callback(id, result, user_data);
    return result;
}

int tovanic_log_manager_destroy(tovanic_log_manager_h manager)
{
    delete manager;
    return manager != nullptr ? NONE : INVALID_PARAMETER;
}
