#include <gtest/gtest.h>

#include <functional>

#include "platform/channels/testing/CurveCatalogue.h"
#include "platform/channels/tests/KeyframeText.h"
#include "tests/support/TextBaseline.h"

using namespace curve_catalogue;

namespace {

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
    CMTime t = seconds(2.01), invalid = kCMTimeInvalid;
    EXPECT_FALSE(c->hasKeyframeAtTime(&t) || c->keyframeExistsAtTime(&t) ||
                 c->nextKeyframeTime(&invalid) || c->nextKeyframeTime(nullptr) ||
                 c->previousKeyframeTime(nullptr) || c->addKeyframe(nullptr) ||
                 c->addKeyframeAtAxisTime(nullptr) || c->keyframeExistsAtTime(nullptr) ||
                 c->hasKeyframeAtTime(nullptr, 1.0))
        << "no keyframe there, or no time to look at";
    EXPECT_TRUE(CMTIME_IS_INVALID(c->toChannelTime(nullptr)));
    c->offsetCurve(nullptr, 5.0);  // no time: nothing moves or goes
    c->deleteKeyframeAtTime(nullptr);
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
    curve_catalogue::AnnouncementCounter told;
    c->setChangeObserver(&told);
    c->reset();
    EXPECT_EQ(told.count, 0) << "a quiet reset";
    c->reset(true);
    EXPECT_EQ(told.count, 1);
    c->setChangeObserver(nullptr);
    const auto fresh = makeChannel("fresh");
    fresh->addBehavior(std::make_unique<TQNoiseBehavior>(1.0, 2.0, 3));
    EXPECT_TRUE(*c == *fresh) << "a new channel's state, its behaviours kept";
    // The extremes are kept from one read to the next: an assigned channel measures anew.
    auto copy = flat();
    copy->getKeyframeMaxValue();
    *copy = static_cast<const TQChannelBase&>(*clone);
    EXPECT_EQ(copy->getKeyframeMaxValue(), 30.0);
}

// Edits of the three keyframes, each a row whose record (see KeyframeScript) is held in
// baselines/keyframe-edits.txt.
struct KeyEdit {
    const char* name;
    const char* script;
};

void PrintTo(const KeyEdit& e, std::ostream* os) { *os << e.name; }

class CurveKeyEdits : public CurveKeyframes, public ::testing::WithParamInterface<KeyEdit> {};

TEST_P(CurveKeyEdits, edit__as_recorded) {
    EXPECT_TRUE(tests_support::matchesBaselineBlock("keyframe-edits", GetParam().name,
                                                    KeyframeScript(*c).run(GetParam().script),
                                                    "platform/channels/tests/baselines"));
}

