// Hit tests against the primitives a frame drew: the transparent corner of a keypoint image,
// a curve, a tangent handle, the closest of overlapping things, and a band over keypoints.

#include "src/view/tests/ViewDrawFixture.h"

namespace view_test {
namespace {

class ViewHitTest : public ViewDrawFixture {
protected:
    std::vector<HXDHitRecord> pickAt(const CGPoint& screen) const {
        const HXDRenderController* rc = view.renderController();
        const auto context = rc->renderingContextForHitTestAtCoords(
            HXDFloat2{static_cast<float>(screen.x), static_cast<float>(screen.y)});
        return rc->newHitTestResultForPrimitives(view.selectionPrimitives(), context, true);
    }
    std::vector<HXDHitRecord> pickWorld(double x, double y) const {
        return pickAt(view.getPointScreen(CGPointMake(x, y)));
    }

    static uint64_t handleOf(const HXDHitRecord& r) {
        const HXDNumber* h = r.extraInfo().objectForKey("Handle");
        return h ? h->unsignedLongLongValue() : 0;
    }
    static uint64_t handleAt(const TQCurveEditorChannelItemPtr& item, double t) {
        return reinterpret_cast<uintptr_t>(item->channel()->getKeyframe(seconds(t)));
    }
};

TEST_F(ViewHitTest, pick__keypointCurveAndTransparentCorner) {
    auto item = linearItem("Flat", {{1.0, 0.0}, {5.0, 0.0}, {9.0, 0.0}});
    ASSERT_TRUE(frame());
    const CGPoint centre = view.getPointScreen(CGPointMake(5.0, 0.0));
    auto hits = pickAt(centre);
    ASSERT_EQ(hits.size(), 1u);
    EXPECT_EQ(hits[0].hitID(), TQSelectionKeypoint)
        << "the keypoint wins over the curve through it";
    EXPECT_EQ(handleOf(hits[0]), handleAt(item, 5.0));

    // Just inside the top right corner of the image: transparent, and farther from the flat
    // curve than a line takes clicks.
    const KeyframeAsset& asset = view.keyframeAsset(item->colorIndex(), 0, 0);
    ASSERT_EQ(asset.texture->alphaAt(asset.texture->width() - 1, 0), 0.0f)
        << "the image needs a transparent corner";
    const double half = asset.size.width * 0.5;
    EXPECT_TRUE(pickAt(centre + CGPointMake(half - 0.5, half - 0.5)).empty())
        << "a transparent corner takes no click";

    hits = pickAt(view.getPointScreen(CGPointMake(3.0, 0.0)) + CGPointMake(0.0, 2.0));
    ASSERT_EQ(hits.size(), 1u) << "two pixels from the line is on it";
    EXPECT_EQ(hits[0].hitID(), TQSelectionCurve);
    EXPECT_EQ(hits[0].extraInfo().objectForKey("ID")->unsignedLongValue(), item->channelId());
    EXPECT_TRUE(
        pickAt(view.getPointScreen(CGPointMake(3.0, 0.0)) + CGPointMake(0.0, 10.0)).empty());
}

TEST_F(ViewHitTest, pick__onATangentHandleAnswersTheTangentWithItsKeypoint) {
    TQChannel* c = addChannel("Bezier", {{1.0, 0.0}, {5.0, 0.0}, {9.0, 0.0}});
    c->setInterpolation(kTQInterpolationBezier);
    const TQKeyframeHandle h = c->getKeyframe(seconds(5.0));
    c->setKeyframeTangentsBroken(h, true);
    c->setKeyframeOutputTangents(h, 1.5, 0.5);
    c->setKeyframeInputTangents(h, -1.5, 0.5);
    auto item = addItem(c);
    selectInView({keypointEntry(item, 5.0)});
    ASSERT_TRUE(frame());
    const auto out = pickWorld(6.5, 0.5);
    ASSERT_EQ(out.size(), 1u);
    EXPECT_EQ(out[0].hitID(), TQSelectionOutTangent);
    EXPECT_EQ(handleOf(out[0]), handleAt(item, 5.0));
    const auto in = pickWorld(3.5, 0.5);
    ASSERT_EQ(in.size(), 1u);
    EXPECT_EQ(in[0].hitID(), TQSelectionInTangent);
}

TEST_F(ViewHitTest, pick__closestOfOverlappingThingsIsTheOnlyRecord) {
    {
        // A keypoint, and another curve two pixels (0.01 units) below it.
        auto keyed = linearItem("Keyed", {{1.0, 0.0}, {5.0, 0.0}, {9.0, 0.0}});
        auto below = linearItem("Below", {{0.5, -0.01}, {9.5, -0.01}});
        ASSERT_TRUE(frame());
        const auto hits = pickWorld(5.0, 0.0);
        ASSERT_EQ(hits.size(), 1u);
        EXPECT_EQ(handleOf(hits[0]), handleAt(keyed, 5.0)) << "on the image beats near the line";
        ctrl().removeChannelWithIdentifier(keyed->channelId(), set);
        ctrl().removeChannelWithIdentifier(below->channelId(), set);
    }
    {
        auto a = linearItem("A", {{2.0, 0.5}, {7.0, 0.5}});
        auto b = linearItem("B", {{2.0, 0.5}, {8.0, 0.5}});
        b->select(1);
        ASSERT_TRUE(frame());
        const auto hits = pickWorld(2.0, 0.5);
        ASSERT_EQ(hits.size(), 1u);
        EXPECT_EQ(handleOf(hits[0]), handleAt(b, 2.0))
            << "of two keypoints on one spot, the primary channel's (on top)";
    }
}

TEST_F(ViewHitTest, rectangle__findsTheKeypointsItCoversAndNothingElse) {
    auto item = linearItem("Three", {{1.0, 0.0}, {3.0, 0.2}, {6.0, 0.4}});
    ASSERT_TRUE(frame());
    const HXDRenderController* rc = view.renderController();
    const CGPoint p0 = view.getPointScreen(CGPointMake(0.5, -0.5));
    const CGPoint p1 = view.getPointScreen(CGPointMake(4.0, 0.5));
    const auto context =
        rc->renderingContextForHitTestInRect(CGRectMake(p0.x, p0.y, p1.x - p0.x, p1.y - p0.y));
    std::vector<uint64_t> found;
    for (const auto& [id, quads] : view.keypointsPrimitives())
        for (const HXDHitRecord& r : rc->newHitTestResultForPrimitives(quads, context, false))
            found.push_back(handleOf(r));
    const std::vector<uint64_t> expected = {handleAt(item, 1.0), handleAt(item, 3.0)};
    EXPECT_EQ(found, expected);
}

}  // namespace
}  // namespace view_test
