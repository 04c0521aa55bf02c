#include "platform/inspector/TQChanNumberControllers.h"

#include <algorithm>
#include <cmath>

#include "platform/channels/TQChannel.h"
#include "platform/channels/TQCompoundChannel.h"

namespace {
constexpr double kZeroTolerance = 1e-7;
}  // namespace

double TQChanNumberController::displayScaleOf(const TQChannel& channel) {
    return channel.getInfo()->displayScale;
}

double TQChanNumberController::clampToCurve(const TQChannel& channel, double x) {
    return std::clamp(x, channel.curveMinimum(),
                      std::max(channel.curveMinimum(), channel.curveMaximum()));
}

double TQChanNumberController::snapToDigits(double x, int digits) {
    const double d = std::pow(10.0, digits);
    return std::floor(x * d + 0.5 + 1e-7) / d;
}

// ---- Common ----------------------------------------------------------------------------------

TQChanNumberController::TQChanNumberController(TQChannelBase* channel,
                                               const JNBuildContext& context)
    : TQViewController(channel, context), _pTF(std::make_shared<RWTextField>()) {
    _pTF->setTarget(this);
    _pTF->setAction("setChannelValue:");
    _pTF->setEditable(true);
    _formatter = TQInspNumberFormatter::formatterWithSuffix("", -HUGE_VAL, HUGE_VAL, 2);
    _pTF->setFormatter(_formatter.get());
}

TQChannel* TQChanNumberController::channel() const {
    return dynamic_cast<TQChannel*>(associatedChannel());
}

double TQChanNumberController::senderValue(RWActionSender& sender) {
    if (auto* field = dynamic_cast<RWTextField*>(&sender)) return field->doubleValue();
    if (auto* value = dynamic_cast<RWValueControl*>(&sender)) return value->doubleValue();
    return 0.0;
}

bool TQChanNumberController::entryCheckFails(const RWActionSender& sender) const {
    return isField(sender) && _actionType == TQNumberAction::Typed && delegate() &&
           delegate()->isAnyInspectorRebuilding();
}

bool TQChanNumberController::areAllChannelsEqual() const {
    const TQChannel* first = channel();
    if (!first) return true;
    const double v = first->getValueAsDouble(currentTime());
    for (TQChannelBase* other : associatedChannelList()) {
        const auto* c = dynamic_cast<const TQChannel*>(other);
        if (c && std::fabs(c->getValueAsDouble(currentTime()) - v) >= kZeroTolerance) return false;
    }
    return true;
}

void TQChanNumberController::startScrubberAction(RWActionSender&) { aboutToChangeChannel(); }
void TQChanNumberController::endScrubberAction(RWActionSender&) {
    _isOffsetting = false;
    endChannelChange();
}
void TQChanNumberController::endSliderAction(RWActionSender& sender) { endScrubberAction(sender); }

void TQChanNumberController::userEnterNumber(const std::string& text) {
    if (isEnabled()) _pTF->userEndEditing(text);
}

bool TQChanNumberController::performAction(const std::string& action, RWActionSender& sender) {
    if (action != "setChannelValue:") return false;
    if (!isField(sender) || isChanging()) {
        setChannelValue(sender);
        return true;
    }
    // A number typed in the field (its end of editing sends the action) is a step of its own.
    const TQNumberAction was = _actionType;
    _actionType = TQNumberAction::Typed;
    aboutToChangeChannel();
    setChannelValue(sender);
    endScrubberAction(sender);
    _actionType = was;
    return true;
}

// ---- Double ----------------------------------------------------------------------------------

TQChanDoubleController::TQChanDoubleController(TQChannelBase* channel,
                                               const JNBuildContext& context)
    : TQChanNumberController(channel, context), _pSlider(std::make_shared<RWSlider>()) {
    setFrameSize(CGSizeMake(237.0, 24.0));
    _pSlider->setTarget(this);
    _pSlider->setAction("setChannelValue:");
    _pSlider->setFrame(CGRectMake(70.0, 3.0, 150.0, 18.0));
    if (TQChannel* c = this->channel()) {
        const TQChannelInfo& info = *c->getInfo();
        _pSlider->setMinValue(info.sliderMinimum * info.displayScale);
        _pSlider->setMaxValue(c->sliderMaximum() * info.displayScale);
    }
}

