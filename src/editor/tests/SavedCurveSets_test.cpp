// The custom curve sets through the host's document and back: what saveCurveSets writes, what
// constructCurveSets builds from a list the host read, and the number that names the
// selected set in documents of each version.
#include <gtest/gtest.h>

#include <memory>
#include <string>
#include <tuple>

#include "host/TQHostProjectFile.h"
#include "src/editor/tests/EditorFixture.h"

namespace editor_test {
namespace {

// What a user sees of a custom set: its name, kind and shortcut, its channels by path from
// the scene root, with their colours.
struct SetForm {
    std::string name;
    bool relative = false;
    std::string shortcut;
    std::vector<std::pair<std::string, uint32_t>> channels;
    friend bool operator==(const SetForm&, const SetForm&) = default;
};

std::ostream& operator<<(std::ostream& out, const SetForm& form) {
    out << form.name << (form.relative ? " (relative)" : "") << " [" << form.shortcut << "]";
    for (const auto& [path, colour] : form.channels) out << " " << path << "#" << colour;
    return out;
}

class SavedCurveSets : public EditorFixture {
protected:
    void SetUp() override {
        EditorFixture::SetUp();
        RWServiceSet services;
        services.userDefaults = &defaults;
        RWInstallServices(services);
    }
    void TearDown() override {
        RWResetServices();
        EditorFixture::TearDown();
    }

    TQChannel* channel(const char* objectName, const char* path) {
        return dynamic_cast<TQChannel*>(TQChannelRef(path).getChannel(object(objectName)));
    }
    std::string pathOf(const TQChannelBase* c) {
        return TQChannelRef(c, host.sceneChannelRoot()).getText();
    }
    // A custom set holding the channels, with the colours given.
    TQCurveSetPtr customSet(const char* name,
                            const std::vector<std::pair<TQChannel*, uint32_t>>& in) {
        const TQCurveSetPtr set = ctrl.createCurveSetWithName(name);
        ctrl.setSelectedCurveSet(set);
        for (const auto& [c, colour] : in) {
            EXPECT_NE(c, nullptr) << "no such channel in the sample";
            if (!c) continue;
            static_cast<TQCurveEditorChannelItem&>(*ctrl.appendChannelToCurveSet(c))
                .setColorIndex(colour);
        }
        return set;
    }
    std::vector<SetForm> forms() {
        std::vector<SetForm> out;
        for (const TQCurveSetPtr& set : ctrl.curveSets()) {
            SetForm form{set->curveSetName(), set->isRelative(), set->curveSetShortcut(), {}};
            for (const TQCurveEditorItemPtr& item : set->allItems())
                form.channels.emplace_back(
                    pathOf(item->channelBase()),
                    static_cast<const TQCurveEditorChannelItem&>(*item).colorIndex());
            out.push_back(form);
        }
        return out;
    }
    // A list as a host reads it from a file: each set with its channel paths (colour 3).
    static std::unique_ptr<TQCurveSetListSerializer> list(
        const std::vector<std::tuple<std::string, bool, std::vector<std::string>>>& sets,
        uint32_t selected) {
        auto out = std::make_unique<TQCurveSetListSerializer>();
        for (const auto& [name, relative, paths] : sets) {
            auto set = std::make_unique<TQCurveSetSerializer>(name);
            set->setRelative(relative);
            for (const std::string& path : paths) {
                auto item = std::make_unique<TQCurveEditorItemSerializer>();
                item->setChannelRef(TQChannelRef(path));
                item->setColorIndex(3);
                set->addChannel(item.release());
            }
            out->addCurveSet(set.release());
        }
        out->setSelectedCurveSet(selected);
        return out;
    }
    // The list built into the controller as the editor's start does: anew, then the pop-up.
    void construct(TQCurveSetListSerializer& saved, double version = 5.0) {
        host.setCurveSetListSerializer(&saved);
        host.setVersion(version);
        ctrl.removeAllCurveSets();
        ctrl.viewDidLoad();
        host.setCurveSetListSerializer(nullptr);
    }

