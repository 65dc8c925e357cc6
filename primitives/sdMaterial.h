#pragma once
// The description of a surface: how it is shaded, its colours and maps, and how its fragments are
// laid over what lies behind them.
//
// Like the lights, a material is a plain record with public members; the renderer reads them when
// it makes the material's shaders.
#include <cstdint>
#include <ostream>
#include <string>

#include "coRgbColorTyped.h"
#include "rcShdPtr.h"
#include "sdObject.h"
#include "sdTextureParams.h"

namespace Zr {

class SdMaterial : public SdObject {
public:
    // Materials form a hierarchy of their own: the registries of material shaders are keyed by
    // it, and a host's material class derives its type object from SdMaterial's.
    using RttiClassType = RttiGenType0<SdMaterial, SdMaterial>;
    const RttiType<SdMaterial>& getType() const override { return RttiClassType::getInstance(); }

    // How a fragment of the material is composited over what is behind it. The numbers are fixed:
    // the renderer's table of blending functions is indexed by them.
    enum class TransferMode : std::int32_t {
        normal = 0,
        lumapremul = 1,
        dissolve = 2,
        add = 3,
        subtract = 4,
        multiply = 5,
        spotlight = 6,
        spotlightBlend = 7,
        screen = 8,
        overlay = 9,
        softlight = 10,
        hardlight = 11,
        darken = 12,
        lighten = 13,
        difference = 14,
        exclusion = 15,
        hue = 16,
        saturation = 17,
        color = 18,
        luminance = 19,
    };
    static constexpr int transferModeCount = 20;

    // noShade: the flat diffuse colour. simple: diffuse colour with environment maps, no lights.
    // standard: the full lighting model. shadowMatte: shows only where shadows fall.
    enum class ShadingModel : std::int32_t { noShade = 0, simple = 1, standard = 2, shadowMatte = 3 };

    SdMaterial() = default;

    void dump(std::ostream& os) const;

    ShadingModel _shadingModel = ShadingModel::standard;
    TransferMode _transferMode = TransferMode::normal;

    // The seven colours. Ambient, diffuse and specular are multiplied with the light that reaches
    // the surface, emissive is added as it is; reflection, refraction and irradiance scale what
    // their maps return.
    CoRgbColorTyped<float> _ambient{0.2f, 0.2f, 0.2f};
    CoRgbColorTyped<float> _diffuse{0.8f, 0.8f, 0.8f};
    CoRgbColorTyped<float> _specular{0.0f, 0.0f, 0.0f};
    CoRgbColorTyped<float> _emissive{0.0f, 0.0f, 0.0f};
    CoRgbColorTyped<float> _reflection{1.0f, 1.0f, 1.0f};
    CoRgbColorTyped<float> _refraction{1.0f, 1.0f, 1.0f};
    CoRgbColorTyped<float> _irradiance{1.0f, 1.0f, 1.0f};

    // Alpha of the shaded colour.
    float _opacity = 1.0f;
    // In [0, 1]: the specular exponent is 2 to the power 10 * _shininess.
    float _shininess = 0.5f;
    float _refractionIndex = 1.0f;
    // Shadow matte: how dark a full shadow shows, and whether the picture is inverted.
    float _shadowStrength = 1.0f;
    bool _inverted = false;

    // Wire-frame drawing: each triangle becomes a ring of edges _wireSize wide, measured in
    // pixels when _screenSpace is set and in eye-space units otherwise.
    bool _wireframe = false;
    bool _screenSpace = true;
    float _wireSize = 1.0f;

    // The five maps; each may be null.
    RCShdPtr<const SdTextureParams> _diffuseMap;
    RCShdPtr<const SdTextureParams> _reflectionMap;
    RCShdPtr<const SdTextureParams> _refractionMap;
    RCShdPtr<const SdTextureParams> _irradianceMap;
    RCShdPtr<const SdTextureParams> _bumpMap;

    // The material's name, as the host's scene calls it; the compositing passes name their IDs by
    // it. May be empty.
    std::string _name;
};

}  // namespace Zr
