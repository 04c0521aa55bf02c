#include <gtest/gtest.h>

#include "platform/channels/tests/CurveCatalogue.h"

using namespace curve_catalogue;

namespace {

double at(const TQChannel& c, double t) { return c.getCurveValue(seconds(t)); }

// The "overshoot" curve spans [0, 2] and rises by 0 per cycle; a rising variant ends at 4.
class CurveExtrapolation : public ::testing::Test {
protected:
    void SetUp() override {
        curve = overshoot();
        rising = overshoot();
        rising->setKeyframeValue(rising->getKeyframe(seconds(2.0)), 4.0);
    }
    std::unique_ptr<TQChannel> curve;
    std::unique_ptr<TQChannel> rising;
};

TEST_F(CurveExtrapolation, constant__holds_end_values) {
    EXPECT_EQ(at(*rising, -3.0), 0.0);
    EXPECT_EQ(at(*rising, 7.0), 4.0);
}

TEST_F(CurveExtrapolation, linear__continues_the_end_tangent) {
    rising->setExtrapolation(kTQExtrapolationLinear, kTQExtrapolationBefore);
    rising->setExtrapolation(kTQExtrapolationLinear, kTQExtrapolationAfter);
    // Before: output handle (0.5, 12) of the first keyframe, slope 24.
    EXPECT_NEAR(at(*rising, -0.5), -12.0, 1e-6);
    // After: input handle (-0.5, 12) of the last keyframe, slope -24.
    EXPECT_NEAR(at(*rising, 2.5), 4.0 - 12.0, 1e-6);
}

TEST_F(CurveExtrapolation, repeat__is_periodic_on_both_sides) {
    curve->setExtrapolation(kTQExtrapolationRepeat, kTQExtrapolationBefore);
    curve->setExtrapolation(kTQExtrapolationRepeat, kTQExtrapolationAfter);
    for (double t = 0.05; t < 2.0; t += 0.15) {
        EXPECT_NEAR(at(*curve, t + 2.0), at(*curve, t), kValueTolerance) << "one cycle on, t=" << t;
        EXPECT_NEAR(at(*curve, t + 6.0), at(*curve, t), kValueTolerance) << "three cycles on";
        EXPECT_NEAR(at(*curve, t - 4.0), at(*curve, t), kValueTolerance) << "two cycles back";
    }
}

TEST_F(CurveExtrapolation, ping_pong__mirrors_alternate_cycles) {
    rising->setExtrapolation(kTQExtrapolationPingPong, kTQExtrapolationAfter);
    rising->setExtrapolation(kTQExtrapolationPingPong, kTQExtrapolationBefore);
    for (double u = 0.05; u < 2.0; u += 0.15) {
        EXPECT_NEAR(at(*rising, 2.0 + u), at(*rising, 2.0 - u), kValueTolerance)
            << "after, u=" << u;
        EXPECT_NEAR(at(*rising, 4.0 + u), at(*rising, u), kValueTolerance)
            << "second cycle forward";
        EXPECT_NEAR(at(*rising, -u), at(*rising, u), kValueTolerance) << "before mirrors at 0";
    }
}

TEST_F(CurveExtrapolation, progressive__rises_by_one_cycle_rise_per_cycle) {
    rising->setExtrapolation(kTQExtrapolationProgressive, kTQExtrapolationAfter);
    rising->setExtrapolation(kTQExtrapolationProgressive, kTQExtrapolationBefore);
    for (double t = 0.05; t < 2.0; t += 0.15) {
        EXPECT_NEAR(at(*rising, t + 2.0), at(*rising, t) + 4.0, kValueTolerance);
        EXPECT_NEAR(at(*rising, t + 4.0), at(*rising, t) + 8.0, kValueTolerance);
        EXPECT_NEAR(at(*rising, t - 2.0), at(*rising, t) - 4.0, kValueTolerance);
    }
}

TEST_F(CurveExtrapolation, extrapolate_false__holds_end_values_whatever_the_code) {
    rising->setExtrapolation(kTQExtrapolationProgressive, kTQExtrapolationAfter);
    EXPECT_EQ(rising->getCurveValue(seconds(9.0), false), 4.0);
}

TEST_F(CurveExtrapolation, codes__are_read_back_per_direction_and_validated) {
    curve->setExtrapolation(kTQExtrapolationRepeat, kTQExtrapolationBefore);
    curve->setExtrapolation(kTQExtrapolationPingPong, kTQExtrapolationAfter);
    curve->setExtrapolation(9, kTQExtrapolationAfter);   // no such code: ignored
    curve->setExtrapolation(kTQExtrapolationLinear, 5);  // no such direction: ignored
    EXPECT_EQ(curve->getExtrapolation(kTQExtrapolationBefore), kTQExtrapolationRepeat);
    EXPECT_EQ(curve->getExtrapolation(kTQExtrapolationAfter), kTQExtrapolationPingPong);
}

TEST_F(CurveExtrapolation, single_keyframe__is_constant_for_every_code) {
    auto c = makeChannel("one");
    c->setKeyframe(seconds(1.0), 3.0);
    for (unsigned code = 0; code <= 4; ++code) {
        c->setExtrapolation(code, kTQExtrapolationAfter);
        c->setExtrapolation(code, kTQExtrapolationBefore);
        EXPECT_EQ(at(*c, -5.0), 3.0) << "code " << code;
        EXPECT_EQ(at(*c, 5.0), 3.0) << "code " << code;
    }
}

}  // namespace
