#pragma once
// A region of a view in which the pointer is tracked without a button down: the view's host
// tells the area's owner when the pointer moves inside it, so that the owner can choose the
// pointer's shape for what a click there would do.
//
// Lifetime: the owner is not owned and must remove its areas from the host (or outlive it).
// The host keeps the areas it was given until they are removed.

#include <cstdint>
#include <memory>

#include "platform/geometry/CGGeometry.h"
#include "platform/ui/RWEvent.h"

// What the host reports to the owner of an area; the owner takes the cases it asked for.
class RWTrackingAreaOwner {
public:
    virtual ~RWTrackingAreaOwner() = default;
    virtual void cursorUpdate(const RWEvent& event) = 0;
};

enum RWTrackingAreaOptions : uint32_t {
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

class RWTrackingArea {
public:
    RWTrackingArea(const CGRect& rect, uint32_t options, RWTrackingAreaOwner* owner)
        : _rect(rect), _options(options), _owner(owner) {}

    const CGRect& rect() const { return _rect; }
    uint32_t options() const { return _options; }
    RWTrackingAreaOwner* owner() const { return _owner; }
    // Whether a point of the view (in points, as its bounds) lies in the area, given the
    // view's visible rectangle.
    bool contains(const CGPoint& point, const CGRect& visibleRect) const {
        return CGRectContainsPoint((_options & RWTrackingInVisibleRect) ? visibleRect : _rect,
                                   point);
    }

private:
    CGRect _rect;
    uint32_t _options;
    RWTrackingAreaOwner* _owner;  // not owned
};

using RWTrackingAreaPtr = std::shared_ptr<RWTrackingArea>;
