#include "src/view/TQCurveEditorViewBase.h"

#include <cmath>
#include <cstdint>

#include "platform/channels/TQChannel.h"
#include "platform/geometry/BNViewProjection.h"
#include "src/contract/TQCurveEditorAppDelegate.h"
#include "src/curvesets/TQCurveSet.h"
#include "src/data/TQCurveEditorItem.h"
#include "src/engine/TQCurveEditorCtrlBase.h"

namespace {

// 2^floor(log2(x)): the power of two at or below x.
double powerOfTwoBelow(double x) { return std::exp2(std::floor(std::log2(x))); }

}  // namespace

TQCurveEditorViewBase::TQCurveEditorViewBase()
    : _selection(std::make_shared<TQCurveSelectionList>()),
      _currentSelection(std::make_shared<TQCurveSelectionList>()),
      _previousSelection(std::make_shared<TQCurveSelectionList>()) {}

TQCurveEditorViewBase::~TQCurveEditorViewBase() {
    // A drag still under way ends here: its undo step closes while the selection it
    // announced is still alive.
    closeDragCapture();
    // The host would report pointer moves to a dead view.
    if (_viewHost && _trackingArea) _viewHost->removeTrackingArea(*_trackingArea);
    // A controller that still points here would call a dead view at its next update.
    if (_controller && _controller->getView() == this) _controller->setView(nullptr);
}

void TQCurveEditorViewBase::setController(TQCurveEditorCtrlBase* controller) {
    if (controller != _controller) closeDragCapture();
    _controller = controller;
}

// ---- Wiring, size and backing --------------------------------------------------------------

void TQCurveEditorViewBase::setViewHost(RWViewHost* host) {
    if (host == _viewHost) {
        viewDidChangeBackingProperties();
        return;
    }
    if (_viewHost && _trackingArea) _viewHost->removeTrackingArea(*_trackingArea);
    _trackingArea.reset();
    _viewHost = host;
    viewDidChangeBackingProperties();
    updateTrackingAreas();
}

RWClock& TQCurveEditorViewBase::clock() const {
    return _clock ? *_clock : *RWApplicationServices().clock;
}

RWTimerService& TQCurveEditorViewBase::timer() const {
    return _timer ? *_timer : *RWApplicationServices().timer;
}

CGRect TQCurveEditorViewBase::bounds() const {
    return _viewHost ? _viewHost->bounds() : CGRectZero;
}

void TQCurveEditorViewBase::setFrameSize(const CGSize&) {
    // The host has already resized its widget; only the backing and the tracking follow.
    viewDidChangeBackingProperties();
    updateTrackingAreas();
}

void TQCurveEditorViewBase::viewDidChangeBackingProperties() {
    if (!_viewHost || !_viewHost->hasWindow()) return;
    const double scale = _viewHost->backingScaleFactor();
    const CGSize size = _viewHost->bounds().size;
    _drawableSize = CGSizeMake(size.width * scale, size.height * scale);
    _contentsScale = scale;
}

// ---- Projection and mapping ----------------------------------------------------------------

// drawProjection is part of the frame: TQCurveEditorViewDraw.cpp.

namespace {
// The projection of the last frame; the zero matrix before the first (conversions then
// answer NaN, as they do on a view that has not drawn).
BNMatrix44f lastProjection(const HXDRenderController* controller) {
    const HXDRenderingContext* context = controller ? controller->renderingContext() : nullptr;
    return context ? context->projection() : BNMatrix44f::zero();
}
}  // namespace

CGPoint TQCurveEditorViewBase::getPointWorld(const CGPoint& screen) const {
    return BNProjectionScreenToWorld(lastProjection(_renderController.get()), _drawableSize,
                                     screen);
}

CGPoint TQCurveEditorViewBase::getPointScreen(const CGPoint& world) const {
    return BNProjectionWorldToScreen(lastProjection(_renderController.get()), _drawableSize, world);
}

CGPoint TQCurveEditorViewBase::getSizeWorld(const CGPoint& size) const {
    return getPointWorld(size) - getPointWorld(CGPointZero);
}

