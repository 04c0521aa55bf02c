// The framework's formatters, its timecode strings, its bundle and its version.
#include <gtest/gtest.h>

#include <cstdio>
#include <string>

#include "src/panels/TQCurveBundle.h"
#include "src/panels/TQFormatters.h"
#include "src/panels/TQTimecodeStrings.h"
#include "src/panels/TQVersion.h"
#include "src/resources/TQStrings.h"

namespace {

TEST(Formatters, boolOnlyOneIsOnEmptyLetsNumbersAndStringsThroughTimecodeOfValidTimes) {
    const TQBoolFormatter flag;
    const std::string on = TQLocalizedString("Curve Editor Flag Value On");
    const std::string off = TQLocalizedString("Curve Editor Flag Value Off");
    for (const auto& [value, expected] :
         {std::pair<RWObjectValue, std::string>{1, on}, {1.9, on}, {"1", on}, {2, off}, {{}, off}})
        EXPECT_EQ(flag.stringForObjectValue(value), expected) << value.stringValue();
    RWObjectValue value, zero;
    EXPECT_TRUE(flag.getObjectValue(&value, " " + on + "\t", nullptr) && value == RWObjectValue(1));
    EXPECT_TRUE(flag.getObjectValue(&zero, off, nullptr) && zero == RWObjectValue(0));
    std::string why;
    EXPECT_FALSE(flag.getObjectValue(&value, "maybe", &why));
    EXPECT_EQ(why, "Type " + on + " or " + off + ".") << "the reason names what to type";

    const TQEmptyFormatter empty;
    EXPECT_EQ(empty.stringForObjectValue(2.5), "2.5");
    EXPECT_EQ(empty.stringForObjectValue({}), std::nullopt) << "neither number nor string";
    EXPECT_TRUE(empty.getObjectValue(&value, "abc", nullptr) && value == RWObjectValue(0))
        << "text without a number is 0, not refused";
    EXPECT_TRUE(empty.getObjectValue(&value, "-4.5 s", nullptr) && value == RWObjectValue(-4.5));

    // Timecode text of valid times only, negatives allowed, the drop flag passed on.
    const CMTime ntsc = CMTimeMake(1001, 30000);
    EXPECT_EQ(TarnTimeToTimecodeString(CMTimeMake(-3, 2), CMTimeMake(1, 30)), "-00:00:01:15");
    EXPECT_EQ(TarnTimeAndDropToTimecodeString(CMTimeMake(1801800, 30000), ntsc, 1), "00:01:00;02");
    EXPECT_EQ(TarnTimeToTimecodeString(CMTimeMake(1801800, 30000), ntsc), "00:01:00:00");
    EXPECT_FALSE(TarnTimeToTimecodeString(CMTime{}, ntsc) ||
                 TarnTimeToTimecodeString(ntsc, CMTime{}) ||
                 TarnTimeToTimecodeString(kCMTimePositiveInfinity, ntsc))
        << "what a missing host gives";
}

TEST(Bundle, theFrameworksResourcesAndAVersionFromTheProject) {
    const TQCurveEditorBundle& bundle = vantaCurveEditorBundle();
    EXPECT_EQ(bundle.localizedStringForKey("Curve Editor Curve Set All"), "All");
    EXPECT_EQ(bundle.localizedStringKeys(), TQLocalizedStringKeys());
    EXPECT_EQ(bundle.imageForResource("K_General_Add", 2.0)->scale(), 2.0);
    unsigned major = 0, minor = 0, patch = 0;
    ASSERT_EQ(std::sscanf(bundle.version().c_str(), "%u.%u.%u", &major, &minor, &patch), 3);
    EXPECT_EQ(VantaCurveEditorVersionNumber, major * 10000.0 + minor * 100.0 + patch);
}

}  // namespace
