#pragma once
// The common part of the builders whose shader depends on the material alone: they hold no data,
// clone themselves by their class, and leave the choice of shader to Builder::makeShader(material)
// (which may answer null). The instance and the scene builder are not used.
#include "rcShdPtr.h"
#include "rsMaterialShader.h"
#include "rsShaderBuilder.h"
#include "sdInstance.h"
#include "sdMaterial.h"

namespace Zr {

template <class Builder>
class RsMaterialOnlyShaderBuilder : public RsMaterialShaderBuilder {
public:
    RCShdPtr<RsMaterialShaderBuilder> clone() const override { return makeShared<Builder>(); }

    RCShdPtr<RsMaterialShader> build(const RCShdPtr<const SdInstance>& /*instance*/,
                                     const RCShdPtr<const SdMaterial>& material,
                                     const RCShdPtr<RsSceneBuilder>& /*sceneBuilder*/) override {
        return Builder::makeShader(material);
    }
};

}  // namespace Zr
