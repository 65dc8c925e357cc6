#include "renderInit.h"

#include "inBuildInfoUtil.h"
#include "inInit.h"
#include "inPackageRegistry.h"
#include "libraryBuildInfo.h"
#include "oPtr.h"
#include "rsSceneRegistry.h"
#include "rsStdLightShaderBuilder.h"
#include "rsStdMaterialShaderBuilder.h"
#include "rsStdShadowShaderBuilder.h"
#include "rttiGenType.h"
#include "sdMaterial.h"
#include "sdStdLight.h"

namespace Zr {

namespace {

// Registers a package, then states what must be up before it, in the order given.
template <class... DependencyTags>
void start(InPackageInit& package) {
    package.registerPackage();
    (package.addDependency(InInit<DependencyTags>::getType()), ...);
}

// The start of the "shaders" package: the standard builders under the types that every standard
// light and every material derives from, so that any of them finds a shader.
void registerStandardShaderBuilders() {
    RsSceneRegistry& registry = RsSceneRegistry::getInstance();
    registry.registerBuilder(RttiGenType1<SdStdLight, SdLight>::getInstance(), makeShared<RsStdLightShaderBuilder>());
    const RttiType<SdMaterial>& material = RttiGenType0<SdMaterial, SdMaterial>::getInstance();
    registry.registerBuilder(material, makeShared<RsStdMaterialShaderBuilder>());
    registry.registerShadowShaderBuilder(material, makeShared<RsStdShadowShaderBuilder>());
}

// The packages of this library, made in static initialisation in this order.
struct RenderLibraryPackages {
    InInit<ZrInit::render> render{"render"};
    InInit<ZrInit::suave> suave{"suave"};
    InInit<ZrInit::shaders> shaders{"shaders"};
    InInit<ZrInit::yarp> yarp{"yarp"};
    const InBuildInfo* buildInfo = nullptr;

    RenderLibraryPackages() {
        namespace Tag = ZrInit;
        start<Tag::media, Tag::internalAPI, Tag::primitives, Tag::pluginAPI, Tag::resmgt, Tag::base, Tag::suave,
              Tag::shaders, Tag::yarp>(render);
        buildInfo = &InBuildInfoUtil::registerInfo(OPtr<InBuildInfo>(new LibraryBuildInfo));
        start<Tag::yarp, Tag::internalAPI, Tag::pluginAPI, Tag::primitives, Tag::resmgt, Tag::base>(suave);
        start<Tag::yarp, Tag::suave, Tag::primitives, Tag::resmgt, Tag::base>(shaders);
        // Once per process, as this object is made once, and before the host can call in.
        registerStandardShaderBuilders();
        start<Tag::primitives, Tag::resmgt, Tag::base>(yarp);
    }

    // The build record's methods are code of this library: it must not outlive it.
    ~RenderLibraryPackages() {
        if (buildInfo) InBuildInfoUtil::unregisterInfo(*buildInfo);
    }
};

RenderLibraryPackages renderLibraryPackages;

}  // namespace

void RenderInit::ensureLoaded() {}

std::vector<InPackageRecord> RenderInit::getPackageRecords() {
    return {renderLibraryPackages.render.getRecord(), renderLibraryPackages.suave.getRecord(),
            renderLibraryPackages.shaders.getRecord(), renderLibraryPackages.yarp.getRecord()};
}

const InBuildInfo& RenderInit::getBuildInfo() { return *renderLibraryPackages.buildInfo; }

}  // namespace Zr
