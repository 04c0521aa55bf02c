// The full editor's curve sets on the sample project, reached as the user reaches them: the
// pop-up's items, adding channels, cloning and merging sets, soloing, and the names custom
// sets get.
#include <gtest/gtest.h>

#include <set>

#include "src/editor/tests/EditorFixture.h"

namespace editor_test {
namespace {

class CurveSetRegistry : public EditorFixture {
protected:
    std::vector<std::string> popUpTitles() const {
        std::vector<std::string> out;
        for (const RWMenuItemPtr& item : ctrl.curveSetsPopUp()->menu()->itemArray())
            out.push_back(item->isSeparatorItem() ? "--"
                          : item->keyEquivalent().empty()
                              ? item->title()
                              : item->title() + ":" + item->keyEquivalent());
        return out;
    }
    std::vector<TQChannelBase*> allObjects() {
        const auto objects = host.scene().objects();
        return {objects.begin(), objects.end()};
    }
};

TEST_F(CurveSetRegistry, pop_up__each_automatic_set_shows_what_it_finds_for_the_selection) {
    host.setSelectedObjects(allObjects());
    std::set<const TQCurveSet*> chosen;
    for (const char* title : {"All", "Animated", "Modified", "Position", "Rotation", "Scale",
                              "Shear", "Pivot", "Opacity", "Retiming"}) {
        SCOPED_TRACE(title);
        choose(title);
        const TQCurveSetPtr set = ctrl.selectedCurveSet();
        ASSERT_TRUE(ctrl.isAutomaticCurveSet(set.get()));
        EXPECT_EQ(set->curveSetName() + ctrl.curveSetsPopUp()->title(), title + std::string(title));
        const TQCurveSetPtr fresh = set->copy();
        fresh->refresh(100, false);
        EXPECT_FALSE(set->allItems().empty()) << "the piece has something for every set";
        EXPECT_EQ(shownChannels(), channelsOf(*fresh)) << "refreshed for the selection";
        chosen.insert(set.get());
    }
    // Active follows what changes: a step of a drag on the title's opacity.
    choose("Active");
    chosen.insert(ctrl.selectedCurveSet().get());
    EXPECT_EQ(chosen.size(), 11u) << "one set of its own for each item";
    EXPECT_EQ(ctrl.curveSetsPopUp()->title(), "Active");
    TQChannelBase* opacity = TQChannelRef("./1/200/202").getChannel(object("Title"));
    opacity->noteWillChange(true);
    host.postNotification(kTQNotifyChannelsChanging);
    EXPECT_EQ(shownChannels(), std::vector<const TQChannelBase*>{opacity});

    // The host's selection word re-filters the shown set.
    choose("Position");
    TQChannelObjectRootBase* logo = object(kTQHostSampleBehaviorObject);
    host.setSelectedObjects({logo});
    ASSERT_FALSE(shownChannels().empty());
    for (const TQChannelBase* c : shownChannels()) EXPECT_EQ(c->getChannelRoot(), logo);
}

TEST_F(CurveSetRegistry, pop_up__sections_in_order_with_custom_sets_and_the_panel_entries) {
    ctrl.createCurveSetWithName("Bounce");
    ctrl.createCurveSetWithName("Fades")->setCurveSetShortcut("F");
    ctrl.curveSetsPopUp()->userWillPopUp();
    EXPECT_EQ(popUpTitles(),
              (std::vector<std::string>{"All", "Animated:u", "Modified:y", "Active", "--",
                                        "Position:p", "Rotation:r", "Scale:s", "Shear:h", "Pivot:a",
                                        "Opacity:o", "Retiming:t", "--", "Bounce", "Fades:f", "--",
                                        "New Curve Set…", "Manage Curve Sets…"}));
    const RWMenu& menu = *ctrl.curveSetsPopUp()->menu();
    EXPECT_EQ(ctrl.curveSetsPopUp()->indexOfSelectedItem(), 1) << "Animated is selected";
    EXPECT_EQ(menu.itemAtIndex(3)->keyEquivalentModifierMask(),
              uint64_t{RWEventModifierFlagCommand})
        << "Active keeps the default mask";
    EXPECT_EQ(menu.itemAtIndex(14)->keyEquivalentModifierMask(), 0u) << "a custom key is plain";
    ctrl.curveSetsPopUp()->menu()->update();
    EXPECT_FALSE(menu.itemAtIndex(17)->isEnabled()) << "its panel is not this controller's";
    choose("Fades");
    EXPECT_EQ(ctrl.selectedCurveSet(), ctrl.curveSets()[1]);

    ctrl.setUsesRelativeCurveSets(false);
    ctrl.refreshPopUp();
    EXPECT_EQ(popUpTitles(),
              (std::vector<std::string>{"All", "Animated:u", "Modified:y", "Active", "Bounce",
                                        "Fades:f", "--", "New Curve Set…", "Manage Curve Sets…"}));
}

TEST_F(CurveSetRegistry, custom_sets__adding_cloning_and_merging) {
    TQChannelObjectRootBase* title = object(kTQHostSampleTitleObject);
    {
        SCOPED_TRACE("adds while an automatic set shows start a custom set");
        TQChannel *opacity = channel("Title", "./1/200/202"),
                  *x = channel("Title", "./1/100/101/1"),
                  *scale = channel("Title", "./1/100/105/1");
        gNewCurveSetIndex = 1;
        ctrl.showActive();
        ASSERT_TRUE(ctrl.canModifySelectedCurveSet()) << "Active takes channels by hand";
        ctrl.appendChannelToCurveSet(opacity);
        ctrl.appendChannelToCurveSet(x);
        const TQCurveSetPtr added = ctrl.selectedCurveSet();
        // "Untitled Set 1" asked for; a number 1 is dropped by the unique form.
        EXPECT_EQ(added->curveSetName(), "Untitled Set");
        EXPECT_EQ(gNewCurveSetIndex, 2u) << "the second add went into the same set";
        EXPECT_EQ(shownChannels(), (std::vector<const TQChannelBase*>{opacity, x}));
        ctrl.showAll();
        ctrl.appendChannelToCurveSet(opacity);
        EXPECT_EQ(ctrl.selectedCurveSet()->curveSetName(), "Untitled Set 2");
        EXPECT_EQ(ctrl.getCurveSetById(added->curveSetId()), added);
        ctrl.setChannelInList(scale);
        EXPECT_EQ(shownChannels(), std::vector<const TQChannelBase*>{scale});
    }
    {
        SCOPED_TRACE("a clone of the shown set is absolute, selected and named uniquely");
        choose("Position");
        const std::vector<const TQChannelBase*> position = shownChannels();
        const TQCurveSetPtr first = ctrl.cloneCurveSetWithName("Slide");
        const TQCurveSetPtr second = ctrl.cloneCurveSetWithName("Slide");
        EXPECT_EQ(std::tuple(ctrl.selectedCurveSet(), second->isRelative(), channelsOf(*second)),
                  std::tuple(second, false, position));
        EXPECT_EQ(first->curveSetName() + "|" + second->curveSetName(), "Slide|Slide 1");
        // An absolute set keeps its channels whatever is selected.
        host.setSelectedObjects({object(kTQHostSampleBehaviorObject)});
        EXPECT_EQ(shownChannels(), position);
    }
    {
        SCOPED_TRACE("a copy keeps the kind, takes the copy suffix once, and is not selected");
        const TQCurveSetPtr shown = ctrl.selectedCurveSet();
        const TQCurveSetPtr copy = ctrl.cloneCurveSet(*ctrl.curveSetScale());
        const TQCurveSetPtr copyOfCopy = ctrl.cloneCurveSet(*copy);
        EXPECT_TRUE(copy->isRelative());
        EXPECT_EQ(copy->curveSetName() + "|" + copyOfCopy->curveSetName(),
                  "Scale Copy|Scale Copy 1");
        EXPECT_EQ(ctrl.selectedCurveSet(), shown);
    }
    {
        SCOPED_TRACE("a folder brings its keyframable channels, sub-folders too");
        TQChannelObjectRootBase* logo = object(kTQHostSampleBehaviorObject);
        std::vector<TQChannelBase*> flat;
        logo->getAllDescendantsFlattened(flat, 0, true);
        std::multiset<const TQChannelBase*> expected;
        for (TQChannelBase* c : flat)
            if (auto* k = dynamic_cast<TQChannel*>(c); k && k->canKeyframe()) expected.insert(k);
        ctrl.showAll();
        ctrl.appendFolderToCurveSet(logo);
        const std::vector<const TQChannelBase*> shown = shownChannels();
        EXPECT_EQ(std::multiset(shown.begin(), shown.end()), expected);
    }
    SCOPED_TRACE("merging the shown set with another");
    host.setSelectedObjects({title});
    choose("Opacity");
    const std::vector<const TQChannelBase*> opacity = shownChannels();
    const TQCurveSetPtr merged = ctrl.addCurveSetToCurrent(ctrl.curveSetRotation());
    EXPECT_EQ(ctrl.selectedCurveSet(), merged);
    EXPECT_EQ(merged->curveSetName(), "Opacity 1") << "the automatic name is reserved";
    std::vector<const TQChannelBase*> expected = opacity;
    for (const TQChannelBase* c : channelsOf(*ctrl.curveSetRotation())) expected.push_back(c);
    const std::vector<const TQChannelBase*> shown = shownChannels();
    EXPECT_EQ(std::multiset(shown.begin(), shown.end()),
              std::multiset(expected.begin(), expected.end()));
}

TEST_F(CurveSetRegistry, unique_names__numbers_go_on_from_a_single_trailing_digit) {
    const struct {
        const char* name;
        std::vector<std::string> taken;
        const char* expected;
    } rows[] = {
        {"Foo", {}, "Foo"},
        {"Foo", {"Foo"}, "Foo 1"},
        {"Foo", {"Foo", "Foo 1"}, "Foo 2"},
        {"Foo 1", {}, "Foo"},  // the number 1 is dropped
        {"Foo 3", {}, "Foo 3"},
        {"Foo 3", {"Foo 3"}, "Foo 4"},
        {"Foo 12", {"Foo 12"}, "Foo 12 1"},  // two digits stay in the base
        {"All", {}, "All 1"},                // automatic names are reserved
        {"Retiming 2", {"Retiming 2"}, "Retiming 3"},
        {"7", {}, "7"},
    };
    for (const auto& row : rows) {
        ctrl.removeAllCurveSets();
        for (const std::string& name : row.taken) {
            auto set = std::make_shared<TQCurveSetMutable>();
            set->initWithName(name, &host);
            ctrl.addCurveSet(set);
        }
        EXPECT_EQ(ctrl.findUniqueCurveSetNameForName(row.name), row.expected)
            << row.name << " with " << row.taken.size() << " taken";
    }
}

TEST_F(CurveSetRegistry, solo_and_close__one_channel_alone_then_all_again_then_none_kept) {
    host.setSelectedObjects({object(kTQHostSampleTitleObject)});
    choose("All");
    const TQCurveSetPtr set = ctrl.selectedCurveSet();
    ASSERT_GE(set->numberOfChannelItems(), 3u);
    const TQCurveEditorItemPtr item = set->channeItemAtIndex(1);
    auto enabled = [&] {
        std::vector<bool> out;
        for (const TQCurveEditorItemPtr& i : set->allItems())
            out.push_back(i->isEnabledItem() != 0);
        return out;
    };
    std::vector<bool> alone(set->numberOfChannelItems(), false);
    alone[1] = true;
    ctrl.soloItem(item.get());
    EXPECT_EQ(enabled(), alone) << "an enabled item among others: it alone";
    ctrl.soloItem(item.get());
    EXPECT_EQ(enabled(), std::vector<bool>(alone.size(), true)) << "soloed already: all again";
    ctrl.enableChannel(item->channelBase(), false);
    ctrl.soloItem(item.get());
    EXPECT_EQ(enabled(), alone) << "a disabled item: enabled, the others not";
    ctrl.selectChannel(item->channelBase(), true);
    EXPECT_EQ(ctrl.selectedChannel(), item);

    SCOPED_TRACE("closing the window forgets what the rebuilt sets hold");
    host.setSelectedObjects(allObjects());
    for (const char* title : {"Modified", "Animated"}) choose(title);
    RWWindow window;
    EXPECT_TRUE(ctrl.windowShouldClose(window));
    for (const TQCurveSetPtr& rebuilt :
         {TQCurveSetPtr(ctrl.curveSetAnimated()), ctrl.curveSetModified(),
          TQCurveSetPtr(ctrl.curveSetAll())})
        EXPECT_EQ(rebuilt->numberOfItems(), 0u) << rebuilt->curveSetName();
}

}  // namespace
}  // namespace editor_test
