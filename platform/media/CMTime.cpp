#include "platform/media/CMTime.h"

#include <cmath>
#include <cstdlib>
#include <limits>
#include <utility>

namespace {

__extension__ typedef __int128 i128;

i128 gcd128(i128 a, i128 b) {
    if (a < 0) a = -a;
    if (b < 0) b = -b;
    while (b != 0) {
        const i128 t = a % b;
        a = b;
        b = t;
    }
    return a;
}

constexpr i128 kMaxValue = std::numeric_limits<CMTimeValue>::max();
constexpr i128 kMinValue = std::numeric_limits<CMTimeValue>::min();

// Integer division of n by a positive d, rounded to nearest, halves away from zero.
i128 divRound(i128 n, i128 d) {
    const i128 q = n / d;
    const i128 r = n % d;
    if (2 * (r < 0 ? -r : r) >= d) return n < 0 ? q - 1 : q + 1;
    return q;
}

i128 floorDiv(i128 n, i128 d) {
    i128 q = n / d;
    if ((n % d != 0) && ((n < 0) != (d < 0))) --q;
    return q;
}

// value/timescale as a CMTime, saturating to the infinity of the value's sign.
CMTime fromWide(i128 value, CMTimeScale timescale, bool rounded) {
    if (value > kMaxValue) return kCMTimePositiveInfinity;
    if (value < kMinValue) return kCMTimeNegativeInfinity;
    CMTime t = CMTimeMake(static_cast<CMTimeValue>(value), timescale);
    if (rounded) t.flags |= kCMTimeFlags_HasBeenRounded;
    return t;
}

// The rational n / d (d > 0) in `scale`, rounded to nearest. A value too wide for 64 bits
// halves the timescale until it fits, and saturates once even a timescale of 1 is too fine.
// Each try rounds from the exact rational, so halving never rounds twice.
CMTime fitRational(i128 n, i128 d, CMTimeScale scale) {
    for (;;) {
        const i128 scaled = n * scale;
        const i128 v = divRound(scaled, d);
        if ((v <= kMaxValue && v >= kMinValue) || scale == 1)
            return fromWide(v, scale, scaled % d != 0);
        scale /= 2;
    }
}

// Adds or subtracts two numeric times: exact in the least common multiple of the timescales
// while that is at most kCMTimeMaxTimescale, rounded into kCMTimeMaxTimescale beyond it.
CMTime addNumeric(const CMTime& a, const CMTime& b, bool subtract) {
    const i128 bv = subtract ? -static_cast<i128>(b.value) : static_cast<i128>(b.value);
    const i128 l = static_cast<i128>(a.timescale) / gcd128(a.timescale, b.timescale) * b.timescale;
    const i128 n = a.value * (l / a.timescale) + bv * (l / b.timescale);
    const CMTimeScale scale =
        l > kCMTimeMaxTimescale ? kCMTimeMaxTimescale : static_cast<CMTimeScale>(l);
    return fitRational(n, l, scale);
}

// Rank of a time's kind in the total order of CMTimeCompare.
int kindRank(const CMTime& t) {
    if (CMTIME_IS_INVALID(t)) return 4;
    if (CMTIME_IS_POSITIVE_INFINITY(t)) return 3;
    if (CMTIME_IS_INDEFINITE(t)) return 2;
    if (CMTIME_IS_NEGATIVE_INFINITY(t)) return 0;
    return 1;  // numeric
}

CMTime combine(const CMTime& a, const CMTime& b, bool subtract) {
    if (CMTIME_IS_INVALID(a) || CMTIME_IS_INVALID(b)) return kCMTimeInvalid;
    const bool aPos = CMTIME_IS_POSITIVE_INFINITY(a), aNeg = CMTIME_IS_NEGATIVE_INFINITY(a);
    bool bPos = CMTIME_IS_POSITIVE_INFINITY(b), bNeg = CMTIME_IS_NEGATIVE_INFINITY(b);
    if (subtract) std::swap(bPos, bNeg);
    if ((aPos && bNeg) || (aNeg && bPos)) return kCMTimeInvalid;
    if (aPos || bPos) return kCMTimePositiveInfinity;
    if (aNeg || bNeg) return kCMTimeNegativeInfinity;
    if (CMTIME_IS_INDEFINITE(a) || CMTIME_IS_INDEFINITE(b)) return kCMTimeIndefinite;
    if (a.timescale <= 0 || b.timescale <= 0) return kCMTimeInvalid;
    if (a.epoch != 0 && b.epoch != 0 && a.epoch != b.epoch) return kCMTimeInvalid;
    CMTime r = addNumeric(a, b, subtract);
    if (CMTIME_IS_NUMERIC(r)) {
        r.flags |= (a.flags | b.flags) & kCMTimeFlags_HasBeenRounded;
        r.epoch = a.epoch != 0 ? a.epoch : b.epoch;
    }
    return r;
}

CMTime saferOperand(const CMTime& t) { return CMTIME_IS_VALID(t) ? t : kCMTimeZero; }

}  // namespace

