#include "rsShadowPass.h"

#include "geFrustum.h"
#include "geRectangle.h"
#include "rsCullAndSort.h"
#include "rsDeepShadowMap.h"
#include "rsFZBufferFactory.h"
#include "rsMZBufferFactory.h"
#include "rsScene.h"
#include "rsSceneRenderer.h"
#include "rsZBufferFactory.h"

namespace Zr {

namespace {

// How far the depth range stands off the scene's box at either end: an absolute part and a part
// of the distance from the light.
constexpr double kDepthMargin = 0.0001;
constexpr double kRelativeDepthMargin = 1e-5;
// The near distance as a part of the far one, where the scene reaches up to the light.
constexpr double kNearToFar = 0.0001;

// One pass: the casters that the frustum of projection admits, drawn into the factory's whole
// pixel region.
template <class Factory>
void renderPass(Factory& factory, const GeAffineMatrix3<float>& worldToMap, const GeProjectiveMatrix3<float>& projection,
                const RCShdPtr<RsScene>& scene) {
    RsSceneRenderer<Factory> renderer(factory);
    renderer.setup(worldToMap, GeProjectiveMatrix3<double>(projection), factory.getPixelRegion());
    RsGeomInstanceList casters;
    const GeFrustum<double> frustum(renderer.getProjection());
    cullAndSortShadowCasters(scene, frustum, worldToMap, casters);
    renderer.renderShadowPass(casters);
}

}  // namespace

void RsShadowPass::renderDepthMap(SdStdLight::ShadowMapType type, double* map, int size,
                                  const GeAffineMatrix3<float>& worldToMap,
                                  const GeProjectiveMatrix3<float>& projection, const RCShdPtr<RsScene>& scene) {
    if (type == SdStdLight::ShadowMapType::ShadowMapMidpoint) {
        RsMZBufferFactory factory;
        factory.setOutput(size, size, map);
        renderPass(factory, worldToMap, projection, scene);
    } else {
        RsZBufferFactory factory;
        factory.setOutput(size, size, map);
        renderPass(factory, worldToMap, projection, scene);
    }
}

void RsShadowPass::renderDeepMap(RsDeepShadowMap& map, const RCShdPtr<RsScene>& scene, RsFZBufferMemory* memory) {
    RsFZBufferFactory factory;
    factory.setOutput(map);
    factory.setMemory(memory);
    renderPass(factory, map.getWorldToShadowMapMatrix(), map.getProjectionMatrix(), scene);
}

bool RsShadowPass::fitDeepProjection(const GeAffineMatrix3<float>& worldToLight, const GeScale3<float>& scale,
                                     bool perspective, const RsScene& scene, GeProjectiveMatrix3<float>& projection) {
    const GeAlignedBox3<float> box = computeSceneBox(scene);
    if (box.isEmpty()) return false;
    // The light looks down its negative z axis: the corner farthest along that direction has the
    // smallest light z, the nearest the largest.
    const GeVector3<float> zRow(worldToLight(2, 0), worldToLight(2, 1), worldToLight(2, 2));
    const GePoint3<float> farCorner(zRow.x < 0.0f ? box.xMax : box.xMin, zRow.y < 0.0f ? box.yMax : box.yMin,
                                    zRow.z < 0.0f ? box.zMax : box.zMin);
    const GePoint3<float> nearCorner(zRow.x > 0.0f ? box.xMax : box.xMin, zRow.y > 0.0f ? box.yMax : box.yMin,
                                     zRow.z > 0.0f ? box.zMax : box.zMin);
    const double zFar = worldToLight.transformPoint(farCorner).z;
    const double zNear = worldToLight.transformPoint(nearCorner).z;
    // A scene wholly at or behind the light's plane has nothing in front of the light: no pass.
    if (!(zFar < 0.0)) return false;
    // Both ends stand off the box by a margin, so that the surfaces that touch them (a card that
    // faces the light at the box's near side, the ground at its far side) stay inside the range
    // and its culling; a box flat across the light's direction thus still has a range of twice the
    // margin. The margin grows with the distance, so that it outlasts the rounding to float.
    const auto margin = [](double z) { return kDepthMargin + std::fabs(z) * kRelativeDepthMargin; };
    const float far = static_cast<float>(-zFar + margin(zFar));
    const float near = std::max(static_cast<float>(-zFar * kNearToFar), static_cast<float>(-zNear - margin(zNear)));
    projection = scale.toProjective();
    if (perspective) {
        projection(2, 2) = -(near + far) / (far - near);
        projection(2, 3) = near * far * -2.0f / (far - near);
        projection(3, 2) = -1.0f;
        projection(3, 3) = 0.0f;
    } else {
        projection(2, 2) = -2.0f / (far - near);
        projection(2, 3) = -(far + near) / (far - near);
        projection(3, 2) = 0.0f;
        projection(3, 3) = 1.0f;
    }
    return true;
}

GeAlignedBox3<float> RsShadowPass::computeSceneBox(const RsScene& scene) {
    const GeAlignedBox3<float>& bounds = scene._bounds;
    if (!bounds.isEmpty()) return bounds;
    GeAlignedBox3<float> box;
    for (const RCShdPtr<RsGeomInstance>& instance : scene._geomInstances) {
        const GeAlignedBox3<float> own = instance->getBoundingBox();
        if (!own.isEmpty()) box.grow(own);
    }
    return box;
}

}  // namespace Zr
