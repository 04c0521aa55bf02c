// Keypoint operations: keeping a selection true to its channels (validate, purge), and the
// edits on selected keypoints (delete, duplicate, reverse, lock, disable, ease, add), with the
// commands that open their own bracket.

#include <algorithm>
#include <vector>

#include "platform/channels/TQChannelObjectRootBase.h"
#include "src/engine/TQCurveEditorCtrlBase.h"
#include "src/engine/TQEditBrackets.h"
#include "src/resources/TQStrings.h"
#include "src/view/TQCurveEditorViewBase.h"

namespace {

// The TQChannel children of a compound, in child order.
std::vector<TQChannel*> componentsOf(const TQCompoundChannel& compound) {
    return compound.getComponents();
}

bool contains(const std::vector<const TQChannel*>& list, const TQChannel* channel) {
    return std::find(list.begin(), list.end(), channel) != list.end();
}

// The time an object's playhead stands at for this channel, in channel time.
CMTime rootCurrentTime(const TQChannel& channel) {
    if (auto* root = dynamic_cast<TQChannelObjectRootBase*>(channel.getChannelRoot()))
        return root->getRootCurrentTime(true);
    return channel.getRootCurrentTime(true);
}

}  // namespace

// ---- Keeping the selection true ---------------------------------------------------------

void TQCurveEditorCtrlBase::validateSelection(TQCurveSelectionList* list) {
    if (!list) return;
    struct Dead {
        uint32_t curveId;
        TQCurveSelectionPtr entry;
    };
    std::vector<Dead> dead;
    for (const TQCurveSelectionPtr& entry : list->getSelectionArray()) {
        if (!entry) continue;
        if (!channelForEntry(*entry)) dead.push_back({entry->getCurveId(), entry});
    }
    for (const Dead& d : dead) {
        // The curve leaves the set: its channel is gone for good, or the set lost its item.
        removeChannelWithIdentifier(d.curveId, _selectedCurveSet);
        list->delSelection(*d.entry);
    }
    for (const TQCurveSelectionPtr& entry : list->getSelectionArray()) {
        if (!entry || !(entry->isKeypoint() || entry->isTangent())) continue;
        TQChannel* channel = channelForEntry(*entry);
        if (!channel || channel->getKeyframe(entry->getHandle(), nullptr, nullptr)) continue;
        // A stale handle: an undo or a host edit rebuilt the keyframe. Find it by the time
        // stored at the last pick; if nothing lies there, the stale handle stays.
        CMTime stored = kCMTimeInvalid;
        entry->getKeypointUV(&stored, nullptr);
        if (TQKeyframeHandle repaired = channel->getKeyframe(stored)) entry->setHandle(repaired);
    }
}

void TQCurveEditorCtrlBase::purgeSelected(TQCurveSelectionList* list) {
    if (!list) return;
    std::vector<uint32_t> ids;
    for (const TQCurveSelectionPtr& entry : list->getSelectionArray()) {
        if (entry && std::find(ids.begin(), ids.end(), entry->getCurveId()) == ids.end())
            ids.push_back(entry->getCurveId());
    }
    for (uint32_t id : ids) {
        TQCurveSelection probe;
        probe.setCurveId(id);
        TQChannel* channel = channelForEntry(probe);
        if (!channel) continue;
        // A linked edit retimed the other components too, shown or not.
        if (TQCompoundChannel* compound = linkedParent(channel)) {
            for (TQChannel* component : componentsOf(*compound)) component->purgeKeyframes();
        } else {
            channel->purgeKeyframes();
        }
    }
}

void TQCurveEditorCtrlBase::cleanSelection(TQCurveSelectionList* list) {
    if (!list) return;
    const uint32_t n = list->size();
    if (n == 0) return;
    const TQCurveSelectionPtr first = list->selectionAtIndex(0);
    if (!first || !first->isTangent()) return;
    // The search for a later entry on the same keyframe starts past the end of the list, so
    // it never runs and the operation has no effect. Its callers have always relied on that
    // (a tangent entry stays primary after mouse-up); keep it so.
    for (uint32_t i = n + 1; i < n; ++i) {
        const TQCurveSelectionPtr other = list->selectionAtIndex(i);
        if (other && other->getHandle() == first->getHandle()) {
            list->delSelection(*first);
            return;
        }
    }
}

