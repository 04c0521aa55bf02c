#include "apps/demo/TQDemoWindow.h"

#include <QAction>
#include <QKeySequence>
#include <QListWidget>
#include <QMenuBar>
#include <QSignalBlocker>
#include <QSplitter>
#include <QStatusBar>
#include <QTimer>

#include "host/TQHostSampleScene.h"
#include "qt/TQQtCurveViewWidget.h"

namespace {

// World rectangle of the view before the first framing: the sample piece's six seconds.
constexpr double kInitialSeconds = 6.0;
constexpr double kInitialHalfHeight = 150.0;
// The value step of the full editor's labels: each curve is fitted to the grid on its own.
constexpr double kGridSpacingY = 25.0;
// Role of a list row's data: the object's id in the scene.
constexpr int kObjectIdRole = Qt::UserRole + 1;

}  // namespace

TQDemoWindow::TQDemoWindow() {
    setWindowTitle(tr("VantaCurveEditor Demo"));

    _controller.init();
    _controller.setAppDelegate(&_host);
    _view.setController(&_controller);
    _controller.setView(&_view);
    _view.setGridSpacingY(kGridSpacingY);
    const CGRect volume =
        CGRectMake(0.0, -kInitialHalfHeight, kInitialSeconds, 2.0 * kInitialHalfHeight);
    _view.setCurrentViewVolume(volume);
    _view.setOriginalViewVolume(volume);

    // Registered after the controller (which registers as it is made): the window hears each
    // word once the curves are in step with it.
    _host.addNotificationReceiver(this);

    auto* splitter = new QSplitter(Qt::Horizontal, this);
    _objectList = new QListWidget(splitter);
    _objectList->setSelectionMode(QAbstractItemView::SingleSelection);
    _objectList->setMinimumWidth(140);
    _curveWidget = new TQQtCurveViewWidget(splitter);
    _curveWidget->setMinimumSize(320, 200);
    splitter->addWidget(_objectList);
    splitter->addWidget(_curveWidget);
    splitter->setStretchFactor(0, 0);
    splitter->setStretchFactor(1, 1);
    splitter->setSizes({170, 830});
    setCentralWidget(splitter);
    connect(_objectList, &QListWidget::itemSelectionChanged, this, [this] { objectChosen(); });

    buildMenus();
    statusBar()->showMessage(
        tr("Click a keypoint to select it, drag to move it (Shift: one axis). "
           "Drag on empty space for a rubber band. Ctrl+Z undoes."));

    _curveWidget->setView(&_view);
    resize(1000, 560);

    TQHostLoadSampleScene(_host, TQHostObjectFamily::Kestrel);
    const CMTimeRange range = _host.displayRange();
    _view.setDisplayRange(&range.start, &range.duration);
    // The load posts its words before the view knows its range: show the selection again.
    const std::vector<TQChannelBase*> selected = _host.selectedObjectsRootChannels();
    _controller.showObject(selected.empty() ? nullptr : selected.front());
    refreshObjectList();
    _editMenu->refresh();
    _curveWidget->setFocus();
}

TQDemoWindow::~TQDemoWindow() {
    // Qt deletes the child widgets after these members are gone: detach them first, and
    // let no signal of a dying child reach this window.
    _host.removeNotificationReceiver(this);
    QObject::disconnect(_objectList, nullptr, this, nullptr);
    _curveWidget->setView(nullptr);
    _editMenu->setHistory(nullptr);
    _view.setController(nullptr);
    _controller.setView(nullptr);
}

