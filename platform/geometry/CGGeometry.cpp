#include "platform/geometry/CGGeometry.h"

#include <algorithm>
#include <cmath>

namespace {

constexpr double kInfinity = std::numeric_limits<double>::infinity();

// Edges of a standardized, non-null rectangle.
struct Edges {
    double minX, minY, maxX, maxY;
};

Edges edgesOf(const CGRect& rect) {
    const CGRect s = CGRectStandardize(rect);
    return {s.origin.x, s.origin.y, s.origin.x + s.size.width, s.origin.y + s.size.height};
}

bool hasNaN(const Edges& e) {
    return std::isnan(e.minX) || std::isnan(e.minY) || std::isnan(e.maxX) || std::isnan(e.maxY);
}

CGRect rectFromEdges(double minX, double minY, double maxX, double maxY) {
    return CGRectMake(minX, minY, maxX - minX, maxY - minY);
}

}  // namespace

bool CGRectIsNull(const CGRect& rect) {
    return rect.origin.x == kInfinity || rect.origin.y == kInfinity;
}

bool CGRectIsInfinite(const CGRect& rect) {
    if (CGRectIsNull(rect)) return false;
    const Edges e = edgesOf(rect);
    const Edges inf = edgesOf(CGRectInfinite);
    return e.minX <= inf.minX && e.minY <= inf.minY && e.maxX >= inf.maxX && e.maxY >= inf.maxY;
}

bool CGRectIsEmpty(const CGRect& rect) {
    if (CGRectIsNull(rect)) return true;
    // Written as "not positive extent" so that a NaN extent also counts as empty.
    return !(std::fabs(rect.size.width) > 0.0) || !(std::fabs(rect.size.height) > 0.0);
}

CGRect CGRectStandardize(const CGRect& rect) {
    if (CGRectIsNull(rect)) return CGRectNull;
    CGRect r = rect;
    if (r.size.width < 0.0) {
        r.origin.x += r.size.width;
        r.size.width = -r.size.width;
    }
    if (r.size.height < 0.0) {
        r.origin.y += r.size.height;
        r.size.height = -r.size.height;
    }
    return r;
}

CGFloat CGRectGetMinX(const CGRect& rect) { return CGRectStandardize(rect).origin.x; }
CGFloat CGRectGetMinY(const CGRect& rect) { return CGRectStandardize(rect).origin.y; }

CGFloat CGRectGetMidX(const CGRect& rect) {
    const CGRect s = CGRectStandardize(rect);
    return s.origin.x + s.size.width * 0.5;
}

CGFloat CGRectGetMidY(const CGRect& rect) {
    const CGRect s = CGRectStandardize(rect);
    return s.origin.y + s.size.height * 0.5;
}

CGFloat CGRectGetMaxX(const CGRect& rect) {
    const CGRect s = CGRectStandardize(rect);
    return s.origin.x + s.size.width;
}

CGFloat CGRectGetMaxY(const CGRect& rect) {
    const CGRect s = CGRectStandardize(rect);
    return s.origin.y + s.size.height;
}

CGFloat CGRectGetWidth(const CGRect& rect) { return std::fabs(rect.size.width); }
CGFloat CGRectGetHeight(const CGRect& rect) { return std::fabs(rect.size.height); }

bool CGRectEqualToRect(const CGRect& a, const CGRect& b) {
    const bool aNull = CGRectIsNull(a), bNull = CGRectIsNull(b);
    if (aNull || bNull) return aNull == bNull;
    return CGRectStandardize(a) == CGRectStandardize(b);
}

bool CGRectContainsPoint(const CGRect& rect, const CGPoint& point) {
    if (CGRectIsEmpty(rect)) return false;
    const Edges e = edgesOf(rect);
    return point.x >= e.minX && point.x < e.maxX && point.y >= e.minY && point.y < e.maxY;
}

bool CGRectContainsRect(const CGRect& container, const CGRect& rect) {
    if (CGRectIsNull(container) || CGRectIsNull(rect)) return false;
    // Edge tests rather than "union equals container": recomputing a width from its edges
    // can round, and a rectangle must contain itself.
    const Edges c = edgesOf(container), r = edgesOf(rect);
    return r.minX >= c.minX && r.minY >= c.minY && r.maxX <= c.maxX && r.maxY <= c.maxY;
}

