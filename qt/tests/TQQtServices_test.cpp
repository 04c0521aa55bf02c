#include <gtest/gtest.h>

#include <QApplication>
#include <QFile>
#include <QWidget>

#include "qt/TQQtServices.h"
#include "qt/TQQtUserDefaults.h"

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

}  // namespace
