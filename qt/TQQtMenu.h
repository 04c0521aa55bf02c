#pragma once
// Menus of platform/ui (RWMenu) shown as QMenus: items, separators, submenus, check marks
// from the items' state (a dash for a mixed one), enabled flags as the menu's validation leaves
// them, key equivalents. Choosing an item calls back with its index in its own menu and the menu, so that the caller performs
// it through the model (RWMenu::performActionForItemAtIndex, or a pop-up's choice).

#include <QMenu>

#include <QKeySequence>

#include <cstdint>
#include <functional>
#include <string>

#include "platform/ui/RWMenu.h"

using TQQtMenuChoice = std::function<void(RWMenu& menu, int64_t index)>;

// Empties `into` and fills it from `menu`, validating the items first when the menu
// enables them automatically. The top level's actions stand in the order of the menu's items,
// separators included. Key equivalents are shown beside the titles and work only while the
// QMenu is up: otherwise keys reach the model's menus through the window (performKeyEquivalent).
void TQQtFillMenu(QMenu& into, const RWMenuPtr& menu, const TQQtMenuChoice& chosen);

// A key equivalent and its modifier mask (RWEvent.h) as Qt writes it; empty for no key.
QKeySequence TQQtKeySequenceOfKeyEquivalent(const std::string& key, uint64_t modifierMask);

// The mark of an item in the mixed state.
QIcon TQQtMixedStateIcon();

// Shows the menu at a point of the screen, validated as it opens, and runs the chosen item's
// action; answers whether an item was chosen. Nothing shows for a null or empty menu.
bool TQQtRunContextMenu(const RWMenuPtr& menu, const QPoint& globalPosition, QWidget* parent);
