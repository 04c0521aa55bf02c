// The controller's core: brackets as the host sees them, queries, conversions, the maximum
// view volume, sampling, the value panel and the menus.

#include <cfloat>
#include <functional>
#include <string>
#include <vector>

#include "platform/channels/TQChannelTypes.h"
#include "src/engine/TQEditBrackets.h"
#include "src/engine/tests/EngineFixture.h"
#include "src/resources/TQStrings.h"
#include "src/view/tests/FrameBaseline.h"

using namespace engine_test;
using Seq = std::vector<std::string>;

class CtrlCore : public EngineFixture {};

TEST_F(CtrlCore, brackets__drag_of_ten_steps_announces_each_channel_once_per_phase) {
    TQChannel* a = addChannel("A", {{1, 0}, {2, 1}});
    TQChannel* b = addChannel("B", {{1, 0}});
    auto ia = addItem(a);
    auto ib = addItem(b);
    ia->setScaleY(1.0);
    ib->setScaleY(1.0);
    TQCurveSelectionList* list =
        selectInView({keypointEntry(ia, 1), keypointEntry(ia, 2), keypointEntry(ib, 1)});

    // The drag variant, as the view runs it: one step for the gesture, ten value steps.
    ctrl().validateSelection(list);
    {
        const TQChangeBracket gesture(ctrl(), list, "Undo Move Keypoint");
        for (int step = 1; step <= 10; ++step) {
            const TQModifyValueGuard values(ctrl(), list);
            ctrl().moveSelected(list, seconds(1.0 + 0.05 * step), 0.1 * step, 1, 0);
        }
    }

    Seq expected = {"startCaptureModifiedChannels(" + TQLocalizedString("Undo Move Keypoint") + ")",
                    "willChangeChannel(A)", "willChangeChannel(B)"};
    for (int step = 0; step < 10; ++step)
        for (const char* c : {"willSetChannelValue(A)", "willSetChannelValue(B)",
                              "didSetChannelValue(B)", "didSetChannelValue(A)"})
            expected.push_back(c);
    for (const char* c :
         {"didChangeChannel(B)", "didChangeChannel(A)", "endCaptureModifiedChannels()"})
        expected.push_back(c);
    EXPECT_EQ(recorder.bracketSequence(), expected);
    // Each step measures from where the last one left the keypoints: the steps add up.
    EXPECT_EQ(keyTimes(a), (std::vector<double>{1.5, 2.5}));
    EXPECT_EQ(keyTimes(b), (std::vector<double>{1.5}));
    EXPECT_NEAR(keyValueAt(a, 1.5), 1.0, kValueTolerance);
    EXPECT_NEAR(keyValueAt(b, 1.5), 1.0, kValueTolerance);
}

TEST_F(CtrlCore, brackets__entry_of_a_removed_channel_is_not_announced) {
    TQChannel* a = addChannel("A", {{1, 0}});
    TQChannel* gone = addChannel("Gone", {{1, 0}});
    TQChannel* b = addChannel("B", {{1, 0}});
    auto ia = addItem(a);
    auto ig = addItem(gone);
    auto ib = addItem(b);
    const uint32_t goneId = ig->channelId();
    selectInView({keypointEntry(ia, 1), keypointEntry(ig, 1), keypointEntry(ib, 1)});
    object->removeChild(gone);

    ctrl().menuReverse();

    Seq expected = {"postNotification(0x20000)"};  // the vanished curve leaves the set
    const Seq bracket = oneShotBracket("Reverse Keypoints", {"A", "B"});
    expected.insert(expected.end(), bracket.begin(), bracket.end());
    EXPECT_EQ(recorder.bracketSequence(), expected);
    EXPECT_EQ(ctrl().channelItemWithIdentifier(goneId), nullptr);
    EXPECT_EQ(view.getSelection()->size(), 2u);
}

TEST_F(CtrlCore, queries__selected_bounds_skip_the_primary_entry) {
    TQChannel* a = addChannel("A", {{1, 5}, {3, -2}});
    auto ia = addItem(a);
    ia->setScaleY(1.0);
    TQCurveSelectionList list;
    double minX = 0, maxX = 0, minY = 0, maxY = 0;
    {
        list.addSelection(keypointEntry(ia, 1));
        EXPECT_FALSE(ctrl().getSelected(&list, &minX, &maxX, &minY, &maxY));
        EXPECT_EQ(minX, static_cast<double>(FLT_MAX));
        EXPECT_EQ(maxY, -static_cast<double>(FLT_MAX));
    }
    {
        list.addSelection(keypointEntry(ia, 3));
        list.addSelection(curveEntry(ia));  // a curve entry and a stale one are not measured
        auto stale = keypointEntry(ia, 1);
        stale->setHandle(reinterpret_cast<TQKeyframeHandle>(uintptr_t{0xdead}));
        list.addSelection(stale);
        EXPECT_TRUE(ctrl().getSelected(&list, &minX, &maxX, nullptr, &maxY));
        EXPECT_NEAR(minX, 3.0, kValueTolerance) << "only the second keypoint is measured";
        EXPECT_NEAR(maxX, 3.0, kValueTolerance);
        EXPECT_NEAR(maxY, -2.0, kValueTolerance);
    }
}

