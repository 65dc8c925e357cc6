#pragma once
// The standard light: a direct (parallel), omni (point) or spot light, with colour, decay, cone and
// shadow settings. The light sits at the origin of its instance's space; direct and spot lights
// shine down that space's negative z axis.
//
// Like SdLight, the settings are plain public members, read by the renderer's light shaders.
#include <cstdint>
#include <ostream>

#include "coRgbColorTyped.h"
#include "rcShdPtr.h"
#include "sdLight.h"
#include "sdLightDecay.h"
#include "sdTextureParams.h"

namespace Zr {

class SdStdLight : public SdLight {
public:
    using RttiClassType = RttiGenType1<SdStdLight, SdLight>;
    const RttiType<SdObject>& getType() const override { return RttiClassType::getInstance(); }

    enum class Kind : std::int32_t { direct = 0, omni = 1, spot = 2 };
    enum class DecayType : std::int32_t { none = 0, linear = 1, quadratic = 2 };
    enum class ConeShape : std::int32_t { circular = 0, rectangular = 1 };
    // How the shadow map is made: the nearest depth, the midpoint of the two nearest depths, or a
    // deep map of transmittance over depth.
    enum class ShadowMapType : std::int32_t { ShadowMapZ = 0, ShadowMapMidpoint = 1, ShadowMapDeep = 2 };

    SdStdLight() = default;

    // The decay of this light, from _decayType and _decayParameter.
    SdLightDecay getDecay() const {
        return SdLightDecay(_decayType == DecayType::quadratic, _decayParameter);
    }

    void dump(std::ostream& os) const;

    Kind _kind = Kind::omni;
    CoRgbColorTyped<float> _color{1.0f, 1.0f, 1.0f};
    // The colour that shadowed light takes on; black darkens, as shadows do.
    CoRgbColorTyped<float> _shadowColor{0.0f, 0.0f, 0.0f};
    // Multiplies the colour.
    float _intensity = 1.0f;
    // How far a shadow pulls the light towards the shadow colour: 0 no shadow, 1 all the way.
    float _shadowStrength = 1.0f;
    // With true the shadow colour multiplies the light's colour instead of replacing it.
    bool _shadowColorMultiplies = false;

    DecayType _decayType = DecayType::none;
    // The distance at which a decaying light has fallen to half its strength (SdLightDecay).
    float _decayParameter = 10.0f;

    // Spot lights: the cone's cross-section, its width-to-height ratio, and the full opening
    // angles in radians within which the light is whole (inner) and beyond which it is gone
    // (outer).
    ConeShape _coneShape = ConeShape::circular;
    float _aspect = 1.0f;
    float _innerConeAngle = 0.5235988f;  // 30 degrees
    float _outerConeAngle = 0.7853982f;  // 45 degrees
    // Spot lights: an image projected through the cone, used when _useProjectedMap is set.
    bool _useProjectedMap = false;
    RCShdPtr<const SdTextureParams> _projectedMap;

    // Direct lights: half the side of the square, across the light's direction, that its shadow
    // map covers (the map reaches _width to either side of the light's axis).
    float _width = 10.0f;

    // Shadows are made only when both flags are non-zero: _shadowsEnabled is the user's switch,
    // _shadowsActive the host's (for instance off while interacting).
    std::int32_t _shadowsActive = 1;
    std::int32_t _shadowsEnabled = 0;
    ShadowMapType _shadowMapType = ShadowMapType::ShadowMapZ;
    // Width and height of the shadow map in pixels.
    std::int32_t _shadowMapSize = 512;
    // Depth added before comparing against the map, against self-shadowing.
    float _shadowBias = 0.01f;
    // The distance over which a shadow map's filtering spreads.
    float _shadowRange = 1.0f;
};

}  // namespace Zr
