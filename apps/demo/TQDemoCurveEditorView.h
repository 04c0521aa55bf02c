#pragma once
// The demo's curve view: the full editor's timeline view, with the host's playhead drawn over
// the curves (a line from the bottom to the top at the current time) and what the demo host
// adds to the box tool. The box's own part of a box drag's undo step is kept here: the four corners as
// they stand (a box distorted by a free corner drag comes back distorted, where a rectangle
// would put the next drag's keypoints out of step with the box). Delete with the box tool
// forgets the box and what it held, and leaves the keypoints alone.
//
// Lifetime: a host that records the box's steps registers the view as an undo client with
// registerBoxUndo and must unregister it (unregisterBoxUndo) before the view dies.

#include <any>

#include "host/TQHostAppDelegate.h"
#include "src/editor/TQCurveEditorView.h"

class TQDemoCurveEditorView final : public TQCurveEditorView, public TQHostUndoClient {
public:
    // The playhead's colour, straight alpha.
    static constexpr GDColor kPlayheadColor{0.91f, 0.36f, 0.25f, 0.9f};

    // The playhead, under the rubber band and the box: those are what the user works with.
    void drawOverlays(const CGRect& bounds) override;

    void registerBoxUndo(TQHostAppDelegate& host);
    void unregisterBoxUndo(TQHostAppDelegate& host);

    // The box tool's Delete: the box and the selection are forgotten, the keypoints stay, and
    // the editor hears that the change is done.
    void forgetBox();

    // TQHostUndoClient: the box of a box drag (its corners and whether it is shown).
    std::any captureUndoState(uint32_t type, uint32_t action) override;
    void restoreUndoState(uint32_t type, uint32_t action, const std::any& state) override;

private:
    // The object the box's steps are recorded under: the view as its base posts them.
    const void* undoObject() const { return static_cast<const TQCurveEditorViewBase*>(this); }
};
