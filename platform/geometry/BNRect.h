#pragma once
// The core library's rectangle: x, y, width, height of one numeric type. The curve editor's
// saved state keeps its view volume in a BNRect<double>; the conversions to and from CGRect
// are exact for double and carry the fields as they stand (a negative size stays negative).
//
// Like CGRect, a rectangle with a negative width or height covers the area of its
// standardized form; the edge queries and set operations answer for that form.

#include "platform/geometry/CGGeometry.h"

#include <algorithm>
#include <type_traits>

template <class T>
struct BNRect {
    static_assert(std::is_arithmetic_v<T>, "BNRect holds numbers");

    T x{};
    T y{};
    T width{};
    T height{};

    constexpr BNRect() = default;
    constexpr BNRect(T x_, T y_, T width_, T height_)
        : x(x_), y(y_), width(width_), height(height_) {}

    static constexpr BNRect fromCGRect(const CGRect& r) {
        return BNRect(static_cast<T>(r.origin.x), static_cast<T>(r.origin.y),
                      static_cast<T>(r.size.width), static_cast<T>(r.size.height));
    }
    constexpr CGRect toCGRect() const {
        return CGRectMake(static_cast<CGFloat>(x), static_cast<CGFloat>(y),
                          static_cast<CGFloat>(width), static_cast<CGFloat>(height));
    }

    // Origin at the least corner, size not negative.
    constexpr BNRect standardized() const {
        BNRect r = *this;
        if (r.width < T{}) {
            r.x += r.width;
            r.width = -r.width;
        }
        if (r.height < T{}) {
            r.y += r.height;
            r.height = -r.height;
        }
        return r;
    }

    constexpr T minX() const { return std::min(x, static_cast<T>(x + width)); }
    constexpr T maxX() const { return std::max(x, static_cast<T>(x + width)); }
    constexpr T minY() const { return std::min(y, static_cast<T>(y + height)); }
    constexpr T maxY() const { return std::max(y, static_cast<T>(y + height)); }

    // No area: a zero width or height (a NaN extent counts too).
    constexpr bool isEmpty() const {
        return !(width != T{} && height != T{}) || width != width || height != height;
    }

    // Half-open like CGRectContainsPoint: the maximum edges are outside.
    constexpr bool contains(T px, T py) const {
        return !isEmpty() && px >= minX() && px < maxX() && py >= minY() && py < maxY();
    }

    // The least rectangle holding both; an empty operand still widens it (a zero-size
    // rectangle stands for a point here, unlike the null rectangle of CGRectUnion).
    constexpr BNRect united(const BNRect& o) const {
        const T x0 = std::min(minX(), o.minX()), y0 = std::min(minY(), o.minY());
        const T x1 = std::max(maxX(), o.maxX()), y1 = std::max(maxY(), o.maxY());
        return BNRect(x0, y0, static_cast<T>(x1 - x0), static_cast<T>(y1 - y0));
    }

    // The common part, or a zero rectangle at the origin when the two share no area.
    constexpr BNRect intersected(const BNRect& o) const {
        const T x0 = std::max(minX(), o.minX()), y0 = std::max(minY(), o.minY());
        const T x1 = std::min(maxX(), o.maxX()), y1 = std::min(maxY(), o.maxY());
        if (!(x1 > x0) || !(y1 > y0)) return BNRect();
        return BNRect(x0, y0, static_cast<T>(x1 - x0), static_cast<T>(y1 - y0));
    }

    constexpr bool intersects(const BNRect& o) const { return !intersected(o).isEmpty(); }

    // Field by field, as stored state is compared.
    friend constexpr bool operator==(const BNRect&, const BNRect&) = default;
};
