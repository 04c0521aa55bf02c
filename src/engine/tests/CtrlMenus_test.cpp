// The context menus as a user meets them: each menu validated for the selections that change
// it, read back as the titles, enabled flags and marks it would show; the actions that set
// interpolation and clear a curve, each one undo step; and every action of the menus chosen
// after its channel went away.

#include <functional>
#include <string>
#include <vector>

#include "platform/channels/TQChannelTypes.h"
#include "src/engine/tests/EngineFixture.h"
#include "src/resources/TQStrings.h"

namespace engine_test {
namespace {

// The item of the menu (submenus included) that sends `action` with `tag`, and its menu.
std::pair<RWMenu*, int64_t> find(const RWMenuPtr& menu, const std::string& action, int64_t tag) {
    for (int64_t i = 0; i < menu->numberOfItems(); ++i) {
        const RWMenuItemPtr item = menu->itemAtIndex(i);
        if (item->hasSubmenu()) {
            if (auto found = find(item->submenu(), action, tag); found.first) return found;
        } else if (item->action() == action && item->tag() == tag) {
            return {menu.get(), i};
        }
    }
    return {nullptr, -1};
}

class CtrlMenus : public WithReferenceHost<EngineFixture> {
protected:
    // A channel of four keypoints (1 0, 2 1, 3 0, 4 1), Linear, in the set and selected (so
    // that it may be modified).
    TQCurveEditorChannelItemPtr fourKeys(const char* name = "A") {
        TQChannel* c = addChannel(name, {{1, 0}, {2, 1}, {3, 0}, {4, 1}});
        c->setInterpolation(kTQInterpolationLinear);
        auto item = addItem(c);
        item->select(1);
        return item;
    }

    // The menu as it would show: validated, then each item's title, "[title]" when disabled,
    // "*" on and "~" mixed after it, "/" for a separator; a submenu's items in its place.
    static std::string reading(const RWMenuPtr& menu) {
        menu->update();
        std::string out;
        std::function<void(const RWMenu&)> walk = [&](const RWMenu& m) {
            for (const RWMenuItemPtr& item : m.itemArray()) {
                if (item->isSeparatorItem()) {
                    out += " /";
                    continue;
                }
                if (item->hasSubmenu()) {
                    walk(*item->submenu());
                    continue;
                }
                out += item->isEnabled() ? " " + item->title() : " [" + item->title() + "]";
                if (item->state() == RWOnState) out += "*";
                if (item->state() == RWMixedState) out += "~";
            }
        };
        walk(*menu);
        return out.substr(1);
    }

