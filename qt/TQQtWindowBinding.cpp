#include "qt/TQQtWindowBinding.h"

#include <QCloseEvent>

TQQtWindowBinding::TQQtWindowBinding(RWWindow& window, QWidget* widget)
    : QObject(widget), _window(window), _widget(widget) {
    _window.addObserver(this);
    if (_widget) _widget->installEventFilter(this);
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
