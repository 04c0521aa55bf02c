#include "platform/draw/HXDHitInfo.h"

#include <cmath>
#include <limits>

HXDNumber HXDNumber::numberWithInteger(int64_t value) {
    HXDNumber n;
    n._kind = Kind::Signed;
    n._v.s = value;
    return n;
}

HXDNumber HXDNumber::numberWithUnsignedLongLong(uint64_t value) {
    HXDNumber n;
    n._kind = Kind::Unsigned;
    n._v.u = value;
    return n;
}

HXDNumber HXDNumber::numberWithDouble(double value) {
    HXDNumber n;
    n._kind = Kind::Floating;
    n._v.d = value;
    return n;
}

namespace {
// A double to an integer type without the undefined behaviour of an out-of-range cast: NaN
// is 0, values beyond the range saturate.
template <class I>
I saturate(double d) {
    if (std::isnan(d)) return 0;
    if (d <= static_cast<double>(std::numeric_limits<I>::min()))
        return std::numeric_limits<I>::min();
    if (d >= static_cast<double>(std::numeric_limits<I>::max()))
        return std::numeric_limits<I>::max();
    return static_cast<I>(d);
}
}  // namespace

int64_t HXDNumber::integerValue() const {
    switch (_kind) {
        case Kind::Signed: return _v.s;
        case Kind::Unsigned: return static_cast<int64_t>(_v.u);
        case Kind::Floating: return saturate<int64_t>(_v.d);
    }
    return 0;
}

uint64_t HXDNumber::unsignedLongLongValue() const {
    switch (_kind) {
        case Kind::Signed: return static_cast<uint64_t>(_v.s);
        case Kind::Unsigned: return _v.u;
        case Kind::Floating:
            // Negative doubles follow the signed path, so that -1.0 reads as -1 does.
            return _v.d < 0.0 ? static_cast<uint64_t>(saturate<int64_t>(_v.d))
                              : saturate<uint64_t>(_v.d);
    }
    return 0;
}

double HXDNumber::doubleValue() const {
    switch (_kind) {
        case Kind::Signed: return static_cast<double>(_v.s);
        case Kind::Unsigned: return static_cast<double>(_v.u);
        case Kind::Floating: return _v.d;
    }
    return 0.0;
}

bool operator==(const HXDNumber& a, const HXDNumber& b) {
    using Kind = HXDNumber::Kind;
    if (a._kind == Kind::Floating || b._kind == Kind::Floating)
        return a.doubleValue() == b.doubleValue();
    if (a._kind == b._kind) return a._v.u == b._v.u;
    // One signed, one unsigned: equal only when the signed one is not negative.
    const int64_t s = a._kind == Kind::Signed ? a._v.s : b._v.s;
    const uint64_t u = a._kind == Kind::Unsigned ? a._v.u : b._v.u;
    return s >= 0 && static_cast<uint64_t>(s) == u;
}

void HXDExtraInfo::setObject(std::string_view key, HXDNumber value) {
    for (auto& entry : _entries) {
        if (entry.first == key) {
            entry.second = value;
            return;
        }
    }
    _entries.emplace_back(std::string(key), value);
}

const HXDNumber* HXDExtraInfo::objectForKey(std::string_view key) const {
    for (const auto& entry : _entries)
        if (entry.first == key) return &entry.second;
    return nullptr;
}

void HXDExtraInfo::removeObjectForKey(std::string_view key) {
    for (auto it = _entries.begin(); it != _entries.end(); ++it) {
        if (it->first == key) {
            _entries.erase(it);
            return;
        }
    }
}