bool CGRectIntersectsRect(const CGRect& a, const CGRect& b) {
    const CGRect i = CGRectIntersection(a, b);
    return !CGRectIsNull(i) && i.size.width > 0.0 && i.size.height > 0.0;
}

CGRect CGRectIntersection(const CGRect& a, const CGRect& b) {
    if (CGRectIsNull(a) || CGRectIsNull(b)) return CGRectNull;
    const Edges ea = edgesOf(a), eb = edgesOf(b);
    // std::max and std::min keep a NaN in one order of their arguments only, so the edges are
    // tested before they meet: a rectangle with a NaN edge shares no area with anything.
    if (hasNaN(ea) || hasNaN(eb)) return CGRectNull;
    const double minX = std::max(ea.minX, eb.minX), maxX = std::min(ea.maxX, eb.maxX);
    const double minY = std::max(ea.minY, eb.minY), maxY = std::min(ea.maxY, eb.maxY);
    if (maxX < minX || maxY < minY) return CGRectNull;
    return rectFromEdges(minX, minY, maxX, maxY);
}

CGRect CGRectUnion(const CGRect& a, const CGRect& b) {
    if (CGRectIsNull(a)) return CGRectStandardize(b);
    if (CGRectIsNull(b)) return CGRectStandardize(a);
    const Edges ea = edgesOf(a), eb = edgesOf(b);
    return rectFromEdges(std::min(ea.minX, eb.minX), std::min(ea.minY, eb.minY),
                         std::max(ea.maxX, eb.maxX), std::max(ea.maxY, eb.maxY));
}

CGRect CGRectInset(const CGRect& rect, CGFloat dx, CGFloat dy) {
    if (CGRectIsNull(rect)) return CGRectNull;
    CGRect r = CGRectStandardize(rect);
    r.origin.x += dx;
    r.origin.y += dy;
    r.size.width -= 2.0 * dx;
    r.size.height -= 2.0 * dy;
    if (r.size.width < 0.0 || r.size.height < 0.0) return CGRectNull;
    return r;
}

CGRect CGRectOffset(const CGRect& rect, CGFloat dx, CGFloat dy) {
    if (CGRectIsNull(rect)) return CGRectNull;
    CGRect r = CGRectStandardize(rect);
    r.origin.x += dx;
    r.origin.y += dy;
    return r;
}

CGRect CGRectIntegral(const CGRect& rect) {
    if (CGRectIsNull(rect)) return CGRectNull;
    const Edges e = edgesOf(rect);
    return rectFromEdges(std::floor(e.minX), std::floor(e.minY), std::ceil(e.maxX),
                         std::ceil(e.maxY));
}

void CGRectDivide(const CGRect& rect, CGRect* slice, CGRect* remainder, CGFloat amount,
                  CGRectEdge edge) {
    CGRect s = CGRectNull, r = CGRectNull;
    if (!CGRectIsNull(rect)) {
        const CGRect whole = CGRectStandardize(rect);
        const bool alongX = edge == CGRectMinXEdge || edge == CGRectMaxXEdge;
        const double extent = alongX ? whole.size.width : whole.size.height;
        const double cut = std::clamp(std::isnan(amount) ? 0.0 : amount, 0.0, extent);
        s = whole;
        r = whole;
        switch (edge) {
            case CGRectMinXEdge:
                s.size.width = cut;
                r.origin.x += cut;
                r.size.width -= cut;
                break;
            case CGRectMaxXEdge:
                s.origin.x += extent - cut;
                s.size.width = cut;
                r.size.width -= cut;
                break;
            case CGRectMinYEdge:
                s.size.height = cut;
                r.origin.y += cut;
                r.size.height -= cut;
                break;
            case CGRectMaxYEdge:
                s.origin.y += extent - cut;
                s.size.height = cut;
                r.size.height -= cut;
                break;
        }
    }
    if (slice) *slice = s;
    if (remainder) *remainder = r;
}
