// The animation menu's commands on whole channels, run on two selected channels of the sample
// piece through the reference host: the channels end as an edited copy of them, in one undo
// step under the command's name that undo and redo walk exactly; the playhead's jumps to the
// next and previous keyframe; the interpolation step left open on purpose, which the host
// closes so that undo goes on.

#include <functional>

#include "src/editor/tests/EditorFixture.h"
#include "src/resources/TQStrings.h"

using namespace editor_test;

namespace {

class ChannelCommands : public EditorFixture {
protected:
    void SetUp() override {
        EditorFixture::SetUp();
        host.selectObject(object(kTQHostSampleTitleObject));
        ctrl.showAll();
        const TQCurveSetPtr set = ctrl.selectedCurveSet();
        ASSERT_TRUE(set);
        // The first two plain channels of the object, with keyframes of our own.
        for (uint32_t i = 0; i < set->numberOfChannelItems() && items.size() < 2; ++i) {
            const TQCurveEditorItemPtr item = set->channeItemAtIndex(i);
            TQChannel* c = item->channel();
            if (!c || c->isLocked(true) || c->testFlag(kTQChannelFlagNoInterpolationChange))
                continue;
            items.push_back(std::dynamic_pointer_cast<TQCurveEditorChannelItem>(item));
        }
        ASSERT_EQ(items.size(), 2u);
        key(*a(), {{1, 1}, {2, 3}, {3, 2}});
        key(*b(), {{0.5, 10}, {4, 20}});
        for (const auto& item : items) {
            item->select(1);
            item->setOriginalCurveDirty(0);
        }
        host.undoStack().clear();
        recorder.clearCalls();
    }
    static void key(TQChannel& c, std::initializer_list<std::pair<double, double>> keys) {
        c.deleteAllKeyframes(kCMTimeZero);
        for (const auto& [t, v] : keys) c.setKeyframe(sec(t), v);
    }
    TQChannel* a() const { return items[0]->channel(); }
    TQChannel* b() const { return items[1]->channel(); }
    bool channelsAre(const Copy& wantA, const Copy& wantB) const {
        return *a() == *wantA && *b() == *wantB;
    }
    bool run(const char* action, int64_t tag = 0) {
        RWMenuItem sender(action, action);
        sender.setTag(tag);
        return ctrl.performAction(action, sender);
    }

