#include "platform/media/CMTime.h"

#include <gtest/gtest.h>

#include <cmath>
#include <limits>

namespace {

constexpr CMTimeScale kCh = 0x40000;  // the timescale of every channel time
constexpr CMTimeScale kMaxScale = kCMTimeMaxTimescale;
constexpr CMTimeValue kMaxValue = std::numeric_limits<CMTimeValue>::max();
constexpr CMTimeValue kMinValue = std::numeric_limits<CMTimeValue>::min();
constexpr CMTime kPos = kCMTimePositiveInfinity, kNeg = kCMTimeNegativeInfinity;
constexpr CMTime kIndef = kCMTimeIndefinite, kInval = kCMTimeInvalid;

// A numeric time as arithmetic should leave it: exact, or flagged as rounded.
constexpr CMTime num(CMTimeValue value, CMTimeScale timescale, CMTimeEpoch epoch = 0) {
    return CMTime{value, timescale, kCMTimeFlags_Valid, epoch};
}
constexpr CMTime rnd(CMTimeValue value, CMTimeScale timescale) {
    return CMTime{value, timescale, kCMTimeFlags_Valid | kCMTimeFlags_HasBeenRounded, 0};
}

// One answer and what it should be, field by field: a lost or spurious flag shows.
struct Answer {
    const char* name;
    CMTime got;
    CMTime want;
};
::testing::AssertionResult same(const CMTime& got, const CMTime& want) {
    if (CMTimeIdentical(got, want)) return ::testing::AssertionSuccess();
    return ::testing::AssertionFailure() << "got " << got.value << "/" << got.timescale << " flags "
                                         << got.flags << " epoch " << got.epoch;
}
void expectAnswers(std::initializer_list<Answer> answers) {
    for (const Answer& a : answers) EXPECT_TRUE(same(a.got, a.want)) << a.name;
}

TEST(CMTimeArithmetic, addSubtractCompare__exactRoundedSaturatedAndNonNumeric) {
    const CMTime five = num(5, 1);
    const CMTime pos = kPos, neg = kNeg, indef = kIndef, inval = kInval;
    struct Row {
        const char* name;
        CMTime a, b;
        CMTime sum, difference;
        int compare;
    };
    const Row rows[] = {
        {"3 and 4 meet in 12", num(1, 3), num(1, 4), num(7, 12), num(1, 12), 1},
        {"lcm of 2^18 and NTSC", num(kCh, kCh), num(1001, 30000), num(507920384, 491520000),
         num(475119616, 491520000), 1},
        {"lcm above 1e9 rounds into it", num(1, kCh), num(1, 1000000007), rnd(3816, kMaxScale),
         rnd(3814, kMaxScale), 1},
        {"into 1e9 without loss", num(1, 2), num(6, 1200000000), num(500000005, kMaxScale),
         num(499999995, kMaxScale), 1},
        {"one timescale above 1e9", num(1, 2000000000), num(1, 2000000000), num(1, kMaxScale),
         num(0, kMaxScale), 0},
        {"equal, other timescales", num(1, 2), num(131072, kCh), num(kCh, kCh), num(0, kCh), 0},
        {"overflow halves", num(kMaxValue, 2), num(kMaxValue, 2), num(kMaxValue, 1), num(0, 2), 0},
        {"halving rounds", num(kMaxValue, 3), num(kMaxValue, 3), rnd(6148914691236517205, 1),
         num(0, 3), 0},
        {"saturates at timescale 1", num(kMaxValue, 1), num(-1, 1), num(kMaxValue - 1, 1), kPos, 1},
        {"saturates below", num(kMinValue, 1), num(-1, 1), kNeg, num(kMinValue + 1, 1), -1},
        {"different non-zero epochs", num(5, 1, 1), num(5, 1, 2), kInval, kInval, -1},
        {"one epoch zero", num(5, 1), num(5, 1, 3), num(10, 1, 3), num(0, 1, 3), -1},
        {"numeric, +inf", five, pos, kPos, kNeg, -1},
        {"+inf, numeric", pos, five, kPos, kPos, 1},
        {"-inf, numeric", neg, five, kNeg, kNeg, -1},
        {"+inf, +inf", pos, pos, kPos, kInval, 0},
        {"-inf, -inf", neg, neg, kNeg, kInval, 0},
        {"+inf, -inf", pos, neg, kInval, kPos, 1},
        {"-inf, +inf", neg, pos, kInval, kNeg, -1},
        {"indefinite, numeric", indef, five, kIndef, kIndef, 1},
        {"numeric, indefinite", five, indef, kIndef, kIndef, -1},
        {"indefinite, +inf", indef, pos, kPos, kNeg, -1},
        {"indefinite, -inf", indef, neg, kNeg, kPos, 1},
        {"indefinite, indefinite", indef, indef, kIndef, kIndef, 0},
        {"invalid, +inf", inval, pos, kInval, kInval, 1},
        {"indefinite, invalid", indef, inval, kInval, kInval, -1},
        {"all-zero time, numeric", CMTime{}, five, kInval, kInval, 1},
        {"numeric, no timescale", five, CMTime{1, 0, kCMTimeFlags_Valid, 0}, kInval, kInval, 1},
    };
    for (const Row& r : rows) {
        EXPECT_TRUE(same(CMTimeAdd(r.a, r.b), r.sum)) << r.name << ": sum";
        EXPECT_TRUE(same(CMTimeSubtract(r.a, r.b), r.difference)) << r.name << ": difference";
        EXPECT_EQ(CMTimeCompare(r.a, r.b), r.compare) << r.name;
        EXPECT_EQ(CMTimeCompare(r.b, r.a), -r.compare) << r.name << ", swapped";
    }
    EXPECT_TRUE(same(CMTimeAdd(rnd(3, 4), num(1, 4)), rnd(4, 4)))
        << "the rounded flag survives later arithmetic";
    EXPECT_TRUE(num(1, 2) == num(2, 4)) << "operator== compares the times, not the fields";
    EXPECT_FALSE(CMTimeIdentical(num(1, 2), num(2, 4)));
    EXPECT_TRUE(num(-1, 2) < kCMTimeZero);
}

TEST(CMTimeArithmetic, scaling__keepsTheTimescaleRoundsToNearestAndSaturates) {
    expectAnswers({
        {"product rounds", num(3, 10) * 2.5, rnd(8, 10)},
        {"rounding is carried", num(3, 10) * 2.5 * 2.0, rnd(16, 10)},
        {"unsigned factor", num(3, 10) * 4u, num(12, 10)},
        {"factor beyond int32", num(1, 10) * 3000000000u, num(3000000000, 10)},
        {"a time factor counts by its seconds", num(1, 2) * num(3, 1), num(3, 2)},
        {"indefinite factor", num(1, 2) * kIndef, kInval},
        {"NaN factor", num(1, 2) * std::nan(""), kInval},
        {"infinity turned", kPos * -2.0, kNeg},
        {"infinity times zero", kPos * 0.0, kIndef},
        {"zero times infinity", kCMTimeZero * HUGE_VAL, kIndef},
        {"one times infinity", num(-1, 1) * HUGE_VAL, kNeg},
        {"double product too wide", num(kMaxValue / 2, 1) * 3.0, kPos},
        {"integer product halves its timescale", CMTimeMultiply(num(kMaxValue, 2), 2),
         num(kMaxValue, 1)},
        {"integer product saturates", CMTimeMultiply(num(kMaxValue, 1), -3), kNeg},
        {"|INT64_MIN| does not fit", CMTimeAbsoluteValue(num(kMinValue, 1)), kPos},
        {"quotient", num(12, 10) / 4.0, num(3, 10)},
        {"quotient halves away from zero", num(10, 4) / 4.0, rnd(3, 4)},
        {"by a time", num(6, 1) / num(3, 2), num(4, 1)},
        {"by zero", num(6, 1) / 0.0, kInval},
        {"by a zero time", num(6, 1) / kCMTimeZero, kInval},
        {"by infinity as a time", num(6, 1) / kPos, kInval},
        {"by NaN", num(2, 1) / std::nan(""), kInval},
        {"over infinity", num(2, 1) / HUGE_VAL, num(0, 1)},
        {"infinity over negative", kPos / -3.0, kNeg},
        {"quotient too wide", num(kMaxValue, 1) / 0.5, kPos},
        {"invalid over two", kInval / 2.0, kInval},
        {"convert rounds", CMTimeConvertScale(num(1, 3), kCh), rnd(87381, kCh)},
        {"convert exactly", CMTimeConvertScale(num(1, 2), kCh), num(131072, kCh)},
        {"convert to no timescale", CMTimeConvertScale(num(1, 2), 0), kInval},
        {"convert infinity", CMTimeConvertScale(kPos, 600), kPos},
        {"convert too wide", CMTimeConvertScale(num(kMaxValue, 1), 2), kPos},
    });
}

TEST(CMTimeArithmetic, secondsRangesAndDecibels) {
    EXPECT_TRUE(std::isnan(CMTimeGetSeconds(kInval)));
    EXPECT_TRUE(std::isnan(CMTimeGetSeconds(kIndef)));
    EXPECT_EQ(CMTimeGetSeconds(kPos), HUGE_VAL);
    EXPECT_EQ(CMTimeGetSeconds(kNeg), -HUGE_VAL);
    EXPECT_EQ(CMTimeGetSeconds(num(-3, 4)), -0.75);

    const CMTimeRange r = CMTimeRangeMake(num(1, 1), num(1, 2));
    EXPECT_TRUE(CMTimeRangeContainsTime(r, num(1, 1))) << "start is inside";
    EXPECT_TRUE(CMTimeRangeContainsTime(r, num(1499, 1000)));
    EXPECT_FALSE(CMTimeRangeContainsTime(r, num(3, 2))) << "end is outside";
    EXPECT_FALSE(CMTimeRangeContainsTime(kCMTimeRangeInvalid, kCMTimeZero));
    EXPECT_TRUE(same(CMTimeRangeGetEnd(CMTimeRangeMake(kCMTimeZero, kPos)), kPos));

    constexpr double kDbTol = 1e-9;
    EXPECT_NEAR(BN_UIAmplitudeToDecibels(10.0), 20.0, kDbTol);
    EXPECT_NEAR(BN_UIAmplitudeToDecibels(0.5), -6.020599913279624, kDbTol);
    EXPECT_NEAR(BN_UIAmplitudeToDecibels(-10.0), 20.0, kDbTol) << "taken by magnitude";
    EXPECT_EQ(BN_UIAmplitudeToDecibels(-0.0), -HUGE_VAL);
    EXPECT_TRUE(std::isnan(BN_UIAmplitudeToDecibels(std::nan(""))));
}

TEST(CMTimeSafer, saferAddSubtract__allZeroTimeCountsAsZero) {
    const CMTime allZero{};  // what a missing host delegate answers for the current time
    expectAnswers({
        {"zero + time", BN_CMTimeSaferAdd(allZero, num(5, 10)), num(5, 10)},
        {"time + zero", BN_CMTimeSaferAdd(num(5, 10), allZero), num(5, 10)},
        {"zero - time", BN_CMTimeSaferSubtract(allZero, num(2, 1)), num(-2, 1)},
        {"invalid only when both are", BN_CMTimeSaferAdd(allZero, kInval), kInval},
        {"both all-zero", BN_CMTimeSaferSubtract(allZero, allZero), kInval},
        {"infinity + zero", BN_CMTimeSaferAdd(kPos, allZero), kPos},
        {"an empty keyframe search", BN_CMTimeSaferSubtract(kCMTimeZero, kPos), kNeg},
        {"infinities cancel", BN_CMTimeSaferSubtract(kPos, kPos), kInval},
        {"the plain form stays strict", CMTimeAdd(allZero, num(5, 10)), kInval},
    });
}

TEST(CMTimeFloor, floorToSampleDuration__negativeTimesOtherTimescalesAndUnusableInputs) {
    const CMTime frame24 = num(1, 24), ntsc = num(1001, 30000), t = num(7, 10);
    expectAnswers({
        {"an exact negative multiple stays", BN_CMTimeFloorToSampleDuration(num(-1, 3), frame24),
         num(-8, 24)},
        {"-8.4 frames floor to -9", BN_CMTimeFloorToSampleDuration(num(-35, 100), frame24),
         num(-9, 24)},
        {"8.4 frames floor to 8", BN_CMTimeFloorToSampleDuration(num(35, 100), frame24),
         num(8, 24)},
        {"29.97 frames in a second", BN_CMTimeFloorToSampleDuration(num(1, 1), ntsc),
         num(29 * 1001, 30000)},
        {"minus a second", BN_CMTimeFloorToSampleDuration(num(-kCh, kCh), ntsc),
         num(-30 * 1001, 30000)},
        {"an unreduced duration's timescale", BN_CMTimeFloorToSampleDuration(num(3, 1), num(2, 4)),
         num(12, 4)},
        {"zero duration", BN_CMTimeFloorToSampleDuration(t, kCMTimeZero), t},
        {"negative duration", BN_CMTimeFloorToSampleDuration(t, num(-1, 24)), t},
        {"infinite duration", BN_CMTimeFloorToSampleDuration(t, kPos), t},
        {"invalid duration", BN_CMTimeFloorToSampleDuration(t, kInval), t},
        {"infinite time", BN_CMTimeFloorToSampleDuration(kNeg, frame24), kNeg},
        {"invalid time", BN_CMTimeFloorToSampleDuration(kInval, frame24), kInval},
    });
}

TEST(ChannelSeconds, tarnTime__roundsAtTheTimescaleAndMapsNonNumbers) {
    expectAnswers({
        {"1.5 s is exact at 2^18", TQTarnTimeForChannelSeconds(1.5, kCh), num(393216, kCh)},
        {"a third rounds to nearest", TQTarnTimeForChannelSeconds(1.0 / 3.0, kCh), rnd(87381, kCh)},
        {"halves away from zero", TQTarnTimeForChannelSeconds(2.5 / kCh, kCh), rnd(3, kCh)},
        {"negative halves too", TQTarnTimeForChannelSeconds(-2.5 / kCh, kCh), rnd(-3, kCh)},
        {"negative zero", TQTarnTimeForChannelSeconds(-0.0, kCh), num(0, kCh)},
        {"a million years fits", TQTarnTimeForChannelSeconds(3.0e13, kCh),
         num(7864320000000000000, kCh)},
        {"beyond 64 bits", TQTarnTimeForChannelSeconds(1e20, kCh), kPos},
        {"infinity", TQTarnTimeForChannelSeconds(-HUGE_VAL, kCh), kNeg},
        {"NaN", TQTarnTimeForChannelSeconds(std::nan(""), kCh), kInval},
        {"no timescale", TQTarnTimeForChannelSeconds(1.0, 0), kInval},
        {"negative timescale", TQTarnTimeForChannelSeconds(1.0, -600), kInval},
    });
}

}  // namespace