CGPoint TQCurveEditorViewBase::getSizeScreen(const CGPoint& size) const {
    return getPointScreen(size) - getPointScreen(CGPointZero);
}

CGPoint TQCurveEditorViewBase::adjustWorldPointToScreen(const CGPoint& world) const {
    const CGPoint s = getPointScreen(world);
    // Truncation to 32 bits is guarded: a NaN or out-of-range pixel (no frame yet) stays as
    // it is instead of being converted, which would be undefined.
    auto snap = [](double c) {
        const double f = std::floor(c + 0.5 + kTQZeroTolerance);
        if (!(f >= static_cast<double>(INT32_MIN) && f <= static_cast<double>(INT32_MAX))) return f;
        return static_cast<double>(static_cast<int32_t>(f));
    };
    return getPointWorld(CGPointMake(snap(s.x), snap(s.y)));
}

CGPoint TQCurveEditorViewBase::getOffsetFromLastWorld(double dx, double deltaY) const {
    return getPointWorld(_lastMousePos + CGPointMake(dx, deltaY)) - getPointWorld(_lastMousePos);
}

CGPoint TQCurveEditorViewBase::getOffsetFromOriginWorld(double dx, double deltaY) const {
    return getPointWorld(_lastMousePos + CGPointMake(dx, deltaY)) - getPointWorld(_mouseOrigin);
}

// ---- Notifications and shared steps ----------------------------------------------------------

void TQCurveEditorViewBase::postNotification(TQNotificationWord word) const {
    if (!_controller) return;
    if (TQCurveEditorAppDelegate* delegate = _controller->appDelegate())
        delegate->postNotification(word);
}

void TQCurveEditorViewBase::volumeChanged(bool markCurvesDirty) {
    if (_controller) _controller->currentViewVolumeChangedTo(&_currentViewVolume);
    postNotification(kTQNotifyViewVolumeChanged);
    if (markCurvesDirty) setAllOriginalCurveDirty(1);
}

void TQCurveEditorViewBase::takeHorizontalFromDisplayRange() {
    const CMTimeRange range = getDisplayRange();
    _currentViewVolume.origin.x = CMTimeGetSeconds(range.start);
    _currentViewVolume.size.width = CMTimeGetSeconds(range.duration);
}

// ---- Zoom ----------------------------------------------------------------------------------

void TQCurveEditorViewBase::zoom(double dx, double y) {
    const CGPoint a = getPointWorld(_mouseOrigin);
    const CGPoint o = getOffsetFromLastWorld(dx, -y);
    const CGRect c = _currentViewVolume;

    // Horizontal: the anchor keeps its fraction of the width; the controller decides.
    const double ax = a.x - c.origin.x;
    if (std::fabs(ax) >= kTQZeroTolerance) {
        const double r = (a.x + o.x * 0.5 - c.origin.x) / ax;
        double origin = 0.0;
        double duration = 0.0;
        if (std::fabs(r) >= kTQZeroTolerance) {
            duration = c.size.width / r;
            origin = a.x - (ax / c.size.width) * duration;
        }
        if (_controller) _controller->didSetViewContentsHorizontalOrigin(origin, duration);
    }

    // Vertical: the same about the anchor, limited by _maxZoomY (and not below: a drag may
    // take the zoom under 1/_maxZoomY, only the factor buttons clamp there).
    const double b = a.y - c.origin.y;
    if (std::fabs(b) >= kTQZeroTolerance) {
        const double f = b / c.size.height;
        const double r = (a.y + o.y * 0.5 - c.origin.y) / b;
        double newY = 0.0;
        double height = 0.0;
        if (std::fabs(r) >= kTQZeroTolerance) {
            height = c.size.height / r;
            newY = a.y - height * f;
        }
        // A zero height gives an infinite (or NaN) factor, which takes the limit branch.
        const double z = _originalViewVolume.size.height / height;
        if (z < _maxZoomY) {
            _zoomFactorY = z;
            _gridZoomY = z < 1.0 ? powerOfTwoBelow(1.0 / z) : 1.0 / powerOfTwoBelow(z);
        } else {
            _zoomFactorY = _maxZoomY;
            _gridZoomY = 1.0 / _maxZoomY;
            height = c.size.height;
            newY = a.y - c.size.height * f;
        }
        _currentViewVolume.origin.y = newY;
        _currentViewVolume.size.height = height;
    }

    takeHorizontalFromDisplayRange();
    _zoomFactorX = _originalViewVolume.size.width / _currentViewVolume.size.width;
    volumeChanged(true);
}

