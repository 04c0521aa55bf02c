#pragma once
// Small service interfaces through which the toolkit-neutral views and controllers reach
// what a desktop toolkit gives them: the view's host (size, backing scale, redraw requests,
// cursor, the queue of pending events), delayed calls on the main thread, a clock, modal
// runs of panels, the pasteboard and the user defaults.
//
// The toolkit adapter implements them; platform/ui/testing/ has scriptable doubles, so that
// tests never sleep and never show anything. Everything runs on the main thread.
//
// Process-wide services (timer, clock, modal runs, pasteboard, defaults) are reached through
// RWApplicationServices(): it starts with headless implementations (a steady clock, a timer
// queue drained by the run loop, in-memory pasteboard and defaults, a modal service that
// aborts at once since nothing can be shown) and the adapter or a test replaces them. A
// replaced service is not owned: the setter's caller keeps it alive while it is installed.

#include <cstdint>
#include <functional>
#include <map>
#include <memory>
#include <optional>
#include <string>
#include <variant>
#include <vector>

#include "platform/geometry/CGGeometry.h"
#include "platform/ui/RWEvent.h"
#include "platform/ui/RWTrackingArea.h"
#include "platform/ui/RWWindow.h"

// ---- View host --------------------------------------------------------------------------

// Cursor shapes the views ask for; the adapter maps them onto its own images.
enum class RWCursor : uint32_t {
    Arrow,
    IBeam,
    PointingHand,
    OpenHand,
    ClosedHand,
    CrossHair,
    ResizeLeftRight,
    ResizeUpDown,
    OperationNotAllowed,
    Move,                // drag of keypoints
    EditPoints,          // pointer over a keypoint
    CrossHairs,          // rubber band
    Sketch,              // the sketch tool
    PenAddControlPoint,  // a click adds a keypoint
    ZoomIn,              // a space-bar zoom that magnifies
    ZoomOut              // a space-bar zoom that shrinks
};

// What a view knows of the widget that shows it. One host per view, not owned by the view;
// the host outlives the view or detaches it first (setViewHost(nullptr)).
class RWViewHost {
public:
    virtual ~RWViewHost() = default;
    // The view's bounds in points, origin at the bottom left.
    virtual CGRect bounds() const = 0;
    // Drawable pixels per point of the window the view is in.
    virtual double backingScaleFactor() const = 0;
    // False while the view is not in a window: the backing is then left as it is.
    virtual bool hasWindow() const { return true; }
    // Asks for one redraw; requests before the redraw runs collapse into one.
    virtual void setNeedsDisplay() = 0;
    // Redraws now, before answering, where the host can (the frame is then what a hit test
    // that follows sees); a request otherwise.
    virtual void displayNow() { setNeedsDisplay(); }
    // Asks for a redraw of a rectangle of the view (points, y up). A host that draws whole
    // frames anyway redraws everything.
    virtual void setNeedsDisplayInRect(const CGRect& rect) {
        (void)rect;
        setNeedsDisplay();
    }
    virtual void setCursor(RWCursor cursor) = 0;
    virtual void setCursorHidden(bool hidden) = 0;
    // A point in window coordinates (an event's locationInWindow) in the view's points.
    virtual CGPoint convertPointFromWindow(const CGPoint& pointInWindow) const = 0;
    // A rectangle of the view's points in screen points (RWWindow.h); nothing while the view
    // is in no window.
    virtual std::optional<CGRect> convertRectToScreen(const CGRect& rect) const {
        (void)rect;
        return std::nullopt;
    }
    // Takes the oldest pending event that matches the mask off the queue, or answers none.
    // Lets a handler fold events that are already waiting (the wheel) into one step.
    virtual std::optional<RWEvent> nextEventMatchingMask(RWEventMask mask) = 0;
    // The areas whose owners hear the pointer move without a button down. A host that tracks
    // nothing ignores them.
    virtual void addTrackingArea(const RWTrackingAreaPtr& area) { (void)area; }
    virtual void removeTrackingArea(const RWTrackingArea& area) { (void)area; }
};

// ---- Time -------------------------------------------------------------------------------

// Seconds on a monotonic clock with an arbitrary origin.
class RWClock {
public:
    virtual ~RWClock() = default;
    virtual double now() const = 0;
};

// Runs a block once on the main thread, at least the given time from now.
class RWTimerService {
public:
    virtual ~RWTimerService() = default;
    virtual void dispatchAfter(uint64_t nanoseconds, std::function<void()> block) = 0;
};

// ---- Modal runs -------------------------------------------------------------------------

using RWModalResponse = int64_t;
inline constexpr RWModalResponse RWModalResponseCancel = 0;
inline constexpr RWModalResponse RWModalResponseOK = 1;
inline constexpr RWModalResponse RWModalResponseStop = -1000;
inline constexpr RWModalResponse RWModalResponseAbort = -1001;
inline constexpr RWModalResponse RWModalResponseContinue = -1002;

// A window can be run modally (RWWindow.h); the panels of the framework derive from it, and
// the adapter finds its widget through the window.

// runModalForWindow returns when the panel (or anything it calls) ends the run with
// stopModal (answering RWModalResponseStop), stopModalWithCode, or abortModal
// (RWModalResponseAbort). Runs nest.
class RWModalService {
public:
    virtual ~RWModalService() = default;
    virtual RWModalResponse runModalForWindow(RWWindow& window) = 0;
    virtual void stopModal() = 0;
    virtual void stopModalWithCode(RWModalResponse code) = 0;
    virtual void abortModal() = 0;
};

