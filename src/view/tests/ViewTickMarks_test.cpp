// The vertical mapping of items: flat curves, the general fit to whole tick steps, the
// channel's range taking over, the fixed scale, when items are (not) fitted again, and the
// value labels.

#include <sstream>

#include "platform/channels/TQChannelTypes.h"
#include "src/view/tests/ViewFixture.h"

namespace view_test {
namespace {

class ViewTickMarks : public ViewFixture {
protected:
    // The mapping the tick pass gives A, as "scale offset", and "+" if it waits to be fitted.
    std::string mapping() {
        view.computeVerticalTickMarks();
        const auto a = item("A");
        return (std::ostringstream()
                << a->scaleY() << " " << a->offsetY() << (a->updateScale() ? " +" : ""))
            .str();
    }
};

// With the label step S = 25 as the timeline view has it (T is 10, Z is 1).
TEST_F(ViewTickMarks, computeVerticalTickMarks__table) {
    const struct {
        const char* what;
        const char* scene;
        double initial, tickStep, rangeTop;  // rangeTop 0: no range
        bool fixedScale;
        const char* want;
    } cases[] = {
        // 7 - remainder(7, 25) = 0.
        {"flat: centred on the label step of its value", "A: ", 7, 1, 0, false, "1 0"},
        // 30 - remainder(30, 50) = 50.
        {"flat: the scale follows the tick step", "A: ", 30, 2, 0, false, "2 50"},
        // Extent -5..105, span 110; the step 250 halves once to 125, then rounds up to 130.
        {"whole tick steps of the padded extent", "A: 0=0/1 1=100/1", 0, 1, 0, false, "0.52 60"},
        // 11 / 250, and the range's bottom padded, two label steps down: -0.5 + 0.044 * 50.
        {"the channel's range when no larger", "A: 0=0/1 1=100/1", 0, 1, 10, false, "0.044 1.7"},
        {"a fixed scale fits a flat curve by its range", "A: ", 3, 1, 10, true, "0.044 1.7"},
        // The range, padded to 106.7, fits within the flat curve's padded four steps (110).
        {"a flat curve's range when no larger", "A: ", 7, 1, 97, false, "0.4268 16.49"},
        {"not when larger, at 132", "A: ", 7, 1, 120, false, "1 0"},
        // Extent -4..67, span 71: 71 / 250 doubles to just over one, so the step halves once.
        {"a span just over half a step", "A: 0=0/1 1=63.6/1", 0, 1, 0, false, "0.52 61"},
        // Extent -11.3..237.3 on whole numbers: -12..238, exactly one step of 250.
        {"a span of exactly one step", "A: 0=0/1 1=226/1", 0, 1, 0, false, "1 113"},
        // Both components' extent, 0..100, one mapping for the compound.
        {"a compound's components", "Pos.A: 0=0/1 1=10/1; Pos.B: 0=0/1 1=100/1", 0, 1, 0, false,
         "0.52 60"},
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(c.what);
        TearDown();
        items.clear();
        SetUp();
        view.setGridSpacingY(25.0);
        view.setHasFixedScale(c.fixedScale);
        build(c.scene);
        TQChannel* a = item("A")->channel();
        a->setInitialValue(c.initial);
        a->getInfo()->tickStep = c.tickStep;
        if (c.rangeTop > 0) a->getImpl()->range().setRange(0.0, c.rangeTop);
        EXPECT_EQ(mapping(), c.want);
    }
    EXPECT_EQ(view.printScale(), 0) << "two displayed channels: no value labels";
}

// A curve must not rescale while it is edited; marked items are fitted to their new extent.
// Without a label step values are shown as they are, and fitted once the view has a grid.
TEST_F(ViewTickMarks, updateScale__gates_refitting_until_the_items_are_marked_again) {
    view.setGridSpacingY(0.0);
    build("A: 0=0/1 1=100/1");
    EXPECT_EQ(mapping(), "1 0 +");
    view.setGridSpacingY(25.0);
    EXPECT_EQ(mapping(), "0.52 60");
    EXPECT_EQ(view.printScale(), 1) << "one displayed channel shows its value labels";
    item("A")->channel()->setKeyframe(seconds(2.0), 1000.0);
    item("A")->setMinY(0.0);
    item("A")->setMaxY(1000.0);
    EXPECT_EQ(mapping(), "0.52 60");
    view.setAllOriginalCurveScaleDirty(1);
    EXPECT_EQ(mapping(), "5 575");
    addItem(static_cast<TQChannel*>(
        object->addChild(std::make_unique<TQChannelCurve>("Shape", nextChannelId++))));
    view.computeVerticalTickMarks();
    EXPECT_EQ(view.printScale(), 0) << "curve-shaped channels have no value to label";
}

}  // namespace
}  // namespace view_test
