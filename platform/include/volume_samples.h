// How loud a recording is along its length, for a picture of it. Any thread, and only for work of its own: a long
// recording takes a second.
#pragma once

#include <atomic>
#include <cstdint>

typedef struct {
    uint32_t* amplitude_samples; // mean amplitudes of stretches of equal length, 0 to 32767; a multiple of 90
    int sample_size; // bytes
} volume_samples_s;
enum volume_samples_quality_e {
    VOLUME_SAMPLES_COARSE, // a first look at a long recording, in a tenth of the time
    VOLUME_SAMPLES_EXACT,
};

extern "C" {
// 0, or 1 when it fails. The samples are the caller's, to be given back to mw_free_volume_samples. What was read or
// recorded before comes from the catalogue, as long as the file is the same.
int mw_get_volume_samples(const char* path, volume_samples_s** samples);
// The same, until the flag is set; nothing is given then. A coarse look fails where it would not be quicker.
int mw_get_volume_samples_until(
    const char* path, volume_samples_quality_e quality, const std::atomic<bool>* cancelled, volume_samples_s** samples);
int mw_free_volume_samples(volume_samples_s* samples);
}
