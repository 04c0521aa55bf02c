#include "platform/ui/RWPopUpButton.h"

void RWPopUpButton::setMenu(RWMenuPtr menu) {
    _menu = menu ? std::move(menu) : std::make_shared<RWMenu>();
    _selected.reset();
    changed();
}

void RWPopUpButton::addItem(const RWMenuItemPtr& item) {
    _menu->addItem(item);
    changed();
}

void RWPopUpButton::removeAllItems() {
    _menu->removeAllItems();
    _selected.reset();
    changed();
}

int64_t RWPopUpButton::indexOfSelectedItem() const {
    return _selected ? _menu->indexOfItem(*_selected) : -1;
}

void RWPopUpButton::selectItemAtIndex(int64_t index) {
    _selected = _menu->itemAtIndex(index);
    changed();
}

void RWPopUpButton::selectItem(const RWMenuItem* item) {
    _selected = item ? _menu->itemAtIndex(_menu->indexOfItem(*item)) : nullptr;
    changed();
}

void RWPopUpButton::setTitle(const std::string& title) {
    _title = title;
    changed();
}

void RWPopUpButton::setBordered(bool bordered) {
    _bordered = bordered;
    changed();
}

void RWPopUpButton::userWillPopUp() {
    if (!isEnabled()) return;
    postNotification(RWPopUpButtonWillPopUpNotification);
}

void RWPopUpButton::userSelectItemAtIndex(int64_t index) {
    const RWMenuItemPtr item = _menu->itemAtIndex(index);
    if (!isEnabled() || !item || item->isSeparatorItem() || !item->isEnabled()) return;
    const std::shared_ptr<RWControl> keep = weak_from_this().lock();  // the action may drop it
    _selected = item;
    _title = item->title();
    changed();
    if (!item->action().empty() && item->target())
        _menu->performActionForItemAtIndex(index);
    else
        sendAction();
}
