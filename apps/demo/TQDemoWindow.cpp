#include "apps/demo/TQDemoWindow.h"

#include <QAbstractEventDispatcher>
#include <QAction>
#include <QApplication>
#include <QDir>
#include <QEvent>
#include <QFile>
#include <QFileDialog>
#include <QFileInfo>
#include <QGridLayout>
#include <QGuiApplication>
#include <QHBoxLayout>
#include <QKeySequence>
#include <QLabel>
#include <QListWidget>
#include <QMenuBar>
#include <QPushButton>
#include <QSignalBlocker>
#include <QSplitter>
#include <QStatusBar>
#include <QTimer>
#include <QToolBar>

#include "apps/demo/TQDemoInspector.h"
#include "apps/demo/TQDemoScenePreview.h"
#include "apps/demo/TQDemoTransport.h"
#include "qt/TQQtCurveViewWidget.h"
#include "qt/TQQtMenu.h"
#include "qt/TQQtOutlineView.h"
#include "qt/TQQtPanelDialog.h"
#include "qt/TQQtPopUpButton.h"
#include "qt/TQQtSegmentedControl.h"
#include "qt/TQQtTimeRuler.h"
#include "qt/TQQtWindowBinding.h"
#include "qt/TQQtZoomScroller.h"
#include "src/editor/TQCurveEditorPanels.h"
#include "src/editor/TQCurveSetPanelViews.h"
#include "src/panels/TQTimingMoveController.h"
#include "src/resources/TQStrings.h"

namespace {

// Role of a list row's data: the object's id in the scene.
constexpr int kObjectIdRole = Qt::UserRole + 1;

// Project files: the host's XML document under a name of its own.
constexpr const char* kProjectSuffix = "vceproj";
QString projectFilter() {
    return QObject::tr("Projects (*.%1);;XML Files (*.xml);;All Files (*)").arg(kProjectSuffix);
}

// A path as the host's file functions take it: in the file system's encoding.
std::string fileSystemPath(const QString& path) { return QFile::encodeName(path).toStdString(); }

}  // namespace

TQDemoWindow::TQDemoWindow(bool stress) {
    installDefaultPrompts();
    // Before the widgets: the ruler and the bar are bound to its models.
    _transport = new TQDemoTransport(_host, this);
    buildWidgets();
    buildMenus();
    if (stress)
        _document.loadStress();
    else
        _document.loadSample();
    setUpController();
    _document.applyEditorState();
    _autoZoom->setChecked(_view.autoZoom() != 0);
    _view.registerBoxUndo(_host);
    // Registered after the controller (which registers as it is made): the window hears each
    // word once the editor is in step with it.
    _host.addNotificationReceiver(this);
    // An undo step still open when the loop waits for the next event, with no button held,
    // was left open; the host closes it (see eventLoopDidGoIdle).
    connect(QAbstractEventDispatcher::instance(), &QAbstractEventDispatcher::aboutToBlock, this,
            [this] {
                // A modal panel's run holds its step open until the panel goes.
                if (QGuiApplication::mouseButtons() == Qt::NoButton &&
                    !QApplication::activeModalWidget())
                    _host.eventLoopDidGoIdle();
            });
    _windowBinding = new TQQtWindowBinding(_editorWindow, this);
    // Filters run last installed first: this one asks before the binding closes the editor.
    installEventFilter(this);
    _controller.setEditorWindow(&_editorWindow);
    refreshObjectList();
    refreshTitle();
    _editMenu->refresh();
    _inspector = new TQDemoInspector(_host, this);
    addDockWidget(Qt::RightDockWidgetArea, _inspector);
    statusBar()->showMessage(
        tr("Pick objects on the left and a curve set above. Click or band keypoints and drag "
           "them (Shift: one axis); the box tool puts a box around a band. Ctrl+Z undoes."));
    resize(1280, 720);
    _curveWidget->setFocus();
}

