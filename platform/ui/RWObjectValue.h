#pragma once
// The object value of a control, a cell, an outline data source or a table view: nothing, a
// number or a string. It is what a formatter turns into text and back, what a text field or
// a table cell holds, and what a data source answers for a row and column.
//
// It answers the conversions their users ask for, as a boxed number or string of the
// desktop toolkits does: doubleValue, intValue, integerValue, boolValue and stringValue work on
// every kind. A string converts by its leading number ("  12.5px" is 12.5, "abc" is 0); a
// number converts to text as its shortest exact decimal ("2", "2.5", "0.1"); nothing is 0 and
// the empty string. Numbers are doubles: integers are exact up to 2^53. Conversions to
// integers truncate toward zero and saturate at the limits of their type; NaN gives 0.
//
// A small value type: copy it freely. Two values are equal when they are of one kind and hold
// equal contents (a number never equals a string, even "2" and 2).

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <type_traits>
#include <variant>

class RWObjectValue {
public:
    // Nothing.
    RWObjectValue() = default;
    // A number. Any arithmetic type, bool included (true is 1).
    template <class T>
        requires std::is_arithmetic_v<T>
    RWObjectValue(T number) : _value(static_cast<double>(number)) {}
    // A string.
    RWObjectValue(std::string string) : _value(std::move(string)) {}
    RWObjectValue(const char* string) : _value(std::string(string ? string : "")) {}

    bool isNil() const { return std::holds_alternative<std::monostate>(_value); }
    bool isNumber() const { return std::holds_alternative<double>(_value); }
    bool isString() const { return std::holds_alternative<std::string>(_value); }

    // What is held, when it is of that kind.
    std::optional<double> number() const;
    const std::string* string() const { return std::get_if<std::string>(&_value); }

    double doubleValue() const;
    int32_t intValue() const;
    int64_t integerValue() const;
    // A nonzero number; a string whose leading number is nonzero or that starts with "Y",
    // "y", "T" or "t" (after blanks).
    bool boolValue() const;
    std::string stringValue() const;

    friend bool operator==(const RWObjectValue&, const RWObjectValue&) = default;

    // The leading decimal number of a text (blanks, a sign, digits, a point, digits, an
    // exponent), or nothing when the text does not start with one. Shared by the formatters.
    static std::optional<double> leadingNumber(std::string_view text);
    // The shortest decimal text that reads back as exactly this number; integral values
    // below 1e15 without an exponent.
    static std::string numberText(double number);

private:
    std::variant<std::monostate, double, std::string> _value;
};
