#include "media/RecordingClaims.h"

#include "media/RecordingJournal.h"

#include <Mutex.h>
#include <recorder_leftover.h>

#include <fcntl.h>
#include <sys/file.h>
#include <sys/random.h>
#include <sys/stat.h>

#include <algorithm>
#include <cstdio>
#include <filesystem>
#include <map>
#include <set>

namespace fs = std::filesystem;

namespace media {

namespace {

    constexpr int ATTEMPTS = 4;
    constexpr mode_t JOURNAL_MODE = 0644;

    struct Claims {
        platform::Mutex mutex;
        std::map<std::string, FileDescriptor> held GUARDED_BY(mutex); // by the resolved path
        std::set<std::string> written GUARDED_BY(mutex);
        std::set<std::string> complete GUARDED_BY(mutex);
    };

    Claims& claims()
    {
        static Claims all;
        return all;
    }

    std::string resolved(const std::string& path)
    {
        std::error_code error;
        const fs::path directory = fs::canonical(directoryOf(path), error);
        return error ? path : (directory / nameOf(path)).string();
    }

    bool exists(const std::string& path)
    {
        struct stat status { };
        return lstat(path.c_str(), &status) == 0;
    }

    bool isSameFile(int fd, const std::string& path)
    {
        struct stat open { };
        struct stat named { };
        return fstat(fd, &open) == 0 && stat(path.c_str(), &named) == 0 && open.st_ino == named.st_ino
            && open.st_dev == named.st_dev;
    }

    // A regular file under no other name.
    bool isOrdinary(int fd)
    {
        struct stat status { };
        return fstat(fd, &status) == 0 && S_ISREG(status.st_mode) && status.st_nlink <= 1;
    }

    int renameWithoutReplacing(const std::string& from, const std::string& to)
    {
        if (renameat2(AT_FDCWD, from.c_str(), AT_FDCWD, to.c_str(), RENAME_NOREPLACE) == 0)
            return 0;
        if (errno != EINVAL && errno != ENOSYS)
            return errno;
        // A file system without that flag, such as a memory card's.
        if (exists(to))
            return EEXIST;
        return rename(from.c_str(), to.c_str()) == 0 ? 0 : errno;
    }

    uint64_t newRescueId()
    {
        uint64_t id = 0;
        while (id == 0 && getrandom(&id, sizeof id, 0) != sizeof id) { }
        return id;
    }

    // Nothing to rescue without a recording: drop the trace of one that was saved or deleted.
    int clearStaleJournal(const std::string& path, int journal)
    {
        (void)unlink((path + RECORDER_NOTES_SUFFIX).c_str());
        return ftruncate(journal, 0) == 0 ? 0 : errno;
    }

    bool isMoveInterrupted(int journal)
    {
        const auto header = readJournalHeader(journal);
        return header && header->rescueId != 0;
    }

    // The journal here, locked; from our own table when an earlier recording was never released.
    FileDescriptor takeOrLock(Claims& all, const std::string& path, int& error) REQUIRES(all.mutex)
    {
        if (auto own = all.held.extract(path); !own.empty())
            if (isSameFile(own.mapped().get(), path + JOURNAL_SUFFIX))
                return std::move(own.mapped());
        const int fd = openLocked(path + JOURNAL_SUFFIX);
        error = fd < 0 ? -fd : 0;
        return FileDescriptor(fd);
    }

