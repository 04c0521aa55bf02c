// The number panels on Qt: each runs as a dialog at the place the caller gives, with the key
// or number in its field, and ends as the user ends it; the time ruler's widget.
#include <gtest/gtest.h>

#include <QPushButton>
#include <QTest>
#include <QTimer>

#include <functional>

#include "platform/ui/RWTimeRuler.h"
#include "qt/TQQtModal.h"
#include "qt/TQQtPanelDialog.h"
#include "qt/TQQtScreen.h"
#include "qt/TQQtTextField.h"
#include "qt/TQQtTimeRuler.h"
#include "src/panels/TQTimingMoveController.h"

namespace {

class QtPanelDialogTest : public ::testing::Test {
protected:
    void SetUp() override { service.install(); }

    // Opens the timing panel hanging from a point, and runs `act` once its dialog is up.
    bool openWith(const std::function<void(QDialog&)>& act, const RWEvent* key = nullptr) {
        QTimer::singleShot(0, [this, act] {
            if (QDialog* dialog = service.activeDialog()) act(*dialog);
        });
        if (key)
            return TQTimingMoveController::openWithEvent(key, CGRectMake(300, 500, 0, 0), &value,
                                                         nullptr);
        return TQTimingMoveController::openWithLocation(CGPointMake(300, 500), &value);
    }
    static TQQtTextField* line(QDialog& dialog) { return dialog.findChild<TQQtTextField*>(); }
    static QPushButton* button(QDialog& dialog, const char* title) {
        for (QPushButton* b : dialog.findChildren<QPushButton*>())
            if (b->text() == QLatin1String(title)) return b;
        return nullptr;
    }

    TQQtModalService service;
    double value = 2.5;
};

TEST_F(QtPanelDialogTest, opens_at_the_point_with_the_number_selected_and_return_answers) {
    const bool accepted = openWith([](QDialog& dialog) {
        // Hanging from the point: its top-left corner there, in global coordinates.
        EXPECT_EQ(dialog.pos(), TQQtGlobalRectOfScreenRect(CGRectMake(300, 500, 0, 0)).topLeft());
        EXPECT_TRUE(dialog.windowFlags() & Qt::FramelessWindowHint);
        ASSERT_NE(line(dialog), nullptr);
        EXPECT_EQ(line(dialog)->text(), "2.5");
        EXPECT_EQ(line(dialog)->selectedText(), "2.5") << "typing replaces the number";
        QTest::keyClicks(line(dialog), "-12");
        QTest::keyClick(line(dialog), Qt::Key_Return);
    });
    EXPECT_TRUE(accepted);
    EXPECT_EQ(value, -12.0);
}

TEST_F(QtPanelDialogTest, cancel_escape_and_ok_on_an_unfinished_number_leave_the_number) {
    // Cancel takes no focus from the field, so the edit does not end and answer OK first.
    EXPECT_FALSE(openWith([](QDialog& dialog) {
        QTest::keyClicks(line(dialog), "7");
        button(dialog, "Cancel")->click();
    }));
    EXPECT_FALSE(openWith([](QDialog& dialog) {
        QTest::keyClicks(line(dialog), "7e");
        button(dialog, "OK")->click();
        EXPECT_TRUE(dialog.isVisible()) << "\"7e\" is no number: the panel stays";
        EXPECT_EQ(line(dialog)->text(), "2.5") << "the number stands again";
        QTest::keyClick(&dialog, Qt::Key_Escape);
    }));
    EXPECT_EQ(value, 2.5);
}

TEST(QtTimeRuler, a_press_and_a_drag_set_the_models_time) {
    auto model = std::make_shared<RWTimeRuler>();
    model->setDisplayRange(CMTimeRangeMake(kCMTimeZero, CMTimeMake(4, 1)));
    TQQtTimeRuler widget;
    widget.resize(400, 24);
    widget.setModel(model);
    QTest::mousePress(&widget, Qt::LeftButton, Qt::NoModifier, QPoint(100, 10));
    EXPECT_TRUE(model->isTracking());
    EXPECT_EQ(model->currentTime(), CMTimeMake(1, 1));
    QMouseEvent move(QEvent::MouseMove, QPointF(250, 10), widget.mapToGlobal(QPointF(250, 10)),
                     Qt::NoButton, Qt::LeftButton, Qt::NoModifier);
    QApplication::sendEvent(&widget, &move);
    EXPECT_EQ(model->currentTime(), CMTimeMake(75, 30));
    QTest::mouseRelease(&widget, Qt::LeftButton, Qt::NoModifier, QPoint(250, 10));
    EXPECT_FALSE(model->isTracking());
}

}  // namespace
