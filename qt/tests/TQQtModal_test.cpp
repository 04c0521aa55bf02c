#include <gtest/gtest.h>

#include <QDialogButtonBox>
#include <QLineEdit>
#include <QPushButton>
#include <QTimer>

#include <functional>

#include "qt/TQQtModal.h"
#include "src/engine/TQCurveEditorCtrlBase.h"

namespace {

constexpr double kValueTolerance = 1e-12;

class QtModalTest : public ::testing::Test {
protected:
    void SetUp() override {
        window.setTitle("TQCurveEditorValueView");
        window.value = 2.5;
    }
    // Runs `act` inside the modal run, once its dialog is up.
    RWModalResponse runWith(const std::function<void(QDialog&)>& act) {
        QTimer::singleShot(0, [this, act] {
            if (QDialog* dialog = service.activeDialog()) act(*dialog);
        });
        return service.runModalForWindow(window);
    }
    static void press(QDialog& dialog, QDialogButtonBox::StandardButton which) {
        dialog.findChild<QDialogButtonBox*>()->button(which)->click();
    }

    TQQtModalService service;
    TQCurveEditorValueWindow window;
};

TEST_F(QtModalTest, value_panel__ok_hands_back_the_typed_number) {
    const RWModalResponse response = runWith([](QDialog& dialog) {
        auto* line = dialog.findChild<QLineEdit*>("value");
        ASSERT_NE(line, nullptr);
        EXPECT_EQ(line->text().toStdString(), "2.5")
            << "the panel starts from the keypoint's value";
        line->setText("-7.25");
        press(dialog, QDialogButtonBox::Ok);
    });
    EXPECT_EQ(response, RWModalResponseOK);
    EXPECT_NEAR(window.value, -7.25, kValueTolerance);
}

TEST_F(QtModalTest, value_panel__text_that_is_no_number_keeps_it_open_and_cancel_keeps_the_value) {
    const RWModalResponse response = runWith([](QDialog& dialog) {
        dialog.findChild<QLineEdit*>("value")->setText("1e999");  // not finite
        press(dialog, QDialogButtonBox::Ok);
        EXPECT_TRUE(dialog.isVisible())
            << "OK on a text that is no finite number must not end the run";
        press(dialog, QDialogButtonBox::Cancel);
    });
    EXPECT_EQ(response, RWModalResponseCancel);
    EXPECT_NEAR(window.value, 2.5, kValueTolerance)
        << "a cancelled panel must not change the value";
}

TEST_F(QtModalTest, stop_and_unknown_windows__end_or_refuse_the_run) {
    EXPECT_EQ(runWith([this](QDialog&) { service.stopModalWithCode(42); }), 42);
    service.stopModal();  // outside a run: nothing to stop, no failure
    RWWindow wrongKind;   // the value panel's title on a window that carries no value
    wrongKind.setTitle("TQCurveEditorValueView");
    EXPECT_EQ(service.runModalForWindow(wrongKind), RWModalResponseAbort);
}

}  // namespace
