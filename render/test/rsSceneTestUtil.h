#pragma once
// Helpers for the tests of the renderer scene and the culling pass: box meshes made with the
// mesh builder, instances with chosen attributes, scenes from lists, and corner arithmetic in
// double precision to serve as an independent reference.
#include <cstdint>
#include <vector>

#include "geAffineMatrix3.h"
#include "geAlignedBox3.h"
#include "gePoint3.h"
#include "rcShdPtr.h"
#include "rsGeomInstance.h"
#include "rsLightShader.h"
#include "rsMaterialShader.h"
#include "rsScene.h"
#include "sdInstanceAttributes.h"
#include "sdMaterial.h"
#include "sdMeshBuilder.h"

namespace Zr::SceneTest {

// A light shader that only has to be owned; it counts the per-render calls it receives.
class TestLight : public RsLightShader {
public:
    void setupRender(const GeAffineMatrix3<float>&) override { ++_setupCount; }
    void initializeMaps(const RCShdPtr<RsScene>&) override { ++_mapCount; }
    int _setupCount = 0;
    int _mapCount = 0;
};

// A material shader that only has to be owned.
class TestMaterial : public RsMaterialShader {
public:
    TestMaterial() : RsMaterialShader(makeShared<SdMaterial>()) {}
    CoRgbaColorTyped<float> shade(RsShadingContext&) override { return {1, 1, 1, 1}; }
    unsigned int getNeededContext() const override { return 0; }

protected:
    void lockMemoryImpl() override {}
    void unlockMemoryImpl() override {}
};

// A mesh whose vertices are the eight corners of [min, max], so that its box is exactly that.
inline RCShdPtr<const SdMesh> makeBoxMesh(const GePoint3<float>& min, const GePoint3<float>& max) {
    std::vector<GePoint3<float>> vertices;
    for (int c = 0; c < 8; ++c)
        vertices.emplace_back((c & 1) ? max.x : min.x, (c & 2) ? max.y : min.y, (c & 4) ? max.z : min.z);
    // Two faces of the box are enough: the box of a mesh covers all its vertices.
    SdMeshBuilder builder;
    builder.setVertices(vertices).setTriangles({0, 1, 3, 4, 7, 6});
    return builder.build();
}

inline SdInstanceAttributes makeAttributes(std::int32_t renderOrder, bool visible = true, bool castsShadows = true) {
    SdInstanceAttributes attributes;
    attributes._renderOrder = renderOrder;
    attributes._visible = visible;
    attributes._castsShadows = castsShadows;
    return attributes;
}

inline RCShdPtr<RsGeomInstance> makeInstance(const GeAffineMatrix3<float>& matrix,
                                             const RCShdPtr<const SdMesh>& mesh,
                                             const SdInstanceAttributes& attributes = SdInstanceAttributes(),
                                             const std::vector<unsigned int>& lights = {}) {
    return makeShared<RsGeomInstance>(matrix, mesh, RsGeomInstance::MaterialList(),
                                      RsGeomInstance::MaterialList(), attributes, lights);
}

inline RCShdPtr<RsScene> makeScene(std::vector<RCShdPtr<RsGeomInstance>> instances) {
    RsScene::LightList lights;
    RsScene::CameraList cameras;
    return makeShared<RsScene>(instances, lights, cameras);
}

// Corner c of box (bit 0 picks the x end, bit 1 y, bit 2 z), in double.
inline GePoint3<double> cornerOf(const GeAlignedBox3<float>& box, int c) {
    return {(c & 1) ? box.xMax : box.xMin, (c & 2) ? box.yMax : box.yMin, (c & 4) ? box.zMax : box.zMin};
}

// p through m in double: the columns of m weighted by the coordinates, plus the translation.
inline GePoint3<double> applyInDouble(const GeAffineMatrix3<float>& m, const GePoint3<double>& p) {
    double out[3];
    for (int row = 0; row < 3; ++row)
        out[row] = double(m(row, 0)) * p.x + double(m(row, 1)) * p.y + double(m(row, 2)) * p.z + double(m(row, 3));
    return {out[0], out[1], out[2]};
}

}  // namespace Zr::SceneTest
