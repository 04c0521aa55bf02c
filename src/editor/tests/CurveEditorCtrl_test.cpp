// The full editor's controller on the sample project: its set-up, the update cycle of notify,
// the vertical scroller, the frame grid, the mirror of the keypoint selection into the list,
// the sketch tool, resizing, and what it does with bad input.
#include <gtest/gtest.h>

#include <cmath>
#include <sstream>
#include <utility>

#include "host/TQHostObjectModel.h"
#include "src/editor/tests/EditorFixture.h"
#include "src/panels/TQEditorControls.h"
#include "tests/support/TextBaseline.h"

namespace editor_test {
namespace {

constexpr double kTolerance = 1e-9;

using CurveEditorCtrl = EditorFixture;

TEST_F(CurveEditorCtrl, setup__wires_the_controls_and_a_dead_controller_stops_observing) {
    const auto scroller = ctrl.verticalScroller();
    ASSERT_NE(dynamic_cast<TQVantaZoomScroller*>(scroller.get()), nullptr);
    EXPECT_EQ(superview.shown, scroller) << "the new scroller sits where the old one was";
    ctrl.tools()->userClickSegment(2);
    EXPECT_EQ(ctrl.getCurrentTool(), TQTool::kBox) << "the segment holds the tool";
    EXPECT_EQ(log.front(), "currentToolChanged");
    EXPECT_EQ(view.getOriginalViewVolume().size.width, 6.0) << "the total range is the reference";

    const auto popUp = ctrl.curveSetsPopUp();
    {
        TQCurveEditorCtrl other;
        other.init();
        other.setAppDelegate(&host);
        other.setView(&view);
        TQCurveEditorOutlets outlets;
        outlets.curveSetsPopUp = popUp;
        outlets.reducePanel = std::make_shared<RWPanel>();
        other.connectOutlets(outlets);
        other.setupController();
        EXPECT_EQ(outlets.reducePanel->delegate(), &other);
        other.viewDidLoad();
    }
    EXPECT_EQ(view.getController(), nullptr);
    log.clear();
    popUp->removeAllItems();
    popUp->userWillPopUp();
    EXPECT_EQ(std::count(log.begin(), log.end(), "refreshPopUp"), 1) << "only the living one";
}

// ---- The update cycle ----------------------------------------------------------------------

class Notify : public EditorFixture {
protected:
    void connect(TQCurveEditorOutlets& outlets) override {
        outlets.channels = &list;
        outlets.channelsList = &list;
    }
    void SetUp() override {
        EditorFixture::SetUp();
        // Words posted from inside notify are recorded, not delivered again.
        host.removeNotificationReceiver(&ctrl);
        view.setIsInCurveEditor(1);  // no auto-zoom in step 7 unless a row asks for it
        title = object(kTQHostSampleTitleObject);
    }
    // The set shown, the title selected (or nothing) and the channel changed since the last
    // reset.
    void state(void (TQCurveEditorCtrl::*show)(RWActionSender*), TQChannel* modified = nullptr,
               bool noneSelected = false) {
        host.setSelectedObjects(noneSelected ? std::vector<TQChannelBase*>{}
                                             : std::vector<TQChannelBase*>{title});
        (ctrl.*show)(nullptr);
        host.resetModifiedChannels();
        if (modified) modified->noteWillChange(true);
        log.clear();
    }

