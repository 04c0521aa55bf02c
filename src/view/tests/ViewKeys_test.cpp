// The view's actions for a key map and its right-click menu, through the view on the
// reference host: nudges land on the frame grid one undo step each, Delete takes the selected
// keypoints (and only the box with the box tool), a right click selects what it hits and
// answers that kind's menu.

#include <string>
#include <vector>

#include "src/view/tests/ViewMouseFixture.h"

namespace view_test {
namespace {

// Puts axis times on the host's 1/30 s frames, as the full editor does.
class FrameGridRangeController : public RangeController {
public:
    CMTime convertToCurveEditorAxis(CMTime time) const override {
        return BN_CMTimeFloorToSampleDuration(BN_CMTimeSaferAdd(time, CMTimeMake(1, 60)),
                                              CMTimeMake(1, 30));
    }
    bool shouldConstrainToFrames() const override { return true; }
};

class ViewKeys : public WithReferenceHost<ViewMouseFixture> {
protected:
    std::unique_ptr<TQCurveEditorCtrlBase> makeController() override {
        return std::make_unique<FrameGridRangeController>();
    }

    // What a key map does: the action sent by name.
    bool send(const char* action) {
        struct KeySender final : RWActionSender {
            int64_t tag() const override { return 0; }
        } sender;
        return view.performAction(action, sender);
    }

