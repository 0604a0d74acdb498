#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <vector>

namespace media {

// How loud a recording is along its length: mean amplitudes, 0 to 32767, of stretches of equal length. Their number is
// a multiple of 90, so that they fall evenly into the bars of a picture.
using Loudness = std::vector<uint32_t>;

// Loudness of a known length, summed up from blocks in any order. One thread; several sum up apart and are added.
class LoudnessSum {
public:
    explicit LoudnessSum(uint64_t samples);

    // A block that begins at a sample (what lies outside the length does not count): its amplitudes added up, 0 to 1.
    void add(uint64_t position, double sum, uint64_t count);
    void add(const LoudnessSum& other);
    [[nodiscard]] Loudness result() const;

    static constexpr uint64_t BLOCK = 64; // samples; what is added at a time has no more

private:
    struct Stretch {
        double sum = 0;
        uint64_t count = 0;
    };

    uint64_t _samples;
    std::vector<Stretch> _stretches;
};

// Loudness while the length is not known yet: the stretches grow as the recording does. One thread.
class GrowingLoudness {
public:
    void add(double sum, uint64_t count);
    // Empty when there was too little.
    [[nodiscard]] Loudness result() const;

private:
    static constexpr size_t MOST = 7200;

    std::vector<double> _sums; // of whole stretches
    double _sum = 0;
    uint64_t _count = 0;
    uint64_t _stretch = 512; // samples
};

}
