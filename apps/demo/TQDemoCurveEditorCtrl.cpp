#include "apps/demo/TQDemoCurveEditorCtrl.h"

#include "src/editor/TQCurveEditorView.h"
#include "src/panels/TQTimingMoveController.h"

namespace {
CMTime seconds(double s) { return TQTarnTimeForChannelSeconds(s, kTQCurveEditorTimescale); }
}  // namespace

TQDemoCurveEditorCtrl::TQDemoCurveEditorCtrl(TQHostAppDelegate& host) : _host(host) {
    _host.addNotificationReceiver(this);
}

TQDemoCurveEditorCtrl::~TQDemoCurveEditorCtrl() { _host.removeNotificationReceiver(this); }

void TQDemoCurveEditorCtrl::applyDisplayRange(const CMTimeRange& range) {
    _host.setDisplayRange(range);
    const CMTimeRange applied = _host.displayRange();
    if (_view) _view->setDisplayRange(&applied.start, &applied.duration);
}

void TQDemoCurveEditorCtrl::didSetViewContentsHorizontalOrigin(double origin, double duration) {
    applyDisplayRange(CMTimeRangeMake(seconds(origin), seconds(duration)));
}

void TQDemoCurveEditorCtrl::didSetViewContentsHorizontalOffset(double offset) {
    const CMTimeRange range = _host.displayRange();
    applyDisplayRange(
        CMTimeRangeMake(BN_CMTimeSaferAdd(range.start, seconds(offset)), range.duration));
}

void TQDemoCurveEditorCtrl::restored() {
    if (_view) validateSelection(_view->getSelection());
    _host.postNotification(kTQNotifyCurvesInvalidated);
}

bool TQDemoCurveEditorCtrl::undo() {
    const bool done = _host.undo();
    if (done) restored();
    return done;
}

bool TQDemoCurveEditorCtrl::redo() {
    const bool done = _host.redo();
    if (done) restored();
    return done;
}

bool TQDemoCurveEditorCtrl::runValuePanel(TQCurveEditorValueWindow& window) {
    const RWWindow* parent = window.parentWindow ? window.parentWindow : _editorWindow;
    return TQCurveEditorValueController::openWithLocationValueInWindow(
        window.location, &window.value, parent, window.parentRect);
}

void TQDemoCurveEditorCtrl::paste(RWActionSender* sender) {
    TQCurveEditorCtrl::paste(sender);
    if (lastPasteResult() != TQPasteResult::kPasted && _pasteRefused)
        _pasteRefused(lastPasteResult());
}
