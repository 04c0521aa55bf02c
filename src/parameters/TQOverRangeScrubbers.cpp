#include "src/parameters/TQOverRangeScrubbers.h"

#include <algorithm>
#include <cmath>

#include "platform/channels/TQChannel.h"
#include "platform/channels/TQChannelTypes.h"

namespace {
constexpr double kZeroTolerance = 1e-7;
}  // namespace

JNBuildContext TQOverRangeRow::rowContext(const JNBuildContext& context) {
    JNBuildContext row = context;
    row.setShouldDisplayAnimIndicator(false);
    row.setShouldDisplayParameterMenu(false);
    return row;
}

void TQOverRangeRow::postChanging() const {
    if (TQCurveEditorAppDelegate* d =
            _pMiniCurveEditor ? _pMiniCurveEditor->appDelegate() : nullptr)
        d->postNotification(kTQNotifyChannelsChanging);
}

// ---- Value ---------------------------------------------------------------------------------

TQChanDoubleOverRangeScrubberController::TQChanDoubleOverRangeScrubberController(
    TQChannelBase* channel, TQMiniCurveEditor* editor, const JNBuildContext& context)
    : TQChanDoubleController(channel, rowContext(context)), TQOverRangeRow(editor) {}

bool TQChanDoubleOverRangeScrubberController::isEnabled() const {
    return editorHasSelection() && _pMiniCurveEditor->isEnabled();
}

void TQChanDoubleOverRangeScrubberController::startScrubberAction(RWActionSender& sender) {
    if (delegate() && delegate()->isAnyInspectorRebuilding()) return;
    aboutToChangeChannel();
    _isOffsetting = !areAllChannelsEqual() && _actionType != TQNumberAction::Typed;
    _pMouseDownValues.clear();
    if (!_pMiniCurveEditor) return;
    _pMouseDownValues.push_back(
        _pMiniCurveEditor->getSelectedValueYForChannel(associatedChannel()));
    for (TQChannelBase* other : associatedChannelList())
        _pMouseDownValues.push_back(_pMiniCurveEditor->getSelectedValueYForChannel(other));
    (void)sender;
}

void TQChanDoubleOverRangeScrubberController::update() {
    TQChannel* c = channel();
    if (!c || _isOffsetting || !_pMiniCurveEditor) return;
    if (_isSuppressingDisabledUpdates && !isEnabled()) return;
    updateEnableState();
    const double y = _pMiniCurveEditor->getSelectedValueYForChannel(c);
    const double scale = displayScaleOf(*c);
    updateScrubberRange(*c, scale);
    _pSlider->setDoubleValue(y * scale);
    if (_pTF->isEditing()) return;  // the user's typing stands
    const double shown = y * scale + valueBias();
    if (_pTF->doubleValue() == shown && !_pTF->objectValue().isNil()) return;
    _pTF->setDoubleValue(shown);
}

void TQChanDoubleOverRangeScrubberController::setChannelValue(RWActionSender& sender) {
    if (entryCheckFails(sender)) return;
    TQChannel* c = channel();
    if (!c || !_pMiniCurveEditor) return;
    const CMTime t = currentTime();
    const double scale = displayScaleOf(*c);
    double x = snapForSlider(sender, senderValue(sender));
    if (_isIntegerController) x = std::trunc(x);
    x /= scale;
    if (_isOffsetting && !_pMouseDownValues.empty())
        x += _pMouseDownValues.front();
    else if (isField(sender))
        x -= valueBias();
    x = clampToCurve(*c, x);
    if (_isSubrangeSet) x = std::clamp(x, _subrangeMin, std::max(_subrangeMin, _subrangeMax));
    if (JNInspectorDelegate* d = delegate()) d->abort();
    showOnControls(x * scale, sender);
    postChanging();
    _pMiniCurveEditor->setSelectedValueY(x, c);
    if (JNInspectorDelegate* d = delegate()) d->channelChanged(c, t, 0);
}

