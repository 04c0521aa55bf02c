// Curves, keypoints and handles as primitives: the three pieces of a curve, the merge of
// selected keypoints into a coarse line, the ghost, the image slot of each keypoint state,
// where handles show, the handle line clipped at the keypoint, the backing scale, and the
// value label kept inside the view.

#include "src/view/tests/ViewDrawFixture.h"

namespace view_test {
namespace {

class ViewCurvesTest : public ViewDrawFixture {
protected:
    // The item's (opaque) colour at `opacity`, premultiplied as primitives carry it.
    static HXDColor colourOf(const TQCurveEditorChannelItemPtr& item, float opacity = 1.0f) {
        const GDColor c = TQCurveEditorViewBase::getColorForIndex(item->colorIndex());
        return HXDColor{c.red * opacity, c.green * opacity, c.blue * opacity, opacity};
    }
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
    ASSERT_TRUE(!before.empty() && !middle.empty() && !after.empty());
    EXPECT_EQ(before.back().start, middle.front().start) << "the pieces join";
    EXPECT_EQ(middle.back().start, after.front().start);
    EXPECT_FLOAT_EQ(middle.front().start.x, 2.0f) << "the keyed piece starts on the first keypoint";
    EXPECT_EQ(before.size() + middle.size() + after.size(), 800u + 2u)
        << "one sample per point, two joins";
    for (size_t i = 1; i < after.size(); ++i) ASSERT_GT(after[i].start.x, 6.0f) << "vertex " << i;

    EXPECT_EQ(before.front().color, colourOf(item, 0.3f))
        << "ends are the curve colour at 0.3 opacity: 30 % of it over the background";
    EXPECT_EQ(middle.front().color, colourOf(item));
    EXPECT_TRUE(pieces[0]->stippled() && pieces[2]->stippled() && !pieces[1]->stippled());
    EXPECT_EQ(pieces[2]->stipplePattern(), 0x33333333u);

    auto late = linearItem("Late", {{20.0, 0.0}, {30.0, 1.0}});
    ASSERT_TRUE(frame());
    EXPECT_EQ(curvePieces(late)[0]->vertices().size(), 800u)
        << "samples before the first keypoint all go first";
    EXPECT_TRUE(curvePieces(late)[1]->vertices().empty() &&
                curvePieces(late)[2]->vertices().empty());
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
    item->setSamplesU(std::move(u), 5);
    item->setSamplesV(std::move(v), 5);
    selectInView({keypointEntry(item, 0.0), keypointEntry(item, 1.0)});
    ASSERT_TRUE(frame());