// ---- Pasteboard -------------------------------------------------------------------------

// The general pasteboard: typed byte payloads, replaced as a whole by clearContents.
class RWPasteboard {
public:
    virtual ~RWPasteboard() = default;
    // Empties the pasteboard and answers the new change count.
    virtual int64_t clearContents() = 0;
    virtual int64_t changeCount() const = 0;
    // Adds or replaces the payload of one type; false if it could not be written.
    virtual bool setData(const std::vector<uint8_t>& data, const std::string& type) = 0;
    virtual std::optional<std::vector<uint8_t>> dataForType(const std::string& type) const = 0;
    virtual std::vector<std::string> types() const = 0;

    bool setString(const std::string& text, const std::string& type);
    // Empties the pasteboard and names the types it holds, with empty payloads: a drag whose
    // data travels elsewhere declares only what it carries.
    void declareTypes(const std::vector<std::string>& types);
    std::optional<std::string> stringForType(const std::string& type) const;
    // The first type of the list that the pasteboard holds.
    std::optional<std::string> availableTypeFromArray(const std::vector<std::string>& wanted) const;
};

// ---- User defaults ----------------------------------------------------------------------

using RWDefaultsValue = std::variant<bool, int64_t, double, std::string>;

// Values by key, with registered defaults under the stored values. The typed readers convert
// between numbers and booleans as the toolkit's defaults do, and answer 0, false or an empty
// text for a missing key or a value that does not convert.
class RWUserDefaults {
public:
    virtual ~RWUserDefaults() = default;
    virtual std::optional<RWDefaultsValue> objectForKey(const std::string& key) const = 0;
    virtual void setObject(const RWDefaultsValue& value, const std::string& key) = 0;
    virtual void removeObjectForKey(const std::string& key) = 0;
    virtual void registerDefaults(const std::map<std::string, RWDefaultsValue>& defaults) = 0;

    bool boolForKey(const std::string& key) const;
    int64_t integerForKey(const std::string& key) const;
    double doubleForKey(const std::string& key) const;
    std::string stringForKey(const std::string& key) const;
    void setBool(bool value, const std::string& key) { setObject(RWDefaultsValue{value}, key); }
    void setInteger(int64_t value, const std::string& key) {
        setObject(RWDefaultsValue{value}, key);
    }
    void setDouble(double value, const std::string& key) { setObject(RWDefaultsValue{value}, key); }
    void setString(const std::string& value, const std::string& key) {
        setObject(RWDefaultsValue{value}, key);
    }
};

// ---- Headless implementations -------------------------------------------------------------

class RWSteadyClock final : public RWClock {
public:
    double now() const override;
};

// Holds delayed blocks until the run loop drains the due ones with runDueBlocks.
class RWQueuedTimer final : public RWTimerService {
public:
    explicit RWQueuedTimer(const RWClock& clock) : _clock(clock) {}
    void dispatchAfter(uint64_t nanoseconds, std::function<void()> block) override;
    // Runs, in due order, every block whose time has come (blocks they add included, if
    // due); answers how many ran.
    size_t runDueBlocks();
    size_t pendingCount() const { return _pending.size(); }

private:
    struct Pending {
        double due;
        uint64_t order;
        std::function<void()> block;
    };
    const RWClock& _clock;
    std::vector<Pending> _pending;
    uint64_t _nextOrder = 0;
};

// Nothing can be shown: every run is aborted at once.
class RWHeadlessModal final : public RWModalService {
public:
    RWModalResponse runModalForWindow(RWWindow&) override { return RWModalResponseAbort; }
    void stopModal() override {}
    void stopModalWithCode(RWModalResponse) override {}
    void abortModal() override {}
};

class RWMemoryPasteboard final : public RWPasteboard {
public:
    int64_t clearContents() override;
    int64_t changeCount() const override { return _changeCount; }
    bool setData(const std::vector<uint8_t>& data, const std::string& type) override;
    std::optional<std::vector<uint8_t>> dataForType(const std::string& type) const override;
    std::vector<std::string> types() const override;

private:
    int64_t _changeCount = 0;
    std::vector<std::pair<std::string, std::vector<uint8_t>>> _items;  // in order of writing
};

class RWMemoryUserDefaults final : public RWUserDefaults {
public:
    std::optional<RWDefaultsValue> objectForKey(const std::string& key) const override;
    void setObject(const RWDefaultsValue& value, const std::string& key) override;
    void removeObjectForKey(const std::string& key) override;
    void registerDefaults(const std::map<std::string, RWDefaultsValue>& defaults) override;

private:
    std::map<std::string, RWDefaultsValue> _values;
    std::map<std::string, RWDefaultsValue> _registered;
};

// ---- Process-wide access ----------------------------------------------------------------

struct RWServiceSet {
    RWClock* clock = nullptr;
    RWTimerService* timer = nullptr;
    RWModalService* modal = nullptr;
    RWPasteboard* pasteboard = nullptr;
    RWUserDefaults* userDefaults = nullptr;
};

// The installed services; never null (the headless ones stand in for anything not set).
const RWServiceSet& RWApplicationServices();
// Installs the non-null members of `services`; null members keep what is installed.
void RWInstallServices(const RWServiceSet& services);
// Back to the headless implementations.
void RWResetServices();
// The headless timer queue, for a run loop that uses it.
RWQueuedTimer& RWHeadlessTimer();
