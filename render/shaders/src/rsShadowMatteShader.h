#pragma once
// A material that shows where shadows fall and nothing else: the shadow that its linked lights
// cast on the fragment, summed over the lights and scaled by the material's shadow strength (shared
// out among the lights), as an opaque grey - white where every light is unshadowed at full
// strength, or the other way round when the material is inverted.
#include <ostream>

#include "coRgbaColorTyped.h"
#include "rsLinkedLights.h"
#include "rsMaterialShader.h"

namespace Zr {

class RsShadowMatteShader : public RsLinkedLights<RsMaterialShader> {
public:
    explicit RsShadowMatteShader(const RCShdPtr<const SdMaterial>& material);

    // Picks the linked lights and shares the shadow strength out among them.
    void initialize(RCShdPtr<RsScene>& scene, RCShdPtr<const RsGeomInstance>& instance) override;
    // Per channel the smaller of (sum of the lights' shadow) x strength and 1, or 1 less that when
    // inverted; alpha 1.
    CoRgbaColorTyped<float> shade(RsShadingContext& context) override;
    // The eye position, where the lights test their shadows.
    unsigned int getNeededContext() const override;

    void dump(std::ostream& os) const;

protected:
    // Nothing to hold: the lights' shadow lookups need no tile, so they are not locked either.
    void lockMemoryImpl() override;
    void unlockMemoryImpl() override;

private:
    bool _inverted;
    float _strength;
};

}  // namespace Zr
