#pragma once
// An axis-aligned rectangle, half open: it covers x0 <= x < x1 and y0 <= y < y1. The members are
// in the order x0, x1, y0, y1, and so are the constructor's arguments.
#include <ostream>

namespace Zr {

template <class T>
struct GeRectangle {
    T x0{};
    T x1{};
    T y0{};
    T y1{};

    constexpr GeRectangle() = default;
    constexpr GeRectangle(T x0_, T x1_, T y0_, T y1_) : x0(x0_), x1(x1_), y0(y0_), y1(y1_) {}

    constexpr T getWidth() const { return x1 - x0; }
    constexpr T getHeight() const { return y1 - y0; }
    // Covers nothing: no width or no height.
    constexpr bool isEmpty() const { return !(x1 > x0) || !(y1 > y0); }
    // The area, 0 for an empty rectangle (also for one with negative extents).
    constexpr T getArea() const { return isEmpty() ? T(0) : getWidth() * getHeight(); }
    constexpr bool contains(T x, T y) const { return x0 <= x && x < x1 && y0 <= y && y < y1; }
    // The common part; empty (possibly with negative extents) when they do not overlap.
    constexpr GeRectangle intersect(const GeRectangle& o) const {
        return {x0 > o.x0 ? x0 : o.x0, x1 < o.x1 ? x1 : o.x1, y0 > o.y0 ? y0 : o.y0, y1 < o.y1 ? y1 : o.y1};
    }
    // The smallest rectangle covering both; an empty operand does not count.
    constexpr GeRectangle unite(const GeRectangle& o) const {
        if (isEmpty()) return o;
        if (o.isEmpty()) return *this;
        return {x0 < o.x0 ? x0 : o.x0, x1 > o.x1 ? x1 : o.x1, y0 < o.y0 ? y0 : o.y0, y1 > o.y1 ? y1 : o.y1};
    }
    constexpr bool operator==(const GeRectangle& o) const {
        return x0 == o.x0 && x1 == o.x1 && y0 == o.y0 && y1 == o.y1;
    }
    constexpr bool operator!=(const GeRectangle& o) const { return !(*this == o); }

    void dump(std::ostream& os) const { os << " x0: " << x0 << " x1: " << x1 << " y0: " << y0 << " y1: " << y1; }
};

template <class T>
std::ostream& operator<<(std::ostream& os, const GeRectangle<T>& r) { r.dump(os); return os; }

}  // namespace Zr
