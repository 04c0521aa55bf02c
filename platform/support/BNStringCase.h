#pragma once
// Character-level views of UTF-8 text that a key or a name needs: lower case and the first
// UTF-16 code unit, as a toolkit's string type answers them.

#include <cstdint>
#include <string_view>

#include "platform/support/BNString.h"

// The lower case of every character, by the Unicode mapping of each character on its own
// (independent of locale; "İ" becomes "i" and a combining dot). Bytes that are not UTF-8 are
// kept as they are.
BNString BNLowercaseString(std::string_view utf8);

// The first character as a UTF-16 code unit (the high surrogate of one beyond U+FFFF); 0 for
// empty text, U+FFFD when the text does not start with a UTF-8 character.
uint16_t BNFirstUTF16Unit(std::string_view utf8);
