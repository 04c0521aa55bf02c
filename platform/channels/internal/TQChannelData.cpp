#include "platform/channels/internal/TQChannelData.h"

#include <algorithm>
#include <atomic>
#include <cmath>
#include <limits>

#include "platform/channels/TQChannel.h"

namespace tq_internal {

bool sameState(const TQKeyframeRecord& a, const TQKeyframeRecord& b) {
    return CMTimeIdentical(a.time, b.time) && a.value == b.value && a.inU == b.inU &&
           a.inV == b.inV && a.outU == b.outU && a.outV == b.outV &&
           a.interpolation == b.interpolation && a.locked == b.locked && a.enabled == b.enabled &&
           a.broken == b.broken && a.scaled == b.scaled;
}

unsigned mirroredInterpolation(unsigned code) {
    switch (code) {
        case kTQInterpolationExp: return kTQInterpolationLog;
        case kTQInterpolationLog: return kTQInterpolationExp;
        case kTQInterpolationEaseOut: return kTQInterpolationEaseIn;
        case kTQInterpolationEaseIn: return kTQInterpolationEaseOut;
        default: return code;
    }
}

void autoTangents(std::vector<TQKeyframeRecord>& keys, size_t pos) {
    TQKeyframeRecord& k = keys[pos];
    const TQKeyframeRecord* prev = pos > 0 ? &keys[pos - 1] : nullptr;
    const TQKeyframeRecord* next = pos + 1 < keys.size() ? &keys[pos + 1] : nullptr;
    double slope = 0.0;
    if (prev && next) {
        const bool extreme = (k.value >= prev->value && k.value >= next->value) ||
                             (k.value <= prev->value && k.value <= next->value);
        const double span = next->seconds - prev->seconds;
        if (!extreme && span > 0.0) slope = (next->value - prev->value) / span;
    }
    // At an end both handles take the one segment's third.
    double lenOut = next ? (next->seconds - k.seconds) / 3.0 : 0.0;
    const double lenIn = prev ? (k.seconds - prev->seconds) / 3.0 : lenOut;
    if (!next) lenOut = lenIn;
    k.inU = -lenIn;
    k.inV = -lenIn * slope;
    k.outU = lenOut;
    k.outV = lenOut * slope;
    k.broken = false;
}

uint64_t nextKeyframeSerial() {
    // Shared by all channels, so that a handle from one channel can never name a keyframe of
    // another, not even after an assignment of state copies serials across.
    static std::atomic<uint64_t> counter{0};
    return ++counter;
}

long TQChannelData::indexOf(const void* handle) const {
    const uint64_t serial = serialOf(handle);
    if (serial == 0) return -1;
    if (!indexValid) {
        index.clear();
        index.reserve(keys.size());
        for (size_t i = 0; i < keys.size(); ++i) index.emplace(keys[i].serial, i);
        indexValid = true;
    }
    const auto it = index.find(serial);
    return it == index.end() ? -1 : long(it->second);
}

const TQKeyframeRecord* TQChannelData::find(const void* handle) const {
    const long i = indexOf(handle);
    return i < 0 ? nullptr : &keys[size_t(i)];
}

TQKeyframeRecord* TQChannelData::find(const void* handle) {
    const long i = indexOf(handle);
    return i < 0 ? nullptr : &keys[size_t(i)];
}

size_t TQChannelData::lowerBound(const CMTime& time) const {
    size_t lo = 0, hi = keys.size();
    while (lo < hi) {
        const size_t mid = lo + (hi - lo) / 2;
        if (compareTimes(keys[mid].time, time) < 0) {
            lo = mid + 1;
        } else {
            hi = mid;
        }
    }
    return lo;
}

size_t TQChannelData::upperBound(const CMTime& time) const {
    size_t lo = 0, hi = keys.size();
    while (lo < hi) {
        const size_t mid = lo + (hi - lo) / 2;
        if (compareTimes(keys[mid].time, time) <= 0) {
            lo = mid + 1;
        } else {
            hi = mid;
        }
    }
    return lo;
}

long TQChannelData::lastAt(const CMTime& time) const {
    const size_t ub = upperBound(time);
    if (ub == 0 || compareTimes(keys[ub - 1].time, time) != 0) return -1;
    return long(ub - 1);
}

size_t TQChannelData::insert(const TQKeyframeRecord& record) {
    const size_t position = upperBound(record.time);
    keys.insert(keys.begin() + long(position), record);
    curveChanged();
    // Keep the index in step for the keyframes that shifted: as cheap as the vector's own
    // shift, and O(1) for the common append at the end.
    if (indexValid) {
        for (size_t i = position; i < keys.size(); ++i) index[keys[i].serial] = i;
    }
    return position;
}

void TQChannelData::eraseAt(size_t position) {
    if (position >= keys.size()) return;
    if (indexValid) index.erase(keys[position].serial);
    keys.erase(keys.begin() + long(position));
    curveChanged();
    if (indexValid) {
        for (size_t i = position; i < keys.size(); ++i) index[keys[i].serial] = i;
    }
}

size_t TQChannelData::retime(size_t position, const CMTime& time) {
    if (position >= keys.size()) return position;
    curveChanged();
    // The new place: after every other keyframe at an equal or earlier time. Moving later,
    // the keyframe itself is among those counted by upperBound; moving earlier, it is not.
    const bool later = compareTimes(time, keys[position].time) >= 0;
    size_t target = upperBound(time);
    if (later) --target;
    keys[position].time = time;
    keys[position].seconds = CMTimeGetSeconds(time);
    if (target == position) return position;  // a drag step usually stays between its neighbours

    // Only the keyframes between the old and the new place shift by one.
    const auto first = keys.begin() + long(std::min(position, target));
    const auto last = keys.begin() + long(std::max(position, target)) + 1;
    if (target > position) {
        std::rotate(first, first + 1, last);
    } else {
        std::rotate(first, last - 1, last);
    }
    if (indexValid) {
        for (size_t i = std::min(position, target), end = std::max(position, target); i <= end;
             ++i) {
            index[keys[i].serial] = i;
        }
    }
    return target;
}

const TQChannelData::Extremes& TQChannelData::extremes() const {
    if (extremesValid) return extremesCache;
    constexpr double kInf = std::numeric_limits<double>::infinity();
    double minAll = kInf, maxAll = -kInf, minEnabled = kInf, maxEnabled = -kInf;
    for (const TQKeyframeRecord& k : keys) {
        minAll = std::min(minAll, k.value);
        maxAll = std::max(maxAll, k.value);
        if (!k.enabled) continue;
        minEnabled = std::min(minEnabled, k.value);
        maxEnabled = std::max(maxEnabled, k.value);
    }
    auto orInitial = [&](double v) { return std::isinf(v) ? initialValue : v; };
    extremesCache = {orInitial(minAll), orInitial(maxAll), orInitial(minEnabled),
                     orInitial(maxEnabled)};
    extremesValid = true;
    return extremesCache;
}

const CurveCache& TQChannelData::curve() const {
    if (!cacheValid) {
        cache.build(keys, discrete, initialValue, extrapolationBefore, extrapolationAfter);
        cacheValid = true;
    }
    return cache;
}

}  // namespace tq_internal
