// Undo and redo through the host's delegate operations, as the framework drives them.
#include <gtest/gtest.h>

#include <memory>

#include "host/TQHostAppDelegate.h"
#include "host/TQHostSampleScene.h"
#include "platform/channels/TQChannelTypes.h"

namespace {

std::unique_ptr<TQChannelBase> snapshot(const TQChannelBase* channel) {
    return std::unique_ptr<TQChannelBase>(channel->cloneChannel());
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
    TQChannel* x = nullptr;
    TQChannel* y = nullptr;
    TQChannel* opacity = nullptr;
};

TEST_F(HostUndo, undoRedo__severalChannelsComeBackBitIdentical) {
    auto xBefore = snapshot(x), yBefore = snapshot(y), opacityBefore = snapshot(opacity);
    bracketedEdit("Move Keypoint", {x, y, opacity}, 123.0);
    auto xAfter = snapshot(x), yAfter = snapshot(y), opacityAfter = snapshot(opacity);
    ASSERT_FALSE(*xAfter == *xBefore) << "the edit should have changed X";

    ASSERT_TRUE(host.undo());
    EXPECT_TRUE(*x == *xBefore) << "undo must restore X exactly";
    EXPECT_TRUE(*y == *yBefore) << "undo must restore Y exactly";
    EXPECT_TRUE(*opacity == *opacityBefore) << "undo must restore opacity exactly";

    ASSERT_TRUE(host.redo());
    EXPECT_TRUE(*x == *xAfter) << "redo must re-apply X exactly";
    EXPECT_TRUE(*y == *yAfter);
    EXPECT_TRUE(*opacity == *opacityAfter);
    EXPECT_FALSE(host.canRedo());
}

TEST_F(HostUndo, nestedBrackets__countAndMakeOneStepUnderTheOuterDescription) {
    auto before = snapshot(x);
    host.startCaptureModifiedChannels("Delete Keypoint");
    host.startCaptureModifiedChannels("Inner");
    host.willChangeChannel(x);
    x->noteWillChange(true);
    x->deleteKeyframe(x->getKeyframes(false).front());
    host.endCaptureModifiedChannels();
    EXPECT_TRUE(host.undoStack().isStepOpen()) << "the inner end must not close the step";
    EXPECT_FALSE(host.canUndo()) << "no undo while a step is open";
    host.endCaptureModifiedChannels();

    EXPECT_EQ(host.undoStack().undoCount(), 1u);
    EXPECT_EQ(host.undoDescription(), "Delete Keypoint");
    ASSERT_TRUE(host.undo());
    EXPECT_TRUE(*x == *before);

    // An extra end with nothing open is tolerated and changes nothing.
    host.endCaptureModifiedChannels();
    EXPECT_EQ(host.undoStack().redoCount(), 1u);
}

TEST_F(HostUndo, stepWithoutChange__leavesTheHistoryAsItWas) {
    bracketedEdit("First", {x}, 1.0);
    bracketedEdit("Second", {y}, 2.0);
    ASSERT_TRUE(host.undo());  // "Second" waits on the redo side

    // A click that announces channels but moves nothing.
    host.startCaptureModifiedChannels("Move Keypoint");
    host.willChangeChannel(x);
    host.willSetChannelValue(x);
    host.didSetChannelValue(x);
    host.didChangeChannel(x);
    host.endCaptureModifiedChannels();

    EXPECT_EQ(host.undoStack().undoCount(), 1u) << "an empty step must not be kept";
    EXPECT_EQ(host.undoDescription(), "First");
    EXPECT_EQ(host.redoDescription(), "Second") << "an empty step must not clear redo";

    bracketedEdit("Third", {opacity}, 0.5);
    EXPECT_FALSE(host.canRedo()) << "a kept step clears redo";
}

TEST_F(HostUndo, levelsOfUndo__forgetTheOldestSteps) {
    host.undoStack().setLevelsOfUndo(2);
    bracketedEdit("One", {x}, 1.0);
    bracketedEdit("Two", {x}, 2.0);
    bracketedEdit("Three", {x}, 3.0);
    EXPECT_EQ(host.undoStack().undoCount(), 2u);
    ASSERT_TRUE(host.undo());
    ASSERT_TRUE(host.undo());
    EXPECT_FALSE(host.canUndo()) << "the oldest step must be gone";
    EXPECT_EQ(host.redoDescription(), "Two");
}

TEST_F(HostUndo, unannouncedChange__isCapturedAtItsNoteWillChange) {
    auto before = snapshot(opacity);
    host.startCaptureModifiedChannels("Nudge");
    opacity->noteWillChange(true);  // no willChangeChannel: the key sentry announces nothing
    opacity->setKeyframe(CMTimeMake(1, 1), 0.25);
    host.endCaptureModifiedChannels();
    ASSERT_TRUE(host.undo());
    EXPECT_TRUE(*opacity == *before);
}

TEST_F(HostUndo, willWithoutDidOutsideBracket__isTolerated) {
    bracketedEdit("Move In Time", {x}, 5.0);
    // The time-move key command closes its step and then announces again with no did...
    host.willSetChannelValue(x);
    host.willChangeChannel(x);
    EXPECT_EQ(host.undoStack().undoCount(), 1u);
    EXPECT_FALSE(host.undoStack().isStepOpen());
    EXPECT_TRUE(host.undo()) << "the stray announcements must not block undo";
}

TEST_F(HostUndo, addChannelToUndo__takesTheAfterStateLazily) {
    auto before = snapshot(y);
    host.addChannelToUndo(y, "Add keypoint");
    host.willChangeChannel(y);
    host.willSetChannelValue(y);
    y->noteWillChange(true);
    const CMTime at = CMTimeMake(7, 3);
    y->addKeyframe(&at);
    host.didSetChannelValue(y);
    host.didChangeChannel(y);
    auto after = snapshot(y);

    EXPECT_EQ(host.undoDescription(), "Add keypoint");
    ASSERT_TRUE(host.undo());
    EXPECT_TRUE(*y == *before);
    ASSERT_TRUE(host.redo());
    EXPECT_TRUE(*y == *after);

    // Recorded but never changed: dropped when the history is next read.
    host.addChannelToUndo(x, "Add keypoint");
    EXPECT_EQ(host.undoStack().undoCount(), 1u);
}

TEST_F(HostUndo, replacedChannel__isFoundByItsReference) {
    auto before = snapshot(x);
    bracketedEdit("Edit", {x}, 77.0);
    // Replace the whole object by a copy with the same id: the channel objects are new.
    const TQChannelId id = object->getChannelId();
    std::unique_ptr<TQChannelObjectRootBase> copy(
        static_cast<TQChannelObjectRootBase*>(object->cloneChannel()));
    host.scene().removeObject(object);
    object = host.scene().adoptObject(std::move(copy));
    ASSERT_EQ(object->getChannelId(), id);
    TQChannel* newX =
        channel(TQHostPropertyPaths(TQHostObjectFamily::Kestrel, TQHostProperty::Position)[0]);
    ASSERT_NE(newX, nullptr);

    ASSERT_TRUE(host.undo());
    EXPECT_TRUE(*newX == *before) << "undo must reach the channel that now lives at the reference";

    // Gone altogether: redo skips it without harm.
    host.scene().removeObject(object);
    EXPECT_TRUE(host.redo());
}

class RecordingClient : public TQHostUndoClient {
public:
    int value = 0;
    std::any captureUndoState(uint32_t, uint32_t) override { return value; }
    void restoreUndoState(uint32_t, uint32_t, const std::any& state) override {
        value = std::any_cast<int>(state);
    }
};

TEST_F(HostUndo, clientStep__restoresThroughItsOwnerAndDiesWithIt) {
    RecordingClient client;
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

    {  // Inside a bracket, the client's part joins the open step.
        host.startCaptureModifiedChannels("Box Edit");
        host.addToUndo(&owner, 1, 0, "Curve Editor Undo Box Edit");
        client.value = 3;
        host.willChangeChannel(x);
        x->noteWillChange(true);
        x->setKeyframe(CMTimeMake(3, 1), -9.0);
        host.endCaptureModifiedChannels();
        EXPECT_EQ(host.undoStack().undoCount(), 2u);
        ASSERT_TRUE(host.undo());
        EXPECT_EQ(client.value, 2);
        EXPECT_EQ(x->getKeyframe(CMTimeMake(3, 1)), nullptr);
    }

    host.unregisterUndoClient(&owner);
    EXPECT_EQ(host.undoStack().undoCount(), 0u) << "the client's own step goes with it";
    EXPECT_EQ(host.undoStack().redoCount(), 1u) << "a step with channels stays, without the client";
    int stranger = 0;
    host.addToUndo(&stranger, 2, 1, "Curve Editor Undo New Curve Set");
    EXPECT_EQ(host.undoStack().undoCount(), 0u) << "no registered owner: nothing to restore";
}

TEST_F(HostUndo, undo__marksRestoredChannelsModifiedAndPosts) {
    struct Counter : TQNotificationReceiver {
        std::vector<TQNotificationWord> words;
        void notify(TQNotificationWord word) override { words.push_back(word); }
    } counter;
    host.addNotificationReceiver(&counter);
    bracketedEdit("Edit", {opacity}, 0.1);
    host.resetModifiedChannels();

    ASSERT_TRUE(host.undo());
    EXPECT_TRUE(host.wasChannelModified(opacity));
    EXPECT_FALSE(host.wasChannelModified(x));
    ASSERT_FALSE(counter.words.empty());
    EXPECT_EQ(counter.words.back(), kTQNotifyChannelsChanged);
    host.removeNotificationReceiver(&counter);
}

}  // namespace