    // Answers whether the journal may be used for a new recording; otherwise it was moved away, or error is set.
    bool isReadyForUse(const std::string& path, int journal, int& error)
    {
        if (!exists(path) && !isMoveInterrupted(journal)) {
            struct stat status { };
            error = fstat(journal, &status) == 0 && status.st_size > 0 ? clearStaleJournal(path, journal) : 0;
            return error == 0;
        }
        error = moveAside(path, journal);
        return false;
    }

}

std::string directoryOf(const std::string& path)
{
    const std::string directory = fs::path(path).parent_path().string();
    return directory.empty() ? "." : directory;
}

std::string nameOf(const std::string& path) { return fs::path(path).filename().string(); }

std::string rescueName(const std::string& path, uint64_t id)
{
    char digits[17];
    snprintf(digits, sizeof digits, "%016llx", static_cast<unsigned long long>(id));
    return directoryOf(path) + "/" + RESCUE_PREFIX + digits;
}

std::vector<std::string> filesWithPrefix(const std::string& directory, const std::string& prefix)
{
    std::vector<std::string> found;
    std::error_code error;
    for (fs::directory_iterator entry(directory, error), end; !error && entry != end; entry.increment(error))
        if (entry->path().filename().string().starts_with(prefix))
            found.push_back(entry->path().string());
    std::sort(found.begin(), found.end());
    return found;
}

void flushDirectory(const std::string& directory)
{
    const FileDescriptor fd(open(directory.c_str(), O_RDONLY | O_DIRECTORY | O_CLOEXEC));
    if (fd)
        (void)fsync(fd.get());
}

int openLocked(const std::string& journalPath)
{
    for (int attempt = 0; attempt < ATTEMPTS; ++attempt) {
        FileDescriptor fd(open(journalPath.c_str(), O_RDWR | O_CREAT | O_CLOEXEC | O_NOFOLLOW, JOURNAL_MODE));
        const int error = errno;
        if (fd ? !isOrdinary(fd.get()) : error == ELOOP) {
            // Planted: what it leads to is not ours to touch.
            if (unlink(journalPath.c_str()) != 0)
                return -errno;
            continue;
        }
        if (!fd)
            return -error;
        if (flock(fd.get(), LOCK_EX | LOCK_NB) != 0)
            return -errno;
        // The previous holder may have removed or renamed it between our opening and locking.
        if (isSameFile(fd.get(), journalPath))
            return fd.release();
    }
    return -EWOULDBLOCK;
}

int renameGroup(const std::string& path, const std::string& newPath)
{
    std::vector<std::string> companions = filesWithPrefix(directoryOf(path), nameOf(path) + ".");
    const std::string journal = path + JOURNAL_SUFFIX;
    std::erase(companions, journal);
    if (exists(path))
        if (const int error = renameWithoutReplacing(path, newPath); error != 0)
            return error;
    for (const auto& companion : companions)
        if (const int error = renameWithoutReplacing(companion, newPath + companion.substr(path.size())); error != 0)
            return error;
    // The journal goes last: its lock and its note of the new name cover all that went before.
    const int error = exists(journal) ? renameWithoutReplacing(journal, newPath + JOURNAL_SUFFIX) : 0;
    flushDirectory(directoryOf(path));
    return error;
}

int moveAside(const std::string& path, int journal)
{
    JournalHeader header = readJournalHeader(journal).value_or(JournalHeader{});
    if (header.rescueId == 0) {
        header.rescueId = newRescueId();
        if (const int error = writeJournalHeader(journal, header); error != 0)
            return error;
        (void)fdatasync(journal);
    }
    return renameGroup(path, rescueName(path, header.rescueId));
}

bool hasLeftover(const std::string& path, int journal) { return exists(path) || isMoveInterrupted(journal); }

int claimTemporary(const std::string& givenPath)
{
    const std::string path = resolved(givenPath);
    const platform::Lock lock(claims().mutex);
    if (claims().written.contains(path))
        return EWOULDBLOCK;
    for (int attempt = 0; attempt < ATTEMPTS; ++attempt) {
        int error = 0;
        FileDescriptor journal = takeOrLock(claims(), path, error);
        if (!journal)
            return error;
        if (isReadyForUse(path, journal.get(), error)) {
            claims().held[path] = std::move(journal);
            claims().written.insert(path);
            claims().complete.erase(path);
            return 0;
        }
        if (error != 0)
            return error;
    }
    return EWOULDBLOCK;
}

bool isClaimedHere(const std::string& path)
{
    const platform::Lock lock(claims().mutex);
    return claims().held.contains(resolved(path));
}

bool isBeingWritten(const std::string& path)
{
    const platform::Lock lock(claims().mutex);
    return claims().written.contains(resolved(path));
}

void endWriting(const std::string& path, bool isComplete)
{
    const platform::Lock lock(claims().mutex);
    claims().written.erase(resolved(path));
    if (isComplete)
        claims().complete.insert(resolved(path));
}

bool isComplete(const std::string& path)
{
    const platform::Lock lock(claims().mutex);
    return claims().complete.contains(resolved(path));
}

FileDescriptor claimedJournal(const std::string& path)
{
    const platform::Lock lock(claims().mutex);
    const auto found = claims().held.find(resolved(path));
    return found == claims().held.end() ? FileDescriptor()
                                        : FileDescriptor(fcntl(found->second.get(), F_DUPFD_CLOEXEC, 3));
}

bool releaseTemporary(const std::string& givenPath)
{
    const std::string path = resolved(givenPath);
    const platform::Lock lock(claims().mutex);
    const auto found = claims().held.find(path);
    if (found == claims().held.end())
        return false;
    if (isSameFile(found->second.get(), path + JOURNAL_SUFFIX))
        (void)unlink((path + JOURNAL_SUFFIX).c_str());
    claims().held.erase(found);
    claims().written.erase(path);
    claims().complete.erase(path);
    return true;
}

}