void TQCurveEditorViewBase::zoomWithFactor(double fx, double y) {
    double fy = y;
    if (std::fabs(fx - 1.0) >= kTQZeroTolerance) {
        const double duration = _originalViewVolume.size.width / fx;
        const double origin =
            _originalViewVolume.origin.x + _originalViewVolume.size.width * 0.5 - duration * 0.5;
        if (_controller) _controller->didSetViewContentsHorizontalOrigin(origin, duration);
        takeHorizontalFromDisplayRange();
        _zoomFactorX = _originalViewVolume.size.width / _currentViewVolume.size.width;
    }
    if (std::fabs(fy - 1.0) >= kTQZeroTolerance) {
        const double minZoom = 1.0 / _maxZoomY;
        fy = fy < minZoom ? minZoom : (fy > _maxZoomY ? _maxZoomY : fy);
        const CGRect c = _currentViewVolume;
        const double height = _originalViewVolume.size.height / fy;
        _currentViewVolume.origin.y = c.origin.y + c.size.height * 0.5 - height * 0.5;
        _currentViewVolume.size.height = height;
        _zoomFactorY = fy;
        // One formula for every factor here, unlike the drag zoom.
        _gridZoomY = powerOfTwoBelow(1.0 / fy);
    }
    volumeChanged(true);
}

void TQCurveEditorViewBase::setVerticalZoom(double zoom, double offsetPercentage) {
    if (!_controller) return;  // nothing defines the range the scroller spans
    const CGRect m = _controller->getMaxViewVolume();
    const double height = m.size.height * zoom;
    const double slack = (m.size.height - height) * offsetPercentage;
    _currentViewVolume.origin.y = m.size.height + m.origin.y - height - slack;
    _currentViewVolume.size.height = height;
    volumeChanged(true);
}

// ---- Pan -----------------------------------------------------------------------------------

void TQCurveEditorViewBase::pan(double dx, double y) {
    const CGPoint o = getOffsetFromLastWorld(-dx, -y);
    _currentViewVolume.origin.y -= o.y;
    // Never to the left of time zero: the whole horizontal part is dropped then.
    if (_currentViewVolume.origin.x + o.x > 0.0) {
        if (_controller) _controller->didSetViewContentsHorizontalOffset(o.x);
        _currentViewVolume.origin.x = CMTimeGetSeconds(getDisplayRange().start);
    }
    volumeChanged(true);
}

void TQCurveEditorViewBase::panWithPage(double px, double y) {
    if (!_controller) return;  // nothing defines the page
    const CGRect m = _controller->getMaxViewVolume();
    _currentViewVolume.origin.y += (m.size.height - _currentViewVolume.size.height) * y;
    const double offset = px * _currentViewVolume.size.width;
    if (_currentViewVolume.origin.x + offset > 0.0) {
        _controller->didSetViewContentsHorizontalOffset(offset);
        _currentViewVolume.origin.x = CMTimeGetSeconds(getDisplayRange().start);
    }
    volumeChanged(true);
}

void TQCurveEditorViewBase::scrollWheel(const RWEvent& event) {
    // Wheel events that are already waiting are folded into this one: one pan, one redraw.
    double sumX = event.deltaX();
    double sumY = event.deltaY();
    if (_viewHost) {
        for (;;) {
            const std::optional<RWEvent> next =
                _viewHost->nextEventMatchingMask(RWEventMaskScrollWheel);
            if (!next.has_value()) break;
            sumX += next->deltaX();
            sumY += next->deltaY();
        }
    }
    pan(4.0 * sumX, 4.0 * sumY);
    if (_controller) _controller->windowWasPanned(4.0 * sumY / _currentViewVolume.size.height);
    postNotification(kTQNotifyChannelsChanging);
}

