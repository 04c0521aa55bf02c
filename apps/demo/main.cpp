// The demo: the full curve editor on a project of the reference host.
//
//   vce_demo                    opens the window on the sample piece, untitled
//   vce_demo --open FILE        opens the window on the project FILE
//   vce_demo --screenshot FILE  draws the window offscreen once the project is loaded, writes
//                               it to FILE (PNG) and exits; needs no display
//
// The editor's settings (auto zoom and the other flags a new project starts with) persist in
// the user's settings of the application.
#include <QApplication>
#include <QElapsedTimer>
#include <QPixmap>
#include <QStringList>
#include <QStyle>
#include <QStyleFactory>

#include <cstdio>
#include <cstdlib>

#include "apps/demo/TQDemoWindow.h"
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
    std::fprintf(stderr, "usage: %s [--open FILE] [--screenshot FILE]\n", program);
    return 2;
}

}  // namespace

int main(int argc, char** argv) {
    QString screenshot;
    QString project;
    for (int i = 1; i < argc; ++i) {
        const QString arg = QString::fromLocal8Bit(argv[i]);
        if (arg == QLatin1String("--screenshot") || arg == QLatin1String("--open")) {
            if (i + 1 >= argc || argv[i + 1][0] == '\0') return usage(argv[0]);
            (arg == QLatin1String("--open") ? project : screenshot) =
                QString::fromLocal8Bit(argv[++i]);
        } else if (arg == QLatin1String("--help") || arg == QLatin1String("-h")) {
            usage(argv[0]);
            return 0;
        }
        // Anything else is left to Qt (-platform, -style...).
    }
    // A screenshot needs no display: draw offscreen unless a platform was asked for.
    if (!screenshot.isEmpty() && !qEnvironmentVariableIsSet("QT_QPA_PLATFORM"))
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

    TQDemoWindow window;
    if (!screenshot.isEmpty()) {
        // No one could answer a dialog offscreen: a file that cannot be read ends the run.
        window.prompts().showError = [](const QString& text, const QString& detail) {
            std::fprintf(stderr, "vce_demo: %s %s\n", text.toLocal8Bit().constData(),
                         detail.toLocal8Bit().constData());
        };
    }
    if (!project.isEmpty() && window.openFile(project) && !screenshot.isEmpty()) return 1;
    window.show();
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
