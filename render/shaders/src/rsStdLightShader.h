#pragma once
// What the three standard lights (omni, direct, spot) share: the described light and its
// instance's matrix, the falloff with distance, the shadow colour mixed into the light where a
// shadow evaluator says the light is blocked, and the common ending of illuminate.
//
// The shadow evaluator is whichever map the light rendered for the current call; null means that
// the light casts no shadow, and every point counts as fully lit.
#include <ostream>

#include "coRgbColorTyped.h"
#include "geAffineMatrix3.h"
#include "rcShdPtr.h"
#include "rsLightShader.h"
#include "rsShadowEvaluator.h"
#include "sdLightDecay.h"
#include "sdStdLight.h"

namespace Zr {

class RsStdLightShader : public RsLightShader {
public:
    ~RsStdLightShader() override;

    RsStdLightShader(const RsStdLightShader&) = delete;
    RsStdLightShader& operator=(const RsStdLightShader&) = delete;

    // The light's colour as it passes the shadows at the fragment, per channel: white where the
    // light has no shadow evaluator or nothing blocks it, moved towards the shadow colour where
    // something does. Does not ask whether the fragment receives shadows.
    CoRgbColorTyped<float> shadow(const RsShadingContext& context) override;

    const RCShdPtr<const SdStdLight>& getLight() const { return _light; }

    // The members of this class and of the base, under their names; for diagnostics.
    void dump(std::ostream& os) const;

protected:
    // lightId is the number of the light's instance, lightToWorld its matrix. A null light is
    // reported as a null pointer failure.
    RsStdLightShader(unsigned int lightId, const GeAffineMatrix3<float>& lightToWorld,
                     const RCShdPtr<const SdStdLight>& light);

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

    // The common end of illuminate once the light is known to reach the fragment: the light's
    // colour, shadowed when the fragment receives shadows, times strength into _color. Returns
    // true.
    bool applyShadowStep(const RsShadingContext& context, Illumination& illumination,
                         float strength) const;

    // The evaluator's three factors at the fragment, or white without an evaluator.
    CoRgbColorTyped<float> evaluateShadow(const RsShadingContext& context) const;

    RCShdPtr<const SdStdLight> _light;
    GeAffineMatrix3<float> _lightToWorld;
    SdLightDecay _decay;
    // Not owned: one of the light's own maps, or null for no shadow.
    const RsShadowEvaluator* _shadowEvaluator = nullptr;
};

}  // namespace Zr
