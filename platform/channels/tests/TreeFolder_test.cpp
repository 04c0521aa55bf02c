#include <gtest/gtest.h>

#include <memory>
#include <type_traits>
#include <typeinfo>
#include <vector>

#include "platform/channels/TQChannel.h"
#include "platform/channels/TQChannelFolder.h"
#include "platform/channels/TQChannelObjectRootBase.h"
#include "platform/channels/TQChannelTypes.h"
#include "platform/channels/TQFactory.h"

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

TEST_F(TreeFolderTest, getAllDescendantsFlattened__exclusionNullsAndObjectRoots) {
    {
        std::vector<TQChannelBase*> out;
        object.getAllDescendantsFlattened(out, 0, false);
        ASSERT_EQ(out.size(), 8u) << "2 + 3 components, opacity, inner, visible";
        EXPECT_EQ(out[0], position->getXChannel()) << "depth first in display order";
        EXPECT_EQ(out[5], opacity);
        EXPECT_EQ(out[6], inner);
        EXPECT_EQ(out[7], visible);
    }
    {
        std::vector<TQChannelBase*> out{visible};  // appends, does not clear
        object.getAllDescendantsFlattened(out, kTQChannelFlagHidden, true);
        ASSERT_EQ(out.size(), 7u);
        for (const TQChannelBase* c : out) {
            EXPECT_NE(c, opacity) << "a hidden folder hides what is below it";
            EXPECT_NE(c, inner) << "other objects' trees are not entered";
        }
    }
    {
        visible->setFlag(kTQChannelFlagHiddenInCurveEditor, false);
        std::vector<TQChannelBase*> out;
        object.getAllDescendantsFlattened(out, 0x10002, true);
        EXPECT_EQ(out.size(), 5u) << "either bit of the word excludes";
    }
}

TEST_F(TreeFolderTest, clone__deepCopyKeepsClassesAndIsIndependent) {
    rotation->setQuaternionMode(true, false);
    position->setLinked(false);
    std::unique_ptr<TQChannelBase> copy(object.cloneChannel());
    const TQChannelBase& copied = *copy;
    ASSERT_EQ(typeid(copied), typeid(TQChannelObjectRootBase));
    EXPECT_TRUE(*copy == object) << "a fresh clone compares equal";
    EXPECT_EQ(copy->getParent(), nullptr);
    EXPECT_EQ(copy->getName(), "Object");
    auto* copyFolder = static_cast<TQChannelFolder*>(copy.get());
    EXPECT_EQ(copyFolder->getChild(2), nullptr) << "a null slot stays null";
    auto* copyPosition = dynamic_cast<TQChannel2D*>(
        static_cast<TQChannelFolder*>(copyFolder->findChild(100))->findChild(101));
    ASSERT_NE(copyPosition, nullptr) << "the 2D channel clones as its own class";
    EXPECT_EQ(copyPosition->getParent()->getParent(), copy.get());
    EXPECT_FALSE(copyPosition->isLinked());
    EXPECT_EQ(copyPosition->getXChannel()->numberOfKeyframes(), 1u);

    copyPosition->getXChannel()->setKeyframe(seconds(3), 1.0);
    EXPECT_EQ(position->getXChannel()->numberOfKeyframes(), 1u) << "the clone shares nothing";
    EXPECT_FALSE(*copy == object);
    *copy = object;  // restore from the live tree, as a ghost backup does the other way round
    EXPECT_TRUE(*copy == object) << "assignment by position restores equality";
    EXPECT_EQ(copyPosition->getXChannel()->numberOfKeyframes(), 1u);

    rotation->setQuaternionMode(false, false);
    EXPECT_FALSE(*copy == object) << "quaternion mode is part of a rotation's state";
}

