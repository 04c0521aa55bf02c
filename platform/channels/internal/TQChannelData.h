#pragma once
// Internal: the state behind a TQChannel. The keyframe table is a vector kept in time order
// (equal times in arrival order); handles map to positions through an index that is rebuilt
// lazily after the order changes, and the evaluation cache is rebuilt lazily after any edit.

#include <cstdint>
#include <memory>
#include <unordered_map>
#include <vector>

#include "platform/channels/TQChannelBehavior.h"
#include "platform/channels/internal/TQCurveCache.h"
#include "platform/media/CMTime.h"

namespace tq_internal {

struct TQKeyframeRecord {
    uint64_t serial = 0;  // the handle; process-wide, never reused
    CMTime time = kCMTimeZero;
    double seconds = 0.0;  // CMTimeGetSeconds(time), cached for evaluation
    double value = 0.0;
    double inU = 0.0;  // input handle offset; u <= 0 when well formed
    double inV = 0.0;
    double outU = 0.0;  // output handle offset; u >= 0 when well formed
    double outV = 0.0;
    unsigned interpolation = 4;
    bool locked = false;
    bool enabled = true;
    bool broken = false;
    bool scaled = false;
};

// Field by field, times with CMTimeIdentical; the serial is identity, not state.
bool sameState(const TQKeyframeRecord& a, const TQKeyframeRecord& b);

uint64_t nextKeyframeSerial();

// The code of a segment run backwards in time: the eased end and the exponential shapes swap.
unsigned mirroredInterpolation(unsigned code);

// Automatic handles of the keyframe at `pos` from its neighbours in the table: the slope of the
// chord through them (Catmull-Rom), flat at an extreme and at the ends so that the curve does
// not overshoot its keyframes; each handle a third of its segment long, or of the other segment
// at an end; unbroken.
void autoTangents(std::vector<TQKeyframeRecord>& keys, size_t pos);

// CMTimeCompare with a shortcut for the common case of two numeric times on one timescale,
// which is every comparison between keyframes set on the editor's grid.
inline int32_t compareTimes(const CMTime& a, const CMTime& b) {
    constexpr CMTimeFlags kKind = kCMTimeFlags_Valid | kCMTimeFlags_ImpliedValueFlagsMask;
    if (a.timescale == b.timescale && a.timescale > 0 && (a.flags & kKind) == kCMTimeFlags_Valid &&
        (b.flags & kKind) == kCMTimeFlags_Valid) {
        return a.value < b.value ? -1 : (a.value > b.value ? 1 : 0);
    }
    return CMTimeCompare(a, b);
}

inline void* handleOf(uint64_t serial) {
    return reinterpret_cast<void*>(static_cast<uintptr_t>(serial));
}
inline uint64_t serialOf(const void* handle) {
    return static_cast<uint64_t>(reinterpret_cast<uintptr_t>(handle));
}

struct TQChannelData {
    std::vector<TQKeyframeRecord> keys;
    double initialValue = 0.0;
    double defaultValue = 0.0;
    double sliderMaximum = 100.0;
    unsigned defaultInterpolation = 4;
    unsigned extrapolationBefore = 0;
    unsigned extrapolationAfter = 0;
    bool animationEnabled = true;
    bool discrete = false;
    bool rigged = false;
    CMTime currentAxisTime = kCMTimeZero;
    std::vector<std::unique_ptr<TQChannelBehavior>> behaviors;

    // Position of a live handle in `keys`, or -1.
    long indexOf(const void* handle) const;
    const TQKeyframeRecord* find(const void* handle) const;
    TQKeyframeRecord* find(const void* handle);

    // Inserts after every keyframe at an equal or earlier time; answers the position.
    size_t insert(const TQKeyframeRecord& record);
    void eraseAt(size_t position);
    // Takes the keyframe at `position` out and puts it back at `time`, arriving last there;
    // answers its new position. Costs a binary search plus the keyframes it passes over.
    size_t retime(size_t position, const CMTime& time);
    // First position whose time is not earlier than `time` / later than `time`.
    size_t lowerBound(const CMTime& time) const;
    size_t upperBound(const CMTime& time) const;
    // Last keyframe of the run exactly at `time`, or -1.
    long lastAt(const CMTime& time) const;

    // Call after any change of the keyframes' order or membership / of anything evaluated
    // (values, enabled flags and the initial value included).
    void orderChanged() {
        indexValid = false;
        curveChanged();
    }
    void curveChanged() {
        cacheValid = false;
        extremesValid = false;
    }
    const CurveCache& curve() const;

    // Least and greatest keyframe value, over every keyframe and over the enabled ones; with
    // no keyframe counted, the initial value. Measured once after each edit: a view reads
    // them for every curve at every update.
    struct Extremes {
        double minAll = 0.0;
        double maxAll = 0.0;
        double minEnabled = 0.0;
        double maxEnabled = 0.0;
    };
    const Extremes& extremes() const;

    mutable std::unordered_map<uint64_t, size_t> index;
    mutable bool indexValid = false;
    mutable CurveCache cache;
    mutable bool cacheValid = false;
    mutable Extremes extremesCache;
    mutable bool extremesValid = false;
};

}  // namespace tq_internal
