// The mini editor's views and containers: the range 0 to 1 on the X axis whatever the zoom and
// the fit, the grid, the inspector's controls, the heads-up form, the rows' reads and writes of
// a channel at the selected position, and the curve strip.

#include <algorithm>
#include <cmath>
#include <string>
#include <vector>

#include "platform/draw/testing/HXDRecordingEncoder.h"
#include "src/mini/TQMiniCurveEditorStripView.h"
#include "src/mini/tests/MiniFixture.h"

using namespace mini_test;

namespace {

class MiniViews : public MiniFixture {};

// Frames a view with the recording encoder; answers the stippled grid lines by direction.
struct GridCount {
    int vertical = 0;
    std::vector<double> rows;  // world y of the horizontal lines, in drawing order
};
GridCount drawAndCountGrid(TQMiniCurveEditorView& view, RWManualClock& clock) {
    HXDRecordingEncoder encoder(219, 145);
    clock.advance(1.0);
    EXPECT_TRUE(view.displayLayer(&encoder));
    GridCount count;
    for (const auto& primitive : view.primitives()) {
        const auto* line = dynamic_cast<const HXDLine*>(primitive.get());
        if (!line || !line->stippled()) continue;
        if (line->start().x == line->end().x)
            ++count.vertical;
        else
            count.rows.push_back(line->start().y);
    }
    return count;
}

TEST_F(MiniViews, view__x_axis_stays_the_range_under_zoom_and_fit) {
    editor.setChannel(gain);
    auto expectRange = [&](const char* after, double x, double width) {
        const CGRect& v = view().getCurrentViewVolume();
        EXPECT_NEAR(v.origin.x, x, 1e-12) << after;
        EXPECT_NEAR(v.size.width, width, 1e-12) << after;
    };
    expectRange("at first", -0.02, 1.04);
    view().frameAll(0);
    expectRange("a vertical fit", -0.02, 1.04);
    view().performAutoZoom(true);
    expectRange("an auto zoom", -0.02, 1.04);
    view().zoomWithFactor(4.0, 2.0);
    expectRange("a zoom by factor", 0.0, 1.0);
    EXPECT_NEAR(view().getCurrentViewVolume().size.height, 50.0, 1e-9) << "Y zooms";
}

TEST_F(MiniViews, view__grid_columns_every_tenth_rows_every_fifth_of_the_height) {
    editor.setChannel(nullptr);
    view().setAutoZoom(0);
    GridCount empty = drawAndCountGrid(view(), clock);
    // -0.02 .. 1.02: positions 0 .. 1 up, 0 down (twice at 0), and the steps that end each run.
    EXPECT_GE(empty.vertical, 11);
    EXPECT_TRUE(empty.rows.empty()) << "rows only with a channel";

    editor.setChannel(gain);
    view().setAutoZoom(0);
    std::vector<double> rows = drawAndCountGrid(view(), clock).rows;
    std::sort(rows.begin(), rows.end());
    ASSERT_GE(rows.size(), 4u);
    for (size_t i = 1; i < rows.size(); ++i)
        EXPECT_NEAR(rows[i] - rows[i - 1], 20.0 * view().gridZoomY(), 1.0)
            << "one row every 20 at the view's grid zoom, 0 once";
    EXPECT_TRUE(std::any_of(rows.begin(), rows.end(), [](double y) { return std::fabs(y) < 1.0; }));
}

TEST_F(MiniViews, inspector__auto_fit_toggles_the_scrollers_which_zoom_within_the_range) {
    editor.setChannel(gain);
    const CGRect frame = editor.curveEditorViewFrame();
    EXPECT_TRUE(editor.verticalZoomScroller().isHidden() &&
                editor.horizontalZoomScrollerControl().isHidden());
    editor.autoFitButton().userClick();
    EXPECT_FALSE(editor.autoFitButton().state() || editor.verticalZoomScroller().isHidden() ||
                 editor.horizontalZoomScrollerControl().isHidden() || view().autoZoom());
    EXPECT_DOUBLE_EQ(editor.curveEditorViewFrame().size.width, frame.size.width - 15.0);
    EXPECT_DOUBLE_EQ(editor.curveEditorViewFrame().origin.y, frame.origin.y + 15.0);
    editor.autoFitButton().userClick();
    EXPECT_TRUE(CGRectEqualToRect(editor.curveEditorViewFrame(), frame));
    EXPECT_TRUE(editor.verticalZoomScroller().isHidden());

    // The horizontal scroller zooms within the range.
    RWZoomScroller& h = editor.horizontalZoomScrollerControl();
    h.setHidden(false);
    h.setKnobProportion(0.5);
    // The knob's position is taken against the width before the step: it settles at the
    // second one.
    h.userMoveKnob(1.0);
    h.userMoveKnob(1.0);
    const CGRect& v = view().getCurrentViewVolume();
    EXPECT_NEAR(v.size.width, 0.52, 1e-6);
    EXPECT_NEAR(v.origin.x + v.size.width, 1.02, 1e-6) << "the knob at the end shows the end";
    editor.updateHorizontalZoomScroller();
    EXPECT_NEAR(h.floatValue(), 1.0, 1e-6);
    EXPECT_NEAR(h.knobProportion(), 0.5, 1e-6);

    // A page back would pass the range's start: the view stays, the knob steps back a fifth.
    h.userClickPart(kRWScrollerDecrementPage);
    EXPECT_NEAR(v.origin.x, 0.5, 1e-6);
    EXPECT_NEAR(h.floatValue(), 0.8, 1e-6);
    // A vertical page moves by the slack between the largest volume and the view.
    const double y = v.origin.y, slack = ctrl().getMaxViewVolume().size.height - v.size.height;
    editor.verticalZoomScroller().userClickPart(kRWScrollerIncrementPage);
    EXPECT_NEAR(v.origin.y, y + slack, 1e-6);
}

TEST_F(MiniViews, forms__tool_switch_flags_disabled_mouse_and_the_heads_up_fit) {
    TQMiniCurveEditorInspector frozen(&recorder, 0);
    frozen.curveEditorView().setViewHost(&viewHost);
    frozen.setChannel(gain);
    frozen.setEnabled(false);
    EXPECT_TRUE(frozen.modes().isEnabled()) << "a dead switch is left as it was";
    EXPECT_FALSE(frozen.autoFitButton().isEnabled() || frozen.isEnabled());
    frozen.modes().setSelectedSegment(2);
    RWMenuItem sender("", "setMode:");
    frozen.setMode(sender);
    EXPECT_EQ(frozen.controller()->getCurrentTool(), TQTool::kEdit);
    frozen.curveEditorView().setViewHost(nullptr);

    editor.setChannel(gain);
    editor.modes().userClickSegment(2);
    EXPECT_EQ(ctrl().getCurrentTool(), TQTool::kBox);

    // A disabled editor's view ignores the mouse and offers no menu.
    editor.setEnabled(false);
    clock.advance(1.0);
    HXDRecordingEncoder encoder(219, 145);
    view().displayLayer(&encoder);
    const CGPoint key = view().getPointScreen(CGPointMake(0.5, 0.0));
    view().mouseDown(RWEvent::mouseEvent(RWEventType::LeftMouseDown, key));
    view().mouseUp(RWEvent::mouseEvent(RWEventType::LeftMouseUp, key));
    const RWEvent rightClick = RWEvent::mouseEvent(RWEventType::RightMouseDown, key);
    EXPECT_FALSE(view().menuForEvent(rightClick));
    EXPECT_FALSE(editor.hasSelection() || view().mouseIsDown());
    editor.setEnabled(true);
    EXPECT_TRUE(view().menuForEvent(rightClick));

    // The heads-up form always fits.
    TQMiniCurveEditorHUD hud(&recorder);
    hud.curveEditorView().setAutoZoom(0);
    hud.setChannel(gain);
    EXPECT_TRUE(hud.curveEditorView().autoZoom() && hud.curveEditorView().isHUD());
    EXPECT_DOUBLE_EQ(hud.curveEditorViewFrame().size.width, 177.0);
}

TEST_F(MiniViews, rows__read_and_write_a_channel_at_the_selected_position) {
    editor.setChannel(gradient);
    TQChannel* x = gradient->getXChannel();
    TQChannel* y = gradient->getYChannel();
    EXPECT_DOUBLE_EQ(editor.getSelectedValueYForChannel(x), 0.0) << "no selection: the start";
    EXPECT_DOUBLE_EQ(editor.getSelectedValueYForChannel(y), 1.0);

    setKeys(*x, {{0.5, 3.0}});
    selectKeys(editor, x, {0.5});
    EXPECT_DOUBLE_EQ(editor.getSelectedValueYForChannel(y), y->getCurveValue(position(0.5), false))
        << "the curve between keys";
    ASSERT_EQ(y->getKeyframe(position(0.5)), nullptr);
    editor.setSelectedValueY(7.0, y);
    EXPECT_DOUBLE_EQ(keyValue(*y, 0.5), 7.0) << "a keypoint added where there was none";
    editor.setSelectedValueY(6.0, y);
    EXPECT_EQ(y->getKeyframes(false).size(), 3u) << "and updated after";
}

// ---- The strip ----

class StripSource : public TQMiniCurveEditorStripSource {
public:
    TQChannelBase* channel = nullptr;
    TQMiniCurveEditor* editor = nullptr;
    TQChannelBase* associatedChannel() const override { return channel; }
    TQMiniCurveEditor* getMiniCurveEditor() const override { return editor; }
};

class Strip : public MiniFixture {
protected:
    void SetUp() override {
        MiniFixture::SetUp();
        editor.setChannel(gain);
        source.editor = &editor;
        strip.setViewHost(&stripHost);
    }
    // What the strip draws: the kinds in order, as letters (M multiline, L line, Q square).
    std::string drawn() {
        HXDRecordingEncoder encoder(180, 18);
        EXPECT_TRUE(strip.drawInView(encoder));
        std::string out;
        for (const auto& e : encoder.entries)
            out += e.kind == HXDRecordingEncoder::Kind::Multiline ? 'M'
                   : e.kind == HXDRecordingEncoder::Kind::Line    ? 'L'
                                                                  : 'Q';
        EXPECT_TRUE(encoder.colourFaults.empty());
        return out;
    }

