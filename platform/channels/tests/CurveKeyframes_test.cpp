#include <gtest/gtest.h>

#include <functional>

#include "platform/channels/tests/CurveCatalogue.h"

using namespace curve_catalogue;

namespace {

constexpr double kTolerance = 1e-12;

class CurveKeyframes : public ::testing::Test {
protected:
    void SetUp() override {
        c = makeChannel("keys");
        a = c->setKeyframe(seconds(1.0), 10.0);
        b = c->setKeyframe(seconds(2.0), 20.0);
        d = c->setKeyframe(seconds(3.0), 30.0);
    }
    double valueOf(TQKeyframeHandle h) const {
        double v = 0.0;
        c->getKeyframe(h, nullptr, &v);
        return v;
    }
    std::unique_ptr<TQChannel> c;
    TQKeyframeHandle a = nullptr, b = nullptr, d = nullptr;
};

TEST_F(CurveKeyframes, getKeyframe__answers_liveness_with_null_out_pointers) {
    EXPECT_TRUE(c->getKeyframe(a, nullptr, nullptr));
    EXPECT_FALSE(c->getKeyframe(nullptr, nullptr, nullptr));
    auto other = flat();
    EXPECT_FALSE(other->getKeyframe(a, nullptr, nullptr)) << "a handle of another channel";
}

TEST_F(CurveKeyframes, delete__makes_handles_stale_and_never_reissues_them) {
    c->deleteKeyframe(b);
    EXPECT_FALSE(c->getKeyframe(b, nullptr, nullptr));
    TQKeyframeHandle again = c->setKeyframe(seconds(2.0), 20.0);
    EXPECT_NE(again, b) << "a new keyframe at the same place must get a new handle";
    EXPECT_FALSE(c->getKeyframe(b, nullptr, nullptr));
    // Every operation on the stale handle is a no-op.
    c->setKeyframeValue(b, 99.0);
    c->setKeyframeOutputTangents(b, 1.0, 1.0);
    c->deleteKeyframe(b);
    EXPECT_EQ(c->numberOfKeyframes(), 3u);
    EXPECT_EQ(valueOf(again), 20.0);
}

TEST_F(CurveKeyframes, meeting_keyframes__both_live_until_purge_keeps_the_arrival) {
    const CMTime from = seconds(1.0), to = seconds(2.0);
    c->moveKeyframe(&from, &to);
    EXPECT_TRUE(c->getKeyframe(a, nullptr, nullptr));
    EXPECT_TRUE(c->getKeyframe(b, nullptr, nullptr));
    EXPECT_EQ(c->numberOfKeyframes(), 3u);
    EXPECT_EQ(c->getKeyframe(to), a) << "lookup by time answers the keyframe that arrived";
    EXPECT_NEAR(c->getCurveValue(to), 10.0, kTolerance) << "the arrival stands for the time";

    c->purgeKeyframes();
    EXPECT_EQ(c->numberOfKeyframes(), 2u);
    EXPECT_TRUE(c->getKeyframe(a, nullptr, nullptr)) << "the moved keyframe survives";
    EXPECT_FALSE(c->getKeyframe(b, nullptr, nullptr)) << "the one it landed on goes stale";
}

TEST_F(CurveKeyframes, move_without_keeping_both__replaces_the_target_at_once) {
    const CMTime from = seconds(1.0), to = seconds(3.0);
    c->moveKeyframe(&from, &to, false);
    EXPECT_EQ(c->numberOfKeyframes(), 2u);
    EXPECT_FALSE(c->getKeyframe(d, nullptr, nullptr));
    EXPECT_EQ(c->getKeyframe(to), a);
}

TEST_F(CurveKeyframes, move__takes_axis_times_and_keeps_handles_and_tangents) {
    c->setTimeOffset(seconds(10.0));
    c->setKeyframeOutputTangents(b, 0.25, 1.5);
    c->setKeyframeInputTangents(b, -0.4, -2.0);
    const CMTime from = seconds(12.0), to = seconds(12.5);
    c->moveKeyframe(&from, &to);
    CMTime t;
    ASSERT_TRUE(c->getKeyframe(b, &t, nullptr)) << "a move keeps the handle alive";
    EXPECT_EQ(CMTimeCompare(t, seconds(2.5)), 0) << "the channel removes its time offset";
    double u = 0, v = 0;
    c->getKeyframeOutputTangents(b, &u, &v);
    EXPECT_EQ(u, 0.25);
    EXPECT_EQ(v, 1.5);
    c->getKeyframeInputTangents(b, &u, &v, false);
    EXPECT_NEAR(u, 2.1, kTolerance) << "absolute handle position follows the keyframe";
    EXPECT_NEAR(v, 18.0, kTolerance);
}

TEST_F(CurveKeyframes, setKeyframeTime__reports_collisions_and_sets_value) {
    bool collided = false;
    const CMTime onto = seconds(3.0);
    const double value = 5.0;
    c->setKeyframeTime(a, &onto, &value, &collided);
    EXPECT_TRUE(collided);
    EXPECT_EQ(valueOf(a), 5.0);
    c->setKeyframeTime(a, nullptr, nullptr, &collided);
    EXPECT_FALSE(collided);
}

TEST_F(CurveKeyframes, neighbours__previous_next_and_enabled) {
    CMTime t = seconds(2.5);
    ASSERT_TRUE(c->previousKeyframeTime(&t));
    EXPECT_EQ(CMTimeCompare(t, seconds(2.0)), 0);
    ASSERT_TRUE(c->nextKeyframeTime(&t));
    EXPECT_EQ(CMTimeCompare(t, seconds(3.0)), 0);
    EXPECT_FALSE(c->nextKeyframeTime(&t));
    EXPECT_FALSE(c->previousKeyframeTime(nullptr));

    c->setKeyframeEnabled(b, false);
    EXPECT_EQ(c->getPreviousEnabledKeyframe(d), a);
    CMTime same = seconds(3.0);
    ASSERT_TRUE(c->getPreviousKeyframe(same, &same, nullptr)) << "input and output may alias";
    EXPECT_EQ(CMTimeCompare(same, seconds(2.0)), 0);

    CMTime near = seconds(2.01);
    EXPECT_FALSE(c->hasKeyframeAtTime(&near));
    EXPECT_TRUE(c->hasKeyframeAtTime(&near, 0.02));
    EXPECT_EQ(CMTimeCompare(near, seconds(2.0)), 0);
}

TEST_F(CurveKeyframes, tangents__follow_only_when_asked_and_unbroken) {
    c->setKeyframeInputTangents(b, -0.5, -1.0);
    c->setKeyframeOutputTangents(b, 0.5, 1.0);
    double u = 0, v = 0;
    {  // The editor's form: only the written side changes.
        c->setKeyframeOutputTangents(b, 0.2, 3.0);
        c->getKeyframeInputTangents(b, &u, &v);
        EXPECT_EQ(u, -0.5);
        EXPECT_EQ(v, -1.0);
    }
    {  // Aligned, unscaled: opposite direction, length scaled with the written handle.
        c->setKeyframeOutputTangents(b, 1.0, 0.0);
        c->setKeyframeInputTangents(b, -1.0, 0.0);
        c->setKeyframeOutputTangents(b, 0.0, 2.0, true, true);
        c->getKeyframeInputTangents(b, &u, &v);
        EXPECT_NEAR(u, 0.0, kTolerance);
        EXPECT_NEAR(v, -2.0, kTolerance);
    }
    {  // Scaled pair: the opposite handle keeps its length.
        c->setKeyframeTangentsScaled(b, true);
        c->setKeyframeOutputTangents(b, 3.0, 0.0, true, true);
        c->getKeyframeInputTangents(b, &u, &v);
        EXPECT_NEAR(u, -2.0, kTolerance);
        EXPECT_NEAR(v, 0.0, kTolerance);
    }
    {  // Broken pair: never follows.
        c->setKeyframeTangentsBroken(b, true);
        c->setKeyframeOutputTangents(b, 0.0, 1.0, true, true);
        c->getKeyframeInputTangents(b, &u, &v);
        EXPECT_NEAR(u, -2.0, kTolerance);
    }
}

TEST_F(CurveKeyframes, smoothKeyframe__gives_catmull_rom_slope_and_bezier) {
    c->setKeyframeInterpolation(b, kTQInterpolationLinear);
    c->setKeyframeTangentsBroken(b, true);
    c->smoothKeyframe(b);
    double u = 0, v = 0;
    c->getKeyframeOutputTangents(b, &u, &v);
    EXPECT_NEAR(v / u, 10.0, kTolerance) << "slope of the chord through the neighbours";
    EXPECT_NEAR(u, 1.0 / 3.0, kTolerance);
    EXPECT_EQ(c->getKeyframeInterpolation(b), kTQInterpolationBezier);
    EXPECT_FALSE(c->getKeyframeTangentsBroken(b));
}

TEST_F(CurveKeyframes, reverseKeyframes__mirrors_times_handles_and_shapes) {
    c->setKeyframeInterpolation(a, kTQInterpolationExp);
    c->setKeyframeOutputTangents(d, 0.3, 0.7);
    auto before = std::unique_ptr<TQChannel>(static_cast<TQChannel*>(c->cloneChannel()));
    c->reverseKeyframes(d, a);  // order of the arguments does not matter
    for (double t = 1.0; t <= 3.0; t += 0.1) {
        EXPECT_NEAR(c->getCurveValue(seconds(t)), before->getCurveValue(seconds(4.0 - t)), 1e-6)
            << "reversed curve at " << t;
    }
    CMTime t;
    c->getKeyframe(d, &t, nullptr);
    EXPECT_EQ(CMTimeCompare(t, seconds(1.0)), 0);
    double u = 0, v = 0;
    c->getKeyframeInputTangents(d, &u, &v);
    EXPECT_EQ(u, -0.3);
    EXPECT_EQ(v, 0.7);
}

TEST_F(CurveKeyframes, segment_and_curve_offsets__move_the_right_keyframes) {
    c->setInterpolation(kTQInterpolationLinear);
    c->setCurveSegmentValue(seconds(1.5), 25.0);
    EXPECT_NEAR(c->getCurveValue(seconds(1.5)), 25.0, kTolerance);
    EXPECT_EQ(valueOf(d), 30.0) << "keyframes outside the segment stay";
}

TEST_F(CurveKeyframes, offsetCurve__puts_the_curve_through_the_target_at_axis_time) {
    c->setInterpolation(kTQInterpolationLinear);
    c->setExtrapolation(kTQExtrapolationLinear, kTQExtrapolationAfter);
    c->setTimeOffset(seconds(10.0));
    const CMTime at = seconds(11.5);  // channel time 1.5, value 15
    c->offsetCurve(&at, 40.0);
    EXPECT_NEAR(c->getCurveValue(seconds(1.5)), 40.0, kTolerance);
    EXPECT_NEAR(valueOf(a), 35.0, kTolerance) << "every keyframe moves by the same amount";
    EXPECT_NEAR(valueOf(d), 55.0, kTolerance);
    {
        // The target is absolute: a repeated or skipped step lands in the same place.
        auto once = std::unique_ptr<TQChannelBase>(c->cloneChannel());
        c->offsetCurve(&at, 40.0);
        EXPECT_TRUE(*c == *once);
    }
    {
        // Past the last keyframe the extrapolated curve is what reaches the target.
        const CMTime late = seconds(14.0);
        c->offsetCurve(&late, 0.0);
        EXPECT_NEAR(c->getCurveValue(seconds(4.0)), 0.0, kTolerance);
        EXPECT_NEAR(valueOf(d), -10.0, kTolerance);
    }
    {
        auto before = std::unique_ptr<TQChannelBase>(c->cloneChannel());
        c->offsetCurve(nullptr, 5.0);
        const CMTime invalid = kCMTimeInvalid;
        c->offsetCurve(&invalid, 5.0);
        c->offsetCurve(&at, NAN);
        EXPECT_TRUE(*c == *before) << "no time, or no finite value: nothing moves";
    }
    {
        auto empty = makeChannel("empty");
        empty->setInitialValue(3.0);
        empty->offsetCurve(&at, -2.0);
        EXPECT_EQ(empty->getInitialValue(), -2.0) << "without keyframes the initial value moves";
    }
}

TEST_F(CurveKeyframes, deleteAllKeyframes__keeps_the_value_shown_at_the_current_time) {
    c->setInterpolation(kTQInterpolationLinear);
    c->deleteAllKeyframes(seconds(2.5));
    EXPECT_EQ(c->numberOfKeyframes(), 0u);
    EXPECT_NEAR(c->getInitialValue(), 25.0, kTolerance);
    EXPECT_FALSE(c->getKeyframe(a, nullptr, nullptr));
}

TEST_F(CurveKeyframes, animation_and_values__disabled_animation_shows_the_initial_value) {
    c->setInitialValue(-1.0);
    c->setAnimationEnabled(false);
    EXPECT_EQ(c->getValueAsDouble(seconds(2.0)), -1.0);
    EXPECT_FALSE(c->canKeyframe());
    EXPECT_FALSE(c->isAnimated());
    c->setValue(nullptr, 4.0);
    EXPECT_EQ(c->getInitialValue(), 4.0) << "without animation a value edit sets the initial value";
    c->setAnimationEnabled(true);
    const CMTime t = seconds(2.5);
    c->setValue(&t, 7.0);
    EXPECT_TRUE(c->keyframeExistsAtTime(&t));
}

TEST_F(CurveKeyframes, clone_assign_and_compare__round_trip_the_state) {
    c->setExtrapolation(kTQExtrapolationRepeat, kTQExtrapolationAfter);
    c->setKeyframeLocked(a, true);
    c->addBehavior(std::make_unique<TQNoiseBehavior>(1.0, 2.0, 3));
    std::unique_ptr<TQChannelBase> clone(c->cloneChannel());
    EXPECT_TRUE(*clone == *c);
    auto* copy = dynamic_cast<TQChannel*>(clone.get());
    ASSERT_NE(copy, nullptr);
    EXPECT_TRUE(copy->getKeyframeLocked(a)) << "a clone keeps the keyframes' serials";

    copy->setKeyframeValue(a, 11.0);
    EXPECT_FALSE(*clone == *c) << "a value change must be seen";
    *copy = *c;
    EXPECT_TRUE(*clone == *c);
    copy->getBehavior(0)->setSelected(true);
    EXPECT_FALSE(*clone == *c) << "behaviour flags are state";

    c->reset();
    EXPECT_EQ(c->numberOfKeyframes(), 0u);
    EXPECT_EQ(c->getInitialValue(), c->getDefaultValue());
    EXPECT_EQ(c->getExtrapolation(kTQExtrapolationAfter), kTQExtrapolationConstant);
}

}  // namespace

