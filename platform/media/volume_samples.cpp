#include <volume_samples.h>

#include <cstdlib>
#include <cstring>

#include "media/LoudnessReader.h"
#include "media/WaveformCache.h"

namespace {

constexpr int DONE = 0;
constexpr int FAILED = 1;

volume_samples_s* copyOf(const media::Loudness& loudness)
{
    const size_t size = loudness.size() * sizeof(uint32_t);
    auto* samples = static_cast<volume_samples_s*>(std::malloc(sizeof(volume_samples_s)));
    auto* values = static_cast<uint32_t*>(std::malloc(size));
    if (samples == nullptr || values == nullptr) {
        std::free(samples);
        std::free(values);
        return nullptr;
    }
    std::memcpy(values, loudness.data(), size);
    *samples = {values, static_cast<int>(size)};
    return samples;
}

}

extern "C" {

int mw_get_volume_samples(const char* path, volume_samples_s** samples)
{
    const std::atomic<bool> never = false;
    return mw_get_volume_samples_until(path, VOLUME_SAMPLES_EXACT, &never, samples);
}

int mw_get_volume_samples_until(
    const char* path, volume_samples_quality_e quality, const std::atomic<bool>* cancelled, volume_samples_s** samples)
{
    if (path == nullptr || cancelled == nullptr || samples == nullptr)
        return FAILED;
    *samples = nullptr;
    media::Loudness loudness = media::cachedLoudness(path);
    if (loudness.empty() && quality == VOLUME_SAMPLES_COARSE) {
        loudness = media::readLoudness(path, media::LoudnessQuality::COARSE, *cancelled);
    } else if (loudness.empty()) {
        loudness = media::readLoudness(path, media::LoudnessQuality::EXACT, *cancelled);
        if (!loudness.empty())
            media::cacheLoudness(path, loudness);
    }
    if (loudness.empty() || *cancelled)
        return FAILED;
    *samples = copyOf(loudness);
    return *samples != nullptr ? DONE : FAILED;
}

int mw_free_volume_samples(volume_samples_s* samples)
{
    if (samples == nullptr)
        return FAILED;
    std::free(samples->amplitude_samples);
    std::free(samples);
    return DONE;
}
}
