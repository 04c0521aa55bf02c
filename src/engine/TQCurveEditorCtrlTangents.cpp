// Tangent operations: dragging a Bezier handle with the opposite one following in screen
// space, the 45-degree constrained drag, breaking, aligning and weighting pairs, smoothing and
// flattening keypoints.
//
// A handle is stored as an offset from its keypoint: u in seconds, v in channel units. The
// follow of the opposite handle is worked out on the screen, not in the world, so that a pair
// keeps the angle and length ratio the user sees whatever the zoom of either axis.
//
// None of these opens an undo step or posts a word: the caller holds the bracket.

#include <cmath>

#include "platform/support/BNAlgorithm.h"
#include "src/engine/TQCurveEditorCtrlBase.h"
#include "src/view/TQCurveEditorViewBase.h"

namespace {

enum class Side { None, Input, Output };

// The handle a flag word names; any other word names none.
Side sideOfWord(uint64_t word) {
    if (word == TQSelectionOutTangent) return Side::Output;
    if (word == TQSelectionInTangent) return Side::Input;
    return Side::None;
}

// The lenient reading used where the steps say "output, else input".
Side outputElseInput(uint64_t word) {
    return word == TQSelectionOutTangent ? Side::Output : Side::Input;
}

bool readHandle(const TQChannel& channel, TQKeyframeHandle h, Side side, double& u, double& v) {
    u = 0.0;
    v = 0.0;
    return side == Side::Output ? channel.getKeyframeOutputTangents(h, &u, &v, true)
                                : channel.getKeyframeInputTangents(h, &u, &v, true);
}

void writeHandle(TQChannel& channel, TQKeyframeHandle h, Side side, double u, double v) {
    if (side == Side::Output)
        channel.setKeyframeOutputTangents(h, u, v, true);
    else
        channel.setKeyframeInputTangents(h, u, v, true);
}

Side opposite(Side side) { return side == Side::Output ? Side::Input : Side::Output; }

bool isKeypointOrTangent(const TQCurveSelection& entry) {
    return entry.isKeypoint() || entry.isTangent();
}

double length(const CGPoint& p) { return std::hypot(p.x, p.y); }
bool isFinite(const CGPoint& p) { return std::isfinite(p.x) && std::isfinite(p.y); }

}  // namespace

// Screen and world through the view's last frame. Without a view the world itself serves as
// the screen, so the operations still do their work in one consistent space.
static CGPoint toScreen(const TQCurveEditorViewBase* view, const CGPoint& world) {
    return view ? view->getPointScreen(world) : world;
}
static CGPoint toWorld(const TQCurveEditorViewBase* view, const CGPoint& screen) {
    return view ? view->getPointWorld(screen) : screen;
}

void TQCurveEditorCtrlBase::setTangents(const TQCurveSelection* entry, double u, double v) {
    editEntryChannel(entry, {}, [&](const EntryChannel& e) { return dragHandle(e, u, v); });
}

