#pragma once
// A parallel light: it shines down the negative z axis of its instance's space, the same way at
// every point, like a distant sun. Its falloff counts the distance from the light's plane along
// that direction, and its shadow is one orthographic depth map, whose square reaches the light's
// width to either side of its axis.
#include <ostream>

#include "geAffineMatrix3.h"
#include "geScale3.h"
#include "geVector3.h"
#include "rsSingleMapLight.h"
#include "rsStdLightShader.h"

namespace Zr {

class RsDirectLightShader : public RsStdLightShader, public RsSingleMapLight {
public:
    // lightId is the number of the light's instance, lightToWorld its matrix. The shadow map
    // takes its size, bias and filter range from the light, and its matrices from the light's
    // placement and width; a null light is reported as a null pointer failure.
    RsDirectLightShader(unsigned int lightId, const GeAffineMatrix3<float>& lightToWorld,
                        const RCShdPtr<const SdStdLight>& light);
    ~RsDirectLightShader() override;

    // Places the light, its direction and its shadow map in the camera space of worldToCamera.
    void setupRender(const GeAffineMatrix3<float>& worldToCamera) override;
    bool illuminate(const RsShadingContext& context, Illumination& illumination) const override;

    // What RsStdLightShader::dump prints, then this light's own members; for diagnostics.
    void dump(std::ostream& os) const;

protected:
    // One map along the light's parallel beam.
    const RsShadowEvaluator* renderShadowMaps(const RCShdPtr<RsScene>& scene, SdStdLight::ShadowMapType type) override;

    // From the light's space to the map's projection: 1 / width across, 1 along the light.
    GeScale3<float> _scale;
    // The unit direction in which the light shines, in camera space.
    GeVector3<float> _direction{0.0f, 0.0f, -1.0f};
};

}  // namespace Zr
