#include "src/editor/TQCurveEditorView.h"

#include <algorithm>
#include <cmath>
#include <cstdio>
#include <limits>

#include "platform/channels/TQChannelTypes.h"
#include "src/contract/TQCurveEditorAppDelegate.h"
#include "src/editor/TQCurveEditorCtrl.h"
#include "src/engine/TQEditBrackets.h"
#include "src/panels/TQTimecodeStrings.h"
#include "src/panels/TQTimingMoveController.h"

namespace {

// A finite, positive number of seconds, or nothing: the only steps and frames that can divide.
bool isPositiveSeconds(double seconds) { return seconds > 0.0 && std::isfinite(seconds); }

}  // namespace

TQCurveEditorView::TQCurveEditorView()
    : _timecodeFormatter(std::make_unique<RWTimecodeFormatter>()) {
    _lockInU = 0;
    _selectionViewVolume = CGRectZero;
    _currentViewVolume = kInitialViewVolume;
    _originalViewVolume = kInitialViewVolume;
    _gridSpacingY = kInitialViewVolume.size.height / kValueStepsPerHeight;
    _gridSpacingX = 1.0;
}

TQCurveEditorCtrl* TQCurveEditorView::editorController() const {
    return dynamic_cast<TQCurveEditorCtrl*>(_controller);
}

