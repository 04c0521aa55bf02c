#include "qt/TQQtValueControls.h"

#include <QApplication>
#include <QLineEdit>
#include <QSignalBlocker>

#include <cmath>

// ---- Slider --------------------------------------------------------------------------------

TQQtSlider::TQQtSlider(QWidget* parent) : QSlider(Qt::Horizontal, parent) {
    setRange(0, kResolution);
    connect(this, &QAbstractSlider::valueChanged, this, [this](int position) {
        if (const std::shared_ptr<RWSlider> m = model()) m->userSetSliderValue(valueAt(position));
        syncFromModel();  // the model may have kept to a tick mark
    });
    syncFromModel();
}

int TQQtSlider::positions() const {
    // A slider that keeps to its marks moves from mark to mark, so that a drag sends one
    // action per mark crossed and not one per pixel.
    const RWSlider* m = model().get();
    if (m && m->allowsTickMarkValuesOnly() && m->numberOfTickMarks() > 1)
        return int(m->numberOfTickMarks() - 1);
    return kResolution;
}

double TQQtSlider::valueAt(int position) const {
    const RWSlider* m = model().get();
    if (!m) return 0.0;
    return m->minValue() + (m->maxValue() - m->minValue()) * position / positions();
}

void TQQtSlider::syncFromModel() {
    const QSignalBlocker blocker(this);
    const RWSlider* m = model().get();
    setEnabled(m && m->isEnabled());
    if (!m) return;
    const int n = positions();
    setRange(0, n);
    const double span = m->maxValue() - m->minValue();
    setValue(span > 0.0 ? int(std::lround((m->doubleValue() - m->minValue()) / span * n)) : 0);
    const int64_t ticks = m->numberOfTickMarks();
    setTickPosition(ticks > 0 ? QSlider::TicksBelow : QSlider::NoTicks);
    if (ticks > 1) setTickInterval(std::max(1, int(n / (ticks - 1))));
}

// ---- Scrubber ------------------------------------------------------------------------------

TQQtScrubber::TQQtScrubber(QWidget* parent) : QDoubleSpinBox(parent) {
    setDecimals(6);
    setKeyboardTracking(false);
    connect(this, &QDoubleSpinBox::valueChanged, this, [this](double value) {
        if (const std::shared_ptr<RWScrubber> m = model()) m->userSetDoubleValue(value);
        syncFromModel();
    });
    syncFromModel();
}

void TQQtScrubber::syncFromModel() {
    const QSignalBlocker blocker(this);
    const RWScrubber* m = model().get();
    setEnabled(m && m->isEnabled());
    if (!m) return;
    setRange(m->minValue(), m->maxValue());
    setSingleStep(m->normalIncrement());
    setValue(m->doubleValue());
    // The text may depend on the formatter alone: show it again.
    lineEdit()->setText(textFromValue(m->doubleValue()));
}

void TQQtScrubber::stepBy(int steps) {
    const std::shared_ptr<RWScrubber> m = model();
    if (!m) return;
    const Qt::KeyboardModifiers modifiers = QApplication::keyboardModifiers();
    const RWScrubber::Step step = modifiers & Qt::ShiftModifier ? RWScrubber::Step::Coarse
                                  : modifiers & Qt::AltModifier ? RWScrubber::Step::Fine
                                                                : RWScrubber::Step::Normal;
    m->userStep(steps, step);
}

QString TQQtScrubber::textFromValue(double value) const {
    const RWScrubber* m = model().get();
    const RWFormatter* formatter = m ? m->formatter() : nullptr;
    if (!formatter) return QDoubleSpinBox::textFromValue(value);
    return QString::fromStdString(formatter->stringForObjectValue(value).value_or(std::string()));
}

double TQQtScrubber::valueFromText(const QString& text) const {
    const RWScrubber* m = model().get();
    const RWFormatter* formatter = m ? m->formatter() : nullptr;
    if (!formatter) return QDoubleSpinBox::valueFromText(text);
    RWObjectValue value;
    return formatter->getObjectValue(&value, text.toStdString(), nullptr) ? value.doubleValue()
                                                                          : this->value();
}

QValidator::State TQQtScrubber::validate(QString& input, int& pos) const {
    const RWScrubber* m = model().get();
    const RWFormatter* formatter = m ? m->formatter() : nullptr;
    if (!formatter) return QDoubleSpinBox::validate(input, pos);
    if (!formatter->isPartialStringValid(input.toStdString(), nullptr, nullptr))
        return QValidator::Invalid;
    return formatter->getObjectValue(nullptr, input.toStdString(), nullptr)
               ? QValidator::Acceptable
               : QValidator::Intermediate;
}
