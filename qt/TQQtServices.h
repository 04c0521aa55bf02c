#pragma once
// The platform services of platform/ui on Qt: a monotonic clock, delayed calls on the Qt
// event loop, the view host of a QWidget, and (TQQtPasteboard.h) the system clipboard.
//
// Coordinates. The views think in points with the origin at the bottom left and y up; a
// QWidget has its origin at the top left and y down. Qt's logical pixels are our points and
// devicePixelRatio is the backing scale, so only the y axis needs flipping.

#include <QCursor>
#include <QElapsedTimer>
#include <QObject>
#include <QPointer>
#include <QWidget>

#include <array>
#include <deque>
#include <optional>
#include <vector>

#include "platform/ui/RWServices.h"
#include "qt/TQQtPainterEncoder.h"
#include "qt/TQQtPasteboard.h"
#include "src/resources/GDCursor.h"

// Seconds since the clock was made, on the monotonic clock Qt's timers use.
class TQQtClock final : public RWClock {
public:
    TQQtClock();
    double now() const override;

private:
    QElapsedTimer _elapsed;
};

// Runs each block once from the Qt event loop, no sooner than asked: delays are rounded up
// to whole milliseconds and use a precise timer, so that the 1/30 s redraw gate never fires
// early. Blocks still pending when the service dies are dropped, never run on a dead owner.
class TQQtTimerService final : public RWTimerService {
public:
    TQQtTimerService();
    ~TQQtTimerService() override;
    TQQtTimerService(const TQQtTimerService&) = delete;
    TQQtTimerService& operator=(const TQQtTimerService&) = delete;

    void dispatchAfter(uint64_t nanoseconds, std::function<void()> block) override;

private:
    // The context of every pending timer: deleting it cancels them all.
    QObject* _context;
};

// What a curve view knows of the QWidget that shows it. The host does not own the widget and
// answers harmless values (empty bounds, scale 1, no redraw) once the widget is gone.
class TQQtViewHost final : public RWViewHost {
public:
    explicit TQQtViewHost(QWidget* widget);

    QWidget* widget() const { return _widget.data(); }

    CGRect bounds() const override;
    double backingScaleFactor() const override;
    bool hasWindow() const override;
    void setNeedsDisplay() override;
    void displayNow() override;
    void setCursor(RWCursor cursor) override;
    void setCursorHidden(bool hidden) override;
    CGPoint convertPointFromWindow(const CGPoint& pointInWindow) const override;
    std::optional<CGRect> convertRectToScreen(const CGRect& rect) const override;
    // The widget's frame is one image: any rectangle redraws the whole.
    void setNeedsDisplayInRect(const CGRect&) override { setNeedsDisplay(); }
    std::optional<RWEvent> nextEventMatchingMask(RWEventMask mask) override;
    void addTrackingArea(const RWTrackingAreaPtr& area) override;
    void removeTrackingArea(const RWTrackingArea& area) override;
    size_t trackingAreaCount() const { return _trackingAreas.size(); }
    // The pointer moved over the widget with no button down (or entered it): the owners of
    // the cursor-update areas under it hear it.
    void pointerMoved(const RWEvent& event);

    // The inverse of convertPointFromWindow for a point in the widget's own Qt coordinates:
    // what the adapter stores as an event's locationInWindow.
    CGPoint windowPointFromWidgetPoint(const QPointF& widgetPoint) const;

    // Qt does not let anyone look into its event queue, so the adapter that translates Qt
    // events puts the ones it holds back (wheel steps arriving in a burst) here, where a
    // handler that folds waiting events finds them.
    void postPendingEvent(const RWEvent& event) { _pending.push_back(event); }
    size_t pendingEventCount() const { return _pending.size(); }

    RWCursor cursor() const { return _cursor; }
    bool cursorHidden() const { return _cursorHidden; }

    // The Qt shape shown for a cursor of the views; Qt::BitmapCursor for the cursors that are
    // images: the editor's own pointers (from the image resources) and the zoom cursors (drawn).
    static Qt::CursorShape cursorShape(RWCursor cursor);
    // The resource of an editor pointer, or null for the cursors Qt or the zoom draws.
    static const GDCursorImage* resourceCursor(RWCursor cursor);
    // The cursor shown, made at the given device pixel ratio where it is an image.
    static QCursor qtCursor(RWCursor cursor, qreal devicePixelRatio);

private:
    void applyCursor();

    QPointer<QWidget> _widget;
    RWCursor _cursor = RWCursor::Arrow;
    bool _cursorHidden = false;
    // The image cursors by RWCursor, made at _imageCursorRatio.
    std::array<std::optional<QCursor>, static_cast<size_t>(RWCursor::ZoomOut) + 1> _imageCursors;
    qreal _imageCursorRatio = 0.0;
    std::deque<RWEvent> _pending;
    std::vector<RWTrackingAreaPtr> _trackingAreas;
};

// Installs a Qt clock, a Qt timer, the system clipboard as the pasteboard and the Qt text
// metrics (so that text boxes are measured with the font the painter draws with) as the
// process-wide services for its lifetime, and puts back what was installed before. Make one after the QApplication, on the main thread.
class TQQtServiceInstaller {
public:
    TQQtServiceInstaller();
    ~TQQtServiceInstaller();
    TQQtServiceInstaller(const TQQtServiceInstaller&) = delete;
    TQQtServiceInstaller& operator=(const TQQtServiceInstaller&) = delete;

    TQQtClock& clock() { return _clock; }
    TQQtTimerService& timer() { return _timer; }
    TQQtPasteboard& pasteboard() { return _pasteboard; }

private:
    TQQtClock _clock;
    TQQtTimerService _timer;
    TQQtPasteboard _pasteboard;
    TQQtTextMetrics _metrics;
    RWServiceSet _previous;
    const HXDTextMetrics* _previousMetrics;
};
