// Tangent operations. The fixture's view maps 10 s by 2 units onto 800 x 400 pixels, so one
// world unit is 80 pixels across and 200 up: angles in the world and on the screen differ,
// which is what the screen-space follow of the opposite handle is about.

#include <cmath>
#include <numbers>
#include <string>

#include "src/engine/tests/EngineFixture.h"

namespace engine_test {
namespace {

constexpr double kPixelTolerance = 1e-2;   // the projection is single precision
constexpr double kAngleTolerance = 1e-4;   // radians
constexpr double kOffsetTolerance = 1e-5;  // handle offsets after a screen round trip

double angleOf(const CGPoint& p) { return std::atan2(p.y, p.x); }
double lengthOf(const CGPoint& p) { return std::hypot(p.x, p.y); }
// Difference of two angles folded into (-pi, pi].
double angleDiff(double a, double b) { return std::remainder(a - b, 2.0 * std::numbers::pi); }
CGPoint rotated(const CGPoint& p, double angle, double scale) {
    return CGPointMake(scale * (p.x * std::cos(angle) - p.y * std::sin(angle)),
                       scale * (p.x * std::sin(angle) + p.y * std::cos(angle)));
}

class CtrlTangentsTest : public EngineFixture {
protected:
    struct Key {
        TQChannel* channel = nullptr;
        TQCurveEditorChannelItemPtr item;
        TQKeyframeHandle handle = nullptr;
        double time = 0.0;
    };

    // One keypoint at `t` with both handles set (offsets in seconds and channel units).
    Key makeKey(const char* name, double t, double value, CGPoint in, CGPoint out,
                bool broken = false, bool scaled = false, double scaleY = 1.0) {
        Key k;
        k.channel = addChannel(name, {{t, value}});
        k.item = addItem(k.channel);
        k.item->setScaleY(scaleY);
        k.item->setOffsetY(0.0);
        k.time = t;
        k.handle = k.channel->getKeyframe(seconds(t));
        k.channel->setKeyframeInterpolation(k.handle, kTQInterpolationBezier);
        k.channel->setKeyframeInputTangents(k.handle, in.x, in.y, true);
        k.channel->setKeyframeOutputTangents(k.handle, out.x, out.y, true);
        k.channel->setKeyframeTangentsBroken(k.handle, broken);
        k.channel->setKeyframeTangentsScaled(k.handle, scaled);
        return k;
    }

    CGPoint handleOffset(const Key& k, bool output) const {
        double u = 0.0;
        double v = 0.0;
        if (output)
            k.channel->getKeyframeOutputTangents(k.handle, &u, &v, true);
        else
            k.channel->getKeyframeInputTangents(k.handle, &u, &v, true);
        return CGPointMake(u, v);
    }

    CGPoint keyWorld(const Key& k) {
        double value = 0.0;
        k.channel->getKeyframe(k.handle, nullptr, &value);
        return CGPointMake(k.time, ctrl().convertFromChannelCoords(k.item.get(), value));
    }

    CGPoint handleWorld(const Key& k, bool output) {
        double value = 0.0;
        k.channel->getKeyframe(k.handle, nullptr, &value);
        const CGPoint o = handleOffset(k, output);
        return CGPointMake(k.time + o.x,
                           ctrl().convertFromChannelCoords(k.item.get(), value + o.y));
    }

    // The handle as the user sees it: pixels from its keypoint.
    CGPoint screenVector(const Key& k, bool output) {
        return view.getPointScreen(handleWorld(k, output)) - view.getPointScreen(keyWorld(k));
    }

