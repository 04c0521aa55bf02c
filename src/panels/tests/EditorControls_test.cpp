// The name cell's swatch and text, the editor's scroller and its pop-up menu.
#include <gtest/gtest.h>

#include <sstream>
#include <string>
#include <vector>

#include "src/panels/TQColoredTextFieldCell.h"
#include "src/panels/TQEditorControls.h"
#include "src/resources/GDColor.h"

namespace {

// Records what a cell draws, one line per call.
class RecordingDrawing : public RWCellDrawing {
public:
    bool shouldAntialias() const override { return _antialias; }
    void setShouldAntialias(bool on) override {
        _antialias = on;
        calls.push_back(on ? "antialias on" : "antialias off");
    }
    void fillRect(const CGRect& r, const RWColor& c) override {
        calls.push_back("fill " + rect(r) + " r" + std::to_string(c.red));
    }
    void strokeRect(const CGRect& r, const RWColor& c, double width) override {
        const bool border = c == toRW(GDColor::curveEditorColoredTextFieldBorderColor());
        calls.push_back("stroke " + rect(r) + (border ? " border" : " other") + " w" +
                        std::to_string(static_cast<int>(width)));
    }
    void drawText(const std::string& text, const CGRect& frame, RWTextAlignment, bool) override {
        calls.push_back("text '" + text + "' " + rect(frame));
    }
    static RWColor toRW(const GDColor& c) { return {c.red, c.green, c.blue, c.alpha}; }
    static std::string rect(const CGRect& r) {
        return (std::ostringstream()
                << r.origin.x << "," << r.origin.y << " " << r.size.width << "x" << r.size.height)
            .str();
    }
    std::vector<std::string> calls;

private:
    bool _antialias = true;
};

TEST(ColoredTextFieldCell, swatch_left_of_the_frame_and_text_dropped_with_or_without_it) {
    TQColoredTextFieldCell cell("Position.X");
    cell.setFillColor(1.0f, 0.0f, 0.0f, 1.0f);
    RecordingDrawing drawing;
    cell.drawWithFrame(CGRectMake(40, 100, 120, 21), drawing);
    EXPECT_EQ(drawing.calls,
              (std::vector<std::string>{"antialias off", "fill 28,107 9x9 r1.000000",
                                        "stroke 28,107 9x9 border w1", "antialias on",
                                        "text 'Position.X' 40,104 120x17"}))
        << "12 left, 7 down, 9 by 9, crisp; the text frame keeps its width";

    cell.setDisplayBox(false);
    drawing.calls.clear();
    cell.drawWithFrame(CGRectMake(40, 100, 120, 21), drawing);
    EXPECT_EQ(drawing.calls, (std::vector<std::string>{"text 'Position.X' 40,104 120x17"}));

    const auto copy = std::dynamic_pointer_cast<TQColoredTextFieldCell>(cell.copy());
    ASSERT_NE(copy, nullptr) << "a copy keeps the class";
    EXPECT_TRUE(copy->stringValue().empty() && copy->fillColor() == cell.fillColor() &&
                copy->displayBox())
        << "the text and the flag are not copied";
}

TEST(EditorControls, the_scroller_keeps_its_frame_and_the_menu_ignores_keys) {
    TQVantaZoomScroller scroller;
    scroller.setEndsAtWindowCorner(true);
    scroller.setFrame(CGRectMake(0, 0, 15, 300));
    EXPECT_EQ(scroller.frame().size.height, 300.0);

    struct Target : RWActionTarget {
        bool performAction(const std::string&, RWActionSender&) override { return ++taken > 0; }
        int taken = 0;
    } target;
    const RWEvent commandA =
        RWEvent::keyEvent(RWEventType::KeyDown, "a", RWEventModifierFlagCommand);
    RWMenu plain;
    TQIgnoreKeyEquivalentsMenu ignoring;
    for (RWMenu* menu : {&plain, static_cast<RWMenu*>(&ignoring)})
        menu->addItemWithTitle("All", "showAll:", "a")->setTarget(&target);
    EXPECT_TRUE(plain.performKeyEquivalent(commandA) && !ignoring.performKeyEquivalent(commandA));
    EXPECT_EQ(target.taken, 1);
}

}  // namespace
