#pragma once
// An SMPTE timecode: a time on a frame grid, counted as hours, minutes, seconds and frames.
//
// Frames. The grid is whole multiples of the frame duration from time zero; a time belongs to
// the frame that starts at or before it, also below zero (-1/60 s at 30 fps is frame -1).
// Negative frame numbers show as the timecode of their magnitude with a minus sign.
//
// Rate. The nominal rate is the frame rate rounded to a whole number: 30 for 29.97 (a frame
// duration of 1001/30000 s), 24 for 23.976, 60 for 59.94. Rates below one frame a second
// count as one. Frames run from 0 to the nominal rate less one.
//
// Drop frame. At the rates of 1000/1001 times a multiple of 30 (29.97, 59.94), drop-frame
// counting keeps the timecode in step with the clock: at the start of every minute except each
// tenth, the first frame numbers (two at 29.97, four at 59.94) are skipped, so 00:00:59;29 is
// followed by 00:01:00;02, while 00:10:00;00 exists. Asked for at any other rate, counting
// stays non-drop. A frame duration counts as such a rate when it is within 1e-4 of it, so that
// 100/2997 s is 29.97 as well as 1001/30000 s.
//
// Hours are not wrapped at 24. A small value type.

#include <cstdint>
#include <optional>

#include "platform/media/CMTime.h"

class RWExtendedTimecode {
public:
    // Invalid.
    RWExtendedTimecode() = default;
    // The frame of `time`. Invalid unless the time is numeric and the frame duration a
    // positive numeric time.
    RWExtendedTimecode(const CMTime& time, const CMTime& frameDuration, bool dropFrame);
    // The frame with this number (negative before time zero); its time is its start.
    static RWExtendedTimecode withFrameNumber(int64_t frameNumber, const CMTime& frameDuration,
                                              bool dropFrame);
    // The frame these fields name, or nothing when they name none at the rate: a field out
    // of its range (frames from the nominal rate on, seconds or minutes from 60 on), a frame
    // number that drop-frame counting skips, or an invalid frame duration.
    static std::optional<RWExtendedTimecode> withFields(bool negative, uint32_t hours,
                                                        uint32_t minutes, uint32_t seconds,
                                                        uint32_t frames,
                                                        const CMTime& frameDuration,
                                                        bool dropFrame);

    bool isValid() const { return _valid; }
    // The time it was made from; for one made from a frame number or fields, the frame's
    // start.
    const CMTime& time() const { return _time; }
    const CMTime& frameDuration() const { return _frameDuration; }
    // Drop-frame counting in force: asked for, at a rate that has it.
    bool isDropFrame() const { return _dropFrame; }
    uint32_t framesPerSecond() const { return _framesPerSecond; }
    int64_t frameNumber() const { return _frameNumber; }
    bool isNegative() const { return _frameNumber < 0; }

    // The fields of the frame number's magnitude.
    uint64_t hours() const { return _hours; }
    uint32_t minutes() const { return _minutes; }
    uint32_t seconds() const { return _seconds; }
    uint32_t frames() const { return _frames; }

    // The nominal rate of a frame duration (0 for one that is not a positive numeric time).
    static uint32_t nominalFramesPerSecond(const CMTime& frameDuration);
    // Whether drop-frame counting exists at the rate of this frame duration.
    static bool hasDropFrame(const CMTime& frameDuration);

private:
    void setFrameNumber(int64_t frameNumber);

    bool _valid = false;
    CMTime _time = kCMTimeInvalid;
    CMTime _frameDuration = kCMTimeInvalid;
    bool _dropFrame = false;
    uint32_t _framesPerSecond = 0;
    int64_t _frameNumber = 0;
    uint64_t _hours = 0;
    uint32_t _minutes = 0;
    uint32_t _seconds = 0;
    uint32_t _frames = 0;
};
