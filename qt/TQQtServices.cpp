#include "qt/TQQtServices.h"

#include <QCursor>
#include <QPainter>
#include <QPixmap>
#include <QTimer>
#include <QWindow>
#include <QtMath>

#include <chrono>
#include <cmath>
#include <optional>

#include "qt/TQQtImages.h"
#include "qt/TQQtScreen.h"
#include "src/resources/BNImage.h"

// ---- Clock --------------------------------------------------------------------------------

TQQtClock::TQQtClock() { _elapsed.start(); }

double TQQtClock::now() const { return static_cast<double>(_elapsed.nsecsElapsed()) * 1e-9; }

// ---- Timer --------------------------------------------------------------------------------

TQQtTimerService::TQQtTimerService() : _context(new QObject) {}

TQQtTimerService::~TQQtTimerService() { delete _context; }

void TQQtTimerService::dispatchAfter(uint64_t nanoseconds, std::function<void()> block) {
    if (!block) return;
    // Rounded up: "at least the given time from now".
    const auto delay =
        std::chrono::ceil<std::chrono::milliseconds>(std::chrono::nanoseconds(nanoseconds));
    QTimer::singleShot(delay, Qt::PreciseTimer, _context, [b = std::move(block)]() { b(); });
}

// ---- View host ------------------------------------------------------------------------------

TQQtViewHost::TQQtViewHost(QWidget* widget) : _widget(widget) {}

CGRect TQQtViewHost::bounds() const {
    if (!_widget) return CGRectZero;
    return CGRectMake(0.0, 0.0, _widget->width(), _widget->height());
}

double TQQtViewHost::backingScaleFactor() const {
    return _widget ? _widget->devicePixelRatioF() : 1.0;
}

bool TQQtViewHost::hasWindow() const {
    // A widget always has a top-level ancestor; it is in a window once that has a native
    // window, which happens when it is first shown.
    return _widget && _widget->window()->windowHandle() != nullptr;
}

void TQQtViewHost::setNeedsDisplay() {
    if (_widget) _widget->update();
}

void TQQtViewHost::displayNow() {
    // Painting runs only for a widget that is shown; a hidden one draws at its next show.
    if (_widget && _widget->isVisible())
        _widget->repaint();
    else
        setNeedsDisplay();
}

std::optional<CGRect> TQQtViewHost::convertRectToScreen(const CGRect& rect) const {
    if (!hasWindow()) return std::nullopt;
    // View points have y up from the widget's bottom edge.
    const QPoint topLeft = _widget->mapToGlobal(QPoint(0, 0));
    const double top = _widget->height() - (rect.origin.y + rect.size.height);
    const QRect global(static_cast<int>(std::lround(topLeft.x() + rect.origin.x)),
                       static_cast<int>(std::lround(topLeft.y() + top)),
                       static_cast<int>(std::lround(rect.size.width)),
                       static_cast<int>(std::lround(rect.size.height)));
    return TQQtScreenRectOfGlobalRect(global);
}

Qt::CursorShape TQQtViewHost::cursorShape(RWCursor cursor) {
    switch (cursor) {
        case RWCursor::Arrow: return Qt::ArrowCursor;
        case RWCursor::IBeam: return Qt::IBeamCursor;
        case RWCursor::PointingHand: return Qt::PointingHandCursor;
        case RWCursor::OpenHand: return Qt::OpenHandCursor;
        case RWCursor::ClosedHand: return Qt::ClosedHandCursor;
        case RWCursor::CrossHair: return Qt::CrossCursor;
        case RWCursor::ResizeLeftRight: return Qt::SizeHorCursor;
        case RWCursor::ResizeUpDown: return Qt::SizeVerCursor;
        case RWCursor::OperationNotAllowed: return Qt::ForbiddenCursor;
        case RWCursor::Move:
        case RWCursor::EditPoints:
        case RWCursor::CrossHairs:
        case RWCursor::Sketch:
        case RWCursor::PenAddControlPoint: return Qt::BitmapCursor;
        case RWCursor::ZoomIn: return Qt::BitmapCursor;
        case RWCursor::ZoomOut: return Qt::BitmapCursor;
    }
    return Qt::ArrowCursor;
}

