#include "platform/ui/RWScrubberCell.h"

#include <algorithm>
#include <cmath>

std::shared_ptr<RWTextFieldCell> RWScrubberCell::copy() const {
    auto cell = std::make_shared<RWScrubberCell>();
    copyScrubberSettingsTo(*cell);
    return cell;
}

void RWScrubberCell::copyScrubberSettingsTo(RWScrubberCell& copy) const {
    copySettingsTo(copy);
    copy._minValue = _minValue;
    copy._maxValue = _maxValue;
    copy._coarseIncrement = _coarseIncrement;
    copy._normalIncrement = _normalIncrement;
    copy._fineIncrement = _fineIncrement;
}

double RWScrubberCell::shownValue() const {
    const RWObjectValue& value = objectValue();
    if (value.isString() && formatter()) {
        RWObjectValue read;
        if (formatter()->getObjectValue(&read, *value.string(), nullptr)) return read.doubleValue();
    }
    return value.doubleValue();
}

bool RWScrubberCell::trackMouse(const RWEvent&, const CGPoint& point, const CGRect&, RWOutlineView&,
                                bool) {
    _clickedWithoutScrub = false;
    _scrubbing = false;
    if (!isEnabled()) return false;
    _tracking = true;
    _pressPoint = point;
    return true;
}

void RWScrubberCell::continueTracking(const RWEvent& event, const CGPoint& point, RWOutlineView&) {
    if (!_tracking) return;
    const double travel = point.x - _pressPoint.x;
    if (!_scrubbing) {
        if (std::fabs(travel) < kDragThreshold) return;
        _scrubbing = true;
        // The target sets the range, the steps and the formatter of the value it scrubs.
        sendActionNamed(kStartAction);
        _startValue = shownValue();
    }
    const uint64_t flags = event.modifierFlags();
    const double increment = (flags & RWEventModifierFlagShift)    ? _coarseIncrement
                             : (flags & RWEventModifierFlagOption) ? _fineIncrement
                                                                   : _normalIncrement;
    const double steps = std::trunc(travel / kPointsPerStep);
    const double value = std::clamp(_startValue + steps * increment, _minValue, _maxValue);
    if (objectValue() == RWObjectValue(value)) return;
    setObjectValue(value);
    sendAction();
}

void RWScrubberCell::stopTracking(const CGPoint&, RWOutlineView&, bool mouseIsUp) {
    if (!_tracking) return;
    _tracking = false;
    if (_scrubbing) {
        _scrubbing = false;
        sendActionNamed(kEndAction);
        return;
    }
    _clickedWithoutScrub = mouseIsUp;
}
