// A host outside the source tree: it includes the renderer's headers by bare name, links the
// installed library, and renders a red square over a blue fill into an 8-bit RGBA tile. The code
// between the "host example" marks is the example of the README.
#include <cstdint>
#include <cstdio>

#include "exBase.h"
#include "renderInit.h"

// ---- host example ---------------------------------------------------------------------------
#include "ixTile.h"
#include "ixWriteGuard.h"
#include "rsGeomInstance.h"
#include "rsMaterialShader.h"
#include "rsRenderer.h"
#include "rsScene.h"
#include "sdCamera.h"
#include "sdMeshBuilder.h"

using namespace Zr;

// A host's own material: a flat colour from the material, needing nothing interpolated.
class FlatShader : public RsMaterialShader {
public:
    using RsMaterialShader::RsMaterialShader;
    CoRgbaColorTyped<float> shade(RsShadingContext&) override {
        const SdMaterial& m = *getMaterial();
        return {m._diffuse.r, m._diffuse.g, m._diffuse.b, m._opacity};
    }
    unsigned int getNeededContext() const override { return 0; }

protected:
    void lockMemoryImpl() override {}
    void unlockMemoryImpl() override {}
};

void renderSquare(IxTile& tile) {
    // A unit square in the z = 0 plane, two triangles, one face group.
    RCShdPtr<const SdMesh> mesh = SdMeshBuilder()
                                      .setVertices({{-1, -1, 0}, {1, -1, 0}, {1, 1, 0}, {-1, 1, 0}})
                                      .setTriangles({0, 1, 2, 0, 2, 3})
                                      .build();
    RCShdPtr<SdMaterial> red = makeShared<SdMaterial>();
    red->_diffuse = {1, 0, 0};

    // The renderer's flat scene: instances with one shader per material, no lights.
    RsScene::GeomInstanceList instances{makeShared<RsGeomInstance>(
        GeAffineMatrix3<float>(), mesh, RsGeomInstance::MaterialList{makeShared<FlatShader>(red)},
        RsGeomInstance::MaterialList{}, SdInstanceAttributes{}, std::vector<unsigned int>{})};
    RsScene::LightList lights;
    RsScene::CameraList cameras;
    RCShdPtr<RsScene> scene = makeShared<RsScene>(instances, lights, cameras);

    // A camera 4 units up the z axis, looking down -z at the square.
    RCShdPtr<SdInstance> camera =
        makeShared<SdInstance>(makeShared<SdCamera>(), GeAffineMatrix3<float>::makeTranslation({0, 0, 4}));

    RsRenderer renderer;
    renderer.setFillColor({0, 0, 1, 1});
    renderer.render(camera, scene, tile.getRectangle(), IxWriteGuard(tile));
}
// ---- end of host example --------------------------------------------------------------------

namespace {

int fail(const char* what) {
    std::printf("consumer failed: %s\n", what);
    return 1;
}

}  // namespace

int main() {
    try {
        if (RenderInit::getPackageRecords().size() != 4) return fail("package records");

        IxTile tile(IxPixelFormat(IxPixelFormat::RGBA, IxPixelFormat::UINT8), GeRectangle<int>{0, 64, 0, 64},
                    {0, 0, 0, 0});
        renderSquare(tile);
        IxWriteGuard guard(tile);
        const auto* centre = static_cast<const std::uint8_t*>(guard.getPixelAddress(32, 32));
        const auto* corner = static_cast<const std::uint8_t*>(guard.getPixelAddress(0, 0));
        if (centre[0] != 255 || centre[2] != 0 || centre[3] != 255) return fail("square colour");
        if (corner[0] != 0 || corner[2] != 255) return fail("fill colour");
    } catch (const ExBase& e) {
        std::printf("consumer failed: %s\n", e.what());
        return 1;
    }
    std::puts("consumer ok");
    return 0;
}