namespace {

// A magnifying glass with a plus or a minus in the lens, dark lines on a light outline so it
// reads on the dark curve view and on light windows alike. Hot spot at the lens's centre.
QCursor magnifierCursor(bool plus, qreal ratio) {
    constexpr int kSize = 24;
    const QPointF centre(9.5, 9.5);
    constexpr qreal kRadius = 6.5;
    constexpr qreal kSign = 3.5;
    QPixmap pixmap(qCeil(kSize * ratio), qCeil(kSize * ratio));
    pixmap.setDevicePixelRatio(ratio);
    pixmap.fill(Qt::transparent);
    QPainter painter(&pixmap);
    painter.setRenderHint(QPainter::Antialiasing);
    painter.setPen(Qt::NoPen);
    painter.setBrush(QColor(255, 255, 255, 190));
    painter.drawEllipse(centre, kRadius, kRadius);
    const auto glass = [&](const QColor& colour, qreal width) {
        painter.setPen(QPen(colour, width, Qt::SolidLine, Qt::RoundCap));
        painter.setBrush(Qt::NoBrush);
        painter.drawEllipse(centre, kRadius, kRadius);
        painter.drawLine(QPointF(14.6, 14.6), QPointF(21.5, 21.5));
        painter.drawLine(centre - QPointF(kSign, 0.0), centre + QPointF(kSign, 0.0));
        if (plus) painter.drawLine(centre - QPointF(0.0, kSign), centre + QPointF(0.0, kSign));
    };
    glass(QColor(255, 255, 255), 3.6);
    glass(QColor(20, 20, 20), 1.6);
    painter.end();
    return QCursor(pixmap, qRound(centre.x()), qRound(centre.y()));
}

}  // namespace

const GDCursorImage* TQQtViewHost::resourceCursor(RWCursor cursor) {
    switch (cursor) {
        case RWCursor::Move: return &GDCursorMove;
        case RWCursor::EditPoints: return &GDCursorEditPoints;
        case RWCursor::CrossHairs: return &GDCursorCrossHairs;
        case RWCursor::Sketch: return &GDCursorSketch;
        case RWCursor::PenAddControlPoint: return &GDCursorPenAddControlPoint;
        default: return nullptr;
    }
}

namespace {

// The resource's image at the screen's scale (its 2x file above a ratio of 1), the hot spot in
// points as Qt takes it for a pixmap with a pixel ratio.
std::optional<QCursor> imageCursor(const GDCursorImage& cursor, qreal devicePixelRatio) {
    const double scale = devicePixelRatio > 1.0 ? 2.0 : 1.0;
    const auto image = BNImageForResource(cursor.name, scale);
    if (!image) return std::nullopt;
    QPixmap pixmap = QPixmap::fromImage(TQQtImage(*image));
    pixmap.setDevicePixelRatio(image->scale());
    return QCursor(pixmap, qRound(cursor.hotSpotX), qRound(cursor.hotSpotY));
}

}  // namespace

QCursor TQQtViewHost::qtCursor(RWCursor cursor, qreal devicePixelRatio) {
    switch (cursor) {
        case RWCursor::ZoomIn: return magnifierCursor(true, devicePixelRatio);
        case RWCursor::ZoomOut: return magnifierCursor(false, devicePixelRatio);
        default: break;
    }
    if (const GDCursorImage* resource = resourceCursor(cursor)) {
        if (auto drawn = imageCursor(*resource, devicePixelRatio)) return *drawn;
        // Resources without the image: the nearest shape of Qt's own.
        return QCursor(cursor == RWCursor::Move ? Qt::SizeAllCursor : Qt::CrossCursor);
    }
    return QCursor(cursorShape(cursor));
}