// ---- Delete -----------------------------------------------------------------------------

bool TQCurveEditorCtrlBase::shouldDeleteKeypoints() {
    TQCurveSelectionList* list = viewSelection();
    if (!list) return false;
    validateSelection(list);
    for (const TQCurveSelectionPtr& entry : list->getSelectionArray()) {
        if (!entry || !entry->isKeypoint()) continue;
        TQChannel* channel = channelForEntry(*entry);
        if (channel && !channel->getKeyframeLocked(entry->getHandle())) return true;
    }
    return false;
}

void TQCurveEditorCtrlBase::deleteKeypoints(void* sender) {
    (void)sender;
    TQCurveSelectionList* list = viewSelection();
    if (!list) return;
    validateSelection(list);
    if (!shouldDeleteKeypoints()) return;
    performWithBracket("Undo Delete Keypoint", &TQCurveEditorCtrlBase::deleteSelected);
}

void TQCurveEditorCtrlBase::deleteSelected(TQCurveSelectionList* list) {
    if (!list) return;
    validateSelection(list);
    // Channels whose initial value already holds the curve's present value.
    std::vector<const TQChannel*> settled;
    // Announcements and dirty marks differ by path, below.
    forEachEntryChannel(
        list, &TQCurveSelection::isKeypoint, {.noteWillChange = false, .markDirty = false},
        [&](const EntryChannel& e) {
            const TQKeyframeHandle handle = e.entry.getHandle();
            CMTime time = kCMTimeInvalid;
            // A keyframe already deleted through a linked sibling earlier in this walk.
            if (!e.channel.getKeyframe(handle, &time, nullptr)) return;
            if (e.channel.getKeyframeLocked(handle)) return;

            if (TQCompoundChannel* compound = linkedParent(&e.channel)) {
                for (TQChannel* component : componentsOf(*compound)) {
                    component->noteWillChange(true);
                    if (contains(settled, component)) continue;
                    settled.push_back(component);
                    component->setInitialValue(
                        component->getCurveValue(rootCurrentTime(*component), true), false);
                }
                compound->deleteKeyframe(&e.channel, time,
                                         compoundLinkArgument(*compound, _linked));
                markComponentsDirty(*compound);
            } else {
                // This path announces nothing to the channel: the old behaviour, kept.
                if (!contains(settled, &e.channel)) {
                    settled.push_back(&e.channel);
                    e.channel.setInitialValue(
                        e.channel.getCurveValue(e.item.getCurrentTime(), true), false);
                }
                const CMTime axisTime = BN_CMTimeSaferAdd(time, e.channel.timeOffset());
                e.channel.deleteKeyframeAtAxisTime(&axisTime, true);
                markDirty(&e.item);
            }
        });
}

// ---- Duplicate, reverse -----------------------------------------------------------------

void TQCurveEditorCtrlBase::duplicateSelected(TQCurveSelectionList* list) {
    if (!list) return;
    const CMTime frame = _pAppDelegate ? _pAppDelegate->getFrameDuration() : CMTime{};
    // Without a positive frame there is no free frame to find.
    if (!CMTIME_IS_NUMERIC(frame) || frame.value <= 0) return;
    // A thousandth of a frame, exactly: in the frame's own timescale it would round to zero.
    const CMTime fine =
        CMTimeConvertScale(frame, static_cast<CMTimeScale>(std::min<int64_t>(
                                      int64_t{frame.timescale} * 1000, kCMTimeMaxTimescale)));
    CMTime smallStep = CMTimeMultiplyByFloat64(fine, 0.001);
    if (CMTimeCompare(smallStep, kCMTimeZero) <= 0) smallStep = CMTimeMake(1, fine.timescale);

    forEachEntryChannel(list, &TQCurveSelection::isKeypoint, {}, [&](const EntryChannel& e) {
        const TQKeyframeHandle handle = e.entry.getHandle();
        CMTime time = kCMTimeInvalid;
        // A stale handle has been announced all the same, and is left unmarked: as it was.
        if (!e.channel.getKeyframe(handle, &time, nullptr)) return false;
        // A non-discrete channel crosses each occupied frame in a thousand small steps and so
        // lands on the first free frame; a time between frames floors to the frame before it,
        // so the copy may land before its source.
        const CMTime step = e.channel.isDiscrete() ? frame : smallStep;
        CMTime delta = kCMTimeZero;
        CMTime target = BN_CMTimeFloorToSampleDuration(BN_CMTimeSaferAdd(time, delta), frame);
        while (e.channel.getKeyframe(target)) {
            delta = BN_CMTimeSaferAdd(delta, step);
            target = BN_CMTimeFloorToSampleDuration(BN_CMTimeSaferAdd(time, delta), frame);
        }
        e.channel.cloneKeyframe(handle, target);
        return true;
    });
}

