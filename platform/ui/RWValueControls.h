#pragma once
// Controls that hold one number between a minimum and a maximum: the slider, and the
// scrubber (a number field the user drags or steps to change, shown through a formatter).
//
// The value is kept within the range; a range set later pulls the value into it. A minimum
// above the maximum leaves the range empty at the minimum. intValue truncates toward zero.

#include <cstdint>

#include "platform/ui/RWControl.h"
#include "platform/ui/RWFormatter.h"

class RWValueControl : public RWControl {
public:
    double minValue() const { return _minValue; }
    void setMinValue(double value);
    double maxValue() const { return _maxValue; }
    void setMaxValue(double value);
    double doubleValue() const { return _value; }
    void setDoubleValue(double value);
    float floatValue() const { return static_cast<float>(_value); }
    void setFloatValue(float value) { setDoubleValue(value); }
    int32_t intValue() const;
    void setIntValue(int32_t value) { setDoubleValue(value); }

    // ---- The user ----
    // The user set a value (by dragging, typing or stepping): kept within the range, then
    // the action. Nothing while disabled.
    void userSetDoubleValue(double value);

private:
    double clamped(double value) const;

    double _minValue = 0.0;
    double _maxValue = 1.0;
    double _value = 0.0;
};

class RWSlider : public RWValueControl {
public:
    // 0: a continuous slider; otherwise marks at evenly spaced values, ends included.
    int64_t numberOfTickMarks() const { return _numberOfTickMarks; }
    void setNumberOfTickMarks(int64_t count);
    bool allowsTickMarkValuesOnly() const { return _tickMarkValuesOnly; }
    void setAllowsTickMarkValuesOnly(bool only) { _tickMarkValuesOnly = only; }
    // The tick mark value nearest to `value` (the value itself without marks).
    double closestTickMarkValueToValue(double value) const;

    // With allowsTickMarkValuesOnly the value goes to the nearest mark first.
    void userSetSliderValue(double value);

private:
    int64_t _numberOfTickMarks = 0;
    bool _tickMarkValuesOnly = false;
};

class RWScrubber : public RWValueControl {
public:
    // The steps of a scrub: coarse with the larger modifier, fine with the smaller one.
    double coarseIncrement() const { return _coarseIncrement; }
    void setCoarseIncrement(double increment) { _coarseIncrement = increment; }
    double normalIncrement() const { return _normalIncrement; }
    void setNormalIncrement(double increment) { _normalIncrement = increment; }
    double fineIncrement() const { return _fineIncrement; }
    void setFineIncrement(double increment) { _fineIncrement = increment; }
    // Shows the value; null shows it as a plain number. Not owned.
    const RWFormatter* formatter() const { return _formatter; }
    void setFormatter(const RWFormatter* formatter);

    enum class Step { Fine, Normal, Coarse };
    // The user stepped by `count` increments of a kind (negative: down).
    void userStep(double count, Step step);

private:
    double _coarseIncrement = 10.0;
    double _normalIncrement = 1.0;
    double _fineIncrement = 0.1;
    const RWFormatter* _formatter = nullptr;  // not owned
};