void TQQtViewHost::setCursor(RWCursor cursor) {
    _cursor = cursor;
    applyCursor();
}

void TQQtViewHost::setCursorHidden(bool hidden) {
    _cursorHidden = hidden;
    applyCursor();
}

void TQQtViewHost::applyCursor() {
    if (!_widget) return;
    if (_cursorHidden) {
        _widget->setCursor(Qt::BlankCursor);
        return;
    }
    if (cursorShape(_cursor) != Qt::BitmapCursor) {
        _widget->setCursor(cursorShape(_cursor));
        return;
    }
    // Drags and pointer moves ask for their cursor at every step: each image is made once per
    // pixel ratio.
    const qreal ratio = _widget->devicePixelRatioF();
    if (ratio != _imageCursorRatio) {
        for (auto& made : _imageCursors) made.reset();
        _imageCursorRatio = ratio;
    }
    std::optional<QCursor>& made = _imageCursors[static_cast<size_t>(_cursor)];
    if (!made) made = qtCursor(_cursor, ratio);
    _widget->setCursor(*made);
}

void TQQtViewHost::addTrackingArea(const RWTrackingAreaPtr& area) {
    if (area) _trackingAreas.push_back(area);
}

void TQQtViewHost::removeTrackingArea(const RWTrackingArea& area) {
    std::erase_if(_trackingAreas, [&](const RWTrackingAreaPtr& a) { return a.get() == &area; });
}

void TQQtViewHost::pointerMoved(const RWEvent& event) {
    if (!_widget) return;
    const CGPoint at = convertPointFromWindow(event.locationInWindow());
    const CGRect visible = bounds();
    // A copy: an owner may replace its area while it hears the move.
    const std::vector<RWTrackingAreaPtr> areas = _trackingAreas;
    for (const RWTrackingAreaPtr& area : areas)
        if ((area->options & RWTrackingCursorUpdate) && area->owner && area->contains(at, visible))
            area->owner->cursorUpdate(event);
}

CGPoint TQQtViewHost::convertPointFromWindow(const CGPoint& pointInWindow) const {
    if (!_widget) return pointInWindow;
    const QWidget* window = _widget->window();
    const QPointF inWindow(pointInWindow.x, window->height() - pointInWindow.y);
    const QPointF local = _widget->mapFrom(window, inWindow);
    return CGPointMake(local.x(), _widget->height() - local.y());
}

CGPoint TQQtViewHost::windowPointFromWidgetPoint(const QPointF& widgetPoint) const {
    if (!_widget) return CGPointMake(widgetPoint.x(), widgetPoint.y());
    const QWidget* window = _widget->window();
    const QPointF inWindow = _widget->mapTo(window, widgetPoint);
    return CGPointMake(inWindow.x(), window->height() - inWindow.y());
}

std::optional<RWEvent> TQQtViewHost::nextEventMatchingMask(RWEventMask mask) {
    for (auto it = _pending.begin(); it != _pending.end(); ++it) {
        if (!it->matchesMask(mask)) continue;
        RWEvent event = *it;
        _pending.erase(it);
        return event;
    }
    return std::nullopt;
}

// ---- Installer ------------------------------------------------------------------------------

TQQtServiceInstaller::TQQtServiceInstaller()
    : _previous(RWApplicationServices()), _previousMetrics(&HXDTextMetrics::shared()) {
    RWServiceSet mine;
    mine.clock = &_clock;
    mine.timer = &_timer;
    mine.pasteboard = &_pasteboard;
    RWInstallServices(mine);
    HXDTextMetrics::setShared(&_metrics);
}

TQQtServiceInstaller::~TQQtServiceInstaller() {
    RWServiceSet back;
    back.clock = _previous.clock;
    back.timer = _previous.timer;
    back.pasteboard = _previous.pasteboard;
    RWInstallServices(back);
    // The estimate, if that is what was there, behaves the same installed as not.
    HXDTextMetrics::setShared(_previousMetrics);
}
