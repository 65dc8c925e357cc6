#pragma once
// A scaling along the three axes. Two scales combine into a scale; a scale converts to the affine
// or the projective matrix that the caller asks for, so that `GeAffineMatrix3<float> m = a * b;`
// and `GeProjectiveMatrix3<float> m = a * b;` both give the scale matrix of the combined factors.
#include <ostream>

#include "geAffineMatrix3.h"
#include "gePoint3.h"
#include "geProjectiveMatrix3.h"
#include "geVector3.h"

namespace Zr {

template <class T>
struct GeScale3 {
    T x = T(1);
    T y = T(1);
    T z = T(1);

    constexpr GeScale3() = default;
    constexpr GeScale3(T x_, T y_, T z_) : x(x_), y(y_), z(z_) {}
    constexpr explicit GeScale3(T uniform) : x(uniform), y(uniform), z(uniform) {}

    // The combined scaling (scales commute, so the order does not matter).
    constexpr GeScale3 operator*(const GeScale3& o) const { return {x * o.x, y * o.y, z * o.z}; }
    constexpr GeVector3<T> operator*(const GeVector3<T>& v) const { return {x * v.x, y * v.y, z * v.z}; }
    constexpr GePoint3<T> operator*(const GePoint3<T>& p) const { return {x * p.x, y * p.y, z * p.z}; }
    constexpr bool operator==(const GeScale3& o) const { return x == o.x && y == o.y && z == o.z; }
    constexpr bool operator!=(const GeScale3& o) const { return !(*this == o); }

    constexpr GeScale3 computeInverse() const { return {T(1) / x, T(1) / y, T(1) / z}; }

    constexpr GeAffineMatrix3<T> toAffine() const { return GeAffineMatrix3<T>::makeScale(x, y, z); }
    constexpr GeProjectiveMatrix3<T> toProjective() const { return GeProjectiveMatrix3<T>(toAffine()); }
    constexpr operator GeAffineMatrix3<T>() const { return toAffine(); }
    constexpr operator GeProjectiveMatrix3<T>() const { return toProjective(); }

    void dump(std::ostream& os) const { os << " x: " << x << " y: " << y << " z: " << z; }
};

// Mixed products with matrices, spelled out so that they are not ambiguous between the two
// conversions. m * s applies s first.
template <class T>
constexpr GeAffineMatrix3<T> operator*(const GeAffineMatrix3<T>& m, const GeScale3<T>& s) { return m * s.toAffine(); }
template <class T>
constexpr GeAffineMatrix3<T> operator*(const GeScale3<T>& s, const GeAffineMatrix3<T>& m) { return s.toAffine() * m; }
template <class T>
constexpr GeProjectiveMatrix3<T> operator*(const GeProjectiveMatrix3<T>& m, const GeScale3<T>& s) {
    return m * s.toProjective();
}
template <class T>
constexpr GeProjectiveMatrix3<T> operator*(const GeScale3<T>& s, const GeProjectiveMatrix3<T>& m) {
    return s.toProjective() * m;
}

template <class T>
std::ostream& operator<<(std::ostream& os, const GeScale3<T>& s) { s.dump(os); return os; }

}  // namespace Zr
