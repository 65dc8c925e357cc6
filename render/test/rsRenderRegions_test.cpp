// Region division and the mesh drawing paths, seen through the fragments that reach a recording
// buffer. The reference is a ray cast per pixel centre in double precision: the camera-space point
// of a triangle seen through the centre, its barycentric coordinates and its depth after
// projection, which decide coverage, texture coordinates and clipping independently of the
// rasterizer's planes.
#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <random>
#include <set>

#include "rsRenderTestSupport.h"

namespace Zr {
namespace {

using namespace RenderTest;
using Rect = GeRectangle<int>;

struct V3 {
    double x, y, z;
    V3 operator-(const V3& o) const { return {x - o.x, y - o.y, z - o.z}; }
    V3 operator+(const V3& o) const { return {x + o.x, y + o.y, z + o.z}; }
    V3 operator*(double s) const { return {x * s, y * s, z * s}; }
    double dot(const V3& o) const { return x * o.x + y * o.y + z * o.z; }
    V3 cross(const V3& o) const { return {y * o.z - z * o.y, z * o.x - x * o.z, x * o.y - y * o.x}; }
};

V3 toV3(const GePoint3<float>& p) { return {p.x, p.y, p.z}; }

// The view of every test: camera space is world space, a perspective of 60 degrees.
struct View {
    Rect rect{0, 64, 0, 48};
    double n = 0.5, f = 100.0;
    GeProjectiveMatrix3<double> projection = perspective(1.0471975511965976, 0.5, 100.0);

