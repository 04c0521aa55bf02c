#include "apps/demo/TQDemoCurveEditorCtrl.h"

#include "src/editor/TQCurveEditorView.h"
#include "src/panels/TQTimingMoveController.h"

namespace {
CMTime seconds(double s) { return TQTarnTimeForChannelSeconds(s, kTQCurveEditorTimescale); }
}  // namespace

TQDemoCurveEditorCtrl::TQDemoCurveEditorCtrl(TQHostAppDelegate& host) : _host(host) {
    _host.addNotificationReceiver(this);
    _host.registerUndoClient(this, this);
}

TQDemoCurveEditorCtrl::~TQDemoCurveEditorCtrl() {
    _host.unregisterUndoClient(this);
    _host.removeNotificationReceiver(this);
}

// ---- The curve sets in the history ------------------------------------------------------------

TQDemoCurveEditorCtrl::SetsState TQDemoCurveEditorCtrl::setsState() const {
    SetsState state;
    for (const TQCurveSetPtr& set : _curveSets) {
        if (set == _selectedCurveSet) state.shownIndex = static_cast<int64_t>(state.sets.size());
        // Copies: a set's own content changes after the step (a channel removed from it).
        if (set) state.sets.push_back(set->copy());
    }
    if (state.shownIndex < 0) state.shownAutomatic = _selectedCurveSet;
    return state;
}

void TQDemoCurveEditorCtrl::newCurveSetOk(RWActionSender* sender) {
    _setsBeforeNewSet = setsState();
    TQCurveEditorCtrl::newCurveSetOk(sender);
    _setsBeforeNewSet.reset();
}

std::any TQDemoCurveEditorCtrl::captureUndoState(uint32_t, uint32_t action) {
    if (action == kTQUndoActionNewCurveSet && _setsBeforeNewSet) return *_setsBeforeNewSet;
    return setsState();
}

void TQDemoCurveEditorCtrl::restoreUndoState(uint32_t, uint32_t, const std::any& state) {
    const auto* sets = std::any_cast<SetsState>(&state);
    if (!sets) return;
    // Copies again, so that the memento stays as it was for a later redo.
    _curveSets.clear();
    for (const TQCurveSetPtr& set : sets->sets) _curveSets.push_back(set->copy());
    const bool custom = sets->shownIndex >= 0 && sets->shownIndex < int64_t(_curveSets.size());
    setSelectedCurveSet(custom ? _curveSets[size_t(sets->shownIndex)] : sets->shownAutomatic);
    refreshSelectedCurveSet();
    refreshPopUp();
    updateUI();
}

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
