#include "platform/ui/RWNumberFormatter.h"

#include <cmath>
#include <cstdio>
#include <optional>

namespace {

bool isDigitSymbol(char c) { return c == '#' || c == '0'; }

// One side of a format: prefix, number part, suffix. Nothing when it holds no digit.
std::optional<RWNumberFormatter::Pattern> readPattern(const std::string& text) {
    RWNumberFormatter::Pattern p;
    size_t first = text.find_first_of("#0");
    if (first == std::string::npos) return std::nullopt;
    // A grouping separator or point right before the first digit belongs to the number.
    while (first > 0 && (text[first - 1] == ',' || text[first - 1] == '.')) --first;
    size_t last = text.find_last_of("#0");
    p.prefix = text.substr(0, first);
    p.suffix = text.substr(last + 1);
    const std::string number = text.substr(first, last + 1 - first);
    const size_t point = number.find('.');
    const std::string integer = number.substr(0, point);
    const std::string fraction = point == std::string::npos ? "" : number.substr(point + 1);
    p.minimumIntegerDigits = 0;
    for (char c : integer)
        if (c == '0') ++p.minimumIntegerDigits;
    const size_t comma = integer.rfind(',');
    if (comma != std::string::npos) {
        int size = 0;
        for (size_t i = comma + 1; i < integer.size(); ++i)
            if (isDigitSymbol(integer[i])) ++size;
        p.groupingSize = size;
    }
    for (char c : fraction) {
        if (c == '0') ++p.minimumFractionDigits;
        if (isDigitSymbol(c)) ++p.maximumFractionDigits;
    }
    return p;
}

// Removes blanks at both ends.
std::string trimmed(const std::string& s) {
    const size_t a = s.find_first_not_of(" \t");
    if (a == std::string::npos) return {};
    const size_t b = s.find_last_not_of(" \t");
    return s.substr(a, b + 1 - a);
}

bool startsWith(const std::string& s, const std::string& p) { return s.rfind(p, 0) == 0; }
bool endsWith(const std::string& s, const std::string& p) {
    return s.size() >= p.size() && s.compare(s.size() - p.size(), p.size(), p) == 0;
}

// A plain decimal number, all of the text: sign, digits with optional groups, point,
// digits, exponent.
std::optional<double> readNumber(std::string text) {
    std::string plain;
    for (char c : text)
        if (c != ',') plain += c;
    if (plain.empty()) return std::nullopt;
    size_t used = 0;
    double value = 0.0;
    try {
        value = std::stod(plain, &used);
    } catch (...) {
        return std::nullopt;
    }
    if (used != plain.size() || !std::isfinite(value)) return std::nullopt;
    // stod takes "inf", "nan" and hexadecimal forms: only decimal digits are numbers here.
    for (char c : plain)
        if (!(std::isdigit(static_cast<unsigned char>(c)) || c == '.' || c == '-' || c == '+' ||
              c == 'e' || c == 'E'))
            return std::nullopt;
    return value;
}

}  // namespace

bool RWNumberFormatter::setFormat(const std::string& format) {
    const size_t semicolon = format.find(';');
    const std::optional<Pattern> positive = readPattern(format.substr(0, semicolon));
    if (!positive) return false;
    std::optional<Pattern> negative;
    if (semicolon != std::string::npos) negative = readPattern(format.substr(semicolon + 1));
    _format = format;
    _positive = *positive;
    _hasNegative = negative.has_value();
    if (negative) _negative = *negative;
    return true;
}

std::string RWNumberFormatter::formatNumber(double number, const Pattern& p) const {
    char buffer[64];
    std::snprintf(buffer, sizeof buffer, "%.*f", p.maximumFractionDigits, number);
    std::string digits = buffer;
    const size_t point = digits.find('.');
    std::string integer = digits.substr(0, point);
    std::string fraction = point == std::string::npos ? "" : digits.substr(point + 1);
    while (static_cast<int>(fraction.size()) > p.minimumFractionDigits && !fraction.empty() &&
           fraction.back() == '0')
        fraction.pop_back();
    if (integer == "0" && p.minimumIntegerDigits == 0 && !fraction.empty()) integer.clear();
    if (static_cast<int>(integer.size()) < p.minimumIntegerDigits)
        integer = std::string(static_cast<size_t>(p.minimumIntegerDigits) - integer.size(), '0') +
                  integer;
    if (p.groupingSize > 0) {
        // Built anew rather than by insertions, a separator before each full group.
        std::string grouped;
        const size_t size = integer.size(), group = static_cast<size_t>(p.groupingSize);
        for (size_t i = 0; i < size; ++i) {
            if (i > 0 && (size - i) % group == 0) grouped += ',';
            grouped += integer[i];
        }
        integer = grouped;
    }
    std::string out = p.prefix + integer;
    if (!fraction.empty()) {
        out += '.';
        out += fraction;
    }
    return out + p.suffix;
}

std::optional<std::string> RWNumberFormatter::stringForObjectValue(
    const RWObjectValue& value) const {
    const std::optional<double> number = value.number();
    if (!number || std::isnan(*number)) return std::nullopt;
    // The rounding of the shown digits decides the sign: -0.0001 at three digits shows 0.
    const double scale = std::pow(10.0, _positive.maximumFractionDigits);
    const bool negative = std::round(std::fabs(*number) * scale) > 0.0 && *number < 0.0;
    if (!negative) return formatNumber(std::fabs(*number), _positive);
    if (_hasNegative) return formatNumber(-*number, _negative);
    std::string text(1, '-');
    text += formatNumber(-*number, _positive);
    return text;
}

bool RWNumberFormatter::getObjectValue(RWObjectValue* value, const std::string& string,
                                       std::string* errorDescription) const {
    std::string text = trimmed(string);
    bool negative = false;
    auto strip = [&](const Pattern& p) {
        if (!p.prefix.empty() && startsWith(text, p.prefix)) text = text.substr(p.prefix.size());
        if (!p.suffix.empty() && endsWith(text, p.suffix))
            text = text.substr(0, text.size() - p.suffix.size());
        text = trimmed(text);
    };
    if (_hasNegative && !_negative.prefix.empty() && startsWith(text, _negative.prefix)) {
        negative = true;
        strip(_negative);
    } else {
        strip(_positive);
    }
    const std::optional<double> number = readNumber(text);
    if (!number) {
        if (errorDescription) *errorDescription = "Invalid number";
        return false;
    }
    if (value) *value = RWObjectValue(negative ? -*number : *number);
    return true;
}
