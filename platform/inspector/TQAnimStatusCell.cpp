#include "platform/inspector/TQAnimStatusCell.h"

#include <algorithm>

#include "platform/channels/TQChannel.h"
#include "platform/channels/TQChannelFolder.h"
#include "platform/ui/RWOutlineView.h"

TQAnimStatusCell::TQAnimStatusCell() = default;

TQAnimStatusCell::~TQAnimStatusCell() = default;

// ---- The row ----------------------------------------------------------------------------------

void TQAnimStatusCell::updateChannel(TQChannelBase* channel, CMTime time) {
    _pChan = channel;
    _time = time;
    updateState();
}

void TQAnimStatusCell::updateState() { _keyframeAtTime = hasKeypointAtTime(_time, _pChan, false); }

bool TQAnimStatusCell::isAnimated(const TQChannelBase* channel) const {
    return channel && channel->isAnimated(true);
}

bool TQAnimStatusCell::hasKeypointAtTime(CMTime time, const TQChannelBase* channel,
                                         bool ignoreCurveType) const {
    if (!channel) return false;
    if (const auto* c = dynamic_cast<const TQChannel*>(channel)) {
        if (!ignoreCurveType && !c->canKeyframe()) return false;
        return c->hasKeyframeAtTime(&time, 0.0);
    }
    if (dynamic_cast<const TQChannelFolder*>(channel)) {
        const std::vector<TQChannelBase*>* children = channel->getChildren();
        if (!children) return false;
        for (const TQChannelBase* child : *children)
            if (child && !child->testFlag(kTQChannelFlagHidden) &&
                hasKeypointAtTime(time, child, ignoreCurveType))
                return true;
    }
    return false;
}

bool TQAnimStatusCell::keyframeBeyond(const TQChannelBase* channel, bool forward, CMTime& time) {
    if (const auto* c = dynamic_cast<const TQChannel*>(channel)) {
        CMTime t = time;
        const bool found = forward ? c->nextKeyframeTime(&t, false) : c->previousKeyframeTime(&t);
        if (found) time = t;
        return found;
    }
    const std::vector<TQChannelBase*>* children = channel ? channel->getChildren() : nullptr;
    if (!children) return false;
    bool found = false;
    CMTime best = time;
    for (const TQChannelBase* child : *children) {
        CMTime t = time;
        if (!child || child->testFlag(kTQChannelFlagHidden) || !keyframeBeyond(child, forward, t))
            continue;
        const int32_t order = CMTimeCompare(t, best);
        if (!found || (forward ? order < 0 : order > 0)) best = t;
        found = true;
    }
    if (found) time = best;
    return found;
}

// ---- Geometry ---------------------------------------------------------------------------------

int64_t TQAnimStatusCell::partAtPoint(const CGRect& frame, const CGPoint& point) {
    for (const int64_t part : {kPartPrevious, kPartNext, kPartAddOrDelete})
        if (CGRectContainsPoint(rectOfPart(frame, part), point)) return part;
    return kPartNone;
}

CGRect TQAnimStatusCell::rectOfPart(const CGRect& frame, int64_t part) {
    // Left to right: previous, next, the keyframe.
    double slot = 0.0;
    switch (part) {
        case kPartPrevious: slot = 0.0; break;
        case kPartNext: slot = 1.0; break;
        case kPartAddOrDelete: slot = 2.0; break;
        default: return CGRectZero;
    }
    return CGRectMake(frame.origin.x + slot * kPartWidth, frame.origin.y, kPartWidth,
                      frame.size.height);
}

// ---- Drawing ----------------------------------------------------------------------------------

void TQAnimStatusCell::drawWithFrame(const CGRect& frame, RWCellDrawing& drawing) const {
    if (!_pChan) return;
    auto opacity = [&](int64_t part) {
        if (_pressedPart == part) return kPressedOpacity;
        return _hoveredPart == part ? kHoveredOpacity : kRestingOpacity;
    };
    // Square images, centred in their part.
    auto square = [&](int64_t part) {
        const CGRect r = rectOfPart(frame, part);
        const double side = std::min(r.size.width, r.size.height);
        return CGRectMake(r.origin.x + (r.size.width - side) * 0.5,
                          r.origin.y + (r.size.height - side) * 0.5, side, side);
    };
    if (_isMouseOverRow) {
        drawing.drawImage(kPreviousImage, square(kPartPrevious), opacity(kPartPrevious));
        drawing.drawImage(kNextImage, square(kPartNext), opacity(kPartNext));
    }
    if (_keyframeAtTime)
        drawing.drawImage(kKeyframeImage, square(kPartAddOrDelete), opacity(kPartAddOrDelete));
    else if (_isMouseOverRow || isAnimated(_pChan))
        drawing.drawImage(kNoKeyframeImage, square(kPartAddOrDelete), opacity(kPartAddOrDelete));
}

// ---- Tracking ---------------------------------------------------------------------------------

bool TQAnimStatusCell::trackMouse(const RWEvent&, const CGPoint& point, const CGRect& frame,
                                  RWOutlineView&, bool) {
    _trackingPart = partAtPoint(frame, point);
    if (_trackingPart == kPartNone) return false;
    _trackingFrame = frame;
    _pressedPart = _trackingPart;
    return true;
}

void TQAnimStatusCell::continueTracking(const RWEvent&, const CGPoint& point, RWOutlineView&) {
    _pressedPart = partAtPoint(_trackingFrame, point) == _trackingPart ? _trackingPart : kPartNone;
}

void TQAnimStatusCell::stopTracking(const CGPoint& point, RWOutlineView&, bool mouseIsUp) {
    const int64_t part = _trackingPart;
    _trackingPart = kPartNone;
    _pressedPart = kPartNone;
    // A press acts only when released in the part it began in.
    if (mouseIsUp && part != kPartNone && partAtPoint(_trackingFrame, point) == part) act(part);
}

void TQAnimStatusCell::act(int64_t part) {
    switch (part) {
        case kPartPrevious:
        case kPartNext: {
            CMTime t = _time;
            if (keyframeBeyond(_pChan, part == kPartNext, t)) setCurrentTimeAndNotify(t, _pChan);
            break;
        }
        case kPartAddOrDelete:
            performAction(_keyframeAtTime ? "deleteKeyframeForCell:" : "addKeyframeForCell:",
                          *this);
            break;
        default: break;
    }
}

void TQAnimStatusCell::rightMouseDown(const RWEvent& event, RWOutlineView& view) {
    if (const RWMenuPtr menu = newMenuUseImages(true)) view.popUpContextMenu(menu, event);
}

RWMenuPtr TQAnimStatusCell::newMenuUseImages(bool) { return nullptr; }

bool TQAnimStatusCell::performAction(const std::string&, RWActionSender&) { return false; }
