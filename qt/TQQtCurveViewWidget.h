#pragma once
// A QWidget that shows a curve view: it is the view's host (TQQtViewHost), draws the view's
// frames with the QPainter encoder in its paint events, and keeps the view's backing in step
// with its size and device pixel ratio.
//
// Frames. A paint event asks the view for a frame. When the view's 1/30 s gate holds the
// frame back, the widget shows the last frame again; the view has then scheduled one delayed
// redraw, which reaches the widget as update(). So a burst of repaints costs one frame.
//
// Wheel events are folded as the views expect: each one is queued on the host, and one
// handler run from the event loop takes the first; the view's scrollWheel takes the ones
// still waiting. Events the view has no handler for are translated by subclasses (see
// TQQtEvents.h) and passed to theirs.
//
// Lifetime: the widget does not own the view. It detaches itself from the view when it dies
// or another view is set; the owner of the view detaches it (setView(nullptr)) before
// deleting the view, if the widget lives on.

#include <QWidget>

#include "qt/TQQtPainterEncoder.h"
#include "qt/TQQtServices.h"

class TQCurveEditorViewBase;

class TQQtCurveViewWidget : public QWidget {
public:
    explicit TQQtCurveViewWidget(QWidget* parent = nullptr);
    ~TQQtCurveViewWidget() override;

    void setView(TQCurveEditorViewBase* view);
    TQCurveEditorViewBase* view() const { return _view; }
    TQQtViewHost& viewHost() { return _host; }
    const TQQtPainterEncoder& encoder() const { return _encoder; }
    // Frames the view actually drew (not the repaints that showed the last one again).
    int framesDrawn() const { return _encoder.framesPresented(); }

    QSize sizeHint() const override { return QSize(640, 320); }

protected:
    void paintEvent(QPaintEvent* event) override;
    void resizeEvent(QResizeEvent* event) override;
    void showEvent(QShowEvent* event) override;
    void wheelEvent(QWheelEvent* event) override;

private:
    void syncBacking();
    void deliverQueuedWheel();

    TQQtViewHost _host;
    TQQtPainterEncoder _encoder;
    TQCurveEditorViewBase* _view = nullptr;  // not owned
    qreal _lastPixelRatio = 0.0;
    bool _wheelDeliveryPending = false;
};
