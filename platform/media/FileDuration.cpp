#include "media/FileDuration.h"

#include "media/AmrIndex.h"
#include "media/FileDescriptor.h"
#include "media/Mp4Index.h"

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
    constexpr auto AMR_WIDE_MAGIC = "#!AMR-WB\n";
    constexpr off_t AMR_WIDE_DATA_START = 9;
    constexpr size_t ADTS_HEAD = 7;
    constexpr off_t MOST_FRAGMENT_INDEX = 1 << 24;
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

    // A track of sound: as long as the movie's index says, and what its fragments need to tell more.
    struct Sound {
        uint64_t length = 0; // units of the movie
        uint64_t identifier = 0;
        uint64_t scale = 0; // units a second of the fragments
        uint64_t frameLength = 0; // of a fragment that does not tell
    };

    std::optional<Sound> soundOf(int fd, const Box& track)
    {
        Sound found;
        bool sound = false;
        visitBoxes(fd, track.content, track.end, [&](const Box& box) {
            constexpr size_t IDENTIFIER = 8; // of the track, and nothing
            if (box.is("tkhd")) {
                const Times times = timesOf(fd, box, IDENTIFIER).value_or(Times());
                found.length = times.duration;
                found.identifier = times.first;
            }
            if (box.is("mdia")) {
                sound = sound || isSound(fd, box);
                visitBoxes(fd, box.content, box.end, [&](const Box& inner) {
                    if (inner.is("mdhd"))
                        found.scale = timesOf(fd, inner, 4).value_or(Times()).first;
                    return true;
                });
            }
            return true;
        });
        return sound ? std::optional<Sound>(found) : std::nullopt;
    }

    // A number in a box; 0 behind its end.
    uint64_t numberAt(int fd, const Box& box, off_t place)
    {
        std::array<unsigned char, 4> bytes{};
        const bool isInside = box.content + place + 4 <= box.end;
        return isInside && readAt(fd, bytes.data(), bytes.size(), box.content + place) ? bigEndian(bytes.data(), 4) : 0;
    }

    uint64_t defaultFrameLength(int fd, const Box& extension, uint64_t track)
    {
        uint64_t length = 0;
        visitBoxes(fd, extension.content, extension.end, [&](const Box& box) {
            if (box.is("trex") && numberAt(fd, box, 4) == track)
                length = numberAt(fd, box, 12);
            return true;
        });
        return length;
    }

    uint64_t runLength(int fd, const Box& run, uint64_t frameLength)
    {
        const uint64_t flags = numberAt(fd, run, 0);
        const uint64_t count = numberAt(fd, run, 4);
        if ((flags & 0x100) == 0)
            return count * frameLength;
        off_t begin = run.content + 8;
        begin += ((flags & 1) != 0 ? 4 : 0) + ((flags & 4) != 0 ? 4 : 0);
        off_t entry = 4;
        for (const unsigned flag : {0x200, 0x400, 0x800})
            entry += (flags & flag) != 0 ? 4 : 0;
        const off_t size = run.end - begin;
        if (size <= 0 || size > MOST_FRAGMENT_INDEX || static_cast<uint64_t>(size / entry) < count)
            return 0;
        std::vector<unsigned char> entries(static_cast<size_t>(size));
        if (!readAt(fd, entries.data(), entries.size(), begin))
            return 0;
        uint64_t sum = 0;
        for (uint64_t i = 0; i < count; ++i)
            sum += bigEndian(entries.data() + i * static_cast<uint64_t>(entry), 4);
        return sum;
    }

    uint64_t fragmentLength(int fd, const Box& fragment, const Sound& sound)
    {
        uint64_t sum = 0;
        visitBoxes(fd, fragment.content, fragment.end, [&](const Box& part) {
            uint64_t frameLength = sound.frameLength;
            bool isMeant = false;
            visitBoxes(fd, part.content, part.is("traf") ? part.end : part.content, [&](const Box& box) {
                if (box.is("tfhd")) {
                    const uint64_t flags = numberAt(fd, box, 0);
                    isMeant = numberAt(fd, box, 4) == sound.identifier;
                    if ((flags & 8) != 0)
                        frameLength = numberAt(fd, box, 8 + ((flags & 1) != 0 ? 8 : 0) + ((flags & 2) != 0 ? 4 : 0));
                }
                if (box.is("trun") && isMeant)
                    sum += runLength(fd, box, frameLength);
                return true;
            });
            return true;
        });
        return sum;
    }

    struct Movie {
        std::optional<int> duration; // of its sound as the index tells it; else of the whole
        std::optional<Sound> sound;
        uint64_t fragments = 0; // length of the sound in them
        bool hasData = false;
        bool isFragmented = false;
        bool isExact = false;
    };

    void readIndex(int fd, const Box& index, Movie& movie)
    {
        std::optional<Times> whole;
        visitBoxes(fd, index.content, index.end, [&](const Box& box) {
            constexpr size_t SCALE = 4;
            if (box.is("mvhd"))
                whole = timesOf(fd, box, SCALE);
            if (box.is("trak") && !movie.sound)
                movie.sound = soundOf(fd, box);
            if (box.is("mvex") && movie.sound)
                movie.sound->frameLength = defaultFrameLength(fd, box, movie.sound->identifier);
            return true;
        });
        if (!whole)
            return;
        const bool isTold = movie.sound && movie.sound->length > 0;
        movie.duration = milliseconds(isTold ? movie.sound->length : whole->duration, whole->first);
    }

    Movie readMovie(int fd)
    {
        Movie movie;
        movie.isExact = visitBoxes(fd, 0, sizeOf(fd), [&](const Box& box) {
            movie.hasData = movie.hasData || box.is("mdat");
            if (box.is("moov"))
                readIndex(fd, box, movie);
            if (box.is("moof")) {
                movie.isFragmented = true;
                movie.fragments += movie.sound ? fragmentLength(fd, box, *movie.sound) : 0;
            }
            return true;
        });
        return movie;
    }

    // What lies behind the last box is nobody's business.
    std::optional<int> movieDuration(int fd)
    {
        const Movie movie = readMovie(fd);
        if (!movie.hasData)
            return {};
        if (!movie.isFragmented)
            return movie.duration;
        const auto fragments = milliseconds(movie.fragments, movie.sound ? movie.sound->scale : 0);
        const int longest = std::max(fragments.value_or(0), movie.duration.value_or(0));
        return longest > 0 ? std::optional<int>(longest) : std::nullopt;
    }

    std::optional<int> adtsDuration(int fd)
    {
        std::vector<unsigned char> block(BLOCK);
        const off_t size = sizeOf(fd);
        off_t begin = 0; // of the block in the file
        size_t filled = 0;
        uint64_t samples = 0;
        uint32_t rate = 0;
        for (off_t at = 0; at + static_cast<off_t>(ADTS_HEAD) <= size;) {
            if (at + static_cast<off_t>(ADTS_HEAD) > begin + static_cast<off_t>(filled)) {
                begin = at;
                filled = static_cast<size_t>(std::min<off_t>(BLOCK, size - at));
                if (!readAt(fd, block.data(), filled, at))
                    return {};
            }
            const unsigned char* head = block.data() + (at - begin);
            const size_t index = head[2] >> 2 & 15;
            const auto length = static_cast<off_t>(bigEndian(head + 3, 3) >> 5 & 0x1FFF);
            if (head[0] != 0xFF || (head[1] & 0xF6) != 0xF0 || index >= AAC_RATES.size()
                || length < static_cast<off_t>(ADTS_HEAD))
                return {};
            rate = AAC_RATES[index];
            samples += 1024 * ((head[6] & 3) + 1u);
            at += length;
        }
        return milliseconds(samples, rate);
    }

    std::optional<int> amrDuration(int fd, FileKind kind)
    {
        const AmrFrames frames = walkAmr(fd, kind);
        const uint64_t length = frames.count * AMR_FRAME_MS;
        // A torn last frame is what a crash leaves; anything longer is damage.
        const bool isDamaged = sizeOf(fd) - frames.end >= (kind == FileKind::AMR ? 32 : 61);
        return isDamaged || frames.count == 0 || length > INT_MAX ? std::nullopt
                                                                  : std::optional<int>(static_cast<int>(length));
    }

}

