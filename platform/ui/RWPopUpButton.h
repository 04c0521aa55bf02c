#pragma once
// A button that pops up its menu and shows the title of the chosen item. The menu is the
// button's (its cell's menu in the toolkits that have cells) and may be replaced.
//
// Just before the menu opens, the button posts RWPopUpButtonWillPopUpNotification: an
// observer may rebuild the menu then, and the adapter shows what the menu holds after it.
// Choosing an item selects it, shows its title, and sends the item's action to the item's
// target; an item without an action sends the button's own action instead.

#include <cstdint>
#include <string>

#include "platform/ui/RWControl.h"
#include "platform/ui/RWMenu.h"

inline constexpr const char* RWPopUpButtonWillPopUpNotification =
    "RWPopUpButtonWillPopUpNotification";

class RWPopUpButton : public RWControl {
public:
    RWPopUpButton() : _menu(std::make_shared<RWMenu>()) {}

    // Never null: a null menu is replaced by an empty one. The selection is dropped.
    const RWMenuPtr& menu() const { return _menu; }
    void setMenu(RWMenuPtr menu);

    int64_t numberOfItems() const { return _menu->numberOfItems(); }
    RWMenuItemPtr itemAtIndex(int64_t index) const { return _menu->itemAtIndex(index); }
    void addItem(const RWMenuItemPtr& item);
    // Empties the menu and drops the selection.
    void removeAllItems();

    // The selected item's index, -1 when none (also when it has left the menu).
    int64_t indexOfSelectedItem() const;
    RWMenuItemPtr selectedItem() const { return itemAtIndex(indexOfSelectedItem()); }
    // Out of range selects none.
    void selectItemAtIndex(int64_t index);
    // Null, or an item not in the menu, selects none.
    void selectItem(const RWMenuItem* item);

    // The text the closed button shows.
    const std::string& title() const { return _title; }
    void setTitle(const std::string& title);
    bool isBordered() const { return _bordered; }
    void setBordered(bool bordered);

    // ---- The user ----
    // The user is about to open the menu: the notification goes out.
    void userWillPopUp();
    // The user chose an item of the open menu. Nothing for a disabled button, an index out
    // of range, a separator or a disabled item.
    void userSelectItemAtIndex(int64_t index);

private:
    RWMenuPtr _menu;
    // The selected item itself, so that the selection follows the item when items move.
    RWMenuItemPtr _selected;
    std::string _title;
    bool _bordered = true;
};
