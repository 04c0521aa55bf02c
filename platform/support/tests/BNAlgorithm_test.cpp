#include "platform/support/BNAlgorithm.h"

#include <gtest/gtest.h>

#include <cmath>
#include <numbers>

namespace {

using BNAlgorithm::findProjectionOn45DegreesDirection;

TEST(BNAlgorithmTest, findProjection__nearestStepOfTheFamilyAndExactOnAxes) {
    // A reference on an axis (or none, which stands for the x axis) snaps exactly.
    const struct {
        BNVec2d vector, reference, expected;
    } exact[] = {{{10.0, 1.0}, {0.0, 3.0}, {10.0, 0.0}},  {{-0.5, -7.0}, {0.0, 3.0}, {0.0, -7.0}},
                 {{3.0, 0.4}, {0.0, 0.0}, {3.0, 0.0}},    {{3.0, 0.4}, {5e-8, 0.0}, {3.0, 0.0}},
                 {{-2.0, 0.1}, {-1.0, 0.0}, {-2.0, 0.0}}, {{0.0, 0.0}, {1.0, 2.0}, {0.0, 0.0}}};
    for (const auto& c : exact)
        EXPECT_EQ(findProjectionOn45DegreesDirection(c.vector, c.reference, 0.0), c.expected)
            << c.vector.x << ", " << c.vector.y;
    const BNVec2d nan = findProjectionOn45DegreesDirection({NAN, 1.0}, {1.0, 2.0}, 0.0);
    EXPECT_TRUE(std::isnan(nan.x) && std::isnan(nan.y))
        << "non-finite input must not pass as a value";

    // Any reference, any offset: a vector 10 degrees past a step of the family projects onto it.
    for (const double offset : {0.0, 0.2}) {
        const double base = 0.3 + offset;
        for (int step = -8; step < 8; ++step) {
            const double a = base + step * std::numbers::pi / 4.0 + 10.0 * std::numbers::pi / 180.0;
            const BNVec2d r = findProjectionOn45DegreesDirection(
                {5.0 * std::cos(a), 5.0 * std::sin(a)}, {2.0 * std::cos(0.3), 2.0 * std::sin(0.3)},
                offset);
            const double length = 5.0 * std::cos(10.0 * std::numbers::pi / 180.0);
            const double stepAngle = base + step * std::numbers::pi / 4.0;
            EXPECT_NEAR(r.x, length * std::cos(stepAngle), 1e-9)
                << "step " << step << " offset " << offset;
            EXPECT_NEAR(r.y, length * std::sin(stepAngle), 1e-9)
                << "step " << step << " offset " << offset;
        }
    }
}

}  // namespace
