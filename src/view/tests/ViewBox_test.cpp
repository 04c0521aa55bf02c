// The box tool through the view: the box a band leaves (with any tool), its primitives, how
// each part's drag moves the corners with each modifier and the keypoints with them, and one
// undo step per drag.

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
    // A band from (1, 0.9) to a world point, in two steps.
    void bandTo(double t, double v) {
        down(1.0, 0.9);
        dragTo((1.0 + t) * 0.5, (0.9 + v) * 0.5);
        dragTo(t, v);
        up(t, v);
    }
    static void expectCorners(const Corners& actual, const Corners& expected) {
        const CGPoint a[] = {actual.bl, actual.br, actual.tr, actual.tl};
        const CGPoint e[] = {expected.bl, expected.br, expected.tr, expected.tl};
        for (int i = 0; i < 4; ++i) {
            EXPECT_NEAR(a[i].x, e[i].x, kDragTolerance) << "corner " << i << " (from bottom-left)";
            EXPECT_NEAR(a[i].y, e[i].y, kDragTolerance) << "corner " << i << " (from bottom-left)";
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
    linearItem("A", {{2.0, 0.0}, {4.0, 0.5}, {6.0, -0.25}});
    const CGRect around = CGRectMake(2.0, -0.25, 4.0, 0.75);
    ASSERT_TRUE(frame());
    bandTo(7.0, -0.9);
    expectRectNear(view.getEditBox(), around, kWorldTolerance, "box tool");
    ASSERT_TRUE(frame());
    for (uint32_t part = kTQBoxPartBottomLeft; part <= kTQBoxPartInside; ++part)
        EXPECT_EQ(pickableParts(part), 1u) << "part " << part;
    const auto inside = pickable<HXDMesh>(kTQBoxPartInside);
    ASSERT_EQ(inside.size(), 1u);
    for (const auto& p : view.primitives()) EXPECT_NE(p.get(), inside[0]) << "it is not seen";
    click(9.0, 0.9);
    EXPECT_FALSE(view.fourCornerBoxInitialized()) << "a click off the box forgets it";
    EXPECT_TRUE(view.getSelection()->empty()) << "and what it held";

    ASSERT_TRUE(frame());
    bandTo(3.0, -0.9);
    EXPECT_FALSE(view.fourCornerBoxInitialized()) << "one keypoint makes no box";

    ctrl().setCurrentTool(TQTool::kEdit);
    ASSERT_TRUE(frame());
    bandTo(7.0, -0.9);
    ASSERT_TRUE(view.fourCornerBoxInitialized()) << "the edit tool's band makes one too";
    expectRectNear(view.getEditBox(), around, kWorldTolerance, "edit tool");
    ASSERT_TRUE(frame());
    EXPECT_EQ(pickableParts(kTQBoxPartInside), 0u) << "and does not show it";
    ctrl().setCurrentTool(TQTool::kBox);
    EXPECT_FALSE(view.fourCornerBoxInitialized()) << "a change of tool forgets it";
}

TEST_F(ViewBoxTest, drag__eachPartMovesTheCornersAndTheKeypointsWithThem) {
    auto a = linearItem("A", {{2.0, -0.5}, {6.0, 0.5}});
    const TQKeyframeHandle onBottomLeft = keyAt(a, 2.0);
    const TQKeyframeHandle onTopRight = keyAt(a, 6.0);
    ASSERT_TRUE(frame());
    bandTo(7.0, -0.9);
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
        down(c.at.x, c.at.y, c.mods);
        dragTo(c.at.x + dt, c.at.y + dv, c.mods);
        up(c.at.x + dt, c.at.y + dv, c.mods);
        expectCorners({view.fourCornersBottomLeft(), view.fourCornersBottomRight(),
                       view.fourCornersTopRight(), view.fourCornersTopLeft()},
                      c.expected);
        // The keypoints that lay on two corners lie on them still.
        const auto [t0, v0] = keyOf(a, onBottomLeft);
        const auto [t1, v1] = keyOf(a, onTopRight);
        expectCorners({{t0, v0}, c.expected.br, {t1, v1}, c.expected.tl}, c.expected);
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
    bandTo(7.0, -0.9);
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
