#include "platform/ui/RWEvent.h"

RWEvent RWEvent::mouseEvent(RWEventType type, const CGPoint& locationInWindow,
                            uint64_t modifierFlags, int64_t clickCount, double timestamp) {
    RWEvent e;
    e._type = type;
    e._locationInWindow = locationInWindow;
    e._modifierFlags = modifierFlags;
    e._clickCount = clickCount;
    e._timestamp = timestamp;
    return e;
}

RWEvent RWEvent::keyEvent(RWEventType type, const std::string& characters, uint64_t modifierFlags,
                          uint16_t keyCode, bool isARepeat,
                          const std::string& charactersIgnoringModifiers, double timestamp) {
    RWEvent e;
    e._type = type;
    e._characters = characters;
    e._charactersIgnoringModifiers =
        charactersIgnoringModifiers.empty() ? characters : charactersIgnoringModifiers;
    e._modifierFlags = modifierFlags;
    e._keyCode = keyCode;
    e._isARepeat = isARepeat;
    e._timestamp = timestamp;
    return e;
}

RWEvent RWEvent::scrollWheelEvent(double deltaX, double deltaY, const CGPoint& locationInWindow,
                                  uint64_t modifierFlags, double timestamp) {
    RWEvent e;
    e._type = RWEventType::ScrollWheel;
    e._deltaX = deltaX;
    e._deltaY = deltaY;
    e._locationInWindow = locationInWindow;
    e._modifierFlags = modifierFlags;
    e._timestamp = timestamp;
    return e;
}

RWEvent RWEvent::flagsChangedEvent(uint64_t modifierFlags, double timestamp) {
    RWEvent e;
    e._type = RWEventType::FlagsChanged;
    e._modifierFlags = modifierFlags;
    e._timestamp = timestamp;
    return e;
}

bool RWEvent::isMouseEvent() const {
    switch (_type) {
        case RWEventType::LeftMouseDown:
        case RWEventType::LeftMouseUp:
        case RWEventType::RightMouseDown:
        case RWEventType::RightMouseUp:
        case RWEventType::MouseMoved:
        case RWEventType::LeftMouseDragged:
        case RWEventType::RightMouseDragged:
        case RWEventType::MouseEntered:
        case RWEventType::MouseExited:
        case RWEventType::OtherMouseDown:
        case RWEventType::OtherMouseUp:
        case RWEventType::OtherMouseDragged: return true;
        default: return false;
    }
}
