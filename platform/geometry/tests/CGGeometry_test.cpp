#include "platform/geometry/CGGeometry.h"
#include "platform/geometry/BNRect.h"

#include <gtest/gtest.h>

#include <cmath>

class RectQueries : public ::testing::Test {
protected:
    // The same area written three ways.
    const CGRect positive = CGRectMake(1.0, 2.0, 4.0, 6.0);
    const CGRect negativeWidth = CGRectMake(5.0, 2.0, -4.0, 6.0);
    const CGRect negativeBoth = CGRectMake(5.0, 8.0, -4.0, -6.0);
};

TEST_F(RectQueries, edges__negativeSizesAnswerForStandardizedForm) {
    for (const CGRect& r : {positive, negativeWidth, negativeBoth}) {
        SCOPED_TRACE(testing::Message() << "size " << r.size.width << " x " << r.size.height);
        EXPECT_EQ(CGRectGetMinX(r), 1.0);
        EXPECT_EQ(CGRectGetMidX(r), 3.0);
        EXPECT_EQ(CGRectGetMaxX(r), 5.0);
        EXPECT_EQ(CGRectGetMinY(r), 2.0);
        EXPECT_EQ(CGRectGetMidY(r), 5.0);
        EXPECT_EQ(CGRectGetMaxY(r), 8.0);
        EXPECT_EQ(CGRectGetWidth(r), 4.0);
        EXPECT_EQ(CGRectGetHeight(r), 6.0);
        EXPECT_EQ(CGRectStandardize(r), positive);
        EXPECT_TRUE(CGRectEqualToRect(r, positive)) << "same area must compare equal";
    }
    EXPECT_NE(negativeBoth, positive) << "operator== compares the stored fields";
}

TEST_F(RectQueries, containsPoint__halfOpenAndEmpty) {
    EXPECT_TRUE(CGRectContainsPoint(negativeBoth, CGPointMake(1.0, 2.0)))
        << "minimum corner is inside";
    EXPECT_FALSE(CGRectContainsPoint(negativeBoth, CGPointMake(5.0, 3.0)))
        << "right edge is outside";
    EXPECT_FALSE(CGRectContainsPoint(negativeBoth, CGPointMake(2.0, 8.0))) << "top edge is outside";
    EXPECT_TRUE(CGRectContainsPoint(negativeWidth, CGPointMake(4.999, 7.999)));
    EXPECT_FALSE(CGRectContainsPoint(CGRectMake(0, 0, 0, 5), CGPointMake(0, 1)))
        << "zero width holds nothing";
    EXPECT_FALSE(CGRectContainsPoint(CGRectNull, CGPointMake(0, 0)));
    EXPECT_TRUE(CGRectContainsPoint(CGRectInfinite, CGPointMake(-1e300, 1e300)));
    EXPECT_FALSE(CGRectContainsPoint(positive, CGPointMake(std::nan(""), 3.0)));
}

TEST_F(RectQueries, nullAndEmpty__classification) {
    EXPECT_TRUE(CGRectIsNull(CGRectNull));
    EXPECT_TRUE(CGRectIsEmpty(CGRectNull)) << "null is also empty";
    EXPECT_FALSE(CGRectIsNull(CGRectZero));
    EXPECT_TRUE(CGRectIsEmpty(CGRectZero));
    EXPECT_TRUE(CGRectIsEmpty(CGRectMake(3, 3, -2, 0)));
    EXPECT_TRUE(CGRectIsEmpty(CGRectMake(0, 0, std::nan(""), 1)));
    EXPECT_FALSE(CGRectIsEmpty(negativeBoth));
    EXPECT_TRUE(CGRectIsInfinite(CGRectInfinite));
    EXPECT_FALSE(CGRectIsInfinite(CGRectMake(-1e300, -1e300, 2e300, 2e300)));
    EXPECT_TRUE(CGRectEqualToRect(CGRectNull, CGRectMake(HUGE_VAL, 0, 5, 5)))
        << "any null equals null";
    EXPECT_FALSE(CGRectEqualToRect(CGRectNull, CGRectZero));
}

class RectOperations : public ::testing::Test {};

TEST_F(RectOperations, intersection__disjointTouchingAndNull) {
    const CGRect a = CGRectMake(0, 0, 10, 10);
    {
        const CGRect i = CGRectIntersection(a, CGRectMake(15, 5, -10, -10));  // x 5..15, y -5..5
        EXPECT_EQ(i, CGRectMake(5, 0, 5, 5)) << "negative-size operand is standardized first";
        EXPECT_TRUE(CGRectIntersectsRect(a, CGRectMake(15, 5, -10, -10)));
    }
    {
        const CGRect touching = CGRectMake(10, 0, 5, 10);
        EXPECT_EQ(CGRectIntersection(a, touching), CGRectMake(10, 0, 0, 10))
            << "shared edge: zero width";
        EXPECT_FALSE(CGRectIntersectsRect(a, touching)) << "a shared edge is not shared area";
    }
    EXPECT_TRUE(CGRectIsNull(CGRectIntersection(a, CGRectMake(20, 20, 1, 1))))
        << "disjoint gives null";
    EXPECT_TRUE(CGRectIsNull(CGRectIntersection(a, CGRectNull)));
    EXPECT_TRUE(CGRectIsNull(CGRectIntersection(CGRectNull, CGRectNull)));
    EXPECT_FALSE(CGRectIntersectsRect(CGRectNull, CGRectInfinite));
}

