// The recording delegate: what it records, and both ways it answers.
#include <gtest/gtest.h>

#include "host/TQHostAppDelegate.h"
#include "host/TQHostSampleScene.h"
#include "platform/channels/TQChannel.h"
#include "tests/support/TQRecordingAppDelegate.h"

namespace {

TEST(RecordingAppDelegate, forwarding__recordsTheBracketInOrderAndTheHostStillUndoes) {
    TQHostAppDelegate host;
    TQHostLoadSampleScene(host, TQHostObjectFamily::Kestrel);
    TQRecordingAppDelegate recorder(&host);
    TQChannelBase* object = host.scene().objects().front();
    const auto& paths = TQHostPropertyPaths(TQHostObjectFamily::Kestrel, TQHostProperty::Position);
    auto* a = dynamic_cast<TQChannel*>(TQChannelRef(paths[0]).getChannel(object));
    auto* b = dynamic_cast<TQChannel*>(TQChannelRef(paths[1]).getChannel(object));
    ASSERT_TRUE(a && b);
    std::unique_ptr<TQChannelBase> before(a->cloneChannel());

    // The one-shot bracket of a duplicate on two channels.
    TQCurveEditorAppDelegate& d = recorder;
    d.startCaptureModifiedChannels("Undo Duplicate");
    d.willChangeChannel(a);
    d.willChangeChannel(b);
    d.willSetChannelValue(a);
    d.willSetChannelValue(b);
    for (TQChannel* c : {a, b}) {
        c->noteWillChange(true);
        c->setKeyframe(CMTimeMake(19, 4), 5.0);
    }
    d.didSetChannelValue(b);
    d.didSetChannelValue(a);
    d.didChangeChannel(b);
    d.didChangeChannel(a);
    d.endCaptureModifiedChannels();
    d.postNotification(kTQNotifyChannelsChanged);
    EXPECT_EQ(d.sceneChannelRoot(), host.sceneChannelRoot()) << "answers come from the host";

    const std::vector<std::string> expected = {"startCaptureModifiedChannels(Undo Duplicate)",
                                               "willChangeChannel(X)",
                                               "willChangeChannel(Y)",
                                               "willSetChannelValue(X)",
                                               "willSetChannelValue(Y)",
                                               "didSetChannelValue(Y)",
                                               "didSetChannelValue(X)",
                                               "didChangeChannel(Y)",
                                               "didChangeChannel(X)",
                                               "endCaptureModifiedChannels()",
                                               "postNotification(0x8)"};
    EXPECT_EQ(recorder.bracketSequence(), expected);
    EXPECT_EQ(recorder.captureBalance(), 0);
    EXPECT_EQ(recorder.calls().back().operation, "sceneChannelRoot");

    EXPECT_EQ(host.undoDescription(), "Undo Duplicate");
    ASSERT_TRUE(host.undo());
    EXPECT_TRUE(*a == *before);
}

TEST(RecordingAppDelegate, standalone__answersFromItsAnswersAndDeliversWords) {
    TQRecordingAppDelegate recorder;
    struct Receiver : TQNotificationReceiver {
        TQRecordingAppDelegate* owner = nullptr;
        int heard = 0;
        void notify(TQNotificationWord) override {
            ++heard;
            owner->removeReceiver(this);  // leaving from inside notify is safe
        }
    } first, second;
    first.owner = second.owner = &recorder;
    recorder.addReceiver(&first);
    recorder.addReceiver(&second);

    recorder.postNotification(0x4);
    recorder.postNotification(0x8);
    EXPECT_EQ(first.heard, 1);
    EXPECT_EQ(second.heard, 1);

    recorder.setCurrentTime(CMTimeMake(3, 2));
    EXPECT_EQ(CMTimeGetSeconds(recorder.currentTime()), 1.5);
    EXPECT_FALSE(recorder.objectsSelectedInScene());
    recorder.addToUndo(&recorder, 2, 1, "Curve Editor Undo New Curve Set");
    EXPECT_EQ(recorder.calls().back().describe(), "addToUndo(2,1,Curve Editor Undo New Curve Set)");
    EXPECT_EQ(recorder.count("postNotification"), 2u);
    recorder.startCaptureModifiedChannels("Open");
    EXPECT_EQ(recorder.captureBalance(), 1) << "an open bracket shows in the balance";
}

}  // namespace
