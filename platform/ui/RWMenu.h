#pragma once
// Menus as a toolkit-neutral model: a menu holds items; an item has a title, an action sent
// to a target (RWAction.h), a tag, a state mark, an enabled flag, a key equivalent and maybe a
// submenu. The toolkit adapter shows a menu and calls performActionForItemAtIndex for the
// chosen item; tests do the same.
//
// Ownership: a menu owns its items and an item owns its submenu (shared); supermenu and menu
// are back references, not owned. Targets are not owned either: a target outlives the menus
// that name it (a controller owns its context menus).

#include <cstdint>
#include <memory>
#include <string>
#include <vector>

#include "platform/ui/RWAction.h"
#include "platform/ui/RWEvent.h"

class RWMenu;

enum : int32_t { RWOffState = 0, RWOnState = 1, RWMixedState = -1 };

class RWMenuItem : public RWActionSender {
public:
    RWMenuItem() = default;
    RWMenuItem(std::string title, std::string action, std::string keyEquivalent = {})
        : _title(std::move(title)),
          _action(std::move(action)),
          _keyEquivalent(std::move(keyEquivalent)) {}
    static std::shared_ptr<RWMenuItem> separatorItem();

    const std::string& title() const { return _title; }
    void setTitle(const std::string& title) { _title = title; }
    const std::string& action() const { return _action; }
    void setAction(const std::string& action) { _action = action; }
    RWActionTarget* target() const { return _target; }
    void setTarget(RWActionTarget* target) { _target = target; }
    int64_t tag() const override { return _tag; }
    void setTag(int64_t tag) { _tag = tag; }
    int32_t state() const { return _state; }
    void setState(int32_t state) { _state = state; }
    bool isEnabled() const { return _enabled; }
    void setEnabled(bool enabled) { _enabled = enabled; }
    const std::string& keyEquivalent() const { return _keyEquivalent; }
    void setKeyEquivalent(const std::string& key) { _keyEquivalent = key; }
    // Command unless set otherwise.
    uint64_t keyEquivalentModifierMask() const { return _keyEquivalentModifierMask; }
    void setKeyEquivalentModifierMask(uint64_t mask) { _keyEquivalentModifierMask = mask; }
    bool isSeparatorItem() const { return _separator; }
    bool hasSubmenu() const { return _submenu != nullptr; }
    const std::shared_ptr<RWMenu>& submenu() const { return _submenu; }
    // Also makes this item's menu the submenu's supermenu.
    void setSubmenu(std::shared_ptr<RWMenu> submenu);
    // The menu that holds this item, or null.
    RWMenu* menu() const { return _menu; }

private:
    friend class RWMenu;
    std::string _title;
    std::string _action;
    std::string _keyEquivalent;
    uint64_t _keyEquivalentModifierMask = RWEventModifierFlagCommand;
    RWActionTarget* _target = nullptr;
    int64_t _tag = 0;
    int32_t _state = RWOffState;
    bool _enabled = true;
    bool _separator = false;
    std::shared_ptr<RWMenu> _submenu;
    RWMenu* _menu = nullptr;
};

using RWMenuItemPtr = std::shared_ptr<RWMenuItem>;
using RWMenuPtr = std::shared_ptr<RWMenu>;

class RWMenu {
public:
    explicit RWMenu(std::string title = {}) : _title(std::move(title)) {}
    virtual ~RWMenu();
    RWMenu(const RWMenu&) = delete;
    RWMenu& operator=(const RWMenu&) = delete;

    const std::string& title() const { return _title; }
    void setTitle(const std::string& title) { _title = title; }
    RWMenu* supermenu() const { return _supermenu; }
    bool autoenablesItems() const { return _autoenablesItems; }
    void setAutoenablesItems(bool autoenables) { _autoenablesItems = autoenables; }

    // An item already in another menu is moved here.
    void addItem(const RWMenuItemPtr& item);
    RWMenuItemPtr addItemWithTitle(const std::string& title, const std::string& action,
                                   const std::string& keyEquivalent = {});
    // Out of range: appended at the end.
    void insertItemAtIndex(const RWMenuItemPtr& item, int64_t index);
    // Out of range: nothing happens.
    void removeItemAtIndex(int64_t index);
    void removeItem(const RWMenuItem& item);
    void removeAllItems();
    void setSubmenuForItem(std::shared_ptr<RWMenu> submenu, RWMenuItem& item);

    int64_t numberOfItems() const { return static_cast<int64_t>(_items.size()); }
    const std::vector<RWMenuItemPtr>& itemArray() const { return _items; }
    // Out of range answers null.
    RWMenuItemPtr itemAtIndex(int64_t index) const;
    RWMenuItemPtr itemWithTag(int64_t tag) const;
    RWMenuItemPtr itemWithTitle(const std::string& title) const;
    // -1 when not found.
    int64_t indexOfItem(const RWMenuItem& item) const;
    int64_t indexOfItemWithTag(int64_t tag) const;
    int64_t indexOfItemWithTitle(const std::string& title) const;

    // With autoenablesItems: each item with an action is enabled by its target's
    // validateMenuItem (disabled without a target); items without an action keep their flag
    // unless they have a submenu. Submenus are validated as well.
    void update();
    // Sends the item's action to its target if the item is enabled; answers whether a target
    // took it.
    bool performActionForItemAtIndex(int64_t index);
    // A key press offered to the menu before the focused view sees it: the first enabled item
    // (submenus included) whose key equivalent is the event's characters, ignoring case, and
    // whose modifier mask equals the event's device-independent modifiers (Shift counted
    // only for a letter key equivalent, which stands for its own case) performs its action.
    // Answers whether an item took the key.
    virtual bool performKeyEquivalent(const RWEvent& event);

private:
    friend class RWMenuItem;
    std::string _title;
    std::vector<RWMenuItemPtr> _items;
    RWMenu* _supermenu = nullptr;
    bool _autoenablesItems = true;
};
