#include "platform/support/BNStringCase.h"

#include <algorithm>
#include <iterator>
#include <optional>

#include "platform/support/internal/BNLowercaseTable.h"

namespace {

constexpr char32_t kReplacementCharacter = 0xFFFD;

// The code point at the start of `text` and its length in bytes; nothing when the bytes there
// are no well-formed UTF-8 (overlong forms and surrogates included).
std::optional<std::pair<char32_t, size_t>> decode(std::string_view text) {
    const auto byte = [&](size_t i) { return static_cast<unsigned char>(text[i]); };
    const unsigned char lead = byte(0);
    if (lead < 0x80) return std::pair{char32_t{lead}, size_t{1}};
    // Lead byte forms of two, three and four bytes, with the least code point each may carry.
    struct Form {
        unsigned char mask;
        unsigned char lead;
        size_t length;
        char32_t least;
    };
    static constexpr Form kForms[] = {
        {0xE0, 0xC0, 2, 0x80}, {0xF0, 0xE0, 3, 0x800}, {0xF8, 0xF0, 4, 0x10000}};
    const Form* form = std::find_if(std::begin(kForms), std::end(kForms),
                                    [&](const Form& f) { return (lead & f.mask) == f.lead; });
    if (form == std::end(kForms)) return std::nullopt;
    const size_t length = form->length;
    char32_t cp = lead & static_cast<unsigned char>(~form->mask);
    if (text.size() < length) return std::nullopt;
    for (size_t i = 1; i < length; ++i) {
        if ((byte(i) & 0xC0) != 0x80) return std::nullopt;
        cp = (cp << 6) | (byte(i) & 0x3F);
    }
    if (cp < form->least || cp > 0x10FFFF || (cp >= 0xD800 && cp <= 0xDFFF)) return std::nullopt;
    return std::pair{cp, length};
}

void encode(char32_t cp, BNString& out) {
    if (cp < 0x80) {
        out += static_cast<char>(cp);
    } else if (cp < 0x800) {
        out += static_cast<char>(0xC0 | (cp >> 6));
        out += static_cast<char>(0x80 | (cp & 0x3F));
    } else if (cp < 0x10000) {
        out += static_cast<char>(0xE0 | (cp >> 12));
        out += static_cast<char>(0x80 | ((cp >> 6) & 0x3F));
        out += static_cast<char>(0x80 | (cp & 0x3F));
    } else {
        out += static_cast<char>(0xF0 | (cp >> 18));
        out += static_cast<char>(0x80 | ((cp >> 12) & 0x3F));
        out += static_cast<char>(0x80 | ((cp >> 6) & 0x3F));
        out += static_cast<char>(0x80 | (cp & 0x3F));
    }
}

void appendLowercase(char32_t cp, BNString& out) {
    for (const BNLowercaseExpansion& e : kBNLowercaseExpansions) {
        if (e.from != cp) continue;
        for (char32_t to : e.to)
            if (to) encode(to, out);
        return;
    }
    // The last run that starts at or before cp is the only one that can hold it.
    const auto after =
        std::upper_bound(std::begin(kBNLowercaseRuns), std::end(kBNLowercaseRuns), cp,
                         [](char32_t c, const BNLowercaseRun& run) { return c < run.first; });
    if (after != std::begin(kBNLowercaseRuns)) {
        const BNLowercaseRun& run = *std::prev(after);
        if (cp <= run.last && (cp - run.first) % run.stride == 0) {
            encode(static_cast<char32_t>(static_cast<int32_t>(cp) + run.delta), out);
            return;
        }
    }
    encode(cp, out);
}

}  // namespace

BNString BNLowercaseString(std::string_view utf8) {
    BNString out;
    out.reserve(utf8.size());
    while (!utf8.empty()) {
        if (const auto decoded = decode(utf8)) {
            appendLowercase(decoded->first, out);
            utf8.remove_prefix(decoded->second);
        } else {
            out += utf8.front();
            utf8.remove_prefix(1);
        }
    }
    return out;
}

uint16_t BNFirstUTF16Unit(std::string_view utf8) {
    if (utf8.empty()) return 0;
    const auto decoded = decode(utf8);
    const char32_t cp = decoded ? decoded->first : kReplacementCharacter;
    if (cp < 0x10000) return static_cast<uint16_t>(cp);
    return static_cast<uint16_t>(0xD800 + ((cp - 0x10000) >> 10));
}
