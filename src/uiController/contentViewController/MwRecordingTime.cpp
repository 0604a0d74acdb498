#include "MwRecordingTime.h"

#include "MwModel.h"

namespace {

constexpr double BYTES_PER_KILOBYTE = 1024.0;
constexpr double HEADER_BYTES = 6.0;
constexpr double FRAMES_PER_BYTE = 0.03125;
constexpr int FRAMES_PER_SECOND = 50;
// How many times more room a second takes in the better format.
constexpr int MP4_FACTOR = 23;

}

std::string mwRecordingTimeText(unsigned int seconds) { return MwModel::getDurationText(seconds * 1000, false); }

unsigned int mwShownSeconds(unsigned long long elapsed, unsigned int maximum)
{
    const auto seconds = static_cast<unsigned int>(elapsed / 1000);
    if (maximum == 0)
        return seconds;
    // The recorder may run a moment past its limit before it reports it.
    return seconds < maximum ? maximum - seconds : 0;
}

std::optional<int> mwEstimatedSeconds(int sizeLimit, int format)
{
    const auto frames = static_cast<int>((sizeLimit * BYTES_PER_KILOBYTE - HEADER_BYTES) * FRAMES_PER_BYTE);
    const int seconds = frames / FRAMES_PER_SECOND;
    if (format == MwModel::FORMAT_AMR)
        return seconds;
    if (format == MwModel::FORMAT_MP4)
        return seconds / MP4_FACTOR;
    return std::nullopt;
}
