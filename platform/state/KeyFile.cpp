#include "state/KeyFile.h"

#include "state/Log.h"

#include <atomic>
#include <cerrno>
#include <chrono>
#include <cstring>
#include <filesystem>

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

namespace platform {

namespace {

    constexpr size_t LONGEST_VALUE = 64 * 1024;
    constexpr auto TEMPORARY_PREFIX = ".tmp-";

    std::string temporaryBeside(const std::string& path)
    {
        static std::atomic<unsigned> counter{0};
        const size_t slash = path.rfind('/');
        return path.substr(0, slash + 1) + TEMPORARY_PREFIX + std::to_string(::getpid()) + "-"
            + std::to_string(counter++) + "-" + path.substr(slash + 1);
    }

    bool writeAll(int file, const std::string& value)
    {
        for (size_t done = 0; done < value.size();) {
            const ssize_t written = ::write(file, value.data() + done, value.size() - done);
            if (written < 0 && errno == EINTR)
                continue;
            if (written <= 0)
                return false;
            done += static_cast<size_t>(written);
        }
        return true;
    }

    void syncDirectoryOf(const std::string& path)
    {
        const int directory = ::open(path.substr(0, path.rfind('/')).c_str(), O_RDONLY | O_DIRECTORY | O_CLOEXEC);
        if (directory < 0)
            return;
        ::fsync(directory);
        ::close(directory);
    }

    bool writeFile(const std::string& path, const std::string& value, bool durable)
    {
        const int file = ::open(path.c_str(), O_WRONLY | O_CREAT | O_TRUNC | O_CLOEXEC | O_NOFOLLOW, 0600);
        if (file < 0)
            return false;
        const bool written = writeAll(file, value) && (!durable || ::fsync(file) == 0);
        return ::close(file) == 0 && written;
    }

}

std::optional<std::string> readKeyFile(const std::string& path)
{
    const int file = ::open(path.c_str(), O_RDONLY | O_CLOEXEC | O_NONBLOCK);
    if (file < 0)
        return std::nullopt;
    std::string value;
    char buffer[4096];
    ssize_t length = 0;
    while (value.size() < LONGEST_VALUE && (length = ::read(file, buffer, sizeof(buffer))) > 0)
        value.append(buffer, static_cast<size_t>(length));
    ::close(file);
    if (length < 0)
        return std::nullopt;
    if (!value.empty() && value.back() == '\n')
        value.pop_back();
    return value;
}

bool replaceKeyFile(const std::string& path, const std::string& value, bool durable)
{
    const std::string temporary = temporaryBeside(path);
    if (value.size() > LONGEST_VALUE || !writeFile(temporary, value, durable)
        || ::rename(temporary.c_str(), path.c_str()) != 0) {
        PLATFORM_LOGE("%s cannot be written: %s", path.c_str(), std::strerror(errno));
        ::unlink(temporary.c_str());
        return false;
    }
    if (durable)
        syncDirectoryOf(path);
    return true;
}

void removeStaleTemporaries(const std::string& root)
{
    namespace fs = std::filesystem;
    const auto limit = fs::file_time_type::clock::now() - std::chrono::minutes(1);
    std::error_code error;
    auto entry = fs::recursive_directory_iterator(root, fs::directory_options::skip_permission_denied, error);
    for (; !error && entry != fs::recursive_directory_iterator(); entry.increment(error)) {
        std::error_code ignored;
        if (entry->path().filename().string().starts_with(TEMPORARY_PREFIX) && entry->last_write_time(ignored) < limit
            && !ignored)
            fs::remove(entry->path(), ignored);
    }
}

}
