#pragma once
// The demo's main window: the full curve editor on a project of the reference host, the
// sample piece at start (untitled). A list of the scene's objects (the scene's selection: pick
// one or several) and the channel list of the shown set (values, show boxes, selection in step
// with the curves) sit beside the curve view with its vertical zoom scroller; the tool bar
// holds the tool switch (edit, sketch and box) and the curve set pop-up, which lists every
// automatic and custom set. The automatic sets follow the objects selected, through the
// controller's notify. View > Frame All fits the shown curves; View > Auto Zoom lets the view
// fit them vertically at every frame (the scroller is disabled meanwhile). The Edit menu undoes
// and redoes through the host's history and names the step it would undo; Copy, Cut and Paste
// take keypoints through the system clipboard (pasted at the playhead; a refused paste says
// why in the status bar); Delete deletes the selected keypoints, or with the box tool forgets
// the box. In the curves, a right click opens
// the menu of what lies under the pointer and the arrows nudge the selection (the curve
// widget's key map).
//
// The File menu makes a new document, opens and saves project files (Save As… where the
// document has no file yet); the title shows the file's name and a mark while the document
// has unsaved changes, and New, Open and closing the window ask first whether to save them
// (Save, Don't Save, Cancel). A file that cannot be read is named in an error dialog, and the
// document that was open stays as it was. The dialogs go through prompts() so that tests can
// answer them.
//
// The curves are a timeline: a time ruler over them sets the playhead, which the view draws;
// the transport bar plays the piece on the host's clock, and a preview beside the object list
// shows the scene at the playhead. The Time menu moves the selected keypoints by or to a
// typed number of frames (as typing a number in the curves does). The Animation menu, like
// the list's Menu column, holds the animation menu of the selected channels, with Simplify
// (a modal panel that previews on the channel itself) and Generate Keyframes (a panel beside
// the editor that bakes cycles of the extrapolation).
//
// The window owns the host (and so the scene), the controller, the view and the control
// models; Qt owns the widgets. Notification words reach the controller first, then the
// window, which keeps the list, the title and the menus in step.

#include <QMainWindow>
#include <QMessageBox>
#include <QPalette>
#include <QString>

#include <functional>
#include <map>
#include <memory>
#include <optional>
#include <vector>

#include "apps/demo/TQDemoCurveEditorCtrl.h"
#include "apps/demo/TQDemoCurveEditorView.h"
#include "apps/demo/TQDemoDocument.h"
#include "host/TQHostAppDelegate.h"
#include "qt/TQQtEditMenu.h"
#include "src/channellist/TQCurveEditorAnimStatusCell.h"
#include "src/channellist/TQCurveEditorChannelList.h"
#include "src/channellist/TQCurveEditorListController.h"

class QAction;
class QMenu;
class QListWidget;
class TQDemoScenePreview;
class TQDemoTransport;
class TQQtCurveViewWidget;
class TQQtOutlineView;
class TQQtPanelDialog;
class TQQtTimeRuler;
class TQQtPopUpButton;
class TQQtSegmentedControl;
class TQQtWindowBinding;
class TQQtZoomScroller;
class TQDemoInspector;

// Centres each panel on the editor's window as it appears.
class TQDemoPanelPlacer final : public RWWindowObserver {
public:
    TQDemoPanelPlacer(RWWindow& editorWindow, std::vector<std::shared_ptr<RWPanel>> panels);
    ~TQDemoPanelPlacer() override;
    TQDemoPanelPlacer(const TQDemoPanelPlacer&) = delete;
    TQDemoPanelPlacer& operator=(const TQDemoPanelPlacer&) = delete;

    void windowDidChange(RWWindow& window) override;

private:
    RWWindow& _editorWindow;
    std::vector<std::shared_ptr<RWPanel>> _panels;
    std::map<const RWWindow*, bool> _visible;
};

// The questions the File menu asks; each starts as the Qt dialog that asks it.
struct TQDemoPrompts {
    // Whether to save the named document's changes: Save, Discard (Don't Save) or Cancel.
    std::function<QMessageBox::StandardButton(const QString& name)> askToSaveChanges;
    // A file to open, or an empty text for none.
    std::function<QString()> chooseFileToOpen;
    // Where to save, starting from a suggested name; an empty text for nowhere.
    std::function<QString(const QString& suggested)> chooseFileToSave;
    // What went wrong, and the reader's or writer's own words on it.
    std::function<void(const QString& text, const QString& detail)> showError;
};

