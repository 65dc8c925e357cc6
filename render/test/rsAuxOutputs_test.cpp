// The surface channels and deep samples that a render gathers beside its picture: a tilted,
// textured quad seen in perspective from a moved camera against the closed form of the ray through
// each pixel centre, and random layered scenes whose front-most opaque-enough layer and deep lists
// are known, with the flattened deep pixel equal to the picture; spheres against the ray-sphere
// intersection, and their motion vectors, as they and the camera move, against the screen
// displacement of the moved point.
#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <random>
#include <string>

#include "rsAuxOutputs.h"
#include "rsTestSupport.h"

namespace Zr {
namespace {

using namespace RsTest;

// Two quads, s and t running along their edges U and V from Q, the first with texture coordinates
// (s, t): at every pixel centre whose ray meets one well inside, the channels hold the
// intersection's depth, world position, world normal (towards the eye), texture coordinates (0 for
// the quad without them) and IDs; where no ray meets a quad they hold 0.
TEST(RsAuxOutputs, SurfaceChannelsEqualTheRayIntersectionAtPixelCentres) {
    const int w = 48, h = 48;
    const GeRectangle<int> rect{0, w, 0, h};
    const GeProjectiveMatrix3<double> projection = perspective(0.9, 0.5, 50.0);
    const GeAffineMatrix3<float> cameraToWorld =
        GeAffineMatrix3<float>::makeTranslation({0.5f, -1.0f, 6.0f}) *
        GeAffineMatrix3<float>::makeRotation({0.3f, 1.0f, 0.2f}, 0.35f);
    const GeAffineMatrix3<float> worldToCamera = cameraToWorld.computeInverse();
    struct Quad {
        GePoint3<double> q;
        GeVector3<double> u, v;
    };
    const Quad quads[2] = {{{-2.0, -1.5, -1.0}, {3.0, 0.5, 1.0}, {0.2, 2.0, -0.8}},
                           {{0.4, 0.2, 1.0}, {1.2, 0.0, 0.3}, {0.0, 1.1, 0.2}}};
    std::vector<RCShdPtr<RsGeomInstance>> instances;
    for (const Quad& k : quads) {
        auto at = [&](double s, double t) {
            return GePoint3<float>(float(k.q.x + s * k.u.x + t * k.v.x), float(k.q.y + s * k.u.y + t * k.v.y),
                                   float(k.q.z + s * k.u.z + t * k.v.z));
        };
        // Only the first quad has texture coordinates; the second's UV is 0.
        const std::vector<GePoint3<float>> texCoords{{0, 0, 0}, {1, 0, 0}, {1, 1, 0}, {0, 1, 0}};
        instances.push_back(drawn(makeMesh({at(0, 0), at(1, 0), at(1, 1), at(0, 1)}, {0, 1, 2, 0, 2, 3},
                                           instances.empty() ? texCoords : std::vector<GePoint3<float>>{}),
                                  MaterialSettings()));
    }
    for (bool zBuffer : {true, false}) {
        RsAuxOutputs aux(rect, true, false);
        RsRenderer renderer;
        renderer.setZBuffer(zBuffer);
        renderer.setAuxOutputs(&aux);
        Picture picture(rect);
        const RCShdPtr<RsScene> scene = makeScene(instances);
        renderer.render(worldToCamera, projection, scene, rect, picture.guard);
        const GeAffineMatrix3<double> toWorld(cameraToWorld);
        const GePoint3<double> eye = toWorld.transformPoint({0, 0, 0});
        int hits = 0;
        for (int y = 0; y < h; ++y)
            for (int x = 0; x < w; ++x) {
                const std::string where = "at " + std::to_string(x) + "," + std::to_string(y);
                const GeVector3<double> d = toWorld.transformVector(rayThroughPixel(projection, rect, x, y));
                // The nearest quad hit well inside its edges, or a ray that clearly misses all.
                double best = 1e300, bs = 0, bt = 0;
                int found = 0;
                bool ambiguous = false;
                for (int i = 0; i < 2; ++i) {
                    const Quad& k = quads[i];
                    const GeVector3<double> n = k.u.cross(k.v);
                    const double along = n.dot(d);
                    const double r = n.dot(k.q - eye) / along;
                    const GeVector3<double> off = (eye + d * r) - k.q;
                    // s and t from the two edge directions by Cramer's rule on the plane.
                    const GeVector3<double> uv = k.u.cross(k.v);
                    const double s = off.cross(k.v).dot(uv) / uv.dot(uv), t = k.u.cross(off).dot(uv) / uv.dot(uv);
                    const double margin = 0.03;
                    const bool inside = r > 0 && s > margin && s < 1 - margin && t > margin && t < 1 - margin;
                    const bool outside = r <= 0 || s < -margin || s > 1 + margin || t < -margin || t > 1 + margin;
                    if (!inside && !outside) ambiguous = true;
                    if (inside && r < best) best = r, bs = s, bt = t, found = i + 1;
                }
                if (ambiguous) continue;
                const std::size_t i = aux.indexOf(x, y);
                if (found == 0) {
                    EXPECT_EQ(aux.getZ()[i], 0.0f) << where;
                    EXPECT_EQ(aux.getObjectId()[i], 0.0f) << where;
                    EXPECT_EQ(aux.getNormal()[3 * i + 2], 0.0f) << where;
                    continue;
                }
                ++hits;
                const Quad& k = quads[found - 1];
                const GePoint3<double> p = eye + d * best;
                const GeVector3<double> e = GeAffineMatrix3<double>(worldToCamera).transformVector(p - eye);
                EXPECT_NEAR(aux.getZ()[i], -e.z, 1e-4 * -e.z) << where;
                for (int c = 0; c < 3; ++c)
                    EXPECT_NEAR(aux.getPosition()[3 * i + c], (&p.x)[c], 2e-4 * best) << where;
                GeVector3<double> n = k.u.cross(k.v);
                n = n * ((n.dot(d) < 0 ? 1.0 : -1.0) / n.length());
                for (int c = 0; c < 3; ++c) EXPECT_NEAR(aux.getNormal()[3 * i + c], (&n.x)[c], 1e-5) << where;
                EXPECT_NEAR(aux.getTexCoord()[2 * i], found == 1 ? bs : 0.0, 1e-4) << where;
                EXPECT_NEAR(aux.getTexCoord()[2 * i + 1], found == 1 ? bt : 0.0, 1e-4) << where;
                EXPECT_EQ(aux.getObjectId()[i], float(found)) << where;
                EXPECT_EQ(aux.getMaterialId()[i], float(found)) << where;
            }
        EXPECT_GT(hits, w * h / 8);
    }
}

// Random quads of random opacity at distinct depths in a parallel view, with and without the
// Z-buffer, with the default threshold and a lower one, with and without the surface channels:
// the surface channels name the nearest layer whose alpha reaches the threshold, the deep list
// holds the layers from the nearest down to the first opaque one with their depths and IDs, and
// laid front to back it gives the picture. The view spans several regions, whose buffers reuse
// one fragment pool; an instance out of view with two materials comes first, so that object and
// material IDs differ; the layers are drawn with all three vertex kinds.
TEST(RsAuxOutputs, LayeredScenesGiveFrontMostLayerAndDeepListsThatFlattenToThePicture) {
    std::mt19937 rng(17);
    std::uniform_real_distribution<float> unit(0.0f, 1.0f);
    const int w = 192, h = 96;
    const GeRectangle<int> rect{0, w, 0, h};
    const double n = 0.5, f = 20.0;
    const GeProjectiveMatrix3<double> parallel{2.0 / w, 0, 0, 0, 0, 2.0 / h, 0, 0, 0, 0, -2.0 / (f - n),
                                               -(f + n) / (f - n), 0, 0, 0, 1};
    for (int trial = 0; trial < 12; ++trial) {
        struct Layer {
            GeRectangle<int> pixels;
            float z;
            Rgba colour;
            float id;
        };
        std::vector<Layer> layers;
        std::vector<RCShdPtr<RsGeomInstance>> instances{makeInstance(
            makeMesh({{-1e3f, 0, -2}, {-999, 0, -2}, {-999, 1, -2}}, {0, 1, 2}), {}, {},
            {makeShared<TestMaterial>(), makeShared<TestMaterial>()})};
        for (const LayerRect& rect : randomLayerRects(rng, 7, 0.75f, w, h)) {
            const auto [x0, x1, y0, y1] = rect.pixels;
            const float z = rect.z;
            // Opaque layers of alpha 1 and of alpha one ulp below, which counts as one.
            const float alpha = rng() % 3 == 0 ? (rng() % 2 ? 1.0f : 0.99999994f) : 0.1f + 0.8f * unit(rng);
            layers.push_back({{x0, x1, y0, y1}, -z, Rgba(unit(rng), unit(rng), unit(rng), alpha),
                              float(layers.size() + 2)});
            const float l = float(x0 - w / 2), r = float(x1 - w / 2), b = float(y0 - h / 2), t = float(y1 - h / 2);
            // The layers' materials take turns at the three vertex kinds.
            constexpr unsigned kinds[3] = {0u, RsShadingContext::needsNormal, RsShadingContext::needsTangents};
            MaterialSettings material(layers.back().colour);
            material.needed = kinds[layers.size() % 3];
            instances.push_back(
                drawn(makeMesh({{l, b, z}, {r, b, z}, {r, t, z}, {l, t, z}}, {0, 1, 2, 0, 2, 3}), material));
        }
        const RCShdPtr<RsScene> scene = makeScene(instances);
        std::sort(layers.begin(), layers.end(), [](const Layer& a, const Layer& b) { return a.z < b.z; });
        const bool zBuffer = trial % 2 == 0;
        const float threshold = trial % 4 < 2 ? 1.0f : 0.5f;
        const bool surface = trial % 3 != 2;
        RsAuxOutputs aux(rect, surface, true);
        aux.setOpacityThreshold(threshold);
        RsRenderer renderer;
        renderer.setZBuffer(zBuffer);
        renderer.setAuxOutputs(&aux);
        Picture picture(rect);
        renderer.render({}, parallel, scene, rect, picture.guard);
        Picture plain(rect);
        renderer.setAuxOutputs(nullptr);
        renderer.render({}, parallel, scene, rect, plain.guard);
        EXPECT_TRUE(picture == plain) << "the outputs change the picture";
        for (int y = 0; y < h; ++y)
            for (int x = 0; x < w; ++x) {
                const std::string where = "trial " + std::to_string(trial) + " at " + std::to_string(x) + "," +
                                          std::to_string(y);
                const std::size_t i = aux.indexOf(x, y);
                std::vector<const Layer*> visible;  // nearest first, down to the first opaque one
                const Layer* front = nullptr;
                for (const Layer& l : layers) {
                    if (!l.pixels.contains(x, y)) continue;
                    visible.push_back(&l);
                    const bool opaque = l.colour.a >= 0.99999994f;
                    if (front == nullptr && (opaque || l.colour.a >= threshold)) front = &l;
                    if (opaque) break;
                }
                if (surface) {
                    EXPECT_EQ(aux.getObjectId()[i], front ? front->id : 0.0f) << where;
                    EXPECT_NEAR(aux.getZ()[i], front ? front->z : 0.0f, 1e-5f) << where;
                }
                ASSERT_EQ(aux.getDeepCounts()[i], visible.size()) << where;
                const RsDeepSample* samples = aux.getDeepSamples().data() + aux.getDeepOffsets()[i];
                for (std::size_t s = 0; s < visible.size(); ++s) {
                    EXPECT_NEAR(samples[s]._zFront, visible[s]->z, 1e-4) << where;
                    EXPECT_EQ(samples[s]._zBack, samples[s]._zFront) << where;
                    EXPECT_EQ(samples[s]._objectId, visible[s]->id) << where;
                    EXPECT_EQ(samples[s]._materialId, visible[s]->id + 1.0f) << where;
                }
                const Rgba flat = flattenFrontToBack(&samples->_r, visible.size(), sizeof(RsDeepSample) / sizeof(float));
                expectNearRgba(flat, premultiplied(picture.at(x, y)), 1e-5, where);
            }
    }
}

// Two spheres (radius 1, 64 meridians, 32 parallels, turned in place) in perspective, seen by a
// camera that moves from now to later while the first slides and the second turns about an axis
// through the world origin. Each pixel whose ray meets a sphere well inside its outline (within
// 0.8 of the centre) keeps the sphere and the hit; one that clearly misses both keeps -1.
class RsAuxOutputsSpheres : public ::testing::Test {
protected:
    const GeRectangle<int> rect{0, 64, 0, 48};
    const GeProjectiveMatrix3<double> projection = perspective(0.8, 0.5, 50.0);
    const GeAffineMatrix3<float> cameraNow = GeAffineMatrix3<float>::makeTranslation({0.5f, -1.0f, 7.0f}) *
                                             GeAffineMatrix3<float>::makeRotation({0.3f, 1.0f, 0.2f}, 0.3f);
    const GeAffineMatrix3<float> cameraLater = GeAffineMatrix3<float>::makeTranslation({0.8f, -0.6f, 7.4f}) *
                                               GeAffineMatrix3<float>::makeRotation({0.2f, 1.0f, 0.5f}, 0.36f);
    const GePoint3<double> centres[2] = {{-1.4, 0.3, 0.0}, {1.2, -0.4, -0.5}};
    const GeAffineMatrix3<double> moves[2] = {GeAffineMatrix3<double>::makeTranslation({0.3, -0.25, 0.4}),
                                              GeAffineMatrix3<double>::makeRotation({0.2, 1.0, 0.3}, 0.25)};
    // The faces lie within g = r (1 - cos h) of the sphere, cos h = cos(pi / 64)^2.
    const double g = 1 - std::cos(M_PI / 64) * std::cos(M_PI / 64);
    RsAuxOutputs aux{rect, false, false};
    struct Hit {
        int x, y, k;
        GePoint3<double> p;
    };
    std::vector<Hit> hits;