    // The camera-space direction through pixel centre (px + 0.5, py + 0.5), with z = -1.
    V3 ray(int px, int py) const {
        const double sx = (rect.x1 - rect.x0) * 0.5, sy = (rect.y1 - rect.y0) * 0.5;
        const double ndcX = (px + 0.5 - (rect.x0 + sx)) / sx;
        const double ndcY = (py + 0.5 - (rect.y0 + sy)) / sy;
        return {ndcX / projection(0, 0), ndcY / projection(1, 1), -1.0};
    }
    // Depth after projection and the viewport, which the clipper bounds to -1..1.
    double pixelZ(const V3& p) const {
        const double zc = projection(2, 2) * p.z + projection(2, 3);
        const double wc = projection(3, 2) * p.z + projection(3, 3);
        return 0.5 * zc / wc + 0.5;
    }
};

// What a ray through a pixel centre sees of triangle a, b, c.
struct Hit {
    bool seen = false;       // inside the triangle, in front of the eye, within the depth range
    bool ambiguous = false;  // too near an edge or a depth limit to call
    double bary[3]{};
    V3 point{};
};

Hit castRay(const View& view, int px, int py, const V3& a, const V3& b, const V3& c) {
    Hit hit;
    const V3 d = view.ray(px, py);
    const V3 normal = (b - a).cross(c - a);
    const double denom = normal.dot(d);
    if (denom == 0.0) return hit;
    const double t = normal.dot(a) / denom;
    if (t <= 0.0) return hit;
    hit.point = d * t;
    const double area = normal.dot(normal);
    hit.bary[0] = (c - b).cross(hit.point - b).dot(normal) / area;
    hit.bary[1] = (a - c).cross(hit.point - c).dot(normal) / area;
    hit.bary[2] = 1.0 - hit.bary[0] - hit.bary[1];
    const double z = view.pixelZ(hit.point);
    const double margin = std::min({hit.bary[0], hit.bary[1], hit.bary[2], z + 1.0, 1.0 - z});
    hit.ambiguous = std::abs(margin) < 1e-6;
    hit.seen = margin > 0.0;
    return hit;
}

RCShdPtr<ConstantMaterial> material(ConstantMaterial::Settings settings = {}) {
    return makeShared<ConstantMaterial>(settings);
}

// Random area limits, from a handful of pixels to the whole picture.
int randomLimit(std::mt19937& rng) {
    const int limits[] = {7, 50, 333, 1000, 16384};
    return limits[rng() % 5];
}

TEST(RsRenderRegions, DivisionTilesTheRegionWithOneBufferAtATime) {
    // Hand cases: the exact limit is one region; one pixel more splits at the truncated middle.
    struct Case {
        Rect region;
        int maxArea;
        std::vector<Rect> expected;
    };
    const Case cases[] = {
        {{0, 128, 0, 128}, 16384, {{0, 128, 0, 128}}},
        {{0, 129, 0, 128}, 16384, {{0, 64, 0, 64}, {64, 129, 0, 64}, {0, 64, 64, 128}, {64, 129, 64, 128}}},
        {{-7, 0, 0, 2}, 13, {{-7, -3, 0, 1}, {-3, 0, 0, 1}, {-7, -3, 1, 2}, {-3, 0, 1, 2}}},
        {{5, 5, 0, 9}, 0, {{5, 5, 0, 9}}},
    };
    const RCShdPtr<RsScene> empty = makeScene({});
    const View view;
    for (const Case& c : cases) {
        Recording recording;
        renderRecording(empty, {}, view.projection, c.region, c.maxArea, recording);
        EXPECT_EQ(recording.regions, c.expected);
    }
    // Random regions: leaves within the limit, disjoint, covering the region, one at a time.
    std::mt19937 rng(11);
    for (int trial = 0; trial < 200; ++trial) {
        const int x0 = int(rng() % 200) - 100, y0 = int(rng() % 200) - 100;
        const Rect region{x0, x0 + int(rng() % 150), y0, y0 + int(rng() % 150)};
        const int maxArea = 1 + int(rng() % 500);
        Recording recording;
        renderRecording(empty, {}, view.projection, region, maxArea, recording);
        std::set<std::pair<int, int>> seen;
        long long total = 0;
        for (const Rect& leaf : recording.regions) {
            EXPECT_LE(leaf.getArea(), maxArea);
            total += leaf.getArea();
            for (int y = leaf.y0; y < leaf.y1; ++y)
                for (int x = leaf.x0; x < leaf.x1; ++x) {
                    EXPECT_TRUE(region.contains(x, y));
                    seen.insert({x, y});
                }
        }
        EXPECT_EQ(total, region.getArea());
        EXPECT_EQ(static_cast<long long>(seen.size()), total);
        EXPECT_EQ(recording.maxBuffersAlive, recording.regions.empty() ? 0 : 1);
    }
}

// A grid of jittered vertices on a tilted plane that runs past the sides of the view, through the
// near limit and, in some trials, past the far plane: every pixel whose ray meets the plane
// within the depth range gets exactly one fragment, whatever the region size, and no other pixel
// gets one.
TEST(RsRenderRegions, TiledPlaneIsWatertightAcrossRegionsAndClipPlanes) {
    std::mt19937 rng(5);
    for (int trial = 0; trial < 6; ++trial) {
        View view;
        if (trial % 2) view.projection = perspective(1.0471975511965976, 0.5, 3.0);
        // z = -0.3 - tilt * y: near the eye at the bottom of the view, receding upwards.
        const float tilt = 1.2f + 0.1f * trial;
        auto planeZ = [&](float y) { return -0.3f - tilt * y; };
        std::uniform_real_distribution<float> jitter(-0.3f, 0.3f);
        const int n = 12;
        std::vector<GePoint3<float>> vertices;
        for (int j = 0; j <= n; ++j)
            for (int i = 0; i <= n; ++i) {
                const bool border = i == 0 || j == 0 || i == n || j == n;
                const float x = -3.0f + 0.5f * (i + (border ? 0.0f : jitter(rng)));
                const float y = -1.0f + 0.25f * (j + (border ? 0.0f : jitter(rng)));
                vertices.emplace_back(x, y, planeZ(y));
            }
        std::vector<std::uint32_t> triangles;
        for (int j = 0; j < n; ++j)
            for (int i = 0; i < n; ++i) {
                const std::uint32_t v = j * (n + 1) + i;
                if (rng() % 2)  // either diagonal
                    triangles.insert(triangles.end(), {v, v + 1, v + n + 2, v, v + n + 2, v + n + 1});
                else
                    triangles.insert(triangles.end(), {v, v + 1, v + n + 1, v + 1, v + n + 2, v + n + 1});
            }
        ConstantMaterial::Settings settings;
        settings.mode = SdMaterial::TransferMode::add;
        settings.needed = (trial % 3 == 0) ? 0u : (trial % 3 == 1 ? 0x02u : 0x40u);
        const RCShdPtr<RsScene> scene = makeScene({makeInstance(makeMesh(vertices, triangles), material(settings))});
        Recording recording;
        EXPECT_EQ(renderRecording(scene, {}, view.projection, view.rect, randomLimit(rng), recording), 0);

        // The grid's outline as two triangles is the reference.
        const V3 corners[4] = {{-3, -1, planeZ(-1)}, {3, -1, planeZ(-1)}, {3, 2, planeZ(2)}, {-3, 2, planeZ(2)}};
        int covered = 0;
        for (int py = view.rect.y0; py < view.rect.y1; ++py)
            for (int px = view.rect.x0; px < view.rect.x1; ++px) {
                const auto it = recording.pixels.find({px, py});
                const int count = it == recording.pixels.end() ? 0 : static_cast<int>(it->second.size());
                const Hit h1 = castRay(view, px, py, corners[0], corners[1], corners[2]);
                const Hit h2 = castRay(view, px, py, corners[0], corners[2], corners[3]);
                if (h1.ambiguous || h2.ambiguous) {
                    EXPECT_LE(count, 1);
                    continue;
                }
                const int expected = (h1.seen || h2.seen) ? 1 : 0;
                EXPECT_EQ(count, expected) << "pixel " << px << ", " << py << " trial " << trial;
                covered += expected;
            }
        // Much of the view is covered, and the depth limits cut some of it away.
        EXPECT_GT(covered, view.rect.getArea() / 4);
        EXPECT_LT(covered, view.rect.getArea() * 9 / 10);
    }
}

// Random triangles, some through the near limit, some beside or behind the eye: the pixels that
// get a fragment are exactly those whose ray meets the visible part, and the fragment's eye
// position, depth and barycentric texture coordinates are those of the ray's hit.
TEST(RsRenderRegions, ClippedTrianglesDrawExactlyTheirVisiblePart) {
    std::mt19937 rng(23);
    std::uniform_real_distribution<float> xy(-4.0f, 4.0f), depth(-6.0f, 1.5f);
    const View view;
    int fragments = 0;
    for (int trial = 0; trial < 40; ++trial) {
        const std::vector<GePoint3<float>> corners = {{xy(rng), xy(rng), depth(rng)},
                                                      {xy(rng), xy(rng), depth(rng)},
                                                      {xy(rng), xy(rng), depth(rng)}};
        ConstantMaterial::Settings settings;
        settings.needed = 0x01u | 0x3cu;
        const RCShdPtr<RsScene> scene = makeScene({makeInstance(makeMesh(corners, {0, 1, 2}), material(settings))});
        Recording recording;
        EXPECT_EQ(renderRecording(scene, {}, view.projection, view.rect, randomLimit(rng), recording), 0);
        const V3 a = toV3(corners[0]), b = toV3(corners[1]), c = toV3(corners[2]);
        for (int py = view.rect.y0; py < view.rect.y1; ++py)
            for (int px = view.rect.x0; px < view.rect.x1; ++px) {
                const auto it = recording.pixels.find({px, py});
                const int count = it == recording.pixels.end() ? 0 : static_cast<int>(it->second.size());
                const Hit hit = castRay(view, px, py, a, b, c);
                if (hit.ambiguous) continue;
                ASSERT_EQ(count, hit.seen ? 1 : 0) << "pixel " << px << ", " << py << " trial " << trial;
                if (!hit.seen) continue;
                ++fragments;
                const Fragment& f = it->second[0];
                const double scale = std::max(1.0, std::abs(hit.point.z));
                EXPECT_NEAR(f.eyeCoord.x, hit.point.x, 2e-4 * scale);
                EXPECT_NEAR(f.eyeCoord.y, hit.point.y, 2e-4 * scale);
                EXPECT_NEAR(f.eyeCoord.z, hit.point.z, 2e-4 * scale);
                EXPECT_NEAR(f.depth, view.pixelZ(hit.point), 1e-6);
                // Without texture coordinates the face's barycentric frame stands in.
                EXPECT_NEAR(f.texCoord.x, hit.bary[0], 1e-5);
                EXPECT_NEAR(f.texCoord.y, hit.bary[1], 1e-5);
            }
    }
    EXPECT_GT(fragments, 1000);
}

// A quad at a grazing angle with texture coordinates: at every pixel centre the coordinates and
// their screen derivatives are those of the exact projective map.
TEST(RsRenderRegions, TextureCoordinatesArePerspectiveCorrect) {
    const View view;
    // A parallelogram receding almost along the view, from z = -1.2 near the bottom of the
    // picture to z = -62.8, and turned about y as well, so that 1/w changes along both axes.
    const std::vector<GePoint3<float>> corners = {{-2, -0.8f, -1.2f}, {2, -0.8f, -2.8f}, {2, 0.2f, -62.8f}, {-2, 0.2f, -61.2f}};
    const std::vector<GePoint3<float>> tex = {{0, 0, 0}, {3, 0, 0}, {3, 7, 0}, {0, 7, 0}};
    ConstantMaterial::Settings settings;
    settings.needed = 0x3cu;
    settings.texCoordColour = true;
    const RCShdPtr<RsScene> scene =
        makeScene({makeInstance(makeMesh(corners, {0, 1, 2, 0, 2, 3}, tex), material(settings))});
    Recording recording;
    renderRecording(scene, {}, view.projection, view.rect, 500, recording);

    const V3 a = toV3(corners[0]), b = toV3(corners[1]), d = toV3(corners[3]);
    // (s, t) of the plane point seen through pixel position (x, y), continuous.
    auto exact = [&](double x, double y) {
        const double sx = 32, sy = 24;
        const V3 ray{(x - sx) / sx / view.projection(0, 0), (y - sy) / sy / view.projection(1, 1), -1.0};
        const V3 normal = (b - a).cross(d - a);
        const V3 p = ray * (normal.dot(a) / normal.dot(ray));
        // p - a = alpha * u + beta * v, by the normal equations.
        const V3 u = b - a, v = d - a, q = p - a;
        const double uu = u.dot(u), uv = u.dot(v), vv = v.dot(v), det = uu * vv - uv * uv;
        const double alpha = (q.dot(u) * vv - q.dot(v) * uv) / det;
        const double beta = (q.dot(v) * uu - q.dot(u) * uv) / det;
        return std::pair{3.0 * alpha, 7.0 * beta};
    };
    int checked = 0;
    for (const auto& [pixel, fragments] : recording.pixels) {
        ASSERT_EQ(fragments.size(), 1u);
        const double x = pixel.first + 0.5, y = pixel.second + 0.5;
        const auto [s, t] = exact(x, y);
        if (s < 0.01 || s > 2.99 || t < 0.01 || t > 6.99) continue;  // stay off the edges
        const Fragment& f = fragments[0];
        EXPECT_NEAR(f.texCoord.x, s, 1e-6 * 3);
        EXPECT_NEAR(f.texCoord.y, t, 1e-6 * 7);
        EXPECT_FLOAT_EQ(f.colour.r, static_cast<float>(f.texCoord.x));
        // Screen derivatives against central differences of the exact map.
        const double h = 1e-3;
        const auto [sx0, tx0] = exact(x - h, y);
        const auto [sx1, tx1] = exact(x + h, y);
        const auto [sy0, ty0] = exact(x, y - h);
        const auto [sy1, ty1] = exact(x, y + h);
        const double expected[2][2] = {{(sx1 - sx0) / (2 * h), (tx1 - tx0) / (2 * h)},
                                       {(sy1 - sy0) / (2 * h), (ty1 - ty0) / (2 * h)}};
        for (int r = 0; r < 2; ++r)
            for (int c = 0; c < 2; ++c)
                EXPECT_NEAR(f.texDerivatives(r, c), expected[r][c], 1e-5 + 1e-4 * std::abs(expected[r][c]));
        ++checked;
    }
    EXPECT_GT(checked, 500);
}

// Wire rings: a pixel gets a fragment exactly when its centre lies in the triangle within the wire
// width of an edge - measured on the screen in pixels (three quarters of the wire size), or in eye
// space at the point seen - and never more than one.
TEST(RsRenderRegions, WireRingsCoverABandAlongTheEdges) {
    std::mt19937 rng(31);
    std::uniform_real_distribution<float> xy(-2.5f, 2.5f), depth(-6.0f, -3.0f), size(0.5f, 4.0f);
    const View view;
    auto project = [&](const V3& p) {
        return std::pair{32.0 + 32.0 * view.projection(0, 0) * p.x / -p.z,
                         24.0 + 24.0 * view.projection(1, 1) * p.y / -p.z};
    };
    // Distance from p to the line through a and b, in 2D or 3D.
    auto lineDistance = [](const V3& p, const V3& a, const V3& b) {
        const V3 u = b - a, v = p - a;
        const V3 c = u.cross(v);
        return std::sqrt(c.dot(c) / u.dot(u));
    };
    int banded = 0, trials = 0;
    while (trials < 24) {
        const bool screenSpace = trials % 2 == 0;
        const std::vector<GePoint3<float>> corners = {{xy(rng), xy(rng), depth(rng)},
                                                      {xy(rng), xy(rng), depth(rng)},
                                                      {xy(rng), xy(rng), depth(rng)}};
        const V3 a = toV3(corners[0]), b = toV3(corners[1]), c = toV3(corners[2]);
        ConstantMaterial::Settings settings;
        settings.wireframe = true;
        settings.screenSpace = screenSpace;
        settings.wireSize = screenSpace ? size(rng) : 0.05f * size(rng);
        settings.needed = trials % 3 == 0 ? 0u : (trials % 3 == 1 ? 0x02u : 0x40u);
        const double width = screenSpace ? 0.75 * settings.wireSize : settings.wireSize;
        // The triangle where widths are measured: on the screen (z = 0) or in eye space.
        V3 t[3] = {a, b, c};
        if (screenSpace)
            for (V3& v : t) {
                const auto [px, py] = project(v);
                v = {px, py, 0.0};
            }
        const V3 n = (t[1] - t[0]).cross(t[2] - t[0]);
        const double perimeter = std::sqrt((t[1] - t[0]).dot(t[1] - t[0])) +
                                 std::sqrt((t[2] - t[1]).dot(t[2] - t[1])) + std::sqrt((t[0] - t[2]).dot(t[0] - t[2]));
        const double inradius = std::sqrt(n.dot(n)) / perimeter;
        // Either a ring with a hole, or a triangle narrower than its wire, which is drawn whole.
        const double minHeight = std::sqrt(n.dot(n)) /
                                 std::max({std::sqrt((t[1] - t[0]).dot(t[1] - t[0])), std::sqrt((t[2] - t[1]).dot(t[2] - t[1])),
                                           std::sqrt((t[0] - t[2]).dot(t[0] - t[2]))});
        const bool whole = minHeight < width;
        if (!whole && inradius < 1.5 * width) continue;
        ++trials;
        const RCShdPtr<RsScene> scene = makeScene({makeInstance(makeMesh(corners, {0, 1, 2}), material(settings))});
        Recording recording;
        EXPECT_EQ(renderRecording(scene, {}, view.projection, view.rect, randomLimit(rng), recording), 0);
        for (int py = view.rect.y0; py < view.rect.y1; ++py)
            for (int px = view.rect.x0; px < view.rect.x1; ++px) {
                const auto it = recording.pixels.find({px, py});
                const int count = it == recording.pixels.end() ? 0 : static_cast<int>(it->second.size());
                ASSERT_LE(count, 1);
                const Hit hit = castRay(view, px, py, a, b, c);
                if (hit.ambiguous) continue;
                const V3 p = screenSpace ? V3{px + 0.5, py + 0.5, 0.0} : hit.point;
                const double d = std::min({lineDistance(p, t[0], t[1]), lineDistance(p, t[1], t[2]),
                                           lineDistance(p, t[2], t[0])});
                if (!whole && std::abs(d - width) < 1e-3 * std::max(1.0, width)) continue;
                const bool expected = hit.seen && (whole || d < width);
                EXPECT_EQ(count, expected ? 1 : 0) << px << ", " << py << " trial " << trials;
                banded += expected && !whole;
            }
    }
    EXPECT_GT(banded, 1000);
}

// Random overlapping triangles with every drawing path: the fragments of a picture cut into
// many regions are those of the picture drawn as one region, pixel by pixel and in order.
TEST(RsRenderRegions, SplitRenderEqualsSingleRegion) {
    std::mt19937 rng(47);
    std::uniform_real_distribution<float> xy(-3.0f, 3.0f), depth(-8.0f, 0.3f), unit(0.0f, 1.0f);
    const View view;
    for (int trial = 0; trial < 6; ++trial) {
        std::vector<RCShdPtr<RsGeomInstance>> instances;
        for (int i = 0; i < 12; ++i) {
            std::vector<GePoint3<float>> corners;
            for (int k = 0; k < 3; ++k) corners.emplace_back(xy(rng), xy(rng), depth(rng));
            ConstantMaterial::Settings settings;
            settings.colour = {unit(rng), unit(rng), unit(rng), unit(rng)};
            settings.needed = (i % 3 == 0) ? 0x01u : (i % 3 == 1 ? 0x3eu : 0x7fu);
            settings.wireframe = i % 4 == 3;
            settings.screenSpace = i % 8 == 3;
            settings.wireSize = settings.screenSpace ? 3.0f : 0.2f;
            instances.push_back(makeInstance(makeMesh(corners, {0, 1, 2}, corners), material(settings),
                                             GeAffineMatrix3<float>(), int(rng() % 3)));
        }
        const RCShdPtr<RsScene> scene = makeScene(instances);
        Recording whole, split;
        renderRecording(scene, {}, view.projection, view.rect, 16384, whole);
        renderRecording(scene, {}, view.projection, view.rect, std::min(randomLimit(rng), 1000), split);
        ASSERT_GT(whole.pixels.size(), 500u);
        ASSERT_EQ(whole.pixels.size(), split.pixels.size());
        for (const auto& [pixel, fragments] : whole.pixels) {
            const std::vector<Fragment>& other = split.pixels[pixel];
            ASSERT_EQ(fragments.size(), other.size()) << pixel.first << ", " << pixel.second;
            for (std::size_t i = 0; i < fragments.size(); ++i) {
                EXPECT_EQ(fragments[i].colour, other[i].colour);
                EXPECT_NEAR(fragments[i].depth, other[i].depth, 1e-9);
                EXPECT_NEAR(fragments[i].texCoord.x, other[i].texCoord.x, 1e-5);
                EXPECT_NEAR(fragments[i].normal.z, other[i].normal.z, 1e-4);
            }
        }
    }
}

}  // namespace
}  // namespace Zr