    RWMemoryUserDefaults defaults;
};

TEST_F(SavedCurveSets, project_round_trip__sets_channels_colours_and_the_selected_set) {
    // The relative set shows its paths on these.
    host.setSelectedObjects({object("Title"), object("Lower Third")});
    const TQCurveSetPtr bounce = customSet(
        "Bounce", {{channel("Logo", "./1/100/101/2"), 5}, {channel("Logo", "./1/100/109/3"), 7}});
    const TQCurveSetPtr fades = customSet("Fades", {{channel("Title", "./1/200/202"), 0},
                                                    {channel("Lower Third", "./1/200/202"), 2}});
    fades->setRelative(true);
    bounce->setCurveSetShortcut("b");
    ctrl.setSelectedCurveSet(fades);
    std::vector<SetForm> before = forms();
    ASSERT_EQ(before.size(), 2u);
    ASSERT_EQ(before[0].channels.size(), 2u);

    TQHostProject project(host);
    ctrl.saveCurveSets(&project.curveSets());
    EXPECT_EQ(project.curveSets().getSelectedCurveSet(), 12u) << "custom set 1 after 11 others";
    std::string text;
    BNStringSink sink(text);
    ASSERT_FALSE(project.write(sink));
    // The document replaces the scene: every object and channel is new.
    ASSERT_FALSE(project.read(text));
    ctrl.removeAllCurveSets();
    ctrl.constructCurveSets();
    ctrl.refreshPopUp();

    before[0].shortcut.clear();  // the shortcut is not saved
    EXPECT_EQ(forms(), before);
    EXPECT_EQ(ctrl.selectedCurveSet(), ctrl.curveSets()[1]);
    EXPECT_EQ(ctrl.curveSetsPopUp()->title(), "Fades");
    for (const SetForm& form : forms())
        for (const auto& [path, colour] : form.channels)
            EXPECT_NE(TQChannelRef(path).getChannel(host.sceneChannelRoot()), nullptr)
                << path << " must resolve in the scene that was read";
}

TEST_F(SavedCurveSets, save__the_selected_sets_number_with_the_gap_for_pivot) {
    ctrl.createCurveSetWithName("One");
    ctrl.createCurveSetWithName("Two");
    const struct {
        TQCurveSetPtr set;
        uint32_t previous;
        uint32_t expected;
    } rows[] = {
        {ctrl.curveSetAll(), 1, 0},      {ctrl.curveSetAnimated(), 0, 1},
        {ctrl.curveSetCurrent(), 1, 2},  {ctrl.curveSetModified(), 1, 3},
        {ctrl.curveSetPosition(), 1, 4}, {ctrl.curveSetRotation(), 1, 5},
        {ctrl.curveSetScale(), 1, 6},    {ctrl.curveSetShear(), 1, 7},
        {ctrl.curveSetOpacity(), 1, 9},  {ctrl.curveSetRetiming(), 1, 10},
        {ctrl.curveSets()[0], 1, 11},    {ctrl.curveSets()[1], 1, 12},
        {ctrl.curveSetPivot(), 1, 1},  // no number of its own: the list's stays
        {ctrl.curveSetPivot(), 7, 7},
    };
    for (const auto& row : rows) {
        SCOPED_TRACE(row.set->curveSetName());
        TQCurveSetListSerializer saved;
        saved.setSelectedCurveSet(row.previous);
        ctrl.setSelectedCurveSet(row.set);
        ctrl.saveCurveSets(&saved);
        EXPECT_EQ(saved.getSelectedCurveSet(), row.expected);
        EXPECT_EQ(saved.curveSets().size(), 2u) << "every custom set, also the empty ones";
    }
    {
        SCOPED_TRACE("Pivot reopens on Animated");
        TQCurveSetListSerializer saved;
        ctrl.setSelectedCurveSet(ctrl.curveSetPivot());
        ctrl.saveCurveSets(&saved);
        construct(saved);
        EXPECT_EQ(ctrl.selectedCurveSet(), ctrl.curveSetAnimated());
    }
}

TEST_F(SavedCurveSets, construct__numbers_by_document_version_and_past_the_end) {
    auto saved = list({{"First", false, {}}, {"Second", false, {}}}, 0);
    const struct {
        double version;
        uint32_t number;
        const char* expected;
    } rows[] = {
        {2.0, 2, "Active"},   {2.0, 3, "First"},     {2.0, 4, "Second"},
        {2.0, 5, "Animated"}, {2.9, 10, "Animated"}, {3.0, 3, "Modified"},
        {3.0, 8, "Pivot"},    {4.0, 9, "Opacity"},   {4.0, 10, "First"},
        {4.0, 11, "Second"},  {4.0, 12, "Animated"}, {5.0, 0, "All"},
        {5.0, 7, "Shear"},    {5.0, 10, "Retiming"}, {5.0, 11, "First"},
        {5.0, 12, "Second"},  {5.0, 13, "Animated"}, {5.0, 4000000000u, "Animated"},
    };
    for (const auto& row : rows) {
        SCOPED_TRACE(std::to_string(row.version) + " #" + std::to_string(row.number));
        saved->setSelectedCurveSet(row.number);
        construct(*saved, row.version);
        ASSERT_EQ(ctrl.curveSets().size(), 2u);
        EXPECT_EQ(ctrl.selectedCurveSet()->curveSetName(), row.expected);
        EXPECT_EQ(ctrl.curveSetsPopUp()->title(), row.expected)
            << "the pop-up is filled after the sets are built";
    }
}

TEST_F(SavedCurveSets, vanished_channels__left_out_when_saving_and_skipped_when_reading) {
    const std::string titleOpacity = pathOf(channel("Title", "./1/200/202"));
    const std::string logoX = pathOf(channel("Logo", "./1/100/101/1"));
    {
        SCOPED_TRACE("reading: a path to nothing and a path to a folder are skipped");
        const std::string folder = pathOf(object("Logo")) + "/1";
        auto saved = list({{"Mixed", false, {titleOpacity, "./99/1", folder, logoX}},
                           {"Gone", false, {"./99/1", "./1/99999"}},
                           {"Relative", true, {"./99/1", titleOpacity}}},
                          11);
        construct(*saved);
        ASSERT_EQ(ctrl.curveSets().size(), 3u) << "a set whose channels all vanished is made";
        const std::vector<SetForm> read = forms();
        EXPECT_EQ(read[0], (SetForm{"Mixed", false, "", {{titleOpacity, 3}, {logoX, 3}}}));
        EXPECT_EQ(read[1], (SetForm{"Gone", false, "", {}}));
        const std::vector<TQChannelRef>* paths = ctrl.curveSets()[2]->references();
        ASSERT_EQ(paths->size(), 1u) << "a relative set keeps the paths of the channels found";
        EXPECT_EQ((*paths)[0].getText(), "./1/200/202");
    }
    {
        SCOPED_TRACE("a set of that name already there takes the channels");
        auto saved = list({{"Gone", false, {titleOpacity}}}, 1);
        host.setCurveSetListSerializer(saved.get());
        ctrl.constructCurveSets();
        host.setCurveSetListSerializer(nullptr);
        ASSERT_EQ(ctrl.curveSets().size(), 3u);
        EXPECT_EQ(forms()[1], (SetForm{"Gone", false, "", {{titleOpacity, 3}}}));
    }
    {
        SCOPED_TRACE("saving: a channel of an object removed since is left out");
        ctrl.removeAllCurveSets();
        customSet("Both",
                  {{channel("Title", "./1/200/202"), 1}, {channel("Logo", "./1/100/101/1"), 4}});
        ASSERT_TRUE(host.removeObject(object("Logo")));
        TQCurveSetListSerializer saved;
        ctrl.saveCurveSets(&saved);
        ASSERT_EQ(saved.curveSets().size(), 1u);
        const auto& channels = saved.curveSets()[0]->_channels;
        ASSERT_EQ(channels.size(), 1u);
        EXPECT_EQ(channels[0]->getChannelRef(), titleOpacity);
        EXPECT_EQ(channels[0]->getColorIndex(), 1u);
    }
    {
        SCOPED_TRACE("no list: nothing changes");
        const TQCurveSetPtr shown = ctrl.selectedCurveSet();
        ctrl.constructCurveSets();
        ctrl.saveCurveSets(nullptr);
        EXPECT_EQ(ctrl.selectedCurveSet(), shown);
        EXPECT_EQ(ctrl.curveSets().size(), 1u);
    }
}

}  // namespace
}  // namespace editor_test
