#pragma once
// Times as timecode text for the editor's read-outs.
//
// The text is RWTimecodeFormatter's with negatives allowed: "HH:MM:SS:FF", "HH:MM:SS;FF" in
// drop-frame counting, a leading "-" before time zero, at the frame grid of `frameDuration`.
// Nothing (not an empty text) when either time lacks its valid flag, and equally when no
// timecode can be made of them (an infinite time, a frame duration that is not a positive
// time).

#include <optional>
#include <string>

#include "platform/media/CMTime.h"

// `dropFrame` nonzero asks for drop-frame counting, which rates other than 29.97 and 59.94
// do not have (their text stays non-drop).
std::optional<std::string> TarnTimeAndDropToTimecodeString(const CMTime& time,
                                                           const CMTime& frameDuration,
                                                           long dropFrame);
// Non-drop counting.
std::optional<std::string> TarnTimeToTimecodeString(const CMTime& time,
                                                    const CMTime& frameDuration);
