#pragma once
// The number format of inspector fields: a fixed count of decimals, an optional suffix, and a
// range into which typed numbers are clamped (never refused).

#include <limits>
#include <memory>
#include <string>

#include "platform/ui/RWFormatter.h"

class TQInspNumberFormatter : public RWFormatter {
public:
    static std::unique_ptr<TQInspNumberFormatter> formatterWithSuffix(const std::string& suffix,
                                                                      double min, double max,
                                                                      int decimalDigits);
    double minimum() const { return _min; }
    void setMinimum(double min) { _min = min; }
    double maximum() const { return _max; }
    void setMaximum(double max) { _max = max; }
    int decimalDigits() const { return _digits; }
    void setDecimalDigits(int digits) { _digits = digits; }
    const std::string& suffix() const { return _suffix; }

    std::optional<std::string> stringForObjectValue(const RWObjectValue& value) const override;
    // A number, with or without the suffix, clamped to the range; anything else is refused.
    bool getObjectValue(RWObjectValue* value, const std::string& string,
                        std::string* errorDescription) const override;

private:
    std::string _suffix;
    double _min = -std::numeric_limits<double>::infinity();
    double _max = std::numeric_limits<double>::infinity();
    int _digits = 2;
};
