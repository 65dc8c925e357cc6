#pragma once
// A direction in space. Directions transform without translation; see GePoint3 for positions.
#include <cmath>
#include <ostream>

namespace Zr {

template <class T>
struct GeVector3 {
    T x{};
    T y{};
    T z{};

    constexpr GeVector3() = default;
    constexpr GeVector3(T x_, T y_, T z_) : x(x_), y(y_), z(z_) {}
    // Conversion between precisions is explicit so that a loss of precision is visible.
    template <class U>
    constexpr explicit GeVector3(const GeVector3<U>& o)
        : x(static_cast<T>(o.x)), y(static_cast<T>(o.y)), z(static_cast<T>(o.z)) {}

    constexpr GeVector3 operator+(const GeVector3& o) const { return {x + o.x, y + o.y, z + o.z}; }
    constexpr GeVector3 operator-(const GeVector3& o) const { return {x - o.x, y - o.y, z - o.z}; }
    constexpr GeVector3 operator-() const { return {-x, -y, -z}; }
    constexpr GeVector3 operator*(T s) const { return {x * s, y * s, z * s}; }
    constexpr GeVector3 operator/(T s) const { return {x / s, y / s, z / s}; }
    constexpr GeVector3& operator+=(const GeVector3& o) { x += o.x; y += o.y; z += o.z; return *this; }
    constexpr GeVector3& operator-=(const GeVector3& o) { x -= o.x; y -= o.y; z -= o.z; return *this; }
    constexpr GeVector3& operator*=(T s) { x *= s; y *= s; z *= s; return *this; }
    constexpr bool operator==(const GeVector3& o) const { return x == o.x && y == o.y && z == o.z; }
    constexpr bool operator!=(const GeVector3& o) const { return !(*this == o); }

    constexpr T dot(const GeVector3& o) const { return x * o.x + y * o.y + z * o.z; }
    constexpr GeVector3 cross(const GeVector3& o) const {
        return {y * o.z - z * o.y, z * o.x - x * o.z, x * o.y - y * o.x};
    }
    constexpr T lengthSquared() const { return dot(*this); }
    T length() const { return std::sqrt(lengthSquared()); }

    // Scales the vector to length 1 in place. A zero vector is left as it is and then fails the
    // assertion "len > 0" (ExAssertionFailed); callers that must accept a zero vector test the
    // length themselves. Returns *this so that the call can be chained.
    GeVector3& normalize();
    // A normalised copy, with the same assertion.
    GeVector3 getNormalized() const {
        GeVector3 r = *this;
        r.normalize();
        return r;
    }

    void dump(std::ostream& os) const;
};

template <class T>
constexpr GeVector3<T> operator*(T s, const GeVector3<T>& v) { return v * s; }

template <class T>
std::ostream& operator<<(std::ostream& os, const GeVector3<T>& v) { v.dump(os); return os; }

}  // namespace Zr

#include "geVector3.inline"
