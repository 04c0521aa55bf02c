#include "qt/TQQtCurveViewWidget.h"

#include <QApplication>
#include <QPainter>
#include <QStyleHints>
#include <QTimer>

#include <cmath>

#include "qt/TQQtEvents.h"
#include "qt/TQQtMenu.h"
#include "src/view/TQCurveEditorViewBase.h"

TQQtCurveViewWidget::TQQtCurveViewWidget(QWidget* parent) : QWidget(parent), _host(this) {
    // Every pixel is painted from the frame image: Qt need not clear first.
    setAttribute(Qt::WA_OpaquePaintEvent);
    setFocusPolicy(Qt::StrongFocus);
    setMouseTracking(true);
    _dragRepeat.setSingleShot(true);
    _dragRepeat.setTimerType(Qt::PreciseTimer);
    // Just past the view's gate, in whole milliseconds.
    _dragRepeat.setInterval(
        static_cast<int>(std::ceil(TQCurveEditorViewBase::kFrameInterval * 1000.0)) + 1);
    connect(&_dragRepeat, &QTimer::timeout, this, [this] { repeatLastDrag(); });
    _menuRunner = [this](const RWMenuPtr& menu, const QPoint& at) {
        return TQQtRunContextMenu(menu, at, this);
    };
}

TQQtCurveViewWidget::~TQQtCurveViewWidget() { setView(nullptr); }

