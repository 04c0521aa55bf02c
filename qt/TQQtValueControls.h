#pragma once
// The slider and the scrubber of platform/ui.
//
// TQQtSlider, a QSlider over a fixed resolution from the model's minimum to its maximum, with
// the model's tick marks; a move is the model's userSetSliderValue (which keeps to the tick
// mark values when the model says so). A slider that keeps to its marks has one position per
// mark.
//
// TQQtScrubber, a QDoubleSpinBox: the model's range and value, its text through the model's
// formatter when it has one. Typing a value is userSetDoubleValue; the arrows and the wheel
// step by the model's normal increment, with Shift by the coarse one and with Alt by the fine
// one (userStep).

#include <QDoubleSpinBox>
#include <QSlider>

#include "platform/ui/RWValueControls.h"
#include "qt/TQQtControlBinding.h"

class TQQtSlider final : public QSlider, public TQQtControlBinding<RWSlider> {
public:
    static constexpr int kResolution = 10000;

    explicit TQQtSlider(QWidget* parent = nullptr);

protected:
    void syncFromModel() override;

private:
    // Positions past the first: one per mark for a slider that keeps to its marks.
    int positions() const;
    double valueAt(int position) const;
};

class TQQtScrubber final : public QDoubleSpinBox, public TQQtControlBinding<RWScrubber> {
public:
    explicit TQQtScrubber(QWidget* parent = nullptr);

    void stepBy(int steps) override;
    QString textFromValue(double value) const override;
    double valueFromText(const QString& text) const override;
    QValidator::State validate(QString& input, int& pos) const override;

protected:
    void syncFromModel() override;
};
