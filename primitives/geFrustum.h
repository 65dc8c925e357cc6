#pragma once
// The viewing volume of a projection as six planes in camera space, and the test of an aligned
// box against them. A camera-space point p is inside the volume when its clip coordinates
// c = projection * p satisfy -c.w <= c.x, c.y, c.z <= c.w; each of the six inequalities is one
// plane. The planes are kept in the order x minimum, y minimum, x maximum, y maximum, near, far,
// with the mask bits 0x01, 0x04, 0x02, 0x08, 0x10, 0x20 (the same bits by which the polygon
// clipper names x minimum 1, x maximum 2, y minimum 4, y maximum 8, z minimum 16, z maximum 32).
#include <ostream>

#include "geAlignedBox3.h"
#include "gePoint3.h"
#include "geProjectiveMatrix3.h"
#include "geVector3.h"

namespace Zr {

template <class T>
class GeFrustum {
public:
    enum Classification : unsigned int {
        INSIDE = 0,        // every point of the box is within all planes tested
        OUTSIDE = 1,       // the box lies wholly outside at least one plane
        INTERSECTING = 2,  // the box crosses at least one plane and is outside none
    };

    // Indices of the planes, in the order in which classify tests them.
    enum PlaneIndex : int {
        X_MIN_PLANE = 0,
        Y_MIN_PLANE = 1,
        X_MAX_PLANE = 2,
        Y_MAX_PLANE = 3,
        NEAR_PLANE = 4,
        FAR_PLANE = 5,
        PLANE_COUNT = 6,
    };

    // The mask bit of each plane.
    enum PlaneBit : unsigned int {
        X_MIN_BIT = 0x01,
        X_MAX_BIT = 0x02,
        Y_MIN_BIT = 0x04,
        Y_MAX_BIT = 0x08,
        NEAR_BIT = 0x10,
        FAR_BIT = 0x20,
        SIDE_BITS = 0x0f,
        ALL_BITS = 0x3f,
    };

    // A plane n . p + d = 0 whose inside is n . p + d >= 0. n has length 1 unless the plane is
    // degenerate (all coefficients of the projection row pair 0), so evaluate gives a signed
    // distance.
    struct Plane {
        GeVector3<T> normal;
        T offset{};
        constexpr T evaluate(const GePoint3<T>& p) const {
            return normal.x * p.x + normal.y * p.y + normal.z * p.z + offset;
        }
        void dump(std::ostream& os) const {
            os << " normal:";
            normal.dump(os);
            os << " offset: " << offset;
        }
    };

    // The planes of the projection's viewing volume, in the camera space that the projection
    // takes as input.
    explicit GeFrustum(const GeProjectiveMatrix3<T>& projection);

    // Tests the box against the first planeCount planes (at most 6; 4 tests the sides only).
    // On return mask holds the bit of every tested plane that the box crosses, that is, with
    // corners on both sides; whatever mask held before is replaced. A box touching a plane from
    // the inside is inside it; a box touching it from the outside crosses it. The box must not
    // be empty.
    Classification classify(const GeAlignedBox3<T>& box, unsigned int& mask, unsigned int planeCount) const;

    const Plane& getPlane(int index) const { return _planes[index]; }
    static unsigned int getPlaneBit(int index) { return kPlaneBits[index]; }
    // True when the projection was a parallel one.
    bool isOrthographic() const { return _orthographic; }

    void dump(std::ostream& os) const;

private:
    static constexpr unsigned int kPlaneBits[PLANE_COUNT] = {X_MIN_BIT, Y_MIN_BIT, X_MAX_BIT,
                                                             Y_MAX_BIT, NEAR_BIT,  FAR_BIT};

    Plane _planes[PLANE_COUNT];
    bool _orthographic;
};

extern template class GeFrustum<float>;
extern template class GeFrustum<double>;

}  // namespace Zr
