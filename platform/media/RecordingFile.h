#pragma once

#include "media/FileDescriptor.h"
#include "media/RecordingJournal.h"

#include <atomic>
#include <memory>
#include <string>

namespace media {

// What tells one state of a file from another.
struct FileVersion {
    uint64_t inode = 0;
    int64_t changed = 0; // nanoseconds
    bool operator==(const FileVersion&) const = default;
};

// The file of one running recording with its journal. append() belongs to one thread at a time, flush() and
// freeSpaceError() may run beside it. Every frame is in the system's hands when append() returns.
class RecordingFile {
public:
    // Creates both files; the path must be claimed. None on failure, error is the system's number.
    static std::unique_ptr<RecordingFile> create(const std::string& path, const JournalHeader& header, int& error);

    // Answers 0 or the system's error number; then the file ends with the last whole frame.
    int append(const void* frame, size_t size);
    // Of the finished file, with one more frame of that many bytes.
    [[nodiscard]] uint64_t sizeWith(size_t frameBytes) const;
    [[nodiscard]] uint64_t size() const;
    [[nodiscard]] uint64_t frames() const { return _frames; }

    // To the storage, with the application's notes: the recording first, so that the journal never promises more than
    // there is. Answers 0 or the system's error number.
    int flush();
    // What tells the file from all others of its file system, whatever its name; 0 when unknown.
    [[nodiscard]] uint64_t inode() const;
    // Whether the path still leads to the file.
    [[nodiscard]] bool isInPlace() const;
    // Room for the index is kept back for the case that the storage fills up; grows with the recording.
    void growReserve();
    // ENOSPC when the storage has no more room than finishing needs, else 0.
    [[nodiscard]] int freeSpaceError() const;

    // Makes it an ordinary file of that many samples and flushes, under its path, wherever that leads by now; answers 0
    // or the system's error number.
    int finish(uint64_t samples);

private:
    RecordingFile(std::string path, JournalHeader header);
    int _flushNotes();
    int _putBack();

    std::string _path;
    JournalHeader _header;
    FileDescriptor _file;
    FileDescriptor _journal;
    FileDescriptor _reserve;
    uint64_t _reserved = 0;
    uint64_t _flushedFrames = 0; // by the flushing thread, as the next one
    FileVersion _flushedNotes;
    std::atomic<uint64_t> _frames{0};
    std::atomic<uint64_t> _bytes{0}; // of the frames
};

}
