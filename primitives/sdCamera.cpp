#include "sdCamera.h"

#include <cmath>
#include <numbers>

#include "assertions.h"

namespace Zr {

namespace {
constexpr const char* kSourceFile = ".\\primitives/sdCamera.cpp";
}

void SdCamera::computeProjection(GeProjectiveMatrix3<double>& result,
                                 std::pair<float, float> lensOffset) const {
    ZR_ASSERT_AT(_aspect > 0.0f, kSourceFile, __LINE__);
    ZR_ASSERT_AT(_near < _far, kSourceFile, __LINE__);
    ZR_ASSERT_AT(_focalDistance > 0.0f, kSourceFile, __LINE__);
    const double n = _near;
    const double f = _far;

    // The centred projection: scales of x and y, and the depth row.
    double scaleX, scaleY;
    result = GeProjectiveMatrix3<double>();
    if (_projection == Projection::orthographic) {
        ZR_ASSERT_AT(_orthographicHeight > 0.0f, kSourceFile, __LINE__);
        scaleY = 2.0 / _orthographicHeight;
        scaleX = scaleY / _aspect;
        result(2, 2) = -2.0 / (f - n);
        result(2, 3) = -(f + n) / (f - n);
        // Row 3 stays (0, 0, 0, 1): w does not depend on z.
    } else {
        ZR_ASSERT_AT(_fieldOfView > 0.0f && _fieldOfView < std::numbers::pi_v<float>, kSourceFile,
                     __LINE__);
        ZR_ASSERT_AT(_near > 0.0f, kSourceFile, __LINE__);
        scaleY = 1.0 / std::tan(0.5 * _fieldOfView);
        scaleX = scaleY / _aspect;
        result(2, 2) = (f + n) / (n - f);
        result(2, 3) = 2.0 * f * n / (n - f);
        result(3, 2) = -1.0;
        result(3, 3) = 0.0;
    }
    result(0, 0) = scaleX;
    result(1, 1) = scaleY;

    // The centred projection times the shear (column 2 of the shear is (kx, ky, 1, 0)): only the
    // coefficients of z in x and y change.
    const double kx = -static_cast<double>(lensOffset.first) / _focalDistance;
    const double ky = -static_cast<double>(lensOffset.second) / _focalDistance;
    result(0, 2) = scaleX * kx;
    result(1, 2) = scaleY * ky;
}

void SdCamera::computeProjection(GeProjectiveMatrix3<double>& result) const {
    computeProjection(result, std::pair<float, float>(0.0f, 0.0f));
}

void SdCamera::dump(std::ostream& os) const {
    os << " _projection: " << static_cast<int>(_projection) << " _fieldOfView: " << _fieldOfView
       << " _orthographicHeight: " << _orthographicHeight << " _aspect: " << _aspect
       << " _near: " << _near << " _far: " << _far << " _focalDistance: " << _focalDistance;
}

}  // namespace Zr
