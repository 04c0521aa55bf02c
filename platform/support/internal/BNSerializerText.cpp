#include "platform/support/internal/BNSerializerText.h"

#include <charconv>
#include <cmath>
#include <limits>
#include <system_error>

namespace bn_internal {

const char* describe(TextValueStatus status) {
    switch (status) {
        case TextValueStatus::Ok: return "is fine";
        case TextValueStatus::Malformed: return "is not a value of its type";
        case TextValueStatus::OutOfRange: return "is out of range";
        case TextValueStatus::ZeroTimescale: return "has a timescale that is not above zero";
    }
    return "is not a value of its type";
}

// ---- Writing ----------------------------------------------------------------------------

void appendBool(std::string& out, bool value) { out += value ? "true" : "false"; }

namespace {

template <class T>
void appendNumber(std::string& out, T value) {
    char buffer[32];
    const auto result = std::to_chars(buffer, buffer + sizeof buffer, value);
    out.append(buffer, result.ptr);
}

}  // namespace

void appendUInt64(std::string& out, uint64_t value) { appendNumber(out, value); }
void appendInt64(std::string& out, int64_t value) { appendNumber(out, value); }

void appendDouble(std::string& out, double value) {
    // to_chars without a format gives the shortest text that reads back to the same double.
    appendNumber(out, value);
}

void appendTime(std::string& out, const CMTime& time) {
    const CMTimeFlags rounded = kCMTimeFlags_Valid | kCMTimeFlags_HasBeenRounded;
    if ((time.flags == kCMTimeFlags_Valid || time.flags == rounded) && time.timescale > 0) {
        appendInt64(out, time.value);
        out += '/';
        appendInt64(out, time.timescale);
        if (time.flags == rounded) out += '~';
        if (time.epoch != 0) {
            out += '@';
            appendInt64(out, time.epoch);
        }
        return;
    }
    if (CMTimeIdentical(time, kCMTimeInvalid)) {
        out += "invalid";
    } else if (CMTimeIdentical(time, kCMTimePositiveInfinity)) {
        out += "+infinity";
    } else if (CMTimeIdentical(time, kCMTimeNegativeInfinity)) {
        out += "-infinity";
    } else if (CMTimeIdentical(time, kCMTimeIndefinite)) {
        out += "indefinite";
    } else {
        appendInt64(out, time.value);
        out += '/';
        appendInt64(out, time.timescale);
        out += '/';
        appendUInt64(out, time.flags);
        out += '/';
        appendInt64(out, time.epoch);
    }
}

// ---- Reading ----------------------------------------------------------------------------

namespace {

template <class T>
TextValueStatus parseInteger(std::string_view text, T& out) {
    if (text.empty() || text.front() == '+') return TextValueStatus::Malformed;
    T value{};
    const auto [ptr, ec] = std::from_chars(text.data(), text.data() + text.size(), value);
    if (ec == std::errc::result_out_of_range) return TextValueStatus::OutOfRange;
    if (ec != std::errc() || ptr != text.data() + text.size()) return TextValueStatus::Malformed;
    out = value;
    return TextValueStatus::Ok;
}

}  // namespace

TextValueStatus parseBool(std::string_view text, bool& out) {
    if (text == "true" || text == "1") {
        out = true;
    } else if (text == "false" || text == "0") {
        out = false;
    } else {
        return TextValueStatus::Malformed;
    }
    return TextValueStatus::Ok;
}

TextValueStatus parseUInt32(std::string_view text, uint32_t& out) {
    if (!text.empty() && text.front() == '-') return TextValueStatus::OutOfRange;
    return parseInteger(text, out);
}

TextValueStatus parseUInt64(std::string_view text, uint64_t& out) {
    if (!text.empty() && text.front() == '-') return TextValueStatus::OutOfRange;
    return parseInteger(text, out);
}

TextValueStatus parseInt64(std::string_view text, int64_t& out) { return parseInteger(text, out); }

TextValueStatus parseDouble(std::string_view text, double& out) {
    if (text.empty() || text.front() == '+') return TextValueStatus::Malformed;
    double value = 0.0;
    const auto [ptr, ec] =
        std::from_chars(text.data(), text.data() + text.size(), value, std::chars_format::general);
    if (ec == std::errc::result_out_of_range) return TextValueStatus::OutOfRange;
    if (ec != std::errc() || ptr != text.data() + text.size()) return TextValueStatus::Malformed;
    out = value;
    return TextValueStatus::Ok;
}

TextValueStatus parseTime(std::string_view text, CMTime& out) {
    if (text == "invalid") {
        out = kCMTimeInvalid;
        return TextValueStatus::Ok;
    }
    if (text == "+infinity") {
        out = kCMTimePositiveInfinity;
        return TextValueStatus::Ok;
    }
    if (text == "-infinity") {
        out = kCMTimeNegativeInfinity;
        return TextValueStatus::Ok;
    }
    if (text == "indefinite") {
        out = kCMTimeIndefinite;
        return TextValueStatus::Ok;
    }
    // "value/timescale[~][@epoch]" or "value/timescale/flags/epoch".
    CMTime time{0, 0, kCMTimeFlags_Valid, 0};
    const size_t at = text.find('@');
    if (at != std::string_view::npos) {
        const TextValueStatus status = parseInt64(text.substr(at + 1), time.epoch);
        if (status != TextValueStatus::Ok) return status;
        text = text.substr(0, at);
    }
    if (!text.empty() && text.back() == '~') {
        time.flags |= kCMTimeFlags_HasBeenRounded;
        text.remove_suffix(1);
    }
    std::string_view fields[4];
    size_t count = 0;
    for (size_t start = 0;;) {
        const size_t slash = text.find('/', start);
        if (count == 4) return TextValueStatus::Malformed;
        fields[count++] =
            text.substr(start, slash == std::string_view::npos ? slash : slash - start);
        if (slash == std::string_view::npos) break;
        start = slash + 1;
    }
    const bool shortForm = time.flags == kCMTimeFlags_Valid && at == std::string_view::npos;
    if (count != 2 && !(count == 4 && shortForm)) return TextValueStatus::Malformed;

    int64_t timescale = 0;
    TextValueStatus status = parseInt64(fields[0], time.value);
    if (status == TextValueStatus::Ok) status = parseInt64(fields[1], timescale);
    if (status == TextValueStatus::Ok && (timescale > std::numeric_limits<CMTimeScale>::max() ||
                                          timescale < std::numeric_limits<CMTimeScale>::min()))
        status = TextValueStatus::OutOfRange;
    if (status == TextValueStatus::Ok && count == 4) {
        uint64_t flags = 0;
        status = parseUInt64(fields[2], flags);
        if (status == TextValueStatus::Ok && flags > std::numeric_limits<CMTimeFlags>::max())
            status = TextValueStatus::OutOfRange;
        if (status == TextValueStatus::Ok) status = parseInt64(fields[3], time.epoch);
        time.flags = static_cast<CMTimeFlags>(flags);
    }
    if (status != TextValueStatus::Ok) return status;
    time.timescale = static_cast<CMTimeScale>(timescale);
    // The short form claims a plain number, which needs a timescale to divide by; the long
    // form stands for whatever it spells out.
    if (count == 2 && time.timescale <= 0) return TextValueStatus::ZeroTimescale;
    out = time;
    return TextValueStatus::Ok;
}

// ---- Escaping ---------------------------------------------------------------------------

namespace {

constexpr std::string_view kReplacement = "\xEF\xBF\xBD";  // U+FFFD

// Length of the well-formed UTF-8 sequence at `p` that encodes a character XML allows, or 0.
size_t allowedSequence(const unsigned char* p, const unsigned char* end) {
    const unsigned char c = p[0];
    const size_t left = static_cast<size_t>(end - p);
    auto cont = [&](size_t i) { return i < left && (p[i] & 0xC0) == 0x80; };
    if (c < 0x80) return (c >= 0x20 || c == '\t' || c == '\n' || c == '\r') ? 1 : 0;
    if (c >= 0xC2 && c <= 0xDF) return cont(1) ? 2 : 0;
    if (c >= 0xE0 && c <= 0xEF) {
        if (!cont(1) || !cont(2)) return 0;
        if (c == 0xE0 && p[1] < 0xA0) return 0;                                     // overlong
        if (c == 0xED && p[1] >= 0xA0) return 0;                                    // surrogates
        if (c == 0xEF && p[1] == 0xBF && (p[2] == 0xBE || p[2] == 0xBF)) return 0;  // U+FFFE/F
        return 3;
    }
    if (c >= 0xF0 && c <= 0xF4) {
        if (!cont(1) || !cont(2) || !cont(3)) return 0;
        if (c == 0xF0 && p[1] < 0x90) return 0;   // overlong
        if (c == 0xF4 && p[1] >= 0x90) return 0;  // beyond U+10FFFF
        return 4;
    }
    return 0;
}

}  // namespace

void appendEscaped(std::string& out, std::string_view text, bool attribute) {
    const auto* p = reinterpret_cast<const unsigned char*>(text.data());
    const auto* end = p + text.size();
    const auto* run = p;  // start of the bytes that go out as they stand
    auto flush = [&](const unsigned char* upTo) {
        out.append(reinterpret_cast<const char*>(run), static_cast<size_t>(upTo - run));
    };
    while (p < end) {
        const unsigned char c = *p;
        const char* replacement = nullptr;
        switch (c) {
            case '&': replacement = "&amp;"; break;
            case '<': replacement = "&lt;"; break;
            case '>': replacement = "&gt;"; break;
            case '\r': replacement = "&#13;"; break;
            case '"': replacement = attribute ? "&quot;" : nullptr; break;
            case '\n': replacement = attribute ? "&#10;" : nullptr; break;
            case '\t': replacement = attribute ? "&#9;" : nullptr; break;
            default: break;
        }
        if (replacement) {
            flush(p);
            out += replacement;
            run = ++p;
            continue;
        }
        if (c >= 0x20 && c < 0x80) {
            ++p;
            continue;
        }
        const size_t length = allowedSequence(p, end);
        if (length > 0) {
            p += length;
            continue;
        }
        flush(p);
        out += kReplacement;
        run = ++p;
    }
    flush(p);
}

std::string_view trimWhiteSpace(std::string_view text) {
    constexpr std::string_view kWhite = " \t\n\r";
    const size_t first = text.find_first_not_of(kWhite);
    if (first == std::string_view::npos) return {};
    const size_t last = text.find_last_not_of(kWhite);
    return text.substr(first, last - first + 1);
}

}  // namespace bn_internal
