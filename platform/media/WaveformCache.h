#pragma once

#include "media/Loudness.h"

#include <cstdint>
#include <string>

namespace media {

// What is known of how loud recordings are, in the catalogue: by path, size and time of change, dropped with the
// recording. Any thread; without a catalogue nothing is kept.
Loudness cachedLoudness(const std::string& path);
void cacheLoudness(const std::string& path, const Loudness& loudness);
// What was measured while recording waits for the file to be catalogued, under whatever name; only the last one does.
void rememberLoudness(uint64_t inode, Loudness loudness);

}
