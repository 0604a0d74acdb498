#include "media/Mp4Movie.h"

#include "media/FileDescriptor.h"
#include "media/Mp4Boxes.h"

#include <sys/stat.h>

#include <algorithm>
#include <array>
#include <limits>

namespace media {

namespace {

    constexpr uint64_t LARGEST_INDEX = uint64_t{256} << 20; // bytes; three weeks of frames
    constexpr int MOST_BOXES = 20000;
    constexpr uint64_t LONGEST_SHORT_TIME = 0xFFFFFFFEu;
    constexpr uint64_t EMPTY_EDIT = std::numeric_limits<uint64_t>::max();
    // Frames that the first heard one needs before it to be decoded as it was in the whole.
    constexpr uint64_t PREROLL_FRAMES = 1;
    constexpr int AAC_DESCRIPTOR = 5;

    uint64_t scaled(uint64_t value, uint64_t to, uint64_t from)
    {
        return value / from * to + (value % from * to + from / 2) / from;
    }

    // Version and flags, two dates, something in between, the duration, the rest: "mvhd", "tkhd" and "mdhd" alike.
    struct TimedBox {
        std::string_view flags;
        uint64_t created = 0;
        uint64_t modified = 0;
        std::string between;
        uint64_t duration = 0;
        std::string_view rest;

        static std::optional<TimedBox> parse(std::string_view content, size_t betweenSize)
        {
            const bool isLong = !content.empty() && content[0] == 1;
            const size_t width = isLong ? 8 : 4;
            if (content.size() < 4 + 3 * width + betweenSize)
                return {};
            TimedBox box;
            box.flags = content.substr(1, 3);
            box.created = bigEndian(content, 4, width);
            box.modified = bigEndian(content, 4 + width, width);
            box.between = content.substr(4 + 2 * width, betweenSize);
            box.duration = bigEndian(content, 4 + 2 * width + betweenSize, width);
            box.rest = content.substr(4 + 3 * width + betweenSize);
            return box;
        }

        [[nodiscard]] std::string write(std::string_view type) const
        {
            const bool isLong = std::max({created, modified, duration}) > LONGEST_SHORT_TIME;
            const int width = isLong ? 8 : 4;
            std::string out(1, isLong ? '\1' : '\0');
            out.append(flags);
            putBigEndian(out, created, width);
            putBigEndian(out, modified, width);
            out.append(between);
            putBigEndian(out, duration, width);
            return makeBox(type, out.append(rest));
        }
    };

    std::string u32(uint64_t value)
    {
        std::string out;
        putBigEndian(out, value, 4);
        return out;
    }

    std::string editList(const std::vector<Mp4Piece>& pieces)
    {
        const bool isLong = std::any_of(pieces.begin(), pieces.end(),
            [](const Mp4Piece& piece) { return std::max(piece.length, piece.from) > 0x7FFFFFFFu; });
        const int width = isLong ? 8 : 4;
        std::string out = u32(isLong ? 0x01000000 : 0) + u32(pieces.size());
        for (const Mp4Piece& piece : pieces) {
            putBigEndian(out, piece.length, width);
            putBigEndian(out, piece.isSilence ? EMPTY_EDIT : piece.from, width);
            putBigEndian(out, 0x10000, 4);
        }
        return makeBox("edts", makeBox("elst", out));
    }

    // Replaces some of the boxes side by side by what the visitor answers for them.
    template <typename Visitor>
    std::string rebuild(std::string_view content, const Visitor& visitor)
    {
        std::string out;
        while (const auto box = takeBox(content))
            out += visitor(*box);
        return out;
    }

    // Chapters name times of the whole.
    std::string withoutChapters(const Mp4Box& box)
    {
        return makeBox(box.type, rebuild(box.content, [](const Mp4Box& inner) {
            return inner.type == "chpl" ? std::string() : std::string(inner.whole);
        }));
    }

}

// Fills a movie from a file.
class Mp4Movie::Reader {
public:
    explicit Reader(Mp4Movie& movie)
        : _movie(movie)
    {
    }

