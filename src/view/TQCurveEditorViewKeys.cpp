// What the view does besides dragging: nudges and deletion as actions of a key map, the menu
// of a right click, the pointer's shape over the curves and the area that keeps it current.

#include <optional>

#include "platform/channels/TQChannel.h"
#include "src/contract/TQCurveEditorAppDelegate.h"
#include "src/data/TQCurveEditorItem.h"
#include "src/engine/TQCurveEditorCtrlBase.h"
#include "src/engine/TQEditBrackets.h"
#include "src/view/TQCurveEditorViewBase.h"

// The undo step of one key: it validates the selection, and with a text opens a capture that
// it closes on every path.
class HotKeySentry {
public:
    HotKeySentry(TQCurveEditorViewBase& view, const char* text) : _view(view) {
        TQCurveEditorCtrlBase* controller = view._controller;
        if (!controller) return;
        controller->validateSelection(view.getSelection());
        if (!text) return;
        // The step is always named a deletion, a nudge's too: its entry in the host's history
        // has always read so.
        _capture.emplace(controller->appDelegate(), "Undo Delete Keypoint");
        _view._keyCapturing = 1;
    }
    ~HotKeySentry() {
        if (!_capture) return;
        _capture.reset();
        _view._keyCapturing = 0;
    }
    HotKeySentry(const HotKeySentry&) = delete;
    HotKeySentry& operator=(const HotKeySentry&) = delete;

private:
    TQCurveEditorViewBase& _view;
    std::optional<TQCaptureGuard> _capture;
};

namespace {

bool optionAlone(uint64_t flags) {
    return (flags & (RWEventModifierFlagOption | RWEventModifierFlagCommand)) ==
           RWEventModifierFlagOption;
}

}  // namespace

// ---- Nudges and deletion -------------------------------------------------------------------

void TQCurveEditorViewBase::nudgeBy(CMTime time, double value) {
    const HotKeySentry sentry(*this, "Undo Move Keypoint");
    if (_controller) _controller->offsetSelected(_selection.get(), time, value);
    notifyChannelChangeDone();
}

void TQCurveEditorViewBase::nudgeVertically(double pixels) {
    const CGPoint step = getSizeWorld(CGPointMake(0.0, pixels));
    nudgeBy(TQTarnTimeForChannelSeconds(step.x, kTQCurveEditorTimescale), step.y);
}

CMTime TQCurveEditorViewBase::frameDuration() const {
    TQCurveEditorAppDelegate* delegate = _controller ? _controller->appDelegate() : nullptr;
    // Without a host there is no frame: a zero step, which moves nothing in time.
    return delegate ? delegate->getFrameDuration() : kCMTimeZero;
}

void TQCurveEditorViewBase::nudgeUp(void*) { nudgeVertically(1.0); }
void TQCurveEditorViewBase::nudgeDown(void*) { nudgeVertically(-1.0); }
void TQCurveEditorViewBase::nudgeLeft(void*) { nudgeBy(frameDuration() * -1.0, 0.0); }
void TQCurveEditorViewBase::nudgeRight(void*) { nudgeBy(frameDuration(), 0.0); }
void TQCurveEditorViewBase::nudgeUpFinished(void*) { notifyChannelChangeDone(); }
void TQCurveEditorViewBase::nudgeDownFinished(void*) { notifyChannelChangeDone(); }
void TQCurveEditorViewBase::nudgeLeftFinished(void*) { notifyChannelChangeDone(); }
void TQCurveEditorViewBase::nudgeRightFinished(void*) { notifyChannelChangeDone(); }

void TQCurveEditorViewBase::deleteKeypoints(void* sender) {
    const HotKeySentry sentry(*this, "Undo Delete Keypoint");
    if (!_controller || _controller->getCurrentTool() != TQTool::kBox) {
        if (_controller) _controller->deleteKeypoints(sender);
        _selection->reset();
    } else {
        // The box tool's Delete takes the box away, and no keypoint.
        resetBoxDeformation();
        _selection->reset();
        setNeedsDisplay(1);
        notifyChannelChangeDone();
    }
    notifyChannelChangeDone();
}

bool TQCurveEditorViewBase::performAction(const std::string& action, RWActionSender& sender) {
    using Action = void (TQCurveEditorViewBase::*)(void*);
    struct Named {
        const char* name;
        Action action;
    };
    static constexpr Named kActions[] = {
        {"nudgeUp:", &TQCurveEditorViewBase::nudgeUp},
        {"nudgeDown:", &TQCurveEditorViewBase::nudgeDown},
        {"nudgeLeft:", &TQCurveEditorViewBase::nudgeLeft},
        {"nudgeRight:", &TQCurveEditorViewBase::nudgeRight},
        {"nudgeUpFinished:", &TQCurveEditorViewBase::nudgeUpFinished},
        {"nudgeDownFinished:", &TQCurveEditorViewBase::nudgeDownFinished},
        {"nudgeLeftFinished:", &TQCurveEditorViewBase::nudgeLeftFinished},
        {"nudgeRightFinished:", &TQCurveEditorViewBase::nudgeRightFinished},
        {"delete:", &TQCurveEditorViewBase::deleteKeypoints},
        {"selectAll:", &TQCurveEditorViewBase::selectAll},
        {"selectNone:", &TQCurveEditorViewBase::selectNone},
    };
    for (const Named& a : kActions) {
        if (action != a.name) continue;
        (this->*a.action)(&sender);
        return true;
    }
    return false;
}

