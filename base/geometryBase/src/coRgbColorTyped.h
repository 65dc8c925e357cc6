#pragma once
// A colour of three channels. For float these are linear values that are never clamped: shading
// may produce values above 1 or below 0 and they pass through unchanged.
#include <ostream>

namespace Zr {

template <class T>
struct CoRgbColorTyped {
    T r{};
    T g{};
    T b{};

    constexpr CoRgbColorTyped() = default;
    constexpr CoRgbColorTyped(T r_, T g_, T b_) : r(r_), g(g_), b(b_) {}
    // The grey of the given level in each channel.
    constexpr explicit CoRgbColorTyped(T grey) : r(grey), g(grey), b(grey) {}
    template <class U>
    constexpr explicit CoRgbColorTyped(const CoRgbColorTyped<U>& o)
        : r(static_cast<T>(o.r)), g(static_cast<T>(o.g)), b(static_cast<T>(o.b)) {}

    // Componentwise arithmetic.
    constexpr CoRgbColorTyped operator+(const CoRgbColorTyped& o) const { return {r + o.r, g + o.g, b + o.b}; }
    constexpr CoRgbColorTyped operator-(const CoRgbColorTyped& o) const { return {r - o.r, g - o.g, b - o.b}; }
    constexpr CoRgbColorTyped operator*(const CoRgbColorTyped& o) const { return {r * o.r, g * o.g, b * o.b}; }
    constexpr CoRgbColorTyped operator*(T s) const { return {r * s, g * s, b * s}; }
    constexpr CoRgbColorTyped operator/(T s) const { return {r / s, g / s, b / s}; }
    constexpr CoRgbColorTyped& operator+=(const CoRgbColorTyped& o) { r += o.r; g += o.g; b += o.b; return *this; }
    constexpr CoRgbColorTyped& operator-=(const CoRgbColorTyped& o) { r -= o.r; g -= o.g; b -= o.b; return *this; }
    constexpr CoRgbColorTyped& operator*=(const CoRgbColorTyped& o) { r *= o.r; g *= o.g; b *= o.b; return *this; }
    constexpr CoRgbColorTyped& operator*=(T s) { r *= s; g *= s; b *= s; return *this; }
    constexpr bool operator==(const CoRgbColorTyped& o) const { return r == o.r && g == o.g && b == o.b; }
    constexpr bool operator!=(const CoRgbColorTyped& o) const { return !(*this == o); }

    constexpr T getMax() const { return r > g ? (r > b ? r : b) : (g > b ? g : b); }
    constexpr T getMin() const { return r < g ? (r < b ? r : b) : (g < b ? g : b); }

    void dump(std::ostream& os) const { os << " r: " << r << " g: " << g << " b: " << b; }
};

template <class T>
constexpr CoRgbColorTyped<T> operator*(T s, const CoRgbColorTyped<T>& c) { return c * s; }

template <class T>
std::ostream& operator<<(std::ostream& os, const CoRgbColorTyped<T>& c) { c.dump(os); return os; }

}  // namespace Zr
