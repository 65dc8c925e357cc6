#include "rsDirectLightShader.h"

#include "geProjectiveMatrix3.h"
#include "rcExUtil.h"
#include "rsShadingContext.h"

namespace Zr {

namespace {

// The map's projection: x and y divided by the light's width, so that the map spans twice the
// width across, and depth taken orthographically from 0.001 to 100 in front of the light.
GeProjectiveMatrix3<float> makeProjection(const GeScale3<float>& scale) {
    GeProjectiveMatrix3<float> projection = scale.toProjective();
    projection(2, 2) = -0.0200002f;
    projection(2, 3) = -1.00002f;
    projection(3, 2) = 0.0f;
    projection(3, 3) = 1.0f;
    return projection;
}

}  // namespace

RsDirectLightShader::RsDirectLightShader(unsigned int lightId, const GeAffineMatrix3<float>& lightToWorld,
                                         const RCShdPtr<const SdStdLight>& light)
    : RsStdLightShader(lightId, lightToWorld, light),
      _scale(1.0f / light->_width, 1.0f / light->_width, 1.0f) {
    _shadowMap.setSize(static_cast<float>(light->_shadowMapSize));
    _shadowMap.setBias(light->_shadowBias);
    _shadowMap.setRange(light->_shadowRange);
    _shadowMap.setMatrices(_lightToWorld.computeInverse(), makeProjection(_scale));
}

RsDirectLightShader::~RsDirectLightShader() = default;

void RsDirectLightShader::setupRender(const GeAffineMatrix3<float>& worldToCamera) {
    const GeAffineMatrix3<float> lightToCamera = worldToCamera * _lightToWorld;
    _position = GePoint3<float>(lightToCamera.getTranslation());
    _cameraToLight = lightToCamera.computeInverse();
    _direction = RsShadingContext::normalizeOrZero(-lightToCamera.getColumn(2));
    // The map's matrices lead from world space, so the map needs the way back from the camera.
    _shadowMap.setCameraMatrix(worldToCamera.computeInverse());
}

void RsDirectLightShader::initializeMaps(const RCShdPtr<RsScene>&) {
    if (!_light) RCExUtil::throwExNullPtr("SdStdLight");
}

bool RsDirectLightShader::illuminate(const RsShadingContext& context, Illumination& illumination) const {
    const SdStdLight& light = *_light;
    float strength = light._intensity;
    const float cosine = -_direction.dot(context._normal);
    illumination._cosine = cosine;
    // How far the fragment lies beyond the light's plane, along the light.
    const float distance = (context._eyeCoord - _position).dot(_direction);

    if (cosine <= 0.0f) {
        // Turned away: no direct light, but the ambient term still counts the falloff.
        if (_emitAmbient) {
            if (!applyDecay(distance, strength)) {
                illumination._ambient = CoRgbColorTyped<float>(0.0f);
                return false;
            }
            illumination._ambient = light._color * strength;
        }
        return false;
    }

    if (!applyDecay(distance, strength)) return false;
    illumination._direction = -_direction;
    illumination._ambient = light._color * strength;
    return applyShadowStep(context, illumination, strength);
}

void RsDirectLightShader::dump(std::ostream& os) const {
    RsStdLightShader::dump(os);
    os << " _shadowMap:";
    _shadowMap.dump(os);
    os << " _cameraToLight:";
    _cameraToLight.dump(os);
    os << " _scale:";
    _scale.dump(os);
    os << " _position:";
    _position.dump(os);
    os << " _direction:";
    _direction.dump(os);
}

void RsDirectLightShader::lockMemoryImpl() {}

void RsDirectLightShader::unlockMemoryImpl() {}

}  // namespace Zr