    bool run(int fd) { return _load(fd) && _readMovie() && _areFramesInside(); }

private:
    bool _load(int fd)
    {
        struct stat status { };
        if (fstat(fd, &status) != 0 || !S_ISREG(status.st_mode))
            return false;
        _fileSize = static_cast<uint64_t>(status.st_size);
        uint64_t offset = 0;
        for (int i = 0; offset + 8 <= _fileSize && i < MOST_BOXES; ++i) {
            std::string head(16, '\0');
            const size_t headSize = std::min<uint64_t>(16, _fileSize - offset);
            if (!readAt(fd, head.data(), headSize, static_cast<off_t>(offset)))
                return false;
            const std::string type = head.substr(4, 4);
            uint64_t size = bigEndian(head, 0, 4);
            if (size == 1 && headSize == 16)
                size = bigEndian(head, 8, 8);
            else if (size == 0)
                size = _fileSize - offset;
            // What follows the last box may be anything.
            if (size < 8 || size > _fileSize - offset)
                break;
            if (type == "moof")
                return false;
            if (type == "ftyp" && !_readBox(fd, offset, size, _movie._fileType))
                return false;
            if (type == "moov" && _movie._moov.empty()) {
                std::string whole;
                if (!_readBox(fd, offset, size, whole))
                    return false;
                std::string_view bytes(whole);
                const auto box = takeBox(bytes);
                _movie._moov = box ? box->content : std::string_view();
            }
            offset += size;
        }
        return !_movie._fileType.empty() && !_movie._moov.empty();
    }

    static bool _readBox(int fd, uint64_t offset, uint64_t size, std::string& into)
    {
        if (size > LARGEST_INDEX)
            return false;
        into.resize(size);
        return readAt(fd, into.data(), size, static_cast<off_t>(offset));
    }

    bool _readMovie()
    {
        std::string_view rest(_movie._moov);
        std::optional<std::string_view> track;
        while (const auto box = takeBox(rest)) {
            if (box->type == "mvex" || (box->type == "trak" && track))
                return false;
            if (box->type == "trak")
                track = box->content;
        }
        const auto header = findBox(_movie._moov, "mvhd");
        const auto movieHeader = header ? TimedBox::parse(*header, 4) : std::nullopt;
        if (!rest.empty() || !track || !movieHeader)
            return false;
        _movieScale = static_cast<uint32_t>(bigEndian(movieHeader->between, 0, 4));
        return _movieScale > 0 && _readTrack(*track);
    }

    bool _readTrack(std::string_view track)
    {
        const auto media = findBox(track, "mdia");
        const auto header = media ? findBox(*media, "mdhd") : std::nullopt;
        const auto handler = media ? findBox(*media, "hdlr") : std::nullopt;
        const auto information = media ? findBox(*media, "minf") : std::nullopt;
        const auto table = information ? findBox(*information, "stbl") : std::nullopt;
        const auto timed = header ? TimedBox::parse(*header, 4) : std::nullopt;
        if (!timed || !handler || handler->substr(std::min<size_t>(8, handler->size()), 4) != "soun" || !table)
            return false;
        _movie._scale = static_cast<uint32_t>(bigEndian(timed->between, 0, 4));
        return _movie._scale > 0 && _readTables(*table) && _readEdits(track);
    }

    bool _readTables(std::string_view table)
    {
        if (findBox(table, "ctts") || findBox(table, "stss"))
            return false;
        return findBox(table, "stsd") && _readSizes(table) && _readTimes(table) && _readChunks(table);
    }

    // The content of a table of fixed-size entries; none when it is shorter than it says.
    static std::optional<std::string_view> _entries(
        std::string_view table, std::string_view type, size_t head, size_t entrySize, uint64_t& count)
    {
        const auto content = findBox(table, type);
        if (!content || content->size() < head)
            return {};
        count = bigEndian(*content, head - 4, 4);
        if (count > (content->size() - head) / entrySize)
            return {};
        return content->substr(head, count * entrySize);
    }

    bool _readSizes(std::string_view table)
    {
        const auto content = findBox(table, "stsz");
        if (!content || content->size() < 12)
            return false;
        const auto uniform = static_cast<uint32_t>(bigEndian(*content, 4, 4));
        uint64_t count = bigEndian(*content, 8, 4);
        if (uniform != 0) {
            if (count > _fileSize / uniform)
                return false;
            _movie._sizes.assign(count, uniform);
            return count > 0;
        }
        const auto sizes = _entries(table, "stsz", 12, 4, count);
        if (!sizes || count == 0)
            return false;
        _movie._sizes.reserve(count);
        for (size_t i = 0; i < count; ++i)
            _movie._sizes.push_back(static_cast<uint32_t>(bigEndian(*sizes, 4 * i, 4)));
        return true;
    }

