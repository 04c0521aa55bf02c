#pragma once
// The reference host: a real TQCurveEditorAppDelegate over a scene of objects, with time and
// playback, object selection, modified-channel tracking, undo and redo built on the capture
// brackets, and delivery of notification words to every registered controller.
//
// Ownership: the host owns its scene (and so every channel), its undo history and its clock.
// Notification receivers and undo clients are not owned: each unregisters before it dies.
// The curve set list serializer is the document's and is not owned either.
//
// Words the host posts of its own accord:
//   kTQNotifyHostTimeChanged         a tick of playback moved the playhead
//   kTQNotifyObjectSelectionChanged  the objects selected in the scene changed
//   kTQNotifySceneChanged            objects were added to or removed from the scene
//   kTQNotifySceneReset              the scene was emptied or its object family changed
//   kTQNotifyPlayRangeChanged        the display range changed
//   kTQNotifyHostTimeChanged         also: the transport or the ruler moved the playhead
//   kTQNotifyChannelsChanged         an undo or redo restored channels
// Setting the playhead through setCurrentTime posts nothing: the framework, which calls it,
// posts kTQNotifyTimeChanged itself.

#include <cstddef>
#include <cstdint>
#include <string>

#include "host/TQHostChangeTracker.h"
#include "host/TQHostNotificationCenter.h"
#include "host/TQHostPlaybackClock.h"
#include "host/TQHostScene.h"
#include "host/TQHostUndoStack.h"
#include "src/contract/TQCurveEditorAppDelegate.h"

class TQHostAppDelegate : public TQCurveEditorAppDelegate, private TQChannelChangeObserver {
public:
    // The version of the document format this host writes and reads.
    static constexpr double kDocumentVersion = 5.0;

    explicit TQHostAppDelegate(TQHostObjectFamily family = TQHostObjectFamily::Kestrel);
    ~TQHostAppDelegate() override;
    TQHostAppDelegate(const TQHostAppDelegate&) = delete;
    TQHostAppDelegate& operator=(const TQHostAppDelegate&) = delete;

    // --- The host's side: scene ---
    TQHostScene& scene() { return _scene; }
    const TQHostScene& scene() const { return _scene; }
    // Adds an object of the scene's family and posts kTQNotifySceneChanged.
    TQChannelObjectRootBase* addObject(const BNString& name,
                                       const TQHostObjectOptions& options = {});
    // Posts kTQNotifySceneChanged, and kTQNotifyObjectSelectionChanged too when the object was
    // selected. False (and no word) when it is not an object of the scene.
    bool removeObject(const TQChannelBase* object);
    // Empties the scene and switches it to the other object family: the undo history, the
    // selection and the modified set are forgotten. Posts kTQNotifySceneReset.
    void resetScene(TQHostObjectFamily family);

    // --- Selection (each posts kTQNotifyObjectSelectionChanged when it changed anything) ---
    void selectObject(const TQChannelBase* object, bool extend = false);
    void deselectObject(const TQChannelBase* object);
    void setSelectedObjects(const std::vector<TQChannelBase*>& objects);
    void clearObjectSelection();

    // --- Time ---
    // A frame duration that is not a positive numeric time is refused.
    bool setFrameDuration(const CMTime& duration);
    // The range the editor shows (its zoom and pan change it). Refused as
    // TQHostPlaybackClock refuses a play range. Posts kTQNotifyPlayRangeChanged.
    bool setDisplayRange(const CMTimeRange& range);
    // The range that playback loops in, and that the transport's start and end are: the
    // document's length, whatever part of it the editor shows. Refused as the clock refuses
    // it; the playhead is not moved.
    bool setPlayRange(const CMTimeRange& range) { return _clock.setPlayRange(range); }
    CMTimeRange playRange() const { return _clock.playRange(); }
    void setFirstFrameNumber(uint32_t frame) { _firstFrameNumber = frame; }
    void setStartTimecode(uint32_t frames) { _startTimecode = frames; }
    // Refused when not a positive numeric time: a drawn timeline divides by it.
    bool setSecondsPerTextStep(const CMTime& step);
    void setDisplayTimeAsFrames(bool asFrames) { _displayTimeAsFrames = asFrames; }

    // --- Playback ---
    TQHostPlaybackClock& clock() { return _clock; }
    void play() { _clock.play(); }
    void stop() { _clock.stop(); }
    // Advances playback; posts kTQNotifyHostTimeChanged when the playhead moved.
    void tick(const CMTime& elapsed);
    // The host's own moves of the playhead (a transport, a ruler): each posts
    // kTQNotifyHostTimeChanged when the playhead moved. A non-numeric time is refused.
    bool movePlayhead(const CMTime& time);
    // By whole frames (negative: back) from the frame the playhead is in, kept within the
    // play range: the first frame of the range at least, its last frame at most.
    bool stepFrames(int64_t frames);
    // The first frame of the play range, and its last.
    bool goToStart();
    bool goToEnd();
    // A time as this host shows times: the frame number counted from firstFrameNumber, or
    // the timecode counted from startTimecode, as shouldDisplayTimeAsFrames says.
    std::string timeText(const CMTime& time) const;
    size_t abortCount() const { return _abortCount; }
    bool isEventCoalescingSuppressed() const { return _coalescingSuppressed > 0; }

