// The rows of an over-range parameter on the reference host: the value and position rows edit
// the keypoint selected in the group's mini editor, each edit one undo step; the rows follow
// the selection and go disabled without one; the strip's reset; the proportional row of a
// pair; the dial; the shape of the groups.

#include <memory>

#include "platform/channels/TQChannelRef.h"
#include "src/engine/TQEditBrackets.h"
#include "src/mini/tests/MiniFixture.h"
#include "src/parameters/TQMiniCurveEditorGroupController.h"
#include "src/parameters/TQOverRangeScrubbers.h"
#include "src/parameters/TQParameterInspectorDelegate.h"
#include "src/resources/TQStrings.h"

using namespace mini_test;

namespace {

class OverRangeRows : public MiniFixture {
protected:
    void SetUp() override {
        MiniFixture::SetUp();
        scale = static_cast<TQChannelScaleOverRange*>(
            object->addChild(std::make_unique<TQChannelScaleOverRange>("Taper", 12)));
        setKeys(*scale->getXChannel(), {{0.0, 1.0}, {1.0, 2.0}});
        group = TQMakeOverRangeGroup<TQChannelDoubleOverRangeController>(gain, &recorder, context);
        rows = group->editorController()->getMiniCurveEditor();
        rows->curveEditorView().setViewHost(&viewHost);
    }
    void TearDown() override {
        rows->curveEditorView().setViewHost(nullptr);
        MiniFixture::TearDown();
    }

    // Selects keypoints in the group's own editor.
    void selectInGroup(TQChannel* channel, double p) {
        TQCurveSelectionList* list = rows->curveEditorView().getSelection();
        list->reset();
        const auto item = rows->controller()->selectedCurveSet()->itemWithChannel(channel);
        auto entry = std::make_shared<TQCurveSelection>();
        entry->setCurveId(item ? item->channelId() : 0);
        entry->setHandle(channel->getKeyframe(position(p)));
        entry->setFlags(TQSelectionKeypoint);
        entry->setKeypointUV(position(p), keyValue(*channel, p));
        list->addSelection(entry);
        rows->controller()->selectionChangedTo(list);
        group->update();
    }
    TQChanDoubleController& valueRow() {
        return static_cast<TQChanDoubleController&>(
            *static_cast<TQLabeledParamController*>(group->yController())->param());
    }
    TQChanRangeScrubberController& positionRow() {
        return static_cast<TQChanRangeScrubberController&>(
            *static_cast<TQLabeledParamController*>(group->xController())->param());
    }
    // One edit is one undo step of the rows' name, and undo gives the scene back.
    void expectOneUndoStep(const TQChannelBase& before) {
        EXPECT_EQ(recorder.captureBalance(), 0);
        EXPECT_EQ(host.undoDescription(), TQLocalizedString("Undo Set Value"));
        ASSERT_TRUE(host.undo());
        EXPECT_TRUE(*object == before) << "undo restores the scene exactly";
        EXPECT_FALSE(host.canUndo()) << "one step, not several";
    }

