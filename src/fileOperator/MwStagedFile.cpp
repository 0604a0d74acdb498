#include "MwStagedFile.h"

#include <cerrno>
#include <charconv>
#include <csignal>
#include <cstdio>
#include <fcntl.h>
#include <filesystem>
#include <sys/file.h>
#include <sys/stat.h>
#include <unistd.h>
#include <utility>

#include "MwFileCopy.h"
#include "MwFiles.h"
#include "MwLog.h"
#include "MwStorageRoots.h"
#include "MwText.h"

namespace {

constexpr std::string_view HIDDEN_PREFIX = ".mw_moving."; // process id and a number follow

std::string hiddenPath(const std::string& directory)
{
    static std::atomic<unsigned int> counter = 0;
    return mwFormat("%s/%s%d.%u", directory.c_str(), HIDDEN_PREFIX.data(), static_cast<int>(::getpid()), ++counter);
}

// Whose hidden file this is; 0 when it is none.
pid_t ownerOf(const std::string& name)
{
    pid_t process = 0;
    if (name.starts_with(HIDDEN_PREFIX))
        std::from_chars(name.data() + HIDDEN_PREFIX.size(), name.data() + name.size(), process);
    return process;
}

bool isDead(pid_t process) { return ::kill(process, 0) != 0 && errno == ESRCH; }

// A process that cannot be seen from here may still hold the lock of its copy.
bool isUnused(const std::string& path)
{
    const int file = ::open(path.c_str(), O_RDONLY | O_CLOEXEC);
    if (file < 0)
        return errno == EACCES;
    const bool unused = ::flock(file, LOCK_EX | LOCK_NB) == 0;
    ::close(file);
    return unused;
}

}

MwStagedFile::MwStagedFile(std::string source, std::string directory)
    : _source(std::move(source))
    , _directory(std::move(directory))
    , _path(hiddenPath(_directory))
{
}

MwStagedFile::~MwStagedFile() { _discard(); }

void MwStagedFile::_discard()
{
    if (_kind == Kind::LINK || _kind == Kind::COPY)
        ::unlink(_path.c_str()); // gone already when it was published
    if (_file >= 0)
        ::close(std::exchange(_file, -1));
    _kind = Kind::NONE;
}

// A second name for the same file: nothing to copy, and the first stays until the second is known everywhere.
bool MwStagedFile::_link()
{
    struct stat source { };
    struct stat directory { };
    if (::lstat(_source.c_str(), &source) != 0 || ::stat(_directory.c_str(), &directory) != 0
        || source.st_dev != directory.st_dev || !S_ISREG(source.st_mode))
        return false;
    // Without hard links (memory cards), renaming is the next best.
    const bool linked = ::link(_source.c_str(), _path.c_str()) == 0;
    if (!linked && errno != EPERM && errno != EOPNOTSUPP && errno != EMLINK && errno != ENOSYS)
        return false;
    _kind = linked ? Kind::LINK : Kind::SOURCE_ITSELF;
    return true;
}

bool MwStagedFile::stage(unsigned int chunksPerReport, const Report& report, const std::atomic<bool>& cancelled)
{
    if (_link()) {
        struct stat status { };
        report(::stat(_source.c_str(), &status) == 0 ? static_cast<uint64_t>(status.st_size) : 0);
        return true;
    }
    const int from = ::open(_source.c_str(), O_RDONLY | O_CLOEXEC);
    if (from < 0) {
        _error = errno;
        MW_LOGE("Fail to open src file : %d", errno);
        return false;
    }
    _file = ::open(_path.c_str(), O_RDWR | O_CREAT | O_EXCL | O_CLOEXEC, 0600);
    bool complete = false;
    if (_file < 0) {
        _error = errno;
        MW_LOGE("Fail to open dst file : %d", errno);
    } else {
        _kind = Kind::COPY;
        ::flock(_file, LOCK_EX | LOCK_NB);
        MwFileCopy copy(from, _file, chunksPerReport, report);
        complete = copy.run(cancelled) && copy.copyAttributes() && ::fsync(_file) == 0;
        if (!complete) {
            _error = errno;
            MW_LOGE("the copy is not complete : %d", errno);
        }
    }
    ::close(from);
    return complete && !cancelled;
}

// The two change places, so that the replaced file can go to the trash; a private one, and where they cannot, for good.
bool MwStagedFile::_replace(const std::string& from, const std::string& destination)
{
    if (::renameat2(AT_FDCWD, from.c_str(), AT_FDCWD, destination.c_str(), RENAME_EXCHANGE) == 0) {
        const bool isPrivate = destination.starts_with(mwPrivateRoot() + "/");
        if (isPrivate || storage_move_to_trash(from.c_str(), destination.c_str()) != 0)
            ::unlink(from.c_str());
        return true;
    }
    if (::rename(from.c_str(), destination.c_str()) == 0)
        return true;
    MW_LOGE("rename failed : [%d]!!!", errno);
    return false;
}

MwStagedFile::Outcome MwStagedFile::publish(const std::string& destination, bool replace)
{
    const std::string& from = _kind == Kind::SOURCE_ITSELF ? _source : _path;
    if (replace) {
        if (!_replace(from, destination))
            return Outcome::FAILED;
    } else if (const auto moved = MwFiles::moveWithoutOverwriting(from, destination); moved != MwFiles::Move::DONE) {
        return moved == MwFiles::Move::EXISTS ? Outcome::EXISTS : Outcome::FAILED;
    }
    MwFiles::flushDirectoryOf(destination);
    if (_kind == Kind::SOURCE_ITSELF)
        MwFiles::flushDirectoryOf(_source);
    return Outcome::DONE;
}

void MwStagedFile::sweep(const std::string& directory)
{
    std::error_code error;
    for (std::filesystem::directory_iterator entry(directory, error), end; !error && entry != end;
         entry.increment(error)) {
        const pid_t owner = ownerOf(entry->path().filename().string());
        const std::string path = entry->path().string();
        if (owner > 0 && (owner == ::getpid() || isDead(owner)) && isUnused(path) && ::unlink(path.c_str()) == 0)
            MW_LOGW("removed what a dead process left : [%s]", path.c_str());
    }
}
