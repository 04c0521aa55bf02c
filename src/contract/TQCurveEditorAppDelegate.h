#pragma once
// The host contract. The framework owns no document: everything it knows of the scene, of
// time and of undo it asks of one host object that implements this interface.
//
// Lifetime: the delegate outlives every controller, item and curve set that refers to it.
// Controllers hold it without owning it; items and sets hold it as a plain pointer too.
// Every call comes from the main thread. The delegate may re-enter the framework through
// notify() from inside postNotification().
//
// The edit bracket that every edit of keyframe data follows, outermost first:
//   startCaptureModifiedChannels(description)
//     willChangeChannel(c)   for each distinct channel, in order of first appearance
//       willSetChannelValue(c) for each, same order
//         noteWillChange(true) on the channel, then the change
//       didSetChannelValue(c)  reverse order
//     didChangeChannel(c)    reverse order
//   endCaptureModifiedChannels()
//   postNotification(kTQNotifyChannelsChanged)
// Brackets may nest (a key command's step around the controller's own): a host counts start
// and end calls. A few paths announce will... without a closing did..., outside any bracket;
// a host must tolerate that.

#include <cstdint>
#include <vector>

#include "platform/channels/TQChannelBase.h"
#include "platform/channels/TQChannelRef.h"
#include "platform/media/CMTime.h"
#include "platform/support/BNString.h"
#include "src/contract/TQNotificationWords.h"

// The `type` and `action` words that the framework passes to addToUndo: the kind of owner of
// the step, and what the owner is to restore.
inline constexpr uint32_t kTQUndoTypeView = 1;
inline constexpr uint32_t kTQUndoTypeController = 2;
inline constexpr uint32_t kTQUndoActionBoxEdit = 0;        // of kTQUndoTypeView
inline constexpr uint32_t kTQUndoActionRemoveChannel = 0;  // of kTQUndoTypeController
inline constexpr uint32_t kTQUndoActionNewCurveSet = 1;    // of kTQUndoTypeController

// The parsed curve set list of the open document; defined with the persistent state.
class TQCurveSetListSerializer;

class TQCurveEditorAppDelegate {
public:
    virtual ~TQCurveEditorAppDelegate() = default;

    // --- Scene and time ---

    // Root against which every TQChannelRef of the framework resolves. Called constantly (each
    // item access): it must be a plain read. May change between calls; references survive.
    virtual TQChannelBase* sceneChannelRoot() = 0;
    // Playhead in curve editor axis time.
    virtual CMTime currentTime() = 0;
    virtual void setCurrentTime(const CMTime& time) = 0;
    // Duration of one frame of the document.
    virtual CMTime getFrameDuration() = 0;
    // The time range that the curve editor shows.
    virtual CMTimeRange displayRange() = 0;
    virtual bool isPlaying() = 0;
    // Added to a frame count in time text.
    virtual uint32_t firstFrameNumber() = 0;
    // Start of the timecode as a frame count: it multiplies getFrameDuration().
    virtual uint32_t startTimecode() = 0;
    // Spacing of the time labels of a timeline; never zero on a host that draws one.
    virtual CMTime secondsPerTextStep() = 0;
    virtual bool shouldDisplayTimeAsFrames() = 0;
    // Chooses which object model's channel path table the automatic curve sets use.
    virtual bool isKestrel() = 0;
    // Stops whatever the host runs on the scene (playback) before the framework changes it.
    virtual void abort() = 0;
    // Between a mouse press and its release the host keeps every mouse event of the drag.
    virtual void suppressEventCoalescing() = 0;
    virtual void unsuppressEventCoalescing() = 0;

    // --- Object selection ---

    virtual bool objectsSelectedInScene() = 0;
    // One object root per selected object, in selection order.
    virtual std::vector<TQChannelBase*> selectedObjectsRootChannels() = 0;
    virtual bool isObjectSelected(const TQChannelBase* objectRoot) = 0;

    // --- Change tracking ---

    // True when the channel changed since the last resetModifiedChannels().
    virtual bool wasChannelModified(const TQChannelBase* channel) = 0;
    // The channels changed since the last resetModifiedChannels(), as references that
    // resolve against sceneChannelRoot().
    virtual std::vector<TQChannelRef> modifiedChannels() = 0;
    virtual void resetModifiedChannels() = 0;
    // Hands the word to the notify() of every live controller.
    virtual void postNotification(TQNotificationWord word) = 0;

    // --- Edit brackets and undo ---

    // Opens one undoable step; channels announced until the matching end belong to it.
    // The description arrives as display text.
    virtual void startCaptureModifiedChannels(const BNString& undoDescription) = 0;
    virtual void endCaptureModifiedChannels() = 0;
    // Before a channel's structure (keyframes, interpolation, flags) changes.
    virtual void willChangeChannel(const TQChannelBase* channel) = 0;
    virtual void didChangeChannel(const TQChannelBase* channel) = 0;
    // Before a channel's values change; during a drag once for each step.
    virtual void willSetChannelValue(const TQChannelBase* channel) = 0;
    virtual void didSetChannelValue(const TQChannelBase* channel) = 0;
    // Records one channel, in its present state, as one undoable step with no bracket.
    virtual void addChannelToUndo(const TQChannelBase* channel,
                                  const BNString& undoDescription) = 0;
    // Records a step that is not a channel's. `object` is the framework object that owns what
    // changes (a controller, a view); the host restores the step through that owner.
    virtual void addToUndo(void* object, uint32_t type, uint32_t action,
                           const BNString& undoDescription) = 0;

    // --- Persistence ---

    // Null when the open document holds no curve set list.
    virtual TQCurveSetListSerializer* getCurveSetListSerializer() = 0;
    // Version of the open document's format.
    virtual double version() = 0;
};
