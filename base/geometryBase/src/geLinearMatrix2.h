#pragma once
// A 2 by 2 matrix, e.g. the derivatives of texture coordinates by pixel position. Stored column
// after column in _m; element (row, col) is _m[col * 2 + row]. Vectors are columns.
#include <ostream>

#include "geVector2.h"

namespace Zr {

template <class T>
struct GeLinearMatrix2 {
    T _m[4] = {T(1), T(0), T(0), T(1)};  // identity by default

    constexpr GeLinearMatrix2() = default;
    // The elements as read row by row.
    constexpr GeLinearMatrix2(T m00, T m01, T m10, T m11) : _m{m00, m10, m01, m11} {}
    template <class U>
    constexpr explicit GeLinearMatrix2(const GeLinearMatrix2<U>& o) : _m{} {
        for (int i = 0; i < 4; ++i) _m[i] = static_cast<T>(o._m[i]);
    }

    constexpr T& operator()(int row, int col) { return _m[col * 2 + row]; }
    constexpr const T& operator()(int row, int col) const { return _m[col * 2 + row]; }

    constexpr void setIdentity() { *this = GeLinearMatrix2(); }
    static constexpr GeLinearMatrix2 makeIdentity() { return GeLinearMatrix2(); }

    constexpr GeVector2<T> getColumn(int col) const { return {_m[col * 2], _m[col * 2 + 1]}; }

    // The product; a * b applies b first.
    constexpr GeLinearMatrix2 operator*(const GeLinearMatrix2& b) const {
        const GeLinearMatrix2& a = *this;
        return {a(0, 0) * b(0, 0) + a(0, 1) * b(1, 0), a(0, 0) * b(0, 1) + a(0, 1) * b(1, 1),
                a(1, 0) * b(0, 0) + a(1, 1) * b(1, 0), a(1, 0) * b(0, 1) + a(1, 1) * b(1, 1)};
    }
    constexpr GeVector2<T> operator*(const GeVector2<T>& v) const {
        return {_m[0] * v.x + _m[2] * v.y, _m[1] * v.x + _m[3] * v.y};
    }
    constexpr GeLinearMatrix2 operator*(T s) const {
        return {_m[0] * s, _m[2] * s, _m[1] * s, _m[3] * s};
    }
    constexpr GeLinearMatrix2 operator+(const GeLinearMatrix2& o) const {
        return {_m[0] + o._m[0], _m[2] + o._m[2], _m[1] + o._m[1], _m[3] + o._m[3]};
    }
    constexpr bool operator==(const GeLinearMatrix2& o) const {
        return _m[0] == o._m[0] && _m[1] == o._m[1] && _m[2] == o._m[2] && _m[3] == o._m[3];
    }
    constexpr bool operator!=(const GeLinearMatrix2& o) const { return !(*this == o); }

    constexpr T computeDeterminant() const { return _m[0] * _m[3] - _m[2] * _m[1]; }
    constexpr GeLinearMatrix2 getTransposed() const { return {_m[0], _m[1], _m[2], _m[3]}; }
    // The inverse; undefined for a singular matrix.
    constexpr GeLinearMatrix2 computeInverse() const {
        const T inv = T(1) / computeDeterminant();
        return {_m[3] * inv, -_m[2] * inv, -_m[1] * inv, _m[0] * inv};
    }

    void dump(std::ostream& os) const {
        os << " _m:";
        for (int r = 0; r < 2; ++r) os << " [" << (*this)(r, 0) << ' ' << (*this)(r, 1) << ']';
    }
};

template <class T>
std::ostream& operator<<(std::ostream& os, const GeLinearMatrix2<T>& m) { m.dump(os); return os; }

}  // namespace Zr
