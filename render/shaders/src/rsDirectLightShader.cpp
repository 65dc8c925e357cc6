#include "rsDirectLightShader.h"

#include "rsShadingContext.h"

namespace Zr {

RsDirectLightShader::RsDirectLightShader(unsigned int lightId, const GeAffineMatrix3<float>& lightToWorld,
                                         const RCShdPtr<const SdStdLight>& light)
    : RsStdLightShader(lightId, lightToWorld, light),
      _scale(1.0f / light->_width, 1.0f / light->_width, 1.0f) {
    // The map spans twice the width across.
    setUpShadowMap(_shadowMap, _deepShadowMap, _scale, MapView::parallel);
}

const RsShadowEvaluator* RsDirectLightShader::renderShadowMaps(const RCShdPtr<RsScene>& scene,
                                                               SdStdLight::ShadowMapType type) {
    return renderSingleMap(scene, type, _shadowMap, _deepShadowMap, _scale, MapView::parallel);
}

RsDirectLightShader::~RsDirectLightShader() = default;

void RsDirectLightShader::setupRender(const GeAffineMatrix3<float>& worldToCamera) {
    RsStdLightShader::setupRender(worldToCamera);
    _direction = RsShadingContext::normalizeOrZero(-_lightToCamera.getColumn(2));
    placeShadowMap(worldToCamera);
}

bool RsDirectLightShader::illuminate(const RsShadingContext& context, Illumination& illumination) const {
    illumination._direction = -_direction;
    illumination._cosine = -_direction.dot(context._normal);
    // How far the fragment lies beyond the light's plane, along the light.
    const float distance = (context._eyeCoord - _position).dot(_direction);
    return illuminateFacing(context, illumination._cosine, distance, illumination);
}

void RsDirectLightShader::dump(std::ostream& os) const {
    RsStdLightShader::dump(os);
    os << " _shadowMap:";
    _shadowMap.dump(os);
    os << " _deepShadowMap:";
    _deepShadowMap.dump(os);
    os << " _scale:";
    _scale.dump(os);
    os << " _direction:";
    _direction.dump(os);
}

}  // namespace Zr
