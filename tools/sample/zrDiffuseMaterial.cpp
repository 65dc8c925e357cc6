#include "zrDiffuseMaterial.h"

#include "rsSceneRegistry.h"
#include "rsShaderBuilder.h"
#include "zrDiffuseShader.h"

namespace Zr {

namespace {

// Makes a ZrDiffuseShader of each material it is given. Like every builder it holds nothing, so
// its clone is a new object of its class.
class ZrDiffuseShaderBuilder : public RsMaterialShaderBuilder {
public:
    RCShdPtr<RsMaterialShaderBuilder> clone() const override { return makeShared<ZrDiffuseShaderBuilder>(); }
    RCShdPtr<RsMaterialShader> build(const RCShdPtr<const SdInstance>&, const RCShdPtr<const SdMaterial>& material,
                                     const RCShdPtr<RsSceneBuilder>&) override {
        return makeShared<ZrDiffuseShader>(material);
    }
};

}  // namespace

void ZrDiffuseMaterial::registerShaderBuilder() {
    // A second registration of the type would be refused by the registry: register once.
    static const bool registered = [] {
        RsSceneRegistry::getInstance().registerBuilder(RttiClassType::getInstance(),
                                                       makeShared<ZrDiffuseShaderBuilder>());
        return true;
    }();
    (void)registered;
}

}  // namespace Zr
