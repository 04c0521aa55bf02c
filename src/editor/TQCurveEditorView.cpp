#include "src/editor/TQCurveEditorView.h"

#include "src/contract/TQCurveEditorAppDelegate.h"
#include "src/engine/TQCurveEditorCtrlBase.h"

TQCurveEditorView::TQCurveEditorView()
    : _timecodeFormatter(std::make_unique<RWTimecodeFormatter>()) {
    _lockInU = 0;
    _selectionViewVolume = CGRectZero;
    _currentViewVolume = kInitialViewVolume;
    _originalViewVolume = kInitialViewVolume;
    _gridSpacingY = kInitialViewVolume.size.height / kValueStepsPerHeight;
    _gridSpacingX = 1.0;
}

void TQCurveEditorView::setShowAudio(char show) {
    _showAudio = show;
    setNeedsDisplay(1);
}

void TQCurveEditorView::setInitialTime(const CMTimeRange* range) {
    if (!range) return;
    _originalViewVolume.origin.x = CMTimeGetSeconds(range->start);
    _originalViewVolume.size.width = CMTimeGetSeconds(range->duration);
}

void TQCurveEditorView::resetZoomX() {
    TQCurveEditorViewBase::resetZoomX();
    if (_controller)
        _controller->didSetViewContentsHorizontalOrigin(_currentViewVolume.origin.x,
                                                        _currentViewVolume.size.width);
}

void TQCurveEditorView::resetPanX() {
    TQCurveEditorViewBase::resetPanX();
    // The position is passed as the offset: the shift equals the reset position.
    if (_controller) _controller->didSetViewContentsHorizontalOffset(_currentViewVolume.origin.x);
}

void TQCurveEditorView::setDisplayRange(const CMTime* start, const CMTime* duration) {
    const CMTimeRange present = getDisplayRange();
    displayRangeModified(
        CMTimeRangeMake(start ? *start : present.start, duration ? *duration : present.duration));
}

void TQCurveEditorView::displayRangeModified(CMTimeRange range) {
    TQCurveEditorViewBase::setDisplayRange(&range.start, &range.duration);
    takeHorizontalFromDisplayRange();
    // Points per second here, where the zoom operations set a ratio of widths: whichever ran
    // last holds.
    _zoomFactorX = bounds().size.width / _currentViewVolume.size.width;
    if (_controller) _controller->currentViewVolumeChangedTo(&_currentViewVolume);
    TQCurveEditorAppDelegate* delegate = _controller ? _controller->appDelegate() : nullptr;
    _gridSpacingX = delegate ? CMTimeGetSeconds(delegate->secondsPerTextStep()) : 0.0;
    _selectionViewVolume = CGRectZero;
    setAllOriginalCurveDirty(1);
    setNeedsDisplay(1);
    if (_controller) _controller->displayRangeChangedTo(range);
}

void TQCurveEditorView::mouseDownSketch(const RWEvent& event) {
    if (_controller && _controller->numberOfSelectedChannels() != 0)
        TQCurveEditorViewBase::mouseDownSketch(event);
}
