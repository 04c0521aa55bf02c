// Box deformation: the frozen copy of the selected keypoints and the bilinear map of the
// box's four corners through which each drag step writes them back.
//
// Frozen coordinates. Setup turns each keypoint and both its handles into (u, v) inside the
// box, (0, 0) at its lower left and (1, 1) at its upper right; handles may lie outside. u is
// kept as a CMTime of the keypoint's own timescale, so its precision is one tick of that
// timescale.
//
// Write order. The keys are written leading edge first, so that none lands on the time of
// one not yet moved (where a move by time would take the wrong keyframe, and where the later
// arrival is the one a purge keeps): the first pass finds the direction of travel and whether
// the box is mirrored, and re-sorts the keys by u when either changed since the last step.
// Unlinked keypoints are moved by their own handle, so even keypoints that do meet (a box
// pulled through zero width) never trade places.

#include <algorithm>
#include <cfloat>
#include <cmath>
#include <cstdint>

#include "src/engine/TQCurveEditorCtrlBase.h"

// The bilinear map of the unit square onto the four corners:
//   time(u, v)  = Ax u v + Bx u + Cx v + Dx
//   value(u, v) = Dy + (Cy v + (Ay u v + By u))
// Lines parallel to the box's sides stay straight; it is not a perspective map.
struct TQBilinearMap {
    double ax = 0.0, bx = 0.0, cx = 0.0, dx = 0.0;
    double ay = 0.0, by = 0.0, cy = 0.0, dy = 0.0;

    TQBilinearMap(CGPoint bl, CGPoint br, CGPoint tr, CGPoint tl)
        : ax(bl.x + (tr.x - br.x) - tl.x),
          bx(br.x - bl.x),
          cx(tl.x - bl.x),
          dx(bl.x),
          ay(bl.y + (tr.y - br.y) - tl.y),
          by(br.y - bl.y),
          cy(tl.y - bl.y),
          dy(bl.y) {}

    // In media time, in this order of operations. With `squaredU` the first term is
    // Ax u u v: how an output handle's time has always been placed in the writing pass. It
    // differs from the keypoint's and the input handle's only when Ax is not zero (a freely
    // distorted box), and it is kept so.
    CMTime time(const CMTime& u, double v, bool squaredU = false) const {
        CMTime t = u * bx;
        // Ax is zero while the box keeps parallel sides (every drag but a free corner's); the
        // term is then an exact zero of u's own timescale, and adding it changes nothing.
        if (ax != 0.0) {
            CMTime first = u * ax;
            first = squaredU ? (first * u) * v : first * v;
            t = BN_CMTimeSaferAdd(first, t);
        }
        t = CMTimeAdd(t, TQTarnTimeForChannelSeconds(cx * v, kTQCurveEditorTimescale));
        return CMTimeAdd(t, TQTarnTimeForChannelSeconds(dx, kTQCurveEditorTimescale));
    }
    double value(const CMTime& u, double v) const {
        const double s = CMTimeGetSeconds(u);
        return dy + (cy * v + (ay * s * v + by * s));
    }
};

namespace {

constexpr double kDegenerateExtent = 1e-6;

bool isLater(const CMTime& a, const CMTime& b) { return CMTimeCompare(a, b) > 0; }
bool isEarlier(const CMTime& a, const CMTime& b) { return CMTimeCompare(a, b) < 0; }

}  // namespace

// ---- Setup -------------------------------------------------------------------------------

