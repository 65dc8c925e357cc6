#pragma once
// The full lighting model of the renderer, for materials of the standard shading model: Blinn-Phong
// in eye space, with an ambient term per light, an emissive term, a bump map, a diffuse map that
// multiplies all of it, and three environment lookups through a sphere map (irradiance by the
// normal, reflection and refraction by the view vector).
//
// Everything that does not change from fragment to fragment - the material's colours with their
// maps' weights, the specular exponent, the needed-context mask - is folded at construction, so
// that shade only multiplies and adds. initialize picks the scene's lights that reach the
// instance; the shader locks them together with its own samplers.
#include <ostream>

#include "coRgbColorTyped.h"
#include "rsEnvironmentShader.h"
#include "rsLinkedLights.h"

namespace Zr {

class RsStdMaterialShader : public RsLinkedLights<RsEnvironmentShader> {
public:
    explicit RsStdMaterialShader(const RCShdPtr<const SdMaterial>& material);

    // Emissive + ambient + diffuse + specular of the linked lights, plus irradiance, all times the
    // diffuse map; then reflection and refraction added. Unclamped; alpha is the opacity times the
    // diffuse map's alpha. Writes the last lookup position into the context's _texCoord and the
    // bumped normal into its _normal. Needs the eye position and normal besides what the maps need.
    CoRgbaColorTyped<float> shade(RsShadingContext& context) override;

    void dump(std::ostream& os) const;

protected:
    // Makes the samplers at the first lock and locks the linked lights.
    void lockMemoryImpl() override;
    // Lets the samplers' tiles go and unlocks the linked lights.
    void unlockMemoryImpl() override;

private:
    // The diffuse colour and the opacity are the base's _color.
    CoRgbColorTyped<float> _emissive;
    CoRgbColorTyped<float> _ambient;
    CoRgbColorTyped<float> _specular;
    float _shininess;
    // 2 to the power 10 _shininess: 1 for a shininess of 0, 1024 for 1.
    float _specularExponent;
};

}  // namespace Zr
