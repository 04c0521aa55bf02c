// The scene's object model in both families, selection and change tracking.
#include <gtest/gtest.h>

#include <cstdint>

#include "host/TQHostAppDelegate.h"
#include "host/TQHostDenseScene.h"
#include "platform/channels/TQChannelTypes.h"

namespace {

constexpr TQHostProperty kAllProperties[] = {TQHostProperty::Position, TQHostProperty::Scale,
                                             TQHostProperty::Rotation, TQHostProperty::Shear,
                                             TQHostProperty::Pivot,    TQHostProperty::Opacity,
                                             TQHostProperty::Retiming};

class SceneFamilies : public ::testing::TestWithParam<TQHostObjectFamily> {};

// A channel class whose allocator hands the last freed address to the next channel, as a
// real allocator may at any time.
class ReusedAddressChannel : public TQChannel {
public:
    using TQChannel::TQChannel;
    static void* operator new(std::size_t size) {
        if (slotTaken || size > sizeof(slot)) return ::operator new(size);
        slotTaken = true;
        return slot;
    }
    static void operator delete(void* p) {
        if (p == slot)
            slotTaken = false;
        else
            ::operator delete(p);
    }
    // Of this class, so that undo can assign the snapshot back.
    TQChannelBase* cloneChannel() const override {
        auto* clone = new ReusedAddressChannel(getName(), getChannelId());
        clone->copyIdentityFrom(*this);
        copyConfigurationTo(*clone);
        clone->assignState(*this);
        return clone;
    }

private:
    alignas(TQChannel) static inline unsigned char slot[sizeof(TQChannel)];
    static inline bool slotTaken = false;
};

TEST_P(SceneFamilies, pathTables__resolveToKeyframableChannelsOfEveryObject) {
    const TQHostObjectFamily family = GetParam();
    TQHostScene scene(family);
    TQChannelObjectRootBase* first = scene.addObject("A");
    TQChannelObjectRootBase* second = scene.addObject("B");
    ASSERT_NE(first->getChannelId(), second->getChannelId());

    for (TQHostProperty property : kAllProperties)
        for (const BNString& path : TQHostPropertyPaths(family, property)) {
            auto* channel = dynamic_cast<TQChannel*>(TQChannelRef(path).getChannel(second));
            ASSERT_NE(channel, nullptr) << path << " does not name a channel";
            EXPECT_TRUE(channel->canKeyframe()) << path;
            EXPECT_EQ(channel->getChannelRoot(), second) << path;
            EXPECT_EQ(channel->getRef(true), TQChannelRef(path))
                << "the relative reference of " << path << " must be the table's text";
        }
    EXPECT_EQ(TQHostPropertyPaths(family, TQHostProperty::Shear).empty(),
              family == TQHostObjectFamily::Other);
    EXPECT_EQ(scene.isKestrel(), family == TQHostObjectFamily::Kestrel);
}

TEST_P(SceneFamilies, typedChannels__giveEveryDowncastSomethingToFind) {
    TQHostScene scene(GetParam());
    TQChannelBase* object = scene.addObject("A");
    const TQHostTypedChannelPaths& paths = TQHostTypedPaths(GetParam());
    auto at = [&](const BNString& path) { return TQChannelRef(path).getChannel(object); };

    EXPECT_TRUE(dynamic_cast<TQChannelBool*>(at(paths.visible)) &&
                dynamic_cast<TQChannelDecibel*>(at(paths.volume)) &&
                dynamic_cast<TQChannel2D*>(at(paths.offset)) &&
                dynamic_cast<TQChannel2DOverRange*>(at(paths.gradient)) &&
                dynamic_cast<TQChannelScaleOverRange*>(at(paths.taper)) &&
                dynamic_cast<TQChannelCurve*>(at(paths.softness)) &&
                dynamic_cast<TQChannelBlindData*>(at(paths.fontIndex)));
    auto* orientation = dynamic_cast<TQChannelRotation3D*>(at(paths.orientation));
    ASSERT_NE(orientation, nullptr);
    EXPECT_TRUE(orientation->isQuaternionMode());
    EXPECT_NE(dynamic_cast<TQChannelAngle*>(orientation->getAngleChannel(kTQComponentZ)), nullptr);
}

INSTANTIATE_TEST_SUITE_P(BothFamilies, SceneFamilies,
                         ::testing::Values(TQHostObjectFamily::Kestrel, TQHostObjectFamily::Other));

class HostDelegate : public ::testing::Test {
protected:
    void SetUp() override {
        // Three objects of the family, a few keyframes on their first channels.
        TQHostLoadDenseScene(host, TQHostObjectFamily::Kestrel,
                             {.objects = 3, .channelsPerObject = 3, .keyframesPerChannel = 4});
        objects = host.scene().objects();
        const auto& positions =
            TQHostPropertyPaths(TQHostObjectFamily::Kestrel, TQHostProperty::Position);
        x = TQChannelRef(positions[0]).getChannel(objects[0]);
        z = TQChannelRef(positions[2]).getChannel(objects[0]);
        otherX = TQChannelRef(positions[0]).getChannel(objects[1]);
    }
    // The modified channels as the host answers them: where each reference leads now.
    std::vector<const TQChannelBase*> modified() {
        std::vector<const TQChannelBase*> out;
        for (const TQChannelRef& ref : host.modifiedChannels())
            out.push_back(ref.getChannel(host.sceneChannelRoot()));
        return out;
    }
    TQHostAppDelegate host;
    std::vector<TQChannelObjectRootBase*> objects;
    TQChannelBase* x = nullptr;
    TQChannelBase* z = nullptr;
    TQChannelBase* otherX = nullptr;
};

TEST_F(HostDelegate, modifiedSet__isExactlyWhatChangedSinceTheLastReset) {
    EXPECT_TRUE(modified().empty()) << "loading must start with a clean set";
    x->noteWillChange(true);
    z->noteWillChange(true);
    x->noteWillChange(true);  // a drag announces again at every step
    EXPECT_EQ(modified(), (std::vector<const TQChannelBase*>{x, z}));
    EXPECT_TRUE(host.wasChannelModified(x) && host.wasChannelModified(objects[0]))
        << "and the object holding it";
    EXPECT_FALSE(host.wasChannelModified(otherX) || host.wasChannelModified(objects[1]) ||
                 host.wasChannelModified(nullptr))
        << "same place, other object: not modified";
    host.resetModifiedChannels();
    EXPECT_FALSE(host.wasChannelModified(x) || !modified().empty());
    x->getParent()->noteWillChange(true);
    EXPECT_TRUE(host.wasChannelModified(z))
        << "a compound announced as a whole covers its components";
    EXPECT_EQ(modified(), (std::vector<const TQChannelBase*>{x->getParent()}));
    ASSERT_TRUE(host.removeObject(objects[0]));
    EXPECT_EQ(modified(), (std::vector<const TQChannelBase*>{nullptr}))
        << "a removed channel's reference leads nowhere";
    EXPECT_FALSE(host.wasChannelModified(otherX) || host.wasChannelModified(objects[1]));
}

TEST_F(HostDelegate, channelAtAReusedAddress__isTrackedAndUndoneAsAChannelOfItsOwn) {
    TQChannelBase* first =
        objects[0]->addChild(std::unique_ptr<TQChannelBase>(new ReusedAddressChannel("A", 9000)));
    const auto firstAddress = reinterpret_cast<std::uintptr_t>(first);
    host.startCaptureModifiedChannels("Replace");
    first->noteWillChange(true);
    ASSERT_TRUE(objects[0]->removeChild(first));
    auto* second = static_cast<TQChannel*>(
        objects[1]->addChild(std::unique_ptr<TQChannelBase>(new ReusedAddressChannel("B", 9001))));
    ASSERT_EQ(reinterpret_cast<std::uintptr_t>(second), firstAddress);
    EXPECT_FALSE(host.wasChannelModified(second)) << "not announced yet";

    second->noteWillChange(true);
    second->setKeyframe(CMTimeMake(1, 1), 5.0);
    host.endCaptureModifiedChannels();

    EXPECT_TRUE(host.wasChannelModified(second) && host.wasChannelModified(objects[1]));
    EXPECT_EQ(modified(), (std::vector<const TQChannelBase*>{nullptr, second}));
    ASSERT_TRUE(host.undo());
    EXPECT_EQ(second->numberOfKeyframes(), 0u) << "the step captured the new channel too";
}

// The words the host posts, in order.
struct Words : TQNotificationReceiver {
    std::vector<TQNotificationWord> seen;
    void notify(TQNotificationWord word) override { seen.push_back(word); }
};

TEST_F(HostDelegate, selectionAndTime__answerAndPostTheHostWords) {
    Words words;
    host.addNotificationReceiver(&words);

    EXPECT_TRUE(host.objectsSelectedInScene());
    host.selectObject(objects[1], true);
    host.selectObject(objects[1], true);  // no change, no word
    EXPECT_EQ(host.selectedObjectsRootChannels(),
              (std::vector<TQChannelBase*>{objects[0], objects[1]}));
    EXPECT_TRUE(host.isObjectSelected(objects[1]));
    EXPECT_FALSE(host.isObjectSelected(x)) << "only object roots are objects";
    host.clearObjectSelection();
    EXPECT_FALSE(host.objectsSelectedInScene());

    host.setCurrentTime(CMTimeMake(3, 1));
    EXPECT_EQ(CMTimeGetSeconds(objects[2]->getRootCurrentTime(false)), 3.0);
    host.play();
    host.tick(CMTimeMake(1, 30));
    EXPECT_TRUE(host.isPlaying());
    host.abort();
    EXPECT_FALSE(host.isPlaying()) << "abort stops playback";

    EXPECT_EQ(words.seen, (std::vector<TQNotificationWord>{kTQNotifyObjectSelectionChanged,
                                                           kTQNotifyObjectSelectionChanged,
                                                           kTQNotifyHostTimeChanged}));
    host.removeNotificationReceiver(&words);
}

TEST_F(HostDelegate, transport__movesOnFramesInsideThePlayRangeAndTellsTheTime) {
    Words words;
    host.addNotificationReceiver(&words);
    // The editor's range is a zoom into the piece; playback keeps to the piece.
    ASSERT_TRUE(host.setPlayRange(CMTimeRangeMake(kCMTimeZero, CMTimeMake(2, 1))));
    ASSERT_TRUE(host.setDisplayRange(CMTimeRangeMake(CMTimeMake(1, 2), CMTimeMake(1, 2))));
    EXPECT_EQ(CMTimeGetSeconds(host.playRange().duration), 2.0);
    words.seen.clear();

    // 1/30 s cannot be held by the clock's timescale: the playhead is in frame 1 all the same.
    host.setCurrentTime(TQTarnTimeForChannelSeconds(1.0 / 30.0, TQHostPlaybackClock::kTimescale));
    EXPECT_TRUE(host.stepFrames(1));
    EXPECT_EQ(host.currentTime(), CMTimeMake(2, 30));
    EXPECT_TRUE(host.stepFrames(-100));
    EXPECT_EQ(host.currentTime(), kCMTimeZero) << "not before the play range";
    EXPECT_TRUE(host.goToEnd());
    EXPECT_EQ(host.currentTime(), CMTimeMake(59, 30)) << "the last frame of the play range";
    EXPECT_TRUE(host.stepFrames(1));
    EXPECT_EQ(words.seen, (std::vector<TQNotificationWord>(3, kTQNotifyHostTimeChanged)))
        << "a word for each move but the step past the end";

    const CMTime frame12 = CMTimeMake(12, 30);
    EXPECT_EQ(host.timeText(frame12), "00:00:00:12");
    host.setStartTimecode(30 * 3600);
    EXPECT_EQ(host.timeText(frame12), "01:00:00:12");
    host.setDisplayTimeAsFrames(true);
    host.setFirstFrameNumber(1);
    EXPECT_EQ(host.timeText(frame12), "13");
    host.removeNotificationReceiver(&words);
}

}  // namespace