void TQChanDoubleController::setSubrange(double min, double max) {
    _isSubrangeSet = true;
    _subrangeMin = min;
    _subrangeMax = max;
}

void TQChanDoubleController::setSliderTickMarkCount() {
    _pSlider->setNumberOfTickMarks(_sliderNaturalTickCount);
}

void TQChanDoubleController::updateEnableState() {
    const bool enabled = isEnabled();
    _pTF->setEnabled(enabled);
    _pSlider->setEnabled(enabled);
}

double TQChanDoubleController::snapForSlider(const RWActionSender& sender, double x) const {
    if (&sender != _pSlider.get() || _pSlider->frame().size.width >= kSnappingSliderWidth) return x;
    return snapToDigits(x, _decimalDigits);
}

void TQChanDoubleController::updateScrubberRange(const TQChannel& c, double scale) {
    const double lower = c.getInfo()->sliderMinimum * scale;
    const double upper = c.sliderMaximum() * scale;
    if (_pSlider->minValue() != lower && !(lower < c.curveMinimum())) {
        _pSlider->setMinValue(lower);
        if (!isHUD()) _formatter->setMinimum(lower);
    }
    if (_pSlider->maxValue() != upper && !(c.curveMaximum() < upper)) {
        _pSlider->setMaxValue(upper);
        if (!isHUD()) _formatter->setMaximum(upper);
    }
}

void TQChanDoubleController::showOnControls(double shown, const RWActionSender& sender) {
    if (isField(sender)) {
        _pSlider->setDoubleValue(shown);
        if (!_isOffsetting) _pTF->setDoubleValue(shown);
    } else {
        _pTF->setDoubleValue(shown);
        _pSlider->setDoubleValue(shown);
    }
}

void TQChanDoubleController::update() {
    TQChannel* c = channel();
    if (!c || _isOffsetting) return;
    updateEnableState();
    const double scale = displayScaleOf(*c);
    updateScrubberRange(*c, scale);
    const double y = c->getValueAsDouble(currentTime());
    _pSlider->setDoubleValue(y * scale);
    const double shown = y * scale + valueBias();
    if (_pTF->doubleValue() == shown && !_pTF->objectValue().isNil()) return;
    _pTF->setDoubleValue(shown);
}

void TQChanDoubleController::startScrubberAction(RWActionSender& sender) {
    if (delegate() && delegate()->isAnyInspectorRebuilding()) return;
    TQChanNumberController::startScrubberAction(sender);
    _isOffsetting = !areAllChannelsEqual() && _actionType != TQNumberAction::Typed;
    _pMouseDownValues.clear();
    const CMTime t = currentTime();
    if (const TQChannel* c = channel()) _pMouseDownValues.push_back(c->getValueAsDouble(t));
    for (TQChannelBase* other : associatedChannelList())
        if (const auto* c = dynamic_cast<const TQChannel*>(other))
            _pMouseDownValues.push_back(c->getValueAsDouble(t));
}

void TQChanDoubleController::endScrubberAction(RWActionSender& sender) {
    _pMouseDownValues.clear();
    TQChanNumberController::endScrubberAction(sender);
}
void TQChanDoubleController::endSliderAction(RWActionSender& sender) { endScrubberAction(sender); }

void TQChanDoubleController::setChannelValue(RWActionSender& sender) {
    if (entryCheckFails(sender)) return;
    TQChannel* c = channel();
    if (!c) return;
    const CMTime t = currentTime();
    const double scale = displayScaleOf(*c);
    double x = snapForSlider(sender, senderValue(sender));
    if (_isIntegerController) x = std::trunc(x);
    x /= scale;
    const double first = c->getValueAsDouble(t);
    if (_isOffsetting && !_pMouseDownValues.empty())
        x += _pMouseDownValues.front();
    else if (isField(sender))
        x -= valueBias();
    x = clampToCurve(*c, x);
    if (_isSubrangeSet) x = std::clamp(x, _subrangeMin, std::max(_subrangeMin, _subrangeMax));
    if (JNInspectorDelegate* d = delegate()) d->abort();
    showOnControls(x * scale, sender);
    c->noteWillChange(true);
    c->setKeyframe(t, x);
    // The others keep their distance from the first channel.
    const double delta = x - first;
    for (TQChannelBase* other : associatedChannelList())
        if (auto* oc = dynamic_cast<TQChannel*>(other)) {
            oc->noteWillChange(true);
            oc->setKeyframe(t, clampToCurve(*oc, oc->getValueAsDouble(t) + delta));
        }
    if (JNInspectorDelegate* d = delegate()) d->channelChanged(c, t, 0);
}

