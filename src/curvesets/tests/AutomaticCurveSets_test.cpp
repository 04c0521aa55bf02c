// The automatic curve sets on the sample piece, in both object families.
#include "src/curvesets/TQAutomaticCurveSets.h"

#include <gtest/gtest.h>

#include <set>
#include <sstream>

#include "host/TQHostAppDelegate.h"
#include "host/TQHostSampleScene.h"
#include "tests/support/TextBaseline.h"

namespace {

using P = TQHostProperty;
using Paths = std::set<BNString>;

class AutomaticSets : public ::testing::TestWithParam<TQHostObjectFamily> {
protected:
    void SetUp() override {
        TQHostLoadSampleScene(host, GetParam());
        title = host.scene().objectNamed(kTQHostSampleTitleObject);
        logo = host.scene().objectNamed(kTQHostSampleBehaviorObject);
    }
    template <class Set>
    std::shared_ptr<Set> refreshed(const std::vector<TQChannelBase*>& selection) {
        auto set = std::make_shared<Set>();
        set->initWithName("Set", &host);
        host.setSelectedObjects(selection);
        set->refresh(100, false);
        return set;
    }
    TQChannel* at(TQChannelBase* object, P property, size_t axis = 0) const {
        const auto& row = TQHostPropertyPaths(GetParam(), property);
        return axis < row.size()
                   ? dynamic_cast<TQChannel*>(TQChannelRef(row[axis]).getChannel(object))
                   : nullptr;
    }
    // What a set shows of one object, as paths below it.
    static Paths shown(const TQCurveSet& set, const TQChannelBase* object) {
        Paths out;
        for (const TQCurveEditorItemPtr& item : set.allItems())
            if (TQChannelBase* c = item->channelBase(); c && c->getChannelRoot() == object)
                out.insert(TQChannelRef(c, object).getText());
        return out;
    }

