#pragma once
// A formatter of plain decimal numbers, exact both ways (unlike a pattern's RWNumberFormatter,
// which rounds to its digits), written as a program writes them and whatever the user's
// locale: an optional sign, digits with an optional point, an optional exponent
// ("12", "-0.5", "+3", "1e-3", ".25"), blanks around them allowed. Only finite numbers are
// read: a text beyond the range of doubles, an empty text or one with anything else in it
// is refused.

#include <optional>
#include <string>
#include <string_view>

#include "platform/ui/RWFormatter.h"

class RWDecimalFormatter : public RWFormatter {
public:
    // The number the whole text names, or nothing.
    static std::optional<double> numberFromString(std::string_view text);

    // A finite number as its shortest exact text; a string (typed text the formatter did not
    // read) as it stands.
    std::optional<std::string> stringForObjectValue(const RWObjectValue& value) const override;
    bool getObjectValue(RWObjectValue* value, const std::string& string,
                        std::string* errorDescription) const override;
    // A text that a number may still grow from: "-", "1.", "2e" and "" may stand; "1a" and
    // "1..2" may not.
    bool isPartialStringValid(const std::string& partialString, std::string* newString,
                              std::string* errorDescription) const override;
};
