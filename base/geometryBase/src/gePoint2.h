#pragma once
// A position in the plane, e.g. in texture space. Position minus position is a vector.
#include <ostream>

#include "geVector2.h"

namespace Zr {

template <class T>
struct GePoint2 {
    T x{};
    T y{};

    constexpr GePoint2() = default;
    constexpr GePoint2(T x_, T y_) : x(x_), y(y_) {}
    template <class U>
    constexpr explicit GePoint2(const GePoint2<U>& o) : x(static_cast<T>(o.x)), y(static_cast<T>(o.y)) {}

    constexpr GeVector2<T> operator-(const GePoint2& o) const { return {x - o.x, y - o.y}; }
    constexpr GePoint2 operator+(const GeVector2<T>& v) const { return {x + v.x, y + v.y}; }
    constexpr GePoint2 operator-(const GeVector2<T>& v) const { return {x - v.x, y - v.y}; }
    constexpr GePoint2& operator+=(const GeVector2<T>& v) { x += v.x; y += v.y; return *this; }
    constexpr GePoint2& operator-=(const GeVector2<T>& v) { x -= v.x; y -= v.y; return *this; }
    constexpr bool operator==(const GePoint2& o) const { return x == o.x && y == o.y; }
    constexpr bool operator!=(const GePoint2& o) const { return !(*this == o); }

    // The offset of this point from the origin.
    constexpr GeVector2<T> toVector() const { return {x, y}; }

    void dump(std::ostream& os) const { os << " x: " << x << " y: " << y; }
};

template <class T>
std::ostream& operator<<(std::ostream& os, const GePoint2<T>& p) { p.dump(os); return os; }

}  // namespace Zr
