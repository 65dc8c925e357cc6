#include "renderInit.h"

#include "inBuildInfoUtil.h"
#include "inInit.h"
#include "inPackageRegistry.h"
#include "libraryBuildInfo.h"
#include "oPtr.h"

namespace Zr {

namespace {

// The packages of this library, made in static initialisation in this order. Each registers,
// then states what must be up before it, in the order given.
struct RenderLibraryPackages {
    InInit<ZrInit::render> render{"render"};
    InInit<ZrInit::suave> suave{"suave"};
    InInit<ZrInit::shaders> shaders{"shaders"};
    InInit<ZrInit::yarp> yarp{"yarp"};
    const InBuildInfo* buildInfo = nullptr;

    RenderLibraryPackages() {
        startRender();
        startSuave();
        startShaders();
        startYarp();
    }

    // The build record's methods are code of this library: it must not outlive it.
    ~RenderLibraryPackages() {
        if (buildInfo) InBuildInfoUtil::unregisterInfo(*buildInfo);
    }

    void startRender() {
        render.registerPackage();
        render.addDependency(InInit<ZrInit::media>::getType());
        render.addDependency(InInit<ZrInit::internalAPI>::getType());
        render.addDependency(InInit<ZrInit::primitives>::getType());
        render.addDependency(InInit<ZrInit::pluginAPI>::getType());
        render.addDependency(InInit<ZrInit::resmgt>::getType());
        render.addDependency(InInit<ZrInit::base>::getType());
        render.addDependency(InInit<ZrInit::suave>::getType());
        render.addDependency(InInit<ZrInit::shaders>::getType());
        render.addDependency(InInit<ZrInit::yarp>::getType());
        buildInfo = &InBuildInfoUtil::registerInfo(OPtr<InBuildInfo>(new LibraryBuildInfo));
    }

    void startSuave() {
        suave.registerPackage();
        suave.addDependency(InInit<ZrInit::yarp>::getType());
        suave.addDependency(InInit<ZrInit::internalAPI>::getType());
        suave.addDependency(InInit<ZrInit::pluginAPI>::getType());
        suave.addDependency(InInit<ZrInit::primitives>::getType());
        suave.addDependency(InInit<ZrInit::resmgt>::getType());
        suave.addDependency(InInit<ZrInit::base>::getType());
    }

    void startShaders() {
        shaders.registerPackage();
        shaders.addDependency(InInit<ZrInit::yarp>::getType());
        shaders.addDependency(InInit<ZrInit::suave>::getType());
        shaders.addDependency(InInit<ZrInit::primitives>::getType());
        shaders.addDependency(InInit<ZrInit::resmgt>::getType());
        shaders.addDependency(InInit<ZrInit::base>::getType());

        // ---- Scene registry registrations of the standard shaders ----
        // The "shaders" package enters its builders into the RsSceneRegistry singleton here:
        // one for lights (SdStdLight), one for materials and one for shadow shaders (SdMaterial).
        // ---- end of scene registry registrations ----
    }

    void startYarp() {
        yarp.registerPackage();
        yarp.addDependency(InInit<ZrInit::primitives>::getType());
        yarp.addDependency(InInit<ZrInit::resmgt>::getType());
        yarp.addDependency(InInit<ZrInit::base>::getType());
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
