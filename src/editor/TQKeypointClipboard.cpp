#include "src/editor/TQKeypointClipboard.h"

#include <charconv>
#include <cmath>
#include <cstdint>
#include <limits>

#include "platform/channels/TQChannelRef.h"
#include "platform/channels/TQFactory.h"

namespace {

constexpr std::string_view kHeader = "VantaCurveEditor keypoints 1";
// Far beyond any real copy; bounds what a damaged or hostile payload makes us allocate.
constexpr size_t kMaxPayloadBytes = size_t{64} << 20;

// ---- Writing ------------------------------------------------------------------------------

void appendDouble(std::string& out, double value) {
    char buffer[32];
    // The shortest form that reads back to the same double.
    const auto [end, ec] = std::to_chars(buffer, buffer + sizeof buffer, value);
    out.append(buffer, ec == std::errc() ? end : buffer);
}

template <class Int>
void appendInt(std::string& out, Int value) {
    char buffer[24];
    const auto [end, ec] = std::to_chars(buffer, buffer + sizeof buffer, value);
    out.append(buffer, ec == std::errc() ? end : buffer);
}

const char* interpolationName(unsigned code) {
    switch (code) {
        case kTQInterpolationConstant: return "Constant";
        case kTQInterpolationLinear: return "Linear";
        case kTQInterpolationBezier: return "Bezier";
        case kTQInterpolationCatmullRom: return "Catmull-Rom";
        case kTQInterpolationExp: return "Exponential";
        case kTQInterpolationLog: return "Logarithmic";
        case kTQInterpolationEaseBoth: return "Ease In and Out";
        case kTQInterpolationEaseOut: return "Ease Out";
        case kTQInterpolationEaseIn: return "Ease In";
        default: return "Other";
    }
}

// ---- Reading ------------------------------------------------------------------------------

// One line cut into words at single blanks; an empty word (two blanks, a blank at either end)
// makes the line unreadable.
bool splitWords(std::string_view line, std::vector<std::string_view>& words) {
    words.clear();
    size_t start = 0;
    while (true) {
        const size_t blank = line.find(' ', start);
        const std::string_view word = line.substr(start, blank - start);
        if (word.empty()) return false;
        words.push_back(word);
        if (blank == std::string_view::npos) return true;
        start = blank + 1;
    }
}

template <class Number>
bool readWhole(std::string_view word, Number& out) {
    const char* end = word.data() + word.size();
    const auto [stop, ec] = std::from_chars(word.data(), end, out);
    return ec == std::errc() && stop == end;
}

bool readFinite(std::string_view word, double& out) {
    return readWhole(word, out) && std::isfinite(out);
}

bool readFlag(char c, bool& out) {
    if (c != '0' && c != '1') return false;
    out = c == '1';
    return true;
}

bool isKindName(std::string_view word) {
    for (const char c : word)
        if (!((c >= 'A' && c <= 'Z') || (c >= 'a' && c <= 'z') || (c >= '0' && c <= '9') ||
              c == '_'))
            return false;
    return !word.empty();
}

// "key <time value> <timescale> <value> <interpolation> <inU> <inV> <outU> <outV> <flags>"
bool readKey(const std::vector<std::string_view>& w, TQKeyframeState& key) {
    if (w.size() != 10) return false;
    CMTimeValue value = 0;
    CMTimeScale timescale = 0;
    if (!readWhole(w[1], value) || !readWhole(w[2], timescale)) return false;
    if (value < 0 || timescale <= 0 || timescale > kCMTimeMaxTimescale) return false;
    key.time = CMTimeMake(value, timescale);
    if (!readFinite(w[3], key.value) || !readWhole(w[4], key.interpolation) ||
        !TQIsInterpolationCode(key.interpolation))
        return false;
    if (!readFinite(w[5], key.inU) || !readFinite(w[6], key.inV) || !readFinite(w[7], key.outU) ||
        !readFinite(w[8], key.outV))
        return false;
    const std::string_view flags = w[9];
    return flags.size() == 4 && readFlag(flags[0], key.broken) && readFlag(flags[1], key.scaled) &&
           readFlag(flags[2], key.locked) && readFlag(flags[3], key.enabled);
}

}  // namespace

size_t TQKeypointClip::keyCount() const {
    size_t n = 0;
    for (const TQKeypointClipChannel& channel : channels) n += channel.keys.size();
    return n;
}

std::string TQChannelKind(const TQChannelBase& channel) {
    const TQFactory* factory = channel.getFactory();
    return factory && factory->getClassName() ? factory->getClassName() : "TQChannel";
}

