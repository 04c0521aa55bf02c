// The channel list beside the full editor on the sample project, driven as a user drives it:
// presses and drags at points of the list's cells, typed text, hovering; checked against what
// the editor's items, the channels, the curve sets and the host's undo then hold.
#include <gtest/gtest.h>

#include "platform/ui/RWCommandsController.h"
#include "src/channellist/TQCurveEditorScrubberCell.h"
#include "src/channellist/tests/ChannelListFixture.h"
#include "src/resources/TQStrings.h"

namespace {

using namespace channellist_test;

// The host's undo hears a value edit through the channel's manipulator, as a host that groups
// value edits into steps does.
class UndoingManipulator : public TQObjectManipulator {
public:
    explicit UndoingManipulator(TQHostAppDelegate& host) : _host(host) {}
    void beginValueEdit(TQChannelBase& channel, const BNString& undoText) override {
        _host.addChannelToUndo(&channel, undoText);
        ++edits;
    }
    int edits = 0;

private:
    TQHostAppDelegate& _host;
};

TEST_F(ChannelListTest, rows__theSelectedSetOpenedWithSwatchesAndValues) {
    ASSERT_GT(list.numberOfRows(), 1);
    auto* root = dynamic_cast<TQCurveEditorFolderItem*>(itemAt(0));
    ASSERT_NE(root, nullptr) << "the first row is the object";
    EXPECT_EQ(list.numberOfRows(), 1 + static_cast<int64_t>(root->numberOfChildren()))
        << "an object that is not collapsed opens";
    const int64_t value = list.columnWithIdentifier(Ctrl::kValueColumn);
    auto* valueCell = dynamic_cast<TQCurveEditorScrubberCell*>(list.preparedCellAtColumn(value, 0));
    ASSERT_NE(valueCell, nullptr);
    EXPECT_FALSE(valueCell->showCell()) << "a folder row has no value";
    auto* item = dynamic_cast<TQCurveEditorChannelItem*>(itemAt(1));
    list.preparedCellAtColumn(value, 1);
    EXPECT_TRUE(valueCell->showCell());
    EXPECT_EQ(valueCell->stringValue(), *controller.valueFormatter().stringForObjectValue(
                                            item->currentValue() * item->conversionFactor()));
}

TEST_F(ChannelListTest, selection__listAndCurvesInStep) {
    const int64_t first = 1, second = 2;
    click(Ctrl::kNameColumn, first);
    click(Ctrl::kNameColumn, second, RWEventModifierFlagCommand);
    EXPECT_EQ(selectedNames(), (std::vector<std::string>{itemAt(first)->simpleName(),
                                                         itemAt(second)->simpleName()}));
    // The other way: a keypoint of one curve selected in the view selects its row alone.
    auto entry = std::make_shared<TQCurveSelection>();
    entry->setCurveId(itemAt(second)->channelId());
    TQCurveSelectionList keypoints;
    keypoints.addSelection(entry);
    ctrl.selectionChangedTo(&keypoints);
    EXPECT_EQ(list.selectedRowIndexes(), (RWIndexSet{second}));
    EXPECT_EQ(selectedNames(), std::vector<std::string>{itemAt(second)->simpleName()});
    // A press below the last row selects nothing.
    list.mouseDown(RWEvent::mouseEvent(
        RWEventType::LeftMouseDown,
        list.convertPointToWindow(CGPointMake(20, list.bounds().size.height + 5))));
    EXPECT_TRUE(list.selectedRowIndexes().empty());
    EXPECT_TRUE(selectedNames().empty());
}

TEST_F(ChannelListTest, showBoxes__folderTriStateGroupToggleAndSolo) {
    const int64_t show = list.columnWithIdentifier(Ctrl::kShowColumn);
    auto state = [&](int64_t row) {
        return static_cast<RWButtonCell*>(list.preparedCellAtColumn(show, row))->state();
    };
    // One channel off: the folder's box is mixed; a click on the folder shows them all.
    click(Ctrl::kShowColumn, 1);
    EXPECT_EQ(std::pair(state(0), state(1)), (std::pair<int, int>(RWMixedState, RWOffState)));
    click(Ctrl::kShowColumn, 0);
    EXPECT_EQ(std::pair(state(0), state(1)), (std::pair<int, int>(RWOnState, RWOnState)));
    // Among selected rows every box takes the opposite of the clicked one.
    click(Ctrl::kNameColumn, 1);
    click(Ctrl::kNameColumn, 3, RWEventModifierFlagShift);
    click(Ctrl::kShowColumn, 2);
    EXPECT_EQ((std::vector{state(1), state(2), state(3), state(4)}),
              (std::vector<int>{RWOffState, RWOffState, RWOffState, RWOnState}));
    EXPECT_EQ(list.selectedRowIndexes(), (RWIndexSet{1, 2, 3}));
    // Option solos the row and selects it alone; again shows everything.
    ctrl.selectedCurveSet()->enableAll(true, nullptr);
    click(Ctrl::kShowColumn, 2, RWEventModifierFlagOption);
    EXPECT_TRUE(ctrl.numberOfEnabledChannels() == 1u && state(2) == RWOnState);
    EXPECT_EQ(list.selectedRowIndexes(), (RWIndexSet{2}));
    click(Ctrl::kShowColumn, 2, RWEventModifierFlagOption);
    EXPECT_EQ(ctrl.numberOfEnabledChannels(), ctrl.numberOfChannelItems());
}

TEST_F(ChannelListTest, valueEdits__typedOrScrubbedOneUndoStepAtTheCurrentTime) {
    const int64_t value = list.columnWithIdentifier(Ctrl::kValueColumn);
    UndoingManipulator manipulator(host);
    host.setCurrentTime(TQTarnTimeForChannelSeconds(2.5, 0x40000));
    auto type = [&](int64_t row, const std::string& text) {
        list.editColumn(value, row, true);
        list.userEndEditing(text, RWReturnTextMovement);
    };
    {  // No number, or the number shown (in display units, here the channel's): no change.
        int64_t row = 1;
        while (dynamic_cast<TQCurveEditorChannelItem*>(itemAt(row))->conversionFactor() != 1.0)
            ++row;
        TQChannel* channel = itemAt(row)->channel();
        channel->setObjectManipulator(&manipulator);
        const std::unique_ptr<TQChannelBase> before(channel->cloneChannel());
        type(row, "abc");
        list.editColumn(value, row, true);
        type(row, list.editingText());
        EXPECT_TRUE(*channel == *before && manipulator.edits == 0 && !host.canUndo());
        channel->setObjectManipulator(nullptr);
    }
    const int64_t row = rowOf("Opacity");
    ASSERT_GE(row, 0);
    auto* item = dynamic_cast<TQCurveEditorChannelItem*>(itemAt(row));
    TQChannel* channel = item->channel();
    channel->setObjectManipulator(&manipulator);
    const std::unique_ptr<TQChannelBase> before(channel->cloneChannel());
    const unsigned keys = channel->numberOfKeyframes();
    // Undo takes back one step of the rows' name, to the channel as it was.
    auto undoOneStep = [&] {
        EXPECT_EQ(host.undoDescription(), TQLocalizedString("Undo Set Value"));
        ASSERT_TRUE(host.undo());
        EXPECT_EQ(*channel, *before);
        EXPECT_FALSE(host.canUndo()) << "one step";
    };
    type(row, "25");
    EXPECT_EQ(channel->numberOfKeyframes(), keys + 1) << "a keyframe at the playhead";
    EXPECT_DOUBLE_EQ(item->currentValue() * item->conversionFactor(), 25.0)
        << "typed in display units";
    EXPECT_FALSE(list.isEditing()) << "Return does not move the edit to the next row";
    undoOneStep();
    channel->setObjectManipulator(nullptr);

    SCOPED_TRACE("a drag in the value cell scrubs, as one step");
    host.setCurrentTime(kCMTimeZero);  // where the title is still fading in
    const double start = item->currentValue();
    const CGPoint from = at(Ctrl::kValueColumn, row), to = from + CGPointMake(20, 0);
    press(from, to, {from + CGPointMake(2, 0), from + CGPointMake(10, 0), to});
    // Five steps of the channel's nudge step (a hundredth of opacity).
    EXPECT_NEAR(item->currentValue(), start + 5 * 0.01, 1e-9);
    EXPECT_FALSE(list.isEditing()) << "a scrub is no click: no edit starts";
    undoOneStep();
}

TEST_F(ChannelListTest, dragOut__leavesCustomSetNotScene) {
    auto dragName = [&](int64_t row, const CGPoint& to) {
        press(at(Ctrl::kNameColumn, row), to, {to});
    };
    const CGPoint outside = list.convertPointToWindow(CGPointMake(-50, 30));
    // An automatic set takes no changes by hand.
    const uint32_t automatic = ctrl.numberOfChannelItems();
    dragName(1, outside);
    EXPECT_EQ(ctrl.numberOfChannelItems(), automatic);
    ctrl.cloneCurveSetWithName("Mine");
    ctrl.updateUI();
    const uint32_t count = ctrl.numberOfChannelItems();
    const std::string name = itemAt(2)->simpleName();
    TQChannelBase* channel = itemAt(2)->channelBase();
    dragName(2, at(Ctrl::kValueColumn, 4));
    EXPECT_EQ(ctrl.numberOfChannelItems(), count) << "a drop inside the list does nothing";
    dragName(2, outside);
    EXPECT_EQ(ctrl.numberOfChannelItems(), count - 1);
    EXPECT_EQ(ctrl.selectedCurveSet()->itemWithChannel(channel), nullptr);
    EXPECT_NE(channel->getParent(), nullptr) << "the channel stays in the scene";
    EXPECT_EQ(rowOf(name), -1) << "the list shows the set again";
}

TEST_F(ChannelListTest, routing__byColumnAndModifier) {
    // Control in Name is a right press: it selects nothing.
    click(Ctrl::kNameColumn, 2);
    click(Ctrl::kNameColumn, 3, RWEventModifierFlagControl);
    EXPECT_EQ(list.selectedRowIndexes(), (RWIndexSet{2}));
    // Shift in Value is a plain click: the row alone.
    click(Ctrl::kValueColumn, 4, RWEventModifierFlagShift);
    EXPECT_EQ(list.selectedRowIndexes(), (RWIndexSet{4}));
    click(Ctrl::kKeyColumn, 1);  // no status cell here: the press only selects
    EXPECT_EQ(list.selectedRowIndexes(), (RWIndexSet{1}));
    EXPECT_FALSE(controller.mouseDown() || controller.cellClickedChannel());
    // The arrows run a bound command instead of moving the selection.
    int ran = 0;
    auto command = std::make_shared<RWCommand>("next frame", 0xF703, 0, [&] {
        ++ran;
        return true;
    });
    RWCommandsController::sharedController().addCommand(command);
    list.keyDown(RWEvent::keyEvent(RWEventType::KeyDown, "\xEF\x9C\x83"));
    RWCommandsController::sharedController().removeCommand("next frame");
    EXPECT_EQ(ran, 1);
    list.keyDown(RWEvent::keyEvent(RWEventType::KeyDown, "\xEF\x9C\x81"));  // down arrow
    EXPECT_EQ(list.selectedRowIndexes(), (RWIndexSet{2}));
}

}  // namespace
