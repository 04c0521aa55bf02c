// The view volume: conversions through the last frame, zoom, pan, the wheel, auto-zoom,
// framing and the resets, with the words they post.

#include <cmath>
#include <functional>

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

// One operation on the volume from the fixture's 0..10 s by -1..1 on 800 x 400 pixels: the
// volume it leaves (to the projection's precision), the zoom factors, and the words posted.
struct VolumeCase {
    const char* what;
    std::function<void()> run;
    CGRect want;
    double zoomX, zoomY;
    std::vector<TQNotificationWord> words;
};

class ViewVolume : public ViewFixture {
protected:
    // An enabled item with its mapping, as the draw pass leaves it.
    void enabled(const char* name, std::initializer_list<std::pair<double, double>> keys) {
        addItem(addChannel(name, keys))->enableItem(1);
        view.computeVerticalTickMarks();
    }
    void startAt(double x) {
        const CMTime start = seconds(x);
        view.setDisplayRange(&start, nullptr);
        CGRect v = view.getCurrentViewVolume();
        v.origin.x = x;
        view.setCurrentViewVolume(v);
        view.drawProjection();
    }
};

constexpr TQNotificationWord kVolume = kTQNotifyViewVolumeChanged;

TEST_F(ViewVolume, operations__table) {
    const VolumeCase cases[] = {
        {"vertical zoom clamps at 128, about the centre",
         [this] { view.zoomWithFactor(1.0, 1000.0); },
         CGRectMake(0, -1.0 / 128, 10, 2.0 / 128),
         1,
         128,
         {kVolume}},
        {"and at 1/128",
         [this] { view.zoomWithFactor(1.0, 0.001); },
         CGRectMake(0, -128, 10, 256),
         1,
         1.0 / 128,
         {kVolume}},
        {"x zoom about the reference centre",
         [this] { view.zoomWithFactor(2.0, 1.0); },
         CGRectMake(2.5, -1, 5, 2),
         2,
         1,
         {kVolume}},
        // Wider in time, taller in value, about the pointer at (200, 100) px = (2.5, -0.5).
        {"zoom keeps the anchor under the pointer",
         [this] {
             view.setMouseOrigin(CGPointMake(200.0, 100.0));
             view.zoom(40.0, -40.0);
         },
         CGRectMake(2.5 - 2.5 / 1.1, -0.5 - 0.5 / 1.2, 10 / 1.1, 2 / 1.2),
         1.1,
         1.2,
         {kVolume}},
        // The factor would reach 200: the height stays, the anchor keeps its fraction.
        {"zoom past the limit",
         [this] {
             view.zoomWithFactor(1.0, 100.0);
             view.drawProjection();
             view.setMouseOrigin(CGPointMake(200.0, 100.0));
             view.zoom(0.0, -200.0);
         },
         CGRectMake(0, -0.01, 10, 0.02),
         1,
         128,
         {kVolume, kVolume}},
        {"pan and back",
         [this] {
             startAt(2.0);
             view.pan(-80.0, -40.0);
             EXPECT_EQ(view.getCurrentViewVolume().origin.y, -1.2);
             view.drawProjection();
             view.pan(80.0, 40.0);
             EXPECT_EQ(range().offsets, (std::vector<double>{1.0, -1.0}));
         },
         CGRectMake(2, -1, 10, 2),
         1,
         1,
         {kVolume, kVolume}},
        {"a pan that would reach time zero moves only y",
         [this] {
             startAt(0.0);
             view.pan(80.0, 40.0);
             EXPECT_TRUE(range().offsets.empty());
         },
         CGRectMake(0, -0.8, 10, 2),
         1,
         1,
         {kVolume}},
        // Four events of a line, four pixels a line: 16 px of 400; one scroller update.
        {"queued wheel events fold into one pan",
         [this] {
             for (int i = 0; i < 3; ++i) viewHost.queueEvent(RWEvent::scrollWheelEvent(0, 1));
             viewHost.queueEvent(RWEvent::keyEvent(RWEventType::KeyDown, "x"));
             view.scrollWheel(RWEvent::scrollWheelEvent(0.0, 1.0));
             EXPECT_EQ(range().panned, std::vector<double>{8.0});
             EXPECT_EQ(viewHost.queuedCount(), 1u) << "only wheel events are taken";
         },
         CGRectMake(0, -0.92, 10, 2),
         1,
         1,
         {kVolume, kTQNotifyChannelsChanging}},
        // One keypoint each at 2 s: the display range widened by 5 % on each side; the
        // factor is taken before the padding.
        {"frame all on single keypoints",
         [this] {
             enabled("A", {{2.0, 3.0}});
             enabled("B", {{2.0, 5.0}});
             view.zoomWithFactor(1.0, 4.0);
             recorder.clearCalls();
             view.frameAll(1);
             EXPECT_GE(viewHost.redrawRequests(), 1);
         },
         CGRectMake(-0.5, 2.9, 11, 2.2),
         10.0 / 11,
         1,
         {kVolume}},
        {"frame all spans enabled items only",
         [this] {
             enabled("A", {{1.0, 0.0}, {2.0, 1.0}});
             enabled("B", {{3.0, 0.0}});
             addItem(addChannel("Disabled", {{9.0, 0.0}}))->enableItem(0);
             view.frameAll(1);
         },
         CGRectMake(0.9, -0.05, 2.2, 1.1),
         10 / 2.2,
         2,
         {kVolume}},
        {"frame all never changes the height for one flat curve",
         [this] {
             enabled("Flat", {{1.0, 0.5}, {4.0, 0.5}});
             view.frameAll(0);
         },
         CGRectMake(0, -1, 10, 2),
         1,
         1,
         {kVolume}},
        // 0..100 needs a factor of 1/50, short of the limit; the draw pass calls it: no word.
        {"auto-zoom only when due",
         [this] {
             enabled("A", {{1.0, 0.0}, {2.0, 100.0}});
             view.performAutoZoom(false);
             EXPECT_EQ(view.getCurrentViewVolume(), CGRectMake(0, -1, 10, 2));
             view.setNeedsAutoZoom(1);
             view.performAutoZoom(false);
             EXPECT_EQ(view.gridZoomY(), 32.0);
         },
         CGRectMake(0, -5, 10, 110),
         1,
         0.02,
         {}},
        {"reset zoom",
         [this] {
             view.zoomWithFactor(2.0, 4.0);
             view.drawProjection();
             view.pan(-80.0, -40.0);
             recorder.clearCalls();
             view.resetZoom();
         },
         CGRectMake(0, -1, 10, 2),
         1,
         1,
         {kVolume}},
        {"reset pan keeps the zoom",
         [this] {
             view.zoomWithFactor(1.0, 2.0);
             view.drawProjection();
             view.pan(0.0, -40.0);
             recorder.clearCalls();
             view.resetPan();
         },
         CGRectMake(0, -1, 10, 1),
         1,
         2,
         {kVolume}},
    };
    for (const VolumeCase& c : cases) {
        SCOPED_TRACE(c.what);
        TearDown();
        SetUp();
        view.resetZoom();  // the view outlives the fixture's set-up
        recorder.clearCalls();
        c.run();
        const CGRect& v = view.getCurrentViewVolume();
        EXPECT_NEAR(v.origin.x, c.want.origin.x, kWorldTolerance);
        EXPECT_NEAR(v.origin.y, c.want.origin.y, kWorldTolerance);
        EXPECT_NEAR(v.size.width, c.want.size.width, kWorldTolerance);
        EXPECT_NEAR(v.size.height, c.want.size.height, kWorldTolerance);
        EXPECT_NEAR(view.zoomX(), c.zoomX, kWorldTolerance);
        EXPECT_NEAR(view.zoomY(), c.zoomY, kWorldTolerance);
        EXPECT_EQ(postedWords(), c.words);
    }
}

TEST_F(ViewVolume, setVerticalZoom__with_zoom_one_shows_the_whole_range_whatever_the_percentage) {
    addItem(addChannel("A", {{1.0, -3.0}, {2.0, 5.0}}));
    view.computeVerticalTickMarks();
    for (double p : {0.0, 0.3, 1.0}) {
        // The range grows with the view's padding, so it is taken anew before each call.
        const CGRect max = ctrl().getMaxViewVolume();
        view.setVerticalZoom(1.0, p);
        EXPECT_DOUBLE_EQ(view.getCurrentViewVolume().origin.y, max.origin.y) << "p = " << p;
        EXPECT_DOUBLE_EQ(view.getCurrentViewVolume().size.height, max.size.height) << p;
    }
    const CGRect max = ctrl().getMaxViewVolume();
    view.setVerticalZoom(0.5, 0.0);
    EXPECT_DOUBLE_EQ(CGRectGetMaxY(view.getCurrentViewVolume()), CGRectGetMaxY(max))
        << "p = 0 is the top of the range";
    EXPECT_DOUBLE_EQ(view.zoomY(), 1.0) << "the scroller does not touch the zoom factor";
}

class ViewFramingTest : public ViewFixture {};

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
