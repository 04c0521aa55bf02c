#include "platform/ui/RWDecimalFormatter.h"

#include <charconv>
#include <cmath>

namespace {

bool isDigit(char c) { return c >= '0' && c <= '9'; }
bool isBlank(char c) { return c == ' ' || c == '\t'; }

// How far a text goes as a number: where the number ends, whether it is complete (it has a
// digit, and an exponent that has begun has its digits).
struct Scan {
    size_t numberStart = 0;
    size_t numberEnd = 0;
    size_t textEnd = 0;  // after the trailing blanks
    bool complete = false;
};

Scan scan(std::string_view text) {
    Scan s;
    size_t i = 0;
    while (i < text.size() && isBlank(text[i])) ++i;
    s.numberStart = i;
    if (i < text.size() && (text[i] == '+' || text[i] == '-')) ++i;
    size_t digits = 0;
    auto digitRun = [&] {
        const size_t from = i;
        while (i < text.size() && isDigit(text[i])) ++i;
        digits += i - from;
    };
    digitRun();
    if (i < text.size() && text[i] == '.') {
        ++i;
        digitRun();
    }
    bool exponentComplete = true;
    if (digits > 0 && i < text.size() && (text[i] == 'e' || text[i] == 'E')) {
        ++i;
        if (i < text.size() && (text[i] == '+' || text[i] == '-')) ++i;
        exponentComplete = i < text.size() && isDigit(text[i]);
        while (i < text.size() && isDigit(text[i])) ++i;
    }
    s.numberEnd = i;
    while (i < text.size() && isBlank(text[i])) ++i;
    s.textEnd = i;
    s.complete = digits > 0 && exponentComplete;
    return s;
}

}  // namespace

std::optional<double> RWDecimalFormatter::numberFromString(std::string_view text) {
    const Scan s = scan(text);
    if (!s.complete || s.textEnd != text.size()) return std::nullopt;
    // from_chars takes no leading '+'.
    size_t from = s.numberStart;
    if (text[from] == '+') ++from;
    double value = 0.0;
    const auto [end, error] = std::from_chars(text.data() + from, text.data() + s.numberEnd, value);
    if (error != std::errc() || end != text.data() + s.numberEnd || !std::isfinite(value))
        return std::nullopt;
    return value;
}

std::optional<std::string> RWDecimalFormatter::stringForObjectValue(
    const RWObjectValue& value) const {
    // Text that was typed and not (yet) read as a number shows as it was typed.
    if (const std::string* text = value.string()) return *text;
    const std::optional<double> number = value.number();
    if (!number || !std::isfinite(*number)) return std::nullopt;
    return RWObjectValue::numberText(*number);
}

bool RWDecimalFormatter::getObjectValue(RWObjectValue* value, const std::string& string,
                                        std::string* errorDescription) const {
    const std::optional<double> number = numberFromString(string);
    if (!number) {
        if (errorDescription) *errorDescription = "Not a number";
        return false;
    }
    if (value) *value = RWObjectValue(*number);
    return true;
}

bool RWDecimalFormatter::isPartialStringValid(const std::string& partialString, std::string*,
                                              std::string* errorDescription) const {
    // Everything the scan passed over, and nothing after it.
    if (scan(partialString).textEnd == partialString.size()) return true;
    if (errorDescription) *errorDescription = "Not a number";
    return false;
}