    // The curve menu's reading for a right click on the item's curve at `t` seconds.
    std::string curveMenuAt(const TQCurveEditorChannelItemPtr& item, double t) {
        selectInView({curveEntry(item)});
        view.setMouseOrigin(view.getPointScreen(CGPointMake(t, 0.0)));
        return reading(ctrl().getCurveMenu());
    }
};

TEST_F(CtrlMenus, keypointMenu__followsTheLocksStatesAndInterpolationsOfTheSelection) {
    // Changes made to the channel of four Linear keypoints before the menu shows.
    using Arrange = std::function<void(TQChannel&)>;
    const auto atKeys = [](std::initializer_list<double> times, auto write) -> Arrange {
        const std::vector<double> at = times;
        return [at, write](TQChannel& c) {
            for (double t : at) write(c, c.getKeyframe(seconds(t)));
        };
    };
    const Arrange nothing = [](TQChannel&) {};
    const auto lock = [](TQChannel& c, TQKeyframeHandle h) { c.setKeyframeLocked(h, true); };
    const auto disable = [](TQChannel& c, TQKeyframeHandle h) { c.setKeyframeEnabled(h, false); };
    const auto bezier = [](TQChannel& c, TQKeyframeHandle h) {
        c.setKeyframeInterpolation(h, kTQInterpolationBezier);
    };
    struct Case {
        const char* what;
        Arrange arrange;
        std::vector<double> selected;
        const char* want;
    };
    const std::vector<Case> cases = {
        {"nothing selected: only the lock item, reading Unlock",
         nothing,
         {},
         "[Delete] / [Reverse] / [Ease In] [Ease Out] [Ease In and Out] / [Constant] [Linear] "
         "[Bézier] [Catmull-Rom] [Exponential] [Logarithmic] / Unlock [Disable]"},
        {"a keypoint after one of its kind",
         nothing,
         {3},
         "Delete / Reverse / Ease In Ease Out Ease In and Out / Constant Linear* Bézier "
         "Catmull-Rom Exponential Logarithmic / Lock Disable"},
        {"the first keypoint",
         nothing,
         {1},
         "Delete / Reverse / Ease In Ease Out Ease In and Out / Constant Linear* Bézier "
         "Catmull-Rom Exponential Logarithmic / Lock Disable"},
        {"a Linear keypoint after a Bezier one: both kinds mixed",
         atKeys({2}, bezier),
         {3},
         "Delete / Reverse / Ease In Ease Out Ease In and Out / Constant Linear~ Bézier~ "
         "Catmull-Rom Exponential Logarithmic / Lock Disable"},
        {"keypoints of two kinds: every item mixed",
         atKeys({4}, bezier),
         {2, 4},
         "Delete / Reverse / Ease In Ease Out Ease In and Out / Constant~ Linear~ Bézier~ "
         "Catmull-Rom~ Exponential~ Logarithmic~ / Lock Disable"},
        {"all locked: no interpolation, Unlock, no Disable",
         atKeys({2, 3}, lock),
         {2, 3},
         "Delete / Reverse / Ease In Ease Out Ease In and Out / [Constant] [Linear] [Bézier] "
         "[Catmull-Rom] [Exponential] [Logarithmic] / Unlock [Disable]"},
        {"some locked: Lock mixed",
         atKeys({2}, lock),
         {2, 3},
         "Delete / Reverse / Ease In Ease Out Ease In and Out / Constant Linear* Bézier "
         "Catmull-Rom Exponential Logarithmic / Lock~ Disable"},
        {"all disabled: only Lock and Enable",
         atKeys({2, 3}, disable),
         {2, 3},
         "[Delete] / [Reverse] / [Ease In] [Ease Out] [Ease In and Out] / [Constant] [Linear] "
         "[Bézier] [Catmull-Rom] [Exponential] [Logarithmic] / Lock Enable"},
        {"some disabled: Disable mixed",
         atKeys({3}, disable),
         {2, 3},
         "Delete / Reverse / Ease In Ease Out Ease In and Out / Constant Linear* Bézier "
         "Catmull-Rom Exponential Logarithmic / Lock Disable~"},
        {"a locked channel: nothing that edits",
         [](TQChannel& c) { c.setLocked(true, false); },
         {3},
         "[Delete] / [Reverse] / Ease In Ease Out Ease In and Out / [Constant] [Linear]* "
         "[Bézier] [Catmull-Rom] [Exponential] [Logarithmic] / [Lock] [Disable]"},
        {"a channel that refuses interpolation changes",
         [](TQChannel& c) { c.setFlag(kTQChannelFlagNoInterpolationChange); },
         {3},
         "Delete / Reverse / Ease In Ease Out Ease In and Out / [Constant] [Linear]* [Bézier] "
         "[Catmull-Rom] [Exponential] [Logarithmic] / Lock Disable"},
    };
    for (const Case& c : cases) {
        SCOPED_TRACE(c.what);
        object->removeAllChildren();
        set->clear();
        auto item = fourKeys();
        c.arrange(*item->channel());
        TQCurveSelectionList* list = selectInView({});
        for (double t : c.selected) list->addSelection(keypointEntry(item, t));
        EXPECT_EQ(reading(ctrl().getKeyframeMenu()), c.want);
    }
}

TEST_F(CtrlMenus, keypointMenu__fixedInterpolationAndQuaternionAnglesNarrowTheKinds) {
    {
        SCOPED_TRACE("a curve channel keeps its kind");
        auto* c = static_cast<TQChannel*>(
            object->addChild(std::make_unique<TQChannelCurve>("Curve", nextChannelId++)));
        c->setKeyframe(seconds(1), 0.0);
        auto item = addItem(c);
        item->select(1);
        selectInView({keypointEntry(item, 1)});
        ctrl().getKeyframeMenu()->update();
        for (const int64_t tag : {0, 1, 4, 6, 13, 14}) {
            const auto [holder, index] =
                find(ctrl().getKeyframeMenu(), "menuSetKeypointInterpolation:", tag);
            EXPECT_FALSE(holder->itemAtIndex(index)->isEnabled()) << tag;
        }
    }
    auto* rotation = static_cast<TQChannelRotation3D*>(
        object->addChild(std::make_unique<TQChannelRotation3D>("Rotation", nextChannelId++)));
    TQChannel* angle = rotation->getAngleChannel(kTQComponentX);
    angle->setKeyframe(seconds(1), 0.0);
    angle->setKeyframe(seconds(2), 1.0);
    auto item = addItem(angle);
    item->select(1);
    selectInView({keypointEntry(item, 2)});
    const std::string euler = reading(ctrl().getKeyframeMenu());
    EXPECT_NE(euler.find("Exponential Logarithmic"), std::string::npos) << euler;
    rotation->setQuaternionMode(true, false);
    const std::string quaternion = reading(ctrl().getKeyframeMenu());
    EXPECT_NE(quaternion.find("Catmull-Rom [Exponential] [Logarithmic]"), std::string::npos)
        << quaternion;
}

TEST_F(CtrlMenus, curveMenu__theSegmentUnderTheClickDecides) {
    auto item = fourKeys();
    item->channel()->setKeyframeInterpolation(item->channel()->getKeyframe(seconds(2)),
                                              kTQInterpolationBezier);
    EXPECT_EQ(curveMenuAt(item, 2.5),
              "Add Keypoint / Delete All Keypoints / Constant Linear Bézier* Catmull-Rom "
              "Exponential Logarithmic");
    // Past the last keypoint the segment is the last one's.
    EXPECT_EQ(curveMenuAt(item, 6.0),
              "Add Keypoint / Delete All Keypoints / Constant Linear* Bézier Catmull-Rom "
              "Exponential Logarithmic");
    EXPECT_EQ(curveMenuAt(item, 0.5),
              "Add Keypoint / Delete All Keypoints / [Constant] [Linear] [Bézier] [Catmull-Rom] "
              "[Exponential] [Logarithmic]");
    item->channel()->setKeyframeLocked(item->channel()->getKeyframe(seconds(2)), true);
    EXPECT_EQ(curveMenuAt(item, 2.5),
              "Add Keypoint / Delete All Keypoints / [Constant] [Linear] [Bézier]* [Catmull-Rom] "
              "[Exponential] [Logarithmic]");

    auto empty = addItem(addChannel("Empty", {}));
    empty->select(1);
    EXPECT_EQ(curveMenuAt(empty, 2.5),
              "Add Keypoint / [Delete All Keypoints] / [Constant] [Linear] [Bézier] "
              "[Catmull-Rom] [Exponential] [Logarithmic]");
    selectInView({});
    EXPECT_EQ(reading(ctrl().getCurveMenu()),
              "Add Keypoint / [Delete All Keypoints] / [Constant] [Linear] [Bézier] "
              "[Catmull-Rom] [Exponential] [Logarithmic]");
}

TEST_F(CtrlMenus, tangentMenu__breakReadsLinkOnABrokenPairAndALockedChannelEditsNothing) {
    auto item = fourKeys();
    TQChannel* c = item->channel();
    selectInView({});
    EXPECT_EQ(reading(ctrl().getTangentMenu()), "[Break Tangents] [Align Tangents]");
    selectInView({tangentEntry(item, 2, true)});
    EXPECT_EQ(reading(ctrl().getTangentMenu()), "Break Tangents Align Tangents");
    c->setKeyframeTangentsBroken(c->getKeyframe(seconds(2)), true);
    EXPECT_EQ(reading(ctrl().getTangentMenu()), "Link Tangents Align Tangents");
    c->setLocked(true, false);
    EXPECT_EQ(reading(ctrl().getTangentMenu()), "[Link Tangents] [Align Tangents]");
}

TEST_F(CtrlMenus, validation__anItemOfAnotherMenuIsRefused) {
    RWMenu other("Other");
    RWMenuItemPtr item = other.addItemWithTitle("Reverse", "menuReverse:");
    item->setTarget(&ctrl());
    auto keys = fourKeys();
    selectInView({keypointEntry(keys, 2)});
    other.update();
    EXPECT_FALSE(item->isEnabled());
    EXPECT_TRUE(ctrl().getDefaultMenu()->itemArray().empty());
}

TEST_F(CtrlMenus, interpolationActions__setTheKeypointsTheKindNeedsInOneUndoStep) {
    struct Case {
        const char* what;
        const char* action;
        int64_t tag;
        std::vector<unsigned> want;  // the interpolations of keys 1..4 after
    };
    constexpr unsigned L = kTQInterpolationLinear, B = kTQInterpolationBezier;
    const std::vector<Case> cases = {
        {"Bezier needs both ends: the keypoint before follows",
         "menuSetKeypointInterpolation:",
         kTQInterpolationBezier,
         {L, B, B, L}},
        {"Exp shapes from its start alone",
         "menuSetKeypointInterpolation:",
         kTQInterpolationExp,
         {L, L, kTQInterpolationExp, L}},
        {"the segment under the click is its start's",
         "menuSetSegmentInterpolation:",
         kTQInterpolationConstant,
         {L, kTQInterpolationConstant, L, L}},
    };
    for (const Case& c : cases) {
        SCOPED_TRACE(c.what);
        object->removeAllChildren();
        set->clear();
        auto item = fourKeys();
        const bool segment = std::string(c.action) == "menuSetSegmentInterpolation:";
        selectInView({segment ? curveEntry(item) : keypointEntry(item, 3)});
        view.setMouseOrigin(view.getPointScreen(CGPointMake(2.5, 0.5)));
        const auto before = snapshot();
        const size_t steps = host.undoStack().undoCount();
        const RWMenuPtr menu = segment ? ctrl().getCurveMenu() : ctrl().getKeyframeMenu();
        menu->update();
        const auto [holder, index] = find(menu, c.action, c.tag);
        ASSERT_NE(holder, nullptr);
        ASSERT_TRUE(holder->performActionForItemAtIndex(index));

        std::vector<unsigned> got;
        for (TQKeyframeHandle h : item->channel()->getKeyframes(false))
            got.push_back(item->channel()->getKeyframeInterpolation(h));
        EXPECT_EQ(got, c.want) << describe(*object);
        EXPECT_EQ(recorder.captureBalance(), 0);
        EXPECT_EQ(host.undoStack().undoCount(), steps + 1);
        EXPECT_EQ(host.undoDescription(), TQLocalizedString("Undo Set Interpolation"));
        ASSERT_TRUE(host.undo());
        EXPECT_TRUE(sceneIs(*before));
    }
}

TEST_F(CtrlMenus, keypointInterpolation__ofALinkedCompoundReachesEveryComponent) {
    TQCompoundChannel* position = addCompound("Position", 2, true, {{1, 0}, {2, 1}, {3, 0}});
    auto x = addItem(static_cast<TQChannel*>(position->getChild(0)));
    x->select(1);
    selectInView({keypointEntry(x, 3)});
    view.setMouseOrigin(CGPointZero);
    const auto [holder, index] =
        find(ctrl().getKeyframeMenu(), "menuSetKeypointInterpolation:", kTQInterpolationConstant);
    ctrl().getKeyframeMenu()->update();
    ASSERT_TRUE(holder->performActionForItemAtIndex(index));
    for (const char* name : {"X", "Y"}) {
        const TQChannel& c = named(*object, name);
        EXPECT_EQ(c.getKeyframeInterpolation(c.getKeyframe(seconds(3))), kTQInterpolationConstant)
            << name;
    }
}

TEST_F(CtrlMenus, deleteAll__clearsTheCurveKeepingItsValueAndUndoesExactly) {
    auto item = fourKeys();
    host.setCurrentTime(seconds(1.5));
    selectInView({curveEntry(item)});
    const auto before = snapshot();
    const auto [holder, index] = find(ctrl().getCurveMenu(), "menuDeleteAllKeyframes:", 0);
    ctrl().getCurveMenu()->update();
    ASSERT_TRUE(holder->performActionForItemAtIndex(index));
    EXPECT_EQ(item->channel()->numberOfKeyframes(), 0u);
    EXPECT_NEAR(item->channel()->getInitialValue(), 0.5, kValueTolerance);
    EXPECT_EQ(host.undoDescription(), TQLocalizedString("Undo Delete All Keypoints"));
    ASSERT_TRUE(host.undo());
    EXPECT_TRUE(sceneIs(*before));
}

TEST_F(CtrlMenus, everyAction__chosenAfterItsChannelWentAwayChangesNothing) {
    for (const RWMenuPtr& menu : {ctrl().getKeyframeMenu(), ctrl().getCurveMenu(),
                                  ctrl().getTangentMenu(), ctrl().getDefaultMenu()}) {
        std::vector<std::pair<RWMenu*, int64_t>> actions;
        std::function<void(const RWMenuPtr&)> gather = [&](const RWMenuPtr& m) {
            for (int64_t i = 0; i < m->numberOfItems(); ++i) {
                const RWMenuItemPtr item = m->itemAtIndex(i);
                if (item->hasSubmenu()) gather(item->submenu());
                if (!item->action().empty()) actions.push_back({m.get(), i});
            }
        };
        gather(menu);
        for (const auto& [holder, index] : actions) {
            const std::string action = holder->itemAtIndex(index)->action();
            SCOPED_TRACE(action);
            object->removeAllChildren();
            set->clear();
            auto item = fourKeys();
            auto keep = fourKeys("B");
            const bool curve = menu == ctrl().getCurveMenu();
            const bool tangent = menu == ctrl().getTangentMenu();
            selectInView({curve     ? curveEntry(item)
                          : tangent ? tangentEntry(item, 2, true)
                                    : keypointEntry(item, 2)});
            view.setMouseOrigin(view.getPointScreen(CGPointMake(2.5, 0.5)));
            menu->update();
            ASSERT_TRUE(holder->itemAtIndex(index)->isEnabled());
            object->removeChild(item->channel());
            const auto before = snapshot();
            const size_t steps = host.undoStack().undoCount();
            holder->performActionForItemAtIndex(index);
            EXPECT_TRUE(sceneIs(*before));
            EXPECT_EQ(host.undoStack().undoCount(), steps);
            EXPECT_EQ(recorder.captureBalance(), 0);
        }
    }
}

}  // namespace
}  // namespace engine_test
