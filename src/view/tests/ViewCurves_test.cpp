// Curves, keypoints and handles as primitives: the three pieces of a curve, the merge of
// selected keypoints into a coarse line, the ghost, the processed curve, the image slot of
// each keypoint state, where handles show, the handle line clipped at the keypoint, the
// backing scale, and the value label kept inside the view.

#include <cmath>

#include "src/view/tests/ViewDrawFixture.h"

namespace view_test {
namespace {

// Seconds per drawable pixel of the fixture's view (10 s over 800).
constexpr double kSecondsPerPixel = 10.0 / 800.0;

class ViewCurvesTest : public ViewDrawFixture {
protected:
    HXDColor colourOf(const TQCurveEditorChannelItemPtr& item, float factor = 1.0f) const {
        const GDColor c = TQCurveEditorViewBase::getColorForIndex(item->colorIndex()).scaled(factor);
        return HXD_sRGBA(c.red, c.green, c.blue, c.alpha);
    }

    std::vector<const HXDQuadTexture*> keypointQuads() const { return pickable<HXDQuadTexture>(TQSelectionKeypoint); }
    size_t handles(uint32_t which) const { return pickable<HXDQuadTexture>(which).size(); }
};

TEST_F(ViewCurvesTest, drawOriginalCurve__dimsAndStipplesTheEndsAndJoinsThePieces) {
    auto item = linearItem("Ramp", {{2.0, 0.0}, {6.0, 0.5}});
    ASSERT_TRUE(frame());
    const auto pieces = curvePieces(item);
    ASSERT_EQ(pieces.size(), 3u);
    const auto& before = pieces[0]->vertices();
    const auto& middle = pieces[1]->vertices();
    const auto& after = pieces[2]->vertices();
    ASSERT_FALSE(before.empty());
    ASSERT_FALSE(middle.empty());
    ASSERT_FALSE(after.empty());

    EXPECT_EQ(before.back().start, middle.front().start) << "the first piece ends where the keyed one begins";
    EXPECT_EQ(middle.back().start, after.front().start) << "the keyed piece ends where the last begins";
    EXPECT_FLOAT_EQ(middle.front().start.x, 2.0f) << "the keyed piece starts on the first keypoint";
    EXPECT_EQ(before.size() + middle.size() + after.size(), 800u + 2u) << "one sample per point, two joins";
    for (size_t i = 0; i + 1 < before.size(); ++i) ASSERT_LT(before[i].start.x, 2.0f) << "vertex " << i;
    for (size_t i = 1; i < after.size(); ++i) ASSERT_GT(after[i].start.x, 6.0f) << "vertex " << i;

    EXPECT_EQ(before.front().color, colourOf(item, 0.3f)) << "ends are the curve colour times 0.3, alpha too";
    EXPECT_EQ(middle.front().color, colourOf(item));
    EXPECT_EQ(after.back().color, colourOf(item, 0.3f));
    for (const HXDMultiline* dimmed : {pieces[0], pieces[2]}) {
        EXPECT_TRUE(dimmed->stippled());
        EXPECT_EQ(dimmed->stipplePattern(), 0x33333333u);
        EXPECT_EQ(dimmed->stippleScale(), 2.0f);
        EXPECT_EQ(dimmed->width(), 1.0f) << "thin lines are 1 point on a backing scale of 1";
    }
    EXPECT_FALSE(pieces[1]->stippled());
    EXPECT_TRUE(pieces[1]->antialiased());
}

TEST_F(ViewCurvesTest, drawOriginalCurve__piecesFollowWhereTheKeypointsLie) {
    {
        auto late = linearItem("Late", {{20.0, 0.0}, {30.0, 1.0}});
        ASSERT_TRUE(frame());
        const auto pieces = curvePieces(late);
        ASSERT_EQ(pieces.size(), 3u);
        EXPECT_EQ(pieces[0]->vertices().size(), 800u) << "samples before the first keypoint all go first";
        EXPECT_TRUE(pieces[1]->vertices().empty());
        EXPECT_TRUE(pieces[2]->vertices().empty());
    }
    {
        auto single = linearItem("Single", {{5.0, 0.2}});
        ASSERT_TRUE(frame());
        const auto pieces = curvePieces(single);
        ASSERT_EQ(pieces.size(), 3u);
        ASSERT_EQ(pieces[1]->vertices().size(), 2u) << "one keypoint: its sample and the next";
        EXPECT_FLOAT_EQ(pieces[1]->vertices()[0].start.x, 5.0f);
        const double next = pieces[1]->vertices()[1].start.x;
        EXPECT_TRUE(next > 5.0 && next < 5.0 + 1.5 * kSecondsPerPixel) << "the next sample follows at " << next;
    }
}

TEST_F(ViewCurvesTest, drawOriginalCurve__aSelectedCurveTakesTheSelectionColour) {
    auto item = linearItem("Ramp", {{2.0, 0.0}, {6.0, 0.5}});
    item->select(1);
    ASSERT_TRUE(frame());
    const GDColor s = view.selectionColor();
    EXPECT_EQ(curvePieces(item)[1]->vertices().front().color, HXD_sRGBA(s.red, s.green, s.blue, s.alpha));
    EXPECT_EQ(idOf(*curvePieces(item)[1]), item->channelId());
}

TEST_F(ViewCurvesTest, drawOriginalCurve__mergesSelectedKeypointsIntoACoarserLine) {
    auto item = linearItem("Coarse", {{0.0, 0.0}, {1.0, 1.0}, {4.0, 4.0}});
    ASSERT_TRUE(frame());
    // The channel answers five samples instead of 800, none of them on the keypoint at 1 s.
    item->setNumberOfSamples(5);
    item->refreshOriginalCurve(seconds(0.0), seconds(2.5));
    auto u = std::make_unique<CMTime[]>(5);
    auto v = std::make_unique<double[]>(5);
    for (int i = 0; i < 5; ++i) {
        u[i] = seconds(2.5 * i);
        v[i] = std::min(2.5 * i, 4.0);
    }
    item->setSamplesU(std::move(u));
    item->setSamplesV(std::move(v));
    selectInView({keypointEntry(item, 0.0), keypointEntry(item, 1.0)});

    ASSERT_TRUE(frame());
    const auto pieces = curvePieces(item);
    ASSERT_EQ(pieces.size(), 3u);
    const auto& middle = pieces[1]->vertices();
    ASSERT_EQ(middle.size(), 4u) << "0, the keypoint at 1, 2.5, and the join at 5";
    EXPECT_EQ(middle[1].start, (HXDFloat3{1.0f, 1.0f, 0.0f})) << "the selected keypoint lies on the line";
    EXPECT_FLOAT_EQ(middle[0].start.x, 0.0f) << "a keypoint on a sample is not inserted twice";
    EXPECT_FLOAT_EQ(middle[2].start.x, 2.5f);
}

TEST_F(ViewCurvesTest, drawOriginalCurve__ghostOnlyForASelectedItemDuringAGesture) {
    auto item = linearItem("Ramp", {{2.0, 0.0}, {6.0, 0.5}});
    ASSERT_TRUE(frame());
    item->takeCurveSnapshot(0);
    item->setDrawGhost(1);
    view.setMouseIsDown(1);
    auto ghosts = [&] {
        std::vector<const HXDMultiline*> out;
        for (const auto& p : view.primitives())
            if (p->hitInfo().hitID() == 0)
                if (const auto* m = dynamic_cast<const HXDMultiline*>(p.get())) out.push_back(m);
        return out;
    };

    ASSERT_TRUE(frame());
    EXPECT_TRUE(ghosts().empty()) << "an unselected item shows no ghost";

    item->select(1);
    ASSERT_TRUE(frame());
    ASSERT_EQ(ghosts().size(), 1u);
    const GDColor own = TQCurveEditorViewBase::getColorForIndex(item->colorIndex());
    EXPECT_EQ(ghosts()[0]->vertices().size(), item->numberOfSamplesSnapshot());
    EXPECT_FLOAT_EQ(ghosts()[0]->vertices()[0].color.alpha, own.alpha * 0.4f);

    view.setMouseIsDown(0);
    ASSERT_TRUE(frame());
    EXPECT_TRUE(ghosts().empty()) << "no gesture, no snapshot mode: no ghost";
}

TEST_F(ViewCurvesTest, drawProcessedCurve__everySecondSampleTranslucentAndNotPickable) {
    auto item = linearItem("Ramp", {{0.0, 0.0}, {10.0, 1.0}});
    ASSERT_TRUE(frame());
    item->setNumberOfProcessedSamples(10);
    item->setProcessedCurveDirty(1);
    const size_t pickableBefore = view.selectionPrimitives().size();
    view.drawProcessedCurve(item.get());
    const auto* line = dynamic_cast<const HXDMultiline*>(view.primitives().back().get());
    ASSERT_NE(line, nullptr);
    ASSERT_EQ(line->vertices().size(), 5u) << "indices 0, 2, 4, 6, 8";
    EXPECT_FLOAT_EQ(line->vertices()[1].start.x, 2.0f);
    EXPECT_FLOAT_EQ(line->vertices()[1].color.alpha, colourOf(item).alpha * 0.4f);
    EXPECT_EQ(view.selectionPrimitives().size(), pickableBefore);
}

TEST_F(ViewCurvesTest, drawKeypoint__eachStateShowsItsImageSlot) {
    auto item = linearItem("States", {{1.0, 0.0}, {2.0, 0.0}, {3.0, 0.0}, {4.0, 0.0}, {5.0, 0.0}, {6.0, 0.0}});
    TQChannel* c = item->channel();
    auto at = [&](double t) { return c->getKeyframe(seconds(t)); };
    c->setKeyframeEnabled(at(1.0), false);
    c->setKeyframeEnabled(at(2.0), false);
    c->setKeyframeLocked(at(3.0), true);
    c->setKeyframeLocked(at(4.0), true);
    selectInView({keypointEntry(item, 1.0), keypointEntry(item, 3.0), keypointEntry(item, 5.0)});
    ASSERT_TRUE(frame());

    // (state, selected) of the asset table each keypoint must show, in time order.
    struct Expected {
        uint32_t state;
        uint32_t selected;
        const char* what;
    };
    const Expected expected[6] = {{3, 1, "disabled, selected"},   {3, 0, "disabled"},
                                  {2, 1, "locked, selected"},     {2, 0, "locked"},
                                  {1, 1, "selected: pressed"},    {0, 0, "plain"}};
    const auto quads = keypointQuads();
    ASSERT_EQ(quads.size(), 6u);
    for (size_t k = 0; k < 6; ++k) {
        EXPECT_EQ(quads[k]->texture(), view.keyframeAsset(item->colorIndex(), expected[k].state, expected[k].selected).texture)
            << "keypoint " << k << " (" << expected[k].what << ") shows the wrong image";
        EXPECT_TRUE(quads[k]->useTextureAlphaForHitTest());
        const HXDNumber* handle = quads[k]->hitInfo().extraInfo().objectForKey("Handle");
        ASSERT_NE(handle, nullptr);
        EXPECT_EQ(handle->unsignedLongLongValue(), reinterpret_cast<uintptr_t>(item->channel()->getKeyframes(false)[k]));
    }
}

class ViewTangentHandlesTest : public ViewCurvesTest {
protected:
    void SetUp() override {
        ViewCurvesTest::SetUp();
        TQChannel* c = addChannel("Bezier", {{1.0, 0.0}, {5.0, 0.0}, {9.0, 0.0}});
        c->setInterpolation(kTQInterpolationBezier);
        for (TQKeyframeHandle h : c->getKeyframes(false)) {
            c->setKeyframeTangentsBroken(h, true);
            c->setKeyframeInputTangents(h, -1.0, -0.25);
            c->setKeyframeOutputTangents(h, 1.0, 0.5);
        }
        item = addItem(c);
    }

