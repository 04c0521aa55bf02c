// The simplify and generate panels worked as a user works them, on a channel of the sample
// piece through the reference host: controls moved and buttons pressed inside the modal run,
// the channel checked against a copy simplified once from the curve the panel opened with.

#include <cmath>
#include <memory>

#include "platform/ui/RWButton.h"
#include "src/editor/TQCurveEditorPanels.h"
#include "src/editor/tests/EditorFixture.h"
#include "src/resources/TQStrings.h"

using namespace editor_test;

namespace {

CMTime frames(int64_t n) { return CMTimeMake(n * 20, 600); }  // 30 frames a second

class SimplifyGenerate : public EditorFixture {
protected:
    void connect(TQCurveEditorOutlets& outlets) override {
        TQInstantiateSimplifyPanel(outlets, &ctrl);
        TQInstantiateGeneratePanel(outlets, &ctrl);
        panels = outlets;
    }
    void SetUp() override {
        EditorFixture::SetUp();
        host.selectObject(object(kTQHostSampleTitleObject));
        ctrl.showAll();
        item = std::dynamic_pointer_cast<TQCurveEditorChannelItem>(
            ctrl.selectedCurveSet()->channeItemAtIndex(0));
        ASSERT_TRUE(item && item->channel());
        // A recorded wobble, a keyframe a frame, with a broken tangent of the user's.
        c().deleteAllKeyframes(kCMTimeZero);
        for (int64_t f = 0; f < 90; ++f)
            c().setKeyframe(frames(f), std::sin(f / 14.0) * 5.0 + std::sin(f * 1.7) * 0.3);
        c().setKeyframeTangentsBroken(c().getKeyframe(frames(10)), true);
        c().setKeyframeOutputTangents(c().getKeyframe(frames(10)), 0.02, 1.5);
        item->select(1);
        host.undoStack().clear();
    }
    TQChannel& c() const { return *item->channel(); }

    TQCurveEditorOutlets panels;
    TQCurveEditorChannelItemPtr item;
};

TEST_F(SimplifyGenerate, simplify__moves_start_from_the_opening_curve_ok_is_one_step_cancel_none) {
    const Copy opening = copyOf(&c()), want = copyOf(&c());
    static_cast<TQChannel&>(*want).simplifyCurve(frames(0), frames(89), host.getFrameDuration(),
                                                 kTQSimplifyBezier, 2, 4.0, kTQSimplifyOnFrames);
    modal.pushScript([&](RWWindow&, RWModalService&) {
        EXPECT_TRUE(c() == *opening) << "opening changes nothing";
        panels.toleranceSlider->userSetSliderValue(2.8);  // to the mark at 3
        panels.smoothness->userSetDoubleValue(2.0);
        panels.tolerance->userStep(1.0, RWScrubber::Step::Normal);
        EXPECT_EQ(panels.toleranceSlider->intValue(), 4);
        EXPECT_TRUE(c() == *want) << "three moves: one simplification of the opening curve";
        press(*panels.reducePanel, "reduceOk:");
    });
    recorder.clearCalls();
    ctrl.animMenuSimplifyCurve();
    EXPECT_TRUE(c() == *want);
    EXPECT_EQ(recorder.bracketText(),
              "{Simplify Channel 4*[!8 {Simplify Channel <X (X X) X> } !8] }");
    EXPECT_EQ(panels.tolerance->intValue(), 1) << "the panel is ready for the next time";
    ASSERT_NE(c().numberOfKeyframes(), static_cast<TQChannel&>(*opening).numberOfKeyframes());
    EXPECT_EQ(host.undoDescription(), TQLocalizedString("Undo Simplify"));
    ASSERT_TRUE(host.undo());
    EXPECT_TRUE(c() == *opening);
    EXPECT_FALSE(host.canUndo()) << "the previews made no steps of their own";

    modal.pushScript([&](RWWindow&, RWModalService&) {
        panels.toleranceSlider->userSetSliderValue(10.0);
        press(*panels.reducePanel, "reduceCancel:");
    });
    ctrl.animMenuSimplifyCurve();
    EXPECT_TRUE(c() == *opening) << "tangents included";
    EXPECT_FALSE(host.canUndo());
}

TEST_F(SimplifyGenerate, generate__bakes_the_panels_cycles_after_the_keyframes_in_one_step) {
    c().setExtrapolation(kTQExtrapolationPingPong, kTQExtrapolationAfter);
    host.undoStack().clear();
    const Copy opening = copyOf(&c()), want = copyOf(&c());
    static_cast<TQChannel&>(*want).generateKeypoints(kTQExtrapolationAfter, 3);

    ctrl.animMenuGeneratePostKeypoints();
    EXPECT_TRUE(modal.runs().empty() && panels.generatePanel->isVisible()) << "not modal";
    panels.numberOfCyclesSlider->userSetSliderValue(3.0);
    press(*panels.generatePanel, "generateOk:");
    EXPECT_TRUE(c() == *want);
    EXPECT_EQ(panels.numberOfCyclesSlider->intValue(), 1) << "one cycle when it reappears";
    ASSERT_TRUE(host.undo());
    EXPECT_TRUE(c() == *opening);
    EXPECT_FALSE(host.canUndo());
}

}  // namespace
