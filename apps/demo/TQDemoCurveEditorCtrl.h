#pragma once
// The demo's controller: the full editor's controller, with what a host adds to it. The
// horizontal zoom and pan of the view become the host's display range, which comes back to
// the view; an undo or redo of the host's history, which restores channels wholesale, is
// followed by the word that every cached curve is stale. A keypoint's value is typed into the
// framework's value panel. A refused paste is told to the window. The custom curve sets are
// part of the history: a new set and a channel removed from a set are undone and redone with
// the other steps.
//
// Lifetime: the host is not owned and must outlive the controller; the controller hears the
// host's words from construction until it dies. Two-phase like its base: construct, then
// init(), the delegate, the view, the outlets, setupController and viewDidLoad.

#include <functional>
#include <optional>

#include "host/TQHostAppDelegate.h"
#include "src/editor/TQCurveEditorCtrl.h"

class TQDemoCurveEditorCtrl final : public TQCurveEditorCtrl, public TQHostUndoClient {
public:
    explicit TQDemoCurveEditorCtrl(TQHostAppDelegate& host);
    ~TQDemoCurveEditorCtrl() override;

    // The range the view asks for, as the host takes it (a range the host refuses leaves the
    // view where it was).
    void didSetViewContentsHorizontalOrigin(double origin, double duration) override;
    void didSetViewContentsHorizontalOffset(double offset) override;

    bool undo();
    bool redo();

    // The new-set panel's OK records its step after the set is made: the sets as they were
    // are taken before, for that step.
    void newCurveSetOk(RWActionSender* sender = nullptr) override;
    // Copies of the custom sets and which set shows; restored as they were taken.
    std::any captureUndoState(uint32_t type, uint32_t action) override;
    void restoreUndoState(uint32_t type, uint32_t action, const std::any& state) override;

    // The window the value panel of a double-clicked keypoint is placed in; not owned.
    void setEditorWindow(RWWindow* window) { _editorWindow = window; }

    // Every paste, from the Edit menu or a context menu, tells a refusal through this.
    void paste(RWActionSender* sender = nullptr) override;
    void setPasteRefused(std::function<void(TQPasteResult)> told) {
        _pasteRefused = std::move(told);
    }

protected:
    // The value panel of the framework (TQCurveEditorValueController), at the click, kept
    // inside the curves.
    bool runValuePanel(TQCurveEditorValueWindow& window) override;

private:
    void applyDisplayRange(const CMTimeRange& range);
    // After a restore: the selection's handles again, and every curve sampled again.
    void restored();

    struct SetsState {
        std::vector<TQCurveSetPtr> sets;
        // The custom set's index, or -1 and the automatic set that shows.
        int64_t shownIndex = -1;
        TQCurveSetPtr shownAutomatic;
    };
    SetsState setsState() const;

    TQHostAppDelegate& _host;
    RWWindow* _editorWindow = nullptr;
    std::function<void(TQPasteResult)> _pasteRefused;
    std::optional<SetsState> _setsBeforeNewSet;
};
