// The simplify and generate commands of the animation menu: their panels, the live preview of
// a simplification on the real channel, the restoring of the curve and the undo steps.

#include "src/editor/TQCurveEditorCtrl.h"

#include "platform/channels/TQChannelTypes.h"
#include "platform/ui/RWServices.h"
#include "src/engine/TQEditBrackets.h"

namespace {

// The panels' starting values.
constexpr int32_t kDefaultTolerance = 1;
constexpr int32_t kDefaultSmoothness = 0;
constexpr int32_t kDefaultCycles = 1;

// A whole-channel edit as one announced step: the capture, the channel's will/did pairs, the
// channel's own notice, then the change.
template <class Change>
void announcedStep(TQCurveEditorAppDelegate* delegate, const char* undoKey, TQChannel& channel,
                   Change&& change) {
    const TQCaptureGuard step(delegate, undoKey);
    const TQChannelEditGuard announced(delegate, &channel);
    channel.noteWillChange(true);
    change(channel);
}

// The first control's whole value, the second's without it, or the default without either.
int32_t wholeValue(const RWValueControl* first, const RWValueControl* second, int32_t fallback) {
    if (first) return first->intValue();
    return second ? second->intValue() : fallback;
}

void setWholeValue(RWValueControl* control, int32_t value) {
    if (control) control->setIntValue(value);
}

// A twin takes the whole value of the control that moved.
void copyWholeValue(const RWValueControl* from, RWValueControl* to) {
    if (from && to) to->setIntValue(from->intValue());
}

}  // namespace

// ---- Simplify ------------------------------------------------------------------------------

void TQCurveEditorCtrl::animMenuSimplifyCurve(RWActionSender*) {
    if (_pAppDelegate) _pAppDelegate->abort();
    const TQCurveEditorItemPtr selected = selectedChannel();
    auto* item = dynamic_cast<TQCurveEditorChannelItem*>(selected.get());
    TQChannel* channel = item ? item->channel() : nullptr;
    // The menu offers the command for one channel; without it or a panel there is nothing to
    // preview on.
    if (!channel || !_reducePanel) return;
    std::unique_ptr<TQChannelBase> clone(channel->cloneChannel());
    if (!dynamic_cast<TQChannel*>(clone.get())) return;
    _reducePanel->makeKeyAndOrderFront();
    _currChan = channel;
    _initialCurve.reset(static_cast<TQChannel*>(clone.release()));
    setWholeValue(_tolerance.get(), kDefaultTolerance);
    setWholeValue(_toleranceSlider.get(), kDefaultTolerance);
    setWholeValue(_smoothness.get(), kDefaultSmoothness);
    setWholeValue(_smoothnessSlider.get(), kDefaultSmoothness);
    // Each preview's step nests in this one, so that the panel leaves a single step, whose
    // "before" is the curve of this moment; a Cancel leaves it empty, and the host drops it.
    const TQCaptureGuard session(_pAppDelegate, "Undo Simplify");
    RWApplicationServices().modal->runModalForWindow(*_reducePanel);
}

void TQCurveEditorCtrl::_updateSimplifyResult() {
    if (!_currChan || !_initialCurve) return;
    if (_pAppDelegate) _pAppDelegate->abort();
    postNotification(kTQNotifyChannelsChanged);
    // Never on top of an earlier preview: always from the untouched curve.
    *_currChan = *_initialCurve;
    const TQCurveSetPtr& set = selectedCurveSet();
    const TQCurveEditorItemPtr held = set ? set->itemWithChannel(_currChan) : nullptr;
    if (auto* item = dynamic_cast<TQCurveEditorChannelItem*>(held.get())) {
        // Without a host there is no frame grid: the channel library then changes nothing.
        const CMTime frame = _pAppDelegate ? _pAppDelegate->getFrameDuration() : CMTime{};
        const double tolerance =
            wholeValue(_tolerance.get(), _toleranceSlider.get(), kDefaultTolerance);
        const int smoothness =
            wholeValue(_smoothness.get(), _smoothnessSlider.get(), kDefaultSmoothness);
        announcedStep(_pAppDelegate, "Undo Simplify", *_currChan, [&](TQChannel& c) {
            c.simplifyCurve(c.getKeyframeMinTime(), c.getKeyframeMaxTime(), frame,
                            kTQSimplifyBezier, smoothness, tolerance, kTQSimplifyOnFrames);
        });
        item->setOriginalCurveDirty(1);
    }
    postNotification(kTQNotifyChannelsChanged);
}

void TQCurveEditorCtrl::reduceOk(RWActionSender*) {
    _updateSimplifyResult();
    closeSimplifyPanel();
}

