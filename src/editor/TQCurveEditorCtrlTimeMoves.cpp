// The time moves of selected keypoints: by a delta, and to a target time.

#include "src/editor/TQCurveEditorCtrl.h"

void TQCurveEditorCtrl::moveSelectedInTime(TQCurveSelectionList* list, CMTime by) {
    if (!list) return;
    validateSelection(list);
    // A copy: marking an item dirty cannot change the list, but a host's callback might.
    const std::vector<TQCurveSelectionPtr> entries = list->getSelectionArray();
    for (const TQCurveSelectionPtr& entry : entries) {
        if (!entry || !entry->isKeypoint()) continue;
        editEntryChannel(entry.get(), {}, [&](const EntryChannel& e) {
            CMTime t = kCMTimeInvalid;
            if (!e.channel.getKeyframe(entry->getHandle(), &t, nullptr)) return false;
            // Channel time on the axis grid, as it has always been: the offset is not added.
            const CMTime target = convertToCurveEditorAxis(BN_CMTimeSaferAdd(t, by));
            e.channel.setKeyframeTime(entry->getHandle(), &target, nullptr, nullptr);
            return true;
        });
    }
}

void TQCurveEditorCtrl::moveSelectedInTimeTo(TQCurveSelectionList* list, CMTime to) {
    if (!list) return;
    validateSelection(list);
    CMTime earliest = kCMTimePositiveInfinity;
    for (const TQCurveSelectionPtr& entry : list->getSelectionArray()) {
        if (!entry || !entry->isKeypoint()) continue;
        const TQChannel* channel = channelForEntry(*entry);
        CMTime t = kCMTimeInvalid;
        if (!channel || !channel->getKeyframe(entry->getHandle(), &t, nullptr)) continue;
        const CMTime axis = BN_CMTimeSaferAdd(t, channel->timeOffset());
        if (CMTimeCompare(axis, earliest) < 0) earliest = axis;
    }
    if (CMTimeCompare(earliest, kCMTimePositiveInfinity) >= 0) return;
    const CMTime delta = BN_CMTimeSaferSubtract(to, earliest);
    if (CMTimeCompare(delta, kCMTimeZero) != 0) moveSelectedInTime(list, delta);
}
