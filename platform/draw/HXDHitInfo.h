#pragma once
// What a primitive answers when a hit test finds it: a 32-bit hit id and a small dictionary
// of numbers (for the curve views: "ID" the item's channel id, "Handle" a keyframe handle).

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

// A number as a dictionary holds it: signed, unsigned or floating, read back in any of the
// three forms with the usual conversions (a negative integer read unsigned wraps, as a
// two's-complement reinterpretation does; a double read as an integer truncates toward zero
// and saturates instead of overflowing).
class HXDNumber {
public:
    static HXDNumber numberWithInteger(int64_t value);
    static HXDNumber numberWithUnsignedLongLong(uint64_t value);
    static HXDNumber numberWithDouble(double value);

    int64_t integerValue() const;
    uint64_t unsignedLongValue() const { return unsignedLongLongValue(); }
    uint64_t unsignedLongLongValue() const;
    double doubleValue() const;

    // By value, as numbers compare: 1 (signed), 1u and 1.0 are equal; -1 and 2^64-1 are not.
    friend bool operator==(const HXDNumber& a, const HXDNumber& b);

private:
    enum class Kind : uint8_t { Signed, Unsigned, Floating };
    Kind _kind = Kind::Signed;
    union {
        int64_t s;
        uint64_t u;
        double d;
    } _v{0};
};

// A small mutable dictionary from string keys to numbers. It holds a handful of entries, so
// it is a flat list searched in order; setting a present key replaces its value in place.
class HXDExtraInfo {
public:
    void setObject(std::string_view key, HXDNumber value);
    // Room for `count` entries: a dictionary filled per primitive grows once.
    void reserve(size_t count) { _entries.reserve(count); }
    // Null when the key is absent.
    const HXDNumber* objectForKey(std::string_view key) const;
    void removeObjectForKey(std::string_view key);
    size_t count() const { return _entries.size(); }
    bool empty() const { return _entries.empty(); }
    const std::vector<std::pair<std::string, HXDNumber>>& entries() const { return _entries; }

    friend bool operator==(const HXDExtraInfo&, const HXDExtraInfo&) = default;

private:
    std::vector<std::pair<std::string, HXDNumber>> _entries;
};

// The hit id and the dictionary of one primitive.
class HXDHitInfo {
public:
    uint32_t hitID() const { return _hitID; }
    void setHitID(uint32_t hitID) { _hitID = hitID; }
    const HXDExtraInfo& extraInfo() const { return _extraInfo; }
    HXDExtraInfo& extraInfo() { return _extraInfo; }
    void setExtraInfo(HXDExtraInfo extraInfo) { _extraInfo = std::move(extraInfo); }

private:
    uint32_t _hitID = 0;
    HXDExtraInfo _extraInfo;
};
