#pragma once
// Internal: exact re-expressions of one segment of a curve, for edits that give a segment new
// neighbours or cut it: simplify keeps segments of the curve whole among fitted ones, generate
// copies cycles of the curve and joins them. A Catmull-Rom segment takes its shape from its
// neighbours, so it moves with them unless it is written out as the Bezier curve it is.

#include "platform/channels/internal/TQChannelData.h"
#include "platform/channels/internal/TQCurveCache.h"

namespace tq_internal {

// Cubic Bezier control points of a segment: absolute seconds and values.
struct BezierControl {
    double t[4];
    double v[4];
};

// The segment as Bezier control points: exact for every kind but Exp and Log, which have no
// cubic form (false). Time control points of a kind other than Bezier lie at thirds.
bool bezierControl(const CurveSegment& segment, BezierControl& out);

// The control points of the part of the curve between parameters s0 < s1 (de Casteljau).
BezierControl subdivide(const BezierControl& c, double s0, double s1);

// Makes the segment from a to b the Bezier curve c: a's output handle and b's input handle, and
// a's interpolation Bezier. Times and values are left as they are: c's ends are theirs.
void setBezierHandles(TQKeyframeRecord& a, TQKeyframeRecord& b, const BezierControl& c);

// The parameter of the segment at a time within it, and its value at a parameter.
double segmentParameter(const CurveSegment& segment, double seconds);
double segmentValue(const CurveSegment& segment, double s);

// The keyframe's handles point in opposite directions, or one of them has no length: what an
// unbroken pair keeps.
bool handlesAligned(const TQKeyframeRecord& k);

}  // namespace tq_internal