    bool _readTimes(std::string_view table)
    {
        uint64_t count = 0;
        const auto runs = _entries(table, "stts", 8, 8, count);
        if (!runs)
            return false;
        uint64_t frame = 0;
        uint64_t time = 0;
        for (size_t i = 0; i < count && frame < _movie.frames(); ++i) {
            const uint64_t frames = std::min(bigEndian(*runs, 8 * i, 4), _movie.frames() - frame);
            const auto delta = static_cast<uint32_t>(bigEndian(*runs, 8 * i + 4, 4));
            if (frames == 0)
                continue;
            if (delta == 0)
                return false;
            _movie._runs.push_back({frame, time, delta});
            frame += frames;
            time += frames * delta;
        }
        _movie._mediaLength = time;
        return frame == _movie.frames();
    }

    bool _readChunks(std::string_view table)
    {
        uint64_t offsets = 0;
        uint64_t groups = 0;
        const bool isLong = !findBox(table, "stco");
        const size_t width = isLong ? 8 : 4;
        const auto places = _entries(table, isLong ? "co64" : "stco", 8, width, offsets);
        const auto layout = _entries(table, "stsc", 8, 12, groups);
        if (!places || !layout || groups == 0)
            return false;
        uint64_t frame = 0;
        size_t group = 0;
        for (uint64_t chunk = 0; chunk < offsets && frame < _movie.frames(); ++chunk) {
            while (group + 1 < groups && bigEndian(*layout, 12 * (group + 1), 4) <= chunk + 1)
                ++group;
            if (bigEndian(*layout, 12 * group + 8, 4) != 1)
                return false; // another description in between
            _movie._chunks.push_back({frame, bigEndian(*places, width * chunk, width)});
            const uint64_t inside = bigEndian(*layout, 12 * group + 4, 4);
            if (inside == 0)
                return false;
            frame += inside;
        }
        return frame >= _movie.frames();
    }

    bool _readEdits(std::string_view track)
    {
        const auto edits = findBox(track, "edts");
        uint64_t count = 0;
        const auto list = edits ? findBox(*edits, "elst") : std::nullopt;
        const bool isLong = list && !list->empty() && (*list)[0] == 1;
        const size_t width = isLong ? 8 : 4;
        const size_t size = 2 * width + 4;
        const auto entries = list ? _entries(*edits, "elst", 8, size, count) : std::nullopt;
        if (!entries || count == 0) {
            _movie._pieces = {{false, 0, _movie._mediaLength}};
            return !list || entries;
        }
        for (size_t i = 0; i < count; ++i) {
            if (bigEndian(*entries, size * i + 2 * width, 4) != 0x10000)
                return false; // played at another speed
            const uint64_t from = bigEndian(*entries, size * i + width, width);
            const bool isSilence = from == (isLong ? EMPTY_EDIT : 0xFFFFFFFFu);
            if (!isSilence && from >= _movie._mediaLength)
                return false;
            uint64_t length = scaled(bigEndian(*entries, size * i, width), _movie._scale, _movieScale);
            if (!isSilence)
                length = std::min(length != 0 ? length : EMPTY_EDIT, _movie._mediaLength - from);
            if (length > 0)
                _movie._pieces.push_back({isSilence, isSilence ? 0 : from, length});
        }
        return !_movie._pieces.empty();
    }

    bool _areFramesInside()
    {
        for (size_t i = 0; i < _movie._chunks.size(); ++i) {
            const auto& chunk = _movie._chunks[i];
            const uint64_t end = i + 1 < _movie._chunks.size()
                ? std::min(_movie._chunks[i + 1].firstFrame, _movie.frames())
                : _movie.frames();
            uint64_t bytes = 0;
            for (uint64_t frame = chunk.firstFrame; frame < end; ++frame)
                bytes += _movie._sizes[frame];
            if (chunk.offset > _fileSize || bytes > _fileSize - chunk.offset)
                return false;
        }
        return true;
    }

