#pragma once
// The text field of platform/ui as a QLineEdit. The field shows the model's text, read only
// unless the model is editable. Its formatter becomes the line's validator: text the
// formatter would refuse while it is typed cannot be typed, and only text it accepts ends an
// edit. An ended edit (Return, or leaving the field) is the model's userEndEditing; text the
// model refuses, or a field left with text that is not acceptable, shows the model's value
// again. While the model has its whole text selected, so has the line. Typing marks the model
// as being edited until the edit ends or the field is left.

#include <QLineEdit>
#include <QValidator>

#include "platform/ui/RWFormatter.h"
#include "platform/ui/RWTextField.h"
#include "qt/TQQtControlBinding.h"

// A formatter as a QValidator: Invalid when the partial text may not stand, Acceptable when
// the formatter reads a value from it, Intermediate otherwise. A replacement the formatter
// offers for a partial text is put in the line. The formatter is not owned.
class TQQtFormatterValidator final : public QValidator {
public:
    TQQtFormatterValidator(const RWFormatter* formatter, QObject* parent)
        : QValidator(parent), _formatter(formatter) {}
    const RWFormatter* formatter() const { return _formatter; }
    State validate(QString& input, int& pos) const override;

private:
    const RWFormatter* _formatter;
};

class TQQtTextField final : public QLineEdit, public TQQtControlBinding<RWTextField> {
public:
    explicit TQQtTextField(QWidget* parent = nullptr);

    // Ends the edit in progress with the line's text, without the model's action: false when
    // the text is not acceptable or the model refuses it (the line then shows the model's
    // value again).
    bool commitEditing();

protected:
    void syncFromModel() override;
    void focusOutEvent(QFocusEvent* event) override;

private:
    void endEditing();
};
