#include "platform/geometry/BNMatrix44Tmpl.h"

#include <cmath>
#include <limits>

template <class T>
BNMatrix44Tmpl<T> BNMatrix44Tmpl<T>::ortho(T left, T right, T bottom, T top, T nearVal, T farVal) {
    const T w = right - left, h = top - bottom, d = farVal - nearVal;
    if (w == T(0) || h == T(0) || d == T(0)) return zero();
    BNMatrix44Tmpl r;
    r._m[0] = T(2) / w;
    r._m[3] = -(right + left) / w;
    r._m[5] = T(2) / h;
    r._m[7] = -(top + bottom) / h;
    r._m[10] = T(-2) / d;
    r._m[11] = -(farVal + nearVal) / d;
    r._m[15] = T(1);
    return r;
}

template <class T>
BNMatrix44Tmpl<T> BNMatrix44Tmpl<T>::orthoZeroToOne(T left, T right, T bottom, T top, T nearVal,
                                                    T farVal) {
    BNMatrix44Tmpl r = ortho(left, right, bottom, top, nearVal, farVal);
    if (r == zero()) return r;
    const T d = farVal - nearVal;
    r._m[10] = T(-1) / d;
    r._m[11] = -nearVal / d;
    return r;
}

template <class T>
BNMatrix44Tmpl<T> BNMatrix44Tmpl<T>::multiply(const BNMatrix44Tmpl& rhs) const {
    BNMatrix44Tmpl r;
    for (int row = 0; row < 4; ++row) {
        for (int col = 0; col < 4; ++col) {
            T sum = T(0);
            for (int k = 0; k < 4; ++k) sum += _m[row * 4 + k] * rhs._m[k * 4 + col];
            r._m[row * 4 + col] = sum;
        }
    }
    return r;
}

template <class T>
T BNMatrix44Tmpl<T>::determinant() const {
    // Laplace expansion along the first two rows: six 2x2 minors of the top pair times their
    // complements in the bottom pair.
    const T* m = _m.data();
    const T s0 = m[0] * m[5] - m[1] * m[4];
    const T s1 = m[0] * m[6] - m[2] * m[4];
    const T s2 = m[0] * m[7] - m[3] * m[4];
    const T s3 = m[1] * m[6] - m[2] * m[5];
    const T s4 = m[1] * m[7] - m[3] * m[5];
    const T s5 = m[2] * m[7] - m[3] * m[6];
    const T c5 = m[10] * m[15] - m[11] * m[14];
    const T c4 = m[9] * m[15] - m[11] * m[13];
    const T c3 = m[9] * m[14] - m[10] * m[13];
    const T c2 = m[8] * m[15] - m[11] * m[12];
    const T c1 = m[8] * m[14] - m[10] * m[12];
    const T c0 = m[8] * m[13] - m[9] * m[12];
    return s0 * c5 - s1 * c4 + s2 * c3 + s3 * c2 - s4 * c1 + s5 * c0;
}

template <class T>
bool BNMatrix44Tmpl<T>::invert() {
    // Gauss-Jordan on [A | I]. Each row's pivot candidate is weighed against the largest
    // element of its row (scaled partial pivoting), so that a row of large numbers does not
    // win over a well-conditioned one, and a pivot that is rounding noise against its row
    // (relative size below a few ulps) marks the matrix singular.
    T a[4][4], inv[4][4], scale[4];
    for (int row = 0; row < 4; ++row) {
        T largest = T(0);
        for (int col = 0; col < 4; ++col) {
            const T v = _m[row * 4 + col];
            if (!std::isfinite(v)) {
                *this = zero();
                return false;
            }
            a[row][col] = v;
            inv[row][col] = row == col ? T(1) : T(0);
            largest = std::fmax(largest, std::fabs(v));
        }
        if (largest == T(0)) {
            *this = zero();
            return false;
        }
        scale[row] = largest;
    }

    const T tiny = T(4) * std::numeric_limits<T>::epsilon();
    for (int col = 0; col < 4; ++col) {
        int pivot = col;
        T best = T(-1);
        for (int row = col; row < 4; ++row) {
            const T weight = std::fabs(a[row][col]) / scale[row];
            if (weight > best) {
                best = weight;
                pivot = row;
            }
        }
        if (!(best > tiny)) {
            *this = zero();
            return false;
        }
        if (pivot != col) {
            for (int k = 0; k < 4; ++k) {
                std::swap(a[pivot][k], a[col][k]);
                std::swap(inv[pivot][k], inv[col][k]);
            }
            std::swap(scale[pivot], scale[col]);
        }
        const T p = a[col][col];
        for (int k = 0; k < 4; ++k) {
            a[col][k] /= p;
            inv[col][k] /= p;
        }
        for (int row = 0; row < 4; ++row) {
            if (row == col) continue;
            const T f = a[row][col];
            if (f == T(0)) continue;
            for (int k = 0; k < 4; ++k) {
                a[row][k] -= f * a[col][k];
                inv[row][k] -= f * inv[col][k];
            }
        }
    }

    for (int row = 0; row < 4; ++row) {
        for (int col = 0; col < 4; ++col) {
            if (!std::isfinite(inv[row][col])) {
                *this = zero();
                return false;
            }
            _m[row * 4 + col] = inv[row][col];
        }
    }
    return true;
}

template <class T>
BNMatrix44Tmpl<T> BNMatrix44Tmpl<T>::inverted(bool* ok) const {
    BNMatrix44Tmpl r = *this;
    const bool success = r.invert();
    if (ok) *ok = success;
    return r;
}

template class BNMatrix44Tmpl<float>;
template class BNMatrix44Tmpl<double>;
