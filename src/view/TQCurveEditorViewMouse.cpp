// Mouse dispatch and the edit tool: the shared part of a gesture (down, drag steps at most
// 30 a second, up), the edit tool's clicks and drags on keypoints, tangent handles and curves,
// the scroll band that zooms or pans when a drag reaches the view's edge, the Shift axis
// constraint, and the space-bar keys that arm navigation.

#include <algorithm>
#include <cmath>
#include <cstdint>

#include "platform/channels/TQChannel.h"
#include "src/contract/TQCurveEditorAppDelegate.h"
#include "src/curvesets/TQCurveSet.h"
#include "src/data/TQCurveEditorItem.h"
#include "src/engine/TQCurveEditorCtrlBase.h"
#include "src/view/TQCurveEditorViewBase.h"

namespace {

// "Option alone" and "Command alone" look at these two bits only: Shift and Control do not
// count.
constexpr uint64_t kOptionCommandMask = RWEventModifierFlagOption | RWEventModifierFlagCommand;

bool hasShift(uint64_t flags) { return (flags & RWEventModifierFlagShift) != 0; }
bool hasControl(uint64_t flags) { return (flags & RWEventModifierFlagControl) != 0; }
bool optionAlone(uint64_t flags) {
    return (flags & kOptionCommandMask) == RWEventModifierFlagOption;
}
bool commandAlone(uint64_t flags) {
    return (flags & kOptionCommandMask) == RWEventModifierFlagCommand;
}
bool optionAndCommand(uint64_t flags) { return (flags & kOptionCommandMask) == kOptionCommandMask; }

CMTime timeOfWorldX(double x) { return TQTarnTimeForChannelSeconds(x, kTQCurveEditorTimescale); }

// The channel items of a selection's entries. Entries of one curve usually follow each other,
// so the lookup through the curve set runs again only when the curve changes.
class ChannelItemLookup {
public:
    explicit ChannelItemLookup(const TQCurveEditorCtrlBase& controller) : _controller(controller) {}
    TQCurveEditorChannelItem* operator()(uint32_t curveId) {
        if (!_looked || curveId != _curveId) {
            _item = _controller.channelItemWithIdentifier(curveId);
            _curveId = curveId;
            _looked = true;
        }
        return dynamic_cast<TQCurveEditorChannelItem*>(_item.get());
    }

private:
    const TQCurveEditorCtrlBase& _controller;
    TQCurveEditorItemPtr _item;
    uint32_t _curveId = 0;
    bool _looked = false;
};

}  // namespace

// ---- Event geometry ------------------------------------------------------------------------

CGPoint TQCurveEditorViewBase::drawablePointOfEvent(const RWEvent& event) const {
    const double scale = windowBackingScale();
    if (!_viewHost)
        return CGPointMake(event.locationInWindow().x * scale, event.locationInWindow().y * scale);
    const CGPoint inView = _viewHost->convertPointFromWindow(event.locationInWindow());
    const CGPoint origin = _viewHost->bounds().origin;
    return CGPointMake((inView.x - origin.x) * scale, (inView.y - origin.y) * scale);
}

CGPoint TQCurveEditorViewBase::backingPointOfEvent(const RWEvent& event) const {
    const double scale = windowBackingScale();
    return CGPointMake(event.locationInWindow().x * scale, event.locationInWindow().y * scale);
}

void TQCurveEditorViewBase::setCursorShape(RWCursor cursor) const {
    if (_viewHost) _viewHost->setCursor(cursor);
}

void TQCurveEditorViewBase::hideCursorForDrag() {
    if (_cursorHidden) return;
    if (_viewHost) _viewHost->setCursorHidden(true);
    _cursorHidden = 1;
}

void TQCurveEditorViewBase::notifyChannelChangeDone() const {
    postNotification(kTQNotifyChannelsChanged);
}

// ---- Dispatch ------------------------------------------------------------------------------

void TQCurveEditorViewBase::mouseDown(const RWEvent& event) {
    // A press while a drag's step is still open means its release was lost: that step ends
    // before this gesture begins.
    closeDragCapture();
    _needsAutoZoom = 0;
    _mouseIsDown = 1;
    _constrainMove = TQConstrainDirection::kUndecided;
    _mouseOrigin = drawablePointOfEvent(event);
    _lastMousePos = _mouseOrigin;
    _startDrag = 1;
    _printText = 1;
    _lastPoint = backingPointOfEvent(event);
    TQCurveEditorAppDelegate* delegate = _controller ? _controller->appDelegate() : nullptr;
    if (delegate) delegate->suppressEventCoalescing();

    switch (_controller ? _controller->getCurrentTool() : TQTool::kEdit) {
        case TQTool::kEdit: mouseDownEdit(event); break;
        case TQTool::kSketch: mouseDownSketch(event); break;
        case TQTool::kBox: mouseDownBox(event); break;
        default: break;  // a host's own tool id: nothing more
    }
}

