#pragma once
// Controls are models. Every control a controller drives (scroller, segmented control, pop-up
// button, text field, slider, scrubber, and the outline and table views and inspector rows
// that follow the same pattern) is a small class here that holds the control's state, answers
// what the controller asks of it, and sends its action to its target when the user changes it.
// No toolkit is involved: core code and its tests drive the models with no display.
//
// The pattern, for every control:
//
//   State       plain getters and setters (setFloatValue, setSelectedSegment, setTitle...).
//               A setter changes the state and tells the observers; it never sends the action,
//               as a program's change is no user's.
//   User        one user... entry per gesture the control knows (userClickSegment,
//               userDragKnob, userSelectItemAtIndex, userEndEditing...). The toolkit adapter
//               calls it when the user acts; tests call it to stand for the user. It does
//               nothing while the control (or the part acted on) is disabled; otherwise it
//               changes the state as the gesture does, tells the observers, and sends the
//               action (sendAction). What the gesture was stays readable during the action
//               (hitPart of a scroller, selectedSegment of a momentary control).
//   Observers   RWControlObserver: the widget bound to the model hears controlDidChange after
//               every change of state, whoever made it, and shows the new state at once.
//               Observers are not owned and remove themselves before they go.
//   Notify      named notifications for controllers (RWPopUpButtonWillPopUpNotification):
//               addNotificationObserver answers a token that removeNotificationObserver takes.
//   Target      target and action of RWAction.h; the control is the sender, so the target
//               reads what it needs from it (tag, hitPart, selectedSegment).
//   Placement   frame, autoresizing and the superview, which the adapter supplies: a
//               controller that replaces a control by one of its own class (a scroller of the
//               framework's) asks the superview to put the new control in the old one's place,
//               and the adapter's widget then shows the new model.
//
// In qt/, one widget class per model binds both ways: it calls the model's user... entries
// from its signals and follows the model's changes as an observer. The widget keeps its model
// alive (shared ownership); models are held by std::shared_ptr everywhere.
//
// Everything runs on the main thread. A target or observer may change the control from
// inside an action or a notification; the control holds itself for the call.

#include <cstdint>
#include <functional>
#include <memory>
#include <string>
#include <vector>

#include "platform/geometry/CGGeometry.h"
#include "platform/ui/RWAction.h"
#include "platform/ui/RWObserverList.h"

class RWControl;

// Told of every change of a control's state.
class RWControlObserver {
public:
    virtual ~RWControlObserver() = default;
    virtual void controlDidChange(RWControl& control) = 0;
};

// What shows a control: a container view, or the adapter's widget bound to the control.
class RWControlSuperview {
public:
    virtual ~RWControlSuperview() = default;
    // Puts `replacement` where `control` is shown, at its place and size; `control` leaves.
    // The implementation sets both controls' superview.
    virtual void replaceSubview(RWControl& control,
                                const std::shared_ptr<RWControl>& replacement) = 0;
};

// Bits of autoresizingMask: which margins and sizes follow the superview's size.
enum : uint32_t {
    RWViewNotSizable = 0,
    RWViewMinXMargin = 1,
    RWViewWidthSizable = 2,
    RWViewMaxXMargin = 4,
    RWViewMinYMargin = 8,
    RWViewHeightSizable = 16,
    RWViewMaxYMargin = 32,
};

class RWControl : public RWActionSender, public std::enable_shared_from_this<RWControl> {
public:
    RWControl() = default;
    ~RWControl() override = default;
    RWControl(const RWControl&) = delete;
    RWControl& operator=(const RWControl&) = delete;

    // ---- Target and action ----
    RWActionTarget* target() const { return _target; }
    void setTarget(RWActionTarget* target) { _target = target; }
    const std::string& action() const { return _action; }
    void setAction(const std::string& action) { _action = action; }
    int64_t tag() const override { return _tag; }
    void setTag(int64_t tag) { _tag = tag; }
    // Sends the action to the target; false while disabled, without target or action, or
    // when the target does not know the action.
    bool sendAction();

    // ---- State every control has ----
    bool isEnabled() const { return _enabled; }
    virtual void setEnabled(bool enabled);
    // A hidden control is not shown and takes no input; it keeps its place and state.
    bool isHidden() const { return _hidden; }
    void setHidden(bool hidden);
    const std::string& accessibilityLabel() const { return _accessibilityLabel; }
    void setAccessibilityLabel(const std::string& label);

    // ---- Placement ----
    const CGRect& frame() const { return _frame; }
    virtual void setFrame(const CGRect& frame);
    uint32_t autoresizingMask() const { return _autoresizingMask; }
    void setAutoresizingMask(uint32_t mask) { _autoresizingMask = mask; }
    bool autoresizesSubviews() const { return _autoresizesSubviews; }
    void setAutoresizesSubviews(bool autoresizes) { _autoresizesSubviews = autoresizes; }
    RWControlSuperview* superview() const { return _superview; }
    // Called by the superview only.
    void setSuperview(RWControlSuperview* superview) { _superview = superview; }
    // Target, action, tag, frame and autoresizing of `other` (what a replacement takes over).
    void takePlacementAndTargetFrom(const RWControl& other);

    // ---- Observers ----
    void addObserver(RWControlObserver* observer) { _observers.add(observer); }
    void removeObserver(RWControlObserver* observer) { _observers.remove(observer); }

    // ---- Notifications ----
    using NotificationBlock = std::function<void(RWControl&)>;
    using NotificationToken = uint64_t;
    NotificationToken addNotificationObserver(const std::string& name, NotificationBlock block);
    // An unknown token is ignored.
    void removeNotificationObserver(NotificationToken token);
    // Runs the blocks observing `name`, in the order they were added.
    void postNotification(const std::string& name);

protected:
    // Tells every observer; each is looked up again, so that one may remove another.
    void changed();

private:
    RWActionTarget* _target = nullptr;  // not owned
    std::string _action;
    int64_t _tag = 0;
    bool _enabled = true;
    bool _hidden = false;
    std::string _accessibilityLabel;
    CGRect _frame = CGRectZero;
    uint32_t _autoresizingMask = RWViewNotSizable;
    bool _autoresizesSubviews = true;
    RWControlSuperview* _superview = nullptr;  // not owned
    RWObserverList<RWControlObserver> _observers;
    struct NotificationObserver {
        NotificationToken token;
        std::string name;
        NotificationBlock block;
    };
    std::vector<NotificationObserver> _notificationObservers;
    NotificationToken _nextToken = 1;
};

using RWControlPtr = std::shared_ptr<RWControl>;
