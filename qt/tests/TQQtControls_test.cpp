// Each control model bound to its Qt widget, both ways: what the user does to the widget
// reaches the model (and its action), and what the program does to the model shows at once.
// Cells draw through the painter: the name cell's swatch, and images from the resource's file
// for the device's pixel ratio, scaled into the frame, at the opacity asked for (a name the
// resources lack draws nothing).
#include <gtest/gtest.h>

#include <QDialog>
#include <QImage>
#include <QMenu>
#include <QTest>

#include "platform/ui/testing/RWTestDoubles.h"
#include "qt/TQQtCellDrawing.h"
#include "qt/TQQtPopUpButton.h"
#include "qt/TQQtSegmentedControl.h"
#include "qt/TQQtTextField.h"
#include "qt/TQQtValueControls.h"
#include "qt/TQQtWindowBinding.h"
#include "qt/TQQtZoomScroller.h"
#include "src/panels/TQColoredTextFieldCell.h"
#include "src/panels/TQFormatters.h"
#include "src/resources/GDColor.h"

namespace {

class Target : public RWActionTarget {
public:
    bool performAction(const std::string& action, RWActionSender& sender) override {
        actions.push_back(action);
        if (onAction) onAction(sender);
        return true;
    }
    std::vector<std::string> actions;
    std::function<void(RWActionSender&)> onAction;
};

TEST(QtZoomScroller, knob_follows_the_model_and_gestures_reach_it) {
    Target target;
    auto model = wired<RWZoomScroller>(target, "scroll:");
    TQQtZoomScroller widget;
    widget.resize(16, 300);
    widget.setModel(model);
    model->setKnobProportion(0.25);
    model->setFloatValue(0.5);
    EXPECT_EQ(widget.pageStep(), TQQtZoomScroller::kResolution / 4);
    EXPECT_EQ(widget.value(), widget.maximum() / 2);

    // A page click: the part reaches the model, the knob waits for the action's answer.
    target.onAction = [&](RWActionSender&) { model->setFloatValue(0.75); };
    widget.triggerAction(QAbstractSlider::SliderPageStepSub);
    EXPECT_EQ(model->hitPart(), kRWScrollerDecrementPage);
    EXPECT_EQ(widget.value(), widget.maximum() * 3 / 4) << "the knob shows what the target set";
    target.onAction = nullptr;

    widget.setSliderPosition(widget.maximum() / 4);  // a drag of the knob
    EXPECT_EQ(model->hitPart(), kRWScrollerKnob);
    EXPECT_NEAR(model->floatValue(), 0.25, 1e-3);

    // Dragging the knob's far end up shrinks it; its start stays.
    widget.show();
    const TQQtZoomScroller::KnobSpan before = widget.knobSpan();
    const int end = int(before.grooveStart + before.start + before.length) - 1;
    QTest::mousePress(&widget, Qt::LeftButton, {}, QPoint(8, end));
    QTest::mouseMove(&widget, QPoint(8, end - 20));
    QTest::mouseRelease(&widget, Qt::LeftButton, {}, QPoint(8, end - 20));
    EXPECT_EQ(model->hitPart(), kRWScrollerKnobEndEdge);
    EXPECT_LT(model->knobProportion(), 0.25);
    EXPECT_NEAR(widget.knobSpan().start, before.start, 2.0);

    model->setEnabled(false);
    EXPECT_FALSE(widget.isEnabled());
    const size_t actions = target.actions.size();
    widget.triggerAction(QAbstractSlider::SliderSingleStepAdd);
    EXPECT_EQ(target.actions.size(), actions) << "a disabled model takes no gesture";
}

TEST(QtSegmentedControl, buttons_show_the_segments_and_clicks_select_them) {
    Target target;
    auto model = wired<RWSegmentedControl>(target, "setCurrentTool:");
    model->setSegmentCount(3);
    model->setImageName("K_KeyframeEditor_EditKeyframes", 0);
    model->setImageName("K_KeyframeEditor_SketchKeyframes", 1);
    model->setLabel("Box", 2);
    model->setAccessibilityDescription("Sketch", 1);
    model->setEnabled(false, 1);
    model->setSelectedSegment(0);
    TQQtSegmentedControl widget;
    widget.setModel(model);
    ASSERT_EQ(widget.buttonCount(), 3);
    EXPECT_FALSE(widget.button(0)->icon().isNull()) << "the image comes from the resources";
    EXPECT_EQ(widget.button(2)->text(), "Box");
    EXPECT_EQ(widget.button(1)->toolTip(), "Sketch");
    EXPECT_FALSE(widget.button(1)->isEnabled());
    EXPECT_TRUE(widget.button(0)->isChecked());

    widget.button(2)->click();
    EXPECT_EQ(model->selectedSegment(), 2);
    EXPECT_EQ(target.actions, std::vector<std::string>{"setCurrentTool:"});
    EXPECT_FALSE(widget.button(0)->isChecked());

    model->setSelectedSegment(0);
    EXPECT_TRUE(widget.button(0)->isChecked()) << "a program's choice shows at once";
    model->setSegmentCount(2);
    EXPECT_EQ(widget.buttonCount(), 2);
}

TEST(QtPopUpButton, opening_rebuilds_the_menu_and_a_choice_selects_the_item) {
    Target target;
    auto model = wired<RWPopUpButton>(target, "popUp:");
    model->setTitle("Animated");
    model->addNotificationObserver(RWPopUpButtonWillPopUpNotification, [&](RWControl&) {
        model->removeAllItems();
        for (const char* title : {"All", "Animated"}) {
            auto item = std::make_shared<RWMenuItem>(title, "show:");
            item->setTarget(&target);
            model->addItem(item);
        }
        model->addItem(RWMenuItem::separatorItem());
        model->addItem(std::make_shared<RWMenuItem>("Manage", "manage:"));
        model->selectItemAtIndex(1);
    });
    TQQtPopUpButton widget;
    widget.setModel(model);
    EXPECT_EQ(widget.text(), "Animated");

    emit widget.popUpMenu()->aboutToShow();
    const QList<QAction*> actions = widget.popUpMenu()->actions();
    ASSERT_EQ(actions.size(), 4);
    EXPECT_TRUE(actions[1]->isChecked()) << "the selected item is marked";
    EXPECT_TRUE(actions[2]->isSeparator());
    EXPECT_FALSE(actions[3]->isEnabled()) << "no target: the menu's validation disables it";
    actions[0]->trigger();
    EXPECT_EQ(model->indexOfSelectedItem(), 0);
    EXPECT_EQ(widget.text(), "All");
    EXPECT_EQ(target.actions, std::vector<std::string>{"show:"});
}

TEST(QtTextField, the_formatter_validates_typing_and_an_edit_reaches_the_model) {
    Target target;
    TQBoolFormatter flags;
    auto model = wired<RWTextField>(target, "flagChanged:");
    model->setEditable(true);
    model->setFormatter(&flags);
    model->setObjectValue(1);
    TQQtTextField widget;
    widget.setModel(model);
    EXPECT_EQ(widget.text(), "On");

    widget.setText("Off");
    emit widget.editingFinished();
    EXPECT_EQ(model->intValue(), 0);
    EXPECT_EQ(target.actions, std::vector<std::string>{"flagChanged:"});

    widget.setText("maybe");
    EXPECT_FALSE(widget.hasAcceptableInput()) << "the formatter refuses it";
    model->setObjectValue(1);
    EXPECT_EQ(widget.text(), "On") << "a program's value shows at once";
    model->setEditable(false);
    EXPECT_TRUE(widget.isReadOnly());
}

TEST(QtValueControls, slider_and_scrubber_both_ways) {
    Target target;
    auto slider = wired<RWSlider>(target, "slide:");
    slider->setMaxValue(10.0);
    slider->setDoubleValue(2.5);
    TQQtSlider sliderWidget;
    sliderWidget.setModel(slider);
    EXPECT_EQ(sliderWidget.value(), TQQtSlider::kResolution / 4);
    sliderWidget.setValue(TQQtSlider::kResolution / 2);
    EXPECT_DOUBLE_EQ(slider->doubleValue(), 5.0);

    TQEmptyFormatter plain;
    auto scrubber = wired<RWScrubber>(target, "scrub:");
    scrubber->setMinValue(1.0);
    scrubber->setMaxValue(10.0);
    scrubber->setFormatter(&plain);
    scrubber->setDoubleValue(3.0);
    TQQtScrubber scrubberWidget;
    scrubberWidget.setModel(scrubber);
    EXPECT_EQ(scrubberWidget.text(), "3");
    scrubberWidget.stepBy(2);
    EXPECT_DOUBLE_EQ(scrubber->doubleValue(), 5.0);
    EXPECT_EQ(scrubberWidget.text(), "5");
    scrubber->setMaxValue(4.0);
    EXPECT_DOUBLE_EQ(scrubberWidget.value(), 4.0) << "the range pulls the shown value in";
    EXPECT_EQ(target.actions, (std::vector<std::string>{"slide:", "scrub:"}));
}

// The user's close asking the delegate goes through the demo window's binding.
TEST(QtWindowBinding, the_model_shows_and_hides_the_widget) {
    RWPanel panel;
    QDialog dialog;
    TQQtWindowBinding binding(panel, &dialog);
    panel.makeKeyAndOrderFront();
    EXPECT_TRUE(dialog.isVisible());
    panel.close();
    EXPECT_FALSE(dialog.isVisible());
}

TEST(QtCellDrawing, the_name_cell_paints_its_swatch_crisply_left_of_its_frame) {
    QImage image(200, 30, QImage::Format_ARGB32_Premultiplied);
    image.fill(Qt::white);
    TQColoredTextFieldCell cell("Opacity");
    cell.setFillColor(0.0f, 0.0f, 1.0f, 1.0f);
    {
        QPainter painter(&image);
        painter.setRenderHint(QPainter::Antialiasing);
        TQQtCellDrawing drawing(painter, QPalette());
        cell.drawWithFrame(CGRectMake(40, 0, 150, 21), drawing);
        EXPECT_TRUE(drawing.shouldAntialias()) << "antialiasing is given back";
    }
    // The swatch covers x 28..36, y 7..15: its edge in the border colour, its inside blue.
    const GDColor b = GDColor::curveEditorColoredTextFieldBorderColor();
    const QColor border = TQQtCellDrawing::qtColor({b.red, b.green, b.blue, b.alpha});
    EXPECT_EQ(image.pixel(28, 7), border.rgb());
    EXPECT_EQ(image.pixel(36, 15), border.rgb());
    EXPECT_EQ(image.pixel(32, 11), QColor(Qt::blue).rgb());
    EXPECT_EQ(image.pixel(27, 11), QColor(Qt::white).rgb()) << "nothing outside the swatch";
    EXPECT_EQ(image.pixel(37, 11), QColor(Qt::white).rgb());
}

// The most opaque pixel's alpha inside the rectangle.
int maxAlpha(const QImage& image, const QRect& rect) {
    int most = 0;
    for (int y = rect.top(); y <= rect.bottom(); ++y)
        for (int x = rect.left(); x <= rect.right(); ++x)
            most = std::max(most, qAlpha(image.pixel(x, y)));
    return most;
}

int drawnAlpha(const char* name, double opacity, qreal ratio, const QRect& probe) {
    QImage image(QSize(40, 20) * ratio, QImage::Format_ARGB32_Premultiplied);
    image.setDevicePixelRatio(ratio);
    image.fill(Qt::transparent);
    {
        QPainter painter(&image);
        TQQtCellDrawing drawing(painter, QPalette());
        drawing.drawImage(name, CGRectMake(20, 2, 16, 16), opacity);
    }
    return maxAlpha(image, QRect(probe.topLeft() * ratio, probe.size() * ratio));
}

TEST(QtCellImages, drawImage__in_its_frame_at_its_opacity_and_either_ratio) {
    for (const qreal ratio : {1.0, 2.0}) {
        SCOPED_TRACE(ratio);
        const QRect frame(20, 2, 16, 16);
        const int full = drawnAlpha("AnimStatusKeyframe", 1.0, ratio, frame);
        EXPECT_GT(full, 200) << "the filled keyframe mark";
        EXPECT_EQ(drawnAlpha("AnimStatusKeyframe", 1.0, ratio, QRect(0, 0, 18, 20)), 0)
            << "nothing outside the frame";
        EXPECT_NEAR(drawnAlpha("AnimStatusKeyframe", 0.5, ratio, frame), full / 2, 3);
        EXPECT_EQ(drawnAlpha("NoSuchImage", 1.0, ratio, QRect(0, 0, 40, 20)), 0);
    }
}

}  // namespace
