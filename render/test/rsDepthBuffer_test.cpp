// The depth buffers through a light's depth pass: random triangles, some crossing the near and far
// planes and the map's sides, against the eye z of a ray through each pixel centre (the nearest, or
// the mean of the two nearest), and the midpoint's own cases on one pixel.
#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <random>
#include <string>
#include <vector>

#include "rsShadowPass.h"
#include "rsTestSupport.h"

namespace Zr {
namespace {

using namespace RsTest;
using Type = SdStdLight::ShadowMapType;
constexpr double kLowest = -1.7976931348623157e308;

// A map of size x size cells of the instances seen through projection from the origin.
std::vector<double> renderMap(Type type, int size, const GeProjectiveMatrix3<double>& projection,
                              std::vector<RCShdPtr<RsGeomInstance>> instances) {
    std::vector<double> map(size * size, 0.0);
    RsShadowPass::renderDepthMap(type, map.data(), size, {}, GeProjectiveMatrix3<float>(projection),
                                 makeScene(std::move(instances)));
    return map;
}

// The ray through pixel (x, y) against triangle a, b, c in double: the eye z of the hit, or nothing
// where the ray misses, grazes an edge (the fill rule decides there) or hits outside the depth range
// that clipping keeps (pixel depth within -1..1, i.e. projected depth within -3..1).
struct Hit {
    bool hit = false, ambiguous = false;
    double z = 0;
};
Hit castRay(int x, int y, int size, double t, double n, double f, const GePoint3<double> (&v)[3]) {
    const GeVector3<double> d(((x + 0.5) / size * 2 - 1) * t, ((y + 0.5) / size * 2 - 1) * t, -1.0);
    const GeVector3<double> e1 = v[1] - v[0], e2 = v[2] - v[0], p = d.cross(e2);
    const double det = e1.dot(p);
    if (std::fabs(det) < 1e-12) return {};
    const GeVector3<double> s = GePoint3<double>() - v[0], q = s.cross(e1);
    const double b1 = s.dot(p) / det, b2 = d.dot(q) / det, dist = e2.dot(q) / det;
    const double ndc = ((f + n) / (n - f) * -dist + 2 * f * n / (n - f)) / dist;
    const double margin = 1e-5;
    const bool inside = b1 > 0 && b2 > 0 && b1 + b2 < 1 && dist > 0 && ndc >= -3 && ndc <= 1;
    const bool near = std::min({std::fabs(b1), std::fabs(b2), std::fabs(1 - b1 - b2)}) < margin ||
                      std::fabs(ndc + 3) < 1e-6 || std::fabs(ndc - 1) < 1e-6;
    return {inside && !near, near, -dist};
}

TEST(RsDepthBuffers, RandomTrianglesGiveTheEyeZOfTheNearestAndTheMidpointOfTheTwoNearest) {
    std::mt19937 rng(36);
    std::uniform_real_distribution<double> across(-1.3, 1.3), depth(0.3, 14.0);
    const int size = 40;
    const double fov = 1.0, n = 0.5, f = 12.0, t = std::tan(fov / 2);
    int checked = 0;
    for (int trial = 0; trial < 12; ++trial) {
        std::vector<RCShdPtr<RsGeomInstance>> instances;
        std::vector<std::array<GePoint3<double>, 3>> triangles;
        for (int k = 0; k < 6; ++k) {
            std::vector<GePoint3<float>> corners;
            std::array<GePoint3<double>, 3> tri;
            bool allInFront = true;
            for (GePoint3<double>& c : tri) {
                const double d = depth(rng);
                c = {across(rng) * d * t, across(rng) * d * t, -d};
                allInFront &= d < n;
                corners.emplace_back(c);
                c = GePoint3<double>(corners.back());  // the float the mesh holds
            }
            instances.push_back(makeInstance(makeMesh(corners, {0, 1, 2})));
            if (!allInFront) triangles.push_back(tri);  // a box wholly before the near plane is culled
        }
        const auto projection = perspective(fov, n, f);
        const std::vector<double> nearest = renderMap(Type::ShadowMapZ, size, projection, instances);
        const std::vector<double> midpoint = renderMap(Type::ShadowMapMidpoint, size, projection, instances);
        for (int y = 0; y < size; ++y) {
            for (int x = 0; x < size; ++x) {
                std::vector<double> zs;
                bool ambiguous = false;
                for (const auto& tri : triangles) {
                    const Hit h = castRay(x, y, size, t, n, f, {tri[0], tri[1], tri[2]});
                    ambiguous |= h.ambiguous;
                    if (h.hit) zs.push_back(h.z);
                }
                if (ambiguous) continue;
                std::sort(zs.rbegin(), zs.rend());
                const double first = zs.empty() ? kLowest : zs[0], second = zs.size() < 2 ? kLowest : zs[1];
                const std::string where = std::to_string(x) + "," + std::to_string(y);
                ASSERT_NEAR(nearest[y * size + x], first, 1e-4 * std::fabs(first)) << where;
                const double mean = first * 0.5 + second * 0.5;
                ASSERT_NEAR(midpoint[y * size + x], mean, 1e-4 * std::fabs(mean)) << where;
                checked += zs.size() >= 2;
            }
        }
    }
    EXPECT_GT(checked, 2000);
}

// Cards facing the light at the given depths, over the whole of a 2 x 2 parallel map, in this
// drawing order: what the midpoint map leaves.
double midpointOf(const std::vector<float>& depths) {
    std::vector<RCShdPtr<RsGeomInstance>> cards;
    for (float z : depths)
        cards.push_back(makeInstance(card(5.0f), GeAffineMatrix3<float>::makeTranslation({0, 0, z})));
    const GeProjectiveMatrix3<double> parallel{1, 0, 0, 0, 0, 1, 0, 0, 0, 0, -0.1, -1, 0, 0, 0, 1};
    return renderMap(Type::ShadowMapMidpoint, 2, parallel, cards)[3];
}

TEST(RsDepthBuffers, TheMidpointKeepsTheTwoNearestSurfaces) {
    EXPECT_EQ(midpointOf({}), kLowest);
    EXPECT_EQ(midpointOf({-3}), kLowest * 0.5 - 1.5);
    EXPECT_EQ(midpointOf({-3, -5}), -4.0);
    EXPECT_EQ(midpointOf({-5, -3}), -4.0);
    EXPECT_EQ(midpointOf({-3, -5, -7}), -4.0);   // a third behind both changes nothing
    EXPECT_EQ(midpointOf({-3, -7, -5}), -4.0);   // a third between replaces the second
    EXPECT_EQ(midpointOf({-7, -5, -3}), -4.0);
    EXPECT_EQ(midpointOf({-3, -3, -5}), -3.0);   // a surface level with the nearest is the second
}

}  // namespace
}  // namespace Zr