TEST_F(TreeFolderTest, compare__shapeAndNullSlotsMatter) {
    std::unique_ptr<TQChannelBase> copy(object.cloneChannel());
    auto* copyFolder = static_cast<TQChannelFolder*>(copy.get());
    copyFolder->removeChildAt(2);  // the null slot
    EXPECT_FALSE(*copy == object) << "one slot fewer";
    copyFolder->insertChild(2, std::make_unique<TQChannel>("Filler", 9));
    EXPECT_FALSE(*copy == object) << "a channel where the other has a null slot";
    TQChannel plain("Plain", 1);
    TQChannelBool flag("Plain", 1);
    EXPECT_FALSE(plain == flag) << "classes differ";
    static_cast<TQChannelBase&>(plain) =
        object;  // a folder's state can't be poured into a channel: nothing breaks
    EXPECT_EQ(plain.numberOfKeyframes(), 0u);
}

TEST_F(TreeFolderTest, lock__throughAncestors) {
    EXPECT_FALSE(opacity->isAnyAncestorLocked());
    hidden->setLocked(true, false);
    EXPECT_TRUE(opacity->isLocked(true));
    EXPECT_TRUE(opacity->isAnyAncestorLocked());
    EXPECT_FALSE(opacity->isLocked(false)) << "its own lock is off";
    EXPECT_FALSE(visible->isLocked(true)) << "siblings of the locked folder are free";
}

TEST_F(TreeFolderTest, noteWillChange__reachesNearestObserver) {
    RecordingObserver sceneObserver, objectObserver;
    TQChannelFolder scene("Scene", 0);
    scene.setChangeObserver(&sceneObserver);
    TQChannelBase* x = position->getXChannel();
    x->noteWillChange(true);
    EXPECT_TRUE(objectObserver.told.empty());
    object.setChangeObserver(&objectObserver);
    x->noteWillChange(true);
    x->noteWillChange(false);
    ASSERT_EQ(objectObserver.told.size(), 1u) << "told once, and not for a silent change";
    EXPECT_EQ(objectObserver.told[0], x) << "the observer hears which channel changes";
    EXPECT_TRUE(sceneObserver.told.empty());
}

TEST_F(TreeFolderTest, timeOffset__sumsAncestors) {
    object.setTimeOffset(seconds(10));
    transform->setTimeOffset(seconds(-2));
    EXPECT_EQ(position->getXChannel()->timeOffset(), seconds(8));
    object.setRootCurrentTime(seconds(11));
    EXPECT_EQ(object.getRootCurrentTime(true), seconds(1)) << "in the object's channel time";
    EXPECT_EQ(object.getRootCurrentTime(false), seconds(11));
}

TEST_F(TreeFolderTest, children__ownershipAndBadIndices) {
    EXPECT_EQ(object.getChild(99), nullptr);
    EXPECT_FALSE(object.removeChildAt(99));
    EXPECT_EQ(object.takeChildAt(2), nullptr) << "a null slot has nothing to hand over";
    TQChannel stranger("Stranger", 5);
    EXPECT_FALSE(object.removeChild(&stranger));
    EXPECT_FALSE(object.removeChild(nullptr));

    std::unique_ptr<TQChannelBase> taken = object.takeChild(visible);
    ASSERT_NE(taken, nullptr);
    EXPECT_EQ(taken->getParent(), nullptr);
    EXPECT_EQ(object.findChild(1000), nullptr);
    hidden->insertChild(500, std::move(taken));  // past the end appends
    EXPECT_EQ(hidden->getChild(1), visible);
    EXPECT_EQ(visible->getParent(), hidden);

    transform->addChild(std::unique_ptr<TQChannelBase>(visible));  // moves between folders
    EXPECT_EQ(hidden->numberOfChildren(), 1u);
    EXPECT_EQ(visible->getParent(), transform);

    object.removeAllChildren();
    EXPECT_EQ(object.getChildren(), nullptr) << "no children: a null vector";
    EXPECT_FALSE(object.isAnimated(true));
}