std::string TQWriteKeypointClip(const TQKeypointClip& clip) {
    std::string out(kHeader);
    out += '\n';
    for (const TQKeypointClipChannel& channel : clip.channels) {
        out += "channel ";
        out += channel.kind;
        out += ' ';
        out += channel.ref;
        out += '\n';
        for (const TQKeyframeState& key : channel.keys) {
            out += "key ";
            appendInt(out, key.time.value);
            out += ' ';
            appendInt(out, key.time.timescale);
            out += ' ';
            appendDouble(out, key.value);
            out += ' ';
            appendInt(out, key.interpolation);
            for (const double d : {key.inU, key.inV, key.outU, key.outV}) {
                out += ' ';
                appendDouble(out, d);
            }
            out += ' ';
            for (const bool b : {key.broken, key.scaled, key.locked, key.enabled})
                out += b ? '1' : '0';
            out += '\n';
        }
    }
    out += "end ";
    appendInt(out, clip.keyCount());
    out += '\n';
    return out;
}

TQKeypointClipReading TQReadKeypointClip(std::string_view text) {
    TQKeypointClipReading damaged{TQKeypointClipRead::kDamaged, {}};
    if (text.size() > kMaxPayloadBytes) return damaged;
    TQKeypointClip clip;
    std::vector<std::string_view> words;
    size_t start = 0;
    bool sawHeader = false;
    bool sawEnd = false;
    while (start < text.size()) {
        const size_t newline = text.find('\n', start);
        // Every line ends with its line break, the last one included.
        if (newline == std::string_view::npos || sawEnd) return damaged;
        const std::string_view line = text.substr(start, newline - start);
        start = newline + 1;
        if (!sawHeader) {
            if (line != kHeader) return damaged;
            sawHeader = true;
            continue;
        }
        if (line.starts_with("channel ")) {
            // The reference is the rest of the line.
            const std::string_view rest = line.substr(8);
            const size_t blank = rest.find(' ');
            if (blank == std::string_view::npos) return damaged;
            const std::string_view kind = rest.substr(0, blank);
            const std::string ref(rest.substr(blank + 1));
            if (!isKindName(kind) || !TQChannelRef(BNString(ref)).isValid()) return damaged;
            if (!clip.channels.empty() && clip.channels.back().keys.empty()) return damaged;
            clip.channels.push_back({ref, std::string(kind), {}});
            continue;
        }
        if (!splitWords(line, words)) return damaged;
        if (words[0] == "key") {
            if (clip.channels.empty()) return damaged;
            TQKeyframeState key;
            if (!readKey(words, key)) return damaged;
            std::vector<TQKeyframeState>& keys = clip.channels.back().keys;
            if (!keys.empty() && CMTimeCompare(key.time, keys.back().time) < 0) return damaged;
            keys.push_back(key);
        } else if (words[0] == "end" && words.size() == 2) {
            size_t count = 0;
            if (!readWhole(words[1], count) || count != clip.keyCount()) return damaged;
            sawEnd = true;
        } else {
            return damaged;
        }
    }
    if (!sawEnd || clip.channels.empty() || clip.channels.back().keys.empty()) return damaged;
    return {TQKeypointClipRead::kOk, std::move(clip)};
}

std::string TQDescribeKeypointClip(const TQKeypointClip& clip) {
    std::string out = "Keypoints: ";
    appendInt(out, clip.keyCount());
    out += " on ";
    appendInt(out, clip.channels.size());
    out += clip.channels.size() == 1 ? " channel" : " channels";
    out += "; seconds from the first, value, interpolation\n";
    for (const TQKeypointClipChannel& channel : clip.channels) {
        out += channel.ref + " (" + channel.kind + ")\n";
        for (const TQKeyframeState& key : channel.keys) {
            out += '\t';
            appendDouble(out, CMTimeGetSeconds(key.time));
            out += '\t';
            appendDouble(out, key.value);
            out += '\t';
            out += interpolationName(key.interpolation);
            out += '\n';
        }
    }
    return out;
}

const char* TQPasteRefusalKey(TQPasteResult result) {
    switch (result) {
        case TQPasteResult::kPasted: return nullptr;
        case TQPasteResult::kNothingToPaste: return "Curve Editor Paste Nothing";
        case TQPasteResult::kDamaged: return "Curve Editor Paste Damaged";
        case TQPasteResult::kNoChannel: return "Curve Editor Paste No Channel";
        case TQPasteResult::kLocked: return "Curve Editor Paste Locked";
    }
    return nullptr;
}

void TQPutKeypointClip(RWPasteboard& pasteboard, const TQKeypointClip& clip) {
    pasteboard.clearContents();
    pasteboard.setString(TQWriteKeypointClip(clip), kTQKeypointClipboardType);
    pasteboard.setString(TQDescribeKeypointClip(clip), kTQPlainTextClipboardType);
}

TQKeypointClipReading TQTakeKeypointClip(const RWPasteboard& pasteboard) {
    const std::optional<std::string> text = pasteboard.stringForType(kTQKeypointClipboardType);
    if (!text) return {};
    return TQReadKeypointClip(*text);
}

bool TQPasteboardHasKeypoints(const RWPasteboard& pasteboard) {
    return pasteboard.availableTypeFromArray({kTQKeypointClipboardType}).has_value();
}
