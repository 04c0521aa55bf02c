#include "platform/ui/RWWindow.h"

void RWWindow::setTitle(const std::string& title) {
    if (_title == title) return;
    _title = title;
    changed();
}

void RWWindow::setIsVisible(bool visible) {
    if (_visible == visible) return;
    _visible = visible;
    changed();
}

bool RWWindow::performClose() {
    if (_delegate && !_delegate->windowShouldClose(*this)) return false;
    close();
    return true;
}

void RWWindow::close() {
    if (_delegate) _delegate->windowWillClose(*this);
    setIsVisible(false);
}

void RWWindow::changed() {
    _observers.forEach([&](RWWindowObserver& observer) { observer.windowDidChange(*this); });
}
