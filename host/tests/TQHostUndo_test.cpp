// Undo and redo through the host's delegate operations, as the framework drives them; every
// check compares the whole scene, so a step that restores one channel and breaks another shows.
#include <gtest/gtest.h>

#include <memory>

#include "host/TQHostAppDelegate.h"
#include "host/TQHostSampleScene.h"
#include "platform/channels/TQChannelTypes.h"

namespace {

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

TEST_F(HostUndo, replacedChannel__isFoundByItsReferenceAndAVanishedOneIsSkipped) {
    const std::unique_ptr<TQChannelBase> before(object->cloneChannel());
    bracketedEdit("Edit", {x}, 77.0);
    // Replace the whole object by a copy with the same id: the channel objects are new.
    std::unique_ptr<TQChannelObjectRootBase> copy(
        static_cast<TQChannelObjectRootBase*>(object->cloneChannel()));
    host.scene().removeObject(object);
    object = host.scene().adoptObject(std::move(copy));
    ASSERT_TRUE(host.undo());
    EXPECT_TRUE(*object == *before)
        << "undo must reach the channel that now lives at the reference";
    host.scene().removeObject(object);
    EXPECT_TRUE(host.redo()) << "gone altogether: redo skips it without harm";
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
    struct Counter : TQNotificationReceiver {
        std::vector<TQNotificationWord> words;
        void notify(TQNotificationWord word) override { words.push_back(word); }
    } counter;
    host.addNotificationReceiver(&counter);
    bracketedEdit("Edit", {opacity}, 0.1);
    host.resetModifiedChannels();
    ASSERT_TRUE(host.undo());
    EXPECT_TRUE(host.wasChannelModified(opacity) && !host.wasChannelModified(x));
    EXPECT_EQ(counter.words.back(), kTQNotifyChannelsChanged);
    host.removeNotificationReceiver(&counter);
}

}  // namespace
