// Gestures through the view on the reference host, each a row run on a fresh scene: the
// channels after it (with their handles), the host's bracket, the view's selection (also
// wherever the script asks with "?"), the undo steps left and what the view shows and asked
// for are held in a recorded baseline (baselines/gestures.txt); every gesture closes what it
// opened and is undone to the very scene it started from and redone to the one it made. Then
// the rules a table cannot show: the axis rules, an abandoned drag and the typed value.

#include <cmath>
#include <memory>
#include <string>
#include <vector>

#include "src/view/tests/ViewFixture.h"

namespace view_test {
namespace {

struct Gesture {
    const char* name;
    const char* scene;      // as build() reads it
    const char* selection;  // as select() reads it
    const char* script;     // as gesture() reads it, "?" noting the selection
};

void PrintTo(const Gesture& g, std::ostream* os) { *os << g.name; }

class ViewGestures : public WithReferenceHost<ViewFixture>,
                     public ::testing::WithParamInterface<Gesture> {};

TEST_P(ViewGestures, gesture__as_recorded_and_undone_exactly) {
    const Gesture& g = GetParam();
    // The value panel, where a gesture opens it, takes 0.75.
    RWScriptedModal modal;
    RWServiceSet services;
    services.modal = &modal;
    RWInstallServices(services);
    modal.pushScript([](RWWindow& window, RWModalService& m) {
        static_cast<TQCurveEditorValueWindow&>(window).value = 0.75;
        m.stopModalWithCode(RWModalResponseOK);
    });
    build(g.scene);
    select(g.selection);
    const auto before = snapshot();
    ASSERT_TRUE(frame());
    recorder.clearCalls();
    std::string seen;
    const std::string script = g.script;
    for (size_t from = 0; from <= script.size();) {
        const size_t mark = std::min(script.find('?', from), script.size());
        gesture(script.substr(from, mark - from));
        if (mark < script.size()) seen += selectionText() + " / ";
        from = mark + 1;
    }
    const size_t steps = host.undoStack().undoCount();
    EXPECT_TRUE(tests_support::matchesBaselineBlock(
        "gestures", g.name,
        "scene: " + sceneText(*object, true) + "\ncalls: " + recorder.bracketText() +
            "\nselection: " + seen + selectionText() + "\nundo steps: " + std::to_string(steps) +
            "\nview: " + viewText() + ", panels " + std::to_string(modal.runs().size()) +
            (notes.empty() ? "" : "\nnotes: ") + notes + "\n",
        "src/view/tests/baselines"));
    RWResetServices();
    EXPECT_EQ(recorder.captureBalance(), 0);
    EXPECT_FALSE(view.getCapturing() || view.mouseIsDown());
    const auto after = snapshot();
    for (size_t i = 0; i < steps; ++i) ASSERT_TRUE(host.undo());
    EXPECT_TRUE(steps == 0 || sceneIs(*before)) << "undo";
    for (size_t i = 0; i < steps; ++i) ASSERT_TRUE(host.redo());
    EXPECT_TRUE(sceneIs(*after)) << "redo";
}

constexpr const char* kLinear = "A: 2=0/1 5=0.5/1 8=0/1";
constexpr const char* kBezier = "A: 2=0 5=0.5(-1,-0.2|1,0.2) 8=0";
constexpr const char* kFlat = "A: 2=0/1 5=0/1 8=0/1";
constexpr const char* kEnds = "A: 2=0/1 9.5=0/1";
constexpr const char* kRightClick = "A: 2=0 5=0.5(-1,-0.2|1,0.2) 8=0; B: 1=-0.5 9=-0.5";
constexpr const char* kSketch = "A: 1=0/1 2=0/1 3=0/1 4=0/1 5=0/1 6=0/1 7=0/1 8=0/1";

INSTANTIATE_TEST_SUITE_P(
    Edit, ViewGestures,
    ::testing::Values(
        // A click elsewhere replaces the selection; a step inside the 1/30 s gate is dropped
        // and loses nothing: the next measures from the last that ran.
        Gesture{"keyDrag", kLinear, "A@2", "d 5 .5|m 5.25 .6|m 5.5 .7|u 5.5 .7"},
        // A press while a step is open means its release was lost: the step ends first, as
        // it does when the view loses its controller in mid-drag.
        Gesture{"lostRelease", kLinear, "", "d 5 .5|m 5.5 .6|d 5.5 .6|u 5.5 .6"},
        Gesture{"controllerGoneInMidDrag", kLinear, "", "d 5 .5|m 5.5 .6|D|u 5.5 .6"},
        // A drag whose press went to another view starts where it arrives.
        Gesture{"dragWithoutItsPress", kLinear, "", "m 5 .5|q 5.5 .6|m 5.5 .6|u 5.5 .6"},
        // The second click of a pair on a keypoint opens the value panel inside one step.
        Gesture{"doubleClickTypesAValue", kLinear, "", "c 5 .5|2 5 .5"},
        Gesture{"gateDropsAStep", kLinear, "", "d 5 .5|m 5.25 .5|q 5.5 .5|m 6 .5|u 6 .5"},
        // Mostly sideways since the origin: the value stays where Shift found it.
        Gesture{"shiftHoldsTheValue", kLinear, "",
                "d 5 .5|m 5.1 .6|m 5.5 .65 s|m 5.75 .8 s|u 5.75 .8 s"},
        Gesture{"shiftUpwardHoldsTheTime", kLinear, "", "d 5 .5|m 5.05 .7 s|m 6 .8 s|u 6 .8 s"},
        // A free drag lands on the grid; one held upright keeps the time it had, off the grid.
        Gesture{"onTheGrid", "A: 5.01=0/1 8=0/1", "",
                "g|d 5.01 0|m 5.02 .5 s|u 5.02 .5 s|d 8 0|m 8.51 .2|u 8.51 .2"},
        // A segment moves its two keypoints, only vertically.
        Gesture{"segmentDrag", kLinear, "", "d 3.5 .25|m 4.5 .55|u 4.5 .55"},
        // The curve passes through the pointer at each step; from a keypoint the time
        // follows too, from the curve the press time holds.
        Gesture{"optionCommandFromAKey", kLinear, "",
                "d 5 .5 oc|m 5.5 .6 oc|q 5.75 .9 oc|m 6 .63333333 oc|u 6 .63333333 oc"},
        Gesture{"optionCommandFromTheCurve", kLinear, "",
                "d 3.5 .25 oc|m 4 .35 oc|q 4 .45 oc|m 4 .55 oc|u 4 .55 oc"},
        Gesture{"optionClickAddsAKey", kLinear, "", "c 6.5 .25 o"},
        Gesture{"doubleClickAddsAKey", kLinear, "", "2 6.5 .25"},
        Gesture{"commandClickFlattens", kBezier, "", "c 5 .5 c"},
        // The Command press flattens first, then the drag pulls the output handle.
        Gesture{"commandDragPullsAHandle", kBezier, "", "d 5 .5 c|m 6.5 .8 c|u 6.5 .8 c"},
        // Handles of the selected keypoint: Option breaks; a drag turns the pair keeping the
        // other's length, with Command unweighted; Shift steps by 45 degrees on screen from
        // the original angle.
        Gesture{"optionClicksOnAHandleBreakAndMend", kBezier, "A@5", "c 6 .7 o|?|c 6 .7 o"},
        Gesture{"handleDrag", kBezier, "A@5", "d 6 .7|m 6.5 .8|u 6.5 .8"},
        Gesture{"commandHandleDrag", kBezier, "A@5", "d 6 .7 c|m 6.5 .8 c|u 6.5 .8 c"},
        // The snap of the Shift press lies outside the drag's step: the host makes it one.
        Gesture{"shiftHandleDrag", kBezier, "A@5", "d 6 .7 s|m 6 .9 s|m 5.9 .95 s|u 5.9 .95 s"},
        // Shift toggles a keypoint and makes it primary; a plain click on a selected one keeps
        // the selection; on empty space Shift keeps it, a plain click empties it.
        Gesture{"shiftClicks", kFlat, "A@2",
                "c 8 0 s|?|c 2 0 s|?|c 5 0 s|c 8 0|?|c 3 .8 s|?|c 3 .8"},
        // A Shift drag from a keypoint the Shift press took out puts it back and drags it.
        Gesture{"shiftDragFromADeselectedKey", kFlat, "A@5 A@2", "d 5 0 s|?|m 5.5 .2 s|u 5.5 .2 s"},
        // A band replaces the selection with the keypoints it covers (only images count) and
        // changes nothing; with Shift each step inverts mouse down's selection, new keypoints
        // joining at the end, or at the front when dragged leftward.
        Gesture{"band", kFlat, "A@8", "d 1 .5|m 3 0|m 6 -.5|?|u 6 -.5|?|d 3 .2|m 4 -.2|u 4 -.2"},
        Gesture{"shiftBand", kFlat, "A@2 A@5", "d 4 .5 s|m 9 -.5 s|?|m 9.5 -.5 s|?|u 9.5 -.5 s"},
        Gesture{"shiftBandLeftward", kFlat, "A@8", "d 6 .5 s|m 1 -.5 s|u 1 -.5 s"},
        // A Control band flattens what it took at the release, outside any step.
        Gesture{"controlBandFlattens", kBezier, "", "d 1 .9 x|m 9 -.9 x|u 9 -.9 x"},
        // A drag into the top 5 % asks auto-zoom for a refit, which the next frame makes, and
        // pans nothing; without auto-zoom 80 px right, 40 px past the edge, pans by the overrun
        // with no padding, as does a drag back past the left edge, and 10 px into the bottom band of 20 px scrolls down by the overrun,
        // also when only the lowest dragged keypoint is in it.
        Gesture{"intoTheTopBand", kEnds, "", "d 2 0|m 2 .5|m 2 .95|u 2 .95|r 9 .9"},
        Gesture{"pastTheRightEdge", kEnds, "", "z|d 9.5 0|m 10.5 0|u 10.5 0"},
        Gesture{"pastTheLeftEdge", kEnds, "",
                "z|d 9.5 0|m 10.5 0|u 10.5 0|f|d 2 0|m .25 0|u .25 0"},
        Gesture{"intoTheBottomBand", kEnds, "", "z|d 2 0|m 2 -.95|u 2 -.95"},
        Gesture{"lowestKeyIntoTheBottomBand", kLinear, "A@5 A@2 A@8", "z|d 5 .5|m 5 -.45|u 5 -.45"},
        // With the space bar a drag on nothing pans the display range by the pointer's
        // movement, the other way; with Command a drag rightward magnifies time about where it
        // began, leftward it shrinks; without it a drag on nothing is a band.
        Gesture{"spaceDragPans", kEnds, "", "z|d 4 .5|m 3 .5|u 3 .5|k|d 4 .5|m 3 .5|u 3 .5|K"},
        Gesture{"spaceRepeatArms", kEnds, "", "z|R|d 4 .5|m 3 .5|u 3 .5|K"},
        Gesture{"spaceDragZooms", kEnds, "", "z|k|d 4 .5|m 5 .5 c|m 3 .5 c|u 3 .5 c|K"},
        // Nudges step by the host's frame and a pixel, one undo step each, named a deletion
        // as the history always read.
        Gesture{"nudges", "A: 10/30=0.25 20/30=0.5", "",
                "a selectAll:|a nudgeRight:|a nudgeRight:|a nudgeLeft:|a nudgeUp:|"
                "a nudgeUpFinished:|a nudgeDown:|a nudgeSideways:"},
        // Delete takes the selected keypoints; with the box tool only the box. Select All
        // starts the selection afresh.
        Gesture{"deleteKeys", kBezier, "A@5 A@8", "a delete:"},
        Gesture{"selectAllReplaces", kLinear, "A@5", "a selectAll:"},
        Gesture{"deleteTheBox", kBezier, "", "b|d 1 .9|m 6 -.2|u 6 -.2|?|a delete:"},
        // A free distortion of the box's top-right corner in five steps is one undo step, each
        // drag step and the release announced per channel.
        Gesture{"boxDistortion", "A: 2=-0.5/1 4=0.25/1 6=0.5/1; B: 3=0/1 5=-0.25/1", "",
                "b|d 1 .9|m 4 0|m 7 -.9|u 7 -.9|f|d 6 .5 c|m 6.2 .55 c|m 6.4 .6 c|m 6.6 .65 c|"
                "m 6.8 .7 c|m 7 .75 c|u 7 .75 c"},
        // A right click selects what it hits and answers that kind's menu: a keypoint alone
        // unless already selected (then it leads), a handle, a curve replacing the selection;
        // empty space leaves the selection.
        Gesture{"rightClicks", kRightClick, "B@1", "r 5 .5|?|c 2 0 s|r 5 .5|?|r 6 .7|?|r 3.5 .9"},
        Gesture{"rightClickOnACurve", kRightClick, "A@5", "r 5 -.5"},
        // A sketch stroke writes a keypoint per step and erases what it passes, either way, as
        // one undo step; a step erases only what it reaches; Shift holds the first axis.
        Gesture{"sketchRightward", kSketch, "", "S|d 2.5 .5|m 3.5 .6|m 4.5 .7|u 4.5 .7"},
        Gesture{"sketchLeftward", kSketch, "", "S|d 6.5 .5|m 5.5 .6|m 4.5 .7|u 4.5 .7"},
        Gesture{"sketchShortSteps", kSketch, "", "S|d 2.5 .5|m 3 .5|m 3.25 .5|u 3.25 .5"},
        Gesture{"sketchClick", kSketch, "", "S|c 2.5 .5"},
        Gesture{"sketchPastTheRightEdge", kSketch, "", "z|S|d 8.5 .5|m 10.5 .5|u 10.5 .5"},
        Gesture{"sketchIntoTheTopBand", kSketch, "", "z|S|d 2.5 .5|m 3.5 .98|u 3.5 .98"},
        Gesture{"sketchIntoTheBottomBand", kSketch, "", "z|S|d 2.5 .5|m 3.5 -.98|u 3.5 -.98"},
        Gesture{"sketchShift", kSketch, "", "S|d 2.5 .5 s|m 3.5 .55 s|m 4.5 .9 s|u 4.5 .9 s"}),
    [](const auto& p) { return std::string(p.param.name); });

class ViewMouse : public ViewFixture {};
class ViewMouseUndo : public WithReferenceHost<ViewFixture> {};

// Kept as a snapshot, the ghost is the curve before the first drag.
TEST_F(ViewMouse, snapshot__the_ghost_stays_the_curve_before_the_first_drag) {
    ctrl().setSnapshotChannels(true);
    build(kSketch);
    const std::string before = keyText(*item("A")->channel(), true);
    for (const char* drag : {"d 2 0|m 2.5 .3|u 2.5 .3", "d 6 0|m 6.5 .6|u 6.5 .6"}) {
        ASSERT_TRUE(frame());
        gesture(drag);
    }
    const TQChannel* ghost = item("A")->snapshotChannel();
    ASSERT_TRUE(ghost && item("A")->drawGhost());
    EXPECT_EQ(keyText(*ghost, true), before);
    EXPECT_NE(keyText(*item("A")->channel(), true), before);
}

// The space bar's release stops at the view only after its press was taken.
TEST_F(ViewMouse, spaceBar__the_release_is_taken_only_after_the_press) {
    EXPECT_FALSE(view.keyUp(RWEvent::keyEvent(RWEventType::KeyUp, " ")));
    EXPECT_TRUE(view.customKeyEquivalent(RWEvent::keyEvent(RWEventType::KeyDown, " ")));
    EXPECT_TRUE(view.keyUp(RWEvent::keyEvent(RWEventType::KeyUp, " ")));
}

TEST_F(ViewMouse, constraints__a_tie_is_vertical_and_time_stays_in_the_ranges) {
    EXPECT_EQ(view.constrainMove(CGPointMake(13, 17), CGPointMake(10, 20)), CGPointMake(10, 20))
        << "the deciding call answers the origin";
    EXPECT_EQ(view.constrainMove(CGPointMake(50, 60), CGPointMake(1, 2)), CGPointMake(1, 60));
    const CMTime start = seconds(1.0), duration = seconds(4.0), longer = seconds(30.0);
    view.setTotalRange(&start, &duration);
    // The display range ends after the total range: its end is the limit.
    EXPECT_EQ(view.constrainTime(CGPointMake(0.5, 3.0)), CGPointMake(1.0, 3.0));
    EXPECT_NEAR(view.constrainTime(CGPointMake(20.0, 0.0)).x, 10.0, kWorldTolerance);
    view.setTotalRange(nullptr, &longer);
    EXPECT_NEAR(view.constrainTime(CGPointMake(40.0, 0.0)).x, 31.0, kWorldTolerance);
    EXPECT_NEAR(view.constrainTime(CGPointMake(12.0, 0.0)).x, 12.0, kWorldTolerance);
}

// A drag left without its release closes its step as the release would have, in reverse
// order, when the view goes in mid-drag; the step undoes whole, and the view going detaches
// from its controller.
TEST_F(ViewMouseUndo, drag__an_abandoned_one_closes_its_step_and_undoes_whole) {
    build("A: 2=0/1 5=0.25/1 8=0/1; B: 5=-0.5/1");
    const auto before = snapshot();
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
    for (const char* e : {"A@5", "B@5"}) doomed->getSelection()->addSelection(entry(e));
    clock.advance(1.0);
    ASSERT_TRUE(doomed->displayLayer(&encoder));
    doomed->mouseDown(mouseAt(RWEventType::LeftMouseDown, CGPointMake(5.0, 0.25), 0));
    clock.advance(kStepSeconds);
    doomed->mouseDragged(mouseAt(RWEventType::LeftMouseDragged, CGPointMake(5.5, 0.5), 0));
    ASSERT_TRUE(doomed->getCapturing());
    recorder.clearCalls();
    doomed.reset();
    EXPECT_EQ(ctrl().getView(), nullptr) << "the controller must not keep a dangling view";
    ctrl().setView(&view);
    EXPECT_EQ(recorder.bracketText(), "B> A> }");
    EXPECT_FALSE(host.undoStack().isStepOpen());
    ASSERT_EQ(host.undoStack().undoCount(), 1u);
    ASSERT_TRUE(host.undo());
    EXPECT_TRUE(sceneIs(*before));
}

}  // namespace
}  // namespace view_test