TQDemoWindow::~TQDemoWindow() {
    // Qt deletes the child widgets after these members are gone: detach them first, and let
    // no signal of a dying child reach this window.
    _host.removeNotificationReceiver(this);
    // Its rows refer to the host's channels: it goes while they are there.
    delete _inspector;
    _inspector = nullptr;
    // So does the preview, which hears the host.
    delete _scenePreview;
    _scenePreview = nullptr;
    _view.unregisterBoxUndo(_host);
    QObject::disconnect(_objectList, nullptr, this, nullptr);
    delete _windowBinding;
    // Its binding observes the generate panel, which goes with the controller.
    delete _generateDialog;
    _generateDialog = nullptr;
    _controller.setEditorWindow(nullptr);
    _transport->pause();
    _transport->detachFromHost();
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
    // The ruler over the curves only, so that both map time to the same x.
    auto* editorLayout = new QGridLayout(editor);
    editorLayout->setContentsMargins(0, 0, 0, 0);
    editorLayout->setSpacing(0);
    _timeRuler = _transport->makeRuler(editor);
    _curveWidget = new TQQtCurveViewWidget(editor);
    _curveWidget->setMinimumSize(320, 200);
    _scroller = new TQQtZoomScroller(editor);
    editorLayout->addWidget(_timeRuler, 0, 0);
    editorLayout->addWidget(_curveWidget, 1, 0);
    editorLayout->addWidget(_scroller, 1, 1);
    editorLayout->setRowStretch(1, 1);
    editorLayout->setColumnStretch(0, 1);
    // The scene at the playhead, under the object list.
    auto* side = new QSplitter(Qt::Vertical, splitter);
    side->addWidget(_objectList);
    _scenePreview = new TQDemoScenePreview(_host, side);
    side->addWidget(_scenePreview);
    side->setStretchFactor(0, 1);
    side->setStretchFactor(1, 0);
    splitter->insertWidget(0, side);
    splitter->addWidget(_channelListView);
    splitter->addWidget(editor);
    splitter->setStretchFactor(0, 0);
    splitter->setStretchFactor(1, 0);
    splitter->setStretchFactor(2, 1);
    splitter->setSizes({220, 300, 760});
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

    QToolBar* transport = addToolBar(tr("Transport"));
    transport->setMovable(false);
    _transport->makeToolBarWidgets(transport);

    _curveWidget->setView(&_view);
}

void TQDemoWindow::setUpController() {
    // The view's settings, auto zoom among them, come from the document's editor state after.
    const CMTimeRange range = _host.displayRange();
    _view.setTotalRange(&range.start, &range.duration);

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
    _channelList->tableColumnWithIdentifier(TQCurveEditorListController::kKeyColumn)
        ->setDataCell(_keyCell);
    _channelList->tableColumnWithIdentifier(TQCurveEditorListController::kMenuColumn)
        ->setDataCell(_menuCell);
    _channelListController.awakeFromNib();
    outlets.channels = _channelList.get();
    outlets.channelsList = &_channelListController;
    // The simplify panel runs modally (the modal service shows it); the generate panel stays
    // beside the editor, shown and hidden with its model.
    TQInstantiateSimplifyPanel(outlets, &_controller);
    TQInstantiateGeneratePanel(outlets, &_controller);
    _panelPlacer = std::make_unique<TQDemoPanelPlacer>(
        _editorWindow, std::vector{outlets.reducePanel, outlets.generatePanel});
    _generateDialog = new TQQtPanelDialog(*outlets.generatePanel, this);
    // The pop-up's New and Manage entries run these, as dialogs of the modal service.
    TQInstantiateCurveSetPanels(&_controller, outlets);
    _controller.connectOutlets(outlets);
    _controller.setupController();
    _controller.viewDidLoad();
    _editorWindow.setDelegate(&_controller);
    _channelListView->setOutline(_channelList);
    _controller.updateUI();

    // Every tool is offered: edit, sketch and box.
    RWSegmentedControl& tools = *_controller.tools();
    const char* descriptions[] = {"Edit keypoints", "Sketch a curve on the selected channels",
                                  "Transform keypoints with a box"};
    for (int64_t i = 0; i < tools.segmentCount() && i < 3; ++i)
        tools.setAccessibilityDescription(descriptions[i], i);
}

