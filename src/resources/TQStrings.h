#pragma once
// The framework's strings table: menu titles, undo descriptions, set names, alert texts,
// tool tips and formats, each under the key that the code names.
//
// The table is kept in strings/en.strings and compiled into this library, so a lookup never
// touches the disk. Keys are looked up at the moment of use: callers keep the key, not the
// text.

#include "platform/support/BNString.h"

#include <string_view>
#include <vector>

// The text of `key`. A key that the table does not hold answers the key itself, so that a
// missing entry shows up on screen as its key instead of as a blank.
BNString TQLocalizedString(const BNString& key);
bool TQHasLocalizedString(const BNString& key);
// Every key of the table, sorted.
std::vector<BNString> TQLocalizedStringKeys();

// The format of the table and its parser, for the tests and for tools that check a table.
namespace TQStringsTable {

struct Entry {
    BNString key;
    BNString text;
    int line = 0;  // line of the key, from 1
};

struct ParseResult {
    std::vector<Entry> entries;    // in the order of the source; duplicates left out
    std::vector<BNString> errors;  // "line N: what is wrong"; empty for a good table
};

// Parses `"key" = "text";` statements with C and C++ comments between them. Strings know
// the escapes \" \\ \n \t. A malformed statement is reported and skipped up to the next ';'
// (or the end of its line); a repeated key is reported and its later definition dropped.
ParseResult parse(std::string_view source);

// The text of the compiled-in English table.
std::string_view builtInSource();

}  // namespace TQStringsTable
