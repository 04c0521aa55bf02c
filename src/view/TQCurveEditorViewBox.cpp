// The box tool: a rubber band that leaves a four-corner box around the keypoints it caught,
// and the drags of the box's corners, side midpoints and inside, each step of which moves
// the corners and deforms the keypoints to the new box (the controller's deformSelected).
//
// Deltas. A step measures the pointer's movement in backing pixels from the last step (sx,
// sy up) and turns it into a world delta (dx, dy up) at the running position of the gesture.
// The corners move by world deltas, so the box follows the pointer at any zoom.

#include <cmath>
#include <cstdint>

#include "src/contract/TQCurveEditorAppDelegate.h"
#include "src/engine/TQCurveEditorCtrlBase.h"
#include "src/resources/TQStrings.h"
#include "src/view/TQCurveEditorViewBase.h"

namespace {

constexpr const char* kBoxUndoKey = "Curve Editor Undo Box Edit";
// Below this a side of the box has collapsed: it has no proportions to keep.
constexpr double kDegenerateExtent = 1e-6;
// The box's handles: squares of this many points.
constexpr double kHandlePoints = 6.0;

bool hasShift(uint64_t flags) { return (flags & RWEventModifierFlagShift) != 0; }
bool hasOption(uint64_t flags) { return (flags & RWEventModifierFlagOption) != 0; }
bool hasCommand(uint64_t flags) { return (flags & RWEventModifierFlagCommand) != 0; }

bool isCorner(uint32_t part) { return part >= kTQBoxPartBottomLeft && part <= kTQBoxPartTopLeft; }
bool isSide(uint32_t part) { return part >= kTQBoxPartTopMiddle && part <= kTQBoxPartRightMiddle; }
bool isRightColumn(uint32_t corner) {
    return corner == kTQBoxPartBottomRight || corner == kTQBoxPartTopRight;
}
bool isTopRow(uint32_t corner) {
    return corner == kTQBoxPartTopRight || corner == kTQBoxPartTopLeft;
}

}  // namespace

// ---- Geometry of the box -------------------------------------------------------------------

void TQCurveEditorViewBase::getBoxLimits(const CGPoint* boxTopLeft, const CGPoint* boxTopRight,
                                         const CGPoint* boxBottomLeft,
                                         const CGPoint* boxBottomRight, double* pWidth,
                                         double* pHeight, double* pCenterX, double* pCenterY) {
    double left = INFINITY, right = -INFINITY, bottom = INFINITY, top = -INFINITY;
    for (const CGPoint* p : {boxTopLeft, boxTopRight, boxBottomLeft, boxBottomRight}) {
        if (!p) continue;
        left = std::fmin(left, p->x);
        right = std::fmax(right, p->x);
        bottom = std::fmin(bottom, p->y);
        top = std::fmax(top, p->y);
    }
    if (left > right) left = right = bottom = top = 0.0;  // no corner given
    if (pWidth) *pWidth = std::fabs(right - left);
    if (pHeight) *pHeight = std::fabs(top - bottom);
    if (pCenterX) *pCenterX = (right - left) * 0.5 + left;
    if (pCenterY) *pCenterY = (top - bottom) * 0.5 + bottom;
}

CGRect TQCurveEditorViewBase::getEditBox() const {
    return CGRectMake(_fourCornersBottomLeft.x, _fourCornersBottomLeft.y,
                      _fourCornersTopRight.x - _fourCornersTopLeft.x,
                      _fourCornersTopRight.y - _fourCornersBottomRight.y);
}

void TQCurveEditorViewBase::setEditBox(const CGRect& box) {
    const double x = box.origin.x;
    const double y = box.origin.y;
    _fourCornersBottomLeft = CGPointMake(x, y);
    _fourCornersBottomRight = CGPointMake(x + box.size.width, y);
    _fourCornersTopRight = CGPointMake(x + box.size.width, y + box.size.height);
    _fourCornersTopLeft = CGPointMake(x, y + box.size.height);
    _fourCornerBoxInitialized = box == CGRectZero ? 0 : 1;
    setNeedsDisplay(1);
}