TEST_F(CtrlCore, maxViewVolume__empty_set_and_negative_curves) {
    const double p = view.getZoomPadding();
    {
        const CGRect r = ctrl().getMaxViewVolume();
        EXPECT_NEAR(r.origin.y, std::min(-1.0, 0.0 - p * 2.0), kValueTolerance);
        EXPECT_NEAR(r.origin.y + r.size.height, 1.0, kValueTolerance);
        EXPECT_EQ(r.origin.x, 0.0);
        EXPECT_EQ(r.size.width, 10.0);
    }
    {
        auto item = addItem(addChannel("Low", {{0, -50}, {1, -40}}));
        item->setScaleY(1.0);
        view.setCurrentViewVolume(CGRectMake(0, -60, 10, 0.5));
        const CGRect r = ctrl().getMaxViewVolume();
        // The running maximum starts at the smallest positive double, not at -infinity.
        EXPECT_NEAR(r.origin.y + r.size.height, DBL_MIN + p * 0.5, kValueTolerance);
        EXPECT_NEAR(r.origin.y, std::min(-60.0, -50.0 - p * 0.5), kValueTolerance);
    }
}

TEST_F(CtrlCore, sets__append_remove_and_first_channel) {
    // Group: W, then the compound Pos (X, Y), so the append recurses once.
    auto* group = static_cast<TQChannelFolder*>(
        object->addChild(std::make_unique<TQChannelFolder>("Group", nextChannelId++)));
    addChannel("W", {{1, 0}}, group);
    TQCompoundChannel* folder = addCompound("Pos", 2, false, {{1, 0}});
    group->addChild(object->takeChild(folder));
    TQCurveEditorItemPtr last = ctrl().appendFolder(group, set);
    ASSERT_NE(last, nullptr);
    EXPECT_EQ(last->channelBase(), folder->getChild(1));
    EXPECT_EQ(ctrl().numberOfChannelItems(), 3u);
    EXPECT_EQ(recorder.count("postNotification"), 2u)
        << "once per level of the recursion, nothing per item";
    EXPECT_EQ(ctrl().appendFolder(nullptr, set), nullptr);
    {
        // A refresh drops the items of channels that went, and the view's selection.
        selectInView({keypointEntry(std::dynamic_pointer_cast<TQCurveEditorChannelItem>(last), 1)});
        folder->removeChild(folder->getChild(1));
        ctrl().refreshSelectedCurveSet();
        EXPECT_EQ(ctrl().numberOfChannelItems(), 2u);
        EXPECT_TRUE(view.getSelection()->empty());
    }

    {
        // Selected but disabled items are passed over.
        auto first = set->channeItemAtIndex(0);
        auto second = set->channeItemAtIndex(1);
        first->select(1);
        first->enableItem(0);
        second->select(1);
        EXPECT_EQ(ctrl().getFirstChannel(), second);
    }
    {
        recorder.clearCalls();
        auto plain = std::make_shared<TQCurveSet>();
        plain->initWithName("Plain", &recorder);
        ctrl().setSelectedCurveSet(plain);
        recorder.clearCalls();
        EXPECT_FALSE(ctrl().removeSelectedChannelFromSelectedCurveSet());
        EXPECT_EQ(recorder.count("postNotification"), 0u) << "a set without removal posts nothing";
        EXPECT_EQ(ctrl().appendChannel(static_cast<TQChannel*>(folder->getChild(0)), plain),
                  nullptr);
        EXPECT_EQ(recorder.count("postNotification"), 0u) << "nothing appended, nothing posted";
    }
}

