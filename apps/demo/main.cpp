// The demo: the full curve editor on a project of the reference host.
//
//   vce_demo                    opens the window on the sample piece, untitled
//   vce_demo --open FILE        opens the window on the project FILE
//   vce_demo --stress           opens the window on the stress scene (100 objects, 3,000
//                               channels, 1,000,000 keyframes), untitled
//   vce_demo --screenshot FILE  draws the window offscreen once the project is loaded, writes
//                               it to FILE (PNG) and exits; needs no display
//   vce_demo --measure-playback SECONDS
//                               plays the piece with every object in the All set for that
//                               long and prints how much of the time the process worked (the
//                               event loop idled the rest), the frames drawn and the ticks
//
// The editor's settings (auto zoom and the other flags a new project starts with) persist in
// the user's settings of the application.
#include <QApplication>
#include <QElapsedTimer>
#include <QPixmap>
#include <QStringList>
#include <QStyle>
#include <QStyleFactory>
#include <QTimer>

#include <cstdio>
#include <cstdlib>
#include <ctime>
#include <vector>

#include "apps/demo/TQDemoTransport.h"
#include "apps/demo/TQDemoWindow.h"
#include "qt/TQQtCurveViewWidget.h"
#include "qt/TQQtModal.h"
#include "qt/TQQtServices.h"
#include "qt/TQQtUserDefaults.h"

namespace {

// Long enough for the first frame and the one delayed redraw the 1/30 s gate may schedule.
constexpr int kSettleMilliseconds = 250;

void settle(int milliseconds) {
    QElapsedTimer elapsed;
    elapsed.start();
    while (elapsed.elapsed() < milliseconds)
        QCoreApplication::processEvents(QEventLoop::AllEvents, 10);
}

int usage(const char* program) {
    std::fprintf(
        stderr,
        "usage: %s [--open FILE | --stress] [--screenshot FILE | --measure-playback SECONDS]\n",
        program);
    return 2;
}

// Plays the whole piece in the All set and measures how much of the time the main thread
// worked: the process's processor time over the time that passed. Every thread counts, so the
// event loop was idle at least the rest of the time, however busy the machine is otherwise.
int measurePlayback(TQDemoWindow& window, double seconds) {
    TQHostAppDelegate& host = window.host();
    std::vector<TQChannelBase*> everything;
    for (TQChannelObjectRootBase* object : host.scene().objects()) everything.push_back(object);
    host.setSelectedObjects(everything);
    window.controller().showAll();
    settle(kSettleMilliseconds);

    const std::clock_t cpuBefore = std::clock();
    const int framesBefore = window.curveWidget()->framesDrawn();
    const int64_t ticksBefore = window.transport().ticks();
    QElapsedTimer wall;
    wall.start();
    window.transport().play();
    QEventLoop loop;
    QTimer::singleShot(static_cast<int>(seconds * 1000.0), &loop, &QEventLoop::quit);
    loop.exec();
    window.transport().pause();
    const double wallSeconds = static_cast<double>(wall.nsecsElapsed()) * 1e-9;
    const double cpuSeconds =
        static_cast<double>(std::clock() - cpuBefore) / static_cast<double>(CLOCKS_PER_SEC);
    const double busy = 100.0 * cpuSeconds / wallSeconds;
    std::printf(
        "playback %.1f s of %zu channels in All: busy %.1f %%, so idle at least %.1f %%; "
        "%d frames drawn, %lld ticks\n",
        wallSeconds, static_cast<size_t>(window.controller().numberOfChannelItems()), busy,
        100.0 - busy, window.curveWidget()->framesDrawn() - framesBefore,
        static_cast<long long>(window.transport().ticks() - ticksBefore));
    return 0;
}

}  // namespace

int main(int argc, char** argv) {
    QString screenshot;
    QString project;
    double measureSeconds = 0.0;
    bool stress = false;
    for (int i = 1; i < argc; ++i) {
        const QString arg = QString::fromLocal8Bit(argv[i]);
        if (arg == QLatin1String("--screenshot") || arg == QLatin1String("--open")) {
            if (i + 1 >= argc || argv[i + 1][0] == '\0') return usage(argv[0]);
            (arg == QLatin1String("--open") ? project : screenshot) =
                QString::fromLocal8Bit(argv[++i]);
        } else if (arg == QLatin1String("--stress")) {
            stress = true;
        } else if (arg == QLatin1String("--measure-playback")) {
            bool ok = false;
            if (i + 1 < argc) measureSeconds = QString::fromLocal8Bit(argv[++i]).toDouble(&ok);
            if (!ok || !(measureSeconds > 0.0) || measureSeconds > 3600.0) return usage(argv[0]);
        } else if (arg == QLatin1String("--help") || arg == QLatin1String("-h")) {
            usage(argv[0]);
            return 0;
        }
        // Anything else is left to Qt (-platform, -style...).
    }
    // A screenshot needs no display: draw offscreen unless a platform was asked for.
    if ((!screenshot.isEmpty() || measureSeconds > 0.0) &&
        !qEnvironmentVariableIsSet("QT_QPA_PLATFORM"))
        qputenv("QT_QPA_PLATFORM", "offscreen");

    QApplication app(argc, argv);
    QApplication::setOrganizationName(QStringLiteral("VantaCurveEditor"));
    QApplication::setApplicationName(QStringLiteral("VantaCurveEditor Demo"));
    if (QStyle* fusion = QStyleFactory::create(QStringLiteral("Fusion"))) {
        QApplication::setStyle(fusion);
        QApplication::setPalette(TQDemoWindow::darkPalette());
    }
    TQQtServiceInstaller services;
    TQQtUserDefaults defaults;
    RWServiceSet preferences;
    preferences.userDefaults = &defaults;
    RWInstallServices(preferences);
    // The number panel of a double-clicked keypoint.
    TQQtModalService modal;
    modal.install();

    if (stress && !project.isEmpty()) return usage(argv[0]);
    TQDemoWindow window(stress);
    if (!screenshot.isEmpty()) {
        // No one could answer a dialog offscreen: a file that cannot be read ends the run.
        window.prompts().showError = [](const QString& text, const QString& detail) {
            std::fprintf(stderr, "vce_demo: %s %s\n", text.toLocal8Bit().constData(),
                         detail.toLocal8Bit().constData());
        };
    }
    if (!project.isEmpty() && window.openFile(project) && !screenshot.isEmpty()) return 1;
    window.show();
    if (measureSeconds > 0.0) {
        settle(kSettleMilliseconds);
        return measurePlayback(window, measureSeconds);
    }
    if (screenshot.isEmpty()) return QApplication::exec();

    settle(kSettleMilliseconds);
    const QPixmap image = window.grab();
    if (image.isNull() || !image.save(screenshot, "PNG")) {
        std::fprintf(stderr, "vce_demo: could not write %s\n",
                     screenshot.toLocal8Bit().constData());
        return 1;
    }
    return 0;
}
