#include "platform/ui/RWButton.h"

void RWButton::setTitle(const std::string& title) {
    if (_cell->title() == title) return;
    _cell->setTitle(title);
    changed();
}

void RWButton::setImageName(const std::string& name) {
    if (_imageName == name) return;
    _imageName = name;
    changed();
}

void RWButton::setKeyEquivalent(const std::string& key) {
    if (_keyEquivalent == key) return;
    _keyEquivalent = key;
    changed();
}

void RWButton::setState(int32_t state) {
    if (_cell->state() == state) return;
    _cell->setState(state);
    changed();
}

void RWButton::userClick() {
    if (!isEnabled() || isHidden()) return;
    if (_buttonType == RWButtonCell::kSwitchButton) setState(_cell->nextState());
    sendAction();
}
