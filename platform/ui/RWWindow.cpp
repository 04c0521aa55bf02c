#include "platform/ui/RWWindow.h"

#include <algorithm>

#include "platform/ui/RWControl.h"

namespace {

int64_t gNextWindowNumber = 1;
// The key window; a window that goes clears it.
const RWWindow* gKeyWindow = nullptr;

}  // namespace

void RWView::addSubview(std::shared_ptr<RWControl> control) {
    if (control) _subviews.push_back(std::move(control));
}

RWWindow::RWWindow() : _windowNumber(gNextWindowNumber++) {}

RWWindow::~RWWindow() {
    if (gKeyWindow == this) gKeyWindow = nullptr;
}

void RWWindow::setTitle(const std::string& title) {
    if (_title == title) return;
    _title = title;
    changed();
}

void RWWindow::setIsVisible(bool visible) {
    if (_visible == visible) return;
    _visible = visible;
    // A hidden window takes no keys.
    if (!visible && gKeyWindow == this) gKeyWindow = nullptr;
    changed();
}

void RWWindow::makeKeyAndOrderFront() {
    setIsVisible(true);
    makeKeyWindow();
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

void RWWindow::setFrame(const CGRect& frame) {
    _frame = frame;
    changed();
}

void RWWindow::setFrameOrigin(const CGPoint& origin) {
    _frame.origin = origin;
    changed();
}

void RWWindow::setContentView(std::shared_ptr<RWView> view) {
    _contentView = std::move(view);
    if (_contentView) _frame.size = _contentView->frame().size;
    changed();
}

void RWWindow::setStyleMask(uint64_t mask) {
    _styleMask = mask;
    changed();
}

void RWWindow::setFloatingPanel(bool floating) {
    _floatingPanel = floating;
    changed();
}

void RWWindow::setLevel(int64_t level) {
    _level = level;
    changed();
}

void RWWindow::makeKeyWindow() {
    if (!canBecomeKeyWindow() || gKeyWindow == this) return;
    gKeyWindow = this;
    changed();
}

bool RWWindow::isKeyWindow() const { return gKeyWindow == this; }

bool RWWindow::makeFirstResponder(const std::shared_ptr<RWControl>& control) {
    if (control) {
        if (!_contentView) return false;
        const auto& views = _contentView->subviews();
        if (std::find(views.begin(), views.end(), control) == views.end()) return false;
    }
    _firstResponder = control;
    changed();
    return true;
}

void RWWindow::changed() {
    _observers.forEach([&](RWWindowObserver& observer) { observer.windowDidChange(*this); });
}
