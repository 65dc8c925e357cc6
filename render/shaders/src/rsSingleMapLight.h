#pragma once
// What a light with one square map adds to its standard light (spot and direct; the omni light has
// a cube of six): the plain depth map and the deep map, reached by getShadowMap and
// getDeepShadowMap, and the plain map's placement for a render call. The light gives the maps
// their settings and the plain map its matrices with RsStdLightShader::setUpShadowMap; the deep
// map's matrices are fitted to the scene on each render (RsStdLightShader::renderSingleMap).
#include "geAffineMatrix3.h"
#include "rsDeepShadowMap.h"
#include "rsShadowMap.h"

namespace Zr {

class RsSingleMapLight {
public:
    const RsShadowMap& getShadowMap() const { return _shadowMap; }
    RsShadowMap& getShadowMap() { return _shadowMap; }
    const RsDeepShadowMap& getDeepShadowMap() const { return _deepShadowMap; }
    RsDeepShadowMap& getDeepShadowMap() { return _deepShadowMap; }

protected:
    // The map's matrices lead from world space, so the map needs the way back from the camera.
    void placeShadowMap(const GeAffineMatrix3<float>& worldToCamera) {
        _shadowMap.setCameraMatrix(worldToCamera.computeInverse());
    }

    RsShadowMap _shadowMap;
    RsDeepShadowMap _deepShadowMap;
};

}  // namespace Zr