bool TQCurveEditorViewBase::boxKeepsAspect() const {
    return _boxAspect > 0.0 && std::isfinite(_boxAspect);
}

// ---- Mouse down and up ---------------------------------------------------------------------

void TQCurveEditorViewBase::mouseDownBox(const RWEvent&) {
    _printText = 0;
    pick(_mouseOrigin);
    if (_currentActivePart != kTQBoxPartNone) {
        _activePart = _currentActivePart;
        return;
    }
    // A press off the box forgets it and what it held.
    if (_fourCornerBoxInitialized) {
        _fourCornerBoxInitialized = 0;
        _selection->reset();
        setNeedsDisplay(1);
    }
    _selecting = 1;
    resetBoxDeformation();
}

void TQCurveEditorViewBase::finishBoxDeformation() {
    // Without a box the corners are zero, and a deformation to them would pile every frozen
    // keypoint onto time 0.
    if (!_fourCornerBoxInitialized) return;
    // A click on the box that did not drag opened no step; the snap to frames below is an
    // edit all the same (a host drops a step that changed nothing).
    if (!_capturing) _capturing.emplace(*_controller, _selection.get(), kBoxUndoKey);
    const TQModifyValueGuard step(*_controller, _selection.get());
    _controller->deformSelected(_selection.get(), _fourCornersBottomLeft, _fourCornersBottomRight,
                                _fourCornersTopRight, _fourCornersTopLeft, 1);
}

void TQCurveEditorViewBase::makeBoxAroundBand() {
    // After the band of any tool, once it has dragged, around two keypoints at least. Only the
    // box tool shows it; a change of tool forgets it.
    if (!_controller || !_selecting || _startDrag || _selection->size() < 2) return;
    const CGRect r = _controller->setupDeformSelected(_selection.get());
    const double right = r.origin.x + r.size.width;
    const double top = r.origin.y + r.size.height;
    _fourCornersBottomLeft = r.origin;
    _fourCornersBottomRight = CGPointMake(right, r.origin.y);
    _fourCornersTopLeft = CGPointMake(r.origin.x, top);
    _fourCornersTopRight = CGPointMake(right, top);
    _initialFourCornersBottomLeft = _fourCornersBottomLeft;
    _initialFourCornersBottomRight = _fourCornersBottomRight;
    _initialFourCornersTopLeft = _fourCornersTopLeft;
    _initialFourCornersTopRight = _fourCornersTopRight;
    _fourCornerBoxInitialized = 1;
}

// ---- One drag step -------------------------------------------------------------------------

