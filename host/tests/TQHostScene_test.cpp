// The reference host: the scene's object model in both families, selection and change
// tracking; the sample piece moves as an animator keyed it, and the dense scene has the size it
// was asked for and is the same scene for the same seed; the owner-ticked playback clock; the
// delivery of words to receivers, re-entrant posts and registration changes during delivery.
// Undo and redo through the delegate operations, as the framework drives them; every check
// compares the whole scene, so a step that restores one channel and breaks another shows.
#include <gtest/gtest.h>

#include <cmath>
#include <cstdint>
#include <functional>
#include <memory>
#include <numbers>
#include <vector>

#include "host/TQHostAppDelegate.h"
#include "host/TQHostDenseScene.h"
#include "host/TQHostNotificationCenter.h"
#include "host/TQHostPlaybackClock.h"
#include "host/TQHostSampleScene.h"
#include "platform/channels/TQChannel.h"
#include "platform/channels/TQChannelTypes.h"

namespace {

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

constexpr double kTolerance = 1e-6;

std::vector<TQChannel*> channelsOf(const TQHostScene& scene) {
    std::vector<TQChannel*> out;
    for (TQChannelObjectRootBase* object : scene.objects()) {
        std::vector<TQChannelBase*> channels;
        object->getAllDescendantsFlattened(channels, 0, true);
        for (TQChannelBase* c : channels) out.push_back(static_cast<TQChannel*>(c));
    }
    return out;
}

class SamplePiece : public ::testing::TestWithParam<TQHostObjectFamily> {
protected:
    TQChannel* channel(const char* object, TQHostProperty property, size_t axis = 0) {
        return dynamic_cast<TQChannel*>(
            TQChannelRef(TQHostPropertyPaths(GetParam(), property).at(axis))
                .getChannel(host.scene().objectNamed(object)));
    }
    static double at(const TQChannel* c, double seconds) {
        return c->getCurveValue(CMTimeMakeWithSeconds(seconds, 0x40000));
    }
    // The largest (sign 1) or smallest (sign -1) value over a span, sampled finely.
    static double peak(const TQChannel* c, double from, double to, double sign) {
        double best = -INFINITY;
        for (double t = from; t <= to; t += 1.0 / 240.0) best = std::max(best, sign * at(c, t));
        return sign * best;
    }
    TQHostAppDelegate host;
};

TEST_P(SamplePiece, piece__titleFliesInAndPopsLogoBouncesAndSpinsOneBehaviour) {
    TQHostLoadSampleScene(host, GetParam());
    EXPECT_EQ(CMTimeGetSeconds(host.displayRange().duration), 6.0);
    EXPECT_EQ(host.selectedObjectsRootChannels(),
              std::vector<TQChannelBase*>{host.scene().objectNamed(kTQHostSampleTitleObject)});
    EXPECT_FALSE(host.canUndo());
    size_t behaviours = 0;
    for (TQChannel* c : channelsOf(host.scene())) behaviours += c->numberOfBehaviors();
    EXPECT_EQ(behaviours, 1u) << "the logo's sway is the one behaviour";

    const TQChannel* x = channel(kTQHostSampleTitleObject, TQHostProperty::Position);
    const TQChannel* scale = channel(kTQHostSampleTitleObject, TQHostProperty::Scale);
    EXPECT_LT(at(x, 0.0), -960.0) << "the title starts outside a 1920-wide picture";
    EXPECT_GT(at(x, 0.75), -25.0) << "and slows into its rest";
    EXPECT_NEAR(peak(x, 0.8, 5.0, 1), 0.0, kTolerance) << "where it stays";
    EXPECT_GT(peak(scale, 0.3, 0.8, 1), 1.1) << "its scale overshoots";
    EXPECT_NEAR(at(scale, 1.2), 1.0, kTolerance);

    const TQChannel* y = channel(kTQHostSampleBehaviorObject, TQHostProperty::Position, 1);
    const double floor = at(y, 3.0);
    EXPECT_GE(peak(y, 1.0, 6.0, -1), floor - kTolerance) << "the logo never sinks through";
    EXPECT_GT(peak(y, 1.5, 2.0, 1), peak(y, 2.0, 2.3, 1)) << "each bounce lower";
    const auto& rotation = TQHostPropertyPaths(GetParam(), TQHostProperty::Rotation);
    const TQChannel* spin =
        channel(kTQHostSampleBehaviorObject, TQHostProperty::Rotation, rotation.size() - 1);
    EXPECT_NEAR(at(spin, 2.0), std::numbers::pi, 1e-9);
    EXPECT_NEAR(at(spin, 5.9), at(spin, 3.9), 1e-9) << "the turn repeats past its keys";
}

INSTANTIATE_TEST_SUITE_P(BothFamilies, SamplePiece,
                         ::testing::Values(TQHostObjectFamily::Kestrel, TQHostObjectFamily::Other));

TEST(DenseScene, sizeAndSeed__asAskedAndTheSameForTheSameSeed) {
    const struct {
        TQHostObjectFamily family;
        TQHostDenseSceneLayout layout;
        size_t channels;  // in the objects, animated or not
        size_t keyframes;
    } cases[] = {
        {TQHostObjectFamily::Other, {.objects = 3, .keyframesPerChannel = 7}, 90, 630},
        {TQHostObjectFamily::Kestrel, {.objects = 2, .channelsPerObject = 4}, 58, 800},
        {TQHostObjectFamily::Kestrel, {.objects = 2, .totalKeyframes = 1001}, 60, 1001},
        {TQHostObjectFamily::Other,
         {.objects = 1, .channelsPerObject = 50, .channels = TQHostDenseChannels::Plain},
         50,
         5000},
    };
    for (const auto& c : cases) {
        TQHostScene scene(c.family), again(c.family);
        TQHostPopulateDenseScene(scene, c.layout);
        TQHostPopulateDenseScene(again, c.layout);
        const auto channels = channelsOf(scene), twins = channelsOf(again);
        ASSERT_EQ(channels.size(), c.channels);
        size_t keyframes = 0;
        for (size_t i = 0; i < channels.size(); ++i) {
            keyframes += channels[i]->numberOfKeyframes();
            EXPECT_TRUE(*channels[i] == *twins[i]) << "channel " << i << " differs, same seed";
        }
        EXPECT_EQ(keyframes, c.keyframes);
    }
    const TQHostDenseSceneLayout stress = TQHostStressSceneLayout();
    EXPECT_EQ(stress.objects * stress.channelsPerObject, 3000u);
    EXPECT_EQ(TQHostDenseKeyframesOfChannel(stress, 0), 334u) << "the remainder goes first";
    EXPECT_EQ(TQHostDenseKeyframesOfChannel(stress, 2999), 333u);
}

constexpr double kTimeTolerance = 1.0 / TQHostPlaybackClock::kTimescale;

class PlaybackClock : public ::testing::Test {
protected:
    void SetUp() override {
        ASSERT_TRUE(clock.setPlayRange(CMTimeRangeMake(CMTimeMake(1, 1), CMTimeMake(2, 1))));
    }
    double seconds() const { return CMTimeGetSeconds(clock.currentTime()); }
    TQHostPlaybackClock clock;
};

TEST_F(PlaybackClock, tick__movesOnlyWhilePlayingAndRefusesBadInput) {
    EXPECT_FALSE(clock.tick(CMTimeMake(1, 2))) << "a stopped clock must not move";
    clock.play();
    EXPECT_NEAR(seconds(), 1.0, kTimeTolerance) << "play starts at the range when outside it";
    EXPECT_TRUE(clock.tick(CMTimeMake(1, 4)));
    EXPECT_NEAR(seconds(), 1.25, kTimeTolerance);
    EXPECT_FALSE(clock.tick(CMTimeMake(-1, 4))) << "negative elapsed time is ignored";
    EXPECT_FALSE(clock.tick(kCMTimeInvalid));
    EXPECT_FALSE(clock.setCurrentTime(kCMTimeInvalid));
    EXPECT_FALSE(clock.setPlayRange(CMTimeRangeMake(kCMTimeZero, kCMTimeZero)));
    EXPECT_FALSE(clock.setPlayRange(CMTimeRangeMake(kCMTimeIndefinite, CMTimeMake(1, 1))));
    EXPECT_NEAR(CMTimeGetSeconds(clock.playRange().duration), 2.0, kTimeTolerance);
    EXPECT_NEAR(seconds(), 1.25, kTimeTolerance);
}

TEST_F(PlaybackClock, tick__loopsExactlyInTheRangeOrRestsOnItsEnd) {
    clock.play();
    for (int i = 0; i < 1000; ++i) clock.tick(CMTimeMake(1, 24));
    // 1000/24 s = 41.666.. s from 1 s, in a 2 s loop: 1 + (41.666.. mod 2) = 2.666..
    EXPECT_NEAR(seconds(), 1.0 + std::fmod(1000.0 / 24.0, 2.0), 1000 * kTimeTolerance);
    clock.setCurrentTime(CMTimeMake(5, 2));
    clock.tick(CMTimeMake(1, 2));
    EXPECT_NEAR(seconds(), 1.0, kTimeTolerance) << "reaching the end exactly wraps to the start";

    clock.setLooping(false);
    clock.tick(CMTimeMake(7, 1));
    EXPECT_NEAR(seconds(), 3.0, kTimeTolerance);
    EXPECT_FALSE(clock.isPlaying());
    clock.play();
    EXPECT_NEAR(seconds(), 1.0, kTimeTolerance) << "playing again starts over";
}

// Logs every word with its own tag, and runs an action on the first word it hears.
struct Receiver : TQNotificationReceiver {
    Receiver(std::vector<std::pair<char, TQNotificationWord>>& log, char tag)
        : log(log), tag(tag) {}
    void notify(TQNotificationWord word) override {
        log.emplace_back(tag, word);
        if (onFirst) {
            auto action = std::move(onFirst);
            onFirst = nullptr;
            action(word);
        }
    }
    std::vector<std::pair<char, TQNotificationWord>>& log;
    char tag;
    std::function<void(TQNotificationWord)> onFirst;
};

class NotificationCenter : public ::testing::Test {
protected:
    using Log = std::vector<std::pair<char, TQNotificationWord>>;
    TQHostNotificationCenter center;
    Log log;
    Receiver a{log, 'a'}, b{log, 'b'}, c{log, 'c'};
};

TEST_F(NotificationCenter, reentrantPost__waitsUntilTheCurrentWordReachedEveryone) {
    center.addReceiver(&a);
    center.addReceiver(&b);
    center.addReceiver(&a);  // twice: still one registration
    center.addReceiver(nullptr);
    a.onFirst = [&](TQNotificationWord) {
        center.post(kTQNotifyCurveSetContentChanged);
        EXPECT_EQ(log.size(), 1u) << "a nested post must not be delivered inside notify";
    };
    center.post(kTQNotifyChannelsChanging);
    EXPECT_EQ(log, (Log{{'a', 0x4}, {'b', 0x4}, {'a', 0x20000}, {'b', 0x20000}}));
    EXPECT_FALSE(center.isDelivering());
    EXPECT_EQ(center.deliveredWordCount(), 2u);
}

TEST_F(NotificationCenter, unregisterDuringDelivery__isSafeAndTakesEffectAtOnce) {
    center.addReceiver(&a);
    center.addReceiver(&b);
    center.addReceiver(&c);
    // a removes b, which has not heard the word yet, and itself.
    a.onFirst = [&](TQNotificationWord) {
        center.removeReceiver(&b);
        center.removeReceiver(&a);
    };
    center.post(0x8);
    EXPECT_EQ(log, (Log{{'a', 0x8}, {'c', 0x8}}));
    EXPECT_EQ(center.receiverCount(), 1u);
    // c registers b again from inside notify: b hears the next word, not this one.
    log.clear();
    c.onFirst = [&](TQNotificationWord) {
        center.addReceiver(&b);
        center.post(0x2);
    };
    center.post(0x10);
    EXPECT_EQ(log, (Log{{'c', 0x10}, {'c', 0x2}, {'b', 0x2}}));
    center.removeReceiver(&a);  // unknown now: ignored
    EXPECT_TRUE(center.hasReceiver(&b));
}

class HostUndo : public ::testing::Test {
protected:
    void SetUp() override {
        TQHostLoadSampleScene(host, TQHostObjectFamily::Kestrel);
        object = host.scene().objects().front();
        const auto& positions =
            TQHostPropertyPaths(TQHostObjectFamily::Kestrel, TQHostProperty::Position);
        x = channel(positions[0]);
        y = channel(positions[1]);
        opacity =
            channel(TQHostPropertyPaths(TQHostObjectFamily::Kestrel, TQHostProperty::Opacity)[0]);
        ASSERT_TRUE(x && y && opacity) << "the sample object lacks its position or opacity";
    }
    TQChannel* channel(const BNString& path) {
        return dynamic_cast<TQChannel*>(TQChannelRef(path).getChannel(object));
    }
    std::unique_ptr<TQChannelBase> scene() {
        return std::unique_ptr<TQChannelBase>(host.sceneChannelRoot()->cloneChannel());
    }
    bool sceneIs(const std::unique_ptr<TQChannelBase>& expected) {
        return *host.sceneChannelRoot() == *expected;
    }
    // A step back (or forward) through the history, after which the scene is `expected`.
    bool undoneTo(const std::unique_ptr<TQChannelBase>& s) { return host.undo() && sceneIs(s); }
    bool redoneTo(const std::unique_ptr<TQChannelBase>& s) { return host.redo() && sceneIs(s); }

