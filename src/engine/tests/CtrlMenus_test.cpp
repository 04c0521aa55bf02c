// The context menus as a user meets them: each menu validated for the selections that change
// it and read back as it would show; the interpolation and delete-all actions, each one undo
// step; and every action of the menus chosen after its channel went away.

#include <functional>
#include <sstream>
#include <string>
#include <vector>

#include "src/engine/tests/EngineFixture.h"
#include "src/resources/TQStrings.h"

namespace engine_test {
namespace {

// Every item of the menu that sends an action, submenus included, as (menu, index).
std::vector<std::pair<RWMenu*, int64_t>> actionItems(const RWMenuPtr& menu) {
    std::vector<std::pair<RWMenu*, int64_t>> out;
    for (int64_t i = 0; i < menu->numberOfItems(); ++i) {
        const RWMenuItemPtr item = menu->itemAtIndex(i);
        if (item->hasSubmenu())
            for (const auto& inner : actionItems(item->submenu())) out.push_back(inner);
        if (!item->action().empty()) out.push_back({menu.get(), i});
    }
    return out;
}

class CtrlMenus : public WithReferenceHost<EngineFixture> {
protected:
    // Four Linear keypoints (1 0, 2 1, 3 0, 4 1) on a selected channel (so it may be modified).
    TQCurveEditorChannelItemPtr fourKeys(const char* name = "A") {
        TQChannel* c = addChannel(name, {{1, 0}, {2, 1}, {3, 0}, {4, 1}});
        c->setInterpolation(kTQInterpolationLinear);
        auto item = addItem(c);
        item->select(1);
        return item;
    }

    // The menu as it would show, validated: each item's title, "[title]" when disabled, "*" on
    // and "~" mixed after it; a submenu's items in its place; separators left out.
    static std::string reading(const RWMenuPtr& menu) {
        menu->update();
        std::string out;
        std::function<void(const RWMenu&)> walk = [&](const RWMenu& m) {
            for (const RWMenuItemPtr& item : m.itemArray()) {
                if (item->hasSubmenu()) walk(*item->submenu());
                if (item->isSeparatorItem() || item->hasSubmenu()) continue;
                out += item->isEnabled() ? " " + item->title() : " [" + item->title() + "]";
                out += item->state() == RWOnState ? "*" : item->state() == RWMixedState ? "~" : "";
            }
        };
        walk(*menu);
        return out.substr(1);
    }

