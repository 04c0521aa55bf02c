#include "platform/geometry/CGGeometry.h"
#include "platform/geometry/BNRect.h"

#include <gtest/gtest.h>

#include <array>
#include <cmath>

namespace {

CGRect R(double x, double y, double w, double h) { return CGRectMake(x, y, w, h); }
bool in(const CGRect& r, double x, double y) { return CGRectContainsPoint(r, CGPointMake(x, y)); }

TEST(Rect, edgeCases__nullEmptyInfiniteHalfOpenAndNaN) {
    // The same area written three ways answers as its standardized form.
    for (const CGRect& r : {R(1, 2, 4, 6), R(5, 2, -4, 6), R(5, 8, -4, -6)}) {
        EXPECT_EQ(
            (std::array{CGRectGetMinX(r), CGRectGetMidX(r), CGRectGetMaxX(r), CGRectGetMinY(r),
                        CGRectGetMidY(r), CGRectGetMaxY(r), CGRectGetWidth(r), CGRectGetHeight(r)}),
            (std::array{1.0, 3.0, 5.0, 2.0, 5.0, 8.0, 4.0, 6.0}));
        const BNRect<double> b = BNRect<double>::fromCGRect(r);
        EXPECT_EQ((std::array{b.minX(), b.maxX(), b.minY(), b.maxY()}),
                  (std::array{1.0, 5.0, 2.0, 8.0}));
        EXPECT_EQ(b.standardized(), BNRect<double>(1, 2, 4, 6));
        EXPECT_EQ(b.toCGRect(), r) << "conversions carry the fields as they stand";
    }
    EXPECT_NE(R(5, 8, -4, -6), R(1, 2, 4, 6)) << "operator== compares the stored fields";
    // Null is empty too, equals any null, holds nothing, and every operation on it gives null.
    for (const CGRect& r : {CGRectNull, R(HUGE_VAL, 0, 5, 5)}) {
        EXPECT_TRUE(CGRectIsNull(r) && CGRectIsEmpty(r) && !CGRectIsInfinite(r) &&
                    CGRectEqualToRect(r, CGRectNull));
        EXPECT_FALSE(in(r, 0, 0) || CGRectContainsRect(r, R(0, 0, 1, 1)) ||
                     CGRectContainsRect(R(0, 0, 1, 1), r));
        for (const CGRect& made :
             {CGRectStandardize(r), CGRectInset(r, -5, -5), CGRectOffset(r, 1, 1),
              CGRectIntegral(r), CGRectIntersection(r, R(0, 0, 1, 1)),
              CGRectIntersection(R(0, 0, 1, 1), r), CGRectUnion(r, r)})
            EXPECT_TRUE(CGRectIsNull(made));
    }
    EXPECT_EQ(CGRectUnion(R(4, 4, -2, -2), CGRectNull), R(2, 2, 2, 2)) << "null is ignored";
    EXPECT_EQ(CGRectUnion(R(4, 4, -2, -2), R(10, -1, 0, 0)), R(2, -1, 8, 5))
        << "an empty operand counts";
    EXPECT_EQ(CGRectGetMinX(CGRectNull), HUGE_VAL);
    EXPECT_FALSE(CGRectIsNull(CGRectZero));
    EXPECT_TRUE(CGRectIsEmpty(CGRectZero) && CGRectIsEmpty(R(3, 3, -2, 0)) &&
                CGRectIsEmpty(R(0, 0, NAN, 1)));
    EXPECT_TRUE(BNRect<double>(0, 0, 0, 3).isEmpty() && BNRect<double>(0, 0, NAN, 3).isEmpty());
    EXPECT_TRUE(CGRectIsInfinite(CGRectInfinite) && in(CGRectInfinite, -1e300, 1e300));
    EXPECT_FALSE(CGRectIsInfinite(R(-1e300, -1e300, 2e300, 2e300)));
    // Touching along an edge: a zero-width intersection, no shared area; apart: null.
    EXPECT_EQ(CGRectIntersection(R(0, 0, 10, 10), R(10, 0, 5, 10)), R(10, 0, 0, 10));
    EXPECT_FALSE(CGRectIntersectsRect(R(0, 0, 10, 10), R(10, 0, 5, 10)));
    // Half-open: the low edges hold their points, the high ones do not.
    EXPECT_TRUE(in(R(0, 0, 10, 10), 0, 0) && !in(R(0, 0, 10, 10), 10, 5) &&
                !in(R(0, 0, 10, 10), 5, 10));
    EXPECT_EQ(CGRectOffset(R(5, 8, -4, -6), 1, -2), R(2, 0, 4, 6));
    EXPECT_TRUE(CGRectIsNull(CGRectIntersection(R(0, 0, 10, 10), R(2, 11, 1, 1))));
    EXPECT_EQ(BNRect<double>(0, 0, 1, 1).intersected(BNRect<double>(5, 5, 1, 1)), BNRect<double>())
        << "a zero rectangle";
    // A NaN edge shares no area and holds no point.
    EXPECT_TRUE(CGRectIsNull(CGRectIntersection(R(0, 0, 10, 10), R(NAN, 0, 1, 1))));
    EXPECT_FALSE(in(R(0, 0, 10, 10), NAN, 3));
    // Inset: used up exactly is empty, past the centre null; a rectangle contains itself
    // whatever rounding its edges see; a divide takes no more than there is, NaN as nothing.
    EXPECT_EQ(CGRectInset(R(10, 10, -6, -4), 3, 2), R(7, 8, 0, 0));
    EXPECT_EQ(CGRectIntegral(R(2.5, 1.5, -1, -1.2)), R(1, 0, 2, 2));
    EXPECT_TRUE(CGRectIsNull(CGRectInset(R(10, 10, -6, -4), 3.5, 0)) &&
                CGRectIsNull(CGRectInset(R(10, 10, -6, -4), 0, 2.5)));
    EXPECT_TRUE(CGRectContainsRect(R(0.1, 0.1, 0.2, 0.2), R(0.1, 0.1, 0.2, 0.2)));
    CGRect slice, rest;
    CGRectDivide(R(10, 4, -10, -4), &slice, &rest, 99, CGRectMaxYEdge);
    EXPECT_EQ(slice, R(0, 0, 10, 4));
    EXPECT_EQ(rest, R(0, 0, 10, 0));
    CGRectDivide(R(0, 0, 4, 10), &slice, &rest, 3, CGRectMinYEdge);
    EXPECT_EQ(rest, R(0, 3, 4, 7));
    CGRectDivide(R(10, 4, -10, -4), &slice, nullptr, NAN, CGRectMaxXEdge);
    EXPECT_EQ(slice, R(10, 0, 0, 4));
    CGRectDivide(CGRectNull, &slice, &rest, 1, CGRectMinXEdge);
    EXPECT_TRUE(CGRectIsNull(slice) && CGRectIsNull(rest));
}

}  // namespace
