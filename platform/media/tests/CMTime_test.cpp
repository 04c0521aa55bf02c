#include "platform/media/CMTime.h"

#include <gtest/gtest.h>

#include <cmath>
#include <limits>

namespace {

constexpr int kChannelTimescale = 0x40000;  // the timescale of every channel time
constexpr double kSecondsTol = 1e-12;
constexpr CMTimeValue kMaxValue = std::numeric_limits<CMTimeValue>::max();
constexpr CMTimeValue kMinValue = std::numeric_limits<CMTimeValue>::min();

bool rounded(const CMTime& t) { return (t.flags & kCMTimeFlags_HasBeenRounded) != 0; }

::testing::AssertionResult isTime(const CMTime& t, CMTimeValue value, CMTimeScale timescale) {
    if (CMTIME_IS_NUMERIC(t) && t.value == value && t.timescale == timescale)
        return ::testing::AssertionSuccess();
    return ::testing::AssertionFailure()
           << "got value " << t.value << " timescale " << t.timescale << " flags " << t.flags
           << ", expected " << value << "/" << timescale;
}

const CMTime kTwo = CMTimeMake(2, 1);

}  // namespace

class CMTimeArithmetic : public ::testing::Test {};

TEST_F(CMTimeArithmetic, add__mixedTimescalesExactViaLcm) {
    {
        const CMTime sum = CMTimeAdd(CMTimeMake(1, 3), CMTimeMake(1, 4));
        EXPECT_TRUE(isTime(sum, 7, 12)) << "1/3 + 1/4 in the common timescale 12";
        EXPECT_FALSE(rounded(sum));
    }
    {
        // A channel time and a 30000/1001 frame: lcm 0x40000 * 1875 fits in 32 bits.
        const CMTime frame = CMTimeMake(1001, 30000);
        const CMTime t = CMTimeMake(kChannelTimescale, kChannelTimescale);
        const CMTime diff = CMTimeSubtract(t, frame);
        EXPECT_FALSE(rounded(diff)) << "exact while the lcm fits";
        EXPECT_EQ(CMTimeCompare(CMTimeAdd(diff, frame), t), 0)
            << "subtract then add must give the time back";
    }
}

TEST_F(CMTimeArithmetic, add__lcmBeyond32BitsRoundsToFinerTimescale) {
    const CMTime a = CMTimeMake(1, kChannelTimescale);
    const CMTime b = CMTimeMake(1, 1000000007);  // prime: lcm = 0x40000 * 1000000007
    const CMTime sum = CMTimeAdd(a, b);
    // 1/262144 s is 3814.697 units of the finer scale, rounded to 3815.
    EXPECT_TRUE(isTime(sum, 3816, 1000000007)) << "rounded into the larger timescale";
    EXPECT_TRUE(rounded(sum)) << "an inexact sum must say so";
    EXPECT_NEAR(CMTimeGetSeconds(sum), 1.0 / kChannelTimescale + 1.0 / 1000000007, 1e-9);

    const CMTime exact = CMTimeAdd(CMTimeMake(kChannelTimescale, kChannelTimescale), b);
    EXPECT_TRUE(isTime(exact, 1000000008, 1000000007));
    EXPECT_FALSE(rounded(exact)) << "whole seconds convert exactly even when the lcm does not fit";

    const CMTime carried = CMTimeAdd(sum, CMTimeMake(0, 1000000007));
    EXPECT_TRUE(rounded(carried)) << "the rounded flag survives later arithmetic";
}

TEST_F(CMTimeArithmetic, add__overflowSaturatesToInfinity) {
    EXPECT_TRUE(CMTIME_IS_POSITIVE_INFINITY(CMTimeAdd(CMTimeMake(kMaxValue, 1), CMTimeMake(1, 1))));
    EXPECT_TRUE(
        CMTIME_IS_NEGATIVE_INFINITY(CMTimeSubtract(CMTimeMake(kMinValue, 1), CMTimeMake(1, 1))));
    EXPECT_TRUE(CMTIME_IS_POSITIVE_INFINITY(CMTimeMultiply(CMTimeMake(kMaxValue / 2 + 1, 1), 2)));
    EXPECT_TRUE(CMTIME_IS_NEGATIVE_INFINITY(CMTimeMultiply(CMTimeMake(kMaxValue, 1), -3)));
    EXPECT_TRUE(CMTIME_IS_POSITIVE_INFINITY(CMTimeAbsoluteValue(CMTimeMake(kMinValue, 1))))
        << "|INT64_MIN| does not fit";
    // Reducing by the gcd keeps a sum that fits in a coarser timescale finite.
    const CMTime reduced = CMTimeAdd(CMTimeMake(kMaxValue - 1, 2), CMTimeMake(kMaxValue - 1, 2));
    EXPECT_TRUE(isTime(reduced, kMaxValue - 1, 1));
}