TEST_F(RectOperations, union__nullIsIdentity) {
    const CGRect a = CGRectMake(4, 4, -2, -2);
    EXPECT_EQ(CGRectUnion(a, CGRectNull), CGRectMake(2, 2, 2, 2))
        << "null is ignored; result standardized";
    EXPECT_EQ(CGRectUnion(CGRectNull, a), CGRectMake(2, 2, 2, 2));
    EXPECT_TRUE(CGRectIsNull(CGRectUnion(CGRectNull, CGRectNull)));
    EXPECT_EQ(CGRectUnion(a, CGRectMake(10, -1, 0, 0)), CGRectMake(2, -1, 8, 5))
        << "an empty rect still counts";
}

TEST_F(RectOperations, insetOffsetIntegral__standardizeAndCollapse) {
    const CGRect r = CGRectMake(10, 10, -6, -4);  // 4..10 x 6..10
    EXPECT_EQ(CGRectInset(r, 1, 1), CGRectMake(5, 7, 4, 2));
    EXPECT_EQ(CGRectInset(r, -1, 0), CGRectMake(3, 6, 8, 4)) << "negative inset grows";
    EXPECT_EQ(CGRectInset(r, 3, 2), CGRectMake(7, 8, 0, 0))
        << "exactly used up is an empty rect, not null";
    EXPECT_TRUE(CGRectIsNull(CGRectInset(r, 3.5, 0))) << "inset past the centre gives null";
    EXPECT_TRUE(CGRectIsNull(CGRectInset(CGRectNull, -5, -5)));
    EXPECT_EQ(CGRectOffset(r, 1, -1), CGRectMake(5, 5, 6, 4));
    EXPECT_TRUE(CGRectIsNull(CGRectOffset(CGRectNull, 1, 1))) << "a null rectangle can't be moved";
    EXPECT_EQ(CGRectIntegral(CGRectMake(0.5, -0.5, 1.2, 0.4)), CGRectMake(0, -1, 2, 1));
    EXPECT_TRUE(CGRectContainsRect(r, CGRectInset(r, 1, 1)));
    EXPECT_TRUE(CGRectContainsRect(CGRectMake(0.1, 0.1, 0.2, 0.2), CGRectMake(0.1, 0.1, 0.2, 0.2)))
        << "a rectangle contains itself despite rounding of its edges";
    EXPECT_FALSE(CGRectContainsRect(r, CGRectNull));
}

TEST_F(RectOperations, divide__edgesAndClamping) {
    const CGRect r = CGRectMake(0, 0, 10, 4);
    CGRect slice, rest;
    CGRectDivide(r, &slice, &rest, 3, CGRectMaxXEdge);
    EXPECT_EQ(slice, CGRectMake(7, 0, 3, 4));
    EXPECT_EQ(rest, CGRectMake(0, 0, 7, 4));
    CGRectDivide(r, &slice, &rest, 99, CGRectMinYEdge);
    EXPECT_EQ(slice, r) << "an amount beyond the extent takes everything";
    EXPECT_EQ(rest, CGRectMake(0, 4, 10, 0));
    CGRectDivide(CGRectNull, &slice, nullptr, 1, CGRectMinXEdge);
    EXPECT_TRUE(CGRectIsNull(slice));
}

TEST(BNRect, conversions__keepFieldsAndAnswerStandardized) {
    const BNRect<double> r = BNRect<double>::fromCGRect(CGRectMake(5, 8, -4, -6));
    EXPECT_EQ(r, BNRect<double>(5, 8, -4, -6)) << "conversion keeps the stored sign";
    EXPECT_EQ(r.toCGRect(), CGRectMake(5, 8, -4, -6));
    EXPECT_EQ(r.standardized(), BNRect<double>(1, 2, 4, 6));
    EXPECT_EQ(r.minX(), 1.0);
    EXPECT_EQ(r.maxY(), 8.0);
    EXPECT_TRUE(r.contains(1.0, 2.0));
    EXPECT_FALSE(r.contains(5.0, 2.0)) << "maximum edge is outside";
    EXPECT_TRUE(BNRect<double>(0, 0, 0, 3).isEmpty());
    EXPECT_EQ(r.intersected(BNRect<double>(4, 7, 10, 10)), BNRect<double>(4, 7, 1, 1));
    EXPECT_EQ(r.intersected(BNRect<double>(20, 20, 1, 1)), BNRect<double>())
        << "disjoint gives zero";
    EXPECT_FALSE(r.intersects(BNRect<double>(5, 2, 1, 1))) << "touching is not intersecting";
    EXPECT_EQ(r.united(BNRect<double>(-1, 0, 1, 1)), BNRect<double>(-1, 0, 6, 8));
    EXPECT_EQ(BNRect<float>::fromCGRect(CGRectMake(0.5, 1, 2, 3)), BNRect<float>(0.5f, 1, 2, 3));
}