// ---- Panels --------------------------------------------------------------------------------

TQDemoPanelPlacer::TQDemoPanelPlacer(RWWindow& editorWindow,
                                     std::vector<std::shared_ptr<RWPanel>> panels)
    : _editorWindow(editorWindow), _panels(std::move(panels)) {
    for (const std::shared_ptr<RWPanel>& panel : _panels)
        if (panel) panel->addObserver(this);
}

TQDemoPanelPlacer::~TQDemoPanelPlacer() {
    for (const std::shared_ptr<RWPanel>& panel : _panels)
        if (panel) panel->removeObserver(this);
}

void TQDemoPanelPlacer::windowDidChange(RWWindow& window) {
    const bool visible = window.isVisible();
    bool& wasVisible = _visible[&window];
    const bool appearing = visible && !wasVisible;
    wasVisible = visible;
    if (!appearing) return;
    const CGRect editor = _editorWindow.frame();
    const CGRect panel = window.frame();
    window.setFrameOrigin(
        CGPointMake(editor.origin.x + (editor.size.width - panel.size.width) / 2.0,
                    editor.origin.y + (editor.size.height - panel.size.height) / 2.0));
}

void TQDemoWindow::buildMenus() {
    QMenu* file = menuBar()->addMenu(tr("&File"));
    auto addFileAction = [&](const QString& title, QKeySequence::StandardKey key, auto command) {
        QAction* action = file->addAction(title);
        action->setShortcut(key);
        connect(action, &QAction::triggered, this, [this, command] { (this->*command)(); });
    };
    addFileAction(tr("&New"), QKeySequence::New, &TQDemoWindow::newDocument);
    addFileAction(tr("&Open…"), QKeySequence::Open, &TQDemoWindow::open);
    addFileAction(tr("&Save"), QKeySequence::Save, &TQDemoWindow::save);
    addFileAction(tr("Save &As…"), QKeySequence::SaveAs, &TQDemoWindow::saveAs);
    file->addSeparator();
    QAction* quit = file->addAction(tr("&Quit"));
    quit->setShortcut(QKeySequence::Quit);
    connect(quit, &QAction::triggered, this, &QWidget::close);

    _editMenu = new TQQtEditMenu(this, this);
    menuBar()->addMenu(_editMenu->menu());
    buildClipboardActions(*_editMenu->menu());
    _editMenu->menu()->addSeparator();
    QAction* all = _editMenu->menu()->addAction(tr("Select &All"));
    all->setShortcut(QKeySequence(Qt::CTRL | Qt::Key_A));
    connect(all, &QAction::triggered, this, [this] { _view.selectAll(); });
    QAction* none = _editMenu->menu()->addAction(tr("Select &None"));
    none->setShortcut(QKeySequence(Qt::CTRL | Qt::SHIFT | Qt::Key_A));
    connect(none, &QAction::triggered, this, [this] { _view.selectNone(); });
    _delete = _editMenu->menu()->addAction(tr("&Delete"));
    _delete->setShortcuts({QKeySequence(QKeySequence::Delete), QKeySequence(Qt::Key_Backspace)});
    connect(_delete, &QAction::triggered, this, [this] { deleteSelection(); });

    QMenu* animation = menuBar()->addMenu(tr("&Animation"));
    connect(animation, &QMenu::aboutToShow, this,
            [this, animation] { fillAnimationMenu(*animation); });

    QMenu* viewMenu = menuBar()->addMenu(tr("&View"));
    QAction* frame = viewMenu->addAction(tr("&Frame All"));
    frame->setShortcut(QKeySequence(Qt::CTRL | Qt::SHIFT | Qt::Key_F));
    connect(frame, &QAction::triggered, this, [this] { frameAll(); });
    _autoZoom = viewMenu->addAction(tr("&Auto Zoom"));
    _autoZoom->setCheckable(true);
    connect(_autoZoom, &QAction::triggered, this, [this] {
        _controller.setAutoZoom(nullptr);
        _autoZoom->setChecked(_view.autoZoom() != 0);
        // The user's choice is the preference from now on, and the document's setting.
        _document.project().editorState().setAutoZoom(_view.autoZoom() != 0);
    });
    buildTimeMenu();
}

