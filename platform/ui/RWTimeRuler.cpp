#include "platform/ui/RWTimeRuler.h"

#include <algorithm>
#include <cmath>

namespace {

bool isPositive(const CMTime& t) {
    return CMTIME_IS_NUMERIC(t) && CMTimeCompare(t, kCMTimeZero) > 0;
}

// The steps a crowded ruler tries after its own: 1, 2, 5, 10, 20, 50... times it.
double nextMultiplier(double m) {
    const double decade = std::pow(10.0, std::floor(std::log10(m) + 1e-9));
    const double mantissa = m / decade;
    if (mantissa < 1.5) return 2.0 * decade;
    if (mantissa < 3.5) return 5.0 * decade;
    return 10.0 * decade;
}

}  // namespace

void RWTimeRuler::setDisplayRange(const CMTimeRange& range) {
    _displayRange = range;
    changed();
}

void RWTimeRuler::setCurrentTime(const CMTime& time) {
    if (CMTimeIdentical(time, _currentTime)) return;
    _currentTime = time;
    changed();
}

void RWTimeRuler::setFrameDuration(const CMTime& duration) {
    _frameDuration = duration;
    changed();
}

void RWTimeRuler::setLabelStep(const CMTime& step) {
    _labelStep = step;
    changed();
}

void RWTimeRuler::setLabelFormatter(const RWFormatter* formatter) {
    _labelFormatter = formatter;
    changed();
}

double RWTimeRuler::xForTime(const CMTime& time, double width) const {
    const double duration = CMTimeGetSeconds(_displayRange.duration);
    if (!(duration > 0.0) || !(width > 0.0) || !std::isfinite(duration)) return 0.0;
    return (CMTimeGetSeconds(time) - CMTimeGetSeconds(_displayRange.start)) * width / duration;
}

CMTime RWTimeRuler::timeForX(double x, double width) const {
    const double duration = CMTimeGetSeconds(_displayRange.duration);
    if (!(duration > 0.0) || !(width > 0.0) || !std::isfinite(x) || !std::isfinite(duration))
        return _displayRange.start;
    // Fine enough for the frames of any rate.
    constexpr CMTimeScale kTimescale = 0x40000;
    return BN_CMTimeSaferAdd(_displayRange.start,
                             CMTimeMakeWithSeconds(x * duration / width, kTimescale));
}

std::vector<CMTime> RWTimeRuler::labelTimes(double width, double minSpacing) const {
    std::vector<CMTime> out;
    const double step = CMTimeGetSeconds(_labelStep);
    const double start = CMTimeGetSeconds(_displayRange.start);
    const double duration = CMTimeGetSeconds(_displayRange.duration);
    if (!isPositive(_labelStep) || !(duration > 0.0) || !(width > 0.0) ||
        !std::isfinite(duration) || !std::isfinite(start))
        return out;
    // The smallest multiple of the step that leaves room for a label (a point at least).
    const double room = std::max(minSpacing, 1.0);
    double multiplier = 1.0;
    while (step * multiplier * width / duration < room) multiplier = nextMultiplier(multiplier);
    const CMTime labelStep = _labelStep * multiplier;
    const double every = step * multiplier;
    // Multiples of the step, from the first at or after the range's start.
    const auto first = static_cast<int64_t>(std::ceil(start / every - 1e-9));
    const CMTime end = CMTimeRangeGetEnd(_displayRange);
    for (int64_t k = first;; ++k) {
        const CMTime t = labelStep * static_cast<double>(k);
        if (!CMTIME_IS_NUMERIC(t) || CMTimeCompare(t, end) > 0) break;
        out.push_back(t);
    }
    return out;
}

std::string RWTimeRuler::labelText(const CMTime& time) const {
    const RWObjectValue seconds(CMTimeGetSeconds(time));
    if (_labelFormatter) return _labelFormatter->stringForObjectValue(seconds).value_or("");
    return seconds.stringValue();
}

void RWTimeRuler::userSetTime(double x, double width, bool always) {
    CMTime t = timeForX(x, width);
    if (isPositive(_frameDuration)) t = BN_CMTimeFloorToSampleDuration(t, _frameDuration);
    // Kept on what the ruler shows: the last frame that starts inside the range at most.
    const CMTime end = CMTimeRangeGetEnd(_displayRange);
    if (CMTimeCompare(t, _displayRange.start) < 0) t = _displayRange.start;
    if (CMTimeCompare(t, end) >= 0) {
        t = isPositive(_frameDuration)
                ? BN_CMTimeFloorToSampleDuration(BN_CMTimeSaferSubtract(end, _frameDuration),
                                                 _frameDuration)
                : end;
        if (CMTimeCompare(t, _displayRange.start) < 0) t = _displayRange.start;
    }
    const bool moved = CMTimeCompare(t, _currentTime) != 0;
    _currentTime = t;
    changed();
    if (moved || always) sendAction();
}

void RWTimeRuler::userPress(double x, double width) {
    if (!isEnabled()) return;
    _tracking = true;
    userSetTime(x, width, true);
}

void RWTimeRuler::userDrag(double x, double width) {
    if (!isEnabled() || !_tracking) return;
    userSetTime(x, width, false);
}

void RWTimeRuler::userRelease() {
    if (!_tracking) return;
    _tracking = false;
    changed();
}
