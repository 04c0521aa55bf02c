#include "platform/inspector/TQInspNumberFormatter.h"

#include <algorithm>
#include <cstdio>
#include <cstdlib>

std::unique_ptr<TQInspNumberFormatter> TQInspNumberFormatter::formatterWithSuffix(
    const std::string& suffix, double min, double max, int decimalDigits) {
    auto formatter = std::make_unique<TQInspNumberFormatter>();
    formatter->_suffix = suffix;
    formatter->_min = min;
    formatter->_max = max;
    formatter->_digits = decimalDigits;
    return formatter;
}

std::optional<std::string> TQInspNumberFormatter::stringForObjectValue(
    const RWObjectValue& value) const {
    if (!value.isNumber()) return std::nullopt;
    char text[64];
    std::snprintf(text, sizeof text, "%.*f", std::clamp(_digits, 0, 12), value.doubleValue());
    return std::string(text) + _suffix;
}

bool TQInspNumberFormatter::getObjectValue(RWObjectValue* value, const std::string& string,
                                           std::string* errorDescription) const {
    std::string text = string;
    if (!_suffix.empty() && text.size() >= _suffix.size() &&
        text.compare(text.size() - _suffix.size(), _suffix.size(), _suffix) == 0)
        text.resize(text.size() - _suffix.size());
    const char* begin = text.c_str();
    char* end = nullptr;
    const double number = std::strtod(begin, &end);
    while (end && *end == ' ') ++end;
    if (end == begin || (end && *end != '\0')) {
        if (errorDescription) *errorDescription = "not a number";
        return false;
    }
    if (value) *value = RWObjectValue(std::clamp(number, _min, _max));
    return true;
}
