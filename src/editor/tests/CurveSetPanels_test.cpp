// The curve set manager of the full editor on the sample project, worked as a user works it:
// its table and buttons inside its modal run (a scripted modal service plays the user), the
// duplicate-name alert. The new-set panel is the demo's test.
#include <gtest/gtest.h>

#include "platform/ui/RWButton.h"
#include "src/editor/TQCurveSetManagerList.h"
#include "src/editor/TQCurveSetPanelViews.h"
#include "src/editor/tests/EditorFixture.h"

namespace editor_test {
namespace {

// What a user can tell of a custom set: everything the manager may change.
struct SetForm {
    std::string name, shortcut;
    bool relative = false;
    std::vector<const TQChannelBase*> channels;
    friend bool operator==(const SetForm&, const SetForm&) = default;
};

class CurveSetPanels : public EditorFixture {
protected:
    void connect(TQCurveEditorOutlets& outlets) override {
        TQInstantiateCurveSetPanels(&ctrl, outlets);
        list = outlets.curveSetManagerList;
        manager = outlets.curveSetManagerPanel;
    }

    // Bounce (title's opacity and x position), Fades (opacity, key "f"), Spin (relative).
    void makeSets() {
        auto channel = [&](const char* path) { return this->channel("Title", path); };
        ctrl.setSelectedCurveSet(ctrl.createCurveSetWithName("Bounce"));
        ctrl.appendChannelToCurveSet(channel("./1/200/202"));
        ctrl.appendChannelToCurveSet(channel("./1/100/101/1"));
        ctrl.setSelectedCurveSet(ctrl.createCurveSetWithName("Fades"));
        ctrl.appendChannelToCurveSet(channel("./1/200/202"));
        ctrl.selectedCurveSet()->setCurveSetShortcut("F");
        ctrl.setSelectedCurveSet(ctrl.createCurveSetWithName("Spin"));
        ctrl.appendChannelToCurveSet(channel("./1/100/109/3"));
        ctrl.selectedCurveSet()->setRelative(true);
    }
    std::vector<SetForm> forms() const {
        std::vector<SetForm> out;
        for (const TQCurveSetPtr& set : ctrl.curveSets()) {
            out.push_back({set->curveSetName(), set->curveSetShortcut(), set->isRelative(),
                           channelsOf(*set)});
        }
        return out;
    }
    std::vector<std::string> names() const {
        std::vector<std::string> out;
        for (const SetForm& form : forms()) out.push_back(form.name);
        return out;
    }

    // ---- The user in the manager ----
    void plusMinus(int64_t segment) {
        manager->contentView()->subview<RWSegmentedControl>()->userClickSegment(segment);
    }
    void select(int64_t row) { list->userSelectRows(RWIndexSet{row}); }
    void type(const char* column, int64_t row, const std::string& text) {
        ASSERT_TRUE(list->editColumn(list->columnWithIdentifier(column), row));
        list->userEndEditing(text);
    }
    bool drag(int64_t from, int64_t to) {
        return list->userBeginDragRows(RWIndexSet{from}) && list->userDropAtRow(to);
    }
    // Opens the manager and plays `user` inside its run.
    void manage(std::function<void()> user) {
        modal.pushScript([user](RWWindow&, RWModalService&) { user(); });
        choose("Manage Curve Sets…");
    }

