// The control models driven as a user would drive them, with no display: each gesture changes
// the state, tells the observers and sends the action with the control as sender; disabled
// controls and parts take nothing.
#include <gtest/gtest.h>

#include <cmath>
#include <limits>
#include <string>
#include <vector>

#include "platform/ui/RWControl.h"
#include "platform/ui/RWDecimalFormatter.h"
#include "platform/ui/RWPopUpButton.h"
#include "platform/ui/RWSegmentedControl.h"
#include "platform/ui/RWTextField.h"
#include "platform/ui/RWValueControls.h"
#include "platform/ui/RWWindow.h"
#include "platform/ui/RWZoomScroller.h"
#include "platform/ui/testing/RWTestDoubles.h"

namespace {

// Records each action with what the sender showed at that moment (a tag, a hit part, a
// selected segment), read through `probe`.
struct Target : RWActionTarget {
    bool performAction(const std::string& action, RWActionSender& sender) override {
        actions.push_back(action + "/" + std::to_string(probe ? probe(sender) : sender.tag()));
        return true;
    }
    std::function<int64_t(RWActionSender&)> probe;
    std::vector<std::string> actions;
};

struct Observer : RWControlObserver {
    void controlDidChange(RWControl&) override { ++changes; }
    int changes = 0;
};

TEST(RWZoomScroller, gestures_set_the_part_and_values_then_send_the_action) {
    Target target;
    auto scroller = wired<RWZoomScroller>(target, "scroll:");
    target.probe = [](RWActionSender& s) { return dynamic_cast<RWZoomScroller&>(s).hitPart(); };
    Observer observer;
    scroller->addObserver(&observer);

    scroller->userClickPart(kRWScrollerIncrementLine);
    scroller->userMoveKnob(0.25);
    scroller->userMoveKnob(2.0, kRWScrollerKnobSlot);
    EXPECT_EQ(scroller->floatValue(), 1.0) << "a value past the end is kept at the end";
    scroller->userResizeKnob(kRWScrollerKnobEndEdge, 0.4, 0.5);
    EXPECT_EQ(target.actions,
              (std::vector<std::string>{"scroll:/5", "scroll:/2", "scroll:/6", "scroll:/8"}));
    EXPECT_EQ(scroller->knobProportion(), 0.4);
    EXPECT_EQ(scroller->floatValue(), 0.5);
    EXPECT_EQ(observer.changes, 4) << "the widget hears every gesture";

    scroller->setEnabled(false);
    scroller->userClickPart(kRWScrollerDecrementPage);
    scroller->userMoveKnob(0.1);
    EXPECT_EQ(target.actions.size(), 4u) << "a disabled scroller takes no gesture";
    EXPECT_EQ(scroller->floatValue(), 0.5);

    // What a program sets tells the widget but sends nothing.
    scroller->setKnobProportion(std::numeric_limits<double>::quiet_NaN());
    scroller->setMinimumKnobProportion(0.01);
    EXPECT_EQ(scroller->knobProportion(), 0.0) << "no number reaches the knob";
    EXPECT_EQ(scroller->displayedKnobProportion(), 0.01);
    EXPECT_EQ(target.actions.size(), 4u);
    scroller->removeObserver(&observer);

    // The frame leaves the window's corner free only when the scroller ends there.
    for (const bool corner : {false, true}) {
        scroller->setEndsAtWindowCorner(corner);
        scroller->setFrame(CGRectMake(0, 0, 15, 200));
        EXPECT_EQ(scroller->frame().size.height, 200.0 - corner * RWZoomScroller::kGrowBoxSize);
    }
}

TEST(RWSegmentedControl, select_one_keeps_the_segment_momentary_only_during_the_action) {
    Target target;
    auto tools = wired<RWSegmentedControl>(target, "setTool:");
    target.probe = [](RWActionSender& s) {
        return dynamic_cast<RWSegmentedControl&>(s).selectedSegment();
    };
    tools->setSegmentCount(3);
    tools->setEnabled(false, 2);
    tools->userClickSegment(1);
    tools->userClickSegment(2);  // disabled segment
    tools->userClickSegment(7);  // no such segment
    EXPECT_EQ(tools->selectedSegment(), 1);
    EXPECT_EQ(target.actions, (std::vector<std::string>{"setTool:/1"}));

    tools->setTrackingMode(RWSegmentSwitchTracking::Momentary);
    tools->userClickSegment(0);
    EXPECT_EQ(target.actions.back(), "setTool:/0") << "the action sees the clicked segment";
    EXPECT_EQ(tools->selectedSegment(), -1) << "a momentary control keeps no selection";

    tools->setSelectedSegment(1);
    tools->setSegmentCount(1);
    EXPECT_EQ(tools->selectedSegment(), -1) << "a selection past the new count is dropped";
    tools->setImageName("Image", 4);
    EXPECT_EQ(tools->imageNameForSegment(4), "");
}

TEST(RWPopUpButton, opening_lets_an_observer_rebuild_and_a_choice_runs_the_items_action) {
    Target target;
    auto popUp = wired<RWPopUpButton>(target, "popUpChanged:");
    int rebuilt = 0;
    const auto token =
        popUp->addNotificationObserver(RWPopUpButtonWillPopUpNotification, [&](RWControl&) {
            ++rebuilt;
            popUp->removeAllItems();
            for (int i = 0; i < 3; ++i) {
                auto item = std::make_shared<RWMenuItem>("Set " + std::to_string(i), "show:");
                item->setTarget(&target);
                item->setTag(10 + i);
                popUp->addItem(item);
            }
            popUp->addItem(RWMenuItem::separatorItem());
            popUp->addItem(std::make_shared<RWMenuItem>("Plain", ""));
        });
    popUp->userWillPopUp();
    popUp->userSelectItemAtIndex(1);
    EXPECT_EQ(popUp->title(), "Set 1");
    EXPECT_EQ(popUp->indexOfSelectedItem(), 1);
    popUp->userSelectItemAtIndex(3);  // the separator
    popUp->userSelectItemAtIndex(4);  // no action of its own: the button's
    EXPECT_EQ(target.actions, (std::vector<std::string>{"show:/11", "popUpChanged:/0"}))
        << "the item is the sender of its action";

    // The selection is the item, wherever it moves.
    popUp->menu()->insertItemAtIndex(std::make_shared<RWMenuItem>("First", ""), 0);
    EXPECT_EQ(popUp->selectedItem()->title(), "Plain");

    popUp->removeNotificationObserver(token);
    popUp->userWillPopUp();
    EXPECT_EQ(rebuilt, 1) << "a removed observer hears nothing more";
    popUp->setMenu(nullptr);
    EXPECT_EQ(popUp->numberOfItems(), 0) << "the button always has a menu";
    EXPECT_EQ(popUp->indexOfSelectedItem(), -1);
}

TEST(RWTextField, an_edit_goes_through_the_formatter) {
    Target target;
    RWDecimalFormatter numbers;
    auto field = wired<RWTextField>(target, "nameChanged:");
    field->setEditable(true);
    field->setFormatter(&numbers);
    field->setDoubleValue(2.5);
    Observer observer;
    field->addObserver(&observer);

    EXPECT_EQ(field->userEndEditing("abc"), std::optional<std::string>("Not a number"));
    EXPECT_EQ(field->stringValue(), "2.5") << "refused text leaves the value";
    EXPECT_EQ(observer.changes, 1) << "the widget is told to show the value again";
    EXPECT_EQ(field->userEndEditing("7"), std::nullopt);
    EXPECT_EQ(field->doubleValue(), 7.0);
    EXPECT_EQ(target.actions.size(), 1u);

    field->setEditable(false);
    field->setCell(nullptr);  // refused: the field keeps its cell and value
    EXPECT_TRUE(field->userEndEditing("9").has_value());
    EXPECT_EQ(field->doubleValue(), 7.0);
    field->removeObserver(&observer);
}

TEST(RWValueControls, values_stay_in_range_and_steps_follow_the_increments) {
    Target target;
    auto slider = wired<RWSlider>(target, "slide:");
    slider->setMinValue(1.0);
    slider->setMaxValue(10.0);
    EXPECT_EQ(slider->doubleValue(), 1.0) << "a new range pulls the value in";
    slider->setDoubleValue(-3.7);
    EXPECT_EQ(slider->doubleValue(), 1.0);
    slider->setNumberOfTickMarks(10);
    slider->setAllowsTickMarkValuesOnly(true);
    slider->userSetSliderValue(4.4);
    EXPECT_EQ(slider->intValue(), 4);
    EXPECT_EQ(slider->doubleValue(), 4.0) << "only tick mark values";

    auto scrubber = wired<RWScrubber>(target, "scrub:");
    scrubber->setMinValue(-100.0);
    scrubber->setMaxValue(100.0);
    scrubber->userStep(2, RWScrubber::Step::Coarse);
    scrubber->userStep(-3, RWScrubber::Step::Fine);
    EXPECT_NEAR(scrubber->doubleValue(), 19.7, 1e-12);
    EXPECT_EQ(scrubber->intValue(), 19);
    scrubber->setDoubleValue(-42.9);
    EXPECT_EQ(scrubber->intValue(), -42) << "intValue truncates toward zero";
    EXPECT_EQ(target.actions.size(), 3u);
}

struct WindowDelegate : RWWindowDelegate {
    bool windowShouldClose(RWWindow&) override {
        calls.push_back("should");
        return allow;
    }
    void windowWillClose(RWWindow&) override { calls.push_back("will"); }
    bool allow = false;
    std::vector<std::string> calls;
};

TEST(RWWindow, the_users_close_asks_the_delegate_first) {
    RWPanel panel;
    WindowDelegate delegate;
    panel.setDelegate(&delegate);
    panel.makeKeyAndOrderFront();
    EXPECT_FALSE(panel.performClose());
    EXPECT_TRUE(panel.isVisible());
    delegate.allow = true;
    EXPECT_TRUE(panel.performClose());
    EXPECT_FALSE(panel.isVisible());
    panel.close();
    EXPECT_EQ(delegate.calls, (std::vector<std::string>{"should", "should", "will", "will"}));
}

}  // namespace
