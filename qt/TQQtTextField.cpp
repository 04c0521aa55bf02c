#include "qt/TQQtTextField.h"

#include <QSignalBlocker>

QValidator::State TQQtFormatterValidator::validate(QString& input, int& pos) const {
    if (!_formatter) return Acceptable;
    std::string replacement;
    if (!_formatter->isPartialStringValid(input.toStdString(), &replacement, nullptr))
        return Invalid;
    if (!replacement.empty() && replacement != input.toStdString()) {
        input = QString::fromStdString(replacement);
        pos = int(input.size());
    }
    return _formatter->getObjectValue(nullptr, input.toStdString(), nullptr) ? Acceptable
                                                                             : Intermediate;
}

TQQtTextField::TQQtTextField(QWidget* parent) : QLineEdit(parent) {
    connect(this, &QLineEdit::editingFinished, this, [this] { endEditing(); });
    connect(this, &QLineEdit::textEdited, this, [this] {
        if (const std::shared_ptr<RWTextField> m = model()) m->userBeginEditing();
    });
    syncFromModel();
}

void TQQtTextField::syncFromModel() {
    const QSignalBlocker blocker(this);
    const RWTextField* m = model().get();
    setEnabled(m && m->isEnabled());
    setReadOnly(!m || !m->isEditable());
    const RWFormatter* formatter = m ? m->formatter() : nullptr;
    const auto* present = dynamic_cast<const TQQtFormatterValidator*>(validator());
    if (!formatter && present) {
        setValidator(nullptr);
        delete present;
    } else if (formatter && (!present || present->formatter() != formatter)) {
        setValidator(new TQQtFormatterValidator(formatter, this));
        delete present;
    }
    const QString text = m ? QString::fromStdString(m->stringValue()) : QString();
    if (this->text() != text) setText(text);
    if (m && m->isAllTextSelected()) selectAll();
    setPlaceholderText(m ? QString::fromStdString(m->placeholderString()) : QString());
}

void TQQtTextField::endEditing() {
    if (const std::shared_ptr<RWTextField> m = model()) m->userEndEditing(text().toStdString());
}

bool TQQtTextField::commitEditing() {
    const std::shared_ptr<RWTextField> m = model();
    if (!m) return true;
    if (!hasAcceptableInput()) {
        syncFromModel();
        return false;
    }
    return !m->userEndEditing(text().toStdString(), false).has_value();
}

void TQQtTextField::focusOutEvent(QFocusEvent* event) {
    QLineEdit::focusOutEvent(event);
    // An edit that the validator holds back never ends: the model's value shows again.
    if (hasAcceptableInput()) return;
    if (const std::shared_ptr<RWTextField> m = model()) m->userAbandonEditing();
    syncFromModel();
}
