#pragma once
// Text fields and their cells.
//
// A text field cell (RWTextFieldCell) is the plain cell of RWCell.h: it shows its object value
// as text. It is what a table or outline column draws in each row, and what a text field keeps.
//
// A text field (RWTextField) is the control around one cell. When the user ends an edit, the
// typed text goes through the formatter: refused text leaves the value as it was and answers
// the formatter's reason; accepted text becomes the value and the action is sent.
//
// Formatters are shared and not owned: a formatter outlives the cells and fields that use it.

#include <memory>
#include <optional>
#include <string>

#include "platform/geometry/CGGeometry.h"
#include "platform/ui/RWCell.h"
#include "platform/ui/RWControl.h"
#include "platform/ui/RWFormatter.h"
#include "platform/ui/RWObjectValue.h"

class RWTextFieldCell : public RWCell {
public:
    // initTextCell: a cell that shows the text.
    explicit RWTextFieldCell(const std::string& text = {}) : RWCell(text) {}

    // A cell of the same class and settings (copyWithZone). Subclasses say what they copy.
    virtual std::shared_ptr<RWTextFieldCell> copy() const;

protected:
    // The settings of this cell onto a copy.
    void copySettingsTo(RWTextFieldCell& copy) const;
};

using RWTextFieldCellPtr = std::shared_ptr<RWTextFieldCell>;

class RWTextField : public RWControl {
public:
    // With a plain cell; a subclass or a host may give another.
    RWTextField() : _cell(std::make_shared<RWTextFieldCell>()) {}

    const RWTextFieldCellPtr& cell() const { return _cell; }
    // Null is refused: the field keeps its cell.
    void setCell(RWTextFieldCellPtr cell);

    const RWObjectValue& objectValue() const { return _cell->objectValue(); }
    void setObjectValue(const RWObjectValue& value);
    std::string stringValue() const { return _cell->stringValue(); }
    void setStringValue(const std::string& text);
    double doubleValue() const { return _cell->doubleValue(); }
    int32_t intValue() const { return _cell->intValue(); }
    void setDoubleValue(double value) { setObjectValue(RWObjectValue(value)); }
    const RWFormatter* formatter() const { return _cell->formatter(); }
    void setFormatter(const RWFormatter* formatter);
    bool isEditable() const { return _cell->isEditable(); }
    void setEditable(bool editable);
    const std::string& placeholderString() const { return _placeholder; }
    void setPlaceholderString(const std::string& text);

    // ---- The text being edited ----
    // Selects the whole text, so that what is typed next replaces it. Setting a value keeps
    // the selection as it is.
    void selectText();
    bool isAllTextSelected() const { return _allTextSelected; }
    // Text typed into the field (a key press forwarded to it): it replaces the whole text
    // when that is selected and is appended otherwise, and the insertion point follows it.
    // Nothing is sent: the edit has not ended.
    void insertText(const std::string& text);

    // ---- The user ----
    // The user began changing the text (typed into it): until the edit ends or is abandoned,
    // whoever keeps the field up to date leaves it alone, so that the typing is not lost.
    void userBeginEditing() { _editing = true; }
    // The user left the field without an edit that ends (text it would refuse).
    void userAbandonEditing();
    bool isEditing() const { return _editing; }
    // The user ended an edit with this text. Accepted: the value changes and the action is
    // sent (unless the edit ended without it: a click on a button of the field's window
    // settles the field first); answers nothing. Refused (or the field is disabled or not
    // editable): the value stays and the observers hear of it, so the widget shows the value
    // again; answers why (the formatter's reason, which may be empty).
    std::optional<std::string> userEndEditing(const std::string& text, bool sendsAction = true);

private:
    RWTextFieldCellPtr _cell;
    std::string _placeholder;
    bool _allTextSelected = false;
    bool _editing = false;
};
