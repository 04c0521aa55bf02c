#include "apps/demo/TQDemoWindow.h"

#include <QAction>
#include <QHBoxLayout>
#include <QKeySequence>
#include <QLabel>
#include <QListWidget>
#include <QMenuBar>
#include <QSignalBlocker>
#include <QSplitter>
#include <QStatusBar>
#include <QTimer>
#include <QToolBar>

#include "host/TQHostSampleScene.h"
#include "qt/TQQtCurveViewWidget.h"
#include "qt/TQQtOutlineView.h"
#include "qt/TQQtPopUpButton.h"
#include "qt/TQQtSegmentedControl.h"
#include "qt/TQQtWindowBinding.h"
#include "qt/TQQtZoomScroller.h"

namespace {

// Role of a list row's data: the object's id in the scene.
constexpr int kObjectIdRole = Qt::UserRole + 1;

}  // namespace

TQDemoWindow::TQDemoWindow() {
    buildWidgets();
    buildMenus();
    TQHostLoadSampleScene(_host, TQHostObjectFamily::Kestrel);
    // The title and the bouncing logo: the piece's two busiest objects.
    _host.setSelectedObjects({_host.scene().objectNamed(kTQHostSampleTitleObject),
                              _host.scene().objectNamed(kTQHostSampleBehaviorObject)});
    setUpController();
    // Registered after the controller (which registers as it is made): the window hears each
    // word once the editor is in step with it.
    _host.addNotificationReceiver(this);
    _windowBinding = new TQQtWindowBinding(_editorWindow, this);
    refreshObjectList();
    refreshTitle();
    _editMenu->refresh();
    statusBar()->showMessage(
        tr("Choose objects on the left and a curve set above. Click a keypoint to select it, "
           "drag to move it (Shift: one axis); drag on empty space for a rubber band. Ctrl+Z "
           "undoes."));
    resize(1100, 620);
    _curveWidget->setFocus();
}

TQDemoWindow::~TQDemoWindow() {
    // Qt deletes the child widgets after these members are gone: detach them first, and let
    // no signal of a dying child reach this window.
    _host.removeNotificationReceiver(this);
    QObject::disconnect(_objectList, nullptr, this, nullptr);
    delete _windowBinding;
    _curveWidget->setView(nullptr);
    _channelListView->setOutline(nullptr);
    _scroller->setModel(nullptr);
    _toolSwitch->setModel(nullptr);
    _curveSetPopUp->setModel(nullptr);
    _editMenu->setHistory(nullptr);
    _view.setController(nullptr);
    _controller.setView(nullptr);
}

void TQDemoWindow::buildWidgets() {
    auto* splitter = new QSplitter(Qt::Horizontal, this);
    _objectList = new QListWidget(splitter);
    _objectList->setSelectionMode(QAbstractItemView::ExtendedSelection);
    _objectList->setMinimumWidth(140);
    _channelListView = new TQQtOutlineView(splitter);
    _channelListView->setMinimumWidth(220);
    auto* editor = new QWidget(splitter);
    auto* editorLayout = new QHBoxLayout(editor);
    editorLayout->setContentsMargins(0, 0, 0, 0);
    editorLayout->setSpacing(0);
    _curveWidget = new TQQtCurveViewWidget(editor);
    _curveWidget->setMinimumSize(320, 200);
    _scroller = new TQQtZoomScroller(editor);
    editorLayout->addWidget(_curveWidget, 1);
    editorLayout->addWidget(_scroller);
    splitter->addWidget(_objectList);
    splitter->addWidget(_channelListView);
    splitter->addWidget(editor);
    splitter->setStretchFactor(0, 0);
    splitter->setStretchFactor(1, 0);
    splitter->setStretchFactor(2, 1);
    splitter->setSizes({140, 320, 740});
    setCentralWidget(splitter);
    connect(_objectList, &QListWidget::itemSelectionChanged, this, [this] { objectsChosen(); });

    QToolBar* bar = addToolBar(tr("Editor"));
    bar->setMovable(false);
    _toolSwitch = new TQQtSegmentedControl(bar);
    bar->addWidget(_toolSwitch);
    bar->addSeparator();
    bar->addWidget(new QLabel(tr(" Curves: "), bar));
    _curveSetPopUp = new TQQtPopUpButton(bar);
    _curveSetPopUp->setMinimumWidth(150);
    bar->addWidget(_curveSetPopUp);

    _curveWidget->setView(&_view);
}

