#pragma once
// The lit material shaders' common part: on top of Base (RsMaterialShader or one of its
// subclasses), the lights of the scene that shine on the shader's instance - those whose
// includes() holds for the instance's light table, in the scene's order. initialize picks them;
// the subclass visits them per fragment, and locks them if its lookups need them locked.
#include <vector>

#include "rcShdPtr.h"
#include "rsGeomInstance.h"
#include "rsLightShader.h"
#include "rsScene.h"

namespace Zr {

template <class Base>
class RsLinkedLights : public Base {
public:
    // Replaces the lights by the scene's lights that reach instance. A null scene, instance or
    // light is reported as a null pointer failure.
    void initialize(RCShdPtr<RsScene>& scene, RCShdPtr<const RsGeomInstance>& instance) override {
        const RsScene::LightList& all = scene->_lights;
        const RsGeomInstance::LightSet& table = instance->_lights;
        _lights.clear();
        _lights.reserve(all.size());
        for (const RCShdPtr<RsLightShader>& light : all)
            if (light->includes(table)) _lights.push_back(light);
    }

protected:
    using Base::Base;

    std::vector<RCShdPtr<RsLightShader>> _lights;
};

}  // namespace Zr
