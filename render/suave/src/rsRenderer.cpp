#include "rsRenderer.h"

#include "assertions.h"
#include "geFrustum.h"
#include "rcStrongPtr.h"
#include "rsABufferFactory.h"
#include "rsAuxOutputs.h"
#include "rsCullAndSort.h"
#include "rsFZBufferFactory.h"
#include "rsSceneRenderer.h"
#include "sdCamera.h"

namespace Zr {

namespace {

constexpr const char* kSourceFile = "render\\suave\\src\\rsRenderer";

// Steps 2 to 7 of a render on the path of Factory, whose settings are made: the scene renderer
// with its matrices, the lights, the culled instance list, and the region recursion over the
// factory's pixel region. Locals go in the reverse order of their making: frustum, list, scene
// renderer; the caller's factory last.
template <class Factory>
void renderWithFactory(Factory& factory, const RCShdPtr<RsScene>& scene, bool zBuffer,
                       const GeAffineMatrix3<float>& worldToCamera,
                       const GeProjectiveMatrix3<double>& projection, const GeRectangle<int>& rectangle) {
    RCStrongPtr<RsSceneRenderer<Factory>> sceneRenderer(new RsSceneRenderer<Factory>(factory));
    sceneRenderer->setup(worldToCamera, projection, rectangle);

    // Each light places itself for this call and rebuilds its shadow maps, in the scene's order,
    // before any pixel is drawn.
    for (const RCShdPtr<RsLightShader>& light : scene->_lights) {
        light->setupRender(sceneRenderer->getWorldToCamera());
        light->initializeMaps(scene);
    }

    const GeRectangle<int> pixelRegion = factory.getPixelRegion();
    RsGeomInstanceList instances;
    const GeFrustum<double> frustum(sceneRenderer->getProjection());
    cullAndSortInstances(scene, zBuffer, frustum, sceneRenderer->getWorldToCamera(), instances);
    sceneRenderer->renderRegion(instances, pixelRegion);
}

}  // namespace

RsRenderer::RsRenderer() = default;

RsRenderer::~RsRenderer() = default;

void RsRenderer::render(const GeAffineMatrix3<float>& worldToCamera, const GeProjectiveMatrix3<double>& projection,
                        const RCShdPtr<RsScene>& scene, const GeRectangle<int>& rectangle,
                        const IxWriteGuard& output) {
    renderCommon(scene, worldToCamera, projection, false, 1.0f, rectangle, output, true);
}

void RsRenderer::render(const RCShdPtr<SdInstance>& camera, const RCShdPtr<RsScene>& scene,
                        const GeRectangle<int>& rectangle, const IxWriteGuard& output) {
    const SdInstance& instance = *camera;
    const SdCamera* sdCamera = dynamic_cast<const SdCamera*>(instance.getObject().get());
    if (sdCamera == nullptr) return;
    const GeAffineMatrix3<float> worldToCamera = instance.getMatrix().computeInverse();
    GeProjectiveMatrix3<double> projection;
    sdCamera->computeProjection(projection);
    renderCommon(scene, worldToCamera, projection, false, 1.0f, rectangle, output, true);
}

void RsRenderer::renderCommon(const RCShdPtr<RsScene>& scene, const GeAffineMatrix3<float>& worldToCamera,
                              const GeProjectiveMatrix3<double>& projection, bool accumulate, float weight,
                              const GeRectangle<int>& rectangle, const IxWriteGuard& output,
                              bool unpremultiply) {
    if (_antialiasing) {
        RsABufferFactory factory;
        factory.setFilterKernel(_filterKernel);
        factory.setZBuffer(_zBuffer);
        factory.setOutput(output, accumulate, weight);
        factory.setFillColor(_fillColor);
        factory.setBackground(_background);
        factory.setUnpremultiply(unpremultiply);
        renderWithFactory(factory, scene, _zBuffer, worldToCamera, projection, rectangle);
        return;
    }
    RsFZBufferFactory factory;
    factory.setZBuffer(_zBuffer);
    factory.setOutput(output, accumulate, weight);
    factory.setFillColor(_fillColor);
    factory.setBackground(_background);
    factory.setUnpremultiply(unpremultiply);
    if (!_bufferMemory) _bufferMemory = std::make_unique<RsFZBufferMemory>();
    factory.setMemory(_bufferMemory.get());
    if (_auxOutputs != nullptr) {
        _auxOutputs->begin(*scene, worldToCamera, projection);
        _auxOutputs->beginMotion(*scene, rectangle);
        factory.setAuxOutputs(_auxOutputs);
    }
    renderWithFactory(factory, scene, _zBuffer, worldToCamera, projection, rectangle);
}

void RsRenderer::dump(std::ostream& os) const {
    os << " _antialiasing: " << _antialiasing << " _zBuffer: " << _zBuffer << " _filterKernel:";
    _filterKernel.dump(os);
    os << " _fillColor:";
    _fillColor.dump(os);
    os << " _background:";
    _background.dump(os);
}

unsigned int RsRenderer::getMemUsageMb() const {
    Assertions::throwProgramAborted(kSourceFile, 397, nullptr);
}

unsigned int RsRenderer::getTileMemUsageMb() const {
    Assertions::throwProgramAborted(kSourceFile, 409, nullptr);
}

}  // namespace Zr
