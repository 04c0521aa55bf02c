// The panels on Qt: the value panel and the timing panel each run as a dialog (the timing one at
// the place the caller gives, with the key or number in its field) and end as the user ends
// them; the simplify panel's controls; the time ruler's widget.
#include <gtest/gtest.h>

#include <QDoubleSpinBox>
#include <QLineEdit>
#include <QPushButton>
#include <QSlider>
#include <QTest>
#include <QTimer>

#include <functional>

#include "platform/ui/RWTimeRuler.h"
#include "qt/TQQtModal.h"
#include "qt/TQQtPanelDialog.h"
#include "qt/TQQtScreen.h"
#include "qt/TQQtTextField.h"
#include "qt/TQQtTimeRuler.h"
#include "src/editor/TQCurveEditorCtrl.h"
#include "src/editor/TQCurveEditorPanels.h"
#include "src/panels/TQTimingMoveController.h"

namespace {

class QtPanelDialogTest : public ::testing::Test {
protected:
    void SetUp() override {
        service.install();
        valueWindow.setTitle("TQCurveEditorValueView");
        valueWindow.value = 2.5;
    }

    // Runs `act` on the dialog once it is up, inside the modal run that `run` starts.
    template <class Run>
    auto inDialog(const std::function<void(QDialog&)>& act, Run run) {
        QTimer::singleShot(0, [this, act] {
            if (QDialog* dialog = service.activeDialog()) act(*dialog);
        });
        return run();
    }
    // The timing panel hanging from a point.
    bool openTiming(const std::function<void(QDialog&)>& act) {
        return inDialog(act, [this] {
            return TQTimingMoveController::openWithLocation(CGPointMake(300, 500), &value);
        });
    }
    RWModalResponse runValuePanel(const std::function<void(QDialog&)>& act) {
        return inDialog(act, [this] { return service.runModalForWindow(valueWindow); });
    }
    static TQQtTextField* line(QDialog& dialog) { return dialog.findChild<TQQtTextField*>(); }
    static QPushButton* button(QDialog& dialog, const char* title) {
        for (QPushButton* b : dialog.findChildren<QPushButton*>())
            if (b->text().remove('&') == QLatin1String(title)) return b;
        return nullptr;
    }

    TQQtModalService service;
    double value = 2.5;
    TQCurveEditorValueWindow valueWindow;
};

TEST_F(QtPanelDialogTest, value_panel__ok_hands_back_a_number_and_refuses_what_is_none) {
    EXPECT_EQ(runValuePanel([](QDialog& dialog) {
                  auto* field = dialog.findChild<QLineEdit*>("value");
                  ASSERT_NE(field, nullptr);
                  EXPECT_EQ(field->text().toStdString(), "2.5") << "it starts from the value";
                  field->setText("-7.25");
                  button(dialog, "OK")->click();
              }),
              RWModalResponseOK);
    EXPECT_EQ(valueWindow.value, -7.25);

    EXPECT_EQ(runValuePanel([](QDialog& dialog) {
                  dialog.findChild<QLineEdit*>("value")->setText("1e999");  // not finite
                  button(dialog, "OK")->click();
                  EXPECT_TRUE(dialog.isVisible()) << "OK on no finite number must not end the run";
                  button(dialog, "Cancel")->click();
              }),
              RWModalResponseCancel);
    EXPECT_EQ(valueWindow.value, -7.25) << "a cancelled panel must not change the value";
}

TEST_F(QtPanelDialogTest, stop_and_unknown_windows__end_or_refuse_the_run) {
    EXPECT_EQ(runValuePanel([this](QDialog&) { service.stopModalWithCode(42); }), 42);
    service.stopModal();  // outside a run: nothing to stop, no failure
    RWWindow wrongKind;   // the value panel's title on a window that carries no value
    wrongKind.setTitle("TQCurveEditorValueView");
    EXPECT_EQ(service.runModalForWindow(wrongKind), RWModalResponseAbort);
}

TEST_F(QtPanelDialogTest, opens_at_the_point_with_the_number_selected_and_return_answers) {
    const bool accepted = openTiming([](QDialog& dialog) {
        // Hanging from the point: its top-left corner there, in global coordinates.
        EXPECT_EQ(dialog.pos(), TQQtGlobalRectOfScreenRect(CGRectMake(300, 500, 0, 0)).topLeft());
        EXPECT_TRUE(dialog.windowFlags() & Qt::FramelessWindowHint);
        ASSERT_NE(line(dialog), nullptr);
        EXPECT_EQ(line(dialog)->selectedText(), "2.5") << "typing replaces the number";
        QTest::keyClicks(line(dialog), "-12");
        QTest::keyClick(line(dialog), Qt::Key_Return);
    });
    EXPECT_TRUE(accepted);
    EXPECT_EQ(value, -12.0);
}

TEST_F(QtPanelDialogTest, cancel_escape_and_ok_on_an_unfinished_number_leave_the_number) {
    // Cancel takes no focus from the field, so the edit does not end and answer OK first.
    EXPECT_FALSE(openTiming([](QDialog& dialog) {
        QTest::keyClicks(line(dialog), "7");
        button(dialog, "Cancel")->click();
    }));
    EXPECT_FALSE(openTiming([](QDialog& dialog) {
        QTest::keyClicks(line(dialog), "7e");
        button(dialog, "OK")->click();
        EXPECT_TRUE(dialog.isVisible()) << "\"7e\" is no number: the panel stays";
        EXPECT_EQ(line(dialog)->text(), "2.5") << "the number stands again";
        QTest::keyClick(&dialog, Qt::Key_Escape);
    }));
    EXPECT_EQ(value, 2.5);
}

TEST(QtPanelControls, simplify_panel__sliders_move_by_marks_and_scrubbers_show_whole_numbers) {
    TQCurveEditorOutlets outlets;
    TQInstantiateSimplifyPanel(outlets, nullptr);
    outlets.toleranceSlider->setMaxValue(10.0);
    outlets.tolerance->setMaxValue(10.0);
    outlets.tolerance->setDoubleValue(3.0);
    TQQtPanelDialog dialog(*outlets.reducePanel, nullptr);

    auto* slider = dynamic_cast<QSlider*>(dialog.widgetOf(outlets.toleranceSlider.get()));
    ASSERT_TRUE(slider);
    EXPECT_EQ(slider->maximum(), 10);
    slider->setValue(7);
    EXPECT_DOUBLE_EQ(outlets.toleranceSlider->doubleValue(), 7.0);
    auto* scrubber = dynamic_cast<QDoubleSpinBox*>(dialog.widgetOf(outlets.tolerance.get()));
    ASSERT_TRUE(scrubber);
    EXPECT_EQ(scrubber->text().toStdString(), "3");
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
