// The renderer's entry points, seen through the pixels of a float output tile: layers composited in
// depth order with and without the Z-buffer against the reference composite, lights prepared on
// every call, the camera overload and the entry's failures, and hostile scenes.
#include <gtest/gtest.h>

#include <algorithm>
#include <limits>
#include <random>
#include <string>
#include <utility>

#include "exBase.h"
#include "rsTestSupport.h"
#include "sdCamera.h"
#include "sdMeshGeometry.h"

namespace Zr {
namespace {

using namespace RsTest;

// Camera space to -1..1 for a parallel view whose pixels are units: x from -w/2 to w/2.
GeProjectiveMatrix3<double> parallel(int w, int h, double n, double f) {
    return {2.0 / w, 0, 0, 0, 0, 2.0 / h, 0, 0, 0, 0, -2.0 / (f - n), -(f + n) / (f - n), 0, 0, 0, 1};
}

// An axis-aligned quad facing the camera at depth z over pixels [x0, x1) x [y0, y1) of a parallel
// view of width w and height h; wound the other way when x0 > x1.
RCShdPtr<const SdMesh> quad(int w, int h, int x0, int x1, int y0, int y1, float z) {
    const float l = float(x0 - w / 2), r = float(x1 - w / 2), b = float(y0 - h / 2), t = float(y1 - h / 2);
    return makeMesh({{l, b, z}, {r, b, z}, {r, t, z}, {l, t, z}}, {0, 1, 2, 0, 2, 3});
}

// Random quads of random colour and opacity at distinct depths, wound either way and drawn on
// chosen sides: with and without the Z-buffer each pixel is the fill colour with the layers drawn
// there laid over it from far to near.
TEST(RsRenderer, LayersCompositeInDepthOrderWithAndWithoutZBuffer) {
    std::mt19937 rng(3);
    const int w = 40, h = 30;
    const GeRectangle<int> rect{0, w, 0, h};
    std::uniform_real_distribution<float> unit(0.0f, 1.0f);
    const Rgba fill(0.2f, 0.4f, 0.6f, 0.5f);
    for (int trial = 0; trial < 20; ++trial) {
        struct Layer {
            GeRectangle<int> pixels;
            float z;
            Rgba colour;
        };
        std::vector<Layer> layers;
        std::vector<RCShdPtr<RsGeomInstance>> instances;
        for (const LayerRect& rect : randomLayerRects(rng, 8, 0.5f, w, h)) {
            const auto [x0, x1, y0, y1] = rect.pixels;
            const float z = rect.z;
            const float alpha = rng() % 2 ? 1.0f : 0.1f + 0.8f * unit(rng);
            const Layer layer{{x0, x1, y0, y1}, z, Rgba(unit(rng), unit(rng), unit(rng), alpha)};
            const bool front = rng() % 2;
            // Half of them ask for normals, and show their colour only where the normal (turned to
            // the eye on a back face) faces the eye.
            MaterialSettings settings(layer.colour);
            if (instances.size() % 2) {
                settings.needed = 0x02u;
                settings.probe = [c = layer.colour](const RsShadingContext& s) {
                    return s._normal.z > 0 ? c : Rgba(1, 0, 1, 1);
                };
            }
            instances.push_back(drawn(quad(w, h, front ? x0 : x1, front ? x1 : x0, y0, y1, z), settings));
            instances.back()->_drawFrontFaces = rng() % 3 != 0;
            instances.back()->_drawBackFaces = rng() % 3 != 0;
            if (front ? instances.back()->_drawFrontFaces : instances.back()->_drawBackFaces) layers.push_back(layer);
        }
        const RCShdPtr<RsScene> scene = makeScene(instances);
        Picture withZ(rect), withoutZ(rect);
        RsRenderer renderer;
        renderer.setFillColor(fill);
        renderer.render({}, parallel(w, h, 0.5, 20.0), scene, rect, withZ.guard);
        renderer.setZBuffer(false);
        renderer.render({}, parallel(w, h, 0.5, 20.0), scene, rect, withoutZ.guard);
        std::sort(layers.begin(), layers.end(), [](const Layer& a, const Layer& b) { return a.z < b.z; });
        for (int y = 0; y < h; ++y)
            for (int x = 0; x < w; ++x) {
                std::vector<Rgba> here;
                for (const Layer& l : layers)
                    if (l.pixels.contains(x, y)) here.push_back(l.colour);
                const Rgba want = overComposite(fill, here);
                expectNearRgba(withZ.at(x, y), want, 1e-5, "with Z at " + std::to_string(x) + "," + std::to_string(y));
                expectNearRgba(withoutZ.at(x, y), want, 1e-5,
                               "without Z at " + std::to_string(x) + "," + std::to_string(y));
            }
    }
}

// Lights are prepared on every call, in the scene's order and with the call's view, before any
// pixel is drawn, even in a scene without instances, whose picture is then the fill colour.
TEST(RsRenderer, LightsArePreparedOnEveryCallEvenWithoutInstances) {
    struct OrderedLight : RsLightShader {
        OrderedLight(std::vector<std::string>& log, std::string name) : _log(log), _name(std::move(name)) {}
        void setupRender(const GeAffineMatrix3<float>& worldToCamera) override {
            _log.push_back(_name + " setup " + std::to_string(worldToCamera(0, 3)));
        }
        void initializeMaps(const RCShdPtr<RsScene>&) override { _log.push_back(_name + " maps"); }
        bool illuminate(const RsShadingContext&, Illumination&) const override { return false; }
        CoRgbColorTyped<float> shadow(const RsShadingContext&) override { return {1, 1, 1}; }
        void lockMemoryImpl() override {}
        void unlockMemoryImpl() override {}
        std::vector<std::string>& _log;
        std::string _name;
    };
    std::vector<std::string> log;
    const RCShdPtr<RsScene> scene =
        makeScene({}, {makeShared<OrderedLight>(log, "a"), makeShared<OrderedLight>(log, "b")});
    const GeRectangle<int> rect{3, 9, -2, 5};
    const Rgba fill(0.25f, 0.5f, 0.75f, 1.0f);
    RsRenderer renderer;
    renderer.setFillColor(fill);
    Picture picture(rect, Rgba(0, 0, 0, 0));
    for (int call = 0; call < 2; ++call)
        renderer.render(GeAffineMatrix3<float>(1, 0, 0, 2, 0, 1, 0, 0, 0, 0, 1, -1), perspective(1.0, 0.1, 10.0), scene,
                        rect, picture.guard);
    const std::vector<std::string> once = {"a setup 2.000000", "a maps", "b setup 2.000000", "b maps"};
    std::vector<std::string> twice = once;
    twice.insert(twice.end(), once.begin(), once.end());
    EXPECT_EQ(log, twice);
    EXPECT_TRUE(picture == Picture(rect, fill));
}

// A camera placed by its instance gives the picture of its inverse matrix and projection; an
// instance of anything else draws nothing, and a missing one is a null pointer.
TEST(RsRenderer, CameraInstancesAndFailures) {
    const GeRectangle<int> rect{0, 24, 0, 16};
    const RCShdPtr<RsScene> scene =
        makeScene({drawn(makeMesh({{-1, -1, -3}, {1, -1, -3}, {0, 1, -3}}, {0, 1, 2}), {})});
    const Rgba untouched(0.25f, 0.5f, 0.75f, 1.0f);
    RsRenderer renderer;
    RCShdPtr<SdCamera> sdCamera = makeShared<SdCamera>();
    sdCamera->_aspect = 1.5f;
    const GeAffineMatrix3<float> place(1, 0, 0, 0.3f, 0, 1, 0, -0.2f, 0, 0, 1, 0.5f);
    const RCShdPtr<SdInstance> camera = makeShared<SdInstance>(sdCamera, place);
    Picture viaCamera(rect, untouched), viaMatrices(rect, untouched), notDrawn(rect, untouched);
    renderer.render(camera, scene, rect, viaCamera.guard);
    GeProjectiveMatrix3<double> projection;
    sdCamera->computeProjection(projection);
    renderer.render(place.computeInverse(), projection, scene, rect, viaMatrices.guard);
    EXPECT_TRUE(viaCamera == viaMatrices);
    EXPECT_FALSE(viaCamera == notDrawn);
    renderer.render(makeShared<SdInstance>(makeShared<SdMeshGeometry>(), place), scene, rect, notDrawn.guard);
    EXPECT_THROW(renderer.render(RCShdPtr<SdInstance>(), scene, rect, notDrawn.guard), ExNullPtr);
    EXPECT_TRUE(notDrawn == Picture(rect, untouched));
}

// Random scenes from a fixed seed with coordinates and matrix entries that are not numbers,
// infinite or huge, faces without area, meshes without vertices or faces, wires of any size, any
// transfer mode and shading needs, drawn with or without antialiasing into empty, one-pixel and
// partial tiles of rectangles that may be empty. Each render gives a picture or fails with the library's own exception; a
// crash, a hang, another exception or a sanitizer report fails the test.
TEST(RsRenderer, HostileScenesGiveAPictureOrTheLibrarysException) {
    std::mt19937 rng(2718);
    const float nan = std::numeric_limits<float>::quiet_NaN(), inf = std::numeric_limits<float>::infinity();
    const float specials[] = {nan, inf, -inf, 1e30f, -1e30f, 3e38f, 1e-30f, 0.0f, 1e7f, 1e20f, -1e20f, -3e38f};
    auto pick = [&](int percent) { return int(rng() % 100) < percent; };
    auto value = [&](int percent, float lo, float hi) {
        return pick(percent) ? specials[rng() % std::size(specials)]
                             : std::uniform_real_distribution<float>(lo, hi)(rng);
    };
    const unsigned int needs[] = {0x00u, 0x01u, 0x03u, 0x3cu, 0x3eu, 0x7fu};
    int pictures = 0, failures = 0;
    for (int trial = 0; trial < 1500; ++trial) {
        std::vector<RCShdPtr<RsGeomInstance>> instances;
        for (int i = int(rng() % 4); i > 0; --i) {
            std::vector<GePoint3<float>> vertices(pick(15) ? 0 : 3 + rng() % 6);
            for (GePoint3<float>& v : vertices) {
                v = GePoint3<float>(value(8, -3, 3), value(8, -3, 3), value(8, -6, 1));
                if (pick(20)) v = vertices.front();  // repeated corners: faces without area
            }
            std::vector<std::uint32_t> triangles;
            for (int k = vertices.empty() ? 0 : 3 * int(1 + rng() % 6); k > 0; --k)
                triangles.push_back(std::uint32_t(rng() % vertices.size()));
            MaterialSettings settings = counting(needs[rng() % std::size(needs)]);
            settings.mode = SdMaterial::TransferMode(rng() % SdMaterial::transferModeCount);
            settings.colour = Rgba(value(5, 0, 1), value(5, 0, 1), value(5, 0, 1), value(5, 0, 1.2f));
            settings.wireframe = pick(30);
            settings.screenSpace = pick(50);
            settings.wireSize = value(20, 0, 3);
            GeAffineMatrix3<float> matrix;
            if (pick(60))
                matrix =
                    GeAffineMatrix3<float>(value(30, -2, 2), value(20, -1, 1), 0, value(20, -1, 1), 0, value(30, -2, 2),
                                           0, value(20, -1, 1), 0, 0, value(30, -2, 2), value(20, -3, 1));
            try {
                instances.push_back(
                    drawn(makeMesh(vertices, triangles, pick(50) ? vertices : std::vector<GePoint3<float>>{}), settings,
                          matrix));
                instances.back()->_renderOrder = int(rng() % 3) - 1;
            } catch (const ExBase&) {
                ++failures;  // a mesh the builder refuses
            }
        }
        const int x0 = int(rng() % 20) - 10, y0 = int(rng() % 20) - 10;
        const int kind = int(rng() % 4);
        const int width = kind == 0 ? 0 : kind == 1 ? 1 : int(rng() % 24);
        const GeRectangle<int> rect{x0, x0 + width, y0, y0 + (kind == 1 ? 1 : int(rng() % 24))};
        // The output tile: the rectangle, one pixel of it, an empty tile, or one that overhangs it.
        const int tx = x0 + int(rng() % 4), ty = y0 + int(rng() % 4);
        const GeRectangle<int> tiles[] = {
            rect, {tx, tx + 1, ty, ty + 1}, {tx, tx, ty, ty + 3}, {tx - 8, tx + 8, ty - 8, ty + 8}};
        const GeProjectiveMatrix3<double> projection =
            pick(50) ? perspective(value(10, 0.2f, 2.5f), value(10, 0.05f, 1), value(10, 2, 100))
                     : parallel(16, 16, value(10, 0.1f, 1), value(10, 2, 50));
        const GeRectangle<int> tile = tiles[rng() % 4];
        try {
            Picture picture(tile);
            RsRenderer renderer;
            renderer.setZBuffer(pick(50));
            renderer.setAntialiasing(pick(40));
            renderer.setFilterKernel(static_cast<RsFilterKernel::KernelType>(rng() % RsFilterKernel::nbKernelTypes));
            renderer.render(GeAffineMatrix3<float>(), projection, makeScene(instances), rect, picture.guard);
            ++pictures;
        } catch (const ExBase&) {
            ++failures;
        }
    }
    EXPECT_GT(pictures, 750) << failures << " failures";
}

}  // namespace
}  // namespace Zr
