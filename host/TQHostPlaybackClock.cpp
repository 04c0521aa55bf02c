#include "host/TQHostPlaybackClock.h"

namespace {

// Value in kTimescale units; the caller has checked that the time is numeric.
CMTimeValue ticksOf(const CMTime& time) {
    return CMTimeConvertScale(time, TQHostPlaybackClock::kTimescale).value;
}

CMTime timeOfTicks(CMTimeValue ticks) { return CMTimeMake(ticks, TQHostPlaybackClock::kTimescale); }

}  // namespace

TQHostPlaybackClock::TQHostPlaybackClock()
    : _currentTime(kCMTimeZero), _playRange(CMTimeRangeMake(kCMTimeZero, CMTimeMake(10, 1))) {}

bool TQHostPlaybackClock::setCurrentTime(const CMTime& time) {
    if (!CMTIME_IS_NUMERIC(time)) return false;
    _currentTime = time;
    return true;
}

bool TQHostPlaybackClock::setPlayRange(const CMTimeRange& range) {
    if (!CMTIME_IS_NUMERIC(range.start) || !CMTIME_IS_NUMERIC(range.duration) ||
        CMTimeCompare(range.duration, kCMTimeZero) <= 0)
        return false;
    _playRange = range;
    return true;
}

void TQHostPlaybackClock::play() {
    if (!CMTimeRangeContainsTime(_playRange, _currentTime)) _currentTime = _playRange.start;
    _playing = true;
}

bool TQHostPlaybackClock::tick(const CMTime& elapsed) {
    if (!_playing || !CMTIME_IS_NUMERIC(elapsed) || CMTimeCompare(elapsed, kCMTimeZero) < 0)
        return false;

    const CMTimeValue start = ticksOf(_playRange.start);
    const CMTimeValue duration = ticksOf(_playRange.duration);
    if (duration <= 0) {
        // A range shorter than one tick of the timescale: nothing to play through.
        _playing = false;
        return false;
    }
    // Offset into the range; a playhead moved outside it meanwhile starts over at the start.
    CMTimeValue offset = ticksOf(_currentTime) - start;
    if (offset < 0 || offset >= duration) offset = 0;
    const CMTime step = CMTimeConvertScale(elapsed, kTimescale);
    if (!CMTIME_IS_NUMERIC(step)) return false;  // beyond 64 bits of ticks
    // Written so that no sum can overflow, whatever the sizes of the range and the step.
    const CMTimeValue untilEnd = duration - offset;
    if (step.value < untilEnd) {
        offset += step.value;
    } else if (_looping) {
        offset = (step.value - untilEnd) % duration;
    } else {
        // Rest on the end; the next play() starts over from the range's start.
        offset = duration;
        _playing = false;
    }
    const CMTime next = timeOfTicks(start + offset);
    const bool moved = CMTimeCompare(next, _currentTime) != 0;
    _currentTime = next;
    return moved;
}
