#include "platform/ui/RWObjectValue.h"

#include <charconv>
#include <cmath>
#include <limits>

namespace {

bool isBlank(char c) { return c == ' ' || c == '\t' || c == '\n' || c == '\r' || c == '\f'; }
bool isDigit(char c) { return c >= '0' && c <= '9'; }

size_t skipBlanks(std::string_view text) {
    size_t i = 0;
    while (i < text.size() && isBlank(text[i])) ++i;
    return i;
}

template <class Int>
Int saturatingTruncation(double value) {
    if (std::isnan(value)) return 0;
    constexpr double lo = static_cast<double>(std::numeric_limits<Int>::min());
    // The largest power of two above the maximum: anything at or past it saturates.
    constexpr double hi = -lo;
    if (value <= lo) return std::numeric_limits<Int>::min();
    if (value >= hi) return std::numeric_limits<Int>::max();
    return static_cast<Int>(value);  // truncates toward zero
}

}  // namespace

std::optional<double> RWObjectValue::number() const {
    if (const double* n = std::get_if<double>(&_value)) return *n;
    return std::nullopt;
}

std::optional<double> RWObjectValue::leadingNumber(std::string_view text) {
    size_t i = skipBlanks(text);
    const size_t start = i;
    if (i < text.size() && (text[i] == '+' || text[i] == '-')) ++i;
    const size_t digitsStart = i;
    while (i < text.size() && isDigit(text[i])) ++i;
    size_t digits = i - digitsStart;
    if (i < text.size() && text[i] == '.') {
        ++i;
        const size_t fraction = i;
        while (i < text.size() && isDigit(text[i])) ++i;
        digits += i - fraction;
    }
    if (digits == 0) return std::nullopt;
    // An exponent counts only when digits follow it.
    if (i < text.size() && (text[i] == 'e' || text[i] == 'E')) {
        size_t j = i + 1;
        if (j < text.size() && (text[j] == '+' || text[j] == '-')) ++j;
        if (j < text.size() && isDigit(text[j])) {
            while (j < text.size() && isDigit(text[j])) ++j;
            i = j;
        }
    }
    // from_chars takes no leading '+'.
    const size_t from = text[start] == '+' ? start + 1 : start;
    double value = 0.0;
    const auto [end, error] = std::from_chars(text.data() + from, text.data() + i, value);
    if (error == std::errc::result_out_of_range)  // beyond the doubles: the signed infinity
        return text[start] == '-' ? -HUGE_VAL : HUGE_VAL;
    if (error != std::errc() || end != text.data() + i) return std::nullopt;
    return value;
}

std::string RWObjectValue::numberText(double number) {
    if (std::isnan(number)) return "nan";
    if (std::isinf(number)) return number < 0 ? "-inf" : "inf";
    if (number == std::trunc(number) && std::fabs(number) < 1e15)
        return std::to_string(static_cast<int64_t>(number));
    char buffer[32];
    const auto [end, error] = std::to_chars(buffer, buffer + sizeof buffer, number);
    (void)error;  // 32 characters hold any double's shortest form
    return std::string(buffer, end);
}

double RWObjectValue::doubleValue() const {
    if (const double* n = std::get_if<double>(&_value)) return *n;
    if (const std::string* s = string()) return leadingNumber(*s).value_or(0.0);
    return 0.0;
}

int32_t RWObjectValue::intValue() const { return saturatingTruncation<int32_t>(doubleValue()); }

int64_t RWObjectValue::integerValue() const { return saturatingTruncation<int64_t>(doubleValue()); }

bool RWObjectValue::boolValue() const {
    if (const std::string* s = string()) {
        const size_t i = skipBlanks(*s);
        if (i < s->size() && (std::string_view("YyTt").find((*s)[i]) != std::string_view::npos))
            return true;
    }
    return doubleValue() != 0.0;
}

std::string RWObjectValue::stringValue() const {
    if (const double* n = std::get_if<double>(&_value)) return numberText(*n);
    if (const std::string* s = string()) return *s;
    return {};
}
