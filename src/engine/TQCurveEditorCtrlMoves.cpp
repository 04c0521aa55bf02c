// Moving keypoints: the edit drag (moveSelected), the nudges (offsetSelected), the curve drag
// (offsetCurve), and the time sort of box-deformation keypoints.
//
// A channel keeps its keyframes in time order and finds them by time, so several keypoints
// moved in one step must not run through each other: they move in the order of their live
// times, the one leading the direction of travel first. Linked compound components move once
// per call however many of them are selected.

#include <algorithm>
#include <functional>
#include <unordered_set>
#include <vector>

#include "src/engine/TQCurveEditorCtrlBase.h"

namespace {

struct OrderedEntry {
    TQCurveSelection* entry = nullptr;
    CMTime time = kCMTimeZero;  // live channel time of the entry's keyframe (no offset)
};

bool isLaterThanZero(const CMTime& t) { return CMTimeCompare(t, kCMTimeZero) > 0; }
bool isZero(const CMTime& t) { return CMTimeCompare(t, kCMTimeZero) == 0; }

}  // namespace

// The ordered list: the entries sorted by the live channel time of their keyframes, equal
// times in list order. Inserting the entries one by one, each before the first one that is
// strictly later, yields exactly a stable sort, which is what runs here: one channel read per
// entry and O(n log n), instead of two reads per comparison in a quadratic walk.
//
// An entry whose keyframe cannot be read (a curve segment entry) sorts as time 0; it is
// skipped by the moves, and a stable sort keeps the others' relative order whatever its key.
// Offsets are left out on purpose, even between curves with different offsets.
static std::vector<OrderedEntry> buildOrderedList(
    const std::vector<TQCurveSelection*>& entries,
    const std::function<TQChannel*(const TQCurveSelection&)>& channelOf) {
    std::vector<OrderedEntry> ordered;
    ordered.reserve(entries.size());
    for (TQCurveSelection* entry : entries) {
        OrderedEntry o{entry, kCMTimeZero};
        if (TQChannel* channel = channelOf(*entry)) {
            CMTime t = kCMTimeZero;
            if (channel->getKeyframe(entry->getHandle(), &t, nullptr)) o.time = t;
        }
        ordered.push_back(o);
    }
    std::stable_sort(ordered.begin(), ordered.end(),
                     [](const OrderedEntry& a, const OrderedEntry& b) {
                         return CMTimeCompare(a.time, b.time) < 0;
                     });
    return ordered;
}

