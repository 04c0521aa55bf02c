#pragma once
// 4x4 matrix of the core library, for float and double.
//
// Convention. Elements are stored row-major: at(row, col) is m[row * 4 + col]. Points and
// vectors are columns and are multiplied on the right: v' = M * v, so the translation of an
// affine matrix lives in the last column (at(0, 3), at(1, 3), at(2, 3)). A * B applies B
// first, then A.
//
// GPU APIs take the same matrix column-major (the translation in elements 12, 13, 14):
// fromColumnMajor / toColumnMajor convert, which is the transpose of the storage. The render
// controller keeps its installed projection column-major in single precision; the view's
// coordinate mapping turns it into this row-major form before it uses it.
//
// Precision. Every operation computes in T: BNMatrix44Tmpl<float>::ortho rounds the
// translation terms to single precision, exactly as the drawn frame sees them. transform()
// computes in the wider of T and the vector's type, so a float matrix applied to a double
// vector is evaluated in double.

#include <array>
#include <cstddef>
#include <type_traits>
#include <utility>

template <class T>
struct BNVector4Tmpl {
    T x{};
    T y{};
    T z{};
    T w{};
    friend constexpr bool operator==(const BNVector4Tmpl&, const BNVector4Tmpl&) = default;
};

template <class T>
class BNMatrix44Tmpl {
    static_assert(std::is_floating_point_v<T>, "BNMatrix44Tmpl is for float and double");

public:
    using value_type = T;

    // The zero matrix: what a render controller without a context answers.
    constexpr BNMatrix44Tmpl() = default;
    // Sixteen elements in row-major order.
    explicit constexpr BNMatrix44Tmpl(const std::array<T, 16>& rowMajor) : _m(rowMajor) {}
    // Conversion between precisions, element by element.
    template <class U>
    explicit constexpr BNMatrix44Tmpl(const BNMatrix44Tmpl<U>& other) {
        for (int i = 0; i < 16; ++i) _m[i] = static_cast<T>(other.data()[i]);
    }

    static constexpr BNMatrix44Tmpl zero() { return BNMatrix44Tmpl(); }
    static constexpr BNMatrix44Tmpl identity() {
        BNMatrix44Tmpl r;
        r._m[0] = r._m[5] = r._m[10] = r._m[15] = T(1);
        return r;
    }
    static constexpr BNMatrix44Tmpl translation(T tx, T ty, T tz) {
        BNMatrix44Tmpl r = identity();
        r._m[3] = tx;
        r._m[7] = ty;
        r._m[11] = tz;
        return r;
    }
    static constexpr BNMatrix44Tmpl scaling(T sx, T sy, T sz) {
        BNMatrix44Tmpl r;
        r._m[0] = sx;
        r._m[5] = sy;
        r._m[10] = sz;
        r._m[15] = T(1);
        return r;
    }

    // The conventional orthographic projection: [left, right] x [bottom, top] to x, y in
    // [-1, 1], and z from -near to [-1, 1] at -far (the eye looks down -z):
    //   x row: 2/(r-l), 0, 0, -(r+l)/(r-l)
    //   y row: 0, 2/(t-b), 0, -(t+b)/(t-b)
    //   z row: 0, 0, -2/(f-n), -(f+n)/(f-n)
    //   w row: 0, 0, 0, 1
    // A degenerate extent (r == l, t == b or f == n) gives the zero matrix, which inverts to
    // the singular answer below, rather than infinities.
    static BNMatrix44Tmpl ortho(T left, T right, T bottom, T top, T nearVal, T farVal);
    // The same with depth mapped to [0, 1] (near to 0, far to 1), as GPU clip space takes it:
    //   z row: 0, 0, -1/(f-n), -n/(f-n)
    // With near -1 and far 1 the z row is -0.5 and 0.5: the projection the curve views draw with.
    static BNMatrix44Tmpl orthoZeroToOne(T left, T right, T bottom, T top, T nearVal, T farVal);

    static constexpr BNMatrix44Tmpl fromColumnMajor(const T* columnMajor) {
        BNMatrix44Tmpl r;
        for (int row = 0; row < 4; ++row)
            for (int col = 0; col < 4; ++col) r._m[row * 4 + col] = columnMajor[col * 4 + row];
        return r;
    }
    constexpr void toColumnMajor(T* out) const {
        for (int row = 0; row < 4; ++row)
            for (int col = 0; col < 4; ++col) out[col * 4 + row] = _m[row * 4 + col];
    }

