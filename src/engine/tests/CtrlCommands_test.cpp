// Every keypoint and tangent command of the menus, run as a user runs it on one scene through
// the reference host: the channels end as wanted (the whole tree compared), the changed curves
// are marked for a redraw, the host sees one balanced bracket under the command's name, and
// undo gives back the scene exactly, redo the result.

#include <functional>
#include <string>
#include <vector>

#include "src/engine/tests/EngineFixture.h"
#include "src/resources/TQStrings.h"

using namespace engine_test;

namespace {

// The present value goes into the initial value before a curve loses keypoints.
void settle(TQChannel& c) { c.setInitialValue(c.getCurveValue(seconds(0), true), false); }
TQKeyframeHandle at(TQChannel& c, double t) { return c.getKeyframe(seconds(t)); }
void forXyz(TQChannelBase& root, const std::function<void(TQChannel&)>& edit) {
    for (const char* n : {"X", "Y", "Z"}) edit(named(root, n));
}

struct Command {
    const char* action;
    const char* undoKey;
    const char* dirty;  // items marked for a redraw, by channel name
    std::function<void(TQChannelBase& want)> expect;
};

void PrintTo(const Command& c, std::ostream* os) { *os << c.action; }

class CtrlCommands : public WithReferenceHost<EngineFixture>,
                     public ::testing::WithParamInterface<Command> {
protected:
    void SetUp() override {
        WithReferenceHost::SetUp();
        a = addChannel("A", {{1, 1}, {2, 3}, {3, 2}});
        b = addChannel("B", {{0, 10}, {4, 20}});
        TQCompoundChannel* pos = addCompound("Pos", 3, true, {{1, 2}, {2, 5}});
        for (TQChannel* c : {a, b, static_cast<TQChannel*>(pos->getChild(0))})
            items.push_back(addItem(c));
        a->setKeyframeLocked(at(*a, 1), true);
        // The primary entry is unlocked and enabled; A's locked keypoint rides along.
        selectInView({keypointEntry(items[0], 2), keypointEntry(items[2], 1),
                      keypointEntry(items[1], 4), keypointEntry(items[0], 1),
                      keypointEntry(items[1], 0)});
        for (const auto& item : items) item->setOriginalCurveDirty(0);
        recorder.clearCalls();
    }
    std::string dirtyItems() const {
        std::string out;
        for (const auto& item : items)
            if (item->originalCurveDirty()) out += item->channel()->getName();
        return out;
    }

    TQChannel* a = nullptr;
    TQChannel* b = nullptr;
    std::vector<TQCurveEditorChannelItemPtr> items;  // A, B, X
};

TEST_P(CtrlCommands, command__one_undo_step_that_restores_the_scene_exactly) {
    const Command& command = GetParam();
    const auto before = snapshot();
    auto want = snapshot();
    command.expect(*want);

    RWMenuItem sender(command.action, command.action);
    ASSERT_TRUE(ctrl().performAction(command.action, sender));

    EXPECT_TRUE(sceneIs(*want));
    EXPECT_EQ(dirtyItems(), command.dirty);
    const auto seq = recorder.bracketSequence();
    ASSERT_FALSE(seq.empty());
    EXPECT_EQ(seq.front(),
              "startCaptureModifiedChannels(" + TQLocalizedString(command.undoKey) + ")");
    EXPECT_EQ(seq.back(), "postNotification(0x8)");
    EXPECT_EQ(recorder.captureBalance(), 0);
    EXPECT_EQ(host.undoDescription(), TQLocalizedString(command.undoKey));
    ASSERT_TRUE(host.undo());
    EXPECT_TRUE(sceneIs(*before)) << "undo";
    ASSERT_TRUE(host.redo());
    EXPECT_TRUE(sceneIs(*want)) << "redo";
}

INSTANTIATE_TEST_SUITE_P(
    Menus, CtrlCommands,
    ::testing::Values(
        // A locked keypoint stays; a linked component takes its siblings along.
        Command{"menuDelete:", "Undo Delete Keypoint", "ABX",
                [](TQChannelBase& w) {
                    TQChannel& wa = named(w, "A");
                    settle(wa);
                    wa.deleteKeyframe(at(wa, 2));
                    TQChannel& wb = named(w, "B");
                    settle(wb);
                    wb.deleteKeyframe(at(wb, 0));
                    wb.deleteKeyframe(at(wb, 4));
                    forXyz(w, [](TQChannel& c) {
                        settle(c);
                        c.deleteKeyframe(at(c, 1));
                    });
                }},
        // Taken frames are crossed; only the selected component is copied.
        Command{"menuDuplicate:", "Undo Duplicate", "ABX",
                [](TQChannelBase& w) {
                    TQChannel& wa = named(w, "A");
                    wa.cloneKeyframe(at(wa, 2), CMTimeMake(61, 30));
                    wa.cloneKeyframe(at(wa, 1), CMTimeMake(31, 30));
                    TQChannel& wb = named(w, "B");
                    wb.cloneKeyframe(at(wb, 4), CMTimeMake(121, 30));
                    wb.cloneKeyframe(at(wb, 0), CMTimeMake(1, 30));
                    TQChannel& wx = named(w, "X");
                    wx.cloneKeyframe(at(wx, 1), CMTimeMake(31, 30));
                }},
        // Each curve over its own span; one keypoint on X reverses nothing.
        Command{"menuReverse:", "Undo Reverse", "AB",
                [](TQChannelBase& w) {
                    TQChannel& wa = named(w, "A");
                    wa.reverseKeyframes(at(wa, 1), at(wa, 2));
                    TQChannel& wb = named(w, "B");
                    wb.reverseKeyframes(at(wb, 0), at(wb, 4));
                }},
        // Onto the segment arriving at each keypoint: none before the first.
        Command{"menuEaseIn:", "Undo Ease In", "AB",
                [](TQChannelBase& w) {
                    TQChannel& wa = named(w, "A");
                    wa.setKeyframeInterpolation(at(wa, 1), kTQInterpolationEaseIn);
                    TQChannel& wb = named(w, "B");
                    wb.setKeyframeInterpolation(at(wb, 0), kTQInterpolationEaseIn);
                }},
        // No redraw mark, unlike the ease-in: kept on purpose.
        Command{"menuEaseOut:", "Undo Ease Out", "",
                [](TQChannelBase& w) {
                    for (auto [n, when] :
                         {std::pair{"A", 2.0}, {"A", 1.0}, {"B", 4.0}, {"B", 0.0}, {"X", 1.0}}) {
                        TQChannel& c = named(w, n);
                        c.setKeyframeInterpolation(at(c, when), kTQInterpolationEaseOut);
                    }
                }},
        Command{"menuEaseBoth:", "Undo Ease Both", "AB",
                [](TQChannelBase& w) {
                    TQChannel& wa = named(w, "A");
                    wa.setKeyframeInterpolation(at(wa, 1), kTQInterpolationEaseBoth);
                    wa.setKeyframeInterpolation(at(wa, 2), kTQInterpolationEaseOut);
                    TQChannel& wb = named(w, "B");
                    wb.setKeyframeInterpolation(at(wb, 0), kTQInterpolationEaseBoth);
                    wb.setKeyframeInterpolation(at(wb, 4), kTQInterpolationEaseOut);
                    TQChannel& wx = named(w, "X");
                    wx.setKeyframeInterpolation(at(wx, 1), kTQInterpolationEaseOut);
                }},
        // All take the opposite of the primary entry; every linked component follows.
        Command{"menuLockSelected:", "Undo Lock Keypoint", "",
                [](TQChannelBase& w) {
                    TQChannel& wa = named(w, "A");
                    wa.setKeyframeLocked(at(wa, 2), true);
                    TQChannel& wb = named(w, "B");
                    for (double when : {0.0, 4.0}) wb.setKeyframeLocked(at(wb, when), true);
                    forXyz(w, [](TQChannel& c) { c.setKeyframeLocked(at(c, 1), true); });
                }},
        // One state for all, the opposite of the primary entry's; no linked siblings here.
        Command{"menuBreakTangent:", "Undo Break Tangents", "ABX",
                [](TQChannelBase& w) {
                    for (auto [n, when] :
                         {std::pair{"A", 2.0}, {"A", 1.0}, {"B", 4.0}, {"B", 0.0}, {"X", 1.0}})
                        named(w, n).setKeyframeTangentsBroken(at(named(w, n), when), true);
                }},
        Command{"menuDisableSelected:", "Undo Disable Keypoint", "ABX",
                [](TQChannelBase& w) {
                    for (const char* n : {"A", "B"})
                        for (TQKeyframeHandle h : named(w, n).getKeyframes(false))
                            named(w, n).setKeyframeEnabled(h, false);
                    named(w, "A").setKeyframeEnabled(at(named(w, "A"), 3), true);
                    forXyz(w, [](TQChannel& c) { c.setKeyframeEnabled(at(c, 1), false); });
                }}),
    [](const auto& p) {
        std::string name = p.param.action;
        return name.substr(0, name.size() - 1);
    });

}  // namespace