void TQCurveEditorCtrlBase::moveSelected(TQCurveSelectionList* list, CMTime x, double y,
                                         char useSelectionOrder, char isConstraining) {
    if (!list) return;
    validateSelection(list);
    if (list->empty()) return;

    const TQCurveSelectionPtr anchor = list->selectionAtIndex(0);
    TQCurveEditorChannelItem* anchorItem = itemForEntry(*anchor);
    TQChannel* anchorChannel = anchorItem ? anchorItem->channel() : nullptr;
    if (!anchorChannel) return;

    if (anchor->isCurve()) {
        // The segment is taken at x as it came: no conversion to channel time here.
        editEntryChannel(anchor.get(), {}, [&](const EntryChannel& e) {
            e.channel.setCurveSegmentValue(x, convertToChannelCoords(&e.item, y), false);
        });
        return;
    }

    // The anchor's present place. A tangent entry reads its keypoint's handle too.
    const CMTime anchorOffset = anchorChannel->timeOffset();
    CMTime anchorTime = kCMTimeInvalid;
    double anchorValue = 0.0;
    if (!anchorChannel->getKeyframe(anchor->getHandle(), &anchorTime, &anchorValue)) return;
    // A vertical constraint holds the time and so puts no rounding on it; a free move puts
    // the anchor on the grid.
    const CMTime target = isConstraining ? x : convertToCurveEditorAxis(x);
    const CMTime dt = BN_CMTimeSaferSubtract(target, BN_CMTimeSaferAdd(anchorTime, anchorOffset));
    const double anchorV = convertFromChannelCoords(anchorItem, anchorValue);

    // With useSelectionOrder clear the anchor itself is not moved: the one caller passes true,
    // and the others are moved relative to it all the same.
    std::vector<TQCurveSelection*> entries;
    entries.reserve(list->size());
    const auto& array = list->getSelectionArray();
    for (size_t i = useSelectionOrder ? 0 : 1; i < array.size(); ++i)
        entries.push_back(array[i].get());
    std::vector<OrderedEntry> ordered =
        buildOrderedList(entries, [this](const TQCurveSelection& e) { return channelForEntry(e); });
    if (ordered.empty()) return;
    // Forward: the latest keypoint first; backward: the earliest first.
    if (isLaterThanZero(dt)) std::reverse(ordered.begin(), ordered.end());

    const bool moveInTime = !isZero(dt);
    const bool singleEntry = ordered.size() == 1;
    // Keyframes of linked components already carried along by an earlier entry of this call.
    std::unordered_set<TQKeyframeHandle> moved;

    // Announced after the stale test, on the compound when linked; the dirty marks are made
    // by path, below.
    const EntryEditMarks byPath{.noteWillChange = false, .markDirty = false};
    for (const OrderedEntry& o : ordered) {
        if (!o.entry->isKeypoint()) continue;
        editEntryChannel(o.entry, byPath, [&](const EntryChannel& e) {
            const TQKeyframeHandle handle = e.entry.getHandle();
            const CMTime offset = e.channel.timeOffset();
            CMTime time = kCMTimeInvalid;
            double value = 0.0;
            // A handle can die within the call when a linked move resolved a meeting; skip it.
            if (!e.channel.getKeyframe(handle, &time, &value)) return;
            // The same V distance on screen for every curve, each through its own scale.
            const double newValue =
                value + ((y - anchorV) * e.item.scaleY()) / e.item.conversionFactor();
            const CMTime from = BN_CMTimeSaferAdd(time, offset);
            CMTime to = BN_CMTimeSaferAdd(BN_CMTimeSaferAdd(time, dt), offset);

            TQCompoundChannel* compound = linkedParent(&e.channel);
            if (!compound) {
                e.channel.noteWillChange(true);
                e.channel.setKeyframeValue(handle, newValue);
                if (moveInTime) {
                    if (!_negativeRangeAllowed && CMTimeCompare(to, kCMTimeZero) < 0)
                        to = kCMTimeZero;
                    // Only a keypoint moved alone lands on the grid; a group keeps its spacing.
                    if (singleEntry && !isConstraining) to = convertToCurveEditorAxis(to);
                    e.channel.moveKeyframe(&from, &to, true);
                }
                markDirty(&e.item);
                return;
            }

            // Linked: no clamp at 0, no rounding, and the move runs even when dt is zero.
            compound->noteWillChange(true);
            e.channel.setKeyframeValue(handle, newValue);
            if (moved.contains(handle)) return;
            compound->moveKeyframe(&e.channel, from, to, nullptr, nullptr, _linked);
            for (TQChannel* component : compound->getComponents()) {
                TQCurveEditorChannelItem* componentItem = itemForChannel(component);
                if (!componentItem) continue;
                markDirty(componentItem);
                // `to` is axis time; the lookup takes each component's own channel time, so
                // that a component with an offset is found as well.
                const CMTime componentTime = component->toChannelTime(&to);
                if (TQKeyframeHandle h = component->getKeyframe(componentTime)) moved.insert(h);
            }
        });
    }
}

