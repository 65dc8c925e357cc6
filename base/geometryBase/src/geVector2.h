#pragma once
// A direction or offset in the plane.
#include <cmath>
#include <ostream>

namespace Zr {

template <class T>
struct GeVector2 {
    T x{};
    T y{};

    constexpr GeVector2() = default;
    constexpr GeVector2(T x_, T y_) : x(x_), y(y_) {}
    // Conversion between precisions is explicit so that a loss of precision is visible.
    template <class U>
    constexpr explicit GeVector2(const GeVector2<U>& o) : x(static_cast<T>(o.x)), y(static_cast<T>(o.y)) {}

    constexpr GeVector2 operator+(const GeVector2& o) const { return {x + o.x, y + o.y}; }
    constexpr GeVector2 operator-(const GeVector2& o) const { return {x - o.x, y - o.y}; }
    constexpr GeVector2 operator-() const { return {-x, -y}; }
    constexpr GeVector2 operator*(T s) const { return {x * s, y * s}; }
    constexpr GeVector2 operator/(T s) const { return {x / s, y / s}; }
    constexpr GeVector2& operator+=(const GeVector2& o) { x += o.x; y += o.y; return *this; }
    constexpr GeVector2& operator-=(const GeVector2& o) { x -= o.x; y -= o.y; return *this; }
    constexpr GeVector2& operator*=(T s) { x *= s; y *= s; return *this; }
    constexpr bool operator==(const GeVector2& o) const { return x == o.x && y == o.y; }
    constexpr bool operator!=(const GeVector2& o) const { return !(*this == o); }

    constexpr T dot(const GeVector2& o) const { return x * o.x + y * o.y; }
    // The z component of the three-dimensional cross product: positive when o lies
    // counter-clockwise of this.
    constexpr T cross(const GeVector2& o) const { return x * o.y - y * o.x; }
    constexpr T lengthSquared() const { return dot(*this); }
    T length() const { return std::sqrt(lengthSquared()); }

    void dump(std::ostream& os) const { os << " x: " << x << " y: " << y; }
};

template <class T>
constexpr GeVector2<T> operator*(T s, const GeVector2<T>& v) { return v * s; }

template <class T>
std::ostream& operator<<(std::ostream& os, const GeVector2<T>& v) { v.dump(os); return os; }

}  // namespace Zr
