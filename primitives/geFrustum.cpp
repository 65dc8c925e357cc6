#include "geFrustum.h"

#include <cmath>

namespace Zr {

namespace {

// The plane sign * row(axis) + row(3) of the projection as camera-space coefficients, scaled so
// that the normal has length 1.
template <class T>
typename GeFrustum<T>::Plane extractPlane(const GeProjectiveMatrix3<T>& m, int axis, T sign) {
    typename GeFrustum<T>::Plane plane;
    plane.normal = GeVector3<T>(sign * m(axis, 0) + m(3, 0), sign * m(axis, 1) + m(3, 1), sign * m(axis, 2) + m(3, 2));
    plane.offset = sign * m(axis, 3) + m(3, 3);
    const T len = plane.normal.length();
    if (len > T(0)) {
        plane.normal *= T(1) / len;
        plane.offset /= len;
    }
    return plane;
}

}  // namespace

template <class T>
GeFrustum<T>::GeFrustum(const GeProjectiveMatrix3<T>& projection) : _orthographic(projection.isOrthographic()) {
    // c.x >= -c.w is row0 + row3 >= 0, c.x <= c.w is -row0 + row3 >= 0, and so on for y and z.
    _planes[X_MIN_PLANE] = extractPlane(projection, 0, T(1));
    _planes[Y_MIN_PLANE] = extractPlane(projection, 1, T(1));
    _planes[X_MAX_PLANE] = extractPlane(projection, 0, T(-1));
    _planes[Y_MAX_PLANE] = extractPlane(projection, 1, T(-1));
    _planes[NEAR_PLANE] = extractPlane(projection, 2, T(1));
    _planes[FAR_PLANE] = extractPlane(projection, 2, T(-1));
}

template <class T>
typename GeFrustum<T>::Classification GeFrustum<T>::classify(const GeAlignedBox3<T>& box, unsigned int& mask,
                                                             unsigned int planeCount) const {
    if (planeCount > PLANE_COUNT) planeCount = PLANE_COUNT;
    mask = 0;
    bool outside = false;
    for (unsigned int i = 0; i < planeCount; ++i) {
        const Plane& plane = _planes[i];
        // The corner farthest along the normal has the largest value, the opposite corner the
        // smallest; these two decide for all eight.
        const GePoint3<T> farCorner(plane.normal.x >= T(0) ? box.xMax : box.xMin,
                                    plane.normal.y >= T(0) ? box.yMax : box.yMin,
                                    plane.normal.z >= T(0) ? box.zMax : box.zMin);
        const GePoint3<T> nearCorner(plane.normal.x >= T(0) ? box.xMin : box.xMax,
                                     plane.normal.y >= T(0) ? box.yMin : box.yMax,
                                     plane.normal.z >= T(0) ? box.zMin : box.zMax);
        if (plane.evaluate(farCorner) < T(0)) {
            outside = true;
        } else if (plane.evaluate(nearCorner) < T(0)) {
            mask |= kPlaneBits[i];
        }
    }
    // All tested planes are examined even after one rejects the box, so that mask means the
    // same thing whatever the result.
    if (outside) return OUTSIDE;
    return mask != 0 ? INTERSECTING : INSIDE;
}

template <class T>
void GeFrustum<T>::dump(std::ostream& os) const {
    static const char* const names[PLANE_COUNT] = {"xMin", "yMin", "xMax", "yMax", "near", "far"};
    os << " _orthographic: " << _orthographic;
    for (int i = 0; i < PLANE_COUNT; ++i) {
        os << " _planes[" << names[i] << "]:";
        _planes[i].dump(os);
    }
}

template class GeFrustum<float>;
template class GeFrustum<double>;

}  // namespace Zr
