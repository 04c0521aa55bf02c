#include "platform/ui/RWCell.h"

#include <algorithm>

// ---- Drawing -------------------------------------------------------------------------------

void RWCellDrawing::drawCheckBox(const CGRect& frame, int32_t state, bool enabled,
                                 bool highlighted) {
    constexpr double kBox = 12.0;
    const double side = std::min({kBox, frame.size.width, frame.size.height});
    const CGRect box = CGRectMake(frame.origin.x + (frame.size.width - side) / 2.0,
                                  frame.origin.y + (frame.size.height - side) / 2.0, side, side);
    const float ink = enabled ? 0.85f : 0.45f;
    const RWColor edge = RWColor::colorWithCalibratedRed(ink, ink, ink, 1.0f);
    if (highlighted) fillRect(box, RWColor::colorWithCalibratedRed(0.5f, 0.5f, 0.5f, 0.4f));
    strokeRect(box, edge, 1.0);
    if (state == RWOnState) {
        fillRect(CGRectMake(box.origin.x + 3.0, box.origin.y + 3.0, side - 6.0, side - 6.0), edge);
    } else if (state == RWMixedState) {
        fillRect(CGRectMake(box.origin.x + 3.0, box.origin.y + side / 2.0 - 1.0, side - 6.0, 2.0),
                 edge);
    }
}

// ---- Cell ----------------------------------------------------------------------------------

std::string RWCell::stringValue() const {
    if (!_formatter) return _objectValue.stringValue();
    return _formatter->stringForObjectValue(_objectValue).value_or(std::string());
}

void RWCell::setStringValue(const std::string& text) {
    RWObjectValue value;
    if (_formatter && _formatter->getObjectValue(&value, text, nullptr))
        setObjectValue(value);
    else
        setObjectValue(RWObjectValue(text));
}

void RWCell::copyCellTo(RWCell& copy) const {
    copy._objectValue = _objectValue;
    copy._formatter = _formatter;
    copy._editable = _editable;
    copy._enabled = _enabled;
    copy._alignment = _alignment;
    copy._wraps = _wraps;
    copy._fontSize = _fontSize;
    copy._target = _target;
    copy._action = _action;
    copy._tag = _tag;
}

bool RWCell::sendAction() { return sendActionNamed(_action); }

bool RWCell::sendActionNamed(const std::string& action) {
    if (!_enabled || !_target || action.empty()) return false;
    return _target->performAction(action, *this);
}

void RWCell::drawWithFrame(const CGRect& frame, RWCellDrawing& drawing) const {
    drawing.drawText(stringValue(), frame, _alignment, _enabled);
}

bool RWCell::trackMouse(const RWEvent&, const CGPoint&, const CGRect&, RWOutlineView&, bool) {
    return false;
}

void RWCell::continueTracking(const RWEvent&, const CGPoint&, RWOutlineView&) {}

void RWCell::stopTracking(const CGPoint&, RWOutlineView&, bool) {}

// ---- Button cell ---------------------------------------------------------------------------

RWButtonCell::RWButtonCell(const std::string& title) : RWCell(std::string()), _title(title) {
    RWCell::setObjectValue(int32_t{RWOffState});
}

void RWButtonCell::setState(int32_t state) {
    if (state == RWMixedState && !_allowsMixedState) state = RWOnState;
    RWCell::setObjectValue(static_cast<int32_t>(state < 0   ? RWMixedState
                                                : state > 0 ? RWOnState
                                                            : RWOffState));
}

void RWButtonCell::setObjectValue(const RWObjectValue& value) { setState(value.intValue()); }

void RWButtonCell::setAllowsMixedState(bool allows) {
    _allowsMixedState = allows;
    if (!allows && state() == RWMixedState) setState(RWOnState);
}

int32_t RWButtonCell::nextState() const {
    switch (state()) {
        case RWOnState: return RWOffState;
        case RWOffState: return _allowsMixedState ? RWMixedState : RWOnState;
        default: return RWOnState;
    }
}

void RWButtonCell::drawWithFrame(const CGRect& frame, RWCellDrawing& drawing) const {
    drawing.drawCheckBox(frame, state(), isEnabled(), isHighlighted());
}

bool RWButtonCell::trackMouse(const RWEvent&, const CGPoint& point, const CGRect& frame,
                              RWOutlineView&, bool) {
    _clicked = false;
    if (!isEnabled()) return false;
    _trackingFrame = frame;
    setHighlighted(CGRectContainsPoint(frame, point));
    return true;
}

void RWButtonCell::continueTracking(const RWEvent&, const CGPoint& point, RWOutlineView&) {
    setHighlighted(CGRectContainsPoint(_trackingFrame, point));
}

void RWButtonCell::stopTracking(const CGPoint& point, RWOutlineView&, bool mouseIsUp) {
    setHighlighted(false);
    _clicked = mouseIsUp && CGRectContainsPoint(_trackingFrame, point);
    if (!_clicked) return;
    setNextState();
    sendAction();
}
