#include "src/mini/TQMiniCurveEditorInspector.h"

#include <cmath>

#include "src/panels/TQEditorControls.h"
#include "src/resources/TQStrings.h"

namespace {
// Each doubling of the vertical zoom takes a tenth off the knob (log 1/2 per step).
constexpr double kLogHalf = -0.6931471805599453;
}  // namespace

TQMiniCurveEditorInspector::TQMiniCurveEditorInspector(TQCurveEditorAppDelegate* hostDelegate,
                                                       uint32_t controlFlags)
    : TQMiniCurveEditor(hostDelegate),
      _modes(std::make_shared<RWSegmentedControl>()),
      _autoFit(std::make_shared<RWButton>()),
      _verticalScroller(std::make_shared<TQVantaZoomScroller>()),
      _horizontalZoomScroller(std::make_shared<TQVantaZoomScroller>()),
      _controlFlags(controlFlags) {
    layOut(CGRectMake(1.0, 1.0, 255.0, 200.0), CGRectMake(22.0, 35.0, 219.0, 145.0),
           CGRectMake(16.0, 45.0, 140.0, 15.0), CGRectMake(20.0, 16.0, 140.0, 15.0));

    RWZoomScroller& v = *_verticalScroller;
    v.setFrame(CGRectMake(225.0, 50.0, 15.0, 130.0));
    v.setVertical(true);
    v.setTarget(this);
    v.setAction("verticalScroller:");
    v.setAutoresizingMask(17);
    v.setHidden(true);
    v.setFloatValue(0.5);
    v.setKnobProportion(0.5);
    v.setMinimumKnobProportion(0.01);

    RWZoomScroller& h = *_horizontalZoomScroller;
    h.setFrame(CGRectMake(22.0, 36.0, 218.0, 15.0));
    h.setTarget(this);
    h.setAction("horizontalZoomScroller:");
    h.setAutoresizingMask(2);
    h.setFloatValue(0.0);
    h.setKnobProportion(1.0);
    h.setHidden(true);
    h.setMinimumKnobProportion(0.03125);

    _modes->setFrame(CGRectMake(139.0, 4.0, 105.0, 22.0));
    _modes->setSegmentCount(3);
    _modes->setAutoresizingMask(1);
    _modes->setSelectedSegment(0);
    _modes->setTarget(this);
    _modes->setAction("setMode:");
    _modes->setBordered(false);
    static const char* const kToolImages[3] = {"K_KeyframeEditor_EditKeyframes",
                                               "K_KeyframeEditor_SketchKeyframes",
                                               "K_KeyframeEditor_TransformKeyframes"};
    for (int64_t i = 0; i < 3; ++i) _modes->setImageName(kToolImages[i], i);

    _autoFit->setFrame(CGRectMake(43.0, 7.0, 95.0, 16.0));
    _autoFit->setButtonType(RWButtonCell::kSwitchButton);
    _autoFit->setTitle(TQLocalizedString("Mini Curve Editor Auto Fit Button"));
    _autoFit->setTarget(this);
    _autoFit->setAction("autoFit:");
    _autoFit->setState(1);
    _autoFit->setAutoresizingMask(33);
}

bool TQMiniCurveEditorInspector::performAction(const std::string& action, RWActionSender& sender) {
    if (action == "setMode:")
        setMode(sender);
    else if (action == "autoFit:")
        autoFit(sender);
    else if (action == "verticalScroller:")
        verticalScroller(sender);
    else if (action == "horizontalZoomScroller:")
        horizontalZoomScroller(sender);
    else
        return TQMiniCurveEditor::performAction(action, sender);
    return true;
}

void TQMiniCurveEditorInspector::update() {
    TQMiniCurveEditor::update();
    updateVerticalZoomScroller();
    updateHorizontalZoomScroller();
}

void TQMiniCurveEditorInspector::setEnabled(bool enabled) {
    TQMiniCurveEditor::setEnabled(enabled);
    _verticalScroller->setEnabled(enabled);
    _horizontalZoomScroller->setEnabled(enabled);
    if (_controlFlags & kModesLive) _modes->setEnabled(enabled);
    _autoFit->setEnabled(enabled);
}

void TQMiniCurveEditorInspector::setMode(RWActionSender&) {
    if (!(_controlFlags & kModesLive) || !_curveEditorCtrl) return;
    _curveEditorCtrl->setCurrentTool(static_cast<TQTool>(_modes->selectedSegment()));
}

void TQMiniCurveEditorInspector::autoFit(RWActionSender&) {
    const bool on = _autoFit->state() == 1;
    TQMiniCurveEditorView& view = *_curveEditorView;
    view.setAutoZoom(on ? 1 : 0);
    if (on) view.frameAll(0);
    const double scrollerWidth = _verticalScroller->frame().size.width;
    const double scrollerHeight = _horizontalZoomScroller->frame().size.height;
    CGRect frame = _curveEditorViewFrame;
    if (!on) {
        frame.origin.y += scrollerHeight;
        frame.size.width -= scrollerWidth;
        frame.size.height -= scrollerHeight;
    } else {
        frame.origin.y -= scrollerHeight;
        frame.size.width += scrollerWidth;
        frame.size.height += scrollerHeight;
    }
    setCurveEditorViewFrame(frame);
    _verticalScroller->setHidden(on);
    _horizontalZoomScroller->setHidden(on);
    if (!on) {
        updateVerticalZoomScroller();
        updateHorizontalZoomScroller();
    }
    view.setNeedsDisplay(1);
}

