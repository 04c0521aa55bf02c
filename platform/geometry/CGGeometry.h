#pragma once
// Points, sizes and rectangles of double precision, with the fields and the free functions
// of the public geometry types they stand for.
//
// Rectangles may have a negative width or height: such a rectangle covers the same area as
// its standardized form (origin moved to the least corner, size made positive). Every query
// below (GetMin/Mid/Max, Contains, Intersects, ...) answers for the standardized form, and
// every function that builds a rectangle returns it standardized.
//
// The null rectangle (CGRectNull) is "no rectangle at all": origin (+inf, +inf), size 0. It
// is what an intersection of disjoint rectangles answers; it is the identity of CGRectUnion,
// contains no point, and every function that builds a rectangle from it answers it again.
// It is also empty. Its edges (GetMinX and friends) answer +inf, the null rectangle's
// origin; callers test CGRectIsNull first.
//
// The infinite rectangle (CGRectInfinite) covers the whole plane: every finite point is in it.

#include <limits>

using CGFloat = double;

struct CGPoint {
    CGFloat x = 0.0;
    CGFloat y = 0.0;
    // Field by field, like CGPointEqualToPoint.
    friend bool operator==(const CGPoint&, const CGPoint&) = default;
};

struct CGSize {
    CGFloat width = 0.0;
    CGFloat height = 0.0;
    friend bool operator==(const CGSize&, const CGSize&) = default;
};

struct CGVector {
    CGFloat dx = 0.0;
    CGFloat dy = 0.0;
    friend bool operator==(const CGVector&, const CGVector&) = default;
};

struct CGRect {
    CGPoint origin;
    CGSize size;
    // Field by field: a rectangle and its standardized form differ here. CGRectEqualToRect
    // compares the areas instead.
    friend bool operator==(const CGRect&, const CGRect&) = default;
};

enum CGRectEdge { CGRectMinXEdge, CGRectMinYEdge, CGRectMaxXEdge, CGRectMaxYEdge };

inline constexpr CGPoint CGPointZero{0.0, 0.0};
inline constexpr CGSize CGSizeZero{0.0, 0.0};
inline constexpr CGRect CGRectZero{{0.0, 0.0}, {0.0, 0.0}};
inline constexpr CGRect CGRectNull{
    {std::numeric_limits<double>::infinity(), std::numeric_limits<double>::infinity()}, {0.0, 0.0}};
// Large finite extents, so that Get/Mid/Max stay finite on it; CGRectIsInfinite recognises it.
inline constexpr CGRect CGRectInfinite{{-8.98846567431158e307, -8.98846567431158e307},
                                       {1.797693134862315e308, 1.797693134862315e308}};

inline constexpr CGPoint CGPointMake(CGFloat x, CGFloat y) { return CGPoint{x, y}; }
inline constexpr CGSize CGSizeMake(CGFloat width, CGFloat height) { return CGSize{width, height}; }
inline constexpr CGVector CGVectorMake(CGFloat dx, CGFloat dy) { return CGVector{dx, dy}; }
inline constexpr CGRect CGRectMake(CGFloat x, CGFloat y, CGFloat width, CGFloat height) {
    return CGRect{{x, y}, {width, height}};
}

inline bool CGPointEqualToPoint(const CGPoint& a, const CGPoint& b) {
    return a.x == b.x && a.y == b.y;
}
inline bool CGSizeEqualToSize(const CGSize& a, const CGSize& b) {
    return a.width == b.width && a.height == b.height;
}

bool CGRectIsNull(const CGRect& rect);
bool CGRectIsInfinite(const CGRect& rect);
// Null, or no area: a width or height of zero. A NaN extent counts as empty as well.
bool CGRectIsEmpty(const CGRect& rect);

CGRect CGRectStandardize(const CGRect& rect);

CGFloat CGRectGetMinX(const CGRect& rect);
CGFloat CGRectGetMidX(const CGRect& rect);
CGFloat CGRectGetMaxX(const CGRect& rect);
CGFloat CGRectGetMinY(const CGRect& rect);
CGFloat CGRectGetMidY(const CGRect& rect);
CGFloat CGRectGetMaxY(const CGRect& rect);
// Always zero or positive, whatever the sign of the stored size.
CGFloat CGRectGetWidth(const CGRect& rect);
CGFloat CGRectGetHeight(const CGRect& rect);

// Same area: both standardized forms match, or both are null.
bool CGRectEqualToRect(const CGRect& a, const CGRect& b);

// Half-open on the maximum edges: a point on the right or top edge is outside, so that
// rectangles that tile the plane claim every point once. An empty rectangle contains nothing.
bool CGRectContainsPoint(const CGRect& rect, const CGPoint& point);
// True when the union of both is the container; a null rectangle is in no rectangle.
bool CGRectContainsRect(const CGRect& container, const CGRect& rect);
// True when the two share area. Rectangles that only touch along an edge do not intersect.
bool CGRectIntersectsRect(const CGRect& a, const CGRect& b);

// The common part. Null when the two are disjoint, either is null or either has a NaN edge;
// rectangles that touch along an edge give a rectangle of zero width or height there.
CGRect CGRectIntersection(const CGRect& a, const CGRect& b);
// The least rectangle holding both. A null operand is ignored.
CGRect CGRectUnion(const CGRect& a, const CGRect& b);
// Moves each edge inward by dx or dy (outward for negative values); null when the result
// would have a negative size.
CGRect CGRectInset(const CGRect& rect, CGFloat dx, CGFloat dy);
CGRect CGRectOffset(const CGRect& rect, CGFloat dx, CGFloat dy);
// The least rectangle with whole-number edges that holds the rectangle.
CGRect CGRectIntegral(const CGRect& rect);
// Cuts `amount` off the given edge into *slice and leaves the rest in *remainder. The amount
// is clamped to [0, extent]. Either output may be null.
void CGRectDivide(const CGRect& rect, CGRect* slice, CGRect* remainder, CGFloat amount,
                  CGRectEdge edge);

// Plain point and size arithmetic, used by the view's offset and size conversions.
inline constexpr CGPoint operator+(const CGPoint& a, const CGPoint& b) {
    return {a.x + b.x, a.y + b.y};
}
inline constexpr CGPoint operator-(const CGPoint& a, const CGPoint& b) {
    return {a.x - b.x, a.y - b.y};
}