void TQCurveEditorCtrlBase::reverseSelected(TQCurveSelectionList* list) {
    if (!list) return;
    validateSelection(list);
    // Per curve, in order of first appearance: the earliest and the latest selected keypoint.
    // Strict comparisons, so the first of equal times wins.
    struct Span {
        uint32_t curveId;
        TQKeyframeHandle earliest = nullptr;
        CMTime earliestTime = kCMTimePositiveInfinity;
        TQKeyframeHandle latest = nullptr;
        CMTime latestTime = kCMTimeNegativeInfinity;
    };
    std::vector<Span> spans;
    for (const TQCurveSelectionPtr& entry : list->getSelectionArray()) {
        if (!entry || !entry->isKeypoint()) continue;
        auto it = std::find_if(spans.begin(), spans.end(),
                               [&](const Span& s) { return s.curveId == entry->getCurveId(); });
        if (it == spans.end()) {
            spans.push_back(Span{entry->getCurveId()});
            it = spans.end() - 1;
        }
        TQChannel* channel = channelForEntry(*entry);
        CMTime time = kCMTimeInvalid;
        if (!channel || !channel->getKeyframe(entry->getHandle(), &time, nullptr)) continue;
        if (CMTimeCompare(time, it->earliestTime) < 0) {
            it->earliestTime = time;
            it->earliest = entry->getHandle();
        }
        if (CMTimeCompare(time, it->latestTime) > 0) {
            it->latestTime = time;
            it->latest = entry->getHandle();
        }
    }
    for (const Span& span : spans) {
        if (!span.earliest || !span.latest || span.earliest == span.latest) continue;
        TQCurveSelection probe;
        probe.setCurveId(span.curveId);
        editEntryChannel(&probe, {}, [&](const EntryChannel& e) {
            e.channel.reverseKeyframes(span.earliest, span.latest);
        });
    }
}

// ---- Lock, disable ----------------------------------------------------------------------

template <class Read, class Write>
void TQCurveEditorCtrlBase::applyKeyframeState(TQCurveSelectionList* list, Read&& read,
                                               Write&& write) {
    if (!list) return;
    validateSelection(list);
    if (list->empty()) return;
    const TQCurveSelectionPtr first = list->selectionAtIndex(0);
    TQChannel* firstChannel = first ? channelForEntry(*first) : nullptr;
    // One state for all, the opposite of the first entry's: a mixed selection becomes uniform.
    const bool state = !(firstChannel && read(*firstChannel, first->getHandle()));
    // Announced after the stale test, on every component when linked; marks are the writer's.
    forEachEntryChannel(list, &TQCurveSelection::isKeypoint,
                        {.noteWillChange = false, .markDirty = false}, [&](const EntryChannel& e) {
                            CMTime time = kCMTimeInvalid;
                            if (!e.channel.getKeyframe(e.entry.getHandle(), &time, nullptr)) return;
                            if (TQCompoundChannel* compound = linkedParent(&e.channel)) {
                                for (TQChannel* component : componentsOf(*compound)) {
                                    component->noteWillChange(true);
                                    write(*component, component->getKeyframe(time), state);
                                }
                            } else {
                                e.channel.noteWillChange(true);
                                write(e.channel, e.entry.getHandle(), state);
                            }
                        });
}

