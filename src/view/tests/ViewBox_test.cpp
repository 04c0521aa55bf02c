// The box tool through the view: the box a band leaves (with any tool), its primitives, how
// each part's drag moves the corners with each modifier, the keypoints that follow, the
// view's edges, and one undo step per drag.

#include <any>
#include <memory>
#include <string>
#include <vector>

#include "src/view/tests/ViewMouseFixture.h"

namespace view_test {
namespace {

struct Corners {
    CGPoint bl, br, tr, tl;
};

class ViewBoxTest : public ViewMouseFixture {
protected:
    void SetUp() override {
        ViewMouseFixture::SetUp();
        ctrl().setCurrentTool(TQTool::kBox);
        recorder.clearCalls();
    }
    // A band from one world point to another, dragged in two steps.
    void band(double t0, double v0, double t1, double v1, uint64_t mods = 0) {
        down(t0, v0, mods);
        dragTo((t0 + t1) * 0.5, (v0 + v1) * 0.5, mods);
        dragTo(t1, v1, mods);
        up(t1, v1, mods);
    }
    // A press at a world point, one step by (dt, dv), and the release.
    void dragBy(CGPoint at, double dt, double dv, uint64_t mods = 0) {
        down(at.x, at.y, mods);
        dragTo(at.x + dt, at.y + dv, mods);
        up(at.x + dt, at.y + dv, mods);
    }
    Corners corners() const {
        return {view.fourCornersBottomLeft(), view.fourCornersBottomRight(),
                view.fourCornersTopRight(), view.fourCornersTopLeft()};
    }
    static void expectCorners(const Corners& actual, const Corners& expected) {
        const char* names[] = {"bottom-left", "bottom-right", "top-right", "top-left"};
        const CGPoint a[] = {actual.bl, actual.br, actual.tr, actual.tl};
        const CGPoint e[] = {expected.bl, expected.br, expected.tr, expected.tl};
        for (int i = 0; i < 4; ++i) {
            EXPECT_NEAR(a[i].x, e[i].x, kDragTolerance) << names[i] << " x";
            EXPECT_NEAR(a[i].y, e[i].y, kDragTolerance) << names[i] << " y";
        }
    }
    // The box parts the last frame made pickable, by hit id.
    size_t pickableParts(uint32_t part) const {
        size_t n = 0;
        for (const auto& p : view.selectionPrimitives()) n += p->hitInfo().hitID() == part;
        return n;
    }
};

TEST_F(ViewBoxTest, band__leavesABoxAroundWhatItCaughtWithAnyTool) {
    auto a = linearItem("A", {{2.0, 0.0}, {4.0, 0.5}, {6.0, -0.25}});
    linearItem("B", {{3.0, 0.25}});
    const CGRect around = CGRectMake(2.0, -0.25, 4.0, 0.75);
    ASSERT_TRUE(frame());
    {
        SCOPED_TRACE("box tool");
        band(1.0, 0.9, 7.0, -0.9);
        EXPECT_EQ(view.getSelection()->size(), 4u);
        ASSERT_TRUE(view.fourCornerBoxInitialized());
        expectRectNear(view.getEditBox(), around, kWorldTolerance, "box");
        ASSERT_TRUE(frame());
        for (uint32_t part = kTQBoxPartBottomLeft; part <= kTQBoxPartInside; ++part)
            EXPECT_EQ(pickableParts(part), 1u) << "part " << part;
        EXPECT_EQ(pickable<HXDMesh>(kTQBoxPartInside).size(), 1u);
        for (const auto& p : view.primitives())
            EXPECT_EQ(dynamic_cast<const HXDMesh*>(p.get()), nullptr) << "the inside is not seen";
        click(9.0, 0.9);
        EXPECT_FALSE(view.fourCornerBoxInitialized()) << "a click off the box forgets it";
        EXPECT_TRUE(view.getSelection()->empty()) << "and what it held";
    }
    {
        SCOPED_TRACE("one keypoint makes no box");
        ASSERT_TRUE(frame());
        band(1.0, 0.9, 2.5, -0.9);
        EXPECT_EQ(view.getSelection()->size(), 1u);
        EXPECT_FALSE(view.fourCornerBoxInitialized());
    }
    {
        SCOPED_TRACE("edit tool: the box is made and not shown");
        ctrl().setCurrentTool(TQTool::kEdit);
        ASSERT_TRUE(frame());
        band(1.0, 0.9, 7.0, -0.9);
        ASSERT_TRUE(view.fourCornerBoxInitialized());
        expectRectNear(view.getEditBox(), around, kWorldTolerance, "box");
        EXPECT_EQ(ctrl().deformKeys().size(), 4u);
        ASSERT_TRUE(frame());
        EXPECT_EQ(pickableParts(kTQBoxPartInside), 0u);
        ctrl().setCurrentTool(TQTool::kBox);
        EXPECT_FALSE(view.fourCornerBoxInitialized()) << "a change of tool forgets it";
    }
    EXPECT_EQ(a->channel()->getKeyframes(false).size(), 3u) << "bands and clicks edit nothing";
}

TEST_F(ViewBoxTest, drag__eachPartMovesTheCornersItShould) {
    linearItem("A", {{2.0, -0.5}, {6.0, 0.5}});
    ASSERT_TRUE(frame());
    band(1.0, 0.9, 7.0, -0.9);
    const CGRect box = CGRectMake(2.0, -0.5, 4.0, 1.0);  // aspect 4
    // The pointer moves 40 px across and 50 px up at each drag.
    constexpr double dt = 0.5, dv = 0.25;
    struct Case {
        const char* what;
        CGPoint at;
        uint64_t mods;
        Corners expected;
    };
    const Case cases[] = {
        {"corner: a rectangle stays one",
         {2.0, -0.5},
         0,
         {{2.5, -0.25}, {6.0, -0.25}, {6.0, 0.5}, {2.5, 0.5}}},
        {"corner, Command: alone",
         {2.0, -0.5},
         kCommand,
         {{2.5, -0.25}, {6.0, -0.5}, {6.0, 0.5}, {2.0, 0.5}}},
        {"corner, Option: about the centre",
         {2.0, -0.5},
         kOption,
         {{2.25, -0.375}, {5.75, -0.375}, {5.75, 0.375}, {2.25, 0.375}}},
        {"corner, Shift: the aspect kept",
         {6.0, 0.5},
         kShift,
         {{2.0, -0.5}, {6.5, -0.5}, {6.5, 0.625}, {2.0, 0.625}}},
        {"top side, Shift: widened evenly",
         {4.0, 0.5},
         kShift,
         {{1.5, -0.5}, {6.5, -0.5}, {6.5, 0.75}, {1.5, 0.75}}},
        {"right side, Option: mirrored",
         {6.0, 0.0},
         kOption,
         {{1.5, -0.5}, {6.5, -0.5}, {6.5, 0.5}, {1.5, 0.5}}},
        {"inside", {4.0, 0.1}, 0, {{2.5, -0.25}, {6.5, -0.25}, {6.5, 0.75}, {2.5, 0.75}}},
        {"inside, Shift: along the larger distance",
         {4.0, 0.1},
         kShift,
         {{2.0, -0.25}, {6.0, -0.25}, {6.0, 0.75}, {2.0, 0.75}}},
    };
    for (const Case& c : cases) {
        SCOPED_TRACE(c.what);
        view.setEditBox(box);  // the box of the band again: the keypoints go back with it
        ASSERT_TRUE(frame());
        dragBy(c.at, dt, dv, c.mods);
        expectCorners(corners(), c.expected);
        EXPECT_TRUE(view.fourCornerBoxInitialized()) << "the box outlives its drags";
    }
}

TEST_F(ViewBoxTest, drag__keypointsAndHandlesFollowTheBox) {
    auto a = linearItem("A", {{2.0, -0.5}, {4.0, 0.0}, {6.0, 0.5}});
    const TQKeyframeHandle k4 = keyAt(a, 4.0);
    ASSERT_TRUE(frame());
    band(1.0, 0.9, 7.0, -0.9);
    ASSERT_TRUE(frame());
    // The right side dragged past the left one: the box mirrored in time.
    down(6.0, 0.0);
    for (double t : {5.0, 3.0, 1.0, -1.0}) dragTo(t, 0.0);
    up(-1.0, 0.0);
    const auto [t, v] = keyOf(a, k4);
    EXPECT_NEAR(t, 0.5, kDragTolerance) << "the middle keypoint mirrored about the left side";
    EXPECT_NEAR(v, 0.0, kDragTolerance);
    for (TQKeyframeHandle h : a->channel()->getKeyframes(false)) {
        double in = 0.0, out = 0.0;
        a->channel()->getKeyframeInputTangents(h, &in, nullptr);
        a->channel()->getKeyframeOutputTangents(h, &out, nullptr);
        EXPECT_LE(in, 0.0) << "input handles stay before their keypoints";
        EXPECT_GE(out, 0.0) << "output handles after";
    }
    EXPECT_EQ(keyTimes(a->channel()), (std::vector<double>{-1.0, 0.5, 2.0}));
}

TEST_F(ViewBoxTest, drag__pastTheViewsEdgeZoomsOrPans) {
    linearItem("A", {{2.0, -0.5}, {6.0, 0.5}});
    ASSERT_TRUE(frame());
    band(1.0, 0.9, 7.0, -0.9);
    {
        SCOPED_TRACE("auto-zoom: the top side into the padding band");
        ASSERT_TRUE(frame());
        down(4.0, 0.5);
        dragTo(4.0, 0.75);
        EXPECT_FALSE(view.needsAutoZoom());
        dragTo(4.0, 0.95);
        EXPECT_TRUE(view.needsAutoZoom());
        up(4.0, 0.95);
    }
    view.setAutoZoom(0);
    view.setNeedsAutoZoom(0);
    view.setEditBox(CGRectMake(2.0, -0.5, 4.0, 1.0));
    {
        SCOPED_TRACE("auto-pan: the inside past the right edge, by the overrun");
        ASSERT_TRUE(frame());
        down(4.0, 0.0);
        dragTo(8.5, 0.0);  // the right side 40 px past the edge
        ASSERT_EQ(range().offsets.size(), 1u);
        EXPECT_NEAR(range().offsets[0], 0.5, kDragTolerance);
        up(8.5, 0.0);
    }
}

// The box as a host keeps it for its undo: what getEditBox answers, given back through
// setEditBox.
class BoxUndoClient : public TQHostUndoClient {
public:
    explicit BoxUndoClient(TQCurveEditorViewBase& view) : _view(view) {}
    std::any captureUndoState(uint32_t, uint32_t) override { return _view.getEditBox(); }
    void restoreUndoState(uint32_t, uint32_t, const std::any& state) override {
        _view.setEditBox(std::any_cast<CGRect>(state));
    }

private:
    TQCurveEditorViewBase& _view;
};

class ViewBoxUndo : public WithReferenceHost<ViewBoxTest> {};

TEST_F(ViewBoxUndo, drag__isOneUndoStepThatRestoresEveryChannel) {
    auto a = linearItem("A", {{2.0, -0.5}, {4.0, 0.25}, {6.0, 0.5}});
    auto b = linearItem("B", {{3.0, 0.0}, {5.0, -0.25}});
    const std::unique_ptr<TQChannelBase> beforeA(a->channel()->cloneChannel());
    const std::unique_ptr<TQChannelBase> beforeB(b->channel()->cloneChannel());
    BoxUndoClient client(view);
    host.registerUndoClient(&view, &client);
    ASSERT_TRUE(frame());
    band(1.0, 0.9, 7.0, -0.9);
    const CGRect box = view.getEditBox();
    recorder.clearCalls();

    // A free distortion of the top-right corner, in five steps.
    ASSERT_TRUE(frame());
    down(6.0, 0.5, kCommand);
    for (int i = 1; i <= 5; ++i) dragTo(6.0 + 0.2 * i, 0.5 + 0.05 * i, kCommand);
    up(7.0, 0.75, kCommand);

    EXPECT_EQ(countCalls("startCaptureModifiedChannels"), 1u);
    EXPECT_EQ(countCalls("addToUndo"), 1u);
    EXPECT_EQ(countCalls("willSetChannelValue"), 2u * 6u)
        << "each step and the release, per channel";
    std::vector<TQNotificationWord> expectedWords(5, kTQNotifyChannelsChanging);
    expectedWords.push_back(kTQNotifyChannelsChanged);
    EXPECT_EQ(postedWords(), expectedWords);
    ASSERT_EQ(host.undoStack().undoCount(), 1u) << "the band made no step";
    EXPECT_EQ(lastUndoStep(), TQLocalizedString("Curve Editor Undo Box Edit"));
    EXPECT_FALSE(*a->channel() == *beforeA);
    EXPECT_FALSE(*b->channel() == *beforeB);

    ASSERT_TRUE(host.undo());
    EXPECT_TRUE(*a->channel() == *beforeA) << "undo restores every channel exactly";
    EXPECT_TRUE(*b->channel() == *beforeB);
    expectRectNear(view.getEditBox(), box, 0.0, "and the box");
    host.unregisterUndoClient(&view);
}

}  // namespace
}  // namespace view_test
