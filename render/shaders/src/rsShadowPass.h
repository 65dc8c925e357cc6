#pragma once
// The shadow passes of the standard lights: one view of the scene from a light, rendered into a
// map with the renderer's own region renderer, rasterizer and buffers. A depth pass fills a plain
// map's doubles in place through RsZBuffer (the nearest depth) or RsMZBuffer (the midpoint of the
// two nearest); a deep pass draws the casters with their shadow shaders into a fragment buffer
// that resolves into a deep map's transmittance curves. Each pass is one region over the whole
// map, with the casters that the light's frustum admits, nearest first.
#include "geAffineMatrix3.h"
#include "geAlignedBox3.h"
#include "geProjectiveMatrix3.h"
#include "geScale3.h"
#include "rcShdPtr.h"
#include "sdStdLight.h"

namespace Zr {

class RsDeepShadowMap;
class RsScene;
struct RsFZBufferMemory;

class RsShadowPass {
public:
    // Renders the depths of the scene's casters seen through worldToMap and projection into the
    // size x size doubles of map: the nearest depth for ShadowMapZ, the midpoint of the two
    // nearest for ShadowMapMidpoint. Every cell is written.
    static void renderDepthMap(SdStdLight::ShadowMapType type, double* map, int size,
                               const GeAffineMatrix3<float>& worldToMap, const GeProjectiveMatrix3<float>& projection,
                               const RCShdPtr<RsScene>& scene);
    // Renders the transmittance curves of the scene's casters into map, whose size, matrices and
    // empty curves are set. memory, when given, lends the fragment buffer its arrays and pool and
    // keeps them for the next pass (the faces of a cube share one).
    static void renderDeepMap(RsDeepShadowMap& map, const RCShdPtr<RsScene>& scene,
                              RsFZBufferMemory* memory = nullptr);

    // The projection of a single deep map whose depth range is fitted to the scene's box along
    // the light: x and y scaled by scale, in perspective or parallel. False, with projection
    // untouched, where the scene has no geometry or lies wholly at or behind the light's plane
    // (nothing in front of the light can cast a shadow).
    static bool fitDeepProjection(const GeAffineMatrix3<float>& worldToLight, const GeScale3<float>& scale,
                                  bool perspective, const RsScene& scene, GeProjectiveMatrix3<float>& projection);

    // The box of the scene's geometry for its shadow maps. The scene's bounds leave an axis empty
    // when no instance has a proper interval on it: a scene of flat cards, such as a ground plane
    // alone. Such cards still cast and receive shadows in their plane, so the box is then made of
    // the instances' closed boxes, flat axes included. Empty for a scene without geometry.
    static GeAlignedBox3<float> computeSceneBox(const RsScene& scene);

    RsShadowPass() = delete;
};

}  // namespace Zr