void TQCurveEditorViewBase::mouseDraggedBox(const RWEvent& event) {
    if (!_controller) return;
    const uint64_t mods = event.modifierFlags();
    const CGPoint p = backingPointOfEvent(event);
    double sx = p.x - _lastPoint.x;
    const double sy = p.y - _lastPoint.y;
    _lastPoint = p;
    double sf = -sy;
    // Every step ends here: the running position advances, and the word of a running edit
    // goes out.
    auto finishStep = [this](double stepX, double stepF) {
        updateDrag(stepX, -stepF);
        setNeedsDisplay(1);
        _startDrag = 0;
        postNotification(kTQNotifyChannelsChanging);
    };

    if (_activePart == kTQBoxPartNone) {
        if (_fourCornerBoxInitialized) {
            finishStep(sx, sf);
            return;
        }
        // The band selects as the edit tool's does, without Shift's inversion.
        rubberBandStep(sx, sy, mods & ~static_cast<uint64_t>(RWEventModifierFlagShift));
        postNotification(kTQNotifyChannelsChanging);
        return;
    }
    // A press on a keypoint or a curve with no box shown has nothing to drag.
    if (!_fourCornerBoxInitialized) {
        finishStep(sx, sf);
        return;
    }

    const BoxOverrun overrun = boxOverrun(sx, sy);
    if (std::fabs(overrun.vertical) >= kTQZeroTolerance) {
        if (_autoZoom) {
            _needsAutoZoom = 1;
        } else if (_autoPan && _canPanVertically) {
            pan(0.0, overrun.vertical);
            sf = overrun.vertical - sy;
            // Of the opposite sign to the edit drag's report: the box's has always been so.
            _controller->windowWasPanned(overrun.vertical / _currentViewVolume.size.height);
        }
    } else if (_autoZoom) {
        _needsAutoZoom = 0;
    }

    CGPoint world = getPointWorld(CGPointMake(_lastMousePos.x + sx, _lastMousePos.y - sf));
    const CGPoint delta = getOffsetFromLastWorld(sx, sf);
    const double dx = delta.x;
    const double dy = -delta.y;

    if (_startDrag) {
        // One undo step for the whole drag: the channels, and the box as the host keeps it.
        openDragCapture(kBoxUndoKey);
        if (TQCurveEditorAppDelegate* delegate = _controller->appDelegate())
            delegate->addToUndo(this, kTQUndoTypeView, kTQUndoActionBoxEdit,
                                TQLocalizedString(kBoxUndoKey));
    }
    trackBoxShift(hasShift(mods));
    world = constrainTime(world);

    if (isCorner(_activePart))
        moveBoxCorner(_activePart, dx, dy, mods);
    else if (isSide(_activePart))
        moveBoxSide(_activePart, dx, dy, mods);
    else if (_activePart == kTQBoxPartInside)
        moveBoxInside(world, dx, dy, mods);

    if (_startDrag && !_selection->empty()) prepareItemsForDrag(false);
    {
        const TQModifyValueGuard step(*_controller, _selection.get());
        _controller->deformSelected(_selection.get(), _fourCornersBottomLeft,
                                    _fourCornersBottomRight, _fourCornersTopRight,
                                    _fourCornersTopLeft, 0);
    }

    if (std::fabs(overrun.horizontal) >= kTQZeroTolerance && _autoPan && _canPanHorizontally) {
        pan(overrun.horizontal, 0.0);
        // The vertical figure in this horizontal case too, as in the edit drag.
        _controller->windowWasPanned(sf / _currentViewVolume.size.height);
    }

    const CGPoint s = getPointScreen(world);
    finishStep(s.x - _lastMousePos.x, -(s.y - _lastMousePos.y));
}

TQCurveEditorViewBase::BoxOverrun TQCurveEditorViewBase::boxOverrun(double sx, double sy) {
    const CGRect b = bounds();
    const double scale = windowBackingScale();
    const double bx = b.origin.x * scale;
    const double by = b.origin.y * scale;
    const double bw = b.size.width * scale;
    const double bh = b.size.height * scale;
    double width = 0.0;
    double height = 0.0;
    getBoxLimits(&_fourCornersTopLeft, &_fourCornersTopRight, &_fourCornersBottomLeft,
                 &_fourCornersBottomRight, &width, &height, &_boxCenterX, &_boxCenterY);
    const CGPoint lo =
        getPointScreen(CGPointMake(_boxCenterX - width * 0.5, _boxCenterY - height * 0.5));
    const CGPoint hi =
        getPointScreen(CGPointMake(_boxCenterX + width * 0.5, _boxCenterY + height * 0.5));

    BoxOverrun o;
    // Vertically the box keeps out of the padding band; horizontally only out of the edges.
    const double padding = getZoomPadding();
    if (lo.y + sy < by + bh * padding)
        o.vertical = (lo.y + sy) - (by + bh * padding);
    else if (hi.y + sy > by + bh - bh * padding)
        o.vertical = (hi.y + sy) - (by + bh - bh * padding);
    if (lo.x + sx < bx)
        o.horizontal = -(lo.x + sx - bx);
    else if (hi.x + sx > bx + bw)
        o.horizontal = -(hi.x + sx - (bx + bw));
    return o;
}