// ---- Angle -----------------------------------------------------------------------------------

TQChanAngleController::TQChanAngleController(TQChannelBase* channel, const JNBuildContext& context)
    : TQChanNumberController(channel, context), _pDial(std::make_shared<RWSlider>()) {
    setFrameSize(CGSizeMake(237.0, 32.0));
    _pDial->setMinValue(0.0);
    _pDial->setMaxValue(360.0);
    _pDial->setFrame(CGRectMake(150.0, 2.0, 28.0, 28.0));
    _pDial->setTarget(this);
    _pDial->setAction("setChannelValue:");
}

double TQChanAngleController::renormalize(double degrees) {
    const double r = std::fmod(degrees, 360.0);
    return r < 0.0 ? r + 360.0 : r;
}

void TQChanAngleController::updateEnableState() {
    _pTF->setEnabled(isEnabled());
    _pDial->setEnabled(isEnabled());
}

void TQChanAngleController::startScrubberAction(RWActionSender& sender) {
    if (delegate() && delegate()->isAnyInspectorRebuilding()) return;
    TQChanNumberController::startScrubberAction(sender);
    _isOffsetting = !areAllChannelsEqual() && _actionType != TQNumberAction::Typed;
    _pMouseDownValues.clear();
    if (const TQChannel* c = channel())
        _pMouseDownValues.push_back(c->getValueAsDouble(currentTime()));
}

void TQChanAngleController::update() {
    TQChannel* c = channel();
    if (!c || _isOffsetting) return;
    updateEnableState();
    const double v = c->getValueAsDouble(currentTime()) * displayScaleOf(*c);
    if (_pTF->doubleValue() != v || _pTF->objectValue().isNil()) _pTF->setDoubleValue(v);
    _pDial->setDoubleValue(360.0 - renormalize(v));
}

void TQChanAngleController::setChannelValue(RWActionSender& sender) {
    if (entryCheckFails(sender)) return;
    TQChannel* c = channel();
    if (!c) return;
    const CMTime t = currentTime();
    const double scale = displayScaleOf(*c);
    const double x = senderValue(sender);
    double value = x / scale;
    double shown = x;
    if (&sender == _pDial.get()) {
        const double y = c->getValueAsDouble(t);
        // A step across the dial's zero is a small one, not a full turn.
        double step = 360.0 - x - renormalize(y * scale);
        if (step > 270.0) step -= 360.0;
        if (step < -270.0) step += 360.0;
        value = y + step / scale;
        shown = value * scale;
    }
    if (_isOffsetting && !_pMouseDownValues.empty()) value += _pMouseDownValues.front();
    value = clampToCurve(*c, value);
    if (JNInspectorDelegate* d = delegate()) d->abort();
    if (isField(sender)) {
        if (!_isOffsetting) _pTF->setDoubleValue(shown);
        _pDial->setDoubleValue(360.0 - renormalize(shown));
    } else {
        _pTF->setDoubleValue(shown);
    }
    c->noteWillChange(true);
    c->setKeyframe(t, value);
    if (JNInspectorDelegate* d = delegate()) d->channelChanged(c, t, 0);
}

// ---- Proportional pair -----------------------------------------------------------------------

TQChan2DPropController::TQChan2DPropController(TQChannelBase* channel,
                                               const JNBuildContext& context)
    : TQChanNumberController(channel, context),
      _pSlider(std::make_shared<RWSlider>()),
      _pEqualFormatter(TQInspNumberFormatter::formatterWithSuffix("", -HUGE_VAL, HUGE_VAL, 2)) {
    setFrameSize(CGSizeMake(237.0, 24.0));
    _pSlider->setTarget(this);
    _pSlider->setAction("setChannelValue:");
    _pSlider->setFrame(CGRectMake(70.0, 3.0, 150.0, 18.0));
    const auto [x, y] = components(channel);
    if (x) {
        const TQChannelInfo& info = *x->getInfo();
        _pSlider->setMinValue(info.sliderMinimum * info.displayScale);
        _pSlider->setMaxValue(x->sliderMaximum() * info.displayScale);
    }
    (void)y;
}

