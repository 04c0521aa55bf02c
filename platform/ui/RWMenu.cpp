#include "platform/ui/RWMenu.h"

#include <algorithm>
#include <cctype>

std::shared_ptr<RWMenuItem> RWMenuItem::separatorItem() {
    auto item = std::make_shared<RWMenuItem>();
    item->_separator = true;
    item->_enabled = false;
    return item;
}

void RWMenuItem::setSubmenu(std::shared_ptr<RWMenu> submenu) {
    if (_submenu) _submenu->_supermenu = nullptr;
    _submenu = std::move(submenu);
    if (_submenu) _submenu->_supermenu = _menu;
}

RWMenu::~RWMenu() {
    // Items may outlive the menu through other references: clear their back pointers.
    for (const auto& item : _items) {
        item->_menu = nullptr;
        if (item->_submenu) item->_submenu->_supermenu = nullptr;
    }
}

void RWMenu::addItem(const RWMenuItemPtr& item) { insertItemAtIndex(item, numberOfItems()); }

RWMenuItemPtr RWMenu::addItemWithTitle(const std::string& title, const std::string& action,
                                       const std::string& keyEquivalent) {
    auto item = std::make_shared<RWMenuItem>(title, action, keyEquivalent);
    addItem(item);
    return item;
}

void RWMenu::insertItemAtIndex(const RWMenuItemPtr& item, int64_t index) {
    if (!item) return;
    if (item->_menu) item->_menu->removeItem(*item);
    if (index < 0 || index > numberOfItems()) index = numberOfItems();
    _items.insert(_items.begin() + index, item);
    item->_menu = this;
    if (item->_submenu) item->_submenu->_supermenu = this;
}

void RWMenu::removeItemAtIndex(int64_t index) {
    if (index < 0 || index >= numberOfItems()) return;
    RWMenuItemPtr item = _items[static_cast<size_t>(index)];
    _items.erase(_items.begin() + index);
    item->_menu = nullptr;
    if (item->_submenu) item->_submenu->_supermenu = nullptr;
}

void RWMenu::removeItem(const RWMenuItem& item) { removeItemAtIndex(indexOfItem(item)); }

void RWMenu::removeAllItems() {
    while (!_items.empty()) removeItemAtIndex(numberOfItems() - 1);
}

void RWMenu::setSubmenuForItem(std::shared_ptr<RWMenu> submenu, RWMenuItem& item) {
    item.setSubmenu(std::move(submenu));
}

RWMenuItemPtr RWMenu::itemAtIndex(int64_t index) const {
    if (index < 0 || index >= numberOfItems()) return nullptr;
    return _items[static_cast<size_t>(index)];
}

RWMenuItemPtr RWMenu::itemWithTag(int64_t tag) const {
    return itemAtIndex(indexOfItemWithTag(tag));
}

RWMenuItemPtr RWMenu::itemWithTitle(const std::string& title) const {
    return itemAtIndex(indexOfItemWithTitle(title));
}

namespace {
template <class Pred>
int64_t indexWhere(const std::vector<RWMenuItemPtr>& items, Pred pred) {
    auto it = std::find_if(items.begin(), items.end(), pred);
    return it == items.end() ? -1 : static_cast<int64_t>(it - items.begin());
}
}  // namespace

int64_t RWMenu::indexOfItem(const RWMenuItem& item) const {
    return indexWhere(_items, [&](const RWMenuItemPtr& p) { return p.get() == &item; });
}

int64_t RWMenu::indexOfItemWithTag(int64_t tag) const {
    return indexWhere(_items, [&](const RWMenuItemPtr& p) { return p->tag() == tag; });
}

int64_t RWMenu::indexOfItemWithTitle(const std::string& title) const {
    return indexWhere(_items, [&](const RWMenuItemPtr& p) { return p->title() == title; });
}

void RWMenu::update() {
    for (const auto& item : _items) {
        if (item->_submenu) item->_submenu->update();
        if (!_autoenablesItems || item->_separator) continue;
        if (!item->_action.empty())
            item->_enabled = item->_target != nullptr && item->_target->validateMenuItem(*item);
        else if (item->_submenu)
            item->_enabled = true;
    }
}

bool RWMenu::performActionForItemAtIndex(int64_t index) {
    RWMenuItemPtr item = itemAtIndex(index);
    // Held by a local reference: the action may remove the item from this menu.
    if (!item || !item->_enabled || item->_action.empty() || !item->_target) return false;
    return item->_target->performAction(item->_action, *item);
}

namespace {
std::string lowered(const std::string& text) {
    std::string out = text;
    for (char& c : out) c = static_cast<char>(std::tolower(static_cast<unsigned char>(c)));
    return out;
}

bool isUpperLetter(const std::string& text) {
    return text.size() == 1 && std::isupper(static_cast<unsigned char>(text[0]));
}

constexpr uint64_t kKeyEquivalentModifiers = RWEventModifierFlagShift | RWEventModifierFlagControl |
                                             RWEventModifierFlagOption | RWEventModifierFlagCommand;
}  // namespace

bool RWMenu::performKeyEquivalent(const RWEvent& event) {
    if (event.type() != RWEventType::KeyDown) return false;
    const std::string& typed = event.charactersIgnoringModifiers().empty()
                                   ? event.characters()
                                   : event.charactersIgnoringModifiers();
    if (typed.empty()) return false;
    const uint64_t modifiers = event.modifierFlags() & kKeyEquivalentModifiers;
    // By index, each item held: an action may change this menu.
    for (int64_t i = 0; i < numberOfItems(); ++i) {
        const RWMenuItemPtr item = _items[static_cast<size_t>(i)];
        if (item->_submenu && item->_submenu->performKeyEquivalent(event)) return true;
        if (item->_keyEquivalent.empty() || !item->_enabled) continue;
        const uint64_t wanted =
            (item->_keyEquivalentModifierMask & kKeyEquivalentModifiers) |
            (isUpperLetter(item->_keyEquivalent) ? uint64_t{RWEventModifierFlagShift} : 0);
        if (wanted != modifiers || lowered(item->_keyEquivalent) != lowered(typed)) continue;
        if (performActionForItemAtIndex(i)) return true;
    }
    return false;
}
