// Channel trees: folders, object roots, compounds and the typed channels.
#include <gtest/gtest.h>

#include <cstdlib>
#include <memory>
#include <numbers>
#include <sstream>
#include <string>
#include <type_traits>
#include <typeinfo>
#include <vector>

#include "platform/channels/TQChannelObjectRootBase.h"
#include "platform/channels/TQChannelTypes.h"
#include "platform/channels/TQFactory.h"
#include "platform/channels/testing/CurveCatalogue.h"
#include "platform/channels/tests/KeyframeText.h"
#include "tests/support/TextBaseline.h"

namespace {

CMTime seconds(double s) { return TQTarnTimeForChannelSeconds(s, 0x40000); }

template <class T, class... Args>
T* add(TQChannelFolder& folder, Args&&... args) {
    return static_cast<T*>(folder.addChild(std::make_unique<T>(std::forward<Args>(args)...)));
}

class RecordingObserver : public TQChannelChangeObserver {
public:
    void channelWillChange(TQChannelBase& channel) override { told.push_back(&channel); }
    std::vector<TQChannelBase*> told;
};

// object (root 1)
//   transform (folder 100): position (2D, 101), rotation (3D, 109)
//   hidden (folder 200, flag 0x2): opacity (202)
//   [null slot]
//   nested (object root 300): inner (1)
//   visible (1000)
class TreeFolderTest : public ::testing::Test {
protected:
    void SetUp() override {
        transform = add<TQChannelFolder>(object, "Transform", 100);
        position = add<TQChannel2D>(*transform, "Position", 101);
        rotation = add<TQChannelRotation3D>(*transform, "Rotation", 109);
        hidden = add<TQChannelFolder>(object, "Hidden", 200);
        hidden->setFlag(kTQChannelFlagHidden, false);
        opacity = add<TQChannel>(*hidden, "Opacity", 202, 1.0);
        object.addChild(nullptr);
        nested = add<TQChannelObjectRootBase>(object, "Nested", 300);
        inner = add<TQChannel>(*nested, "Inner", 1);
        visible = add<TQChannel>(object, "Visible", 1000);
        position->getXChannel()->setKeyframe(seconds(1), 5.0);
        opacity->setKeyframe(seconds(2), 0.5);
    }

