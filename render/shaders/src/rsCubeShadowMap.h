#pragma once
// The shadow of a light that shines in all directions: six square depth maps (RsShadowMap)
// around a centre, one per axis direction; rsCubeMap.h tells how a face is chosen and placed.
#include <ostream>

#include "coRgbColorTyped.h"
#include "gePoint3.h"
#include "rsCubeMap.h"
#include "rsShadowEvaluator.h"
#include "rsShadowMap.h"

namespace Zr {

class RsCubeShadowMap : public RsShadowEvaluator, public RsCubeMap<RsShadowMap> {
public:
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

    // The face's depths, allocated on first use.
    double* getMap(CubeFace face) { return _faces[face].getMap(); }
};

}  // namespace Zr
