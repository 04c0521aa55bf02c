#include <gtest/gtest.h>

#include <array>
#include <functional>

#include "platform/channels/testing/CurveCatalogue.h"
#include "platform/channels/tests/KeyframeText.h"

using namespace curve_catalogue;

namespace {

constexpr double kTolerance = 1e-12;

// Keyframes at 1, 2 and 3 s valued 10, 20 and 30, made in that order.
class CurveKeyframes : public ::testing::Test {
protected:
    void SetUp() override {
        c = makeChannel("keys");
        a = c->setKeyframe(seconds(1.0), 10.0);
        b = c->setKeyframe(seconds(2.0), 20.0);
        d = c->setKeyframe(seconds(3.0), 30.0);
    }
    bool live(TQKeyframeHandle h) const { return c->getKeyframe(h, nullptr, nullptr); }
    std::unique_ptr<TQChannel> c;
    TQKeyframeHandle a = nullptr, b = nullptr, d = nullptr;
};

TEST_F(CurveKeyframes, reading__neighboursExtremesAndLookupsByTime) {
    c->setKeyframeEnabled(b, false);
    c->setKeyframeValue(b, 40.0);
    // Neighbours strictly before and after a time, passing disabled keyframes over when asked;
    // a lookup within a tolerance answers the nearest keyframe, on either side.
    const auto found = [](bool ok, const CMTime& t) { return ok ? CMTimeGetSeconds(t) : -1.0; };
    for (const auto& [at, previous, previousEnabled, next, near] :
         {std::tuple{2.5, 2.0, 1.0, 3.0, -1.0},
          {2.0, 1.0, 1.0, 3.0, 2.0},
          {1.0, -1.0, -1.0, 3.0, 1.0},
          {3.0, 2.0, 1.0, -1.0, 3.0},
          {2.3, 2.0, 1.0, 3.0, 2.0},
          {1.6, 1.0, 1.0, 3.0, 2.0}}) {
        CMTime p = seconds(at), pe = p, n = p, h = p;
        EXPECT_EQ(found(c->previousKeyframeTime(&p), p), previous) << at;
        EXPECT_EQ(found(c->previousKeyframeTime(&pe, true), pe), previousEnabled) << at;
        EXPECT_EQ(found(c->nextKeyframeTime(&n, at < 2.0), n), next) << at;
        EXPECT_EQ(found(c->hasKeyframeAtTime(&h, 0.45), h), near) << at;
        CMTime same = seconds(at);  // input and output may alias
        EXPECT_EQ(found(c->getPreviousKeyframe(same, &same, nullptr), same), previous) << at;
    }
    CMTime t = seconds(2.01), invalid = kCMTimeInvalid;
    EXPECT_FALSE(c->hasKeyframeAtTime(&t) || c->keyframeExistsAtTime(&t) ||
                 c->nextKeyframeTime(&invalid) || c->previousKeyframeTime(nullptr) ||
                 c->nextKeyframeTime(nullptr) || c->addKeyframe(nullptr) ||
                 c->keyframeExistsAtTime(nullptr) || c->hasKeyframeAtTime(nullptr, 1.0));
    EXPECT_EQ(c->getPreviousEnabledKeyframe(d), a);
    EXPECT_EQ(c->getPreviousEnabledKeyframe(a), nullptr);
    // Extremes over enabled keyframes unless told otherwise; the initial value without any.
    EXPECT_EQ((std::array{c->getKeyframeMinValue(), c->getKeyframeMaxValue(),
                          c->getKeyframeMaxValue(false)}),
              (std::array{10.0, 30.0, 40.0}));
    c->setKeyframeValue(b, 5.0);
    EXPECT_EQ(c->getKeyframeMinValue(false), 5.0);
    EXPECT_EQ(
        CMTimeGetSeconds(c->getKeyframeMinTime()) + 10 * CMTimeGetSeconds(c->getKeyframeMaxTime()),
        31.0);
    auto empty = makeChannel("empty");
    EXPECT_TRUE(CMTIME_IS_INVALID(empty->getKeyframeMinTime()) &&
                CMTIME_IS_INVALID(empty->getKeyframeMaxTime()));
    EXPECT_FALSE(empty->getFirstKeyframe(nullptr, nullptr) ||
                 empty->getLastKeyframe(nullptr, nullptr));
    CMTime first, last;
    double value = 0;
    ASSERT_TRUE(c->getFirstKeyframe(&first, &value) && c->getLastKeyframe(&last, nullptr));
    EXPECT_EQ(CMTimeGetSeconds(first) + 10 * CMTimeGetSeconds(last) + 100 * value, 1031.0);
    // A keyframe moved between its neighbours shows at once on a curve already sampled.
    const CMTime to = seconds(1.5);
    c->getCurveValue(to);
    c->setKeyframeTime(a, &to);
    EXPECT_EQ(c->getCurveValue(to), 10.0);
    // So does a change of every segment's interpolation: stepped, 2 s holds the value at 1.5.
    c->setInterpolation(kTQInterpolationConstant);
    EXPECT_EQ(c->getCurveValue(seconds(2.0)), 10.0);
}

TEST_F(CurveKeyframes, handles__staleAfterDeleteNeverReissuedAndIgnoredEverywhere) {
    // A handle looked up before an earlier keyframe goes still finds its own keyframe after.
    const auto keys = cloneOf(*c);
    const std::vector<TQKeyframeHandle> held = keys->getKeyframes(false);
    double value = 0.0;
    ASSERT_TRUE(keys->getKeyframe(held[1], nullptr, nullptr));
    keys->deleteKeyframe(held[0]);
    EXPECT_TRUE(keys->getKeyframe(held[1], nullptr, &value) && value == 20.0);
    c->deleteKeyframe(b);
    EXPECT_FALSE(live(b));
    TQKeyframeHandle again = c->setKeyframe(seconds(2.0), 20.0);
    EXPECT_NE(again, b) << "a new keyframe at the same place must get a new handle";
    auto other = flat();
    EXPECT_FALSE(other->getKeyframe(a, nullptr, nullptr)) << "a handle of another channel";
    EXPECT_FALSE(c->getKeyframe(nullptr, nullptr, nullptr));
    const auto before = cloneOf(*c);
    for (TQKeyframeHandle h : {b, TQKeyframeHandle(nullptr)}) {
        c->setKeyframeValue(h, 99.0);
        c->setKeyframeOutputTangents(h, 1.0, 1.0);
        c->setKeyframeInputTangents(h, -1.0, 1.0);
        c->setKeyframeInterpolation(h, kTQInterpolationLinear);
        c->setKeyframeEnabled(h, false);
        c->setKeyframeLocked(h, true);
        c->setKeyframeTangentsBroken(h, true);
        c->setKeyframeTangentsScaled(h, true);
        c->smoothKeyframe(h);
        c->reverseKeyframes(h, a);
        const CMTime to = seconds(5.0);
        c->setKeyframeTime(h, &to);
        c->deleteKeyframe(h);
        EXPECT_EQ(c->cloneKeyframe(h, to), nullptr);
        EXPECT_EQ(c->getKeyframeInterpolation(h), 0u);
        EXPECT_FALSE(c->getKeyframeInterpolationUsesTangents(h) || c->getKeyframeEnabled(h) ||
                     c->getKeyframeInputTangents(h, nullptr, nullptr));
    }
    EXPECT_TRUE(*c == *before) << keyText(*c, true);
    // Non-numeric times and values that are not finite add nothing; states out of order are
    // refused whole.
    std::vector<TQKeyframeState> states = c->getKeyframeStates();
    ASSERT_TRUE(c->setKeyframeStates(states));
    EXPECT_FALSE(live(a)) << "states make new keyframes";
    EXPECT_EQ(keyText(*c, true), keyText(*before, true)) << "each with a handle of its own";
    std::swap(states[0], states[1]);
    EXPECT_FALSE(c->setKeyframeStates(states));
    std::swap(states[0], states[1]);
    for (auto spoil : {+[](TQKeyframeState& k) { k.time = kCMTimeInvalid; },
                       +[](TQKeyframeState& k) { k.interpolation = 99; }}) {
        std::vector<TQKeyframeState> spoilt = states;
        spoil(spoilt[1]);
        EXPECT_FALSE(c->setKeyframeStates(spoilt));
    }
    EXPECT_EQ(c->setKeyframe(kCMTimeInvalid, 1.0), nullptr);
    EXPECT_EQ(c->setKeyframe(seconds(4.0), NAN), nullptr);
    c->setKeyframeValue(a, INFINITY);
    EXPECT_TRUE(*c == *before) << keyText(*c, true);
}

TEST_F(CurveKeyframes, setKeyframe__addsWithAutomaticHandlesOrReplacesTheValue) {
    editScript(
        *c,
        // A new keyframe between two takes the chord's slope, handles a third of each
        // segment; at an extreme it is flat; at an end both handles take the one
        // segment's third. An existing keyframe keeps its handles and interpolation,
        // unless asked to take the channel's.
        "key 2.5 28; =>h 1=10(0,0|0,0) 2=20(-0.333333,0|0.333333,0) "
        "2.5=28(-0.166667,-1.66667|0.166667,1.66667) "
        "3=30(-0.333333,0|0.333333,0); key 1.5 40; key 0.25 5; interp 2 1; key 2 21; key 3 31 r; "
        "=>h 0.25=5(-0.25,0|0.25,0) 1=10(0,0|0,0) 1.5=40(-0.166667,0|0.166667,0) "
        "2=21/1(-0.333333,0|0.333333,0) "
        "2.5=28(-0.166667,-1.66667|0.166667,1.66667) 3=31(-0.333333,0|0.333333,0); "
        // Added from the curve, what is there kept: in channel time or on the axis.
        "interpall 1; shift 10; addaxis 12.5; add 3.5; addaxis 10.75; add 4.5; "
        "=> 0.25=5/1 0.75=8.33333/1 1=10/1 1.5=40/1 2=21/1 2.5=28/1 3=31/1 3.5=31/1 4.5=31/1");
    EXPECT_EQ(c->setKeyframe(seconds(2.0), 21.0), b) << "the same keyframe";
    EXPECT_EQ(c->addKeyframeAtAxisTime(nullptr), nullptr);
}

TEST_F(CurveKeyframes, meetingKeyframes__bothLiveUntilPurgeKeepsTheArrival) {
    const CMTime two = seconds(2.0);
    editScript(*c, "move 1 2; => 2=20 2=10 3=30");  // the arrival comes last
    EXPECT_EQ(c->getKeyframe(two), a) << "lookup by time answers the keyframe that arrived";
    EXPECT_NEAR(c->getCurveValue(two), 10.0, kTolerance) << "the arrival stands for the time";
    const auto copy = cloneOf(*c);
    editScript(*c, "purge; => 2=10 3=30; purge; => 2=10 3=30");
    EXPECT_TRUE(live(a) && !live(b)) << "the moved keyframe survives, the one it landed on goes";
    // Replacing, every keyframe at the target goes at once; a move to its own time, or from a
    // time without a keyframe, changes nothing.
    // Read, and so held, before the move: the curve and where the handles are.
    EXPECT_TRUE(copy->getKeyframe(b, nullptr, nullptr) && copy->getCurveValue(seconds(2.5)) < 30);
    editScript(*copy, "move 3 2 replace; => 2=30; move 2 2 replace; move 5 3; => 2=30");
    EXPECT_EQ(copy->getKeyframe(two), d);
    EXPECT_FALSE(copy->getKeyframe(a, nullptr, nullptr) || copy->getKeyframe(b, nullptr, nullptr))
        << "the replaced keyframes' handles are stale";
    EXPECT_EQ(copy->getCurveValue(seconds(2.5)), 30.0);

    auto e = makeChannel("e");
    const TQKeyframeHandle x = e->setKeyframe(seconds(1.0), 1.0), y = e->setKeyframe(two, 2.0);
    bool collided = false;
    const double value = 5.0;
    e->setKeyframeTime(x, &two, &value, &collided);
    EXPECT_TRUE(collided) << "and the value set with the move";
    e->setKeyframeTime(y, &two, nullptr, &collided);
    EXPECT_FALSE(collided) << "a keyframe set to its own time does not move";
    editScript(*e, "=> 2=2 2=5; retime 2 3; => 2=2 3=5; clone 2 3; => 2=2 3=5 3=2");
    EXPECT_EQ(e->getKeyframe(seconds(3.0)), e->getKeyframes(false).back())
        << "a copy arrives after";
    editScript(*e, "delaxis 3 last; => 2=2 3=5; clone 2 3; delaxis 3; => 2=2; del 2; => (0)");
    e->setKeyframe(two, 1.0);
    e->cloneKeyframe(e->getKeyframe(two), two);
    e->deleteKeyframeAtTime(&two);
    EXPECT_EQ(e->numberOfKeyframes(), 0u) << "every keyframe at the time";
}

TEST_F(CurveKeyframes, handlesAndTangents__followTheKeyframeAndEachOtherOnlyWhenAsked) {
    editScript(
        *c,
        // A move takes axis times and keeps the handles; absolute handles are given
        // where they lie.
        "shift 10; out 2 0.25 1.5; in 2 -0.4 -2; move 12 12.5; "
        "=>h 1=10(0,0|0,0) 2.5=20(-0.4,-2|0.25,1.5) 3=30(-0.333333,0|0.333333,0); "
        "out 2.5 3 23 abs; in 2.5 2 19 abs; =>h 1=10(0,0|0,0) 2.5=20(-0.5,-1|0.5,3) "
        "3=30(-0.333333,0|0.333333,0); "
        // Aligned, unscaled: opposite direction, the length scaled with the written
        // handle, from either side; scaled: the opposite keeps its length; broken or
        // without a direction: never follows.
        "out 2.5 1 0; in 2.5 -2 0; out 2.5 0 2 aligned; =>h 1=10(0,0|0,0) 2.5=20(0,-4|0,2) "
        "3=30(-0.333333,0|0.333333,0); "
        "in 2.5 3 0 aligned; =>h 1=10(0,0|0,0) 2.5=20(3,0|-1.5,0) 3=30(-0.333333,0|0.333333,0); "
        "scaled 2.5 1; out 2.5 0 -7 aligned; =>h 1=10(0,0|0,0) 2.5=20(0,3|0,-7)s "
        "3=30(-0.333333,0|0.333333,0); "
        "broken 2.5 1; out 2.5 1 1 aligned; =>h 1=10(0,0|0,0) 2.5=20(0,3|1,1)bs "
        "3=30(-0.333333,0|0.333333,0); "
        "broken 2.5 0; out 2.5 0 0 aligned; =>h 1=10(0,0|0,0) 2.5=20(0,3|0,0)s "
        "3=30(-0.333333,0|0.333333,0); "
        // A handle that is not a number changes nothing.
        "out 2.5 nan 5; in 2.5 1 inf; =>h 1=10(0,0|0,0) 2.5=20(0,3|0,0)s "
        "3=30(-0.333333,0|0.333333,0)");
    double u = 0, v = 0;
    ASSERT_TRUE(c->getKeyframeInputTangents(b, &u, &v, false));
    EXPECT_EQ(u * 100 + v, 250.0 + 23.0)
        << "the absolute position of a handle follows the keyframe";
    ASSERT_TRUE(c->getKeyframeOutputTangents(b, &u, &v, false));
    EXPECT_EQ(u * 100 + v, 250.0 + 20.0) << "in the keyframe's own units";
    const CMTime from = seconds(12.0);
    EXPECT_EQ(CMTimeGetSeconds(c->toChannelTime(&from)), 2.0);
    EXPECT_TRUE(CMTIME_IS_INVALID(c->toChannelTime(nullptr)));
    c->setRootCurrentTime(seconds(11.0));
    EXPECT_EQ(
        CMTimeGetSeconds(c->getRootCurrentTime()) + CMTimeGetSeconds(c->getRootCurrentTime(false)),
        12.0);
}

TEST_F(CurveKeyframes, smoothAndReverse__catmullRomHandlesAndMirroredRuns) {
    editScript(*c,
               // The chord's slope through the neighbours, unbroken, Bezier unless kept; flat at
               // an extreme, a level one too.
               "interp 2 1; broken 2 1; interp 3 1; smooth 2; smooth 3 keep; "
               "=>h 1=10(0,0|0,0) 2=20(-0.333333,-3.33333|0.333333,3.33333) "
               "3=30/1(-0.333333,0|0.333333,0); "
               "value 2 30; smooth 1; smooth 2; "
               "=>h 1=10(-0.333333,0|0.333333,0) 2=30(-0.333333,0|0.333333,0) "
               "3=30/1(-0.333333,0|0.333333,0)");
    auto r = makeChannel("r");
    editScript(*r,
               "key 0 0; key 1 4; key 3 5; key 4 1; interp 0 13; interp 1 17; interp 3 1; interp 4 "
               "0; out 3 0.3 0.7");
    const auto before = cloneOf(*r);
    // Mirrored in its span, each segment's shape run backwards, the one leaving as it was; the
    // order of the ends does not matter, and one keyframe has nothing to reverse.
    editScript(*r,
               "reverse 3 0; =>h 0=5/16(-0.3,0.7|0.666667,0) 2=4/14(-0.333333,0|0.333333,0) "
               "3=0/1(0,0|0,0) "
               "4=1/0(-0.333333,0|0.333333,0); reverse 2 2; => 0=5/16 2=4/14 3=0/1 4=1/0");
    for (double t = 0.0; t <= 3.0; t += 0.1)
        EXPECT_NEAR(r->getCurveValue(seconds(t)), before->getCurveValue(seconds(3.0 - t)), 1e-6)
            << t;
}

TEST_F(CurveKeyframes, segmentAndCurveOffsets__moveTheRightKeyframes) {
    editScript(
        *c,
        // Both ends of the segment; past the end the last keyframe; on a keyframe the
        // segment it starts; nothing for a value that is not finite.
        "interpall 1; extrap 1 after; segment 1.5 25; => 1=20/1 2=30/1 3=30/1; segment 3.5 35; "
        "=> 1=20/1 2=30/1 3=35/1; segment 2 40; => 1=20/1 2=40/1 3=45/1; segment 0 nan; "
        "=> 1=20/1 2=40/1 3=45/1; "
        // Every keyframe by the same amount, to an absolute target on the axis, past the
        // end along the extrapolation.
        "shift 10; offset 11.5 40; => 1=30/1 2=50/1 3=55/1; offset 11.5 40; => 1=30/1 2=50/1 "
        "3=55/1; "
        "offset 14 0; => 1=-30/1 2=-10/1 3=-5/1; offset 11.5 nan; => 1=-30/1 2=-10/1 3=-5/1");
    const auto moved = cloneOf(*c);
    const CMTime invalid = kCMTimeInvalid;
    c->offsetCurve(nullptr, 5.0);
    c->offsetCurve(&invalid, 5.0);
    c->deleteKeyframeAtTime(nullptr);
    c->deleteKeyframeAtTime(&invalid);
    EXPECT_TRUE(*c == *moved) << "no time: nothing moves or goes";
    auto empty = makeChannel("empty");
    editScript(*empty, "initial 3; offset 1 -2");
    EXPECT_EQ(empty->getInitialValue(), -2.0) << "without keyframes the initial value moves";
    editScript(*empty, "segment 1 -4");
    EXPECT_EQ(empty->getInitialValue(), -4.0);
}

TEST_F(CurveKeyframes, valuesAndAnimation__deleteAllKeepsWhatWasShownDisabledShowsTheInitialValue) {
    c->setInterpolation(kTQInterpolationLinear);
    c->setInitialValue(-1.0);
    c->setAnimationEnabled(false);
    EXPECT_EQ(c->getValueAsDouble(seconds(2.0)), -1.0);
    EXPECT_EQ(c->getCurveValue(seconds(2.0)), 20.0) << "the keyframed curve is still there";
    EXPECT_FALSE(c->canKeyframe() || c->isAnimated());
    const CMTime t = seconds(2.5);
    c->setValue(&t, 4.0);
    EXPECT_EQ(c->getInitialValue(), 4.0) << "without animation a value edit sets the initial value";
    c->setAnimationEnabled(true);
    EXPECT_TRUE(c->canKeyframe() && c->isAnimated());
    c->setValue(&t, 7.0);
    c->setValue(nullptr, 6.0);
    EXPECT_EQ(keyText(*c), "1=10/1 2=20/1 2.5=7/1 3=30/1");
    EXPECT_EQ(c->getInitialValue(), 6.0);
    EXPECT_EQ(c->getValueAsDouble(seconds(2.0), 0.25), 13.5) << "the sub-frame offset counts";

    c->deleteAllKeyframes(seconds(2.25));
    EXPECT_EQ(keyText(*c), "(13.5)") << "no keyframes, the value shown kept";
    EXPECT_FALSE(live(a) || live(b) || live(d));
    c->setValue(&t, 8.0);
    EXPECT_EQ(c->getInitialValue(), 8.0) << "without keyframes a value edit sets the initial value";
    c->deleteAllKeyframes(seconds(1.0));
    EXPECT_EQ(c->getInitialValue(), 8.0);
}

TEST_F(CurveKeyframes, cloneAssignCompareAndReset__roundTripEveryPartOfTheState) {
    c->setExtrapolation(kTQExtrapolationRepeat, kTQExtrapolationAfter);
    c->setKeyframeLocked(a, true);
    c->addBehavior(std::make_unique<TQNoiseBehavior>(1.0, 2.0, 3));
    const auto clone = cloneOf(*c);
    EXPECT_TRUE(*clone == *c);
    EXPECT_TRUE(clone->getKeyframeLocked(a)) << "a clone keeps the keyframes' serials";
    // Every part of the state is compared and carried by an assignment.
    const std::function<void(TQChannel&)> edits[] = {
        [&](TQChannel& x) { x.setKeyframeValue(a, 11.0); },
        [&](TQChannel& x) { x.setKeyframeInputTangents(d, -0.5, 0.5); },
        [&](TQChannel& x) { x.setKeyframeTangentsScaled(b, true); },
        [&](TQChannel& x) { x.setKeyframe(seconds(4.0), 1.0); },
        [&](TQChannel& x) { x.setInitialValue(2.0); },
        [&](TQChannel& x) { x.setExtrapolation(kTQExtrapolationLinear, kTQExtrapolationBefore); },
        [&](TQChannel& x) { x.setExtrapolation(kTQExtrapolationPingPong, kTQExtrapolationAfter); },
        [&](TQChannel& x) { x.setAnimationEnabled(false); },
        [&](TQChannel& x) {
            x.deleteAllKeyframes(kCMTimeInvalid), x.setInterpolation(kTQInterpolationExp);
        },
        [&](TQChannel& x) { x.getBehavior(0)->setSelected(true); },
        [&](TQChannel& x) { x.addBehavior(std::make_unique<TQOscillateBehavior>(1.0, 1.0)); },
        [&](TQChannel& x) { x.setFlag(kTQChannelFlagHidden), x.setLocked(true); },
        [&](TQChannel& x) { x.getInfo()->tickStep = 2.0, x.getImpl()->range().setRange(0.0, 1.0); },
    };
    for (size_t i = 0; i < std::size(edits); ++i) {
        const auto changed = cloneOf(*c);
        edits[i](*changed);
        EXPECT_FALSE(*changed == *c) << "edit " << i << " must be seen";
        const auto restored = cloneOf(*changed);
        *restored = *c;
        EXPECT_TRUE(*restored == *c) << "edit " << i << " must be undone by an assignment";
        *restored = *changed;
        EXPECT_TRUE(*restored == *changed) << "edit " << i << " must be carried by an assignment";
    }
    c->setInterpolation(kTQInterpolationLinear);
    c->setAnimationEnabled(false);
    c->setInitialValue(3.0);
    c->reset();
    const auto fresh = makeChannel("fresh");
    fresh->addBehavior(std::make_unique<TQNoiseBehavior>(1.0, 2.0, 3));
    EXPECT_TRUE(*c == *fresh) << "a new channel's state, its behaviours kept";
}

// The extremes are kept from one read to the next; every edit must make them read anew.
TEST_F(CurveKeyframes, extremes__follow_every_kind_of_edit) {
    const CMTime later = seconds(2.5);
    const double hundred = 100.0;
    const struct {
        const char* edit;
        std::function<void()> apply;
        std::array<double, 4> minMaxThenEnabledOnly;
    } steps[] = {
        {"as set", [] {}, {10, 30, 10, 30}},
        {"a value", [&] { c->setKeyframeValue(d, 50.0); }, {10, 50, 10, 50}},
        {"disabled", [&] { c->setKeyframeEnabled(a, false); }, {10, 50, 20, 50}},
        {"a new keyframe", [&] { c->setKeyframe(seconds(4.0), -5.0); }, {-5, 50, -5, 50}},
        {"a move", [&] { c->setKeyframeTime(b, &later, &hundred); }, {-5, 100, -5, 100}},
        {"an offset", [&] { c->offsetCurve(&later, 101.0); }, {-4, 101, -4, 101}},
        {"a deletion", [&] { c->deleteKeyframe(b); }, {-4, 51, -4, 51}},
        {"all gone: the initial value",
         [&] { c->deleteAllKeyframes(seconds(0.0)), c->setInitialValue(7.0); },
         {7, 7, 7, 7}},
    };
    for (const auto& step : steps) {
        step.apply();
        EXPECT_EQ((std::array{c->getKeyframeMinValue(false), c->getKeyframeMaxValue(false),
                              c->getKeyframeMinValue(true), c->getKeyframeMaxValue(true)}),
                  step.minMaxThenEnabledOnly)
            << step.edit;
    }
    auto copy = flat();
    *copy = static_cast<const TQChannelBase&>(*c);
    EXPECT_DOUBLE_EQ(copy->getKeyframeMaxValue(), 7.0) << "an assigned channel measures anew";
}

}  // namespace
