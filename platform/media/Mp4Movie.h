#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

namespace media {

struct ByteRange {
    uint64_t offset = 0;
    uint64_t size = 0;
};

// A stretch of what is heard: from a place in the media, or silence. Times are units of Mp4Movie::scale().
struct Mp4Piece {
    bool isSilence = false;
    uint64_t from = 0;
    uint64_t length = 0;
};

// A whole part of a movie: frames [first, end) and what of them is heard, counted from the first one.
struct Mp4Part {
    uint64_t first = 0;
    uint64_t end = 0;
    std::vector<Mp4Piece> pieces;
};

// The index of an MP4 file with one sound track: where its frames lie, what of them is heard, and everything else that
// the index holds (names, dates, cover), kept as it is. Built for hostile input.
class Mp4Movie {
public:
    // None when the file is damaged, or of a kind that this does not read: fragments, several tracks, reordered frames.
    static std::optional<Mp4Movie> read(int fd);

    [[nodiscard]] uint32_t scale() const { return _scale; } // units a second
    [[nodiscard]] uint64_t frames() const { return _sizes.size(); }
    [[nodiscard]] uint64_t length() const; // of what is heard
    [[nodiscard]] const std::vector<Mp4Piece>& pieces() const { return _pieces; }
    [[nodiscard]] uint64_t timeOf(uint64_t frame) const;
    [[nodiscard]] uint64_t frameAt(uint64_t time) const;
    // The bytes of frames [first, end), neighbours merged.
    [[nodiscard]] std::vector<ByteRange> bytesOf(uint64_t first, uint64_t end) const;
    [[nodiscard]] uint32_t sizeOf(uint64_t frame) const { return _sizes[frame]; }
    // The decoder's configuration of an AAC track; empty for any other.
    [[nodiscard]] std::string decoderConfig() const;
    // The "ftyp" box.
    [[nodiscard]] const std::string& fileType() const { return _fileType; }

    // None when nothing but silence is heard in that time.
    [[nodiscard]] std::optional<Mp4Part> part(uint64_t begin, uint64_t end) const;
    // The "moov" box of a file that holds the part in one chunk.
    [[nodiscard]] std::string indexOf(const Mp4Part& part, uint64_t dataOffset) const;

private:
    struct Run { // frames of the same duration
        uint64_t firstFrame = 0;
        uint64_t firstTime = 0;
        uint32_t delta = 0;
    };
    struct Chunk {
        uint64_t firstFrame = 0;
        uint64_t offset = 0;
    };
    class Reader;

    [[nodiscard]] std::string _tables(const Mp4Part& part, uint64_t dataOffset) const;

    std::string _fileType;
    std::string _moov; // the content of the box
    uint32_t _scale = 0;
    uint64_t _mediaLength = 0;
    std::vector<uint32_t> _sizes;
    std::vector<Run> _runs;
    std::vector<Chunk> _chunks;
    std::vector<Mp4Piece> _pieces;
};

}
