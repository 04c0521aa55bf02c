// The demo's Edit menu with the clipboard: what it offers when it opens, and a paste the
// editor refuses told in the status bar.

#include <QClipboard>
#include <QGuiApplication>
#include <QMimeData>
#include <QStatusBar>

#include "apps/demo/tests/DemoWindowFixture.h"
#include "src/editor/TQKeypointClipboard.h"
#include "src/resources/TQStrings.h"

using namespace demo_test;

namespace {

TEST_F(DemoWindowTest, editMenu__paste_offered_for_keypoints_and_a_refusal_told) {
    QMenu& edit = *window.editMenu()->menu();
    QGuiApplication::clipboard()->setText("1 2 3");
    Q_EMIT edit.aboutToShow();
    EXPECT_FALSE(window.pasteAction()->isEnabled()) << "text of another program";
    Q_EMIT edit.aboutToHide();
    EXPECT_TRUE(window.pasteAction()->isEnabled()) << "the shortcut stays live";

    window.pasteAction()->trigger();
    EXPECT_EQ(window.statusBar()->currentMessage().toStdString(),
              TQLocalizedString("Curve Editor Paste Nothing"));

    auto* damaged = new QMimeData;
    damaged->setData(kTQKeypointClipboardType, "VantaCurveEditor keypoints 1\nkey 0\n");
    QGuiApplication::clipboard()->setMimeData(damaged);
    Q_EMIT edit.aboutToShow();
    EXPECT_TRUE(window.pasteAction()->isEnabled()) << "judged when it runs";
    Q_EMIT edit.aboutToHide();
    window.pasteAction()->trigger();
    EXPECT_EQ(window.statusBar()->currentMessage().toStdString(),
              TQLocalizedString("Curve Editor Paste Damaged"));
}

}  // namespace