CMTime CMTimeMake(CMTimeValue value, CMTimeScale timescale) {
    if (timescale <= 0) return kCMTimeInvalid;
    return CMTime{value, timescale, kCMTimeFlags_Valid, 0};
}

CMTime CMTimeMakeWithSeconds(double seconds, CMTimeScale preferredTimescale) {
    return TQTarnTimeForChannelSeconds(seconds, preferredTimescale);
}

CMTime CMTimeAdd(const CMTime& lhs, const CMTime& rhs) { return combine(lhs, rhs, false); }

CMTime CMTimeSubtract(const CMTime& lhs, const CMTime& rhs) { return combine(lhs, rhs, true); }

CMTime CMTimeMultiply(const CMTime& time, int32_t multiplier) {
    if (!CMTIME_IS_NUMERIC(time)) {
        if (CMTIME_IS_INVALID(time) || CMTIME_IS_INDEFINITE(time)) return time;
        if (multiplier == 0) return kCMTimeIndefinite;  // infinity times zero
        const bool positive = CMTIME_IS_POSITIVE_INFINITY(time) == (multiplier > 0);
        return positive ? kCMTimePositiveInfinity : kCMTimeNegativeInfinity;
    }
    CMTime r =
        fitRational(static_cast<i128>(time.value) * multiplier, time.timescale, time.timescale);
    if (CMTIME_IS_NUMERIC(r)) r.flags |= time.flags & kCMTimeFlags_HasBeenRounded;
    return r;
}

namespace {
// `time` with its value replaced by `value` on the same timescale: rounded to the nearest
// integer (and marked so), out of range saturating to an infinity, not a number indefinite.
CMTime withScaledValue(const CMTime& time, long double value) {
    if (std::isnan(value)) return kCMTimeIndefinite;  // zero times infinity
    constexpr long double kLimit = 9.2233720368547758e18L;
    if (!std::isfinite(value) || value >= kLimit || value <= -kLimit)
        return value > 0 ? kCMTimePositiveInfinity : kCMTimeNegativeInfinity;
    const long double rounded = std::round(value);
    CMTime r = CMTimeMake(static_cast<CMTimeValue>(rounded), time.timescale);
    if (rounded != value) r.flags |= kCMTimeFlags_HasBeenRounded;
    r.flags |= time.flags & kCMTimeFlags_HasBeenRounded;
    return r;
}
}  // namespace

CMTime CMTimeMultiplyByFloat64(const CMTime& time, double multiplier) {
    if (std::isnan(multiplier)) return kCMTimeInvalid;
    if (!CMTIME_IS_NUMERIC(time)) {
        if (CMTIME_IS_INVALID(time) || CMTIME_IS_INDEFINITE(time)) return time;
        if (multiplier == 0.0) return kCMTimeIndefinite;
        const bool positive = CMTIME_IS_POSITIVE_INFINITY(time) == (multiplier > 0.0);
        return positive ? kCMTimePositiveInfinity : kCMTimeNegativeInfinity;
    }
    if (multiplier == 1.0) return time;
    return withScaledValue(time, static_cast<long double>(time.value) * multiplier);
}

CMTime CMTimeConvertScale(const CMTime& time, CMTimeScale newTimescale) {
    if (newTimescale <= 0) return kCMTimeInvalid;
    if (!CMTIME_IS_NUMERIC(time) || time.timescale == newTimescale) return time;
    const i128 scaled = static_cast<i128>(time.value) * newTimescale;
    const bool exact = scaled % time.timescale == 0;
    return fromWide(divRound(scaled, time.timescale), newTimescale, !exact);
}

int32_t CMTimeCompare(const CMTime& lhs, const CMTime& rhs) {
    const int ra = kindRank(lhs), rb = kindRank(rhs);
    if (ra != rb) return ra < rb ? -1 : 1;
    if (ra != 1) return 0;
    // Numeric times of different epochs are ordered by epoch alone.
    if (lhs.epoch != rhs.epoch) return lhs.epoch < rhs.epoch ? -1 : 1;
    if (lhs.timescale <= 0 || rhs.timescale <= 0) {
        // A valid flag with no timescale is malformed; order it by its kind only.
        return (lhs.timescale > 0) - (rhs.timescale > 0);
    }
    const i128 a = static_cast<i128>(lhs.value) * rhs.timescale;
    const i128 b = static_cast<i128>(rhs.value) * lhs.timescale;
    return a < b ? -1 : (a > b ? 1 : 0);
}

double CMTimeGetSeconds(const CMTime& time) {
    if (CMTIME_IS_INVALID(time) || CMTIME_IS_INDEFINITE(time)) return std::nan("");
    if (CMTIME_IS_POSITIVE_INFINITY(time)) return HUGE_VAL;
    if (CMTIME_IS_NEGATIVE_INFINITY(time)) return -HUGE_VAL;
    if (time.timescale <= 0) return std::nan("");
    return static_cast<double>(time.value) / static_cast<double>(time.timescale);
}

