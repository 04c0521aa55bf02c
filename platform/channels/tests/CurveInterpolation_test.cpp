#include <gtest/gtest.h>

#include <algorithm>
#include <vector>

#include "platform/channels/internal/TQCurveCache.h"
#include "platform/channels/tests/CurveCatalogue.h"

using namespace curve_catalogue;

namespace {

// Step used to probe continuity and slopes numerically.
constexpr double kProbe = 1e-6;
constexpr double kSlopeTolerance = 1e-3;

// Probes finer than the editor's timescale resolves (4e-6 s), so nanosecond times.
double at(const TQChannel& c, double t) {
    return c.getCurveValue(CMTimeMakeWithSeconds(t, 1000000000));
}

// Two keyframes, 0 -> 10 over one second, the first with the given interpolation.
std::unique_ptr<TQChannel> segment(unsigned interpolation) {
    auto c = makeChannel("segment");
    TQKeyframeHandle a = c->setKeyframe(seconds(0.0), 0.0);
    c->setKeyframe(seconds(1.0), 10.0);
    c->setKeyframeInterpolation(a, interpolation);
    return c;
}

class CurveInterpolation : public ::testing::Test {};

TEST_F(CurveInterpolation, flat__every_value_is_the_keyframes_value) {
    auto c = flat();
    for (double t = -1.0; t <= 3.0; t += 0.125) {
        EXPECT_NEAR(at(*c, t), 5.0, kValueTolerance) << "flat curve left 5 at t=" << t;
    }
}

TEST_F(CurveInterpolation, every_code__passes_through_its_keyframes_and_is_continuous) {
    for (unsigned code : {1u, 4u, 6u, 13u, 14u, 15u, 16u, 17u}) {
        auto c = segment(code);
        c->setKeyframe(seconds(2.0), -5.0);
        for (double t : {0.0, 1.0, 2.0}) {
            CMTime time = seconds(t);
            double value = 0.0;
            c->getKeyframe(c->getKeyframe(time), nullptr, &value);
            EXPECT_NEAR(at(*c, t), value, kValueTolerance) << "code " << code << " at " << t;
        }
        EXPECT_NEAR(at(*c, 1.0 - kProbe), at(*c, 1.0), 1e-3)
            << "code " << code << " jumps at the keyframe it arrives at";
    }
}

TEST_F(CurveInterpolation, constant__holds_until_the_next_keyframe) {
    auto c = segment(kTQInterpolationConstant);
    EXPECT_EQ(at(*c, 0.999), 0.0);
    EXPECT_EQ(at(*c, 1.0), 10.0);
}

TEST_F(CurveInterpolation, linear__is_the_chord) {
    auto c = segment(kTQInterpolationLinear);
    EXPECT_NEAR(at(*c, 0.25), 2.5, kValueTolerance);
}

TEST_F(CurveInterpolation, bezier__honours_handle_directions) {
    auto c = overshoot();
    EXPECT_GT(c->getKeyframeMaxValue(), 9.99);
    double peak = 0.0;
    for (double t = 0.0; t <= 2.0; t += 0.01) peak = std::max(peak, at(*c, t));
    EXPECT_GT(peak, 10.0) << "level-raising handles must lift the curve above the keyframe";
    // Slope leaving the first keyframe is the handle's direction, 12 / 0.5.
    EXPECT_NEAR((at(*c, kProbe) - at(*c, 0.0)) / kProbe, 24.0, 24.0 * kSlopeTolerance);
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

TEST_F(CurveInterpolation, bezier__matches_an_independent_bisection_on_its_control_points) {
    auto c = dense(60);
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
            const CMTime time = CMTimeMakeWithSeconds(
                CMTimeGetSeconds(ta) + f * (CMTimeGetSeconds(tb) - CMTimeGetSeconds(ta)),
                1000000000);
            const double t = CMTimeGetSeconds(time);
            EXPECT_NEAR(c->getCurveValue(time), referenceBezier(*c, keys[k], keys[k + 1], t), 1e-7)
                << "segment " << k << " at fraction " << f;
        }
    }
}

TEST_F(CurveInterpolation, bezier__broken_handles_make_a_cusp) {
    auto c = cusp();
    const double left = (at(*c, 1.0) - at(*c, 1.0 - kProbe)) / kProbe;
    const double right = (at(*c, 1.0 + kProbe) - at(*c, 1.0)) / kProbe;
    EXPECT_NEAR(left, -10.0, 10.0 * kSlopeTolerance) << "input handle (-0.3, 3) gives slope -10";
    EXPECT_NEAR(right, 10.0, 10.0 * kSlopeTolerance) << "output handle (0.3, 3) gives slope 10";
}

TEST_F(CurveInterpolation, bezier__handles_longer_than_the_segment_keep_the_curve_a_function) {
    auto c = segment(kTQInterpolationBezier);
    TQKeyframeHandle a = c->getKeyframe(seconds(0.0));
    TQKeyframeHandle b = c->getKeyframe(seconds(1.0));
    c->setKeyframeOutputTangents(a, 5.0, 0.0);
    c->setKeyframeInputTangents(b, -5.0, 0.0);
    double previous = at(*c, 0.0);
    for (double t = 0.01; t <= 1.0; t += 0.01) {
        const double v = at(*c, t);
        EXPECT_GE(v, previous - kValueTolerance) << "flat handles give a monotone ease, t=" << t;
        previous = v;
    }
}

