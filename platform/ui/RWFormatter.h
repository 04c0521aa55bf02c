#pragma once
// A formatter: what a text field, a table cell or an outline column uses to show its object
// value as text and to turn what the user typed back into a value.
//
// Subclasses say how. A formatter holds no value of its own and is shared by the controls that
// use it (not owned by them); its answers depend only on its settings and the arguments.

#include <optional>
#include <string>

#include "platform/ui/RWObjectValue.h"

class RWFormatter {
public:
    virtual ~RWFormatter() = default;

    // The text that shows `value`, or nothing when this formatter cannot show such a value (the
    // control then shows no text).
    virtual std::optional<std::string> stringForObjectValue(const RWObjectValue& value) const = 0;
    // The text put in the field when editing starts; the shown text unless a subclass differs.
    virtual std::optional<std::string> editingStringForObjectValue(
        const RWObjectValue& value) const {
        return stringForObjectValue(value);
    }
    // Turns typed text into a value. True: the text is accepted and, when `value` is given,
    // it receives the result. False: the text is refused, `value` is left as it was, and
    // `errorDescription`, when given, says why. Either pointer may be null.
    virtual bool getObjectValue(RWObjectValue* value, const std::string& string,
                                std::string* errorDescription) const = 0;
    // Whether a partly typed text may stand while the user types; a formatter may offer a
    // replacement in `newString`. Any text may stand unless a subclass says otherwise.
    virtual bool isPartialStringValid(const std::string& partialString, std::string* newString,
                                      std::string* errorDescription) const {
        (void)partialString;
        (void)newString;
        (void)errorDescription;
        return true;
    }
};
