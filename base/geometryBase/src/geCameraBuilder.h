#pragma once
// Projection matrices for a camera that looks down the negative z axis. They map the visible
// volume onto normalised device space, -1 to 1 in x, y and depth, with the near plane at depth
// -1 and the far plane at depth 1 after the division by w.
#include <cmath>

#include "geProjectiveMatrix3.h"

namespace Zr {

template <class T>
class GeCameraBuilder {
public:
    // A symmetric perspective projection. fieldOfView is the full vertical opening angle in
    // radians; aspect is width over height, so the horizontal extent is aspect times the
    // vertical one. near and far are positive distances along the view direction.
    static GeProjectiveMatrix3<T> makePerspective(T fieldOfView, T near, T far, T aspect) {
        const T f = T(1) / static_cast<T>(std::tan(fieldOfView / T(2)));
        const T depth = near - far;
        return {f / aspect, T(0), T(0),                 T(0),
                T(0),       f,    T(0),                 T(0),
                T(0),       T(0), (far + near) / depth, T(2) * far * near / depth,
                T(0),       T(0), T(-1),                T(0)};
    }

    // A general perspective projection through the window [left, right] x [bottom, top] on the
    // near plane (the window may be off centre).
    static GeProjectiveMatrix3<T> makeFrustum(T left, T right, T bottom, T top, T near, T far) {
        const T w = right - left;
        const T h = top - bottom;
        const T depth = near - far;
        return {T(2) * near / w, T(0),            (right + left) / w,   T(0),
                T(0),            T(2) * near / h, (top + bottom) / h,   T(0),
                T(0),            T(0),            (far + near) / depth, T(2) * far * near / depth,
                T(0),            T(0),            T(-1),                T(0)};
    }

    // A parallel projection of the box [left, right] x [bottom, top] x [-near, -far].
    static GeProjectiveMatrix3<T> makeOrthographic(T left, T right, T bottom, T top, T near, T far) {
        const T w = right - left;
        const T h = top - bottom;
        const T d = far - near;
        return {T(2) / w, T(0),     T(0),      -(right + left) / w,
                T(0),     T(2) / h, T(0),      -(top + bottom) / h,
                T(0),     T(0),     T(-2) / d, -(far + near) / d,
                T(0),     T(0),     T(0),      T(1)};
    }
};

}  // namespace Zr
