#pragma once
// The demo's main window: a list of the scene's objects beside a curve view that shows the
// curves of the object selected in the list (which is the scene's selected object). The
// curves can be clicked, rubber-banded and dragged with the edit tool; the Edit menu undoes
// and redoes through the host's history and names the step it would undo.
//
// The window owns the host (and so the scene), the controller and the view. Notification
// words reach the controller first, then the window, which keeps the list and the Edit menu
// in step.

#include <QMainWindow>

#include "apps/demo/TQDemoCurveEditorCtrl.h"
#include "host/TQHostAppDelegate.h"
#include "qt/TQQtEditMenu.h"
#include "src/view/TQCurveEditorViewBase.h"

class QListWidget;
class TQQtCurveViewWidget;

class TQDemoWindow final : public QMainWindow,
                           public TQNotificationReceiver,
                           public TQQtUndoHistory {
public:
    TQDemoWindow();
    ~TQDemoWindow() override;

    TQHostAppDelegate& host() { return _host; }
    TQDemoCurveEditorCtrl& controller() { return _controller; }
    TQCurveEditorViewBase& curveView() { return _view; }
    TQQtCurveViewWidget* curveWidget() const { return _curveWidget; }
    TQQtEditMenu* editMenu() const { return _editMenu; }
    QListWidget* objectList() const { return _objectList; }

    // Fits the shown curves into the view, in value and in time.
    void frameAll();

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
    void buildMenus();
    // The list shows the scene's objects, the scene's selected object selected.
    void refreshObjectList();
    void objectChosen();

    // Declared first: everything below refers to it, so it dies last.
    TQHostAppDelegate _host;
    TQDemoCurveEditorCtrl _controller{_host};
    TQCurveEditorViewBase _view;

    // Owned by the window as Qt children.
    QListWidget* _objectList = nullptr;
    TQQtCurveViewWidget* _curveWidget = nullptr;
    TQQtEditMenu* _editMenu = nullptr;
    bool _refreshingList = false;
    bool _framedOnce = false;
};
