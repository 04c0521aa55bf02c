// Picking and rubber-band selection: hit tests on the primitives of the last frame, the
// entries they make, and the selection commands that do not go through the mouse.

#include <algorithm>
#include <cmath>
#include <cstdint>

#include "platform/channels/TQChannel.h"
#include "platform/draw/HXDDrawPrimitive.h"
#include "src/curvesets/TQCurveSet.h"
#include "src/data/TQCurveEditorItem.h"
#include "src/engine/TQCurveEditorCtrlBase.h"
#include "src/view/TQCurveEditorViewBase.h"

namespace {

// A record's "ID" and "Handle", read as they were written by the drawing code.
uint32_t recordCurveId(const HXDHitRecord& record) {
    const HXDNumber* id = record.extraInfo().objectForKey("ID");
    return id ? static_cast<uint32_t>(id->unsignedLongValue()) : 0;
}

TQKeyframeHandle recordHandle(const HXDHitRecord& record) {
    const HXDNumber* handle = record.extraInfo().objectForKey("Handle");
    return handle ? reinterpret_cast<TQKeyframeHandle>(
                        static_cast<uintptr_t>(handle->unsignedLongLongValue()))
                  : nullptr;
}

}  // namespace

// ---- Hit tests -----------------------------------------------------------------------------

void TQCurveEditorViewBase::pick(const CGPoint& screen) {
    // Before the first frame there is no render controller and nothing was drawn to hit.
    if (!_renderController) return;
    const HXDHitTestContext context = _renderController->renderingContextForHitTestAtCoords(
        HXDFloat2{static_cast<float>(screen.x), static_cast<float>(screen.y)});
    const std::vector<HXDHitRecord> hits =
        _renderController->newHitTestResultForPrimitives(_selectionPrimitives, context, true);
    if (!hits.empty()) processHits(hits, 0);
}

void TQCurveEditorViewBase::select() {
    if (!_renderController) return;
    // The band may have been dragged to the left or down: its size is then negative.
    const CGRect& band = _selectionViewVolume;
    const double x0 = band.origin.x;
    const double x1 = band.origin.x + band.size.width;
    const double y0 = band.origin.y;
    const double y1 = band.origin.y + band.size.height;
    const CGPoint lo = getPointScreen(CGPointMake(std::fmin(x0, x1), std::fmin(y0, y1)));
    const CGPoint hi = getPointScreen(CGPointMake(std::fmax(x0, x1), std::fmax(y0, y1)));
    const HXDHitTestContext context = _renderController->renderingContextForHitTestInRect(
        CGRectMake(lo.x, lo.y, hi.x - lo.x, hi.y - lo.y));

    std::vector<HXDHitRecord>& hits = _bandHitScratch;
    hits.clear();
    for (const auto& [channelId, quads] : _keypointsPrimitives) {
        std::vector<HXDHitRecord> part =
            _renderController->newHitTestResultForPrimitives(quads, context, false);
        hits.insert(hits.end(), std::make_move_iterator(part.begin()),
                    std::make_move_iterator(part.end()));
    }
    if (!hits.empty()) processHits(hits, 1);
    // The records keep their primitives alive: they are not held past the test.
    hits.clear();
}

