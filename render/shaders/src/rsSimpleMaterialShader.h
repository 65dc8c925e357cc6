#pragma once
// The shader of materials that are not lit but still mirror their surroundings: the flat diffuse
// colour with the standard shader's environment - irradiance by the normal, the diffuse map over
// both, reflection and refraction on top - and its bump map. It reads only the parts of the
// shading context that its maps need.
#include <ostream>

#include "coRgbColorTyped.h"
#include "coRgbaColorTyped.h"
#include "rsMaterialShader.h"
#include "rsShaderMap.h"

namespace Zr {

class RsSimpleMaterialShader : public RsMaterialShader {
public:
    explicit RsSimpleMaterialShader(const RCShdPtr<const SdMaterial>& material);
    ~RsSimpleMaterialShader() override;

    // (colour + irradiance) x diffuse map + reflection + refraction; alpha is the opacity times
    // the diffuse map's alpha. Writes the last lookup position into the context's _texCoord and
    // the bumped normal into its _normal.
    CoRgbaColorTyped<float> shade(RsShadingContext& context) override;
    // What the maps need: texture coordinates for the diffuse map, eye position and normal for a
    // reflection or refraction map, the normal for an irradiance map, and with a bump map of
    // non-zero weight the normal, the texture coordinates and the tangent frame.
    unsigned int getNeededContext() const override;

    void dump(std::ostream& os) const;

protected:
    // Makes the five samplers at the first lock.
    void lockMemoryImpl() override;
    // Lets the samplers' tiles go.
    void unlockMemoryImpl() override;

private:
    // The diffuse colour times the diffuse map's weight, with the opacity as alpha.
    CoRgbaColorTyped<float> _color;
    CoRgbColorTyped<float> _reflection;
    CoRgbColorTyped<float> _refraction;
    CoRgbColorTyped<float> _irradiance;
    float _refractionIndex;
    RsShaderMap _diffuseMap;
    RsShaderMap _reflectionMap;
    RsShaderMap _refractionMap;
    RsShaderMap _irradianceMap;
    RsShaderMap _bumpMap;
    unsigned int _neededContext;
};

}  // namespace Zr
