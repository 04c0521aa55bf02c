#include "apps/demo/TQDemoCurveEditorCtrl.h"

#include "platform/channels/TQChannelObjectRootBase.h"
#include "src/view/TQCurveEditorViewBase.h"

namespace {

// Channels with keyframes, depth first in the object's own order. Unanimated channels would
// only add flat lines that hide each other.
void collectAnimatedChannels(TQChannelBase* node, std::vector<TQChannel*>& out) {
    if (!node) return;
    if (auto* channel = dynamic_cast<TQChannel*>(node)) {
        if (!channel->testFlag(kTQChannelFlagHidden | kTQChannelFlagHiddenInCurveEditor) &&
            channel->numberOfKeyframes() > 0)
            out.push_back(channel);
    }
    if (const std::vector<TQChannelBase*>* children = node->getChildren())
        for (TQChannelBase* child : *children) collectAnimatedChannels(child, out);
}

}  // namespace

TQDemoCurveEditorCtrl::TQDemoCurveEditorCtrl(TQHostAppDelegate& host) : _host(host) {
    _host.addNotificationReceiver(this);
}

TQDemoCurveEditorCtrl::~TQDemoCurveEditorCtrl() { _host.removeNotificationReceiver(this); }

TQChannelObjectRootBase* TQDemoCurveEditorCtrl::shownObject() const {
    return _shownObjectId ? _host.scene().objectWithId(_shownObjectId) : nullptr;
}

void TQDemoCurveEditorCtrl::showObject(const TQChannelBase* object) {
    TQChannelObjectRootBase* root = object ? _host.scene().objectOf(object) : nullptr;
    if (root != object) root = nullptr;  // a channel inside an object is not an object
    _shownObjectId = root ? root->getChannelId() : 0;

    TQCurveEditorViewBase* view = getView();
    // Handles of the old set's channels mean nothing in the new one.
    if (view) {
        view->getSelection()->reset();
        view->getCurrentSelection()->reset();
        view->getPreviousSelection()->reset();
    }
    auto set = std::make_shared<TQCurveSetMutable>();
    set->initWithName(root ? root->getName() : BNString("Empty"), &_host);
    setSelectedCurveSet(set);
    if (root) {
        std::vector<TQChannel*> channels;
        collectAnimatedChannels(root, channels);
        for (TQChannel* channel : channels) appendChannel(channel, set);
    }
    if (view) {
        view->setAllOriginalCurveScaleDirty(1);
        view->frameAll(1);
    }
    updateUI();
}

void TQDemoCurveEditorCtrl::followSceneSelection() {
    const std::vector<TQChannelBase*> selected = _host.selectedObjectsRootChannels();
    const TQChannelBase* first = selected.empty() ? nullptr : selected.front();
    if (first && first == shownObject()) return;
    showObject(first);
}

bool TQDemoCurveEditorCtrl::undo() {
    _restoring = true;
    const bool done = _host.undo();
    _restoring = false;
    return done;
}

bool TQDemoCurveEditorCtrl::redo() {
    _restoring = true;
    const bool done = _host.redo();
    _restoring = false;
    return done;
}

void TQDemoCurveEditorCtrl::redrawView() {
    if (TQCurveEditorViewBase* view = getView()) view->setNeedsDisplay(1);
}

void TQDemoCurveEditorCtrl::notify(TQNotificationWord word) {
    TQCurveEditorViewBase* view = getView();
    if (word & (kTQNotifyObjectSelectionChanged | kTQNotifySceneChanged | kTQNotifySceneReset))
        followSceneSelection();
    if (view && (word & (kTQNotifyViewVolumeChanged | kTQNotifyCurvesInvalidated)))
        view->setAllOriginalCurveDirty(1);
    if (view && (word & (kTQNotifyChannelsChanging | kTQNotifyChannelsChanged))) {
        if (_restoring) {
            // A restored channel may be a new object behind the same reference, and the
            // selection's handles may be stale: sample everything again.
            view->setAllOriginalCurveDirty(1);
            validateSelection(view->getSelection());
        } else {
            view->setVisibleOriginalCurveDirty(1);
        }
    }
    constexpr TQNotificationWord kRedrawWords =
        kTQNotifyHostTimeChanged | kTQNotifyTimeChanged | kTQNotifyChannelsChanging |
        kTQNotifyChannelsChanged | kTQNotifySceneChanged | kTQNotifySceneReset |
        kTQNotifyDisplayChanged | kTQNotifyPreviewChanged | kTQNotifyPlayRangeChanged |
        kTQNotifyViewVolumeChanged | kTQNotifyCurvesInvalidated | kTQNotifyCurveSetContentChanged |
        kTQNotifyObjectSelectionChanged | kTQNotifyToolChanged;
    if (word & kRedrawWords) redrawView();
    // Last, always, also for a word with no known bit.
    _host.resetModifiedChannels();
}
