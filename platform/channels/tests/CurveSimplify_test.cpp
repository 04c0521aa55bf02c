#include <gtest/gtest.h>

#include <cmath>
#include <limits>
#include <memory>
#include <tuple>
#include <utility>

#include "platform/channels/internal/TQCurveFit.h"
#include "platform/channels/testing/ReferenceCurves.h"

using namespace reference_curves;

namespace {

int64_t frameOf(const CMTime& t) { return t.value * kFps / t.timescale; }

// The value of the keyframe at `t`, NaN (equal to nothing) when there is none.
double keyValue(const TQChannel& c, const CMTime& t) {
    double value = NAN;
    c.getKeyframe(c.getKeyframe(t), nullptr, &value);
    return value;
}

bool onFrame(const CMTime& t) {
    return CMTimeCompare(BN_CMTimeFloorToSampleDuration(t, frameDuration()), t) == 0;
}

// Simplifies the span from frame `first` to frame `last` to a worst error of `error` (in the
// curve's units) and checks what every simplification promises: the error at every frame of the
// span, keyframes on frames, no segment running back in time, both ends kept.
void simplifyAndCheck(TQChannel& c, int64_t first, int64_t last, double error, int smoothness,
                      int shape = kTQSimplifyBezier, int placement = kTQSimplifyOnFrames) {
    const auto before = cloneOf(c);
    const double tolerance = error / height(c, first, last) * 100.0;
    c.simplifyCurve(frame(first), frame(last), frameDuration(), shape, smoothness, tolerance,
                    placement);
    EXPECT_LE(worstFrameError(*before, c, first, last), error * (1.0 + 1e-9));
    EXPECT_EQ(backwardSegments(c), 0u);
    EXPECT_EQ(c.getKeyframeMaxValue(false), greatestKeyframeValue(c));
    for (const TQKeyframeState& k : c.getKeyframeStates()) {
        EXPECT_TRUE(onFrame(k.time)) << "keyframe at " << CMTimeGetSeconds(k.time) << " s";
    }
    for (int64_t end : {first, last})
        EXPECT_EQ(keyValue(c, frame(end)), keyValue(*before, frame(end))) << "end at frame " << end;
}

TEST(CurveSimplify, keeps_its_promise_on_the_reference_curves_with_few_keyframes) {
    using Make = std::unique_ptr<TQChannel> (*)();
    // The worst error asked, in the curve's units or of its height, and the keyframes allowed
    // at most. A shorter noisy sine than the benchmark's, with the same rate of keyframes.
    for (const auto& [name, make, asked, ofHeight, most] :
         {std::tuple<const char*, Make, double, bool, unsigned>{
              "noisy sine", [] { return noisySine(6000); }, 0.05, false, 270},
          {"catmull-rom keys", [] { return catmullRomKeys(); }, 0.001, true, 500},
          {"sketched stroke", [] { return sketchedStroke(); }, 0.01, true, 35}}) {
        for (int smoothness : {0, 3, 10}) {
            SCOPED_TRACE(testing::Message() << name << ", smoothness " << smoothness);
            auto c = make();
            const int64_t first = frameOf(c->getKeyframeMinTime());
            const int64_t last = frameOf(c->getKeyframeMaxTime());
            const double error = ofHeight ? asked * height(*c, first, last) : asked;
            simplifyAndCheck(*c, first, last, error, smoothness);
            EXPECT_LE(c->numberOfKeyframes(), most);
        }
    }
}

TEST(CurveSimplify, leaves_the_curve_outside_the_span_and_locked_keyframes_as_they_were) {
    auto c = catmullRomKeys(80);
    c->setInterpolation(kTQInterpolationCatmullRom);
    const std::vector<TQKeyframeHandle> keys = c->getKeyframes(false);
    const TQKeyframeHandle locked = keys[40];
    c->setKeyframeLocked(locked, true);
    CMTime first, last;
    c->getKeyframe(keys[20], &first, nullptr);
    c->getKeyframe(keys[60], &last, nullptr);
    const auto before = cloneOf(*c);

    // The span asked for reaches past the keyframes at its ends, which it snaps in to.
    c->simplifyCurve(CMTimeSubtract(first, frame(1)), CMTimeAdd(last, frame(1)), frameDuration(),
                     kTQSimplifyBezier, 0, 5.0, kTQSimplifyOnFrames);

    EXPECT_LT(c->numberOfKeyframes(), before->numberOfKeyframes());
    EXPECT_EQ(backwardSegments(*c), 0u) << "the locked keyframe parts the span in two";
    for (const TQKeyframeState& k : c->getKeyframeStates()) {
        if (k.inU < 0.0 && k.outU > 0.0 && std::fabs(k.inV / k.inU - k.outV / k.outU) > 1e-6) {
            EXPECT_TRUE(k.broken) << "handles out of line at " << CMTimeGetSeconds(k.time) << " s";
        }
    }
    const int64_t end = frameOf(c->getKeyframeMaxTime());
    // Outside, the curve is the same but for rounding (the bordering Catmull-Rom segments are
    // Bezier segments now).
    EXPECT_LE(worstFrameError(*before, *c, -60, frameOf(first)), 1e-12);
    EXPECT_LE(worstFrameError(*before, *c, frameOf(last), end + 60), 1e-12);
    EXPECT_LE(worstFrameError(*before, *c, frameOf(first), frameOf(last)),
              0.05 * height(*before, frameOf(first), frameOf(last)));
    // Keyframes that stay keep their handles, times and values; the locked one its lock too.
    const auto held = [](const TQChannel& x, TQKeyframeHandle h) {
        CMTime t = kCMTimeInvalid;
        double v = NAN;
        const bool live = x.getKeyframe(h, &t, &v);
        return std::tuple(live, CMTimeGetSeconds(t), v, x.getKeyframeLocked(h));
    };
    for (size_t i : {size_t(0), size_t(20), size_t(40), size_t(60), size_t(79)})
        EXPECT_EQ(held(*c, keys[i]), held(*before, keys[i])) << "keyframe " << i;
}

TEST(CurveSimplify, lines_up_with_the_handles_outside_the_span_where_the_tolerance_allows) {
    // A parabola keyed every 6 frames, Catmull-Rom, with flat stored handles that the
    // interpolation ignores. The keyframes just outside the span sit a little off it, so the
    // slopes the curve arrives and leaves with differ from the parabola's.
    const double step = 6.0 / kFps;
    auto parabola = [&](int keys, int offAt, int offAt2) {
        auto c = std::make_unique<TQChannel>("parabola", 1, 0.0);
        c->setInterpolation(kTQInterpolationCatmullRom);
        for (int i = 0; i < keys; ++i) {
            const double t = i * step;
            const TQKeyframeHandle h =
                c->setKeyframe(frame(6 * i), t * t + (i == offAt || i == offAt2 ? 0.04 : 0.0));
            c->setKeyframeInputTangents(h, -step / 3.0, 0.0);
            c->setKeyframeOutputTangents(h, step / 3.0, 0.0);
        }
        return c;
    };
    auto stateAt = [](const TQChannel& c, const CMTime& t) {
        for (const TQKeyframeState& k : c.getKeyframeStates())
            if (CMTimeCompare(k.time, t) == 0) return k;
        ADD_FAILURE() << "no keyframe at " << CMTimeGetSeconds(t) << " s";
        return TQKeyframeState{};
    };
    {
        auto c = parabola(40, 9, 31);
        const auto before = cloneOf(*c);
        c->simplifyCurve(frame(60), frame(180), frameDuration(), kTQSimplifyBezier, 0, 1.0,
                         kTQSimplifyOnFrames);
        EXPECT_EQ(c->numberOfKeyframes(), 40u - 19u) << "the span is one segment";
        EXPECT_LE(worstFrameError(*before, *c, 0, 60), 1e-12);
        EXPECT_LE(worstFrameError(*before, *c, 180, 240), 1e-12);
        const TQKeyframeState in = stateAt(*c, frame(60)), out = stateAt(*c, frame(180));
        EXPECT_FALSE(in.broken || out.broken);
        EXPECT_NEAR(in.outV / in.outU, in.inV / in.inU, 1e-9) << "start of the span";
        EXPECT_NEAR(out.inV / out.inU, out.outV / out.outU, 1e-9) << "end of the span";
    }
    {
        // Up to the last keyframe, whose own outgoing handle shapes nothing and steers nothing.
        auto c = parabola(20, 9, -1);
        // A Bezier last keyframe whose slope a fit could take, were it to steer.
        const TQKeyframeHandle last = c->getKeyframe(frame(114));
        c->setKeyframeInterpolation(last, kTQInterpolationBezier);
        c->setKeyframeOutputTangents(last, 1.0, 7.7);
        c->setKeyframeTangentsBroken(last, false);
        const auto before = cloneOf(*c);
        c->simplifyCurve(frame(60), frame(114), frameDuration(), kTQSimplifyBezier, 0, 1.0,
                         kTQSimplifyOnFrames);
        EXPECT_LE(worstFrameError(*before, *c, 0, 60), 1e-12);
        EXPECT_LE(worstFrameError(*before, *c, 60, 114), 0.01 * height(*before, 60, 114));
        const TQKeyframeState tail = stateAt(*c, frame(114));
        // The curve arrives there with the slope of the last chord, 7.4.
        EXPECT_NEAR(tail.inV / tail.inU, 7.4, 0.2);
    }
}

TEST(CurveSimplify, at_zero_tolerance_keeps_every_frame_and_drops_keyframes_that_change_nothing) {
    // Two straight runs of keyframes, one per frame, meeting at a corner on frame 30; values
    // from 0 up to 3 and down to -3: the scale (height plus largest magnitude) is 9.
    auto corner = std::make_unique<TQChannel>("corner", 1, 0.0);
    corner->setInterpolation(kTQInterpolationLinear);
    for (int64_t k = 0; k <= 60; ++k)
        corner->setKeyframe(frame(k), k <= 30 ? 0.1 * k : 9.0 - 0.2 * k);
    auto expected = std::make_unique<TQChannel>("corner", 1, 0.0);
    for (int64_t k : {0, 30, 60}) expected->setKeyframe(frame(k), corner->getCurveValue(frame(k)));
    expected->setInterpolation(kTQInterpolationLinear);
    corner->simplifyCurve(frame(0), frame(60), frameDuration(), kTQSimplifyBezier, 0, 0.0,
                          kTQSimplifyOnFrames);
    EXPECT_EQ(corner->numberOfKeyframes(), 3u);
    EXPECT_LE(worstFrameError(*expected, *corner, -10, 70), 9e-10);

    // Noise keeps its value at every frame (its scale is about 3.1).
    auto noise = noisySine(200);
    const auto before = cloneOf(*noise);
    noise->simplifyCurve(frame(0), frame(199), frameDuration(), kTQSimplifyBezier, 4, 0.0,
                         kTQSimplifyOnFrames);
    EXPECT_LE(worstFrameError(*before, *noise, 0, 199), 3.1e-10);
    EXPECT_EQ(backwardSegments(*noise), 0u);
}

TEST(CurveSimplify, fits_lines_steps_and_existing_keyframes_within_the_same_promise) {
    // The interpolation of every new segment, or kTQInterpolationMixed for none new.
    for (const auto& [name, shape, placement, interpolation] :
         {std::tuple<const char*, int, int, unsigned>{"lines", kTQSimplifyLinear,
                                                      kTQSimplifyOnFrames, kTQInterpolationLinear},
          {"steps", kTQSimplifyConstant, kTQSimplifyOnFrames, kTQInterpolationConstant},
          {"existing keyframes", kTQSimplifyBezier, kTQSimplifyOnExistingKeyframes,
           kTQInterpolationMixed}}) {
        SCOPED_TRACE(name);
        auto c = sketchedStroke(120);
        const auto before = cloneOf(*c);
        const int64_t last = frameOf(c->getKeyframeMaxTime());
        simplifyAndCheck(*c, 0, last, 0.02 * height(*c, 0, last), 2, shape, placement);
        EXPECT_LT(c->numberOfKeyframes(), before->numberOfKeyframes());
        const std::vector<TQKeyframeState> now = c->getKeyframeStates();
        for (size_t i = 0; i + 1 < now.size(); ++i) {
            if (interpolation != kTQInterpolationMixed)
                EXPECT_EQ(now[i].interpolation, interpolation);
            else  // only keyframes that were there, with their values
                EXPECT_EQ(now[i].value, keyValue(*before, now[i].time))
                    << "keyframe at " << CMTimeGetSeconds(now[i].time) << " s";
        }
    }
}

TEST(CurveSimplify, fits_a_stepped_channel_with_steps_on_its_own_levels) {
    SteppedChannel c;
    Lcg rng{9};
    double value = 0.0;
    for (int64_t k = 0; k < 120; ++k) {
        if (k % 12 == 0) value = std::floor(rng.next() * 4.0);
        c.setKeyframe(frame(k), value);
    }
    for (int smoothness : {0, 3}) {
        simplifyAndCheck(c, 0, 119, 0.3, smoothness);
        EXPECT_LE(c.numberOfKeyframes(), 11u);
        for (const TQKeyframeState& k : c.getKeyframeStates()) {
            EXPECT_EQ(k.value, std::floor(k.value)) << "smoothness " << smoothness;
        }
    }
}

TEST(CurveSimplify, refuses_bad_input_without_a_change_or_an_announcement) {
    auto c = sketchedStroke(60);
    curve_catalogue::AnnouncementCounter announcements;
    c->setChangeObserver(&announcements);
    const auto untouched = cloneOf(*c);
    const double nan = std::numeric_limits<double>::quiet_NaN();
    const double inf = std::numeric_limits<double>::infinity();
    const CMTime f = frameDuration();
    // What is wrong, then the arguments: start, end, frame duration, shape, smoothness,
    // tolerance and placement.
    const std::tuple<const char*, CMTime, CMTime, CMTime, int, int, double, int> cases[] = {
        {"invalid start", kCMTimeInvalid, frame(59), f, 2, 0, 1.0, 0},
        {"infinite end", frame(0), kCMTimePositiveInfinity, f, 2, 0, 1.0, 0},
        {"zero frame duration", frame(0), frame(59), CMTimeMake(0, kFps), 2, 0, 1.0, 0},
        {"negative frame duration", frame(0), frame(59), CMTimeMake(-1, kFps), 2, 0, 1.0, 0},
        {"NaN tolerance", frame(0), frame(59), f, 2, 0, nan, 0},
        {"infinite tolerance", frame(0), frame(59), f, 2, 0, inf, 0},
        {"negative tolerance", frame(0), frame(59), f, 2, 0, -1.0, 0},
        {"negative smoothness", frame(0), frame(59), f, 2, -1, 1.0, 0},
        {"unknown shape", frame(0), frame(59), f, 3, 0, 1.0, 0},
        {"unknown placement", frame(0), frame(59), f, 2, 0, 1.0, 2},
        {"span after the keyframes", frame(80), frame(200), f, 2, 0, 1.0, 0},
        {"span with one keyframe", frame(10), frame(10), f, 2, 0, 1.0, 0},
        {"span reversed", frame(59), frame(0), f, 2, 0, 1.0, 0},
        {"too many frames", frame(0), frame(59), CMTimeMake(1, 1'000'000'000), 2, 0, 1.0, 0},
    };
    for (const auto& [what, start, end, duration, shape, smoothness, tolerance, placement] :
         cases) {
        c->simplifyCurve(start, end, duration, shape, smoothness, tolerance, placement);
        EXPECT_TRUE(*c == *untouched) << what;
    }
    EXPECT_EQ(announcements.count, 0);

    // Smoothness past what the panel offers is taken as the most there is, once announced.
    c->simplifyCurve(frame(0), frame(59), f, kTQSimplifyBezier, 1'000'000, 1.0,
                     kTQSimplifyOnFrames);
    EXPECT_EQ(announcements.count, 1);
    EXPECT_LE(worstFrameError(*untouched, *c, 0, 59), 0.01 * height(*untouched, 0, 59));
}

}  // namespace

TEST(CurveSimplify, smoothing_keeps_a_parabola_and_irons_out_a_zigzag_within_its_limit) {
    std::vector<double> t, parabola, zigzag, target;
    for (int k = 0; k < 60; ++k) {
        const double s = k / 30.0;
        t.push_back(s);
        parabola.push_back(3.0 * s * s - s + 1.0);
        zigzag.push_back(k % 2 ? 0.1 : -0.1);
    }
    tq_internal::smoothedTargets(t, parabola, 5, 1.0, target);
    for (size_t k = 0; k < t.size(); ++k) EXPECT_NEAR(target[k], parabola[k], 1e-9) << k;
    tq_internal::smoothedTargets(t, zigzag, 5, 0.05, target);
    for (size_t k = 0; k < t.size(); ++k) {
        EXPECT_LE(std::fabs(target[k] - zigzag[k]), 0.05 + 1e-12) << k;
        if (k >= 5 && k + 5 < t.size()) {
            EXPECT_LE(std::fabs(target[k]), 0.05 + 1e-12) << k;
        }
    }
}

TEST(CurveSimplify, keeps_whole_segments_as_stored_and_ignores_a_handle_pointing_backwards) {
    // A long straight segment, then noise on every frame: the straight one is kept whole, with
    // the handles it stores for a later change to Bezier.
    {
        auto c = std::make_unique<TQChannel>("run", 1, 0.0);
        c->setInterpolation(kTQInterpolationLinear);
        c->setKeyframe(frame(0), 0.0);
        Lcg rng{5};
        for (int64_t k = 30; k <= 60; ++k) c->setKeyframe(frame(k), 1.0 + 0.2 * rng.next());
        for (TQKeyframeHandle h : c->getKeyframes(false)) {
            c->setKeyframeInputTangents(h, -0.01, 0.3);
            c->setKeyframeOutputTangents(h, 0.01, 0.3);
        }
        c->simplifyCurve(frame(0), frame(60), frameDuration(), kTQSimplifyBezier, 0, 5.0,
                         kTQSimplifyOnFrames);
        const TQKeyframeHandle start = c->getKeyframe(frame(0));
        ASSERT_TRUE(c->getKeyframe(frame(30))) << "the straight segment is kept whole";
        double u = 0.0, v = 0.0;
        c->getKeyframeOutputTangents(start, &u, &v);
        EXPECT_EQ(std::pair(u, v), std::pair(0.01, 0.3));
        EXPECT_EQ(c->getKeyframeInterpolation(start), kTQInterpolationLinear);
    }
    // Two Bezier curves alike but for where the span's first keyframe points its backward
    // handle, the wrong way in both: the fit lines up with neither, so both come out alike, and
    // the curve before the span stays as it was.
    std::unique_ptr<TQChannel> fitted[2];
    for (int i = 0; i < 2; ++i) {
        auto& c = fitted[i];
        c = std::make_unique<TQChannel>("bezier", 1, 0.0);
        c->setInterpolation(kTQInterpolationBezier);
        for (int64_t k = 0; k <= 60; k += k < 24 ? 6 : 1)
            c->setKeyframe(frame(k), std::sin(0.05 * double(k)));
        const TQKeyframeHandle h = c->getKeyframe(frame(24));
        c->setKeyframeTangentsBroken(h, true);
        c->setKeyframeInputTangents(h, 0.05, i == 0 ? 0.025 : 0.03);
        c->setKeyframeTangentsBroken(h, false);
        const auto before = cloneOf(*c);
        c->simplifyCurve(frame(24), frame(60), frameDuration(), kTQSimplifyBezier, 0, 1.0,
                         kTQSimplifyOnFrames);
        EXPECT_LE(worstFrameError(*before, *c, 0, 24), 1e-12) << "the Bezier segment before";
        c->setKeyframeTangentsBroken(h, true);
        c->setKeyframeInputTangents(h, -0.05, 0.0);
    }
    EXPECT_TRUE(*fitted[0] == *fitted[1]);

    // Two cubics joined smoothly at 1 s: three keyframes, the join an unbroken pair.
    auto join = std::make_unique<TQChannel>("join", 1, 0.0);
    join->setInterpolation(kTQInterpolationLinear);
    for (int64_t k = 0; k <= 60; ++k) {
        const double t = double(k) / kFps, s = t - 1.0;
        join->setKeyframe(frame(k),
                          t <= 1.0 ? t * t * t - t : 2.0 * s + 0.5 * s * s - 2 * s * s * s);
    }
    join->simplifyCurve(frame(0), frame(60), frameDuration(), kTQSimplifyBezier, 0, 0.01,
                        kTQSimplifyOnFrames);
    ASSERT_EQ(join->numberOfKeyframes(), 3u);
    EXPECT_FALSE(join->getKeyframeTangentsBroken(join->getKeyframe(frame(30))));

    // A Catmull-Rom zigzag with nothing to drop: every segment and both of its neighbours
    // stay, so nothing is written out as Bezier.
    auto zigzag = std::make_unique<TQChannel>("zigzag", 1, 0.0);
    zigzag->setInterpolation(kTQInterpolationCatmullRom);
    for (int64_t k = 0; k <= 60; k += 10) zigzag->setKeyframe(frame(k), double(k / 10 % 2));
    const auto stored = cloneOf(*zigzag);
    zigzag->simplifyCurve(frame(0), frame(60), frameDuration(), kTQSimplifyBezier, 0, 0.1,
                          kTQSimplifyOnFrames);
    EXPECT_TRUE(*zigzag == *stored);
}