void TQCurveEditorViewBase::trackBoxShift(bool shiftDown) {
    if (shiftDown && !_shiftWasPressed) {
        // The box as it stands when Shift goes down: its aspect, and where each corner lies
        // within its bounding rectangle.
        _shiftWasPressed = 1;
        double w = 0.0, h = 0.0, cx = 0.0, cy = 0.0;
        getBoxLimits(&_fourCornersTopLeft, &_fourCornersTopRight, &_fourCornersBottomLeft,
                     &_fourCornersBottomRight, &w, &h, &cx, &cy);
        const double l = cx - w * 0.5, r = cx + w * 0.5, b = cy - h * 0.5, t = cy + h * 0.5;
        const bool collapsed = w < kDegenerateExtent || h < kDegenerateExtent;
        _boxAspect = collapsed ? 0.0 : w / h;
        // A collapsed side has every corner on one line: as on a rectangle, a factor of 1.
        auto factor = [](double span, double extent) {
            return extent < kDegenerateExtent ? 1.0 : std::fabs(span / extent);
        };
        _topLeftXFactor = factor(r - _fourCornersTopLeft.x, w);
        _topLeftYFactor = factor(_fourCornersTopLeft.y - b, h);
        _topRightXFactor = factor(_fourCornersTopRight.x - l, w);
        _topRightYFactor = factor(_fourCornersTopRight.y - b, h);
        _bottomLeftXFactor = factor(r - _fourCornersBottomLeft.x, w);
        _bottomLeftYFactor = factor(t - _fourCornersBottomLeft.y, h);
        _bottomRightXFactor = factor(_fourCornersBottomRight.x - l, w);
        _bottomRightYFactor = factor(t - _fourCornersBottomRight.y, h);
    } else if (!shiftDown && _shiftWasPressed) {
        _shiftWasPressed = 0;
        _boxAspect = 0.0;
        _topLeftXFactor = _topLeftYFactor = _topRightXFactor = _topRightYFactor = 1.0;
        _bottomLeftXFactor = _bottomLeftYFactor = _bottomRightXFactor = _bottomRightYFactor = 1.0;
    }
}

// ---- The parts' moves ----------------------------------------------------------------------

void TQCurveEditorViewBase::moveBoxCorner(uint32_t part, double dx, double dy, uint64_t mods) {
    if (_shiftWasPressed && boxKeepsAspect()) {
        // Along the corner's diagonal: the rising one for bottom-left and top-right.
        const bool rising = part == kTQBoxPartBottomLeft || part == kTQBoxPartTopRight;
        const double sign = rising ? 1.0 : -1.0;
        if (std::fabs(dx) <= std::fabs(dy))
            dx = sign * dy * _boxAspect;
        else
            dy = sign * dx / _boxAspect;
    }
    struct Corner {
        uint32_t part;
        CGPoint* point;
        double xFactor;
        double yFactor;
    };
    const Corner corners[4] = {
        {kTQBoxPartBottomLeft, &_fourCornersBottomLeft, _bottomLeftXFactor, _bottomLeftYFactor},
        {kTQBoxPartBottomRight, &_fourCornersBottomRight, _bottomRightXFactor, _bottomRightYFactor},
        {kTQBoxPartTopRight, &_fourCornersTopRight, _topRightXFactor, _topRightYFactor},
        {kTQBoxPartTopLeft, &_fourCornersTopLeft, _topLeftXFactor, _topLeftYFactor},
    };
    for (const Corner& c : corners) {
        const bool sameColumn = isRightColumn(c.part) == isRightColumn(part);
        const bool sameRow = isTopRow(c.part) == isTopRow(part);
        if (hasCommand(mods)) {
            // Free distortion: the corner alone.
            if (c.part == part) *c.point = *c.point + CGPointMake(dx, dy);
        } else if (hasShift(mods)) {
            // Every corner in proportion; on a rectangle (all factors 1) this is the plain
            // rule below with the aspect kept.
            const double fx = sameColumn ? c.xFactor : 1.0 - c.xFactor;
            const double fy = sameRow ? c.yFactor : 1.0 - c.yFactor;
            *c.point = *c.point + CGPointMake(dx * fx, dy * fy);
        } else {
            // The corner, its column's other corner in x, its row's in y: a rectangle stays
            // one, and the opposite corner stays put.
            *c.point = *c.point + CGPointMake(sameColumn ? dx : 0.0, sameRow ? dy : 0.0);
        }
    }
    if (hasOption(mods)) {
        // About the centre: the box moves back so that its centre stays where it was.
        double cx = 0.0, cy = 0.0;
        getBoxLimits(&_fourCornersTopLeft, &_fourCornersTopRight, &_fourCornersBottomLeft,
                     &_fourCornersBottomRight, nullptr, nullptr, &cx, &cy);
        const CGPoint back = CGPointMake(cx - _boxCenterX, cy - _boxCenterY);
        for (const Corner& c : corners) *c.point = *c.point - back;
    }
}

