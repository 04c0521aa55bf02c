// The full editor's curve sets on the sample project, reached as the user reaches them: the
// pop-up's items, adding channels, cloning and merging sets, soloing, the names custom sets
// get, the set manager worked inside its modal run, and the custom sets to the host's saved
// list and back with the number that names the selected set in documents of each version.
#include <gtest/gtest.h>

#include <algorithm>
#include <map>
#include <set>
#include <sstream>

#include "src/curvesets/TQCurveSetListSerializer.h"
#include "src/editor/TQCurveSetManagerList.h"
#include "src/editor/TQCurveSetPanelViews.h"
#include "src/editor/tests/EditorFixture.h"
#include "tests/support/StepScript.h"
#include "tests/support/TextBaseline.h"

namespace editor_test {
namespace {

class CurveSetRegistry : public EditorFixture {
protected:
    // The list built into the controller as the editor's start builds it.
    void construct(TQCurveSetListSerializer& saved, double version = 5.0) {
        host.setCurveSetListSerializer(&saved);
        host.setVersion(version);
        ctrl.removeAllCurveSets();
        ctrl.viewDidLoad();
        host.setCurveSetListSerializer(nullptr);
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

TEST_F(CurveSetRegistry, saved__the_selected_sets_number_with_no_number_for_pivot) {
    ctrl.createCurveSetWithName("One");
    ctrl.createCurveSetWithName("Two");
    // Numbered in this order; Pivot has none (8 is nobody's).
    const TQCurveSetPtr numbered[] = {
        ctrl.curveSetAll(),      ctrl.curveSetAnimated(), ctrl.curveSetCurrent(),
        ctrl.curveSetModified(), ctrl.curveSetPosition(), ctrl.curveSetRotation(),
        ctrl.curveSetScale(),    ctrl.curveSetShear(),    nullptr,
        ctrl.curveSetOpacity(),  ctrl.curveSetRetiming(), ctrl.curveSets()[0],
        ctrl.curveSets()[1]};
    TQCurveSetListSerializer saved;
    for (uint32_t n = 0; n < std::size(numbered); ++n) {
        if (!numbered[n]) continue;
        saved.setSelectedCurveSet(n + 1);
        ctrl.setSelectedCurveSet(numbered[n]);
        ctrl.saveCurveSets(&saved);
        EXPECT_EQ(saved.getSelectedCurveSet(), n) << numbered[n]->curveSetName();
    }
    saved.setSelectedCurveSet(7);
    ctrl.setSelectedCurveSet(ctrl.curveSetPivot());
    ctrl.saveCurveSets(&saved);
    EXPECT_EQ(saved.getSelectedCurveSet(), 7u) << "the list's number stays";
    saved.setSelectedCurveSet(1);
    ctrl.saveCurveSets(&saved);
    construct(saved);
    EXPECT_EQ(ctrl.selectedCurveSet(), ctrl.curveSetAnimated()) << "Pivot reopens so";
}

TEST_F(CurveSetRegistry, saved__construct_numbers_by_document_version_and_past_the_end) {
    TQCurveSetListSerializer saved;
    saved.addCurveSet(new TQCurveSetSerializer("First"));
    saved.addCurveSet(new TQCurveSetSerializer("Second"));
    const struct {
        double version;
        uint32_t number;
        const char* expected;
    } rows[] = {
        {2.0, 2, "Active"},
        {2.0, 3, "First"},
        {2.0, 5, "Animated"},
        {2.9, 10, "Animated"},
        {3.0, 3, "Modified"},
        {3.0, 8, "Pivot"},
        {4.0, 10, "First"},
        {4.0, 12, "Animated"},
        {5.0, 0, "All"},
        {5.0, 10, "Retiming"},
        {5.0, 12, "Second"},
        {5.0, 13, "Animated"},
        {5.0, 4000000000u, "Animated"},
    };
    for (const auto& row : rows) {
        SCOPED_TRACE(std::to_string(row.version) + " #" + std::to_string(row.number));
        saved.setSelectedCurveSet(row.number);
        construct(saved, row.version);
        EXPECT_EQ(ctrl.selectedCurveSet()->curveSetName(), row.expected);
        EXPECT_EQ(ctrl.curveSetsPopUp()->title(), row.expected);
    }
}

struct Script {
    const char* name;
    std::string script;   // steps separated by ";", see steps()
    bool panels = false;  // the set panels of the editor connected
};

void PrintTo(const Script& s, std::ostream* os) { *os << s.name; }

// Scripts of what a user does with sets, each step followed in the recorded baseline
// (baselines/curve_sets.txt) by what the pop-up, the shown set, the custom sets and the
// manager then hold. Sets are lettered in the order they are first seen, so that the record
// tells a set from a copy of it.
class CurveSetScripts : public CurveSetRegistry, public ::testing::WithParamInterface<Script> {
protected:
    void connect(TQCurveEditorOutlets& outlets) override {
        if (!GetParam().panels) return;
        TQInstantiateCurveSetPanels(&ctrl, outlets);
        list = outlets.curveSetManagerList;
        manager = outlets.curveSetManagerPanel;
    }
    // An automatic set by its name, or a custom one.
    TQCurveSetPtr named(const std::string& name) {
        const std::pair<const char*, TQCurveSetPtr> automatic[] = {
            {"All", ctrl.curveSetAll()},
            {"Animated", ctrl.curveSetAnimated()},
            {"Modified", ctrl.curveSetModified()},
            {"Scale", ctrl.curveSetScale()},
            {"Rotation", ctrl.curveSetRotation()}};
        for (const auto& [n, set] : automatic)
            if (name == n) return set;
        for (const TQCurveSetPtr& set : ctrl.curveSets())
            if (set->curveSetName() == name) return set;
        ADD_FAILURE() << "no set " << name;
        return ctrl.curveSetAll();
    }
    // A channel as "Object:Folder.Name#colour", "-" when disabled, "*" when selected.
    static std::string name(const TQCurveEditorItem& item) {
        const TQChannelBase* c = item.channelBase();
        if (!c || !c->getChannelRoot()) return "(vanished)";
        const auto* shown = dynamic_cast<const TQCurveEditorChannelItem*>(&item);
        std::string out =
            c->getChannelRoot()->getName() + ":" + c->getParent()->getName() + "." + c->getName();
        if (shown) out.append("#").append(std::to_string(shown->colorIndex()));
        return out + (item.isEnabledItem() ? "" : "-") + (item.isSelected() ? "*" : "");
    }
    std::string form(const TQCurveSet& set) {
        const auto [at, added] = letters.emplace(set.curveSetId(), char('a' + letters.size()));
        std::string out = {'[', at->second, ']'};
        out += set.curveSetName();
        if (!set.curveSetShortcut().empty()) out += ":" + set.curveSetShortcut();
        if (set.isRelative())
            out +=
                "/relative of " + std::to_string(set.references() ? set.references()->size() : 0);
        for (const TQCurveEditorItemPtr& item : set.allItems()) out.append(" ").append(name(*item));
        return out;
    }
    std::string state() {
        std::string out = "  pop-up " + ctrl.curveSetsPopUp()->title() + ", shown " +
                          form(*ctrl.selectedCurveSet()) + "\n";
        for (const TQCurveSetPtr& set : ctrl.curveSets()) out += "  custom " + form(*set) + "\n";
        for (; runs < modal.runs().size(); ++runs) out += "  ran " + modal.runs()[runs] + "\n";
        if (manager && (ctrl.isManagingCurveSets() || manager->isVisible()))
            out += std::string("  manager") + (ctrl.isManagingCurveSets() ? "" : " done") +
                   (manager->isVisible() ? "" : " hidden") + ", row " +
                   std::to_string(list->selectedRow()) + "\n";
        return out;
    }
    // Objects are named with "_" for a space.
    TQChannelBase* objectNamed(std::string name) {
        std::replace(name.begin(), name.end(), '_', ' ');
        return object(name.c_str());
    }
    TQChannel* channelAt(const std::string& object, const std::string& path) {
        return dynamic_cast<TQChannel*>(TQChannelRef(path).getChannel(objectNamed(object)));
    }
    TQCurveEditorItem* itemAt(size_t i) {
        return ctrl.selectedCurveSet()->channeItemAtIndex(uint32_t(s.number(i))).get();
    }
    // A saved path: "./99/1" as it stands, "Title/1" below an object, "Title:./1/200/202" to
    // the object's channel.
    std::string savedPath(const std::string& word) {
        const TQChannelBase* root = host.sceneChannelRoot();
        const size_t colon = word.find(':'), slash = word.find('/');
        if (colon != word.npos)
            return TQChannelRef(channelAt(word.substr(0, colon), word.substr(colon + 1)), root)
                .getText();
        if (word.rfind("./", 0) == 0) return word;
        return TQChannelRef(objectNamed(word.substr(0, slash)), root).getText() +
               word.substr(slash);
    }

    // Steps: objects (names, or "everything"), choose (a pop-up title), active, all, index
    // (the next new set's number), add and inlist (object and path), folder, create (name and
    // key), clone (the shown set), copy, merge, solo, disable and pick (by index in the shown
    // set), relative (the shown set), close (the window), menu (the pop-up's items), absolute (no relative sets);
    // colour (index, colour), remove (an object), save, read (name, "relative" or not, saved
    // paths), construct, rebuild (without a list); and inside "manage ... end" the manager:
    // type (name or key, row, text with "_" for a space), drag and dragended (rows), row,
    // plus, minus, press (a button), absolutize (a row), deletekey, posted (the last word).
    tests_support::Steps steps() {
        const auto column = [&] {
            return list->columnWithIdentifier(s.word(0) == "name"
                                                  ? TQCurveEditorCtrl::kNameColumn
                                                  : TQCurveEditorCtrl::kShortcutColumn);
        };
        const auto dropped = [&](bool ok) { record += ok ? "" : "  drop refused\n"; };
        return {
            {"objects",
             [&] {
                 std::vector<TQChannelBase*> objects;
                 for (const std::string& w : s.words) objects.push_back(objectNamed(w));
                 host.setSelectedObjects(s.rest == "everything" ? allObjects() : objects);
             }},
            {"choose", [&] { choose(s.rest); }},
            {"active", [&] { ctrl.showActive(); }},
            {"all", [&] { ctrl.showAll(); }},
            {"index", [&] { gNewCurveSetIndex = uint32_t(s.number(0)); }},
            {"add", [&] { ctrl.appendChannelToCurveSet(channelAt(s.word(0), s.word(1))); }},
            {"inlist", [&] { ctrl.setChannelInList(channelAt(s.word(0), s.word(1))); }},
            {"folder", [&] { ctrl.appendFolderToCurveSet(object(s.rest.c_str())); }},
            {"create",
             [&] { ctrl.createCurveSetWithName(s.word(0))->setCurveSetShortcut(s.word(1)); }},
            {"clone", [&] { ctrl.cloneCurveSetWithName(s.rest); }},
            {"copy", [&] { ctrl.cloneCurveSet(*named(s.rest)); }},
            {"merge", [&] { ctrl.addCurveSetToCurrent(named(s.rest)); }},
            {"solo", [&] { ctrl.soloItem(itemAt(0)); }},
            {"disable", [&] { ctrl.enableChannel(itemAt(0)->channelBase(), false); }},
            {"pick",
             [&] {
                 ctrl.selectChannel(itemAt(0)->channelBase(), true);
                 EXPECT_EQ(ctrl.selectedChannel().get(), itemAt(0));
             }},
            {"close",
             [&] {
                 RWWindow window;
                 EXPECT_TRUE(ctrl.windowShouldClose(window));
                 for (const char* set : {"All", "Animated", "Modified"})
                     record += "  " + std::string(set) + " holds " +
                               std::to_string(named(set)->numberOfItems()) + "\n";
             }},
            {"menu",
             [&] {
                 ctrl.curveSetsPopUp()->userWillPopUp();
                 ctrl.curveSetsPopUp()->menu()->update();
                 record += "  menu";
                 const RWMenu& menu = *ctrl.curveSetsPopUp()->menu();
                 for (int64_t i = 0; i < menu.numberOfItems(); ++i) {
                     const RWMenuItemPtr item = menu.itemAtIndex(i);
                     record += " " + (item->isSeparatorItem() ? "--" : item->title());
                     if (!item->keyEquivalent().empty()) record += ":" + item->keyEquivalent();
                     if (!item->isSeparatorItem() && !item->keyEquivalentModifierMask())
                         record += "(plain)";
                     if (ctrl.curveSetsPopUp()->indexOfSelectedItem() == i) record += "(selected)";
                     if (!item->isEnabled() && !item->isSeparatorItem()) record += "(disabled)";
                 }
                 record += "\n";
             }},
            {"absolute",
             [&] {
                 ctrl.setUsesRelativeCurveSets(false);
                 ctrl.refreshPopUp();
             }},
            {"colour",
             [&] {
                 static_cast<TQCurveEditorChannelItem&>(*itemAt(0))
                     .setColorIndex(uint32_t(s.number(1)));
             }},
            {"remove", [&] { EXPECT_TRUE(host.removeObject(objectNamed(s.rest))); }},
            {"save",
             [&] {
                 ctrl.saveCurveSets(&saved);
                 record += "  saved selected " + std::to_string(saved.getSelectedCurveSet()) + "\n";
             }},
            {"read",
             [&] {
                 auto set = std::make_unique<TQCurveSetSerializer>(s.word(0));
                 set->setRelative(s.word(1) == "relative");
                 for (size_t i = 2; i < s.words.size(); ++i) {
                     auto item = std::make_unique<TQCurveEditorItemSerializer>();
                     item->setChannelRef(TQChannelRef(savedPath(s.words[i])));
                     set->addChannel(item.release());
                 }
                 saved.addCurveSet(set.release());
             }},
            {"construct", [&] { construct(saved); }},
            {"rebuild",
             [&] {
                 ctrl.constructCurveSets();
                 ctrl.saveCurveSets(nullptr);
             }},
            {"type",
             [&, column] {
                 std::string text = s.word(2);
                 std::replace(text.begin(), text.end(), '_', ' ');
                 ASSERT_TRUE(list->editColumn(column(), int64_t(s.number(1))));
                 list->userEndEditing(text);
             }},
            {"drag",
             [&, dropped] {
                 dropped(list->userBeginDragRows(RWIndexSet{int64_t(s.number(0))}) &&
                         list->userDropAtRow(int64_t(s.number(1))));
             }},
            {"dragended",
             [&, dropped] {
                 ASSERT_TRUE(list->userBeginDragRows(RWIndexSet{int64_t(s.number(0))}));
                 list->userEndDrag();
                 dropped(list->userDropAtRow(int64_t(s.number(1))));
             }},
            {"row", [&] { list->userSelectRows(RWIndexSet{int64_t(s.number(0))}); }},
            {"plus",
             [&] { manager->contentView()->subview<RWSegmentedControl>()->userClickSegment(0); }},
            {"minus",
             [&] { manager->contentView()->subview<RWSegmentedControl>()->userClickSegment(1); }},
            {"press", [&] { press(*manager, "curveSetManager" + s.rest + ":"); }},
            {"absolutize",
             [&] {
                 list->userSetObjectValue(
                     list->columnWithIdentifier(TQCurveEditorCtrl::kRelativeColumn),
                     int64_t(s.number(0)), RWObjectValue(0));
             }},
            {"deletekey", [&] { list->delete_(); }},
            {"relative", [&] { ctrl.selectedCurveSet()->setRelative(true); }},
            {"end", [] {}},
            {"posted",
             [&] {
                 const auto& calls = recorder.calls();
                 const auto last = std::find_if(calls.rbegin(), calls.rend(), [](const auto& c) {
                     return c.operation == "postNotification";
                 });
                 ASSERT_NE(last, calls.rend());
                 record += "  posted " + std::to_string(last->word) + "\n";
             }},
        };
    }
    void step(const std::string& text) {
        record += ">" + text + "\n";
        tests_support::runSteps(text, s, table);
        record += state();
    }

    TQCurveSetManagerList* list = nullptr;
    std::shared_ptr<RWPanel> manager;
    TQCurveSetListSerializer saved;
    tests_support::StepArgs s;
    tests_support::Steps table = steps();
    std::string record;
    std::map<uint32_t, char> letters;
    size_t runs = 0;
};

TEST_P(CurveSetScripts, each_step__as_recorded) {
    gNewCurveSetIndex = 1;  // process-wide: a row must not see the rows run before it
    std::vector<std::string> script;
    std::istringstream in(GetParam().script);
    for (std::string step; std::getline(in, step, ';');) script.push_back(step);
    for (size_t i = 0; i < script.size(); ++i) {
        std::string name;
        std::istringstream(script[i]) >> name;
        if (name != "manage") {
            step(script[i]);
            continue;
        }
        // The steps up to "end" are the user's inside the manager's modal run.
        size_t end = i;
        while (end < script.size() && script[end] != " end") ++end;
        record += ">" + script[i] + "\n";
        modal.pushScript([&, i, end](RWWindow&, RWModalService&) {
            record += "  opened on row " + std::to_string(list->selectedRow()) + "\n";
            for (size_t k = i + 1; k < end; ++k) step(script[k]);
        });
        choose("Manage Curve Sets…");
        i = end;
        step(" end");
    }
    EXPECT_TRUE(tests_support::matchesBaselineBlock("curve_sets", GetParam().name, record,
                                                    "src/editor/tests/baselines"));
}

// Bounce (the title's opacity and x position), Fades (opacity, key "f"), Spin (relative).
const std::string kSets =
    "create Bounce; choose Bounce; add Title ./1/200/202; add Title ./1/100/101/1; "
    "create Fades F; choose Fades; add Title ./1/200/202; create Spin; choose Spin; "
    "add Title ./1/100/109/3; relative";

INSTANTIATE_TEST_SUITE_P(
    Editor, CurveSetScripts,
    ::testing::Values(
        // Sections in order, custom sets with their keys, the entries of the panels; without
        // relative sets the property section goes.
        Script{"popUp", "create Bounce; create Fades F; menu; choose Fades; absolute; menu"},
        // Adds while an automatic set shows start a custom set ("Untitled Set 1" asked for, a
        // number 1 dropped), the next add goes into it; from All a new one.
        Script{"addsStartACustomSet",
               "index 1; active; add Title ./1/200/202; add Title ./1/100/101/1; all; "
               "add Title ./1/200/202; inlist Title ./1/100/105/1"},
        // A clone of the shown set is absolute, selected and named uniquely; a copy keeps the
        // kind, takes the suffix once and is not selected.
        Script{"clones", "choose Position; clone Slide; clone Slide; objects Logo"},
        Script{"copies", "copy Scale; copy Scale Copy"},
        // A folder brings its keyframable channels, sub-folders too.
        Script{"folder", "all; folder Logo"},
        Script{"merge", "objects Title; choose Opacity; merge Rotation"},
        // Solo: an enabled item among others alone, soloed already all again, a disabled one
        // enabled with the others not. Closing the window forgets what rebuilt sets hold.
        Script{"soloAndClose",
               "objects Title; choose All; solo 1; solo 1; disable 1; solo 1; pick 1; "
               "objects everything; choose Modified; choose Animated; close"},
        // Cancel after many edits gives back the very sets and the shown one; Apply's choice
        // stays, on the original; an emptied list shows All.
        Script{"managerCancel",
               kSets + "; choose Fades; manage; type name 1 Fading; drag 0 3; row 0; minus; "
                       "press Duplicate; plus; type key 0 k; absolutize 0; press Cancel; end; "
                       "manage; row 2; press Apply; press Cancel; end; choose Animated; manage; "
                       "row 0; minus; row 0; minus; row 0; minus; press Cancel; end",
               true},
        // Drops land between rows, the dropped row selected; a drop on its own place or after
        // the drag ended changes nothing. A blank name is refused quietly, a taken one with
        // the alert, and Done waits for a free one; a key is one character free among all
        // sets. The delete key selects no row and leaves the shown set alone.
        Script{"managerDone",
               kSets + "; manage; drag 0 2; drag 2 0; drag 1 1; drag 1 2; dragended 0 2; "
                       "type name 0; type name 0 ___; type name 0 Bounce; press Done; "
                       "type name 0 Twirl; type key 2 u; type key 2 F; type key 2 ab; "
                       "type key 2 B; type key 1; press Done; end; choose Twirl; manage; row 0; "
                       "deletekey; posted; press Done; end",
               true},
        // Saved and built again: a vanished channel is not saved, shortcuts are not, a path
        // to nothing or to a folder is skipped, a relative set's paths come from the channels
        // found; without a list nothing changes.
        Script{"savedAndConstructed",
               "objects Title Lower_Third; create Bounce b; choose Bounce; "
               "add Logo ./1/100/101/2; colour 0 5; add Title ./1/304; colour 1 7; create Fades; "
               "choose Fades; add Title ./1/200/202; colour 0 0; add Lower_Third ./1/200/202; "
               "colour 1 2; remove Logo; save; read Junk absolute ./99/1 Title/1; "
               "read Relative relative ./99/1 Title:./1/200/202; construct; rebuild"}),
    [](const auto& p) { return std::string(p.param.name); });

}  // namespace
}  // namespace editor_test
