#include "platform/geometry/CGGeometry.h"
#include "platform/geometry/BNRect.h"

#include <gtest/gtest.h>

#include <array>
#include <cmath>
#include <random>

namespace {

CGRect R(double x, double y, double w, double h) { return CGRectMake(x, y, w, h); }
bool in(const CGRect& r, double x, double y) { return CGRectContainsPoint(r, CGPointMake(x, y)); }

// Every operation that builds a rectangle, against the points it must and must not hold, for
// random rectangles of both signs of size on a grid of half units.
TEST(Rect, operations__agreeWithPointMembershipOnAGrid) {
    std::mt19937 rng(5);
    std::uniform_int_distribution<int> c(-4, 4);
    for (int trial = 0; trial < 300; ++trial) {
        const int ax = c(rng), ay = c(rng), aw = c(rng), ah = c(rng), bx = c(rng), by = c(rng),
                  bw = c(rng), bh = c(rng);
        const CGRect a = R(ax, ay, aw, ah), b = R(bx, by, bw, bh);
        const BNRect<double> ba = BNRect<double>::fromCGRect(a), bb = BNRect<double>::fromCGRect(b);
        const CGRect i = CGRectIntersection(a, b), u = CGRectUnion(a, b), s = CGRectStandardize(a);
        const CGRect moved = CGRectOffset(a, 1, -2), inset = CGRectInset(a, 0.5, 0.5),
                     whole = CGRectIntegral(R(ax + 0.2, ay - 0.3, aw, ah));
        CGRect slice, rest;
        CGRectDivide(a, &slice, &rest, 1.5, CGRectEdge(trial % 4));
        SCOPED_TRACE(testing::Message()
                     << "a " << ax << "," << ay << "," << aw << "," << ah << " b " << bx << ","
                     << by << "," << bw << "," << bh << " edge " << trial % 4);
        // Each operation's answer for the point, against what membership in a and b says; the
        // union and the integral form hold at least their operands' points, and the slice and
        // the rest share none.
        for (double x = -9.5; x <= 9.5; x += 0.5)
            for (double y = -9.5; y <= 9.5; y += 0.5) {
                const bool inA = in(a, x, y), inB = in(b, x, y);
                const bool inU = in(u, x, y) && ba.united(bb).contains(x, y);
                ASSERT_EQ(
                    (std::array{in(s, x, y), ba.contains(x, y), in(i, x, y),
                                ba.intersected(bb).contains(x, y), inU || !(inA || inB),
                                in(moved, x + 1, y - 2), in(inset, x, y),
                                in(whole, x, y) || !in(R(ax + 0.2, ay - 0.3, aw, ah), x, y),
                                in(slice, x, y) + in(rest, x, y) == int(inA)}),
                    (std::array{inA, inA, inA && inB, inA && inB, true, inA,
                                in(a, x - 0.5, y - 0.5) && in(a, x + 0.5, y + 0.5), true, true}))
                    << x << ", " << y;
            }
        const bool shared = CGRectGetWidth(i) > 0 && CGRectGetHeight(i) > 0 && !CGRectIsNull(i);
        EXPECT_EQ((std::array{CGRectIntersectsRect(a, b), ba.intersects(bb),
                              CGRectContainsRect(a, b), CGRectEqualToRect(a, s)}),
                  (std::array{shared, shared, !CGRectIsNull(i) && CGRectEqualToRect(i, b), true}));
        // The union is the least rectangle: each of its edges is an edge of an operand.
        EXPECT_EQ((std::array{CGRectGetMinX(u), CGRectGetMaxY(u)}),
                  (std::array{std::min(CGRectGetMinX(a), CGRectGetMinX(b)),
                              std::max(CGRectGetMaxY(a), CGRectGetMaxY(b))}));
        // The slice lies on its own side, as wide as the amount allows.
        const double sliceSides[] = {CGRectGetMinX(slice), CGRectGetMinY(slice),
                                     CGRectGetMaxX(slice), CGRectGetMaxY(slice)};
        const double sides[] = {CGRectGetMinX(a), CGRectGetMinY(a), CGRectGetMaxX(a),
                                CGRectGetMaxY(a)};
        EXPECT_EQ(sliceSides[trial % 4], sides[trial % 4]);
        EXPECT_EQ(trial % 2 ? CGRectGetHeight(slice) : CGRectGetWidth(slice),
                  std::min(1.5, trial % 2 ? CGRectGetHeight(a) : CGRectGetWidth(a)));
    }
}

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
    CGRectDivide(R(10, 4, -10, -4), &slice, nullptr, NAN, CGRectMaxXEdge);
    EXPECT_EQ(slice, R(10, 0, 0, 4));
    CGRectDivide(CGRectNull, &slice, &rest, 1, CGRectMinXEdge);
    EXPECT_TRUE(CGRectIsNull(slice) && CGRectIsNull(rest));
}

}  // namespace
