#pragma once
// What the two cube maps of an omnidirectional light (RsCubeShadowMap of depths,
// RsCubeDeepShadowMap of transmittances) share: six square maps around a centre, one per axis
// direction, and the choice of the face that answers for a point.
//
// A query picks the face whose axis is nearest to the point's direction from the centre (the
// largest coordinate by magnitude) and asks that face alone; faces are not blended. setMapsCenter
// places the six cameras at the light with one perspective projection of 95 degrees, a little
// wider than the 90 that the faces need, so that the filter of a point near a face's edge still
// finds cells beyond it; the far distance reaches the scene's farthest corner.
//
// Setters other than setMapsCenter pass their argument to all six faces. Copying copies each face
// as the face's own copying does (the maps move).
#include <cmath>
#include <ostream>

#include "coRgbColorTyped.h"
#include "geAffineMatrix3.h"
#include "gePoint3.h"
#include "geProjectiveMatrix3.h"
#include "geVector3.h"
#include "rcShdPtr.h"

namespace Zr {

class RsScene;

// The rotation of face f (in the order of the faces below) from world directions to the face
// camera's, which looks down its negative z axis.
GeAffineMatrix3<float> rsCubeFaceRotation(int face);
// The projection that all faces share around center: the far distance reaches the scene's
// farthest corner, the near one is a ten-thousandth of it. A null scene is a null pointer
// failure.
GeProjectiveMatrix3<float> rsCubeProjection(const GePoint3<float>& center, const RCShdPtr<RsScene>& scene);

template <class Face>
class RsCubeMap {
public:
    // The faces, by the direction their camera looks in.
    enum CubeFace {
        FacePositiveY = 0,
        FaceNegativeY = 1,
        FaceNegativeX = 2,
        FacePositiveX = 3,
        FaceNegativeZ = 4,
        FacePositiveZ = 5,
    };
    static constexpr int kFaceCount = 6;

    // The face that answers for a point given relative to the centre, in world space. Ties go to
    // the later axis: |x| = |y| = |z| to a z face, |x| = |y| > |z| to a y face.
    static CubeFace chooseFace(const GeVector3<float>& q) {
        const float ax = std::fabs(q.x);
        const float ay = std::fabs(q.y);
        const float az = std::fabs(q.z);
        if (ay > az) {
            if (!(ax > ay)) return q.y > 0.0f ? FacePositiveY : FaceNegativeY;
        } else if (!(ax > az)) {
            return q.z > 0.0f ? FacePositiveZ : FaceNegativeZ;
        }
        return q.x > 0.0f ? FacePositiveX : FaceNegativeX;
    }

    const GeAffineMatrix3<float>& getWorldToShadowMapMatrix(CubeFace face) const {
        return _faces[face].getWorldToShadowMapMatrix();
    }
    const GeProjectiveMatrix3<float>& getProjectionMatrix(CubeFace face) const {
        return _faces[face].getProjectionMatrix();
    }

    void setSize(float size) {
        for (Face& face : _faces) face.setSize(size);
    }
    // Face 0's size, which all faces share.
    float getSize() const { return _faces[0].getSize(); }
    void setRange(float range) {
        for (Face& face : _faces) face.setRange(range);
    }
    void setBias(float bias) {
        for (Face& face : _faces) face.setBias(bias);
    }
    void setCameraMatrix(const GeAffineMatrix3<float>& cameraToWorld) {
        _cameraMatrix = cameraToWorld;
        for (Face& face : _faces) face.setCameraMatrix(cameraToWorld);
    }

    // Places the six cameras at center (world space).
    void setMapsCenter(const GePoint3<float>& center, const RCShdPtr<RsScene>& scene) {
        _center = center;
        const GeProjectiveMatrix3<float> projection = rsCubeProjection(center, scene);
        const GeAffineMatrix3<float> toCenter = GeAffineMatrix3<float>::makeTranslation(-center.toVector());
        for (int f = 0; f < kFaceCount; ++f) _faces[f].setMatrices(rsCubeFaceRotation(f) * toCenter, projection);
    }

    void dump(std::ostream& os) const {
        for (int f = 0; f < kFaceCount; ++f) {
            os << " _faces[" << f << "]:";
            _faces[f].dump(os);
        }
        os << " _cameraMatrix:";
        _cameraMatrix.dump(os);
        os << " _center:";
        _center.dump(os);
    }

protected:
    const Face& pickFace(const GePoint3<float>& point) const {
        return _faces[chooseFace(_cameraMatrix.transformPoint(point) - _center)];
    }

    Face _faces[kFaceCount];
    GeAffineMatrix3<float> _cameraMatrix;
    GePoint3<float> _center;
};

}  // namespace Zr