bool TQCurveEditorCtrlBase::dragHandle(const EntryChannel& e, double u, double v) {
    TQCurveEditorChannelItem* item = &e.item;
    TQChannel* channel = &e.channel;
    const CMTime offset = channel->timeOffset();
    const TQKeyframeHandle h = e.entry.getHandle();
    CMTime keyTime = kCMTimeInvalid;
    double keyValue = 0.0;
    // A stale handle: nothing to drag, and the curve is left unmarked.
    if (!channel->getKeyframe(h, &keyTime, &keyValue)) return false;
    const bool broken = channel->getKeyframeTangentsBroken(h);
    const bool scaled = channel->getKeyframeTangentsScaled(h);
    const double channelV = convertToChannelCoords(item, v);

    const Side side = sideOfWord(e.entry.getFlags());
    if (side != Side::None) {
        // The time offset enters here only: u is on the editor's axis.
        const double newU = u - CMTimeGetSeconds(BN_CMTimeSaferAdd(keyTime, offset));
        const double newV = channelV - keyValue;
        double oldU = 0.0;
        double oldV = 0.0;
        readHandle(*channel, h, side, oldU, oldV);
        writeHandle(*channel, h, side, newU, newV);

        if (!broken) {
            // Read back: the channel may have altered what was written.
            double draggedU = 0.0;
            double draggedV = 0.0;
            double oppositeU = 0.0;
            double oppositeV = 0.0;
            readHandle(*channel, h, side, draggedU, draggedV);
            readHandle(*channel, h, opposite(side), oppositeU, oppositeV);

            // From here on the keypoint is placed without the time offset. The mismatch with
            // the step above is deliberate (the follow is measured about the keypoint as the
            // channel stores it): do not "fix" it.
            const double keySeconds = CMTimeGetSeconds(keyTime);
            const auto absolute = [&](double du, double dv) {
                return CGPointMake(du + keySeconds, convertFromChannelCoords(item, dv + keyValue));
            };
            const CGPoint p =
                toScreen(_view, CGPointMake(keySeconds, convertFromChannelCoords(item, keyValue)));
            const CGPoint n = toScreen(_view, absolute(draggedU, draggedV)) - p;
            const CGPoint o = toScreen(_view, absolute(oppositeU, oppositeV)) - p;
            const CGPoint d = toScreen(_view, absolute(oldU, oldV)) - p;

            // The opposite handle turns by exactly what the dragged one turned on screen.
            const double oppositeLength = length(o);
            const double angle =
                std::atan2(o.y, o.x) + (std::atan2(n.y, n.x) - std::atan2(d.y, d.x));
            const double oldLength = length(d);
            const auto offsetOf = [&](const CGPoint& screen, double& du, double& dv) {
                const CGPoint w = toWorld(_view, screen);
                du = w.x - keySeconds;
                dv = convertToChannelCoords(item, w.y) - keyValue;
                return std::isfinite(du) && std::isfinite(dv);
            };
            double followU = 0.0;
            double followV = 0.0;
            bool ok = false;
            if (!scaled && oldLength == 0.0) {
                // A handle pulled out of its keypoint has no old direction to turn from: the
                // opposite becomes its plain mirror, in channel units.
                ok = offsetOf(p + n, followU, followV);
                followU = -followU;
                followV = -followV;
            } else {
                // Scaled pairs keep the opposite length; others keep the pair's length ratio.
                const double newLength =
                    scaled ? oppositeLength : (length(n) / oldLength) * oppositeLength;
                const CGPoint follow =
                    CGPointMake(newLength * std::cos(angle), newLength * std::sin(angle));
                ok = isFinite(p) && offsetOf(p + follow, followU, followV);
            }
            // Without a drawn frame the mapping gives no numbers: leave the opposite alone
            // rather than write NaN into the channel.
            if (ok) writeHandle(*channel, h, opposite(side), followU, followV);
        }
    }
    return true;
}

void TQCurveEditorCtrlBase::setTangentsSelected(TQCurveSelectionList* list, double u, double v) {
    if (!list) return;
    validateSelection(list);
    if (list->empty()) return;

    // Absolute world position of the handle of `entry` named by its word, keyframe time
    // without offset.
    const auto handlePosition = [this](const TQCurveSelection& entry, CGPoint& out) {
        TQCurveEditorChannelItem* item = itemForEntry(entry);
        TQChannel* channel = item ? item->channel() : nullptr;
        if (!channel) return false;
        CMTime keyTime = kCMTimeInvalid;
        double keyValue = 0.0;
        if (!channel->getKeyframe(entry.getHandle(), &keyTime, &keyValue)) return false;
        double tu = 0.0;
        double tv = 0.0;
        readHandle(*channel, entry.getHandle(), outputElseInput(entry.getFlags()), tu, tv);
        out = CGPointMake(tu + CMTimeGetSeconds(keyTime),
                          convertFromChannelCoords(item, tv + keyValue));
        return true;
    };

    const TQCurveSelectionPtr first = list->selectionAtIndex(0);
    CGPoint firstPosition;
    if (!handlePosition(*first, firstPosition)) return;
    setTangents(first.get(), u, v);
    const CGPoint delta = CGPointMake(u, v) - firstPosition;

    // Only selected keypoints copy the movement, on the first entry's side; handle entries
    // after the first are left alone.
    const auto& array = list->getSelectionArray();
    for (size_t i = 1; i < array.size(); ++i) {
        TQCurveSelection& entry = *array[i];
        if (!entry.isKeypoint() || entry.getHandle() == first->getHandle()) continue;
        const uint64_t savedWord = entry.getFlags();
        entry.setFlags(first->getFlags());
        CGPoint position;
        if (handlePosition(entry, position)) {
            const CGPoint target = position + delta;
            setTangents(&entry, target.x, target.y);
        }
        entry.setFlags(savedWord);
    }
}

void TQCurveEditorCtrlBase::setTangents45(const TQCurveSelection* entry, double u, double v,
                                          char flag) {
    // Announced by the drag it ends in (setTangents), not here.
    editEntryChannel(entry, {.noteWillChange = false},
                     [&](const EntryChannel& e) { return snapHandle45(e, u, v, flag); });
}