void TQDemoWindow::buildTimeMenu() {
    QMenu* time = menuBar()->addMenu(tr("&Time"));
    auto add = [&](const QString& title, const QKeySequence& keys, auto&& run) {
        QAction* action = time->addAction(title);
        action->setShortcut(keys);
        connect(action, &QAction::triggered, this, run);
        return action;
    };
    add(tr("&Play / Pause"), QKeySequence(Qt::CTRL | Qt::Key_P),
        [this] { _transport->togglePlayback(); });
    add(tr("Pre&vious Frame"), QKeySequence(Qt::Key_Comma), [this] { _transport->stepFrames(-1); });
    add(tr("&Next Frame"), QKeySequence(Qt::Key_Period), [this] { _transport->stepFrames(1); });
    add(tr("Go to &Start"), QKeySequence(Qt::Key_Home), [this] { _transport->goToStart(); });
    add(tr("Go to &End"), QKeySequence(Qt::Key_End), [this] { _transport->goToEnd(); });
    time->addSeparator();
    add(tr("Move Keypoints &By Frames..."), QKeySequence(Qt::CTRL | Qt::Key_T),
        [this] { moveSelectedKeypointsInTime(true); });
    add(tr("Move Keypoints &To Frame..."), QKeySequence(Qt::CTRL | Qt::SHIFT | Qt::Key_T),
        [this] { moveSelectedKeypointsInTime(false); });
}

void TQDemoWindow::moveSelectedKeypointsInTime(bool isDelta) {
    if (!_view.hasSelectedKeypoint()) {
        statusBar()->showMessage(tr("Select keypoints to move first."), 4000);
        return;
    }
    double frames = 0.0;
    bool delta = isDelta;
    if (!TQTimingMoveController::openWithEvent(nullptr, _view.timingMoveParentRect(), &frames,
                                               &delta))
        return;
    _view.moveSelectedKeypointsInTime(frames, isDelta);
}

void TQDemoWindow::fillAnimationMenu(QMenu& menu) {
    // The cell's menu for the first selected channel at the playhead, as the list's Menu
    // column opens it.
    const TQCurveEditorItemPtr first = _controller.selectedChannel();
    _keyCell->updateChannel(first ? first->channelBase() : nullptr, _host.currentTime());
    _animationMenu = _keyCell->newMenuUseImages(true);
    TQQtFillMenu(menu, _animationMenu,
                 [](RWMenu& chosen, int64_t index) { chosen.performActionForItemAtIndex(index); });
    if (!_animationMenu) menu.addAction(tr("Select a channel in the list"))->setEnabled(false);
}

void TQDemoWindow::showEvent(QShowEvent* event) {
    QMainWindow::showEvent(event);
    if (_framedOnce) return;
    // Framing fits the curves to the view's size, which the layout settles after the show. A
    // document from a file keeps the time range it was saved with.
    _framedOnce = true;
    QTimer::singleShot(0, this, [this] { frameAll(_document.isUntitled()); });
    if (_inspector) _inspector->headsUpWindow()->show();
}

