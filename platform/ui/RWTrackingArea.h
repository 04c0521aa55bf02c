#pragma once
// A region of a view in which the pointer is tracked without a button down. A view that keeps
// its own areas (the outline) reports entries and exits itself; a view whose host tracks the
// pointer gives its area to the host (RWViewHost::addTrackingArea), and the host tells the
// area's owner when the pointer moves inside it, so that the owner can choose the pointer's
// shape for what a click there would do.
//
// Lifetime: the owner is not owned and must remove its areas from the host (or outlive it).

#include <cstdint>
#include <map>
#include <memory>
#include <string>

#include "platform/geometry/CGGeometry.h"
#include "platform/ui/RWEvent.h"

// What a host reports to the owner of an area with RWTrackingCursorUpdate.
class RWTrackingAreaOwner {
public:
    virtual ~RWTrackingAreaOwner() = default;
    virtual void cursorUpdate(const RWEvent& event) = 0;
};

enum RWTrackingAreaOptions : uint64_t {
    RWTrackingMouseEnteredAndExited = 0x01,
    RWTrackingMouseMoved = 0x02,
    RWTrackingCursorUpdate = 0x04,
    RWTrackingActiveWhenFirstResponder = 0x10,
    RWTrackingActiveInKeyWindow = 0x20,
    RWTrackingActiveInActiveApp = 0x40,
    RWTrackingActiveAlways = 0x80,
    RWTrackingAssumeInside = 0x100,
    // The rectangle is ignored: the area follows the view's visible part.
    RWTrackingInVisibleRect = 0x200,
    RWTrackingEnabledDuringMouseDrag = 0x400,
};

struct RWTrackingArea {
    uint64_t identifier = 0;  // given by a view that keeps its own areas
    CGRect rect = CGRectZero;
    uint64_t options = 0;
    std::map<std::string, int64_t> userInfo;
    RWTrackingAreaOwner* owner = nullptr;  // not owned; hears cursor updates through a host

    int64_t value(const std::string& key, int64_t fallback = -1) const {
        const auto it = userInfo.find(key);
        return it == userInfo.end() ? fallback : it->second;
    }
    // Whether a point of the view (in points, as its bounds) lies in the area, given the
    // view's visible rectangle.
    bool contains(const CGPoint& point, const CGRect& visibleRect) const {
        return CGRectContainsPoint((options & RWTrackingInVisibleRect) ? visibleRect : rect, point);
    }
};

using RWTrackingAreaPtr = std::shared_ptr<RWTrackingArea>;
