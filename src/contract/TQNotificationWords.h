#pragma once
// Notification words: one unsigned 32-bit word of OR-ed flags travels from postNotification
// to notify. Receivers test the flags by value, and several may arrive in one word.

#include <cstdint>

using TQNotificationWord = uint32_t;

enum : TQNotificationWord {
    // From the host: the playhead moved (handled as kTQNotifyTimeChanged).
    kTQNotifyHostTimeChanged = 0x1,
    // Posted by the framework after it moved the playhead.
    kTQNotifyTimeChanged = 0x2,
    // Channels changed; the edit (a drag, a scrub) is still running.
    kTQNotifyChannelsChanging = 0x4,
    // Channels changed; the edit is finished.
    kTQNotifyChannelsChanged = 0x8,
    // From the host: the scene's objects changed; editors re-filter their selected set
    // unless objects are selected.
    kTQNotifySceneChanged = 0x10,
    // From the host: the active curve set is cleared and the tool state refreshed.
    kTQNotifySceneReset = 0x20,
    // From the host, redraw only.
    kTQNotifyDisplayChanged = 0x80,
    kTQNotifyPreviewChanged = 0x200,
    kTQNotifyPlayRangeChanged = 0x400,
    // The view volume changed; the two bits always travel together.
    kTQNotifyViewVolumeChangedX = 0x800,
    kTQNotifyViewVolumeChangedY = 0x1000,
    kTQNotifyViewVolumeChanged = kTQNotifyViewVolumeChangedX | kTQNotifyViewVolumeChangedY,
    // From the host: every cached curve is stale.
    kTQNotifyCurvesInvalidated = 0x8000,
    // The channels shown in an editor changed.
    kTQNotifyCurveSetContentChanged = 0x20000,
    // From the host: the objects selected in the scene changed; the selected set is rebuilt.
    kTQNotifyObjectSelectionChanged = 0x80000,
    // A folder was reset; posted together with kTQNotifyChannelsChanged.
    kTQNotifyFolderReset = 0x800000,
    kTQNotifyFolderResetWord = kTQNotifyFolderReset | kTQNotifyChannelsChanged,
    // The tool changed; posted together with kTQNotifyChannelsChanged.
    kTQNotifyToolChanged = 0x4000000,
    kTQNotifyToolChangedWord = kTQNotifyToolChanged | kTQNotifyChannelsChanged,
};

// Something that takes notification words: every live controller. The host delivers each
// posted word, and words of its own, to all registered receivers.
class TQNotificationReceiver {
public:
    virtual ~TQNotificationReceiver() = default;
    virtual void notify(TQNotificationWord word) = 0;
};
