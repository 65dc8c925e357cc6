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

// Two quads, s and t running along their edges U and V from Q, with texture coordinates (s, t):
// at every pixel centre whose ray meets one well inside, the channels hold the intersection's
// depth, world position, world normal (towards the eye), texture coordinates and IDs; where no
// ray meets a quad they hold 0.
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
        instances.push_back(drawn(makeMesh({at(0, 0), at(1, 0), at(1, 1), at(0, 1)}, {0, 1, 2, 0, 2, 3},
                                           {{0, 0, 0}, {1, 0, 0}, {1, 1, 0}, {0, 1, 0}}),
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
                EXPECT_NEAR(aux.getTexCoord()[2 * i], bs, 1e-4) << where;
                EXPECT_NEAR(aux.getTexCoord()[2 * i + 1], bt, 1e-4) << where;
                EXPECT_EQ(aux.getObjectId()[i], float(found)) << where;
                EXPECT_EQ(aux.getMaterialId()[i], float(found)) << where;
            }
        EXPECT_GT(hits, w * h / 8);
    }
}

// Random quads of random opacity at distinct depths in a parallel view, with and without the
// Z-buffer, with the default threshold and a lower one: the surface channels name the nearest
// layer whose alpha reaches the threshold, the deep list holds the layers from the nearest down
// to the first opaque one with their depths, and laid front to back it gives the picture.
TEST(RsAuxOutputs, LayeredScenesGiveFrontMostLayerAndDeepListsThatFlattenToThePicture) {
    std::mt19937 rng(17);
    std::uniform_real_distribution<float> unit(0.0f, 1.0f);
    const int w = 32, h = 24;
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
        std::vector<RCShdPtr<RsGeomInstance>> instances;
        std::vector<float> depths;
        for (int i = 0; i < 7; ++i) depths.push_back(-1.0f - 0.75f * i);
        std::shuffle(depths.begin(), depths.end(), rng);
        for (float z : depths) {
            const int x0 = int(rng() % w), x1 = x0 + 1 + int(rng() % (w - x0));
            const int y0 = int(rng() % h), y1 = y0 + 1 + int(rng() % (h - y0));
            // Opaque layers of alpha 1 and of alpha one ulp below, which counts as one.
            const float alpha = rng() % 3 == 0 ? (rng() % 2 ? 1.0f : 0.99999994f) : 0.1f + 0.8f * unit(rng);
            layers.push_back({{x0, x1, y0, y1}, -z, Rgba(unit(rng), unit(rng), unit(rng), alpha),
                              float(layers.size() + 1)});
            const float l = float(x0 - w / 2), r = float(x1 - w / 2), b = float(y0 - h / 2), t = float(y1 - h / 2);
            instances.push_back(drawn(makeMesh({{l, b, z}, {r, b, z}, {r, t, z}, {l, t, z}}, {0, 1, 2, 0, 2, 3}),
                                      MaterialSettings(layers.back().colour)));
        }
        const RCShdPtr<RsScene> scene = makeScene(instances);
        std::sort(layers.begin(), layers.end(), [](const Layer& a, const Layer& b) { return a.z < b.z; });
        const bool zBuffer = trial % 2 == 0;
        const float threshold = trial % 4 < 2 ? 1.0f : 0.5f;
        RsAuxOutputs aux(rect, true, true);
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
                EXPECT_EQ(aux.getObjectId()[i], front ? front->id : 0.0f) << where;
                EXPECT_NEAR(aux.getZ()[i], front ? front->z : 0.0f, 1e-5f) << where;
                ASSERT_EQ(aux.getDeepCounts()[i], visible.size()) << where;
                const RsDeepSample* samples = aux.getDeepSamples().data() + aux.getDeepOffsets()[i];
                for (std::size_t s = 0; s < visible.size(); ++s) {
                    EXPECT_NEAR(samples[s]._zFront, visible[s]->z, 1e-4) << where;
                    EXPECT_EQ(samples[s]._zBack, samples[s]._zFront) << where;
                }
                const Rgba flat = flattenFrontToBack(&samples->_r, visible.size(), sizeof(RsDeepSample) / sizeof(float));
                expectNearRgba(flat, premultiplied(picture.at(x, y)), 1e-5, where);
            }
    }
}

