#pragma once
// A host delegate for tests: it records every call with its arguments, in order, so that a
// test can compare a whole bracket sequence with the order the contract lays down.
//
// It answers in one of two ways:
//   - forwarding: every call goes on to another delegate (the reference host, say) after it
//     is recorded, and that delegate's answer comes back;
//   - standalone: calls are answered from `answers`, which a test fills in. Posted words are
//     then handed to the receivers added with addReceiver, in order, on the spot.
//
// Channels are recorded by pointer (compare by identity only; the channel may be gone) and
// by the name they had at the moment of the call, which is what describe() prints.

#include <cstddef>
#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

#include "src/contract/TQCurveEditorAppDelegate.h"

struct TQDelegateCall {
    std::string operation;  // the operation's name, as in the contract
    const TQChannelBase* channel = nullptr;
    std::string channelName;
    std::string text;  // an undo description
    TQNotificationWord word = 0;
    uint32_t type = 0;
    uint32_t action = 0;
    const void* object = nullptr;
    CMTime time = kCMTimeInvalid;

    // "willChangeChannel(X)", "postNotification(0x8)", "startCaptureModifiedChannels(Undo
    // Move Keypoint)", "addToUndo(2,0,Curve Editor Undo Remove Channel)", "currentTime()".
    std::string describe() const;
};

class TQRecordingAppDelegate : public TQCurveEditorAppDelegate {
public:
    // What a standalone recorder answers.
    struct Answers {
        TQChannelBase* sceneChannelRoot = nullptr;
        CMTime currentTime = kCMTimeZero;
        CMTime frameDuration = CMTimeMake(1, 30);
        CMTimeRange displayRange = CMTimeRangeMake(kCMTimeZero, CMTimeMake(10, 1));
        bool playing = false;
        uint32_t firstFrameNumber = 0;
        uint32_t startTimecode = 0;
        CMTime secondsPerTextStep = CMTimeMake(1, 1);
        bool displayTimeAsFrames = false;
        bool kestrel = true;
        std::vector<TQChannelBase*> selectedObjects;
        // Channels reported as modified; resetModifiedChannels empties it.
        std::vector<const TQChannelBase*> modified;
        TQCurveSetListSerializer* curveSetListSerializer = nullptr;
        double version = 1.0;
    };

    explicit TQRecordingAppDelegate(TQCurveEditorAppDelegate* forwardTo = nullptr)
        : _forward(forwardTo) {}
    // Forwarding from now on (null: standalone). Not owned.
    void forwardTo(TQCurveEditorAppDelegate* delegate) { _forward = delegate; }

    Answers answers;

    // --- Reading the record ---
    const std::vector<TQDelegateCall>& calls() const { return _calls; }
    void clearCalls() { _calls.clear(); }
    // The calls of the edit bracket (start and end of capture, the four will/did
    // announcements, the two undo recordings and postNotification) as one short line a test
    // can state whole: "{Move Keypoint" opens a
    // capture and "}" ends it, "<A" and "A>" are will- and didChangeChannel, "(A" and "A)"
    // will- and didSetChannelValue, "+A:Add Keypoint" addChannelToUndo, "+2.0:Box Edit"
    // addToUndo (type.action), "!8" a posted word in hex. A group of calls repeated back to
    // back is written once, as "3*[(A A)]".
    std::string bracketText() const;
    // The same calls, each described.
    std::vector<std::string> bracketSequence() const;
    size_t count(std::string_view operation) const;
    // Starts minus ends so far: 0 when every bracket that opened has closed.
    int captureBalance() const;

    // --- Standalone delivery of posted words (not owned) ---
    void addReceiver(TQNotificationReceiver* receiver);
    void removeReceiver(TQNotificationReceiver* receiver);