    // One framework-style edit: every channel gets a keyframe at 4.5 s with a new value.
    void bracketedEdit(const BNString& description, std::initializer_list<TQChannel*> channels,
                       double value) {
        host.startCaptureModifiedChannels(description);
        for (TQChannel* c : channels) host.willChangeChannel(c);
        for (TQChannel* c : channels) host.willSetChannelValue(c);
        for (TQChannel* c : channels) {
            c->noteWillChange(true);
            c->setKeyframe(CMTimeMake(9, 2), value);
        }
        for (TQChannel* c : channels) host.didSetChannelValue(c);
        for (TQChannel* c : channels) host.didChangeChannel(c);
        host.endCaptureModifiedChannels();
    }

    TQHostAppDelegate host;
    TQChannelObjectRootBase* object = nullptr;
    TQChannel *x = nullptr, *y = nullptr, *opacity = nullptr;
};

TEST_F(HostUndo, brackets__nestedOnesMakeOneStepEmptyOnesNoneAndStrayEndsAreTolerated) {
    const auto before = scene();
    host.startCaptureModifiedChannels("Delete Keypoint");
    host.startCaptureModifiedChannels("Inner");
    host.willChangeChannel(x);
    x->noteWillChange(true);
    x->deleteKeyframe(x->getKeyframes(false).front());
    host.endCaptureModifiedChannels();
    EXPECT_TRUE(host.undoStack().isStepOpen()) << "the inner end must not close the step";
    EXPECT_FALSE(host.canUndo()) << "no undo while a step is open";
    host.endCaptureModifiedChannels();
    EXPECT_EQ(host.undoDescription(), "Delete Keypoint");
    EXPECT_TRUE(undoneTo(before));
    host.endCaptureModifiedChannels();  // nothing open: changes nothing
    EXPECT_EQ(host.undoStack().redoCount(), 1u);

    TQHostUndoStack& history = host.undoStack();
    bracketedEdit("First", {x}, 1.0);
    const uint64_t first = history.position();
    bracketedEdit("Second", {y}, 2.0);
    const uint64_t second = history.position();
    ASSERT_TRUE(host.undo());  // "Second" waits on the redo side
    EXPECT_EQ(history.position(), first) << "undo goes back to where First left the history";
    // A click that announces a channel but moves nothing.
    host.startCaptureModifiedChannels("Move Keypoint");
    host.willChangeChannel(x);
    host.willSetChannelValue(x);
    host.didSetChannelValue(x);
    host.didChangeChannel(x);
    host.endCaptureModifiedChannels();
    EXPECT_EQ(host.undoStack().undoCount(), 1u) << "an empty step must not be kept";
    EXPECT_EQ(host.undoDescription() + "/" + host.redoDescription(), "First/Second")
        << "nor clear redo";
    // The time-move key command closes its step and then announces again with no did.
    host.willSetChannelValue(x);
    host.willChangeChannel(x);
    EXPECT_FALSE(host.undoStack().isStepOpen());
    EXPECT_EQ(history.position(), first) << "an empty step is no position";
    ASSERT_TRUE(host.redo() && history.position() == second && host.undo());
    bracketedEdit("Third", {opacity}, 0.5);
    EXPECT_FALSE(host.canRedo() || host.redo()) << "a kept step clears redo";
    EXPECT_TRUE(history.position() != first && history.position() != second)
        << "a new step after an undo is a new position";

    host.undoStack().setLevelsOfUndo(2);
    bracketedEdit("Fourth", {x}, 4.0);
    EXPECT_EQ(host.undoStack().undoCount(), 2u) << "the oldest steps are forgotten";
    ASSERT_TRUE(host.undo() && host.undo());
    EXPECT_FALSE(host.canUndo());
    EXPECT_EQ(host.redoDescription(), "Third");
}

TEST_F(HostUndo, capture__anUnannouncedChangeAndAChannelAddedLaterAreTakenWhenTheyChange) {
    const auto before = scene();
    host.startCaptureModifiedChannels("Nudge");
    opacity->noteWillChange(true);  // no willChangeChannel: the key sentry announces nothing
    opacity->setKeyframe(CMTimeMake(1, 1), 0.25);
    host.endCaptureModifiedChannels();
    const auto nudged = scene();
    host.addChannelToUndo(y, "Add keypoint");
    host.willChangeChannel(y);
    y->noteWillChange(true);
    const CMTime at = CMTimeMake(7, 3);
    y->addKeyframe(&at);
    host.didChangeChannel(y);
    const auto added = scene();
    EXPECT_EQ(host.undoDescription(), "Add keypoint");
    EXPECT_TRUE(undoneTo(nudged));
    EXPECT_TRUE(undoneTo(before));
    ASSERT_TRUE(host.redo() && host.redo());
    EXPECT_TRUE(sceneIs(added)) << "the after state is taken lazily";
    host.addChannelToUndo(x, "Add keypoint");
    EXPECT_EQ(host.undoStack().undoCount(), 2u) << "recorded but never changed: dropped";
}

// A change announced with no bracket (a Control band's flatten) is a step of its own; the
// channels announced after it join it until the history is read.
TEST_F(HostUndo, unbracketedChanges__becomeOneStepThatUndoes) {
    const auto before = scene();
    for (TQChannel* c : {x, y}) {
        c->noteWillChange(true);
        c->setKeyframe(CMTimeMake(1, 1), -3.0);
    }
    const auto changed = scene();
    EXPECT_EQ(host.undoDescription(), TQHostUndoStack::kImplicitStepDescription);
    EXPECT_TRUE(undoneTo(before));
    EXPECT_FALSE(host.canUndo()) << "both channels in one step";
    EXPECT_TRUE(redoneTo(changed));
}

TEST_F(HostUndo, clientStep__restoresThroughItsOwnerJoinsAnOpenStepAndDiesWithIt) {
    struct Client : TQHostUndoClient {
        int value = 0;
        std::any captureUndoState(uint32_t, uint32_t) override { return value; }
        void restoreUndoState(uint32_t, uint32_t, const std::any& state) override {
            value = std::any_cast<int>(state);
        }
    } client;
    int owner = 0;  // any object's address names the owner
    host.registerUndoClient(&owner, &client);
    client.value = 1;
    host.addToUndo(&owner, 2, 0, "Curve Editor Undo Remove Channel");
    client.value = 2;
    EXPECT_EQ(host.undoDescription(), "Curve Editor Undo Remove Channel");
    ASSERT_TRUE(host.undo());
    EXPECT_EQ(client.value, 1);
    ASSERT_TRUE(host.redo());
    EXPECT_EQ(client.value, 2);

    const auto before = scene();
    host.startCaptureModifiedChannels("Box Edit");
    host.addToUndo(&owner, 1, 0, "Curve Editor Undo Box Edit");
    client.value = 3;
    host.willChangeChannel(x);
    x->noteWillChange(true);
    x->setKeyframe(CMTimeMake(3, 1), -9.0);
    host.endCaptureModifiedChannels();
    EXPECT_EQ(host.undoStack().undoCount(), 2u);
    ASSERT_TRUE(host.undo());
    EXPECT_TRUE(client.value == 2 && sceneIs(before));

    host.unregisterUndoClient(&owner);
    EXPECT_EQ(host.undoStack().undoCount(), 0u) << "the client's own step goes with it";
    EXPECT_EQ(host.undoStack().redoCount(), 1u) << "a step with channels stays, without the client";
    int stranger = 0;
    host.addToUndo(&stranger, 2, 1, "Curve Editor Undo New Curve Set");
    EXPECT_EQ(host.undoStack().undoCount(), 0u) << "no registered owner: nothing to restore";
}

TEST_F(HostUndo, undo__marksRestoredChannelsModifiedAndPosts) {
    Words counter;
    host.addNotificationReceiver(&counter);
    bracketedEdit("Edit", {opacity}, 0.1);
    host.resetModifiedChannels();
    ASSERT_TRUE(host.undo());
    EXPECT_TRUE(host.wasChannelModified(opacity) && !host.wasChannelModified(x));
    EXPECT_EQ(counter.seen.back(), kTQNotifyChannelsChanged);
    host.removeNotificationReceiver(&counter);
}

}  // namespace
