#include <gtest/gtest.h>

#include <QWidget>

#include "qt/TQQtEvents.h"

namespace {

constexpr double kPointTolerance = 1e-9;

// A 200 x 100 window that is the view itself.
class QtEventsTest : public ::testing::Test {
protected:
    void SetUp() override { widget.resize(200, 100); }
    QWidget widget;
    TQQtViewHost host{&widget};
};

TEST_F(QtEventsTest, mouseEvent__types_modifiers_clicks_and_y_up_location) {
    const QPointF at(30.0, 10.0);
    const QMouseEvent press(QEvent::MouseButtonDblClick, at, widget.mapToGlobal(at), Qt::LeftButton,
                            Qt::LeftButton, Qt::ControlModifier | Qt::ShiftModifier);
    const auto down = TQQtEvents::mouseEvent(press, host, 2);
    ASSERT_TRUE(down.has_value());
    EXPECT_EQ(down->type(), RWEventType::LeftMouseDown) << "a double click is a second press";
    EXPECT_EQ(down->clickCount(), 2);
    EXPECT_EQ(down->modifierFlags(),
              uint64_t{RWEventModifierFlagCommand | RWEventModifierFlagShift})
        << "Ctrl plays the part of Command";
    EXPECT_NEAR(down->locationInWindow().y, 90.0, kPointTolerance)
        << "10 below the top of 100 is y = 90";

    const QMouseEvent drag(QEvent::MouseMove, at, widget.mapToGlobal(at), Qt::NoButton,
                           Qt::RightButton, Qt::NoModifier);
    EXPECT_EQ(TQQtEvents::mouseEvent(drag, host)->type(), RWEventType::RightMouseDragged);
    const QMouseEvent back(QEvent::MouseButtonPress, at, widget.mapToGlobal(at), Qt::BackButton,
                           Qt::BackButton, Qt::NoModifier);
    EXPECT_FALSE(TQQtEvents::mouseEvent(back, host))
        << "buttons the views do not know are not translated";
}

TEST_F(QtEventsTest, wheelEvent__notches_are_lines_precise_deltas_points) {
    const QPointF at(10.0, 10.0);
    const QWheelEvent notches(at, widget.mapToGlobal(at), QPoint(), QPoint(0, 240), Qt::NoButton,
                              Qt::NoModifier, Qt::NoScrollPhase, false);
    EXPECT_NEAR(TQQtEvents::wheelEvent(notches, host).deltaY(), 2.0, kPointTolerance);
    const QWheelEvent precise(at, widget.mapToGlobal(at), QPoint(-7, 3), QPoint(0, 120),
                              Qt::NoButton, Qt::NoModifier, Qt::ScrollUpdate, true);
    EXPECT_NEAR(TQQtEvents::wheelEvent(precise, host).deltaX(), 7.0, kPointTolerance)
        << "pixel deltas win, and natural scrolling is turned back";
}

TEST_F(QtEventsTest, keyEvent__function_keys_own_characters_and_modifier_keys) {
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

}  // namespace
