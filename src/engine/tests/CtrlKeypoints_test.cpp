// Keypoint operations: selection repair, delete with its initial value, duplicate, reverse,
// lock, disable, ease, and the add/delete paths through linked compounds.

#include <string>
#include <vector>

#include "src/engine/tests/EngineFixture.h"

using namespace engine_test;
using Seq = std::vector<std::string>;

class CtrlKeypoints : public EngineFixture {};

TEST_F(CtrlKeypoints, validate__repairs_a_stale_handle_by_its_stored_time) {
    TQChannel* a = addChannel("A", {{1, 3}, {2, 4}});
    auto item = addItem(a);
    TQCurveSelectionList list;
    list.addSelection(keypointEntry(item, 2));
    const TQKeyframeHandle before = list.selectionAtIndex(0)->getHandle();

    // An undo rebuilds the keyframe: same time, new handle.
    a->deleteKeyframe(before);
    const TQKeyframeHandle after = a->setKeyframe(seconds(2), 4);
    ctrl().validateSelection(&list);
    EXPECT_EQ(list.selectionAtIndex(0)->getHandle(), after);

    // Nothing at the stored time: the stale handle stays, the entry too.
    a->deleteKeyframe(after);
    ctrl().validateSelection(&list);
    EXPECT_EQ(list.size(), 1u);
    EXPECT_EQ(list.selectionAtIndex(0)->getHandle(), after);
}

TEST_F(CtrlKeypoints, delete__locked_keypoint_opens_no_bracket) {
    TQChannel* a = addChannel("A", {{1, 3}});
    auto item = addItem(a);
    auto entry = keypointEntry(item, 1);
    a->setKeyframeLocked(entry->getHandle(), true);
    selectInView({entry});
    EXPECT_FALSE(ctrl().shouldDeleteKeypoints());
    ctrl().deleteKeypoints();
    EXPECT_TRUE(recorder.bracketSequence().empty());
    EXPECT_EQ(a->numberOfKeyframes(), 1u);
}

TEST_F(CtrlKeypoints, delete__keeps_the_present_value_in_the_initial_value_once) {
    TQChannel* a = addChannel("A", {{0, 0}, {1, 10}});
    auto item = addItem(a);
    recorder.answers.currentTime = seconds(0.5);
    const double shown = a->getCurveValue(seconds(0.5), true);
    selectInView({keypointEntry(item, 0), keypointEntry(item, 1)});

    ctrl().deleteKeypoints();

    EXPECT_EQ(a->numberOfKeyframes(), 0u);
    // Written once, before the first deletion: a second write would read a one-key curve.
    EXPECT_NEAR(a->getInitialValue(), shown, kValueTolerance);
    EXPECT_EQ(recorder.bracketSequence().front(), "startCaptureModifiedChannels(Delete Keypoint)");
    EXPECT_EQ(recorder.bracketSequence().back(), "postNotification(0x8)");
    EXPECT_EQ(recorder.captureBalance(), 0);
}

TEST_F(CtrlKeypoints, delete__through_a_linked_compound_removes_every_component) {
    TQCompoundChannel* pos = addCompound("Pos", 3, true, {{1, 2}, {2, 5}});
    auto ix = addItem(static_cast<TQChannel*>(pos->getChild(0)));
    auto iy = addItem(static_cast<TQChannel*>(pos->getChild(1)));
    TQCurveSelectionList list;
    list.addSelection(keypointEntry(ix, 1));
    list.addSelection(keypointEntry(iy, 1));  // goes stale when X's deletion takes Y's too
    ctrl().deleteSelected(&list);
    for (TQChannel* c : pos->getComponents()) {
        EXPECT_EQ(keyTimes(c), std::vector<double>{2.0}) << c->getName();
    }
}

TEST_F(CtrlKeypoints, duplicate__on_two_channels_brackets_and_lands_on_free_frames) {
    TQChannel* a = addChannel("A", {{1, 3}});
    a->setKeyframe(CMTimeMake(31, 30), 4);  // exactly on the next frame
    TQChannel* b = addChannel("B", {{1.01, 7}});
    auto ia = addItem(a);
    auto ib = addItem(b);
    selectInView({keypointEntry(ia, 1), keypointEntry(ib, 1.01)});

    ctrl().menuDuplicate();

    EXPECT_EQ(recorder.bracketSequence(), oneShotBracket("Duplicate Keypoints", {"A", "B"}));
    {
        // The next frame is taken: the copy goes to the first free one after it.
        const std::vector<double> times = keyTimes(a);
        ASSERT_EQ(times.size(), 3u);
        EXPECT_NEAR(times[2], 1 + 2.0 / 30, 1e-9);
    }
    {
        // Between frames: the copy floors to the frame before its source.
        const std::vector<double> times = keyTimes(b);
        ASSERT_EQ(times.size(), 2u);
        EXPECT_NEAR(times[0], 1.0, 1e-9);
        EXPECT_NEAR(keyValueAt(b, 1.0), 7.0, kValueTolerance);
    }
    EXPECT_EQ(view.getSelection()->size(), 2u) << "the selection is not changed";
}

