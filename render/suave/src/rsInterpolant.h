#pragma once
// One attribute of a triangle as a plane over the screen, stepped from pixel to pixel by additions
// only; and the empty stand-in for an attribute that a vertex kind lacks.
#include <cmath>
#include <ostream>
#include <type_traits>

#include "gePoint2.h"
#include "gePoint3.h"

namespace Zr {

// The value types an interpolant can carry, with their scalar and a way to apply one operation to
// each component of several values in step. Arithmetic of a point type runs in its own scalar:
// a point of three floats is set up and stepped in float.
template <class T>
struct RsInterpolantElement;

template <>
struct RsInterpolantElement<double> {
    using Scalar = double;
    template <class F, class... Values>
    static void forEach(F&& f, Values&&... values) { f(values...); }
    static void dump(std::ostream& os, double value) { os << value; }
};

template <>
struct RsInterpolantElement<float> {
    using Scalar = float;
    template <class F, class... Values>
    static void forEach(F&& f, Values&&... values) { f(values...); }
    static void dump(std::ostream& os, float value) { os << value; }
};

template <>
struct RsInterpolantElement<GePoint3<float>> {
    using Scalar = float;
    template <class F, class... Values>
    static void forEach(F&& f, Values&&... values) {
        f(values.x...);
        f(values.y...);
        f(values.z...);
    }
    static void dump(std::ostream& os, const GePoint3<float>& value) { value.dump(os); }
};

template <>
struct RsInterpolantElement<GePoint2<double>> {
    using Scalar = double;
    template <class F, class... Values>
    static void forEach(F&& f, Values&&... values) {
        f(values.x...);
        f(values.y...);
    }
    static void dump(std::ostream& os, const GePoint2<double>& value) { value.dump(os); }
};

// An attribute q over the screen: q(x, y) = _dq_dx * x + _dq_dy * y + _q00, with x and y relative
// to the region origin, and _q its value at the current pixel.
template <class T>
struct RsInterpolant {
    using Element = RsInterpolantElement<T>;
    using Scalar = typename Element::Scalar;

    T _q;            // value at the current pixel
    T _dq_dx;        // change per pixel to the right
    T _dq_dy;        // change per pixel downward
    Scalar _slope;   // half the change across a pixel's diagonal; kept for the depth alone
    T _q00;          // value at the region-relative origin

    // The plane through the values q0, q1, q2 at the three vertices of the triangle whose
    // gradient block is g; (originX, originY) is the first vertex relative to the region origin.
    // The gradient block is taken in the interpolant's own scalar.
    template <class Gradients>
    void setup(const Gradients& g, const T& q0, const T& q1, const T& q2, Scalar originX,
               Scalar originY) {
        const Scalar invDet = static_cast<Scalar>(g._invDet);
        const Scalar dx0 = static_cast<Scalar>(g._dx0), dx1 = static_cast<Scalar>(g._dx1),
                     dx2 = static_cast<Scalar>(g._dx2);
        const Scalar dy0 = static_cast<Scalar>(g._dy0), dy1 = static_cast<Scalar>(g._dy1),
                     dy2 = static_cast<Scalar>(g._dy2);
        Element::forEach(
            [&](Scalar& q, Scalar& dqdx, Scalar& dqdy, Scalar& q00, const Scalar& a, const Scalar& b,
                const Scalar& c) {
                dqdx = -invDet * (dy1 * a + dy2 * b + dy0 * c);
                dqdy = invDet * (dx1 * a + dx2 * b + dx0 * c);
                q00 = a - dqdx * originX - dqdy * originY;
                q = Scalar(0);
            },
            _q, _dq_dx, _dq_dy, _q00, q0, q1, q2);
        _slope = Scalar(0);
    }

    // Half the change of the plane across a pixel's diagonal (scalar interpolants only).
    void setupSlope() {
        static_assert(std::is_arithmetic_v<T>, "a slope is kept for scalar attributes only");
        _slope = (std::abs(_dq_dx) + std::abs(_dq_dy)) * Scalar(0.5);
    }

    // Moves _q to the pixel whose centre is (centreX, centreY), region-relative. The centre is
    // formed in float by the caller; a float attribute is evaluated in float, a double one in
    // double.
    void place(float centreX, float centreY) {
        const Scalar cx = static_cast<Scalar>(centreX);
        const Scalar cy = static_cast<Scalar>(centreY);
        Element::forEach([&](Scalar& q, const Scalar& dqdx, const Scalar& dqdy,
                             const Scalar& q00) { q = dqdx * cx + dqdy * cy + q00; },
                         _q, _dq_dx, _dq_dy, _q00);
    }

    // Moves _q one pixel to the right.
    void step() {
        Element::forEach([](Scalar& q, const Scalar& dqdx) { q += dqdx; }, _q, _dq_dx);
    }

    void dump(std::ostream& os) const {
        os << " _q: ";
        Element::dump(os, _q);
        os << " _dq_dx: ";
        Element::dump(os, _dq_dx);
        os << " _dq_dy: ";
        Element::dump(os, _dq_dy);
        os << " _q00: ";
        Element::dump(os, _q00);
    }
};

// Stands for an attribute that a vertex kind lacks. It has no storage (in pixel data it is held
// [[no_unique_address]]; the slot number keeps the stand-ins of different attributes distinct
// types, so that they need not have distinct addresses) and no operations, so that a span method
// that reads an attribute its vertex kind lacks does not compile.
template <int Slot = 0>
struct RsNoInterpolant {};

template <class T>
inline constexpr bool rsIsInterpolant = false;
template <class T>
inline constexpr bool rsIsInterpolant<RsInterpolant<T>> = true;

}  // namespace Zr
