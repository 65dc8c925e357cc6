#pragma once
// A projective transform of space as a general 4 by 4 matrix. Stored column after column in _m;
// element (row, col) is _m[col * 4 + row]. A point p becomes the homogeneous coordinate
// p.x * column0 + p.y * column1 + p.z * column2 + column3, and a * b applies b first. In a
// projection, _m[11] (row 3, column 2: the coefficient of z in w) being 0 means orthographic.
#include <ostream>

#include "geAffineMatrix3.h"
#include "geHomogeneousCoord3.h"
#include "gePoint3.h"

namespace Zr {

template <class T>
struct GeProjectiveMatrix3 {
    T _m[16] = {T(1), T(0), T(0), T(0), T(0), T(1), T(0), T(0),
                T(0), T(0), T(1), T(0), T(0), T(0), T(0), T(1)};  // identity by default

    constexpr GeProjectiveMatrix3() = default;
    // The elements as read row by row.
    constexpr GeProjectiveMatrix3(T m00, T m01, T m02, T m03, T m10, T m11, T m12, T m13, T m20, T m21, T m22,
                                  T m23, T m30, T m31, T m32, T m33)
        : _m{m00, m10, m20, m30, m01, m11, m21, m31, m02, m12, m22, m32, m03, m13, m23, m33} {}
    // The same transform as an affine matrix.
    constexpr explicit GeProjectiveMatrix3(const GeAffineMatrix3<T>& a) : _m{} {
        for (int i = 0; i < 16; ++i) _m[i] = a._m[i];
    }
    template <class U>
    constexpr explicit GeProjectiveMatrix3(const GeProjectiveMatrix3<U>& o) : _m{} {
        for (int i = 0; i < 16; ++i) _m[i] = static_cast<T>(o._m[i]);
    }

    constexpr T& operator()(int row, int col) { return _m[col * 4 + row]; }
    constexpr const T& operator()(int row, int col) const { return _m[col * 4 + row]; }

    constexpr void setIdentity() { *this = GeProjectiveMatrix3(); }
    static constexpr GeProjectiveMatrix3 makeIdentity() { return GeProjectiveMatrix3(); }

    // True for a parallel projection: w does not depend on z.
    constexpr bool isOrthographic() const { return _m[11] == T(0); }

    constexpr GeHomogeneousCoord3<T> transform(const GePoint3<T>& p) const {
        return {_m[0] * p.x + _m[4] * p.y + _m[8] * p.z + _m[12], _m[1] * p.x + _m[5] * p.y + _m[9] * p.z + _m[13],
                _m[2] * p.x + _m[6] * p.y + _m[10] * p.z + _m[14], _m[3] * p.x + _m[7] * p.y + _m[11] * p.z + _m[15]};
    }
    constexpr GeHomogeneousCoord3<T> transform(const GeHomogeneousCoord3<T>& p) const {
        return {_m[0] * p.x + _m[4] * p.y + _m[8] * p.z + _m[12] * p.w,
                _m[1] * p.x + _m[5] * p.y + _m[9] * p.z + _m[13] * p.w,
                _m[2] * p.x + _m[6] * p.y + _m[10] * p.z + _m[14] * p.w,
                _m[3] * p.x + _m[7] * p.y + _m[11] * p.z + _m[15] * p.w};
    }
    // transform followed by the division by w.
    constexpr GePoint3<T> transformAndProject(const GePoint3<T>& p) const { return transform(p).project(); }

    // The product; a * b applies b first and then a.
    constexpr GeProjectiveMatrix3 operator*(const GeProjectiveMatrix3& b) const {
        GeProjectiveMatrix3 r;
        for (int c = 0; c < 4; ++c)
            for (int row = 0; row < 4; ++row)
                r(row, c) = (*this)(row, 0) * b(0, c) + (*this)(row, 1) * b(1, c) + (*this)(row, 2) * b(2, c) +
                            (*this)(row, 3) * b(3, c);
        return r;
    }
    constexpr GeProjectiveMatrix3 operator*(const GeAffineMatrix3<T>& b) const {
        return *this * GeProjectiveMatrix3(b);
    }
    constexpr bool operator==(const GeProjectiveMatrix3& o) const {
        for (int i = 0; i < 16; ++i)
            if (_m[i] != o._m[i]) return false;
        return true;
    }
    constexpr bool operator!=(const GeProjectiveMatrix3& o) const { return !(*this == o); }

    constexpr GeProjectiveMatrix3 getTransposed() const {
        GeProjectiveMatrix3 r;
        for (int c = 0; c < 4; ++c)
            for (int row = 0; row < 4; ++row) r(row, c) = (*this)(c, row);
        return r;
    }
    constexpr T computeDeterminant() const;
    // The inverse by cofactors; undefined for a singular matrix.
    constexpr GeProjectiveMatrix3 computeInverse() const;

