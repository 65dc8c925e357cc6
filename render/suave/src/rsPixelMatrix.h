#pragma once
// The map from camera space onto the pixels of a picture: the projection to -1..1 first, then x
// and y onto the picture's rectangle (pixel (x, y) covers x..x+1, y..y+1, its centre at
// x + 0.5, y + 0.5; rows count upwards with the camera's y) and depth onto 0..1.
#include "geProjectiveMatrix3.h"
#include "geRectangle.h"

namespace Zr {

template <class T>
GeProjectiveMatrix3<T> rsPixelMatrix(const GeProjectiveMatrix3<double>& projection, const GeRectangle<int>& rectangle) {
    const T sx = static_cast<T>(rectangle.x1 - rectangle.x0) * T(0.5);
    const T sy = static_cast<T>(rectangle.y1 - rectangle.y0) * T(0.5);
    const T ox = static_cast<T>(rectangle.x0) + sx;
    const T oy = static_cast<T>(rectangle.y0) + sy;
    const GeProjectiveMatrix3<T> viewport(sx, T(0), T(0), ox,  //
                                          T(0), sy, T(0), oy,  //
                                          T(0), T(0), T(0.5), T(0.5),  //
                                          T(0), T(0), T(0), T(1));
    return viewport * GeProjectiveMatrix3<T>(projection);
}

}  // namespace Zr
