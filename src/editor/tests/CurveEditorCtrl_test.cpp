// The full editor's controller on the sample project: its set-up, the update cycle of notify,
// the vertical scroller, the frame grid, the mirror of the keypoint selection into the list,
// and what it does with bad input.
#include <gtest/gtest.h>

#include <cmath>

#include "host/TQHostObjectModel.h"
#include "src/editor/tests/EditorFixture.h"
#include "src/panels/TQEditorControls.h"

namespace editor_test {
namespace {

constexpr double kTolerance = 1e-9;

using CurveEditorCtrl = EditorFixture;

TEST_F(CurveEditorCtrl, setup__replaces_the_scroller_and_wires_the_controls) {
    const auto scroller = ctrl.verticalScroller();
    ASSERT_NE(dynamic_cast<TQVantaZoomScroller*>(scroller.get()), nullptr);
    EXPECT_EQ(superview.shown, scroller) << "the new scroller sits where the old one was";
    EXPECT_EQ(scroller->action(), "verticalZoomScroll:");
    EXPECT_EQ(scroller->minimumKnobProportion(), TQCurveEditorCtrl::kMinimumKnobProportion);
    EXPECT_EQ(ctrl.tools()->imageNameForSegment(1), "K_KeyframeEditor_SketchKeyframes");
    ctrl.tools()->userClickSegment(2);
    EXPECT_EQ(ctrl.getCurrentTool(), TQTool::kBox) << "the segment holds the tool";
    EXPECT_EQ(log.front(), "currentToolChanged");
    EXPECT_EQ(ctrl.selectedCurveSet(), ctrl.curveSetAnimated());
    EXPECT_EQ(ctrl.curveSetsPopUp()->title(), "Animated");
    EXPECT_EQ(view.getOriginalViewVolume().size.width, 6.0) << "the total range is the reference";
}

TEST_F(CurveEditorCtrl, destructor__detaches_the_view_and_stops_rebuilding_the_pop_up) {
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
    popUp->userWillPopUp();  // the first controller observes it still
    EXPECT_GT(popUp->numberOfItems(), 0);
    EXPECT_EQ(std::count(log.begin(), log.end(), "refreshPopUp"), 1)
        << "only the living controller rebuilt the menu";
}

// ---- The update cycle ----------------------------------------------------------------------

class Notify : public EditorFixture {
protected:
    void SetUp() override {
        EditorFixture::SetUp();
        // Words posted from inside notify are recorded, not delivered again.
        host.removeNotificationReceiver(&ctrl);
        view.setIsInCurveEditor(1);  // no auto-zoom in step 7 unless a row asks for it
        title = object(kTQHostSampleTitleObject);
        logo = object(kTQHostSampleBehaviorObject);
    }
    TQChannel* channelOf(TQChannelBase* object, TQHostProperty property, size_t axis = 0) {
        const BNString& path = TQHostPropertyPaths(family(), property)[axis];
        return dynamic_cast<TQChannel*>(TQChannelRef(path).getChannel(object));
    }
    // The set shown, the objects selected and the channels changed since the last reset.
    void state(void (TQCurveEditorCtrl::*show)(RWActionSender*),
               const std::vector<TQChannelBase*>& selected,
               const std::vector<TQChannel*>& modified = {}) {
        host.setSelectedObjects(selected);
        (ctrl.*show)(nullptr);
        host.resetModifiedChannels();
        for (TQChannel* c : modified) c->noteWillChange(true);
        log.clear();
    }

