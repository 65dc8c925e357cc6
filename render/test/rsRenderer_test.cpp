// The renderer's entry points, seen through the pixels of a float output tile: layers of random
// colour and opacity composited in depth order with and without the Z-buffer against a composite
// computed here from the layer list, watertight coverage in the add mode, the camera overload,
// and the entry's failures.
#include <gtest/gtest.h>

#include <algorithm>
#include <random>
#include <string>

#include "exBase.h"
#include "rsRenderTestSupport.h"
#include "rsRenderer.h"
#include "sdCamera.h"
#include "sdMeshGeometry.h"

namespace Zr {
namespace {

using namespace RenderTest;
// Camera space to -1..1 for a parallel view whose pixels are units: x from -w/2 to w/2.
GeProjectiveMatrix3<double> parallel(int w, int h, double n, double f) {
    return GeProjectiveMatrix3<double>(2.0 / w, 0, 0, 0,  //
                                       0, 2.0 / h, 0, 0,  //
                                       0, 0, -2.0 / (f - n), -(f + n) / (f - n),  //
                                       0, 0, 0, 1);
}

// An axis-aligned quad facing the camera at depth z, over pixels [x0, x1) x [y0, y1) of a
// parallel view of width w and height h.
RCShdPtr<const SdMesh> quad(int w, int h, int x0, int x1, int y0, int y1, float z) {
    auto cx = [&](int px) { return static_cast<float>(px - w / 2); };
    auto cy = [&](int py) { return static_cast<float>(py - h / 2); };
    return makeMesh({{cx(x0), cy(y0), z}, {cx(x1), cy(y0), z}, {cx(x1), cy(y1), z}, {cx(x0), cy(y1), z}},
                    {0, 1, 2, 0, 2, 3});
}

TEST(RsRenderer, LayersCompositeInDepthOrderWithAndWithoutZBuffer) {
    std::mt19937 rng(3);
    const int w = 40, h = 30;
    const GeRectangle<int> rect{0, w, 0, h};
    std::uniform_real_distribution<float> unit(0.0f, 1.0f);
    for (int trial = 0; trial < 20; ++trial) {
        struct Layer {
            int x0, x1, y0, y1;
            float z;
            Rgba colour;
        };
        std::vector<Layer> layers;
        std::vector<RCShdPtr<RsGeomInstance>> instances;
        std::vector<float> depths;
        for (int i = 0; i < 8; ++i) depths.push_back(-1.0f - 0.5f * i);
        std::shuffle(depths.begin(), depths.end(), rng);
        for (float z : depths) {
            const int x0 = int(rng() % w), x1 = x0 + 1 + int(rng() % (w - x0));
            const int y0 = int(rng() % h), y1 = y0 + 1 + int(rng() % (h - y0));
            // Half of the layers opaque, the others transparent.
            const float alpha = rng() % 2 ? 1.0f : 0.1f + 0.8f * unit(rng);
            const Layer layer{x0, x1, y0, y1, z, Rgba(unit(rng), unit(rng), unit(rng), alpha)};
            layers.push_back(layer);
            ProbeMaterial::Settings settings;
            settings.colour = layer.colour;
            // Wound towards the camera or away from it, and drawn on one side or both.
            const bool front = rng() % 2;
            instances.push_back(makeInstance(quad(w, h, front ? x0 : x1, front ? x1 : x0, y0, y1, z), settings));
            instances.back()->_drawFrontFaces = rng() % 3 != 0;
            instances.back()->_drawBackFaces = rng() % 3 != 0;
            if (!(front ? instances.back()->_drawFrontFaces : instances.back()->_drawBackFaces)) layers.pop_back();
        }
        const RCShdPtr<RsScene> scene = makeScene(instances);
        const GeProjectiveMatrix3<double> projection = parallel(w, h, 0.5, 20.0);
        const Rgba fill(0.2f, 0.4f, 0.6f, 0.5f);

        Picture withZ(rect), withoutZ(rect);
        RsRenderer renderer;
        renderer.setFillColor(fill);
        renderer.render({}, projection, scene, rect, withZ.guard);
        renderer.setZBuffer(false);
        renderer.render({}, projection, scene, rect, withoutZ.guard);

        for (int y = 0; y < h; ++y)
            for (int x = 0; x < w; ++x) {
                // Far to near, each layer laid over the fill colour and what came before.
                std::vector<Layer> here;
                for (const Layer& l : layers)
                    if (x >= l.x0 && x < l.x1 && y >= l.y0 && y < l.y1) here.push_back(l);
                std::sort(here.begin(), here.end(), [](const Layer& a, const Layer& b) { return a.z < b.z; });
                double r = fill.r * fill.a, g = fill.g * fill.a, b = fill.b * fill.a, a = fill.a;
                for (const Layer& l : here) {
                    const double sa = l.colour.a;
                    r = l.colour.r * sa + r * (1 - sa);
                    g = l.colour.g * sa + g * (1 - sa);
                    b = l.colour.b * sa + b * (1 - sa);
                    a = sa + a * (1 - sa);
                }
                for (const Picture* picture : {&withZ, &withoutZ}) {
                    const Rgba p = picture->at(x, y);
                    EXPECT_NEAR(p.r, r / a, 1e-5) << x << ", " << y;
                    EXPECT_NEAR(p.g, g / a, 1e-5);
                    EXPECT_NEAR(p.b, b / a, 1e-5);
                    EXPECT_NEAR(p.a, a, 1e-5);
                }
            }
    }
}

// The eye inside a closed box whose faces are drawn from both sides, in the add mode with colour
// 1: every ray leaves the box through exactly one surface, so every pixel sums to exactly 1 -
// across the box's seams, across the many regions of a big picture and where the faces run past
// the sides - except where the exit point lies nearer than the near limit or beyond the far plane
// and is clipped away.
TEST(RsRenderer, ClosedMeshAroundTheEyeSumsToExactlyOneInAddMode) {
    std::mt19937 rng(8);
    std::uniform_real_distribution<double> unit(-1.0, 1.0);
    const GeRectangle<int> rect{-150, 170, -90, 150};  // 76800 pixels: many regions
    // Four corners and the outward normal per face, so that the faces are flat and wound outwards.
    SdMeshBuilder builder;
    std::vector<GePoint3<float>> corners;
    std::vector<GeVector3<float>> normals;
    std::vector<std::uint32_t> triangles;
    for (int axis = 0; axis < 3; ++axis)
        for (const float sign : {-1.0f, 1.0f}) {
            const std::uint32_t v = static_cast<std::uint32_t>(corners.size());
            for (int k = 0; k < 4; ++k) {
                float c[3];
                c[axis] = sign;
                c[(axis + 1) % 3] = k & 1 ? 1.0f : -1.0f;
                c[(axis + 2) % 3] = k & 2 ? 1.0f : -1.0f;
                corners.emplace_back(c[0], c[1], c[2]);
                normals.emplace_back(axis == 0 ? sign : 0.0f, axis == 1 ? sign : 0.0f, axis == 2 ? sign : 0.0f);
            }
            const std::vector<std::uint32_t> face = sign > 0 ? std::vector<std::uint32_t>{v, v + 1, v + 3, v, v + 3, v + 2}
                                                             : std::vector<std::uint32_t>{v, v + 3, v + 1, v, v + 2, v + 3};
            triangles.insert(triangles.end(), face.begin(), face.end());
        }
    builder.setVertices(corners).setTriangles(triangles).setNormals(normals);
    const RCShdPtr<const SdMesh> box = builder.build();
    int clipped = 0;
    for (int trial = 0; trial < 4; ++trial) {
        // In two trials the far plane cuts the box as well.
        const GeProjectiveMatrix3<double> projection = perspective(1.2, 0.5, trial < 2 ? 50.0 : 2.5);
        // Seen from inside every face is a back face, drawn with its normal turned to the eye: a
        // fragment counts only when it is.
        ProbeMaterial::Settings settings = counting(trial % 2 ? 0x03u : 0x41u);
        settings.probe = [](const RsShadingContext& c) {
            const bool facing = c._normal.dot(GeVector3<float>(c._eyeCoord.x, c._eyeCoord.y, c._eyeCoord.z)) < 0.0f;
            return facing ? Rgba(1, 1, 1, 1) : Rgba(0, 0, 0, 1);
        };
        // Local to camera: scale by 2, turn about z (roll) and y (yaw), then move so that the eye
        // sits at local point e: near the back wall, with the box ahead, and so close to the
        // side wall x = -1 that rays turned towards it meet it within the near limit.
        const double roll = 3.0 * unit(rng), yaw = 0.3 * unit(rng);
        const double e[3] = {-0.93 + 0.02 * trial, 0.8 * unit(rng), 0.85};
        double m[3][3] = {{std::cos(roll) * std::cos(yaw), -std::sin(roll), std::cos(roll) * std::sin(yaw)},
                          {std::sin(roll) * std::cos(yaw), std::cos(roll), std::sin(roll) * std::sin(yaw)},
                          {-std::sin(yaw), 0.0, std::cos(yaw)}};
        double t[3];
        for (int r = 0; r < 3; ++r) {
            for (int c = 0; c < 3; ++c) m[r][c] *= 2.0;
            t[r] = -(m[r][0] * e[0] + m[r][1] * e[1] + m[r][2] * e[2]);
        }
        const GeAffineMatrix3<float> toCamera{float(m[0][0]), float(m[0][1]), float(m[0][2]), float(t[0]),  //
                                              float(m[1][0]), float(m[1][1]), float(m[1][2]), float(t[1]),  //
                                              float(m[2][0]), float(m[2][1]), float(m[2][2]), float(t[2])};
        const RCShdPtr<RsGeomInstance> instance = makeInstance(box, settings, toCamera);
        instance->_drawFrontFaces = false;
        const RCShdPtr<RsScene> scene = makeScene({instance});
        Picture picture(rect);
        render(scene, projection, rect, picture);

        for (int y = rect.y0; y < rect.y1; ++y)
            for (int x = rect.x0; x < rect.x1; ++x) {
                // The ray through the pixel centre, in the box's frame (m is a scaled rotation, so
                // its inverse is its transpose over 4), leaves the box at tExit.
                const double d[3] = {(x + 0.5 - 10.0) / 160.0 / projection(0, 0),
                                     (y + 0.5 - 30.0) / 120.0 / projection(1, 1), -1.0};
                double tExit = 1e300;
                for (int axis = 0; axis < 3; ++axis) {
                    const double dl = (m[0][axis] * d[0] + m[1][axis] * d[1] + m[2][axis] * d[2]) / 4.0;
                    if (dl != 0.0) tExit = std::min(tExit, ((dl > 0 ? 1.0 : -1.0) - e[axis]) / dl);
                }
                const double zc = projection(2, 2) * -tExit + projection(2, 3);
                const double pixelZ = 0.5 * zc / tExit + 0.5;
                if (std::abs(pixelZ + 1.0) < 1e-6 || std::abs(pixelZ - 1.0) < 1e-6) continue;
                const float expected = pixelZ > -1.0 && pixelZ < 1.0 ? 1.0f : 0.0f;
                clipped += expected == 0.0f;
                ASSERT_EQ(picture.at(x, y).r, expected) << x << ", " << y << " trial " << trial;
            }
    }
    EXPECT_GT(clipped, 1000);
}

// Lights are prepared on every call, in the scene's order and before any pixel is drawn, even in a
// scene without instances, whose picture is then the fill colour.
TEST(RsRenderer, LightsArePreparedOnEveryCallEvenWithoutInstances) {
    struct OrderedLight : RsLightShader {
        OrderedLight(std::vector<std::string>& log, std::string name) : _log(log), _name(std::move(name)) {}
        void setupRender(const GeAffineMatrix3<float>& worldToCamera) override {
            _log.push_back(_name + " setup");
            _lastView = worldToCamera;
        }
        void initializeMaps(const RCShdPtr<RsScene>&) override { _log.push_back(_name + " maps"); }
        std::vector<std::string>& _log;
        std::string _name;
        GeAffineMatrix3<float> _lastView;
    };
    std::vector<std::string> log;
    RsScene::GeomInstanceList instances;
    RsScene::LightList lights{makeShared<OrderedLight>(log, "a"), makeShared<OrderedLight>(log, "b")};
    RsScene::CameraList cameras;
    const RCShdPtr<RsScene> scene = makeShared<RsScene>(instances, lights, cameras);

    const GeRectangle<int> rect{3, 9, -2, 5};
    const Rgba fill(0.25f, 0.5f, 0.75f, 1.0f);
    RsRenderer renderer;
    renderer.setFillColor(fill);
    const GeAffineMatrix3<float> view(1, 0, 0, 2, 0, 1, 0, 0, 0, 0, 1, -1);
    Picture picture(rect, Rgba(0, 0, 0, 0));
    for (int call = 0; call < 2; ++call)
        renderer.render(view, perspective(1.0, 0.1, 10.0), scene, rect, picture.guard);

    EXPECT_EQ(log, (std::vector<std::string>{"a setup", "a maps", "b setup", "b maps",
                                              "a setup", "a maps", "b setup", "b maps"}));
    EXPECT_FLOAT_EQ(static_cast<OrderedLight&>(*scene->_lights[1])._lastView(0, 3), 2.0f);
    EXPECT_TRUE(picture == Picture(rect, fill));
}

TEST(RsRenderer, CameraInstancesAndFailures) {
    const GeRectangle<int> rect{0, 24, 0, 16};
    const RCShdPtr<RsScene> scene =
        makeScene({makeInstance(makeMesh({{-1, -1, -3}, {1, -1, -3}, {0, 1, -3}}, {0, 1, 2}), ProbeMaterial::Settings{})});
    const Rgba untouched(0.25f, 0.5f, 0.75f, 1.0f);
    RsRenderer renderer;

    // A camera placed by its instance: the same picture as its inverse matrix and projection.
    RCShdPtr<SdCamera> sdCamera = makeShared<SdCamera>();
    sdCamera->_aspect = 1.5f;
    const GeAffineMatrix3<float> place(1, 0, 0, 0.3f, 0, 1, 0, -0.2f, 0, 0, 1, 0.5f);
    const RCShdPtr<SdInstance> camera = makeShared<SdInstance>(sdCamera, place);
    Picture viaCamera(rect, untouched), viaMatrices(rect, untouched);
    renderer.render(camera, scene, rect, viaCamera.guard);
    GeProjectiveMatrix3<double> projection;
    sdCamera->computeProjection(projection);
    renderer.render(place.computeInverse(), projection, scene, rect, viaMatrices.guard);
    EXPECT_TRUE(viaCamera == viaMatrices);
    EXPECT_FALSE(viaCamera == Picture(rect, untouched));

    // An instance of anything but a camera draws nothing.
    Picture notDrawn(rect, untouched);
    const RCShdPtr<SdInstance> mesh = makeShared<SdInstance>(makeShared<SdMeshGeometry>(), place);
    renderer.render(mesh, scene, rect, notDrawn.guard);
    EXPECT_TRUE(notDrawn == Picture(rect, untouched));
    EXPECT_THROW(renderer.render(RCShdPtr<SdInstance>(), scene, rect, notDrawn.guard), ExNullPtr);

    // The antialiased path is not there: it fails before touching a pixel.
    renderer.setAntialiasing(true);
    EXPECT_THROW(renderer.render(camera, scene, rect, notDrawn.guard), ExProgramAborted);
    EXPECT_TRUE(notDrawn == Picture(rect, untouched));

    const auto abortLine = [](auto call) {
        try {
            call();
        } catch (const ExProgramAborted& e) {
            EXPECT_EQ(e.getFile(), "render\\suave\\src\\rsRenderer");
            return e.getLine();
        }
        return -1;
    };
    EXPECT_EQ(abortLine([&] { (void)renderer.getMemUsageMb(); }), 397);
    EXPECT_EQ(abortLine([&] { (void)renderer.getTileMemUsageMb(); }), 409);
}

}  // namespace
}  // namespace Zr
