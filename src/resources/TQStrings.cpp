#include "src/resources/TQStrings.h"

#include <algorithm>
#include <string>
#include <unordered_map>

std::string_view TQStringsTableSourceEn();  // generated from strings/en.strings

namespace TQStringsTable {
namespace {

class Parser {
public:
    explicit Parser(std::string_view source) : _src(source) {}

    ParseResult run() {
        std::unordered_map<BNString, int> firstLine;
        for (;;) {
            skipTrivia();
            if (atEnd()) break;
            Entry entry;
            if (!statement(entry)) {
                recover();
                continue;
            }
            const auto [it, inserted] = firstLine.emplace(entry.key, entry.line);
            if (!inserted) {
                error(entry.line, "duplicate key \"" + entry.key + "\" (first defined at line " +
                                      std::to_string(it->second) + ")");
                continue;
            }
            _result.entries.push_back(std::move(entry));
        }
        return std::move(_result);
    }

private:
    bool atEnd() const { return _pos >= _src.size(); }
    char peek() const { return atEnd() ? '\0' : _src[_pos]; }
    void advance() {
        if (_src[_pos] == '\n') ++_line;
        ++_pos;
    }

    void error(int line, const BNString& what) {
        _result.errors.push_back("line " + std::to_string(line) + ": " + what);
    }

    void skipTrivia() {
        while (!atEnd()) {
            const char c = peek();
            if (c == ' ' || c == '\t' || c == '\r' || c == '\n') {
                advance();
            } else if (_src.compare(_pos, 2, "//") == 0) {
                while (!atEnd() && peek() != '\n') advance();
            } else if (_src.compare(_pos, 2, "/*") == 0) {
                const int start = _line;
                const std::size_t end = _src.find("*/", _pos + 2);
                if (end == std::string_view::npos) {
                    error(start, "unterminated comment");
                    while (!atEnd()) advance();
                    return;
                }
                while (_pos < end + 2) advance();
            } else {
                return;
            }
        }
    }

    bool expect(char c, const char* what) {
        // On failure the cursor goes back to where the token was due, so that recovery
        // starts on the broken statement's own line and spares the next statement.
        const std::size_t pos = _pos;
        const int line = _line;
        skipTrivia();
        if (peek() != c) {
            error(line, BNString("expected ") + what);
            _pos = pos;
            _line = line;
            return false;
        }
        advance();
        return true;
    }

    // A quoted string on one line, the opening quote at the cursor.
    bool quoted(BNString& out, const char* what) {
        const std::size_t pos = _pos;
        const int line = _line;
        skipTrivia();
        if (peek() != '"') {
            error(line, BNString("expected ") + what + " in quotes");
            _pos = pos;
            _line = line;
            return false;
        }
        const int start = _line;
        advance();
        while (!atEnd() && peek() != '"') {
            char c = peek();
            if (c == '\n') break;
            if (c == '\\') {
                advance();
                switch (peek()) {
                    case '"': c = '"'; break;
                    case '\\': c = '\\'; break;
                    case 'n': c = '\n'; break;
                    case 't': c = '\t'; break;
                    default: error(_line, BNString("unknown escape in ") + what); return false;
                }
            }
            out.push_back(c);
            advance();
        }
        if (peek() != '"') {
            error(start, BNString("unterminated ") + what);
            return false;
        }
        advance();
        return true;
    }

    bool statement(Entry& entry) {
        entry.line = _line;
        if (!quoted(entry.key, "key")) return false;
        if (entry.key.empty()) {
            error(entry.line, "empty key");
            return false;
        }
        return expect('=', "'=' after the key") && quoted(entry.text, "text") &&
               expect(';', "';' after the text");
    }

    // Skips the rest of a broken statement: up to and including the next ';' or line end.
    void recover() {
        while (!atEnd()) {
            const char c = peek();
            advance();
            if (c == ';' || c == '\n') return;
        }
    }

    std::string_view _src;
    std::size_t _pos = 0;
    int _line = 1;
    ParseResult _result;
};

struct Table {
    std::unordered_map<BNString, BNString> texts;
    std::vector<BNString> sortedKeys;
};

// Built once, on first use; the table is fixed at build time.
const Table& builtInTable() {
    static const Table table = [] {
        Table t;
        ParseResult parsed = parse(builtInSource());
        t.texts.reserve(parsed.entries.size());
        for (Entry& e : parsed.entries) {
            t.sortedKeys.push_back(e.key);
            t.texts.emplace(std::move(e.key), std::move(e.text));
        }
        std::sort(t.sortedKeys.begin(), t.sortedKeys.end());
        return t;
    }();
    return table;
}

}  // namespace

ParseResult parse(std::string_view source) { return Parser(source).run(); }

std::string_view builtInSource() { return TQStringsTableSourceEn(); }

}  // namespace TQStringsTable

BNString TQLocalizedString(const BNString& key) {
    const auto& texts = TQStringsTable::builtInTable().texts;
    const auto it = texts.find(key);
    return it != texts.end() ? it->second : key;
}

bool TQHasLocalizedString(const BNString& key) {
    return TQStringsTable::builtInTable().texts.count(key) != 0;
}

std::vector<BNString> TQLocalizedStringKeys() { return TQStringsTable::builtInTable().sortedKeys; }