    // Drags the handle so that it shows `screen` pixels from its keypoint.
    void dragTo(const Key& k, bool output, const CGPoint& screen) {
        auto entry = tangentEntry(k.item, k.time, output);
        const CGPoint w = view.getPointWorld(view.getPointScreen(keyWorld(k)) + screen);
        ctrl().setTangents(entry.get(), w.x, w.y);
    }
};

TEST_F(CtrlTangentsTest, setTangents__brokenPairMovesAlone) {
    Key k = makeKey("A", 5.0, 0.0, {-0.5, -0.1}, {0.5, 0.1}, /*broken*/ true);
    const CGPoint inBefore = handleOffset(k, false);
    dragTo(k, true, CGPointMake(30.0, 90.0));
    const CGPoint inAfter = handleOffset(k, false);
    EXPECT_EQ(inAfter.x, inBefore.x) << "the opposite handle of a broken pair must not change";
    EXPECT_EQ(inAfter.y, inBefore.y);
    EXPECT_NEAR(screenVector(k, true).y, 90.0, kPixelTolerance)
        << "the dragged handle follows the pointer";
    EXPECT_EQ(k.item->originalCurveDirty(), 1);
}

// The pair is not straight: turning both by the same angle keeps the angle between them.
TEST_F(CtrlTangentsTest, setTangents__unscaledPairKeepsRatioAndTurnsAlike) {
    Key k = makeKey("A", 5.0, 0.3, {-0.3, 0.2}, {0.5, 0.1});
    const CGPoint d = screenVector(k, true);
    const CGPoint o = screenVector(k, false);
    const double turn = 0.4;
    dragTo(k, true, rotated(d, turn, 2.0));
    const CGPoint after = screenVector(k, false);
    EXPECT_NEAR(lengthOf(after), 2.0 * lengthOf(o), kPixelTolerance)
        << "doubling the dragged handle must double the opposite one on screen";
    EXPECT_NEAR(angleDiff(angleOf(after), angleOf(o)), turn, kAngleTolerance)
        << "the opposite handle must turn by what the dragged one turned";
}

TEST_F(CtrlTangentsTest, setTangents__scaledPairKeepsOppositeLength) {
    Key k = makeKey("A", 5.0, 0.0, {-0.5, -0.1}, {0.5, 0.1}, false, /*scaled*/ true);
    const CGPoint d = screenVector(k, false);
    const CGPoint o = screenVector(k, true);
    dragTo(k, false, rotated(d, -0.3, 2.0));
    const CGPoint after = screenVector(k, true);
    EXPECT_NEAR(lengthOf(after), lengthOf(o), kPixelTolerance);
    EXPECT_NEAR(angleDiff(angleOf(after), angleOf(o)), -0.3, kAngleTolerance);
}

TEST_F(CtrlTangentsTest, setTangents__zeroLengthHandlePulledOutMirrorsInChannelUnits) {
    Key k = makeKey("A", 5.0, 0.0, {-0.5, -0.1}, {0.0, 0.0});
    auto entry = tangentEntry(k.item, 5.0, true);
    ctrl().setTangents(entry.get(), 5.4, 0.3);
    const CGPoint out = handleOffset(k, true);
    const CGPoint in = handleOffset(k, false);
    EXPECT_NEAR(out.x, 0.4, kOffsetTolerance);
    EXPECT_NEAR(out.y, 0.3, kOffsetTolerance);
    EXPECT_NEAR(in.x, -0.4, kOffsetTolerance)
        << "the opposite must be the negation, not a screen copy";
    EXPECT_NEAR(in.y, -0.3, kOffsetTolerance);
}

TEST_F(CtrlTangentsTest, setTangents45__snapsToScreenMultiplesOf45) {
    Key k = makeKey("A", 5.0, 0.0, {-0.5, -0.1}, {0.37, 0.05}, /*broken*/ true);
    auto entry = tangentEntry(k.item, 5.0, true);
    const CGPoint key = view.getPointScreen(keyWorld(k));
    struct Case {
        double pointerDegrees;
        double snappedDegrees;
    };
    for (const Case c :
         {Case{40.0, 45.0}, Case{80.0, 90.0}, Case{-10.0, 0.0}, Case{150.0, 135.0}}) {
        SCOPED_TRACE(c.pointerDegrees);
        const double a = c.pointerDegrees * std::numbers::pi / 180.0;
        const CGPoint pointer =
            view.getPointWorld(key + CGPointMake(100.0 * std::cos(a), 100.0 * std::sin(a)));
        ctrl().setTangents45(entry.get(), pointer.x, pointer.y, 0);
        EXPECT_NEAR(angleOf(screenVector(k, true)) * 180.0 / std::numbers::pi, c.snappedDegrees,
                    1e-3)
            << "with flag clear the steps are absolute screen directions";
    }
}

// The first entry's handle goes to the pointer; selected keypoints copy its movement on its
// side, in the world; handle entries after the first are left alone.
TEST_F(CtrlTangentsTest, setTangentsSelected__keypoints_copy_the_first_handles_movement) {
    Key a = makeKey("A", 2.0, 0.2, {-0.5, -0.1}, {0.5, 0.1}, true);
    Key b = makeKey("B", 4.0, 0.5, {-0.2, -0.3}, {0.2, 0.3}, true, false, 2.0);
    Key c = makeKey("C", 6.0, -0.1, {-0.4, 0.0}, {0.4, 0.0}, true);
    const CGPoint bBefore = handleWorld(b, true);
    const CGPoint cIn = handleOffset(c, false), cOut = handleOffset(c, true);
    const CGPoint target = handleWorld(a, true) + CGPointMake(0.3, 0.1);
    ctrl().setTangentsSelected(
        selectInView({tangentEntry(a.item, 2.0, true), keypointEntry(b.item, 4.0),
                      tangentEntry(c.item, 6.0, false)}),
        target.x, target.y);
    for (const auto& [got, want] : {std::pair{handleWorld(a, true), target},
                                    {handleWorld(b, true), bBefore + CGPointMake(0.3, 0.1)}}) {
        EXPECT_NEAR(got.x, want.x, kOffsetTolerance);
        EXPECT_NEAR(got.y, want.y, kOffsetTolerance);
    }
    EXPECT_EQ(handleOffset(c, false), cIn);
    EXPECT_EQ(handleOffset(c, true), cOut);
    ctrl().setTangentsSelected(nullptr, 0.0, 0.0);
}

TEST_F(CtrlTangentsTest, setTangents45Selected__sameScreenHandleOnCurvesOfDifferentScale) {
    Key a = makeKey("A", 2.0, 0.2, {-0.5, -0.1}, {0.5, 0.1}, false, false, 1.0);
    Key b = makeKey("B", 4.0, 0.5, {-0.2, -0.3}, {0.2, 0.3}, false, false, 2.0);
    Key c = makeKey("C", 6.0, -0.1, {-0.4, 0.0}, {0.4, 0.0}, false, false, 0.5);
    TQCurveSelectionList* list = selectInView(
        {tangentEntry(a.item, 2.0, true), keypointEntry(b.item, 4.0), keypointEntry(c.item, 6.0)});
    const CGPoint key = view.getPointScreen(keyWorld(a));
    const CGPoint pointer = view.getPointWorld(key + CGPointMake(60.0, 57.0));
    ctrl().setTangents45Selected(list, pointer.x, pointer.y, 0);
    const CGPoint expected = screenVector(a, true);
    EXPECT_NEAR(angleOf(expected), std::numbers::pi / 4.0, kAngleTolerance);
    for (const Key* k : {&b, &c}) {
        SCOPED_TRACE(k->channel->getName());
        const CGPoint got = screenVector(*k, true);
        EXPECT_NEAR(got.x, expected.x, kPixelTolerance)
            << "every keypoint gets the same on-screen handle";
        EXPECT_NEAR(got.y, expected.y, kPixelTolerance);
    }
    EXPECT_EQ(list->selectionAtIndex(1)->getFlags(), TQSelectionKeypoint)
        << "the entry's word is restored";
}

// The list forms take one state for all and mark the curves for a redraw; the single forms
// (break toggles) leave no mark, kept so.
TEST_F(CtrlTangentsTest, break_and_weight__list_forms_agree_and_mark_single_forms_do_not) {
    Key a = makeKey("A", 2.0, 0.0, {-0.5, 0.0}, {0.5, 0.0}, /*broken*/ true);
    Key b = makeKey("B", 4.0, 0.0, {-0.5, 0.0}, {0.5, 0.0}, /*broken*/ false);
    TQCurveSelectionList* list =
        selectInView({keypointEntry(a.item, 2.0), tangentEntry(b.item, 4.0, true)});
    const auto marks = [&] {
        const std::string m = std::string(a.item->originalCurveDirty() ? "A" : "") +
                              (b.item->originalCurveDirty() ? "B" : "");
        a.item->setOriginalCurveDirty(0);
        b.item->setOriginalCurveDirty(0);
        return m;
    };
    marks();
    ctrl().breakTangentsSelected(list);
    EXPECT_FALSE(a.channel->getKeyframeTangentsBroken(a.handle));
    EXPECT_FALSE(b.channel->getKeyframeTangentsBroken(b.handle)) << "not toggled one by one";
    EXPECT_EQ(marks(), "AB");
    ctrl().breakTangents(list->selectionAtIndex(0).get());
    EXPECT_TRUE(a.channel->getKeyframeTangentsBroken(a.handle)) << "the single form toggles";
    ctrl().weightTangents(list->selectionAtIndex(0).get(), 1);
    EXPECT_TRUE(a.channel->getKeyframeTangentsScaled(a.handle));
    EXPECT_EQ(marks(), "");
    ctrl().weightTangentsSelected(list, 0);
    EXPECT_FALSE(a.channel->getKeyframeTangentsScaled(a.handle));
    EXPECT_FALSE(b.channel->getKeyframeTangentsScaled(b.handle));
    EXPECT_EQ(marks(), "AB");
}

TEST_F(CtrlTangentsTest, setTangents__withoutUsableScreen) {
    {
        SCOPED_TRACE("no view: the world serves as the screen");
        Key k = makeKey("A", 5.0, 0.0, {-0.5, -0.1}, {0.5, 0.1});
        ctrl().setView(nullptr);
        auto entry = tangentEntry(k.item, 5.0, true);
        ctrl().setTangents(entry.get(), 6.0, 0.2);
        const CGPoint in = handleOffset(k, false);
        EXPECT_NEAR(in.x, -1.0, kOffsetTolerance) << "the pair follows in world units";
        EXPECT_NEAR(in.y, -0.2, kOffsetTolerance);
        ctrl().setView(&view);
    }
    {
        SCOPED_TRACE("a view that has not drawn yet");
        Key k = makeKey("B", 5.0, 0.0, {-0.5, -0.1}, {0.5, 0.1});
        TQCurveEditorViewBase undrawn;
        ctrl().setView(&undrawn);
        auto entry = tangentEntry(k.item, 5.0, true);
        ctrl().setTangents(entry.get(), 5.2, 0.3);
        ctrl().setTangents45(entry.get(), 5.2, 0.3, 0);
        ctrl().setView(&view);
        const CGPoint out = handleOffset(k, true);
        const CGPoint in = handleOffset(k, false);
        EXPECT_NEAR(out.x, 0.2, kOffsetTolerance) << "the dragged handle is still written";
        EXPECT_EQ(in, CGPointMake(-0.5, -0.1)) << "no NaN may reach the opposite handle";
    }
}

}  // namespace
}  // namespace engine_test
