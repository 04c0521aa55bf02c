#pragma once
// The host's playhead and its playback, without threads: the owner calls tick() with the
// time that passed (from its frame timer), and while playing the playhead advances by it.
//
// Playback runs inside the play range (the display range unless set otherwise). With
// looping on, passing the end wraps to the start, keeping the overshoot; with looping off
// playback stops on the range's end. A playhead outside the range when play() starts jumps to the
// range's start. Arithmetic is exact in the channel timescale, so that a thousand ticks of
// 1/24 s land where one tick of 1000/24 s lands.

#include "platform/media/CMTime.h"

class TQHostPlaybackClock {
public:
    // The timescale of every time the clock computes.
    static constexpr CMTimeScale kTimescale = 0x40000;

    TQHostPlaybackClock();

    const CMTime& currentTime() const { return _currentTime; }
    // A non-numeric time is refused: the playhead stays where it is.
    bool setCurrentTime(const CMTime& time);

    const CMTimeRange& playRange() const { return _playRange; }
    // A range whose start is not numeric or whose duration is not a positive numeric time is
    // refused. The playhead is not moved.
    bool setPlayRange(const CMTimeRange& range);

    bool isLooping() const { return _looping; }
    void setLooping(bool looping) { _looping = looping; }

    bool isPlaying() const { return _playing; }
    void play();
    void stop() { _playing = false; }

    // Advances the playhead by `elapsed` while playing. Answers whether the playhead moved.
    // A negative or non-numeric elapsed time is ignored.
    bool tick(const CMTime& elapsed);

private:
    CMTime _currentTime;
    CMTimeRange _playRange;
    bool _looping = true;
    bool _playing = false;
};