    RecordingList list{ctrl, log};
    TQChannelObjectRootBase* title = nullptr;
};

TEST_F(Notify, words__several_flags_act_in_the_fixed_order) {
    using C = TQCurveEditorCtrl;
    // An unselected object's channel, and one with no keys at its default value.
    TQChannel* bounce = channel(kTQHostSampleBehaviorObject, TQHostProperty::Position, 1);
    TQChannel* pivot = channel(kTQHostSampleTitleObject, TQHostProperty::Pivot);
    const std::string r = "resetModifiedChannels", sel = "objectsSelectedInScene",
                      mod = "modifiedChannels", ref = "refreshSelectedCurveSet",
                      tool = "currentToolChanged", beh = "updateIfModifiedByBehaviors";
    const char* pop = "refreshPopUp";
    // The set shown, the word, what follows in order, the channel changed, and whether no object
    // is selected or the changed channel is hidden.
    const struct {
        void (C::*show)(RWActionSender*);
        TQNotificationWord word;
        Log expected;
        TQChannel* modified = nullptr;
        bool noneSelected = false, hidden = false;
    } rows[] = {
        {&C::showAnimated, 0x40000140u, {r}},  // unknown bits only
        {&C::showAnimated, kTQNotifySceneChanged, {ref, r}},
        {&C::showActive, kTQNotifySceneChanged, {sel, r}},
        {&C::showActive, kTQNotifySceneChanged, {sel, ref, mod, r}, nullptr, true},
        {&C::showActive, kTQNotifySceneReset, {tool, r}},
        // Changes and set content: stale from step 5 carried into step 7.
        {&C::showAnimated,
         kTQNotifyChannelsChanged | kTQNotifyCurveSetContentChanged,
         {tool, ref, ref, pop, r}},
        // An animated channel outside Animated makes it stale; one without keys does not, but
        // does for Modified; a set by property does not follow changes.
        {&C::showAnimated, kTQNotifyChannelsChanged, {mod, ref, r}, bounce},
        {&C::showAnimated, kTQNotifyChannelsChanging, {mod, beh, r}, pivot},
        {&C::showModified, kTQNotifyChannelsChanging, {mod, ref, r}, pivot},
        {&C::showPosition, kTQNotifyChannelsChanged, {beh, r}, bounce},
        {&C::showAll, kTQNotifyObjectSelectionChanged, {ref, r}},
        {&C::showAll, kTQNotifyToolChanged | kTQNotifyCurveSetContentChanged, {tool, ref, pop, r}},
        // A hidden channel never makes a set stale.
        {&C::showModified, kTQNotifyChannelsChanged, {mod, beh, r}, pivot, false, true},
    };
    for (const auto& row : rows) {
        SCOPED_TRACE(&row - rows);
        if (row.hidden) row.modified->setFlag(kTQChannelFlagHidden);
        state(row.show, row.modified, row.noneSelected);
        ctrl.notify(row.word);
        EXPECT_EQ(log, row.expected);
    }
    viewHost.resetRedrawRequests();
    ctrl.notify(kTQNotifyCurvesInvalidated);
    EXPECT_EQ(viewHost.redrawRequests(), 1) << "invalidated curves are drawn again";
    SCOPED_TRACE("curves beyond a view out of focus zoom it");
    state(&C::showAll);
    view.setIsInCurveEditor(0);
    view.setCurrentViewVolume(CGRectMake(0, 0, 6, 0.001));
    ctrl.notify(kTQNotifyChannelsChanged);
    EXPECT_EQ(log, (Log{beh, "performAutoZoom", r}));
}

TEST_F(Notify, rows__time_refreshes_animated_rows_and_keypoints_select_their_rows) {
    state(&TQCurveEditorCtrl::showAll);
    const TQCurveSetPtr set = ctrl.selectedCurveSet();
    // The title's animated rows (and the ones behaviours move); the others stand still.
    const Log expected = {"refreshRowWithoutTitle 0",  "refreshRowWithoutTitle 1",
                          "refreshRowWithoutTitle 6",  "refreshRowWithoutTitle 7",
                          "refreshRowWithoutTitle 15", "resetModifiedChannels"};
    host.play();
    // The limit of five updates a second never holds: its time is kept in a bool.
    for (int call = 0; call < 2; ++call) {
        log.clear();
        ctrl.notify(kTQNotifyHostTimeChanged);
        EXPECT_EQ(log, expected) << call;
    }

    TQCurveSelectionList selection;
    for (uint32_t row : {3u, 1u, 3u}) {
        auto entry = std::make_shared<TQCurveSelection>();
        entry->setCurveId(set->channeItemAtIndex(row)->channelId());
        selection.addSelection(entry);
    }
    log.clear();
    ctrl.selectionChangedTo(&selection);
    EXPECT_EQ(log, (Log{"deselectAll", "select row 1+", "select row 3+"}));
}

// ---- The vertical scroller -----------------------------------------------------------------

TEST_F(CurveEditorCtrl, vertical_scroller__value_knob_and_auto_zoom_and_what_its_parts_do) {
    view.setAutoZoom(0);
    // No items: the maximum volume is the view's, widened to reach 0 by the padding.
    ctrl.setSelectedCurveSet(ctrl.curveSetPosition());
    host.clearObjectSelection();
    ctrl.refreshSelectedCurveSet();
    ASSERT_EQ(ctrl.numberOfChannelItems(), 0u);
    auto& scroller = *ctrl.verticalScroller();
    auto viewAt = [&](double y, double h) { view.setCurrentViewVolume(CGRectMake(0, y, 6, h)); };
    std::ostringstream notes;
    notes.precision(10);
    // Nine decimals, so that rounding residue does not show.
    auto r = [](double x) { return std::round(x * 1e9) / 1e9 + 0.0; };
    auto note = [&](const std::string& step) {
        const CGRect v = view.getCurrentViewVolume();
        notes << step << ": view " << r(v.origin.y) << "+" << r(v.size.height) << ", value "
              << r(scroller.floatValue()) << " (kept " << r(ctrl.oldKnobValue()) << "), knob "
              << r(scroller.knobProportion()) << " (kept " << r(ctrl.oldKnobProportion()) << ")\n";
    };
    // As high as the range, at the top of a taller range, at the bottom, no height.
    for (const auto& [y, height] : {std::pair{-1.0, 2.0}, {5.0, 2.0}, {-10.0, 2.0}, {0.0, 0.0}}) {
        viewAt(y, height);
        ctrl.updateVerticalZoomScroller();
        note("update");
    }
    viewAt(5.0, 2.0);
    ctrl.updateVerticalZoomScroller();
    EXPECT_FALSE(ctrl.shouldAutoZoom()) << "the knob matches the view";
    viewAt(5.0, 1.0);
    EXPECT_TRUE(ctrl.shouldAutoZoom()) << "the knob no longer matches";
    ctrl.setAutoZoom(nullptr);
    EXPECT_TRUE(view.autoZoom() && !scroller.isEnabled());
    ctrl.setAutoZoom(nullptr);
    EXPECT_TRUE(scroller.isEnabled());

    // Each part clicked on a view of 2 at y 3 (the range is -0.1 .. 5), the knob 0.5 at 0.25.
    for (const RWScrollerPart part :
         {kRWScrollerDecrementPage, kRWScrollerIncrementPage, kRWScrollerDecrementLine,
          kRWScrollerIncrementLine, kRWScrollerKnob, kRWScrollerKnobEndEdge, kRWScrollerNoPart}) {
        viewAt(3.0, 2.0);
        ASSERT_NEAR(ctrl.getMaxViewVolume().size.height, 5.1, kTolerance);
        scroller.setKnobProportion(0.5);
        scroller.setFloatValue(0.25);
        scroller.userClickPart(part);
        note("part " + std::to_string(part));
    }
    EXPECT_TRUE(tests_support::matchesBaselineBlock("controller", "vertical_scroller", notes.str(),
                                                    "src/editor/tests/baselines"));
}

// ---- The frame grid, the sketch tool, resizing, bad input ----------------------------------

TEST_F(CurveEditorCtrl, frame_grid__nearest_frame_with_a_half_going_up) {
    auto at = [](int64_t value, int32_t scale) { return CMTimeMake(value, scale); };
    const struct {
        CMTime frame, time, expected;
    } rows[] = {
        {at(1, 30), at(1, 60), at(1, 30)},  // exactly half a frame goes up
        {at(1, 30), at(9999, 600000), at(0, 30)},
        {at(1, 30), at(-1, 60), at(0, 30)},  // half below zero goes up to zero
        {at(1001, 30000), at(59 * 1001, 60000), at(30 * 1001, 30000)},
        {at(1001, 30000), at(59 * 1001 - 1, 60000), at(29 * 1001, 30000)},
    };
    for (const auto& row : rows) {
        host.setFrameDuration(row.frame);
        EXPECT_EQ(CMTimeCompare(ctrl.convertToCurveEditorAxis(row.time), row.expected), 0)
            << CMTimeGetSeconds(row.time) << " s at " << CMTimeGetSeconds(row.frame) << " s";
    }
    TQCurveEditorCtrl lone;
    EXPECT_EQ(CMTimeCompare(lone.convertToCurveEditorAxis(at(7, 100)), at(7, 100)), 0)
        << "without a host there is no grid";
}

TEST_F(CurveEditorCtrl, sketch__writes_only_on_selected_channels) {
    host.setSelectedObjects({object(kTQHostSampleTitleObject)});
    static_cast<TQCurveEditorCtrlBase&>(ctrl).setCurrentTool(TQTool::kSketch);
    ctrl.deselectAllChannels();
    const TQCurveEditorItemPtr item = ctrl.selectedCurveSet()->channeItemAtIndex(0);
    const unsigned keys = item->channel()->numberOfKeyframes();
    const CGPoint at = view.getPointScreen(CGPointMake(1.2345, 0.0));
    for (const bool selected : {false, true}) {
        item->select(selected);
        recorder.clearCalls();
        view.mouseDown(RWEvent::mouseEvent(RWEventType::LeftMouseDown, at));
        view.mouseUp(RWEvent::mouseEvent(RWEventType::LeftMouseUp, at));
        EXPECT_EQ(recorder.count("startCaptureModifiedChannels"), selected ? 1u : 0u);
        EXPECT_EQ(item->channel()->numberOfKeyframes(), keys + (selected ? 1 : 0));
    }
}

TEST_F(CurveEditorCtrl, bad_input__unknown_bits_missing_parts_and_vanished_channels) {
    constexpr TQNotificationWord kEveryWord = 0xffffffffu;
    {
        SCOPED_TRACE("a controller with nothing set up, then a host but no view or controls");
        TQCurveEditorCtrl bare;
        bare.init();
        bare.notify(kEveryWord);
        bare.update();
        bare.verticalZoomScroll(nullptr);
        bare.setAutoZoom(nullptr);
        bare.showCustom(nullptr);
        bare.selectionChangedTo(nullptr);
        EXPECT_EQ(bare.appendChannelToCurveSet(nullptr), nullptr);
        bare.setAppDelegate(&host);
        bare.setupController();
        bare.viewDidLoad();
        bare.notify(kEveryWord);
        bare.showAll();
        EXPECT_GT(bare.numberOfChannelItems(), 0u) << "sets still fill without a view";
    }
    {
        SCOPED_TRACE("a custom set whose object left the scene");
        host.setSelectedObjects({object(kTQHostSampleTitleObject)});
        ctrl.showAll();
        TQCurveSetPtr custom = ctrl.cloneCurveSetWithName("Kept");
        ASSERT_GT(custom->numberOfChannelItems(), 0u);
        // A resize fits the curves of every set to the new width: a sample a point, and one more.
        ctrl.viewDidResize();
        auto& item = static_cast<TQCurveEditorChannelItem&>(*custom->channeItemAtIndex(0));
        item.refreshOriginalCurve(kCMTimeZero, CMTimeMake(1, 30));
        EXPECT_EQ(item.numberOfSamples(), uint32_t(view.width()) + 1);
        ASSERT_TRUE(host.removeObject(object(kTQHostSampleTitleObject)));
        ctrl.notify(kEveryWord);
        ctrl.update();
        EXPECT_EQ(ctrl.selectedCurveSet(), custom);
        EXPECT_EQ(custom->numberOfChannelItems(), 0u) << "the vanished channels are pruned";
    }
    RWMenuItem stale("Gone", "showCustom:");
    stale.setTag(40);
    const TQCurveSetPtr before = ctrl.selectedCurveSet();
    EXPECT_TRUE(ctrl.performAction("showCustom:", stale)) << "a tag past the custom sets";
    EXPECT_EQ(ctrl.selectedCurveSet(), before);
}

}  // namespace
}  // namespace editor_test