void TQCurveEditorCtrlBase::lockSelected(TQCurveSelectionList* list) {
    applyKeyframeState(
        list, [](const TQChannel& c, TQKeyframeHandle h) { return c.getKeyframeLocked(h); },
        [](TQChannel& c, TQKeyframeHandle h, bool locked) {
            // No dirty mark: a lock does not change the curve.
            c.setKeyframeLocked(h, locked);
        });
}

void TQCurveEditorCtrlBase::disableSelected(TQCurveSelectionList* list) {
    applyKeyframeState(
        list, [](const TQChannel& c, TQKeyframeHandle h) { return c.getKeyframeEnabled(h); },
        [this](TQChannel& c, TQKeyframeHandle h, bool enabled) {
            c.setKeyframeEnabled(h, enabled);
            markDirty(itemForChannel(&c));
        });
}

// ---- Ease -------------------------------------------------------------------------------

void TQCurveEditorCtrlBase::easeInSelected(TQCurveSelectionList* list) {
    // An ease-in works on the segment arriving at the keypoint, whose interpolation belongs
    // to the keyframe before it. The channel is announced only when there is one.
    forEachEntryChannel(
        list, &TQCurveSelection::isKeypoint, {.noteWillChange = false}, [](const EntryChannel& e) {
            const TQKeyframeHandle previous =
                e.channel.getPreviousEnabledKeyframe(e.entry.getHandle());
            if (!previous) return false;
            e.channel.noteWillChange(true);
            const unsigned k = e.channel.getKeyframeInterpolation(previous);
            if (k != kTQInterpolationEaseBoth)
                e.channel.setKeyframeInterpolation(previous, k == kTQInterpolationEaseOut
                                                                 ? kTQInterpolationEaseBoth
                                                                 : kTQInterpolationEaseIn);
            return true;
        });
}

void TQCurveEditorCtrlBase::easeOutSelected(TQCurveSelectionList* list) {
    // No dirty mark here, unlike ease-in: the old behaviour, kept (the bracket's notification
    // redraws through the host's modified set).
    forEachEntryChannel(
        list, &TQCurveSelection::isKeypoint, {.markDirty = false}, [](const EntryChannel& e) {
            const TQKeyframeHandle h = e.entry.getHandle();
            const unsigned k = e.channel.getKeyframeInterpolation(h);
            if (k != kTQInterpolationEaseBoth)
                e.channel.setKeyframeInterpolation(h, k == kTQInterpolationEaseIn
                                                          ? kTQInterpolationEaseBoth
                                                          : kTQInterpolationEaseOut);
        });
}

void TQCurveEditorCtrlBase::easeBothSelected(TQCurveSelectionList* list) {
    easeInSelected(list);
    easeOutSelected(list);
}

// ---- Add and delete at a time -----------------------------------------------------------

TQCurveSelectionPtr TQCurveEditorCtrlBase::addVertex(const TQCurveSelectionPtr& entry, CMTime u) {
    if (!entry) return entry;
    const CMTime axis = convertToCurveEditorAxis(u);
    TQKeyframeHandle added = nullptr;
    // Neither noteWillChange nor a dirty mark here, unlike the sketch form below: callers
    // announce the channel themselves.
    const bool ran = editEntryChannel(
        entry.get(), {.noteWillChange = false, .markDirty = false}, [&](const EntryChannel& e) {
            if (TQCompoundChannel* compound = linkedParent(&e.channel))
                compound->addKeyframe(&e.channel, axis, compoundLinkArgument(*compound, _linked));
            else
                e.channel.addKeyframeAtAxisTime(&axis);
            added = e.channel.getKeyframe(BN_CMTimeSaferSubtract(axis, e.channel.timeOffset()));
        });
    if (!ran) return entry;
    entry->setHandle(added);
    entry->setFlags(TQSelectionKeypoint);
    return entry;
}

