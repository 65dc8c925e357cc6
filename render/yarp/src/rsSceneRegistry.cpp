#include "rsSceneRegistry.h"

#include <typeinfo>

#include "lkSingleton.h"
#include "rcExUtil.h"

namespace Zr {

RsSceneRegistry::RsSceneRegistry() = default;

RsSceneRegistry::~RsSceneRegistry() = default;

RsSceneRegistry& RsSceneRegistry::getInstance() {
    RsSceneRegistry* instance = LkSingleton<RsSceneRegistry>::getInstance();
    if (!instance) RCExUtil::throwExNullPtr(typeid(RsSceneRegistry).name());
    return *instance;
}

void RsSceneRegistry::registerBuilder(const RttiType<SdMaterial>& type, const MaterialShaderBuilderPtr& builder) {
    _materialShaders.registerBuilder(type, builder);
}

void RsSceneRegistry::registerShadowShaderBuilder(const RttiType<SdMaterial>& type,
                                                  const MaterialShaderBuilderPtr& builder) {
    _shadowShaders.registerBuilder(type, builder);
}

void RsSceneRegistry::registerBuilder(const RttiType<SdObject>& type, const LightShaderBuilderPtr& builder) {
    _lightShaders.registerBuilder(type, builder);
}

RsSceneRegistry::MaterialShaderBuilderPtr RsSceneRegistry::getMaterialShaderBuilder(
    const RttiType<SdMaterial>& type) const {
    return _materialShaders.resolveBuilder(type);
}

RsSceneRegistry::MaterialShaderBuilderPtr RsSceneRegistry::getShadowShaderBuilder(
    const RttiType<SdMaterial>& type) const {
    return _shadowShaders.resolveBuilder(type);
}

RsSceneRegistry::LightShaderBuilderPtr RsSceneRegistry::getLightShaderBuilder(const RttiType<SdObject>& type) const {
    return _lightShaders.resolveBuilder(type);
}

}  // namespace Zr
