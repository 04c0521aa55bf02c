// A few short random sessions in the suite; tools/soak runs long ones.
#include <gtest/gtest.h>

#include "tests/soak/TQSoakSession.h"

TEST(Soak, shortSessions__holdTogetherAndUnwindExactly) {
    for (uint32_t seed : {1u, 2u, 3u}) {
        TQSoakSession session(seed);
        for (int i = 0; i < 150; ++i)
            ASSERT_EQ(session.step(), "") << "seed " << seed << ", step " << i + 1;
        EXPECT_EQ(session.unwind(), "") << "seed " << seed;
        EXPECT_GT(session.keypointPresses(), 0u) << "the session should reach the keypoints";
    }
}