INSTANTIATE_TEST_SUITE_P(
    Channels, CurveKeyEdits,
    ::testing::Values(
        // Neighbours pass disabled keyframes over when asked; a lookup within a tolerance
        // answers the nearest keyframe, on either side.
        KeyEdit{
            "neighbours",
            "enable 2 0; value 2 40; near? 2.5; near? 2; near? 1; near? 3; near? 2.3; near? 1.6"},
        // A keyframe moved between its neighbours, or every segment stepped, shows at once on
        // a curve already sampled.
        KeyEdit{"sampledCurveFollows",
                "curve? 1.5; curve? 2.5; retime 1 1.5; curve? 1.5; interpall 0; curve? 2.5"},
        // A new keyframe between two takes the chord's slope, handles a third of each segment;
        // at an extreme it is flat; at an end both handles take the one segment's third. An
        // existing keyframe stays, with its handles and interpolation unless asked to take the
        // channel's. Added from the curve, what is there kept: in channel time or on the axis.
        KeyEdit{"setKeyframe",
                "key 2.5 28; key 1.5 40; key 0.25 5; interp 2 1; key 2 21; key 3 31 r; "
                "interpall 1; shift 10; addaxis 12.5; add 3.5; addaxis 10.75; add 4.5"},
        // Keyframes that meet both live, the arrival standing for the time, until a purge
        // keeps it.
        KeyEdit{"meet", "move 1 2; at? 2; curve? 2; purge; purge"},
        // Replacing, every keyframe at the target goes at once; a move to its own time, or from
        // a time without a keyframe, changes nothing. The curve was read before.
        KeyEdit{"moveReplacing",
                "move 1 2; curve? 2.5; move 3 2 replace; move 2 2 replace; "
                "move 5 3; at? 2; curve? 2.5"},
        // A retime onto a keyframe collides, taking the value given with it; one to its own
        // time does not; a copy arrives after; deletions at a time take the last or all there.
        KeyEdit{"retimeCloneDelete",
                "delall 0; key 1 1; key 2 2; retime d 2 5; retime e 2; retime 2 3; clone 2 3; "
                "at? 3; delaxis 3 last; clone 2 3; delaxis 3; del 2; key 2 1; clone 2 2; delat 2"},
        // A move takes axis times and keeps the handles; absolute handles are given where they
        // lie, and follow the keyframe. Aligned, unscaled: opposite direction, the length
        // scaled with the written handle, from either side; scaled: the opposite keeps its
        // length; broken or without a direction: never follows. A handle that is not a number
        // changes nothing.
        KeyEdit{"handles",
                "shift 10; out 2 0.25 1.5; in 2 -0.4 -2; move 12 12.5; out 2.5 3 23 abs; "
                "in 2.5 2 19 abs; out 2.5 1 0; in 2.5 -2 0; out 2.5 0 2 aligned; "
                "in 2.5 3 0 aligned; scaled 2.5 1; out 2.5 0 -7 aligned; broken 2.5 1; "
                "out 2.5 1 1 aligned; broken 2.5 0; out 2.5 0 0 aligned; out 2.5 nan 5; "
                "in 2.5 1 inf; handles? 2.5; now 11; time? 12"},
        // The chord's slope through the neighbours, unbroken, Bezier unless kept; flat at an
        // extreme, a level one too.
        KeyEdit{"smooth",
                "interp 2 1; broken 2 1; interp 3 1; smooth 2; smooth 3 keep; "
                "value 2 30; smooth 1; smooth 2"},
        // Mirrored in its span, each segment's shape run backwards, the one leaving as it was;
        // the ends in either order; one keyframe has nothing to reverse.
        KeyEdit{"reverse",
                "delall 0; key 0 0; key 1 4; key 3 5; key 4 1; interp 0 13; "
                "interp 1 17; interp 3 1; interp 4 0; out 3 0.3 0.7; reverse 3 0; "
                "reverse 2 2"},
        // A segment's value moves both its ends; past the end the last keyframe; on a keyframe
        // the segment it starts. A curve's offset moves every keyframe by the same amount, to
        // an absolute target on the axis, past the end along the extrapolation. Nothing for a
        // value that is not finite or no time.
        KeyEdit{"segmentAndCurveOffsets",
                "interpall 1; extrap 1 after; segment 1.5 25; segment 3.5 35; segment 2 40; "
                "segment 0 nan; shift 10; offset 11.5 40; offset 11.5 40; offset 14 0; "
                "offset 11.5 nan; offset nan 5; delat nan"},
        // Without keyframes both move the initial value.
        KeyEdit{"offsetsWithoutKeyframes",
                "delall 0; initial 3; curve? 1; offset 1 -2; curve? 1; segment 1 -4; curve? 1"},
        // Without animation the initial value is shown and a value edit sets it; deleting every
        // keyframe keeps the value shown; without keyframes a value edit sets the initial value.
        KeyEdit{"valuesAndAnimation",
                "interpall 1; initial -1; anim 0; shown? 2; curve? 2; animated?; set 2.5 4; "
                "initial?; anim 1; animated?; set 2.5 7; set - 6; initial?; shown? 2 0.25; "
                "delall 2.25; set 2.5 8; delall 1"},
        // The extremes are kept from one read to the next; every edit must make them read anew.
        KeyEdit{"extremes",
                "extremes?; value 3 50; extremes?; enable 1 0; extremes?; key 4 -5; extremes?; "
                "retime b 2.5 100; extremes?; offset 2.5 101; extremes?; del b; extremes?; "
                "delall 0; initial 7; extremes?"}));

}  // namespace
