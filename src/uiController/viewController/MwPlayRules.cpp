#include "MwPlayRules.h"

#include <algorithm>

#include "MwModel.h"
#include "MwText.h"

namespace {

constexpr unsigned int LONG_RECORDING = 300000; // milliseconds
constexpr double PERIOD = 0.02; // seconds
constexpr double LONG_PERIOD = 0.2;
constexpr unsigned int LAST_WITHOUT_HOURS = 3599999; // milliseconds
constexpr unsigned int SHORTEST_SHOWN = 1000;
constexpr unsigned int HALF_SECOND = 500;
constexpr auto UNTRIMMABLE_EXTENSION = ".3ga";

}

double mwPlayRefreshPeriod(unsigned int duration) { return duration > LONG_RECORDING ? LONG_PERIOD : PERIOD; }

std::string mwPlayTotalText(unsigned int duration) { return MwModel::getLengthText(static_cast<int>(duration)); }

std::string mwPlayPositionText(unsigned int position, unsigned int duration)
{
    return MwModel::getDurationText(position, duration > LAST_WITHOUT_HOURS);
}

double mwPlayRatio(unsigned int position, unsigned int duration)
{
    if (duration == 0)
        return 0.0;
    return std::min(1.0, static_cast<double>(position) / static_cast<double>(duration));
}

unsigned int mwSoughtPosition(unsigned int position, long long step, unsigned int duration)
{
    return static_cast<unsigned int>(
        std::clamp(static_cast<long long>(position) + step, 0LL, static_cast<long long>(duration)));
}

unsigned int mwBookmarkSecond(unsigned int position, unsigned int duration)
{
    const unsigned int rounded = position + HALF_SECOND;
    return (rounded > duration ? position : rounded) / 1000;
}

std::string mwFreeBookmarkName(const std::string& word, const std::vector<std::string>& names)
{
    for (int number = 1;; ++number) {
        std::string name = mwFormat("%s%03d", word.c_str(), number);
        if (std::find(names.begin(), names.end(), name) == names.end())
            return name;
    }
}

bool mwIsTrimmable(const std::string& extension, unsigned int duration)
{
    return extension != UNTRIMMABLE_EXTENSION && duration > SHORTEST_SHOWN;
}