CGRect TQCurveEditorCtrlBase::setupDeformSelected(TQCurveSelectionList* list) {
    if (!list) return CGRectZero;
    validateSelection(list);
    _keys.clear();
    _keys.reserve(list->size());
    CMTime minTime = kCMTimePositiveInfinity;
    CMTime maxTime = kCMTimeNegativeInfinity;
    double minValue = DBL_MAX;
    double maxValue = -DBL_MAX;

    for (const TQCurveSelectionPtr& entry : list->getSelectionArray()) {
        if (!entry || !entry->isKeypoint()) continue;
        TQCurveEditorChannelItem* item = itemForEntry(*entry);
        TQChannel* channel = item ? item->channel() : nullptr;
        if (!channel) continue;  // validated away already; guarded all the same
        const TQKeyframeHandle handle = entry->getHandle();
        CMTime time = kCMTimeInvalid;
        double value = 0.0;
        double inU = 0.0, inV = 0.0, outU = 0.0, outV = 0.0;
        if (!channel->getKeyframe(handle, &time, &value)) continue;
        channel->getKeyframeInputTangents(handle, &inU, &inV);
        channel->getKeyframeOutputTangents(handle, &outU, &outV);

        auto key = std::make_shared<TQKeyframe>();
        key->setHandle(handle);
        key->setCurveId(entry->getCurveId());
        const CMTime axisTime = BN_CMTimeSaferAdd(time, channel->timeOffset());
        key->setU(axisTime);
        key->setV(convertFromChannelCoords(item, value));
        key->setInTanU(
            CMTimeAdd(axisTime, TQTarnTimeForChannelSeconds(inU, kTQCurveEditorTimescale)));
        key->setInTanV(convertFromChannelCoords(item, inV + value));
        key->setOutTanU(
            CMTimeAdd(axisTime, TQTarnTimeForChannelSeconds(outU, kTQCurveEditorTimescale)));
        key->setOutTanV(convertFromChannelCoords(item, outV + value));

        // Handles never widen the box.
        if (isEarlier(axisTime, minTime)) minTime = axisTime;
        if (isLater(axisTime, maxTime)) maxTime = axisTime;
        minValue = std::min(minValue, key->v());
        maxValue = std::max(maxValue, key->v());
        _keys.push_back(std::move(key));
    }
    // No keypoint (a list of tangent entries, say) makes no box: the bounds would still be
    // the infinities they started as.
    if (_keys.empty()) return CGRectZero;
    sortKeypoints(_keys, false);

    const double x = CMTimeGetSeconds(minTime);
    const CMTime duration = BN_CMTimeSaferSubtract(maxTime, minTime);
    const double width =
        CMTimeCompare(duration, kCMTimeZero) == 0 ? kDegenerateExtent : CMTimeGetSeconds(duration);
    double height = maxValue - minValue;
    if (std::fabs(height) < kTQZeroTolerance) height = kDegenerateExtent;
    const double y = minValue;

    const CMTime origin = TQTarnTimeForChannelSeconds(x, kTQCurveEditorTimescale);
    for (const TQKeyframePtr& key : _keys) {
        // The keypoint keeps its own timescale, truncated to one tick of it.
        const double n = (CMTimeGetSeconds(key->u()) - x) / width;
        const CMTimeScale scale = key->u().timescale;
        key->setU(CMTimeMake(static_cast<CMTimeValue>(n * scale), scale));
        key->setV((key->v() - y) / height);
        key->setInTanU(CMTimeSubtract(key->inTanU(), origin) / width);
        key->setInTanV((key->inTanV() - y) / height);
        key->setOutTanU(CMTimeSubtract(key->outTanU(), origin) / width);
        key->setOutTanV((key->outTanV() - y) / height);
    }
    return CGRectMake(x, y, width, height);
}

// ---- Deform ------------------------------------------------------------------------------

const TQCurveEditorCtrlBase::DeformTarget& TQCurveEditorCtrlBase::deformTarget(uint32_t curveId) {
    auto it = std::lower_bound(
        _deformTargets.begin(), _deformTargets.end(), curveId,
        [](const DeformTarget& target, uint32_t id) { return target.curveId < id; });
    if (it != _deformTargets.end() && it->curveId == curveId) return *it;
    DeformTarget target;
    target.curveId = curveId;
    target.held = channelItemWithIdentifier(curveId);
    target.item = dynamic_cast<TQCurveEditorChannelItem*>(target.held.get());
    target.channel = target.item ? target.item->channel() : nullptr;
    return *_deformTargets.insert(it, std::move(target));
}

void TQCurveEditorCtrlBase::deformSelected(TQCurveSelectionList*, CGPoint bottomLeft,
                                           CGPoint bottomRight, CGPoint topRight, CGPoint topLeft,
                                           char lastDeformation) {
    const TQBilinearMap map(bottomLeft, bottomRight, topRight, topLeft);
    // Items and channels are resolved once per curve for this call; an edit of keyframes
    // neither adds nor removes items or channels.
    _deformTargets.clear();
    orderKeysForDeform(map);
    if (_keys.empty()) return;
    for (const TQKeyframePtr& key : _keys)
        if (key) writeDeformedKey(*key, map, lastDeformation);
    // Nothing is held past the call.
    _deformTargets.clear();
}

