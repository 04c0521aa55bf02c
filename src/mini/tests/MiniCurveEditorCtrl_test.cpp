// The mini editor's controller through its container, on the reference host: what a channel
// or a folder puts in the private set, the default menu and its commands as undo steps over
// every channel, and the value edits the rows make on the selected keypoints.

#include <functional>
#include <string>

#include "platform/channels/TQChannelRef.h"
#include "src/engine/TQEditBrackets.h"
#include "src/mini/tests/MiniFixture.h"
#include "src/resources/TQStrings.h"
#include "tests/support/SceneText.h"

using namespace mini_test;

namespace {

class MiniCtrl : public MiniFixture {};

TEST_F(MiniCtrl, setChannel__a_channel_or_a_folder_fills_the_private_set) {
    gain->setXAxisLabel("Position");
    editor.setChannel(gain);
    EXPECT_EQ(
        std::tuple(ctrl().numberOfChannelItems(), ctrl()._linked, ctrl().getCurrentTool(),
                   ctrl().selectedCurveSet()->curveSetName(), editor.axisY().stringValue(),
                   editor.axisX().stringValue(), view().getController(), view().curveEditor()),
        std::tuple(1u, true, TQTool::kEdit, TQLocalizedString("Curve Editor Curve Set Untitled"),
                   "Gain", "Position", editor.controller(), &editor));
    editor.setChannel(gradient);
    EXPECT_EQ(ctrl().numberOfChannelItems(), 2u) << "both components of the pair";
    const auto item = ctrl().selectedCurveSet()->itemWithChannel(gradient->getXChannel());
    ASSERT_NE(item, nullptr);
    EXPECT_FALSE(static_cast<TQCurveEditorChannelItem&>(*item).drawProcessedCurve());
    editor.setChannel(nullptr);
    EXPECT_FALSE(ctrl().numberOfChannelItems() || editor.hasSelection())
        << "a null channel is an empty folder";
}

TEST_F(MiniCtrl, defaultMenu__extrapolation_submenus_reflect_the_first_channel) {
    editor.setChannel(gradient);
    gradient->getXChannel()->setExtrapolation(kTQExtrapolationPingPong, kTQExtrapolationBefore);
    const RWMenuPtr& menu = ctrl().getDefaultMenu();
    ASSERT_EQ(menu->itemArray().size(), 2u);
    EXPECT_EQ(menu->itemArray()[0]->title(), TQLocalizedString("Anim Menu Pre Extrapolation"));
    std::string states;  // of the pre and the post extrapolation submenus
    for (const RWMenuItemPtr& side : menu->itemArray()) {
        for (const RWMenuItemPtr& item : side->submenu()->itemArray()) {
            EXPECT_TRUE(ctrl().validateDefaultMenuItem(*item));
            states += std::to_string(item->state());
        }
        states += " ";
    }
    EXPECT_EQ(states, "00100 10000 ");

    // Without a channel nothing is valid, and the states stay as they were.
    editor.setChannel(nullptr);
    RWMenuItem& pingPong = *ctrl().getDefaultMenu()->itemArray()[0]->submenu()->itemArray()[2];
    pingPong.setState(1);
    EXPECT_TRUE(!ctrl().validateDefaultMenuItem(pingPong) && pingPong.state() == 1);
    RWMenuItem del("Delete", "delete:");
    EXPECT_TRUE(ctrl().validateMenuItem(del));
}

TEST_F(MiniCtrl, menu_commands__every_channel_in_one_undo_step) {
    editor.setChannel(gradient);
    const struct {
        const char* action;
        int64_t tag;
        const char* undoKey;
        std::function<void(TQChannel&)> expect;
    } rows[] = {
        {"menuSetCurvePreExtrapolation:", kTQExtrapolationRepeat, "Undo Set Pre Extrapolation",
         [](TQChannel& c) { c.setExtrapolation(kTQExtrapolationRepeat, kTQExtrapolationBefore); }},
        {"menuSetCurvePostExtrapolation:", kTQExtrapolationLinear, "Undo Set Post Extrapolation",
         [](TQChannel& c) { c.setExtrapolation(kTQExtrapolationLinear, kTQExtrapolationAfter); }},
        {"menuSetCurveInterpolation:channel:", kTQInterpolationLinear, "Undo Set Interpolation",
         [](TQChannel& c) { c.setInterpolation(kTQInterpolationLinear); }},
        {"menuLockChannel:channel:", 0, "Undo Lock Keypoint",
         [](TQChannel& c) { c.setLocked(true, true); }},
    };
    for (const auto& row : rows) {
        SCOPED_TRACE(row.action);
        const auto before = snapshot();
        auto want = snapshot();
        auto& pair = static_cast<TQChannel2DOverRange&>(
            *TQChannelRef(gradient, object).getChannel(want.get()));
        row.expect(*pair.getXChannel());
        row.expect(*pair.getYChannel());
        recorder.clearCalls();
        RWMenuItem sender("", row.action);
        sender.setTag(row.tag);
        ASSERT_TRUE(ctrl().performAction(row.action, sender));
        EXPECT_TRUE(*object == *want);
        ASSERT_FALSE(recorder.bracketSequence().empty());
        EXPECT_EQ(std::tuple(recorder.captureBalance(), recorder.bracketSequence().back(),
                             host.undoDescription()),
                  std::tuple(0, "postNotification(0x8)", TQLocalizedString(row.undoKey)));
        ASSERT_TRUE(host.undo());
        EXPECT_TRUE(*object == *before) << "undo gives the scene back exactly";
    }
    // Locking: every channel takes the opposite of the first one's state, whatever its own.
    gradient->getYChannel()->setLocked(true, true);
    RWMenuItem lock("", "menuLockChannel:channel:");
    for (const bool locked : {true, false}) {
        ctrl().performAction(lock.action(), lock);
        EXPECT_EQ(std::pair(gradient->getXChannel()->isLocked(false),
                            gradient->getYChannel()->isLocked(false)),
                  std::pair(locked, locked));
    }

    SCOPED_TRACE("the chosen interpolation is ticked; the mixed tag does nothing");
    editor.setChannel(gain);
    RWMenu menu;
    const RWMenuItemPtr linear =
        menu.addItemWithTitle("Linear", "menuSetCurveInterpolation:channel:", "");
    linear->setTag(kTQInterpolationLinear);
    const RWMenuItemPtr mixed =
        menu.addItemWithTitle("Mixed", "menuSetCurveInterpolation:channel:", "");
    mixed->setTag(TQMiniCurveEditorCtrl::kMixedInterpolationTag);
    mixed->setState(1);
    recorder.clearCalls();
    ctrl().performAction(mixed->action(), *mixed);
    EXPECT_TRUE(recorder.calls().empty()) << "not even a bracket";
    ctrl().performAction(linear->action(), *linear);
    EXPECT_EQ(std::tuple(gain->getInterpolation(), linear->state(), mixed->state()),
              std::tuple(unsigned{kTQInterpolationLinear}, 1, 0));
}

TEST_F(MiniCtrl, selection__mirrored_onto_items_and_read_by_the_rows) {
    editor.setChannel(gain);
    recorder.clearCalls();
    selectKeys(editor, gain, {0.5});
    // What the rows read: the selection, its position and value.
    const auto read = [&] {
        return std::tuple(ctrl().numberOfSelectedChannels(), editor.hasSelection(),
                          CMTimeGetSeconds(editor.getSelectedValueX()), editor.getSelectedValueY());
    };
    EXPECT_EQ(recorder.count("postNotification"), 1u);
    EXPECT_EQ(read(), std::tuple(1u, true, 0.5, 30.0));

    // Tangent entries count as a selection, but give no position.
    view().getSelection()->getSelectionArray().front()->setFlags(TQSelectionOutTangent);
    EXPECT_EQ(read(), std::tuple(1u, true, 0.0, 0.0));

    view().getSelection()->reset();
    ctrl().selectionChangedTo(view().getSelection());
    EXPECT_EQ(ctrl().numberOfSelectedChannels(), 0u);
}

TEST_F(MiniCtrl, move__primary_takes_the_value_others_keep_their_distance_pairs_move_whole) {
    editor.setChannel(gain);
    selectKeys(editor, gain, {0.5, 1.0});
    editor.setSelectedValueY(40.0);
    EXPECT_EQ(keyText(*gain), "0=10 0.5=40 1=30") << "unselected keypoints stay";

    // In x a linked pair moves as a whole.
    editor.setChannel(gradient);
    TQChannel* x = gradient->getXChannel();
    TQChannel* y = gradient->getYChannel();
    setKeys(*x, {{0.4, 2.0}});
    setKeys(*y, {{0.4, 1.5}});
    selectKeys(editor, x, {0.4});
    editor.setSelectedValueX(position(0.6));
    editor.didEndModifyingSelectedX();
    // 0.6 is 0.599998 on the channels' tick grid.
    EXPECT_EQ(keyText(*x) + "; " + keyText(*y), "0=0 0.599998=2 1=4; 0=1 0.599998=1.5 1=2");
}

TEST_F(MiniCtrl, staleSelection__after_undo_or_a_deleted_channel_reads_as_nothing) {
    editor.setChannel(gain);
    setKeys(*gain, {{0.25, 5.0}});
    {
        TQCaptureGuard capture(&recorder, "Undo Move Keypoint");
        TQChannelEditGuard edit(&recorder, gain);
        gain->setKeyframe(position(0.75), 8.0);
    }
    selectKeys(editor, gain, {0.75});
    ASSERT_TRUE(host.undo());
    EXPECT_EQ(CMTimeCompare(editor.getSelectedValueX(), kCMTimeZero), 0);
    editor.setSelectedValueY(3.0);  // a stale list is a no-op
    EXPECT_DOUBLE_EQ(keyValue(*gain, 0.25), 5.0);
    view().update();

    selectKeys(editor, gain, {0.5});
    object->removeChild(gain);
    gain = nullptr;
    EXPECT_EQ(CMTimeCompare(editor.getSelectedValueX(), kCMTimeZero), 0);
    editor.setSelectedValueY(3.0);
    editor.setSelectedValueX(position(0.2));
    editor.update();
    EXPECT_TRUE(view().getSelection()->empty());
}

}  // namespace
