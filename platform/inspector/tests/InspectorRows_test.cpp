// The inspector's ordinary rows: a number row sets its channel at the delegate's time, clamped
// to the channel's limits and in display units, each edit one begin and one end of the
// delegate however many steps it takes; several channels keep their distances; groups hide
// and show their rows; the host's table picks a row by channel.

#include <gtest/gtest.h>

#include <memory>
#include <string>
#include <vector>

#include "platform/channels/TQChannel.h"
#include "platform/channels/TQChannelTypes.h"
#include "platform/inspector/TQChanNumberControllers.h"
#include "platform/inspector/TQChannelControllerMapping.h"
#include "platform/inspector/TQInspectorRows.h"

namespace {

CMTime seconds(double s) { return TQTarnTimeForChannelSeconds(s, 0x40000); }

// Answers a fixed time and keeps the order of the edit's calls.
class RecordingInspectorDelegate : public JNInspectorDelegate {
public:
    bool isAnyInspectorRebuilding() override { return rebuilding; }
    void abort() override { calls += "a"; }
    CMTime currentTimeForChannel(const TQChannelBase*) override { return now; }
    void beginChannelChange(TQViewController*, TQChannelBase*) override { calls += "("; }
    void channelChanged(TQChannelBase*, CMTime, uint32_t) override { calls += "c"; }
    void endChannelChange(TQViewController*) override { calls += ")"; }

    bool rebuilding = false;
    CMTime now = seconds(2.0);
    std::string calls;
};

double valueAt(const TQChannel& c, double s) { return c.getValueAsDouble(seconds(s)); }

TEST(InspectorRows, doubleRow__typed_value_is_a_keyframe_at_the_time_in_one_edit) {
    RecordingInspectorDelegate delegate;
    TQChannel channel("Opacity", 1, 0.5);
    channel.getImpl()->range().setRange(0.0, 1.0);
    channel.getInfo()->displayScale = 100.0;
    TQChanDoubleController row(&channel, JNBuildContext(&delegate));
    row.update();
    EXPECT_DOUBLE_EQ(row.textField().doubleValue(), 50.0) << "display units";

    row.userEnterNumber("80");
    EXPECT_DOUBLE_EQ(valueAt(channel, 2.0), 0.8);
    EXPECT_NE(channel.getKeyframe(seconds(2.0)), nullptr);
    EXPECT_EQ(delegate.calls, "(ac)");

    row.userEnterNumber("250");
    EXPECT_DOUBLE_EQ(valueAt(channel, 2.0), 1.0) << "clamped to the channel's limits";

    delegate.rebuilding = true;
    delegate.calls.clear();
    row.userEnterNumber("10");
    EXPECT_DOUBLE_EQ(valueAt(channel, 2.0), 1.0) << "ignored while the inspector rebuilds";
}

TEST(InspectorRows, doubleRow__a_drag_over_several_channels_is_one_edit_keeping_distances) {
    RecordingInspectorDelegate delegate;
    TQChannel a("A", 1, 10.0);
    TQChannel b("B", 2, 15.0);
    for (TQChannel* c : {&a, &b}) c->getImpl()->range().setRange(-100.0, 100.0);
    TQChanDoubleController row(&a, JNBuildContext(&delegate));
    ASSERT_TRUE(row.addOrResetAssociatedChannel(&b, true, false));
    EXPECT_FALSE(row.addOrResetAssociatedChannel(&b, true, false)) << "once only";
    RWSlider& slider = *row.slider();
    slider.setMinValue(-100.0);
    slider.setMaxValue(100.0);
    row.startScrubberAction(slider);
    EXPECT_TRUE(row.isOffsetting()) << "the channels differ";
    for (double v : {1.0, 2.0, 3.0}) slider.userSetDoubleValue(v);
    row.endSliderAction(slider);
    EXPECT_DOUBLE_EQ(valueAt(a, 2.0), 13.0) << "offset from the value at the press";
    EXPECT_DOUBLE_EQ(valueAt(b, 2.0), 18.0);
    EXPECT_EQ(delegate.calls, "((acacac)");
}

TEST(InspectorRows, angleRow__dial_shows_the_angle_turned_and_steps_across_zero) {
    RecordingInspectorDelegate delegate;
    TQChannelAngle angle("Turn", 1);
    const double degree = 1.0 / angle.getInfo()->displayScale;
    angle.setKeyframe(seconds(2.0), 10.0 * degree);
    TQChanAngleController row(&angle, JNBuildContext(&delegate));
    row.update();
    EXPECT_DOUBLE_EQ(row.dial()->doubleValue(), 350.0);
    row.dial()->userSetDoubleValue(355.0);
    EXPECT_NEAR(valueAt(angle, 2.0) / degree, 5.0, 1e-9);
    EXPECT_DOUBLE_EQ(TQChanAngleController::renormalize(-30.0), 330.0);
}

TEST(InspectorRows, groups__collapse_hides_rows_and_a_folder_row_opens_its_group) {
    JNBuildContext context;
    TQChannel channel("X", 1);
    auto enclosed = std::make_unique<TQViewControllerGroup>(&channel, context);
    TQViewController* first =
        enclosed->addController(std::make_unique<TQChanLabelController>(&channel, context), true);
    enclosed->setIsCollapsed(true);
    TQFolderGroupController folder(std::make_unique<TQFolderLabelController>(&channel, context),
                                   std::move(enclosed), context);
    EXPECT_TRUE(first->isHidden()) << "a closed group hides its rows";
    folder.twiddle(true);
    EXPECT_FALSE(first->isHidden() || folder.enclosedGroup()->isCollapsed());
    folder.setHidden(true);
    EXPECT_TRUE(first->isHidden()) << "hidden with its parent";
    folder.enclosedGroup()->indent();
    EXPECT_DOUBLE_EQ(first->indentation(), TQViewControllerGroup::kIndentStep);
}

TEST(InspectorRows, mapping__registered_kinds_first_then_a_number_row) {
    JNBuildContext context;
    TQChannelControllerMapping mapping;
    mapping.registerClass<TQChannelAngle>([](TQChannelBase* c, const JNBuildContext& ctx) {
        return std::make_unique<TQChanAngleController>(c, ctx);
    });
    TQChannelAngle angle("Turn", 1);
    TQChannel plain("Plain", 2);
    TQChannel2D pair("Pos", 3);
    auto row = [&](TQChannelBase* c) { return mapping.controllerForChannel(c, context); };
    EXPECT_TRUE(dynamic_cast<TQChanAngleController*>(row(&angle).get()) &&
                dynamic_cast<TQChanDoubleController*>(row(&plain).get()));
    EXPECT_FALSE(row(&pair) || row(nullptr));
}

TEST(InspectorRows, formatter__suffix_clamp_and_refusal) {
    auto f = TQInspNumberFormatter::formatterWithSuffix("%", 0.0, 100.0, 2);
    EXPECT_EQ(f->stringForObjectValue(RWObjectValue(12.345)), "12.35%");
    RWObjectValue v, w;
    EXPECT_TRUE(f->getObjectValue(&v, "150%", nullptr) && f->getObjectValue(&w, "-5", nullptr));
    EXPECT_EQ(std::pair(v.doubleValue(), w.doubleValue()), std::pair(100.0, 0.0)) << "clamped";
    std::string why;
    EXPECT_FALSE(f->getObjectValue(&v, "abc", &why));
    EXPECT_FALSE(why.empty());
}

}  // namespace
