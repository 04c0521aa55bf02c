// A window with one curve editor over three channels the host makes itself: a ball's height,
// its squash and its glow. Undo with Ctrl+Z, redo with Ctrl+Shift+Z.
//   minimal-host [--screenshot FILE]   (FILE: draw once offscreen, write a PNG and quit)
#include <QApplication>
#include <QHBoxLayout>
#include <QKeySequence>
#include <QShortcut>
#include <QTimer>
#include <QVBoxLayout>
#include <QWidget>

#include "host/TQHostAppDelegate.h"
#include "platform/channels/TQChannel.h"
#include "platform/channels/TQChannelObjectRootBase.h"
#include "qt/TQQtCurveViewWidget.h"
#include "qt/TQQtPopUpButton.h"
#include "qt/TQQtSegmentedControl.h"
#include "qt/TQQtServices.h"
#include "qt/TQQtZoomScroller.h"
#include "src/editor/TQCurveEditorCtrl.h"
#include "src/editor/TQCurveEditorView.h"

namespace {

CMTime at(double seconds) { return TQTarnTimeForChannelSeconds(seconds, 600); }

// The host's own object: a root with its channels, keyed as an animator would.
std::unique_ptr<TQChannelObjectRootBase> makeBall() {
    auto ball = std::make_unique<TQChannelObjectRootBase>("Ball", 1);
    auto channel = [&](const char* name, TQChannelId id, std::initializer_list<double> values) {
        auto* c = static_cast<TQChannel*>(ball->addChild(std::make_unique<TQChannel>(name, id)));
        double t = 0.0;
        for (double v : values) c->setKeyframe(at(t += 0.5), v);
        return c;
    };
    channel("Height", 2, {300, 0, 180, 0, 60, 0});
    channel("Squash", 3, {1.0, 0.6, 1.0, 0.7, 1.0, 0.85});
    channel("Glow", 4, {0.0, 1.0, 0.2});
    return ball;
}

}  // namespace

int main(int argc, char** argv) {
    const bool screenshot = argc == 3 && QString(argv[1]) == "--screenshot";
    if (screenshot) qputenv("QT_QPA_PLATFORM", "offscreen");
    QApplication app(argc, argv);
    TQQtServiceInstaller services;  // timers, pasteboard and cursors through Qt

    // The host: its scene, selection and undo history. The editor shows the selected objects.
    TQHostAppDelegate host;
    host.setDisplayRange(CMTimeRangeMake(at(0), at(3.5)));
    host.setSelectedObjects({host.scene().adoptObject(makeBall())});

    TQCurveEditorView view;
    TQCurveEditorCtrl editor;
    editor.init();
    editor.setAppDelegate(&host);
    editor.setView(&view);
    host.addNotificationReceiver(&editor);
    const CMTimeRange range = host.displayRange();
    view.setTotalRange(&range.start, &range.duration);

    // The window: tools and curve sets above, the curves with their vertical scroller below.
    QWidget window;
    auto* tools = new TQQtSegmentedControl(&window);
    auto* sets = new TQQtPopUpButton(&window);
    auto* curves = new TQQtCurveViewWidget(&window);
    auto* scroller = new TQQtZoomScroller(&window);
    auto* top = new QHBoxLayout;
    top->addWidget(tools);
    top->addWidget(sets);
    top->addStretch();
    auto* middle = new QHBoxLayout;
    middle->addWidget(curves, 1);
    middle->addWidget(scroller);
    auto* layout = new QVBoxLayout(&window);
    layout->addLayout(top);
    layout->addLayout(middle, 1);
    curves->setView(&view);

    // The controls are models the controller drives; each widget shows one.
    TQCurveEditorOutlets outlets;
    outlets.tools = std::make_shared<RWSegmentedControl>();
    outlets.tools->setTarget(&editor);
    outlets.tools->setAction("setCurrentTool:");
    outlets.curveSetsPopUp = std::make_shared<RWPopUpButton>();
    outlets.verticalScroller = std::make_shared<RWZoomScroller>();
    outlets.verticalScroller->setTarget(&editor);
    outlets.verticalScroller->setAction("verticalZoomScroll:");
    tools->setModel(outlets.tools);
    sets->setModel(outlets.curveSetsPopUp);
    scroller->setModel(outlets.verticalScroller);
    editor.connectOutlets(outlets);
    editor.setupController();
    editor.viewDidLoad();

    // Undo restores channels wholesale: every cached curve is stale after it.
    auto history = [&](bool undo) {
        if (undo ? host.undo() : host.redo()) host.postNotification(kTQNotifyCurvesInvalidated);
    };
    QObject::connect(new QShortcut(QKeySequence::Undo, &window), &QShortcut::activated,
                     [&] { history(true); });
    QObject::connect(new QShortcut(QKeySequence::Redo, &window), &QShortcut::activated,
                     [&] { history(false); });

    window.resize(900, 500);
    window.setWindowTitle("Minimal host");
    window.show();
    QTimer::singleShot(0, [&] {
        view.frameAll(1);
        editor.updateUI();
        if (screenshot) QTimer::singleShot(200, [&] { app.quit(); });
    });
    const int status = QApplication::exec();
    if (screenshot && !window.grab().save(argv[2], "PNG")) return 1;

    // Detach before the models and the view go.
    host.removeNotificationReceiver(&editor);
    curves->setView(nullptr);
    tools->setModel(nullptr);
    sets->setModel(nullptr);
    scroller->setModel(nullptr);
    editor.setView(nullptr);
    return status;
}