    Mp4Movie& _movie;
    uint64_t _fileSize = 0;
    uint32_t _movieScale = 0;
};

std::optional<Mp4Movie> Mp4Movie::read(int fd)
{
    Mp4Movie movie;
    return Reader(movie).run(fd) ? std::optional<Mp4Movie>(std::move(movie)) : std::nullopt;
}

uint64_t Mp4Movie::length() const
{
    uint64_t sum = 0;
    for (const Mp4Piece& piece : _pieces)
        sum += piece.length;
    return sum;
}

uint64_t Mp4Movie::timeOf(uint64_t frame) const
{
    if (frame >= frames())
        return _mediaLength;
    const auto next = std::upper_bound(
        _runs.begin(), _runs.end(), frame, [](uint64_t value, const Run& run) { return value < run.firstFrame; });
    const Run& run = *std::prev(next);
    return run.firstTime + (frame - run.firstFrame) * run.delta;
}

uint64_t Mp4Movie::frameAt(uint64_t time) const
{
    if (time >= _mediaLength)
        return frames();
    const auto next = std::upper_bound(
        _runs.begin(), _runs.end(), time, [](uint64_t value, const Run& run) { return value < run.firstTime; });
    const Run& run = *std::prev(next);
    return run.firstFrame + (time - run.firstTime) / run.delta;
}

std::vector<ByteRange> Mp4Movie::bytesOf(uint64_t first, uint64_t end) const
{
    std::vector<ByteRange> ranges;
    auto chunk = std::prev(std::upper_bound(_chunks.begin(), _chunks.end(), first,
        [](uint64_t value, const Chunk& each) { return value < each.firstFrame; }));
    uint64_t offset = chunk->offset;
    for (uint64_t frame = chunk->firstFrame; frame < end; ++frame) {
        if (std::next(chunk) != _chunks.end() && frame == std::next(chunk)->firstFrame)
            offset = (++chunk)->offset;
        if (frame >= first) {
            if (ranges.empty() || ranges.back().offset + ranges.back().size != offset)
                ranges.push_back({offset, 0});
            ranges.back().size += _sizes[frame];
        }
        offset += _sizes[frame];
    }
    return ranges;
}

std::string Mp4Movie::decoderConfig() const
{
    const auto nested = [](std::string_view bytes, std::initializer_list<std::string_view> types) {
        std::optional<std::string_view> found = bytes;
        for (const auto type : types)
            found = found ? findBox(*found, type) : std::nullopt;
        return found;
    };
    const auto description = nested(_moov, {"trak", "mdia", "minf", "stbl", "stsd"});
    const auto entry = description && description->size() > 8 ? findBox(description->substr(8), "mp4a") : std::nullopt;
    constexpr size_t FIXED = 28; // of a sound's description, before its boxes
    auto rest = entry && entry->size() > FIXED ? findBox(entry->substr(FIXED), "esds") : std::nullopt;
    if (!rest || rest->size() < 4)
        return {};
    std::string_view bytes = rest->substr(4);
    while (bytes.size() >= 2) {
        const auto tag = static_cast<unsigned char>(bytes[0]);
        size_t size = 0;
        size_t head = 1;
        for (int i = 0; i < 4 && head < bytes.size(); ++i) {
            const auto byte = static_cast<unsigned char>(bytes[head++]);
            size = size << 7 | (byte & 0x7F);
            if ((byte & 0x80) == 0)
                break;
        }
        bytes.remove_prefix(head);
        if (tag == AAC_DESCRIPTOR)
            return std::string(bytes.substr(0, size));
        // The outer descriptors hold the next one behind a few bytes of their own.
        const size_t own = tag == 3 ? 3 : tag == 4 ? 13 : size;
        bytes.remove_prefix(std::min(own, bytes.size()));
    }
    return {};
}

std::optional<Mp4Part> Mp4Movie::part(uint64_t begin, uint64_t end) const
{
    Mp4Part part;
    uint64_t heardFrom = EMPTY_EDIT;
    uint64_t heardTo = 0;
    uint64_t start = 0;
    for (const Mp4Piece& piece : _pieces) {
        const uint64_t from = std::max(begin, start);
        const uint64_t to = std::min(end, start + piece.length);
        if (from < to)
            part.pieces.push_back({piece.isSilence, piece.isSilence ? 0 : piece.from + (from - start), to - from});
        if (from < to && !piece.isSilence) {
            heardFrom = std::min(heardFrom, part.pieces.back().from);
            heardTo = std::max(heardTo, part.pieces.back().from + to - from);
        }
        start += piece.length;
    }
    if (heardFrom == EMPTY_EDIT)
        return {};
    const uint64_t firstHeard = frameAt(heardFrom);
    part.first = firstHeard - std::min(firstHeard, PREROLL_FRAMES);
    // Some players hear nothing of a file whose first heard frame is its last one.
    part.end = std::min(std::max(frameAt(heardTo - 1) + 1, firstHeard + 2), frames());
    for (Mp4Piece& piece : part.pieces)
        piece.from -= piece.isSilence ? 0 : timeOf(part.first);
    return part;
}

std::string Mp4Movie::_tables(const Mp4Part& part, uint64_t dataOffset) const
{
    std::string times;
    uint64_t runs = 0;
    for (size_t i = 0; i < _runs.size(); ++i) {
        const uint64_t runEnd = i + 1 < _runs.size() ? _runs[i + 1].firstFrame : frames();
        const uint64_t from = std::max(part.first, _runs[i].firstFrame);
        const uint64_t to = std::min(part.end, runEnd);
        if (from >= to)
            continue;
        ++runs;
        times += u32(to - from) + u32(_runs[i].delta);
    }
    std::string sizes;
    sizes.reserve(4 * (part.end - part.first));
    for (uint64_t frame = part.first; frame < part.end; ++frame)
        putBigEndian(sizes, _sizes[frame], 4);
    const uint64_t count = part.end - part.first;
    return makeBox("stts", u32(0) + u32(runs) + times) + makeBox("stsc", u32(0) + u32(1) + u32(1) + u32(count) + u32(1))
        + makeBox("stsz", u32(0) + u32(0) + u32(count) + sizes) + makeBox("stco", u32(0) + u32(1) + u32(dataOffset));
}

std::string Mp4Movie::indexOf(const Mp4Part& part, uint64_t dataOffset) const
{
    uint64_t heard = 0;
    for (const Mp4Piece& piece : part.pieces)
        heard += piece.length;
    const uint64_t media = timeOf(part.end) - timeOf(part.first);
    const uint64_t hidden = part.pieces.front().from; // before the first heard sample
    const auto timed = [&](const Mp4Box& box, size_t between, uint64_t duration) {
        auto parsed = TimedBox::parse(box.content, between);
        if (!parsed)
            return std::string(box.whole);
        parsed->duration = duration;
        if (box.type == "mvhd") {
            // GStreamer ends a file when its frames, counted from the hidden ones on, reach the length of the movie.
            parsed->duration += timeOf(frameAt(timeOf(part.first) + hidden)) - timeOf(part.first);
            parsed->between = u32(_scale);
        }
        return parsed->write(box.type);
    };
    const auto stbl = [&](const Mp4Box& box) { return box.type == "stsd" ? std::string(box.whole) : std::string(); };
    const auto minf = [&](const Mp4Box& box) {
        return box.type == "stbl" ? makeBox("stbl", rebuild(box.content, stbl) + _tables(part, dataOffset))
                                  : std::string(box.whole);
    };
    const auto mdia = [&](const Mp4Box& box) {
        if (box.type == "mdhd")
            return timed(box, 4, media);
        return box.type == "minf" ? makeBox("minf", rebuild(box.content, minf)) : std::string(box.whole);
    };
    const auto trak = [&](const Mp4Box& box) {
        if (box.type == "tkhd")
            return timed(box, 8, heard) + editList(part.pieces);
        if (box.type == "edts" || box.type == "tref")
            return std::string();
        return box.type == "mdia" ? makeBox("mdia", rebuild(box.content, mdia)) : std::string(box.whole);
    };
    const auto moov = [&](const Mp4Box& box) {
        if (box.type == "mvhd")
            return timed(box, 4, heard);
        if (box.type == "udta")
            return withoutChapters(box);
        return box.type == "trak" ? makeBox("trak", rebuild(box.content, trak)) : std::string(box.whole);
    };
    return makeBox("moov", rebuild(_moov, moov));
}

}