TEST_F(CtrlCore, samples__refresh_when_dirty_and_nothing_for_a_foreign_item) {
    auto item = addItem(addChannel("A", {{0, 0}, {1, 1}}));
    const CMTime* u = nullptr;
    const double* v = nullptr;
    unsigned n = 11;
    ctrl().getSamples(item.get(), kTQSamplesOriginalCurve, kCMTimeZero, CMTimeMake(1, 10), &u, &v,
                      &n);
    ASSERT_NE(v, nullptr);
    EXPECT_EQ(n, 11u);
    EXPECT_NEAR(v[10], 1.0, kValueTolerance);
    {
        // A clean processed curve is served as held, even after a new count was asked for.
        ctrl().getSamples(item.get(), 1, kCMTimeZero, CMTimeMake(1, 10), &u, &v, &n);
        item->setNumberOfSamples(5000);
        ctrl().getSamples(item.get(), 1, kCMTimeZero, CMTimeMake(1, 10), &u, &v, &n);
        EXPECT_EQ(n, 11u) << "no more than the arrays hold";
    }

    auto stranger = std::make_shared<TQCurveEditorChannelItem>();
    stranger->initWithChannel(addChannel("B", {}), 5, &recorder, 0);
    n = 7;
    ctrl().getSamples(stranger.get(), kTQSamplesOriginalCurve, kCMTimeZero, CMTimeMake(1, 10), &u,
                      &v, &n);
    EXPECT_EQ(u, nullptr);
    EXPECT_EQ(v, nullptr);
    EXPECT_EQ(n, 0u);
}

class CtrlValuePanel : public CtrlCore {
protected:
    void SetUp() override {
        CtrlCore::SetUp();
        RWServiceSet services;
        services.modal = &modal;
        RWInstallServices(services);
    }
    void TearDown() override {
        RWResetServices();
        CtrlCore::TearDown();
    }
    RWScriptedModal modal;
};

TEST_F(CtrlValuePanel, showValue__writes_the_accepted_value_in_channel_units) {
    TQChannel* a = addChannel("A", {{1, 0.5}});
    a->getInfo()->displayScale = 100.0;
    auto item = addItem(a);
    item->setOriginalCurveDirty(0);
    selectInView({keypointEntry(item, 1)});
    double shown = 0.0;
    modal.pushScript([&](RWWindow& window, RWModalService& m) {
        auto* panel = dynamic_cast<TQCurveEditorValueWindow*>(&window);
        ASSERT_NE(panel, nullptr);
        shown = panel->value;
        panel->value = 25.0;
        m.stopModalWithCode(RWModalResponseOK);
    });
    ctrl().showValueAtPoint(CGPointMake(10, 10), nullptr, CGRectMake(0, 0, 5, 5));
    EXPECT_NEAR(shown, 50.0, kValueTolerance) << "the panel shows the value times displayScale";
    EXPECT_NEAR(keyValueAt(a, 1), 0.25, kValueTolerance);
    EXPECT_TRUE(recorder.bracketSequence().empty()) << "the value panel opens no bracket";
    EXPECT_FALSE(item->originalCurveDirty()) << "nor marks the curve, as it always has";

    modal.pushScript([](RWWindow& window, RWModalService& m) {
        static_cast<TQCurveEditorValueWindow&>(window).value = 99.0;
        m.stopModalWithCode(RWModalResponseCancel);
    });
    ctrl().showValueAtPoint(CGPointMake(10, 10), nullptr, CGRectMake(0, 0, 5, 5));
    EXPECT_NEAR(keyValueAt(a, 1), 0.25, kValueTolerance) << "a cancelled panel changes nothing";
}

TEST_F(CtrlValuePanel, showValue__a_boolean_channel_opens_no_panel) {
    auto item = addItem(
        static_cast<TQChannel*>(object->addChild(std::make_unique<TQChannelBool>("On", 77))));
    item->channel()->setKeyframe(seconds(1), 1.0);
    selectInView({keypointEntry(item, 1)});
    ctrl().showValueAtPoint(CGPointMake(0, 0), nullptr, CGRectZero);
    EXPECT_TRUE(modal.runs().empty());
}

// The three context menus as a user opens them: titles, actions and tags, submenus indented.
TEST_F(CtrlCore, menus__as_recorded) {
    std::string text;
    const std::function<void(const RWMenu&, int)> walk = [&](const RWMenu& menu, int depth) {
        for (const auto& item : menu.itemArray()) {
            text += std::string(2 * depth, ' ') + item->title() + " | " + item->action() + " | " +
                    std::to_string(item->tag()) + "\n";
            if (item->hasSubmenu()) walk(*item->submenu(), depth + 1);
        }
    };
    for (const RWMenuPtr& menu :
         {ctrl().getKeyframeMenu(), ctrl().getCurveMenu(), ctrl().getTangentMenu()}) {
        walk(*menu, 0);
        text += "--\n";
    }
    EXPECT_TRUE(view_test::matchesBaseline("menus", text, "src/engine/tests/baselines"));
}
