#pragma once
// Text fields and their cells.
//
// A cell (RWTextFieldCell) holds an object value and shows it as text through its formatter,
// if it has one: it is what a table or outline column draws in each row, and what a text
// field keeps. A cell draws itself into a frame through RWCellDrawing, which the adapter
// implements on its painter; frames are in the coordinates of the view that draws the cell,
// with y growing downwards as rows are laid out.
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
#include "platform/ui/RWColor.h"
#include "platform/ui/RWControl.h"
#include "platform/ui/RWFormatter.h"
#include "platform/ui/RWObjectValue.h"

enum class RWTextAlignment { Left = 0, Right = 1, Center = 2, Justified = 3, Natural = 4 };

// What a cell draws with.
class RWCellDrawing {
public:
    virtual ~RWCellDrawing() = default;
    virtual bool shouldAntialias() const = 0;
    virtual void setShouldAntialias(bool antialias) = 0;
    virtual void fillRect(const CGRect& rect, const RWColor& color) = 0;
    // A line of the given width along the rectangle's edges.
    virtual void strokeRect(const CGRect& rect, const RWColor& color, double lineWidth) = 0;
    // One line of text in the frame, at its top, aligned; dimmed when the cell is disabled.
    virtual void drawText(const std::string& text, const CGRect& frame, RWTextAlignment alignment,
                          bool enabled) = 0;
};

class RWTextFieldCell {
public:
    // initTextCell: a cell that shows the text.
    explicit RWTextFieldCell(const std::string& text = {}) : _objectValue(text) {}
    virtual ~RWTextFieldCell() = default;
    RWTextFieldCell(const RWTextFieldCell&) = delete;
    RWTextFieldCell& operator=(const RWTextFieldCell&) = delete;

    // A cell of the same class and settings (copyWithZone). Subclasses say what they copy.
    virtual std::shared_ptr<RWTextFieldCell> copy() const;

    const RWObjectValue& objectValue() const { return _objectValue; }
    void setObjectValue(const RWObjectValue& value) { _objectValue = value; }
    // The value as text: the formatter's, or the value's own text without one (and when
    // the formatter cannot show the value, no text).
    std::string stringValue() const;
    // Text in: through the formatter when there is one (text it refuses is kept as the
    // string it is), else the string itself.
    void setStringValue(const std::string& text);
    double doubleValue() const { return _objectValue.doubleValue(); }
    int32_t intValue() const { return _objectValue.intValue(); }

    const RWFormatter* formatter() const { return _formatter; }
    void setFormatter(const RWFormatter* formatter) { _formatter = formatter; }
    bool isEditable() const { return _editable; }
    void setEditable(bool editable) { _editable = editable; }
    bool isEnabled() const { return _enabled; }
    void setEnabled(bool enabled) { _enabled = enabled; }
    RWTextAlignment alignment() const { return _alignment; }
    void setAlignment(RWTextAlignment alignment) { _alignment = alignment; }
    bool wraps() const { return _wraps; }
    void setWraps(bool wraps) { _wraps = wraps; }

    // Draws the text in the frame.
    virtual void drawWithFrame(const CGRect& frame, RWCellDrawing& drawing) const;

protected:
    // The settings of this cell onto a copy.
    void copySettingsTo(RWTextFieldCell& copy) const;

private:
    RWObjectValue _objectValue;
    const RWFormatter* _formatter = nullptr;  // not owned
    bool _editable = false;
    bool _enabled = true;
    RWTextAlignment _alignment = RWTextAlignment::Natural;
    bool _wraps = false;
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

    // ---- The user ----
    // The user ended an edit with this text. Accepted: the value changes and the action is
    // sent; answers nothing. Refused (or the field is disabled or not editable): the value
    // stays and the observers hear of it, so the widget shows the value again; answers why
    // (the formatter's reason, which may be empty).
    std::optional<std::string> userEndEditing(const std::string& text);

private:
    RWTextFieldCellPtr _cell;
    std::string _placeholder;
};
