// The vertical mapping of items: flat curves, the general fit to whole tick steps, the
// channel's range taking over, the fixed scale, and when items are (not) fitted again.

#include <functional>

#include "platform/channels/TQChannelTypes.h"
#include "src/view/tests/ViewFixture.h"

namespace view_test {
namespace {

class ViewTickMarksTest : public ViewFixture {
protected:
    void SetUp() override {
        ViewFixture::SetUp();
        view.setGridSpacingY(25.0);  // S, as the timeline view has it; T is 10, Z is 1
    }

    TQChannel* flatChannel(const char* name, double value, double tickStep = 1.0) {
        TQChannel* c = addChannel(name, {});
        c->setInitialValue(value);
        c->getInfo()->tickStep = tickStep;
        return c;
    }
};

// The mapping (scale, offset) the tick pass gives an item, with the label step S = 25.
TEST_F(ViewTickMarksTest, computeVerticalTickMarks__table) {
    const auto ramp = [this](const char* name) {
        TQChannel* c = addChannel(name, {{0.0, 0.0}, {1.0, 100.0}});
        c->setInterpolation(kTQInterpolationLinear);
        return c;
    };
    const struct {
        const char* what;
        std::function<TQCurveEditorChannelItemPtr()> make;
        double scale, offset;
    } cases[] = {
        // Flat: centred on the label step of its value, 7 - remainder(7, 25) = 0.
        {"flat", [&] { return addItem(flatChannel("Seven", 7.0)); }, 1.0, 0.0},
        // The scale follows the tick step: 30 - remainder(30, 50) = 50.
        {"flat on a step of 2", [&] { return addItem(flatChannel("Thirty", 30.0, 2.0)); }, 2.0,
         50.0},
        // Extent -5..105, span 110; the step 250 halves once to 125, then rounds up to 130.
        {"whole tick steps of the padded extent", [&] { return addItem(ramp("Ramp")); }, 0.52,
         60.0},
        // The range's bottom padded, two label steps down.
        {"the channel's range when no larger",
         [&] {
             TQChannel* c = ramp("Ranged");
             c->getImpl()->range().setRange(0.0, 10.0);
             return addItem(c);
         },
         11.0 / 250.0, -0.5 + 11.0 / 250.0 * 50.0},
        {"a fixed scale fits a flat curve by its range",
         [&] {
             TQChannel* c = flatChannel("Flat", 3.0);
             c->getImpl()->range().setRange(0.0, 10.0);
             view.setHasFixedScale(1);
             return addItem(c);
         },
         0.044, 1.7},
        // Both components' extent, 0..100, one mapping for the compound.
        {"a compound's components",
         [&] {
             TQCompoundChannel* pos = addCompound("Position", 2, false, {{0, 0}, {1, 100}});
             auto* y = static_cast<TQChannel*>(pos->getChild(1));
             y->setKeyframe(seconds(1.0), 10.0);
             for (TQChannel* c : pos->getComponents()) c->setInterpolation(kTQInterpolationLinear);
             addItem(static_cast<TQChannel*>(pos->getChild(0)));
             return addItem(y);
         },
         0.52, 60.0},
    };
    for (const auto& k : cases) {
        SCOPED_TRACE(k.what);
        TearDown();
        SetUp();
        auto item = k.make();
        view.computeVerticalTickMarks();
        EXPECT_NEAR(item->scaleY(), k.scale, kValueTolerance);
        EXPECT_NEAR(item->offsetY(), k.offset, kValueTolerance);
        EXPECT_FALSE(item->updateScale()) << "a fitted item keeps its mapping";
        view.setHasFixedScale(0);
    }
    EXPECT_EQ(view.printScale(), 0) << "two displayed channels: no value labels";
}

TEST_F(ViewTickMarksTest, updateScale__gatesRefittingUntilTheItemsAreMarkedAgain) {
    TQChannel* c = addChannel("Ramp", {{0.0, 0.0}, {1.0, 100.0}});
    c->setInterpolation(1);
    auto item = addItem(c);
    view.computeVerticalTickMarks();
    const double scale = item->scaleY();

    c->setKeyframe(seconds(2.0), 1000.0);
    item->setMinY(0.0);
    item->setMaxY(1000.0);
    view.computeVerticalTickMarks();
    EXPECT_DOUBLE_EQ(item->scaleY(), scale) << "a curve must not rescale while it is edited";

    view.setAllOriginalCurveScaleDirty(1);
    view.computeVerticalTickMarks();
    EXPECT_GT(item->scaleY(), scale) << "marked items are fitted to their new extent";
}

TEST_F(ViewTickMarksTest, printScale__one_channel_labels_but_not_a_curve_shaped_one) {
    addItem(addChannel("Ramp", {{0.0, 0.0}, {1.0, 100.0}}));
    view.computeVerticalTickMarks();
    EXPECT_EQ(view.printScale(), 1) << "one displayed channel shows its value labels";
    addItem(static_cast<TQChannel*>(
        object->addChild(std::make_unique<TQChannelCurve>("Shape", nextChannelId++))));
    view.computeVerticalTickMarks();
    EXPECT_EQ(view.printScale(), 0) << "curve-shaped channels have no value to label";
}

TEST_F(ViewTickMarksTest, withoutALabelStep__valuesAreShownAsTheyAre) {
    view.setGridSpacingY(0.0);
    auto item = addItem(addChannel("Ramp", {{0.0, 0.0}, {1.0, 100.0}}));
    view.computeVerticalTickMarks();
    EXPECT_DOUBLE_EQ(item->scaleY(), 1.0);
    EXPECT_DOUBLE_EQ(item->offsetY(), 0.0);
    EXPECT_TRUE(item->updateScale()) << "fitted later, once the view has a grid";
}

}  // namespace
}  // namespace view_test
