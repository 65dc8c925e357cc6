#pragma once
// The base of the material shaders that start from the material's diffuse colour and opacity and
// texture them with its diffuse map. It folds the map's weight into the colour at construction,
// answers the needed-context mask that the subclass composes, and holds the diffuse map's sampler:
// made at the first lock, its tiles let go at the last unlock. Subclasses with more maps lock
// them in their own lockMemoryImpl after this class's, with makeSampler.
#include <ostream>

#include "coRgbaColorTyped.h"
#include "rsMaterialShader.h"
#include "rsShaderMap.h"

namespace Zr {

class RsDiffuseMapShader : public RsMaterialShader {
public:
    // The mask given at construction.
    unsigned int getNeededContext() const override;

    void dump(std::ostream& os) const;

protected:
    // neededContext: the bits of the shader's other maps and of its own lighting; the diffuse
    // map's texture coordinates are added when the material has that map.
    RsDiffuseMapShader(const RCShdPtr<const SdMaterial>& material, unsigned int neededContext);

    // Makes the diffuse map's sampler at the first lock.
    void lockMemoryImpl() override;
    // Lets the diffuse map's tiles go.
    void unlockMemoryImpl() override;

    // Makes map's sampler unless it exists already (the samplers live as long as the shader).
    static void makeSampler(RsShaderMap& map);

    // The diffuse colour times the diffuse map's weight, with the opacity as alpha.
    CoRgbaColorTyped<float> _color;
    RsShaderMap _diffuseMap;
    unsigned int _neededContext;
};

}  // namespace Zr
