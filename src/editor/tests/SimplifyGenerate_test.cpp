// The simplify and generate panels worked as a user works them, on a dense channel of the
// sample piece through the reference host: the panels' own controls are moved and their
// buttons pressed inside the modal run. What the user sees is checked: the channel against a
// copy simplified once from the curve of the moment the panel opened, the curve back exactly
// after Cancel, one undo step, and baked cycles that draw the curve the extrapolation drew.

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
        previousModal = RWApplicationServices().modal;
        RWServiceSet mine;
        mine.modal = &modal;
        RWInstallServices(mine);
        host.selectObject(object(kTQHostSampleTitleObject));
        ctrl.showAll();
        const TQCurveSetPtr set = ctrl.selectedCurveSet();
        ASSERT_TRUE(set);
        for (uint32_t i = 0; i < set->numberOfChannelItems() && !item; ++i) {
            auto candidate =
                std::dynamic_pointer_cast<TQCurveEditorChannelItem>(set->channeItemAtIndex(i));
            if (candidate && candidate->channel() && !candidate->channel()->isLocked(true))
                item = candidate;
        }
        ASSERT_TRUE(item);
        // A recorded motion: a keyframe on each of 90 frames, a slow swing with a wobble, and
        // tangents of the user's own on a few keyframes.
        TQChannel& c = channel();
        c.deleteAllKeyframes(kCMTimeZero);
        for (int64_t f = 0; f < 90; ++f)
            c.setKeyframe(frames(f), std::sin(f / 14.0) * 5.0 + std::sin(f * 1.7) * 0.3);
        for (const int64_t f : {10, 40}) {
            const TQKeyframeHandle k = c.getKeyframe(frames(f));
            c.setKeyframeTangentsBroken(k, true);
            c.setKeyframeOutputTangents(k, 0.02, 1.5);
        }
        item->select(1);
        host.undoStack().clear();
    }
    void TearDown() override {
        RWServiceSet back;
        back.modal = previousModal;
        RWInstallServices(back);
        EditorFixture::TearDown();
    }

    TQChannel& channel() const { return *item->channel(); }
    std::unique_ptr<TQChannel> copy() const {
        return std::unique_ptr<TQChannel>(static_cast<TQChannel*>(channel().cloneChannel()));
    }
    // A copy of the curve simplified as the panel does it.
    std::unique_ptr<TQChannel> simplified(const TQChannelBase& from, double tolerance,
                                          int smoothness) {
        std::unique_ptr<TQChannel> out(static_cast<TQChannel*>(from.cloneChannel()));
        out->simplifyCurve(out->getKeyframeMinTime(), out->getKeyframeMaxTime(),
                           host.getFrameDuration(), kTQSimplifyBezier, smoothness, tolerance,
                           kTQSimplifyOnFrames);
        return out;
    }
    static void press(const RWPanel& panel, const char* action) {
        const auto button = panel.contentView()->subview<RWButton>(
            [&](const RWButton& b) { return b.action() == action; });
        ASSERT_TRUE(button) << action;
        button->userClick();
    }
    bool run(const char* action) {
        RWMenuItem sender(action, action);
        return ctrl.performAction(action, sender);
    }

    TQCurveEditorOutlets panels;
    TQCurveEditorChannelItemPtr item;
    RWScriptedModal modal;
    RWModalService* previousModal = nullptr;
};

TEST_F(SimplifyGenerate, simplify__each_move_starts_from_the_opening_curve_and_ok_is_one_step) {
    const std::unique_ptr<TQChannel> opening = copy();
    const std::unique_ptr<TQChannel> want = simplified(*opening, 4.0, 2);
    ASSERT_LT(want->numberOfKeyframes(), opening->numberOfKeyframes());
    modal.pushScript([&](RWWindow&, RWModalService&) {
        EXPECT_TRUE(channel() == *opening) << "opening changes nothing";
        EXPECT_EQ(panels.tolerance->intValue(), 1);
        EXPECT_EQ(panels.smoothnessSlider->intValue(), 0);
        panels.toleranceSlider->userSetSliderValue(2.8);  // to the mark at 3
        EXPECT_EQ(panels.tolerance->intValue(), 3);
        panels.smoothness->userSetDoubleValue(2.0);
        EXPECT_EQ(panels.smoothnessSlider->intValue(), 2);
        panels.tolerance->userStep(1.0, RWScrubber::Step::Normal);
        EXPECT_EQ(panels.toleranceSlider->intValue(), 4);
        EXPECT_TRUE(channel() == *want) << "three moves: one simplification of the opening curve";
        press(*panels.reducePanel, "reduceOk:");
    });
    ASSERT_TRUE(run("animMenuSimplifyCurve:"));
    EXPECT_EQ(modal.runs(), (std::vector<std::string>{TQLocalizedString("Simplify Panel Title")}));
    EXPECT_TRUE(channel() == *want);
    EXPECT_FALSE(panels.reducePanel->isVisible());
    EXPECT_FALSE(ctrl.initialCurve());
    EXPECT_EQ(panels.toleranceSlider->intValue(), 1) << "the panel is ready for the next time";
    EXPECT_EQ(panels.smoothness->intValue(), 0);

    EXPECT_EQ(host.undoDescription(), TQLocalizedString("Undo Simplify"));
    ASSERT_TRUE(host.undo());
    EXPECT_TRUE(channel() == *opening) << "tangents included";
    EXPECT_FALSE(host.canUndo()) << "the previews made no steps of their own";
    ASSERT_TRUE(host.redo());
    EXPECT_TRUE(channel() == *want);
}

