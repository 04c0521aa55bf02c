// The automatic curve sets on the sample piece, in both object families.
#include "src/curvesets/TQAutomaticCurveSets.h"

#include <gtest/gtest.h>

#include <set>
#include <utility>

#include "host/TQHostAppDelegate.h"
#include "host/TQHostSampleScene.h"

namespace {

using P = TQHostProperty;
using Paths = std::set<BNString>;

// A channel of an object, by its row of the host's property table and an axis.
struct Slot {
    P property;
    size_t axis;
};

class AutomaticSets : public ::testing::TestWithParam<TQHostObjectFamily> {
protected:
    void SetUp() override { TQHostLoadSampleScene(host, GetParam()); }

    TQChannelObjectRootBase* object(const char* name) { return host.scene().objectNamed(name); }
    template <class Set>
    std::shared_ptr<Set> make(const char* nameKey) {
        auto set = std::make_shared<Set>();
        set->initWithName(nameKey, &host);
        return set;
    }
    std::shared_ptr<TQCurveSet> refreshed(std::shared_ptr<TQCurveSet> set,
                                          std::vector<TQChannelBase*> selection) {
        host.setSelectedObjects(selection);
        set->refresh(100, false);
        return set;
    }
    // The paths of the slots that exist in this family (an axis beyond the row is skipped).
    Paths pathsOf(std::initializer_list<Slot> slots) const {
        Paths out;
        for (const Slot& s : slots) {
            const auto& row = TQHostPropertyPaths(GetParam(), s.property);
            if (s.axis < row.size()) out.insert(row[s.axis]);
        }
        return out;
    }
    // Every row of a property.
    Paths row(P property) const {
        const auto& paths = TQHostPropertyPaths(GetParam(), property);
        return Paths(paths.begin(), paths.end());
    }
    size_t lastAxis(P property) const {
        return TQHostPropertyPaths(GetParam(), property).size() - 1;
    }
    // What a set shows under one root, as paths below the object.
    static Paths shown(const TQCurveSet& set, const TQChannelBase* root) {
        Paths out;
        for (const TQCurveEditorItemPtr& item : set.allItems())
            if (TQChannelBase* c = item->channelBase(); c && c->getChannelRoot() == root)
                out.insert(TQChannelRef(c, root).getText());
        return out;
    }
    static Paths joined(Paths a, const Paths& b) {
        a.insert(b.begin(), b.end());
        return a;
    }

