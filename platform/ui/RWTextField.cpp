#include "platform/ui/RWTextField.h"

// ---- Cell ----------------------------------------------------------------------------------

std::shared_ptr<RWTextFieldCell> RWTextFieldCell::copy() const {
    auto cell = std::make_shared<RWTextFieldCell>();
    copySettingsTo(*cell);
    return cell;
}

void RWTextFieldCell::copySettingsTo(RWTextFieldCell& copy) const { copyCellTo(copy); }

// ---- Field ---------------------------------------------------------------------------------

void RWTextField::setCell(RWTextFieldCellPtr cell) {
    if (!cell) return;
    _cell = std::move(cell);
    changed();
}

void RWTextField::setObjectValue(const RWObjectValue& value) {
    _cell->setObjectValue(value);
    changed();
}

void RWTextField::setStringValue(const std::string& text) {
    _cell->setStringValue(text);
    changed();
}

void RWTextField::setFormatter(const RWFormatter* formatter) {
    _cell->setFormatter(formatter);
    changed();
}

void RWTextField::setEditable(bool editable) {
    _cell->setEditable(editable);
    changed();
}

void RWTextField::setPlaceholderString(const std::string& text) {
    _placeholder = text;
    changed();
}

void RWTextField::selectText() {
    _allTextSelected = true;
    changed();
}

void RWTextField::insertText(const std::string& text) {
    const std::string typed = _allTextSelected ? text : stringValue() + text;
    _allTextSelected = false;
    _editing = true;
    _cell->setStringValue(typed);
    changed();
}

void RWTextField::userAbandonEditing() {
    _editing = false;
    changed();
}

std::optional<std::string> RWTextField::userEndEditing(const std::string& text, bool sendsAction) {
    _editing = false;
    if (!isEnabled() || !isEditable()) {
        changed();
        return std::string();
    }
    RWObjectValue value(text);
    if (const RWFormatter* f = formatter()) {
        std::string why;
        if (!f->getObjectValue(&value, text, &why)) {
            changed();
            return why;
        }
    }
    _cell->setObjectValue(value);
    _allTextSelected = false;
    changed();
    if (sendsAction) sendAction();
    return std::nullopt;
}
