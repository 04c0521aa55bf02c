// The context menus as a user meets them: the three as they are built (titles, actions and
// tags, submenus indented), each validated for the selections that change it and read back as
// it would show (both against recorded baselines), and every action of the menus chosen after
// its channel went away.

#include <functional>
#include <sstream>
#include <string>
#include <vector>

#include "tests/support/EngineFixture.h"
#include "tests/support/TextBaseline.h"

namespace engine_test {
namespace {

using tests_support::matchesBaselineBlock;

// Calls `visit` with every item of the menu as (menu, index, depth), a submenu's items right
// after the item holding them.
void eachItem(RWMenu& menu, const std::function<void(RWMenu&, int64_t, int)>& visit,
              int depth = 0) {
    for (int64_t i = 0; i < menu.numberOfItems(); ++i) {
        visit(menu, i, depth);
        if (menu.itemAtIndex(i)->hasSubmenu())
            eachItem(*menu.itemAtIndex(i)->submenu(), visit, depth + 1);
    }
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
        eachItem(*menu, [&](RWMenu& m, int64_t i, int) {
            const RWMenuItemPtr item = m.itemAtIndex(i);
            if (item->isSeparatorItem() || item->hasSubmenu()) return;
            out += item->isEnabled() ? " " + item->title() : " [" + item->title() + "]";
            out += item->state() == RWOnState ? "*" : item->state() == RWMixedState ? "~" : "";
        });
        return out.substr(1);
    }
};

TEST_F(CtrlMenus, menus__as_recorded) {
    std::string text;
    for (const RWMenuPtr& menu :
         {ctrl().getKeyframeMenu(), ctrl().getCurveMenu(), ctrl().getTangentMenu()}) {
        eachItem(*menu, [&](RWMenu& m, int64_t i, int depth) {
            const RWMenuItemPtr item = m.itemAtIndex(i);
            text += std::string(2 * depth, ' ') + item->title() + " | " + item->action() + " | " +
                    std::to_string(item->tag()) + "\n";
        });
        text += "--\n";
    }
    EXPECT_TRUE(tests_support::matchesBaseline("menus", text, "src/engine/tests/baselines"));
}

TEST_F(CtrlMenus, keypointMenu__followsTheLocksStatesAndInterpolationsOfTheSelection) {
    // Arrangements: "L2" locks the keypoint at 2, "D3" disables the one at 3, "B2" makes the
    // one at 2 Bezier ("K2" stepped: a stepped segment needs no second end, so only its own
    // kind is ticked), "C" locks the channel, "@3" selects the keypoint at 3.
    std::string text;
    for (const char* arrange : {"", "@3", "B2 @3", "K3 @3", "B4 @2 @4", "L2 L3 @2 @3", "L2 @2 @3",
                                "D2 D3 @2 @3", "D3 @2 @3", "C @3"}) {
        object->removeAllChildren();
        set->clear();
        auto item = fourKeys();
        TQChannel* channel = item->channel();
        TQCurveSelectionList* list = selectInView({});
        std::istringstream words(arrange);
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
        text += std::string(arrange) + ": " + reading(ctrl().getKeyframeMenu()) + "\n";
    }
    EXPECT_TRUE(
        matchesBaselineBlock("menu-states", "keypoint", text, "src/engine/tests/baselines"));
}

// The curve menu follows the segment under the click, the tangent menu the handles.
TEST_F(CtrlMenus, curveAndTangentMenus__followTheSegmentUnderTheClickAndTheHandles) {
    auto item = fourKeys();
    TQChannel* c = item->channel();
    c->setKeyframeInterpolation(c->getKeyframe(seconds(2)), kTQInterpolationBezier);
    std::string text;
    const auto note = [&](const char* what, const RWMenuPtr& menu) {
        text += std::string(what) + ": " + reading(menu) + "\n";
    };
    const auto curveAt = [&](const char* what, double t) {
        view.setMouseOrigin(view.getPointScreen(CGPointMake(t, 0.0)));
        note(what, ctrl().getCurveMenu());
    };
    selectInView({curveEntry(item)});
    curveAt("curve, on a Bezier segment", 2.5);
    curveAt("curve, before the first keypoint", 0.5);
    c->setKeyframeLocked(c->getKeyframe(seconds(2)), true);
    curveAt("curve, on a locked segment", 2.5);
    selectInView({curveEntry(addItem(addChannel("Empty", {})))});
    curveAt("curve, without keypoints", 2.5);
    selectInView({});
    curveAt("curve, nothing selected", 2.5);
    note("tangent, nothing selected", ctrl().getTangentMenu());
    selectInView({tangentEntry(item, 3, true)});
    note("tangent", ctrl().getTangentMenu());
    c->setKeyframeTangentsBroken(c->getKeyframe(seconds(3)), true);
    note("tangent, broken", ctrl().getTangentMenu());
    c->setLocked(true, false);
    note("tangent, locked channel", ctrl().getTangentMenu());
    EXPECT_TRUE(matchesBaselineBlock("menu-states", "curve and tangent", text,
                                     "src/engine/tests/baselines"));
}

TEST_F(CtrlMenus, everyAction__chosenAfterItsChannelWentAwayChangesNothing) {
    for (const RWMenuPtr& menu :
         {ctrl().getKeyframeMenu(), ctrl().getCurveMenu(), ctrl().getTangentMenu()}) {
        std::vector<std::pair<RWMenu*, int64_t>> actions;
        eachItem(*menu, [&](RWMenu& m, int64_t i, int) {
            if (!m.itemAtIndex(i)->action().empty()) actions.push_back({&m, i});
        });
        for (const auto& [holder, index] : actions) {
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
