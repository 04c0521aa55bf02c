// The number panels as a caller sees them: where the panel goes, what its field shows, and
// which answers OK, Return, Cancel and a close give, with the user played by scripts of the
// modal service.
#include <gtest/gtest.h>

#include <cmath>
#include <memory>
#include <string>

#include "platform/ui/RWButton.h"
#include "platform/ui/testing/RWTestDoubles.h"
#include "src/panels/TQTimingMoveController.h"

namespace {

class NumberPanels : public ::testing::Test {
protected:
    void SetUp() override {
        previous = RWApplicationServices().modal;
        RWServiceSet mine;
        mine.modal = &modal;
        RWInstallServices(mine);
    }
    void TearDown() override {
        RWServiceSet back;
        back.modal = previous;
        RWInstallServices(back);
    }
    static std::shared_ptr<RWTextField> fieldOf(RWWindow& panel) {
        for (const auto& control : panel.contentView()->subviews())
            if (auto field = std::dynamic_pointer_cast<RWTextField>(control)) return field;
        return nullptr;
    }
    static void click(RWWindow& panel, const std::string& title) {
        for (const auto& control : panel.contentView()->subviews())
            if (auto b = std::dynamic_pointer_cast<RWButton>(control); b && b->title() == title)
                b->userClick();
    }
    // The user presses Return on this text in the field, the panel's formatter taken off first
    // when `raw` (as a host's own field without one would be).
    void pushReturnWith(const std::string& text, bool raw = false) {
        modal.pushScript([text, raw](RWWindow& panel, RWModalService&) {
            if (raw) fieldOf(panel)->setFormatter(nullptr);
            fieldOf(panel)->userEndEditing(text);
        });
    }

