// The time ruler as a user drives it, and the number formatter of the number panels.
#include <gtest/gtest.h>

#include <cmath>
#include <limits>
#include <memory>
#include <string>
#include <vector>

#include "platform/ui/RWDecimalFormatter.h"
#include "platform/ui/RWTimeRuler.h"

namespace {

class Recorder : public RWActionTarget {
public:
    bool performAction(const std::string& action, RWActionSender&) override {
        actions.push_back(action);
        return true;
    }
    std::vector<std::string> actions;
};

double seconds(const CMTime& t) { return CMTimeGetSeconds(t); }

TEST(RWDecimalFormatter, readsWholeFiniteNumbersAndLetPartsOfThemBeTyped) {
    const RWDecimalFormatter numbers;
    // "1e999" is beyond the doubles.
    const struct {
        const char* text;
        std::optional<double> number;
        bool mayStand;  // as a partial text
    } cases[] = {
        {"12", 12.0, true},          {" -0.5 ", -0.5, true},       {"+3", 3.0, true},
        {".25", 0.25, true},         {"1e-3", 0.001, true},        {"-", std::nullopt, true},
        {"1e", std::nullopt, true},  {"", std::nullopt, true},     {"1..2", std::nullopt, false},
        {"1a", std::nullopt, false}, {"1 2", std::nullopt, false}, {"1e999", std::nullopt, true},
        {"nan", std::nullopt, false}};
    for (const auto& c : cases) {
        EXPECT_EQ(RWDecimalFormatter::numberFromString(c.text), c.number) << c.text;
        RWObjectValue value("kept");
        EXPECT_EQ(numbers.getObjectValue(&value, c.text, nullptr), c.number.has_value()) << c.text;
        // A refusal leaves the value.
        EXPECT_EQ(value, c.number ? RWObjectValue(*c.number) : RWObjectValue("kept")) << c.text;
        EXPECT_EQ(numbers.isPartialStringValid(c.text, nullptr, nullptr), c.mayStand) << c.text;
    }
    EXPECT_EQ(numbers.stringForObjectValue(2.5), "2.5");
    EXPECT_EQ(numbers.stringForObjectValue("-"), "-") << "typed text shows as typed";
    EXPECT_EQ(numbers.stringForObjectValue(std::numeric_limits<double>::infinity()), std::nullopt);
}

class RWTimeRulerTest : public ::testing::Test {
protected:
    void SetUp() override {
        ruler->setTarget(&target);
        ruler->setAction("moved:");
        ruler->setDisplayRange(CMTimeRangeMake(CMTimeMake(-1, 1), CMTimeMake(6, 1)));
        ruler->setFrameDuration(CMTimeMake(1, 30));
    }
    Recorder target;
    std::shared_ptr<RWTimeRuler> ruler = std::make_shared<RWTimeRuler>();
};

TEST_F(RWTimeRulerTest, labelTimes__multiplesOfTheStepThinnedToFit) {
    auto labels = [&](double width, double spacing) {
        std::vector<double> out;
        for (const CMTime& t : ruler->labelTimes(width, spacing)) out.push_back(seconds(t));
        return out;
    };
    EXPECT_EQ(labels(600.0, 50.0), (std::vector<double>{-1, 0, 1, 2, 3, 4, 5}));
    // 100 points a second: labels 120 apart need every second second.
    EXPECT_EQ(labels(600.0, 120.0), (std::vector<double>{0, 2, 4}));
    EXPECT_EQ(labels(600.0, 250.0), (std::vector<double>{0, 5})) << "then five";
    ruler->setLabelStep(kCMTimeZero);
    EXPECT_TRUE(labels(600.0, 50.0).empty()) << "a zero step gives no labels";
    ruler->setLabelStep(CMTimeMake(1, 1000000));
    EXPECT_LE(labels(600.0, 0.0).size(), 601u) << "a tiny step is thinned to a label a point";
}

TEST_F(RWTimeRulerTest, userGestures__putThePlayheadOnAFrameInsideTheRange) {
    ruler->userPress(301.0, 600.0);  // 2.01 s: in frame 60
    EXPECT_TRUE(ruler->isTracking());
    EXPECT_EQ(ruler->currentTime(), CMTimeMake(2, 1));
    ruler->userDrag(301.5, 600.0);  // the same frame: no action
    ruler->userDrag(-40.0, 600.0);
    EXPECT_EQ(ruler->currentTime(), CMTimeMake(-1, 1)) << "not before the range";
    ruler->userDrag(900.0, 600.0);
    EXPECT_EQ(ruler->currentTime(), CMTimeMake(149, 30)) << "the last frame of the range";
    ruler->userRelease();
    EXPECT_FALSE(ruler->isTracking());
    ruler->userDrag(100.0, 600.0);
    EXPECT_EQ(target.actions.size(), 3u) << "press and two moves; nothing after the release";

    ruler->setEnabled(false);
    ruler->userPress(100.0, 600.0);
    EXPECT_EQ(target.actions.size(), 3u);
}

}  // namespace
