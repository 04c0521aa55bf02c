#pragma once
// The demo's main window: the full curve editor on the sample project. A list of the scene's
// objects (the scene's selection: pick one or several) and the channel list of the shown set
// (values, show boxes, selection in step with the curves) sit beside the curve view with its
// vertical zoom scroller; the tool bar holds the tool switch (edit; sketch and box are shown,
// disabled, as the view does not offer them) and the curve set pop-up, which lists every
// automatic and custom set. The automatic sets follow the objects selected, through the
// controller's notify. View > Frame All fits the shown curves; View > Auto Zoom lets the view
// fit them vertically at every frame (the scroller is disabled meanwhile). The Edit menu undoes
// and redoes through the host's history and names the step it would undo.
//
// The window owns the host (and so the scene), the controller, the view and the control
// models; Qt owns the widgets. Notification words reach the controller first, then the
// window, which keeps the list, the title and the menus in step.

#include <QMainWindow>
#include <QPalette>

#include <memory>

#include "apps/demo/TQDemoCurveEditorCtrl.h"
#include "host/TQHostAppDelegate.h"
#include "qt/TQQtEditMenu.h"
#include "src/channellist/TQCurveEditorChannelList.h"
#include "src/channellist/TQCurveEditorListController.h"
#include "src/editor/TQCurveEditorView.h"

class QAction;
class QListWidget;
class TQQtCurveViewWidget;
class TQQtOutlineView;
class TQQtPopUpButton;
class TQQtSegmentedControl;
class TQQtWindowBinding;
class TQQtZoomScroller;

class TQDemoWindow final : public QMainWindow,
                           public TQNotificationReceiver,
                           public TQQtUndoHistory {
public:
    TQDemoWindow();
    ~TQDemoWindow() override;

    TQHostAppDelegate& host() { return _host; }
    TQDemoCurveEditorCtrl& controller() { return _controller; }
    TQCurveEditorView& curveView() { return _view; }
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

    // Fits the shown curves into the view, in value and in time.
    void frameAll();

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

private:
    void buildWidgets();
    void buildMenus();
    void setUpController();
    // The list shows the scene's objects, the scene's selected objects selected.
    void refreshObjectList();
    void objectsChosen();
    void refreshTitle();

    // Declared first: everything below refers to it, so it dies last.
    TQHostAppDelegate _host;
    TQCurveEditorView _view;
    // The list and its controller; the list's widget shares the list.
    std::shared_ptr<TQCurveEditorChannelList> _channelList =
        std::make_shared<TQCurveEditorChannelList>();
    TQCurveEditorListController _channelListController;
    // The editor's window, with the controller as its delegate.
    RWWindow _editorWindow;
    TQDemoCurveEditorCtrl _controller{_host};

    // Owned by the window as Qt children.
    QListWidget* _objectList = nullptr;
    TQQtOutlineView* _channelListView = nullptr;
    TQQtCurveViewWidget* _curveWidget = nullptr;
    TQQtZoomScroller* _scroller = nullptr;
    TQQtSegmentedControl* _toolSwitch = nullptr;
    TQQtPopUpButton* _curveSetPopUp = nullptr;
    TQQtEditMenu* _editMenu = nullptr;
    QAction* _autoZoom = nullptr;
    TQQtWindowBinding* _windowBinding = nullptr;
    bool _refreshingList = false;
    bool _framedOnce = false;
};
