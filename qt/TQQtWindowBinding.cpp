#include "qt/TQQtWindowBinding.h"

#include <QCloseEvent>

TQQtWindowBinding::TQQtWindowBinding(RWWindow& window, QWidget* widget)
    : QObject(widget), _window(window), _widget(widget) {
    // The model starts from what the widget shows.
    if (_widget) {
        _window.setIsVisible(_widget->isVisible());
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

bool TQQtWindowBinding::eventFilter(QObject* watched, QEvent* event) {
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
