#include <gtest/gtest.h>

#include <QWidget>

#include <memory>

#include "qt/TQQtEvents.h"

namespace {

constexpr double kPointTolerance = 1e-9;

// A 200 x 100 window that is the view itself: window points are widget points, y flipped.
class QtEventsTest : public ::testing::Test {
protected:
    QWidget widget;
    TQQtViewHost host{&widget};
    void SetUp() override { widget.resize(200, 100); }

    QMouseEvent mouse(QEvent::Type type, Qt::MouseButton button, Qt::MouseButtons buttons,
                      Qt::KeyboardModifiers modifiers = Qt::NoModifier) {
        const QPointF at(30.0, 10.0);
        return QMouseEvent(type, at, widget.mapToGlobal(at), button, buttons, modifiers);
    }
};

TEST_F(QtEventsTest, modifierFlags__ctrl_is_command_meta_is_control) {
    EXPECT_EQ(TQQtEvents::modifierFlags(Qt::ControlModifier), uint64_t{RWEventModifierFlagCommand});
    EXPECT_EQ(TQQtEvents::modifierFlags(Qt::MetaModifier), uint64_t{RWEventModifierFlagControl});
    EXPECT_EQ(TQQtEvents::modifierFlags(Qt::ShiftModifier | Qt::AltModifier),
              uint64_t{RWEventModifierFlagShift | RWEventModifierFlagOption});
}

TEST_F(QtEventsTest, mouseEvent__types_clicks_and_location_with_y_up) {
    {
        const auto e = TQQtEvents::mouseEvent(mouse(QEvent::MouseButtonPress, Qt::LeftButton, Qt::LeftButton,
                                                    Qt::ShiftModifier),
                                              host);
        ASSERT_TRUE(e.has_value());
        EXPECT_EQ(e->type(), RWEventType::LeftMouseDown);
        EXPECT_EQ(e->clickCount(), 1);
        EXPECT_EQ(e->modifierFlags(), uint64_t{RWEventModifierFlagShift});
        EXPECT_NEAR(e->locationInWindow().x, 30.0, kPointTolerance);
        EXPECT_NEAR(e->locationInWindow().y, 90.0, kPointTolerance) << "10 below the top of 100 is y = 90";
    }
    {
        const auto e = TQQtEvents::mouseEvent(mouse(QEvent::MouseButtonDblClick, Qt::LeftButton, Qt::LeftButton),
                                              host, 2);
        ASSERT_TRUE(e.has_value());
        EXPECT_EQ(e->type(), RWEventType::LeftMouseDown) << "a double click is a second press";
        EXPECT_EQ(e->clickCount(), 2);
    }
    {
        const auto e = TQQtEvents::mouseEvent(mouse(QEvent::MouseMove, Qt::NoButton, Qt::RightButton), host);
        ASSERT_TRUE(e.has_value());
        EXPECT_EQ(e->type(), RWEventType::RightMouseDragged);
    }
    {
        const auto e = TQQtEvents::mouseEvent(mouse(QEvent::MouseMove, Qt::NoButton, Qt::NoButton), host);
        ASSERT_TRUE(e.has_value());
        EXPECT_EQ(e->type(), RWEventType::MouseMoved);
        EXPECT_EQ(e->clickCount(), 0);
    }
    EXPECT_FALSE(TQQtEvents::mouseEvent(mouse(QEvent::MouseButtonPress, Qt::BackButton, Qt::BackButton), host))
        << "buttons the views do not know are not translated";
}

TEST_F(QtEventsTest, wheelEvent__notches_are_lines_and_precise_deltas_are_points) {
    const QPointF at(10.0, 10.0);
    {
        QWheelEvent e(at, widget.mapToGlobal(at), QPoint(), QPoint(0, 240), Qt::NoButton, Qt::NoModifier,
                      Qt::NoScrollPhase, false);
        const RWEvent w = TQQtEvents::wheelEvent(e, host);
        EXPECT_EQ(w.type(), RWEventType::ScrollWheel);
        EXPECT_NEAR(w.deltaY(), 2.0, kPointTolerance) << "two notches up";
    }
    {
        QWheelEvent e(at, widget.mapToGlobal(at), QPoint(-7, 3), QPoint(0, 120), Qt::NoButton, Qt::NoModifier,
                      Qt::ScrollUpdate, true);
        const RWEvent w = TQQtEvents::wheelEvent(e, host);
        EXPECT_NEAR(w.deltaX(), 7.0, kPointTolerance) << "pixel deltas win, natural scrolling inverted back";
        EXPECT_NEAR(w.deltaY(), -3.0, kPointTolerance);
    }
}

TEST_F(QtEventsTest, keyEvent__characters_function_keys_and_modifier_keys) {
    {
        const QKeyEvent e(QEvent::KeyPress, Qt::Key_Up, Qt::NoModifier);
        const RWEvent k = TQQtEvents::keyEvent(e);
        EXPECT_EQ(k.type(), RWEventType::KeyDown);
        EXPECT_EQ(k.characters(), "\xEF\x9C\x80") << "the up arrow is U+F700";
    }
    {
        const QKeyEvent e(QEvent::KeyPress, Qt::Key_A, Qt::ControlModifier, QString("\x01"));
        const RWEvent k = TQQtEvents::keyEvent(e);
        EXPECT_EQ(k.charactersIgnoringModifiers(), "a") << "Ctrl does not change the key's own character";
        EXPECT_EQ(k.modifierFlags(), uint64_t{RWEventModifierFlagCommand});
    }
    {
        const QKeyEvent e(QEvent::KeyPress, Qt::Key_Space, Qt::NoModifier, QString(" "), true);
        const RWEvent k = TQQtEvents::keyEvent(e);
        EXPECT_EQ(k.characters(), " ");
        EXPECT_TRUE(k.isARepeat());
    }
    {
        const QKeyEvent press(QEvent::KeyPress, Qt::Key_Shift, Qt::NoModifier);
        const RWEvent k = TQQtEvents::keyEvent(press);
        EXPECT_EQ(k.type(), RWEventType::FlagsChanged);
        EXPECT_EQ(k.modifierFlags(), uint64_t{RWEventModifierFlagShift}) << "the key pressed counts at once";
        const QKeyEvent release(QEvent::KeyRelease, Qt::Key_Shift, Qt::ShiftModifier);
        EXPECT_EQ(TQQtEvents::keyEvent(release).modifierFlags(), 0u);
    }
}

}  // namespace