    TQHostAppDelegate host;
    TQChannelObjectRootBase* title = nullptr;
    TQChannelObjectRootBase* logo = nullptr;
};

// What Animated and Modified show of each object alone, as paths below it, and how many items
// All enables, recorded (baselines/automatic_sets.txt, a block per family): what moves (the
// logo's sway is a behaviour on a channel without keys), and what was set besides (one
// keypoint, a value set without keys, resting compound parts).
TEST_P(AutomaticSets, byState__eachObjectShowsWhatMovesAndWhatWasSet) {
    const auto line = [](const char* what, const Paths& paths) {
        std::string out = std::string("  ") + what;
        for (const BNString& path : paths) out += " " + path;
        return out + "\n";
    };
    std::string record;
    std::vector<TQChannelBase*> everything;
    for (const char* name : {kTQHostSampleTitleObject, kTQHostSampleBehaviorObject,
                             kTQHostSampleOffsetObject, kTQHostSampleQuaternionObject}) {
        TQChannelBase* o = host.scene().objectNamed(name);
        everything.push_back(o);
        record += name + std::string(":\n") +
                  line("animated", shown(*refreshed<TQCurveSetAnimated>({o}), o)) +
                  line("modified", shown(*refreshed<TQCurveSetModified>({o}), o)) + "  all " +
                  std::to_string(refreshed<TQCurveSetAll>({o})->numberOfEnabledItems()) + "\n";
    }
    EXPECT_TRUE(tests_support::matchesBaselineBlock(
        "automatic_sets", GetParam() == TQHostObjectFamily::Kestrel ? "Kestrel" : "Other", record,
        "src/curvesets/tests/baselines"));
    // Several objects: a root each, in selection order, each starting the colours afresh.
    auto animated = refreshed<TQCurveSetAnimated>(everything);
    ASSERT_EQ(animated->numberOfItems(), 4u);
    for (uint32_t i = 0; i < 4; ++i) {
        EXPECT_EQ(animated->rootItemAtIndex(i)->channelBase(), everything[i]);
        const auto first = animated->rootItemAtIndex(i)->childrenAtIndex(0);
        EXPECT_EQ(static_cast<TQCurveEditorChannelItem&>(*first).colorIndex(), 0u);
    }
}

TEST_P(AutomaticSets, byProperty__eachSelectedObjectShowsItsRowOfTheTable) {
    const std::pair<std::shared_ptr<TQCurveSetByProperty>, char> sets[] = {
        {std::make_shared<TQCurveSetPosition>(), 'p'}, {std::make_shared<TQCurveSetScale>(), 's'},
        {std::make_shared<TQCurveSetRotation>(), 'r'}, {std::make_shared<TQCurveSetShear>(), 'h'},
        {std::make_shared<TQCurveSetPivot>(), 'a'},    {std::make_shared<TQCurveSetOpacity>(), 'o'},
        {std::make_shared<TQCurveSetRetiming>(), 't'}};
    for (const auto& [set, shortcut] : sets) {
        const auto property = static_cast<P>(set->property());  // the two enums share an order
        SCOPED_TRACE(TQCurveSetByProperty::nameKey(set->property()));
        set->initWithName("Set", &host);
        EXPECT_EQ(set->shortcut(), shortcut);
        host.setSelectedObjects({title, logo});
        set->refresh(100, false);
        const auto& row = TQHostPropertyPaths(GetParam(), property);
        EXPECT_EQ(set->numberOfItems(), row.empty() ? 0u : 2u) << "a root per selected object";
        EXPECT_EQ(shown(*set, title), Paths(row.begin(), row.end()));
        EXPECT_EQ(shown(*set, logo), Paths(row.begin(), row.end()));
        const TQCurveSetPtr copy = set->copy();
        const TQCurveSet &copied = *copy, &source = *set;
        EXPECT_EQ(typeid(copied), typeid(source));
        EXPECT_EQ(*copy->references(), *set->references());
    }
}

TEST_P(AutomaticSets, rules__behavioursToleranceEnableStatesAndTheOddRoot) {
    TQChannel* sway = at(logo, P::Position);
    sway->setRigged(true);
    EXPECT_EQ(refreshed<TQCurveSetAnimated>({logo})->itemWithChannel(sway), nullptr) << "rigged";
    sway->setRigged(false);
    sway->setFlag(kTQChannelFlagHiddenInCurveEditor);
    EXPECT_EQ(refreshed<TQCurveSetAnimated>({logo})->itemWithChannel(sway), nullptr) << "hidden";
    sway->resetFlag(kTQChannelFlagHiddenInCurveEditor);
    // The object leaves the selection: only a channel of a selected behaviour stays.
    auto animated = refreshed<TQCurveSetAnimated>({logo});
    sway->getBehavior(0)->setSelected(true);
    host.selectObject(title);
    animated->filterList();
    ASSERT_EQ(animated->allItems().size(), 1u);
    EXPECT_EQ(animated->allItems()[0]->channel(), sway);
    // A value without keys counts from 1e-7 off its default (the title's retime is 0).
    TQChannel* retime = at(title, P::Retiming);
    for (const auto& [value, shown] : {std::pair{0.9e-7, false}, {1e-7, true}, {-1e-7, true}}) {
        retime->setInitialValue(value);
        EXPECT_EQ(refreshed<TQCurveSetModified>({title})->itemWithChannel(retime) != nullptr, shown)
            << value;
    }
    // All opens every root it filters.
    auto all = refreshed<TQCurveSetAll>({title});
    all->rootItemAtIndex(0)->collapse(true);
    all->filterList();
    EXPECT_FALSE(all->rootItemAtIndex(0)->isCollapsed());
    // A disabled curve stays disabled through a refresh of Animated, not of All.
    TQChannel* x = at(title, P::Position);
    for (const TQCurveSetPtr& set : std::initializer_list<TQCurveSetPtr>{
             refreshed<TQCurveSetAnimated>({title}), refreshed<TQCurveSetAll>({title})}) {
        set->itemWithChannel(x)->enableItem(0);
        set->refresh(100, false);
        EXPECT_EQ(set->itemWithChannel(x)->isEnabledItem(),
                  dynamic_cast<TQCurveSetAll*>(set.get()) ? 1 : 0);
    }
    // All keeps a root its filter emptied while it is the last root, until the next is added.
    std::vector<TQChannelBase*> logoChannels;
    logo->getAllDescendantsFlattened(logoChannels, 0, true);
    for (TQChannelBase* c : logoChannels) static_cast<TQChannel*>(c)->setAnimationEnabled(false);
    EXPECT_EQ(refreshed<TQCurveSetAll>({title, logo})->numberOfItems(), 2u);
    EXPECT_EQ(refreshed<TQCurveSetAll>({logo, title})->numberOfItems(), 1u);
}

// Keeps every channel, to tell which set's filter a rebuild ran, and records its hook.
template <class Base>
class KeepEverything : public Base {
public:
    void filterList() override {
        this->filterChildren([](const TQCurveEditorItem&) { return true; });
    }
    void addObjectsAffectedByBehavior(TQChannelBase* object, TQCurveSet& set, uint32_t) override {
        hooked.emplace_back(object, &set);
    }
    std::vector<std::pair<TQChannelBase*, TQCurveSet*>> hooked;

protected:
    TQCurveSetPtr makeEmpty() const override { return std::make_shared<KeepEverything>(); }
};

TEST_P(AutomaticSets, rebuild__temporarySetOfTheReceiversClassOrOfModifiedAndAHookPerObject) {
    auto animated = refreshed<KeepEverything<TQCurveSetAnimated>>({title, logo});
    auto modified = refreshed<KeepEverything<TQCurveSetModified>>({title, logo});
    EXPECT_EQ(animated->numberOfChannelItems(),
              refreshed<TQCurveSetAll>({title, logo})->numberOfChannelItems());
    EXPECT_EQ(modified->numberOfChannelItems(),
              refreshed<TQCurveSetModified>({title, logo})->numberOfChannelItems());
    ASSERT_EQ(animated->hooked.size(), 2u);
    EXPECT_EQ(animated->hooked[1].first, logo);
    EXPECT_EQ(animated->hooked[0].second, animated->hooked[1].second) << "one temporary set";
    EXPECT_NE(animated->hooked[0].second, animated.get());
}

TEST_P(AutomaticSets, current__followsModifiedChannelsByDifferenceAndSurvivesTheirLoss) {
    auto current = refreshed<TQCurveSetCurrent>({title});
    TQChannel* x = at(title, P::Position);
    TQChannel* sway = at(logo, P::Position);
    TQChannel* still = at(logo, P::Position, 1);
    for (TQChannel* c : {x, sway, still}) c->noteWillChange(true);
    still->setAnimationEnabled(false);  // takes no keypoints: never shown
    current->refresh(100, false);
    ASSERT_EQ(current->numberOfChannelItems(), 2u);
    const TQCurveEditorItemPtr kept = current->itemWithChannel(x);

    auto item = [&](TQChannel* c) {
        auto i = std::make_shared<TQCurveEditorChannelItem>();
        i->initWithChannel(c, 0, &host, 1);
        return TQCurveEditorItemPtr(i);
    };
    // The answer for the last item decides (the sway's here): an earlier one may be missing.
    EXPECT_EQ((std::vector{current->containsOnlyChannels({item(still), item(sway)}),
                           current->containsOnlyChannels({item(x), item(still)}),
                           current->containsOnlyChannels({item(sway)})}),
              (std::vector{true, false, false}));

    host.resetModifiedChannels();
    x->noteWillChange(true);
    current->refresh(100, false);
    EXPECT_EQ(current->itemWithChannel(x), kept) << "still modified: the same item";
    EXPECT_EQ(current->numberOfChannelItems(), 1u) << "the sway is no longer modified";

    // Without a host every set is empty; with its channels gone, a set empties, no more.
    const TQCurveSetPtr sets[] = {current, refreshed<TQCurveSetAnimated>({title}),
                                  refreshed<TQCurveSetPosition>({title})};
    host.removeObject(title);
    for (const TQCurveSetPtr& set : sets) {
        set->filterList();
        set->refresh(100, true);
        EXPECT_EQ(set->numberOfChannelItems(), 0u) << set->curveSetName();
        set->initWithName("No host", nullptr);
        set->refresh(100, true);
        EXPECT_EQ(set->numberOfItems(), 0u);
    }
}

INSTANTIATE_TEST_SUITE_P(BothFamilies, AutomaticSets,
                         ::testing::Values(TQHostObjectFamily::Kestrel, TQHostObjectFamily::Other));

}  // namespace
