// The box tool through the view: the box a band leaves (with any tool), its parts, how each
// part's drag moves the corners with each modifier and the keypoints with them. A box drag as
// one undo step is in the gesture table.

#include <sstream>
#include <string>

#include "src/view/tests/ViewFixture.h"

namespace view_test {
namespace {

class ViewBox : public ViewFixture {
protected:
    void SetUp() override {
        ViewFixture::SetUp();
        ctrl().setCurrentTool(TQTool::kBox);
        recorder.clearCalls();
    }
    // A band from (1, 0.9) to (7, -0.9), in two steps.
    void band(const char* to = "7 -.9") {
        ASSERT_TRUE(frame());
        gesture(std::string("d 1 .9|m 4 0|m ") + to + "|u " + to);
    }
    // The corners from the bottom left, counter-clockwise, as "x=y" to three digits.
    std::string corners() const {
        std::ostringstream out;
        out.precision(3);
        for (const CGPoint& p : {view.fourCornersBottomLeft(), view.fourCornersBottomRight(),
                                 view.fourCornersTopRight(), view.fourCornersTopLeft()})
            out << (out.tellp() > 0 ? " " : "") << p.x << "=" << p.y;
        return out.str();
    }
};

TEST_F(ViewBox, band__leaves_a_box_around_what_it_caught_with_any_tool) {
    build("A: 2=0/1 4=0.5/1 6=-0.25/1");
    ASSERT_TRUE(frame());
    gesture("d 1 .9|m 4 0|m 7 -.9");
    ASSERT_TRUE(frame());
    EXPECT_TRUE(frameMatches("frame-band")) << "the band as it is dragged";
    gesture("u 7 -.9");
    EXPECT_EQ(corners(), "2=-0.25 6=-0.25 6=0.5 2=0.5");
    EXPECT_EQ(view.getEditBox(), CGRectMake(2, -0.25, 4, 0.75)) << "what a host keeps for undo";
    ASSERT_TRUE(frame());
    EXPECT_TRUE(frameMatches("frame-box"));
    gesture("c 9 .9");
    EXPECT_FALSE(view.fourCornerBoxInitialized()) << "a click off the box forgets it";
    EXPECT_EQ(selectionText(), "") << "and what it held";
    band("3 -.9");
    EXPECT_FALSE(view.fourCornerBoxInitialized()) << "one keypoint makes no box";
    ctrl().setCurrentTool(TQTool::kEdit);
    band();
    ASSERT_TRUE(view.fourCornerBoxInitialized()) << "the edit tool's band makes one too";
    EXPECT_EQ(corners(), "2=-0.25 6=-0.25 6=0.5 2=0.5");
    ASSERT_TRUE(frame());
    EXPECT_EQ(frameText().find(" loop"), std::string::npos) << "and does not show it";
    ctrl().setCurrentTool(TQTool::kBox);
    EXPECT_FALSE(view.fourCornerBoxInitialized()) << "a change of tool forgets it";
    band();
    ASSERT_TRUE(view.fourCornerBoxInitialized());
    view.frameAll(1);
    EXPECT_FALSE(view.fourCornerBoxInitialized()) << "and so does framing all";
}

// The pointer moves 40 px across and 50 px up at each drag; the box is 4 by 1 again each
// time, and the keypoints that lay on two corners lie on them still. The corners after each
// drag are recorded in baselines/box-drags.txt.
TEST_F(ViewBox, drag__each_part_moves_the_corners_and_the_keypoints_with_them) {
    build("A: 2=-0.5 6=0.5");
    band();
    const struct {
        const char* what;
        const char* script;
    } cases[] = {
        {"corner: a rectangle stays one", "d 2 -.5|m 2.5 -.25|u 2.5 -.25"},
        {"corner, Command: alone", "d 2 -.5 c|m 2.5 -.25 c|u 2.5 -.25 c"},
        {"corner, Option: about the centre", "d 2 -.5 o|m 2.5 -.25 o|u 2.5 -.25 o"},
        {"corner, Shift: the aspect kept", "d 6 .5 s|m 6.5 .75 s|u 6.5 .75 s"},
        {"top side, Shift: widened evenly", "d 4 .5 s|m 4.5 .75 s|u 4.5 .75 s"},
        {"right side, Option: mirrored", "d 6 0 o|m 6.5 .25 o|u 6.5 .25 o"},
        {"left side, Shift: heightened evenly", "d 2 0 s|m 1.5 .25 s|u 1.5 .25 s"},
        {"inside", "d 4 .1|m 4.5 .35|u 4.5 .35"},
        {"inside, Shift: along the larger distance", "d 4 .1 s|m 4.5 .2 s|u 4.5 .2 s"},
        {"corner after Shift drags: free again", "d 2 -.5|m 2.5 -.25|u 2.5 -.25"},
        {"corner, Shift, on a distorted box: each corner keeps its place in the box",
         "d 2 -.5 c|m 2.5 -.25 c|u 2.5 -.25 c|d 6 .5 s|m 6.5 .75 s|u 6.5 .75 s"},
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(c.what);
        view.setEditBox(CGRectMake(2.0, -0.5, 4.0, 1.0));  // the keypoints go back with it
        ASSERT_TRUE(frame());
        gesture(c.script);
        const std::string now = corners();
        EXPECT_TRUE(tests_support::matchesBaselineBlock("box-drags", c.what, now + "\n",
                                                        "src/view/tests/baselines"));
        std::istringstream all(now);
        std::string bl, br, tr;
        all >> bl >> br >> tr;
        EXPECT_EQ(keyText(*item("A")->channel(), false, 3), bl + " " + tr)
            << "the keypoints on the bottom left and top right";
    }
}

// Unlike the edit drag, the box drag keeps every sample of the curves it deforms; without
// auto-zoom it pans only once the box's top edge enters the band.
TEST_F(ViewBox, drag__keeps_the_curves_whole_and_pans_once_the_box_enters_the_band) {
    build("A: 2=-0.5 6=0.5");
    band();
    gesture("z");
    ASSERT_TRUE(frame());
    const uint32_t full = item("A")->numberOfSamples();
    gesture("d 4 0|m 4 .3");
    EXPECT_TRUE(item("A")->drawGhost()) << "from the first step";
    EXPECT_EQ(item("A")->numberOfSamples(), full);
    const CGPoint fromPress = view.getOffsetFromOriginWorld(0.0, 0.0);
    EXPECT_NEAR(fromPress.x, 0.0, kWorldTolerance);
    EXPECT_NEAR(fromPress.y, 0.3, kWorldTolerance);
    const CGPoint step = view.getPointWorld(CGPointMake(20, 0)) - view.getPointWorld(CGPointZero);
    EXPECT_NEAR(view.getOffsetFromOriginWorld(20, 0).x, step.x, kWorldTolerance);
    gesture("u 4 .3");
    ASSERT_TRUE(frame());
    gesture("d 4 .3|m 4 -.3|u 4 -.3");
    ASSERT_TRUE(frame());
    gesture("d 4 -.3|m 2.5 -.3|u 2.5 -.3");
    EXPECT_TRUE(range().panned.empty()) << "top 0.8, bottom -0.8, left 0.5: short of the edges";
    ASSERT_TRUE(frame());
    gesture("d 2.5 -.3|m 2.5 .45|u 2.5 .45");
    EXPECT_EQ(range().panned.size(), 1u) << "a top at 0.95 is in it";
}

}  // namespace
}  // namespace view_test
