// The view volume: conversions through the last frame, zoom, pan, the wheel, auto-zoom,
// framing and the resets, with the words they post.

#include <cmath>

#include "src/view/tests/ViewFixture.h"

namespace view_test {
namespace {

class ViewMappingTest : public ViewFixture {};

TEST_F(ViewMappingTest, getPointScreen__mapsTheVolumeOntoDrawablePixels) {
    const CGPoint centre = view.getPointScreen(CGPointMake(5.0, 0.0));
    EXPECT_NEAR(centre.x, 400.0, kPixelTolerance);
    EXPECT_NEAR(centre.y, 200.0, kPixelTolerance);
    const CGPoint corner = view.getPointWorld(CGPointMake(800.0, 400.0));
    EXPECT_NEAR(corner.x, 10.0, kWorldTolerance);
    EXPECT_NEAR(corner.y, 1.0, kWorldTolerance);
    const CGPoint size = view.getSizeWorld(CGPointMake(80.0, 40.0));
    EXPECT_NEAR(size.x, 1.0, kWorldTolerance);
    EXPECT_NEAR(size.y, 0.2, kWorldTolerance);
    {
        // 5.0031 s lies at 400.248 px: it snaps back to the pixel at 400.
        const CGPoint snapped = view.adjustWorldPointToScreen(CGPointMake(5.0031, 0.0));
        EXPECT_NEAR(snapped.x, 5.0, kWorldTolerance)
            << "the point must move onto the nearest pixel";
    }
    {
        // Drawable pixels, not points: twice as many at a backing scale of 2.
        viewHost.setBackingScaleFactor(2.0);
        view.viewDidChangeBackingProperties();
        const CGPoint scaled = view.getPointScreen(CGPointMake(5.0, 0.0));
        EXPECT_NEAR(scaled.x, 800.0, kPixelTolerance);
        EXPECT_NEAR(scaled.y, 400.0, kPixelTolerance);
    }
}

TEST_F(ViewMappingTest, conversions__answerForTheLastFrameUntilTheNextDraw) {
    view.zoomWithFactor(1.0, 2.0);  // height 1, about the centre
    const CGPoint before = view.getPointScreen(CGPointMake(5.0, 0.5));
    EXPECT_NEAR(before.y, 300.0, kPixelTolerance) << "the zoom must not show before it is drawn";
    view.drawProjection();
    const CGPoint after = view.getPointScreen(CGPointMake(5.0, 0.5));
    EXPECT_NEAR(after.y, 400.0, kPixelTolerance);
}

TEST_F(ViewMappingTest, conversions__beforeTheFirstFrameAreNotNumbers) {
    TQCurveEditorViewBase fresh;
    fresh.setViewHost(&viewHost);
    fresh.setCurrentViewVolume(CGRectMake(0, 0, 1, 1));
    EXPECT_TRUE(std::isnan(fresh.getPointWorld(CGPointMake(10, 10)).x));
    EXPECT_TRUE(std::isnan(fresh.getPointScreen(CGPointMake(0.5, 0.5)).y));
    EXPECT_TRUE(std::isnan(fresh.adjustWorldPointToScreen(CGPointMake(0.5, 0.5)).x))
        << "snapping a NaN pixel must neither crash nor invent a number";
}

class ViewZoomTest : public ViewFixture {};

TEST_F(ViewZoomTest, zoomWithFactor__clampsTheVerticalFactorAndLeavesFactorOneAlone) {
    {
        view.zoomWithFactor(1.0, 1000.0);
        EXPECT_DOUBLE_EQ(view.zoomY(), 128.0);
        EXPECT_DOUBLE_EQ(view.getCurrentViewVolume().size.height, 2.0 / 128.0);
        EXPECT_DOUBLE_EQ(view.gridZoomY(), 1.0 / 128.0);
        EXPECT_EQ(range().originRequests, 0) << "a factor of 1 leaves the time axis alone";
    }
    {
        view.zoomWithFactor(1.0, 0.001);
        EXPECT_DOUBLE_EQ(view.zoomY(), 0.0078125);
        EXPECT_DOUBLE_EQ(view.gridZoomY(), 128.0);
        EXPECT_NEAR(
            view.getCurrentViewVolume().origin.y + view.getCurrentViewVolume().size.height * 0.5,
            0.0, kValueTolerance)
            << "the vertical zoom is about the centre";
    }
    {
        view.zoomWithFactor(2.0, 1.0);
        expectRectNear(view.getCurrentViewVolume(), CGRectMake(2.5, -128.0, 5.0, 256.0),
                       kWorldTolerance, "x zoom by 2 about the reference centre");
        EXPECT_NEAR(view.zoomX(), 2.0, kWorldTolerance);
    }
    EXPECT_EQ(postedWords(), (std::vector<TQNotificationWord>(3, kTQNotifyViewVolumeChanged)));
}

TEST_F(ViewZoomTest, zoom__keepsTheAnchorUnderThePointerAndRoundTrips) {
    const CGPoint anchorPixel = CGPointMake(200.0, 100.0);
    view.setMouseOrigin(anchorPixel);
    const CGPoint anchor = view.getPointWorld(anchorPixel);

    view.zoom(40.0, -40.0);  // wider in time, taller in value
    view.drawProjection();
    const CGRect& v = view.getCurrentViewVolume();
    EXPECT_NEAR(v.size.width, 10.0 / 1.1, kWorldTolerance);
    EXPECT_NEAR(v.size.height, 2.0 / 1.2, kWorldTolerance);
    EXPECT_NEAR(view.zoomY(), 1.2, kWorldTolerance);
    EXPECT_DOUBLE_EQ(view.gridZoomY(), 1.0);
    const CGPoint anchorAfter = view.getPointScreen(anchor);
    EXPECT_NEAR(anchorAfter.x, anchorPixel.x, kPixelTolerance)
        << "the anchor must stay under the pointer";
    EXPECT_NEAR(anchorAfter.y, anchorPixel.y, kPixelTolerance);
    for (const CGPoint p : {CGPointMake(0, 0), CGPointMake(123.5, 377.25), CGPointMake(800, 400)}) {
        const CGPoint back = view.getPointScreen(view.getPointWorld(p));
        EXPECT_NEAR(back.x, p.x, kPixelTolerance) << "screen -> world -> screen at " << p.x;
        EXPECT_NEAR(back.y, p.y, kPixelTolerance) << "screen -> world -> screen at " << p.y;
    }
    EXPECT_EQ(range().volumeChanges, 1);
    EXPECT_EQ(postedWords(), std::vector<TQNotificationWord>{kTQNotifyViewVolumeChanged});
}

TEST_F(ViewZoomTest, zoom__pastTheLimitKeepsTheHeightAndTheAnchorFraction) {
    view.zoomWithFactor(1.0, 100.0);
    view.drawProjection();
    const CGRect before = view.getCurrentViewVolume();
    view.setMouseOrigin(CGPointMake(200.0, 100.0));

    view.zoom(0.0, -200.0);  // would take the factor to 200
    EXPECT_DOUBLE_EQ(view.zoomY(), 128.0);
    EXPECT_DOUBLE_EQ(view.gridZoomY(), 1.0 / 128.0);
    EXPECT_NEAR(view.getCurrentViewVolume().size.height, before.size.height, kValueTolerance);
    EXPECT_NEAR(view.getCurrentViewVolume().origin.y, before.origin.y, kWorldTolerance)
        << "the anchor keeps its fraction of the unchanged height";
}

class ViewPanTest : public ViewFixture {
protected:
    void startAt(double x) {
        const CMTime start = seconds(x);
        view.setDisplayRange(&start, nullptr);
        CGRect v = view.getCurrentViewVolume();
        v.origin.x = x;
        view.setCurrentViewVolume(v);
        view.drawProjection();
    }
};

TEST_F(ViewPanTest, pan__roundTripsBetweenScreenAndWorld) {
    startAt(2.0);
    view.pan(-80.0, -40.0);  // content moves left and down: the view goes right and up
    expectRectNear(view.getCurrentViewVolume(), CGRectMake(3.0, -1.2, 10.0, 2.0), kWorldTolerance,
                   "first pan");
    view.drawProjection();
    view.pan(80.0, 40.0);
    expectRectNear(view.getCurrentViewVolume(), CGRectMake(2.0, -1.0, 10.0, 2.0), kWorldTolerance,
                   "panning back returns to the start");
    EXPECT_EQ(range().offsets.size(), 2u);
}

TEST_F(ViewPanTest, pan__thatWouldReachTimeZeroChangesOnlyY) {
    startAt(0.0);
    view.pan(80.0, 40.0);
    expectRectNear(view.getCurrentViewVolume(), CGRectMake(0.0, -0.8, 10.0, 2.0), kWorldTolerance,
                   "the horizontal part is dropped");
    EXPECT_TRUE(range().offsets.empty()) << "the controller must not be asked to go below zero";
    EXPECT_EQ(postedWords(), std::vector<TQNotificationWord>{kTQNotifyViewVolumeChanged});
}

TEST_F(ViewPanTest, scrollWheel__foldsQueuedWheelEventsIntoOnePan) {
    for (int i = 0; i < 3; ++i) viewHost.queueEvent(RWEvent::scrollWheelEvent(0.0, 1.0));
    viewHost.queueEvent(RWEvent::keyEvent(RWEventType::KeyDown, "x"));

    view.scrollWheel(RWEvent::scrollWheelEvent(0.0, 1.0));
    // Four events of 1 line each, four pixels a line: 16 px of a 400 px, 2-unit view.
    EXPECT_NEAR(view.getCurrentViewVolume().origin.y, -1.0 + 0.08, kWorldTolerance);
    EXPECT_EQ(range().panned, std::vector<double>{8.0})
        << "one scroller update for the whole batch";
    EXPECT_EQ(postedWords(), (std::vector<TQNotificationWord>{kTQNotifyViewVolumeChanged,
                                                              kTQNotifyChannelsChanging}));
    EXPECT_EQ(viewHost.queuedCount(), 1u) << "only wheel events are taken off the queue";
}

TEST_F(ViewPanTest, setVerticalZoom__withZoomOneShowsTheWholeRangeWhateverThePercentage) {
    TQChannel* c = addChannel("A", {{1.0, -3.0}, {2.0, 5.0}});
    addItem(c);
    view.computeVerticalTickMarks();
    for (double p : {0.0, 0.3, 1.0}) {
        // The range grows with the view's padding, so it is taken anew before each call.
        const CGRect max = ctrl().getMaxViewVolume();
        view.setVerticalZoom(1.0, p);
        EXPECT_DOUBLE_EQ(view.getCurrentViewVolume().origin.y, max.origin.y) << "p = " << p;
        EXPECT_DOUBLE_EQ(view.getCurrentViewVolume().size.height, max.size.height) << "p = " << p;
    }
    const CGRect max = ctrl().getMaxViewVolume();
    view.setVerticalZoom(0.5, 0.0);
    EXPECT_DOUBLE_EQ(view.getCurrentViewVolume().origin.y + view.getCurrentViewVolume().size.height,
                     max.origin.y + max.size.height)
        << "p = 0 is the top of the range";
    EXPECT_DOUBLE_EQ(view.zoomY(), 1.0) << "the scroller does not touch the zoom factor";
}

class ViewFramingTest : public ViewFixture {
protected:
    TQCurveEditorChannelItemPtr enabledItem(TQChannel* channel) {
        auto item = addItem(channel);
        item->enableItem(1);
        view.computeVerticalTickMarks();  // as the draw pass does: the item gets its mapping
        return item;
    }
};

TEST_F(ViewFramingTest, frameAll__onCurvesWithOneKeypointFallsBackToTheDisplayRange) {
    enabledItem(addChannel("A", {{2.0, 3.0}}));
    enabledItem(addChannel("B", {{2.0, 5.0}}));
    view.zoomWithFactor(1.0, 4.0);
    recorder.clearCalls();

    view.frameAll(1);
    // Both keypoints at 2 s: the display range 0..10 widened by 5 percent on each side.
    expectRectNear(view.getCurrentViewVolume(), CGRectMake(-0.5, 2.9, 11.0, 2.2), kWorldTolerance,
                   "framed volume");
    EXPECT_NEAR(view.zoomX(), 10.0 / 11.0, kWorldTolerance);
    EXPECT_DOUBLE_EQ(view.zoomY(), 1.0) << "the factor is taken before the padding";
    EXPECT_EQ(postedWords(), std::vector<TQNotificationWord>{kTQNotifyViewVolumeChanged});
    EXPECT_GE(viewHost.redrawRequests(), 1);
}

TEST_F(ViewFramingTest, frameAll__spansTheKeypointsOfEnabledItemsWithTheirTimeOffset) {
    enabledItem(addChannel("A", {{1.0, 0.0}, {2.0, 1.0}}));
    enabledItem(addChannel("B", {{3.0, 0.0}}));
    addItem(addChannel("Disabled", {{9.0, 0.0}}))->enableItem(0);  // not framed

    view.frameAll(1);
    expectRectNear(view.getCurrentViewVolume(), CGRectMake(0.9, -0.05, 2.2, 1.1), kWorldTolerance,
                   "framed volume");
}

TEST_F(ViewFramingTest, frameAll__withOneFlatCurveNeverChangesTheHeight) {
    enabledItem(addChannel("Flat", {{1.0, 0.5}, {4.0, 0.5}}));
    view.frameAll(0);
    // Flat: the value 0.5 lies inside the horizontal edges 0..10, so nothing moves.
    expectRectNear(view.getCurrentViewVolume(), CGRectMake(0.0, -1.0, 10.0, 2.0), kWorldTolerance,
                   "flat curve");
}

TEST_F(ViewFramingTest, performAutoZoom__onlyWhenDueOrForced) {
    enabledItem(addChannel("A", {{1.0, 0.0}, {2.0, 100.0}}));
    const CGRect before = view.getCurrentViewVolume();
    const int changesBefore = range().volumeChanges;
    view.performAutoZoom(false);
    EXPECT_EQ(view.getCurrentViewVolume(), before) << "not due, not forced: nothing changes";
    EXPECT_EQ(range().volumeChanges, changesBefore);

    view.setNeedsAutoZoom(1);
    view.performAutoZoom(false);
    EXPECT_EQ(view.needsAutoZoom(), 0);
    // 0..100 would need a factor of 1/50; the limit 1/128 is not reached.
    EXPECT_NEAR(view.zoomY(), 0.02, kValueTolerance);
    EXPECT_DOUBLE_EQ(view.gridZoomY(), 32.0);
    expectRectNear(view.getCurrentViewVolume(), CGRectMake(0.0, -5.0, 10.0, 110.0), kWorldTolerance,
                   "padded fit");
    EXPECT_TRUE(postedWords().empty()) << "the draw pass calls it: no word";
}

TEST_F(ViewFramingTest, resets__restoreTheReferenceVolumeAndPostOnce) {
    view.zoomWithFactor(2.0, 4.0);
    view.drawProjection();
    view.pan(-80.0, -40.0);
    recorder.clearCalls();

    view.resetZoom();
    expectRectNear(view.getCurrentViewVolume(), view.getOriginalViewVolume(), kWorldTolerance,
                   "reset zoom");
    EXPECT_DOUBLE_EQ(view.zoomX(), 1.0);
    EXPECT_DOUBLE_EQ(view.zoomY(), 1.0);
    EXPECT_EQ(postedWords(), std::vector<TQNotificationWord>{kTQNotifyViewVolumeChanged});
}

TEST_F(ViewFramingTest, currentToolChanged__forgetsTheBoxAndPostsTheToolWord) {
    viewHost.resetRedrawRequests();
    ctrl().setCurrentTool(TQTool::kBox);
    EXPECT_EQ(view.fourCornerBoxInitialized(), 0);
    EXPECT_EQ(postedWords(), std::vector<TQNotificationWord>{kTQNotifyToolChangedWord});
    EXPECT_EQ(viewHost.redrawRequests(), 1);
}

TEST_F(ViewFramingTest, destruction__detachesTheViewFromItsController) {
    auto doomed = std::make_unique<TQCurveEditorViewBase>();
    doomed->setController(&ctrl());
    ctrl().setView(doomed.get());
    doomed.reset();
    EXPECT_EQ(ctrl().getView(), nullptr) << "the controller must not keep a dangling view";
    ctrl().setView(&view);
}

}  // namespace
}  // namespace view_test
