#pragma once
// The shadow of a light that shines in all directions: six square depth maps around a centre,
// one per axis direction. A query picks the face whose axis is nearest to the point's direction
// from the centre (the largest coordinate by magnitude) and asks that face alone; faces are not
// blended.
//
// setMapsCenter places the six cameras at the light and gives them one perspective projection
// of 95 degrees, a little wider than the 90 that the faces need, so that the filter of a point
// near a face's edge still finds cells beyond it. The far distance reaches the scene's farthest
// corner.
//
// Setters other than setMapsCenter pass their argument to all six faces. Copying moves each
// face's map, as RsShadowMap does.
#include <ostream>

#include "coRgbColorTyped.h"
#include "geAffineMatrix3.h"
#include "gePoint3.h"
#include "geProjectiveMatrix3.h"
#include "rcShdPtr.h"
#include "rsShadowEvaluator.h"
#include "rsShadowMap.h"

namespace Zr {

class RsScene;

class RsCubeShadowMap : public RsShadowEvaluator {
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

    // Six empty faces, the identity camera matrix and the centre at the origin.
    RsCubeShadowMap();
    ~RsCubeShadowMap() override;

    // Move each face's map (RsShadowMap's copying does); every other member is copied.
    RsCubeShadowMap(RsCubeShadowMap& other) = default;
    RsCubeShadowMap(RsCubeShadowMap&& other) = default;
    RsCubeShadowMap& operator=(RsCubeShadowMap& other) = default;
    RsCubeShadowMap& operator=(RsCubeShadowMap&& other) = default;

    CoRgbColorTyped<float> computeBestShadow(const GePoint3<float>& point) const override;
    CoRgbColorTyped<float> computeFastShadow(const GePoint3<float>& point) const override;

    // The face that answers for a point given relative to the centre, in world space. Ties go to
    // the later axis: |x| = |y| = |z| to a z face, |x| = |y| > |z| to a y face.
    static CubeFace chooseFace(const GeVector3<float>& fromCenter);

    double* getMap(CubeFace face) { return _faces[face].getMap(); }
    const GeAffineMatrix3<float>& getWorldToShadowMapMatrix(CubeFace face) const {
        return _faces[face].getWorldToShadowMapMatrix();
    }
    const GeProjectiveMatrix3<float>& getProjectionMatrix(CubeFace face) const {
        return _faces[face].getProjectionMatrix();
    }

    void setSize(float size);
    // Face 0's size, which all faces share.
    float getSize() const { return _faces[0].getSize(); }
    void setRange(float range);
    void setBias(float bias);
    void setCameraMatrix(const GeAffineMatrix3<float>& cameraToWorld);

    // Places the six cameras at center (world space) with a projection whose far distance reaches
    // the farthest corner of the scene's bounds. A null scene is a null pointer failure.
    void setMapsCenter(const GePoint3<float>& center, const RCShdPtr<RsScene>& scene);

    void dump(std::ostream& os) const;

private:
    const RsShadowMap& pickFace(const GePoint3<float>& point) const;

    RsShadowMap _faces[kFaceCount];
    GeAffineMatrix3<float> _cameraMatrix;
    GePoint3<float> _center;
};

}  // namespace Zr
