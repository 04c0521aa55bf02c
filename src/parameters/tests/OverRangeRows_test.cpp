// The rows of an over-range parameter on the reference host: the value and position rows edit
// the keypoint selected in the group's mini editor, each edit one undo step; the rows follow
// the selection and go disabled without one; the strip's reset; the proportional row of a
// pair; the dial; the shape of the groups.

#include <array>
#include <memory>
#include <utility>

#include "platform/channels/TQChannelRef.h"
#include "src/engine/TQEditBrackets.h"
#include "src/mini/tests/MiniFixture.h"
#include "src/parameters/TQMiniCurveEditorGroupController.h"
#include "src/parameters/TQOverRangeScrubbers.h"
#include "src/parameters/TQParameterInspectorDelegate.h"
#include "src/resources/TQStrings.h"
#include "tests/support/SceneText.h"

using namespace mini_test;

namespace {

class OverRangeRows : public MiniFixture {
protected:
    void SetUp() override {
        MiniFixture::SetUp();
        group = TQMakeOverRangeGroup<TQChannelDoubleOverRangeController>(gain, &recorder, context);
        rows = group->editorController()->getMiniCurveEditor();
        rows->curveEditorView().setViewHost(&viewHost);
    }
    void TearDown() override {
        rows->curveEditorView().setViewHost(nullptr);
        MiniFixture::TearDown();
    }

    // Selects the keypoint at p in a group's own editor, as a click would, and updates the
    // group as the host's post of the new selection does.
    static void select(TQMiniCurveEditorGroupController& in, TQChannel* channel, double p) {
        mini_test::selectKeys(*in.editorController()->getMiniCurveEditor(), channel, {p});
        in.update();
    }
    void selectInGroup(TQChannel* channel, double p) { select(*group, channel, p); }
    // The control of a labelled row.
    template <class Row>
    static Row& row(TQViewController* labelled) {
        return static_cast<Row&>(*static_cast<TQLabeledParamController*>(labelled)->param());
    }
    TQChanDoubleController& valueRow() { return row<TQChanDoubleController>(group->yController()); }
    TQChanRangeScrubberController& positionRow() {
        return row<TQChanRangeScrubberController>(group->xController());
    }
    // The value and position rows' texts.
    std::pair<double, double> shown() {
        return {valueRow().textField().doubleValue(), positionRow().textField().doubleValue()};
    }
    // One edit is one undo step of the rows' name, and undo gives the scene back.
    void expectOneUndoStep(const TQChannelBase& before) {
        EXPECT_EQ(std::pair(host.undoDescription(), recorder.captureBalance()),
                  std::pair(TQLocalizedString("Undo Set Value"), 0));
        ASSERT_TRUE(host.undo());
        EXPECT_TRUE(*object == before) << "undo restores the scene exactly";
        EXPECT_FALSE(host.canUndo()) << "one step, not several";
    }