void TQCurveEditorViewBase::processHits(const std::vector<HXDHitRecord>& hits, char keyframesOnly) {
    _currentSelection->reset();
    _currentActivePart = kTQBoxPartNone;
    const TQTool tool = _controller ? _controller->getCurrentTool() : TQTool::kEdit;
    const TQCurveSetPtr set = _controller ? _controller->selectedCurveSet() : nullptr;
    // A band's records come channel by channel: the item of the last record is looked up
    // again only when the channel changes, not once per keypoint.
    uint32_t lastCurveId = 0;
    TQCurveEditorItemPtr lastItem;
    bool looked = false;

    for (const HXDHitRecord& record : hits) {
        // The other tools take no entries from a click; the box tool takes the part it hit
        // (the last record wins). A band of any tool selects keypoints as the edit tool does.
        if (tool != TQTool::kEdit && !_selecting) {
            if (tool == TQTool::kBox && !keyframesOnly) _currentActivePart = record.hitID();
            continue;
        }
        const uint32_t hitID = record.hitID();
        const bool isCurve = hitID == TQSelectionCurve;
        const bool isKeypoint = hitID == TQSelectionKeypoint;
        const bool isTangent = hitID == TQSelectionOutTangent || hitID == TQSelectionInTangent;
        if (!(isKeypoint || ((isCurve || isTangent) && !keyframesOnly))) continue;

        // A frame older than the curve set may name items that are gone.
        const uint32_t curveId = recordCurveId(record);
        if (!looked || curveId != lastCurveId) {
            lastItem = set ? set->itemWithIdentifier(curveId) : nullptr;
            lastCurveId = curveId;
            looked = true;
        }
        const TQCurveEditorItemPtr& item = lastItem;
        if (!item) continue;

        auto entry = std::make_shared<TQCurveSelection>();
        entry->setCurveId(item->channelId());
        entry->setFlags(hitID);
        if (!isCurve) {
            const TQKeyframeHandle handle = recordHandle(record);
            TQChannel* channel = item->channel();
            CMTime time = kCMTimeInvalid;
            double value = 0.0;
            // A keyframe deleted since the frame was drawn gets no entry: an entry with no
            // time would later be "repaired" onto whatever keyframe sits at time zero.
            if (!channel || !channel->getKeyframe(handle, &time, &value)) continue;
            entry->setHandle(handle);
            entry->setKeypointUV(time, value);
        }
        _currentSelection->addSelection(std::move(entry));
    }
}

// ---- Rubber band ---------------------------------------------------------------------------

void TQCurveEditorViewBase::rubberBandStep(double dx, double dy, uint64_t modifierFlags) {
    if (!_selecting) {
        _selecting = 1;
        _printText = 0;
    }
    // A band that comes back to the column or row where it started would collapse to a line
    // and select nothing: it is kept one pixel wide there.
    double ax = dx;
    double ay = -dy;
    if (_lastMousePos.x + dx == _mouseOrigin.x) ax = dx + 1.0;
    if (_lastMousePos.y + dy == _mouseOrigin.y) ay = 1.0 - dy;

    const CGPoint offset = getOffsetFromLastWorld(ax, ay);
    _selectionViewVolume.origin = getPointWorld(_mouseOrigin);
    _selectionViewVolume.size.width += offset.x;
    _selectionViewVolume.size.height -= offset.y;

    select();
    _selection->reset();
    if (!(modifierFlags & RWEventModifierFlagShift))
        _selection->setSelection(*_currentSelection);
    else
        invertBandMembership(ax < 0.0);
    if (_controller) _controller->selectionChangedTo(_selection.get());
    _currentSelection->reset();

    updateDrag(ax, -ay);
    setNeedsDisplay(1);
    _startDrag = 0;
}

void TQCurveEditorViewBase::invertBandMembership(bool joinAtFront) {
    // Shift inverts the membership of what the band covers, against the selection at mouse
    // down: a covered keypoint that was selected leaves (with every entry equal to it), one
    // that was not joins. Each addSelectionFront puts the entry before the previous one, so
    // front joiners end up in reverse order. Membership is tested against sorted keys, so a
    // band over thousands of keypoints costs a sort per step, not a walk per keypoint.
    // What isEqual compares; the handle as an integer, which orders totally.
    using Key = std::pair<uintptr_t, uint64_t>;
    auto keyOf = [](const TQCurveSelection& e) {
        return Key{reinterpret_cast<uintptr_t>(e.getHandle()), e.getFlags()};
    };
    std::vector<Key>& before = _bandKeyScratch;
    before.clear();
    for (const TQCurveSelectionPtr& entry : _previousSelection->getSelectionArray())
        if (entry) before.push_back(keyOf(*entry));
    std::sort(before.begin(), before.end());

    std::vector<Key>& leaving = _bandLeavingScratch;
    leaving.clear();
    std::vector<TQCurveSelectionPtr>& joining = _bandJoiningScratch;
    joining.clear();
    for (const TQCurveSelectionPtr& entry : _currentSelection->getSelectionArray()) {
        if (!entry || !entry->isKeypoint()) continue;
        if (std::binary_search(before.begin(), before.end(), keyOf(*entry)))
            leaving.push_back(keyOf(*entry));
        else
            joining.push_back(entry);
    }
    std::sort(leaving.begin(), leaving.end());

    std::vector<TQCurveSelectionPtr>& out = _selection->getSelectionArray();
    out.reserve(_previousSelection->size() + joining.size());
    if (joinAtFront) out.insert(out.end(), joining.rbegin(), joining.rend());
    for (const TQCurveSelectionPtr& entry : _previousSelection->getSelectionArray())
        if (!entry || !std::binary_search(leaving.begin(), leaving.end(), keyOf(*entry)))
            out.push_back(entry);
    if (!joinAtFront) out.insert(out.end(), joining.begin(), joining.end());
    joining.clear();  // holds no entry past the step
}