// Two spheres (radius 1, 64 meridians, 32 parallels) seen in perspective by a camera that moves
// between now and later: the first slides; the second, turned in place, also turns about an axis
// through the world origin. The render of now carries the motion target of later.
struct MovingSpheres {
    static constexpr int kWidth = 64, kHeight = 48;
    const GeRectangle<int> rect{0, kWidth, 0, kHeight};
    const GeProjectiveMatrix3<double> projection = perspective(0.8, 0.5, 50.0);
    const GeAffineMatrix3<float> cameraNow = GeAffineMatrix3<float>::makeTranslation({0.5f, -1.0f, 7.0f}) *
                                             GeAffineMatrix3<float>::makeRotation({0.3f, 1.0f, 0.2f}, 0.3f);
    const GeAffineMatrix3<float> cameraLater = GeAffineMatrix3<float>::makeTranslation({0.8f, -0.6f, 7.4f}) *
                                               GeAffineMatrix3<float>::makeRotation({0.2f, 1.0f, 0.5f}, 0.36f);
    const GePoint3<double> centres[2] = {{-1.4, 0.3, 0.0}, {1.2, -0.4, -0.5}};
    const GeVector3<double> slide{0.3, -0.25, 0.4};
    const GeAffineMatrix3<double> turn = GeAffineMatrix3<double>::makeRotation({0.2, 1.0, 0.3}, 0.25);
    // Where a point of sphere k now is later.
    GePoint3<double> later(int k, const GePoint3<double>& p) const {
        return k == 0 ? p + slide : turn.transformPoint(p);
    }
    RsAuxOutputs render() const {
        const RCShdPtr<const SdMesh> mesh = makeSphereMesh(1.0f, 64, 32);
        const GeAffineMatrix3<float> spin = GeAffineMatrix3<float>::makeRotation({1.0f, 0.2f, 0.4f}, 0.7f);
        const auto place = [&](const GePoint3<double>& c) {
            return GeAffineMatrix3<float>::makeTranslation({float(c.x), float(c.y), float(c.z)}) * spin;
        };
        const RCShdPtr<RsScene> now =
            makeScene({drawn(mesh, {}, place(centres[0])), drawn(mesh, {}, place(centres[1]))});
        const RCShdPtr<RsScene> then = makeScene({drawn(mesh, {}, place(centres[0] + slide)),
                                                  drawn(mesh, {}, GeAffineMatrix3<float>(turn) * place(centres[1]))});
        RsAuxOutputs aux(rect, false, false);
        aux.setMotionTarget(*then, cameraLater.computeInverse(), projection);
        RsRenderer renderer;
        renderer.setAuxOutputs(&aux);
        Picture picture(rect);
        renderer.render(cameraNow.computeInverse(), projection, now, rect, picture.guard);
        return aux;
    }
    // Calls check(x, y, k, p) for each pixel whose ray meets sphere k (-1: none) at p, well inside
    // its outline (the ray within 0.8 of the centre) or clearly outside every sphere.
    template <class Check>
    void forPixels(Check&& check) const {
        const GeAffineMatrix3<double> toWorld(cameraNow);
        const GePoint3<double> eye = toWorld.transformPoint({0, 0, 0});
        for (int y = 0; y < kHeight; ++y)
            for (int x = 0; x < kWidth; ++x) {
                const GeVector3<double> d = toWorld.transformVector(rayThroughPixel(projection, rect, x, y));
                double best = 1e300;
                int found = -1;
                bool clear = true;
                for (int k = 0; k < 2; ++k) {
                    const double t = raySphere(eye, d, centres[k], 1.0);
                    clear = clear && raySphere(eye, d, centres[k], 1.1) < 0;
                    if (t > 0 && t < best) best = t, found = k;
                }
                if (found < 0 ? clear : raySphere(eye, d, centres[found], 0.8) > 0)
                    check(x, y, found, found < 0 ? eye : eye + d * best);
            }
    }
};

// Z, N and P well inside the outline are the ray-sphere intersection's. The faces lie within
// g = r (1 - cos h) = 0.0024 of the sphere (cos h = cos(pi / 64) cos(pi / 64)); with the ray at most
// 53 degrees off the normal there, the face's hit lies within 2g of the sphere's, and the normal,
// interpolated from the vertices' unit positions, points from the centre to the face's hit.
TEST(RsAuxOutputs, SphereChannelsEqualTheRaySphereIntersection) {
    const MovingSpheres s;
    const RsAuxOutputs aux = s.render();
    const double g = 1 - std::cos(M_PI / 64) * std::cos(M_PI / 64);
    const GeAffineMatrix3<double> worldToCamera(s.cameraNow.computeInverse());
    int hits = 0;
    s.forPixels([&](int x, int y, int k, const GePoint3<double>& p) {
        if (k < 0) return;
        ++hits;
        const std::size_t i = aux.indexOf(x, y);
        const std::string where = "at " + std::to_string(x) + "," + std::to_string(y);
        EXPECT_NEAR(aux.getZ()[i], -worldToCamera.transformPoint(p).z, 2 * g) << where;
        const GeVector3<double> n = p - s.centres[k];
        for (int c = 0; c < 3; ++c) {
            EXPECT_NEAR(aux.getPosition()[3 * i + c], (&p.x)[c], 2 * g) << where;
            EXPECT_NEAR(aux.getNormal()[3 * i + c], (&n.x)[c], 2 * g) << where;
        }
    });
    EXPECT_GT(hits, 250);
}

// The motion of a pixel is the later point's picture position through the later camera minus the
// pixel centre; 0 where nothing was drawn. The hit (within 2g of the facet's) seen from 5 or more
// away moves by at most 2g * 80 / 5 pixels.
TEST(RsAuxOutputs, MotionOfRigidlyMovingObjectsIsTheirScreenDisplacement) {
    const MovingSpheres s;
    const RsAuxOutputs aux = s.render();
    const double g = 1 - std::cos(M_PI / 64) * std::cos(M_PI / 64);
    const GeAffineMatrix3<double> laterWorldToCamera(s.cameraLater.computeInverse());
    double largest = 0;
    s.forPixels([&](int x, int y, int k, const GePoint3<double>& p) {
        const std::size_t i = aux.indexOf(x, y);
        GePoint2<double> want(0, 0);
        if (k >= 0) {
            const GePoint2<double> to =
                pixelOfPoint(s.projection, s.rect, laterWorldToCamera.transformPoint(s.later(k, p)));
            want = {to.x - x - 0.5, to.y - y - 0.5};
            largest = std::max(largest, std::hypot(want.x, want.y));
        }
        const std::string where = "at " + std::to_string(x) + "," + std::to_string(y);
        EXPECT_NEAR(aux.getMotion()[2 * i], want.x, 2 * g * 80 / 5) << where;
        EXPECT_NEAR(aux.getMotion()[2 * i + 1], want.y, 2 * g * 80 / 5) << where;
    });
    EXPECT_GT(largest, 3.0);
}

}  // namespace
}  // namespace Zr