    RWStubViewHost stripHost{180.0, 18.0, 1.0};
    StripSource source;
    TQMiniCurveEditorStripView strip;
};

TEST_F(Strip, draws_the_curve_and_its_keypoints_in_the_box_or_flat_forms) {
    source.channel = gain;
    strip.setController(&source);
    EXPECT_EQ(std::pair(strip.numberOfSamples(), strip.numberOfKeypoints()), std::pair(180u, 3u));
    EXPECT_EQ(drawn(), "MQQQ");
    const auto& curve = static_cast<const HXDMultiline&>(*strip.primitives()[0]);
    EXPECT_EQ(curve.vertices().size(), 90u) << "every second sample";
    // The highest keypoint (30 at 0.5) is drawn at the top less half a square.
    const auto& top = static_cast<const HXDScreenspaceQuad&>(*strip.primitives()[2]);
    EXPECT_DOUBLE_EQ(CGRectGetMidX(top.frame()), 90.0);
    EXPECT_DOUBLE_EQ(CGRectGetMaxY(top.frame()), 18.0);

    // The flat forms: one keypoint, none, and no channel.
    TQChannel* one =
        static_cast<TQChannel*>(object->addChild(std::make_unique<TQChannel>("One", 20)));
    setKeys(*one, {{0.25, 5.0}});
    source.channel = one;
    strip.setController(&source);
    EXPECT_EQ(drawn(), "LQ") << "one keypoint: flat at mid height";
    EXPECT_DOUBLE_EQ(
        CGRectGetMidY(static_cast<const HXDScreenspaceQuad&>(*strip.primitives()[1]).frame()), 9.0);

    one->deleteAllKeyframes(kCMTimeZero);
    strip.sample();
    EXPECT_EQ(drawn(), "L") << "no keypoints: the line alone";

    source.channel = nullptr;
    setKeys(*one, {{0.5, 1.0}});
    strip.sample();
    EXPECT_TRUE(!strip.numberOfKeypoints() && strip.samplesY().empty())
        << "counts kept from the last sampling";
    EXPECT_EQ(drawn(), "L") << "and nothing read from the emptied arrays";
}

TEST_F(Strip, a_pair_stands_for_its_first_component_zero_width_and_updates) {
    source.channel = gradient;
    strip.setController(&source);
    EXPECT_EQ(std::pair(strip.numberOfKeypoints(), strip.maxVal()), std::pair(2u, 4.0));

    RWStubViewHost narrow{0.0, 18.0, 1.0};
    strip.setViewHost(&narrow);
    strip.sample();
    EXPECT_FALSE(strip.numberOfSamples() || CMTIME_IS_VALID(strip.resolution()));
    strip.setViewHost(&stripHost);

    // update samples only what the host reports modified.
    source.channel = gain;
    strip.setController(&source);
    host.resetModifiedChannels();
    gain->setKeyframe(position(0.75), 100.0);
    strip.update();
    EXPECT_EQ(strip.numberOfKeypoints(), 3u) << "not reported: the old samples stay";
    gain->noteWillChange(true);
    gain->setKeyframeValue(gain->getKeyframe(position(0.75)), 50.0);
    strip.update();
    EXPECT_EQ(std::pair(strip.numberOfKeypoints(), strip.maxVal()), std::pair(4u, 50.0));
}

}  // namespace