    // --- Notifications ---
    void addNotificationReceiver(TQNotificationReceiver* receiver) {
        _notifications.addReceiver(receiver);
    }
    void removeNotificationReceiver(TQNotificationReceiver* receiver) {
        _notifications.removeReceiver(receiver);
    }
    TQHostNotificationCenter& notificationCenter() { return _notifications; }

    // --- Undo, for an Edit menu ---
    TQHostUndoStack& undoStack() { return _undo; }
    // Each posts kTQNotifyChannelsChanged after it restored something.
    bool undo();
    bool redo();
    bool canUndo() { return _undo.canUndo(); }
    bool canRedo() { return _undo.canRedo(); }
    BNString undoDescription() { return _undo.undoDescription(); }
    BNString redoDescription() { return _undo.redoDescription(); }
    // The event loop calls this when it has handled an event and goes idle with no mouse
    // button held. A step still open then outlives the gesture that opened it: a drag or a
    // scrub holds its step only while the button is down, and the framework leaves one step
    // open on purpose (the interpolation menu's mixed entry). It is closed here, kept if it
    // changed anything, so that the edits after it are steps of their own and undo goes on.
    // Nothing happens while a drag of the curves holds the event stream.
    void eventLoopDidGoIdle();
    void registerUndoClient(const void* object, TQHostUndoClient* client) {
        _undo.registerClient(object, client);
    }
    void unregisterUndoClient(const void* object) { _undo.unregisterClient(object); }

    // --- Document ---
    void setCurveSetListSerializer(TQCurveSetListSerializer* serializer) {
        _curveSets = serializer;
    }
    void setVersion(double version) { _version = version; }

    // --- TQCurveEditorAppDelegate ---
    TQChannelBase* sceneChannelRoot() override { return _sceneRoot; }
    CMTime currentTime() override { return _clock.currentTime(); }
    void setCurrentTime(const CMTime& time) override;
    CMTime getFrameDuration() override { return _frameDuration; }
    CMTimeRange displayRange() override { return _displayRange; }
    bool isPlaying() override { return _clock.isPlaying(); }
    uint32_t firstFrameNumber() override { return _firstFrameNumber; }
    uint32_t startTimecode() override { return _startTimecode; }
    CMTime secondsPerTextStep() override { return _secondsPerTextStep; }
    bool shouldDisplayTimeAsFrames() override { return _displayTimeAsFrames; }
    bool isKestrel() override { return _scene.isKestrel(); }
    void abort() override;
    void suppressEventCoalescing() override { ++_coalescingSuppressed; }
    void unsuppressEventCoalescing() override;

    bool objectsSelectedInScene() override { return _scene.hasSelection(); }
    std::vector<TQChannelBase*> selectedObjectsRootChannels() override {
        return _scene.selectedObjects();
    }
    bool isObjectSelected(const TQChannelBase* objectRoot) override {
        return _scene.isObjectSelected(objectRoot);
    }

    bool wasChannelModified(const TQChannelBase* channel) override {
        return _tracker.wasChannelModified(channel, _sceneRoot);
    }
    std::vector<TQChannelRef> modifiedChannels() override { return _tracker.modifiedChannels(); }
    void resetModifiedChannels() override { _tracker.reset(); }
    void postNotification(TQNotificationWord word) override { _notifications.post(word); }

    void startCaptureModifiedChannels(const BNString& undoDescription) override {
        _undo.beginStep(undoDescription);
    }
    void endCaptureModifiedChannels() override { _undo.endStep(); }
    void willChangeChannel(const TQChannelBase* channel) override {
        _undo.announceChannel(channel);
    }
    // The state after a change is taken when the step closes, so the did... calls, which may
    // be missing, carry nothing the host needs.
    void didChangeChannel(const TQChannelBase*) override {}
    void willSetChannelValue(const TQChannelBase* channel) override {
        _undo.announceChannel(channel);
    }
    void didSetChannelValue(const TQChannelBase*) override {}
    void addChannelToUndo(const TQChannelBase* channel, const BNString& undoDescription) override {
        _undo.addChannelStep(channel, undoDescription);
    }
    void addToUndo(void* object, uint32_t type, uint32_t action,
                   const BNString& undoDescription) override {
        _undo.addClientStep(object, type, action, undoDescription);
    }

    TQCurveSetListSerializer* getCurveSetListSerializer() override { return _curveSets; }
    double version() override { return _version; }

private:
    // noteWillChange of any channel of the scene arrives here.
    void channelWillChange(TQChannelBase& channel) override;
    // Object roots keep the scene's current time for their own lookups.
    void syncObjectTimes();
    // The frame a time is in, on the frame grid from time 0.
    int64_t frameIndexOf(const CMTime& time) const;

    TQHostScene _scene;
    TQChannelBase* _sceneRoot;  // cached: sceneChannelRoot is called constantly
    TQHostChangeTracker _tracker;
    TQHostUndoStack _undo;
    TQHostNotificationCenter _notifications;
    TQHostPlaybackClock _clock;

    CMTime _frameDuration = CMTimeMake(1, 30);
    CMTimeRange _displayRange;
    uint32_t _firstFrameNumber = 0;
    uint32_t _startTimecode = 0;
    CMTime _secondsPerTextStep = CMTimeMake(1, 1);
    bool _displayTimeAsFrames = false;
    size_t _abortCount = 0;
    int _coalescingSuppressed = 0;
    TQCurveSetListSerializer* _curveSets = nullptr;
    double _version = kDocumentVersion;
};
