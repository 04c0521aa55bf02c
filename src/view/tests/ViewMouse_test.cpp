// Gestures of the edit tool through the view: which keypoint a drag moves, the Shift axis
// constraint, one undo step per drag and none for a click, Command-drags that pull tangents,
// the 1/30 s gate on drag steps, the clicks that add, flatten and break, and the space-bar
// navigation.

#include <cmath>
#include <memory>
#include <string>
#include <vector>

#include "src/view/tests/ViewMouseFixture.h"

namespace view_test {
namespace {

class ViewMouseEdit : public ViewMouseFixture {};
// Where a real undo is the point: the reference host behind the recorder.
class ViewMouseUndo : public WithReferenceHost<ViewMouseFixture> {};

TEST_F(ViewMouseEdit, drag__fromAnUnselectedKeypointMovesItAlone) {
    auto item = linearItem("A", {{2.0, 0.0}, {5.0, 0.0}, {8.0, 0.0}});
    const TQKeyframeHandle k2 = keyAt(item, 2.0);
    const TQKeyframeHandle k5 = keyAt(item, 5.0);
    selectInView({keypointEntry(item, 2.0)});
    ASSERT_TRUE(frame());

    down(5.0, 0.0);
    ASSERT_EQ(selectedHandles(), std::vector<TQKeyframeHandle>{k5})
        << "the click replaces the selection";
    dragTo(5.25, 0.2);
    dragTo(5.5, 0.5);
    up(5.5, 0.5);

    const auto [t5, v5] = keyOf(item, k5);
    EXPECT_NEAR(t5, 5.5, kDragTolerance) << "the picked keypoint follows the pointer in time";
    EXPECT_NEAR(v5, 0.5, kDragTolerance) << "and in value";
    const auto [t2, v2] = keyOf(item, k2);
    EXPECT_EQ(t2, 2.0) << "the keypoint selected before the click stays";
    EXPECT_EQ(v2, 0.0);
    EXPECT_FALSE(view.getCapturing()) << "mouse up closes the capture";
    EXPECT_FALSE(view.mouseIsDown());
}

TEST_F(ViewMouseEdit, drag__shiftInMidDragDecidesTheAxisFromTheWholeMovement) {
    auto item = linearItem("A", {{2.0, 0.0}, {5.0, 0.0}, {8.0, 0.0}});
    const TQKeyframeHandle k = keyAt(item, 5.0);
    ASSERT_TRUE(frame());
    {
        // Mostly sideways since the origin (40 px right, 30 px up): horizontal, and the value
        // is held where the keypoint is at that moment, not where the gesture began.
        down(5.0, 0.0);
        dragTo(5.1, 0.1);
        dragTo(5.5, 0.15, kShift);
        EXPECT_EQ(view.constrainMoveDirection(), TQConstrainDirection::kHorizontal);
        dragTo(5.75, 0.6, kShift);
        const auto [t, v] = keyOf(item, k);
        EXPECT_NEAR(t, 5.75, kDragTolerance) << "time follows the pointer";
        EXPECT_NEAR(v, 0.1, kDragTolerance) << "value stays at its position when Shift came";
        // Releasing Shift clears the axis; pressing it again decides afresh.
        dragTo(5.8, 0.2);
        EXPECT_EQ(view.constrainMoveDirection(), TQConstrainDirection::kUndecided);
        up(5.8, 0.2);
    }
    {
        // Mostly upward since the origin: vertical. The pick needs a frame that shows the
        // keypoint where the first gesture left it.
        ASSERT_TRUE(frame());
        const auto [t0, v0] = keyOf(item, k);
        down(t0, v0);
        dragTo(t0 + 0.05, v0 + 0.5, kShift);
        EXPECT_EQ(view.constrainMoveDirection(), TQConstrainDirection::kVertical);
        dragTo(t0 + 1.0, v0 + 0.6, kShift);
        const auto [t, v] = keyOf(item, k);
        EXPECT_NEAR(t, t0, kDragTolerance) << "a vertical constraint keeps the time";
        EXPECT_NEAR(v, v0 + 0.6, kDragTolerance);
        up(t0 + 1.0, v0 + 0.6);
    }
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

TEST_F(ViewMouseEdit, click__withoutADragOpensNoCapture) {
    auto item = linearItem("A", {{2.0, 0.0}, {5.0, 0.0}});
    ASSERT_TRUE(frame());
    click(5.0, 0.0);
    EXPECT_EQ(countCalls("startCaptureModifiedChannels"), 0u);
    EXPECT_EQ(countCalls("endCaptureModifiedChannels"), 0u);
    EXPECT_EQ(countCalls("suppressEventCoalescing"), 1u);
    EXPECT_EQ(countCalls("unsuppressEventCoalescing"), 1u);
    EXPECT_EQ(postedWords(), std::vector<TQNotificationWord>{kTQNotifyChannelsChanged});
    EXPECT_EQ(selectedHandles(), std::vector<TQKeyframeHandle>{keyAt(item, 5.0)});
}

TEST_F(ViewMouseUndo, drag__tenStepsAreOneUndoStepThatRestoresExactly) {
    auto item = linearItem("A", {{2.0, 0.0}, {5.0, 0.25}, {8.0, 0.0}});
    const std::unique_ptr<TQChannelBase> before(item->channel()->cloneChannel());
    ASSERT_TRUE(frame());

    down(5.0, 0.25);
    for (int i = 1; i <= 10; ++i) dragTo(5.0 + 0.1 * i, 0.25 + 0.05 * i);
    up(6.0, 0.75);

    EXPECT_EQ(countCalls("startCaptureModifiedChannels"), 1u);
    EXPECT_EQ(countCalls("endCaptureModifiedChannels"), 1u);
    EXPECT_EQ(countCalls("willSetChannelValue"), 10u) << "each step announces its value change";
    ASSERT_EQ(host.undoStack().undoCount(), 1u);
    EXPECT_EQ(lastUndoStep(), TQLocalizedString("Undo Move Keypoint"));
    EXPECT_NEAR(keyValueAt(item->channel(), 6.0), 0.75, kDragTolerance);

    ASSERT_TRUE(host.undo());
    EXPECT_TRUE(*item->channel() == *before) << "undo restores the channel exactly";
    EXPECT_FALSE(host.canUndo());
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

TEST_F(ViewMouseEdit, drag__commandPullsTangentsOnTheSideOfTheMovement) {
    auto bezierItem = [&](const char* name) {
        TQChannel* c = addChannel(name, {{2.0, 0.0}, {5.0, 0.0}, {8.0, 0.0}});
        c->setInterpolation(kTQInterpolationBezier);
        return addItem(c);
    };
    {
        auto item = bezierItem("Right");
        ASSERT_TRUE(frame());
        down(5.0, 0.0, kCommand);
        dragTo(6.0, 0.4, kCommand);
        ASSERT_EQ(view.getSelection()->size(), 1u);
        EXPECT_EQ(view.getSelection()->selectionAtIndex(0)->getFlags(), TQSelectionOutTangent)
            << "dragging right turns the entry into the output handle";
        double u = 0.0;
        double v = 0.0;
        item->channel()->getKeyframeOutputTangents(keyAt(item, 5.0), &u, &v);
        EXPECT_GT(u, 0.0) << "the output handle leads toward the pointer";
        EXPECT_GT(v, 0.0);
        EXPECT_EQ(recorder.captureBalance(), 1) << "the drag's step stays open until mouse up";
        up(6.0, 0.4, kCommand);
        EXPECT_EQ(recorder.captureBalance(), 0);
        EXPECT_EQ(lastUndoStep(), TQLocalizedString("Undo Set Tangents"));
        EXPECT_EQ(countCalls("startCaptureModifiedChannels"), 2u)
            << "the Command click's flatten, then the pull";
        ctrl().removeChannelWithIdentifier(item->channelId(), set);
    }
    {
        auto item = bezierItem("Left");
        ASSERT_TRUE(frame());
        down(5.0, 0.0, kCommand);
        dragTo(4.0, 0.4, kCommand);
        EXPECT_EQ(view.getSelection()->selectionAtIndex(0)->getFlags(), TQSelectionInTangent)
            << "dragging left turns it into the input handle";
        up(4.0, 0.4, kCommand);
    }
}

TEST_F(ViewMouseEdit, click__commandFlattensOptionOnACurveAddsAKeypoint) {
    TQChannel* c = addChannel("A", {{2.0, 0.0}, {5.0, 0.5}, {8.0, 0.0}});
    c->setInterpolation(kTQInterpolationLinear);
    auto item = addItem(c);
    ASSERT_TRUE(frame());
    {
        // Option-click on the curve between two keypoints: a keypoint there, selected.
        const double y = 0.5 * (6.5 - 5.0) / 3.0 * -1.0 + 0.5;  // on the segment 5..8
        click(6.5, y, kOption);
        EXPECT_EQ(keyTimes(c).size(), 4u) << "a keypoint was added on the curve";
        ASSERT_EQ(view.getSelection()->size(), 1u);
        EXPECT_TRUE(view.getSelection()->selectionAtIndex(0)->isKeypoint())
            << "the new keypoint is selected";
        EXPECT_EQ(lastUndoStep(), TQLocalizedString("Undo Add keypoint"));
    }
    {
        c->setInterpolation(kTQInterpolationBezier);
        ASSERT_TRUE(frame());
        click(5.0, 0.5, kCommand);
        EXPECT_EQ(c->getKeyframeInterpolation(keyAt(item, 5.0)), kTQInterpolationLinear)
            << "Command-click flattens the keypoint into a linear one";
        EXPECT_EQ(lastUndoStep(), TQLocalizedString("Undo Flatten Keypoint"));
    }
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

TEST_F(ViewMouseEdit, tangent__optionClickBreaksAndShiftDragStepsBy45DegreesFromTheOriginalAngle) {
    TQChannel* c = addChannel("A", {{2.0, 0.0}, {5.0, 0.0}, {8.0, 0.0}});
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

TEST_F(ViewMouseEdit, drag__aCurveMovesOnlyVertically) {
    auto item = linearItem("A", {{2.0, 0.0}, {8.0, 0.0}});
    ASSERT_TRUE(frame());
    down(5.0, 0.0);
    ASSERT_TRUE(view.getSelection()->selectionAtIndex(0)->isCurve());
    dragTo(6.0, 0.3);
    up(6.0, 0.3);
    EXPECT_EQ(keyTimes(item->channel()), (std::vector<double>{2.0, 8.0})) << "times stay";
    EXPECT_NEAR(keyValueAt(item->channel(), 2.0), 0.3, kDragTolerance);
    EXPECT_NEAR(keyValueAt(item->channel(), 8.0), 0.3, kDragTolerance);
    EXPECT_EQ(lastUndoStep(), TQLocalizedString("Undo Move Curve"));
}

TEST_F(ViewMouseEdit, optionCommandDrag__keepsTheWholeCurveUnderThePointerThroughDroppedSteps) {
    // Each step moves the curve so that it passes through the pointer; a step the gate
    // drops must not change where the curve ends up.
    const auto expectShiftedBy = [](const TQCurveEditorChannelItemPtr& item, double delta) {
        EXPECT_EQ(keyTimes(item->channel()), (std::vector<double>{2.0, 5.0, 8.0}));
        EXPECT_NEAR(keyValueAt(item->channel(), 2.0), delta, kDragTolerance);
        EXPECT_NEAR(keyValueAt(item->channel(), 5.0), 0.3 + delta, kDragTolerance);
        EXPECT_NEAR(keyValueAt(item->channel(), 8.0), delta, kDragTolerance);
    };
    const uint64_t mods = kOption | kCommand;
    {
        // From a keypoint the curve follows the pointer in time too: at t = 6 the original
        // curve is at 0.2, the pointer ends at 0.5.
        auto item = linearItem("A", {{2.0, 0.0}, {5.0, 0.3}, {8.0, 0.0}});
        ASSERT_TRUE(frame());
        down(5.0, 0.3, mods);
        dragTo(5.5, 0.4, mods);
        dragTo(5.75, 0.9, mods, 0.01);  // dropped by the gate
        dragTo(6.0, 0.5, mods);
        up(6.0, 0.5, mods);
        expectShiftedBy(item, 0.3);
        EXPECT_EQ(lastUndoStep(), TQLocalizedString("Undo Move Keypoint"));
        ASSERT_TRUE(set->removeItemWithIdentifier(item->channelId()));
    }
    {
        // From the curve the time stays that of the press, at 3.5 (value 0.15).
        auto item = linearItem("B", {{2.0, 0.0}, {5.0, 0.3}, {8.0, 0.0}});
        ASSERT_TRUE(frame());
        down(3.5, 0.15, mods);
        ASSERT_TRUE(view.getSelection()->selectionAtIndex(0)->isCurve());
        for (int i = 1; i <= 4; ++i) dragTo(4.0, 0.15 + 0.1 * i, mods, i % 2 ? kStepSeconds : 0.01);
        up(4.0, 0.55, mods);
        expectShiftedBy(item, 0.3);
        EXPECT_EQ(lastUndoStep(), TQLocalizedString("Undo Move Curve"));
    }
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
