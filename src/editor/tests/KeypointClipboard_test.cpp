// Copy, cut and paste of keypoints on the sample piece through the reference host: keypoints
// with broken, scaled handles land in another channel exactly as they were, spaced as they
// were from the playhead, in one step that undo and redo walk exactly; what the pasteboard
// holds that is not ours, is damaged or has nowhere to go changes nothing; and the items that
// offer these commands are enabled when they can act.

#include <algorithm>
#include <functional>
#include <memory>
#include <string>

#include "platform/channels/TQChannelTypes.h"
#include "src/editor/tests/EditorFixture.h"
#include "src/resources/TQStrings.h"

using namespace editor_test;

namespace {

CMTime sec(double s) { return CMTimeMakeWithSeconds(s, 600); }

class KeypointClipboard : public EditorFixture {
protected:
    void SetUp() override {
        EditorFixture::SetUp();
        RWServiceSet services;
        services.pasteboard = &board;
        RWInstallServices(services);
        host.selectObject(object(kTQHostSampleTitleObject));
        ctrl.showAll();
        const TQCurveSetPtr set = ctrl.selectedCurveSet();
        ASSERT_TRUE(set);
        // Two unlocked channels of one kind.
        for (uint32_t i = 0; i < set->numberOfChannelItems() && !itemB; ++i) {
            auto item =
                std::dynamic_pointer_cast<TQCurveEditorChannelItem>(set->channeItemAtIndex(i));
            TQChannel* c = item ? item->channel() : nullptr;
            if (!c || c->isLocked(true) || dynamic_cast<TQChannelFixedInterpolation*>(c)) continue;
            if (!itemA)
                itemA = item;
            else if (TQChannelKind(*c) == TQChannelKind(*a()))
                itemB = item;
        }
        ASSERT_TRUE(itemA && itemB);
        a()->deleteAllKeyframes(kCMTimeZero);
        for (double t : {1.0, 2.0, 3.0}) {
            const TQKeyframeHandle h = a()->setKeyframe(sec(t), t * 10);
            a()->setKeyframeInterpolation(h, kTQInterpolationBezier);
            a()->setKeyframeTangentsBroken(h, true);
            a()->setKeyframeTangentsScaled(h, t == 3.0);
            a()->setKeyframeInputTangents(h, -0.25 * t, 4.0);
            a()->setKeyframeOutputTangents(h, 0.4, -7.5 + t);
        }
        b()->deleteAllKeyframes(kCMTimeZero);
        b()->setKeyframe(sec(0.5), 1.0);
        b()->setKeyframe(sec(6), 2.0);
        host.undoStack().clear();
        recorder.clearCalls();
    }
    void TearDown() override {
        RWResetServices();
        EditorFixture::TearDown();
    }

    TQChannel* a() const { return itemA->channel(); }
    TQChannel* b() const { return itemB->channel(); }
    using Copy = std::unique_ptr<TQChannel>;
    static Copy copyOf(const TQChannel* c) {
        return Copy(static_cast<TQChannel*>(c->cloneChannel()));
    }
    void selectKeypoints(const TQCurveEditorChannelItemPtr& item, std::vector<double> times) {
        TQCurveSelectionList& list = *view.getSelection();
        list.reset();
        for (double t : times) {
            auto entry = std::make_shared<TQCurveSelection>();
            entry->setCurveId(item->channelId());
            entry->setHandle(item->channel()->getKeyframe(sec(t)));
            entry->setFlags(TQSelectionKeypoint);
            list.addSelection(entry);
        }
    }
    // Only B shown (a custom set of it), selected: the channel the keypoints came from is not.
    void showOnlyB() {
        ctrl.setSelectedCurveSet(ctrl.createCurveSetWithName("B alone"));
        const TQCurveEditorItemPtr shown = ctrl.appendChannelToCurveSet(b());
        ASSERT_TRUE(shown);
        shown->select(1);
    }
    bool enabled(const char* action) {
        RWMenuItem item(action, action);
        return ctrl.validateMenuItem(item);
    }
    bool enabled(const RWMenuPtr& menu, int64_t index) {
        return ctrl.validateMenuItem(*menu->itemAtIndex(index));
    }

