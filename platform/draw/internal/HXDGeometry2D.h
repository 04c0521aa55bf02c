#pragma once
// Internal: the planar tests of the hit test, in drawable pixels (double precision).

#include <algorithm>
#include <cmath>

#include "platform/geometry/CGGeometry.h"

namespace hxd_internal {

// Distance from p to the segment ab (to a when the segment has no length).
inline double distanceToSegment(double px, double py, double ax, double ay, double bx, double by) {
    const double dx = bx - ax;
    const double dy = by - ay;
    const double len2 = dx * dx + dy * dy;
    double t = 0.0;
    if (len2 > 0.0) t = std::clamp(((px - ax) * dx + (py - ay) * dy) / len2, 0.0, 1.0);
    const double cx = ax + t * dx - px;
    const double cy = ay + t * dy - py;
    return std::sqrt(cx * cx + cy * cy);
}

// Whether the segment ab meets the closed rectangle [x0, x1] x [y0, y1] (Liang-Barsky
// clipping of the segment's parameter range).
inline bool segmentMeetsRect(double ax, double ay, double bx, double by, double x0, double y0,
                             double x1, double y1) {
    double t0 = 0.0;
    double t1 = 1.0;
    const double dx = bx - ax;
    const double dy = by - ay;
    auto clip = [&](double p, double q) {
        if (p == 0.0) return q >= 0.0;
        const double r = q / p;
        if (p < 0.0) {
            if (r > t1) return false;
            t0 = std::max(t0, r);
        } else {
            if (r < t0) return false;
            t1 = std::min(t1, r);
        }
        return true;
    };
    return clip(-dx, ax - x0) && clip(dx, x1 - ax) && clip(-dy, ay - y0) && clip(dy, y1 - ay) &&
           t0 <= t1;
}

// Closed rectangles meet (touching edges count). Rectangles are standardized.
inline bool rectsMeet(const CGRect& a, const CGRect& b) {
    return a.origin.x <= b.origin.x + b.size.width && b.origin.x <= a.origin.x + a.size.width &&
           a.origin.y <= b.origin.y + b.size.height && b.origin.y <= a.origin.y + a.size.height;
}

inline bool rectContains(const CGRect& r, double x, double y) {
    return x >= r.origin.x && x <= r.origin.x + r.size.width && y >= r.origin.y &&
           y <= r.origin.y + r.size.height;
}

// Distance from a point outside a rectangle to it; 0 inside or on the edge.
inline double distanceToRect(const CGRect& r, double x, double y) {
    const double dx = std::max({r.origin.x - x, 0.0, x - (r.origin.x + r.size.width)});
    const double dy = std::max({r.origin.y - y, 0.0, y - (r.origin.y + r.size.height)});
    return std::sqrt(dx * dx + dy * dy);
}

}  // namespace hxd_internal
