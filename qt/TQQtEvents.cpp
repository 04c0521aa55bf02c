#include "qt/TQQtEvents.h"

namespace TQQtEvents {

namespace {

double seconds(const QInputEvent& event) { return static_cast<double>(event.timestamp()) / 1000.0; }

std::string utf8(char32_t c) { return QString::fromUcs4(&c, 1).toStdString(); }

// The modifier a modifier key stands for, if it is one.
std::optional<Qt::KeyboardModifier> modifierOfKey(int key) {
    switch (key) {
        case Qt::Key_Shift: return Qt::ShiftModifier;
        case Qt::Key_Control: return Qt::ControlModifier;
        case Qt::Key_Alt:
        case Qt::Key_AltGr: return Qt::AltModifier;
        case Qt::Key_Meta:
        case Qt::Key_Super_L:
        case Qt::Key_Super_R: return Qt::MetaModifier;
        default: return std::nullopt;
    }
}

}  // namespace

uint64_t modifierFlags(Qt::KeyboardModifiers modifiers) {
    uint64_t flags = 0;
    if (modifiers & Qt::ShiftModifier) flags |= RWEventModifierFlagShift;
    if (modifiers & Qt::ControlModifier) flags |= RWEventModifierFlagCommand;
    if (modifiers & Qt::MetaModifier) flags |= RWEventModifierFlagControl;
    if (modifiers & Qt::AltModifier) flags |= RWEventModifierFlagOption;
    if (modifiers & Qt::KeypadModifier) flags |= RWEventModifierFlagNumericPad;
    return flags;
}

std::string functionKeyCharacters(int key) {
    switch (key) {
        case Qt::Key_Up: return utf8(0xF700);
        case Qt::Key_Down: return utf8(0xF701);
        case Qt::Key_Left: return utf8(0xF702);
        case Qt::Key_Right: return utf8(0xF703);
        case Qt::Key_Insert: return utf8(0xF727);
        case Qt::Key_Delete: return utf8(0xF728);
        case Qt::Key_Home: return utf8(0xF729);
        case Qt::Key_End: return utf8(0xF72B);
        case Qt::Key_PageUp: return utf8(0xF72C);
        case Qt::Key_PageDown: return utf8(0xF72D);
        case Qt::Key_Backspace: return utf8(0x7F);
        case Qt::Key_Return:
        case Qt::Key_Enter: return utf8(0x0D);
        case Qt::Key_Escape: return utf8(0x1B);
        case Qt::Key_Tab: return utf8(0x09);
        case Qt::Key_Backtab: return utf8(0x19);
        default: break;
    }
    if (key >= Qt::Key_F1 && key <= Qt::Key_F35)
        return utf8(0xF704 + static_cast<char32_t>(key - Qt::Key_F1));
    return {};
}

std::optional<RWEvent> mouseEvent(const QMouseEvent& event, const TQQtViewHost& host,
                                  int64_t clickCount) {
    const auto pick = [](Qt::MouseButton button, RWEventType left, RWEventType right,
                         RWEventType other) -> std::optional<RWEventType> {
        switch (button) {
            case Qt::LeftButton: return left;
            case Qt::RightButton: return right;
            case Qt::MiddleButton: return other;
            default: return std::nullopt;
        }
    };
    std::optional<RWEventType> type;
    switch (event.type()) {
        case QEvent::MouseButtonPress:
        case QEvent::MouseButtonDblClick:
            type = pick(event.button(), RWEventType::LeftMouseDown, RWEventType::RightMouseDown,
                        RWEventType::OtherMouseDown);
            break;
        case QEvent::MouseButtonRelease:
            type = pick(event.button(), RWEventType::LeftMouseUp, RWEventType::RightMouseUp,
                        RWEventType::OtherMouseUp);
            break;
        case QEvent::MouseMove:
            // The drag of the button held longest in the views' order: left, right, other.
            if (event.buttons() & Qt::LeftButton)
                type = RWEventType::LeftMouseDragged;
            else if (event.buttons() & Qt::RightButton)
                type = RWEventType::RightMouseDragged;
            else if (event.buttons() & Qt::MiddleButton)
                type = RWEventType::OtherMouseDragged;
            else
                type = RWEventType::MouseMoved;
            break;
        default: break;
    }
    if (!type) return std::nullopt;
    const int64_t clicks = *type == RWEventType::MouseMoved ? 0 : std::max<int64_t>(1, clickCount);
    return RWEvent::mouseEvent(*type, host.windowPointFromWidgetPoint(event.position()),
                               modifierFlags(event.modifiers()), clicks, seconds(event));
}

RWEvent wheelEvent(const QWheelEvent& event, const TQQtViewHost& host) {
    double dx = 0.0;
    double dy = 0.0;
    if (!event.pixelDelta().isNull()) {
        dx = event.pixelDelta().x();
        dy = event.pixelDelta().y();
    } else {
        dx = event.angleDelta().x() / 120.0;
        dy = event.angleDelta().y() / 120.0;
    }
    // A natural-scrolling device reports inverted deltas; the views want the wheel's sense.
    if (event.inverted()) {
        dx = -dx;
        dy = -dy;
    }
    return RWEvent::scrollWheelEvent(dx, dy, host.windowPointFromWidgetPoint(event.position()),
                                     modifierFlags(event.modifiers()), seconds(event));
}

RWEvent keyEvent(const QKeyEvent& event) {
    // A shortcut override is Qt's look at a key press before the shortcuts take it.
    const bool press = event.type() == QEvent::KeyPress || event.type() == QEvent::ShortcutOverride;
    Qt::KeyboardModifiers modifiers = event.modifiers();
    if (const auto modifier = modifierOfKey(event.key())) {
        // Platforms differ on whether the state already holds the key being pressed.
        modifiers = press ? (modifiers | *modifier) : (modifiers & ~*modifier);
        return RWEvent::flagsChangedEvent(modifierFlags(modifiers), seconds(event));
    }
    std::string characters = functionKeyCharacters(event.key());
    std::string ignoringModifiers = characters;
    if (characters.empty()) {
        characters = event.text().toStdString();
        // The key's own character: Qt names letter keys in upper case; Shift is the one
        // modifier that still counts.
        if (event.key() > 0 && event.key() < 0x110000 && event.key() != Qt::Key_unknown) {
            const char32_t code = static_cast<char32_t>(event.key());
            QString base = QString::fromUcs4(&code, 1);
            if (!(modifiers & Qt::ShiftModifier)) base = base.toLower();
            ignoringModifiers = base.toStdString();
        } else {
            ignoringModifiers = characters;
        }
    }
    return RWEvent::keyEvent(press ? RWEventType::KeyDown : RWEventType::KeyUp, characters,
                             modifierFlags(modifiers),
                             static_cast<uint16_t>(event.nativeVirtualKey() & 0xFFFF),
                             event.isAutoRepeat(), ignoringModifiers, seconds(event));
}

}  // namespace TQQtEvents
