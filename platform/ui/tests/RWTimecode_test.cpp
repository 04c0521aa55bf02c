// Timecode text around the minute marks, in drop frame and not, at the common rates; reading
// text back; and the object value conversions the formatters rely on.
#include <gtest/gtest.h>

#include <climits>
#include <cmath>
#include <optional>

#include "platform/ui/RWExtendedTimecode.h"
#include "platform/ui/RWObjectValue.h"
#include "platform/ui/RWTimecodeFormatter.h"

namespace {

const CMTime k2997 = CMTimeMake(1001, 30000);
const CMTime k5994 = CMTimeMake(1001, 60000);
const CMTime k23976 = CMTimeMake(1001, 24000);
const CMTime k30 = CMTimeMake(1, 30);
const CMTime k25 = CMTimeMake(1, 25);
const CMTime k24 = CMTimeMake(1, 24);

// The start of a frame, as a time of the frame duration's timescale.
CMTime frameStart(int64_t frame, const CMTime& duration) {
    return CMTime{frame * duration.value, duration.timescale, kCMTimeFlags_Valid, 0};
}

std::string text(const CMTime& time, const CMTime& duration, bool drop) {
    RWTimecodeFormatter formatter;
    formatter.setAllowsNegative(true);
    return formatter.stringForTimecode(RWExtendedTimecode(time, duration, drop)).value_or("nil");
}

TEST(Timecode, text__aroundTheMinuteMarksAtEveryRate) {
    // Around the minute marks: 29.97 drop frame skips ;00 and ;01 but in every tenth minute;
    // 59.94 skips four numbers; other rates never drop; hours do not wrap (frame 2160000 at 24
    // is hour 25); negatives count down.
    const CMTime k120 = CMTimeMake(1, 120);
    const struct {
        int64_t frame;
        CMTime duration;
        bool drop;
        const char* expected;
    } frames[] = {{1799, k2997, true, "00:00:59;29"},   {1800, k2997, true, "00:01:00;02"},
                  {3598, k2997, true, "00:02:00;02"},   {17981, k2997, true, "00:09:59;29"},
                  {17982, k2997, true, "00:10:00;00"},  {19782, k2997, true, "00:11:00;02"},
                  {107892, k2997, true, "01:00:00;00"}, {1800, k2997, false, "00:01:00:00"},
                  {3599, k5994, true, "00:00:59;59"},   {3600, k5994, true, "00:01:00;04"},
                  {49, k25, true, "00:00:01:24"},       {90000, k25, false, "01:00:00:00"},
                  {2160000, k24, false, "25:00:00:00"}, {1440, k23976, true, "00:01:00:00"},
                  {119, k120, false, "00:00:00:119"},   {-1800, k2997, true, "-00:01:00;02"}};
    for (const auto& c : frames)
        EXPECT_EQ(text(frameStart(c.frame, c.duration), c.duration, c.drop), c.expected) << c.frame;
    // Times between frame starts, in other timescales; no valid time or frame duration.
    EXPECT_EQ(text(CMTimeMake(6006, 100), k2997, true), "00:01:00;02");
    EXPECT_EQ(text(CMTimeMake(1801800 + 500, 30000), k2997, true), "00:01:00;02");
    EXPECT_EQ(text(CMTimeMake(18, 1), CMTimeMake(100, 2997), true), "00:00:17;29");
    EXPECT_EQ(text(CMTimeMake(-1, 60), k30, false), "-00:00:00:01");
    EXPECT_EQ(text(kCMTimeInvalid, k30, false), "nil");
    EXPECT_EQ(text(CMTimeMake(1, 1), CMTimeMake(0, 30), false), "nil");
}

TEST(Timecode, readBack__everyFrameOfElevenMinutesRoundTrips) {
    RWTimecodeFormatter formatter;
    formatter.setFrameDuration(k2997);
    formatter.setDropFrame(true);
    std::string previous;
    for (int64_t frame = 0; frame <= 19800; ++frame) {
        const std::string shown =
            *formatter.stringForTimecode(RWExtendedTimecode::withFrameNumber(frame, k2997, true));
        ASSERT_GT(shown, previous) << "timecodes must increase, at frame " << frame;
        previous = shown;
        const auto read = formatter.timecodeForString(shown, nullptr);
        ASSERT_TRUE(read.has_value()) << shown;
        ASSERT_EQ(read->frameNumber(), frame) << shown;
    }
}

TEST(Timecode, formatter__readsLenientlyRefusesWithAReasonAndConvertsSeconds) {
    RWTimecodeFormatter formatter;  // 1/30 s, non-drop, no negatives
    const std::pair<const char*, std::optional<int64_t>> cases[] = {
        {" 1:00 ", 30},    {"12", 12},     {"1.02.03.04", 111694},
        {"0:0:0:30", {}},  {"0:60:0", {}}, {"1::2", {}},
        {"1:2:3:4:5", {}}, {"-1:00", {}},  {"99999999999", {}},
        {"ten", {}},       {"", {}}};
    for (const auto& [typed, frame] : cases) {
        std::string why;
        const auto read = formatter.timecodeForString(typed, &why);
        EXPECT_EQ(read ? std::optional(read->frameNumber()) : std::nullopt, frame) << typed;
        EXPECT_EQ(why.empty(), frame.has_value()) << typed << ": a refusal says why";
    }
    formatter.setFrameDuration(k2997);
    formatter.setDropFrame(true);
    EXPECT_FALSE(formatter.timecodeForString("00:01:00;01", nullptr)) << "a skipped number";
    RWObjectValue value;
    EXPECT_EQ(formatter.stringForObjectValue(60.06), "00:01:00;02");
    ASSERT_TRUE(formatter.getObjectValue(&value, "00:01:00;02", nullptr));
    EXPECT_NEAR(value.doubleValue(), 60.06, 1e-9);
    EXPECT_FALSE(formatter.getObjectValue(&value, "junk", nullptr));
    EXPECT_NEAR(value.doubleValue(), 60.06, 1e-9) << "a refused text changes nothing";
    EXPECT_EQ(formatter.stringForObjectValue("00:00:01;00"), std::nullopt) << "only numbers";
    EXPECT_EQ(formatter.stringForObjectValue(-1.0), std::nullopt) << "negatives not allowed";
    EXPECT_FALSE(formatter.isPartialStringValid("-", nullptr, nullptr));
    formatter.setAllowsNegative(true);
    EXPECT_EQ(formatter.stringForObjectValue(-1.0), "-00:00:01;00");
    EXPECT_TRUE(formatter.isPartialStringValid("-01:0", nullptr, nullptr));
    EXPECT_FALSE(formatter.isPartialStringValid("01-", nullptr, nullptr));
}

TEST(ObjectValue, conversions__ofNothingNumbersAndStrings) {
    const struct {
        RWObjectValue value;
        double asDouble;
        int32_t asInt;
        bool asBool;
        const char* asString;
    } cases[] = {{{}, 0.0, 0, false, ""},
                 {-2.7, -2.7, -2, true, "-2.7"},
                 {1e20, 1e20, INT32_MAX, true, "1e+20"},
                 {"  12.5px", 12.5, 12, true, "  12.5px"},
                 {"-3e2x", -300.0, -300, true, "-3e2x"},
                 {"+.5", 0.5, 0, true, "+.5"},
                 {"Yes", 0.0, 0, true, "Yes"},
                 {"-99999999999", -99999999999.0, INT32_MIN, true, "-99999999999"}};
    for (const auto& c : cases) {
        EXPECT_EQ(c.value.doubleValue(), c.asDouble) << c.asString;
        EXPECT_EQ(c.value.intValue(), c.asInt) << c.asString;
        EXPECT_EQ(c.value.boolValue(), c.asBool) << c.asString;
        EXPECT_EQ(c.value.stringValue(), c.asString);
    }
    EXPECT_EQ(RWObjectValue(std::nan("")).integerValue(), 0);
    EXPECT_NE(RWObjectValue(2), RWObjectValue("2")) << "a number never equals a string";
    EXPECT_EQ(RWObjectValue(2), RWObjectValue(2.0));
}

}  // namespace
