#include "platform/ui/RWTextField.h"

// ---- Cell ----------------------------------------------------------------------------------

std::shared_ptr<RWTextFieldCell> RWTextFieldCell::copy() const {
    auto cell = std::make_shared<RWTextFieldCell>();
    copySettingsTo(*cell);
    return cell;
}

void RWTextFieldCell::copySettingsTo(RWTextFieldCell& copy) const {
    copy._objectValue = _objectValue;
    copy._formatter = _formatter;
    copy._editable = _editable;
    copy._enabled = _enabled;
    copy._alignment = _alignment;
    copy._wraps = _wraps;
}

std::string RWTextFieldCell::stringValue() const {
    if (!_formatter) return _objectValue.stringValue();
    return _formatter->stringForObjectValue(_objectValue).value_or(std::string());
}

void RWTextFieldCell::setStringValue(const std::string& text) {
    RWObjectValue value;
    if (_formatter && _formatter->getObjectValue(&value, text, nullptr))
        _objectValue = value;
    else
        _objectValue = RWObjectValue(text);
}

void RWTextFieldCell::drawWithFrame(const CGRect& frame, RWCellDrawing& drawing) const {
    drawing.drawText(stringValue(), frame, _alignment, _enabled);
}

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

std::optional<std::string> RWTextField::userEndEditing(const std::string& text) {
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
    changed();
    sendAction();
    return std::nullopt;
}
