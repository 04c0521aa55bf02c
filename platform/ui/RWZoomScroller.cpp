#include "platform/ui/RWZoomScroller.h"

#include <algorithm>
#include <cmath>

namespace {
// NaN counts as 0: a value that is no number must not reach a widget.
double unit(double v) { return std::isnan(v) ? 0.0 : std::clamp(v, 0.0, 1.0); }
}  // namespace

void RWZoomScroller::setFloatValue(double value) {
    _value = unit(value);
    changed();
}

void RWZoomScroller::setKnobProportion(double proportion) {
    _knobProportion = unit(proportion);
    changed();
}

void RWZoomScroller::setMinimumKnobProportion(double proportion) {
    _minimumKnobProportion = unit(proportion);
    changed();
}

double RWZoomScroller::displayedKnobProportion() const {
    return std::max(_knobProportion, _minimumKnobProportion);
}

void RWZoomScroller::setVertical(bool vertical) {
    _vertical = vertical;
    changed();
}

void RWZoomScroller::setFrame(const CGRect& frame) {
    RWControl::setFrame(frame);
    _adjustForGrowBox();
}

void RWZoomScroller::_adjustForGrowBox() {
    if (!_endsAtWindowCorner) return;
    CGRect f = frame();
    if (_vertical)
        f.size.height = std::max(0.0, f.size.height - kGrowBoxSize);
    else
        f.size.width = std::max(0.0, f.size.width - kGrowBoxSize);
    RWControl::setFrame(f);
}

void RWZoomScroller::act(RWScrollerPart part) {
    _hitPart = part;
    changed();
    sendAction();
}

void RWZoomScroller::userClickPart(RWScrollerPart part) {
    if (!isEnabled()) return;
    act(part);
}

void RWZoomScroller::userMoveKnob(double value, RWScrollerPart part) {
    if (!isEnabled()) return;
    _value = unit(value);
    act(part);
}

void RWZoomScroller::userResizeKnob(RWScrollerPart edge, double knobProportion, double value) {
    if (!isEnabled()) return;
    _knobProportion = unit(knobProportion);
    _value = unit(value);
    act(edge);
}