TEST_F(TreeFolderTest, animatedAndReset) {
    EXPECT_FALSE(transform->isAnimated(false)) << "a folder has no animation of its own";
    EXPECT_TRUE(transform->isAnimated(true));
    EXPECT_TRUE(position->isAnimated(false)) << "a compound answers for its components";
    EXPECT_FALSE(rotation->isAnimated(false));
    object.reset(false);
    EXPECT_FALSE(object.isAnimated(true));
    EXPECT_EQ(opacity->numberOfKeyframes(), 0u);
}

TEST(TreeFactory, identifiersAndCreation) {
    EXPECT_EQ(kTQChannelBoolFactoryId.word0, 0x229211d70b00de81u);
    EXPECT_EQ(kTQChannelBoolFactoryId.word1, 0x9389b702ac3d0003u);
    TQChannelBool flag("On", 1);
    EXPECT_EQ(TQChannelFactoryIdOf(&flag), kTQChannelBoolFactoryId);
    TQChannel plain("Plain", 1);
    EXPECT_EQ(TQChannelFactoryIdOf(&plain), kTQChannelFactoryId);
    EXPECT_TRUE(TQChannelFactoryIdOf(nullptr).isNull());

    for (const TQFactoryId& id :
         {kTQChannelFactoryId, kTQChannelFolderFactoryId, kTQChannelBoolFactoryId,
          kTQChannelCurveFactoryId, kTQChannelBlindDataFactoryId, kTQChannelAngleFactoryId,
          kTQChannelDecibelFactoryId, kTQCompoundChannelFactoryId, kTQChannel2DFactoryId,
          kTQChannel2DOverRangeFactoryId, kTQChannelScaleOverRangeFactoryId,
          kTQChannelRotation3DFactoryId, kTQChannelObjectRootFactoryId}) {
        const TQFactory* factory = TQFactory::find(id);
        ASSERT_NE(factory, nullptr) << "no factory for word " << id.word1;
        std::unique_ptr<TQChannelBase> made = factory->create("Made", 42);
        EXPECT_EQ(TQChannelFactoryIdOf(made.get()), id) << factory->getClassName();
        std::unique_ptr<TQChannelBase> copy(made->cloneChannel());
        const TQChannelBase& copied = *copy;
        const TQChannelBase& original = *made;
        EXPECT_EQ(typeid(copied), typeid(original))
            << factory->getClassName() << " clones as itself";
        EXPECT_TRUE(*copy == *made) << factory->getClassName();
    }
    EXPECT_EQ(TQFactory::find(TQFactoryId{1, 2}), nullptr);
}

TEST(TreeTypes, boolSnapsAndFixedInterpolationHolds) {
    TQChannelBool flag("On", 1);
    flag.setKeyframe(seconds(0), 0.7);
    double value = -1.0;
    ASSERT_TRUE(flag.getKeyframe(flag.getKeyframe(seconds(0)), nullptr, &value));
    EXPECT_EQ(value, 1.0) << "0.7 is on";
    EXPECT_TRUE(flag.isDiscrete());

    TQChannelBlindData data("Data", 2);
    TQKeyframeHandle h = data.setKeyframe(seconds(0), 3.0);
    data.setKeyframeInterpolation(h, kTQInterpolationLinear);
    EXPECT_EQ(data.getKeyframeInterpolation(h), kTQInterpolationConstant);
    EXPECT_TRUE(data.testFlag(kTQChannelFlagNoInterpolationChange));

    TQChannelRotation3D rotation("Rotation", 9);
    EXPECT_NE(rotation.getAngleChannel(kTQComponentZ), nullptr);
    EXPECT_TRUE(rotation.isLinked());
    TQChannelScaleOverRange scale("Scale", 3);
    static_assert(!std::is_base_of_v<TQChannel2DOverRange, TQChannelScaleOverRange>,
                  "pair classes must be told apart by downcast");
    EXPECT_EQ(scale.getXChannel()->getInitialValue(), 1.0);
}

}  // namespace