// ---- The context menu ----------------------------------------------------------------------

RWMenuPtr TQCurveEditorViewBase::menuForEvent(const RWEvent& event) {
    if (!_controller) return nullptr;
    const bool shift = (event.modifierFlags() & RWEventModifierFlagShift) != 0;
    TQCurveSelectionList* selection = _selection.get();
    // A miss leaves the current selection as it was: what an earlier menu left there must not
    // count as hit.
    _currentSelection->reset();
    _mouseOrigin = drawablePointOfEvent(event);
    pick(_mouseOrigin);
    _controller->validateSelection(selection);
    if (shift) _previousSelection->setSelection(*selection);

    if (const TQCurveSelectionPtr e = _currentSelection->selectionAtIndex(0)) {
        if (e->isKeypoint() || e->isTangent()) {
            // As a click: a selected one becomes primary, another replaces the selection
            // (joins it with Shift).
            if (selection->isSelection(*e))
                selection->delSelection(*e);
            else if (!shift)
                selection->reset();
            selection->addSelectionFront(e);
            _controller->selectionChangedTo(selection);
        } else if (e->isCurve()) {
            selection->reset();
            selection->addSelectionFront(e);
            _controller->selectionChangedTo(selection);
        }
    }
    _currentSelection->reset();
    // The menu is chosen from the frame that shows the new selection.
    display();
    _mouseOrigin = drawablePointOfEvent(event);
    pick(_mouseOrigin);

    const TQCurveSelectionPtr hit = _currentSelection->selectionAtIndex(0);
    if (hit && hit->isKeypoint()) return _controller->getKeyframeMenu();
    if (hit && hit->isTangent()) return _controller->getTangentMenu();
    if (hit && hit->isCurve()) return _controller->getCurveMenu();
    return _controller->getDefaultMenu();
}

void TQCurveEditorViewBase::display() {
    if (_viewHost) _viewHost->displayNow();
}

// ---- The pointer ---------------------------------------------------------------------------

void TQCurveEditorViewBase::cursorUpdate(const RWEvent& event) {
    const TQTool tool = _controller ? _controller->getCurrentTool() : TQTool::kEdit;
    if (tool == TQTool::kBox) {
        setCursorShape(RWCursor::CrossHairs);
        return;
    }
    if (tool == TQTool::kSketch) {
        setCursorShape(RWCursor::Sketch);
        return;
    }
    // A host's own tool keeps its pointer; a gesture or the space bar sets its own.
    if (tool != TQTool::kEdit || _mouseIsDown || _space) return;

    // The window point is scaled to the backing before it is taken into the view: unlike
    // mouseDown's conversion, and kept so.
    const double scale = windowBackingScale();
    const CGPoint backing =
        CGPointMake(event.locationInWindow().x * scale, event.locationInWindow().y * scale);
    CGPoint at = backing;
    if (_viewHost) at = _viewHost->convertPointFromWindow(backing) - _viewHost->bounds().origin;
    // A miss leaves the current selection as it was: it must start empty to tell.
    _currentSelection->reset();
    pick(at);
    const TQCurveSelectionPtr hit = _currentSelection->selectionAtIndex(0);
    if (!hit) {
        setCursorShape(RWCursor::EditPoints);
        return;
    }
    RWCursor cursor = RWCursor::Move;
    if (hit->isCurve() && optionAlone(event.modifierFlags()) && _controller) {
        const TQCurveEditorItemPtr item = _controller->channelItemWithIdentifier(hit->getCurveId());
        const TQChannel* channel = item ? item->channel() : nullptr;
        if (channel && channel->canKeyframe()) cursor = RWCursor::PenAddControlPoint;
    }
    setCursorShape(cursor);
    _currentSelection->reset();
}

void TQCurveEditorViewBase::updateTrackingAreas() {
    if (_viewHost && _trackingArea) _viewHost->removeTrackingArea(*_trackingArea);
    _trackingArea.reset();
    if (!_viewHost) return;
    _trackingArea = std::make_shared<RWTrackingArea>();
    _trackingArea->rect = bounds();
    _trackingArea->options =
        RWTrackingCursorUpdate | RWTrackingActiveInActiveApp | RWTrackingInVisibleRect;
    _trackingArea->owner = this;
    _viewHost->addTrackingArea(_trackingArea);
}

bool TQCurveEditorViewBase::acceptsFirstMouse(const RWEvent& event) {
    mouseMoved(event);
    return true;
}