void TQCurveEditorViewBase::moveBoxSide(uint32_t part, double dx, double dy, uint64_t mods) {
    const bool horizontalSide = part == kTQBoxPartTopMiddle || part == kTQBoxPartBottomMiddle;
    // Shift widens the other axis by half the change on each side, keeping the aspect.
    double e = 0.0;
    if (boxKeepsAspect()) {
        switch (part) {
            case kTQBoxPartTopMiddle: e = _boxAspect * dy * 0.5; break;
            case kTQBoxPartBottomMiddle: e = -dy * _boxAspect * 0.5; break;
            case kTQBoxPartLeftMiddle: e = (dx / _boxAspect) * -0.5; break;
            default: e = (dx / _boxAspect) * 0.5; break;
        }
    }
    auto widen = [&] {
        if (horizontalSide) {
            _fourCornersBottomLeft.x -= e;
            _fourCornersTopLeft.x -= e;
            _fourCornersBottomRight.x += e;
            _fourCornersTopRight.x += e;
        } else {
            _fourCornersTopRight.y += e;
            _fourCornersTopLeft.y += e;
            _fourCornersBottomRight.y -= e;
            _fourCornersBottomLeft.y -= e;
        }
    };
    // The side's own two corners, and the opposite side's, along the drag's axis.
    CGPoint *nearA = nullptr, *nearB = nullptr, *farA = nullptr, *farB = nullptr;
    switch (part) {
        case kTQBoxPartTopMiddle:
            nearA = &_fourCornersTopLeft, nearB = &_fourCornersTopRight;
            farA = &_fourCornersBottomLeft, farB = &_fourCornersBottomRight;
            break;
        case kTQBoxPartBottomMiddle:
            nearA = &_fourCornersBottomLeft, nearB = &_fourCornersBottomRight;
            farA = &_fourCornersTopLeft, farB = &_fourCornersTopRight;
            break;
        case kTQBoxPartLeftMiddle:
            nearA = &_fourCornersTopLeft, nearB = &_fourCornersBottomLeft;
            farA = &_fourCornersTopRight, farB = &_fourCornersBottomRight;
            break;
        default:
            nearA = &_fourCornersTopRight, nearB = &_fourCornersBottomRight;
            farA = &_fourCornersTopLeft, farB = &_fourCornersBottomLeft;
            break;
    }
    const CGPoint step = horizontalSide ? CGPointMake(0.0, dy) : CGPointMake(dx, 0.0);
    *nearA = *nearA + step;
    *nearB = *nearB + step;
    if (hasShift(mods)) widen();
    if (hasOption(mods)) {
        // Option mirrors the change on the opposite side; with Shift as well the widening
        // is applied a second time, as it always was.
        if (hasShift(mods)) widen();
        *farA = *farA - step;
        *farB = *farB - step;
    }
}