    TQHostAppDelegate host;
};

TEST_P(AutomaticSets, byState__eachObjectShowsWhatMovesAndWhatWasSet) {
    const P kPos = P::Position, kScale = P::Scale, kRot = P::Rotation, kPivot = P::Pivot;
    struct Row {
        const char* object;
        Paths animated;
        Paths modifiedToo;  // shown by Modified beside the animated ones
    };
    const size_t spin = lastAxis(kRot);
    const Row rows[] = {
        {kTQHostSampleTitleObject,
         pathsOf({{kPos, 0}, {kPos, 1}, {kScale, 0}, {kScale, 1}, {P::Opacity, 0}}),
         // Resting components of the animated position and scale compounds.
         pathsOf({{kPos, 2}, {kScale, 2}})},
        {kTQHostSampleBehaviorObject,
         // The sway is a behaviour on a channel with no keypoint.
         pathsOf({{kPos, 0}, {kPos, 1}, {kRot, spin}, {kScale, 0}, {kScale, 1}, {P::Opacity, 0}}),
         // The pivot's single keypoint, and the resting components around it.
         pathsOf({{kPos, 2},
                  {kRot, 0},
                  {kRot, 1},
                  {kScale, 2},
                  {kPivot, 0},
                  {kPivot, 1},
                  {kPivot, 2}})},
        {kTQHostSampleOffsetObject, pathsOf({{kPos, 0}, {P::Shear, 0}, {P::Opacity, 0}}),
         // The height set without a keypoint.
         pathsOf({{kPos, 1}, {kPos, 2}, {P::Shear, 1}})},
        {kTQHostSampleQuaternionObject,
         joined(joined(pathsOf({{kPos, 0}, {kPos, 1}, {kRot, spin}, {kScale, 0}, {kScale, 1}}),
                       row(P::Retiming)),
                {TQHostTypedPaths(GetParam()).volume}),
         // The dimmed opacity, off its default with no keypoint.
         pathsOf({{kPos, 2}, {kRot, 0}, {kRot, 1}, {kScale, 2}, {P::Opacity, 0}})},
    };
    const size_t channelsPerObject = GetParam() == TQHostObjectFamily::Kestrel ? 29 : 23;
    for (const Row& r : rows) {
        SCOPED_TRACE(r.object);
        TQChannelBase* o = object(r.object);
        auto animated = refreshed(make<TQCurveSetAnimated>(TQCurveSetAnimated::kNameKey), {o});
        auto modified = refreshed(make<TQCurveSetModified>(TQCurveSetModified::kNameKey), {o});
        auto all = refreshed(make<TQCurveSetAll>(TQCurveSetAll::kNameKey), {o});
        EXPECT_EQ(shown(*animated, o), r.animated);
        EXPECT_EQ(shown(*modified, o), joined(r.animated, r.modifiedToo));
        EXPECT_EQ(all->numberOfChannelItems(), channelsPerObject) << "every keyframable channel";
        EXPECT_EQ(all->numberOfEnabledItems(), channelsPerObject);
        EXPECT_EQ(animated->numberOfItems(), 1u);
    }
    {  // Several objects: a root each, in selection order, each starting the colours afresh.
        std::vector<TQChannelBase*> everything;
        for (const Row& r : rows) everything.push_back(object(r.object));
        auto animated =
            refreshed(make<TQCurveSetAnimated>(TQCurveSetAnimated::kNameKey), everything);
        ASSERT_EQ(animated->numberOfItems(), 4u);
        for (uint32_t i = 0; i < 4; ++i) {
            EXPECT_EQ(animated->rootItemAtIndex(i)->channelBase(), everything[i]);
            auto first = std::static_pointer_cast<TQCurveEditorChannelItem>(
                animated->rootItemAtIndex(i)->childrenAtIndex(0));
            EXPECT_EQ(first->colorIndex(), 0u) << "root " << i;
        }
    }
}

TEST_P(AutomaticSets, byProperty__eachSelectedObjectShowsItsRowOfTheTable) {
    struct Row {
        std::shared_ptr<TQCurveSetByProperty> set;
        P property;
        char shortcut;
    };
    const Row rows[] = {
        {std::make_shared<TQCurveSetPosition>(), P::Position, 'p'},
        {std::make_shared<TQCurveSetScale>(), P::Scale, 's'},
        {std::make_shared<TQCurveSetRotation>(), P::Rotation, 'r'},
        {std::make_shared<TQCurveSetShear>(), P::Shear, 'h'},
        {std::make_shared<TQCurveSetPivot>(), P::Pivot, 'a'},
        {std::make_shared<TQCurveSetOpacity>(), P::Opacity, 'o'},
        {std::make_shared<TQCurveSetRetiming>(), P::Retiming, 't'},
    };
    TQChannelBase* title = object(kTQHostSampleTitleObject);
    TQChannelBase* logo = object(kTQHostSampleBehaviorObject);
    for (const Row& r : rows) {
        const char* key = TQCurveSetByProperty::nameKey(r.set->property());
        SCOPED_TRACE(key);
        r.set->initWithName(key, &host);
        EXPECT_EQ(r.set->shortcut(), r.shortcut);
        EXPECT_TRUE(r.set->isRelative());
        refreshed(r.set, {title, logo});
        const Paths expected = row(r.property);
        if (expected.empty()) {
            EXPECT_EQ(GetParam(), TQHostObjectFamily::Other) << "only this family lacks a row";
            EXPECT_EQ(r.set->numberOfItems(), 0u) << "no path, no channel";
            continue;
        }
        ASSERT_EQ(r.set->numberOfItems(), 2u) << "one root per selected object";
        EXPECT_EQ(shown(*r.set, title), expected);
        EXPECT_EQ(shown(*r.set, logo), expected);

        const TQCurveSetPtr copy = r.set->copy();
        EXPECT_EQ(typeid(*copy), typeid(*r.set)) << "a copy keeps the class";
        EXPECT_EQ(*copy->references(), *r.set->references());
    }
}

INSTANTIATE_TEST_SUITE_P(BothFamilies, AutomaticSets,
                         ::testing::Values(TQHostObjectFamily::Kestrel, TQHostObjectFamily::Other));

// The rest does not depend on the family.
class AutomaticSetCases : public ::testing::Test {
protected:
    void SetUp() override {
        TQHostLoadSampleScene(host, TQHostObjectFamily::Kestrel);
        title = host.scene().objectNamed(kTQHostSampleTitleObject);
        logo = host.scene().objectNamed(kTQHostSampleBehaviorObject);
    }
    TQChannel* at(TQChannelBase* o, P property, size_t axis = 0) {
        return dynamic_cast<TQChannel*>(
            TQChannelRef(TQHostPropertyPaths(TQHostObjectFamily::Kestrel, property)[axis])
                .getChannel(o));
    }
    template <class Set>
    std::shared_ptr<Set> refreshed(std::vector<TQChannelBase*> selection,
                                   TQCurveEditorAppDelegate* delegate = nullptr) {
        auto set = std::make_shared<Set>();
        set->initWithName("Set", delegate ? delegate : &host);
        host.setSelectedObjects(selection);
        set->refresh(100, false);
        return set;
    }

