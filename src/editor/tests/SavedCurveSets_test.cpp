// The custom curve sets to the host's saved list and back, and the number that names the
// selected set in documents of each version.
#include <gtest/gtest.h>

#include <string>

#include "src/curvesets/TQCurveSetListSerializer.h"
#include "src/editor/tests/EditorFixture.h"

namespace editor_test {
namespace {

class SavedCurveSets : public EditorFixture {
protected:
    std::string pathOf(const TQChannelBase* c) {
        return c ? TQChannelRef(c, host.sceneChannelRoot()).getText() : "(none)";
    }
    // Each custom set as "name[/relative]: path#colour ...".
    std::vector<std::string> forms() {
        std::vector<std::string> out;
        for (const TQCurveSetPtr& set : ctrl.curveSets()) {
            std::string form = set->curveSetName() + (set->isRelative() ? "/relative:" : ":");
            for (const TQCurveEditorItemPtr& item : set->allItems()) {
                const auto& shown = static_cast<const TQCurveEditorChannelItem&>(*item);
                form +=
                    " " + pathOf(item->channelBase()) + "#" + std::to_string(shown.colorIndex());
            }
            out.push_back(form);
        }
        return out;
    }
    // The list built into the controller as the editor's start builds it.
    void construct(TQCurveSetListSerializer& saved, double version = 5.0) {
        host.setCurveSetListSerializer(&saved);
        host.setVersion(version);
        ctrl.removeAllCurveSets();
        ctrl.viewDidLoad();
        host.setCurveSetListSerializer(nullptr);
    }
};

TEST_F(SavedCurveSets, save_and_construct__sets_come_back_without_what_vanished) {
    host.setSelectedObjects({object("Title"), object("Lower Third")});
    auto add = [&](const char* name, std::vector<std::pair<TQChannel*, uint32_t>> channels) {
        const TQCurveSetPtr set = ctrl.createCurveSetWithName(name);
        ctrl.setSelectedCurveSet(set);
        for (const auto& [c, colour] : channels)
            static_cast<TQCurveEditorChannelItem&>(*ctrl.appendChannelToCurveSet(c))
                .setColorIndex(colour);
        return set;
    };
    add("Bounce", {{channel("Logo", "./1/100/101/2"), 5}, {channel("Title", "./1/304"), 7}});
    add("Fades",
        {{channel("Title", "./1/200/202"), 0}, {channel("Lower Third", "./1/200/202"), 2}});
    ctrl.curveSets()[0]->setCurveSetShortcut("b");
    const std::string retiming = pathOf(channel("Title", "./1/304")),
                      opacity = pathOf(channel("Title", "./1/200/202"));
    const std::vector<std::string> before = forms();
    ASSERT_TRUE(host.removeObject(object("Logo")));

    TQCurveSetListSerializer saved;
    ctrl.saveCurveSets(&saved);
    EXPECT_EQ(saved.getSelectedCurveSet(), 12u) << "custom set 1 after the 11 automatic ones";
    // Reading skips a path to nothing and one to a folder; a set of nothing is still made.
    auto read = [&](const char* name, bool relative, const std::vector<std::string>& paths) {
        auto set = std::make_unique<TQCurveSetSerializer>(name);
        set->setRelative(relative);
        for (const std::string& path : paths) {
            auto item = std::make_unique<TQCurveEditorItemSerializer>();
            item->setChannelRef(TQChannelRef(path));
            set->addChannel(item.release());
        }
        saved.addCurveSet(set.release());
    };
    read("Junk", false, {"./99/1", pathOf(object("Title")) + "/1"});
    read("Relative", true, {"./99/1", opacity});
    construct(saved);

    // The logo's channel was not saved; a relative set's paths come from the channels found.
    EXPECT_EQ(forms(), (std::vector<std::string>{"Bounce: " + retiming + "#7", before[1],
                                                 "Junk:", "Relative/relative: " + opacity + "#0"}));
    EXPECT_EQ(ctrl.curveSets()[0]->curveSetShortcut(), "") << "shortcuts are not saved";
    EXPECT_EQ(ctrl.selectedCurveSet(), ctrl.curveSets()[1]);
    EXPECT_EQ(ctrl.curveSets()[3]->references()->size(), 1u);
    EXPECT_EQ(ctrl.curveSetsPopUp()->title(), "Fades");

    const TQCurveSetPtr shown = ctrl.selectedCurveSet();
    ctrl.constructCurveSets();  // no list: nothing changes
    ctrl.saveCurveSets(nullptr);
    EXPECT_EQ(ctrl.selectedCurveSet(), shown);
    EXPECT_EQ(ctrl.curveSets().size(), 4u);
}

TEST_F(SavedCurveSets, save__the_selected_sets_number_with_no_number_for_pivot) {
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

TEST_F(SavedCurveSets, construct__numbers_by_document_version_and_past_the_end) {
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

}  // namespace
}  // namespace editor_test
