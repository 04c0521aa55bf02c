#include <gtest/gtest.h>

#include <array>
#include <string>
#include <vector>

#include "platform/ui/RWMenu.h"

namespace {

// Records the actions it receives; enables only the actions it is told to.
struct RecordingTarget : RWActionTarget {
    bool performAction(const std::string& action, RWActionSender& sender) override {
        performed.push_back(action);
        auto* item = dynamic_cast<RWMenuItem*>(&sender);
        if (removeSenderOnAction && item && item->menu()) item->menu()->removeItem(*item);
        return action != "unknown:";
    }
    bool validateMenuItem(RWMenuItem& item) override {
        item.setState(item.action() == enabledAction ? RWOnState : RWOffState);
        return item.action() == enabledAction;
    }
    std::vector<std::string> performed;
    std::string enabledAction;
    bool removeSenderOnAction = false;
};

TEST(RWMenuTest, structure__oneMenuPerItemBackReferencesAndLookupsOutOfRange) {
    RWMenu first("first"), top("top");
    RWMenuItemPtr item = first.addItemWithTitle("Delete", "menuDelete:");
    ASSERT_EQ(item->menu(), &first);
    top.addItem(item);  // an item lives in one menu only
    EXPECT_EQ(first.numberOfItems() * 10 + top.indexOfItem(*item), 0);
    EXPECT_EQ(item->menu(), &top);
    auto sub = std::make_shared<RWMenu>("sub");
    RWMenuItemPtr holder = top.addItemWithTitle("Interpolation", "");
    top.setSubmenuForItem(sub, *holder);
    EXPECT_TRUE(sub->supermenu() == &top && holder->hasSubmenu());
    top.removeItemAtIndex(1);
    EXPECT_EQ(sub->supermenu(), nullptr)
        << "a removed item's submenu must not point at the old menu";
    EXPECT_EQ(holder->menu(), nullptr);

    RWMenu menu;
    menu.addItemWithTitle("A", "a:")->setTag(7);
    menu.insertItemAtIndex(std::make_shared<RWMenuItem>("B", "b:"), 99);  // appended
    EXPECT_EQ(menu.itemAtIndex(1)->title() + menu.itemWithTag(7)->title(), "BA");
    EXPECT_FALSE(menu.itemAtIndex(-1) || menu.itemAtIndex(2) || menu.itemWithTag(8));
    EXPECT_EQ(menu.indexOfItemWithTitle("C"), -1);
    menu.removeItemAtIndex(5);  // no-op
    EXPECT_EQ(menu.numberOfItems(), 2);
}

TEST(RWMenuTest, update__enablesThroughTheTargetAndRecursesIntoSubmenus) {
    RecordingTarget target;
    target.enabledAction = "menuReverse:";
    RWMenu menu;
    RWMenuItemPtr reverse = menu.addItemWithTitle("Reverse", "menuReverse:");
    RWMenuItemPtr lock = menu.addItemWithTitle("Lock", "menuLock:");
    RWMenuItemPtr orphan = menu.addItemWithTitle("No target", "menuLock:");
    reverse->setTarget(&target);
    lock->setTarget(&target);
    auto sub = std::make_shared<RWMenu>();
    RWMenuItemPtr inner = sub->addItemWithTitle("Inner", "menuReverse:");
    inner->setTarget(&target);
    inner->setEnabled(false);
    menu.addItemWithTitle("Sub", "")->setSubmenu(sub);

    menu.update();
    // Validation may set the state; an action without a target cannot run; submenus are
    // validated too.
    EXPECT_EQ(reverse->state(), RWOnState);
    EXPECT_EQ((std::array{reverse->isEnabled(), lock->isEnabled(), orphan->isEnabled(),
                          inner->isEnabled()}),
              (std::array{true, false, false, true}));
}

TEST(RWMenuTest, performActionForItemAtIndex__skipsDisabledAndSurvivesSelfRemoval) {
    RecordingTarget target;
    target.removeSenderOnAction = true;
    RWMenu menu;
    RWMenuItemPtr off = menu.addItemWithTitle("Off", "off:");
    off->setTarget(&target);
    off->setEnabled(false);
    menu.addItemWithTitle("On", "on:")->setTarget(&target);

    EXPECT_FALSE(menu.performActionForItemAtIndex(0));
    EXPECT_TRUE(menu.performActionForItemAtIndex(1));
    EXPECT_EQ(target.performed, std::vector<std::string>{"on:"});
    EXPECT_EQ(menu.numberOfItems(), 1) << "the action removed its own item";
    EXPECT_FALSE(menu.performActionForItemAtIndex(3));
}

TEST(RWMenuTest, keyEquivalents__matchCharacterAndModifiersOfEnabledItems) {
    RecordingTarget target;
    RWMenu menu;
    const uint64_t command = RWEventModifierFlagCommand, shift = RWEventModifierFlagShift;
    for (const auto& [key, mask] :
         {std::pair{"d", command}, {"D", command}, {"p", 0}, {"x", command}}) {
        RWMenuItemPtr item = menu.addItemWithTitle("Item", key + std::string(":"), key);
        item->setTarget(&target);
        item->setKeyEquivalentModifierMask(mask);
    }
    menu.itemAtIndex(3)->setEnabled(false);
    // An upper-case letter stands for Shift; the modifiers must match exactly; a disabled item
    // takes no key.
    auto press = [&](const char* key, uint64_t flags) {
        return menu.performKeyEquivalent(RWEvent::keyEvent(RWEventType::KeyDown, key, flags));
    };
    EXPECT_TRUE(press("d", command) && press("D", command | shift) && press("p", 0));
    EXPECT_FALSE(press("p", command) || press("x", command) || press("q", command));
    EXPECT_EQ(target.performed, (std::vector<std::string>{"d:", "D:", "p:"}));
    EXPECT_EQ(RWMenuItem().keyEquivalentModifierMask(), command)
        << "items want Command unless told otherwise";
}

}  // namespace
