// Copy, cut and paste of keypoints on the sample piece through the reference host: keypoints
// with broken, scaled handles land in another channel exactly as they were, spaced as they
// were from the playhead, in one step that undo and redo walk exactly; what the pasteboard
// holds that is not ours, is damaged or has nowhere to go changes nothing; and the items that
// offer these commands are enabled when they can act (a cut, one named step, enables Paste).

#include <string>

#include "platform/channels/TQChannelTypes.h"
#include "src/editor/tests/EditorFixture.h"
#include "src/resources/TQStrings.h"

using namespace editor_test;

namespace {

class KeypointClipboard : public EditorFixture {
protected:
    void SetUp() override {
        EditorFixture::SetUp();
        host.selectObject(object(kTQHostSampleTitleObject));
        ctrl.showAll();
        // Two unlocked channels of one kind.
        for (const TQCurveEditorItemPtr& item : ctrl.selectedCurveSet()->allItems()) {
            auto channelItem = std::dynamic_pointer_cast<TQCurveEditorChannelItem>(item);
            TQChannel* c = channelItem ? channelItem->channel() : nullptr;
            if (!c || c->isLocked(true) || dynamic_cast<TQChannelFixedInterpolation*>(c)) continue;
            if (!itemA)
                itemA = channelItem;
            else if (!itemB && TQChannelKind(*c) == TQChannelKind(*a()))
                itemB = channelItem;
        }
        ASSERT_TRUE(itemA && itemB);
        a()->deleteAllKeyframes(kCMTimeZero);
        for (double t : {1.0, 2.0, 3.0}) {
            const TQKeyframeHandle h = a()->setKeyframe(sec(t), t * 10);
            a()->setKeyframeInterpolation(h, kTQInterpolationBezier);
            a()->setKeyframeTangentsBroken(h, true);
            a()->setKeyframeTangentsScaled(h, t == 3.0);
            a()->setKeyframeInputTangents(h, -0.25 * t, 4.5);
            a()->setKeyframeOutputTangents(h, 0.4, -7.5 + t);
        }
        b()->deleteAllKeyframes(kCMTimeZero);
        b()->setKeyframe(sec(0.5), 1.0);
    }
    TQChannel* a() const { return itemA->channel(); }
    TQChannel* b() const { return itemB->channel(); }
    void selectKeypoints(std::initializer_list<double> times) {
        EditorFixture::selectKeypoints(a(), times);
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

TEST_F(KeypointClipboard, paste_into_another_channel__exact_keypoints_at_the_playhead_one_step) {
    selectKeypoints({1.0, 3.0, 1.0});  // one listed twice is copied once
    ctrl.copy();
    // Only B shown, and selected: the channel the keypoints came from is not.
    ctrl.setSelectedCurveSet(ctrl.createCurveSetWithName("B alone"));
    ctrl.appendChannelToCurveSet(b())->select(1);
    host.setCurrentTime(sec(5));
    const Copy before = copyOf(b()), aBefore = copyOf(a());
    // B's own keypoint and A's two, 2 s apart from the playhead on, written another way.
    std::vector<TQKeyframeState> states = b()->getKeyframeStates();
    for (TQKeyframeState s : a()->getKeyframeStates()) {
        const CMTime axis = sec(5 + CMTimeGetSeconds(s.time) - 1);
        s.time = b()->toChannelTime(&axis);
        if (CMTimeGetSeconds(axis) != 6) states.push_back(s);
    }
    const Copy want = copyOf(b());
    ASSERT_TRUE(static_cast<TQChannel&>(*want).setKeyframeStates(states));

    recorder.clearCalls();
    ctrl.paste();
    EXPECT_TRUE(*b() == *want && *a() == *aBefore);
    EXPECT_EQ(recorder.bracketText(), "{Paste Keypoints <Y (Y Y) Y> } !8");
    // The pasted keypoints are the selection, in one step.
    EXPECT_EQ(std::tuple(view.getSelection()->size(), host.undoStack().undoCount(),
                         host.undoDescription()),
              std::tuple(2u, 1u, TQLocalizedString("Undo Paste Keypoints")));
    ASSERT_TRUE(host.undo());
    EXPECT_TRUE(*b() == *before) << "undo";
    ASSERT_TRUE(host.redo());
    EXPECT_TRUE(*b() == *want) << "redo";
    ASSERT_TRUE(host.undo());

    // With the channel they came from shown again, they go back into it.
    ctrl.showAll();
    ctrl.paste();
    EXPECT_TRUE(*b() == *before);
    EXPECT_EQ(a()->numberOfKeyframes(), 5u);
}

TEST_F(KeypointClipboard, refused_paste__changes_nothing_and_says_why) {
    selectKeypoints({1.0, 2.0});
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

TEST_F(KeypointClipboard, validation__by_channels_keypoints_locks_and_the_pasteboard) {
    ctrl.deselectAllChannels();
    EXPECT_FALSE(enabled("copy:") || enabled("cut:") || enabled("delete:") || enabled("paste:"))
        << "no channel selected, nothing to paste";
    EXPECT_TRUE(enabled("nextKeyframe:") && enabled("previousKeyframe:"));
    itemA->select(1);
    selectKeypoints({1.0, 2.0});
    ctrl.cut();
    EXPECT_FALSE(a()->getKeyframe(sec(1)) || a()->getKeyframe(sec(2)));
    EXPECT_EQ(host.undoDescription(), TQLocalizedString("Undo Cut Keypoints"));
    EXPECT_TRUE(enabled("copy:") && enabled("cut:") && enabled("delete:") && enabled("paste:"));

    // The keypoint menu begins Copy, Cut, Paste, Delete.
    const RWMenuPtr& keys = ctrl.getKeyframeMenu();
    selectKeypoints({3.0});
    EXPECT_TRUE(enabled(keys, 1) && enabled(keys, 2) && enabled(keys, 3));
    a()->setKeyframeLocked(a()->getKeyframe(sec(3)), true);
    EXPECT_TRUE(enabled(keys, 0)) << "a locked keypoint can be copied";
    EXPECT_FALSE(enabled(keys, 1) || enabled(keys, 2) || enabled(keys, 3));
    board.clearContents();
    EXPECT_FALSE(enabled(ctrl.getDefaultMenu(), 2)) << "nothing to paste";
}

}  // namespace
