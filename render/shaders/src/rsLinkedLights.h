#pragma once
// The lights of a scene that shine on one instance: those whose includes() holds for the
// instance's light table, in the scene's order. The lit material shaders keep this list from
// their initialize on, and visit it per fragment.
#include <vector>

#include "rcShdPtr.h"
#include "rsGeomInstance.h"
#include "rsLightShader.h"
#include "rsScene.h"

namespace Zr {

struct RsLinkedLights {
    using LightList = std::vector<RCShdPtr<RsLightShader>>;

    // Replaces lights by the scene's lights that reach instance. A null scene, instance or light
    // is reported as a null pointer failure.
    static void select(const RCShdPtr<RsScene>& scene, const RCShdPtr<const RsGeomInstance>& instance,
                       LightList& lights) {
        const RsScene::LightList& all = scene->_lights;
        const RsGeomInstance::LightSet& table = instance->_lights;
        lights.clear();
        lights.reserve(all.size());
        for (const RCShdPtr<RsLightShader>& light : all)
            if (light->includes(table)) lights.push_back(light);
    }
};

}  // namespace Zr
