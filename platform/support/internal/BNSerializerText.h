#pragma once
// Internal: the text forms of the values a serializer stream carries, and the escaping of
// text into XML. Shared by the write and read streams, and by the fuzzers' checks.
//
//   bool     "true" / "false"; reading also takes "1" / "0"
//   integers decimal, no sign for unsigned; no blanks, no leading "+"
//   double   the shortest text that reads back to the same bits ("0.1", "1e+300", "-0");
//            "nan", "inf", "-inf" for the values that are no numbers
//   CMTime   "value/timescale" for a numeric time (timescale above 0), followed by "~" when
//            it has been rounded and by "@epoch" when its epoch is not 0; "invalid",
//            "+infinity", "-infinity", "indefinite" for those constants; every other time
//            (flags in another combination) as "value/timescale/flags/epoch"
//
// Reading is strict: the whole text must be the value, or the read fails with a reason.

#include <cstdint>
#include <string>
#include <string_view>

#include "platform/media/CMTime.h"

namespace bn_internal {

enum class TextValueStatus {
    Ok,
    Malformed,      // not a value of that type
    OutOfRange,     // a number that does not fit the type
    ZeroTimescale,  // a numeric time whose timescale is not above zero
};

// A short phrase for an error message ("is not a number", ...).
const char* describe(TextValueStatus status);

void appendBool(std::string& out, bool value);
void appendUInt64(std::string& out, uint64_t value);
void appendInt64(std::string& out, int64_t value);
void appendDouble(std::string& out, double value);
void appendTime(std::string& out, const CMTime& time);

TextValueStatus parseBool(std::string_view text, bool& out);
TextValueStatus parseUInt32(std::string_view text, uint32_t& out);
TextValueStatus parseUInt64(std::string_view text, uint64_t& out);
TextValueStatus parseInt64(std::string_view text, int64_t& out);
TextValueStatus parseDouble(std::string_view text, double& out);
TextValueStatus parseTime(std::string_view text, CMTime& out);

// Appends `text` escaped for XML content (attribute false) or a double-quoted attribute value.
// Bytes that are not well-formed UTF-8, and characters that XML 1.0 does not allow (control
// characters other than tab, line feed and carriage return; U+FFFE, U+FFFF), become U+FFFD,
// so that what is written is always well-formed. Line ends and tabs in attributes, and
// carriage returns anywhere, are written as character references so that they read back as
// they were.
void appendEscaped(std::string& out, std::string_view text, bool attribute);

// XML white space: space, tab, line feed, carriage return.
std::string_view trimWhiteSpace(std::string_view text);

}  // namespace bn_internal
