#include "media/RecordingFile.h"

#include "media/FileDuration.h"
#include "media/RecordingClaims.h"
#include "media/RecordingRebuild.h"

#include <recorder_leftover.h>

#include <fcntl.h>
#include <sys/stat.h>
#include <sys/statvfs.h>

#include <algorithm>
#include <cstring>
#include <filesystem>
#include <utility>
#include <vector>

namespace media {

namespace {

    constexpr mode_t FILE_MODE = 0644;
    constexpr size_t COPY_BYTES = 256 * 1024;
    constexpr uint64_t RESERVE_STEP = 32 * 1024;
    constexpr uint64_t RESERVE_PER_FRAME = 8;
    constexpr uint64_t FREE_SPACE_MOST = 2 * 1024 * 1024;
    constexpr uint64_t FREE_SPACE_LEAST = 64 * 1024;

    int errorOf(int result) { return result == 0 ? 0 : errno; }

    bool isAac(const JournalHeader& header) { return header.format == RECORDER_FILE_FORMAT_MP4; }

    off_t dataStart(const JournalHeader& header)
    {
        return isAac(header) ? static_cast<off_t>(MP4_DATA_START) : AMR_DATA_START;
    }

}

RecordingFile::RecordingFile(std::string path, JournalHeader header)
    : _path(std::move(path))
    , _header(header)
{
}

std::unique_ptr<RecordingFile> RecordingFile::create(const std::string& path, const JournalHeader& header, int& error)
{
    std::unique_ptr<RecordingFile> self(new RecordingFile(path, header));
    self->_journal = claimedJournal(path);
    self->_file = FileDescriptor(open(path.c_str(), O_RDWR | O_CREAT | O_EXCL | O_CLOEXEC, FILE_MODE));
    error = self->_file ? 0 : errno;
    if (error == 0 && !self->_journal)
        error = EBADF;
    const bool isOurs = bool(self->_file);
    const std::string head = isAac(header) ? mp4FileHead(MP4_UNFINISHED) : AMR_MAGIC;
    if (error == 0)
        error = writeAt(self->_file.get(), head.data(), head.size(), 0);
    if (error == 0)
        error = writeJournalHeader(self->_journal.get(), header);
    if (error == 0)
        error = self->freeSpaceError();
    if (error != 0) {
        if (isOurs)
            (void)unlink(path.c_str());
        return nullptr;
    }
    self->growReserve();
    return self;
}

int RecordingFile::append(const void* frame, size_t size)
{
    const off_t end = dataStart(_header) + static_cast<off_t>(_bytes);
    int error = writeAt(_file.get(), frame, size, end);
    if (error == 0 && isAac(_header)) {
        const auto entry = static_cast<uint16_t>(size);
        error = writeAt(_journal.get(), &entry, sizeof entry, journalSize(_frames));
    }
    if (error != 0) {
        (void)!ftruncate(_file.get(), end);
        return error;
    }
    _bytes += size;
    ++_frames;
    return 0;
}

uint64_t RecordingFile::sizeWith(size_t frameBytes) const
{
    const uint64_t more = frameBytes > 0 ? 1 : 0;
    return isAac(_header) ? mp4FileSize(_frames + more, _bytes + frameBytes)
                          : static_cast<uint64_t>(AMR_DATA_START) + _bytes + frameBytes;
}

uint64_t RecordingFile::size() const { return sizeWith(0); }

int RecordingFile::flush()
{
    const int notesError = _flushNotes();
    const uint64_t frames = _frames;
    if (frames == _flushedFrames)
        return notesError;
    const int fileError = errorOf(fdatasync(_file.get()));
    const int journalError = errorOf(fdatasync(_journal.get()));
    // The names of both files, once.
    if (std::exchange(_flushedFrames, frames) == 0)
        flushDirectory(directoryOf(_path));
    return fileError != 0 ? fileError : journalError != 0 ? journalError : notesError;
}

int RecordingFile::_flushNotes()
{
    const std::string path = _path + RECORDER_NOTES_SUFFIX;
    const FileDescriptor notes(open(path.c_str(), O_RDONLY | O_NOFOLLOW | O_NONBLOCK | O_CLOEXEC));
    struct stat status { };
    if (!notes || fstat(notes.get(), &status) != 0)
        return 0; // there are none
    const FileVersion now{status.st_ino, int64_t{status.st_ctim.tv_sec} * 1000000000 + status.st_ctim.tv_nsec};
    if (now == _flushedNotes)
        return 0;
    if (fdatasync(notes.get()) != 0)
        return errno;
    flushDirectory(directoryOf(_path));
    _flushedNotes = now;
    return 0;
}

uint64_t RecordingFile::inode() const
{
    struct stat status { };
    return fstat(_file.get(), &status) == 0 ? status.st_ino : 0;
}

bool RecordingFile::isInPlace() const
{
    struct stat open { };
    struct stat named { };
    return fstat(_file.get(), &open) != 0
        || (stat(_path.c_str(), &named) == 0 && named.st_ino == open.st_ino && named.st_dev == open.st_dev);
}

void RecordingFile::growReserve()
{
    const uint64_t wanted = RESERVE_STEP + (isAac(_header) ? RESERVE_PER_FRAME * _frames : 0);
    if (wanted <= _reserved)
        return;
    const uint64_t size = (wanted / RESERVE_STEP + 1) * RESERVE_STEP;
    if (!_reserve) {
        // Without a name from the start: it goes with the process. What somebody put there is not ours to open.
        const std::string name = _path + ".reserve";
        (void)unlink(name.c_str());
        _reserve = FileDescriptor(open(name.c_str(), O_RDWR | O_CREAT | O_EXCL | O_NOFOLLOW | O_CLOEXEC, 0600));
        (void)unlink(name.c_str());
    }
    if (_reserve && posix_fallocate(_reserve.get(), 0, static_cast<off_t>(size)) == 0)
        _reserved = size;
}

int RecordingFile::freeSpaceError() const
{
    struct statvfs storage { };
    if (fstatvfs(_file.get(), &storage) != 0 || storage.f_blocks == 0)
        return 0;
    const uint64_t total = uint64_t{storage.f_blocks} * storage.f_frsize;
    const uint64_t least = std::clamp(total / 50, FREE_SPACE_LEAST, FREE_SPACE_MOST) + RESERVE_PER_FRAME * _frames;
    return uint64_t{storage.f_bavail} * storage.f_frsize < least ? ENOSPC : 0;
}

int RecordingFile::finish(uint64_t samples)
{
    _reserve.close();
    int error = isAac(_header) ? finishMp4(_file.get(), _journal.get(), _header, {_frames, _bytes}, samples)
                               : finishAmr(_file.get(), _journal.get(), _header);
    if (error == 0 && !isInPlace())
        error = _putBack();
    endWriting(_path, error == 0);
    return error;
}

// Its folder or its name was deleted meanwhile; the open file still has everything.
int RecordingFile::_putBack()
{
    std::error_code ignored;
    std::filesystem::create_directories(directoryOf(_path), ignored);
    const FileDescriptor copy(open(_path.c_str(), O_RDWR | O_CREAT | O_EXCL | O_NOFOLLOW | O_CLOEXEC, FILE_MODE));
    if (!copy)
        return errno;
    std::vector<char> block(COPY_BYTES);
    for (off_t at = 0;;) {
        const ssize_t count = pread(_file.get(), block.data(), block.size(), at);
        if (count < 0)
            return errno;
        if (count == 0)
            break;
        if (const int error = writeAt(copy.get(), block.data(), static_cast<size_t>(count), at); error != 0)
            return error;
        at += count;
    }
    if (fdatasync(copy.get()) != 0)
        return errno;
    flushDirectory(directoryOf(_path));
    return 0;
}

}