void TQCurveEditorCtrlBase::offsetSelected(TQCurveSelectionList* list, CMTime x, double y) {
    if (!list) return;
    validateSelection(list);
    if (list->empty()) return;

    const TQCurveSelectionPtr first = list->selectionAtIndex(0);
    if (first->isCurve()) {
        editEntryChannel(first.get(), {}, [&](const EntryChannel& e) {
            // A vertical nudge of a segment steps by the channel's value step.
            const double value =
                convertToChannelCoords(&e.item, y * e.channel.getInfo()->valueStep);
            e.channel.setCurveSegmentValue(e.channel.toSegmentTime(&x),
                                           value + e.channel.getInitialValue(), false);
        });
        return;
    }

    if (shouldConstrainToFrames()) x = convertToCurveEditorAxis(x);

    std::vector<TQCurveSelection*> entries;
    entries.reserve(list->size());
    for (const auto& e : list->getSelectionArray()) entries.push_back(e.get());
    std::vector<OrderedEntry> ordered =
        buildOrderedList(entries, [this](const TQCurveSelection& e) { return channelForEntry(e); });
    if (isLaterThanZero(x)) std::reverse(ordered.begin(), ordered.end());

    const bool moveInTime = !isZero(x);
    const bool singleEntry = ordered.size() == 1;
    for (const OrderedEntry& o : ordered) {
        if (!o.entry->isKeypoint()) continue;
        editEntryChannel(o.entry, {}, [&](const EntryChannel& e) {
            const TQKeyframeHandle handle = e.entry.getHandle();
            CMTime time = kCMTimeInvalid;
            double value = 0.0;
            // Announced, but a stale handle is left unmarked: as it always was.
            if (!e.channel.getKeyframe(handle, &time, &value)) return false;
            e.channel.setKeyframeValue(handle,
                                       value + (e.item.scaleY() * y) / e.item.conversionFactor());
            const CMTime from = BN_CMTimeSaferAdd(time, e.channel.timeOffset());
            if (!moveInTime) return true;
            // No moved set here: a nudge of two components of one linked compound moves the
            // compound twice, as it always has.
            if (TQCompoundChannel* compound = linkedParent(&e.channel)) {
                compound->noteWillChange(true);
                compound->moveKeyframe(&e.channel, from, BN_CMTimeSaferAdd(from, x), nullptr,
                                       nullptr, _linked);
                markComponentsDirty(*compound);
            } else {
                CMTime to = BN_CMTimeSaferAdd(from, x);
                if (singleEntry) to = convertToCurveEditorAxis(to);
                e.channel.moveKeyframe(&from, &to, true);
            }
            return true;
        });
    }
}

void TQCurveEditorCtrlBase::offsetCurve(TQCurveSelectionList* list, CMTime x, double y) {
    if (!list) return;
    validateSelection(list);
    if (list->empty()) return;
    // Only the curve of entry 0 moves; x is where the user took it.
    editEntryChannel(list->selectionAtIndex(0).get(), {}, [&](const EntryChannel& e) {
        e.channel.offsetCurve(&x, convertToChannelCoords(&e.item, y));
    });
}

void TQCurveEditorCtrlBase::sortKeypoints(std::vector<TQKeyframePtr>& keys, bool bBackward) {
    // The comparators put a before b only for a strict order; equal times are "descending"
    // both ways, which is an equivalence here, so the sort is well defined. Stable, so equal
    // times keep their order.
    const auto timeOf = [](const TQKeyframePtr& k) { return k ? k->u() : kCMTimeZero; };
    const auto before = [&](const TQKeyframePtr& a, const TQKeyframePtr& b) {
        const int32_t c = CMTimeCompare(timeOf(a), timeOf(b));
        return bBackward ? c > 0 : c < 0;
    };
    // A box drag turns the order of the same keys around whenever its direction changes:
    // keys sorted the other way are reversed, each run of equal times turned back so that it
    // keeps its order, as the stable sort would give it, in one pass instead of a sort.
    if (std::is_sorted(keys.begin(), keys.end(), before)) return;
    const auto after = [&](const TQKeyframePtr& a, const TQKeyframePtr& b) { return before(b, a); };
    if (std::is_sorted(keys.begin(), keys.end(), after)) {
        std::reverse(keys.begin(), keys.end());
        for (auto run = keys.begin(); run != keys.end();) {
            const auto end = std::find_if(run, keys.end(), [&](const TQKeyframePtr& k) {
                return CMTimeCompare(timeOf(k), timeOf(*run)) != 0;
            });
            std::reverse(run, end);
            run = end;
        }
        return;
    }
    std::stable_sort(keys.begin(), keys.end(), before);
}
