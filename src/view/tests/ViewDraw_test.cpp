// The frame: its 1/30 s gate and the one delayed redraw, a frame without a drawable, the order
// in which items are drawn, the assets, and the value texts.

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
    EXPECT_EQ(viewHost.redrawRequests(), redrawsBefore + 1)
        << "the delayed request asks the host once";
    EXPECT_TRUE(view.displayLayer(&encoder));
    clock.advance(0.001);
    EXPECT_FALSE(view.displayLayer(&encoder));
    EXPECT_EQ(timer.requests().size(), 2u)
        << "after a frame the next early request schedules again";
}

TEST_F(ViewFrameTest, displayLayer__withoutADrawableSkipsTheFrameButRestartsTheGate) {
    encoder.setDrawableAvailable(false);
    EXPECT_FALSE(frame());
    EXPECT_EQ(encoder.framesBegun, 0);
    encoder.setDrawableAvailable(true);
    clock.advance(0.01);
    EXPECT_FALSE(view.displayLayer(&encoder)) << "the skipped frame still counts for the gate";
    EXPECT_EQ(timer.requests().size(), 1u);
}

TEST_F(ViewFrameTest, displayLayer__delayedRedrawOfADestroyedViewDoesNothing) {
    auto doomed = std::make_unique<TQCurveEditorViewBase>();
    RWStubViewHost host;
    doomed->setViewHost(&host);
    doomed->setClock(&clock);
    doomed->setTimer(&timer);
    clock.advance(1.0);
    ASSERT_TRUE(doomed->displayLayer(&encoder));
    ASSERT_FALSE(doomed->displayLayer(&encoder));
    doomed.reset();
    EXPECT_EQ(timer.advance(0.05), 1u);
    EXPECT_EQ(host.redrawRequests(), 0) << "the block outlived its view and must not call it";
}

TEST_F(ViewFrameTest, drawCurveEditor__drawsFromLastToFirstWithThePrimaryChannelOnTop) {
    auto a = linearItem("A", {{1.0, 0.0}, {5.0, 0.5}});
    auto b = linearItem("B", {{1.0, 0.1}, {5.0, 0.6}});
    auto c = linearItem("C", {{1.0, 0.2}, {5.0, 0.7}});
    linearItem("Hidden", {{1.0, 0.3}, {5.0, 0.8}})->enableItem(0);
    b->select(1);  // the first selected, enabled item: the primary channel
    ASSERT_TRUE(frame());

    std::vector<int64_t> order;
    for (const auto& p : view.selectionPrimitives())
        if (p->hitInfo().hitID() == TQSelectionCurve && (order.empty() || order.back() != idOf(*p)))
            order.push_back(idOf(*p));
    const std::vector<int64_t> expected = {c->channelId(), a->channelId(), b->channelId()};
    EXPECT_EQ(order, expected)
        << "C and A in reverse order, B last; the disabled item is not drawn";

    ASSERT_EQ(encoder.entries.size(), view.primitives().size());
    for (size_t i = 0; i < encoder.entries.size(); ++i)
        ASSERT_EQ(encoder.entries[i].primitive, view.primitives()[i].get())
            << "primitive " << i << " out of order";
    const GDColor bg = view.backgroundColor();
    EXPECT_EQ(encoder.clearColor, HXD_sRGBA(bg.red, bg.green, bg.blue, bg.alpha));
    ASSERT_TRUE(frame());
    EXPECT_EQ(view.keypointsPrimitives().at(a->channelId()).size(), 2u)
        << "each frame starts from empty lists";
}

TEST_F(ViewFrameTest, drawCurveEditor__fitsAFlatCurveAtZeroToOffsetZero) {
    view.setGridSpacingY(25.0);
    TQChannel* flat = addChannel("Zero", {});
    flat->setInitialValue(0.0);
    auto item = addItem(flat);
    ASSERT_TRUE(frame());
    EXPECT_FALSE(item->updateScale()) << "the frame runs the tick pass";
    EXPECT_NEAR(item->scaleY(), 1.0, kValueTolerance);
    EXPECT_NEAR(item->offsetY(), 0.0, kValueTolerance);
}

TEST_F(ViewFrameTest, setupMetalRender__loadsEveryImageAtTheBackingScale) {
    viewHost.setBackingScaleFactor(2.0);
    view.viewDidChangeBackingProperties();
    ASSERT_TRUE(frame());
    for (uint32_t c = 0; c < 8; ++c)
        for (uint32_t state = 0; state < 4; ++state)
            for (uint32_t selected = 0; selected < 2; ++selected) {
                const KeyframeAsset& asset = view.keyframeAsset(c, state, selected);
                auto image =
                    BNImageForResource(TQKeyframeImages::imageName(c, state, selected != 0), 2.0);
                ASSERT_TRUE(asset.texture && image)
                    << "colour " << c << " state " << state << " selected " << selected;
                EXPECT_EQ(asset.texture->width(), static_cast<uint32_t>(image->pixelsWide()))
                    << "the @2x file";
                EXPECT_EQ(asset.size, image->size()) << "sizes are in points";
            }
    EXPECT_EQ(view.keyframeAsset(0, 1, 1).texture, view.keyframeAsset(7, 1, 1).texture)
        << "the selected images are one texture for every colour";
    EXPECT_TRUE(view.tangentAsset().texture);
}

TEST_F(ViewFrameTest, getScaleAndCoordinates__formatValuesByChannelType) {
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

}  // namespace
}  // namespace view_test

namespace view_test {
namespace {

TEST_F(ViewFrameTest, setVisibleOriginalCurveDirty__marksOnlyWhatTheHostReportsChanged) {
    auto changed = linearItem("Changed", {{1.0, 0.0}, {5.0, 0.5}});
    auto still = linearItem("Still", {{1.0, 0.0}, {5.0, 0.5}});
    ASSERT_TRUE(frame());
    ASSERT_FALSE(changed->originalCurveDirty() || still->originalCurveDirty())
        << "a frame caches every curve";
    recorder.answers.modified = {changed->channel()};
    view.setVisibleOriginalCurveDirty(1);
    EXPECT_TRUE(changed->originalCurveDirty());
    EXPECT_FALSE(still->originalCurveDirty()) << "an unchanged curve keeps its samples";
    view.setAllOriginalCurveDirty(1);
    EXPECT_TRUE(still->originalCurveDirty());
}

}  // namespace
}  // namespace view_test
