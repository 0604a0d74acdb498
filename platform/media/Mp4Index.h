#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <string>

namespace media {

// What the index of an MP4 file with one AAC track has to tell. The frames lie one behind the other from
// MP4_DATA_START.
struct Mp4Track {
    uint32_t sampleRate = 0;
    uint16_t channels = 0;
    uint32_t bitRate = 0;
    std::string decoderConfig; // the AudioSpecificConfig
};

// By the number that stands for them in a stream.
inline constexpr std::array<uint32_t, 13> AAC_RATES
    = {96000, 88200, 64000, 48000, 44100, 32000, 24000, 22050, 16000, 12000, 11025, 8000, 7350};
constexpr size_t MP4_DATA_START = 48;
constexpr uint32_t AAC_FRAME_SAMPLES = 1024;
constexpr uint32_t AAC_PRIMING_SAMPLES = 1600; // that our encoder puts before the sound
constexpr uint64_t MP4_UNFINISHED = ~uint64_t{0};

// The two bytes that tell a decoder an AAC low-complexity stream's rate and channels.
std::string aacDecoderConfig(uint32_t sampleRate, uint16_t channels);
// The first MP4_DATA_START bytes. Takes the 64-bit form above 4 GiB; MP4_UNFINISHED while the size is unknown.
std::string mp4FileHead(uint64_t dataBytes);
// The sound in that many frames.
uint64_t aacSamples(uint64_t frames);
// The "moov" box up to its last table, whose `frames` 32-bit big-endian frame sizes have to follow. All
// frames are one chunk at the beginning of the data, so that its place never needs more than 32 bits. An edit list
// shows that many samples of sound and hides what the encoder put before and behind them.
std::string mp4IndexHead(const Mp4Track& track, uint64_t frames, uint64_t samples);
// An upper bound of head, frames and index together.
uint64_t mp4FileSize(uint64_t frames, uint64_t dataBytes);

}
