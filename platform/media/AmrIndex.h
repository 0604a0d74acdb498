#pragma once

#include <array>
#include <cstdint>
#include <optional>
#include <string>
#include <vector>

namespace media {

// Where the frames of an AMR file lie, narrow or wide band. A torn last frame is left out.
class AmrIndex {
public:
    static constexpr unsigned int FRAME_MS = 20;

    // None when the file is none, or damaged before its last frame.
    static std::optional<AmrIndex> read(int fd);

    [[nodiscard]] bool isWideBand() const { return _isWideBand; }
    // What the file begins with.
    [[nodiscard]] std::string head() const;
    [[nodiscard]] uint64_t frames() const { return _frames; }
    // Where a frame begins; for frames() the end of the last one.
    [[nodiscard]] uint64_t offsetOf(int fd, uint64_t frame) const;
    // The bytes of a frame with its head; 0 for what cannot be the head of one.
    static size_t frameSize(unsigned char head, bool isWideBand);

private:
    static constexpr uint64_t STRIDE = 512; // frames from one kept place to the next

    bool _isWideBand = false;
    uint64_t _frames = 0;
    uint64_t _end = 0;
    std::vector<uint64_t> _places;
};

}
