// Copy, cut and paste of keypoints, and the Copy, Cut and Paste items of the context menus.

#include <algorithm>
#include <map>

#include "src/editor/TQCurveEditorCtrl.h"
#include "src/engine/TQEditBrackets.h"
#include "src/resources/TQStrings.h"
#include "src/view/TQCurveEditorViewBase.h"

namespace {

RWPasteboard& pasteboard() { return *RWApplicationServices().pasteboard; }

void addClipboardItem(RWMenu& menu, const char* key, const char* action, RWActionTarget* target,
                      std::optional<int64_t> index) {
    auto item = std::make_shared<RWMenuItem>(TQLocalizedString(key), action, "");
    item->setTarget(target);
    item->setTag(0);
    if (index)
        menu.insertItemAtIndex(item, *index);
    else
        menu.addItem(item);
}

// One keypoint as a clip holds it, its time still the axis time.
TQKeyframeState keyframeState(const TQChannel& channel, TQKeyframeHandle handle, CMTime axis,
                              double value) {
    TQKeyframeState key;
    key.time = axis;
    key.value = value;
    key.interpolation = channel.getKeyframeInterpolation(handle);
    channel.getKeyframeInputTangents(handle, &key.inU, &key.inV);
    channel.getKeyframeOutputTangents(handle, &key.outU, &key.outV);
    key.broken = channel.getKeyframeTangentsBroken(handle);
    key.scaled = channel.getKeyframeTangentsScaled(handle);
    key.locked = channel.getKeyframeLocked(handle);
    key.enabled = channel.getKeyframeEnabled(handle);
    return key;
}

// Writes a keypoint of a clip at a channel time: a keyframe already there takes its place.
TQKeyframeHandle writeKeyframe(TQChannel& channel, const TQKeyframeState& key, CMTime time) {
    channel.noteWillChange(true);
    const TQKeyframeHandle handle = channel.setKeyframe(time, key.value);
    if (!handle) return nullptr;
    channel.setKeyframeInterpolation(handle, key.interpolation);
    // The states first: the handles are then written as they were, not re-aligned.
    channel.setKeyframeTangentsBroken(handle, key.broken);
    channel.setKeyframeTangentsScaled(handle, key.scaled);
    channel.setKeyframeInputTangents(handle, key.inU, key.inV);
    channel.setKeyframeOutputTangents(handle, key.outU, key.outV);
    channel.setKeyframeLocked(handle, key.locked);
    channel.setKeyframeEnabled(handle, key.enabled);
    return handle;
}

}  // namespace

// ---- Copy and cut ---------------------------------------------------------------------------

TQKeypointClip TQCurveEditorCtrl::clipOfSelection(const TQCurveSelectionList& list) const {
    TQKeypointClip clip;
    // Groups in the order their channels first appear in the selection.
    std::map<uint32_t, size_t> groupOfCurve;
    CMTime earliest = kCMTimePositiveInfinity;
    for (const TQCurveSelectionPtr& entry : list.getSelectionArray()) {
        if (!entry || !entry->isKeypoint()) continue;
        const TQCurveEditorChannelItem* item = itemForEntry(*entry);
        const TQChannel* channel = item ? item->channel() : nullptr;
        CMTime time = kCMTimeInvalid;
        double value = 0.0;
        if (!channel || !item->channelRef() ||
            !channel->getKeyframe(entry->getHandle(), &time, &value))
            continue;
        const CMTime axis = BN_CMTimeSaferAdd(time, channel->timeOffset());
        if (!CMTIME_IS_NUMERIC(axis)) continue;
        auto [group, added] = groupOfCurve.try_emplace(entry->getCurveId(), clip.channels.size());
        if (added)
            clip.channels.push_back({item->channelRef()->getText(), TQChannelKind(*channel), {}});
        clip.channels[group->second].keys.push_back(
            keyframeState(*channel, entry->getHandle(), axis, value));
        earliest = CMTimeMinimum(earliest, axis);
    }
    for (TQKeypointClipChannel& group : clip.channels) {
        std::stable_sort(group.keys.begin(), group.keys.end(),
                         [](const TQKeyframeState& a, const TQKeyframeState& b) {
                             return CMTimeCompare(a.time, b.time) < 0;
                         });
        // A keypoint listed twice in the selection is copied once.
        group.keys.erase(std::unique(group.keys.begin(), group.keys.end(),
                                     [](const TQKeyframeState& a, const TQKeyframeState& b) {
                                         return CMTimeCompare(a.time, b.time) == 0 &&
                                                a.value == b.value;
                                     }),
                         group.keys.end());
        for (TQKeyframeState& key : group.keys) key.time = CMTimeSubtract(key.time, earliest);
    }
    return clip;
}