    TQCurveSetManagerList* list = nullptr;
    std::shared_ptr<RWPanel> manager;
};

TEST_F(CurveSetPanels, manager__cancel_after_many_edits_gives_back_every_set_and_the_shown_one) {
    makeSets();
    choose("Fades");
    const std::vector<TQCurveSetPtr> originals = ctrl.curveSets();
    const TQCurveSetPtr shown = ctrl.selectedCurveSet();
    const std::vector<SetForm> before = forms();
    manage([&] {
        EXPECT_EQ(list->selectedRow(), 1) << "the shown set's row";
        type(TQCurveEditorCtrl::kNameColumn, 1, "Fading");
        EXPECT_TRUE(drag(0, 3));
        select(0);
        plusMinus(1);
        press(*manager, "curveSetManagerDuplicate:");
        plusMinus(0);
        type(TQCurveEditorCtrl::kShortcutColumn, 0, "k");
        list->userSetObjectValue(list->columnWithIdentifier(TQCurveEditorCtrl::kRelativeColumn), 0,
                                 RWObjectValue(0));
        EXPECT_EQ(names(),
                  (std::vector<std::string>{"Spin", "Bounce", "Spin Copy", "Untitled Set"}))
            << "the working copies took every edit";
        press(*manager, "curveSetManagerCancel:");
    });
    EXPECT_EQ(modal.runs(), std::vector<std::string>{"Curve Sets"});
    EXPECT_EQ(ctrl.curveSets(), originals) << "the very sets that were there";
    EXPECT_EQ(forms(), before);
    EXPECT_EQ(ctrl.selectedCurveSet(), shown) << "the renamed copy must not stay shown";
    EXPECT_EQ(ctrl.curveSetsPopUp()->title(), "Fades");

    manage([&] {
        select(2);
        press(*manager, "curveSetManagerApply:");
        EXPECT_EQ(ctrl.selectedCurveSet()->curveSetName(), "Spin");
        press(*manager, "curveSetManagerCancel:");
    });
    EXPECT_EQ(ctrl.selectedCurveSet(), originals[2]) << "Apply's choice stays, on the original";

    SCOPED_TRACE("an automatic set shown, every custom set removed, then Cancel");
    choose("Animated");
    manage([&] {
        for (int i = 0; i < 3; ++i) {
            select(0);
            plusMinus(1);
        }
        EXPECT_EQ(ctrl.selectedCurveSet(), ctrl.curveSetAll()) << "an emptied list shows All";
        press(*manager, "curveSetManagerCancel:");
    });
    EXPECT_EQ(ctrl.curveSets(), originals);
    EXPECT_EQ(ctrl.selectedCurveSet(), ctrl.curveSetAnimated());
}

TEST_F(CurveSetPanels, manager__done_keeps_reorders_and_refuses_bad_names_and_keys) {
    makeSets();
    manage([&] {
        // Drops land between rows; a drop on its own place, or outside, changes nothing.
        EXPECT_TRUE(drag(0, 2));
        EXPECT_EQ(names(), (std::vector<std::string>{"Fades", "Bounce", "Spin"}));
        EXPECT_EQ(list->selectedRow(), 1) << "the dropped row is selected";
        EXPECT_TRUE(drag(2, 0));
        EXPECT_EQ(names(), (std::vector<std::string>{"Spin", "Fades", "Bounce"}));
        EXPECT_TRUE(drag(1, 1) && drag(1, 2));
        ASSERT_TRUE(list->userBeginDragRows(RWIndexSet{0}));
        list->userEndDrag();
        EXPECT_FALSE(list->userDropAtRow(2)) << "that drag has ended";
        EXPECT_EQ(names(), (std::vector<std::string>{"Spin", "Fades", "Bounce"}));

        for (const char* blank : {"", "   "}) type(TQCurveEditorCtrl::kNameColumn, 0, blank);
        EXPECT_EQ(modal.runs().size(), 1u) << "a blank name is refused without the alert";
        type(TQCurveEditorCtrl::kNameColumn, 0, "Bounce");
        EXPECT_EQ(modal.runs().back(), "Duplicate Curve Set Name") << "the one alert";
        press(*manager, "curveSetManagerDone:");
        EXPECT_TRUE(ctrl.isManagingCurveSets()) << "Done waits for a name that is free";
        type(TQCurveEditorCtrl::kNameColumn, 0, "Twirl");

        // A key is one character, free among all the sets, automatic ones included.
        for (const char* refused : {"u", "F", "ab"})
            type(TQCurveEditorCtrl::kShortcutColumn, 2, refused);
        type(TQCurveEditorCtrl::kShortcutColumn, 2, "B");
        type(TQCurveEditorCtrl::kShortcutColumn, 1, "");
        press(*manager, "curveSetManagerDone:");
    });
    EXPECT_FALSE(ctrl.isManagingCurveSets());
    EXPECT_FALSE(manager->isVisible());
    const std::vector<SetForm> after = forms();
    EXPECT_EQ(names(), (std::vector<std::string>{"Twirl", "Fades", "Bounce"}));
    EXPECT_EQ(after[2].shortcut + "|" + after[1].shortcut, "b|");

    SCOPED_TRACE("the delete key on row 0 selects no row and leaves the shown set alone");
    choose("Twirl");
    manage([&] {
        select(0);
        list->delete_();
        EXPECT_EQ(list->selectedRow(), -1);
        const auto& calls = recorder.calls();
        EXPECT_EQ(std::find_if(calls.rbegin(), calls.rend(),
                               [](const auto& c) { return c.operation == "postNotification"; })
                      ->word,
                  kTQNotifyChannelsChanged);
        press(*manager, "curveSetManagerDone:");
    });
    EXPECT_EQ(names(), (std::vector<std::string>{"Fades", "Bounce"}));
    EXPECT_EQ(ctrl.selectedCurveSet()->curveSetName(), "Twirl");
}

}  // namespace
}  // namespace editor_test
