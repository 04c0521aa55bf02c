#include "platform/media/CMTime.h"

#include <gtest/gtest.h>

TEST(CMTime, add__mixedTimescalesExact) {
    const CMTime a = CMTimeMake(1, 3), b = CMTimeMake(1, 4);
    const CMTime sum = CMTimeAdd(a, b);
    EXPECT_EQ(CMTimeCompare(sum, CMTimeMake(7, 12)), 0);
    EXPECT_EQ(sum.flags & kCMTimeFlags_HasBeenRounded, 0u);
}
