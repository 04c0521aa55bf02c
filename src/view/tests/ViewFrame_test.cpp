// Frames: what each draws, against recorded baselines (see ViewFixture), and the frame's own
// rules: the 1/30 s gate and its one delayed redraw, the skipped frame, the images at the
// backing scale, the fitting of a flat curve, value texts and which curves are fetched again.

#include <algorithm>

#include "platform/channels/TQChannelTypes.h"
#include "src/resources/BNImage.h"
#include "src/resources/TQKeyframeImages.h"
#include "src/view/tests/ViewFixture.h"

namespace view_test {
namespace {

class ViewFrame : public ViewFixture {};

// Items drawn from the last to the first with the primary one on top, a disabled one not at
// all, a channel that takes no keypoints without them; the ends dimmed and stippled; a curve
// that starts after the view puts every sample in its first piece.
TEST_F(ViewFrame, frame__order_pieces_and_dimmed_ends) {
    build(
        "A: 2=0/1 6=0.5/1; B: 1=0.1/1 5=0.6/1; C: 20=0/1 30=1/1; Hidden: 1=0.3/1 5=0.8/1; "
        "Still: 3=-0.5/1 7=-0.5/1");
    item("Hidden")->enableItem(0);
    item("Still")->channel()->setAnimationEnabled(false);
    item("B")->select(1);
    ASSERT_TRUE(frame());
    EXPECT_TRUE(frameMatches("frame-order-and-ends"));
    ASSERT_EQ(encoder.entries.size(), view.primitives().size());
    for (size_t i = 0; i < encoder.entries.size(); ++i)
        ASSERT_EQ(encoder.entries[i].primitive, view.primitives()[i].get()) << "out of order";
    const GDColor bg = view.backgroundColor();
    EXPECT_EQ(encoder.clearColor, HXD_sRGBA(bg.red, bg.green, bg.blue, bg.alpha));
    ASSERT_TRUE(frame());
    EXPECT_EQ(view.keypointsPrimitives().at(item("A")->channelId()).size(), 2u)
        << "each frame starts from empty lists";
}

// Each keypoint state shows its image; handles only on selected, enabled keypoints, none that
// lies on its keypoint, lines stopping short of the keypoint; the primary keypoint's value
// label, moved back inside near the top right corner; a mapping of its own, which the frame
// keeps: V = (value * 2 + 0.4) / 1; a locked channel shows no handles.
TEST_F(ViewFrame, frame__keypoint_states_handles_and_label) {
    build(
        "States: 1=0/1! 2=0/1! 3=0/1L 4=0/1L 5=0/1 6=0/1; Bezier: 1=-0.5(-1,-0.25|2,0.5)b "
        "5=-0.5(-1,-0.25|2,0.5)b 8=-0.5(-0.01,-0.001|2,0.5)b 9=-0.5(0,0.2|0,-0.2)b; "
        "Corner: 1=0/1 9.95=0.98/1");
    select("Corner@9.95 States@1 States@3 States@5 Bezier@5 Bezier@8 Bezier@9");
    view.setPrintText(1);
    item("States")->setScaleY(0.5);
    item("States")->setOffsetY(-0.2);
    item("States")->setUpdateScale(0);
    ASSERT_TRUE(frame());
    EXPECT_TRUE(frameMatches("frame-keypoints"));
    item("Bezier")->channel()->setLocked(true);
    ASSERT_TRUE(frame());
    EXPECT_EQ(frameText().find("image tangent"), std::string::npos);
}

// A drag's ghost (only of a curve selected in the list), the processed curve hidden while the
// mouse is down and back after, then the rubber band.
TEST_F(ViewFrame, frame__ghost_processed_curve_and_band) {
    build("Ramp: 2=0/1 6=0.5/1; Other: 2=0.2/1 6=0.7/1");
    item("Ramp")->channel()->addBehavior(std::make_unique<TQOscillateBehavior>(0.1, 1.0, 0.0));
    item("Ramp")->setDrawProcessedCurve(1);
    item("Ramp")->setNumberOfProcessedSamples(100);
    item("Ramp")->setProcessedCurveDirty(1);
    item("Ramp")->select(1);
    ASSERT_TRUE(frame());
    gesture("d 6 .5|m 6.5 .7");
    ASSERT_TRUE(frame());
    const std::string dragged = frameText() + "--\n";
    gesture("u 6.5 .7");
    ASSERT_TRUE(frame());
    gesture("d 1 .9|m 3 .6");
    ASSERT_TRUE(frame());
    EXPECT_TRUE(frameMatches("frame-gesture", dragged));
    gesture("u 3 .6");
}

// Selected keypoints are merged into a coarse sampling, once each.
TEST_F(ViewFrame, frame__selected_keypoints_join_a_coarse_line) {
    build("Coarse: 0=0/1 1=1/1 4=4/1");
    ASSERT_TRUE(frame());
    const auto coarse = item("Coarse");
    coarse->setNumberOfSamples(5);
    coarse->refreshOriginalCurve(seconds(0.0), seconds(2.5));
    auto u = std::make_unique<CMTime[]>(5);
    auto v = std::make_unique<double[]>(5);
    for (int i = 0; i < 5; ++i) u[i] = seconds(2.5 * i), v[i] = std::min(2.5 * i, 4.0);
    coarse->setSamplesU(std::move(u), 5);
    coarse->setSamplesV(std::move(v), 5);
    select("Coarse@0 Coarse@1");
    ASSERT_TRUE(frame());
    EXPECT_TRUE(frameMatches("frame-coarse"));
}

TEST_F(ViewFrame, frame__backing_scale_two_doubles_images_and_keeps_thin_lines) {
    build("Ramp: 2=0/1 6=0.5/1");
    viewHost.setBackingScaleFactor(2.0);
    view.viewDidChangeBackingProperties();
    HXDRecordingEncoder retina(1600, 800);
    clock.advance(1.0);
    ASSERT_TRUE(view.displayLayer(&retina));
    EXPECT_TRUE(frameMatches("frame-retina"));
    for (uint32_t k = 0; k < 8 * 4 * 2; ++k) {
        const KeyframeAsset& asset = view.keyframeAsset(k / 8, k / 2 % 4, k % 2);
        auto image = BNImageForResource(TQKeyframeImages::imageName(k / 8, k / 2 % 4, k % 2), 2.0);
        ASSERT_TRUE(asset.texture && image) << k;
        EXPECT_EQ(asset.texture->width(), static_cast<uint32_t>(image->pixelsWide())) << k;
        EXPECT_EQ(asset.size, image->size()) << "sizes are in points";
    }
}

// Keypoint quads are refilled from frame to frame: each frame's show where their keyframes are
// now and which keyframes they are (the baseline); a quad still held from an earlier frame (as
// a hit record holds it) stays as it was; a channel that no longer shows keypoints has no list.
TEST_F(ViewFrame, frame__kept_keypoint_quads_follow_their_keyframes) {
    build("A: 2=0/1 6=0.5/1; B: 1=0.1/1 5=0.6/1");
    ASSERT_TRUE(frame());
    const uint32_t a = item("A")->channelId();
    const std::shared_ptr<HXDDrawPrimitive> held = view.keypointsPrimitives().at(a).back();
    const CGRect heldRect = static_cast<const HXDQuadTexture&>(*held).destinationRect();
    item("A")->channel()->setKeyframe(seconds(6.0), -0.25);
    item("A")->channel()->setKeyframe(seconds(4.0), 0.75);
    item("B")->enableItem(0);
    view.setAllOriginalCurveDirty(1);
    ASSERT_TRUE(frame());
    EXPECT_TRUE(frameMatches("frame-kept"));
    EXPECT_FALSE(view.keypointsPrimitives().contains(item("B")->channelId()));
    const HXDPrimitiveArray& quads = view.keypointsPrimitives().at(a);
    EXPECT_EQ(quads.size(), 3u);
    EXPECT_EQ(std::find(quads.begin(), quads.end(), held), quads.end())
        << "a held quad is not refilled";
    EXPECT_EQ(static_cast<const HXDQuadTexture&>(*held).destinationRect(), heldRect);
}

// A redraw put off by the 1/30 s gate, for a view that goes before it is due.
TEST_F(ViewFrame, displayLayer__a_dead_view_is_not_called) {
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

// Value texts by channel type; a flat curve at zero fitted to offset zero by the frame's tick
// pass; only curves the host reports changed are fetched again.
TEST_F(ViewFrame, values_fitting_and_refetching) {
    build("Plain: 0=1; Zero: ; Changed: 1=0/1 5=0.5/1");
    EXPECT_EQ(view.getScale(item("Plain").get(), 3.14159), "3.14");
    auto decibels = addItem(static_cast<TQChannel*>(
        object->addChild(std::make_unique<TQChannelDecibel>("Gain", nextChannelId++))));
    EXPECT_EQ(view.getScale(decibels.get(), 10.0), "20") << "amplitude 10 is 20 dB";
    object->removeChild(decibels->channel());
    EXPECT_FALSE(view.getScale(decibels.get(), 1.0).has_value()) << "its channel is gone";
    EXPECT_EQ(view.getCoordinates(nullptr, seconds(1.5), 0.25), "(1.500 s, 0.250)");
    view.setGridSpacingY(25.0);
    item("Zero")->setUpdateScale(1);
    item("Zero")->setScaleY(3.0);
    ASSERT_TRUE(frame());
    EXPECT_EQ(std::tuple(item("Zero")->scaleY(), item("Zero")->offsetY(),
                         bool(item("Zero")->updateScale())),
              std::tuple(1.0, 0.0, false));
    recorder.answers.modified = {item("Changed")->channel()};
    view.setVisibleOriginalCurveDirty(1);
    EXPECT_TRUE(item("Changed")->originalCurveDirty() && !item("Plain")->originalCurveDirty())
        << "an unchanged curve keeps its samples";
    view.setAllOriginalCurveDirty(1);
    EXPECT_TRUE(item("Plain")->originalCurveDirty());
}

}  // namespace
}  // namespace view_test
