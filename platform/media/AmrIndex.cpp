#include "media/AmrIndex.h"

#include "media/FileDescriptor.h"

#include <sys/stat.h>

#include <algorithm>
#include <string_view>

namespace media {

namespace {

    constexpr std::string_view NARROW = "#!AMR\n";
    constexpr std::string_view WIDE = "#!AMR-WB\n";
    constexpr unsigned int PADDING_BITS = 0x83;
    constexpr size_t LARGEST_FRAME = 61;
    constexpr size_t BLOCK = 65536;
    constexpr std::array<uint8_t, 16> NARROW_BYTES = {13, 14, 16, 18, 20, 21, 27, 32, 6, 1, 1, 1, 1, 1, 1, 1};
    constexpr std::array<uint8_t, 16> WIDE_BYTES = {18, 24, 33, 37, 41, 47, 51, 59, 61, 6, 1, 1, 1, 1, 1, 1};

}

size_t AmrIndex::frameSize(unsigned char head, bool isWideBand)
{
    if ((head & PADDING_BITS) != 0)
        return 0;
    return (isWideBand ? WIDE_BYTES : NARROW_BYTES)[head >> 3 & 15];
}

std::string AmrIndex::head() const { return std::string(_isWideBand ? WIDE : NARROW); }

std::optional<AmrIndex> AmrIndex::read(int fd)
{
    struct stat status { };
    std::string start(WIDE.size(), '\0');
    if (fstat(fd, &status) != 0 || !S_ISREG(status.st_mode) || !readAt(fd, start.data(), start.size(), 0))
        return {};
    AmrIndex index;
    index._isWideBand = start == WIDE;
    if (!index._isWideBand && !start.starts_with(NARROW))
        return {};
    const auto size = static_cast<uint64_t>(status.st_size);
    index._end = index.head().size();
    std::vector<unsigned char> block(BLOCK);
    while (index._end < size) {
        const auto want = static_cast<size_t>(std::min<uint64_t>(BLOCK, size - index._end));
        if (!readAt(fd, block.data(), want, static_cast<off_t>(index._end)))
            return {};
        size_t at = 0;
        while (at < want) {
            const size_t length = frameSize(block[at], index._isWideBand);
            if (length == 0 || at + length > want)
                break;
            if (index._frames++ % STRIDE == 0)
                index._places.push_back(index._end + at);
            at += length;
        }
        if (at == 0)
            break;
        index._end += at;
    }
    const bool isDamaged = size - index._end >= LARGEST_FRAME;
    return isDamaged || index._frames == 0 ? std::nullopt : std::optional(std::move(index));
}

uint64_t AmrIndex::offsetOf(int fd, uint64_t frame) const
{
    if (frame >= _frames)
        return _end;
    uint64_t offset = _places[frame / STRIDE];
    std::vector<unsigned char> block(std::min<uint64_t>(STRIDE * LARGEST_FRAME, _end - offset));
    if (!readAt(fd, block.data(), block.size(), static_cast<off_t>(offset)))
        return _end;
    size_t at = 0;
    for (uint64_t left = frame % STRIDE; left > 0 && at < block.size(); --left)
        at += std::max<size_t>(1, frameSize(block[at], _isWideBand));
    return offset + at;
}

}