void TQCurveEditorViewBase::mouseDragged(const RWEvent& event) {
    // A drag can arrive without its down (the press went to another view): it starts here.
    if (!_mouseIsDown) mouseDown(event);
    // At most one step per frame interval. A dropped event loses nothing: the next step
    // measures its movement from _lastPoint, which only a step that runs moves.
    if (clock().now() - _lastMouseDraggedEvent <= kFrameInterval) return;
    switch (_controller ? _controller->getCurrentTool() : TQTool::kEdit) {
        case TQTool::kEdit: mouseDraggedEdit(event); break;
        case TQTool::kSketch: mouseDraggedSketch(event); break;
        case TQTool::kBox: mouseDraggedBox(event); break;
        default: break;
    }
    _lastMouseDraggedEvent = clock().now();
}

void TQCurveEditorViewBase::mouseUp(const RWEvent& event) {
    const uint64_t mods = event.modifierFlags();
    TQCurveSelectionList* selection = _selection.get();
    TQCurveEditorAppDelegate* delegate = _controller ? _controller->appDelegate() : nullptr;

    // A Control-drag of the band flattens what it took.
    if (_controller && _selecting && hasControl(mods)) _controller->flattenSelected(selection);
    setNeedsDisplay(1);
    if (_controller) {
        _controller->validateSelection(selection);
        _controller->cleanSelection(selection);
    }
    if (delegate) delegate->unsuppressEventCoalescing();
    if (_controller && _controller->getCurrentTool() == TQTool::kBox && !_selecting)
        finishBoxDeformation();

    if (_controller && !selection->empty()) {
        _controller->purgeSelected(selection);
        restoreItemsAfterDrag();
    }
    closeDragCapture();
    // A plain rubber band changed no channel and posts nothing.
    if (!_selecting || hasControl(mods)) postNotification(kTQNotifyChannelsChanged);
    makeBoxAroundBand();

    _selecting = 0;
    _selectionViewVolume = CGRectZero;
    _useOriginalAngle = 0;
    _startDrag = 0;
    _printText = 0;
    _shiftWasPressed = 0;
    _mouseIsDown = 0;
    _activePart = kTQBoxPartNone;
    _currentActivePart = kTQBoxPartNone;
    _didAddPoint = 0;
    _constrainMove = TQConstrainDirection::kUndecided;
    _currentSelection->reset();
    _previousSelection->reset();

    if (_controller && _controller->getCurrentTool() == TQTool::kEdit)
        setCursorShape(RWCursor::EditPoints);
    if (_cursorHidden) {
        if (_viewHost) _viewHost->setCursorHidden(false);
        _cursorHidden = 0;
    }
}

// ---- Items during a drag -------------------------------------------------------------------

void TQCurveEditorViewBase::prepareItemsForDrag(bool coarseCurves) {
    const bool snapshot = _controller->snapshotChannels();
    // A coarser curve while dragging; the next draw takes this count for the dirty curve.
    const auto dragSamples = static_cast<uint32_t>(bounds().size.width / 5.0 + 1.0);
    ChannelItemLookup itemOf(*_controller);
    for (const TQCurveSelectionPtr& entry : _selection->getSelectionArray()) {
        if (!entry) continue;
        TQCurveEditorChannelItem* item = itemOf(entry->getCurveId());
        if (!item) continue;
        // Several entries of one curve take one snapshot: the ghost is on after the first.
        if ((!snapshot && !item->drawGhost()) || item->numberOfSamplesSnapshot() == 0)
            item->takeCurveSnapshot(snapshot);
        item->setDrawGhost(1);
        if (!coarseCurves) continue;
        item->setNumberOfSamples(dragSamples);
        if (item->drawProcessedCurve()) item->setDrawProcessedCurve(0);
    }
}

