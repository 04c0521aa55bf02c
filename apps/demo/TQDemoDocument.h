#pragma once
// The demo's document: the reference host's project file behind the window, where it lives on
// disk (nowhere while untitled), and whether it changed since it was opened or saved.
//
// Modified means the document would save differently in what the user made: the undo history
// stands elsewhere than where it stood at the last save (undoing back to that point makes it
// unmodified again), objects were added to or removed from the scene, or the custom curve sets
// differ (names, kinds, channels, colours). What the editor merely shows does not count: the
// shown set, the objects selected, zoom and pan.
//
// Opening, making a new document and saving keep the editor in step with the document: its
// custom sets are built from the document's list (and written into it before saving), and
// its settings (auto zoom, snapping, time lock, curve snapshots, the display range) come from
// and go to the document's editor state. A failed open changes nothing; a failed save leaves
// the file on disk as it was and the document modified.
//
// Lifetime: the host, the controller and the view are not owned and must outlive the
// document; the document hears the host's words from construction until it dies.

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

#include "host/TQHostAppDelegate.h"
#include "host/TQHostProjectFile.h"
#include "src/editor/TQCurveEditorCtrl.h"
#include "src/editor/TQCurveEditorView.h"

class TQDemoDocument final : public TQNotificationReceiver {
public:
    TQDemoDocument(TQHostAppDelegate& host, TQCurveEditorCtrl& controller, TQCurveEditorView& view);
    ~TQDemoDocument() override;
    TQDemoDocument(const TQDemoDocument&) = delete;
    TQDemoDocument& operator=(const TQDemoDocument&) = delete;

    TQHostProject& project() { return _project; }
    // Empty while untitled.
    const std::string& path() const { return _path; }
    bool isUntitled() const { return _path.empty(); }
    // The file's name, "Untitled" without one.
    std::string displayName() const;
    bool isModified() const;

    // The sample piece in memory: untitled, unmodified, its title and logo selected. Before
    // the editor is set up, whose start builds the (empty) custom sets and takes the
    // settings: only the scene, the time settings and a fresh editor state are made here.
    void loadSample();
    // The stress scene in memory (100 objects of 30 channels, 1,000,000 keyframes), untitled
    // and unmodified, its first two objects selected. Called where loadSample would be.
    void loadStress();
    // An empty scene, untitled.
    void newDocument();
    // All or nothing: on failure the document and the editor stay exactly as they were.
    std::optional<BNSerializerError> open(const std::string& path);
    // Writes the document there; on success that is its path and it is unmodified.
    std::optional<BNSerializerError> saveAs(const std::string& path);

    // The editor's settings from the document's state: the view's auto zoom, snapping and
    // time lock, the controller's curve snapshots; the view shows the host's display range.
    void applyEditorState();

    // TQNotificationReceiver: a change of the scene's objects that no load made.
    void notify(TQNotificationWord word) override;

private:
    // What the custom curve sets save as, set by set, for the modified test.
    struct SavedSetForm {
        std::string name;
        bool relative = false;
        // A relative set's paths from an object, an absolute one's channels from the scene
        // root with their colours.
        std::vector<std::pair<std::string, uint32_t>> members;
        friend bool operator==(const SavedSetForm&, const SavedSetForm&) = default;
    };
    std::vector<SavedSetForm> customSetsForm() const;
    // The editor's sets anew from the document's list, its settings from the document's state.
    void editorFollowsDocument();
    // The settings the user has now, into the document's state.
    void collectEditorState();
    void markSaved();

    TQHostAppDelegate& _host;
    TQCurveEditorCtrl& _controller;
    TQCurveEditorView& _view;
    TQHostProject _project;
    std::string _path;
    uint64_t _savedPosition = 0;
    std::vector<SavedSetForm> _savedSets;
    bool _sceneChanged = false;
    // While the document itself replaces the scene: its words are no change of the user's.
    bool _loading = false;
};