TEST_F(CMTimeArithmetic, add__nonNumericOperands) {
    const CMTime five = CMTimeMake(5, 1);
    struct Case {
        const char* name;
        CMTime result;
        bool (*is)(const CMTime&);
    } cases[] = {
        {"+inf + 5", CMTimeAdd(kCMTimePositiveInfinity, five), CMTIME_IS_POSITIVE_INFINITY},
        {"5 - +inf", CMTimeSubtract(five, kCMTimePositiveInfinity), CMTIME_IS_NEGATIVE_INFINITY},
        {"-inf - +inf", CMTimeSubtract(kCMTimeNegativeInfinity, kCMTimePositiveInfinity),
         CMTIME_IS_NEGATIVE_INFINITY},
        {"+inf + -inf", CMTimeAdd(kCMTimePositiveInfinity, kCMTimeNegativeInfinity),
         CMTIME_IS_INDEFINITE},
        {"+inf - +inf", CMTimeSubtract(kCMTimePositiveInfinity, kCMTimePositiveInfinity),
         CMTIME_IS_INDEFINITE},
        {"indefinite + 5", CMTimeAdd(kCMTimeIndefinite, five), CMTIME_IS_INDEFINITE},
        {"indefinite + +inf", CMTimeAdd(kCMTimeIndefinite, kCMTimePositiveInfinity),
         CMTIME_IS_INDEFINITE},
        {"invalid + +inf", CMTimeAdd(kCMTimeInvalid, kCMTimePositiveInfinity), CMTIME_IS_INVALID},
        {"indefinite - invalid", CMTimeSubtract(kCMTimeIndefinite, kCMTimeInvalid),
         CMTIME_IS_INVALID},
        {"5 + zero-timescale time", CMTimeAdd(five, CMTime{1, 0, kCMTimeFlags_Valid, 0}),
         CMTIME_IS_INVALID},
    };
    for (const Case& c : cases)
        EXPECT_TRUE(c.is(c.result)) << c.name << " gave flags " << c.result.flags;
}

TEST_F(CMTimeArithmetic, compareAndSeconds__totalOrderOverKinds) {
    const CMTime ordered[] = {
        kCMTimeNegativeInfinity, CMTimeMake(kMinValue, 1), CMTimeMake(-1, 3), CMTimeMake(0, 7),
        CMTimeMake(1, 3),        kCMTimePositiveInfinity,  kCMTimeIndefinite, kCMTimeInvalid};
    const int n = static_cast<int>(std::size(ordered));
    for (int i = 0; i < n; ++i) {
        for (int j = 0; j < n; ++j) {
            const int expected = (i > j) - (i < j);
            EXPECT_EQ(CMTimeCompare(ordered[i], ordered[j]), expected)
                << "positions " << i << " and " << j;
        }
    }
    EXPECT_EQ(CMTimeCompare(CMTimeMake(1, 2), CMTimeMake(131072, kChannelTimescale)), 0);
    EXPECT_TRUE(CMTimeMake(1, 2) == CMTimeMake(2, 4))
        << "operator== compares the times, not the fields";
    EXPECT_FALSE(CMTimeIdentical(CMTimeMake(1, 2), CMTimeMake(2, 4)));
    EXPECT_TRUE(CMTimeMake(-1, 2) < kCMTimeZero);
    EXPECT_EQ(CMTimeCompare(kCMTimeInvalid, CMTime{}), 0) << "two invalid times are equal";

    EXPECT_TRUE(std::isnan(CMTimeGetSeconds(kCMTimeInvalid)));
    EXPECT_TRUE(std::isnan(CMTimeGetSeconds(kCMTimeIndefinite)));
    EXPECT_EQ(CMTimeGetSeconds(kCMTimePositiveInfinity), HUGE_VAL);
    EXPECT_EQ(CMTimeGetSeconds(kCMTimeNegativeInfinity), -HUGE_VAL);
    EXPECT_NEAR(CMTimeGetSeconds(CMTimeMake(-3, 4)), -0.75, kSecondsTol);
}

