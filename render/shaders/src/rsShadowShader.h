#pragma once
// What a material lets through when its instance is drawn from a light into a deep shadow map: a
// transmittance rather than a colour. A clear surface passes white and has no alpha, an opaque
// one passes black; a partly clear one passes light tinted by its diffuse colour (and map).
#include <ostream>

#include "coRgbaColorTyped.h"
#include "rsMaterialShader.h"
#include "rsShaderMap.h"

namespace Zr {

class RsShadowShader : public RsMaterialShader {
public:
    explicit RsShadowShader(const RCShdPtr<const SdMaterial>& material);
    ~RsShadowShader() override;

    // With a = opacity x the map's alpha and u = 1 - a: each colour channel is
    // (colour x map x a + u) x u, and alpha is a.
    CoRgbaColorTyped<float> shade(RsShadingContext& context) override;
    // Nothing, or the texture coordinates with a diffuse map.
    unsigned int getNeededContext() const override;

    void dump(std::ostream& os) const;

protected:
    void lockMemoryImpl() override;
    void unlockMemoryImpl() override;

private:
    // The diffuse colour times the map's weight, with the opacity as alpha.
    CoRgbaColorTyped<float> _color;
    RsShaderMap _diffuseMap;
    unsigned int _neededContext;
};

}  // namespace Zr