    // Performs the item sending `action` with `tag` after validating its menu.
    bool choose(const RWMenuPtr& menu, const std::string& action, int64_t tag) {
        menu->update();
        for (const auto& [holder, index] : actionItems(menu))
            if (holder->itemAtIndex(index)->action() == action &&
                holder->itemAtIndex(index)->tag() == tag)
                return holder->performActionForItemAtIndex(index);
        return false;
    }
};

TEST_F(CtrlMenus, keypointMenu__followsTheLocksStatesAndInterpolationsOfTheSelection) {
    // Arrangement: "L2" locks the keypoint at 2, "D3" disables the one at 3, "B2" makes the
    // one at 2 Bezier ("K2" stepped), "C" locks the channel, "@3" selects the keypoint at 3.
    struct Case {
        const char* arrange;
        const char* want;
    };
    const std::vector<Case> cases = {
        {"",
         "[Delete] [Reverse] [Ease In] [Ease Out] [Ease In and Out] [Constant] [Linear] [Bézier] "
         "[Catmull-Rom] [Exponential] [Logarithmic] Unlock [Disable]"},
        {"@3",
         "Delete Reverse Ease In Ease Out Ease In and Out Constant Linear* Bézier Catmull-Rom "
         "Exponential Logarithmic Lock Disable"},
        {"B2 @3",
         "Delete Reverse Ease In Ease Out Ease In and Out Constant Linear~ Bézier~ Catmull-Rom "
         "Exponential Logarithmic Lock Disable"},
        // A stepped segment needs no second end: only its own kind is ticked.
        {"K3 @3",
         "Delete Reverse Ease In Ease Out Ease In and Out Constant* Linear Bézier Catmull-Rom "
         "Exponential Logarithmic Lock Disable"},
        {"B4 @2 @4",
         "Delete Reverse Ease In Ease Out Ease In and Out Constant~ Linear~ Bézier~ Catmull-Rom~ "
         "Exponential~ Logarithmic~ Lock Disable"},
        {"L2 L3 @2 @3",
         "Delete Reverse Ease In Ease Out Ease In and Out [Constant] [Linear] [Bézier] "
         "[Catmull-Rom] [Exponential] [Logarithmic] Unlock [Disable]"},
        {"L2 @2 @3",
         "Delete Reverse Ease In Ease Out Ease In and Out Constant Linear* Bézier Catmull-Rom "
         "Exponential Logarithmic Lock~ Disable"},
        {"D2 D3 @2 @3",
         "[Delete] [Reverse] [Ease In] [Ease Out] [Ease In and Out] [Constant] [Linear] [Bézier] "
         "[Catmull-Rom] [Exponential] [Logarithmic] Lock Enable"},
        {"D3 @2 @3",
         "Delete Reverse Ease In Ease Out Ease In and Out Constant Linear* Bézier Catmull-Rom "
         "Exponential Logarithmic Lock Disable~"},
        {"C @3",
         "[Delete] [Reverse] Ease In Ease Out Ease In and Out [Constant] [Linear]* [Bézier] "
         "[Catmull-Rom] [Exponential] [Logarithmic] [Lock] [Disable]"},
    };
    for (const Case& c : cases) {
        SCOPED_TRACE(std::string("arranged \"") + c.arrange + "\"");
        object->removeAllChildren();
        set->clear();
        auto item = fourKeys();
        TQChannel* channel = item->channel();
        TQCurveSelectionList* list = selectInView({});
        std::istringstream words(c.arrange);
        for (std::string w; words >> w;) {
            const TQKeyframeHandle h =
                w.size() > 1 ? channel->getKeyframe(seconds(w[1] - '0')) : nullptr;
            if (w[0] == 'L') channel->setKeyframeLocked(h, true);
            if (w[0] == 'D') channel->setKeyframeEnabled(h, false);
            if (w[0] == 'B') channel->setKeyframeInterpolation(h, kTQInterpolationBezier);
            if (w[0] == 'K') channel->setKeyframeInterpolation(h, kTQInterpolationConstant);
            if (w[0] == 'C') channel->setLocked(true, false);
            if (w[0] == '@') list->addSelection(keypointEntry(item, w[1] - '0'));
        }
        EXPECT_EQ(reading(ctrl().getKeyframeMenu()), c.want);
    }
}

TEST_F(CtrlMenus, curveAndTangentMenus__followTheSegmentUnderTheClickAndTheHandles) {
    auto item = fourKeys();
    TQChannel* c = item->channel();
    c->setKeyframeInterpolation(c->getKeyframe(seconds(2)), kTQInterpolationBezier);
    const auto curveMenuAt = [&](double t) {
        view.setMouseOrigin(view.getPointScreen(CGPointMake(t, 0.0)));
        return reading(ctrl().getCurveMenu());
    };
    selectInView({curveEntry(item)});
    EXPECT_EQ(curveMenuAt(2.5),
              "Add Keypoint Delete All Keypoints Constant Linear Bézier* "
              "Catmull-Rom Exponential Logarithmic");
    // Before the first keypoint no segment lies under the click.
    EXPECT_EQ(curveMenuAt(0.5),
              "Add Keypoint Delete All Keypoints [Constant] [Linear] [Bézier] "
              "[Catmull-Rom] [Exponential] [Logarithmic]");
    c->setKeyframeLocked(c->getKeyframe(seconds(2)), true);
    EXPECT_EQ(curveMenuAt(2.5),
              "Add Keypoint Delete All Keypoints [Constant] [Linear] [Bézier]* "
              "[Catmull-Rom] [Exponential] [Logarithmic]");
    auto empty = addItem(addChannel("Empty", {}));
    selectInView({curveEntry(empty)});
    EXPECT_EQ(curveMenuAt(2.5),
              "Add Keypoint [Delete All Keypoints] [Constant] [Linear] "
              "[Bézier] [Catmull-Rom] [Exponential] [Logarithmic]");

    selectInView({});
    EXPECT_EQ(curveMenuAt(2.5),
              "Add Keypoint [Delete All Keypoints] [Constant] [Linear] "
              "[Bézier] [Catmull-Rom] [Exponential] [Logarithmic]")
        << "nothing selected";
    EXPECT_EQ(reading(ctrl().getTangentMenu()), "[Break Tangents] [Align Tangents]");
    selectInView({tangentEntry(item, 3, true)});
    EXPECT_EQ(reading(ctrl().getTangentMenu()), "Break Tangents Align Tangents");
    c->setKeyframeTangentsBroken(c->getKeyframe(seconds(3)), true);
    EXPECT_EQ(reading(ctrl().getTangentMenu()), "Link Tangents Align Tangents");
    c->setLocked(true, false);
    EXPECT_EQ(reading(ctrl().getTangentMenu()), "[Link Tangents] [Align Tangents]");
}

TEST_F(CtrlMenus, everyAction__chosenAfterItsChannelWentAwayChangesNothing) {
    for (const RWMenuPtr& menu :
         {ctrl().getKeyframeMenu(), ctrl().getCurveMenu(), ctrl().getTangentMenu()}) {
        for (const auto& [holder, index] : actionItems(menu)) {
            SCOPED_TRACE(holder->itemAtIndex(index)->action());
            object->removeAllChildren();
            set->clear();
            auto item = fourKeys();
            fourKeys("B");
            selectInView({menu == ctrl().getCurveMenu()     ? curveEntry(item)
                          : menu == ctrl().getTangentMenu() ? tangentEntry(item, 2, true)
                                                            : keypointEntry(item, 2)});
            view.setMouseOrigin(view.getPointScreen(CGPointMake(2.5, 0.5)));
            menu->update();
            ASSERT_TRUE(holder->itemAtIndex(index)->isEnabled());
            object->removeChild(item->channel());
            const auto before = snapshot();
            holder->performActionForItemAtIndex(index);
            EXPECT_TRUE(sceneIs(*before) && host.undoStack().undoCount() == 0u &&
                        recorder.captureBalance() == 0);
        }
    }
}

}  // namespace
}  // namespace engine_test
