// Picking: what the hit test of a frame answers at a point, what the other tools take, and the
// selection repairs and commands. What a click and a band take is in the gesture table.

#include <sstream>
#include <string>

#include "src/view/tests/ViewFixture.h"

namespace view_test {
namespace {

class ViewPick : public ViewFixture {};

// The one record the hit test answers at a point of the last frame, as "kind name#key", or
// "none". Keys are numbered per channel in time order.
std::string hitAt(const TQCurveEditorViewBase& view, const TQCurveEditorCtrlBase& ctrl,
                  const CGPoint& screen) {
    const HXDRenderController* rc = view.renderController();
    const auto context = rc->renderingContextForHitTestAtCoords(
        HXDFloat2{static_cast<float>(screen.x), static_cast<float>(screen.y)});
    const auto hits = rc->newHitTestResultForPrimitives(view.selectionPrimitives(), context, true);
    if (hits.size() != 1) return hits.empty() ? "none" : "several";
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
    // B runs through A's keypoint at 5 two pixels below it; C has broken handles at its middle
    // keypoint, selected; D and E share a keypoint, E primary.
    build(
        "A: 2=0/1 5=0/1 8=0/1; B: 0.5=-0.01/1 9.5=-0.01/1; C: 1=-0.6 5=-0.6(-1.5,0.2|1.5,0.2)b "
        "9=-0.6; D: 2=0.6/1 7=0.6/1; E: 2=0.6/1 8=0.6/1");
    item("E")->select(1);
    select("C@5");
    ASSERT_TRUE(frame());
    const double corner = view.keyframeAsset(item("A")->colorIndex(), 0, 0).size.width * 0.5 - 0.5;
    ASSERT_EQ(view.keyframeAsset(item("A")->colorIndex(), 0, 0).texture->alphaAt(0, 0), 0.0f);
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

// Saved handles are matched again by time; then the sketch tool takes nothing, a record of an
// item that went is skipped, and a miss leaves the list.
TEST_F(ViewPick, stale_records__handles_matched_by_time_and_records_of_items_that_went) {
    build("A: 2=0/1 5=0/1 8=0/1");
    TQCurveSelectionList saved;
    for (const char* e : {"A@8", "A@5", "A@2"}) saved.addSelection(entry(e));
    // A rebuild of the channel: new handles at 2 and 8, the keypoint at 5 gone.
    TQChannel* c = item("A")->channel();
    c->deleteKeyframe(c->getKeyframe(seconds(5)));
    c->deleteKeyframe(c->getKeyframe(seconds(8)));
    c->setKeyframe(seconds(8.0), 1.0);
    view.validateSelectedHandles(&saved);
    EXPECT_EQ(selectionText(), "A@8 A@2") << "order kept, value ignored";
    view.validateSelectedHandles(view.getSelection());
    view.validateSelectedHandles(nullptr);
    EXPECT_EQ(selectionText(), "A@8 A@2") << "its own list, or none, changes nothing";

    ASSERT_TRUE(frame());
    const CGPoint onKey = view.getPointScreen(CGPointMake(2.0, 0.0));
    ctrl().setCurrentTool(TQTool::kSketch);
    view.pick(onKey);
    EXPECT_EQ(view.getCurrentSelection()->size() + view.getCurrentActivePart(), 0u);
    ctrl().setCurrentTool(TQTool::kEdit);
    ctrl().removeChannelWithIdentifier(item("A")->channelId(), set);
    view.getCurrentSelection()->addSelection(entry("A@8"));
    view.pick(onKey);
    EXPECT_TRUE(view.getCurrentSelection()->empty()) << "the frame is older than the set";
    view.getCurrentSelection()->addSelection(entry("A@8"));
    view.pick(view.getPointScreen(CGPointMake(5.0, 0.9)));
    EXPECT_EQ(view.getCurrentSelection()->size(), 1u) << "a miss calls nothing";
}

TEST_F(ViewPick, selectAll__skips_disabled_items_and_takes_locked_keypoints) {
    build("A: 2=0/1 5=0/1L 8=0/1; B: 1=0; Gone: 1=0");
    item("B")->channel()->resetFlag(kTQChannelFlagEnabledInCurveEditor);
    item("A")->channel()->setFlag(kTQChannelFlagEnabledInCurveEditor);
    const auto gone = item("Gone");
    object->removeChild(gone->channel());
    ctrl().selectAll(nullptr);
    EXPECT_EQ(selectionText(), "A@2 A@5 A@8");
    ctrl().selectNone(nullptr);
    EXPECT_EQ(selectionText(), "");
    for (const auto& selected : {gone, item("B"), item("A")}) selected->select(1);
    EXPECT_EQ(view.channelsForSelection(),
              (std::vector<TQChannelBase*>{item("A")->channel(), item("B")->channel()}));
}

}  // namespace
}  // namespace view_test