TEST_F(CMTimeArithmetic, convertScaleAndRanges__roundingAndHalfOpenEnd) {
    {
        const CMTime t = CMTimeConvertScale(CMTimeMake(1, 3), kChannelTimescale);
        EXPECT_TRUE(isTime(t, 87381, kChannelTimescale));
        EXPECT_TRUE(rounded(t));
    }
    EXPECT_FALSE(rounded(CMTimeConvertScale(CMTimeMake(1, 2), kChannelTimescale)))
        << "1/2 is exact at 2^18";
    EXPECT_TRUE(CMTIME_IS_INVALID(CMTimeConvertScale(CMTimeMake(1, 2), 0)));
    EXPECT_TRUE(CMTIME_IS_POSITIVE_INFINITY(CMTimeConvertScale(kCMTimePositiveInfinity, 600)));
    EXPECT_TRUE(CMTIME_IS_POSITIVE_INFINITY(CMTimeConvertScale(CMTimeMake(kMaxValue, 1), 2)));

    const CMTimeRange r = CMTimeRangeMake(CMTimeMake(1, 1), CMTimeMake(1, 2));
    EXPECT_TRUE(CMTimeRangeContainsTime(r, CMTimeMake(1, 1))) << "start is inside";
    EXPECT_TRUE(CMTimeRangeContainsTime(r, CMTimeMake(1499, 1000)));
    EXPECT_FALSE(CMTimeRangeContainsTime(r, CMTimeMake(3, 2))) << "end is outside";
    EXPECT_FALSE(CMTimeRangeContainsTime(kCMTimeRangeInvalid, kCMTimeZero));
    EXPECT_TRUE(CMTIME_IS_POSITIVE_INFINITY(
        CMTimeRangeGetEnd(CMTimeRangeMake(kCMTimeZero, kCMTimePositiveInfinity))));
}

class CMTimeSafer : public ::testing::Test {
protected:
    const CMTime allZero{};  // what a missing host delegate answers for the current time
};

TEST_F(CMTimeSafer, saferAddSubtract__allZeroTimeCountsAsZero) {
    EXPECT_TRUE(isTime(BN_CMTimeSaferAdd(allZero, CMTimeMake(5, 10)), 5, 10));
    EXPECT_TRUE(isTime(BN_CMTimeSaferAdd(CMTimeMake(5, 10), allZero), 5, 10));
    EXPECT_TRUE(isTime(BN_CMTimeSaferSubtract(allZero, CMTimeMake(2, 1)), -2, 1));
    EXPECT_TRUE(CMTIME_IS_INVALID(BN_CMTimeSaferAdd(allZero, kCMTimeInvalid)))
        << "invalid only when both are";
    EXPECT_TRUE(CMTIME_IS_INVALID(BN_CMTimeSaferSubtract(allZero, allZero)));
    EXPECT_TRUE(CMTIME_IS_POSITIVE_INFINITY(BN_CMTimeSaferAdd(kCMTimePositiveInfinity, allZero)));
    // An empty keyframe search leaves +inf and zero; their difference stays defined.
    EXPECT_TRUE(
        CMTIME_IS_NEGATIVE_INFINITY(BN_CMTimeSaferSubtract(kCMTimeZero, kCMTimePositiveInfinity)));
    EXPECT_TRUE(CMTIME_IS_INDEFINITE(
        BN_CMTimeSaferSubtract(kCMTimePositiveInfinity, kCMTimePositiveInfinity)));
    EXPECT_TRUE(CMTIME_IS_INVALID(CMTimeAdd(allZero, CMTimeMake(5, 10))))
        << "the plain form stays strict";
}

class CMTimeFloor : public ::testing::Test {};

TEST_F(CMTimeFloor, floorToSampleDuration__negativeTimesAndOtherTimescales) {
    const CMTime frame24 = CMTimeMake(1, 24);
    EXPECT_TRUE(isTime(BN_CMTimeFloorToSampleDuration(CMTimeMake(-1, 3), frame24), -8, 24))
        << "an exact negative multiple stays";
    EXPECT_TRUE(isTime(BN_CMTimeFloorToSampleDuration(CMTimeMake(-35, 100), frame24), -9, 24))
        << "-8.4 frames floors to -9, not towards zero";
    EXPECT_TRUE(isTime(BN_CMTimeFloorToSampleDuration(CMTimeMake(35, 100), frame24), 8, 24));

    const CMTime ntsc = CMTimeMake(1001, 30000);
    EXPECT_TRUE(isTime(BN_CMTimeFloorToSampleDuration(CMTimeMake(1, 1), ntsc), 29 * 1001, 30000))
        << "29.97 frames in a second floor to 29";
    EXPECT_TRUE(isTime(
        BN_CMTimeFloorToSampleDuration(CMTimeMake(-kChannelTimescale, kChannelTimescale), ntsc),
        -30 * 1001, 30000));
    EXPECT_TRUE(isTime(BN_CMTimeFloorToSampleDuration(CMTimeMake(3, 1), CMTimeMake(2, 4)), 12, 4))
        << "the answer is in the duration's timescale, even an unreduced one";
}

