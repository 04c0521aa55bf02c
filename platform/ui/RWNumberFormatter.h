#pragma once
// A number formatter driven by a format pattern, as desktop toolkits take one: "#,##0.000"
// shows 1234.5 as "1,234.500". The pattern's number part holds '#' and '0' digits, an
// optional grouping separator ',' among the integer digits and an optional decimal point '.';
// '0's are digits always shown, '#'s digits shown when needed. Text before and after the
// number part is kept as prefix and suffix. A second pattern after ';' is for negative
// numbers; without it a negative number is the positive form behind a minus sign.
//
// Typed text reads back when it is a number with or without the grouping separators, the
// prefix and the suffix, blanks around it allowed; any other text is refused. The separators
// are the English ones (',' for groups, '.' for decimals).

#include <string>

#include "platform/ui/RWFormatter.h"

class RWNumberFormatter : public RWFormatter {
public:
    RWNumberFormatter() { setFormat("#,##0.###"); }

    const std::string& format() const { return _format; }
    // A pattern without any digit is refused: the formatter keeps its format.
    bool setFormat(const std::string& format);
    // Kept for the toolkit's interface: the separators are always the English ones here.
    bool localizesFormat() const { return _localizesFormat; }
    void setLocalizesFormat(bool localizes) { _localizesFormat = localizes; }

    std::optional<std::string> stringForObjectValue(const RWObjectValue& value) const override;
    bool getObjectValue(RWObjectValue* value, const std::string& string,
                        std::string* errorDescription) const override;

    // The pattern's parts, as read.
    struct Pattern {
        std::string prefix;
        std::string suffix;
        int minimumIntegerDigits = 1;
        int minimumFractionDigits = 0;
        int maximumFractionDigits = 0;
        int groupingSize = 0;  // 0: no grouping
    };
    const Pattern& positivePattern() const { return _positive; }

private:
    std::string formatNumber(double number, const Pattern& pattern) const;

    std::string _format;
    Pattern _positive;
    Pattern _negative;
    bool _hasNegative = false;
    bool _localizesFormat = false;
};