// ---- Selection care ------------------------------------------------------------------------

void TQCurveEditorViewBase::validateSelectedHandles(TQCurveSelectionList* list) {
    if (!list || list == _selection.get()) return;
    // The list may share entries with _selection (setSelection copies pointers), so it is
    // read from a snapshot of its entries, not after _selection has been emptied.
    const std::vector<TQCurveSelectionPtr> saved = list->getSelectionArray();
    _selection->reset();
    const TQCurveSetPtr set = _controller ? _controller->selectedCurveSet() : nullptr;
    for (const TQCurveSelectionPtr& entry : saved) {
        if (!entry || !set) continue;
        CMTime time = kCMTimeInvalid;
        entry->getKeypointUV(&time, nullptr);
        const TQCurveEditorItemPtr item = set->itemWithIdentifier(entry->getCurveId());
        TQChannel* channel = item ? item->channel() : nullptr;
        if (!channel) continue;
        // Only time is compared, exactly: the value may have changed since the list was
        // saved. The channel's own lookup by time keeps a large list from walking every
        // keyframe once per entry.
        const TQKeyframeHandle handle = channel->getKeyframe(time);
        if (!handle) continue;
        entry->setHandle(handle);
        _selection->addSelection(entry);
    }
    setNeedsDisplay(1);
}

std::vector<TQChannelBase*> TQCurveEditorViewBase::channelsForSelection() const {
    std::vector<TQChannelBase*> channels;
    if (!_controller) return channels;
    for (const TQCurveEditorItemPtr& item : _controller->selectedChannels()) {
        TQChannelBase* channel = item ? item->channelBase() : nullptr;
        if (channel && std::find(channels.begin(), channels.end(), channel) == channels.end())
            channels.push_back(channel);
    }
    return channels;
}

void TQCurveEditorViewBase::selectAll(void*) {
    _selection->reset();
    const TQCurveSetPtr set = _controller ? _controller->selectedCurveSet() : nullptr;
    if (set) {
        for (const TQCurveEditorItemPtr& item : set->allItems()) {
            if (!item || !item->isEnabledItem()) continue;
            TQChannel* channel = item->channel();
            if (!channel) continue;
            for (TQKeyframeHandle handle : channel->getKeyframes(false)) {
                CMTime time = kCMTimeInvalid;
                double value = 0.0;
                channel->getKeyframe(handle, &time, &value);
                auto entry = std::make_shared<TQCurveSelection>();
                entry->setHandle(handle);
                entry->setCurveId(item->channelId());
                entry->setKeypointUV(time, value);
                entry->setFlags(TQSelectionKeypoint);
                _selection->addSelection(std::move(entry));
            }
        }
    }
    if (_controller) _controller->selectionChangedTo(_selection.get());
    setNeedsDisplay(1);
}

void TQCurveEditorViewBase::selectNone(void*) {
    _selection->reset();
    if (_controller) _controller->selectionChangedTo(_selection.get());
    setNeedsDisplay(1);
}
