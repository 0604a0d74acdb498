#pragma once

#include <optional>
#include <string>

// The pure rules of the recorder screen's time display.

// "00:07", from an hour on "01:00:07".
std::string mwRecordingTimeText(unsigned int seconds);
// The seconds to show: counting down from the maximum when there is one, else up. Elapsed in milliseconds.
unsigned int mwShownSeconds(unsigned long long elapsed, unsigned int maximum);
// How many seconds fit into a request's size limit (kilobytes); none for a format (MwModel::FORMAT_...) that is
// unknown.
std::optional<int> mwEstimatedSeconds(int sizeLimit, int format);
