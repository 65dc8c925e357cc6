#pragma once
// A 3 by 3 matrix: the linear part of a transform. Stored column after column in _m; element
// (row, col) is _m[col * 3 + row]. Vectors are columns.
#include <ostream>

#include "geVector3.h"

namespace Zr {

template <class T>
struct GeLinearMatrix3 {
    T _m[9] = {T(1), T(0), T(0), T(0), T(1), T(0), T(0), T(0), T(1)};  // identity by default

    constexpr GeLinearMatrix3() = default;
    // The elements as read row by row.
    constexpr GeLinearMatrix3(T m00, T m01, T m02, T m10, T m11, T m12, T m20, T m21, T m22)
        : _m{m00, m10, m20, m01, m11, m21, m02, m12, m22} {}
    // The matrix with the given columns.
    static constexpr GeLinearMatrix3 makeFromColumns(const GeVector3<T>& c0, const GeVector3<T>& c1,
                                                     const GeVector3<T>& c2) {
        return {c0.x, c1.x, c2.x, c0.y, c1.y, c2.y, c0.z, c1.z, c2.z};
    }
    template <class U>
    constexpr explicit GeLinearMatrix3(const GeLinearMatrix3<U>& o) : _m{} {
        for (int i = 0; i < 9; ++i) _m[i] = static_cast<T>(o._m[i]);
    }

    constexpr T& operator()(int row, int col) { return _m[col * 3 + row]; }
    constexpr const T& operator()(int row, int col) const { return _m[col * 3 + row]; }

    constexpr void setIdentity() { *this = GeLinearMatrix3(); }
    static constexpr GeLinearMatrix3 makeIdentity() { return GeLinearMatrix3(); }
    static constexpr GeLinearMatrix3 makeScale(T sx, T sy, T sz) { return {sx, 0, 0, 0, sy, 0, 0, 0, sz}; }

    constexpr GeVector3<T> getColumn(int col) const { return {_m[col * 3], _m[col * 3 + 1], _m[col * 3 + 2]}; }
    constexpr GeVector3<T> getRow(int row) const { return {_m[row], _m[3 + row], _m[6 + row]}; }

    // The product; a * b applies b first.
    constexpr GeLinearMatrix3 operator*(const GeLinearMatrix3& b) const {
        GeLinearMatrix3 r;
        for (int c = 0; c < 3; ++c)
            for (int row = 0; row < 3; ++row)
                r(row, c) = (*this)(row, 0) * b(0, c) + (*this)(row, 1) * b(1, c) + (*this)(row, 2) * b(2, c);
        return r;
    }
    constexpr GeVector3<T> operator*(const GeVector3<T>& v) const {
        return {_m[0] * v.x + _m[3] * v.y + _m[6] * v.z, _m[1] * v.x + _m[4] * v.y + _m[7] * v.z,
                _m[2] * v.x + _m[5] * v.y + _m[8] * v.z};
    }
    constexpr GeLinearMatrix3 operator*(T s) const {
        GeLinearMatrix3 r = *this;
        for (T& e : r._m) e *= s;
        return r;
    }
    // The vector taken as a row, multiplied by this matrix on its right: v^T * M.
    constexpr GeVector3<T> mulOnRight(const GeVector3<T>& v) const {
        return {v.x * _m[0] + v.y * _m[1] + v.z * _m[2], v.x * _m[3] + v.y * _m[4] + v.z * _m[5],
                v.x * _m[6] + v.y * _m[7] + v.z * _m[8]};
    }
    constexpr bool operator==(const GeLinearMatrix3& o) const {
        for (int i = 0; i < 9; ++i)
            if (_m[i] != o._m[i]) return false;
        return true;
    }
    constexpr bool operator!=(const GeLinearMatrix3& o) const { return !(*this == o); }

    constexpr T computeDeterminant() const {
        const GeLinearMatrix3& a = *this;
        return a(0, 0) * (a(1, 1) * a(2, 2) - a(1, 2) * a(2, 1)) - a(0, 1) * (a(1, 0) * a(2, 2) - a(1, 2) * a(2, 0)) +
               a(0, 2) * (a(1, 0) * a(2, 1) - a(1, 1) * a(2, 0));
    }
    constexpr GeLinearMatrix3 getTransposed() const {
        return {_m[0], _m[1], _m[2], _m[3], _m[4], _m[5], _m[6], _m[7], _m[8]};
    }
    // The inverse by the adjugate; undefined for a singular matrix.
    constexpr GeLinearMatrix3 computeInverse() const {
        const GeLinearMatrix3& a = *this;
        GeLinearMatrix3 r(a(1, 1) * a(2, 2) - a(1, 2) * a(2, 1), a(0, 2) * a(2, 1) - a(0, 1) * a(2, 2),
                          a(0, 1) * a(1, 2) - a(0, 2) * a(1, 1), a(1, 2) * a(2, 0) - a(1, 0) * a(2, 2),
                          a(0, 0) * a(2, 2) - a(0, 2) * a(2, 0), a(0, 2) * a(1, 0) - a(0, 0) * a(1, 2),
                          a(1, 0) * a(2, 1) - a(1, 1) * a(2, 0), a(0, 1) * a(2, 0) - a(0, 0) * a(2, 1),
                          a(0, 0) * a(1, 1) - a(0, 1) * a(1, 0));
        const T det = a(0, 0) * r(0, 0) + a(0, 1) * r(1, 0) + a(0, 2) * r(2, 0);
        return r * (T(1) / det);
    }

    void dump(std::ostream& os) const {
        os << " _m:";
        for (int r = 0; r < 3; ++r)
            os << " [" << (*this)(r, 0) << ' ' << (*this)(r, 1) << ' ' << (*this)(r, 2) << ']';
    }
};

template <class T>
std::ostream& operator<<(std::ostream& os, const GeLinearMatrix3<T>& m) { m.dump(os); return os; }

}  // namespace Zr
