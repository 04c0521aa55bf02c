#include "platform/ui/RWExtendedTimecode.h"

#include <cmath>
#include <limits>

namespace {

// Products of a time's value and the other's timescale need more than 64 bits.
__extension__ typedef __int128 Wide;

constexpr uint64_t kSecondsPerMinute = 60;
constexpr uint64_t kMinutesPerHour = 60;
// Drop-frame counting skips frame numbers in nine minutes of every ten.
constexpr uint64_t kMinutesPerDropCycle = 10;
// How close a frame duration must be to a rate of 1000/1001 times a multiple of 30.
constexpr double kDropRateTolerance = 1e-4;

bool isPositiveDuration(const CMTime& duration) {
    return CMTIME_IS_NUMERIC(duration) && duration.value > 0;
}

// Frame numbers skipped at the start of each minute: two per 30 frames of nominal rate.
uint64_t droppedPerMinute(uint32_t framesPerSecond) { return framesPerSecond / 15; }

Wide floorDivide(Wide numerator, Wide denominator) {
    Wide quotient = numerator / denominator;
    if (numerator % denominator != 0 && (numerator < 0) != (denominator < 0)) --quotient;
    return quotient;
}

bool fitsInt64(Wide value) {
    return value >= std::numeric_limits<int64_t>::min() &&
           value <= std::numeric_limits<int64_t>::max();
}

}  // namespace

uint32_t RWExtendedTimecode::nominalFramesPerSecond(const CMTime& frameDuration) {
    if (!isPositiveDuration(frameDuration)) return 0;
    const Wide rounded =
        (Wide(frameDuration.timescale) + frameDuration.value / 2) / frameDuration.value;
    return rounded < 1 ? 1 : static_cast<uint32_t>(rounded);
}

bool RWExtendedTimecode::hasDropFrame(const CMTime& frameDuration) {
    const uint32_t fps = nominalFramesPerSecond(frameDuration);
    if (fps == 0 || fps % 30 != 0) return false;
    const double ratio = static_cast<double>(frameDuration.value) * fps * 1000.0 /
                         (static_cast<double>(frameDuration.timescale) * 1001.0);
    return std::fabs(ratio - 1.0) < kDropRateTolerance;
}

RWExtendedTimecode::RWExtendedTimecode(const CMTime& time, const CMTime& frameDuration,
                                       bool dropFrame)
    : _time(time), _frameDuration(frameDuration) {
    if (!CMTIME_IS_NUMERIC(time) || !isPositiveDuration(frameDuration)) return;
    const Wide frame = floorDivide(Wide(time.value) * frameDuration.timescale,
                                   Wide(time.timescale) * frameDuration.value);
    if (!fitsInt64(frame)) return;
    _valid = true;
    _dropFrame = dropFrame && hasDropFrame(frameDuration);
    _framesPerSecond = nominalFramesPerSecond(frameDuration);
    setFrameNumber(static_cast<int64_t>(frame));
}

RWExtendedTimecode RWExtendedTimecode::withFrameNumber(int64_t frameNumber,
                                                       const CMTime& frameDuration,
                                                       bool dropFrame) {
    if (!isPositiveDuration(frameDuration)) return {};
    const Wide value = Wide(frameNumber) * frameDuration.value;
    if (!fitsInt64(value)) return {};
    return RWExtendedTimecode(
        CMTime{static_cast<int64_t>(value), frameDuration.timescale, kCMTimeFlags_Valid, 0},
        frameDuration, dropFrame);
}

std::optional<RWExtendedTimecode> RWExtendedTimecode::withFields(bool negative, uint32_t hours,
                                                                 uint32_t minutes, uint32_t seconds,
                                                                 uint32_t frames,
                                                                 const CMTime& frameDuration,
                                                                 bool dropFrame) {
    const uint32_t fps = nominalFramesPerSecond(frameDuration);
    if (fps == 0 || frames >= fps || seconds >= kSecondsPerMinute || minutes >= kMinutesPerHour)
        return std::nullopt;
    const bool drop = dropFrame && hasDropFrame(frameDuration);
    const uint64_t dropped = droppedPerMinute(fps);
    if (drop && seconds == 0 && frames < dropped && minutes % kMinutesPerDropCycle != 0)
        return std::nullopt;  // a number the counting skips
    const Wide totalMinutes = Wide(hours) * kMinutesPerHour + minutes;
    Wide frame = (totalMinutes * kSecondsPerMinute + seconds) * fps + frames;
    if (drop) frame -= Wide(dropped) * (totalMinutes - totalMinutes / kMinutesPerDropCycle);
    if (negative) frame = -frame;
    if (!fitsInt64(frame)) return std::nullopt;
    RWExtendedTimecode timecode = withFrameNumber(static_cast<int64_t>(frame), frameDuration, drop);
    if (!timecode.isValid()) return std::nullopt;
    return timecode;
}

void RWExtendedTimecode::setFrameNumber(int64_t frameNumber) {
    _frameNumber = frameNumber;
    // The magnitude, which the minimum of int64 also has in 64 unsigned bits.
    uint64_t n = frameNumber < 0 ? 0 - static_cast<uint64_t>(frameNumber)
                                 : static_cast<uint64_t>(frameNumber);
    const uint64_t fps = _framesPerSecond;
    if (_dropFrame) {
        // Put back the numbers skipped so far, then split as plain counting does.
        const uint64_t dropped = droppedPerMinute(_framesPerSecond);
        const uint64_t perMinute = fps * kSecondsPerMinute - dropped;
        const uint64_t perCycle =
            fps * kSecondsPerMinute * kMinutesPerDropCycle - dropped * (kMinutesPerDropCycle - 1);
        const uint64_t cycles = n / perCycle;
        const uint64_t rest = n % perCycle;
        n += dropped * (kMinutesPerDropCycle - 1) * cycles;
        if (rest > dropped) n += dropped * ((rest - dropped) / perMinute);
    }
    _frames = static_cast<uint32_t>(n % fps);
    _seconds = static_cast<uint32_t>((n / fps) % kSecondsPerMinute);
    _minutes = static_cast<uint32_t>((n / (fps * kSecondsPerMinute)) % kMinutesPerHour);
    _hours = n / (fps * kSecondsPerMinute * kMinutesPerHour);
}
