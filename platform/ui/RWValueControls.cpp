#include "platform/ui/RWValueControls.h"

#include <algorithm>
#include <cmath>
#include <limits>

double RWValueControl::clamped(double value) const {
    if (std::isnan(value)) return _minValue;
    return std::max(_minValue, std::min(value, _maxValue));
}

void RWValueControl::setMinValue(double value) {
    _minValue = value;
    _value = clamped(_value);
    changed();
}

void RWValueControl::setMaxValue(double value) {
    _maxValue = value;
    _value = clamped(_value);
    changed();
}

void RWValueControl::setDoubleValue(double value) {
    _value = clamped(value);
    changed();
}

int32_t RWValueControl::intValue() const {
    const double t = std::trunc(_value);
    if (t <= static_cast<double>(std::numeric_limits<int32_t>::min()))
        return std::numeric_limits<int32_t>::min();
    if (t >= static_cast<double>(std::numeric_limits<int32_t>::max()))
        return std::numeric_limits<int32_t>::max();
    return static_cast<int32_t>(t);
}

void RWValueControl::userSetDoubleValue(double value) {
    if (!isEnabled()) return;
    _value = clamped(value);
    changed();
    sendAction();
}

void RWSlider::setNumberOfTickMarks(int64_t count) {
    _numberOfTickMarks = std::max<int64_t>(0, count);
    changed();
}

double RWSlider::closestTickMarkValueToValue(double value) const {
    if (_numberOfTickMarks < 2)
        return _numberOfTickMarks == 1 ? (minValue() + maxValue()) / 2 : value;
    const double step = (maxValue() - minValue()) / static_cast<double>(_numberOfTickMarks - 1);
    if (step <= 0.0) return minValue();
    const double index = std::round((value - minValue()) / step);
    return minValue() + std::clamp(index, 0.0, static_cast<double>(_numberOfTickMarks - 1)) * step;
}

void RWSlider::userSetSliderValue(double value) {
    userSetDoubleValue(_tickMarkValuesOnly ? closestTickMarkValueToValue(value) : value);
}

void RWScrubber::setFormatter(const RWFormatter* formatter) {
    _formatter = formatter;
    changed();
}

void RWScrubber::userStep(double count, Step step) {
    const double increment = step == Step::Fine     ? _fineIncrement
                             : step == Step::Coarse ? _coarseIncrement
                                                    : _normalIncrement;
    userSetDoubleValue(doubleValue() + count * increment);
}