    void SetUp() override {
        const RCShdPtr<const SdMesh> mesh = makeSphereMesh(1.0f, 64, 32);
        std::vector<RCShdPtr<RsGeomInstance>> now, later;
        for (const int k : {0, 1}) {
            const GeAffineMatrix3<float> place =
                GeAffineMatrix3<float>::makeTranslation({float(centres[k].x), float(centres[k].y), float(centres[k].z)}) *
                GeAffineMatrix3<float>::makeRotation({1.0f, 0.2f, 0.4f}, 0.7f);
            now.push_back(drawn(mesh, {}, place));
            later.push_back(drawn(mesh, {}, GeAffineMatrix3<float>(moves[k]) * place));
        }
        aux.setMotionTarget(*makeScene(later), cameraLater.computeInverse(), projection);
        RsRenderer renderer;
        renderer.setAuxOutputs(&aux);
        Picture picture(rect);
        renderer.render(cameraNow.computeInverse(), projection, makeScene(now), rect, picture.guard);

        const GeAffineMatrix3<double> toWorld(cameraNow);
        const GePoint3<double> eye = toWorld.transformPoint({0, 0, 0});
        for (int y = rect.y0; y < rect.y1; ++y)
            for (int x = rect.x0; x < rect.x1; ++x) {
                const GeVector3<double> d = toWorld.transformVector(rayThroughPixel(projection, rect, x, y));
                double t[2], near[2], far[2];
                for (const int k : {0, 1}) {
                    t[k] = raySphere(eye, d, centres[k], 1.0);
                    near[k] = raySphere(eye, d, centres[k], 0.8), far[k] = raySphere(eye, d, centres[k], 1.1);
                }
                const int k = t[1] > 0 && (t[0] < 0 || t[1] < t[0]) ? 1 : 0;
                if (near[k] > 0) hits.push_back({x, y, k, eye + d * t[k]});
                if (far[0] < 0 && far[1] < 0) hits.push_back({x, y, -1, eye});
            }
    }
};

// Z, N and P are the ray-sphere intersection's: with the ray at most 53 degrees off the normal,
// the face's hit lies within 2g of the sphere's, and the normal, interpolated from the vertices'
// unit positions, points from the centre to the face's hit.
TEST_F(RsAuxOutputsSpheres, ChannelsEqualTheRaySphereIntersection) {
    const GeAffineMatrix3<double> worldToCamera(cameraNow.computeInverse());
    int met = 0;
    for (const Hit& h : hits) {
        if (h.k < 0) continue;
        ++met;
        const std::size_t i = aux.indexOf(h.x, h.y);
        const std::string where = "at " + std::to_string(h.x) + "," + std::to_string(h.y);
        EXPECT_NEAR(aux.getZ()[i], -worldToCamera.transformPoint(h.p).z, 2 * g) << where;
        const GeVector3<double> n = h.p - centres[h.k];
        for (int c = 0; c < 3; ++c) {
            EXPECT_NEAR(aux.getPosition()[3 * i + c], (&h.p.x)[c], 2 * g) << where;
            EXPECT_NEAR(aux.getNormal()[3 * i + c], (&n.x)[c], 2 * g) << where;
        }
    }
    EXPECT_GT(met, 250);
}

// The motion is the later point's position in the picture through the later camera less the
// pixel centre, 0 where nothing was drawn. The hit (within 2g of the face's) seen from 5 or more
// away moves by at most 2g * 80 / 5 pixels.
TEST_F(RsAuxOutputsSpheres, MotionIsTheScreenDisplacementOfTheMovedPoint) {
    const GeAffineMatrix3<double> laterWorldToCamera(cameraLater.computeInverse());
    double largest = 0;
    for (const Hit& h : hits) {
        const std::size_t i = aux.indexOf(h.x, h.y);
        GePoint2<double> want(0, 0);
        if (h.k >= 0) {
            const GePoint3<double> later = laterWorldToCamera.transformPoint(moves[h.k].transformPoint(h.p));
            want = pixelOfPoint(projection, rect, later);
            want = {want.x - h.x - 0.5, want.y - h.y - 0.5};
            largest = std::max(largest, std::hypot(want.x, want.y));
        }
        const std::string where = "at " + std::to_string(h.x) + "," + std::to_string(h.y);
        EXPECT_NEAR(aux.getMotion()[2 * i], want.x, 2 * g * 80 / 5) << where;
        EXPECT_NEAR(aux.getMotion()[2 * i + 1], want.y, 2 * g * 80 / 5) << where;
    }
    EXPECT_GT(largest, 3.0);
}

}  // namespace
}  // namespace Zr
