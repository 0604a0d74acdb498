#include "media/FileDuration.h"

#include "media/FileDescriptor.h"

#include <fcntl.h>
#include <sys/stat.h>

#include <algorithm>
#include <array>
#include <climits>
#include <cstring>
#include <vector>

namespace media {

namespace {

    constexpr int MOST_BOXES = 20000; // more than any honest file has side by side
    constexpr std::array<unsigned char, 16> AMR_FRAME_BYTES = {13, 14, 16, 18, 20, 21, 27, 32, 6, 1, 1, 1, 1, 1, 1, 1};
    constexpr unsigned AMR_PADDING_BITS = 0x83;
    constexpr size_t BLOCK = 65536;

    struct Box {
        std::array<char, 4> type{};
        off_t content = 0;
        off_t end = 0;

        [[nodiscard]] bool is(const char* name) const { return std::memcmp(type.data(), name, 4) == 0; }
    };

    off_t sizeOf(int fd)
    {
        struct stat status { };
        return fstat(fd, &status) == 0 && S_ISREG(status.st_mode) ? status.st_size : 0;
    }

    uint64_t bigEndian(const unsigned char* bytes, int count)
    {
        uint64_t value = 0;
        for (int i = 0; i < count; ++i)
            value = value << 8 | bytes[i];
        return value;
    }

    // The box at an offset, which must lie inside the limit.
    std::optional<Box> boxAt(int fd, off_t offset, off_t limit)
    {
        std::array<unsigned char, 16> head{};
        if (limit - offset < 8 || !readAt(fd, head.data(), 8, offset))
            return {};
        uint64_t size = bigEndian(head.data(), 4);
        off_t headSize = 8;
        if (size == 1) {
            headSize = 16;
            if (limit - offset < headSize || !readAt(fd, head.data() + 8, 8, offset + 8))
                return {};
            size = bigEndian(head.data() + 8, 8);
        } else if (size == 0) {
            size = static_cast<uint64_t>(limit - offset);
        }
        if (size < static_cast<uint64_t>(headSize) || size > static_cast<uint64_t>(limit - offset))
            return {};
        Box box{{}, offset + headSize, offset + static_cast<off_t>(size)};
        std::memcpy(box.type.data(), head.data() + 4, 4);
        return box;
    }

    // Visits the boxes side by side in a range until the visitor answers false; answers whether they fill it exactly.
    template <typename Visitor>
    bool visitBoxes(int fd, off_t begin, off_t end, const Visitor& visitor)
    {
        for (int i = 0; begin < end; ++i) {
            const auto box = i < MOST_BOXES ? boxAt(fd, begin, end) : std::nullopt;
            if (!box || !visitor(*box))
                return false;
            begin = box->end;
        }
        return true;
    }

    std::optional<int> milliseconds(uint64_t duration, uint64_t scale)
    {
        if (scale == 0 || duration / scale > INT_MAX / 1000)
            return {};
        const uint64_t value = duration / scale * 1000 + duration % scale * 1000 / scale;
        return value > INT_MAX ? std::nullopt : std::optional<int>(static_cast<int>(value));
    }

    // What a header says of times lies behind version, flags and two dates; 32 or 64 bits wide.
    struct Times {
        uint64_t first = 0; // of what comes before the duration, the last 4 bytes
        uint64_t duration = 0;
    };

    std::optional<Times> timesOf(int fd, const Box& header, size_t between)
    {
        std::array<unsigned char, 40> content{};
        const auto size
            = static_cast<size_t>(std::min<off_t>(static_cast<off_t>(content.size()), header.end - header.content));
        if (size < 1 || !readAt(fd, content.data(), size, header.content))
            return {};
        const int width = content[0] == 1 ? 8 : 4;
        const size_t place = 4 + 2 * static_cast<size_t>(width);
        if (content[0] > 1 || size < place + between + static_cast<size_t>(width))
            return {};
        return Times{bigEndian(content.data() + place, 4), bigEndian(content.data() + place + between, width)};
    }

    bool isSound(int fd, const Box& media)
    {
        bool sound = false;
        visitBoxes(fd, media.content, media.end, [&](const Box& box) {
            std::array<char, 12> head{};
            sound = sound
                || (box.is("hdlr") && box.end - box.content >= 12 && readAt(fd, head.data(), head.size(), box.content)
                    && std::memcmp(head.data() + 8, "soun", 4) == 0);
            return !sound;
        });
        return sound;
    }

