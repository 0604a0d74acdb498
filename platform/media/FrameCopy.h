#pragma once

#include "media/Mp4Movie.h"

#include <atomic>
#include <cstdint>
#include <functional>
#include <string_view>

namespace media {

// What an export needs to know of its caller, and tells it; shared by the threads of an export.
struct ExportWatch {
    std::atomic<bool> cancelled = false;
    std::atomic<int> percent = 0;
};

// Fills a new file from parts of another one, by the kernel where it can (sharing blocks where the file system has
// that). Looks at the cancel flag about once a megabyte. Answers 0, ECANCELED or the system's error number.
class FrameCopy {
public:
    // The descriptors are borrowed; total is what will be copied, in bytes.
    FrameCopy(int from, int to, uint64_t total, ExportWatch& watch);

    int write(std::string_view bytes);
    int copy(const ByteRange& range);
    [[nodiscard]] uint64_t position() const { return _position; }

private:
    int _copySlice(uint64_t offset, size_t size);
    int _copyThroughBuffer(uint64_t offset, size_t size);

    int _from;
    int _to;
    uint64_t _total;
    ExportWatch& _watch;
    uint64_t _position = 0;
    uint64_t _copied = 0;
    bool _kernelCopies = true;
};

}
