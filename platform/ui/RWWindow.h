#pragma once
// Windows and panels as models: a title, whether the window is on screen, and a delegate that
// is asked before a close and told when one happens. A panel is a window that a controller
// runs modally (RWModalService) or keeps floating beside its editor.
//
// The toolkit adapter binds a top-level widget to the model both ways: the user's close
// button asks performClose (the delegate may refuse), and a change of the model's title or
// visibility shows at once. Like the controls (RWControl.h), a window tells its observers of
// every change of its state.
//
// The delegate is not owned: it outlives the window or clears itself first (setDelegate
// with null), as a controller does in its destructor.

#include <string>

#include "platform/ui/RWObserverList.h"

class RWWindow;

class RWWindowDelegate {
public:
    virtual ~RWWindowDelegate() = default;
    // Asked before the user's close; false keeps the window open.
    virtual bool windowShouldClose(RWWindow& window) {
        (void)window;
        return true;
    }
    // The window is about to close, whoever closes it.
    virtual void windowWillClose(RWWindow& window) { (void)window; }
};

class RWWindowObserver {
public:
    virtual ~RWWindowObserver() = default;
    virtual void windowDidChange(RWWindow& window) = 0;
};

class RWWindow {
public:
    RWWindow() = default;
    virtual ~RWWindow() = default;
    RWWindow(const RWWindow&) = delete;
    RWWindow& operator=(const RWWindow&) = delete;

    const std::string& title() const { return _title; }
    void setTitle(const std::string& title);
    RWWindowDelegate* delegate() const { return _delegate; }
    void setDelegate(RWWindowDelegate* delegate) { _delegate = delegate; }
    bool isVisible() const { return _visible; }
    void setIsVisible(bool visible);
    // Shows the window in front (orderFront, makeKeyAndOrderFront).
    void makeKeyAndOrderFront() { setIsVisible(true); }

    // The user's close: asks the delegate, and closes unless it refuses. Answers whether the
    // window closed.
    bool performClose();
    // Closes without asking: the delegate hears windowWillClose, then the window hides.
    void close();

    // Observers are not owned; each removes itself before it goes. Adding one twice keeps one.
    void addObserver(RWWindowObserver* observer) { _observers.add(observer); }
    void removeObserver(RWWindowObserver* observer) { _observers.remove(observer); }

private:
    void changed();

    std::string _title;
    RWWindowDelegate* _delegate = nullptr;  // not owned
    bool _visible = false;
    RWObserverList<RWWindowObserver> _observers;
};

// A window that serves a controller: the simplify, generate and curve set panels.
class RWPanel : public RWWindow {};
