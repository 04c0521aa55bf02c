// Keypoint operations beyond what the menu table covers: selection repair, the deletion paths'
// edges, duplicate onto taken and in-between frames, and adding through linked compounds.

#include <string>
#include <vector>

#include "src/engine/tests/EngineFixture.h"

using namespace engine_test;
using Seq = std::vector<std::string>;

class CtrlKeypoints : public EngineFixture {};

TEST_F(CtrlKeypoints, validate__repairs_a_stale_handle_by_its_stored_time) {
    TQChannel* a = addChannel("A", {{1, 3}, {2, 4}});
    TQCurveSelectionList list;
    list.addSelection(keypointEntry(addItem(a), 2));
    // An undo rebuilds the keyframe: same time, new handle.
    a->deleteKeyframe(list.selectionAtIndex(0)->getHandle());
    const TQKeyframeHandle after = a->setKeyframe(seconds(2), 4);
    ctrl().validateSelection(&list);
    EXPECT_EQ(list.selectionAtIndex(0)->getHandle(), after);
    // Nothing at the stored time: the stale handle stays, the entry too.
    a->deleteKeyframe(after);
    ctrl().validateSelection(&list);
    ASSERT_EQ(list.size(), 1u);
    EXPECT_EQ(list.selectionAtIndex(0)->getHandle(), after);
}

TEST_F(CtrlKeypoints, delete__locked_only_opens_nothing_and_the_initial_value_is_written_once) {
    TQChannel* a = addChannel("A", {{0, 0}, {1, 10}});
    auto item = addItem(a);
    {
        a->setKeyframeLocked(a->getKeyframe(seconds(1)), true);
        selectInView({keypointEntry(item, 1)});
        const auto before = snapshot();
        EXPECT_FALSE(ctrl().shouldDeleteKeypoints());
        ctrl().deleteKeypoints();
        EXPECT_TRUE(recorder.bracketSequence().empty());
        EXPECT_TRUE(sceneIs(*before));
        a->setKeyframeLocked(a->getKeyframe(seconds(1)), false);
    }
    // Written before the first deletion: a second write would read a one-key curve.
    recorder.answers.currentTime = seconds(0.5);
    const double shown = a->getCurveValue(seconds(0.5), true);
    selectInView({keypointEntry(item, 1), keypointEntry(item, 0)});
    ctrl().deleteKeypoints();
    EXPECT_EQ(a->numberOfKeyframes(), 0u);
    EXPECT_NEAR(a->getInitialValue(), shown, kValueTolerance);
    EXPECT_EQ(recorder.bracketSequence(), oneShotBracket("Delete Keypoint", {"A"}));
}

TEST_F(CtrlKeypoints, duplicate__crosses_taken_frames_and_floors_between_frames) {
    TQChannel* a = addChannel("A", {{1, 3}});
    a->setKeyframe(CMTimeMake(31, 30), 4);  // exactly on the next frame
    TQChannel* b = addChannel("B", {{1.01, 7}});
    selectInView({keypointEntry(addItem(a), 1), keypointEntry(addItem(b), 1.01)});
    auto want = snapshot();
    named(*want, "A").cloneKeyframe(named(*want, "A").getKeyframe(seconds(1)), CMTimeMake(32, 30));
    named(*want, "B")
        .cloneKeyframe(named(*want, "B").getKeyframe(seconds(1.01)), CMTimeMake(30, 30));
    ctrl().menuDuplicate();
    EXPECT_TRUE(sceneIs(*want));
    EXPECT_EQ(recorder.bracketSequence(), oneShotBracket("Duplicate Keypoints", {"A", "B"}));
    EXPECT_EQ(view.getSelection()->size(), 2u) << "the selection is not changed";
}

class CtrlKeypointsOnGrid : public CtrlKeypoints {
protected:
    std::unique_ptr<TQCurveEditorCtrlBase> makeController() override {
        return std::make_unique<FrameGridController>();
    }
};

TEST_F(CtrlKeypointsOnGrid, addVertex__on_the_grid_and_through_linked_compounds) {
    TQCompoundChannel* pos = addCompound("Pos", 3, true, {{0, 0}, {4, 8}});
    auto ix = addItem(static_cast<TQChannel*>(pos->getChild(0)));
    ix->setScaleY(1.0);
    auto want = snapshot();
    for (const char* n : {"X", "Y", "Z"}) {
        TQChannel& c = named(*want, n);
        c.setKeyframe(CMTimeMake(60, 30), c.getCurveValue(seconds(2), false));
    }
    {
        auto entry = curveEntry(ix);
        EXPECT_EQ(ctrl().addVertex(entry, seconds(2.01)), entry);
        EXPECT_TRUE(entry->isKeypoint());
        EXPECT_EQ(entry->getHandle(), pos->getComponents()[0]->getKeyframe(seconds(2.0)));
        EXPECT_TRUE(sceneIs(*want)) << "every component, on the frame grid";
    }
    {
        ctrl().addVertex(curveEntry(ix), seconds(3), 6.5, 1);
        EXPECT_NEAR(keyValueAt(pos->getComponents()[0], 3), 6.5, kValueTolerance);
        EXPECT_NE(pos->getComponents()[2]->getKeyframe(seconds(3)), nullptr);
        ctrl().deleteVertex(keypointEntry(ix, 3).get(), seconds(3));
        EXPECT_TRUE(sceneIs(*want)) << "deleted from every component";
    }
}

TEST_F(CtrlKeypoints, menuAddKeyframe__records_one_channel_without_a_capture) {
    TQChannel* a = addChannel("A", {{1, 2}});
    selectInView({curveEntry(addItem(a))});
    ctrl().menuAddKeyframe();
    const Seq expected = {"addChannelToUndo(A,Add Keypoint)",
                          "willChangeChannel(A)",
                          "willSetChannelValue(A)",
                          "didSetChannelValue(A)",
                          "didChangeChannel(A)",
                          "postNotification(0x8)"};
    EXPECT_EQ(recorder.bracketSequence(), expected);
    EXPECT_EQ(a->numberOfKeyframes(), 2u);
    ASSERT_EQ(view.getSelection()->size(), 1u);
    EXPECT_TRUE(view.getSelection()->selectionAtIndex(0)->isKeypoint());
}

TEST_F(CtrlKeypoints, purge_and_clean__settle_channels_and_leave_the_list) {
    TQChannel* a = addChannel("A", {{1, 1}, {2, 2}});
    auto item = addItem(a);
    const CMTime from = seconds(1), to = seconds(2);
    a->moveKeyframe(&from, &to, true);
    TQCurveSelectionList list;
    list.addSelection(tangentEntry(item, 2, true));
    list.addSelection(keypointEntry(item, 2));
    ctrl().cleanSelection(&list);
    EXPECT_EQ(list.size(), 2u) << "cleanSelection has no effect";
    ctrl().purgeSelected(&list);
    EXPECT_EQ(a->numberOfKeyframes(), 1u);
}
