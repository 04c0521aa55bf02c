// The Qt services: the view host's coordinates and cursors, events translated for the views,
// the timer, the installer, the user defaults, and keypoints through the system clipboard
// (both forms go out together and the private one reads back exactly; other programs see the
// readable one as text, and their text is not taken for keypoints).
#include <gtest/gtest.h>

#include <QApplication>
#include <QClipboard>
#include <QFile>
#include <QWidget>

#include "qt/TQQtEvents.h"
#include "qt/TQQtServices.h"
#include "qt/TQQtUserDefaults.h"
#include "src/editor/TQKeypointClipboard.h"

namespace {

constexpr double kPointTolerance = 1e-9;

// The view is a 100 x 50 child at (20, 30) from the top left of a 300 x 200 window.
TEST(QtViewHostTest, convertPointFromWindow__flips_y_and_removes_the_offset) {
    QWidget window;
    window.resize(300, 200);
    auto* view = new QWidget(&window);
    view->setGeometry(20, 30, 100, 50);
    TQQtViewHost host(view);
    const CGPoint bottomLeft = host.convertPointFromWindow(CGPointMake(20.0, 120.0));
    EXPECT_NEAR(bottomLeft.x, 0.0, kPointTolerance);
    EXPECT_NEAR(bottomLeft.y, 0.0, kPointTolerance) << "the view's bottom edge must be y = 0";
    const CGPoint inWindow = host.windowPointFromWidgetPoint(QPointF(0.0, 0.0));
    EXPECT_NEAR(inWindow.y, 170.0, kPointTolerance) << "the view's top edge, y up in the window";
    EXPECT_NEAR(host.convertPointFromWindow(inWindow).y, 50.0, kPointTolerance);

    delete view;  // the host must answer harmless values for a widget that is gone
    EXPECT_EQ(host.bounds().size.width, 0.0);
    EXPECT_FALSE(host.hasWindow());
    host.setNeedsDisplay();
    host.setCursor(RWCursor::Arrow);
}

TEST(QtViewHostTest, setCursor__hidden_wins_and_zoom_cursors_are_drawn_images) {
    QWidget view;
    TQQtViewHost host(&view);
    host.setCursor(RWCursor::Move);
    host.setCursorHidden(true);
    host.setCursor(RWCursor::CrossHair);
    EXPECT_EQ(view.cursor().shape(), Qt::BlankCursor) << "a new shape must not unhide the cursor";
    host.setCursorHidden(false);
    EXPECT_EQ(view.cursor().shape(), Qt::CrossCursor);

    // The zoom cursors tell in from out.
    host.setCursor(RWCursor::ZoomIn);
    const QCursor in = view.cursor();
    host.setCursor(RWCursor::ZoomOut);
    const QCursor out = view.cursor();
    ASSERT_TRUE(in.shape() == Qt::BitmapCursor && out.shape() == Qt::BitmapCursor);
    const QImage inImage = in.pixmap().toImage();
    const QImage outImage = out.pixmap().toImage();
    ASSERT_FALSE(inImage.isNull());
    EXPECT_NE(inImage, outImage) << "the plus and the minus differ";
    EXPECT_GT(qAlpha(inImage.pixel(in.hotSpot())), 0) << "the hot spot lies on the glass";
    EXPECT_EQ(qAlpha(inImage.pixel(0, inImage.height() - 1)), 0) << "around the glass is clear";

    const QCursor sharp = TQQtViewHost::qtCursor(RWCursor::ZoomIn, 2.0);
    EXPECT_EQ(sharp.pixmap().width(), 2 * in.pixmap().width()) << "drawn for the screen's pixels";
    EXPECT_EQ(sharp.pixmap().deviceIndependentSize(), in.pixmap().deviceIndependentSize());
}

TEST(QtTimerServiceTest, dispatchAfter__runs_later_from_the_loop_and_never_after_the_service_died) {
    int runs = 0;
    {
        TQQtTimerService timer;
        timer.dispatchAfter(0, [&] { ++runs; });
        EXPECT_EQ(runs, 0) << "a delayed block must not run inside dispatchAfter";
        for (int i = 0; i < 100 && runs == 0; ++i) QCoreApplication::processEvents();
        EXPECT_EQ(runs, 1);
        timer.dispatchAfter(0, [&] { ++runs; });
    }
    for (int i = 0; i < 10; ++i) QCoreApplication::processEvents();
    EXPECT_EQ(runs, 1) << "a block of a dead service ran";
}

TEST(QtServiceInstallerTest, installs_and_restores) {
    RWClock* before = RWApplicationServices().clock;
    const HXDTextMetrics* metricsBefore = &HXDTextMetrics::shared();
    {
        TQQtServiceInstaller installer;
        EXPECT_EQ(RWApplicationServices().timer, &installer.timer());
        EXPECT_NE(dynamic_cast<const TQQtTextMetrics*>(&HXDTextMetrics::shared()), nullptr)
            << "text must be measured with the painter's font";
    }
    EXPECT_EQ(RWApplicationServices().clock, before);
    EXPECT_EQ(&HXDTextMetrics::shared(), metricsBefore);
}

TEST(QtUserDefaultsTest, valuesOutliveTheSettingsObjectAndSitAboveRegisteredOnes) {
    const QString path = QString::fromStdString(testing::TempDir()) + "qt_user_defaults.ini";
    QFile::remove(path);
    {
        TQQtUserDefaults defaults(path);
        defaults.registerDefaults({{"TQPreferenceManager::CurveEditorSnapping", true},
                                   {"Registered", RWDefaultsValue{std::string("only here")}}});
        EXPECT_TRUE(defaults.boolForKey("TQPreferenceManager::CurveEditorSnapping"));
        defaults.setBool(false, "TQPreferenceManager::CurveEditorSnapping");
        defaults.setInteger(-7, "Count");
        defaults.setDouble(0.25, "Ratio");
        defaults.setString("a/b c", "Text");
        EXPECT_FALSE(defaults.boolForKey("TQPreferenceManager::CurveEditorSnapping"))
            << "a stored value sits above the registered one";
        defaults.synchronize();
    }
    TQQtUserDefaults reopened(path);
    EXPECT_FALSE(reopened.boolForKey("TQPreferenceManager::CurveEditorSnapping"));
    EXPECT_EQ(reopened.integerForKey("Count"), -7);
    EXPECT_EQ(reopened.doubleForKey("Ratio"), 0.25);
    EXPECT_EQ(reopened.stringForKey("Text"), "a/b c");
    EXPECT_EQ(reopened.stringForKey("Registered"), "") << "registration is not stored";
    reopened.removeObjectForKey("Count");
    EXPECT_FALSE(reopened.objectForKey("Count"));
    QFile::remove(path);
}

// Presses, modifiers and the y flip reach the views through every gesture test; here a right
// drag, a button the views do not know, wheel notches against precise deltas, and keys.
TEST(QtEventsTest, mouse_wheel_and_key_events__as_the_views_know_them) {
    QWidget widget;  // a 200 x 100 window that is the view itself
    widget.resize(200, 100);
    TQQtViewHost host{&widget};
    const QPointF at(30.0, 10.0);
    const QMouseEvent drag(QEvent::MouseMove, at, widget.mapToGlobal(at), Qt::NoButton,
                           Qt::RightButton, Qt::NoModifier);
    EXPECT_EQ(TQQtEvents::mouseEvent(drag, host)->type(), RWEventType::RightMouseDragged);
    const QMouseEvent back(QEvent::MouseButtonPress, at, widget.mapToGlobal(at), Qt::BackButton,
                           Qt::BackButton, Qt::NoModifier);
    EXPECT_FALSE(TQQtEvents::mouseEvent(back, host))
        << "buttons the views do not know are not translated";

    const QWheelEvent notches(at, widget.mapToGlobal(at), QPoint(), QPoint(0, 240), Qt::NoButton,
                              Qt::NoModifier, Qt::NoScrollPhase, false);
    EXPECT_NEAR(TQQtEvents::wheelEvent(notches, host).deltaY(), 2.0, kPointTolerance);
    const QWheelEvent precise(at, widget.mapToGlobal(at), QPoint(-7, 3), QPoint(0, 120),
                              Qt::NoButton, Qt::NoModifier, Qt::ScrollUpdate, true);
    EXPECT_NEAR(TQQtEvents::wheelEvent(precise, host).deltaX(), 7.0, kPointTolerance)
        << "pixel deltas win, and natural scrolling is turned back";

    EXPECT_EQ(
        TQQtEvents::keyEvent(QKeyEvent(QEvent::KeyPress, Qt::Key_Up, Qt::NoModifier)).characters(),
        "\xEF\x9C\x80")
        << "the up arrow is U+F700";
    const RWEvent ctrlA =
        TQQtEvents::keyEvent(QKeyEvent(QEvent::KeyPress, Qt::Key_A, Qt::ControlModifier, "\x01"));
    EXPECT_EQ(ctrlA.charactersIgnoringModifiers(), "a");
    const RWEvent shift =
        TQQtEvents::keyEvent(QKeyEvent(QEvent::KeyPress, Qt::Key_Shift, Qt::NoModifier));
    EXPECT_EQ(shift.type(), RWEventType::FlagsChanged);
    EXPECT_EQ(shift.modifierFlags(), uint64_t{RWEventModifierFlagShift})
        << "the key pressed counts at once";
}

TEST(QtPasteboardTest, keypoints__both_forms_on_the_clipboard_and_read_back) {
    const TQQtServiceInstaller services;
    RWPasteboard& board = *RWApplicationServices().pasteboard;
    // Doubles at the edges of what a double holds, and every state off its default.
    TQKeyframeState key{.time = CMTimeMake(7, 30),
                        .value = -0.0,
                        .inU = 5e-324,
                        .inV = 1.7976931348623157e308,
                        .outU = 0.1,
                        .outV = -1.0 / 3.0,
                        .interpolation = kTQInterpolationEaseIn,
                        .locked = true,
                        .enabled = false,
                        .broken = true,
                        .scaled = true};
    TQKeypointClip clip;
    clip.channels.push_back({"./1/100", "TQChannelAngle", {TQKeyframeState{}, key}});

    TQPutKeypointClip(board, clip);
    EXPECT_EQ(QGuiApplication::clipboard()->text().toStdString(), TQDescribeKeypointClip(clip));
    const TQKeypointClipReading read = TQTakeKeypointClip(board);
    ASSERT_EQ(read.status, TQKeypointClipRead::kOk) << "the first form kept beside the second";
    // The form is exact, so a clip read back writes the same text.
    EXPECT_EQ(TQWriteKeypointClip(read.clip), TQWriteKeypointClip(clip));

    QGuiApplication::clipboard()->setText("another program's text");
    EXPECT_EQ(TQTakeKeypointClip(board).status, TQKeypointClipRead::kNone);
}

}  // namespace
