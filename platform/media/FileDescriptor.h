#pragma once

#include <unistd.h>

#include <cerrno>
#include <cstddef>
#include <utility>

namespace media {

// Owns one open file.
class FileDescriptor {
public:
    FileDescriptor() = default;
    explicit FileDescriptor(int fd)
        : _fd(fd)
    {
    }
    FileDescriptor(FileDescriptor&& other) noexcept
        : _fd(other.release())
    {
    }
    FileDescriptor& operator=(FileDescriptor&& other) noexcept
    {
        std::swap(_fd, other._fd);
        return *this;
    }
    ~FileDescriptor() { close(); }

    explicit operator bool() const { return _fd >= 0; }
    [[nodiscard]] int get() const { return _fd; }
    [[nodiscard]] int release() { return std::exchange(_fd, -1); }
    void close()
    {
        if (_fd >= 0)
            ::close(release());
    }

private:
    int _fd = -1;
};

// Writes all of it at the offset; answers 0 or the system's error number.
inline int writeAt(int fd, const void* data, size_t size, off_t offset)
{
    const auto* bytes = static_cast<const char*>(data);
    while (size > 0) {
        const ssize_t count = pwrite(fd, bytes, size, offset);
        if (count < 0 && errno == EINTR)
            continue;
        if (count <= 0)
            return count < 0 ? errno : ENOSPC;
        bytes += count;
        offset += count;
        size -= static_cast<size_t>(count);
    }
    return 0;
}

// Answers whether all of it could be read.
inline bool readAt(int fd, void* data, size_t size, off_t offset)
{
    auto* bytes = static_cast<char*>(data);
    while (size > 0) {
        const ssize_t count = pread(fd, bytes, size, offset);
        if (count < 0 && errno == EINTR)
            continue;
        if (count <= 0)
            return false;
        bytes += count;
        offset += count;
        size -= static_cast<size_t>(count);
    }
    return true;
}

}
