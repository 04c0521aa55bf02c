// The "Key" and "Menu" cells of the channel list on the sample project: what each draws for
// the row under the pointer, the three parts of the key cell pressed as a user presses them,
// and the animation menu opened from a row, read back item by item for the selections that
// change it.

#include <memory>
#include <string>
#include <vector>

#include "src/channellist/TQCurveEditorAnimStatusCell.h"
#include "src/channellist/tests/ChannelListFixture.h"
#include "src/resources/TQStrings.h"

namespace {

using namespace channellist_test;

CMTime sec(double s) { return CMTimeMakeWithSeconds(s, 600); }

// The images a cell asked for, by name.
class RecordingDrawing : public RWCellDrawing {
public:
    bool shouldAntialias() const override { return true; }
    void setShouldAntialias(bool) override {}
    void fillRect(const CGRect&, const RWColor&) override {}
    void strokeRect(const CGRect&, const RWColor&, double) override {}
    void drawText(const std::string&, const CGRect&, RWTextAlignment, bool) override {}
    void drawImage(const std::string& name, const CGRect&, double) override {
        images.push_back(name);
    }
    std::vector<std::string> images;
};

// The menus the list was asked to show.
class MenuObserver : public RWOutlineViewObserver {
public:
    void outlinePopUpContextMenu(RWOutlineView&, const RWMenuPtr& menu, const CGPoint&) override {
        shown = menu;
    }
    RWMenuPtr shown;
};

class AnimStatusCells : public ChannelListTest {
protected:
    void SetUp() override {
        ChannelListTest::SetUp();
        list.tableColumnWithIdentifier(Ctrl::kKeyColumn)->setDataCell(keyCell);
        list.tableColumnWithIdentifier(Ctrl::kMenuColumn)->setDataCell(menuCell);
        list.addOutlineObserver(&menus);
        row = rowOf("Opacity");
        ASSERT_GT(row, 0);
        channel = itemAt(row)->channel();
        channel->deleteAllKeyframes(kCMTimeZero);
        for (const double t : {1.0, 2.0, 3.0}) channel->setKeyframe(sec(t), t);
        host.undoStack().clear();
    }
    void TearDown() override {
        list.removeOutlineObserver(&menus);
        ChannelListTest::TearDown();
    }
    CGRect frame(const char* column, int64_t r) const {
        return list.frameOfCellAtColumn(list.columnWithIdentifier(column), r);
    }
    // The pointer over the key cell's part at x points from its left edge.
    CGPoint keyPoint(double x) const {
        const CGRect f = frame(Ctrl::kKeyColumn, row);
        return list.convertPointToWindow(CGPointMake(f.origin.x + x, f.origin.y + 5));
    }
    void pressKey(double x) {
        moveTo(keyPoint(x));
        press(keyPoint(x), keyPoint(x));
    }
    std::vector<std::string> drawn(const char* column, int64_t r) {
        RecordingDrawing drawing;
        list.preparedCellAtColumn(list.columnWithIdentifier(column), r)
            ->drawWithFrame(frame(column, r), drawing);
        return drawing.images;
    }
    RWMenuPtr openMenu(int64_t r) {
        menus.shown.reset();
        list.rightMouseDown(
            RWEvent::mouseEvent(RWEventType::RightMouseDown, at(Ctrl::kMenuColumn, r)));
        return menus.shown;
    }
    // The item of the animation menu's key "Anim Menu <name>", in any submenu.
    static RWMenuItemPtr item(const RWMenuPtr& menu, const std::string& name) {
        const std::string title = TQLocalizedString("Anim Menu " + name);
        for (const RWMenuItemPtr& i : menu->itemArray()) {
            if (i->title() == title) return i;
            if (i->hasSubmenu())
                if (RWMenuItemPtr found = item(i->submenu(), name)) return found;
        }
        return nullptr;
    }
    // The named items of the row's menu, each as its state (M mixed, 1 on, 0 off) and whether
    // it is enabled (+ or -).
    std::string states(std::initializer_list<const char*> names) {
        const RWMenuPtr menu = openMenu(row);
        std::string out;
        for (const char* name : names) {
            const RWMenuItemPtr i = item(menu, name);
            if (!i) return out + "?" + name;
            out += i->state() == RWMixedState ? 'M' : i->state() == RWOnState ? '1' : '0';
            out += i->isEnabled() ? '+' : '-';
        }
        return out;
    }

