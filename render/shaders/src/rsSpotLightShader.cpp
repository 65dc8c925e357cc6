#include "rsSpotLightShader.h"

#include <algorithm>
#include <cmath>
#include <limits>

#include "geLinearMatrix2.h"
#include "gePoint2.h"
#include "nullTextureSampler.h"
#include "rsShadingContext.h"

namespace Zr {

namespace {

// The smooth step of the penumbra: 0 at t = 0, 1 at t = 1, flat at both ends.
inline float smoothFalloff(float t) { return t * t * (3.0f - t - t); }

// The change of a projected coordinate, -0.5 a / c, across one pixel step: its values at the
// step's two ends, half a step either side of the fragment at (a, c).
inline double projectedStep(float a, float c, float halfStepA, float halfStepC) {
    return -0.5f * ((a + halfStepA) / (c + halfStepC) - (a - halfStepA) / (c - halfStepC));
}

}  // namespace

RsSpotLightShader::RsSpotLightShader(unsigned int lightId, const GeAffineMatrix3<float>& lightToWorld,
                                     const RCShdPtr<const SdStdLight>& light)
    : RsStdLightShader(lightId, lightToWorld, light) {
    if (light->_useProjectedMap) _projectedMap = light->_projectedMap;

    const float outerTangent = std::tan(light->_outerConeAngle * 0.5f);
    // The cone's width; kept away from 0 so that its reciprocal stays finite.
    float width = light->_aspect * outerTangent;
    const float tiny = std::numeric_limits<float>::min();
    if (std::fabs(width) < tiny) width = width < 0.0f ? -tiny : tiny;
    _coneScale = GeScale3<float>(1.0f / width, 1.0f / outerTangent, 1.0f);

    const float innerTangent = std::tan(std::min(light->_innerConeAngle, light->_outerConeAngle) * 0.5f);
    _penumbraStart = outerTangent > 0.0f ? innerTangent / outerTangent : 1.0f;
    _penumbraScale = _penumbraStart < 1.0f ? 1.0f / (1.0f - _penumbraStart) : 0.0f;

    // The map sees the cone's frame in perspective.
    setUpShadowMap(_shadowMap, _deepShadowMap, _coneScale, MapView::perspective);
}

const RsShadowEvaluator* RsSpotLightShader::renderShadowMaps(const RCShdPtr<RsScene>& scene,
                                                             SdStdLight::ShadowMapType type) {
    return renderSingleMap(scene, type, _shadowMap, _deepShadowMap, _coneScale, MapView::perspective);
}

RsSpotLightShader::~RsSpotLightShader() = default;

void RsSpotLightShader::setupRender(const GeAffineMatrix3<float>& worldToCamera) {
    RsStdLightShader::setupRender(worldToCamera);
    _cameraToCone = _coneScale * _cameraToLight;
    placeShadowMap(worldToCamera);
}

bool RsSpotLightShader::applyCone(const GePoint3<float>& p, float& strength) const {
    if (_light->_coneShape == SdStdLight::ConeShape::circular) {
        const float radius2 = p.x * p.x + p.y * p.y;
        const float depth2 = p.z * p.z;
        if (depth2 < radius2) return false;
        // The fragment's place between the axis (0) and the cone's surface (1).
        const float f = std::sqrt(radius2 / depth2);
        if (f > _penumbraStart) strength *= smoothFalloff((1.0f - f) * _penumbraScale);
        return true;
    }
    const float ax = std::fabs(p.x);
    const float ay = std::fabs(p.y);
    const float az = std::fabs(p.z);
    if (ax > az || ay > az) return false;
    const float fx = ax / az;
    const float fy = ay / az;
    float t = fx <= _penumbraStart ? 1.0f : (1.0f - fx) * _penumbraScale;
    if (fy > _penumbraStart) t *= (1.0f - fy) * _penumbraScale;
    if (t < 1.0f) strength *= smoothFalloff(t);
    return true;
}

bool RsSpotLightShader::illuminate(const RsShadingContext& context, Illumination& illumination) const {
    const SdStdLight& light = *_light;
    // Where the light does not reach, not even its ambient term counts.
    const auto unlit = [&illumination] {
        illumination._ambient = CoRgbColorTyped<float>(0.0f);
        return false;
    };
    // A cone of no width lights nothing.
    if (light._aspect <= 0.0f) return unlit();

    float strength = light._intensity;
    const GePoint3<float> p = _cameraToCone.transformPoint(context._eyeCoord);
    // Behind the light, or at its very origin, or outside the cone.
    if (p.z >= 0.0f || !applyCone(p, strength)) return unlit();

    const GeVector3<float> toLight = _position - context._eyeCoord;
    const float distance = toLight.length();
    if (distance != 0.0f) illumination._direction = toLight / distance;
    if (!applyDecay(distance, strength)) return unlit();

    illumination._ambient = light._color * strength;
    illumination._cosine = illumination._direction.dot(context._normal);
    if (illumination._cosine <= 0.0f) return false;

    const CoRgbColorTyped<float> shadow = receivedShadow(context);
    illumination._color = light._color;

    if (_projectedMap && (shadow.r != 0.0f || shadow.g != 0.0f || shadow.b != 0.0f)) {
        // The image spans the cone's square cross-section, centred on its axis.
        const float scale = -0.5f / p.z;
        const GePoint2<double> texCoord(p.x * scale + 0.5f, p.y * scale + 0.5f);
        GeLinearMatrix2<double> derivatives = context._texCoordDerivatives;
        if (_projectedMap->needsDerivatives()) {
            const GeVector3<float> h = _cameraToCone.transformVector(context._dEyeCoord_dx * 0.5f);
            const GeVector3<float> k = _cameraToCone.transformVector(context._dEyeCoord_dy * 0.5f);
            derivatives._m[0] = projectedStep(p.x, p.z, h.x, h.z);
            derivatives._m[1] = projectedStep(p.x, p.z, k.x, k.z);
            derivatives._m[2] = projectedStep(p.y, p.z, h.y, h.z);
            derivatives._m[3] = projectedStep(p.y, p.z, k.y, k.z);
        }
        const CoRgbaColorTyped<float> g = _projectedSampler->sample(texCoord, derivatives);
        const float w = _projectedMap->getWeight();
        // Where the light is shadowed the image fades out with it.
        illumination._color.r *= g.r * w * shadow.r + 1.0f - shadow.r;
        illumination._color.g *= g.g * w * shadow.g + 1.0f - shadow.g;
        illumination._color.b *= g.b * w * shadow.b + 1.0f - shadow.b;
    }

    applyShadow(illumination._color, shadow);
    illumination._color *= strength;
    return true;
}

void RsSpotLightShader::dump(std::ostream& os) const {
    RsStdLightShader::dump(os);
    os << " _shadowMap:";
    _shadowMap.dump(os);
    os << " _deepShadowMap:";
    _deepShadowMap.dump(os);
    os << " _projectedMap: " << static_cast<const void*>(_projectedMap.get());
    os << " _projectedSampler: " << static_cast<const void*>(_projectedSampler.get());
    os << " _cameraToCone:";
    _cameraToCone.dump(os);
    os << " _coneScale:";
    _coneScale.dump(os);
    os << " _penumbraStart: " << _penumbraStart;
    os << " _penumbraScale: " << _penumbraScale;
}

void RsSpotLightShader::lockMemoryImpl() {
    if (_projectedSampler) return;
    if (_projectedMap) _projectedSampler = _projectedMap->createSampler();
    if (!_projectedSampler) _projectedSampler = makeOwned<NullTextureSampler>();
}

void RsSpotLightShader::unlockMemoryImpl() {
    if (_projectedSampler) _projectedSampler->releaseTiles();
}

}  // namespace Zr
