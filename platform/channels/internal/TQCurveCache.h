#pragma once
// Internal: the evaluation form of a channel's keyframed curve. Built from the keyframe table
// after an edit, read by every value query and by sampling. Not part of the public interface.
//
// Every segment is stored as polynomials in the segment parameter s in [0, 1]:
//   value(s) = y0 + s (y1 + s (y2 + s y3))
//   time(s)  = t0 + s * dt                      (all kinds but Bezier)
//   time(s)  = t0 + s (x0 + s (x1 + s x2))      (Bezier)
// Exp and Log segments keep their end values and evaluate a fixed exponential shape.

#include <cstddef>
#include <cstdint>
#include <vector>

#include "platform/media/CMTime.h"

namespace tq_internal {

struct TQKeyframeRecord;

enum class SegmentKind : uint8_t { Polynomial, Bezier, Exp, Log };

struct CurveSegment {
    double t0 = 0.0;
    double t1 = 0.0;
    double invDt = 0.0;
    double y[4] = {0.0, 0.0, 0.0, 0.0};
    double x[3] = {0.0, 0.0, 0.0};
    SegmentKind kind = SegmentKind::Polynomial;
};

// Where the last evaluation landed, so that the next one close by starts from there: the
// segment and, for a Bezier segment, the solved parameter at the time asked.
struct CurveCursor {
    size_t segment = 0;
    bool warm = false;  // lastS / lastT belong to `segment`
    double lastS = 0.0;
    double lastT = 0.0;
    size_t stride = 0;  // segments crossed by the last long step forward
};

// A sample waiting for a cold solve in its segment.
struct ColdSample {
    const CurveSegment* segment;
    double seconds;
    unsigned index;  // where its value goes
    double guess;    // a parameter to start from, or negative for the chord's
};
inline constexpr unsigned kColdBatch = 16;

class CurveCache {
public:
    // Rebuilds from keyframes in table order. Disabled keyframes are left out; of keyframes
    // that share a time, the last one in the table stands for the time. Handle offsets are
    // clamped so that each Bezier segment's time is monotone in s (see buildBezier).
    void build(const std::vector<TQKeyframeRecord>& keys, bool discrete, double initialValue,
               unsigned extrapolationBefore, unsigned extrapolationAfter);

    // The curve at `seconds`. With extrapolate false the end values hold outside the span.
    double evaluate(double seconds, CurveCursor& cursor, bool extrapolate = true) const;

    // Sample i at time (startValue + i * stepValue) / timescale, written to times[i] and
    // values[i] (either may be null). The caller has checked that no value overflows.
    void sample(CMTimeValue startValue, CMTimeValue stepValue, CMTimeScale timescale,
                CMTimeEpoch epoch, unsigned count, CMTime* times, double* values) const;

    size_t keyCount() const { return _keyCount; }

private:
    double evaluateInside(double seconds, CurveCursor& cursor) const;
    double evaluateOutside(double seconds, bool before, CurveCursor& cursor) const;
    // The keyframe's time when `seconds` lies at most `slack` short of a keyframe, else seconds.
    double snapToKeyframe(double seconds, double slack, CurveCursor& cursor) const;
    size_t locate(double seconds, CurveCursor& cursor) const;
    size_t locateFar(double seconds, size_t from, size_t& stride) const;
    // Samples the run of evenly spaced times, from `value` on, that fall in one Bezier
    // segment; answers how many it wrote (at least one).
    // Solves the samples side by side and writes their values; `solved`, if given, receives
    // their parameters in batch order.
    void solveColdBatch(const ColdSample* batch, unsigned n, double* values,
                        double* solved = nullptr) const;
    unsigned sampleBezierRun(const CurveSegment& seg, CMTimeValue value, CMTimeValue stepValue,
                             double scale, unsigned remaining, double* values) const;

    std::vector<CurveSegment> _segments;
    std::vector<double> _starts;  // t0 of each segment, for the binary search
    size_t _keyCount = 0;
    double _firstT = 0.0;
    double _lastT = 0.0;
    double _firstV = 0.0;
    double _lastV = 0.0;
    double _slopeBefore = 0.0;
    double _slopeAfter = 0.0;
    unsigned _extrapolationBefore = 0;
    unsigned _extrapolationAfter = 0;
    double _initialValue = 0.0;
};

// The keyframes that shape the curve, in time order: the enabled ones, and of keyframes that
// share a time the one that arrived last.
void collectStanding(const std::vector<TQKeyframeRecord>& keys,
                     std::vector<const TQKeyframeRecord*>& out);

// The Catmull-Rom slope at a keyframe: the chord from its neighbour before to its neighbour
// after (the keyframe itself standing in for a missing neighbour at an end); 0 when they share
// a time.
double catmullRomSlope(const TQKeyframeRecord& before, const TQKeyframeRecord& after);

// The segment from a to b evaluated with interpolation `code`; slopeA and slopeB are the
// Catmull-Rom slopes at a and b, read by that code only. invDt stays 0 when b is not later
// than a: there is no segment.
CurveSegment makeSegment(const TQKeyframeRecord& a, const TQKeyframeRecord& b, unsigned code,
                         double slopeA, double slopeB);

// Interpolation shapes of the non-Bezier codes, on s in [0, 1], exposed for tests.
double expShape(double s);
double logShape(double s);

// Solves time(s) = target for a Bezier segment whose time is monotone in s (one root on
// [0, 1]), starting from `guess`. Newton with a shrinking bracket; a step that leaves the
// bracket, or a flat derivative, falls back to bisection.
double solveBezierParameter(const CurveSegment& segment, double target, double guess);

}  // namespace tq_internal
