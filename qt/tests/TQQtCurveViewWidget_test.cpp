// The curve view through Qt itself: a lost release, the space bar, the frame gate and the
// folding of wheel bursts. The demo's window test drags a keypoint through Qt and undoes it.
#include <gtest/gtest.h>

#include <QTest>
#include <QWheelEvent>

#include "qt/tests/QtViewFixture.h"

namespace qt_test {
namespace {

using QtCurveViewWidget = QtBumpFixture;

TEST_F(QtCurveViewWidget, press_while_a_gesture_is_open__ends_it_first) {
    // The release of a drag can go astray (to a window that was modal meanwhile); the next
    // press must not find the view still dragging with its undo step open.
    const QPoint start = widgetPoint(5, 0.5);
    QTest::mousePress(&widget, Qt::LeftButton, Qt::NoModifier, start);
    clock.advance(kStepSeconds);
    QTest::mouseMove(&widget, start + QPoint(0, -20));
    ASSERT_TRUE(host.undoStack().isStepOpen()) << "the drag should have opened its step";
    QMouseEvent press(QEvent::MouseButtonPress, QPointF(start), widget.mapToGlobal(QPointF(start)),
                      Qt::LeftButton, Qt::LeftButton, Qt::NoModifier);
    QCoreApplication::sendEvent(&widget, &press);
    EXPECT_FALSE(host.undoStack().isStepOpen());
    EXPECT_EQ(host.undoStack().undoCount(), 1u) << "the first drag is one step";
    QTest::mouseRelease(&widget, Qt::LeftButton, Qt::NoModifier, start);
}

TEST_F(QtCurveViewWidget, space_bar__arms_on_the_first_press_and_ends_on_release) {
    // Shortcut overrides go to the focus object of the active window.
    widget.activateWindow();
    ASSERT_TRUE(QTest::qWaitForWindowActive(&widget));
    widget.setFocus();
    QTest::keyPress(&widget, Qt::Key_Space);
    EXPECT_EQ(view.space(), 1) << "the first space press must reach the view as a key equivalent";
    QTest::keyRelease(&widget, Qt::Key_Space);
    EXPECT_EQ(view.space(), 0);
}

TEST_F(QtCurveViewWidget, repaints_inside_the_gate__one_frame_and_one_delayed_redraw) {
    timer.advance(1.0);
    widget.repaint();
    const int before = widget.framesDrawn();
    const qreal ratio = widget.devicePixelRatioF();
    EXPECT_EQ(widget.encoder().image().size(), QSize(qRound(800 * ratio), qRound(400 * ratio)));
    const size_t pending = timer.pendingCount();
    widget.repaint();
    widget.repaint();
    EXPECT_EQ(widget.framesDrawn(), before) << "repaints inside 1/30 s must show the last frame";
    EXPECT_EQ(timer.pendingCount(), pending + 1) << "exactly one delayed redraw is scheduled";
    timer.advance(0.034);
    settle();
    EXPECT_EQ(widget.framesDrawn(), before + 1) << "the delayed redraw must draw once";
}

TEST_F(QtCurveViewWidget, wheel__a_burst_is_folded_into_one_delivery) {
    const QPointF at(100.0, 80.0);
    for (int i = 0; i < 3; ++i) {
        QWheelEvent e(at, widget.mapToGlobal(at), QPoint(), QPoint(120, 0), Qt::NoButton,
                      Qt::NoModifier, Qt::NoScrollPhase, false);
        QCoreApplication::sendEvent(&widget, &e);
    }
    EXPECT_EQ(widget.viewHost().pendingEventCount(), 3u) << "wheel events wait for one delivery";
    settle();
    EXPECT_EQ(widget.viewHost().pendingEventCount(), 0u);
}

}  // namespace
}  // namespace qt_test
