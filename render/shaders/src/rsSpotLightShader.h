#pragma once
// A spot light: it shines from the origin of its instance's space down the negative z axis,
// within a cone of circular or rectangular cross-section. Inside the inner angle the light is
// whole; between the inner and the outer angle it fades smoothly to nothing at the cone's edge.
// It may project an image through the cone, like a slide projector, and its shadow is one
// perspective depth map seen through the cone.
//
// The cone's frame is the light's space scaled so that the cone's surface lies where x or y
// equals |z| (the outer half angle becomes 45 degrees, across both the width and the height).
#include <ostream>

#include "geAffineMatrix3.h"
#include "gePoint3.h"
#include "geScale3.h"
#include "oPtr.h"
#include "rsSingleMapLight.h"
#include "rsStdLightShader.h"
#include "sdTextureParams.h"
#include "sdTextureSampler.h"

namespace Zr {

class RsSpotLightShader : public RsStdLightShader, public RsSingleMapLight {
public:
    // lightId is the number of the light's instance, lightToWorld its matrix. Works out the
    // cone's scale and penumbra from the light's angles and aspect; the shadow map takes its
    // size, bias and filter range from the light, and its matrices from the light's placement and
    // cone. A null light is reported as a null pointer failure.
    RsSpotLightShader(unsigned int lightId, const GeAffineMatrix3<float>& lightToWorld,
                      const RCShdPtr<const SdStdLight>& light);
    ~RsSpotLightShader() override;

    // Places the light, its cone and its shadow map in the camera space of worldToCamera.
    void setupRender(const GeAffineMatrix3<float>& worldToCamera) override;
    // Reads the projected image while the shader is locked; the context is left as it came.
    bool illuminate(const RsShadingContext& context, Illumination& illumination) const override;

    // What RsStdLightShader::dump prints, then this light's own members; for diagnostics.
    void dump(std::ostream& os) const;

protected:
    // One map seen through the cone, in perspective.
    const RsShadowEvaluator* renderShadowMaps(const RCShdPtr<RsScene>& scene, SdStdLight::ShadowMapType type) override;

    // Multiplies strength by the cone's penumbra at p, a point of the cone's frame in front of
    // the light; false, with strength unchanged, outside the cone. A point on the cone's surface
    // is inside, with no light left.
    bool applyCone(const GePoint3<float>& p, float& strength) const;

    // Makes the projected image's sampler at the first lock (a NullTextureSampler when the map
    // hands out none); lets its cached tiles go at the last unlock.
    void lockMemoryImpl() override;
    void unlockMemoryImpl() override;

    // The image projected through the cone: null unless the light uses one.
    RCShdPtr<const SdTextureParams> _projectedMap;
    OPtr<SdTextureSampler> _projectedSampler;
    // From camera space into the cone's frame: _coneScale after _cameraToLight.
    GeAffineMatrix3<float> _cameraToCone;
    GeScale3<float> _coneScale;
    // The ratio of the inner to the outer cone's opening (1 for a hard edge), and 1 over the
    // width of the penumbra in that ratio (0 for a hard edge).
    float _penumbraStart = 1.0f;
    float _penumbraScale = 0.0f;
};

}  // namespace Zr
