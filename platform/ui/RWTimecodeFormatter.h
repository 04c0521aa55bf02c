#pragma once
// Timecode text: "HH:MM:SS:FF", with ";" before the frames when the counting is drop frame
// ("00:01:00;02"), and a leading "-" before time zero when negatives are allowed. Hours take
// two digits or more, minutes and seconds two, frames as many as the nominal rate needs (two
// up to 99 frames a second).
//
// A formatter for timecode fields: its object values are numbers of seconds, shown as the
// timecode of the frame they fall in at the formatter's frame duration and counting; typed
// text is read back into the seconds of its frame's start. Text is read leniently: one to four
// fields of digits split by ":" or ";" (or "."), the last being frames ("12" is frame 12,
// "1:00" one second), blanks around it ignored; the counting is the formatter's, whatever the
// separators say.

#include <optional>
#include <string>

#include "platform/media/CMTime.h"
#include "platform/ui/RWExtendedTimecode.h"
#include "platform/ui/RWFormatter.h"

class RWTimecodeFormatter : public RWFormatter {
public:
    // False at first: a negative timecode has no text, and "-" is refused.
    bool allowsNegative() const { return _allowsNegative; }
    void setAllowsNegative(bool allows) { _allowsNegative = allows; }
    // The frame grid for object values and typed text; 1/30 s, non-drop, at first. A frame
    // duration that is not a positive numeric time leaves every value without text.
    const CMTime& frameDuration() const { return _frameDuration; }
    void setFrameDuration(const CMTime& frameDuration) { _frameDuration = frameDuration; }
    bool dropFrame() const { return _dropFrame; }
    void setDropFrame(bool dropFrame) { _dropFrame = dropFrame; }

    // The text of a timecode; nothing for an invalid one, or a negative one while negatives
    // are not allowed.
    std::optional<std::string> stringForTimecode(const RWExtendedTimecode& timecode) const;
    // The timecode typed text names, or nothing (with the reason in errorDescription).
    std::optional<RWExtendedTimecode> timecodeForString(const std::string& string,
                                                        std::string* errorDescription) const;

    // A number of seconds as timecode; nothing for any other value.
    std::optional<std::string> stringForObjectValue(const RWObjectValue& value) const override;
    // The seconds at the start of the typed frame, as a number.
    bool getObjectValue(RWObjectValue* value, const std::string& string,
                        std::string* errorDescription) const override;
    // Only digits, separators, blanks and (when allowed) a leading "-" may be typed.
    bool isPartialStringValid(const std::string& partialString, std::string* newString,
                              std::string* errorDescription) const override;

private:
    bool _allowsNegative = false;
    CMTime _frameDuration = CMTimeMake(1, 30);
    bool _dropFrame = false;
};