// ---- Position ------------------------------------------------------------------------------

namespace {
// A pair is shown by its first component.
TQChannelBase* positionChannel(TQChannelBase* channel) {
    if (auto* pair = dynamic_cast<TQChannelPair*>(channel)) return pair->getXChannel();
    return channel;
}
}  // namespace

TQChanRangeScrubberController::TQChanRangeScrubberController(TQChannelBase* channel,
                                                             TQMiniCurveEditor* editor,
                                                             const JNBuildContext& context)
    : TQChanDoubleController(positionChannel(channel), rowContext(context)),
      TQOverRangeRow(editor) {
    const double width = (isHUD() ? 198.0 : 237.0) - 9.0;
    _pSlider->setFrame(CGRectMake(9.0, 3.0, width, 18.0));
    _pSlider->setAutoresizingMask(2);
    _pSuffixTF.assign(1, '%');
    _decimalDigits = 2;
    _pSlider->setMinValue(0.0);
    _pSlider->setMaxValue(100.0);
    _sliderNaturalTickCount = 11;
    setSliderTickMarkCount();
    if (!isHUD()) {
        _formatter = TQInspNumberFormatter::formatterWithSuffix("", 0.0, 100.0, _decimalDigits);
        _pTF->setFormatter(_formatter.get());
    }
}

bool TQChanRangeScrubberController::isEnabled() const {
    return editorHasSelection() && _pMiniCurveEditor->isEnabled();
}

void TQChanRangeScrubberController::update() {
    if (!channel() || _isOffsetting || !_pMiniCurveEditor) return;
    if (_isSuppressingDisabledUpdates && !isEnabled()) return;
    updateEnableState();
    const double shown = CMTimeGetSeconds(_pMiniCurveEditor->getSelectedValueX()) * 100.0;
    _pSlider->setMinValue(0.0);
    _pSlider->setMaxValue(100.0);
    _formatter->setMinimum(0.0);
    _formatter->setMaximum(100.0);
    _pSlider->setDoubleValue(shown);
    if (_pTF->doubleValue() == shown + valueBias() && !_pTF->objectValue().isNil()) return;
    _pTF->setDoubleValue(shown + valueBias());
}

void TQChanRangeScrubberController::setChannelValue(RWActionSender& sender) {
    if (entryCheckFails(sender)) return;
    TQChannel* c = channel();
    if (!c || !_pMiniCurveEditor) return;
    const CMTime t = currentTime();
    double x = snapForSlider(sender, senderValue(sender));
    if (_isIntegerController) x = std::trunc(x);
    x /= 100.0;
    if (_isOffsetting && !_pMouseDownValues.empty())
        x += _pMouseDownValues.front();
    else if (isField(sender))
        x -= valueBias();
    x = std::clamp(x, 0.0, 1.0);
    if (_isSubrangeSet) x = std::clamp(x, _subrangeMin, std::max(_subrangeMin, _subrangeMax));
    if (JNInspectorDelegate* d = delegate()) d->abort();
    _pMiniCurveEditor->setSelectedValueX(TQTarnTimeForChannelSeconds(x, 0x40000));
    if (isField(sender)) {
        _pSlider->setDoubleValue(x * 100.0);
        if (!_isOffsetting) {
            _pTF->setDoubleValue(x * 100.0);
            // A typed position is final at once.
            _pMiniCurveEditor->didEndModifyingSelectedX();
        }
    } else {
        _pTF->setDoubleValue(x * 100.0);
        _pSlider->setDoubleValue(x * 100.0);
    }
    postChanging();
    if (JNInspectorDelegate* d = delegate()) d->channelChanged(c, t, 0);
}

void TQChanRangeScrubberController::aboutToChangeChannel() {
    JNInspectorDelegate* d = delegate();
    TQChannelBase* c = associatedChannel();
    if (!d || !c) return;
    TQChannelFolder* parent = c->getParent();
    const bool compound = parent && parent->isCompoundChannel();
    // The base opens the step for the channel and its list; a compound goes first.
    if (compound) d->beginChannelChange(this, parent);
    TQChanDoubleController::aboutToChangeChannel();
    if (d->getObjectManipulator()) d->abort();
}