    TQCurveEditorChannelItemPtr item;
};

TEST_F(ViewTangentHandlesTest, drawPoints__handlesOnlyOnSelectedEnabledUnlockedKeypoints) {
    {
        selectInView({keypointEntry(item, 5.0)});
        ASSERT_TRUE(frame());
        EXPECT_EQ(handles(TQSelectionInTangent), 1u);
        EXPECT_EQ(handles(TQSelectionOutTangent), 1u);
    }
    {
        selectInView({keypointEntry(item, 1.0), keypointEntry(item, 9.0)});
        ASSERT_TRUE(frame());
        EXPECT_EQ(handles(TQSelectionInTangent), 1u) << "the first keypoint has no input handle";
        EXPECT_EQ(handles(TQSelectionOutTangent), 1u) << "the last keypoint has no output handle";
    }
    {
        selectInView({});
        ASSERT_TRUE(frame());
        EXPECT_EQ(handles(TQSelectionInTangent) + handles(TQSelectionOutTangent), 0u) << "unselected: no handles";
    }
    {
        selectInView({keypointEntry(item, 5.0)});
        item->channel()->setKeyframeEnabled(item->channel()->getKeyframe(seconds(5.0)), false);
        ASSERT_TRUE(frame());
        EXPECT_EQ(handles(TQSelectionInTangent) + handles(TQSelectionOutTangent), 0u) << "disabled: no handles";
        item->channel()->setKeyframeEnabled(item->channel()->getKeyframe(seconds(5.0)), true);
    }
    {
        selectInView({keypointEntry(item, 1.0), keypointEntry(item, 5.0), keypointEntry(item, 9.0)});
        item->channel()->setLocked(true);
        ASSERT_TRUE(frame());
        EXPECT_EQ(handles(TQSelectionInTangent) + handles(TQSelectionOutTangent), 0u)
            << "a locked channel shows no handle, whatever is selected";
    }
}

TEST_F(ViewTangentHandlesTest, drawTangent__lineStopsAtTheEllipseAroundTheKeypoint) {
    TQChannel* c = item->channel();
    const TQKeyframeHandle h = c->getKeyframe(seconds(5.0));
    c->setKeyframeOutputTangents(h, 2.0, 0.0);
    selectInView({keypointEntry(item, 5.0)});
    ASSERT_TRUE(frame());

    const HXDLine* line = nullptr;
    for (const auto& p : view.primitives())
        if (const auto* l = dynamic_cast<const HXDLine*>(p.get()); l && l->start().x > 6.0f) line = l;
    ASSERT_NE(line, nullptr) << "the output handle's line";
    const double keypointWidth = view.keyframeAsset(0, 1, 1).size.width / 800.0 * 10.0;
    EXPECT_NEAR(line->start().x, 7.0, 1e-5) << "the line starts at the handle";
    EXPECT_NEAR(line->end().x, 5.0 + keypointWidth * 0.25, 1e-5) << "and stops a quarter image from the keypoint";
    EXPECT_NEAR(line->end().y, 0.0, 1e-6);
    const GDColor s = view.selectionColor();
    EXPECT_EQ(line->color(), HXD_sRGBA(s.red, s.green, s.blue, s.blue)) << "the fourth component is blue, kept so";

    const auto outs = pickable<HXDQuadTexture>(TQSelectionOutTangent);
    ASSERT_EQ(outs.size(), 1u);
    EXPECT_NEAR(CGRectGetMidX(outs[0]->destinationRect()), 7.0, 1e-9);
    EXPECT_FALSE(outs[0]->useTextureAlphaForHitTest()) << "a handle is hit on its whole rectangle";
}

TEST_F(ViewTangentHandlesTest, drawTangent__aHandleOnItsKeypointIsNotDrawn) {
    TQChannel* c = item->channel();
    const TQKeyframeHandle h = c->getKeyframe(seconds(5.0));
    c->setKeyframeOutputTangents(h, 0.01, 0.001);
    selectInView({keypointEntry(item, 5.0)});
    ASSERT_TRUE(frame());
    EXPECT_EQ(handles(TQSelectionOutTangent), 0u);
    EXPECT_EQ(handles(TQSelectionInTangent), 1u);
    EXPECT_EQ(encoder.count(HXDRecordingEncoder::Kind::Line), 1u) << "neither the handle nor its line";
}

TEST_F(ViewCurvesTest, drawPoints__onABackingScaleOfTwoImagesCoverTwiceThePixels) {
    auto item = linearItem("Ramp", {{2.0, 0.0}, {6.0, 0.5}});
    ASSERT_TRUE(frame());
    const double pixelsAtOne = view.getSizeScreen(CGPointMake(keypointQuads()[0]->destinationRect().size.width, 0)).x;

    viewHost.setBackingScaleFactor(2.0);
    view.viewDidChangeBackingProperties();
    HXDRecordingEncoder retina(1600, 800);
    clock.advance(1.0);
    ASSERT_TRUE(view.displayLayer(&retina));
    const double pixelsAtTwo = view.getSizeScreen(CGPointMake(keypointQuads()[0]->destinationRect().size.width, 0)).x;
    EXPECT_NEAR(pixelsAtTwo, 2.0 * pixelsAtOne, kPixelTolerance);
    EXPECT_EQ(curvePieces(item)[0]->width(), 0.5f) << "thin lines are one pixel wide";
    EXPECT_EQ(view.thinLineWidth(), 0.5f);
}

TEST_F(ViewCurvesTest, drawKeypoint__valueLabelNearTheTopRightIsMovedBackInside) {
    auto item = linearItem("Corner", {{1.0, 0.0}, {9.95, 0.98}});
    selectInView({keypointEntry(item, 9.95)});
    view.setPrintText(1);
    ASSERT_TRUE(frame());

    const HXDText* label = nullptr;
    for (const auto& p : view.primitives())
        if (const auto* t = dynamic_cast<const HXDText*>(p.get())) label = t;
    ASSERT_NE(label, nullptr) << "the primary selected keypoint is labelled";
    EXPECT_EQ(label->string(), view.getCoordinates(item.get(), seconds(9.95), 0.98));
    // Undo the nudge of metalPrint (minDeltaU over the zoom, in world units) to read where
    // the label was placed: its box ends 2 pixels inside the top right corner.
    const CGPoint placed = view.getPointScreen(label->position() - CGPointMake(1.0, 1.0));
    const CGSize size = HXDSizeWithAttributes(label->string(), view.textAttribs());
    EXPECT_NEAR(placed.x + size.width, 800.0 - 2.0, 1.0);
    EXPECT_NEAR(placed.y + size.height, 400.0 - 2.0, 1.0);

    view.setPrintText(0);
    ASSERT_TRUE(frame());
    EXPECT_EQ(encoder.count(HXDRecordingEncoder::Kind::Text), 0u);
}

}  // namespace
}  // namespace view_test