void TQCurveEditorViewBase::restoreItemsAfterDrag() {
    const bool snapshot = _controller->snapshotChannels();
    const CGRect b = bounds();
    const auto fullSamples = static_cast<uint32_t>(b.size.width + 1.0);
    // The view in points and not in backing pixels, as it has always been compared here.
    const double worldTop = getPointWorld(CGPointMake(0.0, b.size.height)).y;
    const double worldBottom = getPointWorld(CGPointZero).y;
    ChannelItemLookup itemOf(*_controller);
    for (const TQCurveSelectionPtr& entry : _selection->getSelectionArray()) {
        if (!entry) continue;
        TQCurveEditorChannelItem* item = itemOf(entry->getCurveId());
        if (!item) continue;
        if (item->drawGhost() && !snapshot) item->setDrawGhost(0);
        item->setNumberOfSamples(fullSamples);
        if (_shouldDrawProcessedCurve) item->setDrawProcessedCurve(1);
        if (_autoZoom && item->drawProcessedCurve()) {
            const double top = _controller->convertFromChannelCoords(item, item->maxY());
            const double bottom = _controller->convertFromChannelCoords(item, item->minY());
            if (top > worldTop || bottom < worldBottom) item->setUpdateScale(1);
        }
    }
}

void TQCurveEditorViewBase::openDragCapture(const char* undoKey) {
    // After a key release before the first step (_startDrag cleared) the drag's value
    // announcements run with no capture open: left so on purpose.
    if (!_startDrag) return;
    _capturing.emplace(*_controller, _selection.get(), undoKey);
}

// ---- The edit tool: mouse down -------------------------------------------------------------

void TQCurveEditorViewBase::mouseDownEdit(const RWEvent& event) {
    if (!_controller) return;
    const uint64_t mods = event.modifierFlags();
    TQCurveSelectionList* selection = _selection.get();
    // One step that opens and closes within the click.
    auto clickStep = [&](const char* undoKey, TQCurveSelectionList* list, auto&& change) {
        const TQEditBracket bracket(*_controller, list, undoKey);
        change();
    };

    _didAddPoint = 0;
    pick(_mouseOrigin);
    _controller->validateSelection(selection);
    if (hasShift(mods)) _previousSelection->setSelection(*selection);

    if (_currentSelection->empty()) {
        // Empty space: Shift starts a band that adds to the selection, a plain click empties it.
        if (hasShift(mods))
            _selecting = 1;
        else
            selection->reset();
        _controller->selectionChangedTo(selection);
        return;
    }

    TQCurveSelectionPtr e = _currentSelection->selectionAtIndex(0);
    if (e->isKeypoint()) {
        if (!hasShift(mods)) {
            // A click on a selected keypoint keeps the selection and makes it primary.
            if (selection->isSelection(*e))
                selection->delSelection(*e);
            else
                selection->reset();
            selection->addSelectionFront(e);
            if (event.clickCount() >= 2) {
                // The value panel runs to its end here, so the typed value lies inside the step.
                clickStep("Undo Move Keypoint", selection, [&] {
                    CGRect inWindow = bounds();
                    if (_viewHost)
                        inWindow.origin =
                            inWindow.origin - _viewHost->convertPointFromWindow(CGPointZero);
                    _controller->showValueAtPoint(event.locationInWindow(), nullptr, inWindow);
                });
            } else if (commandAlone(mods)) {
                clickStep("Undo Flatten Keypoint", selection,
                          [&] { _controller->flattenSelected(selection); });
            }
        } else if (selection->isSelection(*e)) {
            selection->delSelection(*e);
        } else {
            selection->addSelectionFront(e);
        }
        _lastMousePos = _mouseOrigin;
    } else if (e->isTangent()) {
        if (selection->isSelection(*e)) selection->delSelection(*e);
        selection->addSelectionFront(e);
        if (mods & RWEventModifierFlagOption)
            clickStep("Undo Break Tangents", selection,
                      [&] { _controller->breakTangentsSelected(selection); });
        if (hasShift(mods)) {
            // Shift snaps the handle onto its nearest 45-degree direction at once. Deliberately
            // outside any bracket: the snap is part of the press, as it has always been.
            const CGPoint w = getPointWorld(_mouseOrigin);
            _controller->saveTangents(e.get());
            _controller->setTangents45Selected(selection, w.x, w.y, 0);
            _useOriginalAngle = 1;
            _shiftWasPressed = 1;
        }
    } else if (e->isCurve()) {
        if (optionAlone(mods) || event.clickCount() >= 2) {
            const TQCurveEditorItemPtr item =
                _controller->channelItemWithIdentifier(e->getCurveId());
            TQChannel* channel = item ? item->channel() : nullptr;
            if (channel && channel->canKeyframe()) {
                // The curve's own entry announces its channel: the selection may not hold it.
                TQCurveSelectionList* picked = _currentSelection.get();
                clickStep("Undo Add keypoint", picked, [&] {
                    const TQCurveSelectionPtr added =
                        _controller->addVertex(e, timeOfWorldX(getPointWorld(_mouseOrigin).x));
                    if (added) e = added;
                    _didAddPoint = 1;
                });
            }
        }
        // Without an added keypoint this selects the curve itself.
        selection->reset();
        selection->addSelection(e);
    } else if (hasShift(mods)) {
        _selecting = 1;
    } else {
        selection->reset();
    }

    _currentSelection->reset();
    _controller->selectionChangedTo(selection);
}