// ---- Auto-zoom and framing -----------------------------------------------------------------

void TQCurveEditorViewBase::performAutoZoom(bool force) {
    if (!_needsAutoZoom && !force) return;
    if (!_controller || _controller->numberOfChannelItems() == 0) return;

    double bottom = 1e6;
    double top = -1e6;
    if (_controller->getCurrentTool() != TQTool::kBox || !_fourCornerBoxInitialized) {
        auto set = _controller->selectedCurveSet();
        if (set) {
            for (const TQCurveEditorItemPtr& item : set->allItems()) {
                auto* channelItem = dynamic_cast<TQCurveEditorChannelItem*>(item.get());
                if (!channelItem) continue;
                double lo = 0.0;
                double hi = 0.0;
                channelItem->extremes(&lo, &hi);
                bottom = std::fmin(bottom, _controller->convertFromChannelCoords(channelItem, lo));
                top = std::fmax(top, _controller->convertFromChannelCoords(channelItem, hi));
            }
        }
    } else {
        bottom = std::fmin(std::fmin(_fourCornersTopLeft.y, _fourCornersTopRight.y),
                           std::fmin(_fourCornersBottomLeft.y, _fourCornersBottomRight.y));
        top = std::fmax(std::fmax(_fourCornersTopLeft.y, _fourCornersTopRight.y),
                        std::fmax(_fourCornersBottomLeft.y, _fourCornersBottomRight.y));
    }

    CGRect& c = _currentViewVolume;
    if (std::fabs(bottom - top) < kTQZeroTolerance) {
        // Deliberately compares a vertical value with the horizontal edges: that is how the
        // flat case has always behaved, and views of one flat curve rely on it not zooming.
        if (bottom < c.origin.x)
            c.origin.y = bottom;
        else if (top > c.origin.x + c.size.width)
            c.origin.y = top - c.size.height;
    } else {
        const double h = c.size.height;
        const double o = _originalViewVolume.size.height;
        double s = h / (top - bottom);
        const double z = s * o / h;
        if (z > _maxZoomY)
            s = h * _maxZoomY / o;
        else if (z < 1.0 / _maxZoomY)
            s = h * (1.0 / _maxZoomY) / o;
        const double e = h / s;
        // Taken before the padding: with 0.05 the factor is 1.1 times the real ratio.
        _zoomFactorY = o / e;
        _gridZoomY = powerOfTwoBelow(1.0 / _zoomFactorY);
        const double p = getZoomPadding();
        c.size.height = e + e * 2.0 * p;
        c.origin.y = bottom - e * p;
    }
    _needsAutoZoom = 0;
    // No redraw and no word: the usual caller is the draw pass itself.
    _controller->currentViewVolumeChangedTo(&_currentViewVolume);
}

void TQCurveEditorViewBase::frameAll(char includeTime) {
    resetBoxDeformation();
    resetZoomY();
    resetPanY();
    if (!_controller || _controller->numberOfChannelItems() == 0) return;

    performAutoZoom(true);
    if (includeTime) {
        CMTime minT = kCMTimePositiveInfinity;
        CMTime maxT = kCMTimeZero;
        if (auto set = _controller->selectedCurveSet()) {
            for (const TQCurveEditorItemPtr& item : set->allItems()) {
                if (!item->isEnabledItem()) continue;
                TQChannel* channel = item->channel();
                if (!channel) continue;
                const CMTime offset = channel->timeOffset();
                const CMTime k0 = BN_CMTimeSaferAdd(channel->getKeyframeMinTime(), offset);
                const CMTime k1 = BN_CMTimeSaferAdd(channel->getKeyframeMaxTime(), offset);
                if (CMTimeCompare(k0, minT) < 0) minT = k0;
                if (CMTimeCompare(k1, maxT) > 0) maxT = k1;
            }
        }
        if (CMTimeCompare(minT, maxT) == 0) {
            // One keypoint time for all: the span falls back to the display range.
            const CMTimeRange range = getDisplayRange();
            minT = range.start;
            maxT = BN_CMTimeSaferAdd(range.start, range.duration);
        }
        const double span = CMTimeGetSeconds(BN_CMTimeSaferSubtract(maxT, minT));
        // Without an enabled keyframed item minT stays infinite; the fit would then make the
        // volume infinite and the view unusable, so the time axis is left as it is.
        if (std::isfinite(span)) {
            const CMTime pad = TQTarnTimeForChannelSeconds(span * 0.05, kTQCurveEditorTimescale);
            maxT = BN_CMTimeSaferAdd(maxT, pad);
            minT = BN_CMTimeSaferSubtract(minT, pad);
            const double ratio = _currentViewVolume.size.width /
                                 CMTimeGetSeconds(BN_CMTimeSaferSubtract(maxT, minT));
            if (std::fabs(ratio - 1.0) >= kTQZeroTolerance) {
                _currentViewVolume.size.width /= ratio;
                _zoomFactorX = _originalViewVolume.size.width / _currentViewVolume.size.width;
            }
            _currentViewVolume.origin.x = CMTimeGetSeconds(minT);
        }
        setAllOriginalCurveDirty(1);
    }
    _controller->currentViewVolumeChangedTo(&_currentViewVolume);
    postNotification(kTQNotifyViewVolumeChanged);
    setNeedsDisplay(1);
}

