// The number panels as a caller sees them: where the panel goes, what its field shows, and
// which answers OK, Return, Cancel and a close give, with the user played by scripts of the
// modal service.
#include <gtest/gtest.h>

#include <memory>
#include <string>

#include "platform/ui/RWButton.h"
#include "platform/ui/testing/RWTestDoubles.h"
#include "src/panels/TQTimingMoveController.h"

namespace {

// A button of a panel, by its title, as the user finds it, and the panel's field.
std::shared_ptr<RWButton> button(RWWindow& panel, const std::string& title) {
    return panel.contentView()->subview<RWButton>(
        [&](const RWButton& b) { return b.title() == title; });
}
std::shared_ptr<RWTextField> field(RWWindow& panel) {
    return panel.contentView()->subview<RWTextField>();
}

class NumberPanels : public ::testing::Test {
protected:
    void SetUp() override { RWInstallServices({.modal = &modal}); }
    void TearDown() override { RWResetServices(); }
    // The user presses Return on text that is no number in a field without the panel's
    // formatter (as a host's own field would be).
    void pushReturnWithoutFormatter() {
        modal.pushScript([](RWWindow& panel, RWModalService&) {
            field(panel)->setFormatter(nullptr);
            field(panel)->userEndEditing("abc");
        });
    }

    RWScriptedModal modal;
};

TEST_F(NumberPanels, getPanelLocation__keepsThePanelInsideTheParentFrame) {
    TQCurveEditorValueController controller;
    controller.init();
    const CGSize size = controller.view()->frame().size;
    const CGRect parent = CGRectMake(100.0, 100.0, 600.0, 400.0);
    // Inside, left of the frame, past the right, too low, above.
    const CGPoint cases[][2] = {{{300, 300}, {300, 300}},
                                {{50, 300}, {100, 300}},
                                {{690, 300}, {700 - size.width, 300}},
                                {{300, 110}, {300, 100 + size.height}},
                                {{300, 900}, {300, 500}}};
    for (const auto& c : cases)
        EXPECT_EQ(controller.getPanelLocation(c[0], parent), c[1]) << c[0].x << ", " << c[0].y;

    // The class method takes the kept point to the screen through the window.
    RWWindow window;
    window.setFrame(CGRectMake(1000.0, 2000.0, 800.0, 600.0));
    CGRect frame = CGRectZero;
    modal.pushScript([&](RWWindow& panel, RWModalService& m) {
        frame = panel.frame();
        m.stopModalWithCode(RWModalResponseCancel);
    });
    double value = 1.0;
    EXPECT_FALSE(TQCurveEditorValueController::openWithLocationValueInWindow(
        CGPointMake(50.0, 900.0), &value, &window, parent));
    EXPECT_EQ(frame.origin, CGPointMake(1000.0 + 100.0, 2000.0 + 500.0 - frame.size.height));
    EXPECT_EQ(value, 1.0) << "cancelled: the number stays";
}

TEST_F(NumberPanels, answers__return_cancel_close_and_text_that_is_no_number) {
    // Without an event the number is shown, selected, and Return on a new one answers it.
    double value = -5.0;
    std::string shown;
    modal.pushScript([&](RWWindow& panel, RWModalService&) {
        shown = field(panel)->stringValue();
        EXPECT_TRUE(field(panel)->isAllTextSelected());
        field(panel)->userEndEditing("2.5");
    });
    EXPECT_TRUE(TQCurveEditorValueController::openWithLocation(CGPointZero, &value));
    EXPECT_EQ(std::pair(shown, value), std::pair(std::string("-5"), 2.5));

    // Cancel, the user's close and a run nothing could show leave the number alone.
    modal.pushScript(
        [&](RWWindow& panel, RWModalService&) { button(panel, "Cancel")->userClick(); });
    modal.pushScript([&](RWWindow& panel, RWModalService&) { EXPECT_TRUE(panel.performClose()); });
    modal.pushScript([&](RWWindow&, RWModalService& m) { m.abortModal(); });
    for (int i = 0; i < 3; ++i)
        EXPECT_FALSE(TQTimingMoveController::openWithLocation(CGPointZero, &value)) << i;
    EXPECT_EQ(value, 2.5);

    // OK after a refused edit answers the number shown.
    modal.pushScript([&](RWWindow& panel, RWModalService&) {
        field(panel)->userEndEditing("1e");
        button(panel, "OK")->userClick();
    });
    EXPECT_TRUE(TQTimingMoveController::openWithLocation(CGPointZero, &value));
    EXPECT_EQ(value, 2.5);
    // Reaching Return anyway: the value panel answers no, the timing panel the field's number.
    pushReturnWithoutFormatter();
    EXPECT_FALSE(TQCurveEditorValueController::openWithLocation(CGPointZero, &value));
    EXPECT_EQ(value, 2.5);
    pushReturnWithoutFormatter();
    EXPECT_TRUE(TQTimingMoveController::openWithLocation(CGPointZero, &value));
    EXPECT_EQ(value, 0.0);
    // After a run the field has no formatter left; the next run gives it one again.
    modal.pushScript([&](RWWindow& panel, RWModalService&) {
        EXPECT_NE(field(panel)->formatter(), nullptr);
        button(panel, "Cancel")->userClick();
    });
    TQTimingMoveController::openWithLocation(CGPointZero, &value);
}

}  // namespace
