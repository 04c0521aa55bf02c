#include "platform/ui/RWTimecodeFormatter.h"

#include <cmath>
#include <limits>
#include <vector>

namespace {

// Decimal seconds of a frame's start may fall a hair short of it; this share of a frame
// absorbs that without moving a time that lies inside a frame into the next one.
constexpr double kFrameSlack = 1e-6;
constexpr size_t kMaxFields = 4;

bool isSeparator(char c) { return c == ':' || c == ';' || c == '.'; }
bool isBlank(char c) { return c == ' ' || c == '\t'; }
bool isDigit(char c) { return c >= '0' && c <= '9'; }

std::string padded(uint64_t number, size_t width) {
    std::string digits = std::to_string(number);
    if (digits.size() < width) digits.insert(0, width - digits.size(), '0');
    return digits;
}

size_t frameDigits(uint32_t framesPerSecond) {
    return std::max<size_t>(2,
                            std::to_string(framesPerSecond > 0 ? framesPerSecond - 1 : 0).size());
}

std::string_view trimmed(std::string_view text) {
    while (!text.empty() && isBlank(text.front())) text.remove_prefix(1);
    while (!text.empty() && isBlank(text.back())) text.remove_suffix(1);
    return text;
}

// Why a text is refused.
constexpr const char* kNoNegative = "A negative timecode is not allowed here.";
constexpr const char* kShape = "A timecode is up to four numbers split by \":\".";
constexpr const char* kCharacters = "A timecode holds only digits and \":\".";
constexpr const char* kNoSuchFrame = "No frame has that timecode at this frame rate.";

bool fail(std::string* errorDescription, const char* why) {
    if (errorDescription) *errorDescription = why;
    return false;
}

}  // namespace

std::optional<std::string> RWTimecodeFormatter::stringForTimecode(
    const RWExtendedTimecode& timecode) const {
    if (!timecode.isValid() || (timecode.isNegative() && !_allowsNegative)) return std::nullopt;
    std::string text = timecode.isNegative() ? "-" : "";
    text += padded(timecode.hours(), 2) + ":" + padded(timecode.minutes(), 2) + ":" +
            padded(timecode.seconds(), 2) + (timecode.isDropFrame() ? ";" : ":") +
            padded(timecode.frames(), frameDigits(timecode.framesPerSecond()));
    return text;
}

std::optional<RWExtendedTimecode> RWTimecodeFormatter::timecodeForString(
    const std::string& string, std::string* errorDescription) const {
    const auto refuse = [errorDescription](const char* why) {
        fail(errorDescription, why);
        return std::optional<RWExtendedTimecode>();
    };
    std::string_view text = trimmed(string);
    if (text.empty()) return refuse("Type a timecode.");
    const bool negative = text.front() == '-';
    if (negative) {
        if (!_allowsNegative) return refuse(kNoNegative);
        text.remove_prefix(1);
    }
    std::vector<uint32_t> fields(1, 0);
    bool digitInField = false;
    for (const char c : text) {
        if (isSeparator(c)) {
            if (!digitInField || fields.size() == kMaxFields) return refuse(kShape);
            fields.push_back(0);
            digitInField = false;
        } else if (isDigit(c)) {
            const uint64_t next = uint64_t(fields.back()) * 10 + uint64_t(c - '0');
            if (next > std::numeric_limits<uint32_t>::max()) return refuse(kNoSuchFrame);
            fields.back() = static_cast<uint32_t>(next);
            digitInField = true;
        } else {
            return refuse(kCharacters);
        }
    }
    if (!digitInField) return refuse(kShape);
    // Right-aligned: the last field is frames, then seconds, minutes, hours.
    uint32_t hms[kMaxFields] = {0, 0, 0, 0};
    std::copy(fields.begin(), fields.end(), hms + (kMaxFields - fields.size()));
    std::optional<RWExtendedTimecode> timecode = RWExtendedTimecode::withFields(
        negative, hms[0], hms[1], hms[2], hms[3], _frameDuration, _dropFrame);
    return timecode ? timecode : refuse(kNoSuchFrame);
}

std::optional<std::string> RWTimecodeFormatter::stringForObjectValue(
    const RWObjectValue& value) const {
    const std::optional<double> seconds = value.number();
    if (!seconds || !std::isfinite(*seconds)) return std::nullopt;
    const double frameSeconds = CMTimeGetSeconds(_frameDuration);
    if (!(frameSeconds > 0.0)) return std::nullopt;
    const double frame = std::floor(*seconds / frameSeconds + kFrameSlack);
    if (std::fabs(frame) >= 9.2e18) return std::nullopt;  // beyond 64-bit frame numbers
    return stringForTimecode(RWExtendedTimecode::withFrameNumber(static_cast<int64_t>(frame),
                                                                 _frameDuration, _dropFrame));
}

bool RWTimecodeFormatter::getObjectValue(RWObjectValue* value, const std::string& string,
                                         std::string* errorDescription) const {
    const std::optional<RWExtendedTimecode> timecode = timecodeForString(string, errorDescription);
    if (!timecode) return false;
    if (value) *value = CMTimeGetSeconds(timecode->time());
    return true;
}

bool RWTimecodeFormatter::isPartialStringValid(const std::string& partialString,
                                               std::string* newString,
                                               std::string* errorDescription) const {
    (void)newString;
    bool seenOther = false;
    for (const char c : partialString) {
        if (c == '-' && !seenOther) {
            if (!_allowsNegative) return fail(errorDescription, kNoNegative);
            seenOther = true;
            continue;
        }
        if (!isDigit(c) && !isSeparator(c) && !isBlank(c))
            return fail(errorDescription, kCharacters);
        if (!isBlank(c)) seenOther = true;
    }
    return true;
}
