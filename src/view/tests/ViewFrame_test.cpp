// Frames: what each draws, against recorded baselines (FrameBaseline.h), and the frame's own
// rules: the 1/30 s gate and its one delayed redraw, the skipped frame, the images at the
// backing scale, the fitting of a flat curve, value texts and which curves are fetched again.

#include "platform/channels/TQChannelTypes.h"
#include "src/resources/BNImage.h"
#include "src/resources/TQKeyframeImages.h"
#include "src/view/tests/ViewMouseFixture.h"

namespace view_test {
namespace {

class ViewFrame : public ViewMouseFixture {
protected:
    void SetUp() override {
        ViewMouseFixture::SetUp();
        TQCurveEditorItem::resetColorIndex();  // colours as the baselines hold them
    }
};

// Items drawn from the last to the first with the primary one on top, a disabled one not at
// all, a channel that takes no keypoints without them; the ends dimmed and stippled; a curve that starts after the view puts every sample in
// its first piece.
TEST_F(ViewFrame, frame__order_pieces_and_dimmed_ends) {
    auto a = linearItem("A", {{2.0, 0.0}, {6.0, 0.5}});
    auto b = linearItem("B", {{1.0, 0.1}, {5.0, 0.6}});
    linearItem("C", {{20.0, 0.0}, {30.0, 1.0}});
    linearItem("Hidden", {{1.0, 0.3}, {5.0, 0.8}})->enableItem(0);
    linearItem("Still", {{3.0, -0.5}, {7.0, -0.5}})->channel()->setAnimationEnabled(false);
    b->select(1);
    ASSERT_TRUE(frame());
    EXPECT_TRUE(matchesBaseline("frame-order-and-ends", frameText()));
    ASSERT_EQ(encoder.entries.size(), view.primitives().size());
    for (size_t i = 0; i < encoder.entries.size(); ++i)
        ASSERT_EQ(encoder.entries[i].primitive, view.primitives()[i].get())
            << "encoded out of order";
    const GDColor bg = view.backgroundColor();
    EXPECT_EQ(encoder.clearColor, HXD_sRGBA(bg.red, bg.green, bg.blue, bg.alpha));
    ASSERT_TRUE(frame());
    EXPECT_EQ(view.keypointsPrimitives().at(a->channelId()).size(), 2u)
        << "each frame starts from empty lists";
}

// Each keypoint state shows its image; handles only on selected, enabled keypoints, none that
// lies on its keypoint, lines stopping short of the keypoint; the primary keypoint's value
// label, moved back inside near the top right corner.
TEST_F(ViewFrame, frame__keypoint_states_handles_and_label) {
    auto states = linearItem("States", {{1, 0}, {2, 0}, {3, 0}, {4, 0}, {5, 0}, {6, 0}});
    TQChannel* c = states->channel();
    for (double t : {1.0, 2.0}) c->setKeyframeEnabled(c->getKeyframe(seconds(t)), false);
    for (double t : {3.0, 4.0}) c->setKeyframeLocked(c->getKeyframe(seconds(t)), true);
    TQChannel* bez = addChannel("Bezier", {{1.0, -0.5}, {5.0, -0.5}, {8.0, -0.5}});
    for (TQKeyframeHandle h : bez->getKeyframes(false)) {
        bez->setKeyframeTangentsBroken(h, true);
        bez->setKeyframeInputTangents(h, -1.0, -0.25);
        bez->setKeyframeOutputTangents(h, 2.0, 0.5);
    }
    bez->setKeyframeInputTangents(bez->getKeyframe(seconds(8.0)), -0.01, -0.001);
    auto handles = addItem(bez);
    auto corner = linearItem("Corner", {{1.0, 0.0}, {9.95, 0.98}});
    selectInView({keypointEntry(corner, 9.95), keypointEntry(states, 1), keypointEntry(states, 3),
                  keypointEntry(states, 5), keypointEntry(handles, 5), keypointEntry(handles, 8)});
    view.setPrintText(1);
    // A mapping of its own, which the frame keeps: V = (value * 2 + 0.4) / 1.
    states->setScaleY(0.5);
    states->setOffsetY(-0.2);
    states->setUpdateScale(0);
    ASSERT_TRUE(frame());
    EXPECT_TRUE(matchesBaseline("frame-keypoints", frameText()));
    bez->setLocked(true);
    ASSERT_TRUE(frame());
    EXPECT_TRUE(pickable<HXDQuadTexture>(TQSelectionOutTangent).empty())
        << "a locked channel shows no handles";
}

// A drag's ghost (only of a curve selected in the list), the processed curve hidden while the
// mouse is down and back after, then the rubber band.
TEST_F(ViewFrame, frame__ghost_processed_curve_and_band) {
    auto item = linearItem("Ramp", {{2.0, 0.0}, {6.0, 0.5}});
    linearItem("Other", {{2.0, 0.2}, {6.0, 0.7}});
    item->channel()->addBehavior(std::make_unique<TQOscillateBehavior>(0.1, 1.0, 0.0));
    item->setDrawProcessedCurve(1);
    item->setNumberOfProcessedSamples(100);
    item->setProcessedCurveDirty(1);
    item->select(1);
    ASSERT_TRUE(frame());
    down(6.0, 0.5);
    dragTo(6.5, 0.7);
    ASSERT_TRUE(frame());
    std::string text = frameText();
    up(6.5, 0.7);
    ASSERT_TRUE(frame());
    down(1.0, 0.9);
    dragTo(3.0, 0.6);
    ASSERT_TRUE(frame());
    EXPECT_TRUE(matchesBaseline("frame-gesture", text + "--\n" + frameText()));
    up(3.0, 0.6);
}

// Selected keypoints are merged into a coarse sampling, once each.
TEST_F(ViewFrame, frame__selected_keypoints_join_a_coarse_line) {
    auto item = linearItem("Coarse", {{0.0, 0.0}, {1.0, 1.0}, {4.0, 4.0}});
    ASSERT_TRUE(frame());
    item->setNumberOfSamples(5);
    item->refreshOriginalCurve(seconds(0.0), seconds(2.5));
    auto u = std::make_unique<CMTime[]>(5);
    auto v = std::make_unique<double[]>(5);
    for (int i = 0; i < 5; ++i) {
        u[i] = seconds(2.5 * i);
        v[i] = std::min(2.5 * i, 4.0);
    }
    item->setSamplesU(std::move(u), 5);
    item->setSamplesV(std::move(v), 5);
    selectInView({keypointEntry(item, 0.0), keypointEntry(item, 1.0)});
    ASSERT_TRUE(frame());
    EXPECT_TRUE(matchesBaseline("frame-coarse", frameText()));
}

TEST_F(ViewFrame, frame__backing_scale_two_doubles_images_and_keeps_thin_lines) {
    linearItem("Ramp", {{2.0, 0.0}, {6.0, 0.5}});
    viewHost.setBackingScaleFactor(2.0);
    view.viewDidChangeBackingProperties();
    HXDRecordingEncoder retina(1600, 800);
    clock.advance(1.0);
    ASSERT_TRUE(view.displayLayer(&retina));
    EXPECT_TRUE(matchesBaseline("frame-retina", frameText()));
    for (uint32_t k = 0; k < 8 * 4 * 2; ++k) {
        const KeyframeAsset& asset = view.keyframeAsset(k / 8, k / 2 % 4, k % 2);
        auto image = BNImageForResource(TQKeyframeImages::imageName(k / 8, k / 2 % 4, k % 2), 2.0);
        ASSERT_TRUE(asset.texture && image) << k;
        EXPECT_EQ(asset.texture->width(), static_cast<uint32_t>(image->pixelsWide())) << k;
        EXPECT_EQ(asset.size, image->size()) << "sizes are in points";
    }
}

TEST_F(ViewFrame, displayLayer__two_requests_inside_the_gap_make_one_delayed_redraw) {
    ASSERT_TRUE(frame());
    const int redrawsBefore = viewHost.redrawRequests();
    clock.advance(0.01);
    EXPECT_FALSE(view.displayLayer(&encoder)) << "a frame 10 ms after the last is put off";
    clock.advance(0.01);
    EXPECT_FALSE(view.displayLayer(&encoder));
    EXPECT_EQ(timer.requests(),
              std::vector<uint64_t>{TQCurveEditorViewBase::kDelayedDisplayNanoseconds});
    EXPECT_EQ(encoder.framesBegun, 1) << "nothing was encoded inside the gap";
    timer.advance(0.034);
    EXPECT_EQ(viewHost.redrawRequests(), redrawsBefore + 1);
    EXPECT_TRUE(view.displayLayer(&encoder));
    clock.advance(0.001);
    EXPECT_FALSE(view.displayLayer(&encoder));
    EXPECT_EQ(timer.requests().size(), 2u) << "after a frame an early request schedules again";
}

TEST_F(ViewFrame, displayLayer__a_skipped_frame_restarts_the_gate_and_a_dead_view_is_not_called) {
    encoder.setDrawableAvailable(false);
    EXPECT_FALSE(frame());
    EXPECT_EQ(encoder.framesBegun, 0);
    encoder.setDrawableAvailable(true);
    clock.advance(0.01);
    EXPECT_FALSE(view.displayLayer(&encoder)) << "the skipped frame still counts for the gate";

    auto doomed = std::make_unique<TQCurveEditorViewBase>();
    RWStubViewHost host;
    doomed->setViewHost(&host);
    doomed->setClock(&clock);
    doomed->setTimer(&timer);
    clock.advance(1.0);
    ASSERT_TRUE(doomed->displayLayer(&encoder));
    ASSERT_FALSE(doomed->displayLayer(&encoder));
    doomed.reset();
    timer.advance(0.05);
    EXPECT_EQ(host.redrawRequests(), 0) << "the block outlived its view and must not call it";
}

TEST_F(ViewFrame, drawCurveEditor__fits_a_flat_curve_at_zero_to_offset_zero) {
    view.setGridSpacingY(25.0);
    TQChannel* flat = addChannel("Zero", {});
    flat->setInitialValue(0.0);
    auto item = addItem(flat);
    ASSERT_TRUE(frame());
    EXPECT_FALSE(item->updateScale()) << "the frame runs the tick pass";
    EXPECT_NEAR(item->scaleY(), 1.0, kValueTolerance);
    EXPECT_NEAR(item->offsetY(), 0.0, kValueTolerance);
}

TEST_F(ViewFrame, getScale_and_getCoordinates__format_values_by_channel_type) {
    auto plain = addItem(addChannel("Plain", {{0.0, 1.0}}));
    EXPECT_EQ(view.getScale(plain.get(), 3.14159), "3.14");
    auto* gain = static_cast<TQChannel*>(
        object->addChild(std::make_unique<TQChannelDecibel>("Gain", nextChannelId++)));
    auto decibels = addItem(gain);
    EXPECT_EQ(view.getScale(decibels.get(), 10.0), "20") << "amplitude 10 is 20 dB";
    object->removeChild(gain);
    EXPECT_FALSE(view.getScale(decibels.get(), 1.0).has_value()) << "an item whose channel is gone";
    EXPECT_EQ(view.getCoordinates(nullptr, seconds(1.5), 0.25), "(1.500 s, 0.250)");
}

TEST_F(ViewFrame, setVisibleOriginalCurveDirty__marks_only_what_the_host_reports_changed) {
    auto changed = linearItem("Changed", {{1.0, 0.0}, {5.0, 0.5}});
    auto still = linearItem("Still", {{1.0, 0.0}, {5.0, 0.5}});
    ASSERT_TRUE(frame());
    ASSERT_FALSE(changed->originalCurveDirty() || still->originalCurveDirty());
    recorder.answers.modified = {changed->channel()};
    view.setVisibleOriginalCurveDirty(1);
    EXPECT_TRUE(changed->originalCurveDirty());
    EXPECT_FALSE(still->originalCurveDirty()) << "an unchanged curve keeps its samples";
    view.setAllOriginalCurveDirty(1);
    EXPECT_TRUE(still->originalCurveDirty());
}

}  // namespace
}  // namespace view_test