    std::vector<TQCurveEditorChannelItemPtr> items;
};

TEST_F(ChannelCommands, each_command__one_named_step_that_undo_and_redo_walk_exactly) {
    struct Row {
        const char* action;
        int64_t tag;
        const char* undoKey;
        std::function<void(TQChannel&)> change;
    };
    const CMTime now = sec(2);
    const Row rows[] = {
        {"animMenuSetCurveInterpolation:", kTQInterpolationLinear, "Undo Set Interpolation",
         [](TQChannel& c) { c.setInterpolation(kTQInterpolationLinear); }},
        {"animMenuSetCurvePreExtrapolation:", kTQExtrapolationRepeat, "Undo Set Pre Extrapolation",
         [](TQChannel& c) { c.setExtrapolation(kTQExtrapolationRepeat, kTQExtrapolationBefore); }},
        {"animMenuSetCurvePostExtrapolation:", kTQExtrapolationPingPong,
         "Undo Set Post Extrapolation",
         [](TQChannel& c) { c.setExtrapolation(kTQExtrapolationPingPong, kTQExtrapolationAfter); }},
        {"animMenuLockChannel:", 0, "Undo Lock Keypoint",
         [](TQChannel& c) { c.setLocked(true, true); }},
        {"animMenuDisableAnimation:", 0, "Undo Chan Menu Disable Animation",
         [](TQChannel& c) { c.setAnimationEnabled(false); }},
        {"animMenuAddKeyframe:", 0, "Undo Chan Menu Add Keyframe",
         [&](TQChannel& c) { c.addKeyframe(&now); }},
        {"animMenuDeleteKeyframe:", 0, "Undo Chan Menu Delete Keyframe",
         [&](TQChannel& c) { c.deleteKeyframeAtTime(&now); }},
        {"animMenuResetChannel:", 0, "Undo Chan Menu Reset Channel",
         [](TQChannel& c) { c.reset(false); }},
    };
    host.setCurrentTime(now);
    for (const Row& row : rows) {
        SCOPED_TRACE(row.action);
        const Copy beforeA = copyOf(a()), beforeB = copyOf(b());
        Copy wantA = copyOf(a()), wantB = copyOf(b());
        row.change(static_cast<TQChannel&>(*wantA));
        row.change(static_cast<TQChannel&>(*wantB));
        recorder.clearCalls();

        ASSERT_TRUE(run(row.action, row.tag));
        EXPECT_TRUE(channelsAre(wantA, wantB));
        EXPECT_TRUE(items[0]->originalCurveDirty() && items[1]->originalCurveDirty());
        const std::string steps = recorder.bracketText();
        EXPECT_TRUE(steps.starts_with("{" + TQLocalizedString(row.undoKey) + " ") &&
                    steps.ends_with(" } !8"))
            << steps;
        EXPECT_EQ(host.undoDescription(), TQLocalizedString(row.undoKey));

        ASSERT_TRUE(host.undo());
        EXPECT_TRUE(channelsAre(beforeA, beforeB)) << "undo";
        ASSERT_TRUE(host.redo());
        EXPECT_TRUE(channelsAre(wantA, wantB)) << "redo";
        ASSERT_TRUE(host.undo());
    }
    // With no channel selected a step is still opened and posted.
    for (const auto& item : items) item->select(0);
    recorder.clearCalls();
    ASSERT_TRUE(run("animMenuResetChannel:"));
    EXPECT_EQ(recorder.bracketText(),
              "{" + TQLocalizedString("Undo Chan Menu Reset Channel") + " } !8");
}

TEST_F(ChannelCommands, ghost__back_to_the_snapshot_and_a_channel_without_one_stays) {
    ctrl.setSnapshotChannels(true);
    items[0]->setNumberOfSamples(8);
    items[0]->refreshOriginalCurve(kCMTimeZero, sec(0.5));
    items[0]->takeCurveSnapshot(1);
    const Copy ghost = copyOf(a());
    key(*a(), {{5, 5}});
    key(*b(), {{6, 6}});
    const Copy untouched = copyOf(b());
    ASSERT_TRUE(items[0]->snapshotChannel() && !items[1]->snapshotChannel());
    ASSERT_TRUE(run("animMenuSetChannelToGhost:"));
    EXPECT_TRUE(channelsAre(ghost, untouched));
}

TEST_F(ChannelCommands, interpolation__ticks_its_item_and_skips_channels_that_refuse_it) {
    RWMenu menu;
    for (const int64_t tag : {0, 1, 4, 6})
        menu.addItemWithTitle(std::to_string(tag), "x")->setTag(tag);
    menu.itemAtIndex(0)->setState(RWOnState);
    b()->setFlag(kTQChannelFlagNoInterpolationChange);
    const Copy keptB = copyOf(b());
    ctrl.animMenuSetCurveInterpolation(menu.itemWithTag(4).get());
    EXPECT_EQ(a()->getInterpolation(), kTQInterpolationBezier);
    EXPECT_TRUE(*b() == *keptB);
    for (const RWMenuItemPtr& item : menu.itemArray())
        EXPECT_EQ(item->state(), item->tag() == 4 ? RWOnState : RWOffState) << item->tag();

    // Extrapolation ticks the item at the index of the tag, not the item with the tag.
    RWMenu extrapolation;
    for (int64_t i = 0; i < 5; ++i)
        extrapolation.addItemWithTitle(std::to_string(i), "x")->setTag(4 - i);
    ctrl.animMenuSetCurvePostExtrapolation(extrapolation.itemAtIndex(1).get());
    EXPECT_EQ(a()->getExtrapolation(kTQExtrapolationAfter), 3u);
    for (int64_t i = 0; i < 5; ++i)
        EXPECT_EQ(extrapolation.itemAtIndex(i)->state(), i == 3 ? RWOnState : RWOffState) << i;
}

TEST_F(ChannelCommands, idle_host__closes_the_mixed_interpolation_step_but_not_a_drag) {
    const Copy beforeA = copyOf(a()), beforeB = copyOf(b());
    ASSERT_TRUE(run("animMenuSetCurveInterpolation:", kTQInterpolationMixed));
    EXPECT_EQ(recorder.captureBalance(), 1) << "the step stays open";
    EXPECT_EQ(recorder.count("postNotification"), 0u);
    EXPECT_TRUE(channelsAre(beforeA, beforeB));
    host.eventLoopDidGoIdle();
    EXPECT_EQ(host.undoStack().depth(), 0);
    EXPECT_FALSE(host.canUndo()) << "an empty step leaves no trace";

    ASSERT_TRUE(run("animMenuLockChannel:"));
    host.eventLoopDidGoIdle();
    const Copy lockedA = copyOf(a());
    ASSERT_TRUE(a()->isLocked(true));
    EXPECT_EQ(host.undoDescription(), TQLocalizedString("Undo Lock Keypoint"));
    ASSERT_TRUE(host.undo());
    EXPECT_TRUE(channelsAre(beforeA, beforeB));
    ASSERT_TRUE(host.redo());
    EXPECT_TRUE(*a() == *lockedA);

    // A drag of the curves is not closed by the idle host.
    recorder.suppressEventCoalescing();
    recorder.startCaptureModifiedChannels("drag");
    host.eventLoopDidGoIdle();
    EXPECT_TRUE(host.undoStack().isStepOpen());
    recorder.endCaptureModifiedChannels();
    recorder.unsuppressEventCoalescing();
}

TEST_F(ChannelCommands, keyframes__the_playhead_jumps_to_the_nearest_on_any_channel) {
    struct Row {
        const char* what;
        const char* action;
        double from;
        double expected;  // negative: the playhead stays and nothing is posted
    } rows[] = {
        {"next: the earlier of the two channels", "animMenuNextKeyframe:", 0.7, 1},
        {"next from between", "animMenuNextKeyframe:", 2.5, 3},
        {"next at the last keyframe of all", "animMenuNextKeyframe:", 4, -1},
        {"previous: the later of the two", "animMenuPreviousKeyframe:", 3.5, 3},
        {"previous with none earlier", "animMenuPreviousKeyframe:", 0.5, -1},
        {"the menu's name for it", "nextKeyframe:", 0, 0.5},
    };
    for (const Row& row : rows) {
        SCOPED_TRACE(row.what);
        host.setCurrentTime(sec(row.from));
        recorder.clearCalls();
        ASSERT_TRUE(run(row.action));
        const double want = row.expected < 0 ? row.from : row.expected;
        EXPECT_DOUBLE_EQ(CMTimeGetSeconds(host.currentTime()), want);
        EXPECT_EQ(recorder.count("postNotification"), row.expected < 0 ? 0u : 1u);
    }
    key(*b(), {{-1, 0}});
    key(*a(), {{5, 0}});
    host.setCurrentTime(sec(2));
    ASSERT_TRUE(run("animMenuPreviousKeyframe:"));
    EXPECT_DOUBLE_EQ(CMTimeGetSeconds(host.currentTime()), 2.0)
        << "a keyframe before zero is never the previous one";
    for (const auto& item : items) item->select(0);
    host.setCurrentTime(sec(0));
    ASSERT_TRUE(run("animMenuNextKeyframe:"));
    EXPECT_DOUBLE_EQ(CMTimeGetSeconds(host.currentTime()), 0.0) << "no channel selected";
}

}  // namespace