    TQChannelObjectRootBase object{"Object", 1};
    TQChannelFolder* transform = nullptr;
    TQChannel2D* position = nullptr;
    TQChannelRotation3D* rotation = nullptr;
    TQChannelFolder* hidden = nullptr;
    TQChannel* opacity = nullptr;
    TQChannelObjectRootBase* nested = nullptr;
    TQChannel* inner = nullptr;
    TQChannel* visible = nullptr;
};

TEST_F(TreeFolderTest, getAllDescendantsFlattened__hiddenFoldersAndOtherObjectsLeftOut) {
    std::vector<TQChannelBase*> out{&object};  // appends, does not clear
    object.getAllDescendantsFlattened(out, kTQChannelFlagHidden, true);
    std::string names;
    for (const TQChannelBase* c : out) names += c->getName() + " ";
    EXPECT_EQ(names, "Object X Y X Y Z Visible ") << "depth first in display order";
}

TEST_F(TreeFolderTest, cloneAssignCompare__deepCopiesOfTheSameClassesComparedByPosition) {
    rotation->setQuaternionMode(true, false);
    position->setLinked(false);
    transform->setFoldFlag(kTQFoldFlagCollapsed);
    std::unique_ptr<TQChannelBase> copy(object.cloneChannel());
    const TQChannelBase& copied = *copy;
    ASSERT_EQ(typeid(copied), typeid(TQChannelObjectRootBase));
    EXPECT_TRUE(*copy == object) << "a fresh clone compares equal";
    EXPECT_EQ(copy->getParent(), nullptr);
    EXPECT_NE(copy->getSerial(), object.getSerial()) << "a node's serial is its own";
    auto* copyFolder = static_cast<TQChannelFolder*>(copy.get());
    EXPECT_EQ(copyFolder->getChild(2), nullptr) << "a null slot stays null";
    auto* copyTransform = static_cast<TQChannelFolder*>(copyFolder->findChild(100));
    auto* copyPosition = dynamic_cast<TQChannel2D*>(copyTransform->findChild(101));
    ASSERT_NE(copyPosition, nullptr) << "the 2D channel clones as its own class";
    EXPECT_EQ(copyPosition->getParent()->getParent(), copy.get());
    EXPECT_TRUE(copyTransform->testFoldFlag(kTQFoldFlagCollapsed) && !copyPosition->isLinked());

    // Every part of the state is seen by the comparison and carried back by an assignment.
    const std::function<void()> edits[] = {
        [&] { copyPosition->getXChannel()->setKeyframe(seconds(3), 1.0); },
        [&] { copyTransform->resetFoldFlag(kTQFoldFlagCollapsed); },
        [&] { copyPosition->setLinked(true); },
        [&] {
            static_cast<TQChannelRotation3D*>(copyTransform->findChild(109))
                ->setQuaternionMode(false);
        },
        [&] { copyFolder->findChild(200)->setFlag(kTQChannelFlagShowFlattened); },
        [&] { copyFolder->findChild(300)->setLocked(true); },
    };
    for (size_t i = 0; i < std::size(edits); ++i) {
        edits[i]();
        EXPECT_FALSE(*copy == object) << "edit " << i;
        *copy = object;  // a ghost backup restored the other way round
        EXPECT_TRUE(*copy == object) << "edit " << i;
    }
    EXPECT_EQ(copyPosition->getXChannel()->numberOfKeyframes(), 1u);
    // The shape matters: a slot fewer, a channel where the other has none, another class.
    copyFolder->removeChildAt(2);
    EXPECT_FALSE(*copy == object);
    copyFolder->insertChild(2, std::make_unique<TQChannel>("Filler", 9));
    EXPECT_FALSE(*copy == object);
    TQChannel plain("Plain", 1);
    EXPECT_FALSE(plain == TQChannelBool("Plain", 1)) << "classes differ";
    static_cast<TQChannelBase&>(plain) = object;  // a folder's state can't be poured into a channel
    EXPECT_EQ(plain.numberOfKeyframes(), 0u);
    static_cast<TQChannelBase&>(*copyFolder->getChild(2)) = *transform;
    EXPECT_EQ(copyFolder->getChild(2)->getName(), "Filler") << "identity is not state";
}

TEST_F(TreeFolderTest, ancestors__locksObserversTimeOffsetsAndRoots) {
    hidden->setLocked(true, false);
    EXPECT_TRUE(opacity->isLocked(true) && opacity->isAnyAncestorLocked());
    EXPECT_FALSE(opacity->isLocked(false)) << "its own lock is off";
    EXPECT_FALSE(visible->isLocked(true) || visible->isAnyAncestorLocked()) << "siblings are free";

    RecordingObserver sceneObserver, objectObserver;
    TQChannelFolder scene("Scene", 0);
    scene.setChangeObserver(&sceneObserver);
    TQChannelBase* x = position->getXChannel();
    x->noteWillChange(true);
    object.setChangeObserver(&objectObserver);
    x->noteWillChange(true);
    x->noteWillChange(false);
    visible->setLocked(true);
    visible->setLocked(true);  // no change, nothing told
    visible->setFlag(0x4, true);
    rotation->setQuaternionMode(true);
    // A flag changed with notify is announced first; without, silently.
    for (bool notify : {false, true}) {
        opacity->setFlag(kTQChannelFlagShowFlattened, notify);
        opacity->resetFlag(kTQChannelFlagShowFlattened, notify);
    }
    EXPECT_EQ(objectObserver.told,
              (std::vector<TQChannelBase*>{x, visible, visible, rotation, opacity, opacity}))
        << "the nearest observer hears which channel changes, and not of a silent change";
    EXPECT_TRUE(sceneObserver.told.empty());

    object.setTimeOffset(seconds(10));
    transform->setTimeOffset(seconds(-2));
    EXPECT_EQ(position->getXChannel()->timeOffset(), seconds(8));
    object.setRootCurrentTime(seconds(11));
    EXPECT_EQ(object.getRootCurrentTime(true), seconds(1)) << "in the object's channel time";
    EXPECT_EQ(object.getRootCurrentTime(false), seconds(11));
    EXPECT_EQ(inner->getChannelRoot(), nested);
    EXPECT_EQ(position->getXChannel()->getChannelRoot(), &object);
    EXPECT_EQ(TQChannel("Loose", 1).getChannelRoot(), nullptr);
}

TEST_F(TreeFolderTest, children__ownershipMovesAndBadIndices) {
    const size_t n = object.numberOfChildren();
    TQChannel stranger("Stranger", 5);
    EXPECT_FALSE(object.getChild(99) || object.getChild(n) || object.takeChildAt(n) ||
                 object.takeChildAt(99) || object.removeChildAt(99) ||
                 object.removeChild(&stranger) || object.removeChild(nullptr) ||
                 object.indexOfChild(opacity));
    EXPECT_EQ(object.takeChildAt(2), nullptr) << "a null slot has nothing to hand over";
    EXPECT_EQ(object.numberOfChildren(), 5u);

    std::unique_ptr<TQChannelBase> taken = object.takeChild(visible);
    ASSERT_NE(taken, nullptr);
    EXPECT_FALSE(taken->getParent() || object.findChild(1000));
    hidden->insertChild(500, std::move(taken));  // past the end appends
    EXPECT_TRUE(hidden->indexOfChild(visible) == 1u && visible->getParent() == hidden);
    transform->insertChild(0, std::unique_ptr<TQChannelBase>(visible));  // moves between folders
    EXPECT_TRUE(hidden->numberOfChildren() == 1u && transform->getChild(0) == visible &&
                visible->getParent() == transform);
    delete visible;  // deleted on its own: it leaves its folder first
    EXPECT_EQ(transform->numberOfChildren(), 2u);
    EXPECT_TRUE(object.removeChildAt(2)) << "an empty slot can be removed";
    EXPECT_TRUE(object.removeChild(nested));
    EXPECT_EQ(object.numberOfChildren(), 2u);

    // Many siblings: lookups use an index that follows every change; of equal ids the first
    // in display order wins.
    TQChannelFolder wide("Wide", 0);
    for (TQChannelId id = 1000; id > 0; id -= 10) add<TQChannel>(wide, "C", id);
    wide.addChild(nullptr);
    add<TQChannel>(wide, "Duplicate", 500);
    TQChannelBase* first = wide.findChild(500);
    ASSERT_NE(first, nullptr);
    EXPECT_EQ(first->getName(), "C");
    EXPECT_TRUE(wide.removeChild(first));
    EXPECT_EQ(wide.findChild(500)->getName(), "Duplicate");
    wide.insertChild(0, std::make_unique<TQChannel>("Inserted", 3));
    EXPECT_EQ(wide.findChild(3)->getName(), "Inserted");
    EXPECT_EQ(wide.findChild(4), nullptr);
    EXPECT_EQ(wide.findChild(10)->getName(), "C");
    EXPECT_TRUE(wide.removeChildAt(0));
    EXPECT_EQ(wide.findChild(3), nullptr);

    object.removeAllChildren();
    EXPECT_EQ(object.getChildren(), nullptr) << "no children: a null vector";
    EXPECT_EQ(object.findChild(100), nullptr);
}

TEST_F(TreeFolderTest, animatedAndReset__aFolderAnswersForItsDescendants) {
    TQChannelFolder("Empty", 1).reset(false);  // nothing to reset
    EXPECT_FALSE(transform->isAnimated(false)) << "a folder has no animation of its own";
    EXPECT_TRUE(transform->isAnimated(true));
    EXPECT_TRUE(position->isAnimated(false)) << "a compound answers for its components";
    EXPECT_FALSE(rotation->isAnimated(false));
    hidden->setFoldFlag(kTQFoldFlagCollapsed);
    object.reset(false);
    EXPECT_FALSE(object.isAnimated(true) || position->isAnimated());
    EXPECT_EQ(opacity->numberOfKeyframes(), 0u);
    EXPECT_TRUE(hidden->testFlag(kTQChannelFlagHidden) &&
                hidden->testFoldFlag(kTQFoldFlagCollapsed))
        << "a folder's own flags and fold state stay";
}

TEST(TreeTypes, factoriesCreateAndCloneEveryClassAsItself) {
    EXPECT_EQ(kTQChannelBoolFactoryId, (TQFactoryId{0x229211d70b00de81u, 0x9389b702ac3d0003u}))
        << "identifiers in saved data never change";
    EXPECT_TRUE(TQChannelFactoryIdOf(nullptr).isNull());
    for (uint64_t word = 1; word <= 13; ++word) {
        const TQFactoryId id{0x229211d70b00de81u, 0x9389b702ac3d0000u + word};
        const TQFactory* factory = TQFactory::find(id);
        ASSERT_NE(factory, nullptr) << "no factory for word " << word;
        std::unique_ptr<TQChannelBase> made = factory->create("Made", 42);
        EXPECT_EQ(TQChannelFactoryIdOf(made.get()), id) << factory->getClassName();
        made->setTimeOffset(CMTimeMake(1, 2));
        std::unique_ptr<TQChannelBase> copy(made->cloneChannel());
        EXPECT_EQ(copy->timeOffset(), CMTimeMake(1, 2)) << factory->getClassName();
        const TQChannelBase &copied = *copy, &original = *made;
        EXPECT_EQ(typeid(copied), typeid(original))
            << factory->getClassName() << " clones as itself";
        EXPECT_TRUE(*copy == *made && copy->getName() == "Made" && copy->getChannelId() == 42u);
    }
    EXPECT_EQ(TQFactory::find(TQFactoryId{1, 2}), nullptr);
    struct HostChannel : TQChannelFolder {
        using TQChannelFolder::TQChannelFolder;
        const TQFactory* getFactory() const override { return TQChannelBase::getFactory(); }
    } host("Host", 1);
    EXPECT_TRUE(TQChannelFactoryIdOf(&host).isNull()) << "a host's class without a factory";
}

TEST(TreeTypes, typedChannels__snapFixTheirInterpolationAndComeWithTheirComponents) {
    TQChannelBool flag("On", 1);
    const CMTime t = seconds(1);
    flag.setKeyframe(seconds(0), 0.7);
    flag.setKeyframeValue(flag.setKeyframe(t, 1.0), 0.2);
    flag.setValue(&t, 0.5);
    flag.setInitialValue(0.49);
    flag.setDefaultValue(0.9);
    EXPECT_EQ(keyText(flag), "0=1/0 1=1/0") << "half and above is on";
    EXPECT_EQ(flag.getInitialValue() + 10 * flag.getDefaultValue(), 10.0);
    EXPECT_TRUE(flag.isDiscrete() && flag.getBoolValue(seconds(0.5)));
    EXPECT_EQ(flag.curveMaximum() + flag.sliderMaximum() + flag.curveMinimum(), 2.0);

    TQChannelBlindData data("Data", 2);
    TQChannelCurve curve("Curve", 3);
    TQKeyframeHandle h = data.setKeyframe(seconds(0), 3.0);
    data.setKeyframeInterpolation(h, kTQInterpolationLinear);
    data.setInterpolation(kTQInterpolationLinear);
    curve.setInterpolation(kTQInterpolationLinear);
    EXPECT_EQ(data.getKeyframeInterpolation(h), kTQInterpolationConstant);
    EXPECT_EQ(curve.getInterpolation(), kTQInterpolationBezier);
    EXPECT_EQ(curve_catalogue::SteppedChannel().getInterpolation(), kTQInterpolationConstant)
        << "a discrete kind starts stepped";
    EXPECT_TRUE(data.testFlag(kTQChannelFlagNoInterpolationChange) &&
                curve.testFlag(kTQChannelFlagNoInterpolationChange));
    EXPECT_EQ(TQChannelBlindData("Fresh", 10).getInitialValue(), 0.0);

    TQChannelAngle angle("Angle", 4, 1.0);
    EXPECT_NEAR(angle.getInfo()->displayScale * std::numbers::pi, 180.0, 1e-12);
    EXPECT_NEAR(angle.getInfo()->valueStep * 180.0, std::numbers::pi, 1e-12)
        << "a nudge moves a degree";
    TQChannelDecibel gain("Gain", 5, -2.0);
    EXPECT_EQ(gain.getInitialValue(), 2.0) << "an amplitude is never negative";
    EXPECT_EQ(gain.curveMinimum(), 0.0);
    EXPECT_NEAR(gain.getDecibels(seconds(0)), 6.0206, 1e-4);
    EXPECT_NEAR(TQChannelDecibel::decibelsToAmplitude(-20.0), 0.1, 1e-12);

    TQChannel2D pair("Pair", 6, 3.0, 4.0);
    TQChannelScaleOverRange scale("Scale", 7);
    TQChannel2DOverRange gradient("Gradient", 8);
    static_assert(!std::is_base_of_v<TQChannel2DOverRange, TQChannelScaleOverRange>,
                  "told apart by downcast");
    EXPECT_EQ(pair.getXChannel()->getName() + pair.getYChannel()->getName(), "XY");
    EXPECT_EQ(pair.getXChannel()->getInitialValue() * 10 + pair.getYChannel()->getInitialValue(),
              34.0);
    EXPECT_EQ(scale.getXChannel()->getInitialValue() + scale.getYChannel()->getInitialValue(), 2.0);
    EXPECT_TRUE(pair.isLinked() && scale.isLinked() && pair.numberOfComponents() == 2);
    EXPECT_TRUE(scale.timeExtent() == TQOverRangePositionRange() &&
                gradient.timeExtent() == TQOverRangePositionRange());
    EXPECT_EQ(CMTimeGetSeconds(TQOverRangePositionRange().end()), 1.0);
    EXPECT_FALSE(pair.timeExtent() == TQOverRangePositionRange());
    pair.removeChild(pair.getXChannel());
    EXPECT_EQ(pair.getXChannel(), nullptr) << "a component the host removed";

    TQChannelRotation3D rotation("Rotation", 9);
    EXPECT_NE(rotation.getAngleChannel(kTQComponentZ), nullptr);
    EXPECT_EQ(rotation.getAngleChannel(4), nullptr);
    EXPECT_TRUE(rotation.isLinked() && rotation.numberOfComponents() == 3 &&
                !rotation.isQuaternionMode());
    RecordingObserver told;
    rotation.setChangeObserver(&told);
    for (const bool mode : {false, true, true}) rotation.setQuaternionMode(mode, true);
    EXPECT_EQ(told.told.size(), 1u) << "announced once, by the one change";
    EXPECT_EQ(TQCompoundChannel("Empty", 12).numberOfComponents(), 0u);
}

// A compound of three components, each keyed at 1 s (value 10 * id) and 2 s, and shifted by
// one second on the editor's axis.
class TreeCompoundTest : public ::testing::Test {
protected:
    void SetUp() override {
        for (TQChannelId id : {1u, 2u, 3u}) {
            auto* c = add<TQChannel>(compound, "C", id);
            c->setKeyframe(seconds(1), 10.0 * id);
            c->setKeyframe(seconds(2), 0.0);
            components.push_back(c);
        }
        compound.addChild(nullptr);
        add<TQChannelFolder>(compound, "Not a component", 4);
        compound.setTimeOffset(seconds(1));
        compound.setChangeObserver(&observer);
    }
    std::string keys() const {
        return keyText(*components[0]) + " | " + keyText(*components[1]) + " | " +
               keyText(*components[2]);
    }
    TQCompoundChannel compound{"Position", 101};
    std::vector<TQChannel*> components;
    RecordingObserver observer;
};

// Compound edits, each a row run on the compound: a step names a component by its index ("s"
// a stranger outside the compound, "-" none) and gives times as the call takes them (adds and
// moves on the axis, deletes and interpolations in channel time); "=V" is a value to move
// with, "held" the handle the last "hold" step looked up. The record has a line a step: every
// component's keyframes and the stranger's, then the components announced by id.
struct CompoundEdit {
    const char* name;
    const char* script;
};

void PrintTo(const CompoundEdit& e, std::ostream* os) { *os << e.name; }

class TreeCompoundEdits : public TreeCompoundTest,
                          public ::testing::WithParamInterface<CompoundEdit> {};

TEST_P(TreeCompoundEdits, edit__as_recorded) {
    EXPECT_EQ(compound.getComponents(), components);
    EXPECT_TRUE(compound.isCompoundChannel() && !TQChannelFolder("F", 1).isCompoundChannel());
    TQChannel stranger("Stranger", 1);
    stranger.setKeyframe(seconds(1), 1.0);
    tests_support::StepArgs a;
    TQKeyframeHandle held = nullptr;
    bool collided = false;
    const auto C = [&](size_t i) -> TQChannel* {
        if (a.word(i) == "-") return nullptr;
        return a.word(i) == "s" ? &stranger : components.at(size_t(a.number(i)));
    };
    const auto T = [&](size_t i) { return seconds(a.number(i)); };
    const auto linked = [&] { return a.words.back() == "linked"; };
    const auto H = [&](size_t i) { return a.word(i) == "held" ? held : C(0)->getKeyframe(T(i)); };
    const tests_support::Steps steps = {
        {"add", [&] { compound.addKeyframe(C(0), T(1), linked()); }},
        {"move",
         [&] {
             const double value = std::strtod(a.word(3).c_str() + 1, nullptr);
             compound.moveKeyframe(C(0), T(1), T(2), a.word(3)[0] == '=' ? &value : nullptr,
                                   &collided, linked());
         }},
        {"del", [&] { compound.deleteKeyframe(C(0), T(1), linked()); }},
        {"interp",
         [&] { compound.setLinkedInterpolation(C(0), H(1), unsigned(a.number(2)), linked()); }},
        {"curveinterp", [&] { compound.setLinkedCurveInterpolation(unsigned(a.number(0))); }},
        {"link", [&] { compound.setLinked(a.number(0) != 0); }},
        {"hold", [&] { held = H(1); }},
        {"key", [&] { C(0)->setKeyframe(T(1), a.number(2)); }},
        {"shift", [&] { C(0)->setTimeOffset(T(1)); }},
        {"nointerp", [&] { C(0)->setFlag(kTQChannelFlagNoInterpolationChange, false); }},
    };
    std::string record;
    const auto fresh = [&] {
        observer.told.clear();
        collided = false;
    };
    tests_support::runSteps(GetParam().script, a, steps, {}, fresh, [&](const std::string& step) {
        record += step + ": " + keys() + " | s " + keyText(stranger) +
                  (collided ? " collided" : "") + ";";
        for (const TQChannelBase* c : observer.told)
            record.append(" ").append(c == &stranger ? "s" : std::to_string(c->getChannelId()));
        record += "\n";
    });
    EXPECT_TRUE(tests_support::matchesBaselineBlock("compound-edits", GetParam().name, record,
                                                    "platform/channels/tests/baselines"));
}

INSTANTIATE_TEST_SUITE_P(
    Channels, TreeCompoundEdits,
    ::testing::Values(
        // Linked edits reach every component in child order, valued from each curve, the one
        // touched with the value given; unlinked only the touched one; a component without a
        // keyframe there is neither moved nor announced; keyframes met both stay until a purge.
        // The compound's own link flag links whatever the caller asks.
        CompoundEdit{"linked",
                     "add 1 4 linked; add 1 5.5; add 0 2 linked; "
                     "move 0 2 2.5 =99 linked; move 2 2.5 3; move 1 5.5 6 linked; "
                     "move 1 6 5.5 linked; del 0 2; del 1 3 linked; link 1; add 1 7; "
                     "del 0 1.5"},
        // The same instant in each component, whatever its own offset, except where changes
        // of interpolation are refused; a stale handle, a stranger, no component or no time
        // changes nothing.
        CompoundEdit{"interpolationAndStrangers",
                     "nointerp 2; shift 1 0.5; key 1 0.5 7; hold 0 1; interp 0 1 13 linked; "
                     "interp 1 1 1; del 1 0.5 linked; curveinterp 6; interp 0 held 0 linked; "
                     "del s 1 linked; add - 4 linked; move s 2 4 linked; interp s 1 1 linked; "
                     "add 0 nan linked"}));

}  // namespace
