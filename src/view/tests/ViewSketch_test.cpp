// The sketch tool through the view on the reference host: a stroke writes a keypoint at each
// drag step and erases the keypoints it passes over, in either direction, as one undo step
// that gives the curve back exactly.

#include <string>
#include <vector>

#include "src/view/tests/ViewMouseFixture.h"

namespace view_test {
namespace {

class ViewSketch : public WithReferenceHost<ViewMouseFixture> {
protected:
    void SetUp() override {
        WithReferenceHost<ViewMouseFixture>::SetUp();
        ctrl().setCurrentTool(TQTool::kSketch);
    }

    // A flat Linear channel with keypoints at every second from 1 to 8, selected for sketching.
    TQCurveEditorChannelItemPtr sketched(const char* name) {
        TQChannel* c = addChannel(name, {{1, 0}, {2, 0}, {3, 0}, {4, 0}, {5, 0}, {6, 0}, {7, 0}});
        c->setKeyframe(seconds(8), 0.0);
        c->setInterpolation(kTQInterpolationLinear);
        auto item = addItem(c);
        item->select(1);
        return item;
    }

    // Down at the first point, a drag step to each of the others, up at the last.
    void stroke(const std::vector<std::pair<double, double>>& points, uint64_t mods = 0) {
        down(points.front().first, points.front().second, mods);
        for (size_t i = 1; i < points.size(); ++i) dragTo(points[i].first, points[i].second, mods);
        up(points.back().first, points.back().second, mods);
    }

    // "time value" of each keypoint, to a millisecond and a thousandth.
    static std::string keys(const TQChannel* c) {
        std::string out;
        for (TQKeyframeHandle h : c->getKeyframes(false)) {
            CMTime t = kCMTimeInvalid;
            double v = 0.0;
            c->getKeyframe(h, &t, &v);
            char text[40];
            std::snprintf(text, sizeof text, "%s%.3g %.3g", out.empty() ? "" : ", ",
                          CMTimeGetSeconds(t), std::abs(v) < kDragTolerance ? 0.0 : v);
            out += text;
        }
        return out;
    }
};

TEST_F(ViewSketch, stroke__erasesWhatItPassesOverAsOneUndoStep) {
    struct Case {
        const char* what;
        std::vector<std::pair<double, double>> points;
        uint64_t mods;
        const char* want;
    };
    const std::vector<Case> cases = {
        {"to the right",
         {{2.5, .5}, {3.5, .6}, {4.5, .7}},
         0,
         "1 0, 2 0, 2.5 0.5, 3.5 0.6, 4.5 0.7, 5 0, 6 0, 7 0, 8 0"},
        {"to the left: the new keypoints come before the old ones",
         {{6.5, .5}, {5.5, .6}, {4.5, .7}},
         0,
         "1 0, 2 0, 3 0, 4 0, 4.5 0.7, 5.5 0.6, 6.5 0.5, 7 0, 8 0"},
        // A keypoint beyond the step's reach stays: from 2.5 a step of half a second reaches 3.
        {"short steps erase only what they reach",
         {{2.5, .5}, {3, .5}, {3.25, .5}},
         0,
         "1 0, 2 0, 2.5 0.5, 3 0.5, 3.25 0.5, 4 0, 5 0, 6 0, 7 0, 8 0"},
        {"a click alone leaves one keypoint",
         {{2.5, .5}},
         0,
         "1 0, 2 0, 2.5 0.5, 3 0, 4 0, 5 0, 6 0, 7 0, 8 0"},
        // Mostly sideways from the press: the stroke keeps the press's value.
        {"Shift holds the first axis",
         {{2.5, .5}, {3.5, .55}, {4.5, .9}},
         kShift,
         "1 0, 2 0, 2.5 0.5, 3.5 0.5, 4.5 0.5, 5 0, 6 0, 7 0, 8 0"},
    };
    for (const Case& c : cases) {
        SCOPED_TRACE(c.what);
        object->removeAllChildren();
        set->clear();
        auto item = sketched("A");
        ASSERT_TRUE(frame());
        const auto before = snapshot();
        const size_t steps = host.undoStack().undoCount();
        stroke(c.points, c.mods);
        EXPECT_EQ(keys(item->channel()), c.want);
        EXPECT_EQ(recorder.captureBalance(), 0);
        EXPECT_FALSE(view.getCapturing());
        EXPECT_EQ(host.undoStack().undoCount(), steps + 1);
        EXPECT_EQ(host.undoDescription(), TQLocalizedString("Undo Draw Curve"));
        const auto after = snapshot();
        ASSERT_TRUE(host.undo());
        EXPECT_TRUE(sceneIs(*before)) << "undo";
        ASSERT_TRUE(host.redo());
        EXPECT_TRUE(sceneIs(*after)) << "redo";
    }
}

}  // namespace
}  // namespace view_test
