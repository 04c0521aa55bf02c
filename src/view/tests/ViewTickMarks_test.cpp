// The vertical mapping of items: flat curves, the general fit to whole tick steps, the
// channel's range taking over, the fixed scale, and when items are (not) fitted again.

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

TEST_F(ViewTickMarksTest, flatCurve__isCentredOnTheLabelStepOfItsValue) {
    {
        auto item = addItem(flatChannel("Seven", 7.0));
        view.computeVerticalTickMarks();
        EXPECT_NEAR(item->scaleY(), 1.0, kValueTolerance);
        EXPECT_NEAR(item->offsetY(), 0.0, kValueTolerance) << "7 - remainder(7, 25) is 0";
        EXPECT_FALSE(item->updateScale()) << "a fitted item keeps its mapping";
    }
    {
        auto item = addItem(flatChannel("Thirty", 30.0, 2.0));
        view.computeVerticalTickMarks();
        EXPECT_NEAR(item->scaleY(), 2.0, kValueTolerance) << "the scale follows the tick step";
        EXPECT_NEAR(item->offsetY(), 50.0, kValueTolerance) << "30 - remainder(30, 50) is 50";
    }
}

TEST_F(ViewTickMarksTest, generalCase__spansWholeTickStepsOfThePaddedExtent) {
    TQChannel* c = addChannel("Ramp", {{0.0, 0.0}, {1.0, 100.0}});
    c->setInterpolation(1);
    auto item = addItem(c);
    ASSERT_DOUBLE_EQ(item->minY(), 0.0);
    ASSERT_DOUBLE_EQ(item->maxY(), 100.0);

    view.computeVerticalTickMarks();
    // Extent -5..105, span 110; the step 250 halves once to 125, then rounds up to 130.
    EXPECT_NEAR(item->scaleY(), 0.52, kValueTolerance);
    EXPECT_NEAR(item->offsetY(), 60.0, kValueTolerance);
    EXPECT_NEAR(view.gridScaleY(), 0.52, kValueTolerance);
    EXPECT_EQ(view.printScale(), 1) << "one displayed channel shows its value labels";
}

TEST_F(ViewTickMarksTest, channelRange__takesOverWhenNoLargerThanThePaddedExtent) {
    TQChannel* c = addChannel("Ramp", {{0.0, 0.0}, {1.0, 100.0}});
    c->setInterpolation(1);
    c->getImpl()->range().setRange(0.0, 10.0);
    auto item = addItem(c);

    view.computeVerticalTickMarks();
    EXPECT_NEAR(item->scaleY(), 11.0 / 250.0, kValueTolerance);
    EXPECT_NEAR(item->offsetY(), -0.5 + 11.0 / 250.0 * 50.0, kValueTolerance)
        << "the offset is two label steps above the padded range's bottom";
}

TEST_F(ViewTickMarksTest, fixedScale__fitsAFlatCurveByItsChannelRange) {
    TQChannel* c = flatChannel("Flat", 3.0);
    c->getImpl()->range().setRange(0.0, 10.0);
    auto item = addItem(c);
    view.setHasFixedScale(1);

    view.computeVerticalTickMarks();
    // The general case on the range 0..10; its padded extent equals the padded range, so the
    // range's mapping wins.
    EXPECT_NEAR(item->scaleY(), 0.044, kValueTolerance);
    EXPECT_NEAR(item->offsetY(), 1.7, kValueTolerance);
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

TEST_F(ViewTickMarksTest, printScale__isClearedByACurveShapedChannel) {
    auto* shape = static_cast<TQChannel*>(
        object->addChild(std::make_unique<TQChannelCurve>("Shape", nextChannelId++)));
    addItem(shape);
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

TEST_F(ViewTickMarksTest, compound__sharesOneMappingAcrossItsComponents) {
    TQCompoundChannel* compound = addCompound("Position", 2, false, {{0.0, 0.0}, {1.0, 100.0}});
    auto* x = static_cast<TQChannel*>((*compound->getChildren())[0]);
    auto* y = static_cast<TQChannel*>((*compound->getChildren())[1]);
    x->setInterpolation(1);
    y->setInterpolation(1);
    y->setKeyframe(seconds(1.0), 10.0);
    auto itemX = addItem(x);
    auto itemY = addItem(y);
    ASSERT_DOUBLE_EQ(itemY->maxY(), 10.0);

    view.computeVerticalTickMarks();
    // The extent of both components, 0..100, as for a single ramp to 100.
    EXPECT_NEAR(itemX->scaleY(), 0.52, kValueTolerance);
    EXPECT_NEAR(itemX->offsetY(), 60.0, kValueTolerance);
    EXPECT_DOUBLE_EQ(itemY->scaleY(), itemX->scaleY()) << "components share one vertical mapping";
    EXPECT_DOUBLE_EQ(itemY->offsetY(), itemX->offsetY());
    EXPECT_FALSE(itemY->updateScale()) << "the component was fitted with its compound";
}

}  // namespace
}  // namespace view_test
