// The commands on whole channels and the keypoint clipboard, on two selected channels of one
// kind of the sample piece through the reference host. Each edit is a row run on a fresh
// piece: both channels as text, the host's brackets, the undo steps, the playhead and the
// keypoints selected after it are held in a recorded baseline (baselines/channel_edits.txt,
// see TextBaseline.h); every row is undone to the very channels it started from and redone to
// the ones it made. Beside the rows: the menus' ticks, what the pasteboard holds that is not
// ours or is damaged, and which items are enabled.

#include <string>

#include "platform/channels/TQChannelTypes.h"
#include "src/editor/tests/EditorFixture.h"
#include "src/resources/TQStrings.h"
#include "tests/support/StepScript.h"
#include "tests/support/TextBaseline.h"

using namespace editor_test;

namespace {

class TwoChannels : public EditorFixture {
protected:
    void SetUp() override {
        EditorFixture::SetUp();
        host.selectObject(object(kTQHostSampleTitleObject));
        ctrl.showAll();
        // The first two unlocked channels of one kind whose interpolation may change.
        for (const TQCurveEditorItemPtr& item : ctrl.selectedCurveSet()->allItems()) {
            auto channelItem = std::dynamic_pointer_cast<TQCurveEditorChannelItem>(item);
            TQChannel* c = channelItem ? channelItem->channel() : nullptr;
            if (!c || c->isLocked(true) || dynamic_cast<TQChannelFixedInterpolation*>(c) ||
                c->testFlag(kTQChannelFlagNoInterpolationChange))
                continue;
            if (!itemA)
                itemA = channelItem;
            else if (!itemB && TQChannelKind(*c) == TQChannelKind(*a()))
                itemB = channelItem;
        }
        ASSERT_TRUE(itemA && itemB);
        key(*a(), "1=1 2=3 3=2");
        key(*b(), "0.5=10 4=20");
        for (const auto& item : {itemA, itemB}) item->select(1);
        host.undoStack().clear();
        recorder.clearCalls();
    }
    // The channel's keyframes replaced by those of the text, in addKeys' form.
    static void key(TQChannel& c, const std::string& text) {
        c.deleteAllKeyframes(kCMTimeZero);
        addKeys(c, text, 600);
    }
    TQChannel* a() const { return itemA->channel(); }
    TQChannel* b() const { return itemB->channel(); }
    TQChannel* named(const std::string& letter) const { return letter == "A" ? a() : b(); }
    bool perform(const std::string& action, int64_t tag = 0) {
        RWMenuItem sender(action, action);
        sender.setTag(tag);
        return ctrl.performAction(action, sender);
    }
    bool enabled(const char* action) {
        RWMenuItem item(action, action);
        return ctrl.validateMenuItem(item);
    }
    bool enabled(const RWMenuPtr& menu, int64_t index) {
        return ctrl.validateMenuItem(*menu->itemAtIndex(index));
    }