    RWScriptedModal modal;
    RWModalService* previous = nullptr;
};

TEST_F(NumberPanels, placement__centredBelowARectOrHangingFromAPoint) {
    CGRect frame = CGRectZero;
    const auto note = [&](RWWindow& panel, RWModalService& m) {
        frame = panel.frame();
        EXPECT_TRUE(panel.isVisible() && panel.isKeyWindow()) << "the panel takes the keys";
        EXPECT_EQ(panel.firstResponder(), fieldOf(panel));
        m.stopModalWithCode(RWModalResponseCancel);
    };
    double value = 1.0;
    modal.pushScript(note);
    TQTimingMoveController::openWithEvent(nullptr, CGRectMake(100.0, 500.0, 301.0, 40.0), &value,
                                          nullptr);
    // x + r(301 / 2) - r(width / 2), whole points; the top at the rectangle's y.
    EXPECT_EQ(frame.origin.x, 100.0 + 151.0 - std::floor(frame.size.width / 2.0 + 0.5));
    EXPECT_EQ(frame.origin.y + frame.size.height, 500.0);

    modal.pushScript(note);
    TQTimingMoveController::openWithLocation(CGPointMake(40.0, 300.0), &value);
    EXPECT_EQ(frame.origin, CGPointMake(40.0, 300.0 - frame.size.height));

    // Kept inside the window's rectangle, then taken to the screen.
    RWWindow window;
    window.setFrame(CGRectMake(1000.0, 2000.0, 800.0, 600.0));
    modal.pushScript(note);
    TQCurveEditorValueController::openWithLocationValueInWindow(
        CGPointMake(-50.0, 590.0), &value, &window, CGRectMake(10.0, 20.0, 700.0, 500.0));
    EXPECT_EQ(frame.origin, CGPointMake(1000.0 + 10.0, 2000.0 + 520.0 - frame.size.height));
    EXPECT_EQ(value, 1.0) << "cancelled: the number stays";
}

TEST_F(NumberPanels, getPanelLocation__keepsThePanelInsideTheParentFrame) {
    TQCurveEditorValueController controller;
    controller.init();
    const CGSize size = controller.view()->frame().size;
    const CGRect parent = CGRectMake(100.0, 100.0, 600.0, 400.0);
    const struct {
        CGPoint point;
        CGPoint expected;
        const char* what;
    } cases[] = {
        {{300.0, 300.0}, {300.0, 300.0}, "inside: as it is"},
        {{50.0, 300.0}, {100.0, 300.0}, "left of the frame: at its left edge"},
        {{690.0, 300.0}, {700.0 - size.width, 300.0}, "past the right: moved back in"},
        {{300.0, 110.0}, {300.0, 100.0 + size.height}, "too low: room for the panel"},
        {{300.0, 900.0}, {300.0, 500.0}, "above the frame: at its top"},
    };
    for (const auto& c : cases)
        EXPECT_EQ(controller.getPanelLocation(c.point, parent), c.expected) << c.what;
}

TEST_F(NumberPanels, answers__okReturnCancelAndCloseForBothPanels) {
    // A key press opens the panel with that key typed in place of the number.
    double value = 4.0;
    std::string shown;
    modal.pushScript([&](RWWindow& panel, RWModalService&) {
        shown = fieldOf(panel)->stringValue();
        fieldOf(panel)->insertText("5");
        click(panel, "OK");
    });
    const RWEvent key = RWEvent::keyEvent(RWEventType::KeyDown, "-");
    EXPECT_TRUE(TQTimingMoveController::openWithEvent(&key, CGRectZero, &value, nullptr));
    EXPECT_EQ(shown, "-");
    EXPECT_EQ(value, -5.0);

    // Without an event the number is shown, selected, and Return on a new one answers it.
    modal.pushScript([&](RWWindow& panel, RWModalService&) {
        shown = fieldOf(panel)->stringValue();
        EXPECT_TRUE(fieldOf(panel)->isAllTextSelected());
        fieldOf(panel)->userEndEditing("2.5");
    });
    EXPECT_TRUE(TQCurveEditorValueController::openWithLocation(CGPointZero, &value));
    EXPECT_EQ(shown, "-5");
    EXPECT_EQ(value, 2.5);

    // Cancel, the user's close and a run nothing could show leave the number alone.
    modal.pushScript([&](RWWindow& panel, RWModalService&) { click(panel, "Cancel"); });
    modal.pushScript([&](RWWindow& panel, RWModalService&) { EXPECT_TRUE(panel.performClose()); });
    modal.pushScript([&](RWWindow&, RWModalService& m) { m.abortModal(); });
    for (int i = 0; i < 3; ++i)
        EXPECT_FALSE(TQTimingMoveController::openWithLocation(CGPointZero, &value)) << i;
    EXPECT_EQ(value, 2.5);
}

TEST_F(NumberPanels, textThatIsNoNumber__keepsThePanelOpenOrIsRefusedByTheValuePanel) {
    double value = 3.0;
    // The panel's own field refuses it: the run goes on until the user cancels.
    std::optional<std::string> why;
    modal.pushScript([&](RWWindow& panel, RWModalService&) {
        why = fieldOf(panel)->userEndEditing("1e");
        click(panel, "OK");
    });
    EXPECT_TRUE(TQTimingMoveController::openWithLocation(CGPointZero, &value));
    EXPECT_TRUE(why.has_value()) << "a number must be complete to end the edit";
    EXPECT_EQ(value, 3.0) << "OK after a refused edit answers the number shown";

    // Reaching Return anyway: the value panel answers no, the timing panel the field's number.
    pushReturnWith("abc", true);
    EXPECT_FALSE(TQCurveEditorValueController::openWithLocation(CGPointZero, &value));
    EXPECT_EQ(value, 3.0);
    pushReturnWith("abc", true);
    EXPECT_TRUE(TQTimingMoveController::openWithLocation(CGPointZero, &value));
    EXPECT_EQ(value, 0.0);

    // After a run the field has no formatter left; the next run gives it one again.
    modal.pushScript([&](RWWindow& panel, RWModalService&) {
        EXPECT_NE(fieldOf(panel)->formatter(), nullptr);
        click(panel, "Cancel");
    });
    TQTimingMoveController::openWithLocation(CGPointZero, &value);
}

}  // namespace