CMTime CMTimeAbsoluteValue(const CMTime& time) {
    if (CMTIME_IS_NEGATIVE_INFINITY(time)) return kCMTimePositiveInfinity;
    if (!CMTIME_IS_NUMERIC(time) || time.value >= 0) return time;
    if (time.value == std::numeric_limits<CMTimeValue>::min()) return kCMTimePositiveInfinity;
    CMTime r = time;
    r.value = -time.value;
    return r;
}

CMTime CMTimeMinimum(const CMTime& a, const CMTime& b) { return CMTimeCompare(a, b) <= 0 ? a : b; }
CMTime CMTimeMaximum(const CMTime& a, const CMTime& b) { return CMTimeCompare(a, b) >= 0 ? a : b; }

CMTimeRange CMTimeRangeMake(const CMTime& start, const CMTime& duration) {
    return CMTimeRange{start, duration};
}

CMTime CMTimeRangeGetEnd(const CMTimeRange& range) {
    return CMTimeAdd(range.start, range.duration);
}

bool CMTimeRangeContainsTime(const CMTimeRange& range, const CMTime& time) {
    return CMTimeCompare(range.start, time) <= 0 &&
           CMTimeCompare(time, CMTimeRangeGetEnd(range)) < 0;
}

CMTime BN_CMTimeSaferAdd(const CMTime& lhs, const CMTime& rhs) {
    if (CMTIME_IS_INVALID(lhs) && CMTIME_IS_INVALID(rhs)) return kCMTimeInvalid;
    return CMTimeAdd(saferOperand(lhs), saferOperand(rhs));
}

CMTime BN_CMTimeSaferSubtract(const CMTime& lhs, const CMTime& rhs) {
    if (CMTIME_IS_INVALID(lhs) && CMTIME_IS_INVALID(rhs)) return kCMTimeInvalid;
    return CMTimeSubtract(saferOperand(lhs), saferOperand(rhs));
}

CMTime BN_CMTimeFloorToSampleDuration(const CMTime& time, const CMTime& sampleDuration) {
    if (!CMTIME_IS_NUMERIC(time) || !CMTIME_IS_NUMERIC(sampleDuration) || sampleDuration.value <= 0)
        return time;
    // k = floor(time / duration) = floor((t.v * d.ts) / (d.v * t.ts))
    const i128 k = floorDiv(static_cast<i128>(time.value) * sampleDuration.timescale,
                            static_cast<i128>(sampleDuration.value) * time.timescale);
    return fromWide(k * sampleDuration.value, sampleDuration.timescale, false);
}

CMTime TQTarnTimeForChannelSeconds(double seconds, int timescale) {
    if (timescale <= 0 || std::isnan(seconds)) return kCMTimeInvalid;
    const long double scaled = static_cast<long double>(seconds) * timescale;
    if (scaled >= 9.2233720368547758e18L) return kCMTimePositiveInfinity;
    if (scaled <= -9.2233720368547758e18L) return kCMTimeNegativeInfinity;
    const long double rounded = std::round(scaled);
    CMTime t = CMTimeMake(static_cast<CMTimeValue>(rounded), timescale);
    if (rounded != scaled) t.flags |= kCMTimeFlags_HasBeenRounded;
    return t;
}

double BN_UIAmplitudeToDecibels(double amplitude) {
    const double magnitude = std::fabs(amplitude);
    if (magnitude == 0.0) return -HUGE_VAL;
    return 20.0 * std::log10(magnitude);
}

CMTime operator*(const CMTime& time, double factor) {
    return CMTimeMultiplyByFloat64(time, factor);
}

CMTime operator*(const CMTime& time, unsigned factor) {
    if (factor <= static_cast<unsigned>(std::numeric_limits<int32_t>::max()))
        return CMTimeMultiply(time, static_cast<int32_t>(factor));
    return CMTimeMultiplyByFloat64(time, static_cast<double>(factor));
}

CMTime operator*(const CMTime& time, const CMTime& factor) {
    const double f = CMTimeGetSeconds(factor);
    if (std::isnan(f)) return kCMTimeInvalid;
    return CMTimeMultiplyByFloat64(time, f);
}

CMTime operator/(const CMTime& time, double divisor) {
    if (divisor == 0.0 || std::isnan(divisor)) return kCMTimeInvalid;
    if (CMTIME_IS_NUMERIC(time))
        return withScaledValue(time, static_cast<long double>(time.value) / divisor);
    return CMTimeMultiplyByFloat64(time, 1.0 / divisor);
}

CMTime operator/(const CMTime& time, const CMTime& divisor) {
    if (!CMTIME_IS_NUMERIC(divisor) || divisor.value == 0) return kCMTimeInvalid;
    return time / CMTimeGetSeconds(divisor);
}