    // --- The contract: recorded, then forwarded or answered from `answers` ---
    using Base = TQCurveEditorAppDelegate;
    TQChannelBase* sceneChannelRoot() override {
        return ask("sceneChannelRoot", &Base::sceneChannelRoot, answers.sceneChannelRoot);
    }
    CMTime currentTime() override {
        return ask("currentTime", &Base::currentTime, answers.currentTime);
    }
    void setCurrentTime(const CMTime& time) override;
    CMTime getFrameDuration() override {
        return ask("getFrameDuration", &Base::getFrameDuration, answers.frameDuration);
    }
    CMTimeRange displayRange() override {
        return ask("displayRange", &Base::displayRange, answers.displayRange);
    }
    bool isPlaying() override { return ask("isPlaying", &Base::isPlaying, answers.playing); }
    uint32_t firstFrameNumber() override {
        return ask("firstFrameNumber", &Base::firstFrameNumber, answers.firstFrameNumber);
    }
    uint32_t startTimecode() override {
        return ask("startTimecode", &Base::startTimecode, answers.startTimecode);
    }
    CMTime secondsPerTextStep() override {
        return ask("secondsPerTextStep", &Base::secondsPerTextStep, answers.secondsPerTextStep);
    }
    bool shouldDisplayTimeAsFrames() override {
        return ask("shouldDisplayTimeAsFrames", &Base::shouldDisplayTimeAsFrames,
                   answers.displayTimeAsFrames);
    }
    bool isKestrel() override { return ask("isKestrel", &Base::isKestrel, answers.kestrel); }
    void abort() override;
    void suppressEventCoalescing() override {
        pass(record("suppressEventCoalescing"), &Base::suppressEventCoalescing);
    }
    void unsuppressEventCoalescing() override {
        pass(record("unsuppressEventCoalescing"), &Base::unsuppressEventCoalescing);
    }

    bool objectsSelectedInScene() override {
        return ask("objectsSelectedInScene", &Base::objectsSelectedInScene,
                   !answers.selectedObjects.empty());
    }
    std::vector<TQChannelBase*> selectedObjectsRootChannels() override {
        return ask("selectedObjectsRootChannels", &Base::selectedObjectsRootChannels,
                   answers.selectedObjects);
    }
    bool isObjectSelected(const TQChannelBase* objectRoot) override;

    bool wasChannelModified(const TQChannelBase* channel) override;
    std::vector<TQChannelRef> modifiedChannels() override;
    void resetModifiedChannels() override;
    void postNotification(TQNotificationWord word) override;

    void startCaptureModifiedChannels(const BNString& undoDescription) override {
        record("startCaptureModifiedChannels").text = undoDescription;
        if (_forward) _forward->startCaptureModifiedChannels(undoDescription);
    }
    void endCaptureModifiedChannels() override {
        pass(record("endCaptureModifiedChannels"), &Base::endCaptureModifiedChannels);
    }
    void willChangeChannel(const TQChannelBase* channel) override {
        pass(recordChannel("willChangeChannel", channel), &Base::willChangeChannel, channel);
    }
    void didChangeChannel(const TQChannelBase* channel) override {
        pass(recordChannel("didChangeChannel", channel), &Base::didChangeChannel, channel);
    }
    void willSetChannelValue(const TQChannelBase* channel) override {
        pass(recordChannel("willSetChannelValue", channel), &Base::willSetChannelValue, channel);
    }
    void didSetChannelValue(const TQChannelBase* channel) override {
        pass(recordChannel("didSetChannelValue", channel), &Base::didSetChannelValue, channel);
    }
    void addChannelToUndo(const TQChannelBase* channel, const BNString& undoDescription) override {
        recordChannel("addChannelToUndo", channel).text = undoDescription;
        if (_forward) _forward->addChannelToUndo(channel, undoDescription);
    }
    void addToUndo(void* object, uint32_t type, uint32_t action,
                   const BNString& undoDescription) override;

    TQCurveSetListSerializer* getCurveSetListSerializer() override {
        return ask("getCurveSetListSerializer", &Base::getCurveSetListSerializer,
                   answers.curveSetListSerializer);
    }
    double version() override { return ask("version", &Base::version, answers.version); }

private:
    TQDelegateCall& record(std::string_view operation);
    TQDelegateCall& recordChannel(std::string_view operation, const TQChannelBase* channel);
    // Recorded as `operation`; the forward's answer, or `standalone` without one.
    template <class R>
    R ask(std::string_view operation, R (Base::*call)(), R standalone) {
        record(operation);
        return _forward ? (_forward->*call)() : standalone;
    }
    // A recorded call without an answer, passed on to the forward.
    template <class... P, class... A>
    void pass(TQDelegateCall&, void (Base::*call)(P...), A... args) {
        if (_forward) (_forward->*call)(args...);
    }

    TQCurveEditorAppDelegate* _forward;
    std::vector<TQDelegateCall> _calls;
    std::vector<TQNotificationReceiver*> _receivers;
};
