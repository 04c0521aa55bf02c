#include <gtest/gtest.h>

#include <QApplication>
#include <QWheelEvent>

#include "host/TQHostAppDelegate.h"
#include "platform/ui/testing/RWTestDoubles.h"
#include "qt/TQQtCurveViewWidget.h"
#include "src/engine/TQCurveEditorCtrlBase.h"
#include "src/view/TQCurveEditorViewBase.h"

namespace {

// A view without curves on a shown widget, with a clock and a timer the test moves.
class CurveViewWidgetTest : public ::testing::Test {
protected:
    void SetUp() override {
        controller.init();
        controller.setAppDelegate(&host);
        view.setClock(&clock);
        view.setTimer(&timer);
        view.setController(&controller);
        controller.setView(&view);
        view.setCurrentViewVolume(CGRectMake(0.0, -1.0, 10.0, 2.0));
        widget.resize(320, 160);
        widget.setView(&view);
        widget.show();
        settle();
    }
    void TearDown() override {
        widget.setView(nullptr);
        view.setController(nullptr);
        controller.setView(nullptr);
    }
    // Runs posted updates and zero-delay calls; bounded, it never waits on the clock.
    static void settle() {
        for (int i = 0; i < 20; ++i) QCoreApplication::processEvents();
    }

    TQHostAppDelegate host;
    RWManualClock clock;
    RWManualTimer timer{clock};
    TQCurveEditorCtrlBase controller;
    TQCurveEditorViewBase view;
    TQQtCurveViewWidget widget;
};

TEST_F(CurveViewWidgetTest, repaints_inside_the_gate__one_frame_and_one_delayed_redraw) {
    timer.advance(1.0);
    widget.repaint();
    const int before = widget.framesDrawn();
    ASSERT_GE(before, 1);
    const qreal ratio = widget.devicePixelRatioF();
    EXPECT_EQ(widget.encoder().image().size(), QSize(qRound(320 * ratio), qRound(160 * ratio)));
    const size_t pending = timer.pendingCount();
    widget.repaint();
    widget.repaint();
    EXPECT_EQ(widget.framesDrawn(), before) << "repaints inside 1/30 s must show the last frame";
    EXPECT_EQ(timer.pendingCount(), pending + 1) << "exactly one delayed redraw is scheduled";
    timer.advance(0.034);  // the delayed redraw asks the widget for an update
    settle();
    EXPECT_EQ(widget.framesDrawn(), before + 1) << "the delayed redraw must draw once";
}

TEST_F(CurveViewWidgetTest, wheel__a_burst_is_folded_into_one_delivery) {
    const QPointF at(100.0, 80.0);
    for (int i = 0; i < 3; ++i) {
        QWheelEvent e(at, widget.mapToGlobal(at), QPoint(), QPoint(120, 0), Qt::NoButton,
                      Qt::NoModifier, Qt::NoScrollPhase, false);
        QCoreApplication::sendEvent(&widget, &e);
    }
    EXPECT_EQ(widget.viewHost().pendingEventCount(), 3u) << "wheel events wait for one delivery";
    settle();
    EXPECT_EQ(widget.viewHost().pendingEventCount(), 0u)
        << "the view's scrollWheel takes the waiting ones";
}

}  // namespace
