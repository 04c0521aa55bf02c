#include "src/panels/TQFormatters.h"

#include <algorithm>
#include <cctype>

#include "src/panels/TQCurveBundle.h"

namespace {

constexpr const char* kOnKey = "Curve Editor Flag Value On";
constexpr const char* kOffKey = "Curve Editor Flag Value Off";

std::string folded(std::string_view text) {
    while (!text.empty() && std::isspace(static_cast<unsigned char>(text.front())))
        text.remove_prefix(1);
    while (!text.empty() && std::isspace(static_cast<unsigned char>(text.back())))
        text.remove_suffix(1);
    std::string out(text);
    std::transform(out.begin(), out.end(), out.begin(),
                   [](unsigned char c) { return static_cast<char>(std::tolower(c)); });
    return out;
}

}  // namespace

std::optional<std::string> TQBoolFormatter::stringForObjectValue(const RWObjectValue& value) const {
    return vantaCurveEditorBundle().localizedStringForKey(value.intValue() == 1 ? kOnKey : kOffKey);
}

bool TQBoolFormatter::getObjectValue(RWObjectValue* value, const std::string& string,
                                     std::string* errorDescription) const {
    const TQCurveEditorBundle& bundle = vantaCurveEditorBundle();
    const std::string typed = folded(string);
    for (const auto& [key, number] : {std::pair{kOnKey, 1}, std::pair{kOffKey, 0}}) {
        if (typed != folded(bundle.localizedStringForKey(key))) continue;
        if (value) *value = number;
        return true;
    }
    if (errorDescription)
        *errorDescription = "Type " + bundle.localizedStringForKey(kOnKey) + " or " +
                            bundle.localizedStringForKey(kOffKey) + ".";
    return false;
}

std::optional<std::string> TQEmptyFormatter::stringForObjectValue(
    const RWObjectValue& value) const {
    if (value.isNil()) return std::nullopt;
    return value.stringValue();
}

bool TQEmptyFormatter::getObjectValue(RWObjectValue* value, const std::string& string,
                                      std::string*) const {
    if (value) *value = RWObjectValue::leadingNumber(string).value_or(0.0);
    return true;
}