void TQCurveEditorCtrl::reduceCancel(RWActionSender*) {
    if (_pAppDelegate) _pAppDelegate->abort();
    if (_currChan && _initialCurve) {
        *_currChan = *_initialCurve;
        // The restored curve is drawn again where the set shows it.
        const TQCurveSetPtr& set = selectedCurveSet();
        const TQCurveEditorItemPtr held = set ? set->itemWithChannel(_currChan) : nullptr;
        if (auto* item = dynamic_cast<TQCurveEditorChannelItem*>(held.get()))
            item->setOriginalCurveDirty(1);
    }
    closeSimplifyPanel();
    postNotification(kTQNotifyChannelsChanged);
}

void TQCurveEditorCtrl::closeSimplifyPanel() {
    setWholeValue(_tolerance.get(), kDefaultTolerance);
    setWholeValue(_toleranceSlider.get(), kDefaultTolerance);
    setWholeValue(_smoothness.get(), kDefaultSmoothness);
    setWholeValue(_smoothnessSlider.get(), kDefaultSmoothness);
    _initialCurve.reset();
    RWApplicationServices().modal->stopModal();
    if (_reducePanel) _reducePanel->setIsVisible(false);
}

void TQCurveEditorCtrl::setSmoothnessWithSlider(RWActionSender*) {
    copyWholeValue(_smoothnessSlider.get(), _smoothness.get());
    _updateSimplifyResult();
}

void TQCurveEditorCtrl::setSmoothnessWithScrubber(RWActionSender*) {
    copyWholeValue(_smoothness.get(), _smoothnessSlider.get());
    _updateSimplifyResult();
}

void TQCurveEditorCtrl::setToleranceWithSlider(RWActionSender*) {
    copyWholeValue(_toleranceSlider.get(), _tolerance.get());
    _updateSimplifyResult();
}

void TQCurveEditorCtrl::setToleranceWithScrubber(RWActionSender*) {
    copyWholeValue(_tolerance.get(), _toleranceSlider.get());
    _updateSimplifyResult();
}

// ---- Generate ------------------------------------------------------------------------------

void TQCurveEditorCtrl::animMenuGeneratePreKeypoints(RWActionSender*) {
    openGeneratePanel(kTQExtrapolationBefore);
}

void TQCurveEditorCtrl::animMenuGeneratePostKeypoints(RWActionSender*) {
    openGeneratePanel(kTQExtrapolationAfter);
}

void TQCurveEditorCtrl::openGeneratePanel(uint32_t direction) {
    _extrapolationType = direction;
    const TQCurveEditorItemPtr selected = selectedChannel();
    auto* item = dynamic_cast<TQCurveEditorChannelItem*>(selected.get());
    _currChan = item ? item->channel() : nullptr;
    setWholeValue(_numberOfCyclesSlider.get(), kDefaultCycles);
    setWholeValue(_numberOfCycles.get(), kDefaultCycles);
    if (_generatePanel) _generatePanel->setIsVisible(true);
}

void TQCurveEditorCtrl::generateOk(RWActionSender*) {
    // The panel is not modal: the channel may have gone since it opened, so it is reached
    // through the selected set and never through the pointer kept.
    const TQCurveSetPtr& set = selectedCurveSet();
    const TQCurveEditorItemPtr held = set && _currChan ? set->itemWithChannel(_currChan) : nullptr;
    auto* item = dynamic_cast<TQCurveEditorChannelItem*>(held.get());
    if (TQChannel* channel = item ? item->channel() : nullptr) {
        const auto cycles = static_cast<unsigned>(
            wholeValue(_numberOfCyclesSlider.get(), _numberOfCycles.get(), kDefaultCycles));
        announcedStep(_pAppDelegate, "Undo Generate Keypoints", *channel,
                      [&](TQChannel& c) { c.generateKeypoints(_extrapolationType, cycles); });
        item->setOriginalCurveDirty(1);
        postNotification(kTQNotifyChannelsChanged);
    }
    closeGeneratePanel();
}

void TQCurveEditorCtrl::generateCancel(RWActionSender*) { closeGeneratePanel(); }

void TQCurveEditorCtrl::closeGeneratePanel() {
    setWholeValue(_numberOfCyclesSlider.get(), kDefaultCycles);
    setWholeValue(_numberOfCycles.get(), kDefaultCycles);
    if (_generatePanel) _generatePanel->setIsVisible(false);
}

void TQCurveEditorCtrl::setNumberOfCylesWithSlider(RWActionSender*) {
    copyWholeValue(_numberOfCyclesSlider.get(), _numberOfCycles.get());
}

void TQCurveEditorCtrl::setNumberOfCylesWithScrubber(RWActionSender*) {
    copyWholeValue(_numberOfCycles.get(), _numberOfCyclesSlider.get());
}