    // Checked access: an index outside 0..3 reads as zero and writes nowhere.
    constexpr T at(int row, int col) const {
        return inRange(row, col) ? _m[static_cast<std::size_t>(row * 4 + col)] : T(0);
    }
    constexpr void set(int row, int col, T value) {
        if (inRange(row, col)) _m[static_cast<std::size_t>(row * 4 + col)] = value;
    }
    constexpr const T* data() const { return _m.data(); }
    constexpr const std::array<T, 16>& elements() const { return _m; }

    BNMatrix44Tmpl multiply(const BNMatrix44Tmpl& rhs) const;
    friend BNMatrix44Tmpl operator*(const BNMatrix44Tmpl& a, const BNMatrix44Tmpl& b) {
        return a.multiply(b);
    }

    constexpr void transpose() {
        for (int row = 0; row < 4; ++row)
            for (int col = row + 1; col < 4; ++col) std::swap(_m[row * 4 + col], _m[col * 4 + row]);
    }
    constexpr BNMatrix44Tmpl transposed() const {
        BNMatrix44Tmpl r = *this;
        r.transpose();
        return r;
    }

    T determinant() const;

    // Inverts in place by Gauss-Jordan elimination with scaled partial pivoting. Answers
    // true on success. A singular matrix (a pivot that vanishes against its row's scale,
    // including any matrix with a zero row, and any matrix holding NaN or infinity) answers
    // false and becomes the zero matrix: points transformed by it come out as (0, 0, 0, 0),
    // whose perspective divide is NaN, so a failed inversion can't pass for a real answer.
    bool invert();
    // The inverse, or the zero matrix for a singular one; *ok (if given) tells which.
    BNMatrix44Tmpl inverted(bool* ok = nullptr) const;

    // M * v, computed in the wider of the two precisions.
    template <class U>
    constexpr BNVector4Tmpl<std::common_type_t<T, U>> transform(const BNVector4Tmpl<U>& v) const {
        using R = std::common_type_t<T, U>;
        const R in[4] = {static_cast<R>(v.x), static_cast<R>(v.y), static_cast<R>(v.z),
                         static_cast<R>(v.w)};
        R out[4];
        for (int row = 0; row < 4; ++row) {
            R sum = R(0);
            for (int col = 0; col < 4; ++col) sum += static_cast<R>(_m[row * 4 + col]) * in[col];
            out[row] = sum;
        }
        return {out[0], out[1], out[2], out[3]};
    }

    // A point (w = 1) through the matrix, divided by the resulting w when that is not 1. A
    // w of 0 (a point at infinity, or the zero matrix) follows IEEE division: infinities or
    // NaN, never a trap; callers that must tell test std::isfinite.
    template <class U>
    constexpr BNVector4Tmpl<std::common_type_t<T, U>> transformPoint(U x, U y, U z) const {
        auto r = transform(BNVector4Tmpl<U>{x, y, z, U(1)});
        return perspectiveDivide(r);
    }
    // A direction (w = 0): only the upper 3x3 part acts, no translation, no divide.
    template <class U>
    constexpr BNVector4Tmpl<std::common_type_t<T, U>> transformVector(U x, U y, U z) const {
        return transform(BNVector4Tmpl<U>{x, y, z, U(0)});
    }
    // x, y, z divided by w, and w set to 1; left as it is when w is already 1.
    template <class R>
    static constexpr BNVector4Tmpl<R> perspectiveDivide(BNVector4Tmpl<R> v) {
        if (v.w != R(1)) {
            v.x /= v.w;
            v.y /= v.w;
            v.z /= v.w;
            v.w = R(1);
        }
        return v;
    }

    friend constexpr bool operator==(const BNMatrix44Tmpl&, const BNMatrix44Tmpl&) = default;

private:
    static constexpr bool inRange(int row, int col) {
        return row >= 0 && row < 4 && col >= 0 && col < 4;
    }

    std::array<T, 16> _m{};
};

extern template class BNMatrix44Tmpl<float>;
extern template class BNMatrix44Tmpl<double>;

using BNMatrix44f = BNMatrix44Tmpl<float>;
using BNMatrix44d = BNMatrix44Tmpl<double>;