void TQDemoWindow::setUpController() {
    const CMTimeRange range = _host.displayRange();
    _view.setTotalRange(&range.start, &range.duration);
    // The scroller works from the start; View > Auto Zoom hands the vertical fit to the view.
    _view.setAutoZoom(0);

    _controller.init();
    _controller.setAppDelegate(&_host);
    _controller.setView(&_view);
    TQCurveEditorOutlets outlets;
    outlets.verticalScroller = std::make_shared<RWZoomScroller>();
    outlets.verticalScroller->setTarget(&_controller);
    outlets.verticalScroller->setAction("verticalZoomScroll:");
    _scroller->setModel(outlets.verticalScroller);
    outlets.tools = std::make_shared<RWSegmentedControl>();
    outlets.tools->setTarget(&_controller);
    outlets.tools->setAction("setCurrentTool:");
    _toolSwitch->setModel(outlets.tools);
    outlets.curveSetsPopUp = std::make_shared<RWPopUpButton>();
    _curveSetPopUp->setModel(outlets.curveSetsPopUp);
    // The channel list, as its interface file connects it.
    _channelList->addStandardColumns();
    _channelList->setCurveListController(&_channelListController);
    _channelListController.setMainCurveEditorController(&_controller);
    _channelListController.setOutlineView(_channelList.get());
    _channelListController.awakeFromNib();
    outlets.channels = _channelList.get();
    outlets.channelsList = &_channelListController;
    _controller.connectOutlets(outlets);
    _controller.setupController();
    _controller.viewDidLoad();
    _editorWindow.setDelegate(&_controller);
    _channelListView->setOutline(_channelList);
    _controller.updateUI();

    // The view offers the edit tool only: the other two are shown, not offered.
    RWSegmentedControl& tools = *_controller.tools();
    const char* descriptions[] = {"Edit keypoints", "Sketch a curve (not offered here)",
                                  "Transform keypoints with a box (not offered here)"};
    for (int64_t i = 0; i < tools.segmentCount() && i < 3; ++i)
        tools.setAccessibilityDescription(descriptions[i], i);
    tools.setEnabled(false, static_cast<int64_t>(TQTool::kSketch));
    tools.setEnabled(false, static_cast<int64_t>(TQTool::kBox));
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
    _autoZoom = viewMenu->addAction(tr("&Auto Zoom"));
    _autoZoom->setCheckable(true);
    connect(_autoZoom, &QAction::triggered, this, [this] {
        _controller.setAutoZoom(nullptr);
        _autoZoom->setChecked(_view.autoZoom() != 0);
    });
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
    _controller.updateUI();
}

void TQDemoWindow::refreshObjectList() {
    _refreshingList = true;
    const QSignalBlocker blocker(_objectList);
    const std::vector<TQChannelObjectRootBase*> objects = _host.scene().objects();
    // The rows are kept when the objects are the same: this runs inside the list's own
    // selection signal when the user picks rows, and its rows must not vanish under it.
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
    for (int i = 0; i < _objectList->count(); ++i)
        _objectList->item(i)->setSelected(_host.isObjectSelected(objects[static_cast<size_t>(i)]));
    _refreshingList = false;
}

void TQDemoWindow::objectsChosen() {
    if (_refreshingList) return;
    std::vector<TQChannelBase*> chosen;
    for (int i = 0; i < _objectList->count(); ++i) {
        if (!_objectList->item(i)->isSelected()) continue;
        const auto id =
            static_cast<TQChannelId>(_objectList->item(i)->data(kObjectIdRole).toULongLong());
        if (TQChannelObjectRootBase* object = _host.scene().objectWithId(id))
            chosen.push_back(object);
    }
    // The scene's selection decides what the sets show: the controller follows its word.
    _host.setSelectedObjects(chosen);
}

QPalette TQDemoWindow::darkPalette() {
    QPalette p;
    const QColor window(45, 45, 48), base(30, 30, 32), text(220, 220, 222), dim(120, 120, 124);
    p.setColor(QPalette::Window, window);
    p.setColor(QPalette::WindowText, text);
    p.setColor(QPalette::Base, base);
    p.setColor(QPalette::AlternateBase, window);
    p.setColor(QPalette::ToolTipBase, base);
    p.setColor(QPalette::ToolTipText, text);
    p.setColor(QPalette::Text, text);
    p.setColor(QPalette::Button, QColor(58, 58, 62));
    p.setColor(QPalette::ButtonText, text);
    p.setColor(QPalette::Highlight, QColor(52, 110, 190));
    p.setColor(QPalette::HighlightedText, Qt::white);
    p.setColor(QPalette::Light, QColor(80, 80, 84));
    p.setColor(QPalette::Mid, QColor(40, 40, 42));
    p.setColor(QPalette::Dark, QColor(25, 25, 27));
    for (QPalette::ColorRole role : {QPalette::WindowText, QPalette::Text, QPalette::ButtonText})
        p.setColor(QPalette::Disabled, role, dim);
    return p;
}

void TQDemoWindow::refreshTitle() {
    const TQCurveSetPtr& set = _controller.selectedCurveSet();
    setWindowTitle(
        set ? tr("VantaCurveEditor Demo - %1").arg(QString::fromStdString(set->curveSetName()))
            : tr("VantaCurveEditor Demo"));
}

void TQDemoWindow::notify(TQNotificationWord word) {
    if (word & (kTQNotifySceneChanged | kTQNotifySceneReset | kTQNotifyObjectSelectionChanged))
        refreshObjectList();
    if (word & kTQNotifyCurveSetContentChanged) refreshTitle();
    // Any word may follow a change of the history (a drag's end, an undo): cheap to refresh.
    _editMenu->refresh();
}