    TQCurveEditorChannelItemPtr itemA, itemB;
};

struct Edit {
    const char* name;
    std::string script;  // "set-up steps | the edit's steps", each ";"-separated, see run()
};

void PrintTo(const Edit& e, std::ostream* os) { *os << e.name; }

class ChannelEdits : public TwoChannels, public ::testing::WithParamInterface<Edit> {
protected:
    // Steps: "now 2", "run action: tag", "keys A 1=0 2=1", "select A@1 A@3" (keypoints of one
    // channel, selected in the view), "off" (neither channel selected), "alone B" (a set of
    // its own, selected), "all", "copy", "cut", "paste", "idle" (the host's event loop),
    // "ghost" (A's curve snapshot taken).
    void run(const std::string& script) {
        tests_support::StepArgs s;
        const tests_support::Steps steps = {
            {"now", [&] { host.setCurrentTime(sec(s.number(0))); }},
            {"run", [&] { EXPECT_TRUE(perform(s.word(0), int64_t(s.number(1)))); }},
            {"keys", [&] { key(*named(s.word(0)), s.rest.substr(2)); }},
            {"select",
             [&] {
                 std::vector<TQKeyframeHandle> keys;
                 for (const std::string& w : s.words)
                     keys.push_back(
                         named(w.substr(0, 1))->getKeyframe(sec(std::stod(w.substr(2)))));
                 selectHandles(named(s.word(0).substr(0, 1)), keys);
             }},
            {"off",
             [&] {
                 itemA->select(0);
                 itemB->select(0);
             }},
            {"alone",
             [&] {
                 ctrl.setSelectedCurveSet(ctrl.createCurveSetWithName("Alone"));
                 ctrl.appendChannelToCurveSet(named(s.word(0)))->select(1);
             }},
            {"all", [&] { ctrl.showAll(); }},
            {"copy", [&] { ctrl.copy(); }},
            {"cut", [&] { ctrl.cut(); }},
            {"paste", [&] { ctrl.paste(); }},
            {"idle", [&] { host.eventLoopDidGoIdle(); }},
            {"ghost",
             [&] {
                 ctrl.setSnapshotChannels(true);
                 itemA->setNumberOfSamples(8);
                 itemA->refreshOriginalCurve(kCMTimeZero, sec(0.5));
                 itemA->takeCurveSnapshot(1);
             }},
        };
        tests_support::runSteps(script, s, steps);
    }
    // A channel as keyText with handles, then its extrapolations before and after, and its
    // lock and animation switch when they are on and off.
    static std::string text(const TQChannel& c) {
        return keyText(c, true) + " <" +
               std::to_string(c.getExtrapolation(kTQExtrapolationBefore)) + ">" +
               std::to_string(c.getExtrapolation(kTQExtrapolationAfter)) +
               (c.isLocked(false) ? " locked" : "") + (c.isAnimationEnabled() ? "" : " still");
    }
};

TEST_P(ChannelEdits, edit__as_recorded_and_undone_exactly) {
    const std::string script = GetParam().script;
    const size_t bar = script.find(" | ");
    if (bar != script.npos) run(script.substr(0, bar));
    host.undoStack().clear();
    for (const auto& item : {itemA, itemB}) item->setOriginalCurveDirty(0);
    const Copy beforeA = copyOf(a()), beforeB = copyOf(b());
    recorder.clearCalls();
    run(script.substr(bar == script.npos ? 0 : bar + 3));
    const size_t steps = host.undoStack().undoCount();
    std::string redraw;
    for (const auto& item : {itemA, itemB})
        redraw += item->originalCurveDirty() ? item->channel()->getName() : "";
    EXPECT_TRUE(tests_support::matchesBaselineBlock(
        "channel_edits", GetParam().name,
        "A: " + text(*a()) + "\nB: " + text(*b()) + "\ncalls: " + recorder.bracketText() +
            "\nundo: " + std::to_string(steps) + " " + host.undoDescription() +
            "\nnow: " + std::to_string(CMTimeGetSeconds(host.currentTime())) +
            "\nselected keypoints: " + std::to_string(view.getSelection()->size()) +
            "\nredraw: " + redraw + "\n",
        "src/editor/tests/baselines"));
    const Copy afterA = copyOf(a()), afterB = copyOf(b());
    for (size_t i = 0; i < steps; ++i) ASSERT_TRUE(host.undo());
    EXPECT_TRUE(*a() == *beforeA && *b() == *beforeB) << "undo";
    for (size_t i = 0; i < steps; ++i) ASSERT_TRUE(host.redo());
    EXPECT_TRUE(*a() == *afterA && *b() == *afterB) << "redo";
}

// Keypoints to copy: broken handles, scaled on the last.
const std::string kHandles =
    "1=10(-0.25,4.5|0.4,-6.5)b 2=20(-0.5,4.5|0.4,-5.5)b 3=30(-0.75,4.5|0.4,-4.5)bs";
const std::string kCopied = "keys A " + kHandles + "; keys B 0.5=1; ";

INSTANTIATE_TEST_SUITE_P(
    Editor, ChannelEdits,
    ::testing::Values(
        // Each command is one step under its name on every selected channel; with none
        // selected a step is still opened and posted.
        Edit{"interpolation", "run animMenuSetCurveInterpolation: 1"},
        Edit{"preExtrapolation", "run animMenuSetCurvePreExtrapolation: 3"},
        Edit{"postExtrapolation", "run animMenuSetCurvePostExtrapolation: 2"},
        Edit{"lock", "run animMenuLockChannel:"},
        Edit{"disableAnimation", "run animMenuDisableAnimation:"},
        Edit{"addKeyframe", "now 2.5 | run animMenuAddKeyframe:"},
        Edit{"deleteKeyframe", "now 2 | run animMenuDeleteKeyframe:"},
        Edit{"reset", "run animMenuResetChannel:"},
        Edit{"resetNoneSelected", "off | run animMenuResetChannel:"},
        // Back to the snapshot; a channel without one stays.
        Edit{"ghost", "ghost; keys A 5=5; keys B 6=6 | run animMenuSetChannelToGhost:"},
        // The mixed interpolation's step is left open for the host to close when idle; an
        // empty step leaves no trace. A lock closed so is one step that undo walks.
        Edit{"mixedInterpolationClosedWhenIdle", "run animMenuSetCurveInterpolation: 100; idle"},
        Edit{"lockClosedWhenIdle", "run animMenuLockChannel:; idle"},
        // The playhead goes to the nearest keyframe of any selected channel, or stays unposted.
        Edit{"nextKeyframe", "now 0.7 | run animMenuNextKeyframe:"},
        Edit{"nextFromBetween", "now 2.5 | run animMenuNextKeyframe:"},
        Edit{"nextAtTheLast", "now 4 | run animMenuNextKeyframe:"},
        Edit{"previousKeyframe", "now 3.5 | run animMenuPreviousKeyframe:"},
        Edit{"previousNoneEarlier", "now 0.5 | run animMenuPreviousKeyframe:"},
        Edit{"nextKeyframeMenuName", "now 0 | run nextKeyframe:"},
        Edit{"previousNeverBeforeZero",
             "keys B -1=0; keys A 5=0; now 2 | run animMenuPreviousKeyframe:"},
        Edit{"nextNoneSelected", "off; now 0 | run animMenuNextKeyframe:"},
        // Pasted into the one channel shown, spaced as they were from the playhead, the
        // keypoint listed twice copied once; with their own channel shown they go back to it.
        Edit{"pasteIntoAnother", kCopied + "select A@1 A@3 A@1; copy; alone B; now 5 | paste"},
        Edit{"pasteBackWhereTheyCameFrom",
             kCopied + "select A@1 A@3; copy; alone B; now 5; all | paste"},
        Edit{"cut", kCopied + "select A@1 A@2 | cut"}),
    [](const auto& p) { return std::string(p.param.name); });

TEST_F(TwoChannels, interpolation_menu__ticks_its_item_and_skips_channels_that_refuse_it) {
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

    // A drag of the curves is not closed by the idle host.
    recorder.suppressEventCoalescing();
    recorder.startCaptureModifiedChannels("drag");
    host.eventLoopDidGoIdle();
    EXPECT_TRUE(host.undoStack().isStepOpen());
    recorder.endCaptureModifiedChannels();
    recorder.unsuppressEventCoalescing();
}

TEST_F(TwoChannels, refused_paste__changes_nothing_and_says_why) {
    key(*a(), kHandles);
    selectKeypoints(a(), {1.0, 2.0});
    ctrl.copy();
    const std::string good = *board.stringForType(kTQKeypointClipboardType);
    auto edited = [&](const std::string& from, const std::string& to) {
        std::string text = good;
        return text.replace(text.find(from), from.size(), to);
    };
    // What lies under our type (nothing: another program's text only), and the answer.
    std::vector<std::pair<std::string, TQPasteResult>> rows = {
        {"", TQPasteResult::kNothingToPaste},
        {"hello", TQPasteResult::kDamaged},
        {edited(" 10 ", " nan "), TQPasteResult::kDamaged},
        {edited(" 4 ", " 100 "), TQPasteResult::kDamaged},  // an unknown interpolation
        {edited("end 2", "end 3"), TQPasteResult::kDamaged},
        {good + "key\n", TQPasteResult::kDamaged},
        {edited(" ./", " ./999999"), TQPasteResult::kNoChannel},  // not shown, none selected
    };
    for (size_t cut = 1; cut + 1 < good.size(); cut += 7)
        rows.push_back({good.substr(0, cut), TQPasteResult::kDamaged});
    const Copy beforeA = copyOf(a()), beforeB = copyOf(b());
    ctrl.deselectAllChannels();
    for (const auto& [ours, result] : rows) {
        SCOPED_TRACE(ours);
        board.clearContents();
        board.setString("1 2 3", "text/plain");
        if (!ours.empty()) board.setString(ours, kTQKeypointClipboardType);
        recorder.clearCalls();
        ctrl.paste();
        EXPECT_EQ(ctrl.lastPasteResult(), result);
        EXPECT_TRUE(*a() == *beforeA && *b() == *beforeB && recorder.bracketSequence().empty());
    }
    board.setString(good, kTQKeypointClipboardType);
    a()->setLocked(true, false);
    ctrl.paste();
    EXPECT_EQ(ctrl.lastPasteResult(), TQPasteResult::kLocked);
    EXPECT_EQ(host.undoStack().undoCount(), 0u);
}

TEST_F(TwoChannels, validation__by_channels_keypoints_locks_and_the_pasteboard) {
    ctrl.deselectAllChannels();
    EXPECT_FALSE(enabled("copy:") || enabled("cut:") || enabled("delete:") || enabled("paste:"))
        << "no channel selected, nothing to paste";
    EXPECT_TRUE(enabled("nextKeyframe:") && enabled("previousKeyframe:"));
    itemA->select(1);
    selectKeypoints(a(), {1.0, 2.0});
    ctrl.cut();
    EXPECT_TRUE(enabled("copy:") && enabled("cut:") && enabled("delete:") && enabled("paste:"));

    // The keypoint menu begins Copy, Cut, Paste, Delete.
    const RWMenuPtr& keys = ctrl.getKeyframeMenu();
    selectKeypoints(a(), {3.0});
    EXPECT_TRUE(enabled(keys, 1) && enabled(keys, 2) && enabled(keys, 3));
    a()->setKeyframeLocked(a()->getKeyframe(sec(3)), true);
    EXPECT_TRUE(enabled(keys, 0)) << "a locked keypoint can be copied";
    EXPECT_FALSE(enabled(keys, 1) || enabled(keys, 2) || enabled(keys, 3));
    board.clearContents();
    EXPECT_FALSE(enabled(ctrl.getDefaultMenu(), 2)) << "nothing to paste";
}

}  // namespace