// ---- Resets --------------------------------------------------------------------------------

namespace {

// One axis of a rectangle, so that both axes are reset by the same lines.
struct VolumeAxis {
    double CGPoint::*origin;
    double CGSize::*extent;
};
constexpr VolumeAxis kTimeAxis{&CGPoint::x, &CGSize::width};
constexpr VolumeAxis kValueAxis{&CGPoint::y, &CGSize::height};

// The axis of `current` back to where `original` has it; its extent too with `extent`.
void resetAxis(CGRect& current, const CGRect& original, const VolumeAxis& axis, bool extent) {
    current.origin.*axis.origin = original.origin.*axis.origin;
    if (extent) current.size.*axis.extent = original.size.*axis.extent;
}

}  // namespace

void TQCurveEditorViewBase::resetZoomX() {
    _zoomFactorX = 1.0;
    _gridZoomX = 1.0;
    resetAxis(_currentViewVolume, _originalViewVolume, kTimeAxis, true);
    volumeReset(false);
}

void TQCurveEditorViewBase::resetZoomY() {
    _zoomFactorY = 1.0;
    _gridZoomY = 1.0;
    resetAxis(_currentViewVolume, _originalViewVolume, kValueAxis, true);
    volumeReset(false);
}

void TQCurveEditorViewBase::resetPanX() {
    resetAxis(_currentViewVolume, _originalViewVolume, kTimeAxis, false);
    volumeReset(false);
}

void TQCurveEditorViewBase::resetPanY() {
    resetAxis(_currentViewVolume, _originalViewVolume, kValueAxis, false);
    volumeReset(true);
}

void TQCurveEditorViewBase::volumeReset(bool ticksAgain) {
    if (_controller) _controller->currentViewVolumeChangedTo(&_currentViewVolume);
    // Only a vertical pan asks for the tick marks again, as it always has.
    if (ticksAgain) computeVerticalTickMarks();
    setAllOriginalCurveDirty(1);
}

void TQCurveEditorViewBase::resetZoom() {
    resetZoomY();
    resetZoomX();
    postNotification(kTQNotifyViewVolumeChanged);
}

void TQCurveEditorViewBase::resetPan() {
    resetPanY();
    resetPanX();
    postNotification(kTQNotifyViewVolumeChanged);
}

// ---- Plain state ---------------------------------------------------------------------------

void TQCurveEditorViewBase::setDisplayRange(const CMTime* start, const CMTime* duration) {
    if (start) _displayRange.start = *start;
    if (duration) _displayRange.duration = *duration;
}

void TQCurveEditorViewBase::setTotalRange(const CMTime* start, const CMTime* duration) {
    if (start) _totalRange.start = *start;
    if (duration) _totalRange.duration = *duration;
}

CMTime TQCurveEditorViewBase::currentTime() const {
    TQCurveEditorAppDelegate* delegate = _controller ? _controller->appDelegate() : nullptr;
    return delegate ? delegate->currentTime() : CMTime{};
}