    TQHostAppDelegate host;
    TQChannelObjectRootBase* title = nullptr;
    TQChannelObjectRootBase* logo = nullptr;
};

TEST_F(AutomaticSetCases, behaviours__riggedHiddenSelectedOnOtherObjectsShown) {
    TQChannel* sway = at(logo, P::Position);
    TQChannel* opacity = at(logo, P::Opacity);
    sway->setRigged(true);
    auto animated = refreshed<TQCurveSetAnimated>({logo});
    EXPECT_EQ(animated->itemWithChannel(sway), nullptr) << "a rig drives it: not animated";
    sway->setRigged(false);
    animated->refresh(100, false);
    ASSERT_NE(animated->itemWithChannel(sway), nullptr);

    // The object goes out of the selection while its items are in the sets: only a channel
    // moved by a selected behaviour stays at the next filtering.
    auto modified = refreshed<TQCurveSetModified>({logo});
    sway->getBehavior(0)->setSelected(true);
    host.selectObject(title);
    animated->filterList();
    modified->filterList();
    EXPECT_EQ(animated->allItems().size(), 1u);
    EXPECT_NE(animated->itemWithChannel(sway), nullptr);
    EXPECT_NE(modified->itemWithChannel(sway), nullptr);
    EXPECT_EQ(modified->itemWithChannel(opacity), nullptr) << "keys alone need a selected object";
}

TEST_F(AutomaticSetCases, modified__valueOffItsDefaultByTheTolerance) {
    // The title's retime value: no keypoint, default 0, a channel of its own.
    TQChannel* retime = at(title, P::Retiming);
    ASSERT_EQ(retime->getDefaultValue(), 0.0);
    const std::pair<double, bool> cases[] = {
        {0.0, false}, {0.9e-7, false}, {1e-7, true}, {-1e-7, true}, {25.0, true}};
    for (const auto& [value, shown] : cases) {
        retime->setInitialValue(value);
        auto modified = refreshed<TQCurveSetModified>({title});
        EXPECT_EQ(modified->itemWithChannel(retime) != nullptr, shown) << value;
        EXPECT_EQ(refreshed<TQCurveSetAnimated>({title})->itemWithChannel(retime), nullptr)
            << "a value without keypoints is not animation";
    }
}

TEST_F(AutomaticSetCases, enableStates__surviveInAnimatedAndModifiedNotInAll) {
    TQChannel* x = at(title, P::Position);
    for (bool carried : {true, false}) {
        TQCurveSetPtr set = carried ? TQCurveSetPtr(refreshed<TQCurveSetAnimated>({title}))
                                    : TQCurveSetPtr(refreshed<TQCurveSetAll>({title}));
        set->itemWithChannel(x)->enableItem(0);
        const uint32_t enabled = set->numberOfEnabledItems();
        set->refresh(100, false);
        EXPECT_EQ(set->itemWithChannel(x)->isEnabledItem(), carried ? 0 : 1);
        EXPECT_EQ(set->numberOfEnabledItems(), carried ? enabled : enabled + 1);
    }
    auto modified = refreshed<TQCurveSetModified>({title});
    modified->itemWithChannel(x)->enableItem(0);
    host.selectObject(logo, true);
    modified->refresh(100, false);
    EXPECT_EQ(modified->itemWithChannel(x)->isEnabledItem(), 0);
    EXPECT_EQ(modified->itemWithChannel(at(logo, P::Position))->isEnabledItem(), 1)
        << "a channel new to the set comes in enabled";
}

TEST_F(AutomaticSetCases, all__aRootEmptiedByTheFilterStaysOnlyWhileItIsLast) {
    std::vector<TQChannelBase*> channels;
    logo->getAllDescendantsFlattened(channels, 0, true);
    for (TQChannelBase* c : channels) static_cast<TQChannel*>(c)->setAnimationEnabled(false);

    auto all = refreshed<TQCurveSetAll>({title, logo});
    ASSERT_EQ(all->numberOfItems(), 2u) << "the last root, emptied, stays";
    EXPECT_EQ(all->rootItemAtIndex(1)->numberOfChildren(), 0u);
    all = refreshed<TQCurveSetAll>({logo, title});
    ASSERT_EQ(all->numberOfItems(), 1u) << "the next root's pass removes it";
    EXPECT_EQ(all->rootItemAtIndex(0)->channelBase(), title);
    auto animated = refreshed<TQCurveSetAnimated>({logo, title});
    ASSERT_EQ(animated->numberOfItems(), 2u);
    EXPECT_EQ(animated->rootItemAtIndex(0)->numberOfChildren(), 1u)
        << "the sway is a behaviour's, whether or not its channel takes keypoints";
}

// A filter that keeps every channel, to tell which set's filter a rebuild ran.
template <class Base>
class KeepEverything : public Base {
public:
    void filterList() override {
        this->filterChildren([](const TQCurveEditorItem&) { return true; });
    }
    void addObjectsAffectedByBehavior(TQChannelBase* object, TQCurveSet& set,
                                      uint32_t samples) override {
        hooked.emplace_back(object, &set);
        EXPECT_EQ(samples, 100u);
    }
    std::vector<std::pair<TQChannelBase*, TQCurveSet*>> hooked;

protected:
    TQCurveSetPtr makeEmpty() const override { return std::make_shared<KeepEverything>(); }
};

TEST_F(AutomaticSetCases, rebuild__temporarySetClassAndTheHookPerObject) {
    // Animated rebuilds in a set of the receiver's class, so the subclass's filter decides
    // alone; Modified rebuilds in a Modified, whose filter has had its say first.
    auto animated = refreshed<KeepEverything<TQCurveSetAnimated>>({title, logo});
    auto modified = refreshed<KeepEverything<TQCurveSetModified>>({title, logo});
    auto all = refreshed<TQCurveSetAll>({title, logo});
    auto plainModified = refreshed<TQCurveSetModified>({title, logo});
    EXPECT_EQ(animated->numberOfChannelItems(), all->numberOfChannelItems());
    EXPECT_EQ(modified->numberOfChannelItems(), plainModified->numberOfChannelItems());

    for (const auto* set : {&animated->hooked, &modified->hooked}) {
        ASSERT_EQ(set->size(), 2u) << "once per selected object";
        EXPECT_EQ((*set)[0].first, title);
        EXPECT_EQ((*set)[1].first, logo);
        EXPECT_EQ((*set)[0].second, (*set)[1].second) << "the same temporary set";
    }
    EXPECT_NE(animated->hooked[0].second, animated.get()) << "the hook sees the set being built";
}

TEST_F(AutomaticSetCases, current__followsTheModifiedChannelsByDifference) {
    auto current = refreshed<TQCurveSetCurrent>({title});
    EXPECT_EQ(current->numberOfItems(), 0u) << "nothing modified yet";

    TQChannel* x = at(title, P::Position);
    TQChannel* sway = at(logo, P::Position);
    TQChannel* height = at(logo, P::Position, 1);
    for (TQChannel* c : {x, sway, height}) c->noteWillChange(true);
    height->setAnimationEnabled(false);  // takes no keypoints: never shown
    current->refresh(100, false);
    ASSERT_EQ(current->numberOfChannelItems(), 2u);
    EXPECT_EQ(current->numberOfItems(), 2u) << "a root per object, selected or not";
    const TQCurveEditorItemPtr kept = current->itemWithChannel(x);
    ASSERT_NE(kept, nullptr);

    host.resetModifiedChannels();
    x->noteWillChange(true);
    current->refresh(100, false);
    EXPECT_EQ(current->itemWithChannel(x), kept) << "a channel still modified keeps its item";
    EXPECT_EQ(current->itemWithChannel(sway), nullptr) << "dropped once no longer modified";
    EXPECT_EQ(current->numberOfItems(), 1u);

    {  // The answer for the last item decides.
        auto item = [&](TQChannel* c) {
            auto i = std::make_shared<TQCurveEditorChannelItem>();
            i->initWithChannel(c, 0, &host, 1);
            return TQCurveEditorItemPtr(i);
        };
        x->noteWillChange(true);
        sway->noteWillChange(true);
        current->refresh(100, false);
        const auto present = current->allItems();  // x, then the sway
        ASSERT_EQ(present.size(), 2u);
        EXPECT_TRUE(current->containsOnlyChannels({item(sway), item(x)}));
        EXPECT_TRUE(current->containsOnlyChannels({item(height), item(sway)}));
        EXPECT_FALSE(current->containsOnlyChannels({item(x), item(height)}));
        EXPECT_FALSE(current->containsOnlyChannels({item(sway)})) << "counts differ";
        TQCurveSetCurrent empty;
        empty.initWithName("Empty", &host);
        EXPECT_TRUE(empty.containsOnlyChannels({}));
    }
}

TEST_F(AutomaticSetCases, badInput__noDelegateAndVanishedChannelsLeaveEmptySets) {
    std::vector<TQCurveSetPtr> sets = {
        std::make_shared<TQCurveSetAll>(),      std::make_shared<TQCurveSetAnimated>(),
        std::make_shared<TQCurveSetModified>(), std::make_shared<TQCurveSetCurrent>(),
        std::make_shared<TQCurveSetPosition>(), std::make_shared<TQCurveSetShear>()};
    host.setSelectedObjects({title, logo});
    for (const TQCurveSetPtr& set : sets) {
        set->initWithName("No host", nullptr);
        set->refresh(100, true);
        EXPECT_EQ(set->numberOfItems(), 0u) << set->curveSetName();
    }
    for (const TQCurveSetPtr& set : sets) {
        set->initWithName("Host", &host);
        set->refresh(100, false);
    }
    at(logo, P::Position)->noteWillChange(true);
    sets[3]->refresh(100, false);
    host.removeObject(logo);
    host.removeObject(title);
    for (const TQCurveSetPtr& set : sets) {
        set->filterList();  // items whose channels are gone
        set->refresh(100, true);
        EXPECT_EQ(set->numberOfChannelItems(), 0u) << set->curveSetName();
    }
}

}  // namespace