    // A Bezier channel of keypoints at 2, 5 and 8 s (0, .5, 0) whose keypoint at 5 has its
    // handles a second and .2 to either side; the channel item is selected.
    TQCurveEditorChannelItemPtr bezierItem() {
        TQChannel* c = addChannel("A", {{2, 0}, {5, .5}, {8, 0}});
        c->setInterpolation(kTQInterpolationBezier);
        const TQKeyframeHandle k = c->getKeyframe(seconds(5));
        c->setKeyframeOutputTangents(k, 1.0, 0.2);
        c->setKeyframeInputTangents(k, -1.0, -0.2);
        auto item = addItem(c);
        item->select(1);
        return item;
    }
};

TEST_F(ViewKeys, nudges__stepByAFrameAndAPixelOneUndoStepEach) {
    TQChannel* c = addChannel("A", {});
    c->setKeyframe(CMTimeMake(10, 30), 0.25);
    c->setKeyframe(CMTimeMake(20, 30), 0.5);
    auto item = addItem(c);
    ASSERT_TRUE(frame());
    // Entries of frame times, which seconds() would not hit exactly.
    const auto atFrame = [&](int64_t frame) {
        auto entry = std::make_shared<TQCurveSelection>();
        entry->setCurveId(item->channelId());
        entry->setFlags(TQSelectionKeypoint);
        entry->setHandle(c->getKeyframe(CMTimeMake(frame, 30)));
        return entry;
    };
    selectInView({atFrame(10), atFrame(20)});
    const auto before = snapshot();

    ASSERT_TRUE(send("nudgeRight:"));
    ASSERT_TRUE(send("nudgeRight:"));
    ASSERT_TRUE(send("nudgeLeft:"));
    ASSERT_TRUE(send("nudgeUp:"));
    ASSERT_TRUE(send("nudgeUpFinished:"));
    std::vector<CMTime> times;
    for (TQKeyframeHandle h : c->getKeyframes(false)) {
        CMTime t = kCMTimeInvalid;
        c->getKeyframe(h, &t, nullptr);
        times.push_back(t);
    }
    ASSERT_EQ(times.size(), 2u) << describe(*object);
    EXPECT_EQ(CMTimeCompare(times[0], CMTimeMake(11, 30)), 0) << describe(*object);
    EXPECT_EQ(CMTimeCompare(times[1], CMTimeMake(21, 30)), 0) << describe(*object);
    // One drawable pixel of the 2-unit-high volume on 400 pixels.
    double value = 0.0;
    c->getKeyframe(c->getKeyframe(CMTimeMake(11, 30)), nullptr, &value);
    EXPECT_NEAR(value, 0.25 + 2.0 / 400.0, kDragTolerance);

    EXPECT_EQ(recorder.captureBalance(), 0);
    EXPECT_FALSE(view.getCapturing());
    EXPECT_EQ(host.undoStack().undoCount(), 4u);
    // Every key's step is named a deletion: the history has always read so.
    EXPECT_EQ(host.undoDescription(), TQLocalizedString("Undo Delete Keypoint"));
    while (host.canUndo()) ASSERT_TRUE(host.undo());
    EXPECT_TRUE(sceneIs(*before));

    EXPECT_FALSE(send("nudgeSideways:"));
}

TEST_F(ViewKeys, delete__takesTheSelectedKeypointsOrOnlyTheBoxOfTheBoxTool) {
    auto item = bezierItem();
    TQChannel* c = item->channel();
    ASSERT_TRUE(frame());
    {
        SCOPED_TRACE("edit tool");
        selectInView({keypointEntry(item, 5), keypointEntry(item, 8)});
        const auto before = snapshot();
        ASSERT_TRUE(send("delete:"));
        EXPECT_EQ(keyTimes(c), (std::vector<double>{2}));
        EXPECT_TRUE(view.getSelection()->empty());
        EXPECT_EQ(host.undoStack().undoCount(), 1u);
        ASSERT_TRUE(host.undo());
        EXPECT_TRUE(sceneIs(*before));
    }
    {
        SCOPED_TRACE("box tool");
        ctrl().setCurrentTool(TQTool::kBox);
        selectInView({keypointEntry(item, 2), keypointEntry(item, 5)});
        view.setEditBox(CGRectMake(2, 0, 3, .5));
        const auto before = snapshot();
        recorder.clearCalls();
        ASSERT_TRUE(send("delete:"));
        EXPECT_TRUE(sceneIs(*before));
        EXPECT_FALSE(view.fourCornerBoxInitialized());
        EXPECT_TRUE(view.getSelection()->empty());
        EXPECT_EQ(postedWords(), (std::vector<TQNotificationWord>{kTQNotifyChannelsChanged,
                                                                  kTQNotifyChannelsChanged}));
    }
}

TEST_F(ViewKeys, rightClick__selectsWhatItHitsAndAnswersThatKindsMenu) {
    auto item = bezierItem();
    auto other = addItem(addChannel("B", {{1, -.5}, {9, -.5}}));
    const auto rightClick = [&](double t, double v, uint64_t mods = 0) {
        EXPECT_TRUE(frame());
        return view.menuForEvent(mouseAt(RWEventType::RightMouseDown, CGPointMake(t, v), mods));
    };
    const auto primary = [&] { return view.getSelection()->selectionAtIndex(0); };
    {
        SCOPED_TRACE("a keypoint of another curve: selected alone");
        selectInView({keypointEntry(other, 1)});
        EXPECT_EQ(rightClick(5, .5), ctrl().getKeyframeMenu());
        EXPECT_EQ(selectedHandles(), (std::vector<TQKeyframeHandle>{keyAt(item, 5)}));
    }
    {
        SCOPED_TRACE("a selected keypoint: the selection stays, the keypoint leads it");
        selectInView({keypointEntry(item, 2), keypointEntry(item, 5)});
        EXPECT_EQ(rightClick(5, .5), ctrl().getKeyframeMenu());
        EXPECT_EQ(selectedHandles(),
                  (std::vector<TQKeyframeHandle>{keyAt(item, 5), keyAt(item, 2)}));
    }
    {
        SCOPED_TRACE("the handle of the selected keypoint");
        selectInView({keypointEntry(item, 5)});
        EXPECT_EQ(rightClick(6, .7), ctrl().getTangentMenu());
        ASSERT_TRUE(primary());
        EXPECT_TRUE(primary()->isTangent());
    }
    {
        SCOPED_TRACE("a curve: it replaces the selection");
        selectInView({keypointEntry(item, 5)});
        EXPECT_EQ(rightClick(5, -.5), ctrl().getCurveMenu());
        ASSERT_EQ(view.getSelection()->size(), 1u);
        EXPECT_TRUE(primary()->isCurve());
        EXPECT_EQ(primary()->getCurveId(), other->channelId());
    }
    {
        SCOPED_TRACE("empty space: the selection stays");
        selectInView({keypointEntry(item, 5)});
        EXPECT_EQ(rightClick(3.5, .9), ctrl().getDefaultMenu());
        EXPECT_EQ(selectedHandles(), (std::vector<TQKeyframeHandle>{keyAt(item, 5)}));
    }
}

}  // namespace
}  // namespace view_test
