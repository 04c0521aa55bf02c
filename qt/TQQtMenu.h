#pragma once
// Menus of platform/ui (RWMenu) shown as QMenus: items, separators, submenus, check marks
// from the items' state (a dash for a mixed one), enabled flags as the menu's validation leaves
// them. Choosing an
// item calls back with its index in its own menu and the menu, so that the caller performs
// it through the model (RWMenu::performActionForItemAtIndex, or a pop-up's choice).

#include <QMenu>

#include <functional>

#include "platform/ui/RWMenu.h"

using TQQtMenuChoice = std::function<void(RWMenu& menu, int64_t index)>;

// Empties `into` and fills it from `menu`, validating the items first when the menu
// enables them automatically. The top level's actions stand in the order of the menu's items,
// separators included. Key equivalents are not bound to the actions: keys reach the model's
// menus through the window (performKeyEquivalent).
void TQQtFillMenu(QMenu& into, const RWMenuPtr& menu, const TQQtMenuChoice& chosen);

// The mark of an item in the mixed state.
QIcon TQQtMixedStateIcon();

// Shows the menu at a point of the screen, validated as it opens, and runs the chosen item's
// action; answers whether an item was chosen. Nothing shows for a null or empty menu.
bool TQQtRunContextMenu(const RWMenuPtr& menu, const QPoint& globalPosition, QWidget* parent);