bool TQCurveEditorCtrlBase::snapHandle45(const EntryChannel& e, double u, double v, char flag) {
    TQCurveEditorChannelItem* item = &e.item;
    TQChannel* channel = &e.channel;
    const TQKeyframeHandle h = e.entry.getHandle();
    CMTime keyTime = kCMTimeInvalid;
    double keyValue = 0.0;
    if (!channel->getKeyframe(h, &keyTime, &keyValue)) return false;
    const double keySeconds = CMTimeGetSeconds(keyTime);

    // The reference direction: the handle as it stood when the drag began (flag set), or a
    // vertical one (flag clear), so that the steps are then absolute screen directions. An
    // entry that names no handle takes the world origin as its reference point.
    CGPoint reference = CGPointZero;
    const Side side = sideOfWord(e.entry.getFlags());
    if (side != Side::None) {
        double refU = 0.0;
        double refV = 0.0;
        if (flag) {
            refU = side == Side::Output ? _originalOutTanU : _originalInTanU;
            refV = side == Side::Output ? _originalOutTanV : _originalInTanV;
        } else {
            readHandle(*channel, h, side, refU, refV);
            refU = 0.0;
        }
        reference = CGPointMake(refU + keySeconds, convertFromChannelCoords(item, refV + keyValue));
    }

    const CGPoint p =
        toScreen(_view, CGPointMake(keySeconds, convertFromChannelCoords(item, keyValue)));
    const CGPoint t = toScreen(_view, reference) - p;
    const CGPoint m = toScreen(_view, CGPointMake(u, v)) - p;
    const BNVec2d r = BNAlgorithm::findProjectionOn45DegreesDirection({m.x, m.y}, {t.x, t.y}, 0.0);
    const CGPoint target = toWorld(_view, p + CGPointMake(r.x, r.y));
    // No frame drawn yet: there is no screen to snap on.
    if (!isFinite(target)) return false;
    setTangents(&e.entry, target.x, target.y);
    return true;
}

void TQCurveEditorCtrlBase::setTangents45Selected(TQCurveSelectionList* list, double u, double v,
                                                  char flag) {
    if (!list) return;
    validateSelection(list);
    if (list->empty()) return;

    const TQCurveSelectionPtr first = list->selectionAtIndex(0);
    TQCurveEditorChannelItem* firstItem = itemForEntry(*first);
    TQChannel* firstChannel = firstItem ? firstItem->channel() : nullptr;
    if (!firstChannel) return;
    CMTime keyTime = kCMTimeInvalid;
    double keyValue = 0.0;
    if (!firstChannel->getKeyframe(first->getHandle(), &keyTime, &keyValue)) return;
    setTangents45(first.get(), u, v, flag);

    // The on-screen offset of the handle just set, which every other keypoint receives.
    double tu = 0.0;
    double tv = 0.0;
    readHandle(*firstChannel, first->getHandle(), outputElseInput(first->getFlags()), tu, tv);
    const double keySeconds = CMTimeGetSeconds(keyTime);
    const CGPoint handleScreen = toScreen(
        _view, CGPointMake(tu + keySeconds, convertFromChannelCoords(firstItem, tv + keyValue)));
    const CGPoint keyScreen =
        toScreen(_view, CGPointMake(keySeconds, convertFromChannelCoords(firstItem, keyValue)));
    const CGPoint screenOffset = handleScreen - keyScreen;

    const auto& array = list->getSelectionArray();
    for (size_t i = 1; i < array.size(); ++i) {
        TQCurveSelection& entry = *array[i];
        if (!entry.isKeypoint() || entry.getHandle() == first->getHandle()) continue;
        TQCurveEditorChannelItem* item = itemForEntry(entry);
        TQChannel* channel = item ? item->channel() : nullptr;
        CMTime time = kCMTimeInvalid;
        double value = 0.0;
        if (!channel || !channel->getKeyframe(entry.getHandle(), &time, &value)) continue;
        const uint64_t savedWord = entry.getFlags();
        entry.setFlags(first->getFlags());
        const CGPoint own = toScreen(
            _view, CGPointMake(CMTimeGetSeconds(time), convertFromChannelCoords(item, value)));
        const CGPoint target = toWorld(_view, own + screenOffset);
        if (isFinite(target)) setTangents(&entry, target.x, target.y);
        entry.setFlags(savedWord);
    }
}

void TQCurveEditorCtrlBase::saveTangents(const TQCurveSelection* entry) {
    if (!entry || !entry->isTangent()) return;
    TQChannel* channel = channelForEntry(*entry);
    if (!channel) return;
    // Both sides, whichever was picked: the constrained drag reads the one it needs.
    readHandle(*channel, entry->getHandle(), Side::Input, _originalInTanU, _originalInTanV);
    readHandle(*channel, entry->getHandle(), Side::Output, _originalOutTanU, _originalOutTanV);
}