    TQChannelObjectRootBase* title = nullptr;
    TQChannelObjectRootBase* logo = nullptr;
};

TEST_F(Notify, words__several_flags_act_in_the_fixed_order) {
    using C = TQCurveEditorCtrl;
    using W = TQNotificationWord;
    TQChannel* bounce = channelOf(logo, TQHostProperty::Position, 1);  // an unselected object's
    TQChannel* pivot = channelOf(title, TQHostProperty::Pivot);        // no keys, default value
    const Log reset{"resetModifiedChannels"};
    const struct {
        const char* what;
        void (C::*show)(RWActionSender*);
        std::vector<TQChannelBase*> selected;
        TQChannel* modified;
        W word;
        Log expected;
    } rows[] = {
        {"unknown bits only", &C::showAnimated, {title}, nullptr, 0x40000140u, reset},
        {"scene change",
         &C::showAnimated,
         {title},
         nullptr,
         kTQNotifySceneChanged,
         {"refreshSelectedCurveSet", reset[0]}},
        {"scene change, Active, objects selected: nothing rebuilt",
         &C::showActive,
         {title},
         nullptr,
         kTQNotifySceneChanged,
         {"objectsSelectedInScene", reset[0]}},
        {"scene change, Active, no object selected",
         &C::showActive,
         {},
         nullptr,
         kTQNotifySceneChanged,
         {"objectsSelectedInScene", "refreshSelectedCurveSet", "modifiedChannels", reset[0]}},
        {"scene reset, Active: cleared in both branches",
         &C::showActive,
         {title},
         nullptr,
         kTQNotifySceneReset,
         {"currentToolChanged", reset[0]}},
        {"changes and set content: stale from step 5 carried into step 7",
         &C::showAnimated,
         {title},
         nullptr,
         kTQNotifyChannelsChanged | kTQNotifyCurveSetContentChanged,
         {"currentToolChanged", "refreshSelectedCurveSet", "refreshSelectedCurveSet",
          "refreshPopUp", reset[0]}},
        {"an animated channel outside Animated makes it stale",
         &C::showAnimated,
         {title},
         bounce,
         kTQNotifyChannelsChanged,
         {"modifiedChannels", "refreshSelectedCurveSet", reset[0]}},
        {"a channel without keys does not, for Animated",
         &C::showAnimated,
         {title},
         pivot,
         kTQNotifyChannelsChanging,
         {"modifiedChannels", "updateIfModifiedByBehaviors", reset[0]}},
        {"but does for Modified",
         &C::showModified,
         {title},
         pivot,
         kTQNotifyChannelsChanging,
         {"modifiedChannels", "refreshSelectedCurveSet", reset[0]}},
        {"a set by property does not follow changes",
         &C::showPosition,
         {title},
         bounce,
         kTQNotifyChannelsChanged,
         {"updateIfModifiedByBehaviors", reset[0]}},
        {"object selection",
         &C::showAll,
         {title},
         nullptr,
         kTQNotifyObjectSelectionChanged,
         {"refreshSelectedCurveSet", reset[0]}},
        {"tool change with set content",
         &C::showAll,
         {title},
         nullptr,
         kTQNotifyToolChanged | kTQNotifyCurveSetContentChanged,
         {"currentToolChanged", "refreshSelectedCurveSet", "refreshPopUp", reset[0]}},
    };
    for (const auto& row : rows) {
        SCOPED_TRACE(row.what);
        state(row.show, row.selected,
              row.modified ? std::vector{row.modified} : std::vector<TQChannel*>{});
        ctrl.notify(row.word);
        EXPECT_EQ(log, row.expected);
    }
    {
        SCOPED_TRACE("a hidden channel never makes a set stale");
        state(&C::showModified, {title}, {pivot});
        pivot->setFlag(kTQChannelFlagHidden);
        ctrl.notify(kTQNotifyChannelsChanged);
        EXPECT_EQ(log, (Log{"modifiedChannels", "updateIfModifiedByBehaviors", reset[0]}));
    }
    {
        SCOPED_TRACE("curves beyond a view out of focus zoom it");
        state(&C::showAll, {title});
        view.setIsInCurveEditor(0);
        view.setCurrentViewVolume(CGRectMake(0, 0, 6, 0.001));
        ctrl.notify(kTQNotifyChannelsChanged);
        EXPECT_EQ(log, (Log{"updateIfModifiedByBehaviors", "performAutoZoom", reset[0]}));
    }
}

class NotifyWithList : public Notify {
protected:
    void connect(TQCurveEditorOutlets& outlets) override {
        outlets.channels = &list;
        outlets.channelsList = &list;
    }
    RecordingList list{ctrl, log};
};

TEST_F(NotifyWithList, time__animated_rows_refresh_without_titles_at_every_word_while_playing) {
    state(&TQCurveEditorCtrl::showAll, {title});
    std::vector<std::string> animatedRows;
    const TQCurveSetPtr set = ctrl.selectedCurveSet();
    for (uint32_t i = 0; i < set->numberOfChannelItems(); ++i)
        if (TQChannel* c = set->channeItemAtIndex(i)->channel();
            c->isAnimated(false) || c->isChannelAffectedByBehaviors(true))
            animatedRows.push_back("refreshRowWithoutTitle " + std::to_string(i));
    ASSERT_FALSE(animatedRows.empty());
    ASSERT_LT(animatedRows.size(), set->numberOfChannelItems()) << "some rows stand still";

    host.play();
    for (int call = 0; call < 2; ++call) {
        SCOPED_TRACE(call);
        log.clear();
        ctrl.notify(kTQNotifyHostTimeChanged);
        Log expected = animatedRows;
        expected.push_back("resetModifiedChannels");
        // The limit of five updates a second never holds: its time is kept in a bool.
        EXPECT_EQ(log, expected);
    }
}

TEST_F(NotifyWithList, selection__mirrors_the_curves_of_the_keypoints_into_the_rows) {
    state(&TQCurveEditorCtrl::showAll, {title});
    const TQCurveSetPtr set = ctrl.selectedCurveSet();
    TQCurveSelectionList selection;
    for (uint32_t row : {3u, 1u, 3u}) {
        auto entry = std::make_shared<TQCurveSelection>();
        entry->setCurveId(set->channeItemAtIndex(row)->channelId());
        selection.addSelection(entry);
    }
    ctrl.selectionChangedTo(&selection);
    EXPECT_EQ(log, (Log{"deselectAll", "select row 1+", "select row 3+"}));
}

// ---- The vertical scroller -----------------------------------------------------------------

class Scroller : public EditorFixture {
protected:
    void SetUp() override {
        EditorFixture::SetUp();
        view.setAutoZoom(0);
        // No items: the maximum volume is the view's, widened to reach 0 by the padding.
        ctrl.setSelectedCurveSet(ctrl.curveSetPosition());
        host.clearObjectSelection();
        ctrl.refreshSelectedCurveSet();
        ASSERT_EQ(ctrl.numberOfChannelItems(), 0u);
    }
    void viewAt(double y, double height) { view.setCurrentViewVolume(CGRectMake(0, y, 6, height)); }
};

TEST_F(Scroller, update__value_and_knob_at_the_edges) {
    const struct {
        const char* what;
        double y, height;
        double value, knob;
    } rows[] = {
        {"view as high as the range: top, full knob", -1.0, 2.0, 0.0, 1.0},
        {"view at the top of a taller range", 5.0, 2.0, 0.0, 2.0 / 7.1},
        {"view at the bottom", -10.0, 2.0, 1.0, 2.0 / 10.1},
        {"zero height: no knob", 0.0, 0.0, 0.0, 0.0},
    };
    for (const auto& row : rows) {
        SCOPED_TRACE(row.what);
        viewAt(row.y, row.height);
        ctrl.updateVerticalZoomScroller();
        EXPECT_NEAR(ctrl.verticalScroller()->floatValue(), row.value, kTolerance);
        EXPECT_NEAR(ctrl.verticalScroller()->knobProportion(), row.knob, kTolerance);
        EXPECT_FLOAT_EQ(ctrl.oldKnobValue(), static_cast<float>(row.value));
        EXPECT_FLOAT_EQ(ctrl.oldKnobProportion(), static_cast<float>(row.knob));
    }
}

TEST_F(Scroller, hit_parts__pages_and_lines_pan_the_knob_parts_zoom) {
    // A view of 2 at y 3: the range is -0.1 .. 5 (5.1 high, 3.1 to pan over).
    const double slack = 3.1;
    const struct {
        RWScrollerPart part;
        double y, height;  // the view afterwards
    } rows[] = {
        {kRWScrollerDecrementPage, 3.0 - slack, 2.0},
        {kRWScrollerIncrementPage, 3.0 + slack, 2.0},
        {kRWScrollerDecrementLine, 3.0 - 0.2 * slack, 2.0},
        {kRWScrollerIncrementLine, 3.0 + 0.2 * slack, 2.0},
        // knob 0.5 at 0.25: 2.55 high, a quarter of the 2.55 left below the top
        {kRWScrollerKnob, 5.0 - 2.55 - 0.25 * 2.55, 2.55},
        {kRWScrollerKnobEndEdge, 5.0 - 2.55 - 0.25 * 2.55, 2.55},
        {kRWScrollerNoPart, 3.0, 2.0},
    };
    auto& scroller = *ctrl.verticalScroller();
    scroller.setEnabled(true);
    for (const auto& row : rows) {
        SCOPED_TRACE(row.part);
        viewAt(3.0, 2.0);
        ASSERT_NEAR(ctrl.getMaxViewVolume().size.height, 5.1, kTolerance);
        scroller.setKnobProportion(0.5);
        scroller.setFloatValue(0.25);
        scroller.userClickPart(row.part);
        EXPECT_NEAR(view.getCurrentViewVolume().origin.y, row.y, kTolerance);
        EXPECT_NEAR(view.getCurrentViewVolume().size.height, row.height, kTolerance);
        if (row.part == kRWScrollerDecrementPage) {
            // The view was at the top, which updateVerticalZoomScroller puts at 0.
            EXPECT_NEAR(scroller.floatValue(), 1.0, kTolerance)
                << "after a pan: from the volumes before it, unflipped";
            EXPECT_FLOAT_EQ(ctrl.oldKnobValue(), 1.0f);
        }
    }
}

TEST_F(Scroller, auto_zoom__the_view_or_the_scroller) {
    viewAt(5.0, 2.0);
    ctrl.updateVerticalZoomScroller();
    EXPECT_FALSE(ctrl.shouldAutoZoom()) << "the knob matches the view";
    viewAt(5.0, 1.0);
    EXPECT_TRUE(ctrl.shouldAutoZoom()) << "the knob no longer matches";
    ctrl.setAutoZoom(nullptr);
    EXPECT_TRUE(view.autoZoom());
    EXPECT_FALSE(ctrl.verticalScroller()->isEnabled());
    ctrl.setAutoZoom(nullptr);
    EXPECT_TRUE(ctrl.verticalScroller()->isEnabled());
}

// ---- The frame grid ------------------------------------------------------------------------

TEST_F(CurveEditorCtrl, frame_grid__nearest_frame_with_a_half_going_up) {
    auto at = [](int64_t value, int32_t scale) { return CMTimeMake(value, scale); };
    const struct {
        CMTime frame, time, expected;
    } rows[] = {
        {at(1, 30), at(1, 60), at(1, 30)},                    // exactly half a frame
        {at(1, 30), at(9999, 600000), at(0, 30)},             // just below half
        {at(1, 30), at(-1, 60), at(0, 30)},                   // half below zero goes up to zero
        {at(1001, 30000), at(1001, 60000), at(1001, 30000)},  // 29.97
        {at(1001, 30000), at(59 * 1001, 60000), at(30 * 1001, 30000)},
        {at(1001, 30000), at(59 * 1001 - 1, 60000), at(29 * 1001, 30000)},
    };
    for (const auto& row : rows) {
        host.setFrameDuration(row.frame);
        const CMTime got = ctrl.convertToCurveEditorAxis(row.time);
        EXPECT_EQ(CMTimeCompare(got, row.expected), 0)
            << CMTimeGetSeconds(row.time) << " s at " << CMTimeGetSeconds(row.frame) << " s";
    }
    TQCurveEditorCtrl lone;
    const CMTime t = at(7, 100);
    EXPECT_EQ(CMTimeCompare(lone.convertToCurveEditorAxis(t), t), 0)
        << "without a host there is no grid";
}

// ---- Bad input -----------------------------------------------------------------------------

TEST_F(CurveEditorCtrl, bad_input__unknown_bits_missing_parts_and_vanished_channels) {
    constexpr TQNotificationWord kEveryWord = 0xffffffffu;
    {
        SCOPED_TRACE("a controller with nothing set up");
        TQCurveEditorCtrl bare;
        bare.init();
        bare.notify(kEveryWord);
        bare.update();
        bare.refreshPopUp();
        bare.verticalZoomScroll(nullptr);
        bare.setAutoZoom(nullptr);
        bare.showCustom(nullptr);
        bare.clearCurveSet(nullptr);
        bare.selectionChangedTo(nullptr);
        EXPECT_EQ(bare.appendChannelToCurveSet(nullptr), nullptr);
    }
    {
        SCOPED_TRACE("a host but no view, list or scroller");
        TQCurveEditorCtrl headless;
        headless.init();
        headless.setAppDelegate(&host);
        headless.setupController();
        headless.viewDidLoad();
        headless.notify(kEveryWord);
        headless.showAll();
        EXPECT_EQ(headless.selectedCurveSet(), headless.curveSetAll());
        EXPECT_GT(headless.numberOfChannelItems(), 0u) << "sets still fill without a view";
    }
    {
        SCOPED_TRACE("a custom set whose object left the scene");
        host.setSelectedObjects({object(kTQHostSampleTitleObject)});
        ctrl.showAll();
        TQCurveSetPtr custom = ctrl.cloneCurveSetWithName("Kept");
        ASSERT_GT(custom->numberOfChannelItems(), 0u);
        ASSERT_TRUE(host.removeObject(object(kTQHostSampleTitleObject)));
        ctrl.notify(kEveryWord);
        ctrl.notify(kTQNotifyChannelsChanged);
        ctrl.update();
        EXPECT_EQ(ctrl.selectedCurveSet(), custom);
        EXPECT_EQ(custom->numberOfChannelItems(), 0u) << "the vanished channels are pruned";
    }
    {
        SCOPED_TRACE("a tag past the custom sets");
        RWMenuItem stale("Gone", "showCustom:");
        stale.setTag(40);
        const TQCurveSetPtr before = ctrl.selectedCurveSet();
        EXPECT_TRUE(ctrl.performAction("showCustom:", stale));
        EXPECT_EQ(ctrl.selectedCurveSet(), before);
    }
}

// ---- The timeline view ---------------------------------------------------------------------

TEST_F(CurveEditorCtrl, timeline__display_range_drives_the_horizontal_view) {
    view.setSelectionViewVolume(CGRectMake(1, 1, 1, 1));
    const CMTime start = CMTimeMake(2, 1);
    const CMTime duration = CMTimeMake(4, 1);
    view.setDisplayRange(&start, &duration);
    EXPECT_TRUE(CGRectEqualToRect(view.getCurrentViewVolume(), CGRectMake(2, -62.5, 4, 125)));
    EXPECT_EQ(view.zoomX(), 800.0 / 4.0) << "points per second";
    EXPECT_TRUE(CGRectEqualToRect(view.getSelectionViewVolume(), CGRectZero))
        << "a rubber band is forgotten";
    view.setDisplayRange(nullptr, &start);
    EXPECT_EQ(view.getCurrentViewVolume().size.width, 2.0) << "a missing part stays";
}

}  // namespace
}  // namespace editor_test
