#include "rsStdLightShader.h"

#include "geProjectiveMatrix3.h"
#include "rcExUtil.h"
#include "rsCubeDeepShadowMap.h"
#include "rsCubeShadowMap.h"
#include "rsDeepShadowMap.h"
#include "rsFZBuffer.h"
#include "rsScene.h"
#include "rsShadingContext.h"
#include "rsShadowMap.h"
#include "rsShadowPass.h"

namespace Zr {

namespace {

// One channel of the shadow colour mix. k is how far the light is pulled towards the shadow
// colour: 0 leaves it, 1 replaces (or, multiplying, scales) it. Beyond 1 the light's own colour
// no longer counts when the shadow colour replaces it.
inline float mixChannel(float color, float shadowColor, float k, bool multiplies) {
    if (multiplies) {
        if (k < 0.0f) return color * (k + shadowColor);
        if (k > 1.0f) return color * shadowColor * k;
        return color * (1.0f - k + shadowColor * k);
    }
    if (k < 0.0f) return color + shadowColor * k;
    if (k > 1.0f) return shadowColor * k;
    return color * (1.0f - k) + shadowColor * k;
}

// The settings that every kind of map takes from the light alike.
template <class Map>
void takeMapSettings(Map& map, const SdStdLight& light) {
    map.setSize(static_cast<float>(light._shadowMapSize));
    map.setBias(light._shadowBias);
    map.setRange(light._shadowRange);
}

}  // namespace

RsStdLightShader::RsStdLightShader(unsigned int lightId, const GeAffineMatrix3<float>& lightToWorld,
                                   const RCShdPtr<const SdStdLight>& light)
    : RsLightShader(lightId, *light),
      _light(light),
      _lightToWorld(lightToWorld),
      _decay(light->getDecay()) {}

RsStdLightShader::~RsStdLightShader() = default;

void RsStdLightShader::setupRender(const GeAffineMatrix3<float>& worldToCamera) {
    _lightToCamera = worldToCamera * _lightToWorld;
    _position = GePoint3<float>(_lightToCamera.getTranslation());
    _cameraToLight = _lightToCamera.computeInverse();
    _cameraToWorld = worldToCamera.computeInverse();
}

void RsStdLightShader::initializeMaps(const RCShdPtr<RsScene>& scene) {
    if (!_light) RCExUtil::throwExNullPtr("SdStdLight");
    const SdStdLight& light = *_light;
    if (light._shadowsActive == 0 || light._shadowsEnabled == 0) return;
    using Type = SdStdLight::ShadowMapType;
    const Type type = light._shadowMapType;
    if (type != Type::ShadowMapZ && type != Type::ShadowMapMidpoint && type != Type::ShadowMapDeep) return;
    _shadowEvaluator = renderShadowMaps(scene, type);
}

const RsShadowEvaluator* RsStdLightShader::renderSingleMap(const RCShdPtr<RsScene>& scene,
                                                           SdStdLight::ShadowMapType type, RsShadowMap& map,
                                                           RsDeepShadowMap& deepMap, const GeScale3<float>& scale,
                                                           MapView view) const {
    const int size = _light->_shadowMapSize;
    if (type != SdStdLight::ShadowMapType::ShadowMapDeep) {
        RsShadowPass::renderDepthMap(type, map.getMap(), size, map.getWorldToShadowMapMatrix(),
                                     map.getProjectionMatrix(), scene);
        return &map;
    }
    const GeAffineMatrix3<float> worldToLight = _lightToWorld.computeInverse();
    GeProjectiveMatrix3<float> projection;
    const bool fitted = RsShadowPass::fitDeepProjection(worldToLight, scale, view == MapView::perspective, *scene,
                                                        projection);
    if (fitted) deepMap.setMatrices(worldToLight, projection);
    deepMap.setCameraMatrix(_cameraToWorld);
    deepMap.allocateMap();
    // Without a depth range in front of the light nothing casts a shadow: the curves stay empty.
    if (fitted) RsShadowPass::renderDeepMap(deepMap, scene);
    return &deepMap;
}

const RsShadowEvaluator* RsStdLightShader::renderCubeMaps(const RCShdPtr<RsScene>& scene,
                                                          SdStdLight::ShadowMapType type, RsCubeShadowMap& map,
                                                          RsCubeDeepShadowMap& deepMap) const {
    const GePoint3<float> center(_lightToWorld.getTranslation());
    const int size = _light->_shadowMapSize;
    if (type != SdStdLight::ShadowMapType::ShadowMapDeep) {
        map.setMapsCenter(center, scene);
        map.setCameraMatrix(_cameraToWorld);
        for (int f = 0; f < RsCubeShadowMap::kFaceCount; ++f) {
            const auto face = static_cast<RsCubeShadowMap::CubeFace>(f);
            RsShadowPass::renderDepthMap(type, map.getMap(face), size, map.getWorldToShadowMapMatrix(face),
                                         map.getProjectionMatrix(face), scene);
        }
        return &map;
    }
    deepMap.setMapsCenter(center, scene);
    deepMap.setCameraMatrix(_cameraToWorld);
    // The six passes draw into fragment buffers of one size, one after the other: they share
    // one buffer's memory.
    RsFZBufferMemory memory;
    for (int f = 0; f < RsCubeDeepShadowMap::kFaceCount; ++f)
        RsShadowPass::renderDeepMap(deepMap.getMap(static_cast<RsCubeDeepShadowMap::CubeFace>(f)), scene, &memory);
    return &deepMap;
}

void RsStdLightShader::lockMemoryImpl() {}

void RsStdLightShader::unlockMemoryImpl() {}

void RsStdLightShader::setUpShadowMap(RsCubeShadowMap& map, RsCubeDeepShadowMap& deepMap) const {
    takeMapSettings(map, *_light);
    takeMapSettings(deepMap, *_light);
}

void RsStdLightShader::setUpShadowMap(RsShadowMap& map, RsDeepShadowMap& deepMap, const GeScale3<float>& scale,
                                      MapView view) const {
    takeMapSettings(map, *_light);
    takeMapSettings(deepMap, *_light);
    // Only the depth part differs: a perspective divides by the distance in front of the light,
    // a parallel view keeps w at 1.
    GeProjectiveMatrix3<float> projection = scale.toProjective();
    const bool perspective = view == MapView::perspective;
    projection(2, 2) = perspective ? -1.00002f : -0.0200002f;
    projection(2, 3) = perspective ? -0.00200002f : -1.00002f;
    projection(3, 2) = perspective ? -1.0f : 0.0f;
    projection(3, 3) = perspective ? 0.0f : 1.0f;
    map.setMatrices(_lightToWorld.computeInverse(), projection);
}

bool RsStdLightShader::applyDecay(float distance, float& strength) const {
    if (_light->_decayType == SdStdLight::DecayType::none) return true;
    const float factor = _decay.computeFactor(distance);
    // Written so that a factor that is not a number does not reach either.
    if (!(factor > 0.0f)) return false;
    strength *= factor;
    return true;
}

void RsStdLightShader::applyShadowColor(CoRgbColorTyped<float>& color,
                                        const CoRgbColorTyped<float>& shadowColor,
                                        const CoRgbColorTyped<float>& shadow) const {
    const float strength = _light->_shadowStrength;
    const bool multiplies = _light->_shadowColorMultiplies;
    color.r = mixChannel(color.r, shadowColor.r, (1.0f - shadow.r) * strength, multiplies);
    color.g = mixChannel(color.g, shadowColor.g, (1.0f - shadow.g) * strength, multiplies);
    color.b = mixChannel(color.b, shadowColor.b, (1.0f - shadow.b) * strength, multiplies);
}

void RsStdLightShader::applyShadowColor(CoRgbColorTyped<float>& color,
                                        const CoRgbColorTyped<float>& shadowColor,
                                        float shadow) const {
    applyShadowColor(color, shadowColor, CoRgbColorTyped<float>(shadow));
}

void RsStdLightShader::applyShadow(CoRgbColorTyped<float>& color, const CoRgbColorTyped<float>& shadow) const {
    if (shadow.getMin() < 1.0f) applyShadowColor(color, _light->_shadowColor, shadow);
}

CoRgbColorTyped<float> RsStdLightShader::receivedShadow(const RsShadingContext& context) const {
    if (!context._receivesShadows || _shadowEvaluator == nullptr) return CoRgbColorTyped<float>(1.0f);
    return _shadowEvaluator->computeBestShadow(context._eyeCoord);
}

bool RsStdLightShader::illuminateFacing(const RsShadingContext& context, float facing, float distance,
                                        Illumination& illumination) const {
    const SdStdLight& light = *_light;
    float strength = light._intensity;
    if (facing <= 0.0f) {
        if (_emitAmbient) {
            const bool reaches = applyDecay(distance, strength);
            illumination._ambient = reaches ? light._color * strength : CoRgbColorTyped<float>(0.0f);
        }
        return false;
    }
    if (!applyDecay(distance, strength)) return false;
    illumination._ambient = light._color * strength;
    illumination._color = light._color;
    applyShadow(illumination._color, receivedShadow(context));
    illumination._color *= strength;
    return true;
}

CoRgbColorTyped<float> RsStdLightShader::shadow(const RsShadingContext& context) {
    CoRgbColorTyped<float> passed(1.0f);
    if (_shadowEvaluator != nullptr) applyShadow(passed, _shadowEvaluator->computeBestShadow(context._eyeCoord));
    return passed;
}

void RsStdLightShader::dump(std::ostream& os) const {
    os << " _lightId: " << _lightId << " _linkMode: " << static_cast<int>(_linkMode)
       << " _emitAmbient: " << _emitAmbient << " _emitDiffuse: " << _emitDiffuse
       << " _emitSpecular: " << _emitSpecular << " _lockCount: " << _lockCount
       << " _light: " << static_cast<const void*>(_light.get()) << " _lightToWorld:";
    _lightToWorld.dump(os);
    os << " _decay:";
    _decay.dump(os);
    os << " _shadowEvaluator: " << static_cast<const void*>(_shadowEvaluator) << " _lightToCamera:";
    _lightToCamera.dump(os);
    os << " _cameraToLight:";
    _cameraToLight.dump(os);
    os << " _position:";
    _position.dump(os);
}

}  // namespace Zr
