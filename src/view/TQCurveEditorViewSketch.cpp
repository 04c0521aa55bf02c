// The sketch tool: a curve drawn freehand. While the button is down the sketched channels get
// a keypoint at the pointer at each drag step, and the keypoints the pointer passes over are
// erased. The whole stroke is one undo step, opened at the press and closed at the release.

#include <algorithm>
#include <cmath>
#include <vector>

#include "platform/channels/TQChannel.h"
#include "src/contract/TQCurveEditorAppDelegate.h"
#include "src/data/TQCurveEditorItem.h"
#include "src/engine/TQCurveEditorCtrlBase.h"
#include "src/engine/TQEditBrackets.h"
#include "src/view/TQCurveEditorViewBase.h"

namespace {

CMTime timeOfWorldX(double x) { return TQTarnTimeForChannelSeconds(x, kTQCurveEditorTimescale); }

CMTime magnitude(const CMTime& t) { return CMTimeCompare(t, kCMTimeZero) < 0 ? t * -1.0 : t; }

}  // namespace

const TQCurveSelectionPtr& TQCurveEditorViewBase::sketchEntry(uint32_t channelId) {
    if (!_sketchEntry) _sketchEntry = std::make_shared<TQCurveSelection>();
    _sketchEntry->setCurveId(channelId);
    return _sketchEntry;
}

void TQCurveEditorViewBase::mouseDownSketch(const RWEvent&) {
    if (!_controller) return;
    const CGPoint world = getPointWorld(_mouseOrigin);
    // mouseDown has already suppressed event coalescing for the gesture; mouseUp lifts it.
    TQCurveSelectionList* selection = _selection.get();
    _capturing.emplace(*_controller, selection, "Undo Draw Curve");
    const TQModifyValueGuard values(*_controller, selection);
    const CMTime at = timeOfWorldX(world.x);
    for (const TQCurveEditorItemPtr& item : _controller->sketchedChannels()) {
        if (!item || !item->isEnabledItem()) continue;
        _controller->addVertex(sketchEntry(item->channelId()), at, world.y, 0);
    }
    // _lastTime is set by the first drag step.
}

void TQCurveEditorViewBase::mouseDraggedSketch(const RWEvent& event) {
    if (!_controller) return;
    const CGPoint p = backingPointOfEvent(event);
    const double sx = p.x - _lastPoint.x;
    const double sy = p.y - _lastPoint.y;
    _lastPoint = p;
    const uint64_t mods = event.modifierFlags();
    if (TQCurveEditorAppDelegate* delegate = _controller->appDelegate()) delegate->abort();

    // How far the pointer runs past the padded top or bottom, and past the left or right edge.
    const CGRect b = bounds();
    const double scale = windowBackingScale();
    const CGRect band = CGRectMake(b.origin.x * scale, b.origin.y * scale, b.size.width * scale,
                                   b.size.height * scale);
    const double padding = getZoomPadding();
    const double bottom = band.origin.y + band.size.height * padding;
    const double top = band.origin.y + band.size.height - band.size.height * padding;
    const double y = _lastMousePos.y + sy;
    double vertical = 0.0;
    if (y < bottom)
        vertical = y - bottom;
    else if (y > top)
        vertical = y - top;
    const double x = _lastMousePos.x + sx;
    const double left = band.origin.x;
    const double right = band.origin.x + band.size.width;
    double horizontal = 0.0;
    if (x > right) horizontal = -(x - right);
    if (x < left) horizontal = -(x - left);

    double sf = -sy;
    if (std::fabs(vertical) >= kTQZeroTolerance && _autoPan && _canPanVertically) {
        pan(0.0, vertical);
        sf = vertical - sy;
        // Minus the excess here, where the box tool passes it as it is: both stay so.
        _controller->windowWasPanned(-vertical / _currentViewVolume.size.height);
    }

    CGPoint world = getPointWorld(CGPointMake(_lastMousePos.x + sx, _lastMousePos.y - sf));
    const double lastX = getPointWorld(_lastMousePos).x;
    if (!(mods & RWEventModifierFlagShift)) {
        _shiftWasPressed = 0;
        _constrainMove = TQConstrainDirection::kUndecided;
    } else {
        const CGPoint screen = getPointScreen(world);
        // The axis is fixed when Shift is first seen in the stroke.
        if (!_shiftWasPressed) {
            _shiftWasPressed = 1;
            constrainMove(screen, _mouseOrigin);
        }
        world = getPointWorld(constrainMove(screen, _mouseOrigin));
    }
    world = constrainTime(world);

    {
        TQCurveSelectionList* selection = _selection.get();
        const TQModifyGuard modify(*_controller, selection);
        const TQModifyValueGuard values(*_controller, selection);
        const std::vector<TQCurveEditorItemPtr> sketched = _controller->sketchedChannels();
        const size_t n = std::min<size_t>(_controller->numberOfSketchedChannels(), sketched.size());
        for (size_t i = 0; i < n; ++i) {
            const TQCurveEditorItemPtr& item = sketched[i];
            if (item && item->isEnabledItem())
                sketchChannelStep(item->channelId(), lastX, world.x, world.y);
        }
    }

    if (std::fabs(horizontal) >= kTQZeroTolerance && _autoPan && _canPanHorizontally) {
        pan(horizontal, 0.0);
        _controller->windowWasPanned(sf / _currentViewVolume.size.height);
    }
    const CGPoint s = getPointScreen(world);
    updateDrag(s.x - _lastMousePos.x, s.y - _lastMousePos.y);
    setNeedsDisplay(1);
    _startDrag = 0;
    postNotification(kTQNotifyChannelsChanging);
}

void TQCurveEditorViewBase::sketchChannelStep(uint32_t channelId, double lastX, double newX,
                                              double v) {
    const TQCurveSelectionPtr& entry = sketchEntry(channelId);
    const TQCurveEditorItemPtr held = _controller->channelItemWithIdentifier(channelId);
    auto* item = dynamic_cast<TQCurveEditorChannelItem*>(held.get());
    if (_startDrag && item) {
        // The ghost shows the curve as it was before the stroke.
        const bool snapshot = _controller->snapshotChannels();
        if (!((snapshot || item->drawGhost()) && item->numberOfSamplesSnapshot() != 0))
            item->takeCurveSnapshot(snapshot);
        item->setDrawGhost(1);
    }

    const CMTime lastTime = _controller->convertToCurveEditorAxis(timeOfWorldX(lastX));
    if (_startDrag) _lastTime = lastTime;
    const CMTime newTime = _controller->convertToCurveEditorAxis(timeOfWorldX(newX));
    const CMTime distance = magnitude(BN_CMTimeSaferAdd(_lastTime * -1.0, newTime));

    // Erase what the pointer passed over since the last keypoint written, in the direction it
    // moved: a keypoint exactly at the distance goes, the one at _lastTime itself stays. Only
    // the first enabled channel of a step erases past the first step: the others find
    // _lastTime already moved on, as the tool has always behaved.
    if (TQChannel* channel = item ? item->channel() : nullptr) {
        const bool forward = lastX <= newX;
        const CMTime origin = channel->toChannelTime(&_lastTime);
        CMTime cursor = origin;
        while (forward ? channel->nextKeyframeTime(&cursor, false)
                       : channel->previousKeyframeTime(&cursor, false)) {
            if (CMTimeCompare(magnitude(BN_CMTimeSaferSubtract(cursor, origin)), distance) > 0)
                break;
            _controller->deleteVertex(entry.get(), cursor);
        }
    }
    _lastTime = newTime;
    _controller->addVertex(entry, _lastTime, v, 0);
}
