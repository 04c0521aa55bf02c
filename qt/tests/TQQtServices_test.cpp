#include <gtest/gtest.h>

#include <QApplication>
#include <QWidget>

#include <memory>

#include "qt/TQQtServices.h"

namespace {

constexpr double kPointTolerance = 1e-9;

// A window of 300 x 200 with the view as a 100 x 50 child at (20, 30) from its top left.
class QtViewHostTest : public ::testing::Test {
protected:
    void SetUp() override {
        window = std::make_unique<QWidget>();
        window->resize(300, 200);
        view = new QWidget(window.get());
        view->setGeometry(20, 30, 100, 50);
    }

    std::unique_ptr<QWidget> window;
    QWidget* view = nullptr;  // owned by the window
};

TEST_F(QtViewHostTest, bounds__points_with_origin_at_zero) {
    TQQtViewHost host(view);
    const CGRect b = host.bounds();
    EXPECT_EQ(b.origin.x, 0.0);
    EXPECT_EQ(b.origin.y, 0.0);
    EXPECT_EQ(b.size.width, 100.0);
    EXPECT_EQ(b.size.height, 50.0);
    EXPECT_GE(host.backingScaleFactor(), 1.0);
}

TEST_F(QtViewHostTest, convertPointFromWindow__flips_y_and_removes_the_offset) {
    TQQtViewHost host(view);
    // The view's bottom left corner lies at (20, 200 - 80) in the window, y up.
    {
        const CGPoint p = host.convertPointFromWindow(CGPointMake(20.0, 120.0));
        EXPECT_NEAR(p.x, 0.0, kPointTolerance);
        EXPECT_NEAR(p.y, 0.0, kPointTolerance) << "the view's bottom edge must be y = 0";
    }
    {
        const CGPoint p = host.convertPointFromWindow(CGPointMake(70.0, 160.0));
        EXPECT_NEAR(p.x, 50.0, kPointTolerance);
        EXPECT_NEAR(p.y, 40.0, kPointTolerance);
    }
    // The widget's own top-left corner goes to the window and comes back as the view's top.
    const CGPoint inWindow = host.windowPointFromWidgetPoint(QPointF(0.0, 0.0));
    EXPECT_NEAR(inWindow.x, 20.0, kPointTolerance);
    EXPECT_NEAR(inWindow.y, 170.0, kPointTolerance);
    const CGPoint back = host.convertPointFromWindow(inWindow);
    EXPECT_NEAR(back.x, 0.0, kPointTolerance);
    EXPECT_NEAR(back.y, 50.0, kPointTolerance);
}

TEST_F(QtViewHostTest, setCursor__hidden_wins_until_shown_again) {
    TQQtViewHost host(view);
    host.setCursor(RWCursor::Move);
    EXPECT_EQ(view->cursor().shape(), Qt::SizeAllCursor);
    host.setCursorHidden(true);
    EXPECT_EQ(view->cursor().shape(), Qt::BlankCursor);
    host.setCursor(RWCursor::CrossHairs);
    EXPECT_EQ(view->cursor().shape(), Qt::BlankCursor) << "a new shape must not unhide the cursor";
    host.setCursorHidden(false);
    EXPECT_EQ(view->cursor().shape(), Qt::CrossCursor);
}

TEST_F(QtViewHostTest, nextEventMatchingMask__takes_the_oldest_match_only) {
    TQQtViewHost host(view);
    host.postPendingEvent(RWEvent::mouseEvent(RWEventType::MouseMoved, CGPointMake(1, 1)));
    host.postPendingEvent(RWEvent::scrollWheelEvent(0.0, 1.0));
    host.postPendingEvent(RWEvent::scrollWheelEvent(0.0, 2.0));
    auto first = host.nextEventMatchingMask(RWEventMaskScrollWheel);
    ASSERT_TRUE(first.has_value());
    EXPECT_EQ(first->deltaY(), 1.0) << "wheel steps must come in the order they arrived";
    EXPECT_EQ(host.pendingEventCount(), 2u) << "the mouse move must stay queued";
    EXPECT_TRUE(host.nextEventMatchingMask(RWEventMaskScrollWheel).has_value());
    EXPECT_FALSE(host.nextEventMatchingMask(RWEventMaskScrollWheel).has_value());
}

TEST_F(QtViewHostTest, deleted_widget__answers_harmless_values) {
    TQQtViewHost host(view);
    delete view;
    view = nullptr;
    EXPECT_EQ(host.widget(), nullptr);
    EXPECT_EQ(host.bounds().size.width, 0.0);
    EXPECT_EQ(host.backingScaleFactor(), 1.0);
    EXPECT_FALSE(host.hasWindow());
    host.setNeedsDisplay();
    host.setCursor(RWCursor::Arrow);
}

// Runs the event loop until `done` holds, a bounded number of passes: zero-delay timers are
// due at once, so this does not wait on the clock.
template <typename Pred>
bool processEventsUntil(Pred done) {
    for (int i = 0; i < 100 && !done(); ++i) QCoreApplication::processEvents(QEventLoop::AllEvents);
    return done();
}

TEST(QtTimerServiceTest, dispatchAfter__runs_from_the_event_loop_not_at_once) {
    TQQtTimerService timer;
    int runs = 0;
    timer.dispatchAfter(0, [&] { ++runs; });
    EXPECT_EQ(runs, 0) << "a delayed block must not run inside dispatchAfter";
    EXPECT_TRUE(processEventsUntil([&] { return runs == 1; }));
    QCoreApplication::processEvents();
    EXPECT_EQ(runs, 1) << "a block runs once";
}

TEST(QtTimerServiceTest, destruction__drops_pending_blocks) {
    int runs = 0;
    {
        TQQtTimerService timer;
        timer.dispatchAfter(0, [&] { ++runs; });
    }
    for (int i = 0; i < 10; ++i) QCoreApplication::processEvents();
    EXPECT_EQ(runs, 0) << "a block of a dead service ran";
}

TEST(QtClockTest, now__is_monotonic) {
    TQQtClock clock;
    const double a = clock.now();
    const double b = clock.now();
    EXPECT_GE(a, 0.0);
    EXPECT_GE(b, a);
}

TEST(QtServiceInstallerTest, installs_and_restores) {
    RWClock* before = RWApplicationServices().clock;
    const HXDTextMetrics* metricsBefore = &HXDTextMetrics::shared();
    {
        TQQtServiceInstaller installer;
        EXPECT_EQ(RWApplicationServices().clock, &installer.clock());
        EXPECT_EQ(RWApplicationServices().timer, &installer.timer());
        EXPECT_NE(dynamic_cast<const TQQtTextMetrics*>(&HXDTextMetrics::shared()), nullptr)
            << "text must be measured with the painter's font";
    }
    EXPECT_EQ(RWApplicationServices().clock, before);
    EXPECT_EQ(&HXDTextMetrics::shared(), metricsBefore);
}

}  // namespace
