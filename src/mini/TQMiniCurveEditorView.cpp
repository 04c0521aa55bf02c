#include "src/mini/TQMiniCurveEditorView.h"

#include <cmath>

#include "src/engine/TQCurveEditorCtrlBase.h"

TQMiniCurveEditorView::TQMiniCurveEditorView() {
    _selectionViewVolume = CGRectZero;
    _currentViewVolume = kInitialViewVolume;
    _originalViewVolume = kInitialViewVolume;
    _gridSpacingY = kInitialViewVolume.size.height / 5.0;
    _gridSpacingX = (kInitialViewVolume.size.width - 2.0 * kRangeMargin) / 10.0;
    _minDeltaU = 0.001;
    const CMTime start = kCMTimeZero;
    const CMTime oneSecond = CMTimeMake(1, 1);
    TQCurveEditorViewBase::setDisplayRange(&start, &oneSecond);
    setTotalRange(&start, &oneSecond);
    _shouldDrawProcessedCurve = 0;
}

void TQMiniCurveEditorView::update() {
    if (_controller) {
        _controller->validateSelection(_selection.get());
        _controller->cleanSelection(_selection.get());
    }
    if (_selection->empty()) {
        _fourCornerBoxInitialized = 0;
        _fourCornersBottomLeft = CGPointZero;
        _fourCornersBottomRight = CGPointZero;
        _fourCornersTopLeft = CGPointZero;
        _fourCornersTopRight = CGPointZero;
    }
    setNeedsDisplay(1);
}

void TQMiniCurveEditorView::reset() {
    _fourCornerBoxInitialized = 0;
    _selection->reset();
}

void TQMiniCurveEditorView::mouseDown(const RWEvent& event) {
    if (_isEnabled) TQCurveEditorViewBase::mouseDown(event);
}
void TQMiniCurveEditorView::mouseDragged(const RWEvent& event) {
    if (_isEnabled) TQCurveEditorViewBase::mouseDragged(event);
}
void TQMiniCurveEditorView::mouseUp(const RWEvent& event) {
    if (_isEnabled) TQCurveEditorViewBase::mouseUp(event);
}
void TQMiniCurveEditorView::scrollWheel(const RWEvent& event) {
    if (_isEnabled) TQCurveEditorViewBase::scrollWheel(event);
}
RWMenuPtr TQMiniCurveEditorView::menuForEvent(const RWEvent& event) {
    return _isEnabled ? TQCurveEditorViewBase::menuForEvent(event) : nullptr;
}

void TQMiniCurveEditorView::setCurrentViewVolume(const CGRect& volume) {
    TQCurveEditorViewBase::setCurrentViewVolume(volume);
    if (std::fabs(volume.size.width) >= kTQZeroTolerance)
        _zoomFactorX = _originalViewVolume.size.width / volume.size.width;
    setAllOriginalCurveDirty(1);
}

// ---- Grid ----------------------------------------------------------------------------------

void TQMiniCurveEditorView::addGridLine(CGPoint from, CGPoint to, HXDColor color) {
    const CGPoint a = adjustWorldPointToScreen(from);
    const CGPoint b = adjustWorldPointToScreen(to);
    auto line = HXDLine::lineFromStart({static_cast<float>(a.x), static_cast<float>(a.y), 0.0f},
                                       {static_cast<float>(b.x), static_cast<float>(b.y), 0.0f},
                                       1.0f, color, false);
    line->setStippled(true);
    _primitives.push_back(std::move(line));
}

void TQMiniCurveEditorView::drawGridColumns(double left, double right, double bottom, double top,
                                            HXDColor color) {
    // A step that cannot advance would never leave the view.
    if (!(_gridSpacingX > kTQZeroTolerance)) return;
    double up = 0.0;
    double down = 0.0;
    do {
        addGridLine(CGPointMake(up, bottom), CGPointMake(up, top), color);
        addGridLine(CGPointMake(down, bottom), CGPointMake(down, top), color);
        up += _gridSpacingX;
        down -= _gridSpacingX;
    } while (up <= right || down >= left);
}

void TQMiniCurveEditorView::drawGridRows(double left, double right, double bottom, double top,
                                         HXDColor color) {
    auto set = _controller ? _controller->selectedCurveSet() : nullptr;
    const TQCurveEditorItemPtr held = set ? set->channeItemAtIndex(0) : nullptr;
    const auto* item = dynamic_cast<const TQCurveEditorChannelItem*>(held.get());
    const double step = _gridSpacingY * _gridZoomY;
    if (!item || !(step > kTQZeroTolerance)) return;
    double up = 0.0;
    double down = 0.0;
    do {
        // 0 once: the lower run starts on it too.
        const bool lowerToo = std::fabs(up - down) >= kTQZeroTolerance;
        for (const double y : {up, down}) {
            if (y < bottom || y > top) continue;
            addGridLine(CGPointMake(left, y), CGPointMake(right, y), color);
            if (auto label = getScale(item, y * item->scaleY() + item->offsetY()))
                metalPrint(*label, CGPointMake(left, y));
            if (!lowerToo) break;
        }
        up += step;
        down -= step;
    } while (up <= top || down >= bottom);
}

void TQMiniCurveEditorView::drawGrid() {
    const CGPoint lowerLeft = getPointWorld(CGPointZero);
    const CGPoint upperRight =
        getPointWorld(CGPointMake(_drawableSize.width, _drawableSize.height));
    if (!std::isfinite(lowerLeft.x) || !std::isfinite(upperRight.x)) return;
    const HXDColor color = drawingColor(gridColor());
    drawGridColumns(lowerLeft.x, upperRight.x, lowerLeft.y, upperRight.y, color);
    if (_controller && _controller->numberOfEnabledChannels() != 0)
        drawGridRows(lowerLeft.x, upperRight.x, lowerLeft.y, upperRight.y, color);
}
