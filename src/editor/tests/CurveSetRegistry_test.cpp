// The full editor's curve sets on the sample project, reached as the user reaches them: the
// pop-up's items, adding channels, cloning and merging sets, soloing, the names custom sets
// get, the set manager worked inside its modal run, and the custom sets to the host's saved
// list and back with the number that names the selected set in documents of each version.
#include <gtest/gtest.h>

#include <algorithm>
#include <map>
#include <sstream>

#include "src/curvesets/TQCurveSetListSerializer.h"
#include "src/editor/TQCurveSetManagerList.h"
#include "src/editor/TQCurveSetPanelViews.h"
#include "src/editor/tests/EditorFixture.h"
#include "tests/support/StepScript.h"
#include "tests/support/TextBaseline.h"

namespace editor_test {
namespace {

struct Script {
    const char* name;
    std::string script;   // steps separated by ";", see steps()
    bool panels = false;  // the set panels of the editor connected
};

void PrintTo(const Script& s, std::ostream* os) { *os << s.name; }

// Scripts of what a user does with sets, each step followed in the recorded baseline
// (baselines/curve_sets.txt) by what the pop-up, the shown set, the custom sets and the
// manager then hold. Sets are lettered in the order they are first seen (numbered past the
// 26th), so that the record tells a set from a copy of it.
class CurveSetScripts : public EditorFixture, public ::testing::WithParamInterface<Script> {
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
        const size_t n = letters.emplace(set.curveSetId(), letters.size()).first->second;
        std::string out("[");
        out.append(n < 26 ? std::string(1, char('a' + n)) : std::to_string(n)).append("]");
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
    // (the next new set's number), add and inlist (object and path), folder, create (name with
    // "_" for a space, and key), forget (every custom set), clone (the shown set), copy, merge,
    // solo, disable and pick (by index in the shown set), relative (the shown set), close (the
    // window), menu (the pop-up's items), absolute (no relative sets); change (a step of a drag
    // on an object's channel); colour (index, colour), remove (an object), save, read (name,
    // "relative" or not, saved paths), construct (at a document version and selected number,
    // or as the list stands), rebuild (without a list); and inside "manage ... end" the manager:
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
                 const auto all = host.scene().objects();
                 if (s.rest == "everything") objects.assign(all.begin(), all.end());
                 host.setSelectedObjects(objects);
             }},
            {"choose", [&] { choose(s.rest); }},
            {"active", [&] { ctrl.showActive(); }},
            {"all", [&] { ctrl.showAll(); }},
            {"index", [&] { gNewCurveSetIndex = uint32_t(s.number(0)); }},
            {"add", [&] { ctrl.appendChannelToCurveSet(channelAt(s.word(0), s.word(1))); }},
            {"inlist", [&] { ctrl.setChannelInList(channelAt(s.word(0), s.word(1))); }},
            {"folder", [&] { ctrl.appendFolderToCurveSet(object(s.rest.c_str())); }},
            {"create",
             [&] {
                 std::string name = s.word(0);
                 std::replace(name.begin(), name.end(), '_', ' ');
                 ctrl.createCurveSetWithName(name)->setCurveSetShortcut(s.word(1));
             }},
            {"forget", [&] { ctrl.removeAllCurveSets(); }},
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
            {"construct",
             [&] {
                 // The list built into the controller as the editor's start builds it.
                 if (!s.words.empty()) saved.setSelectedCurveSet(uint32_t(s.number(1)));
                 host.setCurveSetListSerializer(&saved);
                 host.setVersion(s.words.empty() ? 5.0 : s.number(0));
                 ctrl.removeAllCurveSets();
                 ctrl.viewDidLoad();
                 host.setCurveSetListSerializer(nullptr);
             }},
            {"change",
             [&] {
                 channelAt(s.word(0), s.word(1))->noteWillChange(true);
                 host.postNotification(kTQNotifyChannelsChanging);
             }},
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
    std::map<uint32_t, size_t> letters;
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
        // Numbers go on from a single trailing digit (a number 1 is dropped, two digits stay
        // in the base); automatic names are reserved.
        Script{"uniqueNames",
               "create Foo; create Foo; create Foo; forget; create Foo_1; forget; create Foo_3; "
               "create Foo_3; forget; create Foo_12; create Foo_12; create All; "
               "create Retiming_2; create Retiming_2; create 7"},
        // Each set chosen, saved under its number and built again from it; Pivot has no number
        // when saved, so the list keeps the one it had. Active follows a drag; the selection
        // re-filters the shown set.
        Script{"eachSetSavedAndBuilt",
               "objects Title; create One; create Two; choose All; save; construct; "
               "choose Animated; save; construct; choose Active; save; construct; "
               "choose Modified; save; construct; choose Position; save; construct; "
               "choose Rotation; save; construct; choose Scale; save; construct; choose Shear; "
               "save; construct; choose Pivot; save; construct; choose Opacity; save; construct; "
               "choose Retiming; save; construct; choose One; save; construct; choose Two; save; "
               "construct; active; change Title ./1/200/202; choose Position; objects Logo"},
        // The selected number of documents of each version, and past the end of the list.
        Script{"numbersByVersion",
               "read First absolute; read Second absolute; construct 2 2; construct 2 3; "
               "construct 2 5; construct 2.9 10; construct 3 3; construct 3 8; construct 4 10; "
               "construct 4 12; construct 5 0; construct 5 10; construct 5 12; construct 5 13; "
               "construct 5 4000000000"},
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