bool TQDemoWindow::eventFilter(QObject* watched, QEvent* event) {
    // Ahead of the editor window's binding, whose close lets the controller forget what its
    // sets hold: a close the user cancels must not get that far.
    if (watched == this && event->type() == QEvent::Close && !maybeSave()) {
        event->ignore();
        return true;
    }
    return QMainWindow::eventFilter(watched, event);
}

void TQDemoWindow::frameAll(bool includeTime) {
    _view.frameAll(includeTime ? 1 : 0);
    // The host's display range leads the view horizontally: it takes a framed span, and the
    // ruler with it.
    if (includeTime) {
        const CGRect& framed = _view.getCurrentViewVolume();
        _controller.didSetViewContentsHorizontalOrigin(framed.origin.x, framed.size.width);
    }
    _controller.updateUI();
}

void TQDemoWindow::buildClipboardActions(QMenu& edit) {
    edit.addSeparator();
    struct Command {
        QAction** field;
        const char* key;
        QKeySequence::StandardKey shortcut;
        const char* action;
    };
    const Command commands[] = {
        {&_copy, "Curve Editor Menu Copy", QKeySequence::Copy, "copy:"},
        {&_cut, "Curve Editor Menu Cut", QKeySequence::Cut, "cut:"},
        {&_paste, "Curve Editor Menu Paste", QKeySequence::Paste, "paste:"},
    };
    for (const Command& c : commands) {
        QAction* action = edit.addAction(QString::fromStdString(TQLocalizedString(c.key)));
        action->setShortcut(c.shortcut);
        action->setData(QString(c.action));
        *c.field = action;
    }
    connect(_copy, &QAction::triggered, this, [this] { _controller.copy(); });
    connect(_cut, &QAction::triggered, this, [this] { _controller.cut(); });
    connect(_paste, &QAction::triggered, this, [this] { _controller.paste(); });
    _controller.setPasteRefused([this](TQPasteResult result) {
        if (const char* refusal = TQPasteRefusalKey(result))
            statusBar()->showMessage(QString::fromStdString(TQLocalizedString(refusal)), 6000);
    });
    // The menu shows what the editor would do now; closed, the shortcuts stay live and each
    // command judges for itself (a refused paste says why in the status bar).
    connect(&edit, &QMenu::aboutToShow, this, [this] {
        for (QAction* action : {_copy, _cut, _paste}) {
            RWMenuItem item(action->text().toStdString(), action->data().toString().toStdString());
            action->setEnabled(_controller.validateMenuItem(item));
        }
    });
    connect(&edit, &QMenu::aboutToHide, this, [this] {
        for (QAction* action : {_copy, _cut, _paste}) action->setEnabled(true);
    });
}

void TQDemoWindow::deleteSelection() {
    // The box tool deletes no keypoint: Delete takes the box away.
    if (_controller.getCurrentTool() == TQTool::kBox)
        _view.forgetBox();
    else
        _controller.deleteKeypoints();
}

// ---- The document ---------------------------------------------------------------------------

void TQDemoWindow::installDefaultPrompts() {
    _prompts.askToSaveChanges = [this](const QString& name) {
        QMessageBox box(QMessageBox::Warning, tr("Unsaved Changes"),
                        tr("Do you want to save the changes you made to “%1”?").arg(name),
                        QMessageBox::Save | QMessageBox::Discard | QMessageBox::Cancel, this);
        box.setInformativeText(tr("Your changes will be lost if you don't save them."));
        box.button(QMessageBox::Discard)->setText(tr("Don't Save"));
        box.setDefaultButton(QMessageBox::Save);
        return static_cast<QMessageBox::StandardButton>(box.exec());
    };
    _prompts.chooseFileToOpen = [this] {
        return QFileDialog::getOpenFileName(this, tr("Open Project"), QString(), projectFilter());
    };
    _prompts.chooseFileToSave = [this](const QString& suggested) {
        QFileDialog dialog(this, tr("Save Project As"), suggested, projectFilter());
        dialog.setAcceptMode(QFileDialog::AcceptSave);
        dialog.setDefaultSuffix(QString::fromLatin1(kProjectSuffix));
        if (dialog.exec() != QDialog::Accepted || dialog.selectedFiles().isEmpty())
            return QString();
        return dialog.selectedFiles().front();
    };
    _prompts.showError = [this](const QString& text, const QString& detail) {
        QMessageBox box(QMessageBox::Critical, tr("VantaCurveEditor Demo"), text, QMessageBox::Ok,
                        this);
        box.setInformativeText(detail);
        box.exec();
    };
}