class TQDemoWindow final : public QMainWindow,
                           public TQNotificationReceiver,
                           public TQQtUndoHistory {
public:
    // With `stress`, the window opens on the stress scene instead of the sample piece.
    explicit TQDemoWindow(bool stress = false);
    ~TQDemoWindow() override;

    TQHostAppDelegate& host() { return _host; }
    TQDemoCurveEditorCtrl& controller() { return _controller; }
    TQDemoCurveEditorView& curveView() { return _view; }
    TQDemoDocument& document() { return _document; }
    TQDemoPrompts& prompts() { return _prompts; }
    TQQtCurveViewWidget* curveWidget() const { return _curveWidget; }
    TQQtEditMenu* editMenu() const { return _editMenu; }
    QListWidget* objectList() const { return _objectList; }
    // The channels of the selected set beside the curves.
    TQQtOutlineView* channelListView() const { return _channelListView; }
    TQCurveEditorChannelList& channelList() { return *_channelList; }
    TQCurveEditorListController& channelListController() { return _channelListController; }
    TQQtSegmentedControl* toolSwitch() const { return _toolSwitch; }
    TQQtPopUpButton* curveSetPopUp() const { return _curveSetPopUp; }
    TQQtZoomScroller* verticalScroller() const { return _scroller; }
    QAction* autoZoomAction() const { return _autoZoom; }
    QAction* deleteAction() const { return _delete; }
    QAction* copyAction() const { return _copy; }
    QAction* cutAction() const { return _cut; }
    QAction* pasteAction() const { return _paste; }
    // The inspector of the selected object, with its heads-up window.
    TQDemoInspector* inspector() const { return _inspector; }
    TQDemoTransport& transport() const { return *_transport; }
    TQQtTimeRuler* timeRuler() const { return _timeRuler; }
    TQDemoScenePreview* scenePreview() const { return _scenePreview; }
    RWWindow& editorWindow() { return _editorWindow; }
    // The generate panel's dialog (the simplify panel's is made by each modal run).
    TQQtPanelDialog* generateDialog() const { return _generateDialog; }

    // The Time menu's command: the timing move panel under the top of the curves, then the
    // selected keypoints moved by (isDelta) or to the typed number of frames. Nothing without
    // a selected keypoint.
    void moveSelectedKeypointsInTime(bool isDelta);

    // Fits the shown curves into the view, in value and, unless told not to, in time.
    void frameAll(bool includeTime = true);

    // The File menu's commands. Each answers whether it went through (false when the user
    // cancelled or a file could not be read or written).
    bool newDocument();
    bool open();
    bool save();
    bool saveAs();
    // Opens the file without a question about unsaved changes (the command line's file, a
    // file the caller asked about itself); an error dialog names a file that cannot be read.
    std::optional<BNSerializerError> openFile(const QString& path);
    // Asks whether to save unsaved changes; false when the user cancels (or the save fails).
    bool maybeSave();

    // The application's look: a dark palette that matches the curve view and its light tool
    // icons (for the Fusion style).
    static QPalette darkPalette();

    // TQNotificationReceiver
    void notify(TQNotificationWord word) override;

    // TQQtUndoHistory: the host's history, through the controller so that the view samples
    // the restored curves again.
    bool canUndo() override { return _host.canUndo(); }
    bool canRedo() override { return _host.canRedo(); }
    std::string undoDescription() override { return _host.undoDescription(); }
    std::string redoDescription() override { return _host.redoDescription(); }
    bool undo() override { return _controller.undo(); }
    bool redo() override { return _controller.redo(); }

protected:
    void showEvent(QShowEvent* event) override;
    // Asks about unsaved changes before the window closes.
    bool eventFilter(QObject* watched, QEvent* event) override;

private:
    void buildWidgets();
    void buildMenus();
    void setUpController();
    // The list shows the scene's objects, the scene's selected objects selected.
    void refreshObjectList();
    void objectsChosen();
    void refreshTitle();
    void installDefaultPrompts();
    // With the box tool, forgets the box; with the others, deletes the selected keypoints.
    void deleteSelection();
    // Copy, Cut and Paste of keypoints, after Undo and Redo in the Edit menu.
    void buildClipboardActions(QMenu& edit);
    // After the document was replaced: the controls and the view follow it.
    void documentReplaced();
    // Saves to the path, or names the failure in an error dialog.
    bool writeDocument(const QString& path);
    // The Animation menu, built for the selected channels each time it opens.
    void fillAnimationMenu(QMenu& menu);

    void buildTimeMenu();

    // Declared first: everything below refers to it, so it dies last.
    TQHostAppDelegate _host;
    TQDemoCurveEditorView _view;
    // The list and its controller; the list's widget shares the list.
    std::shared_ptr<TQCurveEditorChannelList> _channelList =
        std::make_shared<TQCurveEditorChannelList>();
    TQCurveEditorListController _channelListController;
    // The editor's window, with the controller as its delegate.
    RWWindow _editorWindow;
    TQDemoCurveEditorCtrl _controller{_host};
    // After the controller: it hears each word once the editor has.
    TQDemoDocument _document{_host, _controller, _view};
    TQDemoPrompts _prompts;
    // The cells of the list's "Key" and "Menu" columns; the key cell also builds the
    // Animation menu of the menu bar.
    std::shared_ptr<TQCurveEditorAnimStatusCell> _keyCell =
        std::make_shared<TQCurveEditorAnimStatusCell>(&_controller);
    std::shared_ptr<TQCurveEditorAnimMenuCell> _menuCell =
        std::make_shared<TQCurveEditorAnimMenuCell>(&_controller);
    // The Animation menu's model while it is shown.
    RWMenuPtr _animationMenu;
    // Places the simplify and generate panels, which the controller shares.
    std::unique_ptr<TQDemoPanelPlacer> _panelPlacer;

    // Owned by the window as Qt children.
    QListWidget* _objectList = nullptr;
    TQQtOutlineView* _channelListView = nullptr;
    TQQtCurveViewWidget* _curveWidget = nullptr;
    TQQtZoomScroller* _scroller = nullptr;
    TQQtSegmentedControl* _toolSwitch = nullptr;
    TQQtPopUpButton* _curveSetPopUp = nullptr;
    TQQtEditMenu* _editMenu = nullptr;
    QAction* _autoZoom = nullptr;
    QAction* _delete = nullptr;
    QAction* _copy = nullptr;
    QAction* _cut = nullptr;
    QAction* _paste = nullptr;
    TQQtWindowBinding* _windowBinding = nullptr;
    TQQtPanelDialog* _generateDialog = nullptr;
    TQDemoInspector* _inspector = nullptr;
    TQDemoTransport* _transport = nullptr;
    TQQtTimeRuler* _timeRuler = nullptr;
    TQDemoScenePreview* _scenePreview = nullptr;
    bool _refreshingList = false;
    bool _framedOnce = false;
};
