#pragma once
// The demo's controller: the editing engine of one curve view, fed with the host's
// notification words. It shows the channels of one object of the scene at a time (the
// object the scene selects), in a private curve set it rebuilds whenever that object changes.
//
// Words, tested in this order:
//   0x80000 (object selection)      the set follows the scene's first selected object
//   0x10, 0x20 (scene)              the same, since the shown object may be gone
//   0x800 | 0x1000 (view volume)    every curve is sampled again at the new zoom
//   0x8000 (curves invalidated)     every curve is sampled again
//   0x4, 0x8 (channels)             the curves of modified channels are sampled again; after
//                                   an undo or redo, which restores channels wholesale,
//                                   every curve is
//   anything else that can change what is drawn: a redraw
// and always, last, resetModifiedChannels on the host.
//
// Lifetime: the host is not owned and must outlive the controller; the controller registers
// with it on construction and unregisters when it dies. Two-phase like its base: construct,
// then init().

#include <cstdint>

#include "host/TQHostAppDelegate.h"
#include "src/engine/TQCurveEditorCtrlBase.h"

class TQDemoCurveEditorCtrl final : public TQCurveEditorCtrlBase, public TQNotificationReceiver {
public:
    explicit TQDemoCurveEditorCtrl(TQHostAppDelegate& host);
    ~TQDemoCurveEditorCtrl() override;

    void notify(TQNotificationWord word) override;

    // Puts the keyframed channels of the object into a fresh set and frames them; null (or an
    // object that is not the scene's) empties the view. The view's selection is forgotten.
    void showObject(const TQChannelBase* object);
    // The object shown, looked up again by id: null once it left the scene.
    TQChannelObjectRootBase* shownObject() const;

    // Undo and redo from the host's history: after either, every curve is stale.
    bool undo();
    bool redo();

private:
    void followSceneSelection();
    void redrawView();

    TQHostAppDelegate& _host;
    TQChannelId _shownObjectId = 0;  // 0: nothing shown
    bool _restoring = false;         // an undo or redo is delivering its word
};