void TQCurveEditorViewBase::moveBoxInside(const CGPoint& world, double dx, double dy,
                                          uint64_t mods) {
    CGPoint step = CGPointMake(dx, dy);
    if (!hasShift(mods)) {
        _constrainMove = TQConstrainDirection::kUndecided;
    } else {
        // Shift holds the move to the axis of the larger distance from the press, decided
        // once until Shift is released (the point constrainMove answers is not needed).
        if (_constrainMove == TQConstrainDirection::kUndecided)
            constrainMove(getPointScreen(world), _mouseOrigin);
        if (_constrainMove == TQConstrainDirection::kHorizontal)
            step.y = 0.0;
        else
            step.x = 0.0;
    }
    for (CGPoint* c : {&_fourCornersBottomLeft, &_fourCornersBottomRight, &_fourCornersTopRight,
                       &_fourCornersTopLeft})
        *c = *c + step;
}

// ---- Drawing -------------------------------------------------------------------------------

void TQCurveEditorViewBase::drawFourCornerBox() {
    const HXDColor colour = drawingColor(selectionColor());
    const HXDBlendingInfo blending = HXDDataType::sourceOneMinusSourceBlendingInfo();
    auto vertex = [](const CGPoint& p) {
        return HXDFloat3{static_cast<float>(p.x), static_cast<float>(p.y), 0.0f};
    };
    const HXDFloat3 bl = vertex(_fourCornersBottomLeft);
    const HXDFloat3 tl = vertex(_fourCornersTopLeft);
    const HXDFloat3 tr = vertex(_fourCornersTopRight);
    const HXDFloat3 br = vertex(_fourCornersBottomRight);

    const HXDLineSegment segments[4] = {
        {bl, tl, colour},
        {tl, tr, colour},
        {tr, br, colour},
        {br, bl, colour},
    };
    auto outline = std::make_shared<HXDMultiline>(std::span<const HXDLineSegment>(segments));
    outline->setBlendingInfo(blending);
    outline->setAntialiased(true);
    outline->setLoop(true);
    outline->setLineJoin(0);
    _primitives.push_back(std::move(outline));

    // The inside takes clicks and is not seen.
    auto inside = std::make_shared<HXDMesh>(
        kTQBoxPartInside, HXDBrush{0, colour},
        std::vector<HXDSubmesh>{
            HXDSubmesh({{bl.x, bl.y}, {tl.x, tl.y}, {tr.x, tr.y}, {br.x, br.y}})});
    inside->setBlendingInfo(blending);
    inside->setWireframe(false);
    _selectionPrimitives.push_back(std::move(inside));

    const double pixels = kHandlePoints * windowBackingScale();
    const CGPoint size = worldSizeOfPixels(pixels, pixels);
    auto midpoint = [](const CGPoint& a, const CGPoint& b) {
        return CGPointMake(static_cast<float>((a.x + b.x) * 0.5),
                           static_cast<float>((a.y + b.y) * 0.5));
    };
    const std::pair<CGPoint, uint32_t> handles[8] = {
        {_fourCornersBottomLeft, kTQBoxPartBottomLeft},
        {_fourCornersTopLeft, kTQBoxPartTopLeft},
        {_fourCornersTopRight, kTQBoxPartTopRight},
        {_fourCornersBottomRight, kTQBoxPartBottomRight},
        {midpoint(_fourCornersBottomLeft, _fourCornersBottomRight), kTQBoxPartBottomMiddle},
        {midpoint(_fourCornersTopLeft, _fourCornersTopRight), kTQBoxPartTopMiddle},
        {midpoint(_fourCornersBottomRight, _fourCornersTopRight), kTQBoxPartRightMiddle},
        {midpoint(_fourCornersBottomLeft, _fourCornersTopLeft), kTQBoxPartLeftMiddle},
    };
    for (const auto& [centre, part] : handles) {
        auto handle = std::make_shared<HXDScreenspaceQuad>(
            CGRectMake(centre.x - size.x * 0.5, centre.y - size.y * 0.5, size.x, size.y), 0);
        handle->hitInfo().setHitID(part);
        handle->setColor(colour);
        handle->setBlendingInfo(blending);
        _primitives.push_back(handle);
        _selectionPrimitives.push_back(std::move(handle));
    }
}