// ---- The edit tool: one drag step ----------------------------------------------------------

void TQCurveEditorViewBase::mouseDraggedEdit(const RWEvent& event) {
    if (!_controller) return;
    const uint64_t mods = event.modifierFlags();
    TQCurveSelectionList* selection = _selection.get();
    _controller->validateSelection(selection);
    const CGPoint p = backingPointOfEvent(event);
    const double dx = p.x - _lastPoint.x;
    const double dy = p.y - _lastPoint.y;
    double ny = -dy;
    _lastPoint = p;

    if (!_selecting && _startDrag) {
        // A Shift drag from a keypoint that the Shift click has just taken out of the
        // selection puts it back and drags it along.
        pick(_lastMousePos);
        const TQCurveSelectionPtr hit = _currentSelection->selectionAtIndex(0);
        if (hasShift(mods) && hit && !selection->isSelection(*hit) && hit->isKeypoint()) {
            selection->addSelectionFront(hit);
            _controller->selectionChangedTo(selection);
        }
        // The pick serves only this test; left in place it would leak into a band below.
        _currentSelection->reset();
    }

    if (selection->empty() || _selecting) {
        if (!_space || _autoZoom) {
            rubberBandStep(dx, dy, mods);
            return;
        }
        // Space-bar navigation: pan, or zoom with Command.
        const double height = _currentViewVolume.size.height;
        if (!(mods & RWEventModifierFlagCommand)) {
            setCursorShape(RWCursor::OpenHand);
            if (_canPanHorizontally || _canPanVertically)
                pan(_canPanHorizontally ? dx : 0.0, _canPanVertically ? ny : 0.0);
            _controller->windowWasPanned(dy / height);
        } else {
            setCursorShape(std::max(dx, ny) > 1.0 ? RWCursor::ZoomIn : RWCursor::ZoomOut);
            zoom(dx, ny);
            _controller->windowWasZoomed();
        }
        postNotification(kTQNotifyChannelsChanging);
        updateDrag(dx, dy);
        setNeedsDisplay(1);
        _startDrag = 0;
        return;
    }

    const TQCurveSelectionPtr e = selection->selectionAtIndex(0);
    if (!e) return;  // a list given a null entry from outside: nothing to drag
    if (_startDrag) prepareItemsForDrag(true);

    // The scroll band: how far the dragged keypoints (or the pointer) would go past the
    // padded top or bottom, and past the unpadded left or right edge.
    const CGRect b = bounds();
    const double scale = windowBackingScale();
    const CGRect band = CGRectMake(b.origin.x * scale, b.origin.y * scale, b.size.width * scale,
                                   b.size.height * scale);
    CGPoint lo = _lastMousePos;
    CGPoint hi = _lastMousePos;
    double minX = 0.0, maxX = 0.0, minY = 0.0, maxY = 0.0;
    if (_controller->getSelected(selection, &minX, &maxX, &minY, &maxY)) {
        lo = getPointScreen(CGPointMake(minX, minY));
        hi = getPointScreen(CGPointMake(maxX, maxY));
    }
    const double padding = getZoomPadding();
    double v = 0.0;
    if (lo.y + dy < band.origin.y + padding * band.size.height)
        v = lo.y + dy - (band.origin.y + band.size.height * padding);
    else if (hi.y + dy > band.origin.y + band.size.height - padding * band.size.height)
        v = hi.y + dy - (band.origin.y + band.size.height - band.size.height * padding);
    double h = 0.0;
    if (lo.x + dx < band.origin.x)
        h = band.origin.x - (lo.x + dx);
    else if (hi.x + dx > band.origin.x + band.size.width)
        h = (band.origin.x + band.size.width) - (hi.x + dx);
    if (std::fabs(v) >= kTQZeroTolerance) {
        if (_autoZoom) {
            _needsAutoZoom = 1;
        } else if (_autoPan && _canPanVertically) {
            pan(0.0, v);
            ny = v - dy;
            _controller->windowWasPanned(-v / _currentViewVolume.size.height);
        }
    } else if (_autoZoom) {
        _needsAutoZoom = 0;
    }

    const CGPoint world = getPointWorld(CGPointMake(_lastMousePos.x + dx, _lastMousePos.y - ny));
    // The keypoint case may constrain the point; _lastMousePos follows the constrained one.
    CGPoint moved = world;
    if (e->isTangent()) {
        dragTangentStep(*e, world, mods);
    } else if (e->isKeypoint()) {
        moved = dragKeypointStep(*e, world, dx, mods);
    } else if (e->isCurve()) {
        dragCurveStep(world, mods);
    }

    if (std::fabs(h) >= kTQZeroTolerance && _autoPan && _canPanHorizontally) {
        pan(h, 0.0);
        // The vertical figure in this horizontal case too: the scrollers expect it so.
        _controller->windowWasPanned(ny / _currentViewVolume.size.height);
    }

    const CGPoint s = getPointScreen(moved);
    postNotification(kTQNotifyChannelsChanging);
    updateDrag(s.x - _lastMousePos.x, s.y - _lastMousePos.y);
    setNeedsDisplay(1);
    _startDrag = 0;
}