void TQQtCurveViewWidget::setView(TQCurveEditorViewBase* view) {
    if (view == _view) return;
    if (_view && _view->viewHost() == &_host) _view->setViewHost(nullptr);
    // A gesture does not carry over to another view: its release would reach a view that
    // never saw the press.
    _leftGesture = false;
    _dragRepeat.stop();
    _lastDrag.reset();
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
        painter.fillRect(rect(),
                         TQQtPainterEncoder::qColor(HXDColor{c.red, c.green, c.blue, 1.0f}));
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

void TQQtCurveViewWidget::beginGesture(QMouseEvent* event, bool doubleClick) {
    const qint64 nowMs = static_cast<qint64>(event->timestamp());
    const QPointF at = event->position();
    // Qt reports the second press of a double click by itself; later presses of a longer
    // run are counted here by the same rules of time and distance.
    const bool continues =
        _hasLastPress &&
        nowMs - _lastPressMs <= QGuiApplication::styleHints()->mouseDoubleClickInterval() &&
        (at - _lastPressAt).manhattanLength() <= QGuiApplication::styleHints()->startDragDistance();
    if (doubleClick)
        _clickCount = std::max<int64_t>(2, continues ? _clickCount + 1 : 2);
    else
        _clickCount = continues ? _clickCount + 1 : 1;
    _hasLastPress = true;
    _lastPressMs = nowMs;
    _lastPressAt = at;

    const std::optional<RWEvent> down = TQQtEvents::mouseEvent(*event, _host, _clickCount);
    if (!down) return;
    event->accept();
    // A click that activates the window acts in the view as well, the pointer brought up to
    // date first.
    if (!isActiveWindow()) _view->acceptsFirstMouse(*down);
    // A gesture whose release never came (it went to a window that was modal then) ends
    // before the next one starts, so that the view is never left with its button down.
    if (_leftGesture) endGesture(*down);
    _dragRepeat.stop();
    _lastDrag.reset();
    _leftGesture = true;
    _view->mouseDown(*down);
    // The press may have run a modal panel (a double click types a value) during which the
    // button came up: that release went to the panel, so it is made up for here.
    if (_view && _leftGesture && !(QGuiApplication::mouseButtons() & Qt::LeftButton))
        endGesture(*down);
}

void TQQtCurveViewWidget::endGesture(const RWEvent& at) {
    _leftGesture = false;
    _dragRepeat.stop();
    _lastDrag.reset();
    if (!_view) return;
    _view->mouseUp(RWEvent::mouseEvent(RWEventType::LeftMouseUp, at.locationInWindow(),
                                       at.modifierFlags(), at.clickCount(), at.timestamp()));
}

void TQQtCurveViewWidget::mousePressEvent(QMouseEvent* event) {
    if (!_view || event->button() != Qt::LeftButton) {
        QWidget::mousePressEvent(event);
        return;
    }
    beginGesture(event, false);
}

void TQQtCurveViewWidget::mouseDoubleClickEvent(QMouseEvent* event) {
    if (!_view || event->button() != Qt::LeftButton) {
        QWidget::mouseDoubleClickEvent(event);
        return;
    }
    beginGesture(event, true);
}

void TQQtCurveViewWidget::mouseMoveEvent(QMouseEvent* event) {
    if (_view && event->buttons() == Qt::NoButton && !_leftGesture) {
        hover(event->position(), event->modifiers());
        QWidget::mouseMoveEvent(event);
        return;
    }
    if (!_view || !_leftGesture || !(event->buttons() & Qt::LeftButton)) {
        QWidget::mouseMoveEvent(event);
        return;
    }
    const std::optional<RWEvent> drag = TQQtEvents::mouseEvent(*event, _host, _clickCount);
    if (!drag || drag->type() != RWEventType::LeftMouseDragged) return;
    event->accept();
    _lastDrag = drag;
    _view->mouseDragged(*drag);
    _dragRepeat.start();
}

void TQQtCurveViewWidget::repeatLastDrag() {
    if (!_view || !_leftGesture || !_lastDrag) return;
    _view->mouseDragged(*_lastDrag);
}

void TQQtCurveViewWidget::mouseReleaseEvent(QMouseEvent* event) {
    if (!_view || event->button() != Qt::LeftButton || !_leftGesture) {
        QWidget::mouseReleaseEvent(event);
        return;
    }
    _leftGesture = false;
    _dragRepeat.stop();
    _lastDrag.reset();
    const std::optional<RWEvent> up = TQQtEvents::mouseEvent(*event, _host, _clickCount);
    if (!up) return;
    event->accept();
    _view->mouseUp(*up);
}

bool TQQtCurveViewWidget::event(QEvent* event) {
    if (event->type() == QEvent::ShortcutOverride && _view) {
        auto* keyEvent = static_cast<QKeyEvent*>(event);
        const RWEvent key = TQQtEvents::keyEvent(*keyEvent);
        // Accepting the override keeps the key from the shortcuts: it arrives as a key press.
        if (key.type() == RWEventType::KeyDown && _view->customKeyEquivalent(key)) {
            event->accept();
            return true;
        }
    }
    return QWidget::event(event);
}

bool TQQtCurveViewWidget::sendMappedAction(const std::optional<std::string>& action) {
    if (!_view || !action) return false;
    struct KeySender final : RWActionSender {
        int64_t tag() const override { return 0; }
    } sender;
    return _view->performAction(*action, sender);
}

void TQQtCurveViewWidget::keyPressEvent(QKeyEvent* event) {
    if (_view) {
        const RWEvent key = TQQtEvents::keyEvent(*event);
        // A modifier key changes no state of the view's, but may change what a click where
        // the pointer hovers would do.
        if (key.type() == RWEventType::FlagsChanged && _hoverAt)
            hover(*_hoverAt, event->modifiers() | QGuiApplication::queryKeyboardModifiers());
        if ((key.type() == RWEventType::KeyDown && _view->keyDown(key)) ||
            sendMappedAction(_keyMap.actionForPress(*event))) {
            event->accept();
            return;
        }
    }
    QWidget::keyPressEvent(event);
}

void TQQtCurveViewWidget::keyReleaseEvent(QKeyEvent* event) {
    if (_view) {
        const RWEvent key = TQQtEvents::keyEvent(*event);
        if (key.type() == RWEventType::FlagsChanged && _hoverAt)
            hover(*_hoverAt, QGuiApplication::queryKeyboardModifiers());
        if ((key.type() == RWEventType::KeyUp && _view->keyUp(key)) ||
            sendMappedAction(_keyMap.actionForRelease(*event))) {
            event->accept();
            return;
        }
    }
    QWidget::keyReleaseEvent(event);
}

void TQQtCurveViewWidget::hover(const QPointF& at, Qt::KeyboardModifiers modifiers) {
    _hoverAt = at;
    if (!_view) return;
    _host.pointerMoved(RWEvent::mouseEvent(RWEventType::MouseMoved,
                                           _host.windowPointFromWidgetPoint(at),
                                           TQQtEvents::modifierFlags(modifiers), 0));
}

void TQQtCurveViewWidget::enterEvent(QEnterEvent* event) {
    QWidget::enterEvent(event);
    hover(event->position(), event->modifiers());
}

void TQQtCurveViewWidget::leaveEvent(QEvent* event) {
    QWidget::leaveEvent(event);
    _hoverAt.reset();
}

void TQQtCurveViewWidget::contextMenuEvent(QContextMenuEvent* event) {
    // The menu of a click that is part of a left drag would act on a gesture under way.
    if (!_view || _leftGesture) {
        QWidget::contextMenuEvent(event);
        return;
    }
    event->accept();
    const RWEvent click = RWEvent::mouseEvent(RWEventType::RightMouseDown,
                                              _host.windowPointFromWidgetPoint(event->pos()),
                                              TQQtEvents::modifierFlags(event->modifiers()));
    const RWMenuPtr menu = _view->menuForEvent(click);
    if (_menuRunner) _menuRunner(menu, event->globalPos());
    // The menu's action may have changed what lies under the pointer.
    if (_view) hover(event->pos(), QGuiApplication::queryKeyboardModifiers());
}

void TQQtCurveViewWidget::focusInEvent(QFocusEvent* event) {
    QWidget::focusInEvent(event);
    if (_view) _view->becomeFirstResponder();
}

void TQQtCurveViewWidget::focusOutEvent(QFocusEvent* event) {
    QWidget::focusOutEvent(event);
    if (_view) _view->resignFirstResponder();
}
