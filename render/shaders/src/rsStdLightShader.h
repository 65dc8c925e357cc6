#pragma once
// What the three standard lights (omni, direct, spot) share: the described light and its
// instance's matrix, the light's placement in the render call's camera space, the falloff with
// distance, the set-up of the light's own shadow map, the shadow colour mixed into the light where
// a shadow evaluator says the light is blocked, and the common ending of illuminate.
//
// The shadow evaluator is whichever map the light rendered for the current call; null means that
// the light casts no shadow, and every point counts as fully lit.
#include <ostream>

#include "coRgbColorTyped.h"
#include "geAffineMatrix3.h"
#include "gePoint3.h"
#include "geScale3.h"
#include "rcShdPtr.h"
#include "rsLightShader.h"
#include "rsShadowEvaluator.h"
#include "sdLightDecay.h"
#include "sdStdLight.h"

namespace Zr {

class RsCubeDeepShadowMap;
class RsCubeShadowMap;
class RsDeepShadowMap;
class RsShadowMap;

class RsStdLightShader : public RsLightShader {
public:
    ~RsStdLightShader() override;

    RsStdLightShader(const RsStdLightShader&) = delete;
    RsStdLightShader& operator=(const RsStdLightShader&) = delete;

    // Places the light in the camera space of worldToCamera: _lightToCamera, its inverse and the
    // light's origin. Lights that place more call this first.
    void setupRender(const GeAffineMatrix3<float>& worldToCamera) override;
    // Renders the light's shadow maps of its map type for the coming picture and makes them the
    // light's shadow evaluator. Nothing happens while either shadow flag of the light is zero, or
    // for a map type outside the three: the evaluator stays as it was (none on a new light). A
    // null light is reported as a null pointer failure.
    void initializeMaps(const RCShdPtr<RsScene>& scene) override;

    // The light's colour as it passes the shadows at the fragment, per channel: white where the
    // light has no shadow evaluator or nothing blocks it, moved towards the shadow colour where
    // something does. Does not ask whether the fragment receives shadows.
    CoRgbColorTyped<float> shadow(const RsShadingContext& context) override;

    const RCShdPtr<const SdStdLight>& getLight() const { return _light; }

    // The members of this class and of the base, under their names; for diagnostics.
    void dump(std::ostream& os) const;

protected:
    // How a single depth map sees from the light: through the spot's cone, or straight along the
    // direct light's parallel beam.
    enum class MapView { perspective, parallel };

    // lightId is the number of the light's instance, lightToWorld its matrix. A null light is
    // reported as a null pointer failure.
    RsStdLightShader(unsigned int lightId, const GeAffineMatrix3<float>& lightToWorld,
                     const RCShdPtr<const SdStdLight>& light);

    // Nothing to hold for omni and direct lights.
    void lockMemoryImpl() override;
    void unlockMemoryImpl() override;

    // Gives the light's own maps their size, bias and filter range from the light. A single plain
    // map also takes its matrices: the light's view from world space, and a projection of x and y
    // scaled by scale with depths from 0.001 to 100 in front of the light, in the way view says.
    void setUpShadowMap(RsCubeShadowMap& map, RsCubeDeepShadowMap& deepMap) const;
    void setUpShadowMap(RsShadowMap& map, RsDeepShadowMap& deepMap, const GeScale3<float>& scale,
                        MapView view) const;

    // Renders the maps of the type (one of the three) for the coming picture; returns the one
    // that is to answer the shadow queries.
    virtual const RsShadowEvaluator* renderShadowMaps(const RCShdPtr<RsScene>& scene,
                                                      SdStdLight::ShadowMapType type) = 0;
    // The passes of a single map: a depth pass into the plain map, or a deep pass into the deep
    // map, whose depth range is first fitted to the scene along the light (scale and view as for
    // setUpShadowMap).
    const RsShadowEvaluator* renderSingleMap(const RCShdPtr<RsScene>& scene, SdStdLight::ShadowMapType type,
                                             RsShadowMap& map, RsDeepShadowMap& deepMap,
                                             const GeScale3<float>& scale, MapView view) const;
    // The six passes of a cube around the light, one per face in face order.
    const RsShadowEvaluator* renderCubeMaps(const RCShdPtr<RsScene>& scene, SdStdLight::ShadowMapType type,
                                            RsCubeShadowMap& map, RsCubeDeepShadowMap& deepMap) const;

    // Multiplies strength by the light's falloff at distance; false, with strength unchanged,
    // when the falloff is not positive and the light does not reach that far. A light without
    // decay reaches everywhere.
    bool applyDecay(float distance, float& strength) const;

    // Mixes the shadow colour into color, channel by channel, by how much shadow (1 lit, 0 fully
    // shadowed) blocks the light, scaled by the light's shadow strength.
    void applyShadowColor(CoRgbColorTyped<float>& color, const CoRgbColorTyped<float>& shadowColor,
                          const CoRgbColorTyped<float>& shadow) const;
    // The same with one shadow factor for all three channels.
    void applyShadowColor(CoRgbColorTyped<float>& color, const CoRgbColorTyped<float>& shadowColor,
                          float shadow) const;
    // applyShadowColor with the light's shadow colour, only where some factor is below 1: a fully
    // lit point keeps its colour exactly.
    void applyShadow(CoRgbColorTyped<float>& color, const CoRgbColorTyped<float>& shadow) const;

    // The shadow factors that reach the fragment: the evaluator's where the fragment receives
    // shadows and the light has an evaluator, white otherwise.
    CoRgbColorTyped<float> receivedShadow(const RsShadingContext& context) const;

    // The rest of illuminate for a light whose only test is which way the fragment faces
    // (omni, direct), once _direction and _cosine are written. facing <= 0, turned away: no
    // direct light, but the ambient term, when the light emits one, still counts the falloff at
    // distance (black where the light does not reach); returns false. Otherwise, where the light
    // reaches that far: _ambient, then the shadow step (the light's colour, shadowed as the
    // fragment receives it, times intensity and falloff into _color), and true; false with
    // _ambient untouched where it does not reach.
    bool illuminateFacing(const RsShadingContext& context, float facing, float distance,
                          Illumination& illumination) const;

    RCShdPtr<const SdStdLight> _light;
    GeAffineMatrix3<float> _lightToWorld;
    SdLightDecay _decay;
    // Not owned: one of the light's own maps, or null for no shadow.
    const RsShadowEvaluator* _shadowEvaluator = nullptr;
    // The light's space to the render call's camera space and back, and the light's origin in
    // camera space; set by setupRender.
    GeAffineMatrix3<float> _lightToCamera;
    GeAffineMatrix3<float> _cameraToLight;
    GePoint3<float> _position;
    // The render call's camera space to world space, for the maps' queries; set by setupRender.
    GeAffineMatrix3<float> _cameraToWorld;
};

}  // namespace Zr
