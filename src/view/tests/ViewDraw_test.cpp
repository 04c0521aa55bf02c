// The frame: its 1/30 s gate and the one delayed redraw, a frame without a drawable, the order
// in which items are drawn, the overlays, the assets, the colours and the texts.

#include <cstdio>

#include "platform/channels/TQChannelTypes.h"
#include "src/resources/BNImage.h"
#include "src/resources/TQKeyframeImages.h"
#include "src/view/tests/ViewDrawFixture.h"

namespace view_test {
namespace {

using ViewFrameTest = ViewDrawFixture;

TEST_F(ViewFrameTest, displayLayer__twoRequestsInsideTheGapCollapseIntoOneDelayedRedraw) {
    ASSERT_TRUE(frame());
    const int redrawsBefore = viewHost.redrawRequests();

    clock.advance(0.01);
    EXPECT_FALSE(view.displayLayer(&encoder)) << "a frame 10 ms after the last is put off";
    clock.advance(0.01);
    EXPECT_FALSE(view.displayLayer(&encoder));
    ASSERT_EQ(timer.requests().size(), 1u) << "at most one delayed redraw is pending";
    EXPECT_EQ(timer.requests()[0], TQCurveEditorViewBase::kDelayedDisplayNanoseconds);
    EXPECT_EQ(encoder.framesBegun, 1) << "nothing was encoded inside the gap";

    timer.advance(0.034);
    EXPECT_EQ(viewHost.redrawRequests(), redrawsBefore + 1) << "the delayed request asks the host once";
    EXPECT_TRUE(view.displayLayer(&encoder)) << "the delayed frame runs";
    EXPECT_EQ(encoder.framesBegun, 2);

    // The gate opens anew after a frame: the next early request schedules again.
    clock.advance(0.001);
    EXPECT_FALSE(view.displayLayer(&encoder));
    EXPECT_EQ(timer.requests().size(), 2u);
}

TEST_F(ViewFrameTest, displayLayer__withoutADrawableSkipsTheFrameButRestartsTheGate) {
    encoder.setDrawableAvailable(false);
    EXPECT_FALSE(frame());
    EXPECT_EQ(encoder.framesBegun, 0);
    EXPECT_EQ(view.metalRenderReady(), 0) << "set-up waits for a frame that draws";

    encoder.setDrawableAvailable(true);
    clock.advance(0.01);
    EXPECT_FALSE(view.displayLayer(&encoder)) << "the skipped frame still counts for the gate";
    EXPECT_EQ(timer.requests().size(), 1u);
    EXPECT_FALSE(view.displayLayer(nullptr)) << "a host without an encoder draws nothing";
}

TEST_F(ViewFrameTest, displayLayer__delayedRedrawOfADestroyedViewDoesNothing) {
    auto doomed = std::make_unique<TQCurveEditorViewBase>();
    RWStubViewHost host;
    doomed->setViewHost(&host);
    doomed->setClock(&clock);
    doomed->setTimer(&timer);
    doomed->setCurrentViewVolume(CGRectMake(0, -1, 10, 2));
    clock.advance(1.0);
    ASSERT_TRUE(doomed->displayLayer(&encoder));
    ASSERT_FALSE(doomed->displayLayer(&encoder));
    doomed.reset();
    EXPECT_EQ(timer.advance(0.05), 1u);
    EXPECT_EQ(host.redrawRequests(), 0) << "the block outlived its view and must not call it";
}

TEST_F(ViewFrameTest, frame__clearsToTheBackgroundAndEncodesEveryPrimitiveInOrder) {
    auto a = linearItem("A", {{1.0, 0.0}, {5.0, 0.5}});
    ASSERT_TRUE(frame());
    const GDColor bg = view.backgroundColor();
    EXPECT_EQ(encoder.clearColor, HXD_sRGBA(bg.red, bg.green, bg.blue, bg.alpha));
    EXPECT_EQ(encoder.framesEnded, 1);
    ASSERT_EQ(encoder.entries.size(), view.primitives().size());
    for (size_t i = 0; i < encoder.entries.size(); ++i)
        EXPECT_EQ(encoder.entries[i].primitive, view.primitives()[i].get()) << "primitive " << i << " out of order";
    EXPECT_EQ(view.encoder(), nullptr) << "the encoder is the frame's only";
    EXPECT_EQ(view.currentTexture(), nullptr);
    EXPECT_EQ(view.keypointsPrimitives().at(a->channelId()).size(), 2u);

    // The next frame starts from empty lists.
    ASSERT_TRUE(frame());
    EXPECT_EQ(view.keypointsPrimitives().at(a->channelId()).size(), 2u) << "last frame's quads were not emptied";
    EXPECT_EQ(curvePieces(a).size(), 3u);
}

TEST_F(ViewFrameTest, drawCurveEditor__drawsFromLastToFirstWithThePrimaryChannelOnTop) {
    auto a = linearItem("A", {{1.0, 0.0}, {5.0, 0.5}});
    auto b = linearItem("B", {{1.0, 0.1}, {5.0, 0.6}});
    auto c = linearItem("C", {{1.0, 0.2}, {5.0, 0.7}});
    auto hidden = linearItem("Hidden", {{1.0, 0.3}, {5.0, 0.8}});
    hidden->enableItem(0);
    b->select(1);  // the first selected, enabled item: the primary channel

    ASSERT_TRUE(frame());
    std::vector<int64_t> order;
    for (const auto& p : view.selectionPrimitives())
        if (p->hitInfo().hitID() == TQSelectionCurve && (order.empty() || order.back() != idOf(*p)))
            order.push_back(idOf(*p));
    const std::vector<int64_t> expected = {c->channelId(), a->channelId(), b->channelId()};
    EXPECT_EQ(order, expected) << "C and A in reverse order, B last; the disabled item is not drawn";
}

TEST_F(ViewFrameTest, drawCurveEditor__fitsTheVerticalMappingOfNewItems) {
    view.setGridSpacingY(25.0);
    TQChannel* flat = addChannel("Zero", {});
    flat->setInitialValue(0.0);
    auto item = addItem(flat);
    ASSERT_TRUE(frame());
    EXPECT_FALSE(item->updateScale()) << "the frame runs the tick pass";
    EXPECT_NEAR(item->scaleY(), 1.0, kValueTolerance);
    EXPECT_NEAR(item->offsetY(), 0.0, kValueTolerance) << "a flat curve at 0 keeps offset 0";
}

TEST_F(ViewFrameTest, drawOverlays__rubberBandIsATranslucentFillAndAClosedOutline) {
    view.setSelecting(1);
    view.setSelectionViewVolume(CGRectMake(1.0, -0.5, 2.0, 0.75));
    ASSERT_TRUE(frame());

    ASSERT_EQ(encoder.count(HXDRecordingEncoder::Kind::ScreenspaceQuad), 1u);
    ASSERT_EQ(encoder.count(HXDRecordingEncoder::Kind::Multiline), 1u);
    const auto* fill = dynamic_cast<const HXDScreenspaceQuad*>(view.primitives()[0].get());
    const auto* edge = dynamic_cast<const HXDMultiline*>(view.primitives()[1].get());
    ASSERT_TRUE(fill && edge) << "the fill is drawn under its outline";
    const GDColor c = view.selectionColor();
    EXPECT_EQ(fill->color(), HXD_sRGBA(c.red, c.green, c.blue, 0.25f));
    EXPECT_EQ(fill->hitInfo().hitID(), 0u);
    EXPECT_TRUE(edge->loop());
    EXPECT_FALSE(edge->antialiased());
    EXPECT_EQ(edge->numberOfRuns(), 1u) << "four chained segments make one run";
    EXPECT_EQ(edge->vertices().front().start, (HXDFloat3{1.0f, -0.5f, 0.0f}));
    EXPECT_TRUE(view.selectionPrimitives().empty()) << "the band is never picked";

    view.setSelecting(0);
    ASSERT_TRUE(frame());
    EXPECT_TRUE(view.primitives().empty());
}

TEST_F(ViewFrameTest, setupMetalRender__loadsEveryImageOnceAtTheBackingScale) {
    viewHost.setBackingScaleFactor(2.0);
    view.viewDidChangeBackingProperties();
    ASSERT_TRUE(frame());
    ASSERT_EQ(view.metalRenderReady(), 1);

    for (uint32_t c = 0; c < 8; ++c)
        for (uint32_t state = 0; state < 4; ++state)
            for (uint32_t selected = 0; selected < 2; ++selected) {
                const KeyframeAsset& asset = view.keyframeAsset(c, state, selected);
                ASSERT_TRUE(asset.texture) << "colour " << c << " state " << state << " selected " << selected;
                auto image = BNImageForResource(TQKeyframeImages::imageName(c, state, selected != 0), 2.0);
                EXPECT_EQ(asset.texture->width(), static_cast<uint32_t>(image->pixelsWide()))
                    << "the @2x file at a backing scale of 2";
                EXPECT_EQ(asset.size, image->size()) << "sizes are in points";
            }
    EXPECT_EQ(view.keyframeAsset(0, 1, 1).texture, view.keyframeAsset(7, 1, 1).texture)
        << "the selected images are one texture for every colour";
    EXPECT_NE(view.keyframeAsset(0, 0, 0).texture, view.keyframeAsset(1, 0, 0).texture);
    EXPECT_TRUE(view.tangentAsset().texture);
    EXPECT_FALSE(view.keyframeAsset(8, 0, 0).texture) << "out of range answers an empty asset";
}

TEST_F(ViewFrameTest, colours__curveColoursByIndexAndTheNamedOnes) {
    EXPECT_EQ(view.curveColor(2), GDColor::curveColor2());
    EXPECT_FALSE(view.curveColor(8).has_value()) << "no curve colour above 7";
    EXPECT_EQ(TQCurveEditorViewBase::getColorForIndex(7), GDColor::curveColor7());
    EXPECT_EQ(TQCurveEditorViewBase::getColorForIndex(9), GDColor::curveColor1()) << "wraps, never reads past";
    EXPECT_EQ(view.endpointsColor().alpha, 0.15f);
    EXPECT_NEAR(view.gridColor().red, 45.0 / 255.0, 1e-6);
    EXPECT_EQ(view.textAttribs().fontSize, 8.0f);
}

TEST_F(ViewFrameTest, getScale__decibelsForAmplitudesAndTwoDecimalsOtherwise) {
    auto plain = addItem(addChannel("Plain", {{0.0, 1.0}}));
    EXPECT_EQ(view.getScale(plain.get(), 3.14159), "3.14");
    EXPECT_EQ(view.getScale(plain.get(), -0.5), "-0.50");

    auto* gain = static_cast<TQChannel*>(object->addChild(std::make_unique<TQChannelDecibel>("Gain", nextChannelId++)));
    auto decibels = addItem(gain);
    EXPECT_EQ(view.getScale(decibels.get(), 10.0), "20") << "amplitude 10 is 20 dB";
    EXPECT_EQ(view.getScale(decibels.get(), 1.0), "0");

    EXPECT_FALSE(view.getScale(nullptr, 1.0).has_value());
    object->removeChild(gain);
    EXPECT_FALSE(view.getScale(decibels.get(), 1.0).has_value()) << "an item whose channel is gone";
}

TEST_F(ViewFrameTest, getCoordinates__formatsTimeThenValue) {
    EXPECT_EQ(view.getCoordinates(nullptr, seconds(1.5), 0.25), "(1.500 s, 0.250)");
}

TEST_F(ViewFrameTest, metalPrint__placesTextOnAWholePixelNudgedByTheZoom) {
    ASSERT_TRUE(frame());
    view.metalPrint("label", CGPointMake(2.0, 0.0));
    const auto* text = dynamic_cast<const HXDText*>(view.primitives().back().get());
    ASSERT_NE(text, nullptr);
    EXPECT_EQ(text->string(), "label");
    EXPECT_EQ(text->attributes(), view.textAttribs());
    // (2, 0) + (1, 1) world units (minDeltaU 1 at zoom 1), then onto the pixel grid.
    const CGPoint pixel = view.getPointScreen(text->position());
    EXPECT_NEAR(pixel.x, std::round(pixel.x), kPixelTolerance);
    EXPECT_NEAR(pixel.y, std::round(pixel.y), kPixelTolerance);
    EXPECT_NEAR(text->position().x, 3.0, 0.5 * 10.0 / 800.0);
    EXPECT_NEAR(text->position().y, 1.0, 0.5 * 2.0 / 400.0);
}

}  // namespace
}  // namespace view_test
