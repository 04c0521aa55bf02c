// The controller's edits, each a row run on a fresh scene through the reference host: what the
// channels hold after it (every keyframe with its handles), what the host saw of it (the
// bracket as one line, see bracketText, and the channels it heard announced), the order the
// channels moved their keyframes in, the view's selection and the curves marked for a redraw
// are held in a recorded baseline (baselines/edits.txt, see TextBaseline.h); every row is
// undone to the very scene it started from and redone to the one it made.

#include <string>

#include "src/engine/TQEditBrackets.h"
#include "tests/support/EngineFixture.h"
#include "tests/support/StepScript.h"
#include "tests/support/TextBaseline.h"

namespace engine_test {
namespace {

struct Edit {
    const char* name;
    const char* scene;      // as build() reads it
    const char* selection;  // as select() reads it
    const char* script;     // "set-up steps | the edit's steps", separated by ";", see run()
    bool onGrid = false;    // the controller puts times on the frame grid
};

void PrintTo(const Edit& e, std::ostream* os) { *os << e.name; }

class CtrlEdits : public WithReferenceHost<EngineFixture>,
                  public ::testing::WithParamInterface<Edit> {
protected:
    std::unique_ptr<TQCurveEditorCtrlBase> makeController() override {
        if (GetParam().onGrid) return std::make_unique<FrameGridController>();
        return EngineFixture::makeController();
    }
    // Runs the steps: a name and its arguments, times in seconds, entries as select() reads
    // them. The selection a step works on is the view's.
    void run(const std::string& script) {
        TQCurveEditorViewBase undrawn;
        tests_support::StepArgs a;
        const auto N = [&](size_t i) { return a.number(i); };
        const auto T = [&](size_t i) { return seconds(N(i)); };
        const auto E = [&](size_t i) { return entry(a.words.at(i)); };
        const auto C = [&] { return item(a.rest)->channel(); };  // the named channel
        const auto C0 = [&] { return item(a.word(0))->channel(); };
        TQCurveSelectionList* s = view.getSelection();
        const auto perform = [&](const std::string& action, double tag) {
            RWMenuItem sender(action, action);
            sender.setTag(int64_t(tag));
            EXPECT_TRUE(ctrl().performAction(action, sender));
        };
        const tests_support::Steps steps = {
            {"menu", [&] { perform(a.word(0), N(1)); }},  // an action and its tag
            {"interp", [&] { perform("menuSetKeypointInterpolation:", N(0)); }},
            {"select", [&] { select(a.rest); }},
            {"move", [&] { ctrl().moveSelected(s, T(0), N(1), 1, char(N(2))); }},
            {"nudge", [&] { ctrl().offsetSelected(s, T(0), N(1)); }},
            {"offsetcurve", [&] { ctrl().offsetCurve(s, T(0), N(1)); }},
            {"drag", [&] { drag(int(N(0)), N(1), N(2), N(3)); }},
            {"add", [&] { ctrl().addVertex(E(0), T(1)); }},
            {"addvalue", [&] { ctrl().addVertex(E(0), T(1), N(2), 1); }},
            {"deletevertex", [&] { ctrl().deleteVertex(E(0).get(), T(1)); }},
            {"tangent", [&] { ctrl().setTangents(E(0).get(), N(1), N(2)); }},
            {"tangent45", [&] { ctrl().setTangents45(E(0).get(), N(1), N(2), char(N(3))); }},
            {"tangents", [&] { ctrl().setTangentsSelected(s, N(0), N(1)); }},
            {"tangents45", [&] { ctrl().setTangents45Selected(s, N(0), N(1), char(N(2))); }},
            {"break", [&] { ctrl().breakTangents(E(0).get()); }},
            {"breaks", [&] { ctrl().breakTangentsSelected(s); }},
            {"weight", [&] { ctrl().weightTangents(E(0).get(), char(N(1))); }},
            {"weights", [&] { ctrl().weightTangentsSelected(s, char(N(0))); }},
            {"bezier", [&] { ctrl().setBezierPoint(E(0).get()); }},
            {"beziers", [&] { ctrl().setBezierPointSelected(s); }},
            {"flatten", [&] { ctrl().flattenSelected(s); }},
            {"align", [&] { ctrl().alignTangentsSelected(s); }},
            {"purge", [&] { ctrl().purgeSelected(s); }},
            {"clean", [&] { ctrl().cleanSelection(s); }},
            {"now", [&] { recorder.setCurrentTime(T(0)); }},
            {"mouse", [&] { view.setMouseOrigin(view.getPointScreen(CGPointMake(N(0), N(1)))); }},
            {"save", [&] { ctrl().saveTangents(E(0).get()); }},
            {"negative", [&] { ctrl().allowNegativeRange(true); }},
            {"cycle",
             [&] { C()->setExtrapolation(kTQExtrapolationRepeat, kTQExtrapolationAfter); }},
            {"linked", [&] { ctrl()._linked = true; }},
            {"offset", [&] { object->setTimeOffset(T(0)); }},
            {"remove", [&] { C()->getParent()->removeChild(C()); }},
            {"unlist", [&] { set->removeItemWithIdentifier(item(a.rest)->channelId()); }},
            {"movekey",
             [&] {
                 const CMTime from = T(1), to = T(2);
                 C0()->moveKeyframe(&from, &to, true);
             }},
            // The keyframe at a time deleted, or deleted and set again as an undo rebuilds it:
            // the same time and value, a new handle.
            {"unkey", [&] { C0()->deleteKeyframe(C0()->getKeyframe(T(1))); }},
            {"rekey",
             [&] {
                 const double v = C0()->getCurveValue(T(1));
                 C0()->deleteKeyframe(C0()->getKeyframe(T(1)));
                 C0()->setKeyframe(T(1), v);
             }},
            {"validate", [&] { ctrl().validateSelection(s); }},
            {"noview", [&] { ctrl().setView(nullptr); }},
            {"undrawn", [&] { ctrl().setView(&undrawn); }},
            {"fps", [&] { EXPECT_TRUE(host.setFrameDuration(CMTimeMake(1, int32_t(N(0))))); }},
        };
        tests_support::runSteps(script, a, steps);
        ctrl().setView(&view);
    }
    // A drag of `steps` steps as the view runs it, the anchor going from t0 by dt and dv a step.
    void drag(int steps, double t0, double dt, double dv) {
        TQCurveSelectionList* list = view.getSelection();
        ctrl().validateSelection(list);
        const TQChangeBracket gesture(ctrl(), list, "Undo Move Keypoint");
        for (int step = 1; step <= steps; ++step) {
            const TQModifyValueGuard values(ctrl(), list);
            ctrl().moveSelected(list, seconds(t0 + dt * step), dv * step, 1, 0);
        }
    }
};

TEST_P(CtrlEdits, edit__as_recorded_and_undone_exactly) {
    const Edit& e = GetParam();
    build(e.scene);
    select(e.selection);
    const std::string script = e.script;
    const size_t bar = script.find('|');
    if (bar != script.npos) run(script.substr(0, bar));
    for (const auto& i : items) i->setOriginalCurveDirty(0);
    const auto before = snapshot();
    moves.clear();
    recorder.clearCalls();
    host.resetModifiedChannels();
    run(script.substr(bar == script.npos ? 0 : bar + 1));
    std::string redraw, announced;
    for (const auto& i : items)
        redraw += i->originalCurveDirty() ? i->channelBase()->getName() : "";
    for (const TQChannelRef& ref : host.modifiedChannels()) {
        const TQChannelBase* c = ref.getChannel(host.sceneChannelRoot());
        announced.append(c ? c->getName() : "?").append(" ");
    }
    const size_t steps = host.undoStack().undoCount();
    EXPECT_TRUE(tests_support::matchesBaselineBlock(
        "edits", e.name,
        "scene: " + sceneText(*object, true) + "\ncalls: " + recorder.bracketText() +
            "\nmoves: " + moves + "\nselection: " + selectionText() + "\nredraw: " + redraw +
            "\nannounced: " + announced + "\nundo steps: " + std::to_string(steps) + "\n",
        "src/engine/tests/baselines"));
    EXPECT_EQ(recorder.captureBalance(), 0);
    // Edits made outside a bracket are one step the host makes of them.
    const auto after = snapshot();
    for (size_t i = 0; i < steps; ++i) ASSERT_TRUE(host.undo());
    EXPECT_TRUE(steps == 0 || sceneIs(*before)) << "undo";
    for (size_t i = 0; i < steps; ++i) ASSERT_TRUE(host.redo());
    EXPECT_TRUE(sceneIs(*after)) << "redo";
}

// The scene of the menu commands: A's first keypoint is locked; X is linked to Y and Z. The
// primary entry is unlocked and enabled.
constexpr const char* kMenuScene =
    "A: 1=1L 2=3 3=2; B: 0=10 4=20; Pos.X: 1=2 2=5; Pos.Y: 1=2 2=5; Pos.Z: 1=2 2=5";
constexpr const char* kMenuSelection = "A@2 X@1 B@4 A@1 B@0";
constexpr const char* kFourKeys = "A: 1=0/1 2=1/1 3=0/1 4=1/1";

INSTANTIATE_TEST_SUITE_P(
    Engine, CtrlEdits,
    ::testing::Values(
        // Menus: a locked keypoint stays; a linked component takes its siblings along; taken
        // frames are crossed when duplicating; each curve reverses over its own span; eases go
        // onto the segment arriving at each keypoint; lock and disable take the opposite of
        // the primary entry for all.
        Edit{"menuDelete", kMenuScene, kMenuSelection, "menu menuDelete:"},
        Edit{"menuDuplicate", kMenuScene, kMenuSelection, "menu menuDuplicate:"},
        Edit{"menuReverse", kMenuScene, kMenuSelection, "menu menuReverse:"},
        Edit{"reverseSkipsHandles", "A: 1=0 2=1 3=2 4=3", "A<1 A@2 A@4", "menu menuReverse:"},
        Edit{"menuEaseIn", kMenuScene, kMenuSelection, "menu menuEaseIn:"},
        Edit{"menuEaseOut", kMenuScene, kMenuSelection, "menu menuEaseOut:"},
        Edit{"menuEaseBoth", kMenuScene, kMenuSelection, "menu menuEaseBoth:"},
        Edit{"menuLockSelected", kMenuScene, kMenuSelection, "menu menuLockSelected:"},
        Edit{"menuDisableSelected", kMenuScene, kMenuSelection, "menu menuDisableSelected:"},
        Edit{"menuBreakTangent", kMenuScene, kMenuSelection, "menu menuBreakTangent:"},
        Edit{"menuAlignTangent", "A: 2=3(-0.3,0.2|0.5,0.1); B: 4=20(-1,0.5|1,0.1)", "A>2 B@4",
             "menu menuAlignTangent:"},
        Edit{"menuAddKeyframe", "A: 1=2", "A~", "mouse 0.5 0 | menu menuAddKeyframe:"},
        Edit{"menuInterpolationLinked", kMenuScene, "X@1", "interp 1"},
        // Bezier shapes a segment from both ends: the keypoint before follows; Exp does not.
        Edit{"menuBezier", kFourKeys, "A@3", "interp 4"},
        Edit{"menuExponential", kFourKeys, "A@3", "interp 13"},
        // The segment under the click (at 2.5) is its first keypoint's; without an entry, or
        // with a tag that names no interpolation, not even an empty step.
        Edit{"menuSegmentConstant", kFourKeys, "A~",
             "mouse 2.5 0.5 | menu menuSetSegmentInterpolation: 0"},
        Edit{"menuSegmentRefused", kFourKeys, "",
             "mouse 2.5 0.5 | menu menuSetSegmentInterpolation: 0; select A~; "
             "menu menuSetSegmentInterpolation: -1"},
        // The cleared channel shows what it showed at the playhead.
        Edit{"menuDeleteAllKeyframes", kFourKeys, "A~",
             "now 1.5; mouse 2.5 0.5 | menu menuDeleteAllKeyframes:"},
        // Each channel announced once per phase; each step measures from where the last left.
        Edit{"drag", "A: 1=0 2=1; B: 1=0", "A@1 A@2 B@1", "drag 10 1 0.05 0.1"},
        Edit{"vanishedChannel", "A: 1=0 2=1; Gone: 1=0; B: 1=0", "A@1 Gone@1 B@1 A@2",
             "remove Gone | menu menuReverse:"},
        Edit{"deleteLockedOnly", "A: 0=0 1=10L", "A@1", "menu menuDelete:"},
        // Written before the first deletion: a second write would read a one-key curve.
        Edit{"deleteAll", "A: 0=0 1=10", "A@1 A@0", "now 0.5 | menu menuDelete:"},
        // Past the keyframes what was shown follows the extrapolation, linked components too.
        Edit{"deleteAllPastTheEnd", "A: 0=0 1=10; Pos.X: 0=0 1=4; Pos.Y: 0=1 1=5",
             "A@1 A@0 X@0 X@1", "now 1.3; cycle A; cycle Y | menu menuDelete:"},
        Edit{"duplicateOnTakenAndBetweenFrames", "A: 1=3 31/30=4; B: 1.01=7", "A@1 B@1.01",
             "menu menuDuplicate:"},
        // A thousandth of so short a frame is below the finest time: the steps are one tick.
        Edit{"duplicateOnATinyFrame", "A: 1=3", "A@1", "fps 100000000 | menu menuDuplicate:"},
        Edit{"addToLinked", "Pos.X: 0=0 4=8; Pos.Y: 0=0 4=8; Pos.Z: 0=0 4=8", "",
             "add X~ 2.01; addvalue X~ 3 6.5", true},
        Edit{"deleteVertex", "A: 1=0 2=1 3=0", "", "deletevertex A@2 2"},
        Edit{"deleteFromLinked", "Pos.X: 0=0 3=2 4=8; Pos.Y: 0=0 3=2 4=8; Pos.Z: 0=0 3=2 4=8", "",
             "deletevertex Y@3 3"},
        Edit{"purgeAndClean", "A: 1=1 2=2", "", "movekey A 1 2; select A@2 | clean; purge"},
        // A stale handle is found again by its stored time, also by the operations on a
        // selection before they run; with nothing at that time the entry stays stale.
        Edit{"staleHandleRepaired", "A: 1=3/1 2=4/1", "A@2", "rekey A 2 | validate"},
        Edit{"staleHandleRepairedFirst", "A: 1=3/1 2=4/1", "A@2", "rekey A 2 | beziers"},
        Edit{"staleHandleWithoutAKeyframe", "A: 1=3/1 2=4/1", "A@2", "unkey A 2 | validate"},
        // Moves: the anchor first; the one leading the direction of travel moves first.
        Edit{"moveForward", "A*2: 1=0 2=0 3=0", "A@2 A@3 A@1", "move 3 0"},
        Edit{"moveBackward", "A*2: 2=0 3=0 4=0", "A@3 A@4 A@2", "move 2 0"},
        Edit{"moveStopsAtZero", "A*2: 0.5=0 1.5=0 4=0", "A@1.5 A@0.5", "move 0.5 0"},
        Edit{"moveNegative", "A*2: 0.5=0 1.5=0", "A@1.5 A@0.5", "negative | move 0.5 0"},
        // The anchor's V is 10 / 2 = 5: V 6 is one unit up on screen, for each curve.
        Edit{"moveByScreenDistance", "A*2: 1=10; B*50: 2=100", "A@1 B@2", "move 1 6 1"},
        // The first entry moves the compound, the second is found in the moved set, also when
        // the object starts 2 s late on the axis.
        Edit{"moveLinkedUnderOffset", "Pos.X: 1=0 3=0; Pos.Y: 1=0 3=0; Pos.Z: 1=0 3=0", "X@1 Y@1",
             "linked; offset 2 | move 3.5 0; move 3.5 0.5 1"},
        Edit{"moveSegment", "A*2: 1=0 3=1", "A~", "move 2 0.5; offsetcurve 2 0.25"},
        Edit{"nudge", "A*4: 1=1 2=2", "A@1 A@2", "nudge 0 0.5; nudge 0.5 0"},
        Edit{"nudgeSegment", "A: 1=0 3=1", "A~", "nudge 2 1"},
        Edit{"nudgeLinked", "Pos.X: 1=0 2=1; Pos.Y: 1=0 2=1; Pos.Z: 1=0 2=1", "X@1",
             "linked | nudge 0.5 0.25"},
        Edit{"nothingToMove", "A: 1=0", "A@1",
             "select; move 1 0; nudge 1 0; offsetcurve 1 0; select A@1; unlist A; move 2 1"},
        // A keypoint alone lands on a frame, a group keeps its spacing, a nudge is in frames.
        Edit{"onTheFrameGrid", "A: 1=0; C: 1=0 1.25=0", "A@1",
             "move 1.04667 0; select C@1 C@1.25; move 1.07333 0; nudge 0.04667 0", true},
        // Tangents; 80 px a second and 200 a unit on screen.
        Edit{"brokenHandleAlone", "A: 5=0(-0.5,-0.1|0.5,0.1)b", "", "tangent A>5 5.375 0.45"},
        Edit{"pairFollowsOnScreen", "A: 5=0.3(-0.3,0.2|0.5,0.1)", "", "tangent A>5 5.6 0.5"},
        Edit{"weightedPairKeepsLength", "A: 5=0.3(-0.3,0.2|0.5,0.1)s", "", "tangent A>5 5.6 0.5"},
        Edit{"zeroHandlePulledOut", "A: 5=0(-0.5,-0.1|0,0)", "", "tangent A>5 5.4 0.3"},
        Edit{"noViewWorldIsScreen", "A: 5=0(-0.5,-0.1|0.5,0.1)", "", "noview; tangent A>5 6 0.2"},
        Edit{"undrawnViewNoNaN", "A: 5=0(-0.5,-0.1|0.5,0.1)", "", "undrawn; tangent A>5 5.2 0.3"},
        Edit{"undrawnViewNoSnap", "A: 5=0(-0.5,-0.1|0.5,0.1)", "",
             "| undrawn; tangent45 A>5 5.2 0.3 0"},
        // The pointer 40, 80, -10 and 150 degrees on screen from the keypoint.
        Edit{"snap45", "A: 5=0(-0.5,-0.1|0.37,0.05)b", "", "tangent45 A>5 5.9 0.3 0"},
        Edit{"snap45Upright", "A: 0=0(-0.5,-0.1|0.37,0.05)b", "", "tangent45 A>0 0.217 0.492 0"},
        Edit{"snap45Level", "A: 5=0(-0.5,-0.1|0.37,0.05)b", "", "tangent45 A>5 6.231 -0.087 0"},
        Edit{"snap45Backward", "A: 5=0(-0.5,-0.1|0.37,0.05)b", "", "tangent45 A>5 3.917 0.25 0"},
        Edit{"snap45FromOriginalAngle", "A: 5=0(-0.5,-0.1|0.37,0.05)b", "",
             "save A>5; tangent45 A>5 5.5 0.5 1"},
        Edit{"snap45InputFromOriginalAngle", "A: 5=0(-0.5,-0.1|0.37,0.05)b", "",
             "save A<5; tangent45 A<5 4.5 0.5 1"},
        // Selected keypoints copy the first handle's movement on its side; handle entries
        // after the first are left alone.
        Edit{"tangentsSelected",
             "A: 2=0.2(-0.5,-0.1|0.5,0.1)b; B*2: 4=0.5(-0.2,-0.3|0.2,0.3)b; C: 6=0(-0.4,0|0.4,0)",
             "A>2 B@4 C<6", "tangents 2.8 0.3"},
        Edit{"tangents45Selected",
             "A: 2=0.2(-0.5,-0.1|0.5,0.1); B*2: 4=0.5(-0.2,-0.3|0.2,0.3); C*0.5: "
             "6=-0.1(-0.4,0|0.4,0); D: 8=0(-0.4,0|0.4,0)b",
             "A>2 B@4 C@6 D<8", "tangents45 2.75 0.485 0"},
        // The list forms take one state for all; the single forms toggle.
        Edit{"breakAndWeight", "A: 2=0(-0.5,0|0.5,0)b; B: 4=0(-0.5,0|0.5,0)", "A@2 B>4",
             "breaks; break A@2; weight A@2 1; weights 0"},
        Edit{"bezierPoints", "A: 1=0/1 2=1/1 3=0/1", "A@2 A@3", "beziers; bezier A@1"},
        Edit{"flatten", "A: 1=0(-0.3,0.2|0.3,0.4)b 2=1(-0.3,0.2|0.3,0.4)b 3=0", "A@2", "flatten"}),
    [](const auto& p) { return std::string(p.param.name); });

}  // namespace
}  // namespace engine_test