CMTime TQCurveEditorView::frameDuration() const {
    TQCurveEditorAppDelegate* delegate = _controller ? _controller->appDelegate() : nullptr;
    return delegate ? delegate->getFrameDuration() : CMTime{};
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

// ---- Horizontal volume ---------------------------------------------------------------------

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

void TQCurveEditorView::takePointsPerSecond() {
    const double width = _currentViewVolume.size.width;
    const double points = bounds().size.width;
    // Without a width on either side the factor stays: text placement divides by it.
    if (isPositiveSeconds(width) && points > 0.0) _zoomFactorX = points / width;
}

void TQCurveEditorView::zoom(double dx, double y) {
    TQCurveEditorViewBase::zoom(dx, y);
    takePointsPerSecond();
}

void TQCurveEditorView::zoomWithFactor(double fx, double y) {
    TQCurveEditorViewBase::zoomWithFactor(fx, y);
    takePointsPerSecond();
}

void TQCurveEditorView::frameAll(char includeTime) {
    TQCurveEditorViewBase::frameAll(includeTime);
    takePointsPerSecond();
}

void TQCurveEditorView::setDisplayRange(const CMTime* start, const CMTime* duration) {
    const CMTimeRange present = getDisplayRange();
    displayRangeModified(
        CMTimeRangeMake(start ? *start : present.start, duration ? *duration : present.duration));
}

void TQCurveEditorView::displayRangeModified(CMTimeRange range) {
    TQCurveEditorViewBase::setDisplayRange(&range.start, &range.duration);
    takeHorizontalFromDisplayRange();
    // Points per second here, where the base's zoom operations set a ratio of widths; this
    // view puts its meaning back after them, since keypoint and value labels are nudged by
    // one point through it.
    takePointsPerSecond();
    if (_controller) _controller->currentViewVolumeChangedTo(&_currentViewVolume);
    TQCurveEditorAppDelegate* delegate = _controller ? _controller->appDelegate() : nullptr;
    _gridSpacingX = delegate ? CMTimeGetSeconds(delegate->secondsPerTextStep()) : 0.0;
    _selectionViewVolume = CGRectZero;
    setAllOriginalCurveDirty(1);
    setNeedsDisplay(1);
    if (_controller) _controller->displayRangeChangedTo(range);
}

// ---- Text ----------------------------------------------------------------------------------

BNString TQCurveEditorView::getCoordinates(const TQCurveEditorItem* item, const CMTime& time,
                                           double value) const {
    TQCurveEditorAppDelegate* delegate = _controller ? _controller->appDelegate() : nullptr;
    const CMTime frame = frameDuration();
    const double frameSeconds = CMTimeGetSeconds(frame);
    if (!delegate || !isPositiveSeconds(frameSeconds))
        return TQCurveEditorViewBase::getCoordinates(item, time, value);

    char timeText[64];
    if (delegate->shouldDisplayTimeAsFrames()) {
        const double frames = CMTimeGetSeconds(time) / frameSeconds;
        std::snprintf(timeText, sizeof timeText, "%4.1f", frames + delegate->firstFrameNumber());
    } else {
        const CMTime start = frame * static_cast<unsigned>(delegate->startTimecode());
        const std::optional<std::string> timecode =
            TarnTimeAndDropToTimecodeString(BN_CMTimeSaferAdd(time, start), frame, 0);
        if (!timecode) return TQCurveEditorViewBase::getCoordinates(item, time, value);
        std::snprintf(timeText, sizeof timeText, "%s", timecode->c_str());
    }

    char text[160];
    const TQChannel* channel = item ? item->channel() : nullptr;
    if (dynamic_cast<const TQChannelDecibel*>(channel))
        std::snprintf(text, sizeof text, "(%s,%.f)", timeText, BN_UIAmplitudeToDecibels(value));
    else
        std::snprintf(text, sizeof text, "(%s,%4.1f)", timeText, value);
    return BNString(text);
}

// ---- Frame ---------------------------------------------------------------------------------

void TQCurveEditorView::drawGrid() {
    const CGRect b = bounds();
    const double scale = windowBackingScale();
    const CGSize backing = CGSizeMake(b.size.width * scale, b.size.height * scale);
    const CGPoint p0 = getPointWorld(b.origin);
    const CGPoint p1 =
        getPointWorld(CGPointMake(b.origin.x + backing.width, b.origin.y + backing.height));
    const float r = static_cast<float>(p1.x);
    if (!(r >= 0.0f)) return;
    // A step of zero (or none) would never reach the right edge.
    if (!isPositiveSeconds(_gridSpacingX)) return;

    // Lines fall on whole seconds whatever the step (x is rounded below), so a step under a
    // second draws the lines of a one-second step, and lines left of the view are not drawn.
    const float step = static_cast<float>(std::max(_gridSpacingX, 1.0));
    const double firstVisible = std::max(0.0, std::floor(p0.x / step) - 1.0);
    const HXDColor color = drawingColor(gridColor());
    const float top = static_cast<float>(p1.y);
    const float bottom = static_cast<float>(p0.y);
    double lastColumn = -std::numeric_limits<double>::infinity();
    for (float t = static_cast<float>(firstVisible * step); t <= r;) {
        double x = adjustWorldPointToScreen(CGPointMake(t, 0.0)).x;
        x = static_cast<float>(static_cast<int64_t>(std::floor(x + 0.5 + 1e-7)));
        // Whole seconds closer than a pixel share a column: one line shows them all.
        const double column = std::floor(getPointScreen(CGPointMake(x, 0.0)).x);
        if (column != lastColumn) {
            lastColumn = column;
            auto line =
                HXDLine::lineFromStart({static_cast<float>(x), top, 0.0f},
                                       {static_cast<float>(x), bottom, 0.0f}, 1.0f, color, false);
            line->setStippled(true);
            _primitives.push_back(std::move(line));
        }
        const float next = t + step;
        if (!(next > t)) break;  // beyond float precision the walk would stand still
        t = next;
    }
}

void TQCurveEditorView::drawCurveUnits() {
    if (!_controller) return;
    CGRect b = bounds();
    const double scale = windowBackingScale();
    b.size = CGSizeMake(b.size.width * scale, b.size.height * scale);
    b.origin.x += scale * kUnitsMargin;
    b.size.width -= scale * kUnitsMargin;
    if (_controller->numberOfEnabledChannels() == 0) return;

    const CGPoint l = getPointWorld(b.origin);
    const double top = getPointWorld(CGPointMake(kUnitsTopInset, b.origin.y + b.size.height)).y;
    const double step = _gridSpacingY * _gridZoomY;
    if (!(step > 0.0) || !std::isfinite(step) || !std::isfinite(l.y) || !std::isfinite(top)) return;
    double y =
        l.y > 0.0 ? std::floor(l.y / step + 1e-7) * step : -std::floor(-l.y / step + 1e-7) * step;

    // Labels are for a single shown channel (_printScale), and name its values.
    const TQCurveEditorItemPtr item = _controller->selectedChannel();
    auto* channelItem = dynamic_cast<TQCurveEditorChannelItem*>(item.get());
    if (!_printScale || !channelItem || !channelItem->isEnabledItem()) return;
    if (_zoomFactorX == 0.0 || _zoomFactorY == 0.0) return;
    const CGPoint nudge = CGPointMake(1.0 / _zoomFactorX, 1.0 / _zoomFactorY);
    // One label per pixel row at most, whatever the step.
    for (double rows = 0.0; y < top && rows <= b.size.height; y += step, rows += 1.0) {
        const std::optional<BNString> text =
            getScale(channelItem, channelItem->offsetY() + channelItem->scaleY() * y);
        if (text) metalPrint(*text, CGPointMake(l.x + nudge.x, y + nudge.y));
    }
}

void TQCurveEditorView::drawOverlays(const CGRect& bounds) {
    drawEndpoints();
    if (_snapCursor) drawMarkers(bounds);
    TQCurveEditorViewBase::drawOverlays(bounds);
}

void TQCurveEditorView::drawEndpoints() {
    if (!_controller) return;
    _endpointRanges.clear();
    auto addExtentOf = [this](const TQCurveEditorItemPtr& item) {
        TQChannelBase* channel = item ? item->channelBase() : nullptr;
        const TQChannelBase* root = channel ? channel->getChannelRoot() : nullptr;
        if (!root) return;
        const BNTimeRange extent = root->timeExtent();
        if (std::find(_endpointRanges.begin(), _endpointRanges.end(), extent) ==
            _endpointRanges.end())
            _endpointRanges.push_back(extent);
    };
    if (_controller->numberOfSelectedChannels() != 0) {
        for (const TQCurveEditorItemPtr& item : _controller->selectedChannels()) addExtentOf(item);
    } else if (_controller->numberOfRootItems() == 1) {
        if (const TQCurveSetPtr& set = _controller->selectedCurveSet())
            addExtentOf(set->rootItemAtIndex(0));
    }
    if (_endpointRanges.empty()) return;

    // Points, not drawable pixels: on a backing scale of 2 the lines stop at half height, as
    // they always have.
    const CGRect b = bounds();
    const float y0 = static_cast<float>(getPointWorld(b.origin).y);
    const float y1 = static_cast<float>(
        getPointWorld(CGPointMake(b.origin.x + b.size.width, b.origin.y + b.size.height)).y);
    const HXDColor color = drawingColor(endpointsColor());
    const CMTime frame = frameDuration();
    auto lineAt = [&](const CMTime& time) {
        const auto x = static_cast<float>(CMTimeGetSeconds(time));
        _primitives.push_back(
            HXDLine::lineFromStart({x, y1, 0.0f}, {x, y0, 0.0f}, 1.0f, color, false));
    };
    for (const BNTimeRange& range : _endpointRanges) {
        lineAt(range.start);
        lineAt(BN_CMTimeSaferSubtract(BN_CMTimeSaferAdd(range.start, range.duration), frame));
    }
}

void TQCurveEditorView::getCurveSnapshot(TQCurveEditorItem* item) {
    const CMTimeRange range = getDisplayRange();
    if (!_controller || !item || !item->channel()) return;
    const auto* channelItem = dynamic_cast<const TQCurveEditorChannelItem*>(item);
    const unsigned n = channelItem ? channelItem->numberOfSamples() : 0;
    if (n == 0 || !isPositiveSeconds(CMTimeGetSeconds(range.duration))) return;
    const CMTime resolution =
        TQTarnTimeForChannelSeconds(CMTimeGetSeconds(range.duration) / n, kTQCurveEditorTimescale);
    const double* samplesV = nullptr;
    unsigned number = n;
    _controller->getSamples(item, 0, range.start, resolution, nullptr, &samplesV, &number);
}

void TQCurveEditorView::currentFrameChanged() {
    if (!CGRectIsEmpty(_lastTimeRect)) setNeedsDisplayInRect(_lastTimeRect);
    const CGRect b = bounds();
    const double y0 = getPointWorld(b.origin).y;
    const double y1 =
        getPointWorld(CGPointMake(b.origin.x + b.size.width, b.origin.y + b.size.height)).y;
    const double x = CMTimeGetSeconds(getCurveEditorCurrentTime());
    // World values in a rectangle of view points, y1 as the height: the old column's
    // rectangle, as hosts have always received it.
    _lastTimeRect = CGRectMake(x, y0, 1.0, y1);
    setNeedsDisplayInRect(_lastTimeRect);
}

// ---- Keys ----------------------------------------------------------------------------------

bool TQCurveEditorView::openTimingMoveWithEvent(const RWEvent* event, const CGRect& parentRect,
                                                double* timeValue, char* timeIsDelta) {
    bool isDelta = timeIsDelta && *timeIsDelta != 0;
    const bool accepted =
        TQTimingMoveController::openWithEvent(event, parentRect, timeValue, &isDelta);
    if (timeIsDelta) *timeIsDelta = isDelta ? 1 : 0;
    return accepted;
}

bool TQCurveEditorView::keyDown(const RWEvent& event) {
    const std::string& characters = event.characters();
    const char c = characters.empty() ? '\0' : characters[0];
    // Every other key goes to the next responder (the space bar's repeat included: this view
    // has never passed keys to the base's handler).
    if (!((c >= '0' && c <= '9') || c == '-' || c == '+')) return false;
    if (!hasSelectedKeypoint()) return true;
    // A sign asks for a move by the typed number of frames; a digit for a move to a frame.
    char isDelta = (c == '-' || c == '+') ? 1 : 0;
    double value = 0.0;
    if (!openTimingMoveWithEvent(&event, timingMoveParentRect(), &value, &isDelta)) return true;
    moveSelectedKeypointsInTime(value, isDelta != 0);
    return true;
}

bool TQCurveEditorView::hasSelectedKeypoint() {
    if (!_controller) return false;
    _controller->validateSelection(_selection.get());
    for (const TQCurveSelectionPtr& entry : _selection->getSelectionArray())
        if (entry && entry->isKeypoint()) return true;
    return false;
}

CGRect TQCurveEditorView::timingMoveParentRect() const {
    CGRect frame = bounds();
    frame.origin.y += frame.size.height;
    return _viewHost ? _viewHost->convertRectToScreen(frame).value_or(CGRectZero) : CGRectZero;
}

void TQCurveEditorView::moveSelectedKeypointsInTime(double frames, bool isDelta) {
    TQCurveEditorCtrl* controller = editorController();
    if (!controller || !std::isfinite(frames)) return;
    TQCurveSelectionList* list = _selection.get();
    const CMTime time = frameDuration() * frames;
    {
        const TQCaptureGuard capture(controller->appDelegate(), "Undo Move Keypoint");
        controller->willModify(list);
        controller->willModifyValue(list);
        if (isDelta)
            controller->moveSelectedInTime(list, time);
        else
            controller->moveSelectedInTimeTo(list, time);
    }
    // The announcements left open on purpose: this command has always closed with will...,
    // not did..., after the step.
    controller->willModifyValue(list);
    controller->willModify(list);
    postNotification(kTQNotifyChannelsChanged);
}

void TQCurveEditorView::mouseDownSketch(const RWEvent& event) {
    if (_controller && _controller->numberOfSelectedChannels() != 0)
        TQCurveEditorViewBase::mouseDownSketch(event);
}