void TQDemoWindow::buildMenus() {
    QMenu* file = menuBar()->addMenu(tr("&File"));
    QAction* quit = file->addAction(tr("&Quit"));
    quit->setShortcut(QKeySequence::Quit);
    connect(quit, &QAction::triggered, this, &QWidget::close);

    _editMenu = new TQQtEditMenu(this, this);
    menuBar()->addMenu(_editMenu->menu());
    _editMenu->menu()->addSeparator();
    QAction* all = _editMenu->menu()->addAction(tr("Select &All"));
    all->setShortcut(QKeySequence(Qt::CTRL | Qt::Key_A));
    connect(all, &QAction::triggered, this, [this] { _view.selectAll(); });
    QAction* none = _editMenu->menu()->addAction(tr("Select &None"));
    none->setShortcut(QKeySequence(Qt::CTRL | Qt::SHIFT | Qt::Key_A));
    connect(none, &QAction::triggered, this, [this] { _view.selectNone(); });

    QMenu* viewMenu = menuBar()->addMenu(tr("&View"));
    QAction* frame = viewMenu->addAction(tr("&Frame All"));
    frame->setShortcut(QKeySequence(Qt::CTRL | Qt::SHIFT | Qt::Key_F));
    connect(frame, &QAction::triggered, this, [this] { frameAll(); });
}

void TQDemoWindow::showEvent(QShowEvent* event) {
    QMainWindow::showEvent(event);
    if (_framedOnce) return;
    // Framing fits the curves to the view's size, which the layout settles after the show.
    _framedOnce = true;
    QTimer::singleShot(0, this, [this] { frameAll(); });
}

void TQDemoWindow::frameAll() {
    _view.frameAll(1);
    _view.setAllOriginalCurveDirty(1);
    _view.setNeedsDisplay(1);
}

void TQDemoWindow::refreshObjectList() {
    _refreshingList = true;
    const QSignalBlocker blocker(_objectList);
    const std::vector<TQChannelObjectRootBase*> objects = _host.scene().objects();
    // The rows are kept when the objects are the same: this runs inside the list's own
    // selection signal when the user picks a row, and its rows must not vanish under it.
    bool same = _objectList->count() == static_cast<int>(objects.size());
    for (int i = 0; same && i < _objectList->count(); ++i)
        same = _objectList->item(i)->data(kObjectIdRole).toULongLong() ==
                   objects[static_cast<size_t>(i)]->getChannelId() &&
               _objectList->item(i)->text() ==
                   QString::fromStdString(objects[static_cast<size_t>(i)]->getName());
    if (!same) {
        _objectList->clear();
        for (TQChannelObjectRootBase* object : objects) {
            auto* row = new QListWidgetItem(QString::fromStdString(object->getName()), _objectList);
            row->setData(kObjectIdRole, static_cast<qulonglong>(object->getChannelId()));
        }
    }
    const TQChannelObjectRootBase* shown = _controller.shownObject();
    setWindowTitle(
        shown ? tr("VantaCurveEditor Demo - %1").arg(QString::fromStdString(shown->getName()))
              : tr("VantaCurveEditor Demo"));
    for (int i = 0; i < _objectList->count(); ++i) {
        const bool isShown = shown && objects[static_cast<size_t>(i)] == shown;
        _objectList->item(i)->setSelected(isShown);
        if (isShown) _objectList->setCurrentRow(i, QItemSelectionModel::Current);
    }
    _refreshingList = false;
}

void TQDemoWindow::objectChosen() {
    if (_refreshingList) return;
    const QList<QListWidgetItem*> rows = _objectList->selectedItems();
    if (rows.isEmpty()) return;  // the view keeps the last object rather than going blank
    const auto id = static_cast<TQChannelId>(rows.front()->data(kObjectIdRole).toULongLong());
    // The scene's selection decides what the view shows: the controller follows its word.
    if (TQChannelObjectRootBase* object = _host.scene().objectWithId(id))
        _host.selectObject(object);
}

void TQDemoWindow::notify(TQNotificationWord word) {
    if (word & (kTQNotifySceneChanged | kTQNotifySceneReset | kTQNotifyObjectSelectionChanged))
        refreshObjectList();
    // Any word may follow a change of the history (a drag's end, an undo): cheap to refresh.
    _editMenu->refresh();
}
