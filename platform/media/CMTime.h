#pragma once
// Media time: a rational number of seconds (value / timescale) with flags for validity and
// the infinities, the same fields and arithmetic as the public media-time type it stands for.
//
// Sums and differences of two numeric times are exact in the least common multiple of their
// timescales while that is at most kCMTimeMaxTimescale; beyond it the result is rounded to
// nearest into kCMTimeMaxTimescale. A value too wide for 64 bits halves the timescale until
// it fits (rounding to nearest) and saturates to the infinity of its sign when even a
// timescale of 1 does not hold it. kCMTimeFlags_HasBeenRounded tells of a real loss, and once
// set it is carried through later arithmetic. Numeric operands with different non-zero epochs
// give invalid; otherwise the result takes the non-zero epoch.
//
// Non-numeric times, and what every operation answers for them:
//   invalid   (flags without Valid; includes the all-zero time a missing host yields)
//   +infinity, -infinity, indefinite (Valid plus the matching flag)
// CMTimeAdd / CMTimeSubtract (the right side's infinity counts with its sign turned when
//   subtracting): invalid beats everything; infinities of opposite sign give invalid; one
//   infinity gives that infinity, also against indefinite; otherwise indefinite on either
//   side gives indefinite.
// CMTimeCompare orders -inf < every numeric time < indefinite < +inf < invalid; numeric
//   times of different epochs by epoch alone; two invalid times compare equal, as do two
//   equal infinities and two indefinite times.
// CMTimeGetSeconds: NaN for invalid and indefinite, +/-HUGE_VAL for the infinities.

#include <compare>
#include <cstdint>

using CMTimeValue = int64_t;
using CMTimeScale = int32_t;
using CMTimeEpoch = int64_t;
using CMTimeFlags = uint32_t;

enum : CMTimeFlags {
    kCMTimeFlags_Valid = 1u << 0,
    kCMTimeFlags_HasBeenRounded = 1u << 1,
    kCMTimeFlags_PositiveInfinity = 1u << 2,
    kCMTimeFlags_NegativeInfinity = 1u << 3,
    kCMTimeFlags_Indefinite = 1u << 4,
    kCMTimeFlags_ImpliedValueFlagsMask =
        kCMTimeFlags_PositiveInfinity | kCMTimeFlags_NegativeInfinity | kCMTimeFlags_Indefinite,
};

inline constexpr CMTimeScale kCMTimeMaxTimescale = 1000000000;

struct CMTime {
    CMTimeValue value = 0;
    CMTimeScale timescale = 0;
    CMTimeFlags flags = 0;
    CMTimeEpoch epoch = 0;
};

struct CMTimeRange {
    CMTime start;
    CMTime duration;
};

inline constexpr CMTime kCMTimeZero{0, 1, kCMTimeFlags_Valid, 0};
inline constexpr CMTime kCMTimeInvalid{0, 0, 0, 0};
inline constexpr CMTime kCMTimeIndefinite{0, 0, kCMTimeFlags_Valid | kCMTimeFlags_Indefinite, 0};
inline constexpr CMTime kCMTimePositiveInfinity{
    0, 0, kCMTimeFlags_Valid | kCMTimeFlags_PositiveInfinity, 0};
inline constexpr CMTime kCMTimeNegativeInfinity{
    0, 0, kCMTimeFlags_Valid | kCMTimeFlags_NegativeInfinity, 0};
inline constexpr CMTimeRange kCMTimeRangeZero{kCMTimeZero, kCMTimeZero};
inline constexpr CMTimeRange kCMTimeRangeInvalid{kCMTimeInvalid, kCMTimeInvalid};

inline constexpr bool CMTIME_IS_VALID(const CMTime& t) {
    return (t.flags & kCMTimeFlags_Valid) != 0;
}
inline constexpr bool CMTIME_IS_INVALID(const CMTime& t) { return !CMTIME_IS_VALID(t); }
inline constexpr bool CMTIME_IS_POSITIVE_INFINITY(const CMTime& t) {
    return CMTIME_IS_VALID(t) && (t.flags & kCMTimeFlags_PositiveInfinity) != 0;
}
inline constexpr bool CMTIME_IS_NEGATIVE_INFINITY(const CMTime& t) {
    return CMTIME_IS_VALID(t) && (t.flags & kCMTimeFlags_NegativeInfinity) != 0;
}
inline constexpr bool CMTIME_IS_INDEFINITE(const CMTime& t) {
    return CMTIME_IS_VALID(t) && (t.flags & kCMTimeFlags_Indefinite) != 0;
}
// A plain rational time: valid, finite, definite, with a positive timescale.
inline constexpr bool CMTIME_IS_NUMERIC(const CMTime& t) {
    return (t.flags & (kCMTimeFlags_Valid | kCMTimeFlags_ImpliedValueFlagsMask)) ==
               kCMTimeFlags_Valid &&
           t.timescale > 0;
}

