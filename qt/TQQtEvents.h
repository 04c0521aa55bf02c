#pragma once
// Qt input events as the views expect them (RWEvent): type codes, modifier bits, locations in
// window coordinates with y up, wheel deltas in lines, and key characters.
//
// Modifiers. The views follow a desktop where Command is the key of shortcuts and of
// extending a selection, and Control a secondary key. On this desktop Ctrl plays the first
// role, so Qt's Control becomes RWEventModifierFlagCommand and Qt's Meta (the Super or
// Windows key) becomes RWEventModifierFlagControl; Alt is Option, Shift is Shift.
//
// Keys. Printable keys carry their text. Keys without text carry the private-use characters
// the views' desktop gives them (the arrows U+F700..U+F703, F1.. from U+F704, forward delete
// U+F728, Home, End, Page Up and Down), Backspace U+007F, Return U+000D, Escape U+001B.

#include <QKeyEvent>
#include <QMouseEvent>
#include <QWheelEvent>

#include <optional>

#include "platform/ui/RWEvent.h"
#include "qt/TQQtServices.h"

namespace TQQtEvents {

uint64_t modifierFlags(Qt::KeyboardModifiers modifiers);

// The characters of a key without text (arrows, function keys...); empty for keys with text.
std::string functionKeyCharacters(int qtKey);

// A mouse event of the widget behind `host`. clickCount counts presses of one multi-click
// (Qt reports the second press as a double click). Answers nothing for buttons the views do
// not know (back, forward...) and for event types that are not mouse events.
std::optional<RWEvent> mouseEvent(const QMouseEvent& event, const TQQtViewHost& host,
                                  int64_t clickCount = 1);

// A wheel event: one notch (120 eighths of a degree) is one line; a precise device (a
// touchpad) gives its pixel deltas in points instead. Positive y scrolls up.
RWEvent wheelEvent(const QWheelEvent& event, const TQQtViewHost& host);

// A key press (also the shortcut override Qt sends before it) or release; a press or
// release of a modifier key alone becomes a FlagsChanged event with the new modifier state.
RWEvent keyEvent(const QKeyEvent& event);

}  // namespace TQQtEvents
