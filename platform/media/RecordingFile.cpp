#include "media/RecordingFile.h"

#include "media/FileDuration.h"
#include "media/RecordingClaims.h"
#include "media/RecordingRebuild.h"

#include <fcntl.h>
#include <sys/statvfs.h>

#include <algorithm>
#include <cstring>
#include <utility>

namespace media {

namespace {

    constexpr mode_t FILE_MODE = 0644;
    constexpr uint64_t RESERVE_STEP = 32 * 1024;
    constexpr uint64_t RESERVE_PER_FRAME = 8;
    constexpr uint64_t FREE_SPACE_MOST = 2 * 1024 * 1024;
    constexpr uint64_t FREE_SPACE_LEAST = 64 * 1024;

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

void RecordingFile::flush()
{
    const uint64_t frames = _frames;
    if (frames == _flushedFrames)
        return;
    (void)fdatasync(_file.get());
    (void)fdatasync(_journal.get());
    // The names of both files, once.
    if (std::exchange(_flushedFrames, frames) == 0)
        flushDirectory(directoryOf(_path));
}

void RecordingFile::growReserve()
{
    const uint64_t wanted = RESERVE_STEP + (isAac(_header) ? RESERVE_PER_FRAME * _frames : 0);
    if (wanted <= _reserved)
        return;
    const uint64_t size = (wanted / RESERVE_STEP + 1) * RESERVE_STEP;
    if (!_reserve) {
        // Without a name from the start: it goes with the process.
        const std::string name = _path + ".reserve";
        _reserve = FileDescriptor(open(name.c_str(), O_RDWR | O_CREAT | O_TRUNC | O_CLOEXEC, 0600));
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

int RecordingFile::finish()
{
    _reserve.close();
    const int error = isAac(_header) ? finishMp4(_file.get(), _journal.get(), _header, {_frames, _bytes})
                                     : finishAmr(_file.get(), _journal.get(), _header);
    endWriting(_path, error == 0);
    return error;
}

}
