#pragma once
// A span of time given by its start and duration.
#include "platform/media/CMTime.h"

struct BNTimeRange {
    CMTime start = kCMTimeZero;
    CMTime duration = kCMTimeZero;

    CMTime end() const { return CMTimeAdd(start, duration); }
    bool contains(const CMTime& t) const {
        return CMTimeCompare(start, t) <= 0 && CMTimeCompare(t, end()) < 0;
    }
    friend bool operator==(const BNTimeRange& a, const BNTimeRange& b) {
        return a.start == b.start && a.duration == b.duration;
    }
};