    TQParameterInspectorDelegate bridge{&recorder};
    JNBuildContext context{&bridge};
    TQChannelScaleOverRange* scale = nullptr;
    std::unique_ptr<TQMiniCurveEditorGroupController> group;
    TQMiniCurveEditorInspector* rows = nullptr;
};

TEST_F(OverRangeRows, valueRow__typed_value_moves_the_selected_keypoint_in_one_step) {
    selectInGroup(gain, 0.5);
    const auto before = snapshot();
    valueRow().userEnterNumber("42");
    EXPECT_DOUBLE_EQ(keyValue(*gain, 0.5), 42.0);
    EXPECT_DOUBLE_EQ(keyValue(*gain, 0.0), 10.0);
    expectOneUndoStep(*before);
}

TEST_F(OverRangeRows, valueRow__a_slider_drag_is_one_step) {
    selectInGroup(gain, 1.0);
    const auto before = snapshot();
    RWSlider& slider = *valueRow().slider();
    slider.setMaxValue(100.0);
    valueRow().startScrubberAction(slider);
    for (double v : {21.0, 24.0, 27.0}) slider.userSetDoubleValue(v);
    valueRow().endSliderAction(slider);
    EXPECT_DOUBLE_EQ(keyValue(*gain, 1.0), 27.0);
    expectOneUndoStep(*before);
}

TEST_F(OverRangeRows, positionRow__percent_moves_the_keypoint_and_clamps) {
    selectInGroup(gain, 0.5);
    const auto before = snapshot();
    positionRow().userEnterNumber("25");
    EXPECT_NE(gain->getKeyframe(position(0.25)), nullptr);
    EXPECT_EQ(gain->getKeyframe(position(0.5)), nullptr);
    EXPECT_DOUBLE_EQ(keyValue(*gain, 0.25), 30.0);
    EXPECT_DOUBLE_EQ(positionRow().textField().doubleValue(), 25.0);
    expectOneUndoStep(*before);

    selectInGroup(gain, 0.5);
    positionRow().userEnterNumber("150");
    EXPECT_DOUBLE_EQ(positionRow().textField().doubleValue(), 100.0) << "clamped to the range";
    selectInGroup(gain, 0.0);
    positionRow().userEnterNumber("-5");
    EXPECT_NE(gain->getKeyframe(position(0.0)), nullptr);
    EXPECT_DOUBLE_EQ(positionRow().textField().doubleValue(), 0.0);
}

TEST_F(OverRangeRows, rows__follow_the_selection_and_disable_without_one) {
    EXPECT_FALSE(valueRow().isEnabled());
    EXPECT_FALSE(positionRow().isEnabled());
    EXPECT_FALSE(valueRow().textField().isEnabled());

    selectInGroup(gain, 0.5);
    EXPECT_TRUE(valueRow().isEnabled());
    EXPECT_TRUE(valueRow().slider()->isEnabled());
    EXPECT_DOUBLE_EQ(valueRow().textField().doubleValue(), 30.0);
    EXPECT_DOUBLE_EQ(positionRow().textField().doubleValue(), 50.0);

    selectInGroup(gain, 1.0);
    EXPECT_DOUBLE_EQ(valueRow().textField().doubleValue(), 20.0);
    EXPECT_DOUBLE_EQ(positionRow().textField().doubleValue(), 100.0);

    // A selection gone stale after an undo: the rows go disabled.
    {
        TQCaptureGuard capture(&recorder, "Undo Move Keypoint");
        TQChannelEditGuard edit(&recorder, gain);
        gain->setKeyframe(position(0.75), 1.0);
    }
    selectInGroup(gain, 0.75);
    ASSERT_TRUE(host.undo());
    rows->update();
    group->update();
    EXPECT_FALSE(valueRow().isEnabled());
}

TEST_F(OverRangeRows, strip__reset_restores_the_channel_in_one_step) {
    TQMiniCurveEditorStripController* strip = group->stripController();
    ASSERT_NE(strip, nullptr);
    auto want = snapshot();
    TQChannelRef(gain, object).getChannel(want.get())->reset(false);
    const auto before = snapshot();
    strip->resetButton().userClick();
    EXPECT_TRUE(*object == *want);
    EXPECT_EQ(host.undoDescription(), TQLocalizedString("Undo Folder Reset"));
    EXPECT_EQ(recorder.captureBalance(), 0);
    ASSERT_TRUE(host.undo());
    EXPECT_TRUE(*object == *before);
}

TEST_F(OverRangeRows, group__starts_closed_with_the_strip_and_opens) {
    EXPECT_TRUE(group->editorGroup()->isCollapsed());
    EXPECT_TRUE(group->editorController()->isHidden());
    EXPECT_FALSE(group->stripController()->isBorderHidden());
    group->twiddle(true);
    EXPECT_FALSE(group->editorController()->isHidden());
    EXPECT_TRUE(group->stripController()->isBorderHidden());

    JNBuildContext hud(&bridge, true);
    auto heads = TQMakeOverRangeGroup<TQChannelDoubleOverRangeController>(gain, &recorder, hud);
    EXPECT_EQ(heads->headingController(), nullptr);
    EXPECT_EQ(heads->stripController(), nullptr);
    EXPECT_FALSE(heads->editorController()->isHidden());
    heads->update();  // a missing heading is skipped
}

TEST_F(OverRangeRows, pair__typed_sets_both_a_drag_keeps_the_ratio) {
    auto pairGroup =
        TQMakeOverRangeGroup<TQChannel2DOverRangeController>(gradient, &recorder, context);
    TQMiniCurveEditorInspector* editor = pairGroup->editorController()->getMiniCurveEditor();
    auto* folder = static_cast<TQFolderGroupController*>(pairGroup->yController());
    ASSERT_NE(folder, nullptr);
    EXPECT_TRUE(folder->enclosedGroup()->isCollapsed()) << "component rows start hidden";
    auto& prop = static_cast<TQChan2DPropOverRangeScrubberController&>(
        *static_cast<TQLabeledParamController*>(folder->heading())->param());

    TQChannel* x = gradient->getXChannel();
    TQChannel* y = gradient->getYChannel();
    setKeys(*x, {{0.5, 4.0}});
    setKeys(*y, {{0.5, 2.0}});
    {
        TQCurveSelectionList* list = editor->curveEditorView().getSelection();
        auto entry = std::make_shared<TQCurveSelection>();
        entry->setCurveId(
            editor->controller()->selectedCurveSet()->itemWithChannel(x)->channelId());
        entry->setHandle(x->getKeyframe(position(0.5)));
        entry->setFlags(TQSelectionKeypoint);
        list->addSelection(entry);
    }
    pairGroup->update();  // as the host's post of the new selection does
    RWSlider& slider = *prop.slider();
    slider.setMaxValue(100.0);
    prop.startScrubberAction(slider);
    EXPECT_DOUBLE_EQ(prop.ratio(), 0.5);
    slider.userSetDoubleValue(8.0);
    prop.endSliderAction(slider);
    EXPECT_DOUBLE_EQ(keyValue(*x, 0.5), 8.0);
    EXPECT_DOUBLE_EQ(keyValue(*y, 0.5), 4.0) << "the drag keeps the ratio";

    prop.userEnterNumber("3");
    EXPECT_DOUBLE_EQ(keyValue(*x, 0.5), 3.0);
    EXPECT_DOUBLE_EQ(keyValue(*y, 0.5), 3.0) << "a typed number sets both";

    // x 0 and y 4: the ratio is 0 and the trailing component is left alone.
    x->setKeyframeValue(x->getKeyframe(position(0.5)), 0.0);
    y->setKeyframeValue(y->getKeyframe(position(0.5)), 4.0);
    prop.startScrubberAction(slider);
    EXPECT_DOUBLE_EQ(prop.ratio(), 0.0);
    EXPECT_FALSE(prop.isXMax());
    slider.userSetDoubleValue(6.0);
    prop.endSliderAction(slider);
    EXPECT_DOUBLE_EQ(keyValue(*y, 0.5), 6.0);
    EXPECT_DOUBLE_EQ(keyValue(*x, 0.5), 0.0);

    auto wrong =
        TQMakeOverRangeGroup<TQChannelScaleOverRangeController>(gradient, &recorder, context);
    EXPECT_EQ(wrong->yController(), nullptr) << "a pair of another class has no value row";
}

TEST_F(OverRangeRows, angle__dial_across_zero_takes_a_small_step) {
    auto* turn = static_cast<TQChannelAngle*>(
        object->addChild(std::make_unique<TQChannelAngle>("Turn", 13)));
    const double degree = 1.0 / turn->getInfo()->displayScale;
    setKeys(*turn, {{0.5, 5.0 * degree}});
    auto angleGroup =
        TQMakeOverRangeGroup<TQChannelAngleOverRangeController>(turn, &recorder, context);
    TQMiniCurveEditorInspector* editor = angleGroup->editorController()->getMiniCurveEditor();
    TQCurveSelectionList* list = editor->curveEditorView().getSelection();
    auto entry = std::make_shared<TQCurveSelection>();
    entry->setCurveId(editor->controller()->selectedCurveSet()->itemWithChannel(turn)->channelId());
    entry->setHandle(turn->getKeyframe(position(0.5)));
    entry->setFlags(TQSelectionKeypoint);
    list->addSelection(entry);
    angleGroup->update();
    auto& row = static_cast<TQChanAngleOverRangeScrubberController&>(
        *static_cast<TQLabeledParamController*>(angleGroup->yController())->param());
    EXPECT_DOUBLE_EQ(row.dial()->doubleValue(), 355.0);
    // The dial shows 360 - 5 = 355; turning it to 5 crosses its zero: ten degrees down.
    RWSlider& dial = *row.dial();
    dial.userSetDoubleValue(5.0);
    EXPECT_NEAR(keyValue(*turn, 0.5) / degree, -5.0, 1e-9);
}

TEST_F(OverRangeRows, editorRow__refreshes_for_a_modified_child_of_a_folder) {
    TQChanMiniCurveEditorController row(gradient, &recorder, context);
    host.resetModifiedChannels();
    EXPECT_FALSE(row.needsRefresh());
    gradient->getYChannel()->noteWillChange(true);
    EXPECT_TRUE(row.needsRefresh());
    TQChanMiniCurveEditorController empty(nullptr, &recorder, context);
    EXPECT_FALSE(empty.needsRefresh());
}

}  // namespace