TEST_F(CtrlKeypoints, reverse__each_curve_over_its_own_span) {
    TQChannel* a = addChannel("A", {{1, 1}, {2, 2}, {3, 3}});
    TQChannel* b = addChannel("B", {{0, 10}, {4, 20}});
    auto ia = addItem(a);
    auto ib = addItem(b);
    TQCurveSelectionList list;
    list.addSelection(keypointEntry(ia, 1));
    list.addSelection(keypointEntry(ib, 4));
    list.addSelection(keypointEntry(ia, 3));
    list.addSelection(keypointEntry(ib, 0));
    ctrl().reverseSelected(&list);
    EXPECT_NEAR(keyValueAt(a, 1), 3.0, kValueTolerance);
    EXPECT_NEAR(keyValueAt(a, 3), 1.0, kValueTolerance);
    EXPECT_NEAR(keyValueAt(b, 0), 20.0, kValueTolerance);
}

TEST_F(CtrlKeypoints, lock__mixed_selection_takes_the_opposite_of_the_first) {
    TQChannel* a = addChannel("A", {{1, 1}, {2, 2}});
    auto item = addItem(a);
    TQCurveSelectionList list;
    list.addSelection(keypointEntry(item, 1));
    list.addSelection(keypointEntry(item, 2));
    a->setKeyframeLocked(list.selectionAtIndex(0)->getHandle(), true);
    ctrl().lockSelected(&list);
    EXPECT_FALSE(a->getKeyframeLocked(list.selectionAtIndex(0)->getHandle()));
    EXPECT_FALSE(a->getKeyframeLocked(list.selectionAtIndex(1)->getHandle()));

    // Linked: every component's keyframe at that time follows.
    TQCompoundChannel* pos = addCompound("Pos", 2, true, {{1, 0}});
    auto ix = addItem(static_cast<TQChannel*>(pos->getChild(0)));
    TQCurveSelectionList linked;
    linked.addSelection(keypointEntry(ix, 1));
    ctrl().disableSelected(&linked);
    for (TQChannel* c : pos->getComponents())
        EXPECT_FALSE(c->getKeyframeEnabled(c->getKeyframe(seconds(1)))) << c->getName();
}

TEST_F(CtrlKeypoints, ease__in_out_and_both_on_their_segments) {
    TQChannel* a = addChannel("A", {{1, 0}, {2, 1}, {3, 0}});
    auto item = addItem(a);
    for (TQKeyframeHandle h : a->getKeyframes(false))
        a->setKeyframeInterpolation(h, kTQInterpolationBezier);
    const auto interp = [&](double t) {
        return a->getKeyframeInterpolation(a->getKeyframe(seconds(t)));
    };
    TQCurveSelectionList first;
    first.addSelection(keypointEntry(item, 1));
    TQCurveSelectionList middle;
    middle.addSelection(keypointEntry(item, 2));
    {
        ctrl().easeInSelected(&first);
        EXPECT_EQ(interp(1), kTQInterpolationBezier)
            << "the first keypoint has no arriving segment";
    }
    {
        ctrl().easeBothSelected(&middle);
        EXPECT_EQ(interp(1), kTQInterpolationEaseIn);
        EXPECT_EQ(interp(2), kTQInterpolationEaseOut);
    }
    {
        TQCurveSelectionList last;
        last.addSelection(keypointEntry(item, 3));
        ctrl().easeInSelected(&last);  // predecessor has 16: becomes 15
        EXPECT_EQ(interp(2), kTQInterpolationEaseBoth);
        ctrl().easeOutSelected(&middle);
        EXPECT_EQ(interp(2), kTQInterpolationEaseBoth);
    }
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
    {
        auto entry = EngineFixture::curveEntry(ix);
        auto result = ctrl().addVertex(entry, seconds(2.01));
        EXPECT_EQ(result, entry);
        EXPECT_TRUE(entry->isKeypoint());
        for (TQChannel* c : pos->getComponents())
            EXPECT_NE(c->getKeyframe(seconds(2.0)), nullptr)
                << c->getName() << ": on the frame grid";
        EXPECT_EQ(entry->getHandle(), pos->getComponents()[0]->getKeyframe(seconds(2.0)));
    }
    {
        ix->setScaleY(1.0);
        auto entry = EngineFixture::curveEntry(ix);
        ctrl().addVertex(entry, seconds(3), 6.5, 1);
        EXPECT_NEAR(keyValueAt(pos->getComponents()[0], 3), 6.5, kValueTolerance);
        EXPECT_NE(pos->getComponents()[2]->getKeyframe(seconds(3)), nullptr);
    }
    {
        ctrl().deleteVertex(keypointEntry(ix, 3).get(), seconds(3));
        for (TQChannel* c : pos->getComponents())
            EXPECT_EQ(c->getKeyframe(seconds(3)), nullptr) << c->getName();
    }
}

TEST_F(CtrlKeypoints, menuAddKeyframe__records_one_channel_without_a_capture) {
    TQChannel* a = addChannel("A", {{1, 2}});
    auto item = addItem(a);
    selectInView({EngineFixture::curveEntry(item)});
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
