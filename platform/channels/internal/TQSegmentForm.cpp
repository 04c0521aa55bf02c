#include "platform/channels/internal/TQSegmentForm.h"

#include <cmath>

#include "platform/channels/TQChannel.h"

namespace tq_internal {

namespace {

// Bernstein coefficients of c0 + a1 s + a2 s^2 + a3 s^3.
void bernstein(double c0, double a1, double a2, double a3, double out[4]) {
    out[0] = c0;
    out[1] = c0 + a1 / 3.0;
    out[2] = a2 / 3.0 + 2.0 * out[1] - c0;
    out[3] = c0 + a1 + a2 + a3;
}

void split(const double c[4], double s, double left[4], double right[4]) {
    const double ab = c[0] + (c[1] - c[0]) * s;
    const double bc = c[1] + (c[2] - c[1]) * s;
    const double cd = c[2] + (c[3] - c[2]) * s;
    const double abc = ab + (bc - ab) * s;
    const double bcd = bc + (cd - bc) * s;
    const double mid = abc + (bcd - abc) * s;
    left[0] = c[0];
    left[1] = ab;
    left[2] = abc;
    left[3] = mid;
    right[0] = mid;
    right[1] = bcd;
    right[2] = cd;
    right[3] = c[3];
}

void part(const double c[4], double s0, double s1, double out[4]) {
    double left[4], right[4], scratch[4];
    split(c, s1, left, scratch);
    if (s0 <= 0.0) {
        for (int i = 0; i < 4; ++i) out[i] = left[i];
        return;
    }
    split(left, s0 / s1, scratch, right);
    for (int i = 0; i < 4; ++i) out[i] = right[i];
}

}  // namespace

bool bezierControl(const CurveSegment& segment, BezierControl& out) {
    const CurveSegment& g = segment;
    switch (g.kind) {
        case SegmentKind::Exp:
        case SegmentKind::Log: return false;
        case SegmentKind::Bezier: bernstein(g.t0, g.x[0], g.x[1], g.x[2], out.t); break;
        case SegmentKind::Polynomial: bernstein(g.t0, g.t1 - g.t0, 0.0, 0.0, out.t); break;
    }
    bernstein(g.y[0], g.y[1], g.y[2], g.y[3], out.v);
    out.t[3] = g.t1;  // exactly, not as a sum
    return true;
}

BezierControl subdivide(const BezierControl& c, double s0, double s1) {
    BezierControl out;
    part(c.t, s0, s1, out.t);
    part(c.v, s0, s1, out.v);
    return out;
}

void setBezierHandles(TQKeyframeRecord& a, TQKeyframeRecord& b, const BezierControl& c) {
    a.outU = c.t[1] - c.t[0];
    a.outV = c.v[1] - c.v[0];
    b.inU = c.t[2] - c.t[3];
    b.inV = c.v[2] - c.v[3];
    a.interpolation = kTQInterpolationBezier;
}

double segmentParameter(const CurveSegment& segment, double seconds) {
    const double chord = (seconds - segment.t0) * segment.invDt;
    if (segment.kind != SegmentKind::Bezier) return chord;
    return solveBezierParameter(segment, seconds, chord);
}

double segmentValue(const CurveSegment& segment, double s) {
    const CurveSegment& g = segment;
    switch (g.kind) {
        case SegmentKind::Exp: return g.y[0] + g.y[1] * expShape(s);
        case SegmentKind::Log: return g.y[0] + g.y[1] * logShape(s);
        case SegmentKind::Polynomial:
        case SegmentKind::Bezier: break;
    }
    return g.y[0] + s * (g.y[1] + s * (g.y[2] + s * g.y[3]));
}

bool handlesAligned(const TQKeyframeRecord& k) {
    const double in = std::hypot(k.inU, k.inV);
    const double out = std::hypot(k.outU, k.outV);
    if (in == 0.0 || out == 0.0) return true;
    const double cross = k.inU * k.outV - k.inV * k.outU;
    const double dot = k.inU * k.outU + k.inV * k.outV;
    return dot < 0.0 && std::fabs(cross) <= 1e-9 * in * out;
}

}  // namespace tq_internal