void TQCurveEditorViewBase::setCurrentTime(const CMTime& time) {
    TQCurveEditorAppDelegate* delegate = _controller ? _controller->appDelegate() : nullptr;
    if (delegate) delegate->setCurrentTime(time);
}

// ---- Selection -----------------------------------------------------------------------------

TQCurveSelectionList* TQCurveEditorViewBase::getSelection() {
    prepareSelectedHandles();
    return _selection.get();
}

void TQCurveEditorViewBase::prepareSelectedHandles() {
    if (!_controller) return;
    for (const TQCurveSelectionPtr& entry : _selection->getSelectionArray()) {
        if (!entry) continue;
        TQCurveEditorItemPtr item = _controller->channelItemWithIdentifier(entry->getCurveId());
        TQChannel* channel = item ? item->channel() : nullptr;
        if (!channel) continue;
        CMTime time{};
        double value = 0.0;
        // A stale handle leaves the stored time and value for the repair by time.
        if (channel->getKeyframe(entry->getHandle(), &time, &value))
            entry->setKeypointUV(time, value);
    }
}

// ---- Redraw and dirty marks ----------------------------------------------------------------

void TQCurveEditorViewBase::setNeedsDisplay(char needs) {
    if (needs && _viewHost) _viewHost->setNeedsDisplay();
}

void TQCurveEditorViewBase::setNeedsDisplayInRect(const CGRect& rect) {
    if (_viewHost) _viewHost->setNeedsDisplayInRect(rect);
}

void TQCurveEditorViewBase::setOriginalCurveDirty(TQCurveEditorItem* item, char enable) {
    if (auto* channelItem = dynamic_cast<TQCurveEditorChannelItem*>(item))
        channelItem->setOriginalCurveDirty(enable);
}

void TQCurveEditorViewBase::setProcessedCurveDirty(TQCurveEditorItem* item, char enable) {
    if (auto* channelItem = dynamic_cast<TQCurveEditorChannelItem*>(item))
        channelItem->setProcessedCurveDirty(enable);
}

namespace {
template <class Fn>
void forEachChannelItem(TQCurveEditorCtrlBase* controller, Fn fn) {
    if (!controller) return;
    auto set = controller->selectedCurveSet();
    if (!set) return;
    for (const TQCurveEditorItemPtr& item : set->allItems())
        if (auto* channelItem = dynamic_cast<TQCurveEditorChannelItem*>(item.get()))
            fn(*channelItem);
}
}  // namespace

void TQCurveEditorViewBase::setVisibleOriginalCurveDirty(char dirty) {
    TQCurveEditorAppDelegate* delegate = _controller ? _controller->appDelegate() : nullptr;
    if (!delegate) return;
    forEachChannelItem(_controller, [&](TQCurveEditorChannelItem& item) {
        TQChannel* channel = item.channel();
        if (channel && delegate->wasChannelModified(channel)) item.setOriginalCurveDirty(dirty);
    });
}

void TQCurveEditorViewBase::setAllOriginalCurveDirty(char dirty) {
    forEachChannelItem(_controller,
                       [&](TQCurveEditorChannelItem& item) { item.setOriginalCurveDirty(dirty); });
}

void TQCurveEditorViewBase::setAllOriginalCurveScaleDirty(char dirty) {
    forEachChannelItem(_controller,
                       [&](TQCurveEditorChannelItem& item) { item.setUpdateScale(dirty); });
}

// ---- Tools ---------------------------------------------------------------------------------

void TQCurveEditorViewBase::currentToolChanged() {
    resetBoxDeformation();
    setNeedsDisplay(1);
    postNotification(kTQNotifyToolChangedWord);
}

void TQCurveEditorViewBase::resetBoxDeformation() {
    _fourCornerBoxInitialized = 0;
    _fourCornersTopLeft = CGPointZero;
    _fourCornersTopRight = CGPointZero;
    _fourCornersBottomLeft = CGPointZero;
    _fourCornersBottomRight = CGPointZero;
    _selectionViewVolume = CGRectZero;
}
