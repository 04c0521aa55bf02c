// Gestures of the edit tool through the view on the reference host: each gesture of the table
// leaves the curve where the user put it as one undo step that gives it back exactly; then the
// abandoned drag, the 1/30 s gate, the typed value, the axis rules, the edge bands and the
// space-bar navigation.

#include <cctype>
#include <cmath>
#include <memory>
#include <sstream>
#include <string>
#include <vector>

#include "src/view/tests/ViewMouseFixture.h"

namespace view_test {
namespace {

class ViewMouseEdit : public ViewMouseFixture {};
// Where a real undo is the point: the reference host behind the recorder.
class ViewMouseUndo : public WithReferenceHost<ViewMouseFixture> {};

// One gesture as a script: "d t v", "m t v" (a drag step past the gate), "q t v" (one inside
// it), "u t v", "c t v" (a click); after the point, modifiers: s Shift, o Option, c Command.
struct Gesture {
    const char* what;
    unsigned interpolation;
    const char* script;
    const char* want;  // the keys after it: "time value, ..."
    const char* undoStep;
    size_t steps;  // undo steps the gesture leaves
};

void PrintTo(const Gesture& g, std::ostream* os) { *os << g.what; }
Gesture gesture(const char* what, unsigned interpolation, const char* script, const char* want,
                const char* undoStep, size_t steps) {
    return {what, interpolation, script, want, undoStep, steps};
}

class ViewGestures : public WithReferenceHost<ViewMouseFixture>,
                     public ::testing::WithParamInterface<Gesture> {
protected:
    void run(const std::string& script) {
        std::istringstream in(script);
        std::string step;
        while (std::getline(in, step, '|')) {
            std::istringstream words(step);
            char op = 0;
            double t = 0, v = 0;
            std::string mods;
            words >> op >> t >> v >> mods;
            uint64_t m = 0;
            for (char c : mods)
                m |= c == 's' ? kShift : c == 'o' ? kOption : c == 'c' ? kCommand : 0;
            if (op == 'd') down(t, v, m);
            if (op == 'm') dragTo(t, v, m);
            if (op == 'q') dragTo(t, v, m, 0.01);
            if (op == 'u') up(t, v, m);
            if (op == 'c') click(t, v, m);
        }
    }
};

TEST_P(ViewGestures, gesture__lands_as_one_undo_step_that_gives_the_curve_back) {
    const Gesture& g = GetParam();
    TQChannel* c = addCurve("A", "bump");
    c->setInterpolation(g.interpolation);
    auto item = addItem(c);
    selectInView({keypointEntry(item, 2.0)});  // a click elsewhere replaces it
    const auto before = snapshot();
    ASSERT_TRUE(frame());
    run(g.script);

    std::istringstream want(g.want);
    const std::vector<double> times = keyTimes(c);
    for (size_t i = 0; i < times.size(); ++i) {
        double t = NAN, v = NAN;
        char comma = 0;
        want >> t >> v >> comma;
        EXPECT_NEAR(times[i], t, kDragTolerance) << "time of key " << i << describe(*object);
        EXPECT_NEAR(keyValueAt(c, times[i]), v, kDragTolerance) << "value of key " << i;
    }
    EXPECT_TRUE(want.eof()) << "fewer keys than wanted:" << describe(*object);
    EXPECT_EQ(recorder.captureBalance(), 0);
    EXPECT_FALSE(view.getCapturing() || view.mouseIsDown());
    EXPECT_EQ(host.undoStack().undoCount(), g.steps);
    EXPECT_EQ(host.undoDescription(), TQLocalizedString(g.undoStep));
    const auto after = snapshot();
    while (host.canUndo()) ASSERT_TRUE(host.undo());
    EXPECT_TRUE(sceneIs(*before)) << "undo";
    while (host.canRedo()) ASSERT_TRUE(host.redo());
    EXPECT_TRUE(sceneIs(*after)) << "redo";
}

constexpr unsigned kLinear = kTQInterpolationLinear;
INSTANTIATE_TEST_SUITE_P(
    Edit, ViewGestures,
    ::testing::Values(
        gesture("a picked keypoint follows the pointer alone", kLinear,
                "d 5 .5|m 5.25 .6|m 5.5 .7|u 5.5 .7", "2 0, 5.5 .7, 8 0", "Undo Move Keypoint", 1),
        // Mostly sideways since the origin: the value stays where Shift found it.
        gesture("shift in mid-drag holds the value", kLinear,
                "d 5 .5|m 5.1 .6|m 5.5 .65 s|m 5.75 .8 s|u 5.75 .8 s", "2 0, 5.75 .6, 8 0",
                "Undo Move Keypoint", 1),
        gesture("shift upward holds the time", kLinear, "d 5 .5|m 5.05 .7 s|m 6 .8 s|u 6 .8 s",
                "2 0, 5 .8, 8 0", "Undo Move Keypoint", 1),
        // A segment moves its two keypoints, only vertically.
        gesture("a curve segment moves only vertically", kLinear, "d 3.5 .25|m 4.5 .55|u 4.5 .55",
                "2 .3, 5 .8, 8 0", "Undo Move Curve", 1),
        // The curve passes through the pointer at each step; a step the gate drops loses
        // nothing. From a keypoint the time follows too (at 6 the curve was at 1/3).
        gesture("option-command from a keypoint", kLinear,
                "d 5 .5 oc|m 5.5 .6 oc|q 5.75 .9 oc|m 6 .63333333 oc|u 6 .63333333 oc",
                "2 .3, 5 .8, 8 .3", "Undo Move Keypoint", 1),
        gesture("option-command from the curve keeps the press time", kLinear,
                "d 3.5 .25 oc|m 4 .35 oc|q 4 .45 oc|m 4 .55 oc|u 4 .55 oc", "2 .3, 5 .8, 8 .3",
                "Undo Move Curve", 1),
        gesture("option-click on the curve adds a keypoint", kLinear, "c 6.5 .25 o",
                "2 0, 5 .5, 6.5 .25, 8 0", "Undo Add keypoint", 1),
        gesture("command-click flattens", kTQInterpolationBezier, "c 5 .5 c", "2 0, 5 .5, 8 0",
                "Undo Flatten Keypoint", 1),
        // The Command press flattens first, then the drag pulls the output handle.
        gesture("command-drag pulls a handle", kTQInterpolationBezier, "d 5 .5 c|m 6 .7 c|u 6 .7 c",
                "2 0, 5 .5, 8 0", "Undo Set Tangents", 2)),
    [](const auto& p) {
        std::string name;
        for (const char* w = p.param.what; *w; ++w)
            if (std::isalnum(static_cast<unsigned char>(*w))) name += *w;
        return name;
    });

TEST_F(ViewMouseEdit, tangent__optionClickBreaksAndShiftDragStepsBy45DegreesFromTheOriginalAngle) {
    TQChannel* c = addCurve("A", "level");
    c->setInterpolation(kTQInterpolationBezier);
    auto item = addItem(c);
    const TQKeyframeHandle k = keyAt(item, 5.0);
    c->setKeyframeOutputTangents(k, 1.0, 0.2);
    c->setKeyframeInputTangents(k, -1.0, -0.2);
    selectInView({keypointEntry(item, 5.0)});
    ASSERT_TRUE(frame());
    // On screen (80 px a second, 200 px a unit) the handle points at atan(40 / 80).
    const double original = std::atan2(0.2 * 200.0, 1.0 * 80.0);

    click(6.0, 0.2, kOption);
    EXPECT_TRUE(c->getKeyframeTangentsBroken(k));
    EXPECT_EQ(lastUndoStep(), TQLocalizedString("Undo Break Tangents"));
    ASSERT_EQ(view.getSelection()->selectionAtIndex(0)->getFlags(), TQSelectionOutTangent);

    down(6.0, 0.2, kShift);
    dragTo(6.0, 0.6, kShift);
    dragTo(5.9, 0.7, kShift);
    up(5.9, 0.7, kShift);
    double u = 0.0;
    double v = 0.0;
    c->getKeyframeOutputTangents(k, &u, &v);
    const double steps = (std::atan2(v * 200.0, u * 80.0) - original) / (M_PI / 4.0);
    EXPECT_NEAR(steps, std::round(steps), 1e-3)
        << "the handle turned by whole 45-degree steps on screen";
    EXPECT_NE(std::round(steps), 0.0) << "and followed the pointer upward";
    double inU = 0.0;
    double inV = 0.0;
    c->getKeyframeInputTangents(k, &inU, &inV);
    EXPECT_NEAR(inV, -0.2, kValueTolerance) << "broken: the input handle stays";
    EXPECT_EQ(lastUndoStep(), TQLocalizedString("Undo Set Tangents"));
}

TEST_F(ViewMouseEdit, constrainMove__aTieIsVertical) {
    EXPECT_EQ(view.constrainMove(CGPointMake(13, 17), CGPointMake(10, 20)), CGPointMake(10, 20))
        << "the deciding call answers the origin";
    EXPECT_EQ(view.constrainMoveDirection(), TQConstrainDirection::kVertical);
    EXPECT_EQ(view.constrainMove(CGPointMake(50, 60), CGPointMake(1, 2)), CGPointMake(1, 60));
}

TEST_F(ViewMouseEdit, constrainTime__clampsToTotalStartAndTheLaterEnd) {
    const CMTime totalStart = seconds(1.0);
    const CMTime totalDuration = seconds(4.0);
    view.setTotalRange(&totalStart, &totalDuration);
    EXPECT_EQ(view.constrainTime(CGPointMake(0.5, 3.0)).x, 1.0);
    EXPECT_EQ(view.constrainTime(CGPointMake(0.5, 3.0)).y, 3.0) << "y is not touched";
    EXPECT_NEAR(view.constrainTime(CGPointMake(20.0, 0.0)).x, 10.0, kWorldTolerance)
        << "the display range ends after the total range: its end is the limit";
    const CMTime longer = seconds(30.0);
    view.setTotalRange(nullptr, &longer);
    EXPECT_NEAR(view.constrainTime(CGPointMake(40.0, 0.0)).x, 31.0, kWorldTolerance);
    EXPECT_NEAR(view.constrainTime(CGPointMake(12.0, 0.0)).x, 12.0, kWorldTolerance);
}

TEST_F(ViewMouseUndo, drag__abandonedClosesItsStepInReverseOrderAndUndoesWhole) {
    auto a = linearItem("A", {{2.0, 0.0}, {5.0, 0.25}, {8.0, 0.0}});
    auto b = linearItem("B", {{5.0, -0.5}});
    const std::unique_ptr<TQChannelBase> aBefore(a->channel()->cloneChannel());
    const std::unique_ptr<TQChannelBase> bBefore(b->channel()->cloneChannel());
    // What the release would have closed, and nothing else.
    const std::vector<std::string> closing = {"didChangeChannel(B)", "didChangeChannel(A)",
                                              "endCaptureModifiedChannels()"};
    // One step of a drag of A's and B's keypoints at 5 s on `on`, left without its release.
    const auto startDrag = [&](TQCurveEditorViewBase& on) {
        TQCurveSelectionList* list = on.getSelection();
        list->reset();
        list->addSelection(keypointEntry(a, 5.0));
        list->addSelection(keypointEntry(b, 5.0));
        clock.advance(1.0);
        ASSERT_TRUE(on.displayLayer(&encoder));
        on.mouseDown(mouseAt(RWEventType::LeftMouseDown, CGPointMake(5.0, 0.25), 0));
        clock.advance(kStepSeconds);
        on.mouseDragged(mouseAt(RWEventType::LeftMouseDragged, CGPointMake(5.5, 0.5), 0));
        ASSERT_TRUE(on.getCapturing());
        ASSERT_NE(keyAt(a, 5.5), nullptr) << "the step moved the keypoint";
        recorder.clearCalls();
    };
    const auto expectUndoneWhole = [&](const char* what) {
        EXPECT_FALSE(host.undoStack().isStepOpen()) << what;
        ASSERT_EQ(host.undoStack().undoCount(), 1u) << what;
        ASSERT_TRUE(host.undo()) << what;
        EXPECT_TRUE(*a->channel() == *aBefore) << what;
        EXPECT_TRUE(*b->channel() == *bBefore) << what;
    };
    {
        startDrag(view);
        down(5.5, 0.5);
        EXPECT_EQ(recorder.bracketSequence(), closing)
            << "a lost release: the next press ends the step before its own gesture";
        EXPECT_FALSE(view.getCapturing());
        up(5.5, 0.5);
        expectUndoneWhole("lost release");
    }
    {
        startDrag(view);
        view.setController(nullptr);
        EXPECT_EQ(recorder.bracketSequence(), closing) << "closed through the old controller";
        view.setController(&ctrl());
        expectUndoneWhole("controller detached");
    }
    {
        auto doomed = std::make_unique<TQCurveEditorViewBase>();
        doomed->setViewHost(&viewHost);
        doomed->setClock(&clock);
        doomed->setTimer(&timer);
        doomed->setController(&ctrl());
        ctrl().setView(doomed.get());
        doomed->setCurrentViewVolume(view.getCurrentViewVolume());
        doomed->setOriginalViewVolume(view.getOriginalViewVolume());
        const CMTimeRange range = view.getDisplayRange();
        doomed->setDisplayRange(&range.start, &range.duration);
        startDrag(*doomed);
        doomed.reset();
        ctrl().setView(&view);
        EXPECT_EQ(recorder.bracketSequence(), closing) << "the view torn down in mid-drag";
        expectUndoneWhole("view torn down");
    }
}

TEST_F(ViewMouseEdit, mouseDragged__stepsAreGatedToThirtyASecondWithoutLosingMovement) {
    auto item = linearItem("A", {{2.0, 0.0}, {5.0, 0.0}});
    const TQKeyframeHandle k = keyAt(item, 5.0);
    ASSERT_TRUE(frame());
    down(5.0, 0.0);
    dragTo(5.25, 0.0);
    dragTo(5.5, 0.0, 0, 0.01);  // inside the gap: dropped whole
    EXPECT_NEAR(keyOf(item, k).first, 5.25, kDragTolerance);
    dragTo(6.0, 0.0);
    EXPECT_NEAR(keyOf(item, k).first, 6.0, kDragTolerance)
        << "the next step measures from the last that ran";
    up(6.0, 0.0);
}

TEST_F(ViewMouseUndo, doubleClick__onAKeypointTypesItsValueInsideOneUndoStep) {
    auto item = linearItem("A", {{2.0, 0.0}, {5.0, 0.25}});
    const std::unique_ptr<TQChannelBase> before(item->channel()->cloneChannel());
    RWScriptedModal modal;
    RWServiceSet services;
    services.modal = &modal;
    RWInstallServices(services);
    modal.pushScript([](RWWindow& window, RWModalService& m) {
        static_cast<TQCurveEditorValueWindow&>(window).value = 0.75;
        m.stopModalWithCode(RWModalResponseOK);
    });
    ASSERT_TRUE(frame());
    down(5.0, 0.25);
    up(5.0, 0.25);
    click(5.0, 0.25, 0, 2);
    RWResetServices();

    EXPECT_EQ(modal.runs().size(), 1u) << "the second click of the pair opens the panel";
    EXPECT_NEAR(keyValueAt(item->channel(), 5.0), 0.75, kValueTolerance)
        << "the typed value is set";
    EXPECT_EQ(host.undoStack().undoCount(), 1u);
    EXPECT_EQ(lastUndoStep(), TQLocalizedString("Undo Move Keypoint"));
    ASSERT_TRUE(host.undo());
    EXPECT_TRUE(*item->channel() == *before) << "the step holds what was typed";
}

TEST_F(ViewMouseEdit, drag__intoTheEdgeBandZoomsOrPans) {
    auto item = linearItem("A", {{2.0, 0.0}, {9.5, 0.0}});
    const TQKeyframeHandle k2 = keyAt(item, 2.0);
    {
        // Auto-zoom: into the top 5 percent (above 0.9) asks for a refit at the next draw.
        ASSERT_TRUE(frame());
        down(2.0, 0.0);
        dragTo(2.0, 0.5);
        EXPECT_FALSE(view.needsAutoZoom());
        dragTo(2.0, 0.95);
        EXPECT_TRUE(view.needsAutoZoom());
        EXPECT_TRUE(range().panned.empty()) << "auto-zoom does not pan";
        up(2.0, 0.95);
    }
    view.setAutoZoom(0);  // auto-pan instead, on the volume of the fixture
    view.setNeedsAutoZoom(0);
    view.setCurrentViewVolume(CGRectMake(0.0, -1.0, 10.0, 2.0));
    {
        ASSERT_TRUE(frame());
        down(9.5, 0.0);
        dragTo(10.5, 0.0);  // 80 px right, ending 40 px past the edge
        ASSERT_EQ(range().offsets.size(), 1u) << "one horizontal pan";
        EXPECT_NEAR(range().offsets[0], 0.5, kDragTolerance) << "by the overrun, with no padding";
        up(10.5, 0.0);
    }
    {
        ASSERT_TRUE(frame());
        const CGRect before = view.getCurrentViewVolume();
        const auto [t, v] = keyOf(item, k2);
        down(t, v);
        dragTo(t, -0.95);  // 10 px into the bottom band of 20 px
        EXPECT_NEAR(view.getCurrentViewVolume().origin.y, before.origin.y - 0.05, kDragTolerance)
            << "the view scrolls down by the overrun";
        up(t, -0.95);
    }
}

TEST_F(ViewMouseEdit, spaceDrag__pansOrWithCommandZoomsShowingWhichInTheCursor) {
    linearItem("A", {{2.0, 0.0}, {8.0, 0.0}});
    view.setAutoZoom(0);  // with auto-zoom a drag on nothing is always a band
    ASSERT_TRUE(frame());
    const auto lastCursor = [&] {
        return viewHost.cursors().empty() ? RWCursor::Arrow : viewHost.cursors().back();
    };
    down(4.0, 0.5);
    dragTo(3.0, 0.5);
    EXPECT_TRUE(view.selecting()) << "without the space bar a drag on nothing is a band";
    up(3.0, 0.5);
    ASSERT_TRUE(frame());
    ASSERT_TRUE(view.customKeyEquivalent(RWEvent::keyEvent(RWEventType::KeyDown, " ")));

    down(4.0, 0.5);
    dragTo(3.0, 0.5);  // 80 px left
    EXPECT_EQ(lastCursor(), RWCursor::OpenHand);
    ASSERT_EQ(range().offsets.size(), 1u) << "a pan moves the display range";
    EXPECT_NEAR(range().offsets[0], 1.0, kDragTolerance)
        << "by the pointer's movement, the other way";
    EXPECT_EQ(range().panned.size(), 1u);

    // With Command, a drag to the right magnifies time about where the drag began.
    const double before = CMTimeGetSeconds(view.getDisplayRange().duration);
    dragTo(4.0, 0.5, kCommand);
    EXPECT_EQ(lastCursor(), RWCursor::ZoomIn);
    const double magnified = CMTimeGetSeconds(view.getDisplayRange().duration);
    EXPECT_LT(magnified, before);
    dragTo(2.0, 0.5, kCommand);
    EXPECT_EQ(lastCursor(), RWCursor::ZoomOut);
    EXPECT_GT(CMTimeGetSeconds(view.getDisplayRange().duration), magnified);
    up(2.0, 0.5, kCommand);

    EXPECT_TRUE(view.keyUp(RWEvent::keyEvent(RWEventType::KeyUp, " ")));
    EXPECT_FALSE(view.keyUp(RWEvent::keyEvent(RWEventType::KeyUp, " ")))
        << "the space bar is released";
}

}  // namespace
}  // namespace view_test
