#include "qt/TQQtCurveViewWidget.h"

#include <QPainter>
#include <QTimer>

#include <cmath>

#include "qt/TQQtEvents.h"
#include "src/view/TQCurveEditorViewBase.h"

TQQtCurveViewWidget::TQQtCurveViewWidget(QWidget* parent) : QWidget(parent), _host(this) {
    // Every pixel is painted from the frame image: Qt need not clear first.
    setAttribute(Qt::WA_OpaquePaintEvent);
    setFocusPolicy(Qt::StrongFocus);
    setMouseTracking(true);
}

TQQtCurveViewWidget::~TQQtCurveViewWidget() { setView(nullptr); }

void TQQtCurveViewWidget::setView(TQCurveEditorViewBase* view) {
    if (view == _view) return;
    if (_view && _view->viewHost() == &_host) _view->setViewHost(nullptr);
    _view = view;
    if (_view) {
        _view->setViewHost(&_host);
        _lastPixelRatio = devicePixelRatioF();
    }
    update();
}

void TQQtCurveViewWidget::syncBacking() {
    if (!_view) return;
    _lastPixelRatio = devicePixelRatioF();
    _view->viewDidChangeBackingProperties();
}

void TQQtCurveViewWidget::showEvent(QShowEvent* event) {
    QWidget::showEvent(event);
    syncBacking();  // the window, and with it the backing, exists from now on
}

void TQQtCurveViewWidget::resizeEvent(QResizeEvent* event) {
    QWidget::resizeEvent(event);
    if (_view) _view->setFrameSize(CGSizeMake(width(), height()));
}

void TQQtCurveViewWidget::paintEvent(QPaintEvent*) {
    // Qt 6.4 sends no event when a window moves to a screen of another scale: look here.
    if (_view && devicePixelRatioF() != _lastPixelRatio) syncBacking();
    if (_view) {
        const qreal ratio = devicePixelRatioF();
        _encoder.setDrawableSize(QSize(static_cast<int>(std::lround(width() * ratio)),
                                       static_cast<int>(std::lround(height() * ratio))));
        _view->displayLayer(&_encoder);  // false: gated or no drawable; the last frame stays
    }
    QPainter painter(this);
    const QImage& frame = _encoder.image();
    if (_view && !frame.isNull()) {
        painter.drawImage(QRectF(rect()), frame, QRectF(frame.rect()));
    } else {
        const GDColor c = GDColor::curveEditorBackgroundColor0();
        painter.fillRect(rect(), TQQtPainterEncoder::qColor(HXDColor{c.red, c.green, c.blue, 1.0f}));
    }
}

void TQQtCurveViewWidget::wheelEvent(QWheelEvent* event) {
    if (!_view) {
        event->ignore();
        return;
    }
    event->accept();
    _host.postPendingEvent(TQQtEvents::wheelEvent(*event, _host));
    if (_wheelDeliveryPending) return;
    _wheelDeliveryPending = true;
    QTimer::singleShot(0, this, [this] { deliverQueuedWheel(); });
}

void TQQtCurveViewWidget::deliverQueuedWheel() {
    _wheelDeliveryPending = false;
    if (!_view) return;
    if (std::optional<RWEvent> first = _host.nextEventMatchingMask(RWEventMaskScrollWheel))
        _view->scrollWheel(*first);
}
