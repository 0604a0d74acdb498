#include "MwFileCopy.h"

#include <array>
#include <cerrno>
#include <fcntl.h>
#include <linux/fs.h>
#include <linux/magic.h>
#include <memory>
#include <new>
#include <sys/ioctl.h>
#include <sys/sendfile.h>
#include <sys/stat.h>
#include <sys/vfs.h>
#include <unistd.h>
#include <utility>

#include "MwFilePlaces.h"
#include "MwLog.h"

namespace {

constexpr size_t CHUNK = MwFilePlaces::CHUNK;

// What a kernel or a file system answers that does not offer the call for these two files.
bool isUnsupported(int error)
{
    return error == EXDEV || error == EINVAL || error == ENOSYS || error == EOPNOTSUPP || error == EBADF
        || error == EPERM || error == ETXTBSY;
}

}

MwFileCopy::MwFileCopy(int from, int to, unsigned int chunksPerReport, Report report)
    : _from(from)
    , _to(to)
    , _chunksPerReport(chunksPerReport)
    , _report(std::move(report))
{
    if (::fstat(_from, &_source) != 0)
        MW_LOGE("fstat failed : [%d]!!!", errno);
}

bool MwFileCopy::run(const std::atomic<bool>& cancelled)
{
    if (_shareBlocks())
        return true;
    if (!_reserve())
        return false;
    constexpr std::array<Step (MwFileCopy::*)(), 3> WAYS
        = {&MwFileCopy::_copyInKernel, &MwFileCopy::_sendInKernel, &MwFileCopy::_copyThroughBuffer};
    for (const auto way : WAYS) {
        Step step = Step::MORE;
        while (step == Step::MORE && !cancelled)
            step = (this->*way)();
        if (cancelled || step == Step::FAILED)
            return false;
        if (step == Step::UNABLE)
            continue;
        if (_pending > 0)
            _report(std::exchange(_pending, 0));
        return true;
    }
    return false;
}

// Some file systems let two files share their blocks until one is changed.
bool MwFileCopy::_shareBlocks()
{
    if (::ioctl(_to, FICLONE, _from) != 0)
        return false;
    _report(static_cast<uint64_t>(_source.st_size));
    return true;
}

// A full disk shows before anything is copied, and blocks that lie together are written twice as fast.
bool MwFileCopy::_reserve() const
{
    // In memory the reserved room would be filled with zeros first, which takes half as long as the copy.
    struct statfs system { };
    if (_source.st_size == 0 || (::fstatfs(_to, &system) == 0 && system.f_type == TMPFS_MAGIC))
        return true;
    if (::fallocate(_to, 0, 0, _source.st_size) == 0 || isUnsupported(errno))
        return true;
    MW_LOGE("no room for the copy : %d", errno);
    return false;
}

MwFileCopy::Step MwFileCopy::_copyInKernel()
{
    off_t in = _done;
    off_t out = _done;
    const ssize_t bytes = ::copy_file_range(_from, &in, _to, &out, CHUNK * _chunksPerReport, 0);
    return _advanced(bytes);
}

MwFileCopy::Step MwFileCopy::_sendInKernel()
{
    off_t in = _done;
    if (::lseek(_to, _done, SEEK_SET) < 0)
        return Step::UNABLE;
    return _advanced(::sendfile(_to, _from, &in, CHUNK * _chunksPerReport));
}

// After one call of the kernel. Nothing copied means the end, or a file that the kernel cannot copy.
MwFileCopy::Step MwFileCopy::_advanced(ssize_t bytes)
{
    if (bytes < 0)
        return isUnsupported(errno) ? Step::UNABLE : Step::FAILED;
    if (bytes == 0)
        return _done > 0 && _done >= _source.st_size ? Step::DONE : Step::UNABLE;
    if (const int result = ::posix_fadvise(_to, _done, bytes, POSIX_FADV_DONTNEED); result != 0)
        MW_LOGE(" >>>>posix_fadvise ret=%d", result);
    _done += bytes;
    _report(static_cast<uint64_t>(bytes));
    return Step::MORE;
}

MwFileCopy::Step MwFileCopy::_copyThroughBuffer()
{
    const std::unique_ptr<char[]> buffer(new (std::nothrow) char[CHUNK]);
    if (!buffer) {
        MW_LOGE("fail to alloc buf, alloc_size : %lu", CHUNK);
        return Step::FAILED;
    }
    // As many chunks as make one report; the caller looks for a cancel in between.
    for (unsigned int chunk = 0; chunk < _chunksPerReport; ++chunk) {
        const ssize_t bytes = ::pread(_from, buffer.get(), CHUNK, _done);
        if (bytes <= 0)
            return bytes == 0 ? Step::DONE : Step::FAILED;
        if (!_writeAll(buffer.get(), static_cast<size_t>(bytes)))
            return Step::FAILED;
        if (const int result = ::posix_fadvise(_to, _done, bytes, POSIX_FADV_DONTNEED); result != 0)
            MW_LOGE(" >>>>posix_fadvise ret=%d", result);
        _done += bytes;
        _pending += static_cast<uint64_t>(bytes);
    }
    _report(std::exchange(_pending, 0));
    return Step::MORE;
}

bool MwFileCopy::_writeAll(const char* data, size_t size)
{
    for (size_t written = 0; written < size;) {
        const ssize_t bytes = ::pwrite(_to, data + written, size - written, _done + static_cast<off_t>(written));
        if (bytes <= 0) {
            MW_LOGE("fail to write:%d,%d", static_cast<int>(bytes), errno);
            return false;
        }
        written += static_cast<size_t>(bytes);
    }
    return true;
}

bool MwFileCopy::copyAttributes() const
{
    // Some file systems know no modes; the recording is worth more than its mode.
    if (::fchmod(_to, _source.st_mode & 07777) != 0)
        MW_LOGW("fchmod failed : [%d]", errno);
    const std::array<struct timespec, 2> times = {_source.st_atim, _source.st_mtim};
    return ::futimens(_to, times.data()) == 0;
}
