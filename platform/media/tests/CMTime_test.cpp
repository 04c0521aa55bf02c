// Media time arithmetic as cases "A op B" (or "f of A"), separated by ";", each answer recorded
// after its case in baselines/arithmetic.txt. Times in a small notation: "7/12" value/timescale, "7/12~" flagged rounded, "5/1@3" of epoch 3, "1/0"
// valid but without a timescale, "+inf", "-inf", "indef", "inval" (the all-zero time), and MAX
// and MIN for the extremes of a 64-bit value. Answers show every field, so a lost or spurious
// flag shows.
#include "platform/media/CMTime.h"

#include <gtest/gtest.h>

#include <charconv>
#include <functional>
#include <map>
#include <sstream>
#include <string>

#include "tests/support/TextBaseline.h"

namespace {

const char* const kNames[] = {"+inf", "-inf", "indef", "inval"};
const CMTime kNamed[] = {kCMTimePositiveInfinity, kCMTimeNegativeInfinity, kCMTimeIndefinite,
                         kCMTimeInvalid};

CMTime timeOf(std::string s) {
    for (const auto& [word, digits] :
         {std::pair{"MAX", "9223372036854775807"}, {"MIN", "-9223372036854775808"}})
        if (const size_t at = s.find(word); at != s.npos)
            s = s.substr(0, at) + digits + s.substr(at + 3);
    for (size_t i = 0; i < 4; ++i)
        if (s == kNames[i]) return kNamed[i];
    CMTime t{0, 0, kCMTimeFlags_Valid, 0};
    const char* p = s.data();
    const char* const end = p + s.size();
    p = std::from_chars(std::from_chars(p, end, t.value).ptr + 1, end, t.timescale).ptr;
    if (p != end && *p == '~') ++p, t.flags |= kCMTimeFlags_HasBeenRounded;
    if (p != end && *p == '@') p = std::from_chars(p + 1, end, t.epoch).ptr;
    EXPECT_EQ(p, end) << "not a time: " << s;
    return t;
}

std::string text(const CMTime& t) {
    for (size_t i = 0; i < 4; ++i)
        if (CMTimeIdentical(t, kNamed[i])) return kNames[i];
    std::ostringstream out;
    out << t.value << "/" << t.timescale;
    if (t.flags != kCMTimeFlags_Valid) out << (t.flags == 3 ? "~" : "?flags");
    if (t.epoch) out << "@" << t.epoch;
    return out.str();
}

std::string text(double v) { return (std::ostringstream() << v).str(); }

// Each case with its answer, "A +- B = S D c" giving the sum S, the difference D and the order
// c of A and B (and -c of B and A) at once; an unknown operation throws.
std::string cases(const std::string& cases) {
    using S = const std::string&;
    const auto T = timeOf;
    const auto x = [](S s) { return std::stod(s); };
    const auto isTime = [](S s) { return s.find('/') != s.npos || s == "+inf" || s == "indef"; };
    const std::map<std::string, std::function<std::string(S, S)>> ops = {
        {"+-",
         [&](S a, S b) {
             const int order = CMTimeCompare(T(a), T(b));
             return text(CMTimeAdd(T(a), T(b))) + " " + text(CMTimeSubtract(T(a), T(b))) + " " +
                    (CMTimeCompare(T(b), T(a)) == -order ? std::to_string(order) : "asymmetric");
         }},
        {"++", [&](S a, S b) { return text(BN_CMTimeSaferAdd(T(a), T(b))); }},
        {"--", [&](S a, S b) { return text(BN_CMTimeSaferSubtract(T(a), T(b))); }},
        {"floor", [&](S a, S b) { return text(BN_CMTimeFloorToSampleDuration(T(a), T(b))); }},
        {"*", [&](S a, S b) { return text(isTime(b) ? T(a) * T(b) : T(a) * x(b)); }},
        {"/", [&](S a, S b) { return text(isTime(b) ? T(a) / T(b) : T(a) / x(b)); }},
        {"*u", [&](S a, S b) { return text(T(a) * unsigned(x(b))); }},
        {"*i", [&](S a, S b) { return text(CMTimeMultiply(T(a), int32_t(x(b)))); }},
        {"->", [&](S a, S b) { return text(CMTimeConvertScale(T(a), CMTimeScale(x(b)))); }},
        {"in", [&](S a, S b) { return text(TQTarnTimeForChannelSeconds(x(a), int(x(b)))); }},
        {"min", [&](S a, S b) { return text(CMTimeMinimum(T(a), T(b))); }},
        {"max", [&](S a, S b) { return text(CMTimeMaximum(T(a), T(b))); }},
        {"abs", [&](S, S b) { return text(CMTimeAbsoluteValue(T(b))); }},
        {"seconds", [&](S, S b) { return text(CMTimeGetSeconds(T(b))); }},
        {"dB", [&](S, S b) { return text(BN_UIAmplitudeToDecibels(x(b))); }},
        {"within", [&](S a, S b) {
             const CMTimeRange range{T(b.substr(0, b.find(','))), T(b.substr(b.find(',') + 1))};
             return text(double(CMTimeRangeContainsTime(range, T(a))));
         }}};
    std::istringstream all(cases);
    std::string record;
    for (std::string line; std::getline(all, line, ';');) {
        std::istringstream in(line);
        std::string a, op, b;
        in >> a >> op >> b;
        const std::string answer = ops.at(op == "of" ? a : op)(op == "of" ? op : a, b);
        record += line.substr(line.find_first_not_of(' ')) + " = " + answer + "\n";
    }
    return record;
}

TEST(CMTimeArithmetic, everyOperation__exactRoundedSaturatedAndNonNumeric) {
    EXPECT_TRUE(tests_support::matchesBaseline(
        "arithmetic",
        cases(
            "1/3 +- 1/4; 1/2 +- 131072/262144; 262144/262144 +- 1001/30000; "
            // Above a timescale of 1e9 the sum is rounded into it, and exact there when it can be.
            "1/262144 +- 1/1000000007; 1/2 +- 6/1200000000; 1/2000000000 +- 1/2000000000; "
            // Too wide for 64 bits: the timescale halves, then the result saturates.
            "MAX/2 +- MAX/2; MAX/3 +- MAX/3; MAX/1 +- -1/1; MIN/1 +- -1/1; 5/1@1 +- 5/1@2; "
            "5/1 +- 5/1@3; 5/1 +- +inf; +inf +- 5/1; -inf +- 5/1; +inf +- +inf; -inf +- -inf; "
            "+inf +- -inf; -inf +- +inf; indef +- 5/1; 5/1 +- indef; indef +- +inf; indef +- -inf; "
            "indef +- indef; inval +- +inf; indef +- inval; inval +- 5/1; 5/1 +- 1/0; 1/0 +- 5/1; "
            "3/4~ +- 1/4; "
            // Of equal times the first is the minimum and the maximum; |INT64_MIN| does not fit.
            "1/2 min 2/4; 2/4 max 1/2; abs of MIN/1; abs of -3/4~; abs of -inf; abs of -5/0; "
            // Scaling keeps the time's timescale, rounds to nearest and saturates.
            "3/10 * 2.5; 8/10~ * 2; 3/10 *u 4; 1/10 *u 3000000000; 1/2 * 3/1; 1/2 * indef; 1/2 * "
            "nan; "
            "+inf * -2; +inf * 0; 0/1 * inf; -1/1 * inf; 4611686018427387903/1 * 3; 5/1 * 1; "
            "MAX/2 *i 2; MAX/1 *i -3; -inf *i 0; indef *i 3; 12/10 / 4; 10/4 / 4; 6/1 / 3/2; 6/1 / "
            "0; "
            "6/1 / 0/1; 6/1 / +inf; 2/1 / nan; 2/1 / inf; +inf / -3; MAX/1 / 0.5; -MAX/1 / 0.5; "
            "inval / 2; 1/3 -> 262144; 1/2 -> 262144; 1/2 -> 0; +inf -> 600; MAX/1 -> 2; "
            // The safer forms count an invalid operand (what a missing host answers) as zero.
            "inval ++ 5/10; 5/10 ++ inval; inval -- 2/1; inval ++ inval; inval -- inval; "
            "+inf ++ inval; 0/1 -- +inf; +inf -- +inf; "
            // Floor to a sample duration, in the duration's timescale.
            "-1/3 floor 1/24; -35/100 floor 1/24; 35/100 floor 1/24; 1/1 floor 1001/30000; "
            "-262144/262144 floor 1001/30000; 3/1 floor 2/4; 7/10 floor 0/1; 7/10 floor -1/24; "
            "7/10 floor +inf; 7/10 floor inval; -inf floor 1/24; inval floor 1/24; "
            // Seconds to a channel time, rounded to nearest, halves away from zero.
            "1.5 in 262144; 0.3333333333333333 in 262144; 9.5367431640625e-06 in 262144; "
            "-9.5367431640625e-06 in 262144; -0 in 262144; 3e13 in 262144; 1e20 in 262144; "
            "-1e20 in 262144; -inf in 262144; nan in 262144; 1 in 0; 1 in -600; "
            // And back, ranges (start inside, end outside) and decibels (by magnitude).
            "seconds of -3/4; seconds of +inf; seconds of -inf; seconds of inval; seconds of "
            "indef; "
            "seconds of 1/0; 1/1 within 1/1,1/2; 1499/1000 within 1/1,1/2; 3/2 within 1/1,1/2; "
            "999/1000 within 1/1,1/2; 0/1 within inval,inval; dB of 0.5; dB of -10; dB of -0"),
        "platform/media/tests/baselines"));
    EXPECT_TRUE(timeOf("1/2") == timeOf("2/4")) << "operator== compares the times, not the fields";
    EXPECT_FALSE(CMTimeIdentical(timeOf("1/2"), timeOf("2/4")));
    EXPECT_TRUE(timeOf("-1/2") < kCMTimeZero);
}

}  // namespace
