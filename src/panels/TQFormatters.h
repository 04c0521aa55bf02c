#pragma once
// The framework's two formatters. Both are stateless: one instance may serve any number of
// controls.

#include "platform/ui/RWFormatter.h"

// On and off: the channel list shows a flag with it. Only a value whose intValue is exactly 1
// is on; 2, 0.5, a string without a leading 1 and nothing are all off. Texts are the strings
// table's "Curve Editor Flag Value On" and "Curve Editor Flag Value Off", looked up at each
// call.
class TQBoolFormatter : public RWFormatter {
public:
    std::optional<std::string> stringForObjectValue(const RWObjectValue& value) const override;
    // The on text gives 1 and the off text 0 (blanks around them and case ignored); any other
    // text is refused.
    bool getObjectValue(RWObjectValue* value, const std::string& string,
                        std::string* errorDescription) const override;
};

// Lets numbers and strings through as they are: a number shows as its shortest decimal
// text, a string as itself, anything else as no text. Typed text is never refused: it
// becomes the number it starts with, or 0 when it starts with none.
class TQEmptyFormatter : public RWFormatter {
public:
    std::optional<std::string> stringForObjectValue(const RWObjectValue& value) const override;
    bool getObjectValue(RWObjectValue* value, const std::string& string,
                        std::string* errorDescription) const override;
};
