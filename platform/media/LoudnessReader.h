#pragma once

#include "media/Loudness.h"

#include <atomic>
#include <string>

namespace media {

enum class LoudnessQuality {
    COARSE, // from a tenth of a long recording
    EXACT
};

// Decodes a recording to tell how loud it is, on the calling thread and a second one. Empty when it cannot be decoded
// or was cancelled, which is looked at with every frame.
Loudness readLoudness(const std::string& path, LoudnessQuality quality, const std::atomic<bool>& cancelled);

}