TQCurveSelectionList* TQCurveEditorCtrl::copySelectedKeypoints() {
    TQCurveSelectionList* list = viewSelection();
    if (!list) return nullptr;
    validateSelection(list);
    const TQKeypointClip clip = clipOfSelection(*list);
    if (clip.channels.empty()) return nullptr;
    TQPutKeypointClip(pasteboard(), clip);
    return list;
}

void TQCurveEditorCtrl::copy(RWActionSender*) { copySelectedKeypoints(); }

void TQCurveEditorCtrl::cut(RWActionSender*) {
    TQCurveSelectionList* list = copySelectedKeypoints();
    // Locked keypoints are copied and stay, as Delete leaves them.
    if (!list || !shouldDeleteKeypoints()) return;
    performWithBracket("Undo Cut Keypoints", &TQCurveEditorCtrlBase::deleteSelected);
    validateSelection(list);
}

// ---- Paste ----------------------------------------------------------------------------------

bool TQCurveEditorCtrl::canPaste() const { return TQPasteboardHasKeypoints(pasteboard()); }

std::vector<TQCurveEditorChannelItem*> TQCurveEditorCtrl::pasteTargets(
    const TQKeypointClip& clip) const {
    std::vector<TQCurveEditorChannelItem*> shown;
    if (_selectedCurveSet)
        for (const TQCurveEditorItemPtr& item : _selectedCurveSet->allItems())
            if (auto* channelItem = dynamic_cast<TQCurveEditorChannelItem*>(item.get());
                channelItem && channelItem->channel() && channelItem->channelRef())
                shown.push_back(channelItem);
    std::vector<TQCurveEditorChannelItem*> targets;
    std::vector<const TQCurveEditorChannelItem*> standIns;
    for (const TQKeypointClipChannel& group : clip.channels) {
        TQCurveEditorChannelItem* target = nullptr;
        // The same channel of several shown objects has one reference: a selected one wins.
        for (TQCurveEditorChannelItem* item : shown) {
            if (item->channelRef()->getText() != group.ref) continue;
            if (!target || (item->isSelected() && !target->isSelected())) target = item;
        }
        if (!target) {
            for (TQCurveEditorChannelItem* item : shown) {
                if (!item->isSelected() || TQChannelKind(*item->channel()) != group.kind ||
                    std::find(standIns.begin(), standIns.end(), item) != standIns.end())
                    continue;
                target = item;
                standIns.push_back(item);
                break;
            }
        }
        targets.push_back(target);
    }
    return targets;
}

