#include "rsStdLightShaderBuilder.h"

#include "assertions.h"
#include "rsDirectLightShader.h"
#include "rsOmniLightShader.h"
#include "rsSpotLightShader.h"
#include "sdStdLight.h"

namespace Zr {

namespace {
// Failures report this source path and these lines, fixed whatever the build layout.
constexpr const char* kSourceFile = "render\\shaders\\src\\rsStdLightShaderBuilder";
constexpr int lineNotStdLight = 67;
constexpr int lineUnknownKind = 97;
}  // namespace

RsStdLightShaderBuilder::RsStdLightShaderBuilder() = default;

RsStdLightShaderBuilder::~RsStdLightShaderBuilder() = default;

RCShdPtr<RsLightShaderBuilder> RsStdLightShaderBuilder::clone() const {
    return makeShared<RsStdLightShaderBuilder>();
}

RCShdPtr<RsLightShader> RsStdLightShaderBuilder::build(const RCShdPtr<const SdInstance>& instance,
                                                       const RCShdPtr<const SdLight>& light,
                                                       const RCShdPtr<RsSceneBuilder>& /*sceneBuilder*/) {
    const RCShdPtr<const SdStdLight> stdLight = dynamicPointerCast<const SdStdLight>(light);
    if (stdLight.isNull())
        Assertions::throwAssertionFailed(kSourceFile, lineNotStdLight, "stdLight.dynamicAssign( light )");
    const unsigned int lightId = instance->getLightNumber();
    const GeAffineMatrix3<float>& lightToWorld = instance->getMatrix();
    switch (stdLight->_kind) {
    case SdStdLight::Kind::direct:
        return makeShared<RsDirectLightShader>(lightId, lightToWorld, stdLight);
    case SdStdLight::Kind::omni:
        return makeShared<RsOmniLightShader>(lightId, lightToWorld, stdLight);
    case SdStdLight::Kind::spot:
        return makeShared<RsSpotLightShader>(lightId, lightToWorld, stdLight);
    }
    Assertions::throwProgramAborted(kSourceFile, lineUnknownKind, nullptr);
}

}  // namespace Zr