TEST_F(CMTimeFloor, floorToSampleDuration__unusableInputsGiveTimeBack) {
    const CMTime t = CMTimeMake(7, 10);
    EXPECT_TRUE(CMTimeIdentical(BN_CMTimeFloorToSampleDuration(t, kCMTimeZero), t))
        << "zero duration";
    EXPECT_TRUE(CMTimeIdentical(BN_CMTimeFloorToSampleDuration(t, CMTimeMake(-1, 24)), t))
        << "negative duration";
    EXPECT_TRUE(CMTimeIdentical(BN_CMTimeFloorToSampleDuration(t, kCMTimePositiveInfinity), t));
    EXPECT_TRUE(CMTimeIdentical(BN_CMTimeFloorToSampleDuration(t, kCMTimeInvalid), t));
    EXPECT_TRUE(CMTIME_IS_NEGATIVE_INFINITY(
        BN_CMTimeFloorToSampleDuration(kCMTimeNegativeInfinity, CMTimeMake(1, 24))));
    EXPECT_TRUE(
        CMTIME_IS_INVALID(BN_CMTimeFloorToSampleDuration(kCMTimeInvalid, CMTimeMake(1, 24))));
}

class ChannelSeconds : public ::testing::Test {};

TEST_F(ChannelSeconds, tarnTime__roundingAtChannelTimescale) {
    {
        const CMTime t = TQTarnTimeForChannelSeconds(1.5, kChannelTimescale);
        EXPECT_TRUE(isTime(t, 393216, kChannelTimescale));
        EXPECT_FALSE(rounded(t)) << "1.5 s is exact at 2^18";
    }
    {
        const CMTime t = TQTarnTimeForChannelSeconds(1.0 / 3.0, kChannelTimescale);
        EXPECT_TRUE(isTime(t, 87381, kChannelTimescale)) << "87381.33 rounds to nearest";
        EXPECT_TRUE(rounded(t));
    }
    EXPECT_TRUE(isTime(TQTarnTimeForChannelSeconds(2.5 / kChannelTimescale, kChannelTimescale), 3,
                       kChannelTimescale))
        << "halves round away from zero";
    EXPECT_TRUE(isTime(TQTarnTimeForChannelSeconds(-2.5 / kChannelTimescale, kChannelTimescale), -3,
                       kChannelTimescale));
    EXPECT_TRUE(isTime(TQTarnTimeForChannelSeconds(-0.0, kChannelTimescale), 0, kChannelTimescale));
    EXPECT_NEAR(CMTimeGetSeconds(TQTarnTimeForChannelSeconds(-12.3456789, kChannelTimescale)),
                -12.3456789, 0.5 / kChannelTimescale);
}

TEST_F(ChannelSeconds, tarnTime__nanInfinitiesAndRange) {
    EXPECT_TRUE(CMTIME_IS_INVALID(TQTarnTimeForChannelSeconds(std::nan(""), kChannelTimescale)));
    EXPECT_TRUE(
        CMTIME_IS_POSITIVE_INFINITY(TQTarnTimeForChannelSeconds(HUGE_VAL, kChannelTimescale)));
    EXPECT_TRUE(
        CMTIME_IS_NEGATIVE_INFINITY(TQTarnTimeForChannelSeconds(-HUGE_VAL, kChannelTimescale)));
    EXPECT_TRUE(CMTIME_IS_POSITIVE_INFINITY(TQTarnTimeForChannelSeconds(1e20, kChannelTimescale)))
        << "beyond 64 bits of 2^-18 s";
    EXPECT_TRUE(CMTIME_IS_NUMERIC(TQTarnTimeForChannelSeconds(3.0e13, kChannelTimescale)))
        << "about a million years still fits";
    EXPECT_TRUE(CMTIME_IS_INVALID(TQTarnTimeForChannelSeconds(1.0, 0)));
    EXPECT_TRUE(CMTIME_IS_INVALID(TQTarnTimeForChannelSeconds(1.0, -600)));
}

class CMTimeScaling : public ::testing::Test {};