std::pair<TQChannel*, TQChannel*> TQChan2DPropController::components(TQChannelBase* pair) {
    auto* compound = dynamic_cast<TQCompoundChannel*>(pair);
    if (!compound) return {nullptr, nullptr};
    const std::vector<TQChannel*> parts = compound->getComponents();
    if (parts.size() < 2) return {nullptr, nullptr};
    return {parts[0], parts[1]};
}

void TQChan2DPropController::updateEnableState() {
    _pTF->setEnabled(isEnabled());
    _pSlider->setEnabled(isEnabled());
}

double TQChan2DPropController::snapForSlider(const RWActionSender& sender, double x) const {
    if (&sender != _pSlider.get() || _pSlider->frame().size.width >= kSnappingSliderWidth) return x;
    return snapToDigits(x, _decimalDigits);
}

void TQChan2DPropController::startScrubberAction(RWActionSender& sender) {
    if (delegate() && delegate()->isAnyInspectorRebuilding()) return;
    _isSliding = _actionType != TQNumberAction::Typed;
    TQChanNumberController::startScrubberAction(sender);
}

void TQChan2DPropController::endScrubberAction(RWActionSender& sender) {
    _isSliding = false;
    _isMultiplying = false;
    _pMouseDownValues.clear();
    TQChanNumberController::endScrubberAction(sender);
}
void TQChan2DPropController::endSliderAction(RWActionSender& sender) { endScrubberAction(sender); }

void TQChan2DPropController::update() {
    if (_isSliding) return;
    const auto [cx, cy] = components(compoundChan());
    if (!cx || !cy) return;
    updateEnableState();
    const CMTime t = currentTime();
    const double x = cx->getValueAsDouble(t);
    const double y = cy->getValueAsDouble(t);
    const double shown = (std::fabs(y) > std::fabs(x) ? y : x) * displayScaleOf(*cx);
    _pSlider->setDoubleValue(shown);
    _isMixed = std::fabs(x - y) >= kZeroTolerance;
    if (!isHUD() && _pTF->formatter() != _pEqualFormatter.get())
        _pTF->setFormatter(_pEqualFormatter.get());
    _pTF->setDoubleValue(shown);
}

void TQChan2DPropController::setChannelValue(RWActionSender& sender) {
    if (entryCheckFails(sender)) return;
    const auto [cx, cy] = components(compoundChan());
    if (!cx || !cy) return;
    const CMTime t = currentTime();
    double x = snapForSlider(sender, senderValue(sender));
    const double ox = cx->getValueAsDouble(t);
    const double oy = cy->getValueAsDouble(t);
    // The larger component leads; the other follows by the ratio taken at the drag's start.
    const bool xLeads = std::fabs(ox) >= std::fabs(oy);
    TQChannel* leading = xLeads ? cx : cy;
    TQChannel* trailing = xLeads ? cy : cx;
    const double ratio = xLeads ? (std::fabs(ox) < kZeroTolerance ? 0.0 : oy / ox)
                                : (std::fabs(oy) < kZeroTolerance ? 0.0 : ox / oy);
    x = clampToCurve(*leading, x / displayScaleOf(*leading));
    if (JNInspectorDelegate* d = delegate()) d->abort();
    double factor = 1.0;
    if (isField(sender)) {
        if (_pTF->stringValue().empty()) return;
        factor = _isSliding ? ratio : 1.0;
        _pSlider->setDoubleValue(x * displayScaleOf(*leading));
    } else if (&sender == _pSlider.get()) {
        _pTF->setDoubleValue(x * displayScaleOf(*leading));
        factor = ratio;
    }
    leading->noteWillChange(true);
    leading->setKeyframe(t, x);
    if (std::fabs(factor) >= kZeroTolerance) {
        trailing->noteWillChange(true);
        trailing->setKeyframe(t, x * factor);
    }
    if (JNInspectorDelegate* d = delegate()) d->channelChanged(compoundChan(), t, 0);
}