TQPasteResult TQCurveEditorCtrl::pasteKeypoints() {
    TQKeypointClipReading reading = TQTakeKeypointClip(pasteboard());
    if (reading.status == TQKeypointClipRead::kNone) return TQPasteResult::kNothingToPaste;
    if (reading.status != TQKeypointClipRead::kOk) return TQPasteResult::kDamaged;
    const TQKeypointClip& clip = reading.clip;
    const std::vector<TQCurveEditorChannelItem*> targets = pasteTargets(clip);
    for (const TQCurveEditorChannelItem* target : targets) {
        if (!target) return TQPasteResult::kNoChannel;
        if (target->channel()->isLocked(true)) return TQPasteResult::kLocked;
    }
    // Every time is worked out before the first change, so that a paste that cannot land
    // (a time past what a time can hold) changes nothing.
    const CMTime playhead = _pAppDelegate ? _pAppDelegate->currentTime() : kCMTimeZero;
    std::vector<std::vector<CMTime>> times(clip.channels.size());
    for (size_t i = 0; i < clip.channels.size(); ++i) {
        const TQChannel& channel = *targets[i]->channel();
        for (const TQKeyframeState& key : clip.channels[i].keys) {
            const CMTime axis = BN_CMTimeSaferAdd(playhead, key.time);
            const CMTime time = channel.toChannelTime(&axis);
            if (!CMTIME_IS_NUMERIC(time)) return TQPasteResult::kDamaged;
            times[i].push_back(time);
        }
    }

    std::vector<TQCurveSelectionPtr> pasted;
    {
        const TQCaptureGuard capture(_pAppDelegate, "Undo Paste Keypoints");
        for (size_t i = 0; i < clip.channels.size(); ++i) {
            TQCurveEditorChannelItem& item = *targets[i];
            TQChannel& channel = *item.channel();
            const TQChannelEditGuard announced(_pAppDelegate, &channel);
            for (size_t k = 0; k < times[i].size(); ++k) {
                const TQKeyframeState& key = clip.channels[i].keys[k];
                const TQKeyframeHandle handle = writeKeyframe(channel, key, times[i][k]);
                if (!handle) continue;
                auto entry = std::make_shared<TQCurveSelection>();
                entry->setCurveId(item.channelId());
                entry->setHandle(handle);
                entry->setFlags(TQSelectionKeypoint);
                entry->setKeypointUV(times[i][k], key.value);
                pasted.push_back(std::move(entry));
            }
            markDirty(&item);
        }
    }
    if (TQCurveSelectionList* list = viewSelection()) {
        list->reset();
        for (TQCurveSelectionPtr& entry : pasted) list->addSelection(std::move(entry));
        selectionChangedTo(list);
    }
    postNotification(kTQNotifyChannelsChanged);
    return TQPasteResult::kPasted;
}

void TQCurveEditorCtrl::paste(RWActionSender*) { _lastPasteResult = pasteKeypoints(); }

// ---- Menus ----------------------------------------------------------------------------------

void TQCurveEditorCtrl::buildKeyframeMenu() {
    TQCurveEditorCtrlBase::buildKeyframeMenu();
    // Each at the front, so that the menu begins Copy, Cut, Paste, Delete.
    addClipboardItem(*_keyframeMenu, "Curve Editor Menu Paste", "menuPaste:", this, 0);
    addClipboardItem(*_keyframeMenu, "Curve Editor Menu Cut", "menuCut:", this, 0);
    addClipboardItem(*_keyframeMenu, "Curve Editor Menu Copy", "menuCopy:", this, 0);
}

void TQCurveEditorCtrl::buildDefaultMenu() {
    TQCurveEditorCtrlBase::buildDefaultMenu();
    addClipboardItem(*_defaultMenu, "Curve Editor Menu Copy", "menuCopy:", this, std::nullopt);
    addClipboardItem(*_defaultMenu, "Curve Editor Menu Cut", "menuCut:", this, std::nullopt);
    addClipboardItem(*_defaultMenu, "Curve Editor Menu Paste", "menuPaste:", this, std::nullopt);
}

bool TQCurveEditorCtrl::validateKeyframeMenuItem(RWMenuItem& item) {
    TQCurveSelectionList* list = viewSelection();
    validateSelection(list);
    const std::string& action = item.action();
    const bool needsUnlocked =
        action == "menuCut:" || action == "menuDelete:" || action == "menuPaste:";
    if (needsUnlocked && keypointStates(list).allLocked()) return false;
    if (action == "menuCopy:") return canModifySelectedAnyCurve();
    if (action == "menuPaste:" && !canPaste()) return false;
    return TQCurveEditorCtrlBase::validateKeyframeMenuItem(item);
}

bool TQCurveEditorCtrl::validateDefaultMenuItem(RWMenuItem& item) {
    const std::string& action = item.action();
    if (action == "menuCopy:") return !selectedChannels().empty();
    if (action == "menuCut:") return canModifySelectedAnyCurve();
    if (action == "menuPaste:") return canPaste();
    return TQCurveEditorCtrlBase::validateDefaultMenuItem(item);
}