TEST_F(CurveInterpolation, catmull_rom__passes_through_interior_points_smoothly) {
    auto c = makeChannel("cr");
    const double values[] = {0.0, 4.0, 1.0, 7.0, 3.0};
    for (int i = 0; i < 5; ++i) c->setKeyframe(seconds(i), values[i]);
    c->setInterpolation(kTQInterpolationCatmullRom);
    for (int i = 1; i < 4; ++i) {
        EXPECT_NEAR(at(*c, i), values[i], kValueTolerance);
        const double left = (at(*c, i) - at(*c, i - kProbe)) / kProbe;
        const double right = (at(*c, i + kProbe) - at(*c, i)) / kProbe;
        const double expected = (values[i + 1] - values[i - 1]) / 2.0;
        EXPECT_NEAR(left, expected, kSlopeTolerance * 10) << "slope into point " << i;
        EXPECT_NEAR(right, expected, kSlopeTolerance * 10) << "slope out of point " << i;
    }
}

TEST_F(CurveInterpolation, eased_forms__are_flat_at_their_eased_end) {
    struct Case {
        unsigned code;
        bool flatStart;
        bool flatEnd;
    };
    for (Case k : {Case{15, true, true}, Case{16, true, false}, Case{17, false, true}}) {
        auto c = segment(k.code);
        const double start = (at(*c, kProbe) - at(*c, 0.0)) / kProbe;
        const double end = (at(*c, 1.0) - at(*c, 1.0 - kProbe)) / kProbe;
        EXPECT_EQ(std::fabs(start) < kSlopeTolerance, k.flatStart) << "code " << k.code;
        EXPECT_EQ(std::fabs(end) < kSlopeTolerance, k.flatEnd) << "code " << k.code;
    }
}

TEST_F(CurveInterpolation, exp_and_log__are_monotone_and_mirror_each_other) {
    auto e = segment(kTQInterpolationExp);
    auto l = segment(kTQInterpolationLog);
    double pe = 0.0, pl = 0.0;
    for (double t = 0.05; t <= 1.0; t += 0.05) {
        EXPECT_GT(at(*e, t), pe);
        EXPECT_GT(at(*l, t), pl);
        pe = at(*e, t);
        pl = at(*l, t);
        EXPECT_NEAR(at(*l, t), 10.0 - at(*e, 1.0 - t), 1e-6) << "Log is Exp run backwards";
    }
    EXPECT_LT(at(*e, 0.5), 5.0) << "Exp starts slow";
    EXPECT_NEAR(tq_internal::expShape(1.0), 1.0, kValueTolerance);
}

TEST_F(CurveInterpolation, channel_wide_interpolation__reports_mixed_and_members) {
    auto c = segment(kTQInterpolationLinear);
    c->setKeyframe(seconds(2.0), 3.0);
    EXPECT_EQ(c->getInterpolation(), kTQInterpolationMixed);
    EXPECT_TRUE(c->hasInterpolation(kTQInterpolationLinear));
    EXPECT_TRUE(c->hasInterpolation(kTQInterpolationBezier));
    EXPECT_FALSE(c->hasInterpolation(kTQInterpolationExp));
    c->setInterpolation(kTQInterpolationEaseBoth);
    EXPECT_EQ(c->getInterpolation(), kTQInterpolationEaseBoth);
    c->setInterpolation(3);  // no such code
    EXPECT_EQ(c->getInterpolation(), kTQInterpolationEaseBoth);
}

TEST_F(CurveInterpolation, disabled_keyframe__no_longer_shapes_the_curve) {
    auto c = segment(kTQInterpolationLinear);
    TQKeyframeHandle mid = c->setKeyframe(seconds(0.5), 100.0);
    c->setKeyframeInterpolation(mid, kTQInterpolationLinear);
    EXPECT_NEAR(at(*c, 0.5), 100.0, kValueTolerance);
    c->setKeyframeEnabled(mid, false);
    EXPECT_NEAR(at(*c, 0.5), 5.0, kValueTolerance);
    EXPECT_EQ(c->getKeyframes(true).size(), 2u);
    EXPECT_EQ(c->getKeyframes(false).size(), 3u);
}

TEST_F(CurveInterpolation, uses_tangents__on_either_side_of_a_bezier_segment) {
    auto c = segment(kTQInterpolationBezier);
    TQKeyframeHandle last = c->setKeyframe(seconds(2.0), 0.0);
    c->setKeyframeInterpolation(c->getKeyframe(seconds(1.0)), kTQInterpolationLinear);
    EXPECT_TRUE(c->getKeyframeInterpolationUsesTangents(c->getKeyframe(seconds(0.0))));
    EXPECT_TRUE(c->getKeyframeInterpolationUsesTangents(c->getKeyframe(seconds(1.0))));
    EXPECT_FALSE(c->getKeyframeInterpolationUsesTangents(last));
    EXPECT_FALSE(c->getKeyframeInterpolationUsesTangents(nullptr));
}

}  // namespace
