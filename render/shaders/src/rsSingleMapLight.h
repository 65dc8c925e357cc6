#pragma once
// What a light with one square depth map adds to its standard light (spot and direct; the omni
// light has a cube of six): the map, reached by getShadowMap, and its placement for a render call.
// The light gives the map its settings and matrices with RsStdLightShader::setUpShadowMap.
#include "geAffineMatrix3.h"
#include "rsShadowMap.h"

namespace Zr {

class RsSingleMapLight {
public:
    const RsShadowMap& getShadowMap() const { return _shadowMap; }
    RsShadowMap& getShadowMap() { return _shadowMap; }

protected:
    // The map's matrices lead from world space, so the map needs the way back from the camera.
    void placeShadowMap(const GeAffineMatrix3<float>& worldToCamera) {
        _shadowMap.setCameraMatrix(worldToCamera.computeInverse());
    }

    RsShadowMap _shadowMap;
};

}  // namespace Zr
