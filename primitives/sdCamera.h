#pragma once
// A camera: the projection from its camera space, which looks down the negative z axis, to
// normalised device space, -1 to 1 in x, y and depth (near plane -1, far plane 1). Where the
// camera stands is its instance's matrix (camera to world).
//
// Depth of field. A renderer that simulates a lens renders several passes, each from a point
// (lx, ly) of the lens: it moves the view by the offset, subtracting lx and ly from the x and y of
// the world-to-camera translation, and asks computeProjection for the projection of that offset.
// The projection then shears the view so that the plane z = -_focalDistance projects as it does
// through the centre of the lens: points on that plane land on the same pixel in every pass and
// stay sharp, points nearer or farther move and blur. The shear is
//
//   x' = x - lx * z / _focalDistance,  y' = y - ly * z / _focalDistance,
//
// applied before the centred projection; it works alike for both kinds of projection. The
// offsets are in camera-space units.
#include <cstdint>
#include <ostream>
#include <utility>

#include "geProjectiveMatrix3.h"
#include "sdObject.h"

namespace Zr {

class SdCamera : public SdObject {
public:
    using RttiClassType = RttiGenType1<SdCamera, SdObject>;
    const RttiType<SdObject>& getType() const override { return RttiClassType::getInstance(); }

    enum class Projection : std::int32_t { perspective = 0, orthographic = 1 };

    SdCamera() = default;

    // The projection seen through the lens at lensOffset (see above). The settings must be valid:
    // a field of view strictly between 0 and pi, positive aspect, orthographic height and focal
    // distance, 0 < _near < _far for a perspective and _near < _far for an orthographic camera;
    // otherwise ExAssertionFailed.
    virtual void computeProjection(GeProjectiveMatrix3<double>& result,
                                   std::pair<float, float> lensOffset) const;
    // The projection through the centre of the lens.
    virtual void computeProjection(GeProjectiveMatrix3<double>& result) const;

    void dump(std::ostream& os) const;

    Projection _projection = Projection::perspective;
    // Perspective: the full vertical opening angle, in radians.
    float _fieldOfView = 0.8726646f;  // 50 degrees
    // Orthographic: the height of the view in camera-space units.
    float _orthographicHeight = 2.0f;
    // Width over height of the picture.
    float _aspect = 1.0f;
    // Distances of the near and far planes along the view direction.
    float _near = 0.1f;
    float _far = 1000.0f;
    // Distance of the plane that stays sharp under a lens offset.
    float _focalDistance = 10.0f;
};

}  // namespace Zr
