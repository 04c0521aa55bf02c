#pragma once
// Scriptable stand-ins for the services of RWServices.h, for tests: a clock that only moves
// when told, a timer that runs its blocks when that clock passes their time, a view host that
// records redraw requests and cursors and serves queued events, and a modal service that
// plays scripted panel sessions.

#include <deque>
#include <functional>
#include <memory>
#include <string>
#include <vector>

#include "platform/ui/RWControl.h"
#include "platform/ui/RWServices.h"

class RWManualClock final : public RWClock {
public:
    explicit RWManualClock(double start = 1000.0) : _now(start) {}
    double now() const override { return _now; }
    void set(double seconds) { _now = seconds; }
    void advance(double seconds) { _now += seconds; }

private:
    double _now;
};

// dispatchAfter queues; advance() moves the clock and runs what became due, in due order.
class RWManualTimer final : public RWTimerService {
public:
    explicit RWManualTimer(RWManualClock& clock) : _clock(clock), _queue(clock) {}
    void dispatchAfter(uint64_t nanoseconds, std::function<void()> block) override {
        _queue.dispatchAfter(nanoseconds, std::move(block));
    }
    size_t advance(double seconds) {
        _clock.advance(seconds);
        return _queue.runDueBlocks();
    }
    size_t pendingCount() const { return _queue.pendingCount(); }

private:
    RWManualClock& _clock;
    RWQueuedTimer _queue;
};

class RWStubViewHost final : public RWViewHost {
public:
    RWStubViewHost(double widthPoints = 800.0, double heightPoints = 400.0, double scale = 1.0)
        : _bounds(CGRectMake(0, 0, widthPoints, heightPoints)), _scale(scale) {}

    CGRect bounds() const override { return _bounds; }
    double backingScaleFactor() const override { return _scale; }
    void setNeedsDisplay() override { ++_redrawRequests; }
    // Only whole-frame requests are counted: a partial or immediate redraw is none.
    void setNeedsDisplayInRect(const CGRect&) override {}
    void displayNow() override {}
    void setCursor(RWCursor cursor) override { _cursors.push_back(cursor); }
    void setCursorHidden(bool hidden) override { _hiding += hidden ? 'H' : 'S'; }
    // The view fills the window, whose origin is the view's.
    CGPoint convertPointFromWindow(const CGPoint& p) const override { return p - _bounds.origin; }
    // The window sits at screenOrigin (bottom left).
    std::optional<CGRect> convertRectToScreen(const CGRect& rect) const override {
        return CGRectMake(rect.origin.x + _screenOrigin.x, rect.origin.y + _screenOrigin.y,
                          rect.size.width, rect.size.height);
    }
    std::optional<RWEvent> nextEventMatchingMask(RWEventMask mask) override {
        for (auto it = _queued.begin(); it != _queued.end(); ++it) {
            if (!it->matchesMask(mask)) continue;
            RWEvent e = *it;
            _queued.erase(it);
            return e;
        }
        return std::nullopt;
    }

    void setBackingScaleFactor(double scale) { _scale = scale; }
    void setScreenOrigin(const CGPoint& origin) { _screenOrigin = origin; }
    void queueEvent(const RWEvent& event) { _queued.push_back(event); }
    size_t queuedCount() const { return _queued.size(); }
    int redrawRequests() const { return _redrawRequests; }
    void resetRedrawRequests() { _redrawRequests = 0; }
    const std::vector<RWCursor>& cursors() const { return _cursors; }
    // Each call to setCursorHidden: H hides, S shows.
    const std::string& hiding() const { return _hiding; }

private:
    CGRect _bounds;
    double _scale;
    CGPoint _screenOrigin = CGPointZero;
    int _redrawRequests = 0;
    std::vector<RWCursor> _cursors;
    std::string _hiding;
    std::deque<RWEvent> _queued;
};

// Each runModalForWindow plays the next script: the script stands for the user working the
// panel, and ends the run as the panel would (stopModal, stopModalWithCode, abortModal). A
// script that ends nothing, or a run with no script left, is aborted.
class RWScriptedModal final : public RWModalService {
public:
    using Script = std::function<void(RWWindow& window, RWModalService& modal)>;

    void pushScript(Script script) { _scripts.push_back(std::move(script)); }
    size_t scriptsLeft() const { return _scripts.size(); }
    // Titles of the windows run, in order.
    const std::vector<std::string>& runs() const { return _runs; }

    RWModalResponse runModalForWindow(RWWindow& window) override {
        _runs.push_back(window.title());
        _stack.push_back(std::nullopt);
        if (!_scripts.empty()) {
            Script script = std::move(_scripts.front());
            _scripts.pop_front();
            script(window, *this);
        }
        const std::optional<RWModalResponse> code = _stack.back();
        _stack.pop_back();
        return code.value_or(RWModalResponseAbort);
    }
    void stopModal() override { stopModalWithCode(RWModalResponseStop); }
    void stopModalWithCode(RWModalResponse code) override {
        if (!_stack.empty() && !_stack.back()) _stack.back() = code;
    }
    void abortModal() override { stopModalWithCode(RWModalResponseAbort); }

private:
    std::deque<Script> _scripts;
    std::vector<std::string> _runs;
    std::vector<std::optional<RWModalResponse>> _stack;  // the answer of each open run
};

// A new control of the given class that sends `action` to `target`.
template <class Control>
std::shared_ptr<Control> wired(RWActionTarget& target, const char* action) {
    auto control = std::make_shared<Control>();
    control->setTarget(&target);
    control->setAction(action);
    return control;
}
