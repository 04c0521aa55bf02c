// Delivery of words to receivers, re-entrant posts and registration changes during delivery.
#include <gtest/gtest.h>

#include <functional>
#include <vector>

#include "host/TQHostNotificationCenter.h"

namespace {

// Logs every word with its own tag, and runs an action on the first word it hears.
struct Receiver : TQNotificationReceiver {
    Receiver(std::vector<std::pair<char, TQNotificationWord>>& log, char tag)
        : log(log), tag(tag) {}
    void notify(TQNotificationWord word) override {
        log.emplace_back(tag, word);
        if (onFirst) {
            auto action = std::move(onFirst);
            onFirst = nullptr;
            action(word);
        }
    }
    std::vector<std::pair<char, TQNotificationWord>>& log;
    char tag;
    std::function<void(TQNotificationWord)> onFirst;
};

class NotificationCenter : public ::testing::Test {
protected:
    using Log = std::vector<std::pair<char, TQNotificationWord>>;
    TQHostNotificationCenter center;
    Log log;
    Receiver a{log, 'a'}, b{log, 'b'}, c{log, 'c'};
};

TEST_F(NotificationCenter, post__reachesEveryReceiverInRegistrationOrder) {
    center.addReceiver(&a);
    center.addReceiver(&b);
    center.addReceiver(&a);  // twice: still one registration
    center.addReceiver(nullptr);
    center.post(kTQNotifyChannelsChanged);
    EXPECT_EQ(log, (Log{{'a', 0x8}, {'b', 0x8}}));
    EXPECT_EQ(center.receiverCount(), 2u);
}

TEST_F(NotificationCenter, reentrantPost__waitsUntilTheCurrentWordReachedEveryone) {
    center.addReceiver(&a);
    center.addReceiver(&b);
    a.onFirst = [&](TQNotificationWord) {
        center.post(kTQNotifyCurveSetContentChanged);
        EXPECT_EQ(log.size(), 1u) << "a nested post must not be delivered inside notify";
    };
    center.post(kTQNotifyChannelsChanging);
    EXPECT_EQ(log, (Log{{'a', 0x4}, {'b', 0x4}, {'a', 0x20000}, {'b', 0x20000}}));
    EXPECT_FALSE(center.isDelivering());
    EXPECT_EQ(center.deliveredWordCount(), 2u);
}

TEST_F(NotificationCenter, unregisterDuringDelivery__isSafeAndTakesEffectAtOnce) {
    center.addReceiver(&a);
    center.addReceiver(&b);
    center.addReceiver(&c);
    // a removes b, which has not heard the word yet, and itself.
    a.onFirst = [&](TQNotificationWord) {
        center.removeReceiver(&b);
        center.removeReceiver(&a);
    };
    center.post(0x8);
    EXPECT_EQ(log, (Log{{'a', 0x8}, {'c', 0x8}}));
    EXPECT_EQ(center.receiverCount(), 1u);
    // c registers b again from inside notify: b hears the next word, not this one.
    log.clear();
    c.onFirst = [&](TQNotificationWord) {
        center.addReceiver(&b);
        center.post(0x2);
    };
    center.post(0x10);
    EXPECT_EQ(log, (Log{{'c', 0x10}, {'c', 0x2}, {'b', 0x2}}));
    center.removeReceiver(&a);  // unknown now: ignored
    EXPECT_TRUE(center.hasReceiver(&b));
}

}  // namespace
