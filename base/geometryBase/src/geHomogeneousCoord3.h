#pragma once
// A point of projective space: the result of a projection before the division by w.
#include <ostream>

#include "gePoint3.h"

namespace Zr {

template <class T>
struct GeHomogeneousCoord3 {
    T x{};
    T y{};
    T z{};
    T w{};

    constexpr GeHomogeneousCoord3() = default;
    constexpr GeHomogeneousCoord3(T x_, T y_, T z_, T w_) : x(x_), y(y_), z(z_), w(w_) {}
    // An affine point: w is 1.
    constexpr explicit GeHomogeneousCoord3(const GePoint3<T>& p) : x(p.x), y(p.y), z(p.z), w(T(1)) {}
    template <class U>
    constexpr explicit GeHomogeneousCoord3(const GeHomogeneousCoord3<U>& o)
        : x(static_cast<T>(o.x)), y(static_cast<T>(o.y)), z(static_cast<T>(o.z)), w(static_cast<T>(o.w)) {}

    constexpr GeHomogeneousCoord3 operator+(const GeHomogeneousCoord3& o) const {
        return {x + o.x, y + o.y, z + o.z, w + o.w};
    }
    constexpr GeHomogeneousCoord3 operator-(const GeHomogeneousCoord3& o) const {
        return {x - o.x, y - o.y, z - o.z, w - o.w};
    }
    constexpr GeHomogeneousCoord3 operator*(T s) const { return {x * s, y * s, z * s, w * s}; }
    constexpr bool operator==(const GeHomogeneousCoord3& o) const {
        return x == o.x && y == o.y && z == o.z && w == o.w;
    }
    constexpr bool operator!=(const GeHomogeneousCoord3& o) const { return !(*this == o); }

    // The division by w. The caller makes sure w is not 0 (clipping does).
    constexpr GePoint3<T> project() const {
        const T inv = T(1) / w;
        return {x * inv, y * inv, z * inv};
    }

    void dump(std::ostream& os) const { os << " x: " << x << " y: " << y << " z: " << z << " w: " << w; }
};

template <class T>
std::ostream& operator<<(std::ostream& os, const GeHomogeneousCoord3<T>& c) { c.dump(os); return os; }

}  // namespace Zr