    void dump(std::ostream& os) const {
        os << " _m:";
        for (int r = 0; r < 4; ++r)
            os << " [" << (*this)(r, 0) << ' ' << (*this)(r, 1) << ' ' << (*this)(r, 2) << ' ' << (*this)(r, 3) << ']';
    }

private:
    // The 2 by 2 minors of rows 0-1 and of rows 2-3 over each pair of columns, shared by the
    // determinant and the inverse (Laplace expansion along the two row pairs).
    struct Minors {
        T s0, s1, s2, s3, s4, s5;  // rows 0 and 1
        T c0, c1, c2, c3, c4, c5;  // rows 2 and 3
        constexpr T determinant() const { return s0 * c5 - s1 * c4 + s2 * c3 + s3 * c2 - s4 * c1 + s5 * c0; }
    };
    constexpr Minors computeMinors() const {
        const GeProjectiveMatrix3& a = *this;
        Minors m{};
        m.s0 = a(0, 0) * a(1, 1) - a(1, 0) * a(0, 1);
        m.s1 = a(0, 0) * a(1, 2) - a(1, 0) * a(0, 2);
        m.s2 = a(0, 0) * a(1, 3) - a(1, 0) * a(0, 3);
        m.s3 = a(0, 1) * a(1, 2) - a(1, 1) * a(0, 2);
        m.s4 = a(0, 1) * a(1, 3) - a(1, 1) * a(0, 3);
        m.s5 = a(0, 2) * a(1, 3) - a(1, 2) * a(0, 3);
        m.c5 = a(2, 2) * a(3, 3) - a(3, 2) * a(2, 3);
        m.c4 = a(2, 1) * a(3, 3) - a(3, 1) * a(2, 3);
        m.c3 = a(2, 1) * a(3, 2) - a(3, 1) * a(2, 2);
        m.c2 = a(2, 0) * a(3, 3) - a(3, 0) * a(2, 3);
        m.c1 = a(2, 0) * a(3, 2) - a(3, 0) * a(2, 2);
        m.c0 = a(2, 0) * a(3, 1) - a(3, 0) * a(2, 1);
        return m;
    }
};

template <class T>
constexpr T GeProjectiveMatrix3<T>::computeDeterminant() const {
    return computeMinors().determinant();
}

template <class T>
constexpr GeProjectiveMatrix3<T> GeProjectiveMatrix3<T>::computeInverse() const {
    const GeProjectiveMatrix3& a = *this;
    const Minors m = computeMinors();
    const T inv = T(1) / m.determinant();
    GeProjectiveMatrix3 r;
    r(0, 0) = (a(1, 1) * m.c5 - a(1, 2) * m.c4 + a(1, 3) * m.c3) * inv;
    r(0, 1) = (-a(0, 1) * m.c5 + a(0, 2) * m.c4 - a(0, 3) * m.c3) * inv;
    r(0, 2) = (a(3, 1) * m.s5 - a(3, 2) * m.s4 + a(3, 3) * m.s3) * inv;
    r(0, 3) = (-a(2, 1) * m.s5 + a(2, 2) * m.s4 - a(2, 3) * m.s3) * inv;
    r(1, 0) = (-a(1, 0) * m.c5 + a(1, 2) * m.c2 - a(1, 3) * m.c1) * inv;
    r(1, 1) = (a(0, 0) * m.c5 - a(0, 2) * m.c2 + a(0, 3) * m.c1) * inv;
    r(1, 2) = (-a(3, 0) * m.s5 + a(3, 2) * m.s2 - a(3, 3) * m.s1) * inv;
    r(1, 3) = (a(2, 0) * m.s5 - a(2, 2) * m.s2 + a(2, 3) * m.s1) * inv;
    r(2, 0) = (a(1, 0) * m.c4 - a(1, 1) * m.c2 + a(1, 3) * m.c0) * inv;
    r(2, 1) = (-a(0, 0) * m.c4 + a(0, 1) * m.c2 - a(0, 3) * m.c0) * inv;
    r(2, 2) = (a(3, 0) * m.s4 - a(3, 1) * m.s2 + a(3, 3) * m.s0) * inv;
    r(2, 3) = (-a(2, 0) * m.s4 + a(2, 1) * m.s2 - a(2, 3) * m.s0) * inv;
    r(3, 0) = (-a(1, 0) * m.c3 + a(1, 1) * m.c1 - a(1, 2) * m.c0) * inv;
    r(3, 1) = (a(0, 0) * m.c3 - a(0, 1) * m.c1 + a(0, 2) * m.c0) * inv;
    r(3, 2) = (-a(3, 0) * m.s3 + a(3, 1) * m.s1 - a(3, 2) * m.s0) * inv;
    r(3, 3) = (a(2, 0) * m.s3 - a(2, 1) * m.s1 + a(2, 2) * m.s0) * inv;
    return r;
}

// An affine transform followed by a projection, in the usual order: a * p applies p first.
template <class T>
constexpr GeProjectiveMatrix3<T> operator*(const GeAffineMatrix3<T>& a, const GeProjectiveMatrix3<T>& p) {
    return GeProjectiveMatrix3<T>(a) * p;
}

template <class T>
std::ostream& operator<<(std::ostream& os, const GeProjectiveMatrix3<T>& m) { m.dump(os); return os; }

}  // namespace Zr