// A valid time of value/timescale seconds; a timescale of 0 or less gives kCMTimeInvalid.
CMTime CMTimeMake(CMTimeValue value, CMTimeScale timescale);
CMTime CMTimeMakeWithSeconds(double seconds, CMTimeScale preferredTimescale);
CMTime CMTimeAdd(const CMTime& lhs, const CMTime& rhs);
CMTime CMTimeSubtract(const CMTime& lhs, const CMTime& rhs);
// Keeps the time's timescale; a value too wide for it halves the timescale as a sum does.
CMTime CMTimeMultiply(const CMTime& time, int32_t multiplier);
// Keeps the time's timescale, rounding to nearest; NaN gives invalid, and zero times an
// infinity (either way round) gives indefinite.
CMTime CMTimeMultiplyByFloat64(const CMTime& time, double multiplier);
// Exact re-expression in another timescale where possible, rounded to nearest otherwise.
CMTime CMTimeConvertScale(const CMTime& time, CMTimeScale newTimescale);
int32_t CMTimeCompare(const CMTime& lhs, const CMTime& rhs);
double CMTimeGetSeconds(const CMTime& time);
CMTime CMTimeAbsoluteValue(const CMTime& time);
CMTime CMTimeMinimum(const CMTime& a, const CMTime& b);
CMTime CMTimeMaximum(const CMTime& a, const CMTime& b);

CMTimeRange CMTimeRangeMake(const CMTime& start, const CMTime& duration);
CMTime CMTimeRangeGetEnd(const CMTimeRange& range);
// Start inclusive, end exclusive.
bool CMTimeRangeContainsTime(const CMTimeRange& range, const CMTime& time);

// Like CMTimeAdd and CMTimeSubtract, but an invalid operand (such as the all-zero time a
// missing host delegate gives) counts as zero, so the result is invalid only when both are.
CMTime BN_CMTimeSaferAdd(const CMTime& lhs, const CMTime& rhs);
CMTime BN_CMTimeSaferSubtract(const CMTime& lhs, const CMTime& rhs);

// Largest whole multiple of the sample duration that is not later than the time, in the
// duration's timescale. A non-numeric time, or a duration that is not a positive numeric
// time, gives the time back unchanged.
CMTime BN_CMTimeFloorToSampleDuration(const CMTime& time, const CMTime& sampleDuration);

// Seconds to a time of the given timescale, rounded to nearest. NaN gives invalid, the
// infinities and values beyond 64 bits give the matching infinity, a timescale of 0 or less
// gives invalid.
CMTime TQTarnTimeForChannelSeconds(double seconds, int timescale);

// 20 log10(amplitude). Zero gives -infinity; a negative amplitude is taken by magnitude.
double BN_UIAmplitudeToDecibels(double amplitude);

// Scaling. A CMTime factor or divisor counts by its seconds.
CMTime operator*(const CMTime& time, double factor);
CMTime operator*(const CMTime& time, unsigned factor);
CMTime operator*(const CMTime& time, const CMTime& factor);
// Division by zero, or by a non-numeric time, gives invalid.
CMTime operator/(const CMTime& time, double divisor);
CMTime operator/(const CMTime& time, const CMTime& divisor);

// Comparison through CMTimeCompare: equal times of different timescales are equal.
inline bool operator==(const CMTime& a, const CMTime& b) { return CMTimeCompare(a, b) == 0; }
inline std::strong_ordering operator<=>(const CMTime& a, const CMTime& b) {
    return CMTimeCompare(a, b) <=> 0;
}
// Fields compared one by one, for deep comparisons of stored state.
inline bool CMTimeIdentical(const CMTime& a, const CMTime& b) {
    return a.value == b.value && a.timescale == b.timescale && a.flags == b.flags &&
           a.epoch == b.epoch;
}
