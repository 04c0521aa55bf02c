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
//
// Screen coordinates. A window's frame is in screen points with the origin at the bottom left
// of the main screen and y up, so that a frame's origin is its bottom-left corner: a panel
// that hangs below a point has its origin at the point's y less its height. The adapter
// converts to its toolkit's coordinates.

#include <cstdint>
#include <functional>
#include <memory>
#include <string>
#include <vector>

#include "platform/geometry/CGGeometry.h"
#include "platform/ui/RWObserverList.h"

class RWControl;
class RWWindow;

// The content of a window as an interface file lays it out: a size, and the controls at their
// frames (in the content's points, origin at the bottom left, y up). The controls are shared
// with whoever drives them.
class RWView {
public:
    explicit RWView(const CGRect& frame = CGRectZero) : _frame(frame) {}

    const CGRect& frame() const { return _frame; }
    void setFrame(const CGRect& frame) { _frame = frame; }
    const std::vector<std::shared_ptr<RWControl>>& subviews() const { return _subviews; }
    // Null is ignored.
    void addSubview(std::shared_ptr<RWControl> control);
    // The first control of that class (that `matches`, when given), or null.
    template <class Control>
    std::shared_ptr<Control> subview(
        const std::function<bool(const Control&)>& matches = {}) const {
        for (const std::shared_ptr<RWControl>& control : _subviews)
            if (auto found = std::dynamic_pointer_cast<Control>(control))
                if (!matches || matches(*found)) return found;
        return nullptr;
    }

private:
    CGRect _frame;
    std::vector<std::shared_ptr<RWControl>> _subviews;
};

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
    RWWindow();
    virtual ~RWWindow();
    RWWindow(const RWWindow&) = delete;
    RWWindow& operator=(const RWWindow&) = delete;

    const std::string& title() const { return _title; }
    void setTitle(const std::string& title);
    RWWindowDelegate* delegate() const { return _delegate; }
    void setDelegate(RWWindowDelegate* delegate) { _delegate = delegate; }
    bool isVisible() const { return _visible; }
    void setIsVisible(bool visible);
    // Shows the window in front and makes it key (when it can be).
    void makeKeyAndOrderFront();

    // The user's close: asks the delegate, and closes unless it refuses. Answers whether the
    // window closed. A panel may close without asking.
    virtual bool performClose();
    // Closes without asking: the delegate hears windowWillClose, then the window hides.
    void close();

    // ---- Frame and content ----
    // In screen points (see above).
    const CGRect& frame() const { return _frame; }
    void setFrame(const CGRect& frame);
    void setFrameOrigin(const CGPoint& origin);
    // A rectangle of the window's points (origin at the bottom left of its content, y up) in
    // screen points.
    CGRect convertRectToScreen(const CGRect& rect) const {
        return CGRectMake(rect.origin.x + _frame.origin.x, rect.origin.y + _frame.origin.y,
                          rect.size.width, rect.size.height);
    }
    // The laid-out content; null until one is set. The frame takes the content's size.
    const std::shared_ptr<RWView>& contentView() const { return _contentView; }
    void setContentView(std::shared_ptr<RWView> view);
    // 0 is a window without title bar or border.
    uint64_t styleMask() const { return _styleMask; }
    void setStyleMask(uint64_t mask);
    // Floating panels stay above the document windows; the level orders windows (0 normal,
    // 3 floating).
    bool isFloatingPanel() const { return _floatingPanel; }
    void setFloatingPanel(bool floating);
    int64_t level() const { return _level; }
    void setLevel(int64_t level);
    // A number of the window, unique in the process (what events name their window by).
    int64_t windowNumber() const { return _windowNumber; }

    // ---- Keys ----
    virtual bool canBecomeKeyWindow() const { return true; }
    // The window that takes the keys: becomes it if it can. Only one window is key at a time.
    void makeKeyWindow();
    bool isKeyWindow() const;
    // The control that takes the window's keys; false (and no change) for a control that is
    // not in the content. Null resigns it.
    bool makeFirstResponder(const std::shared_ptr<RWControl>& control);
    std::shared_ptr<RWControl> firstResponder() const { return _firstResponder.lock(); }

    // Observers are not owned; each removes itself before it goes. Adding one twice keeps one.
    void addObserver(RWWindowObserver* observer) { _observers.add(observer); }
    void removeObserver(RWWindowObserver* observer) { _observers.remove(observer); }

private:
    void changed();

    std::string _title;
    RWWindowDelegate* _delegate = nullptr;  // not owned
    bool _visible = false;
    CGRect _frame = CGRectZero;
    std::shared_ptr<RWView> _contentView;
    uint64_t _styleMask = 15;  // titled, closable, miniaturizable, resizable
    bool _floatingPanel = false;
    int64_t _level = 0;
    int64_t _windowNumber;
    std::weak_ptr<RWControl> _firstResponder;
    RWObserverList<RWWindowObserver> _observers;
};

// A window that serves a controller: the simplify, generate and curve set panels.
class RWPanel : public RWWindow {};
