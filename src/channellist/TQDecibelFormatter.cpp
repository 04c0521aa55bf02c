#include "src/channellist/TQDecibelFormatter.h"

#include <cmath>
#include <cstdio>

#include "platform/channels/TQChannelTypes.h"
#include "platform/media/CMTime.h"

namespace {

constexpr const char* kUnit = "dB";
constexpr const char* kSilence = "-inf";

std::string trimmed(const std::string& s) {
    const size_t a = s.find_first_not_of(" \t");
    if (a == std::string::npos) return {};
    const size_t b = s.find_last_not_of(" \t");
    return s.substr(a, b + 1 - a);
}

}  // namespace

std::optional<std::string> TQDecibelFormatter::stringForObjectValue(
    const RWObjectValue& value) const {
    const std::optional<double> amplitude = value.number();
    if (!amplitude || std::isnan(*amplitude)) return std::nullopt;
    if (*amplitude <= 0.0) return std::string(kSilence) + " " + kUnit;
    char text[64];
    std::snprintf(text, sizeof text, "%.1f %s", BN_UIAmplitudeToDecibels(*amplitude), kUnit);
    return std::string(text);
}

bool TQDecibelFormatter::getObjectValue(RWObjectValue* value, const std::string& string,
                                        std::string* errorDescription) const {
    std::string text = trimmed(string);
    if (text.size() >= 2 && (text.ends_with("dB") || text.ends_with("db") || text.ends_with("DB")))
        text = trimmed(text.substr(0, text.size() - 2));
    if (text == kSilence) {
        if (value) *value = RWObjectValue(0.0);
        return true;
    }
    const std::optional<double> decibels = RWObjectValue::leadingNumber(text);
    // The whole text must be the number: "6 apples" is refused.
    char* end = nullptr;
    const double parsed = text.empty() ? 0.0 : std::strtod(text.c_str(), &end);
    if (!decibels || !end || *end != '\0' || !std::isfinite(parsed)) {
        if (errorDescription) *errorDescription = "Invalid number";
        return false;
    }
    if (value) *value = RWObjectValue(TQChannelDecibel::decibelsToAmplitude(parsed));
    return true;
}
