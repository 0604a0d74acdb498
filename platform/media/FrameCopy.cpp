#include "media/FrameCopy.h"

#include "media/FileDescriptor.h"

#include <algorithm>
#include <cerrno>
#include <vector>

namespace media {

namespace {

    constexpr uint64_t SLICE = uint64_t{1} << 20;

    bool cannotCopyInKernel(int error)
    {
        return error == EXDEV || error == EINVAL || error == ENOSYS || error == EOPNOTSUPP || error == EPERM;
    }

}

FrameCopy::FrameCopy(int from, int to, uint64_t total, ExportWatch& watch)
    : _from(from)
    , _to(to)
    , _total(total)
    , _watch(watch)
{
}

int FrameCopy::write(std::string_view bytes)
{
    const int error = writeAt(_to, bytes.data(), bytes.size(), static_cast<off_t>(_position));
    _position += bytes.size();
    return error;
}

int FrameCopy::copy(const ByteRange& range)
{
    for (uint64_t done = 0; done < range.size;) {
        if (_watch.cancelled)
            return ECANCELED;
        const auto size = static_cast<size_t>(std::min(SLICE, range.size - done));
        if (const int error = _copySlice(range.offset + done, size); error != 0)
            return error;
        done += size;
        _copied += size;
        _watch.percent = static_cast<int>(_total > 0 ? _copied * 100 / _total : 100);
    }
    return 0;
}

int FrameCopy::_copySlice(uint64_t offset, size_t size)
{
    while (_kernelCopies && size > 0) {
        auto from = static_cast<off_t>(offset);
        auto to = static_cast<off_t>(_position);
        const ssize_t count = copy_file_range(_from, &from, _to, &to, size, 0);
        if (count < 0 && errno == EINTR)
            continue;
        if (count < 0 && !cannotCopyInKernel(errno))
            return errno;
        if (count <= 0) {
            _kernelCopies = false;
            break;
        }
        offset += static_cast<uint64_t>(count);
        _position += static_cast<uint64_t>(count);
        size -= static_cast<size_t>(count);
    }
    return size > 0 ? _copyThroughBuffer(offset, size) : 0;
}

int FrameCopy::_copyThroughBuffer(uint64_t offset, size_t size)
{
    std::vector<char> buffer(size);
    if (!readAt(_from, buffer.data(), size, static_cast<off_t>(offset)))
        return EIO;
    return write({buffer.data(), size});
}

}