bool TQDemoWindow::maybeSave() {
    if (!_document.isModified()) return true;
    switch (_prompts.askToSaveChanges(QString::fromStdString(_document.displayName()))) {
        case QMessageBox::Save: return save();
        case QMessageBox::Discard: return true;
        default: return false;
    }
}

bool TQDemoWindow::newDocument() {
    if (!maybeSave()) return false;
    _document.newDocument();
    documentReplaced();
    return true;
}

bool TQDemoWindow::open() {
    if (!maybeSave()) return false;
    const QString path = _prompts.chooseFileToOpen();
    return !path.isEmpty() && !openFile(path);
}

std::optional<BNSerializerError> TQDemoWindow::openFile(const QString& path) {
    std::optional<BNSerializerError> error = _document.open(fileSystemPath(path));
    if (error) {
        _prompts.showError(
            tr("The project “%1” could not be opened.").arg(QFileInfo(path).fileName()),
            QString::fromStdString(error->text()));
        return error;
    }
    documentReplaced();
    return std::nullopt;
}

bool TQDemoWindow::save() {
    if (_document.isUntitled()) return saveAs();
    return writeDocument(QString::fromStdString(_document.path()));
}

bool TQDemoWindow::saveAs() {
    const QString suggested = _document.isUntitled()
                                  ? QDir::home().filePath(tr("Untitled.%1").arg(kProjectSuffix))
                                  : QFile::decodeName(QByteArray::fromStdString(_document.path()));
    const QString path = _prompts.chooseFileToSave(suggested);
    return !path.isEmpty() && writeDocument(path);
}

bool TQDemoWindow::writeDocument(const QString& path) {
    if (const std::optional<BNSerializerError> error = _document.saveAs(fileSystemPath(path))) {
        _prompts.showError(
            tr("The project could not be saved as “%1”.").arg(QFileInfo(path).fileName()),
            QString::fromStdString(error->text()));
        return false;
    }
    refreshTitle();
    return true;
}

void TQDemoWindow::documentReplaced() {
    _autoZoom->setChecked(_view.autoZoom() != 0);
    frameAll(false);
    refreshObjectList();
    refreshTitle();
    _editMenu->refresh();
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
    // "[*]" is where Qt shows the modified mark.
    QString title = QString::fromStdString(_document.displayName()) + QStringLiteral("[*]");
    if (const TQCurveSetPtr& set = _controller.selectedCurveSet())
        title += QStringLiteral(" - ") + QString::fromStdString(set->curveSetName());
    // Through the editor's window, whose binding shows its title.
    _editorWindow.setTitle((title + tr(" - VantaCurveEditor Demo")).toStdString());
    setWindowModified(_document.isModified());
}

void TQDemoWindow::notify(TQNotificationWord word) {
    if (word & (kTQNotifySceneChanged | kTQNotifySceneReset | kTQNotifyObjectSelectionChanged))
        refreshObjectList();
    // Any word may follow a change of the history (a drag's end, an undo) or of the sets:
    // both are cheap to refresh.
    refreshTitle();
    if (word & (kTQNotifyHostTimeChanged | kTQNotifyTimeChanged)) _view.currentFrameChanged();
    _editMenu->refresh();
    if (_inspector) _inspector->notify(word);
}
