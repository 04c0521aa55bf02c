#pragma once
// Values of a decibel channel in the channel list: the channel keeps an amplitude, the list
// shows and takes decibels ("-6.0 dB"). Amplitude 0 and below is silence, shown as "-inf dB"
// and typed back as "-inf". Typed text reads with or without its unit; any other text is
// refused. Stateless: one instance may serve any number of cells.

#include "platform/ui/RWFormatter.h"

class TQDecibelFormatter : public RWFormatter {
public:
    std::optional<std::string> stringForObjectValue(const RWObjectValue& value) const override;
    // Accepted text gives the amplitude.
    bool getObjectValue(RWObjectValue* value, const std::string& string,
                        std::string* errorDescription) const override;
};
