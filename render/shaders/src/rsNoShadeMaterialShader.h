#pragma once
// The shader of materials that are not lit: the material's diffuse colour and opacity, times the
// diffuse map. Without a map it needs nothing of the shading context, so the plainest drawing
// path serves it.
#include <ostream>

#include "coRgbaColorTyped.h"
#include "rsMaterialShader.h"
#include "rsShaderMap.h"

namespace Zr {

class RsNoShadeMaterialShader : public RsMaterialShader {
public:
    explicit RsNoShadeMaterialShader(const RCShdPtr<const SdMaterial>& material);
    ~RsNoShadeMaterialShader() override;

    // The flat colour times the diffuse map's sample, all four channels.
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
