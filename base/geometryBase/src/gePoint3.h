#pragma once
// A position in space. Position minus position is a vector; position plus vector is a position.
#include <ostream>

#include "geVector3.h"

namespace Zr {

template <class T>
struct GePoint3 {
    T x{};
    T y{};
    T z{};

    constexpr GePoint3() = default;
    constexpr GePoint3(T x_, T y_, T z_) : x(x_), y(y_), z(z_) {}
    template <class U>
    constexpr explicit GePoint3(const GePoint3<U>& o)
        : x(static_cast<T>(o.x)), y(static_cast<T>(o.y)), z(static_cast<T>(o.z)) {}
    // The point at the given offset from the origin.
    constexpr explicit GePoint3(const GeVector3<T>& v) : x(v.x), y(v.y), z(v.z) {}

    constexpr GeVector3<T> operator-(const GePoint3& o) const { return {x - o.x, y - o.y, z - o.z}; }
    constexpr GePoint3 operator+(const GeVector3<T>& v) const { return {x + v.x, y + v.y, z + v.z}; }
    constexpr GePoint3 operator-(const GeVector3<T>& v) const { return {x - v.x, y - v.y, z - v.z}; }
    constexpr GePoint3& operator+=(const GeVector3<T>& v) { x += v.x; y += v.y; z += v.z; return *this; }
    constexpr GePoint3& operator-=(const GeVector3<T>& v) { x -= v.x; y -= v.y; z -= v.z; return *this; }
    constexpr bool operator==(const GePoint3& o) const { return x == o.x && y == o.y && z == o.z; }
    constexpr bool operator!=(const GePoint3& o) const { return !(*this == o); }

    // The offset of this point from the origin.
    constexpr GeVector3<T> toVector() const { return {x, y, z}; }

    void dump(std::ostream& os) const { os << " x: " << x << " y: " << y << " z: " << z; }
};

template <class T>
std::ostream& operator<<(std::ostream& os, const GePoint3<T>& p) { p.dump(os); return os; }

}  // namespace Zr
