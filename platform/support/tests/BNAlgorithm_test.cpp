#include "platform/support/BNAlgorithm.h"

#include <gtest/gtest.h>

#include <cmath>
#include <numbers>

namespace {

double angleOf(const BNVec2d& v) { return std::atan2(v.y, v.x); }

// Angle between two vectors, folded into [0, pi].
double angleBetween(const BNVec2d& a, const BNVec2d& b) {
    return std::abs(std::remainder(angleOf(a) - angleOf(b), 2.0 * std::numbers::pi));
}

TEST(BNAlgorithmTest, findProjection__axisReferenceSnapsExactly) {
    const BNVec2d vertical{0.0, 3.0};
    {
        const BNVec2d r =
            BNAlgorithm::findProjectionOn45DegreesDirection({10.0, 1.0}, vertical, 0.0);
        EXPECT_EQ(r.x, 10.0) << "a nearly horizontal drag must snap to exactly horizontal";
        EXPECT_EQ(r.y, 0.0);
    }
    {
        const BNVec2d r =
            BNAlgorithm::findProjectionOn45DegreesDirection({-0.5, -7.0}, vertical, 0.0);
        EXPECT_EQ(r.x, 0.0) << "a nearly downward drag must snap to exactly vertical";
        EXPECT_EQ(r.y, -7.0);
    }
}

TEST(BNAlgorithmTest, findProjection__familyFollowsAnArbitraryReference) {
    const double refAngle = 0.3;
    const BNVec2d reference{2.0 * std::cos(refAngle), 2.0 * std::sin(refAngle)};
    for (int step = 0; step < 8; ++step) {
        SCOPED_TRACE(step);
        // A vector 10 degrees past each step of the family lands on that step.
        const double a = refAngle + step * std::numbers::pi / 4.0 + 10.0 * std::numbers::pi / 180.0;
        const BNVec2d v{5.0 * std::cos(a), 5.0 * std::sin(a)};
        const BNVec2d r = BNAlgorithm::findProjectionOn45DegreesDirection(v, reference, 0.0);
        const double stepAngle = refAngle + step * std::numbers::pi / 4.0;
        EXPECT_NEAR(angleBetween(r, {std::cos(stepAngle), std::sin(stepAngle)}), 0.0, 1e-9)
            << "result is not on the nearest 45-degree step";
        EXPECT_NEAR(std::hypot(r.x, r.y), 5.0 * std::cos(10.0 * std::numbers::pi / 180.0), 1e-9)
            << "result is not the orthogonal projection";
    }
}

TEST(BNAlgorithmTest, findProjection__degenerateInputs) {
    {
        const BNVec2d r =
            BNAlgorithm::findProjectionOn45DegreesDirection({3.0, 0.4}, {0.0, 0.0}, 0.0);
        EXPECT_EQ(r.x, 3.0) << "a zero reference uses the x axis family";
        EXPECT_EQ(r.y, 0.0);
    }
    {
        const BNVec2d r =
            BNAlgorithm::findProjectionOn45DegreesDirection({0.0, 0.0}, {1.0, 2.0}, 0.0);
        EXPECT_EQ(r, (BNVec2d{0.0, 0.0}));
    }
    {
        const BNVec2d r =
            BNAlgorithm::findProjectionOn45DegreesDirection({NAN, 1.0}, {1.0, 2.0}, 0.0);
        EXPECT_TRUE(std::isnan(r.x) && std::isnan(r.y))
            << "non-finite input must not pass as a value";
    }
}

}  // namespace