void TQMiniCurveEditorInspector::verticalScroller(RWActionSender&) {
    RWZoomScroller& s = *_verticalScroller;
    TQMiniCurveEditorView& view = *_curveEditorView;
    double page = 0.0;
    switch (s.hitPart()) {
        case kRWScrollerDecrementPage: page = -1.0; break;
        case kRWScrollerIncrementPage: page = 1.0; break;
        case kRWScrollerDecrementLine: page = -0.2; break;
        case kRWScrollerIncrementLine: page = 0.2; break;
        case kRWScrollerKnob:
        case kRWScrollerKnobSlot:
        case kRWScrollerKnobStartEdge:
        case kRWScrollerKnobEndEdge:
            view.setVerticalZoom(s.knobProportion(), s.floatValue());
            view.setNeedsDisplay(1);
            return;
        default: return;
    }
    // Taken before the pan, as the knob's value follows the volume it left.
    const CGRect m = _curveEditorCtrl ? _curveEditorCtrl->getMaxViewVolume() : CGRectZero;
    view.panWithPage(0.0, page);
    const CGRect& c = view.getCurrentViewVolume();
    const double d = m.size.height - c.size.height;
    if (std::fabs(d) >= kTQZeroTolerance) s.setFloatValue((c.origin.y - m.origin.y) / d);
    _oldKnobValueY = static_cast<float>(s.floatValue());
}

void TQMiniCurveEditorInspector::horizontalZoomScroller(RWActionSender&) {
    RWZoomScroller& s = *_horizontalZoomScroller;
    TQMiniCurveEditorView& view = *_curveEditorView;
    auto pageBy = [&](double px, double valueStep) {
        view.panWithPage(px, 0.0);
        s.setFloatValue(s.floatValue() + valueStep);
    };
    switch (s.hitPart()) {
        case kRWScrollerDecrementPage: pageBy(-1.0, -0.2); break;
        case kRWScrollerIncrementPage: pageBy(1.0, 0.2); break;
        case kRWScrollerDecrementLine: pageBy(-0.2, -0.04); break;
        case kRWScrollerIncrementLine: pageBy(0.2, 0.04); break;
        case kRWScrollerKnob:
        case kRWScrollerKnobSlot:
        case kRWScrollerKnobStartEdge:
        case kRWScrollerKnobEndEdge: {
            const CGRect& o = view.getOriginalViewVolume();
            CGRect c = view.getCurrentViewVolume();
            c.origin.x = o.origin.x + (o.size.width - c.size.width) * s.floatValue();
            c.size.width = s.knobProportion() * o.size.width;
            view.setCurrentViewVolume(c);
            break;
        }
        default: break;
    }
    view.setNeedsDisplay(1);
}

void TQMiniCurveEditorInspector::updateVerticalZoomScroller() {
    if (!_curveEditorCtrl) return;
    const CGRect m = _curveEditorCtrl->getMaxViewVolume();
    const CGRect& c = _curveEditorView->getCurrentViewVolume();
    const double slack = m.size.height - c.size.height;
    const double value =
        std::fabs(slack) < kTQZeroTolerance ? 0.0 : 1.0 - (c.origin.y - m.origin.y) / slack;
    double proportion = 0.0;
    if (std::fabs(m.size.height) >= kTQZeroTolerance) {
        proportion = c.size.height / m.size.height;
        if (std::fabs(proportion - 1.0) < kTQZeroTolerance) proportion = 1.0;
    }
    _verticalScroller->setFloatValue(value);
    _verticalScroller->setKnobProportion(proportion);
    _oldKnobValueY = static_cast<float>(_verticalScroller->floatValue());
    _oldKnobProportionY = _verticalScroller->knobProportion();
}

void TQMiniCurveEditorInspector::updateHorizontalZoomScroller() {
    const CGRect& o = _curveEditorView->getOriginalViewVolume();
    const CGRect& c = _curveEditorView->getCurrentViewVolume();
    const double slack = o.size.width - c.size.width;
    const double value =
        std::fabs(slack) < kTQZeroTolerance ? 0.0 : (c.origin.x - o.origin.x) / slack;
    _horizontalZoomScroller->setFloatValue(value);
    if (std::fabs(o.size.width) >= kTQZeroTolerance)
        _horizontalZoomScroller->setKnobProportion(c.size.width / o.size.width);
}

void TQMiniCurveEditorInspector::windowWasPanned(double delta) {
    const double value = _verticalScroller->floatValue() + delta * -0.2;
    const double zoom = _curveEditorView->zoomY();
    const auto proportion =
        static_cast<float>(zoom > 0.0 ? std::log(zoom) / kLogHalf / 10.0 + 0.5 : 0.5);
    _verticalScroller->setFloatValue(value);
    _verticalScroller->setKnobProportion(proportion);
    _oldKnobValueY = static_cast<float>(_verticalScroller->floatValue());
    updateHorizontalZoomScroller();
}
