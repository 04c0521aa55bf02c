#include <gtest/gtest.h>

#include <string>
#include <tuple>
#include <vector>

#include "platform/ui/RWServices.h"
#include "platform/ui/testing/RWTestDoubles.h"

namespace {

TEST(RWUserDefaultsTest, readers__convertBetweenNumbersBooleansAndTextsOverRegisteredDefaults) {
    RWMemoryUserDefaults defaults;
    defaults.setObject(std::string("YES"), "text-yes");
    defaults.setObject(std::string("2.5"), "text-number");
    defaults.setObject(std::string("abc"), "text-word");
    defaults.setDouble(3.75, "double");
    defaults.setBool(true, "bool");
    // Doubles truncate to integers, a text that is no number reads as false, and numbers are
    // not formatted as texts.
    EXPECT_EQ(std::tuple(defaults.boolForKey("text-yes"), defaults.doubleForKey("text-number"),
                         defaults.integerForKey("double"), defaults.integerForKey("bool"),
                         defaults.boolForKey("text-word"), defaults.stringForKey("double"),
                         defaults.boolForKey("missing")),
              std::tuple(true, 2.5, 3, 1, false, std::string(), false));
    // Registered defaults stand below stored values and come back when those are removed.
    defaults.registerDefaults({{"TQPreferenceManager::flag", RWDefaultsValue{true}}});
    EXPECT_TRUE(defaults.boolForKey("TQPreferenceManager::flag"));
    defaults.setBool(false, "TQPreferenceManager::flag");
    EXPECT_FALSE(defaults.boolForKey("TQPreferenceManager::flag"));
    defaults.removeObjectForKey("TQPreferenceManager::flag");
    EXPECT_TRUE(defaults.boolForKey("TQPreferenceManager::flag"));
}

TEST(RWPasteboardTest, clearContents__dropsEveryTypeAndCountsChanges) {
    RWMemoryPasteboard board;
    const int64_t before = board.changeCount();
    board.setString("a", "public.text");
    board.setString("b", "TQCurveEditorPrivateDrag");
    board.setString("c", "public.text");  // replaces, keeps the order of first writing
    EXPECT_EQ(board.types(), (std::vector<std::string>{"public.text", "TQCurveEditorPrivateDrag"}));
    EXPECT_EQ(board.stringForType("public.text"), "c");
    EXPECT_EQ(board.availableTypeFromArray({"x", "TQCurveEditorPrivateDrag"}),
              "TQCurveEditorPrivateDrag");
    EXPECT_EQ(board.clearContents(), before + 1);
    EXPECT_TRUE(board.types().empty());
    EXPECT_FALSE(board.dataForType("public.text").has_value());
}

TEST(RWServicesTest, queuedTimer__runsBlocksInDueOrderWhenTheirTimeHasCome) {
    RWManualClock clock;
    RWQueuedTimer timer(clock);
    std::vector<int> ran;
    timer.dispatchAfter(33333333, [&] { ran.push_back(2); });
    timer.dispatchAfter(10000000, [&] { ran.push_back(1); });
    timer.dispatchAfter(33333333, [&] {
        ran.push_back(3);
        timer.dispatchAfter(0, [&] { ran.push_back(4); });  // due at once: runs in the same drain
        timer.dispatchAfter(1000000000, [&] { ran.push_back(5); });
    });
    clock.advance(0.005);
    EXPECT_EQ(timer.runDueBlocks(), 0u) << "nothing is due after 5 ms";
    clock.advance(0.030);
    EXPECT_EQ(timer.runDueBlocks(), 4u);
    EXPECT_EQ(ran, (std::vector<int>{1, 2, 3, 4})) << "equal due times run in dispatch order";
    EXPECT_EQ(timer.pendingCount(), 1u);
}

TEST(RWServicesTest, install__replacesOnlyTheGivenServicesUntilReset) {
    RWManualClock clock(42.0);
    RWScriptedModal modal;
    RWInstallServices({&clock, nullptr, &modal, nullptr, nullptr});
    EXPECT_DOUBLE_EQ(RWApplicationServices().clock->now(), 42.0);
    EXPECT_EQ(RWApplicationServices().modal, &modal);
    EXPECT_EQ(RWApplicationServices().timer, &RWHeadlessTimer())
        << "unset services keep the headless ones";
    RWResetServices();
    EXPECT_NE(RWApplicationServices().clock, &clock);
    RWWindow window;
    EXPECT_EQ(RWApplicationServices().modal->runModalForWindow(window), RWModalResponseAbort)
        << "headless modal runs abort at once";
}

}  // namespace
