// The simplify panel's content on Qt: a slider that moves from mark to mark (one action per
// mark, not per pixel) and a scrubber that shows whole numbers.
#include <gtest/gtest.h>

#include <QDoubleSpinBox>
#include <QSlider>

#include "qt/TQQtPanelDialog.h"
#include "src/editor/TQCurveEditorCtrl.h"
#include "src/editor/TQCurveEditorPanels.h"

namespace {

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

}  // namespace
