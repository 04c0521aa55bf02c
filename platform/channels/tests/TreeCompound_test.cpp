#include <gtest/gtest.h>

#include <memory>
#include <vector>

#include "platform/channels/TQChannel.h"
#include "platform/channels/TQCompoundChannel.h"

namespace {

CMTime seconds(double s) { return TQTarnTimeForChannelSeconds(s, 0x40000); }

class RecordingObserver : public TQChannelChangeObserver {
public:
    void channelWillChange(TQChannelBase& channel) override { told.push_back(&channel); }
    std::vector<TQChannelBase*> told;
};

// A compound of three components, each keyed at 1 s (value 10 * id) and 2 s, and shifted by
// one second on the editor's axis.
class TreeCompoundTest : public ::testing::Test {
protected:
    void SetUp() override {
        for (TQChannelId id : {1u, 2u, 3u}) {
            auto* c =
                static_cast<TQChannel*>(compound.addChild(std::make_unique<TQChannel>("C", id)));
            c->setKeyframe(seconds(1), 10.0 * id);
            c->setKeyframe(seconds(2), 0.0);
            components.push_back(c);
        }
        compound.setTimeOffset(seconds(1));
        compound.setChangeObserver(&observer);
    }

    bool keyedAt(const TQChannel* c, double channelSeconds) const {
        const CMTime t = seconds(channelSeconds);
        return c->keyframeExistsAtTime(&t);
    }

    TQCompoundChannel compound{"Position", 101};
    std::vector<TQChannel*> components;
    RecordingObserver observer;
};

TEST_F(TreeCompoundTest, foldFlag__linksWhateverTheCallerAsks) {
    compound.setLinked(true);
    compound.addKeyframe(components[1], seconds(6.5), false);
    for (TQChannel* c : components) EXPECT_TRUE(keyedAt(c, 5.5)) << "id " << c->getChannelId();
    compound.deleteKeyframe(components[0], seconds(5.5), false);
    for (TQChannel* c : components) EXPECT_FALSE(keyedAt(c, 5.5)) << "id " << c->getChannelId();
}

TEST_F(TreeCompoundTest, addKeyframe__linkedAddsToAllUnlinkedToOne) {
    compound.addKeyframe(components[1], seconds(4), true);  // axis 4 s = channel 3 s
    for (TQChannel* c : components) EXPECT_TRUE(keyedAt(c, 3)) << "id " << c->getChannelId();
    EXPECT_EQ(observer.told,
              (std::vector<TQChannelBase*>{components[0], components[1], components[2]}))
        << "each component is announced, in child order";

    observer.told.clear();
    compound.addKeyframe(components[1], seconds(5.5), false);
    EXPECT_TRUE(keyedAt(components[1], 4.5));
    EXPECT_FALSE(keyedAt(components[0], 4.5)) << "unlinked: only the touched component";
    EXPECT_EQ(observer.told.size(), 1u);

    observer.told.clear();
    compound.addKeyframe(components[0], seconds(2), true);  // channel 1 s: taken everywhere
    EXPECT_TRUE(observer.told.empty()) << "nothing to add, nothing announced";
    EXPECT_EQ(components[0]->numberOfKeyframes(), 3u);
}

TEST_F(TreeCompoundTest, moveKeyframe__eachComponentFoundAtTarget) {
    const double newValue = 99.0;
    bool collided = true;
    compound.moveKeyframe(components[0], seconds(2), seconds(2.5), &newValue, &collided, true);
    EXPECT_FALSE(collided);
    for (TQChannel* c : components) {
        EXPECT_TRUE(keyedAt(c, 1.5)) << "id " << c->getChannelId() << " not at the target";
        EXPECT_FALSE(keyedAt(c, 1)) << "id " << c->getChannelId() << " left a keyframe behind";
    }
    double value = 0.0;
    components[0]->getKeyframe(components[0]->getKeyframe(seconds(1.5)), nullptr, &value);
    EXPECT_EQ(value, newValue) << "the touched component takes the new value";
    components[2]->getKeyframe(components[2]->getKeyframe(seconds(1.5)), nullptr, &value);
    EXPECT_EQ(value, 30.0) << "the others keep theirs";

    compound.moveKeyframe(components[2], seconds(2.5), seconds(3), nullptr, &collided, false);
    EXPECT_TRUE(collided) << "moved onto the keyframe at channel 2 s";
    EXPECT_TRUE(keyedAt(components[1], 1.5)) << "unlinked: the others stay";
    EXPECT_FALSE(keyedAt(components[2], 1.5));
}

TEST_F(TreeCompoundTest, deleteKeyframe__channelTimeLinkedOrNot) {
    compound.deleteKeyframe(components[0], seconds(2), false);
    EXPECT_FALSE(keyedAt(components[0], 2));
    EXPECT_TRUE(keyedAt(components[1], 2));
    compound.deleteKeyframe(components[1], seconds(1), true);
    for (TQChannel* c : components) EXPECT_FALSE(keyedAt(c, 1)) << "id " << c->getChannelId();
    EXPECT_EQ(observer.told.size(), 4u);
}

TEST_F(TreeCompoundTest, interpolation__linkedKeyframesAndLockedOutComponents) {
    components[2]->setFlag(kTQChannelFlagNoInterpolationChange, false);
    TQKeyframeHandle h = components[0]->getKeyframe(seconds(1));
    compound.setLinkedInterpolation(components[0], h, kTQInterpolationExp, true);
    EXPECT_EQ(components[0]->getKeyframeInterpolation(h), kTQInterpolationExp);
    EXPECT_EQ(components[1]->getKeyframeInterpolation(components[1]->getKeyframe(seconds(1))),
              kTQInterpolationExp);
    EXPECT_NE(components[2]->getKeyframeInterpolation(components[2]->getKeyframe(seconds(1))),
              kTQInterpolationExp)
        << "a component that takes no interpolation change is left alone";

    components[0]->deleteKeyframe(h);
    observer.told.clear();
    compound.setLinkedInterpolation(components[0], h, kTQInterpolationConstant, true);
    EXPECT_TRUE(observer.told.empty()) << "a stale handle changes nothing";

    compound.setLinkedCurveInterpolation(kTQInterpolationCatmullRom);
    EXPECT_EQ(components[1]->getInterpolation(), kTQInterpolationCatmullRom);
    EXPECT_NE(components[2]->getInterpolation(), kTQInterpolationCatmullRom);
}

TEST_F(TreeCompoundTest, edits__foreignOrNullComponentIsNoOp) {
    TQChannel stranger("Stranger", 1);
    stranger.setKeyframe(seconds(1), 1.0);
    compound.deleteKeyframe(&stranger, seconds(1), true);
    compound.addKeyframe(nullptr, seconds(4), true);
    compound.moveKeyframe(&stranger, seconds(2), seconds(4), nullptr, nullptr, true);
    EXPECT_TRUE(observer.told.empty());
    EXPECT_EQ(stranger.numberOfKeyframes(), 1u);
    for (TQChannel* c : components) EXPECT_EQ(c->numberOfKeyframes(), 2u);
    EXPECT_TRUE(compound.isCompoundChannel());
    EXPECT_EQ(compound.numberOfComponents(), 3u);
}

}  // namespace