void TQChanRangeScrubberController::endScrubberAction(RWActionSender& sender) {
    if (_pMiniCurveEditor) _pMiniCurveEditor->didEndModifyingSelectedX();
    TQChanDoubleController::endScrubberAction(sender);
}

void TQChanRangeScrubberController::endSliderAction(RWActionSender& sender) {
    endScrubberAction(sender);
}

// ---- Angle ---------------------------------------------------------------------------------

TQChanAngleOverRangeScrubberController::TQChanAngleOverRangeScrubberController(
    TQChannelBase* channel, TQMiniCurveEditor* editor, const JNBuildContext& context)
    : TQChanAngleController(channel, rowContext(context)), TQOverRangeRow(editor) {}

void TQChanAngleOverRangeScrubberController::update() {
    TQChannel* c = channel();
    if (!c || _isOffsetting || !_pMiniCurveEditor) return;
    updateEnableState();
    const double v = _pMiniCurveEditor->getSelectedValueY() * displayScaleOf(*c);
    if (!_pTF->isEditing() && (_pTF->doubleValue() != v || _pTF->objectValue().isNil()))
        _pTF->setDoubleValue(v);
    _pDial->setDoubleValue(360.0 - renormalize(v));
}

void TQChanAngleOverRangeScrubberController::setChannelValue(RWActionSender& sender) {
    if (entryCheckFails(sender)) return;
    TQChannel* c = channel();
    if (!c || !_pMiniCurveEditor) return;
    const double scale = displayScaleOf(*c);
    const double x = senderValue(sender);
    double value = x / scale;
    double shown = x;
    if (&sender == _pDial.get()) {
        const double y = _pMiniCurveEditor->getSelectedValueY();
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
    postChanging();
    // The form without a channel: it moves the selection.
    _pMiniCurveEditor->setSelectedValueY(value);
    JNInspectorDelegate* d = delegate();
    // This row reports the host's time, not the selected position.
    if (d) d->channelChanged(c, d->currentTimeForChannel(c), 0);
}

// ---- Proportional pair ---------------------------------------------------------------------

TQChan2DPropOverRangeScrubberController::TQChan2DPropOverRangeScrubberController(
    TQChannelBase* channel, TQMiniCurveEditor* editor, const JNBuildContext& context)
    : TQChan2DPropController(channel, rowContext(context)), TQOverRangeRow(editor) {}

bool TQChan2DPropOverRangeScrubberController::isEnabled() const {
    return editorHasSelection() && _pMiniCurveEditor->isEnabled();
}

void TQChan2DPropOverRangeScrubberController::calcRatio() {
    const auto [cx, cy] = components(compoundChan());
    if (!cx || !cy || !_pMiniCurveEditor) return;
    const double x = _pMiniCurveEditor->getSelectedValueYForChannel(cx);
    const double y = _pMiniCurveEditor->getSelectedValueYForChannel(cy);
    if (std::fabs(x - y) < kZeroTolerance) {
        _ratio = 1.0;
    } else if (x > y) {
        _ratio = std::fabs(x) < kZeroTolerance ? 0.0 : y / x;
        _isXMax = true;
    } else {
        _ratio = std::fabs(y) < kZeroTolerance ? 0.0 : x / y;
        _isXMax = false;
    }
}

void TQChan2DPropOverRangeScrubberController::startScrubberAction(RWActionSender&) {
    if (delegate() && delegate()->isAnyInspectorRebuilding()) return;
    _isSliding = _actionType != TQNumberAction::Typed;
    aboutToChangeChannel();
    _isMultiplying = !areAllChannelsEqual() && _actionType != TQNumberAction::Typed;
    if (!_isMultiplying) calcRatio();
    _pMouseDownValues.clear();
    if (!_pMiniCurveEditor) return;
    auto pairAt = [&](TQChannelBase* pair) {
        const auto [cx, cy] = components(pair);
        if (cx && cy)
            _pMouseDownValues.emplace_back(_pMiniCurveEditor->getSelectedValueYForChannel(cx),
                                           _pMiniCurveEditor->getSelectedValueYForChannel(cy));
    };
    pairAt(compoundChan());
    for (TQChannelBase* other : associatedChannelList()) pairAt(other);
}

void TQChan2DPropOverRangeScrubberController::update() {
    if (_isSliding || !_pMiniCurveEditor) return;
    const auto [cx, cy] = components(compoundChan());
    if (!cx || !cy) return;
    updateEnableState();
    const double x = _pMiniCurveEditor->getSelectedValueYForChannel(cx);
    const double y = _pMiniCurveEditor->getSelectedValueYForChannel(cy);
    const double shown = (std::fabs(y) > std::fabs(x) ? y : x) * displayScaleOf(*cx);
    _pSlider->setDoubleValue(shown);
    _isMixed = std::fabs(x - y) >= kZeroTolerance;
    if (!isHUD() && _pTF->formatter() != _pEqualFormatter.get())
        _pTF->setFormatter(_pEqualFormatter.get());
    _pTF->setDoubleValue(shown);
}

void TQChan2DPropOverRangeScrubberController::setChannelValue(RWActionSender& sender) {
    if (entryCheckFails(sender) || !_pMiniCurveEditor) return;
    const auto [cx, cy] = components(compoundChan());
    if (!cx || !cy) return;
    const CMTime t = currentTime();
    double x = senderValue(sender);
    if (&sender == _pSlider.get() && _pSlider->frame().size.width < kSnappingSliderWidth)
        x = snapToDigits(x, _decimalDigits);
    TQChannel* leading = _isXMax ? cx : cy;
    TQChannel* trailing = _isXMax ? cy : cx;
    const double scale = displayScaleOf(*leading);
    x = clampToCurve(*leading, x / scale);
    if (JNInspectorDelegate* d = delegate()) d->abort();
    double factor = 1.0;
    if (isField(sender)) {
        if (_pTF->stringValue().empty()) return;
        // A typed number sets both components equal.
        factor = _isSliding ? _ratio : 1.0;
        _pSlider->setDoubleValue(x * scale);
    } else if (&sender == _pSlider.get()) {
        _pTF->setDoubleValue(x * scale);
        factor = _ratio;
    }
    postChanging();
    if (_isMultiplying && !_pMouseDownValues.empty()) {
        size_t i = 0;
        auto multiply = [&](TQChannelBase* pair) {
            const auto [px, py] = components(pair);
            if (!px || !py || i >= _pMouseDownValues.size()) return;
            _pMiniCurveEditor->setSelectedValueY(x * _pMouseDownValues[i].first, px);
            _pMiniCurveEditor->setSelectedValueY(x * _pMouseDownValues[i].second, py);
            ++i;
        };
        multiply(compoundChan());
        for (TQChannelBase* other : associatedChannelList()) multiply(other);
    } else {
        _pMiniCurveEditor->setSelectedValueY(x, leading);
        if (std::fabs(factor) >= kZeroTolerance)
            _pMiniCurveEditor->setSelectedValueY(x * factor, trailing);
        for (TQChannelBase* other : associatedChannelList()) {
            const auto [ox, oy] = components(other);
            if (!ox || !oy) continue;
            _pMiniCurveEditor->setSelectedValueY(x, _isXMax ? ox : oy);
            if (std::fabs(factor) >= kZeroTolerance)
                _pMiniCurveEditor->setSelectedValueY(x * factor, _isXMax ? oy : ox);
        }
    }
    if (JNInspectorDelegate* d = delegate()) d->channelChanged(compoundChan(), t, 0);
}