void TQCurveEditorCtrlBase::breakTangents(const TQCurveSelection* entry) {
    // Toggles, with no dirty mark: the old behaviour, kept.
    editEntryChannel(entry, {.markDirty = false}, [](const EntryChannel& e) {
        const TQKeyframeHandle h = e.entry.getHandle();
        e.channel.setKeyframeTangentsBroken(h, !e.channel.getKeyframeTangentsBroken(h));
    });
}

void TQCurveEditorCtrlBase::breakTangentsSelected(TQCurveSelectionList* list) {
    if (!list) return;
    // One state for all, decided by the first keypoint or handle that has a channel.
    bool reading = true;
    for (const auto& entry : list->getSelectionArray()) {
        TQChannel* channel = entry ? channelForEntry(*entry) : nullptr;
        if (!channel || !isKeypointOrTangent(*entry)) continue;
        reading = channel->getKeyframeTangentsBroken(entry->getHandle());
        break;
    }
    forEachEntryChannel(list, isKeypointOrTangent, {}, [&](const EntryChannel& e) {
        e.channel.setKeyframeTangentsBroken(e.entry.getHandle(), !reading);
    });
}

void TQCurveEditorCtrlBase::alignTangentsSelected(TQCurveSelectionList* list) {
    forEachEntryChannel(list, &TQCurveSelection::isTangent, {}, [](const EntryChannel& e) {
        // The opposite handle becomes the exact mirror; its own length is lost by design.
        const Side from = e.entry.getFlags() == TQSelectionInTangent ? Side::Input : Side::Output;
        double tu = 0.0;
        double tv = 0.0;
        readHandle(e.channel, e.entry.getHandle(), from, tu, tv);
        writeHandle(e.channel, e.entry.getHandle(), opposite(from), -tu, -tv);
    });
}

void TQCurveEditorCtrlBase::weightTangents(const TQCurveSelection* entry, char flag) {
    // No dirty mark for one entry, unlike the list form: the old behaviour, kept.
    editEntryChannel(entry, {.markDirty = false}, [&](const EntryChannel& e) {
        e.channel.setKeyframeTangentsScaled(e.entry.getHandle(), flag != 0);
    });
}

void TQCurveEditorCtrlBase::weightTangentsSelected(TQCurveSelectionList* list, char flag) {
    forEachEntryChannel(list, isKeypointOrTangent, {}, [&](const EntryChannel& e) {
        e.channel.setKeyframeTangentsScaled(e.entry.getHandle(), flag != 0);
    });
}

void TQCurveEditorCtrlBase::setBezierPoint(const TQCurveSelection* entry) {
    // Unlike its siblings this announces nothing and leaves the dirty mark alone; callers
    // rely on that. A missing channel is guarded all the same.
    if (!entry || !entry->isKeypoint()) return;
    editEntryChannel(entry, {.noteWillChange = false, .markDirty = false},
                     [](const EntryChannel& e) {
                         const TQKeyframeHandle h = e.entry.getHandle();
                         e.channel.smoothKeyframe(h, true);
                         CMTime time = kCMTimeInvalid;
                         if (!e.channel.getKeyframe(h, &time, nullptr)) return;
                         // The segment into the keypoint depends on its predecessor, so that
                         // one is smoothed too.
                         CMTime previous = kCMTimeInvalid;
                         if (e.channel.getPreviousKeyframe(time, &previous, nullptr))
                             e.channel.smoothKeyframe(e.channel.getKeyframe(previous), true);
                     });
}

void TQCurveEditorCtrlBase::setBezierPointSelected(TQCurveSelectionList* list) {
    if (!list) return;
    validateSelection(list);
    for (const auto& entry : list->getSelectionArray())
        if (entry && entry->isKeypoint()) setBezierPoint(entry.get());
}

void TQCurveEditorCtrlBase::flattenSelected(TQCurveSelectionList* list) {
    if (!list) return;
    validateSelection(list);
    forEachEntryChannel(list, &TQCurveSelection::isKeypoint, {}, [](const EntryChannel& e) {
        const TQKeyframeHandle h = e.entry.getHandle();
        e.channel.setKeyframeInterpolation(h, kTQInterpolationLinear);
        e.channel.setKeyframeTangentsBroken(h, false);
        CMTime time = kCMTimeInvalid;
        CMTime previous = kCMTimeInvalid;
        // The incoming segment is the predecessor's: it turns Linear too.
        if (e.channel.getKeyframe(h, &time, nullptr) &&
            e.channel.getPreviousKeyframe(time, &previous, nullptr)) {
            e.channel.setKeyframeInterpolation(e.channel.getKeyframe(previous),
                                               kTQInterpolationLinear);
        }
    });
}
