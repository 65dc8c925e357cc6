#pragma once
// An affine transform of space as a 4 by 4 matrix whose bottom row is (0, 0, 0, 1). Stored
// column after column in _m; element (row, col) is _m[col * 4 + row]. Columns 0 to 2 are the
// linear part, column 3 the translation. Points and vectors are columns, so a point p becomes
// p.x * column0 + p.y * column1 + p.z * column2 + column3, and a * b applies b first.
#include <cmath>
#include <ostream>

#include "geLinearMatrix3.h"
#include "gePoint3.h"
#include "geVector3.h"

namespace Zr {

template <class T>
struct GeAffineMatrix3 {
    T _m[16] = {T(1), T(0), T(0), T(0), T(0), T(1), T(0), T(0),
                T(0), T(0), T(1), T(0), T(0), T(0), T(0), T(1)};  // identity by default

    constexpr GeAffineMatrix3() = default;
    // The top three rows as read row by row; the bottom row is (0, 0, 0, 1).
    constexpr GeAffineMatrix3(T m00, T m01, T m02, T m03, T m10, T m11, T m12, T m13, T m20, T m21, T m22,
                              T m23)
        : _m{m00, m10, m20, T(0), m01, m11, m21, T(0), m02, m12, m22, T(0), m03, m13, m23, T(1)} {}
    // A linear part followed by a translation.
    constexpr GeAffineMatrix3(const GeLinearMatrix3<T>& linear, const GeVector3<T>& translation)
        : GeAffineMatrix3(linear(0, 0), linear(0, 1), linear(0, 2), translation.x, linear(1, 0), linear(1, 1),
                          linear(1, 2), translation.y, linear(2, 0), linear(2, 1), linear(2, 2), translation.z) {}
    template <class U>
    constexpr explicit GeAffineMatrix3(const GeAffineMatrix3<U>& o) : _m{} {
        for (int i = 0; i < 16; ++i) _m[i] = static_cast<T>(o._m[i]);
    }

    constexpr T& operator()(int row, int col) { return _m[col * 4 + row]; }
    constexpr const T& operator()(int row, int col) const { return _m[col * 4 + row]; }

    constexpr void setIdentity() { *this = GeAffineMatrix3(); }
    static constexpr GeAffineMatrix3 makeIdentity() { return GeAffineMatrix3(); }
    static constexpr GeAffineMatrix3 makeTranslation(const GeVector3<T>& t) {
        return {T(1), T(0), T(0), t.x, T(0), T(1), T(0), t.y, T(0), T(0), T(1), t.z};
    }
    static constexpr GeAffineMatrix3 makeScale(T sx, T sy, T sz) {
        return {sx, T(0), T(0), T(0), T(0), sy, T(0), T(0), T(0), T(0), sz, T(0)};
    }
    // A rotation by angle radians about axis (which need not have length 1), counter-clockwise
    // when the axis points at the viewer.
    static GeAffineMatrix3 makeRotation(const GeVector3<T>& axis, T angle);

    constexpr GeLinearMatrix3<T> getLinear() const {
        return {_m[0], _m[4], _m[8], _m[1], _m[5], _m[9], _m[2], _m[6], _m[10]};
    }
    constexpr GeVector3<T> getTranslation() const { return {_m[12], _m[13], _m[14]}; }
    constexpr void setTranslation(const GeVector3<T>& t) {
        _m[12] = t.x;
        _m[13] = t.y;
        _m[14] = t.z;
    }
    constexpr GeVector3<T> getColumn(int col) const { return {_m[col * 4], _m[col * 4 + 1], _m[col * 4 + 2]}; }

    constexpr GePoint3<T> transformPoint(const GePoint3<T>& p) const {
        return {_m[0] * p.x + _m[4] * p.y + _m[8] * p.z + _m[12], _m[1] * p.x + _m[5] * p.y + _m[9] * p.z + _m[13],
                _m[2] * p.x + _m[6] * p.y + _m[10] * p.z + _m[14]};
    }
    // A direction: the linear part only.
    constexpr GeVector3<T> transformVector(const GeVector3<T>& v) const {
        return {_m[0] * v.x + _m[4] * v.y + _m[8] * v.z, _m[1] * v.x + _m[5] * v.y + _m[9] * v.z,
                _m[2] * v.x + _m[6] * v.y + _m[10] * v.z};
    }
    // The vector taken as a row and multiplied by the linear part, which stands on its right:
    // v^T * L. Called on the inverse of a transform this applies the inverse transpose, which is
    // how normals transform.
    constexpr GeVector3<T> mulOnRight(const GeVector3<T>& v) const {
        return {v.x * _m[0] + v.y * _m[1] + v.z * _m[2], v.x * _m[4] + v.y * _m[5] + v.z * _m[6],
                v.x * _m[8] + v.y * _m[9] + v.z * _m[10]};
    }

    // The product; a * b applies b first and then a.
    constexpr GeAffineMatrix3 operator*(const GeAffineMatrix3& b) const {
        GeAffineMatrix3 r;
        for (int c = 0; c < 4; ++c) {
            for (int row = 0; row < 3; ++row) {
                T sum = (*this)(row, 0) * b(0, c) + (*this)(row, 1) * b(1, c) + (*this)(row, 2) * b(2, c);
                if (c == 3) sum += (*this)(row, 3);
                r(row, c) = sum;
            }
        }
        return r;
    }
    constexpr bool operator==(const GeAffineMatrix3& o) const {
        for (int i = 0; i < 16; ++i)
            if (_m[i] != o._m[i]) return false;
        return true;
    }
    constexpr bool operator!=(const GeAffineMatrix3& o) const { return !(*this == o); }

    // The determinant of the linear part (that of the whole matrix, as the bottom row is 0 0 0 1).
    constexpr T computeDeterminant() const { return getLinear().computeDeterminant(); }
    // The inverse transform; undefined for a singular linear part.
    constexpr GeAffineMatrix3 computeInverse() const {
        const GeLinearMatrix3<T> inv = getLinear().computeInverse();
        return GeAffineMatrix3(inv, -(inv * getTranslation()));
    }

    void dump(std::ostream& os) const {
        os << " _m:";
        for (int r = 0; r < 4; ++r)
            os << " [" << (*this)(r, 0) << ' ' << (*this)(r, 1) << ' ' << (*this)(r, 2) << ' ' << (*this)(r, 3) << ']';
    }
};

template <class T>
GeAffineMatrix3<T> GeAffineMatrix3<T>::makeRotation(const GeVector3<T>& axis, T angle) {
    const T len = axis.length();
    const T x = axis.x / len;
    const T y = axis.y / len;
    const T z = axis.z / len;
    const T c = std::cos(angle);
    const T s = std::sin(angle);
    const T t = T(1) - c;
    return {t * x * x + c,     t * x * y - s * z, t * x * z + s * y, T(0),
            t * x * y + s * z, t * y * y + c,     t * y * z - s * x, T(0),
            t * x * z - s * y, t * y * z + s * x, t * z * z + c,     T(0)};
}

template <class T>
std::ostream& operator<<(std::ostream& os, const GeAffineMatrix3<T>& m) { m.dump(os); return os; }

}  // namespace Zr