namespace {

// The extremes are kept from one read to the next; every edit must make them read anew.
TEST_F(CurveKeyframes, extremes__follow_every_kind_of_edit) {
    const struct {
        const char* edit;
        std::function<void()> apply;
        double min, max, minEnabled, maxEnabled;
    } steps[] = {
        {"as set", [] {}, 10, 30, 10, 30},
        {"a value", [&] { c->setKeyframeValue(d, 50.0); }, 10, 50, 10, 50},
        {"disabled", [&] { c->setKeyframeEnabled(a, false); }, 10, 50, 20, 50},
        {"a new keyframe", [&] { c->setKeyframe(seconds(4.0), -5.0); }, -5, 50, -5, 50},
        {"a move",
         [&] {
             const CMTime later = seconds(2.5);
             const double value = 100.0;
             c->setKeyframeTime(b, &later, &value);
         },
         -5, 100, -5, 100},
        {"an offset",
         [&] {
             const CMTime at = seconds(2.5);
             c->offsetCurve(&at, 101.0);
         },
         -4, 101, -4, 101},
        {"a deletion", [&] { c->deleteKeyframe(b); }, -4, 51, -4, 51},
        {"all gone: the initial value",
         [&] {
             c->deleteAllKeyframes(seconds(0.0));
             c->setInitialValue(7.0);
         },
         7, 7, 7, 7},
    };
    for (const auto& step : steps) {
        step.apply();
        EXPECT_DOUBLE_EQ(c->getKeyframeMinValue(false), step.min) << step.edit;
        EXPECT_DOUBLE_EQ(c->getKeyframeMaxValue(false), step.max) << step.edit;
        EXPECT_DOUBLE_EQ(c->getKeyframeMinValue(true), step.minEnabled) << step.edit;
        EXPECT_DOUBLE_EQ(c->getKeyframeMaxValue(true), step.maxEnabled) << step.edit;
    }
    auto copy = flat();
    *copy = static_cast<const TQChannelBase&>(*c);
    EXPECT_DOUBLE_EQ(copy->getKeyframeMaxValue(), 7.0) << "an assigned channel measures anew";
}

}  // namespace
