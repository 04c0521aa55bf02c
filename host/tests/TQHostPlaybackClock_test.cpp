// The owner-ticked playback clock.
#include <gtest/gtest.h>

#include <cmath>

#include "host/TQHostPlaybackClock.h"

namespace {

constexpr double kTimeTolerance = 1.0 / TQHostPlaybackClock::kTimescale;

class PlaybackClock : public ::testing::Test {
protected:
    void SetUp() override {
        ASSERT_TRUE(clock.setPlayRange(CMTimeRangeMake(CMTimeMake(1, 1), CMTimeMake(2, 1))));
    }
    double seconds() const { return CMTimeGetSeconds(clock.currentTime()); }
    TQHostPlaybackClock clock;
};

TEST_F(PlaybackClock, tick__movesOnlyWhilePlayingAndRefusesBadInput) {
    EXPECT_FALSE(clock.tick(CMTimeMake(1, 2))) << "a stopped clock must not move";
    clock.play();
    EXPECT_NEAR(seconds(), 1.0, kTimeTolerance) << "play starts at the range when outside it";
    EXPECT_TRUE(clock.tick(CMTimeMake(1, 4)));
    EXPECT_NEAR(seconds(), 1.25, kTimeTolerance);
    EXPECT_FALSE(clock.tick(CMTimeMake(-1, 4))) << "negative elapsed time is ignored";
    EXPECT_FALSE(clock.tick(kCMTimeInvalid));
    EXPECT_FALSE(clock.setCurrentTime(kCMTimeInvalid));
    EXPECT_FALSE(clock.setPlayRange(CMTimeRangeMake(kCMTimeZero, kCMTimeZero)));
    EXPECT_FALSE(clock.setPlayRange(CMTimeRangeMake(kCMTimeIndefinite, CMTimeMake(1, 1))));
    EXPECT_NEAR(CMTimeGetSeconds(clock.playRange().duration), 2.0, kTimeTolerance);
    EXPECT_NEAR(seconds(), 1.25, kTimeTolerance);
}

TEST_F(PlaybackClock, tick__loopsExactlyInTheRangeOrRestsOnItsEnd) {
    clock.play();
    for (int i = 0; i < 1000; ++i) clock.tick(CMTimeMake(1, 24));
    // 1000/24 s = 41.666.. s from 1 s, in a 2 s loop: 1 + (41.666.. mod 2) = 2.666..
    EXPECT_NEAR(seconds(), 1.0 + std::fmod(1000.0 / 24.0, 2.0), 1000 * kTimeTolerance);
    clock.setCurrentTime(CMTimeMake(5, 2));
    clock.tick(CMTimeMake(1, 2));
    EXPECT_NEAR(seconds(), 1.0, kTimeTolerance) << "reaching the end exactly wraps to the start";

    clock.setLooping(false);
    clock.tick(CMTimeMake(7, 1));
    EXPECT_NEAR(seconds(), 3.0, kTimeTolerance);
    EXPECT_FALSE(clock.isPlaying());
    clock.play();
    EXPECT_NEAR(seconds(), 1.0, kTimeTolerance) << "playing again starts over";
}

}  // namespace