    RWMemoryPasteboard board;
    TQCurveEditorChannelItemPtr itemA, itemB;
};

TEST_F(KeypointClipboard, paste_into_another_channel__exact_keypoints_at_the_playhead_one_step) {
    selectKeypoints(itemA, {1.0, 3.0});
    ctrl.copy();
    ASSERT_TRUE(board.stringForType("text/plain")) << "a readable form for other programs";
    showOnlyB();
    host.setCurrentTime(sec(5));
    const Copy before = copyOf(b());
    // What B should end as: its own keypoints and A's two, 2 s apart from the playhead on.
    Copy want = copyOf(b());
    std::vector<TQKeyframeState> states = b()->getKeyframeStates();
    for (TQKeyframeState s : a()->getKeyframeStates()) {
        if (s.time == sec(2)) continue;
        const CMTime axis = sec(5 + CMTimeGetSeconds(s.time) - 1);
        s.time = b()->toChannelTime(&axis);
        states.push_back(s);
    }
    std::sort(states.begin(), states.end(),
              [](const auto& x, const auto& y) { return CMTimeCompare(x.time, y.time) < 0; });
    ASSERT_TRUE(want->setKeyframeStates(states));
    const Copy aBefore = copyOf(a());
    recorder.clearCalls();

    ctrl.paste();
    EXPECT_EQ(ctrl.lastPasteResult(), TQPasteResult::kPasted);
    EXPECT_TRUE(*b() == *want);
    EXPECT_TRUE(*a() == *aBefore);
    EXPECT_EQ(view.getSelection()->size(), 2u) << "the pasted keypoints are the selection";
    EXPECT_EQ(recorder.captureBalance(), 0);
    EXPECT_EQ(recorder.bracketSequence().back(), "postNotification(0x8)");
    EXPECT_EQ(host.undoStack().undoCount(), 1u);
    EXPECT_EQ(host.undoDescription(), TQLocalizedString("Undo Paste Keypoints"));
    ASSERT_TRUE(host.undo());
    EXPECT_TRUE(*b() == *before) << "undo";
    ASSERT_TRUE(host.redo());
    EXPECT_TRUE(*b() == *want) << "redo";
    ASSERT_TRUE(host.undo());

    // With the channel they came from shown again, they go back into it, not the selected one.
    ctrl.showAll();
    itemB->select(1);
    ctrl.paste();
    EXPECT_EQ(ctrl.lastPasteResult(), TQPasteResult::kPasted);
    EXPECT_TRUE(*b() == *before);
    EXPECT_EQ(a()->numberOfKeyframes(), 5u);
}

TEST_F(KeypointClipboard, cut__copies_every_selected_keypoint_deletes_the_unlocked_in_one_step) {
    a()->setKeyframeLocked(a()->getKeyframe(sec(3)), true);
    const Copy before = copyOf(a());
    Copy want = copyOf(a());
    want->deleteKeyframe(want->getKeyframe(sec(1)));
    selectKeypoints(itemA, {1.0, 3.0});

    ctrl.cut();
    // The channel keeps showing what it showed (Delete's own rule, not this test's).
    want->setInitialValue(a()->getInitialValue());
    EXPECT_TRUE(*a() == *want) << "the locked keypoint stays";
    EXPECT_EQ(host.undoDescription(), TQLocalizedString("Undo Cut Keypoints"));
    const TQKeypointClipReading read = TQTakeKeypointClip(board);
    ASSERT_EQ(read.status, TQKeypointClipRead::kOk);
    EXPECT_EQ(read.clip.keyCount(), 2u);
    ASSERT_TRUE(host.undo());
    EXPECT_TRUE(*a() == *before);
}

TEST_F(KeypointClipboard, refused_paste__changes_nothing_and_says_why) {
    selectKeypoints(itemA, {1.0, 2.0});
    ctrl.copy();
    const std::string good = *board.stringForType(kTQKeypointClipboardType);
    auto ours = [&](std::string text) {
        return [text](RWPasteboard& p) { p.setString(text, kTQKeypointClipboardType); };
    };
    auto edited = [&](const std::string& from, const std::string& to) {
        std::string text = good;
        const size_t at = text.find(from);
        EXPECT_NE(at, std::string::npos) << from;
        if (at != std::string::npos) text.replace(at, from.size(), to);
        return ours(text);
    };
    struct Row {
        const char* what;
        std::function<void(RWPasteboard&)> fill;
        TQPasteResult result;
    };
    std::vector<Row> rows = {
        {"another program's text", [](RWPasteboard& p) { p.setString("1 2 3", "text/plain"); },
         TQPasteResult::kNothingToPaste},
        {"text under our type", ours("hello"), TQPasteResult::kDamaged},
        {"not a number", edited(" 10 ", " nan "), TQPasteResult::kDamaged},
        {"an unknown interpolation", edited(" 4 ", " 100 "), TQPasteResult::kDamaged},
        {"a count that does not match", edited("end 2", "end 3"), TQPasteResult::kDamaged},
        {"a line after the end", ours(good + "key\n"), TQPasteResult::kDamaged},
        {"a doubled blank", edited("key ", "key  "), TQPasteResult::kDamaged},
        {"a channel of no kind shown or selected", edited(" ./", " ./999999"),
         TQPasteResult::kNoChannel},
    };
    for (size_t cut = 0; cut + 1 < good.size(); cut += 7)
        rows.push_back({"cut short", ours(good.substr(0, cut)), TQPasteResult::kDamaged});

    const Copy beforeA = copyOf(a()), beforeB = copyOf(b());
    ctrl.deselectAllChannels();
    for (const Row& row : rows) {
        SCOPED_TRACE(row.what);
        board.clearContents();
        row.fill(board);
        recorder.clearCalls();
        ctrl.paste();
        EXPECT_EQ(ctrl.lastPasteResult(), row.result);
        EXPECT_TRUE(*a() == *beforeA && *b() == *beforeB);
        EXPECT_TRUE(recorder.bracketSequence().empty());
        EXPECT_TRUE(TQHasLocalizedString(TQPasteRefusalKey(row.result)));
    }
    // Into a locked channel.
    ours(good)(board);
    a()->setLocked(true, false);
    ctrl.paste();
    EXPECT_EQ(ctrl.lastPasteResult(), TQPasteResult::kLocked);
    EXPECT_TRUE(*b() == *beforeB);
    EXPECT_EQ(host.undoStack().undoCount(), 0u);
}

TEST_F(KeypointClipboard, validation__by_channels_keypoints_locks_and_the_pasteboard) {
    ctrl.deselectAllChannels();
    view.getSelection()->reset();
    EXPECT_FALSE(enabled("copy:") || enabled("cut:") || enabled("delete:"))
        << "no channel selected";
    EXPECT_FALSE(enabled("paste:")) << "an empty pasteboard";
    EXPECT_TRUE(enabled("nextKeyframe:") && enabled("previousKeyframe:"));

    itemA->select(1);
    selectKeypoints(itemA, {1.0});
    EXPECT_TRUE(enabled("copy:") && enabled("cut:") && enabled("delete:"));
    ctrl.copy();
    EXPECT_TRUE(enabled("paste:"));

    const RWMenuPtr& keys = ctrl.getKeyframeMenu();
    std::vector<std::string> firstFour;
    for (int64_t i = 0; i < 4; ++i) firstFour.push_back(keys->itemAtIndex(i)->action());
    EXPECT_EQ(firstFour,
              (std::vector<std::string>{"menuCopy:", "menuCut:", "menuPaste:", "menuDelete:"}));
    EXPECT_TRUE(enabled(keys, 0) && enabled(keys, 1) && enabled(keys, 2) && enabled(keys, 3));
    a()->setKeyframeLocked(a()->getKeyframe(sec(1)), true);
    EXPECT_TRUE(enabled(keys, 0)) << "a locked keypoint can be copied";
    EXPECT_FALSE(enabled(keys, 1) || enabled(keys, 2) || enabled(keys, 3))
        << "not cut, pasted on, deleted";

    const RWMenuPtr& background = ctrl.getDefaultMenu();
    ASSERT_EQ(background->numberOfItems(), 3);
    board.clearContents();
    EXPECT_TRUE(enabled(background, 0));
    EXPECT_FALSE(enabled(background, 2)) << "nothing to paste";
}

}  // namespace
