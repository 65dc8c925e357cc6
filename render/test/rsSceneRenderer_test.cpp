// Region division and the mesh drawing paths. The reference is a ray cast through each pixel
// centre in double precision: the camera-space point of the triangle seen there, its barycentric
// coordinates and its depth after projection decide coverage, texture coordinates and clipping
// independently of the rasterizer's planes.
#include <gtest/gtest.h>

#include <algorithm>
#include <random>
#include <set>
#include <stdexcept>

#include "rsDrawContext.h"
#include "rsRasterizer.h"
#include "rsSceneRenderer.h"
#include "rsTestSupport.h"

namespace Zr {
namespace {

using namespace RsTest;
using Rect = GeRectangle<int>;

struct V3 {
    double x, y, z;
    V3 operator-(const V3& o) const { return {x - o.x, y - o.y, z - o.z}; }
    V3 operator*(double s) const { return {x * s, y * s, z * s}; }
    double dot(const V3& o) const { return x * o.x + y * o.y + z * o.z; }
    V3 cross(const V3& o) const { return {y * o.z - z * o.y, z * o.x - x * o.z, x * o.y - y * o.x}; }
};

// 64 x 48 pixels seen through a 60 degree perspective.
const Rect kRect{0, 64, 0, 48};
const GeProjectiveMatrix3<double> kProjection = perspective(1.0471975511965976, 0.5, 100.0);

// The camera-space direction through pixel position (x, y), with z = -1.
V3 rayThrough(double x, double y) { return {(x - 32) / 32 / kProjection(0, 0), (y - 24) / 24 / kProjection(1, 1), -1}; }

// What the ray through pixel centre (px, py) sees of triangle a, b, c: `seen` when it meets it
// in front of the eye within the clipper's depth range (-1 to 1 after the viewport), `ambiguous`
// when too near an edge or a depth limit to call.
struct Hit {
    bool seen = false, ambiguous = false;
    double bary[3]{};
    V3 point{};
};

Hit castRay(int px, int py, const V3& a, const V3& b, const V3& c) {
    Hit hit;
    const V3 d = rayThrough(px + 0.5, py + 0.5);
    const V3 n = (b - a).cross(c - a);
    const double t = n.dot(a) / n.dot(d);
    if (!(t > 0.0)) return hit;
    hit.point = d * t;
    hit.bary[0] = (c - b).cross(hit.point - b).dot(n) / n.dot(n);
    hit.bary[1] = (a - c).cross(hit.point - c).dot(n) / n.dot(n);
    hit.bary[2] = 1.0 - hit.bary[0] - hit.bary[1];
    const double z = 0.5 * (kProjection(2, 2) * hit.point.z + kProjection(2, 3)) / -hit.point.z + 0.5;
    const double margin = std::min({hit.bary[0], hit.bary[1], hit.bary[2], z + 1.0, 1.0 - z});
    hit.ambiguous = std::abs(margin) < 1e-6;
    hit.seen = margin > 0.0;
    return hit;
}

V3 toV3(const GePoint3<float>& p) { return {p.x, p.y, p.z}; }

// A factory whose buffers only log the regions they are made for; they are given nothing to draw.
struct LoggingFactory {
    struct Buffer : RCObject {
        using Context = RsDrawContext;
        template <class V>
        const RsRasterizer<Buffer, V, RsPixelSpan<0, 0>>& getRasterizer() const {
            throw std::logic_error("nothing to draw");
        }
        Buffer(LoggingFactory& f, const Rect& r) : factory(f), region(r) {
            factory.maxAlive = std::max(factory.maxAlive, ++factory.alive);
        }
        ~Buffer() override { --factory.alive; }
        void finalize() { factory.regions.push_back(region); }
        LoggingFactory& factory;
        Rect region;
    };
    int getMaxArea() const { return maxArea; }
    int getKernelSize() const { return 0; }
    RCShdPtr<Buffer> createBuffer(const Rect& r) { return makeShared<Buffer>(*this, r); }
    int maxArea;
    std::vector<Rect> regions;
    int alive = 0, maxAlive = 0;
};

std::vector<Rect> divide(const Rect& region, int maxArea, int* maxAlive = nullptr) {
    LoggingFactory factory{maxArea, {}};
    RsSceneRenderer<LoggingFactory> renderer(factory);
    renderer.renderRegion({}, region);
    if (maxAlive) *maxAlive = factory.maxAlive;
    return factory.regions;
}

TEST(RsSceneRenderer, DivisionTilesTheRegionWithOneBufferAtATime) {
    // The limit itself is one region; one pixel more splits at the middle, truncated towards 0.
    EXPECT_EQ(divide({0, 128, 0, 128}, 16384), std::vector<Rect>({{0, 128, 0, 128}}));
    EXPECT_EQ(divide({0, 129, 0, 128}, 16384),
              std::vector<Rect>({{0, 64, 0, 64}, {64, 129, 0, 64}, {0, 64, 64, 128}, {64, 129, 64, 128}}));
    EXPECT_EQ(divide({-7, 0, 0, 2}, 13),
              std::vector<Rect>({{-7, -3, 0, 1}, {-3, 0, 0, 1}, {-7, -3, 1, 2}, {-3, 0, 1, 2}}));
    std::mt19937 rng(11);
    for (int trial = 0; trial < 200; ++trial) {
        const int x0 = int(rng() % 200) - 100, y0 = int(rng() % 200) - 100;
        const Rect region{x0, x0 + int(rng() % 150), y0, y0 + int(rng() % 150)};
        const int maxArea = 1 + int(rng() % 500);
        int maxAlive = 0;
        std::set<std::pair<int, int>> seen;
        long long total = 0;
        for (const Rect& leaf : divide(region, maxArea, &maxAlive)) {
            EXPECT_LE(leaf.getArea(), maxArea);
            total += leaf.getArea();
            for (int y = leaf.y0; y < leaf.y1; ++y)
                for (int x = leaf.x0; x < leaf.x1; ++x) seen.insert({x, y});
        }
        EXPECT_EQ(total, region.getArea());
        EXPECT_EQ(static_cast<long long>(seen.size()), total);
        EXPECT_TRUE(seen.empty() || (seen.begin()->first >= region.x0 && seen.rbegin()->first < region.x1));
        EXPECT_EQ(maxAlive, 1);
    }
}

// Random triangles, some through the near limit, some beside or behind the eye: a pixel has one
// fragment exactly when its ray meets the visible part, and its texture coordinates are the
// barycentric coordinates of the hit, the stand-in for a mesh without texture coordinates.
TEST(RsSceneRenderer, ClippedTrianglesDrawExactlyTheirVisiblePart) {
    std::mt19937 rng(23);
    std::uniform_real_distribution<float> xy(-4.0f, 4.0f), depth(-6.0f, 1.5f);
    int fragments = 0;
    for (int trial = 0; trial < 40; ++trial) {
        std::vector<GePoint3<float>> corners;
        for (int k = 0; k < 3; ++k) corners.emplace_back(xy(rng), xy(rng), depth(rng));
        MaterialSettings settings = counting(0x3cu);
        settings.probe = [](const RsShadingContext& c) {
            return Rgba(float(c._texCoord.x), float(c._texCoord.y), 1, 1);
        };
        Picture picture(kRect);
        render(makeScene({drawn(makeMesh(corners, {0, 1, 2}), settings)}), kProjection, kRect, picture);
        for (int py = kRect.y0; py < kRect.y1; ++py)
            for (int px = kRect.x0; px < kRect.x1; ++px) {
                const Hit hit = castRay(px, py, toV3(corners[0]), toV3(corners[1]), toV3(corners[2]));
                if (hit.ambiguous) continue;
                const Rgba p = picture.at(px, py);
                ASSERT_EQ(p.b, hit.seen ? 1.0f : 0.0f) << px << ", " << py << " trial " << trial;
                if (!hit.seen) continue;
                ++fragments;
                EXPECT_NEAR(p.r, hit.bary[0], 1e-5);
                EXPECT_NEAR(p.g, hit.bary[1], 1e-5);
            }
    }
    EXPECT_GT(fragments, 1000);
}

// A textured parallelogram at a grazing angle: at every pixel centre the texture coordinates, the
// eye position and their screen derivatives are those of the exact projective map.
TEST(RsSceneRenderer, ShadingInputsArePerspectiveCorrect) {
    // From z = -1.2 to z = -62.8, turned about y as well, so that 1/w changes along both axes.
    const std::vector<GePoint3<float>> corners = {
        {-2, -0.8f, -1.2f}, {2, -0.8f, -2.8f}, {2, 0.2f, -62.8f}, {-2, 0.2f, -61.2f}};
    const RCShdPtr<const SdMesh> mesh =
        makeMesh(corners, {0, 1, 2, 0, 2, 3}, {{0, 0, 0}, {3, 0, 0}, {3, 7, 0}, {0, 7, 0}});
    // (s, t) and the eye point P of the plane point seen through pixel position (x, y):
    // P - a = alpha u + beta v.
    const V3 a = toV3(corners[0]), u = toV3(corners[1]) - a, v = toV3(corners[3]) - a, n = u.cross(v);
    auto exact = [&](double x, double y) {
        const V3 ray = rayThrough(x, y);
        const V3 p = ray * (n.dot(a) / n.dot(ray));
        const V3 q = p - a;
        const double uu = u.dot(u), uv = u.dot(v), vv = v.dot(v), det = uu * vv - uv * uv;
        return std::array<double, 5>{3.0 * (q.dot(u) * vv - q.dot(v) * uv) / det,
                                     7.0 * (q.dot(v) * uu - q.dot(u) * uv) / det, p.x, p.y, p.z};
    };
    // Five pictures: (s, t, ds/dx), (dt/dx, ds/dy, dt/dy), P, dP/dx, dP/dy.
    const auto rgb = [](const auto& v) { return Rgba(float(v.x), float(v.y), float(v.z), 1); };
    const std::function<Rgba(const RsShadingContext&)> probes[5] = {
        [](const RsShadingContext& c) {
            return Rgba(float(c._texCoord.x), float(c._texCoord.y), float(c._texCoordDerivatives(0, 0)), 1);
        },
        [](const RsShadingContext& c) {
            const GeLinearMatrix2<double>& d = c._texCoordDerivatives;
            return Rgba(float(d(0, 1)), float(d(1, 0)), float(d(1, 1)), 1);
        },
        [&](const RsShadingContext& c) { return rgb(c._eyeCoord); },
        [&](const RsShadingContext& c) { return rgb(c._dEyeCoord_dx); },
        [&](const RsShadingContext& c) { return rgb(c._dEyeCoord_dy); }};
    std::vector<Picture> pictures;
    for (const auto& probe : probes) {
        MaterialSettings settings;
        settings.needed = 0x3du;
        settings.probe = probe;
        pictures.emplace_back(kRect);
        render(makeScene({drawn(mesh, settings)}), kProjection, kRect, pictures.back());
    }
    int checked = 0;
    const double h = 1e-3;
    for (int py = kRect.y0; py < kRect.y1; ++py)
        for (int px = kRect.x0; px < kRect.x1; ++px) {
            const double x = px + 0.5, y = py + 0.5;
            const auto e = exact(x, y);
            if (e[0] < 0.01 || e[0] > 2.99 || e[1] < 0.01 || e[1] > 6.99) continue;  // off the edges
            // The derivatives against central differences of the exact map.
            const auto dx0 = exact(x - h, y), dx1 = exact(x + h, y), dy0 = exact(x, y - h), dy1 = exact(x, y + h);
            const auto ddx = [&](int k) { return (dx1[k] - dx0[k]) / (2 * h); };
            const auto ddy = [&](int k) { return (dy1[k] - dy0[k]) / (2 * h); };
            const double expected[15] = {e[0],   e[1],   ddx(0), ddx(1), ddy(0), ddy(1), e[2],  e[3],
                                         e[4],   ddx(2), ddx(3), ddx(4), ddy(2), ddy(3), ddy(4)};
            for (int k = 0; k < 15; ++k) {
                const Rgba pixel = pictures[static_cast<std::size_t>(k / 3)].at(px, py);
                const float got = k % 3 == 0 ? pixel.r : k % 3 == 1 ? pixel.g : pixel.b;
                EXPECT_NEAR(got, expected[k], 2e-5 + 1e-4 * std::abs(expected[k])) << px << ", " << py << " #" << k;
            }
            ++checked;
        }
    EXPECT_GT(checked, 500);
}

// Wire rings: a pixel gets one fragment exactly when its centre lies in the triangle within the
// wire width of an edge - on the screen, three quarters of the wire size in pixels, or in eye
// space at the point seen - and a triangle narrower than its wire is drawn whole.
TEST(RsSceneRenderer, WireRingsCoverABandAlongTheEdges) {
    std::mt19937 rng(31);
    std::uniform_real_distribution<float> xy(-2.5f, 2.5f), depth(-6.0f, -3.0f), size(0.5f, 4.0f);
    auto lineDistance = [](const V3& p, const V3& a, const V3& b) {
        const V3 c = (b - a).cross(p - a);
        return std::sqrt(c.dot(c) / (b - a).dot(b - a));
    };
    int banded = 0;
    for (int trials = 0; trials < 24;) {
        const bool screenSpace = trials % 2 == 0;
        std::vector<GePoint3<float>> corners;
        for (int k = 0; k < 3; ++k) corners.emplace_back(xy(rng), xy(rng), depth(rng));
        MaterialSettings settings = counting(trials % 3 == 0 ? 0u : (trials % 3 == 1 ? 0x02u : 0x40u));
        settings.wireframe = true;
        settings.screenSpace = screenSpace;
        settings.wireSize = screenSpace ? size(rng) : 0.05f * size(rng);
        const double width = screenSpace ? 0.75 * settings.wireSize : settings.wireSize;
        // The triangle where widths are measured: on the screen (z = 0) or in eye space.
        V3 t[3];
        for (int k = 0; k < 3; ++k) {
            const V3 c = toV3(corners[k]);
            t[k] = screenSpace
                       ? V3{32 + 32 * kProjection(0, 0) * c.x / -c.z, 24 + 24 * kProjection(1, 1) * c.y / -c.z, 0}
                       : c;
        }
        const double area2 = std::sqrt((t[1] - t[0]).cross(t[2] - t[0]).dot((t[1] - t[0]).cross(t[2] - t[0])));
        double perimeter = 0, longest = 0;
        for (int k = 0; k < 3; ++k) {
            const double e = std::sqrt((t[(k + 1) % 3] - t[k]).dot(t[(k + 1) % 3] - t[k]));
            perimeter += e;
            longest = std::max(longest, e);
        }
        // Either a ring with a clear hole, or a triangle lower than its wire.
        const bool whole = area2 / longest < width;
        if (!whole && area2 / perimeter < 1.5 * width) continue;
        ++trials;
        Picture picture(kRect);
        render(makeScene({drawn(makeMesh(corners, {0, 1, 2}), settings)}), kProjection, kRect, picture);
        for (int py = kRect.y0; py < kRect.y1; ++py)
            for (int px = kRect.x0; px < kRect.x1; ++px) {
                const float count = picture.at(px, py).r;
                ASSERT_LE(count, 1.0f);
                const Hit hit = castRay(px, py, toV3(corners[0]), toV3(corners[1]), toV3(corners[2]));
                if (hit.ambiguous) continue;
                const V3 p = screenSpace ? V3{px + 0.5, py + 0.5, 0.0} : hit.point;
                const double d =
                    std::min({lineDistance(p, t[0], t[1]), lineDistance(p, t[1], t[2]), lineDistance(p, t[2], t[0])});
                if (!whole && std::abs(d - width) < 1e-3 * std::max(1.0, width)) continue;
                const bool expected = hit.seen && (whole || d < width);
                EXPECT_EQ(count, expected ? 1.0f : 0.0f) << px << ", " << py << " trial " << trials;
                banded += expected && !whole;
            }
    }
    EXPECT_GT(banded, 1000);
}

}  // namespace
}  // namespace Zr