void TQCurveEditorViewBase::dragTangentStep(TQCurveSelection& primary, CGPoint world,
                                            uint64_t mods) {
    TQCurveSelectionList* selection = _selection.get();
    setCursorShape(RWCursor::Move);
    openDragCapture("Undo Set Tangents");
    // Command pulls the handles unweighted: the weighting is switched off around the change,
    // the first switch ahead of the value announcement, as it always was.
    const char c = (mods & RWEventModifierFlagCommand) ? 1 : 0;
    _controller->weightTangentsSelected(selection, static_cast<char>(1 - c));
    const TQModifyValueGuard step(*_controller, selection);
    if (!hasShift(mods)) {
        _shiftWasPressed = 0;
        _useOriginalAngle = 0;
        _controller->setTangentsSelected(selection, world.x, world.y);
    } else if (!_shiftWasPressed) {
        _controller->saveTangents(&primary);
        _controller->setTangents45Selected(selection, world.x, world.y, 0);
        _useOriginalAngle = 1;
        _shiftWasPressed = 1;
    } else {
        _controller->setTangents45Selected(selection, world.x, world.y, _useOriginalAngle);
    }
    _controller->weightTangentsSelected(selection, c);
}

CGPoint TQCurveEditorViewBase::dragKeypointStep(TQCurveSelection& primary, CGPoint world, double dx,
                                                uint64_t mods) {
    TQCurveSelectionList* selection = _selection.get();
    setCursorShape(RWCursor::Move);
    hideCursorForDrag();

    if (commandAlone(mods) && !_didAddPoint) {
        // Command pulls tangents out of the keypoint, on the side the pointer moves to.
        const TQCurveEditorItemPtr item =
            _controller->channelItemWithIdentifier(primary.getCurveId());
        const TQChannel* channel = item ? item->channel() : nullptr;
        // A channel whose interpolation may not change keeps its keypoints as they are.
        if (channel && channel->testFlag(kTQChannelFlagNoInterpolationChange)) return world;
        openDragCapture("Undo Set Tangents");
        const TQModifyValueGuard step(*_controller, selection);
        _controller->setBezierPointSelected(selection);
        _controller->weightTangents(&primary, 0);
        // The entry becomes that tangent: the following steps drag it as a handle.
        primary.setFlags(dx >= 0.0 ? TQSelectionOutTangent : TQSelectionInTangent);
        _controller->setTangents(&primary, world.x, world.y);
        _controller->alignTangentsSelected(selection);
        _controller->weightTangents(&primary, 1);
        return world;
    }

    openDragCapture("Undo Move Keypoint");
    const TQModifyValueGuard step(*_controller, selection);
    double u = 0.0;
    double y = 0.0;
    _controller->getSelectedVertex(&primary, &u, &y);
    CGPoint w = world;
    const bool shift = hasShift(mods);
    if (!shift || _lockInU) {
        _shiftWasPressed = 0;
        _constrainMove = TQConstrainDirection::kUndecided;
    } else {
        const CGPoint ps = getPointScreen(w);
        const CGPoint vs = getPointScreen(CGPointMake(u, y));
        // The axis is decided once from the whole movement since the gesture began; the
        // keypoint is then held around its own present position.
        if (!_shiftWasPressed) {
            _shiftWasPressed = 1;
            constrainMove(ps, _mouseOrigin);
        }
        w = getPointWorld(constrainMove(ps, vs));
    }
    w = constrainTime(w);
    if (_snapCursor) w = snapCursorTo(w);
    const char isConstraining = _constrainMove == TQConstrainDirection::kVertical ? 1 : 0;

    if (!_lockInU || shift) {
        if (optionAndCommand(mods))
            _controller->offsetCurve(selection, timeOfWorldX(w.x), w.y);
        else
            _controller->moveSelected(selection, timeOfWorldX(w.x), w.y, 1, isConstraining);
    } else {
        // Locked in time: only the value follows the pointer.
        _controller->moveSelected(selection, timeOfWorldX(getPointWorld(_mouseOrigin).x), w.y, 1,
                                  isConstraining);
    }
    return w;
}