FileKind kindOf(int fd)
{
    std::array<char, AMR_WIDE_DATA_START> head{};
    if (!readAt(fd, head.data(), 8, 0))
        return FileKind::UNKNOWN;
    if (std::memcmp(head.data(), AMR_MAGIC, AMR_DATA_START) == 0)
        return FileKind::AMR;
    if (readAt(fd, head.data(), head.size(), 0) && std::memcmp(head.data(), AMR_WIDE_MAGIC, head.size()) == 0)
        return FileKind::AMR_WIDE;
    if (head[0] == '\xFF' && (head[1] & 0xF6) == 0xF0)
        return FileKind::ADTS;
    return std::memcmp(head.data() + 4, "ftyp", 4) == 0 ? FileKind::MP4 : FileKind::UNKNOWN;
}

AmrFrames walkAmr(int fd, FileKind kind)
{
    const bool isWide = kind == FileKind::AMR_WIDE;
    std::vector<unsigned char> block(BLOCK);
    AmrFrames frames{0, isWide ? AMR_WIDE_DATA_START : AMR_DATA_START, true};
    const off_t size = sizeOf(fd);
    while (frames.end < size) {
        const auto want = std::min<off_t>(BLOCK, size - frames.end);
        if (!readAt(fd, block.data(), static_cast<size_t>(want), frames.end))
            break;
        off_t at = 0;
        while (at < want) {
            const auto length = static_cast<off_t>(AmrIndex::frameSize(block[static_cast<size_t>(at)], isWide));
            if (length == 0 || at + length > want)
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
    switch (const FileKind kind = kindOf(fd)) {
    case FileKind::AMR:
    case FileKind::AMR_WIDE:
        return amrDuration(fd, kind);
    case FileKind::ADTS:
        return adtsDuration(fd);
    case FileKind::MP4:
        return movieDuration(fd);
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

bool isCompleteMp4(int fd)
{
    if (kindOf(fd) != FileKind::MP4)
        return false;
    const Movie movie = readMovie(fd);
    return movie.isExact && movie.hasData && !movie.isFragmented && movie.duration;
}

}