    TQParameterInspectorDelegate bridge{&recorder};
    JNBuildContext context{&bridge};
    std::unique_ptr<TQMiniCurveEditorGroupController> group;
    TQMiniCurveEditorInspector* rows = nullptr;
};

TEST_F(OverRangeRows, valueRow__typed_or_dragged_one_step_and_typing_stands_through_updates) {
    selectInGroup(gain, 0.5);
    auto before = snapshot();
    valueRow().userEnterNumber("42");
    EXPECT_EQ(keyText(*gain), "0=10 0.5=42 1=20");
    expectOneUndoStep(*before);

    selectInGroup(gain, 1.0);
    before = snapshot();
    RWSlider& slider = *valueRow().slider();
    slider.setMaxValue(100.0);
    valueRow().startScrubberAction(slider);
    for (double v : {21.0, 24.0, 27.0}) slider.userSetDoubleValue(v);
    valueRow().endSliderAction(slider);
    EXPECT_DOUBLE_EQ(keyValue(*gain, 1.0), 27.0);
    expectOneUndoStep(*before);

    // A field being typed in keeps its text through updates.
    selectInGroup(gain, 0.5);
    RWTextField& field = valueRow().textField();
    const double was = field.doubleValue();
    field.selectText();
    field.insertText("4");
    gain->setKeyframeValue(gain->getKeyframe(position(0.5)), was + 5.0);
    group->update();
    EXPECT_DOUBLE_EQ(field.doubleValue(), 4.0) << "the typing stands";
    field.userAbandonEditing();
    group->update();
    EXPECT_DOUBLE_EQ(field.doubleValue(), was + 5.0) << "once left, the field follows again";
}

TEST_F(OverRangeRows, rows__follow_the_selection_and_the_position_row_moves_and_clamps) {
    EXPECT_FALSE(valueRow().isEnabled() || positionRow().isEnabled() ||
                 valueRow().textField().isEnabled());
    selectInGroup(gain, 0.5);
    EXPECT_TRUE(valueRow().isEnabled() && valueRow().slider()->isEnabled());
    EXPECT_EQ(shown(), (std::pair{30.0, 50.0}));
    selectInGroup(gain, 1.0);
    EXPECT_EQ(shown(), (std::pair{20.0, 100.0}));

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

    // The position row: a percent of the range, clamped to it.
    selectInGroup(gain, 0.5);
    const auto before = snapshot();
    positionRow().userEnterNumber("25");
    EXPECT_EQ(keyText(*gain), "0=10 0.25=30 1=20");
    EXPECT_EQ(shown(), (std::pair{30.0, 25.0}));
    expectOneUndoStep(*before);

    selectInGroup(gain, 0.5);
    positionRow().userEnterNumber("150");
    EXPECT_EQ(shown().second, 100.0) << "clamped to the range";
    selectInGroup(gain, 0.0);
    positionRow().userEnterNumber("-5");
    EXPECT_NE(gain->getKeyframe(position(0.0)), nullptr);
    EXPECT_EQ(shown().second, 0.0);
}

TEST_F(OverRangeRows, strip__reset_restores_the_channel_in_one_step_group_opens_from_it) {
    TQMiniCurveEditorStripController* strip = group->stripController();
    ASSERT_NE(strip, nullptr);
    auto want = snapshot();
    TQChannelRef(gain, object).getChannel(want.get())->reset(false);
    const auto before = snapshot();
    strip->resetButton().userClick();
    EXPECT_TRUE(*object == *want);
    EXPECT_EQ(std::pair(host.undoDescription(), recorder.captureBalance()),
              std::pair(TQLocalizedString("Undo Folder Reset"), 0));
    ASSERT_TRUE(host.undo());
    EXPECT_TRUE(*object == *before);

    // The group starts closed with the strip, and opens.
    auto state = [&] {
        return std::array{group->editorGroup()->isCollapsed(),
                          group->editorController()->isHidden(),
                          group->stripController()->isBorderHidden()};
    };
    EXPECT_EQ(state(), (std::array{true, true, false}));
    group->twiddle(true);
    EXPECT_EQ(state(), (std::array{false, false, true}));

    JNBuildContext hud(&bridge, true);
    auto heads = TQMakeOverRangeGroup<TQChannelDoubleOverRangeController>(gain, &recorder, hud);
    EXPECT_TRUE(!heads->headingController() && !heads->stripController() &&
                !heads->editorController()->isHidden());
    heads->update();  // a missing heading is skipped
}

TEST_F(OverRangeRows, pair__typed_sets_both_a_drag_keeps_the_ratio) {
    auto pairGroup =
        TQMakeOverRangeGroup<TQChannel2DOverRangeController>(gradient, &recorder, context);
    auto* folder = static_cast<TQFolderGroupController*>(pairGroup->yController());
    ASSERT_NE(folder, nullptr);
    EXPECT_TRUE(folder->enclosedGroup()->isCollapsed()) << "component rows start hidden";
    auto& prop = row<TQChan2DPropOverRangeScrubberController>(folder->heading());

    TQChannel* x = gradient->getXChannel();
    TQChannel* y = gradient->getYChannel();
    auto values = [&] { return std::pair{keyValue(*x, 0.5), keyValue(*y, 0.5)}; };
    setKeys(*x, {{0.5, 4.0}});
    setKeys(*y, {{0.5, 2.0}});
    select(*pairGroup, x, 0.5);
    RWSlider& slider = *prop.slider();
    slider.setMaxValue(100.0);
    prop.startScrubberAction(slider);
    EXPECT_DOUBLE_EQ(prop.ratio(), 0.5);
    slider.userSetDoubleValue(8.0);
    prop.endSliderAction(slider);
    EXPECT_EQ(values(), (std::pair{8.0, 4.0})) << "the drag keeps the ratio";

    prop.userEnterNumber("3");
    EXPECT_EQ(values(), (std::pair{3.0, 3.0})) << "a typed number sets both";

    // x 0 and y 4: the ratio is 0 and the trailing component is left alone.
    x->setKeyframeValue(x->getKeyframe(position(0.5)), 0.0);
    y->setKeyframeValue(y->getKeyframe(position(0.5)), 4.0);
    prop.startScrubberAction(slider);
    EXPECT_TRUE(prop.ratio() == 0.0 && !prop.isXMax());
    slider.userSetDoubleValue(6.0);
    prop.endSliderAction(slider);
    EXPECT_EQ(values(), (std::pair{0.0, 6.0}));

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
    select(*angleGroup, turn, 0.5);
    RWSlider& dial = *row<TQChanAngleOverRangeScrubberController>(angleGroup->yController()).dial();
    // The dial shows 360 - 5 = 355; turning it to 5 crosses its zero: ten degrees down.
    EXPECT_DOUBLE_EQ(dial.doubleValue(), 355.0);
    dial.userSetDoubleValue(5.0);
    EXPECT_NEAR(keyValue(*turn, 0.5) / degree, -5.0, 1e-9);
}

TEST_F(OverRangeRows, editorRow__refreshes_for_a_modified_child_of_a_folder) {
    TQChanMiniCurveEditorController row(gradient, &recorder, context);
    host.resetModifiedChannels();
    TQChanMiniCurveEditorController empty(nullptr, &recorder, context);
    EXPECT_FALSE(row.needsRefresh());
    gradient->getYChannel()->noteWillChange(true);
    EXPECT_TRUE(row.needsRefresh() && !empty.needsRefresh());
}

}  // namespace
