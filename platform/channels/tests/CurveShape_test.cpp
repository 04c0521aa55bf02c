// The keyframed curve between and beyond its keyframes, for every interpolation and
// extrapolation code.
#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <sstream>
#include <vector>

#include "platform/channels/TQChannelTypes.h"
#include "platform/channels/testing/CurveCatalogue.h"
#include "tests/support/TextBaseline.h"

using namespace curve_catalogue;

namespace {

// Finer than the editor's timescale resolves (4e-6 s), so nanosecond times.
double at(const TQChannel& c, double t) {
    return c.getCurveValue(CMTimeMakeWithSeconds(t, 1000000000));
}

// Two keyframes, 0 -> 10 over one second, the first with the given interpolation.
std::unique_ptr<TQChannel> segment(unsigned interpolation) {
    auto c = makeChannel("segment");
    c->setKeyframeInterpolation(c->setKeyframe(seconds(0.0), 0.0), interpolation);
    c->setKeyframe(seconds(1.0), 10.0);
    return c;
}

TEST(CurveShape, everyCode__theShapeOfItsSegment) {
    // Each shape at a quarter, a half, three quarters, just short of the end and at the end, in
    // baselines/segment-shapes.txt: eases flat at the ends they name, the exponential shapes
    // reaching half their rise at 0.83, a step held to the next keyframe.
    std::ostringstream shapes;
    shapes.precision(12);
    for (const unsigned code : {kTQInterpolationConstant, kTQInterpolationLinear,
                                kTQInterpolationEaseBoth, kTQInterpolationEaseOut,
                                kTQInterpolationEaseIn, kTQInterpolationExp, kTQInterpolationLog}) {
        shapes << code << ":";
        for (double t : {0.25, 0.5, 0.75, 0.999999, 1.0}) shapes << " " << at(*segment(code), t);
        shapes << "\n";
    }
    EXPECT_TRUE(tests_support::matchesBaseline("segment-shapes", shapes.str(),
                                               "platform/channels/tests/baselines"));
    // Catmull-Rom: through every keyframe with the slope of the chord through its neighbours.
    auto cr = makeChannel("cr");
    const double values[] = {0.0, 4.0, 1.0, 7.0, 3.0};
    for (int i = 0; i < 5; ++i) cr->setKeyframe(seconds(i), values[i]);
    cr->setInterpolation(kTQInterpolationCatmullRom);
    for (int i = 1; i < 4; ++i) {
        const double slope = (values[i + 1] - values[i - 1]) / 2.0;
        EXPECT_NEAR(at(*cr, i), values[i], kValueTolerance);
        EXPECT_NEAR((at(*cr, i) - at(*cr, i - 1e-6)) / 1e-6, slope, 1e-3) << "into " << i;
        EXPECT_NEAR((at(*cr, i + 1e-6) - at(*cr, i)) / 1e-6, slope, 1e-3) << "out of " << i;
    }
    EXPECT_NEAR((at(*cr, 1e-6) - at(*cr, 0.0)) / 1e-6, 4.0, 1e-3) << "one-sided at the ends";
    // A discrete channel steps whatever its codes.
    auto flag = std::make_unique<TQChannelBool>("on", 1);
    flag->setKeyframe(seconds(0.0), 0.0);
    flag->setKeyframe(seconds(1.0), 1.0);
    EXPECT_EQ(at(*flag, 0.9), 0.0);
}

// Reference value of a Bezier segment by bisection on its control points, with the handle
// reach clamped to the segment as the channel does.
double referenceBezier(const TQChannel& c, TQKeyframeHandle a, TQKeyframeHandle b, double t) {
    CMTime ta, tb;
    double va = 0, vb = 0, ou = 0, ov = 0, iu = 0, iv = 0;
    c.getKeyframe(a, &ta, &va);
    c.getKeyframe(b, &tb, &vb);
    c.getKeyframeOutputTangents(a, &ou, &ov);
    c.getKeyframeInputTangents(b, &iu, &iv);
    const double t0 = CMTimeGetSeconds(ta), t3 = CMTimeGetSeconds(tb), dt = t3 - t0;
    auto clampReach = [&](double reach, double rise, double& r, double& v) {
        r = std::clamp(reach, 0.0, dt);
        v = reach > dt ? rise * dt / reach : rise;
    };
    double ro, vo, ri, vi;
    clampReach(ou, ov, ro, vo);
    clampReach(-iu, iv, ri, vi);
    const double x[4] = {t0, t0 + ro, t3 - ri, t3}, y[4] = {va, va + vo, vb + vi, vb};
    auto bez = [](const double* p, double s) {
        const double u = 1 - s;
        return u * u * u * p[0] + 3 * u * u * s * p[1] + 3 * u * s * s * p[2] + s * s * s * p[3];
    };
    double lo = 0, hi = 1;
    for (int i = 0; i < 200; ++i) (bez(x, 0.5 * (lo + hi)) < t ? lo : hi) = 0.5 * (lo + hi);
    return bez(y, 0.5 * (lo + hi));
}

TEST(CurveShape, bezier__matchesAnIndependentBisectionOnItsControlPoints) {
    auto c = dense(60);  // broken and unbroken handles, some reaching past their segment
    c->setKeyframeOutputTangents(c->getKeyframes(true)[3], 5.0, 0.0);  // longer than the segment
    const std::vector<TQKeyframeHandle> keys = c->getKeyframes(true);
    // Across each segment, and close to its middle: handles reaching across the whole segment
    // make time stand still there (a vertical tangent). At the middle itself no solver can pin
    // the value in doubles; a ten-millionth of the segment away it is well defined again, and
    // a parameter solve that stops short there is off by a large part of the segment's rise.
    std::vector<double> fractions;
    for (double f = 0.03; f < 1.0; f += 0.0625) fractions.push_back(f);
    for (double d : {1e-7, 1e-6, 3e-6, 1e-4}) fractions.insert(fractions.end(), {0.5 - d, 0.5 + d});
    for (size_t k = 0; k + 1 < keys.size(); ++k) {
        CMTime ta, tb;
        c->getKeyframe(keys[k], &ta, nullptr);
        c->getKeyframe(keys[k + 1], &tb, nullptr);
        for (double f : fractions) {
            const double t =
                CMTimeGetSeconds(ta) + f * (CMTimeGetSeconds(tb) - CMTimeGetSeconds(ta));
            EXPECT_NEAR(at(*c, t),
                        referenceBezier(*c, keys[k], keys[k + 1],
                                        CMTimeGetSeconds(CMTimeMakeWithSeconds(t, 1000000000))),
                        1e-7)
                << "segment " << k << " at fraction " << f;
        }
    }
}

TEST(CurveShape, keyframes__disabledOnesAndCodesOfTheChannel) {
    auto c = segment(kTQInterpolationLinear);
    TQKeyframeHandle mid = c->setKeyframe(seconds(0.5), 100.0);
    c->setKeyframeInterpolation(mid, kTQInterpolationLinear);
    EXPECT_NEAR(at(*c, 0.5), 100.0, kValueTolerance);
    c->setKeyframeEnabled(mid, false);
    EXPECT_NEAR(at(*c, 0.5), 5.0, kValueTolerance)
        << "a disabled keyframe no longer shapes the curve";
    EXPECT_EQ(c->getKeyframes(true).size() * 10 + c->getKeyframes(false).size(), 23u);
    c->setKeyframe(seconds(2.0), 3.0);
    EXPECT_EQ(c->getInterpolation(), kTQInterpolationMixed);
    EXPECT_TRUE(c->hasInterpolation(kTQInterpolationLinear) &&
                c->hasInterpolation(kTQInterpolationBezier));
    EXPECT_FALSE(c->hasInterpolation(kTQInterpolationExp));
    // The handles of a keyframe matter when a Bezier segment leaves or arrives at it.
    const std::vector<TQKeyframeHandle> k = c->getKeyframes(false);
    EXPECT_EQ((std::array{c->getKeyframeInterpolationUsesTangents(k[0]),
                          c->getKeyframeInterpolationUsesTangents(k[2]),
                          c->getKeyframeInterpolationUsesTangents(k[3]),
                          c->getKeyframeInterpolationUsesTangents(nullptr)}),
              (std::array{false, true, true, false}));
    c->setInterpolation(kTQInterpolationEaseBoth);
    c->setInterpolation(3);  // no such code
    c->setKeyframeInterpolation(k[0], 99);
    EXPECT_EQ(c->getInterpolation(), kTQInterpolationEaseBoth);
    EXPECT_EQ(makeChannel("empty")->getInterpolation(), kTQInterpolationBezier)
        << "what new keyframes get";
}

// The "overshoot" curve moved to start at 1 s and end at 4 above where it starts: span
// [1, 3], rise 4 per cycle.
class CurveExtrapolation : public ::testing::Test {
protected:
    void SetUp() override {
        c = overshoot();
        const std::vector<TQKeyframeHandle> keys = c->getKeyframes(false);
        for (auto it = keys.rbegin(); it != keys.rend(); ++it) {
            CMTime t;
            c->getKeyframe(*it, &t, nullptr);
            const CMTime later = CMTimeAdd(t, seconds(1.0));
            c->setKeyframeTime(*it, &later);
        }
        c->setKeyframeValue(keys.back(), 4.0);
    }
    void extrapolate(unsigned code) {
        c->setExtrapolation(code, kTQExtrapolationBefore);
        c->setExtrapolation(code, kTQExtrapolationAfter);
    }
    std::unique_ptr<TQChannel> c;
};

TEST_F(CurveExtrapolation, cycles__repeatPingPongAndProgressiveOnBothSides) {
    for (const unsigned code :
         {kTQExtrapolationRepeat, kTQExtrapolationPingPong, kTQExtrapolationProgressive}) {
        extrapolate(code);
        for (double u = 0.05; u < 1.9; u += 0.15)
            for (const int k : {-3, -2, -1, 1, 2, 5}) {
                const bool mirrored = code == kTQExtrapolationPingPong && k % 2 != 0;
                const double expected = at(*c, mirrored ? 3.0 - u : 1.0 + u) +
                                        (code == kTQExtrapolationProgressive ? 4.0 * k : 0.0);
                EXPECT_NEAR(at(*c, 1.0 + u + 2.0 * k), expected, kValueTolerance)
                    << "code " << code << " cycle " << k << " u " << u;
            }
    }
}

TEST_F(CurveExtrapolation, endsHoldOrContinueTheirTangents) {
    EXPECT_EQ(at(*c, -3.0), 0.0);
    EXPECT_EQ(at(*c, 7.0), 4.0);
    extrapolate(kTQExtrapolationLinear);
    EXPECT_NEAR(at(*c, 0.5), -12.0, 1e-6) << "output handle (0.5, 12) of the first keyframe";
    EXPECT_NEAR(at(*c, 3.5), 4.0 - 12.0, 1e-6) << "input handle (-0.5, 12) of the last keyframe";
    EXPECT_EQ(c->getCurveValue(seconds(9.0), false), 4.0) << "without extrapolation the ends hold";
    EXPECT_EQ(c->getCurveValue(seconds(0.0), false), 0.0);
    c->setExtrapolation(9, kTQExtrapolationAfter);   // no such code: ignored
    c->setExtrapolation(kTQExtrapolationRepeat, 5);  // no such direction: ignored
    EXPECT_EQ(c->getExtrapolation(kTQExtrapolationAfter) * 10 +
                  c->getExtrapolation(kTQExtrapolationBefore),
              11u);
    EXPECT_EQ(c->getExtrapolation(5), kTQExtrapolationConstant);
    // A single keyframe holds for every code.
    auto one = makeChannel("one");
    one->setKeyframe(seconds(1.0), 3.0);
    for (unsigned code = 0; code <= 4; ++code) {
        one->setExtrapolation(code, kTQExtrapolationAfter);
        one->setExtrapolation(code, kTQExtrapolationBefore);
        EXPECT_EQ(at(*one, -5.0) + at(*one, 5.0), 6.0) << "code " << code;
    }
    EXPECT_EQ(one->getCurveValue(kCMTimeInvalid), 0.0) << "a non-numeric time: the initial value";
}

}  // namespace
