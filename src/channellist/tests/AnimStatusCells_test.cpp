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
    static RWMenuItemPtr item(const RWMenuPtr& menu, const char* key) {
        const std::string title = TQLocalizedString(key);
        for (const RWMenuItemPtr& i : menu->itemArray()) {
            if (i->title() == title) return i;
            if (i->hasSubmenu())
                if (RWMenuItemPtr found = item(i->submenu(), key)) return found;
        }
        return nullptr;
    }

    std::shared_ptr<TQCurveEditorAnimStatusCell> keyCell =
        std::make_shared<TQCurveEditorAnimStatusCell>(&ctrl);
    std::shared_ptr<TQCurveEditorAnimMenuCell> menuCell =
        std::make_shared<TQCurveEditorAnimMenuCell>(&ctrl);
    MenuObserver menus;
    int64_t row = -1;
    TQChannel* channel = nullptr;
};

TEST_F(AnimStatusCells, drawing__key_mark_at_the_playhead_and_arrows_and_menu_on_hover_only) {
    host.setCurrentTime(sec(2));
    EXPECT_EQ(drawn(Ctrl::kKeyColumn, row), (std::vector<std::string>{"AnimStatusKeyframe"}));
    EXPECT_TRUE(drawn(Ctrl::kMenuColumn, row).empty()) << "not under the pointer";

    moveTo(keyPoint(5));
    host.setCurrentTime(sec(2.5));
    EXPECT_EQ(
        drawn(Ctrl::kKeyColumn, row),
        (std::vector<std::string>{"AnimStatusPrevious", "AnimStatusNext", "AnimStatusNoKeyframe"}));
    EXPECT_EQ(drawn(Ctrl::kMenuColumn, row),
              (std::vector<std::string>{TQCurveEditorAnimMenuCell::kMenuImage}));

    // The object's row is a folder: neither cell draws, hovered or not.
    moveTo(at(Ctrl::kMenuColumn, 0));
    EXPECT_TRUE(drawn(Ctrl::kKeyColumn, 0).empty());
    EXPECT_TRUE(drawn(Ctrl::kMenuColumn, 0).empty());
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
    EXPECT_TRUE(item(menu, "Anim Menu Disable Animation")) << "the channel is animated";
    EXPECT_TRUE(item(menu, "Anim Menu Lock Channel"));
    EXPECT_FALSE(item(menu, "Anim Menu KEYFRAMES")->isEnabled());
    EXPECT_FALSE(item(menu, "Anim Menu Set To Ghost")->isEnabled()) << "no ghosts are kept";
    EXPECT_TRUE(item(menu, "Anim Menu Simplify Channel")->isEnabled()) << "one channel";

    const RWMenuItemPtr linear = item(menu, "Anim Menu Interpolation Linear");
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
    // Each item's state or enabled flag: M mixed, 1 on, 0 off; + enabled, - disabled.
    auto states = [&](std::initializer_list<const char*> keys) {
        const RWMenuPtr menu = openMenu(row);
        std::string out;
        for (const char* key : keys) {
            const RWMenuItemPtr i = item(menu, key);
            if (!i) return out + "?" + key;
            out += i->state() == RWMixedState ? 'M' : i->state() == RWOnState ? '1' : '0';
            out += i->isEnabled() ? '+' : '-';
        }
        return out;
    };
    // Two channels, Linear and Bezier, both keyed at 2 s.
    EXPECT_EQ(states({"Anim Menu Interpolation Linear", "Anim Menu Interpolation Bezier",
                      "Anim Menu Interpolation Constant", "Anim Menu Simplify Channel",
                      "Anim Menu Extrapolation Generate", "Anim Menu Delete Keyframe",
                      "Anim Menu Add Keyframe"}),
              "M+M+0+0-0-0+0-");
    // One channel whose keyframes differ marks each kind it holds.
    channel->setKeyframeInterpolation(channel->getKeyframe(sec(1)), kTQInterpolationCatmullRom);
    list.selectRowIndexes(RWIndexSet{row}, false);
    EXPECT_EQ(states({"Anim Menu Interpolation Catmull Rom", "Anim Menu Interpolation Linear",
                      "Anim Menu Interpolation Bezier"}),
              "M+M+0+");
    // One of two locked: still Lock, mixed, and edits stay allowed.
    second->setLocked(true);
    list.selectRowIndexes(RWIndexSet{row, other}, false);
    EXPECT_EQ(states({"Anim Menu Lock Channel", "Anim Menu Reset Channel"}), "M+0+");
    // All locked: Unlock, and nothing that edits; moving time is fine.
    channel->setLocked(true);
    EXPECT_EQ(
        states({"Anim Menu Unlock Channel", "Anim Menu Reset Channel", "Anim Menu Add Keyframe",
                "Anim Menu Delete Keyframe", "Anim Menu Disable Animation",
                "Anim Menu Interpolation Linear", "Anim Menu Extrapolation Repeat",
                "Anim Menu Simplify Channel", "Anim Menu Next Keyframe"}),
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
