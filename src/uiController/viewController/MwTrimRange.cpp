#include "MwTrimRange.h"

#include <algorithm>
#include <cmath>

namespace {

// How far beside a bar a finger still takes it, in widths of the bar: together 9 mm at least.
constexpr double SIDE_REACH = 4;
constexpr double PLAY_REACH = 14;
constexpr double FINE_ENOUGH = 20; // milliseconds a pixel
constexpr double SLOW = 2; // side bars a second
constexpr double SLOW_STEP = 0.2;
constexpr double FINEST_STEP = 0.02;

}

MwTrimRange::MwTrimRange(unsigned int duration)
    : _duration(duration)
    , _trimEnd(duration)
{
}

double MwTrimRange::_timeOf(double pixels) const
{
    return _geometry.waveform > 0 ? pixels / _geometry.waveform * _duration : 0;
}

double MwTrimRange::getStartX() const { return _duration > 0 ? _geometry.waveform * _trimBegin / _duration : 0; }

double MwTrimRange::getEndX() const
{
    return _geometry.sideBar + (_duration > 0 ? _geometry.waveform * _trimEnd / _duration : _geometry.waveform);
}

double MwTrimRange::getPlayX(unsigned int position) const
{
    const double place = _duration > 0 ? position * _geometry.waveform / _duration : 0;
    const double raised = std::max(std::floor(place + _geometry.sideBar + 0.5), getStartX() + _geometry.sideBar);
    return std::min(raised, getEndX() - _geometry.playBar);
}

MwTrimRange::Press MwTrimRange::press(double x, unsigned int position) const
{
    const double toStart = std::abs(x - std::floor(_geometry.sideBar / 2) - getStartX());
    const double toEnd = std::abs(x - std::floor(_geometry.sideBar / 2) - getEndX());
    const double toPlay = std::abs(x - std::floor(_geometry.playBar / 2) - getPlayX(position));
    const bool isEndNearer = toEnd < toStart;
    const auto reaches = [x](double bar, double width, double reach) {
        return x - bar >= -reach * width && x - bar <= (reach + 1) * width;
    };
    if (std::min(toStart, toEnd) <= toPlay) {
        if (!reaches(isEndNearer ? getEndX() : getStartX(), _geometry.sideBar, SIDE_REACH))
            return NONE;
        return isEndNearer ? END_TRIM_BAR_PRESSED : START_TRIM_BAR_PRESSED;
    }
    return reaches(getPlayX(position), _geometry.playBar, PLAY_REACH) ? PLAY_POSITION_BAR_PRESSED : NONE;
}

void MwTrimRange::moveStart(double pixels)
{
    if (_duration == 0 || _geometry.waveform <= 0)
        return;
    const double second = _geometry.waveform * SHORTEST / _duration;
    const double room = getEndX() - _geometry.sideBar;
    const double limit = std::min(room - second, room - _geometry.playBar);
    const double place = std::max(0.0, std::min(getStartX() + pixels, limit));
    _trimBegin = static_cast<unsigned int>(std::lround(_timeOf(place)));
}

void MwTrimRange::moveEnd(double pixels)
{
    if (_duration == 0 || _geometry.waveform <= 0)
        return;
    const double second = _geometry.waveform * SHORTEST / _duration;
    const double last = _geometry.sideBar + _geometry.waveform;
    const double limit
        = std::max(_geometry.sideBar + getStartX() + second, getStartX() + _geometry.playBar + _geometry.sideBar);
    const double place = std::min(last, std::max(getEndX() + pixels, limit));
    const auto time = static_cast<unsigned int>(std::lround(_timeOf(place - _geometry.sideBar)));
    _trimEnd = place >= last ? _duration : std::max(time, SHORTEST);
}

unsigned int MwTrimRange::movePlay(unsigned int position, double pixels) const
{
    const double place = std::max(0.0, getPlayX(position) + pixels);
    if (place < getStartX() + _geometry.sideBar)
        return _trimBegin;
    if (place >= getEndX() - _geometry.playBar)
        return _trimEnd;
    return confine(std::lround(_timeOf(place - _geometry.sideBar)));
}

void MwTrimRange::setBegin(long long time)
{
    const long long limit = std::max<long long>(0, static_cast<long long>(_trimEnd) - SHORTEST);
    _trimBegin = static_cast<unsigned int>(std::clamp(time, 0LL, limit));
}

void MwTrimRange::setEnd(long long time)
{
    const auto last = static_cast<long long>(_duration);
    _trimEnd = static_cast<unsigned int>(
        std::clamp(time, std::min<long long>(static_cast<long long>(_trimBegin) + SHORTEST, last), last));
}

unsigned int MwTrimRange::confine(long long position) const
{
    return static_cast<unsigned int>(
        std::clamp(position, static_cast<long long>(_trimBegin), static_cast<long long>(_trimEnd)));
}

double MwTrimRange::stepOf(double away, double speed) const
{
    const double aPixel = _timeOf(1);
    if (aPixel <= FINE_ENOUGH)
        return 1;
    double step = 1 / (1 + std::max(0.0, away) / (_geometry.sideBar * 2));
    if (speed < SLOW * _geometry.sideBar)
        step = std::min(step, SLOW_STEP);
    return std::max({step, FINEST_STEP, std::min(1.0, FINE_ENOUGH / 4 / aPixel)});
}
