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

TEST(Formatters, boolOnlyOneIsOn__emptyLetsNumbersAndStringsThrough) {
    const TQBoolFormatter flag;
    const std::string on = TQLocalizedString("Curve Editor Flag Value On");
    const std::string off = TQLocalizedString("Curve Editor Flag Value Off");
    for (const auto& [value, expected] :
         {std::pair<RWObjectValue, std::string>{1, on}, {1.9, on}, {"1", on}, {2, off}, {{}, off}})
        EXPECT_EQ(flag.stringForObjectValue(value), expected) << value.stringValue();
    RWObjectValue value;
    ASSERT_TRUE(flag.getObjectValue(&value, " " + on + " ", nullptr));
    EXPECT_EQ(value, RWObjectValue(1));
    std::string why;
    EXPECT_FALSE(flag.getObjectValue(&value, "maybe", &why));
    EXPECT_NE(why.find(off), std::string::npos) << "the reason names what to type";

    const TQEmptyFormatter empty;
    EXPECT_EQ(empty.stringForObjectValue(2.5), "2.5");
    EXPECT_EQ(empty.stringForObjectValue("abc"), "abc");
    EXPECT_EQ(empty.stringForObjectValue({}), std::nullopt) << "neither number nor string";
    EXPECT_TRUE(empty.getObjectValue(nullptr, "anything", nullptr));
    ASSERT_TRUE(empty.getObjectValue(&value, "abc", nullptr));
    EXPECT_EQ(value, RWObjectValue(0)) << "text without a number is 0, not refused";
}

TEST(TimecodeStrings, validTimesOnlyWithNegativesAndTheDropFlagPassedOn) {
    const CMTime ntsc = CMTimeMake(1001, 30000);
    EXPECT_EQ(TarnTimeToTimecodeString(CMTimeMake(-3, 2), CMTimeMake(1, 30)), "-00:00:01:15");
    EXPECT_EQ(TarnTimeAndDropToTimecodeString(CMTimeMake(1801800, 30000), ntsc, 1), "00:01:00;02");
    EXPECT_EQ(TarnTimeToTimecodeString(CMTimeMake(1801800, 30000), ntsc), "00:01:00:00");
    const std::pair<CMTime, CMTime> nothing[] = {
        {kCMTimeInvalid, ntsc},
        {CMTimeMake(1, 1), kCMTimeInvalid},
        {CMTime{}, CMTime{}},  // what a missing host delegate gives
        {kCMTimePositiveInfinity, ntsc},
        {CMTimeMake(1, 1), CMTimeMake(0, 30)}};
    for (const auto& [time, duration] : nothing)
        EXPECT_EQ(TarnTimeToTimecodeString(time, duration), std::nullopt) << time.value;
}

TEST(Bundle, theFrameworksResourcesAndAVersionFromTheProject) {
    const TQCurveEditorBundle& bundle = vantaCurveEditorBundle();
    EXPECT_EQ(&bundle, &vantaCurveEditorBundle());
    EXPECT_EQ(bundle.bundleIdentifier(), TQCurveBundleIdentifier);
    EXPECT_EQ(bundle.localizedStringForKey("Curve Editor Curve Set All"), "All");
    EXPECT_EQ(bundle.imageForResource("no-such-image"), nullptr);
    unsigned major = 0, minor = 0, patch = 0;
    ASSERT_EQ(std::sscanf(bundle.version().c_str(), "%u.%u.%u", &major, &minor, &patch), 3);
    EXPECT_EQ(VantaCurveEditorVersionNumber, major * 10000.0 + minor * 100.0 + patch);
}

}  // namespace