void TQCurveEditorViewBase::dragCurveStep(CGPoint world, uint64_t mods) {
    TQCurveSelectionList* selection = _selection.get();
    openDragCapture("Undo Move Curve");
    setCursorShape(RWCursor::Move);
    hideCursorForDrag();
    const TQModifyValueGuard step(*_controller, selection);
    // A curve moves only vertically: the time is always that of the gesture's origin.
    const CMTime originTime = timeOfWorldX(getPointWorld(_mouseOrigin).x);
    if (optionAndCommand(mods))
        _controller->offsetCurve(selection, originTime, world.y);
    else
        _controller->moveSelected(selection, originTime, world.y, 1, 0);
}

// ---- Constraints ---------------------------------------------------------------------------

CGPoint TQCurveEditorViewBase::constrainMove(const CGPoint& p, const CGPoint& origin) {
    switch (_constrainMove) {
        case TQConstrainDirection::kVertical: return CGPointMake(origin.x, p.y);
        case TQConstrainDirection::kHorizontal: return CGPointMake(p.x, origin.y);
        default:
            // A tie is vertical.
            _constrainMove = std::fabs(p.x - origin.x) > std::fabs(p.y - origin.y)
                                 ? TQConstrainDirection::kHorizontal
                                 : TQConstrainDirection::kVertical;
            return origin;
    }
}

CGPoint TQCurveEditorViewBase::constrainTime(const CGPoint& p) const {
    CGPoint out = p;
    const double start = CMTimeGetSeconds(_totalRange.start);
    if (out.x < start) out.x = start;
    const CMTime totalEnd = BN_CMTimeSaferAdd(_totalRange.start, _totalRange.duration);
    const CMTime displayEnd = BN_CMTimeSaferAdd(_displayRange.start, _displayRange.duration);
    const CMTime limit = CMTimeCompare(displayEnd, totalEnd) > 0 ? displayEnd : totalEnd;
    const double end = CMTimeGetSeconds(limit);
    if (out.x >= end) out.x = end;
    return out;
}

CGPoint TQCurveEditorViewBase::snapCursorTo(const CGPoint& p) const {
    // Deliberately only a round trip through the screen: the snap never moved the point onto
    // the start, end or playhead times near it, and the timeline draws no markers for it.
    return getPointWorld(getPointScreen(p));
}

// ---- Keys ----------------------------------------------------------------------------------

bool TQCurveEditorViewBase::keyDown(const RWEvent& event) {
    // Only a repeat arms the space bar here; the first press goes through customKeyEquivalent.
    if (!event.characters().empty() && event.characters()[0] == ' ' && event.isARepeat()) {
        _space = 1;
        return true;
    }
    return false;
}

bool TQCurveEditorViewBase::keyUp(const RWEvent&) {
    _useOriginalAngle = 0;
    _startDrag = 0;
    if (!_space) return false;
    notifyChannelChangeDone();
    _space = 0;
    return true;
}

bool TQCurveEditorViewBase::customKeyEquivalent(const RWEvent& event) {
    if (event.type() == RWEventType::KeyDown && !event.characters().empty() &&
        event.characters()[0] == ' ') {
        _space = 1;
        return true;
    }
    return false;
}