TEST_F(SimplifyGenerate, simplify__cancel_and_close_end_the_run_as_the_user_means) {
    const std::unique_ptr<TQChannel> opening = copy();
    {
        SCOPED_TRACE("Cancel: the curve exactly as it was, and no step");
        modal.pushScript([&](RWWindow&, RWModalService&) {
            panels.toleranceSlider->userSetSliderValue(10.0);
            panels.smoothnessSlider->userSetSliderValue(5.0);
            EXPECT_FALSE(channel() == *opening);
            press(*panels.reducePanel, "reduceCancel:");
        });
        ASSERT_TRUE(run("animMenuSimplifyCurve:"));
        EXPECT_TRUE(channel() == *opening);
        EXPECT_FALSE(host.canUndo());
        EXPECT_FALSE(panels.reducePanel->isVisible());
        EXPECT_EQ(panels.tolerance->intValue(), 1);
    }
    {
        SCOPED_TRACE("the close box: the last preview stays, and undo takes it back");
        const std::unique_ptr<TQChannel> want = simplified(*opening, 6.0, 0);
        modal.pushScript([&](RWWindow& window, RWModalService&) {
            panels.tolerance->userSetDoubleValue(6.0);
            EXPECT_TRUE(window.performClose());
        });
        ASSERT_TRUE(run("animMenuSimplifyCurve:"));
        EXPECT_TRUE(channel() == *want);
        EXPECT_TRUE(ctrl.selectedCurveSet()->itemWithChannel(&channel()))
            << "closing the panel is not closing the editor";
        ASSERT_TRUE(host.undo());
        EXPECT_TRUE(channel() == *opening);
    }
}

TEST_F(SimplifyGenerate, generate__baked_cycles_draw_the_extrapolated_curve_in_one_step) {
    TQChannel& c = channel();
    c.deleteAllKeyframes(kCMTimeZero);
    c.setKeyframe(frames(0), 0.0);
    c.setKeyframe(frames(10), 4.0);
    c.setKeyframe(frames(25), 1.0);
    c.setExtrapolation(kTQExtrapolationProgressive, kTQExtrapolationAfter);
    c.setExtrapolation(kTQExtrapolationPingPong, kTQExtrapolationBefore);
    host.undoStack().clear();
    const std::unique_ptr<TQChannel> opening = copy();
    // The curve the extrapolation draws, at every frame and between frames, from the
    // keyframes to well past what gets baked on one side (the other side's extrapolation
    // then repeats a longer span).
    auto drawsAs = [&](const TQChannel& before, int64_t from, int64_t to) {
        for (int64_t f = from; f <= to; ++f)
            for (const double sub : {0.0, 0.5}) {
                const CMTime t = CMTimeMake(f * 20 + static_cast<int64_t>(sub * 20), 600);
                if (std::abs(c.getValueAsDouble(t) - before.getValueAsDouble(t)) > 1e-9)
                    return false;
            }
        return true;
    };

    ASSERT_TRUE(run("animMenuGeneratePostKeypoints:"));
    EXPECT_TRUE(panels.generatePanel->isVisible());
    EXPECT_TRUE(modal.runs().empty()) << "the generate panel is not modal";
    panels.numberOfCyclesSlider->userSetSliderValue(3.0);
    EXPECT_EQ(panels.numberOfCycles->intValue(), 3);
    press(*panels.generatePanel, "generateOk:");
    EXPECT_FALSE(panels.generatePanel->isVisible());
    EXPECT_EQ(c.numberOfKeyframes(), 3u + 3u * 2u);
    EXPECT_TRUE(drawsAs(*opening, 0, 125));
    EXPECT_EQ(host.undoDescription(), TQLocalizedString("Undo Generate Keypoints"));

    ASSERT_TRUE(run("animMenuGeneratePreKeypoints:"));
    EXPECT_EQ(panels.numberOfCycles->intValue(), 1) << "one cycle whenever the panel reappears";
    press(*panels.generatePanel, "generateCancel:");
    EXPECT_EQ(c.numberOfKeyframes(), 9u) << "Cancel bakes nothing";

    const std::unique_ptr<TQChannel> beforePre = copy();
    ASSERT_TRUE(run("animMenuGeneratePreKeypoints:"));
    press(*panels.generatePanel, "generateOk:");
    EXPECT_EQ(c.numberOfKeyframes(), 9u + 8u) << "one cycle of the whole, longer span";
    EXPECT_TRUE(drawsAs(*beforePre, -150, 99));

    ASSERT_TRUE(host.undo());
    ASSERT_TRUE(host.undo());
    EXPECT_TRUE(c == *opening);
    EXPECT_FALSE(host.canUndo());
}

}  // namespace
