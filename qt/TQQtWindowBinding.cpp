#include "qt/TQQtWindowBinding.h"

#include <QCloseEvent>

#include "qt/TQQtScreen.h"

TQQtWindowBinding::TQQtWindowBinding(RWWindow& window, QWidget* widget)
    : QObject(widget), _window(window), _widget(widget) {
    // The model starts from what the widget shows.
    if (_widget) {
        _window.setIsVisible(_widget->isVisible());
        takeFrameFromWidget();
        _widget->installEventFilter(this);
    }
    _window.addObserver(this);
    windowDidChange(_window);
}

TQQtWindowBinding::~TQQtWindowBinding() { _window.removeObserver(this); }

void TQQtWindowBinding::windowDidChange(RWWindow& window) {
    if (!_widget) return;
    _widget->setWindowTitle(QString::fromStdString(window.title()));
    // While Qt closes the widget, the hidden model needs nothing more from it.
    if (!_closing && _widget->isVisible() != window.isVisible())
        _widget->setVisible(window.isVisible());
}

void TQQtWindowBinding::takeFrameFromWidget() {
    if (!_widget || !_widget->isVisible()) return;
    const QRect global(_widget->mapToGlobal(QPoint(0, 0)), _widget->size());
    const CGRect frame = TQQtScreenRectOfGlobalRect(global);
    if (!(frame == _window.frame())) _window.setFrame(frame);
}

bool TQQtWindowBinding::eventFilter(QObject* watched, QEvent* event) {
    if (watched == _widget && (event->type() == QEvent::Move || event->type() == QEvent::Resize ||
                               event->type() == QEvent::Show))
        takeFrameFromWidget();
    // Shown or hidden by Qt (the application shows its main window): the model follows.
    if (watched == _widget && (event->type() == QEvent::Show || event->type() == QEvent::Hide) &&
        !_closing)
        _window.setIsVisible(event->type() == QEvent::Show);
    if (watched == _widget && event->type() == QEvent::Close && !_closing) {
        _closing = true;
        const bool closed = _window.performClose();
        _closing = false;
        if (!closed) {
            event->ignore();
            return true;
        }
    }
    return QObject::eventFilter(watched, event);
}
