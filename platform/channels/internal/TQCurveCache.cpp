#include "platform/channels/internal/TQCurveCache.h"

#include <algorithm>
#include <cmath>
#include <limits>

#include "platform/channels/TQChannel.h"
#include "platform/channels/internal/TQChannelData.h"

namespace tq_internal {

namespace {

// Curvature of the Exp and Log shapes: the Exp segment reaches half its rise at s = 0.83.
constexpr double kShapeCurvature = 4.0;

// Newton stops when its step in s is this small: convergence is quadratic near a simple
// root, so the error left is far below it.
constexpr double kNewtonStepTolerance = 1e-12;

void setHermite(CurveSegment& seg, double v0, double v1, double m0, double m1) {
    const double dt = seg.t1 - seg.t0;
    const double rise = v1 - v0;
    seg.kind = SegmentKind::Polynomial;
    seg.y[0] = v0;
    seg.y[1] = dt * m0;
    seg.y[2] = 3.0 * rise - 2.0 * dt * m0 - dt * m1;
    seg.y[3] = -2.0 * rise + dt * m0 + dt * m1;
}

// A handle's reach along time, clamped to [0, dt], and its value offset scaled with it so the
// handle keeps its direction. With both reaches in [0, dt] the segment's time is monotone: its
// derivative is a quadratic in Bernstein form with coefficients a, dt - a - b, b (a, b the
// reaches), which is non-negative on [0, 1] when a, b >= 0 and dt - a - b >= -sqrt(ab), and
// a + b - sqrt(ab) <= dt holds on the square [0, dt]^2 since it is convex and holds at the
// corners. So every time on the segment has exactly one parameter.
void clampHandle(double reach, double rise, double dt, double& outReach, double& outRise) {
    if (!(reach > 0.0)) {
        outReach = 0.0;
        outRise = rise;
    } else if (reach > dt) {
        outReach = dt;
        outRise = rise * (dt / reach);
    } else {
        outReach = reach;
        outRise = rise;
    }
}

void setBezier(CurveSegment& seg, const TQKeyframeRecord& a, const TQKeyframeRecord& b) {
    const double dt = seg.t1 - seg.t0;
    double reachOut = 0.0, riseOut = 0.0, reachIn = 0.0, riseIn = 0.0;
    clampHandle(a.outU, a.outV, dt, reachOut, riseOut);
    clampHandle(-b.inU, b.inV, dt, reachIn, riseIn);

    const double p0 = a.value;
    const double p1 = a.value + riseOut;
    const double p2 = b.value + riseIn;
    const double p3 = b.value;
    seg.y[0] = p0;
    seg.y[1] = 3.0 * (p1 - p0);
    seg.y[2] = 3.0 * (p0 - 2.0 * p1 + p2);
    seg.y[3] = p3 - p0 + 3.0 * (p1 - p2);

    // Time control points relative to t0: 0, reachOut, dt - reachIn, dt.
    const double q1 = reachOut;
    const double q2 = dt - reachIn;
    seg.x[0] = 3.0 * q1;
    seg.x[1] = 3.0 * (q2 - 2.0 * q1);
    seg.x[2] = dt + 3.0 * (q1 - q2);
    // Handles at thirds make time linear in s: evaluate such a segment without a solve.
    if (std::fabs(seg.x[1]) <= 1e-12 * dt && std::fabs(seg.x[2]) <= 1e-12 * dt) {
        seg.kind = SegmentKind::Polynomial;
    } else {
        seg.kind = SegmentKind::Bezier;
    }
}

double polynomial(const CurveSegment& seg, double s) {
    return seg.y[0] + s * (seg.y[1] + s * (seg.y[2] + s * seg.y[3]));
}

double bezierTime(const CurveSegment& seg, double s) {
    return s * (seg.x[0] + s * (seg.x[1] + s * seg.x[2]));
}

double bezierTimeSlope(const CurveSegment& seg, double s) {
    return seg.x[0] + s * (2.0 * seg.x[1] + 3.0 * seg.x[2] * s);
}

double valueSlopeInS(const CurveSegment& seg, double s) {
    switch (seg.kind) {
        case SegmentKind::Exp:
            return seg.y[1] * kShapeCurvature * std::exp(kShapeCurvature * s) /
                   std::expm1(kShapeCurvature);
        case SegmentKind::Log:
            return seg.y[1] * kShapeCurvature * std::exp(kShapeCurvature * (1.0 - s)) /
                   std::expm1(kShapeCurvature);
        case SegmentKind::Polynomial:
        case SegmentKind::Bezier: break;
    }
    return seg.y[1] + s * (2.0 * seg.y[2] + 3.0 * seg.y[3] * s);
}

// dv/dt at s = 0 or 1, for linear extrapolation.
double slopeAt(const CurveSegment& seg, double s) {
    const double dt = seg.t1 - seg.t0;
    const double dvds = valueSlopeInS(seg, s);
    if (seg.kind != SegmentKind::Bezier) return dvds / dt;
    const double dtds = bezierTimeSlope(seg, s);
    if (dtds > 1e-9 * dt) return dvds / dtds;
    // A handle without reach: the limit is a vertical tangent for a handle that has a rise
    // and the chord for a zero handle; the chord is the finite answer in both cases.
    return (polynomial(seg, 1.0) - polynomial(seg, 0.0)) / dt;
}

}  // namespace

void collectStanding(const std::vector<TQKeyframeRecord>& keys,
                     std::vector<const TQKeyframeRecord*>& out) {
    out.clear();
    out.reserve(keys.size());
    for (const TQKeyframeRecord& k : keys) {
        if (!k.enabled) continue;
        if (!out.empty() && compareTimes(out.back()->time, k.time) == 0) {
            out.back() = &k;  // keyframes that met: the last arrived stands for the time
        } else {
            out.push_back(&k);
        }
    }
}

double catmullRomSlope(const TQKeyframeRecord& before, const TQKeyframeRecord& after) {
    const double dt = after.seconds - before.seconds;
    if (!(dt > 0.0)) return 0.0;
    return (after.value - before.value) / dt;
}

CurveSegment makeSegment(const TQKeyframeRecord& a, const TQKeyframeRecord& b, unsigned code,
                         double slopeA, double slopeB) {
    CurveSegment seg;
    seg.t0 = a.seconds;
    seg.t1 = b.seconds;
    const double dt = seg.t1 - seg.t0;
    if (!(dt > 0.0)) return seg;
    seg.invDt = 1.0 / dt;
    const double rise = b.value - a.value;
    switch (code) {
        case kTQInterpolationConstant: seg.y[0] = a.value; break;
        case kTQInterpolationBezier: setBezier(seg, a, b); break;
        case kTQInterpolationCatmullRom: setHermite(seg, a.value, b.value, slopeA, slopeB); break;
        case kTQInterpolationExp:
        case kTQInterpolationLog:
            seg.kind = code == kTQInterpolationExp ? SegmentKind::Exp : SegmentKind::Log;
            seg.y[0] = a.value;
            seg.y[1] = rise;
            break;
        case kTQInterpolationEaseBoth: setHermite(seg, a.value, b.value, 0.0, 0.0); break;
        case kTQInterpolationEaseOut: setHermite(seg, a.value, b.value, 0.0, rise / dt); break;
        case kTQInterpolationEaseIn: setHermite(seg, a.value, b.value, rise / dt, 0.0); break;
        case kTQInterpolationLinear:
        default:
            seg.y[0] = a.value;
            seg.y[1] = rise;
            break;
    }
    return seg;
}

double expShape(double s) { return std::expm1(kShapeCurvature * s) / std::expm1(kShapeCurvature); }

double logShape(double s) { return 1.0 - expShape(1.0 - s); }

namespace {

// Bracketed Newton: the safe path. A step that leaves the bracket, or a flat derivative,
// falls back to bisection, so it always converges on a monotone segment.
double solveBracketed(const CurveSegment& seg, double tr, double guess) {
    double lo = 0.0;
    double hi = 1.0;
    double s = std::clamp(guess, 0.0, 1.0);
    for (int iteration = 0; iteration < 64; ++iteration) {
        const double f = bezierTime(seg, s) - tr;
        if (f > 0.0) {
            hi = s;
        } else if (f < 0.0) {
            lo = s;
        } else {
            return s;
        }
        const double d = bezierTimeSlope(seg, s);
        double next = d > 0.0 ? s - f / d : lo - 1.0;
        if (!(next > lo && next < hi)) next = 0.5 * (lo + hi);
        const double step = next - s;
        s = next;
        if (std::fabs(step) <= kNewtonStepTolerance || hi - lo <= 1e-15) return s;
    }
    return s;
}

// Halley steps converge cubically near a simple root: from the chord's parameter three of them
// reach machine precision on all but sharply bent segments.
constexpr int kHalleySteps = 3;
// Their result stands when the Newton correction left at it, time error over slope, is below
// this: near a simple root that is the error left (a third of it at the flat inflection of a
// segment whose handles both reach across it). The last step's size is no guide: close to that
// inflection each step is about as long as the distance to it, so the steps grow while the
// root may still lie far off.
constexpr double kSettledTolerance = 1e-13;

// The lane kernels below run the same arithmetic on every lane without branches, so the
// compiler turns their loops into vector code; on x86-64 a second copy for the AVX2 and FMA
// generation is picked at load time (GCC on ELF). Sanitizer builds keep one copy.
#if defined(__x86_64__) && defined(__GNUC__) && !defined(__clang__) && defined(__ELF__) && \
    !defined(__SANITIZE_ADDRESS__)
#define TQ_LANE_CLONES __attribute__((target_clones("arch=x86-64-v3", "default")))
#else
#define TQ_LANE_CLONES
#endif

inline double clampUnit(double s) { return std::min(std::max(s, 0.0), 1.0); }

// Samples solved side by side, one per lane, structure of arrays. A batch is padded to whole
// groups of lanes with copies of lane 0, so the kernels always run whole vectors.
constexpr unsigned kLaneGroup = 4;
struct Lanes {
    alignas(64) double c0[kColdBatch];  // time(s) - t0 = s (c0 + s (c1 + s c2))
    alignas(64) double c1[kColdBatch];
    alignas(64) double c2[kColdBatch];
    alignas(64) double tr[kColdBatch];  // target time - t0
    alignas(64) double s[kColdBatch];
    alignas(64) double settled[kColdBatch];  // 1 where s stands, 0 where it needs the safe path
};

// One Halley step for time(s) = tr, given the time polynomial's coefficients; where the step
// is undefined s stays, and the check after the steps finds it unsettled. Without branches,
// so that the lane kernel's loop vectorises.
inline double halleyStep(double c0, double c1, double c2, double tr, double s) {
    // The step 2 f d / (2 d^2 - f d2), with d the slope and d2 its derivative, written with
    // h = d2 / 2: the same value in fewer operations.
    const double f = s * (c0 + s * (c1 + s * c2)) - tr;
    const double h = c1 + 3.0 * c2 * s;
    const double d = c0 + s * (c1 + h);
    const double den = d * d - f * h;
    const bool defined = den > 0.0;
    // Divide unconditionally and select after: a branch would keep the loop scalar.
    const double q = (f * d) / (defined ? den : 1.0);
    return clampUnit(s - (defined ? q : 0.0));
}

// Whether s solves time(s) = tr to kSettledTolerance: |f| / slope, compared without dividing.
// Where the slope is zero only an exact root settles.
inline bool settledAt(double c0, double c1, double c2, double tr, double s) {
    const double f = s * (c0 + s * (c1 + s * c2)) - tr;
    const double d = c0 + s * (2.0 * c1 + 3.0 * c2 * s);
    return std::fabs(f) <= kSettledTolerance * d;
}

// kHalleySteps Halley steps on every lane; settled marks the lanes whose result stands.
TQ_LANE_CLONES void halleyLanes(Lanes& l, unsigned lanes) {
    for (int k = 0; k < kHalleySteps; ++k) {
        for (unsigned m = 0; m < lanes; ++m) {
            l.s[m] = halleyStep(l.c0[m], l.c1[m], l.c2[m], l.tr[m], l.s[m]);
        }
    }
    for (unsigned m = 0; m < lanes; ++m) {
        l.settled[m] = settledAt(l.c0[m], l.c1[m], l.c2[m], l.tr[m], l.s[m]) ? 1.0 : 0.0;
    }
}

}  // namespace

double solveBezierParameter(const CurveSegment& seg, double target, double guess) {
    const double tr = target - seg.t0;
    // Fixed Halley steps; the bracketed solver takes what they leave unsettled.
    double s = clampUnit(guess);
    for (int k = 0; k < kHalleySteps; ++k) s = halleyStep(seg.x[0], seg.x[1], seg.x[2], tr, s);
    if (settledAt(seg.x[0], seg.x[1], seg.x[2], tr, s)) return s;
    return solveBracketed(seg, tr, s);
}

void CurveCache::solveColdBatch(const ColdSample* batch, unsigned n, double* values,
                                double* solved) const {
    if (n == 0) return;
    // The same steps as solveBezierParameter, one sample per lane: the samples lie in
    // different segments and don't depend on each other.
    Lanes l;
    const unsigned lanes = std::min((n + kLaneGroup - 1) / kLaneGroup * kLaneGroup, kColdBatch);
    for (unsigned m = 0; m < lanes; ++m) {
        const ColdSample& c = batch[m < n ? m : 0];
        const CurveSegment& seg = *c.segment;
        l.c0[m] = seg.x[0];
        l.c1[m] = seg.x[1];
        l.c2[m] = seg.x[2];
        l.tr[m] = c.seconds - seg.t0;
        l.s[m] = clampUnit(c.guess >= 0.0 ? c.guess : l.tr[m] * seg.invDt);
    }
    halleyLanes(l, lanes);
    for (unsigned m = 0; m < n; ++m) {
        const CurveSegment& seg = *batch[m].segment;
        double s = l.s[m];
        if (!(l.settled[m] > 0.0)) s = solveBracketed(seg, l.tr[m], s);
        values[batch[m].index] = polynomial(seg, s);
        if (solved) solved[m] = s;
    }
}

void CurveCache::build(const std::vector<TQKeyframeRecord>& keys, bool discrete,
                       double initialValue, unsigned extrapolationBefore,
                       unsigned extrapolationAfter) {
    _segments.clear();
    _starts.clear();
    _initialValue = initialValue;
    _extrapolationBefore = extrapolationBefore;
    _extrapolationAfter = extrapolationAfter;
    _slopeBefore = 0.0;
    _slopeAfter = 0.0;

    std::vector<const TQKeyframeRecord*> pts;
    collectStanding(keys, pts);
    _keyCount = pts.size();
    if (pts.empty()) return;
    _firstT = pts.front()->seconds;
    _firstV = pts.front()->value;
    _lastT = pts.back()->seconds;
    _lastV = pts.back()->value;

    _segments.reserve(pts.size() - 1);
    _starts.reserve(pts.size() - 1);
    // Catmull-Rom slopes take the chord through the neighbours, one-sided at the ends.
    auto chordSlope = [&](size_t i) {
        return catmullRomSlope(*pts[i == 0 ? 0 : i - 1], *pts[i + 1 < pts.size() ? i + 1 : i]);
    };
    for (size_t i = 0; i + 1 < pts.size(); ++i) {
        const TQKeyframeRecord& a = *pts[i];
        const unsigned code = discrete ? unsigned(kTQInterpolationConstant) : a.interpolation;
        const bool catmullRom = code == kTQInterpolationCatmullRom;
        const CurveSegment seg = makeSegment(a, *pts[i + 1], code, catmullRom ? chordSlope(i) : 0.0,
                                             catmullRom ? chordSlope(i + 1) : 0.0);
        if (!(seg.invDt > 0.0)) continue;  // distinct times closer than a double tells apart
        _segments.push_back(seg);
        _starts.push_back(seg.t0);
    }
    if (!_segments.empty()) {
        _slopeBefore = slopeAt(_segments.front(), 0.0);
        _slopeAfter = slopeAt(_segments.back(), 1.0);
    }
}

size_t CurveCache::locate(double seconds, CurveCursor& cursor) const {
    // The cursor's segment or the next: what a sorted walk mostly asks, kept small enough to
    // be inlined into the walk.
    const size_t n = _starts.size();
    const size_t i = cursor.segment < n ? cursor.segment : 0;
    const double* starts = _starts.data();
    if (seconds >= starts[i]) {
        if (i + 1 == n || seconds < starts[i + 1]) return i;
        if (i + 2 == n || seconds < starts[i + 2]) return i + 1;
    }
    return locateFar(seconds, i, cursor.stride);
}

size_t CurveCache::locateFar(double seconds, size_t i, size_t& stride) const {
    // For a time before segment i or past segment i + 1. Galloping search from segment i:
    // O(log d) for a sample d segments away, so a sorted walk costs what the segments crossed
    // cost, and stays within nearby memory.
    const size_t n = _starts.size();
    const double* starts = _starts.data();
    if (seconds >= starts[i]) {
        size_t lo = i + 2;  // at or before `seconds`
        size_t hi = n;
        // Evenly spaced samples cross about as many segments each time: look there first.
        const size_t guess = i + stride;
        if (stride > 2 && guess < n) {
            if (starts[guess] <= seconds) {
                lo = guess;
            } else {
                hi = guess;
            }
        }
        if (hi == n) {
            size_t step = 1;
            while (lo + step < n && starts[lo + step] <= seconds) {
                lo += step;
                step *= 2;
            }
            hi = std::min(lo + step, n);
        }
        const size_t k = size_t(std::upper_bound(starts + lo, starts + hi, seconds) - starts) - 1;
        stride = k - i;
        return k;
    }
    size_t hi = i;  // the answer lies below hi
    size_t step = 1;
    while (hi >= step && starts[hi - step] > seconds) {
        hi -= step;
        step *= 2;
    }
    const size_t lo = hi >= step ? hi - step : 0;
    const size_t k = size_t(std::upper_bound(starts + lo, starts + hi, seconds) - starts);
    return k == 0 ? 0 : k - 1;
}

double CurveCache::evaluateInside(double seconds, CurveCursor& cursor) const {
    if (seconds >= _lastT || _segments.empty()) return _lastV;
    const size_t i = locate(seconds, cursor);
    if (i != cursor.segment) {
        cursor.segment = i;
        cursor.warm = false;
    }
    const CurveSegment& seg = _segments[i];
    const double s = (seconds - seg.t0) * seg.invDt;
    switch (seg.kind) {
        case SegmentKind::Polynomial: return polynomial(seg, s);
        case SegmentKind::Exp: return seg.y[0] + seg.y[1] * expShape(s);
        case SegmentKind::Log: return seg.y[0] + seg.y[1] * logShape(s);
        case SegmentKind::Bezier: break;
    }
    double guess = s;  // the chord's parameter
    if (cursor.warm) {
        // Warm start: one tangent step from the parameter solved for the previous sample.
        const double d = bezierTimeSlope(seg, cursor.lastS);
        if (d > 0.0) guess = cursor.lastS + (seconds - cursor.lastT) / d;
    }
    const double solved = solveBezierParameter(seg, seconds, guess);
    cursor.warm = true;
    cursor.lastS = solved;
    cursor.lastT = seconds;
    return polynomial(seg, solved);
}

double CurveCache::snapToKeyframe(double seconds, double slack, CurveCursor& cursor) const {
    if (_segments.empty() || seconds >= _lastT) return seconds;
    if (_lastT - seconds <= slack) return _lastT;
    const size_t i = locate(seconds, cursor);
    if (i + 1 < _starts.size() && _starts[i + 1] - seconds <= slack) return _starts[i + 1];
    return seconds;
}

double CurveCache::evaluateOutside(double seconds, bool before, CurveCursor& cursor) const {
    const unsigned code = before ? _extrapolationBefore : _extrapolationAfter;
    const double endT = before ? _firstT : _lastT;
    const double endV = before ? _firstV : _lastV;
    const double period = _lastT - _firstT;
    switch (code) {
        case kTQExtrapolationLinear:
            return endV + (before ? _slopeBefore : _slopeAfter) * (seconds - endT);
        case kTQExtrapolationPingPong:
        case kTQExtrapolationRepeat:
        case kTQExtrapolationProgressive: {
            if (!(period > 0.0)) return endV;
            // The time within the cycle is off by a few roundings of the times involved. A time
            // that far short of a cycle's start, or of a keyframe, is taken as that time: a
            // jump between cycles or a step then lands on the frame where it lands among the
            // keyframes, not a frame late.
            const double slack = 8.0 * std::numeric_limits<double>::epsilon() *
                                 (std::fabs(seconds) + std::fabs(_firstT) + period);
            const double d = seconds - _firstT;
            const double cycles = std::floor((d + slack) / period);
            double u = std::clamp(d - cycles * period, 0.0, period);
            if (code == kTQExtrapolationPingPong && std::fmod(cycles, 2.0) != 0.0) u = period - u;
            const double v = evaluateInside(snapToKeyframe(_firstT + u, slack, cursor), cursor);
            if (code == kTQExtrapolationProgressive) return v + cycles * (_lastV - _firstV);
            return v;
        }
        case kTQExtrapolationConstant:
        default: return endV;
    }
}

double CurveCache::evaluate(double seconds, CurveCursor& cursor, bool extrapolate) const {
    if (_keyCount == 0) return _initialValue;
    if (_keyCount == 1 || std::isnan(seconds)) return _firstV;
    if (seconds < _firstT) return extrapolate ? evaluateOutside(seconds, true, cursor) : _firstV;
    if (seconds > _lastT) return extrapolate ? evaluateOutside(seconds, false, cursor) : _lastV;
    return evaluateInside(seconds, cursor);
}

namespace {

// Samples solved together from one warm start. Within a block no sample waits for another,
// so their Newton steps overlap in the processor instead of forming one long chain.
constexpr unsigned kBlock = 16;
static_assert(kBlock <= kColdBatch, "a block's unsettled samples are solved as one cold batch");

// A segment's last samples, and every sample of a segment with fewer than this, are solved
// cold, side by side with those of the segments around: a warm start pays off over a long
// run only, since each block waits for the one before.
constexpr CMTimeValue kShortRun = 64;
// How far in s the warm start's series is trusted; farther samples are solved cold.
constexpr double kWarmReach = 0.1;
// Each warm start gets two corrections; the last must be under this for the block's answer to
// stand: the error left is that step times about |x''/x'| times the warm start's error.
constexpr double kBlockStepTolerance = 1e-10;

// One block of a run of samples in one Bezier segment, one sample per lane.
struct WarmBlock {
    alignas(64) double secs[kBlock];   // in: the sample times
    alignas(64) double s[kBlock];      // out: the parameter reached, or where to solve from
    alignas(64) double value[kBlock];  // out: the value at s
    alignas(64) double step[kBlock];   // out: the last step; 1 where the warm start failed
    // Between passes:
    alignas(64) double tr[kBlock];      // sample time - t0
    alignas(64) double rm[kBlock];      // 1 / slope at the warm start
    alignas(64) double reach[kBlock];   // distance in s from the anchor
    alignas(64) double sloped[kBlock];  // 1 where the slope at the warm start is positive
};

// Warm starts from the last solved sample (anchorT, anchorS): the inverse's Taylor series to
// second order, s(t + h) = s + h / x' - x'' h^2 / (2 x'^3), accurate to O(h^3), then two
// Newton steps with the slope taken once, at the warm start: it is within O(h^2) of the slope
// at the root, so each step gains far more than its size, at one division per sample. Lanes
// too far from the anchor for the series get the chord's parameter to start a cold solve from.
//
// Done in passes over the block, each a loop without branches that vectorises; in one loop
// the compiler turns the clamps into branches.
TQ_LANE_CLONES void warmLanes(const CurveSegment& seg, double anchorT, double anchorS,
                              WarmBlock& b) {
    const double x0 = seg.x[0], x1 = seg.x[1], x2 = seg.x[2];
    const double r = 1.0 / (x0 + anchorS * (2.0 * x1 + 3.0 * x2 * anchorS));
    const double curl = (2.0 * x1 + 6.0 * x2 * anchorS) * 0.5 * r;
    const double t0 = seg.t0;
    for (unsigned m = 0; m < kBlock; ++m) {
        const double ds = (b.secs[m] - anchorT) * r;
        const double sp = clampUnit(anchorS + ds - curl * ds * ds);
        const double slope = x0 + sp * (2.0 * x1 + 3.0 * x2 * sp);
        const bool sloped = slope > 0.0;
        b.tr[m] = b.secs[m] - t0;
        b.s[m] = sp;
        b.rm[m] = 1.0 / (sloped ? slope : 1.0);
        b.reach[m] = std::fabs(ds);
        b.sloped[m] = sloped ? 1.0 : 0.0;
    }
    for (int k = 0; k < 2; ++k) {
        for (unsigned m = 0; m < kBlock; ++m) {
            const double sp = b.s[m];
            const double step = (sp * (x0 + sp * (x1 + sp * x2)) - b.tr[m]) * b.rm[m];
            b.s[m] = clampUnit(sp - step);
            b.step[m] = step;
        }
    }
    const double y0 = seg.y[0], y1 = seg.y[1], y2 = seg.y[2], y3 = seg.y[3];
    const double invDt = seg.invDt;
    for (unsigned m = 0; m < kBlock; ++m) {
        const double sp = b.s[m];
        const bool near = b.reach[m] <= kWarmReach;
        b.value[m] = y0 + sp * (y1 + sp * (y2 + sp * y3));
        const double settledStep = b.sloped[m] > 0.0 ? b.step[m] : 1.0;
        b.step[m] = near ? settledStep : 1.0;
        b.s[m] = near ? sp : b.tr[m] * invDt;
    }
}

}  // namespace

unsigned CurveCache::sampleBezierRun(const CurveSegment& seg, CMTimeValue value,
                                     CMTimeValue stepValue, double scale, unsigned remaining,
                                     double* values) const {
    // First sample of the run: a cold solve from the chord's parameter.
    double lastT = double(value) / scale;
    double lastS = solveBezierParameter(seg, lastT, (lastT - seg.t0) * seg.invDt);
    values[0] = polynomial(seg, lastS);
    unsigned done = 1;

    WarmBlock b;
    while (done < remaining) {
        unsigned n = 0;
        for (; n < kBlock && done + n < remaining; ++n) {
            // Sample done + n exists (it is below `remaining`), so its time value fits.
            const double t = double(value + CMTimeValue(done + n) * stepValue) / scale;
            if (!(t < seg.t1)) break;
            b.secs[n] = t;
        }
        if (n == 0) break;
        for (unsigned m = n; m < kBlock; ++m) b.secs[m] = b.secs[0];
        ColdSample rest[kBlock];
        unsigned restCount = 0;
        if (!(bezierTimeSlope(seg, lastS) > 1e-6 * (seg.t1 - seg.t0))) {
            // No slope to extrapolate with: all cold.
            for (unsigned m = 0; m < n; ++m) {
                rest[restCount++] = ColdSample{&seg, b.secs[m], done + m, -1.0};
            }
        } else {
            warmLanes(seg, lastT, lastS, b);
            // Where the curve bends hard within the block, or the samples lie far apart in
            // the segment, the warm start was not close enough: those samples are solved like
            // cold ones, from where the block got to.
            for (unsigned m = 0; m < n; ++m) {
                if (std::fabs(b.step[m]) <= kBlockStepTolerance) {
                    values[done + m] = b.value[m];
                } else {
                    rest[restCount++] = ColdSample{&seg, b.secs[m], done + m, b.s[m]};
                }
            }
        }
        if (restCount > 0) {
            double solved[kBlock];
            solveColdBatch(rest, restCount, values, solved);
            for (unsigned m = 0; m < restCount; ++m) b.s[rest[m].index - done] = solved[m];
        }
        lastS = b.s[n - 1];
        lastT = b.secs[n - 1];
        done += n;
        if (n < kBlock) break;
    }
    return done;
}

void CurveCache::sample(CMTimeValue startValue, CMTimeValue stepValue, CMTimeScale timescale,
                        CMTimeEpoch epoch, unsigned count, CMTime* times, double* values) const {
    if (times) {
        for (unsigned i = 0; i < count; ++i) {
            times[i] = CMTime{startValue + CMTimeValue(i) * stepValue, timescale,
                              kCMTimeFlags_Valid, epoch};
        }
    }
    if (!values) return;
    const double scale = double(timescale);
    const double shortRun = double(kShortRun) * double(stepValue) / scale;
    CurveCursor cursor;
    ColdSample cold[kColdBatch];
    unsigned coldCount = 0;
    unsigned i = 0;
    while (i < count) {
        const CMTimeValue v = startValue + CMTimeValue(i) * stepValue;
        const double t = double(v) / scale;
        if (_keyCount >= 2 && t >= _firstT && t < _lastT && !_segments.empty()) {
            const size_t k = locate(t, cursor);
            cursor.segment = k;
            const CurveSegment& seg = _segments[k];
            if (seg.kind == SegmentKind::Bezier) {
                if (!(t + shortRun < seg.t1)) {
                    // One of the last samples in this segment: too few left to gain from a
                    // warm start. Solved with the next such samples, side by side.
                    cold[coldCount++] = ColdSample{&seg, t, i, -1.0};
                    if (coldCount == kColdBatch) {
                        solveColdBatch(cold, coldCount, values);
                        coldCount = 0;
                    }
                    ++i;
                    continue;
                }
                // Every sample of the run inside this segment at once.
                i += sampleBezierRun(seg, v, stepValue, scale, count - i, values + i);
                continue;
            }
        }
        values[i] = evaluate(t, cursor, true);
        ++i;
    }
    solveColdBatch(cold, coldCount, values);
}

}  // namespace tq_internal
