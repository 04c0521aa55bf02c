// Picking: what the hit test of a frame answers at a point, what a click and a band take into
// the selection, what the other tools take, and the selection repairs and commands.

#include <sstream>
#include <string>

#include "src/view/tests/ViewMouseFixture.h"

namespace view_test {
namespace {

class ViewPick : public ViewMouseFixture {
protected:
    void SetUp() override {
        ViewMouseFixture::SetUp();
        item = linearItem("A", {{2.0, 0.0}, {5.0, 0.0}, {8.0, 0.0}});
        k2 = keyAt(item, 2.0);
        k5 = keyAt(item, 5.0);
        k8 = keyAt(item, 8.0);
    }
    TQCurveEditorChannelItemPtr item;
    TQKeyframeHandle k2 = nullptr;
    TQKeyframeHandle k5 = nullptr;
    TQKeyframeHandle k8 = nullptr;
};

// The one record the hit test answers at a point of the last frame, as "kind name#key", or
// "none". Keys are numbered per channel in time order.
std::string hitAt(const TQCurveEditorViewBase& view, const TQCurveEditorCtrlBase& ctrl,
                  const CGPoint& screen) {
    const HXDRenderController* rc = view.renderController();
    const auto context = rc->renderingContextForHitTestAtCoords(
        HXDFloat2{static_cast<float>(screen.x), static_cast<float>(screen.y)});
    const auto hits = rc->newHitTestResultForPrimitives(view.selectionPrimitives(), context, true);
    if (hits.empty()) return "none";
    if (hits.size() > 1) return "several";
    const auto item = ctrl.channelItemWithIdentifier(
        static_cast<uint32_t>(hits[0].extraInfo().objectForKey("ID")->unsignedLongValue()));
    const TQChannel* c = item ? dynamic_cast<const TQChannel*>(item->channelBase()) : nullptr;
    std::ostringstream out;
    out << (hits[0].hitID() == TQSelectionKeypoint     ? "key "
            : hits[0].hitID() == TQSelectionOutTangent ? "out "
            : hits[0].hitID() == TQSelectionInTangent  ? "in "
                                                       : "curve ")
        << (c ? c->getName() : "?");
    if (const HXDNumber* h = hits[0].extraInfo().objectForKey("Handle")) {
        const auto keys = c ? c->getKeyframes(false) : std::vector<TQKeyframeHandle>{};
        for (size_t k = 0; k < keys.size(); ++k)
            if (reinterpret_cast<uintptr_t>(keys[k]) == h->unsignedLongLongValue()) out << "#" << k;
    }
    return out.str();
}

TEST_F(ViewPick, hitTest__the_closest_thing_under_the_pointer_is_the_only_record) {
    // A: 2, 5, 8 at 0 (the fixture's); B through A's keypoint at 5 two pixels below it; C with
    // broken handles at its middle keypoint, selected; D and E sharing a keypoint, E primary.
    linearItem("B", {{0.5, -0.01}, {9.5, -0.01}});
    TQChannel* c = addChannel("C", {{1.0, -0.6}, {5.0, -0.6}, {9.0, -0.6}});
    c->setInterpolation(kTQInterpolationBezier);
    c->setKeyframeTangentsBroken(c->getKeyframe(seconds(5.0)), true);
    c->setKeyframeOutputTangents(c->getKeyframe(seconds(5.0)), 1.5, 0.2);
    c->setKeyframeInputTangents(c->getKeyframe(seconds(5.0)), -1.5, 0.2);
    auto ci = addItem(c);
    linearItem("D", {{2.0, 0.6}, {7.0, 0.6}});
    linearItem("E", {{2.0, 0.6}, {8.0, 0.6}})->select(1);
    selectInView({keypointEntry(ci, 5.0)});
    ASSERT_TRUE(frame());
    const double corner = view.keyframeAsset(item->colorIndex(), 0, 0).size.width * 0.5 - 0.5;
    ASSERT_EQ(view.keyframeAsset(item->colorIndex(), 0, 0).texture->alphaAt(0, 0), 0.0f);
    const struct {
        double t, v, dx, dy;  // a world point and a pixel offset from it
        const char* want;
    } cases[] = {
        {5.0, 0.0, 0, 0, "key A#1"},         // the image beats the lines through it
        {5.0, 0.0, corner, corner, "none"},  // a transparent corner takes no click
        {3.0, 0.0, 0, 3, "curve A"},         // three pixels from the line is on it
        {3.0, 0.0, 0, 12, "none"},           // twelve are not
        {6.5, -0.4, 0, 0, "out C#1"},        // a handle answers with its keypoint
        {3.5, -0.4, 0, 0, "in C#1"},
        {2.0, 0.6, 0, 0, "key E#0"},  // the primary channel's, drawn on top
    };
    for (const auto& k : cases)
        EXPECT_EQ(hitAt(view, ctrl(),
                        view.getPointScreen(CGPointMake(k.t, k.v)) + CGPointMake(k.dx, k.dy)),
                  k.want)
            << "at " << k.t << ", " << k.v << " + " << k.dx << ", " << k.dy;
}

TEST_F(ViewPick, rubberBand__selectsTheKeypointsItCoversAndNothingElse) {
    selectInView({keypointEntry(item, 8.0)});
    ASSERT_TRUE(frame());
    down(1.0, 0.5);  // on empty space, above the curve
    dragTo(3.0, 0.0);
    dragTo(6.0, -0.5);
    EXPECT_TRUE(view.selecting());
    EXPECT_EQ(selectedHandles(), (std::vector<TQKeyframeHandle>{k2, k5}))
        << "the band replaces the selection";
    up(6.0, -0.5);
    EXPECT_FALSE(view.selecting());
    EXPECT_EQ(view.getSelectionViewVolume(), CGRectZero) << "the band is forgotten at mouse up";
    EXPECT_EQ(countCalls("postNotification"), 0u)
        << "a plain band changes no channel and posts nothing";
    EXPECT_EQ(countCalls("startCaptureModifiedChannels"), 0u);

    // A band that covers only the curve between keypoints takes nothing.
    ASSERT_TRUE(frame());
    down(3.0, 0.2);
    dragTo(4.0, -0.2);
    EXPECT_TRUE(view.getSelection()->empty()) << "bands test keypoint images only";
    up(4.0, -0.2);
}

TEST_F(ViewPick, rubberBand__withShiftInvertsMembership) {
    selectInView({keypointEntry(item, 2.0), keypointEntry(item, 5.0)});
    ASSERT_TRUE(frame());
    down(4.0, 0.5, kShift);
    EXPECT_TRUE(view.selecting()) << "Shift on empty space starts a band at once";
    dragTo(9.0, -0.5, kShift);
    EXPECT_EQ(selectedHandles(), (std::vector<TQKeyframeHandle>{k2, k8}))
        << "the covered selected keypoint leaves, the covered unselected one joins at the end";
    dragTo(9.5, -0.5, kShift);
    EXPECT_EQ(selectedHandles(), (std::vector<TQKeyframeHandle>{k2, k8}))
        << "each step starts from mouse down's selection";
    up(9.5, -0.5, kShift);

    // Dragged leftward, new keypoints join at the front, each in front of the one before.
    ASSERT_TRUE(frame());
    selectInView({keypointEntry(item, 8.0)});
    down(6.0, 0.5, kShift);
    dragTo(1.0, -0.5, kShift);
    EXPECT_EQ(selectedHandles(), (std::vector<TQKeyframeHandle>{k5, k2, k8}));
    up(1.0, -0.5, kShift);
}

TEST_F(ViewPick, click__shiftTogglesAKeypointAndMakesItPrimary) {
    selectInView({keypointEntry(item, 2.0)});
    ASSERT_TRUE(frame());
    click(8.0, 0.0, kShift);
    EXPECT_EQ(selectedHandles(), (std::vector<TQKeyframeHandle>{k8, k2}));
    click(2.0, 0.0, kShift);
    EXPECT_EQ(selectedHandles(), std::vector<TQKeyframeHandle>{k8});
    click(5.0, 0.0, kShift);
    click(8.0, 0.0);
    EXPECT_EQ(selectedHandles(), (std::vector<TQKeyframeHandle>{k8, k5}))
        << "a plain click on a selected keypoint keeps the selection and makes it primary";
    click(3.0, 0.8, kShift);
    EXPECT_EQ(view.getSelection()->size(), 2u) << "Shift on empty space keeps the selection";
    click(3.0, 0.8);
    EXPECT_TRUE(view.getSelection()->empty()) << "a plain click on empty space empties it";
}

TEST_F(ViewPick, pick__otherToolsMakeNoEntry) {
    ASSERT_TRUE(frame());
    const CGPoint onKey = view.getPointScreen(CGPointMake(5.0, 0.0));
    {
        ctrl().setCurrentTool(TQTool::kSketch);
        view.pick(onKey);
        EXPECT_TRUE(view.getCurrentSelection()->empty()) << "sketch";
        EXPECT_EQ(view.getCurrentActivePart(), 0u);
    }
    {
        ctrl().setCurrentTool(TQTool::kBox);
        view.pick(onKey);
        EXPECT_TRUE(view.getCurrentSelection()->empty()) << "box, no band";
        EXPECT_EQ(view.getCurrentActivePart(), TQSelectionKeypoint)
            << "the box tool records the hit id";
        view.setSelecting(1);
        view.pick(onKey);
        EXPECT_EQ(view.getCurrentSelection()->size(), 1u)
            << "during a band the box tool takes keypoints";
        view.setSelecting(0);
    }
}

TEST_F(ViewPick, pick__aRecordOfAnItemThatIsGoneIsSkipped) {
    ASSERT_TRUE(frame());
    ctrl().removeChannelWithIdentifier(item->channelId(), set);
    view.getCurrentSelection()->addSelection(keypointEntry(item, 8.0));
    view.pick(view.getPointScreen(CGPointMake(5.0, 0.0)));
    EXPECT_TRUE(view.getCurrentSelection()->empty()) << "the frame is older than the set";
    view.getCurrentSelection()->addSelection(keypointEntry(item, 8.0));
    view.pick(view.getPointScreen(CGPointMake(5.0, 0.9)));
    EXPECT_EQ(view.getCurrentSelection()->size(), 1u) << "a miss calls nothing and leaves the list";
}

TEST_F(ViewPick, validateSelectedHandles__matchesByTimeAndDropsDeletedKeypoints) {
    TQCurveSelectionList saved;
    saved.addSelection(keypointEntry(item, 8.0));
    saved.addSelection(keypointEntry(item, 5.0));
    saved.addSelection(keypointEntry(item, 2.0));
    // A rebuild of the channel: new handles at 2 and 8, the keypoint at 5 gone.
    TQChannel* c = item->channel();
    c->deleteKeyframe(k5);
    const double v8 = keyValueAt(c, 8.0);
    c->deleteKeyframe(keyAt(item, 8.0));
    c->setKeyframe(seconds(8.0), v8 + 1.0);

    view.validateSelectedHandles(&saved);
    ASSERT_EQ(view.getSelection()->size(), 2u);
    EXPECT_EQ(selectedHandles(),
              (std::vector<TQKeyframeHandle>{keyAt(item, 8.0), keyAt(item, 2.0)}))
        << "order kept, value ignored";
}

TEST_F(ViewPick, selectAllFromTheController__skipsDisabledItemsAndTakesLockedKeypoints) {
    TQChannel* other = addChannel("B", {{1.0, 0.0}});
    auto disabled = addItem(other);
    other->resetFlag(kTQChannelFlagEnabledInCurveEditor);
    item->channel()->setFlag(kTQChannelFlagEnabledInCurveEditor);
    item->channel()->setKeyframeLocked(k5, true);
    object->removeChild(addItem(addChannel("Gone", {{1.0, 0.0}}))->channel());

    // The channel list reaches the view's selection through the controller.
    ctrl().selectAll(nullptr);
    EXPECT_EQ(selectedHandles(), (std::vector<TQKeyframeHandle>{k2, k5, k8}));
    for (const auto& e : view.getSelection()->getSelectionArray())
        EXPECT_EQ(e->getFlags(), TQSelectionKeypoint);
    ctrl().selectNone(nullptr);
    EXPECT_TRUE(view.getSelection()->empty());
}

}  // namespace
}  // namespace view_test
