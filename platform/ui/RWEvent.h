#pragma once
// A user input event with the semantics of the desktop toolkit the framework was written
// for: its type codes, its modifier bits, a location in window coordinates (points, origin
// at the bottom left, y up), click count, characters and wheel deltas. The toolkit adapter
// translates its own events into these; tests build them directly.

#include <cstdint>
#include <string>

#include "platform/geometry/CGGeometry.h"

enum class RWEventType : uint32_t {
    LeftMouseDown = 1,
    LeftMouseUp = 2,
    RightMouseDown = 3,
    RightMouseUp = 4,
    MouseMoved = 5,
    LeftMouseDragged = 6,
    RightMouseDragged = 7,
    MouseEntered = 8,
    MouseExited = 9,
    KeyDown = 10,
    KeyUp = 11,
    FlagsChanged = 12,
    AppKitDefined = 13,
    SystemDefined = 14,
    ApplicationDefined = 15,
    Periodic = 16,
    CursorUpdate = 17,
    Rotate = 18,
    ScrollWheel = 22,
    TabletPoint = 23,
    TabletProximity = 24,
    OtherMouseDown = 25,
    OtherMouseUp = 26,
    OtherMouseDragged = 27,
    Gesture = 29,
    Magnify = 30,
    Swipe = 31,
};

// Event masks: one bit per type, bit number = type code.
using RWEventMask = uint64_t;
inline constexpr RWEventMask RWEventMaskFromType(RWEventType type) {
    return RWEventMask{1} << static_cast<uint32_t>(type);
}
inline constexpr RWEventMask RWEventMaskScrollWheel =
    RWEventMaskFromType(RWEventType::ScrollWheel);  // 0x400000
inline constexpr RWEventMask RWEventMaskAny = ~RWEventMask{0};

// Bits of modifierFlags. The low 16 bits are device dependent and carry nothing here.
enum : uint64_t {
    RWEventModifierFlagCapsLock = 0x10000,
    RWEventModifierFlagShift = 0x20000,
    RWEventModifierFlagControl = 0x40000,
    RWEventModifierFlagOption = 0x80000,
    RWEventModifierFlagCommand = 0x100000,
    RWEventModifierFlagNumericPad = 0x200000,
    RWEventModifierFlagHelp = 0x400000,
    RWEventModifierFlagFunction = 0x800000,
    RWEventModifierFlagDeviceIndependentFlagsMask = 0xffff0000,
};

class RWEvent {
public:
    RWEvent() = default;

    // A mouse event at a window location.
    static RWEvent mouseEvent(RWEventType type, const CGPoint& locationInWindow,
                              uint64_t modifierFlags = 0, int64_t clickCount = 1,
                              double timestamp = 0.0);
    // A key event. With an empty charactersIgnoringModifiers the characters serve for both.
    static RWEvent keyEvent(RWEventType type, const std::string& characters,
                            uint64_t modifierFlags = 0, uint16_t keyCode = 0,
                            bool isARepeat = false,
                            const std::string& charactersIgnoringModifiers = {},
                            double timestamp = 0.0);
    // A wheel event; deltas in lines (or points, for precise deltas), positive y scrolls up.
    static RWEvent scrollWheelEvent(double deltaX, double deltaY,
                                    const CGPoint& locationInWindow = CGPointZero,
                                    uint64_t modifierFlags = 0, double timestamp = 0.0);
    // Only the modifier state changed.
    static RWEvent flagsChangedEvent(uint64_t modifierFlags, double timestamp = 0.0);

    RWEventType type() const { return _type; }
    uint64_t modifierFlags() const { return _modifierFlags; }
    CGPoint locationInWindow() const { return _locationInWindow; }
    int64_t clickCount() const { return _clickCount; }
    // Empty for events that carry no characters.
    const std::string& characters() const { return _characters; }
    const std::string& charactersIgnoringModifiers() const { return _charactersIgnoringModifiers; }
    uint16_t keyCode() const { return _keyCode; }
    bool isARepeat() const { return _isARepeat; }
    double deltaX() const { return _deltaX; }
    double deltaY() const { return _deltaY; }
    double deltaZ() const { return _deltaZ; }
    // Seconds on the clock the host stamps its events with.
    double timestamp() const { return _timestamp; }

    void setModifierFlags(uint64_t flags) { _modifierFlags = flags; }
    void setLocationInWindow(const CGPoint& p) { _locationInWindow = p; }
    void setDeltas(double dx, double dy, double dz = 0.0) {
        _deltaX = dx;
        _deltaY = dy;
        _deltaZ = dz;
    }

    bool isMouseEvent() const;
    bool isKeyEvent() const { return _type == RWEventType::KeyDown || _type == RWEventType::KeyUp; }
    bool matchesMask(RWEventMask mask) const { return (RWEventMaskFromType(_type) & mask) != 0; }

private:
    RWEventType _type = RWEventType::ApplicationDefined;
    uint64_t _modifierFlags = 0;
    CGPoint _locationInWindow;
    int64_t _clickCount = 0;
    std::string _characters;
    std::string _charactersIgnoringModifiers;
    uint16_t _keyCode = 0;
    bool _isARepeat = false;
    double _deltaX = 0.0;
    double _deltaY = 0.0;
    double _deltaZ = 0.0;
    double _timestamp = 0.0;
};