    // Units of the movie; none for a track of something else.
    std::optional<uint64_t> soundLength(int fd, const Box& track)
    {
        std::optional<uint64_t> length;
        bool sound = false;
        visitBoxes(fd, track.content, track.end, [&](const Box& box) {
            constexpr size_t IDENTIFIER = 8; // of the track, and nothing
            if (box.is("tkhd")) {
                if (const auto times = timesOf(fd, box, IDENTIFIER))
                    length = times->duration;
            }
            sound = sound || (box.is("mdia") && isSound(fd, box));
            return true;
        });
        return sound && length.value_or(0) > 0 ? length : std::nullopt;
    }

    // As long as its sound is heard; else what the whole says.
    std::optional<int> soundDuration(int fd, const Box& movie)
    {
        std::optional<Times> whole;
        std::optional<uint64_t> sound;
        visitBoxes(fd, movie.content, movie.end, [&](const Box& box) {
            constexpr size_t SCALE = 4;
            if (box.is("mvhd"))
                whole = timesOf(fd, box, SCALE);
            if (box.is("trak") && !sound)
                sound = soundLength(fd, box);
            return true;
        });
        return whole ? milliseconds(sound.value_or(whole->duration), whole->first) : std::nullopt;
    }

    struct Movie {
        std::optional<int> duration;
        bool hasData = false;
        bool isFragmented = false;
        bool isExact = false;
    };

    Movie readMovie(int fd)
    {
        Movie movie;
        movie.isExact = visitBoxes(fd, 0, sizeOf(fd), [&](const Box& box) {
            movie.isFragmented = movie.isFragmented || box.is("moof");
            movie.hasData = movie.hasData || box.is("mdat");
            if (box.is("moov"))
                movie.duration = soundDuration(fd, box);
            return !movie.isFragmented;
        });
        return movie;
    }

    std::optional<int> amrDuration(int fd)
    {
        const AmrFrames frames = walkAmr(fd);
        const uint64_t length = frames.count * AMR_FRAME_MS;
        // A torn last frame is what a crash leaves; anything longer is damage.
        const bool isDamaged = sizeOf(fd) - frames.end >= AMR_FRAME_BYTES[7];
        return isDamaged || frames.count == 0 || length > INT_MAX ? std::nullopt
                                                                  : std::optional<int>(static_cast<int>(length));
    }

}

FileKind kindOf(int fd)
{
    std::array<char, 8> head{};
    if (!readAt(fd, head.data(), head.size(), 0))
        return FileKind::UNKNOWN;
    if (std::memcmp(head.data(), AMR_MAGIC, AMR_DATA_START) == 0)
        return FileKind::AMR;
    return std::memcmp(head.data() + 4, "ftyp", 4) == 0 ? FileKind::MP4 : FileKind::UNKNOWN;
}

AmrFrames walkAmr(int fd)
{
    std::vector<unsigned char> block(BLOCK);
    AmrFrames frames{0, AMR_DATA_START, true};
    const off_t size = sizeOf(fd);
    while (frames.end < size) {
        const auto want = std::min<off_t>(BLOCK, size - frames.end);
        if (!readAt(fd, block.data(), static_cast<size_t>(want), frames.end))
            break;
        off_t at = 0;
        while (at < want) {
            const unsigned char head = block[static_cast<size_t>(at)];
            const off_t length = AMR_FRAME_BYTES[head >> 3 & 15];
            if ((head & AMR_PADDING_BITS) != 0 || at + length > want)
                break;
            at += length;
            ++frames.count;
        }
        if (at == 0)
            break;
        frames.end += at;
    }
    frames.isClean = frames.end == size;
    return frames;
}

std::optional<int> durationOf(int fd)
{
    switch (kindOf(fd)) {
    case FileKind::AMR:
        return amrDuration(fd);
    case FileKind::MP4: {
        const Movie movie = readMovie(fd);
        return movie.hasData && movie.isExact && !movie.isFragmented ? movie.duration : std::nullopt;
    }
    case FileKind::UNKNOWN:
        break;
    }
    return {};
}

std::optional<int> durationOf(const std::string& path)
{
    const FileDescriptor file(open(path.c_str(), O_RDONLY | O_CLOEXEC | O_NONBLOCK));
    return file ? durationOf(file.get()) : std::nullopt;
}

bool isCompleteMp4(int fd) { return kindOf(fd) == FileKind::MP4 && durationOf(fd).has_value(); }

}
