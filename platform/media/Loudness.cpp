#include "media/Loudness.h"

#include <algorithm>
#include <cmath>

namespace media {

namespace {

    constexpr size_t COARSE = 90;
    constexpr size_t FINE = 900;
    constexpr double FULL_SCALE = 32767;

    uint32_t amplitude(double sum, uint64_t count)
    {
        if (count == 0)
            return 0;
        return static_cast<uint32_t>(std::lround(std::clamp(sum / static_cast<double>(count), 0.0, 1.0) * FULL_SCALE));
    }

}

LoudnessSum::LoudnessSum(uint64_t samples)
    : _samples(std::max<uint64_t>(1, samples))
    , _stretches(samples >= FINE * BLOCK ? FINE : COARSE)
{
}

void LoudnessSum::add(uint64_t position, double sum, uint64_t count)
{
    if (position >= _samples)
        return;
    Stretch& stretch = _stretches[position * _stretches.size() / _samples];
    stretch.sum += sum;
    stretch.count += count;
}

void LoudnessSum::add(const LoudnessSum& other)
{
    for (size_t i = 0; i < _stretches.size(); ++i) {
        _stretches[i].sum += other._stretches[i].sum;
        _stretches[i].count += other._stretches[i].count;
    }
}

Loudness LoudnessSum::result() const
{
    Loudness loudness;
    for (const Stretch& stretch : _stretches)
        loudness.push_back(amplitude(stretch.sum, stretch.count));
    return loudness;
}

void GrowingLoudness::add(double sum, uint64_t count)
{
    _sum += sum;
    _count += count;
    if (_count < _stretch)
        return;
    // Blocks are short beside a stretch: what one has too much, the next has too little.
    _sums.push_back(_sum / static_cast<double>(_count));
    _sum = 0;
    _count = 0;
    if (_sums.size() < MOST)
        return;
    for (size_t i = 0; i < MOST / 2; ++i)
        _sums[i] = (_sums[2 * i] + _sums[2 * i + 1]) / 2;
    _sums.resize(MOST / 2);
    _stretch *= 2;
}

Loudness GrowingLoudness::result() const
{
    if (_sums.size() < COARSE)
        return {};
    const size_t size = _sums.size() >= FINE ? FINE : COARSE;
    std::vector<double> sums(size);
    std::vector<uint64_t> counts(size);
    for (size_t i = 0; i < _sums.size(); ++i) {
        sums[i * size / _sums.size()] += _sums[i];
        ++counts[i * size / _sums.size()];
    }
    Loudness loudness;
    for (size_t i = 0; i < size; ++i)
        loudness.push_back(amplitude(sums[i], counts[i]));
    return loudness;
}

}
