#include "src/panels/TQTimecodeStrings.h"

#include "platform/ui/RWExtendedTimecode.h"
#include "platform/ui/RWTimecodeFormatter.h"

std::optional<std::string> TarnTimeAndDropToTimecodeString(const CMTime& time,
                                                           const CMTime& frameDuration,
                                                           long dropFrame) {
    if (!CMTIME_IS_VALID(time) || !CMTIME_IS_VALID(frameDuration)) return std::nullopt;
    const RWExtendedTimecode timecode(time, frameDuration, dropFrame != 0);
    RWTimecodeFormatter formatter;
    formatter.setAllowsNegative(true);
    return formatter.stringForTimecode(timecode);
}

std::optional<std::string> TarnTimeToTimecodeString(const CMTime& time,
                                                    const CMTime& frameDuration) {
    return TarnTimeAndDropToTimecodeString(time, frameDuration, 0);
}
