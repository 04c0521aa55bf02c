#include <gtest/gtest.h>

#include <utility>

#include "platform/channels/TQChannelTypes.h"

namespace {

CMTime seconds(double s) { return TQTarnTimeForChannelSeconds(s, 600); }

// Dragging a boolean curve moves it as a whole and leaves only off and on, with keyframes
// and without: the saved project keeps booleans, so a value between would not come back.
TEST(ChannelBool, curveDrags__leaveOnlyOffAndOn) {
    const CMTime at = seconds(1.0);
    TQChannelBool keyed("Visible", 1), segment("Visible", 1), expected("Visible", 1);
    for (const auto& [c, first] : {std::pair{&keyed, 0.0}, {&segment, 0.0}, {&expected, 1.0}}) {
        c->setKeyframe(seconds(1.0), first);
        c->setKeyframe(seconds(2.0), 1.0);
    }
    keyed.offsetCurve(&at, 0.7);
    EXPECT_TRUE(keyed == expected);
    segment.setCurveSegmentValue(seconds(1.5), 0.9);
    EXPECT_TRUE(segment == expected) << "the segment from off to on lifted: both on";

    TQChannelBool bare("Visible", 1);
    bare.offsetCurve(&at, 0.3);
    EXPECT_EQ(bare.getInitialValue(), 0.0) << "less than half way stays off";
    bare.offsetCurve(&at, 0.8);
    EXPECT_EQ(bare.getInitialValue(), 1.0);
}

}  // namespace
