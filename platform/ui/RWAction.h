#pragma once
// Target and action: how a menu item or a control tells its controller that the user chose
// or changed something. The sender names the action (the operation's name, "showAll:") and
// hands itself to its target, which may read the sender's state (a scroller's hit part, a
// segmented control's selected segment, an item's tag).
//
// Targets are not owned by their senders: a target outlives the menus and controls that name
// it, or clears itself from them first.

#include <cstdint>
#include <string>

class RWMenuItem;

// Whatever sends an action: a menu item or a control. Every sender carries a tag, which a
// target may use to tell senders of one action apart (the index of a custom curve set).
class RWActionSender {
public:
    virtual ~RWActionSender() = default;
    virtual int64_t tag() const = 0;
};

// Whatever an action goes to. A target answers false for an action it does not know.
class RWActionTarget {
public:
    virtual ~RWActionTarget() = default;
    virtual bool performAction(const std::string& action, RWActionSender& sender) = 0;
    // Called before a menu shows when the menu validates its items: sets the state, may
    // change the title, answers whether the item is enabled.
    virtual bool validateMenuItem(RWMenuItem& item) {
        (void)item;
        return true;
    }
};
