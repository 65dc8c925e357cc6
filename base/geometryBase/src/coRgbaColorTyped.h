#pragma once
// A colour of four channels: r, g, b and alpha. Whether the colour is premultiplied by alpha is
// the user's convention; the type does plain componentwise arithmetic on all four channels.
#include <ostream>

#include "coRgbColorTyped.h"

namespace Zr {

template <class T>
struct CoRgbaColorTyped {
    T r{};
    T g{};
    T b{};
    T a{};

    constexpr CoRgbaColorTyped() = default;
    constexpr CoRgbaColorTyped(T r_, T g_, T b_, T a_) : r(r_), g(g_), b(b_), a(a_) {}
    constexpr CoRgbaColorTyped(const CoRgbColorTyped<T>& rgb, T a_) : r(rgb.r), g(rgb.g), b(rgb.b), a(a_) {}
    template <class U>
    constexpr explicit CoRgbaColorTyped(const CoRgbaColorTyped<U>& o)
        : r(static_cast<T>(o.r)), g(static_cast<T>(o.g)), b(static_cast<T>(o.b)), a(static_cast<T>(o.a)) {}

    constexpr CoRgbColorTyped<T> getRgb() const { return {r, g, b}; }
    constexpr void setRgb(const CoRgbColorTyped<T>& c) {
        r = c.r;
        g = c.g;
        b = c.b;
    }

    // Componentwise arithmetic over all four channels.
    constexpr CoRgbaColorTyped operator+(const CoRgbaColorTyped& o) const {
        return {r + o.r, g + o.g, b + o.b, a + o.a};
    }
    constexpr CoRgbaColorTyped operator-(const CoRgbaColorTyped& o) const {
        return {r - o.r, g - o.g, b - o.b, a - o.a};
    }
    constexpr CoRgbaColorTyped operator*(const CoRgbaColorTyped& o) const {
        return {r * o.r, g * o.g, b * o.b, a * o.a};
    }
    constexpr CoRgbaColorTyped operator*(T s) const { return {r * s, g * s, b * s, a * s}; }
    constexpr CoRgbaColorTyped operator/(T s) const { return {r / s, g / s, b / s, a / s}; }
    constexpr CoRgbaColorTyped& operator+=(const CoRgbaColorTyped& o) {
        r += o.r; g += o.g; b += o.b; a += o.a;
        return *this;
    }
    constexpr CoRgbaColorTyped& operator-=(const CoRgbaColorTyped& o) {
        r -= o.r; g -= o.g; b -= o.b; a -= o.a;
        return *this;
    }
    constexpr CoRgbaColorTyped& operator*=(const CoRgbaColorTyped& o) {
        r *= o.r; g *= o.g; b *= o.b; a *= o.a;
        return *this;
    }
    constexpr CoRgbaColorTyped& operator*=(T s) {
        r *= s; g *= s; b *= s; a *= s;
        return *this;
    }
    constexpr bool operator==(const CoRgbaColorTyped& o) const {
        return r == o.r && g == o.g && b == o.b && a == o.a;
    }
    constexpr bool operator!=(const CoRgbaColorTyped& o) const { return !(*this == o); }

    void dump(std::ostream& os) const { os << " r: " << r << " g: " << g << " b: " << b << " a: " << a; }
};

template <class T>
constexpr CoRgbaColorTyped<T> operator*(T s, const CoRgbaColorTyped<T>& c) { return c * s; }

template <class T>
std::ostream& operator<<(std::ostream& os, const CoRgbaColorTyped<T>& c) { c.dump(os); return os; }

// The colour that flows between the renderer's transfer functions.
using Rgba = CoRgbaColorTyped<float>;

}  // namespace Zr