    std::shared_ptr<TQCurveEditorAnimStatusCell> keyCell =
        std::make_shared<TQCurveEditorAnimStatusCell>(&ctrl);
    std::shared_ptr<TQCurveEditorAnimMenuCell> menuCell =
        std::make_shared<TQCurveEditorAnimMenuCell>(&ctrl);
    MenuObserver menus;
    int64_t row = -1;
    TQChannel* channel = nullptr;
};

TEST_F(AnimStatusCells, hover__parts_and_tips_of_the_key_cell_and_arrows_and_menu_drawn_only_so) {
    host.setCurrentTime(sec(2));
    EXPECT_EQ(drawn(Ctrl::kKeyColumn, row), (std::vector<std::string>{"AnimStatusKeyframe"}));
    EXPECT_TRUE(drawn(Ctrl::kMenuColumn, row).empty()) << "not under the pointer";

    using L = TQCurveEditorChannelList;
    const struct {
        double x;
        int part;
        const char* tip;
    } parts[] = {{5, L::kPartPrevious, "Anim Tool Tip Previous Keyframe"},
                 {25, L::kPartNext, "Anim Tool Tip Next Keyframe"},
                 {45, L::kPartAddOrDelete, "Anim Tool Tip Delete Keyframe"},
                 {-30, L::kPartOutside, nullptr}};
    for (const auto& p : parts) {
        moveTo(keyPoint(p.x));
        EXPECT_EQ(controller.mouseInRow(), row);
        EXPECT_EQ(controller.mouseInPartIndex(), p.part) << p.x;
        EXPECT_EQ(list.toolTip(), p.tip ? std::optional(TQLocalizedString(p.tip)) : std::nullopt);
    }
    EXPECT_EQ(controller.mouseInChan(), channel);

    host.setCurrentTime(sec(2.5));
    moveTo(keyPoint(45));
    EXPECT_EQ(list.toolTip(), TQLocalizedString("Anim Tool Tip Add Keyframe"));
    EXPECT_EQ(
        drawn(Ctrl::kKeyColumn, row),
        (std::vector<std::string>{"AnimStatusPrevious", "AnimStatusNext", "AnimStatusNoKeyframe"}));
    EXPECT_EQ(drawn(Ctrl::kMenuColumn, row),
              (std::vector<std::string>{TQCurveEditorAnimMenuCell::kMenuImage}));

    // The object's row is a folder: neither cell draws, hovered or not.
    moveTo(at(Ctrl::kMenuColumn, 0));
    EXPECT_TRUE(drawn(Ctrl::kKeyColumn, 0).empty());
    EXPECT_TRUE(drawn(Ctrl::kMenuColumn, 0).empty());
    list.mouseLeftView(RWEvent::mouseEvent(RWEventType::MouseExited, CGPointZero));
    EXPECT_EQ(controller.mouseInRow(), Ctrl::kNone);
    EXPECT_EQ(controller.mouseInChan(), nullptr);
}

TEST_F(AnimStatusCells, key_parts__step_between_keyframes_and_add_or_delete_one_undoably) {
    host.setCurrentTime(sec(2.5));
    pressKey(5);  // previous
    EXPECT_DOUBLE_EQ(CMTimeGetSeconds(host.currentTime()), 2.0);
    pressKey(27);  // next, the middle third
    EXPECT_DOUBLE_EQ(CMTimeGetSeconds(host.currentTime()), 3.0);
    EXPECT_FALSE(host.canUndo()) << "moving the playhead is no edit";

    const std::unique_ptr<TQChannelBase> keyed(channel->cloneChannel());
    host.setCurrentTime(sec(2.5));
    pressKey(45);  // no keyframe here: added
    EXPECT_EQ(channel->numberOfKeyframes(), 4u);
    EXPECT_EQ(host.undoDescription(), TQLocalizedString("Undo Chan Menu Add Keyframe"));
    pressKey(45);  // now there is one: deleted
    EXPECT_TRUE(*channel == *keyed);
    ASSERT_TRUE(host.undo());
    EXPECT_EQ(channel->numberOfKeyframes(), 4u);
    ASSERT_TRUE(host.undo());
    EXPECT_TRUE(*channel == *keyed);

    // A press released in another part does nothing.
    press(keyPoint(5), keyPoint(27));
    EXPECT_DOUBLE_EQ(CMTimeGetSeconds(host.currentTime()), 2.5);
}

TEST_F(AnimStatusCells, menu__built_for_the_selection_and_its_items_reach_the_editor) {
    const RWMenuPtr menu = openMenu(row);
    ASSERT_TRUE(menu);
    EXPECT_EQ(menu->itemAtIndex(0)->title(), TQLocalizedString("Anim Menu Reset Channel"));
    // An animated channel, unlocked, alone, without a ghost.
    EXPECT_EQ(states({"Disable Animation", "Lock Channel", "KEYFRAMES", "Set To Ghost",
                      "Simplify Channel"}),
              "0+0+0-0-0+");

    const RWMenuItemPtr linear = item(menu, "Interpolation Linear");
    RWMenu* interpolation = linear->menu();
    interpolation->performActionForItemAtIndex(interpolation->indexOfItem(*linear));
    EXPECT_EQ(std::tuple(channel->getInterpolation(), linear->state(), host.undoDescription()),
              std::tuple(unsigned{kTQInterpolationLinear}, int32_t{RWOnState},
                         TQLocalizedString("Undo Set Interpolation")));

    // No selected channel: no menu.
    ctrl.deselectAllChannels();
    list.deselectAll();
    EXPECT_FALSE(TQCurveEditorAnimStatusCell(&ctrl).newMenuUseImages(true));
}

TEST_F(AnimStatusCells, validation__locked_mixed_and_several_channels) {
    int64_t other = -1;
    for (int64_t r = 1; r < list.numberOfRows() && other < 0; ++r)
        if (r != row && dynamic_cast<TQCurveEditorChannelItem*>(itemAt(r))) other = r;
    ASSERT_GT(other, 0);
    TQChannel* second = itemAt(other)->channel();
    second->deleteAllKeyframes(kCMTimeZero);
    second->setKeyframe(sec(1), 0);
    second->setKeyframe(sec(2), 1);
    channel->setInterpolation(kTQInterpolationLinear);
    second->setInterpolation(kTQInterpolationBezier);
    list.selectRowIndexes(RWIndexSet{row}, false);
    list.selectRowIndexes(RWIndexSet{other}, true);
    host.setCurrentTime(sec(2));
    // Two channels, Linear and Bezier, both keyed at 2 s.
    EXPECT_EQ(
        states({"Interpolation Linear", "Interpolation Bezier", "Interpolation Constant",
                "Simplify Channel", "Extrapolation Generate", "Delete Keyframe", "Add Keyframe"}),
        "M+M+0+0-0-0+0-");
    // One channel whose keyframes differ marks each kind it holds.
    channel->setKeyframeInterpolation(channel->getKeyframe(sec(1)), kTQInterpolationCatmullRom);
    list.selectRowIndexes(RWIndexSet{row}, false);
    EXPECT_EQ(states({"Interpolation Catmull Rom", "Interpolation Linear", "Interpolation Bezier"}),
              "M+M+0+");
    // One of two locked: still Lock, mixed, and edits stay allowed.
    second->setLocked(true);
    list.selectRowIndexes(RWIndexSet{row, other}, false);
    EXPECT_EQ(states({"Lock Channel", "Reset Channel"}), "M+0+");
    // All locked: Unlock, and nothing that edits; moving time is fine.
    channel->setLocked(true);
    EXPECT_EQ(states({"Unlock Channel", "Reset Channel", "Add Keyframe", "Delete Keyframe",
                      "Disable Animation", "Interpolation Linear", "Extrapolation Repeat",
                      "Simplify Channel", "Next Keyframe"}),
              "0+0-0-0-0-M-0-0-0+");
}

TEST_F(AnimStatusCells, folder_keyframes__hidden_children_do_not_count) {
    TQChannelFolder* folder = channel->getParent();
    ASSERT_TRUE(folder);
    TQCurveEditorAnimStatusCell cell(&ctrl);
    EXPECT_TRUE(cell.hasKeypointAtTime(sec(2), folder, false));
    for (TQChannelBase* child : *folder->getChildren()) {
        CMTime two = sec(2);
        auto* c = dynamic_cast<TQChannel*>(child);
        if (c && c->hasKeyframeAtTime(&two)) child->setFlag(kTQChannelFlagHidden);
    }
    EXPECT_FALSE(cell.hasKeypointAtTime(sec(2), folder, false));
    EXPECT_FALSE(cell.hasKeypointAtTime(sec(2), nullptr, true));
}

}  // namespace