    const auto& middle = curvePieces(item)[1]->vertices();
    ASSERT_EQ(middle.size(), 4u) << "0, the keypoint at 1, 2.5, and the join at 5";
    EXPECT_EQ(middle[1].start, (HXDFloat3{1.0f, 1.0f, 0.0f}))
        << "the selected keypoint lies on the line";
    EXPECT_FLOAT_EQ(middle[2].start.x, 2.5f) << "a keypoint on a sample is not inserted twice";
}

TEST_F(ViewCurvesTest, drawOriginalCurve__ghostOnlyForASelectedItemDuringAGesture) {
    auto item = linearItem("Ramp", {{2.0, 0.0}, {6.0, 0.5}});
    ASSERT_TRUE(frame());
    item->takeCurveSnapshot(0);
    item->setDrawGhost(1);
    view.setMouseIsDown(1);
    auto ghosts = [&] {
        size_t n = 0;
        for (const auto& p : view.primitives())
            n += p->hitInfo().hitID() == 0 && dynamic_cast<const HXDMultiline*>(p.get());
        return n;
    };
    ASSERT_TRUE(frame());
    EXPECT_EQ(ghosts(), 0u) << "an unselected item shows no ghost";
    item->select(1);
    ASSERT_TRUE(frame());
    EXPECT_EQ(ghosts(), 1u) << "the ghost is drawn, and never pickable";
}

TEST_F(ViewCurvesTest, drawKeypoint__eachStateShowsItsImageSlot) {
    auto item = linearItem(
        "States", {{1.0, 0.0}, {2.0, 0.0}, {3.0, 0.0}, {4.0, 0.0}, {5.0, 0.0}, {6.0, 0.0}});
    TQChannel* c = item->channel();
    auto at = [&](double t) { return c->getKeyframe(seconds(t)); };
    c->setKeyframeEnabled(at(1.0), false);
    c->setKeyframeEnabled(at(2.0), false);
    c->setKeyframeLocked(at(3.0), true);
    c->setKeyframeLocked(at(4.0), true);
    selectInView({keypointEntry(item, 1.0), keypointEntry(item, 3.0), keypointEntry(item, 5.0)});
    ASSERT_TRUE(frame());

    // (state, selected) of the asset table that each keypoint must show, in time order.
    const uint32_t expected[6][2] = {{3, 1}, {3, 0}, {2, 1}, {2, 0}, {1, 1}, {0, 0}};
    const char* what[6] = {"disabled, selected", "disabled", "locked, selected", "locked",
                           "selected",           "plain"};
    const auto quads = pickable<HXDQuadTexture>(TQSelectionKeypoint);
    ASSERT_EQ(quads.size(), 6u);
    for (size_t k = 0; k < 6; ++k) {
        EXPECT_EQ(quads[k]->texture(),
                  view.keyframeAsset(item->colorIndex(), expected[k][0], expected[k][1]).texture)
            << "keypoint " << k << " (" << what[k] << ") shows the wrong image";
        EXPECT_EQ(quads[k]->hitInfo().extraInfo().objectForKey("Handle")->unsignedLongLongValue(),
                  reinterpret_cast<uintptr_t>(c->getKeyframes(false)[k]));
    }
}

class ViewTangentHandlesTest : public ViewCurvesTest {
protected:
    void SetUp() override {
        ViewCurvesTest::SetUp();
        c = addChannel("Bezier", {{1.0, 0.0}, {5.0, 0.0}, {9.0, 0.0}});
        c->setInterpolation(kTQInterpolationBezier);
        for (TQKeyframeHandle h : c->getKeyframes(false)) {
            c->setKeyframeTangentsBroken(h, true);
            c->setKeyframeInputTangents(h, -1.0, -0.25);
            c->setKeyframeOutputTangents(h, 1.0, 0.5);
        }
        item = addItem(c);
    }
    TQChannel* c = nullptr;
    TQCurveEditorChannelItemPtr item;
};

TEST_F(ViewTangentHandlesTest, drawPoints__handlesOnlyOnSelectedEnabledUnlockedKeypoints) {
    struct Case {
        std::vector<double> selected;
        bool disableMiddle;
        bool lockChannel;
        size_t in, out;
        const char* what;
    };
    const Case cases[] = {
        {{5.0}, false, false, 1, 1, "a middle keypoint shows both"},
        {{1.0, 9.0}, false, false, 1, 1, "no input on the first, no output on the last"},
        {{}, false, false, 0, 0, "unselected"},
        {{5.0}, true, false, 0, 0, "disabled"},
        {{1.0, 5.0, 9.0}, false, true, 0, 0, "a locked channel, whatever is selected"}};
    for (const Case& k : cases) {
        TQCurveSelectionList* list = view.getSelection();
        list->reset();
        for (double t : k.selected) list->addSelection(keypointEntry(item, t));
        c->setKeyframeEnabled(c->getKeyframe(seconds(5.0)), !k.disableMiddle);
        c->setLocked(k.lockChannel);
        ASSERT_TRUE(frame());
        EXPECT_EQ(handles(TQSelectionInTangent), k.in) << k.what;
        EXPECT_EQ(handles(TQSelectionOutTangent), k.out) << k.what;
    }
}

TEST_F(ViewTangentHandlesTest, drawTangent__lineStopsAtTheEllipseAndShortHandlesAreNotDrawn) {
    const TQKeyframeHandle h = c->getKeyframe(seconds(5.0));
    c->setKeyframeOutputTangents(h, 2.0, 0.0);
    c->setKeyframeInputTangents(h, -0.01, -0.001);  // inside half the handle image
    selectInView({keypointEntry(item, 5.0)});
    ASSERT_TRUE(frame());

    EXPECT_EQ(handles(TQSelectionInTangent), 0u) << "a handle lying on its keypoint is not drawn";
    ASSERT_EQ(encoder.count(HXDRecordingEncoder::Kind::Line), 1u) << "nor is its line";
    const HXDLine* line = nullptr;
    for (const auto& p : view.primitives())
        if (const auto* l = dynamic_cast<const HXDLine*>(p.get())) line = l;
    const double keypointWidth = view.keyframeAsset(0, 1, 1).size.width / 800.0 * 10.0;
    EXPECT_NEAR(line->start().x, 7.0, 1e-5) << "the line starts at the handle";
    EXPECT_NEAR(line->end().x, 5.0 + keypointWidth * 0.25, 1e-5)
        << "and stops a quarter image from the keypoint";
    const GDColor s = view.selectionColor();
    EXPECT_EQ(line->color(), (HXDColor{s.red * s.blue, s.green * s.blue, s.blue * s.blue, s.blue}))
        << "the selection colour at the opacity of its blue, kept so";
}

TEST_F(ViewTangentHandlesTest, frame__translucentColoursReachTheEncoderPremultiplied) {
    // Everything a frame can hold at once: handles, a value label, the ghost of a drag, the
    // processed curve and the rubber band.
    ASSERT_TRUE(frame());
    selectInView({keypointEntry(item, 5.0)});
    view.setPrintText(1);
    item->select(1);
    item->takeCurveSnapshot(0);
    item->setDrawGhost(1);
    view.setMouseIsDown(1);
    c->addBehavior(std::make_unique<TQOscillateBehavior>(0.1, 1.0, 0.0));
    item->setDrawProcessedCurve(1);
    item->setNumberOfProcessedSamples(100);
    item->setProcessedCurveDirty(1);
    view.setSelecting(1);
    view.setSelectionViewVolume(CGRectMake(2.0, -0.5, 3.0, 1.0));
    ASSERT_TRUE(frame());
    EXPECT_TRUE(encoder.colourFaults.empty()) << "the frame's colours and images are premultiplied";

    std::vector<HXDColor> unpickableLines;
    const HXDScreenspaceQuad* band = nullptr;
    for (const auto& p : view.primitives()) {
        if (const auto* m = dynamic_cast<const HXDMultiline*>(p.get());
            m && p->hitInfo().hitID() == 0 && !m->vertices().empty() && !m->loop())
            unpickableLines.push_back(m->vertices().front().color);
        if (const auto* q = dynamic_cast<const HXDScreenspaceQuad*>(p.get())) band = q;
    }
    const HXDColor translucent = colourOf(item, 0.4f);
    EXPECT_EQ(std::count(unpickableLines.begin(), unpickableLines.end(), translucent), 2)
        << "the ghost and the processed curve: the curve colour at 0.4 opacity";
    ASSERT_NE(band, nullptr);
    const GDColor s = view.selectionColor();
    EXPECT_EQ(band->color(), (HXDColor{s.red * 0.25f, s.green * 0.25f, s.blue * 0.25f, 0.25f}))
        << "the band is the selection colour at a quarter opacity";
}

TEST_F(ViewCurvesTest, drawPoints__onABackingScaleOfTwoImagesCoverTwiceThePixels) {
    auto item = linearItem("Ramp", {{2.0, 0.0}, {6.0, 0.5}});
    auto keypointPixels = [&] {
        const CGRect r = pickable<HXDQuadTexture>(TQSelectionKeypoint)[0]->destinationRect();
        return view.getSizeScreen(CGPointMake(r.size.width, 0.0)).x;
    };
    ASSERT_TRUE(frame());
    const double atOne = keypointPixels();
    viewHost.setBackingScaleFactor(2.0);
    view.viewDidChangeBackingProperties();
    HXDRecordingEncoder retina(1600, 800);
    clock.advance(1.0);
    ASSERT_TRUE(view.displayLayer(&retina));
    EXPECT_NEAR(keypointPixels(), 2.0 * atOne, kPixelTolerance);
    EXPECT_EQ(curvePieces(item)[0]->width(), 0.5f) << "thin lines are one pixel wide";
}

TEST_F(ViewCurvesTest, drawKeypoint__valueLabelNearTheTopRightIsMovedBackInside) {
    auto item = linearItem("Corner", {{1.0, 0.0}, {9.95, 0.98}});
    selectInView({keypointEntry(item, 9.95)});
    view.setPrintText(1);
    ASSERT_TRUE(frame());
    ASSERT_EQ(encoder.count(HXDRecordingEncoder::Kind::Text), 1u)
        << "the primary selected keypoint is labelled";
    const HXDText* label = nullptr;
    for (const auto& p : view.primitives())
        if (const auto* t = dynamic_cast<const HXDText*>(p.get())) label = t;
    EXPECT_EQ(label->string(), view.getCoordinates(item.get(), seconds(9.95), 0.98));
    // Undo metalPrint's nudge (minDeltaU over the zoom, in world units) to read where the
    // label was placed: its box ends 2 pixels inside the top right corner.
    const CGPoint placed = view.getPointScreen(label->position() - CGPointMake(1.0, 1.0));
    const CGSize size = HXDSizeWithAttributes(label->string(), view.textAttribs());
    EXPECT_NEAR(placed.x + size.width, 800.0 - 2.0, 1.0);
    EXPECT_NEAR(placed.y + size.height, 400.0 - 2.0, 1.0);
}

}  // namespace
}  // namespace view_test