void TQCurveEditorCtrlBase::orderKeysForDeform(const TQBilinearMap& map) {
    int32_t direction = 0;
    bool flipped = false;  // accumulates over the keys walked
    for (const TQKeyframePtr& key : _keys) {
        if (!key) continue;
        const DeformTarget& target = deformTarget(key->curveId());
        if (!target.channel) continue;
        TQChannel& channel = *target.channel;
        CMTime present = kCMTimeInvalid;
        // A keyframe deleted since setup (an undo, a purge) says nothing of the direction.
        if (!channel.getKeyframe(key->handle(), &present, nullptr)) continue;
        const CMTime offset = channel.timeOffset();
        channel.noteWillChange(true);
        const CMTime t = map.time(key->u(), key->v());
        const CMTime in = CMTimeSubtract(map.time(key->inTanU(), key->inTanV()), t);
        const CMTime out = CMTimeSubtract(map.time(key->outTanU(), key->outTanV()), t);
        if (isLater(in, kCMTimeZero) || isEarlier(out, kCMTimeZero)) flipped = true;
        const int32_t c = CMTimeCompare(BN_CMTimeSaferSubtract(t, offset), present);
        if (c != 0) {
            direction = c < 0 ? -1 : 1;
            break;
        }
    }
    if (direction == 0) return;

    const bool backward = direction == -1 ? flipped : !flipped;
    const bool sameDirection = direction == _iLastDragDirection;
    const bool sameFlip = flipped == _bSelectionWasFlipped;
    if (sameDirection && !sameFlip) {
        _bSelectionWasFlipped = flipped;
        sortKeypoints(_keys, backward);
    } else if (!sameDirection && sameFlip) {
        _iLastDragDirection = direction;
        sortKeypoints(_keys, backward);
    }
    // Both the same, or both changed at once: the order stays, and so does the stored state.
    // The second case is deliberately left alone.
}

void TQCurveEditorCtrlBase::writeDeformedKey(const TQKeyframe& key, const TQBilinearMap& map,
                                             char lastDeformation) {
    const DeformTarget& resolved = deformTarget(key.curveId());
    if (!resolved.channel) return;
    TQChannel& channel = *resolved.channel;
    TQCurveEditorChannelItem& item = *resolved.item;
    const TQKeyframeHandle handle = key.handle();
    CMTime present = kCMTimeInvalid;
    // A keyframe gone since setup is skipped: its time could name another keyframe.
    if (!channel.getKeyframe(handle, &present, nullptr)) return;
    channel.noteWillChange(true);

    const CMTime t = map.time(key.u(), key.v());
    const double w = map.value(key.u(), key.v());
    CMTime inT = CMTimeSubtract(map.time(key.inTanU(), key.inTanV()), t);
    double inW = map.value(key.inTanU(), key.inTanV()) - w;
    CMTime outT = CMTimeSubtract(map.time(key.outTanU(), key.outTanV(), true), t);
    double outW = map.value(key.outTanU(), key.outTanV()) - w;
    // A mirrored box would put the input handle after its keypoint: the two trade places,
    // where trading can mend it. The second test runs on the result of the first.
    if (isLater(inT, kCMTimeZero)) {
        std::swap(inT, outT);
        std::swap(inW, outW);
    }
    if (isEarlier(outT, kCMTimeZero)) {
        std::swap(inT, outT);
        std::swap(inW, outW);
    }

    // Into channel terms: channel time, channel units, handles relative to the keypoint.
    const CMTime offset = channel.timeOffset();
    const CMTime channelTime = BN_CMTimeSaferSubtract(t, offset);
    const double channelValue = convertToChannelCoords(&item, w);
    // A handle's time relative to its keypoint is the same in channel time as on the axis
    // (the offset cancels exactly in rational time); its value goes through the item's
    // mapping, which need not keep differences.
    const auto relativeValue = [&](double handleOffset) {
        return convertToChannelCoords(&item, handleOffset + w) - channelValue;
    };
    channel.setKeyframeValue(handle, channelValue);
    channel.setKeyframeInputTangents(handle, CMTimeGetSeconds(inT), relativeValue(inW), true);
    channel.setKeyframeOutputTangents(handle, CMTimeGetSeconds(outT), relativeValue(outW), true);

    // The time last. Only the gesture's last call goes on the grid; the channel time is put
    // on it before the offset is added back, as it always was.
    const CMTime newTime = lastDeformation && shouldConstrainToFrames()
                               ? convertToCurveEditorAxis(channelTime)
                               : channelTime;
    if (TQCompoundChannel* compound = linkedParent(&channel)) {
        // Linked: every component's keyframe at that time goes along. Two selected components
        // of one compound each move the compound; their times agree unless the box is freely
        // distorted, and then the later one's stands.
        const CMTime from = BN_CMTimeSaferAdd(present, offset);
        compound->moveKeyframe(&channel, from, BN_CMTimeSaferAdd(newTime, offset), nullptr, nullptr,
                               _linked);
        markComponentsDirty(*compound);
    } else {
        // By the keyframe itself, not by its time: keypoints that meet (a box pulled through
        // zero width) stay apart from each other's moves.
        channel.setKeyframeTime(handle, &newTime);
    }
    markDirty(&item);
}