TEST_F(CMTimeScaling, multiply__doubleUnsignedAndTimeFactors) {
    {
        const CMTime t = CMTimeMake(3, 10) * 2.5;
        EXPECT_TRUE(isTime(t, 8, 10)) << "7.5 units round to 8 in the time's own timescale";
        EXPECT_TRUE(rounded(t));
    }
    EXPECT_TRUE(isTime(CMTimeMake(3, 10) * 4u, 12, 10));
    EXPECT_TRUE(CMTIME_IS_NUMERIC(CMTimeMake(1, 10) * 3000000000u))
        << "factors beyond int32 still work";
    EXPECT_NEAR(CMTimeGetSeconds(CMTimeMake(1, 10) * 3000000000u), 3.0e8, kSecondsTol);
    EXPECT_TRUE(isTime(CMTimeMake(1, 2) * CMTimeMake(3, 1), 3, 2))
        << "a time factor counts by its seconds";
    EXPECT_TRUE(CMTIME_IS_INVALID(CMTimeMake(1, 2) * kCMTimeIndefinite));
    EXPECT_TRUE(CMTIME_IS_INVALID(CMTimeMake(1, 2) * std::nan("")));
    EXPECT_TRUE(CMTIME_IS_NEGATIVE_INFINITY(kCMTimePositiveInfinity * -2.0));
    EXPECT_TRUE(CMTIME_IS_INDEFINITE(kCMTimePositiveInfinity * 0.0)) << "infinity times zero";
    EXPECT_TRUE(CMTIME_IS_INDEFINITE(kCMTimeZero * HUGE_VAL)) << "zero times infinity";
    EXPECT_TRUE(CMTIME_IS_POSITIVE_INFINITY(CMTimeMake(1, 1) * HUGE_VAL));
    EXPECT_TRUE(CMTIME_IS_NEGATIVE_INFINITY(CMTimeMake(-1, 1) * HUGE_VAL));
    EXPECT_TRUE(CMTIME_IS_POSITIVE_INFINITY(CMTimeMake(kMaxValue / 2, 1) * 3.0));
    EXPECT_TRUE(rounded(CMTimeMake(3, 10) * 2.5 * 2.0)) << "earlier rounding is not forgotten";
}

TEST_F(CMTimeScaling, divide__byNumberAndByTime) {
    EXPECT_TRUE(isTime(CMTimeMake(12, 10) / 4.0, 3, 10));
    {
        const CMTime t = CMTimeMake(10, 4) / 4.0;
        EXPECT_TRUE(isTime(t, 3, 4)) << "2.5 units round away from zero";
        EXPECT_TRUE(rounded(t));
    }
    EXPECT_TRUE(isTime(CMTimeMake(6, 1) / CMTimeMake(3, 2), 4, 1));
    EXPECT_TRUE(CMTIME_IS_INVALID(CMTimeMake(6, 1) / 0.0)) << "division by zero";
    EXPECT_TRUE(CMTIME_IS_INVALID(CMTimeMake(6, 1) / kCMTimeZero));
    EXPECT_TRUE(CMTIME_IS_INVALID(CMTimeMake(6, 1) / kCMTimePositiveInfinity))
        << "non-numeric divisor";
    EXPECT_TRUE(CMTIME_IS_INVALID(kTwo / std::nan("")));
    EXPECT_TRUE(isTime(kTwo / HUGE_VAL, 0, 1)) << "a finite time over infinity is zero";
    EXPECT_TRUE(CMTIME_IS_NEGATIVE_INFINITY(kCMTimePositiveInfinity / -3.0));
    EXPECT_TRUE(CMTIME_IS_POSITIVE_INFINITY(CMTimeMake(kMaxValue, 1) / 0.5));
    EXPECT_TRUE(CMTIME_IS_INVALID(kCMTimeInvalid / 2.0));
}

TEST(Decibels, amplitudeToDecibels__magnitudesAndZero) {
    constexpr double kDbTol = 1e-9;
    EXPECT_NEAR(BN_UIAmplitudeToDecibels(1.0), 0.0, kDbTol);
    EXPECT_NEAR(BN_UIAmplitudeToDecibels(10.0), 20.0, kDbTol);
    EXPECT_NEAR(BN_UIAmplitudeToDecibels(0.5), -6.020599913279624, kDbTol);
    EXPECT_NEAR(BN_UIAmplitudeToDecibels(-10.0), 20.0, kDbTol) << "taken by magnitude";
    EXPECT_EQ(BN_UIAmplitudeToDecibels(0.0), -HUGE_VAL);
    EXPECT_EQ(BN_UIAmplitudeToDecibels(-0.0), -HUGE_VAL);
    EXPECT_TRUE(std::isnan(BN_UIAmplitudeToDecibels(std::nan(""))));
    EXPECT_EQ(BN_UIAmplitudeToDecibels(HUGE_VAL), HUGE_VAL);
}