TQCurveSelectionPtr TQCurveEditorCtrlBase::addVertex(const TQCurveSelectionPtr& entry, CMTime u,
                                                     double v, char link) {
    if (!entry) return entry;
    const CMTime axis = convertToCurveEditorAxis(u);
    TQKeyframeHandle added = nullptr;
    // Announced after the compound's own keyframe is added, as it always was.
    const bool ran =
        editEntryChannel(entry.get(), {.noteWillChange = false}, [&](const EntryChannel& e) {
            const double value = convertToChannelCoords(&e.item, v);
            if (link) {
                if (TQCompoundChannel* compound = linkedParent(&e.channel))
                    compound->addKeyframe(&e.channel, convertToCurveEditorAxis(axis),
                                          compoundLinkArgument(*compound, _linked));
            }
            const CMTime channelTime = BN_CMTimeSaferSubtract(axis, e.channel.timeOffset());
            e.channel.noteWillChange(true);
            e.channel.setKeyframe(channelTime, value, false);
            added = e.channel.getKeyframe(channelTime);
        });
    if (!ran) return entry;
    entry->setHandle(added);
    entry->setFlags(TQSelectionKeypoint);
    return entry;
}

void TQCurveEditorCtrlBase::deleteVertex(const TQCurveSelection* entry, CMTime u) {
    // No announcement; the dirty marks differ by path.
    editEntryChannel(
        entry, {.noteWillChange = false, .markDirty = false}, [&](const EntryChannel& e) {
            if (TQCompoundChannel* compound = linkedParent(&e.channel)) {
                compound->deleteKeyframe(&e.channel, u, compoundLinkArgument(*compound, false));
                markComponentsDirty(*compound);
            } else if (TQKeyframeHandle handle = e.channel.getKeyframe(u)) {
                e.channel.deleteKeyframe(handle);
                markDirty(&e.item);
            }
        });
}

// ---- Commands ---------------------------------------------------------------------------

void TQCurveEditorCtrlBase::menuDuplicate(void*) {
    performWithBracket("Undo Duplicate", &TQCurveEditorCtrlBase::duplicateSelected);
}

void TQCurveEditorCtrlBase::menuReverse(void*) {
    performWithBracket("Undo Reverse", &TQCurveEditorCtrlBase::reverseSelected);
}

void TQCurveEditorCtrlBase::menuEaseIn(void*) {
    performWithBracket("Undo Ease In", &TQCurveEditorCtrlBase::easeInSelected);
}

void TQCurveEditorCtrlBase::menuEaseOut(void*) {
    performWithBracket("Undo Ease Out", &TQCurveEditorCtrlBase::easeOutSelected);
}

void TQCurveEditorCtrlBase::menuEaseBoth(void*) {
    performWithBracket("Undo Ease Both", &TQCurveEditorCtrlBase::easeBothSelected);
}

void TQCurveEditorCtrlBase::menuLockSelected(void*) {
    performWithBracket("Undo Lock Keypoint", &TQCurveEditorCtrlBase::lockSelected);
}

void TQCurveEditorCtrlBase::menuDisableSelected(void*) {
    performWithBracket("Undo Disable Keypoint", &TQCurveEditorCtrlBase::disableSelected);
}

void TQCurveEditorCtrlBase::menuAddKeyframe(void*) {
    TQCurveSelectionList* list = viewSelection();
    if (!list || list->empty()) return;
    const TQCurveSelectionPtr entry = list->selectionAtIndex(0);
    if (!entry || !entry->isCurve()) return;
    const CGPoint world = _view->getPointWorld(_view->getMouseOrigin());
    TQChannel* channel = channelForEntry(*entry);
    if (channel && channel->canKeyframe()) {
        // Deliberately no capture bracket: the channel is recorded as its own undo step.
        if (_pAppDelegate)
            _pAppDelegate->addChannelToUndo(channel, TQLocalizedString("Undo Add keypoint"));
        const TQChannelEditGuard announced(_pAppDelegate, channel);
        addVertex(entry, TQTarnTimeForChannelSeconds(world.x, kTQCurveEditorTimescale));
    }
    list->reset();
    list->addSelection(entry);
    postNotification(kTQNotifyChannelsChanged);
}
