#include "platform/channels/internal/TQCurveCache.h"

#include <algorithm>
#include <cmath>

#include "platform/channels/TQChannel.h"
#include "platform/channels/internal/TQChannelData.h"

namespace tq_internal {

namespace {

// Curvature of the Exp and Log shapes: the Exp segment reaches half its rise at s = 0.83.
constexpr double kShapeCurvature = 4.0;

// Steps tried from the cursor's segment before a binary search: samples usually land in the
// same or the next segment.
constexpr int kCursorWalk = 4;

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
    case SegmentKind::Bezier:
        break;
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

// Non-uniform Catmull-Rom slope: the chord through the neighbours, one-sided at the ends.
template <typename Points>
double catmullRomSlope(const Points& pts, size_t i) {
    const size_t n = pts.size();
    const size_t lo = i == 0 ? 0 : i - 1;
    const size_t hi = i + 1 < n ? i + 1 : n - 1;
    const double dt = pts[hi]->seconds - pts[lo]->seconds;
    if (!(dt > 0.0)) return 0.0;
    return (pts[hi]->value - pts[lo]->value) / dt;
}

}  // namespace

double expShape(double s) { return std::expm1(kShapeCurvature * s) / std::expm1(kShapeCurvature); }

double logShape(double s) { return 1.0 - expShape(1.0 - s); }

double solveBezierParameter(const CurveSegment& seg, double target, double guess) {
    const double tr = target - seg.t0;
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
    pts.reserve(keys.size());
    for (const TQKeyframeRecord& k : keys) {
        if (!k.enabled) continue;
        if (!pts.empty() && CMTimeCompare(pts.back()->time, k.time) == 0) {
            pts.back() = &k;  // keyframes that met: the last arrived stands for the time
        } else {
            pts.push_back(&k);
        }
    }
    _keyCount = pts.size();
    if (pts.empty()) return;
    _firstT = pts.front()->seconds;
    _firstV = pts.front()->value;
    _lastT = pts.back()->seconds;
    _lastV = pts.back()->value;

    _segments.reserve(pts.size() - 1);
    _starts.reserve(pts.size() - 1);
    for (size_t i = 0; i + 1 < pts.size(); ++i) {
        const TQKeyframeRecord& a = *pts[i];
        const TQKeyframeRecord& b = *pts[i + 1];
        CurveSegment seg;
        seg.t0 = a.seconds;
        seg.t1 = b.seconds;
        const double dt = seg.t1 - seg.t0;
        if (!(dt > 0.0)) continue;  // distinct times closer than a double tells apart
        seg.invDt = 1.0 / dt;
        const double rise = b.value - a.value;
        const unsigned code = discrete ? unsigned(kTQInterpolationConstant) : a.interpolation;
        switch (code) {
        case kTQInterpolationConstant:
            seg.y[0] = a.value;
            break;
        case kTQInterpolationBezier:
            setBezier(seg, a, b);
            break;
        case kTQInterpolationCatmullRom:
            setHermite(seg, a.value, b.value, catmullRomSlope(pts, i),
                       catmullRomSlope(pts, i + 1));
            break;
        case kTQInterpolationExp:
        case kTQInterpolationLog:
            seg.kind = code == kTQInterpolationExp ? SegmentKind::Exp : SegmentKind::Log;
            seg.y[0] = a.value;
            seg.y[1] = rise;
            break;
        case kTQInterpolationEaseBoth:
            setHermite(seg, a.value, b.value, 0.0, 0.0);
            break;
        case kTQInterpolationEaseOut:
            setHermite(seg, a.value, b.value, 0.0, rise / dt);
            break;
        case kTQInterpolationEaseIn:
            setHermite(seg, a.value, b.value, rise / dt, 0.0);
            break;
        case kTQInterpolationLinear:
        default:
            seg.y[0] = a.value;
            seg.y[1] = rise;
            break;
        }
        _segments.push_back(seg);
        _starts.push_back(seg.t0);
    }
    if (!_segments.empty()) {
        _slopeBefore = slopeAt(_segments.front(), 0.0);
        _slopeAfter = slopeAt(_segments.back(), 1.0);
    }
}

size_t CurveCache::locate(double seconds, CurveCursor& cursor) const {
    const size_t n = _segments.size();
    size_t i = cursor.segment < n ? cursor.segment : 0;
    const CurveSegment* seg = &_segments[i];
    if (seconds >= seg->t0 && seconds < seg->t1) return i;
    if (seconds >= seg->t1) {
        for (int step = 0; step < kCursorWalk && i + 1 < n; ++step) {
            seg = &_segments[++i];
            if (seconds < seg->t1) return i;
        }
    } else {
        for (int step = 0; step < kCursorWalk && i > 0; ++step) {
            seg = &_segments[--i];
            if (seconds >= seg->t0) return i;
        }
    }
    const auto it = std::upper_bound(_starts.begin(), _starts.end(), seconds);
    return it == _starts.begin() ? 0 : size_t(it - _starts.begin()) - 1;
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
    case SegmentKind::Polynomial:
        return polynomial(seg, s);
    case SegmentKind::Exp:
        return seg.y[0] + seg.y[1] * expShape(s);
    case SegmentKind::Log:
        return seg.y[0] + seg.y[1] * logShape(s);
    case SegmentKind::Bezier:
        break;
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
        const double cycles = std::floor((seconds - _firstT) / period);
        double u = std::clamp((seconds - _firstT) - cycles * period, 0.0, period);
        if (code == kTQExtrapolationPingPong && std::fmod(cycles, 2.0) != 0.0) u = period - u;
        const double v = evaluateInside(_firstT + u, cursor);
        if (code == kTQExtrapolationProgressive) return v + cycles * (_lastV - _firstV);
        return v;
    }
    case kTQExtrapolationConstant:
    default:
        return endV;
    }
}

double CurveCache::evaluate(double seconds, CurveCursor& cursor, bool extrapolate) const {
    if (_keyCount == 0) return _initialValue;
    if (_keyCount == 1 || std::isnan(seconds)) return _firstV;
    if (seconds < _firstT) return extrapolate ? evaluateOutside(seconds, true, cursor) : _firstV;
    if (seconds > _lastT) return extrapolate ? evaluateOutside(seconds, false, cursor) : _lastV;
    return evaluateInside(seconds, cursor);
}

void CurveCache::sample(CMTimeValue startValue, CMTimeValue stepValue, CMTimeScale timescale,
                        CMTimeEpoch epoch, unsigned count, CMTime* times, double* values) const {
    CurveCursor cursor;
    const double scale = double(timescale);
    CMTimeValue v = startValue;
    for (unsigned i = 0; i < count; ++i, v += stepValue) {
        if (times) times[i] = CMTime{v, timescale, kCMTimeFlags_Valid, epoch};
        if (values) values[i] = evaluate(double(v) / scale, cursor, true);
    }
}

}  // namespace tq_internal
