// Shadow maps: the area-weighted filter against a supersampled integral over random maps, the
// zero-width filter and the single-sample query against the plain cell test, the cube's choice of
// face on random points and on ties, size changes and the moving copy.
#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <limits>
#include <random>
#include <vector>

#include "geAlignedBox3.h"
#include "geCameraBuilder.h"
#include "rsCubeShadowMap.h"
#include "rsScene.h"
#include "rsShadowMap.h"

namespace Zr {
namespace {

using Rgb = CoRgbColorTyped<float>;
const double kInf = std::numeric_limits<double>::infinity();

// A map of the given size whose matrices are identities: the point (x, y, z) falls at
// u = (x + 1) * size / 2, v = (y + 1) * size / 2, with depth z. The cells get random depths.
std::vector<double> makeIdentityMap(RsShadowMap& map, int size, std::mt19937& rng) {
    map.setSize(static_cast<float>(size));
    map.setBias(0.0f);
    map.setMatrices({}, {});
    map.setCameraMatrix({});
    std::uniform_real_distribution<double> depth(-1.0, 1.0);
    std::vector<double> cells(size * size);
    for (double& d : cells) d = depth(rng);
    std::copy(cells.begin(), cells.end(), map.getMap());
    return cells;
}

// The query point of the identity map at cell position (u, v); exact for power-of-two sizes.
GePoint3<float> atCell(double u, double v, float z, int size) {
    const double half = size / 2.0;
    return {static_cast<float>(u / half - 1.0), static_cast<float>(v / half - 1.0), z};
}

// The lit part of the square of half width r around (u, v), by a grid of n x n samples of which
// only those inside the map count. The grid is a product, so the samples of each cell are the
// product of the counts of its column and its row.
double supersampledLight(const std::vector<double>& cells, int size, double u, double v, double r, float z) {
    const int n = 20000;
    std::vector<double> columns(size, 0.0), rows(size, 0.0);
    for (int k = 0; k < n; ++k) {
        const double t = (k + 0.5) / n * 2.0 * r - r;
        if (u + t >= 0.0 && u + t < size) columns[static_cast<int>(std::floor(u + t))] += 1.0;
        if (v + t >= 0.0 && v + t < size) rows[static_cast<int>(std::floor(v + t))] += 1.0;
    }
    double inside = 0.0, lit = 0.0;
    for (int j = 0; j < size; ++j)
        for (int i = 0; i < size; ++i) {
            inside += columns[i] * rows[j];
            if (static_cast<double>(z) > cells[j * size + i]) lit += columns[i] * rows[j];
        }
    return inside == 0.0 ? 1.0 : lit / inside;
}

TEST(RsShadowMapTest, BestShadowIsTheLitAreaOfTheFilterSquareInsideTheMap) {
    std::mt19937 rng(61);
    for (int size : {16, 4}) {
        RsShadowMap map;
        const std::vector<double> cells = makeIdentityMap(map, size, rng);
        // Centres on a 1/1024 grid from 4 cells before the map to 4 beyond: squares inside, across
        // one or two borders, around the whole map and wholly outside it.
        std::uniform_int_distribution<int> position(-4 * 1024, (size + 4) * 1024);
        std::uniform_real_distribution<float> halfRange(0.05f, 3.0f), depth(-1.0f, 1.0f);
        int outside = 0, partial = 0;
        for (int n = 0; n < 1500; ++n) {
            const double u = position(rng) / 1024.0, v = position(rng) / 1024.0;
            const float r = halfRange(rng), z = depth(rng);
            map.setRange(2.0f * r);
            const double expected = supersampledLight(cells, size, u, v, r, z);
            const Rgb got = map.computeBestShadow(atCell(u, v, z, size));
            // The sampling errs by 1e-4 per cell border; the square's end short of the far edge by
            // 0.001 of its width.
            ASSERT_NEAR(got.r, expected, 2e-3) << "size " << size << " u " << u << " v " << v << " r " << r;
            ASSERT_EQ(got.g, got.r);
            ASSERT_EQ(got.b, got.r);
            const bool out = u + r < 0 || v + r < 0 || u - r >= size || v - r >= size;
            outside += out;
            partial += !out && (u - r < 0 || v - r < 0 || u + r > size || v + r > size);
        }
        EXPECT_GT(outside, 50);
        EXPECT_GT(partial, 300);
    }
}

// With no filter width the square is one point: the cell under it decides, also at a cell's
// exact left or top border, and a point off the map is lit.
TEST(RsShadowMapTest, ZeroRangeTestsTheOneCellUnderThePoint) {
    std::mt19937 rng(62);
    const int size = 8;
    RsShadowMap map;
    const std::vector<double> cells = makeIdentityMap(map, size, rng);
    map.setRange(0.0f);
    std::uniform_int_distribution<int> position(-8, 4 * size + 8);  // quarter cells, many whole
    std::uniform_real_distribution<float> depth(-1.0f, 1.0f);
    for (int n = 0; n < 2000; ++n) {
        const double u = position(rng) / 4.0, v = position(rng) / 4.0;
        const float z = depth(rng);
        const bool inside = u >= 0 && u < size && v >= 0 && v < size;
        const float expected =
            !inside || z > cells[static_cast<int>(std::floor(v)) * size + static_cast<int>(std::floor(u))] ? 1.0f
                                                                                                           : 0.0f;
        ASSERT_EQ(map.computeBestShadow(atCell(u, v, z, size)), Rgb(expected)) << u << ' ' << v;
    }
}

// The single-sample query through general matrices: a light's view, a projection whose depth row
// carries arbitrary numbers (the map keeps view depth) and a camera, all worked forward in double.
TEST(RsShadowMapTest, FastShadowTestsTheCellUnderTheProjectedPoint) {
    std::mt19937 rng(63);
    std::uniform_real_distribution<float> unit(-1.0f, 1.0f);
    int inside = 0, outside = 0;
    const auto randomMove = [&] {
        const GeVector3<float> axis{unit(rng), unit(rng), unit(rng)};
        GeAffineMatrix3<float> m = GeAffineMatrix3<float>::makeRotation(axis, 3 * unit(rng));
        m.setTranslation({5 * unit(rng), 5 * unit(rng), 5 * unit(rng)});
        return m;
    };
    for (int trial = 0; trial < 20; ++trial) {
        const int size = 24;
        const GeAffineMatrix3<float> light = randomMove(), camera = randomMove();
        const float window[4] = {-1.0f + 0.3f * unit(rng), 1.0f + 0.3f * unit(rng), -1.0f + 0.3f * unit(rng),
                                 1.0f + 0.3f * unit(rng)};
        GeProjectiveMatrix3<float> projection =
            GeCameraBuilder<float>::makeFrustum(window[0], window[1], window[2], window[3], 1.0f, 50.0f);
        for (int k : {2, 6, 10, 14}) projection._m[k] = 7 * unit(rng);
        const float bias = 0.1f * unit(rng);
        RsShadowMap map;
        map.setSize(size);
        map.setBias(bias);
        map.setMatrices(light, projection);
        map.setCameraMatrix(camera);
        std::vector<double> cells(size * size);
        for (double& d : cells) d = -5.0 + 4.0 * unit(rng);
        std::copy(cells.begin(), cells.end(), map.getMap());

        const GeAffineMatrix3<float> viewToCamera = (light * camera).computeInverse();
        for (int n = 0; n < 300; ++n) {
            // A point seen by the light, some of them beside the map.
            const float depth = -5.0f + 4.0f * unit(rng);
            const GePoint3<float> p =
                viewToCamera.transformPoint({1.3f * depth * unit(rng), 1.3f * depth * unit(rng), depth});
            GePoint3<double> q(p);
            for (const GeAffineMatrix3<float>* m : {&camera, &light})
                q = GeAffineMatrix3<double>(*m).transformPoint(q);
            const GeHomogeneousCoord3<double> c = GeProjectiveMatrix3<double>(projection).transform(q);
            const double u = (c.x / c.w + 1.0) * size / 2, v = (c.y / c.w + 1.0) * size / 2, z = q.z + bias;
            const auto nearBorder = [](double t) { return std::fabs(t - std::round(t)) < 1e-3; };
            if (nearBorder(u) || nearBorder(v)) continue;
            float expected = 1.0f;
            if (u >= 0 && u < size && v >= 0 && v < size) {
                const double stored = cells[static_cast<int>(v) * size + static_cast<int>(u)];
                if (std::fabs(z - stored) < 1e-3) continue;
                expected = z > stored ? 1.0f : 0.0f;
            }
            ++(expected == 1.0f && !(u >= 0 && u < size && v >= 0 && v < size) ? outside : inside);
            ASSERT_EQ(map.computeFastShadow(p), Rgb(expected)) << trial << ' ' << u << ' ' << v;
        }
    }
    EXPECT_GT(inside, 3000);
    EXPECT_GT(outside, 500);
}

// Shadowed everywhere: every stored depth is nearer than any point.
void fillShadowing(double* cells, int size) { std::fill(cells, cells + size * size, kInf); }

TEST(RsShadowMapTest, SetSizeKeepsTheMapOnlyForTheSameSize) {
    RsShadowMap map;
    map.setSize(8.0f);
    map.setRange(1.0f);
    double* cells = map.getMap();
    fillShadowing(cells, 8);
    const GePoint3<float> centre(0.0f, 0.0f, 0.0f);
    // Equal sizes, exactly or within float tolerance, keep the rendered map.
    for (float same : {8.0f, std::nextafter(8.0f, 9.0f), std::nextafter(8.0f, 7.0f)}) {
        map.setSize(same);
        EXPECT_EQ(map.computeFastShadow(centre), Rgb(0.0f));
        EXPECT_EQ(map.getMap(), cells);
    }
    // A new size drops it: lit until rendered again, then in the new size's cells.
    map.setSize(9.0f);
    EXPECT_EQ(map.computeFastShadow(centre), Rgb(1.0f));
    EXPECT_EQ(map.computeBestShadow(centre), Rgb(1.0f));
    double* resized = map.getMap();
    std::fill(resized, resized + 81, -kInf);
    resized[80] = kInf;
    EXPECT_EQ(map.computeFastShadow({0.95f, 0.95f, 0.0f}), Rgb(0.0f));  // u = v = 8.775: the last cell
    EXPECT_EQ(map.computeFastShadow({0.7f, 0.95f, 0.0f}), Rgb(1.0f));  // the cell before it
}

// A cube map around centre (1, 2, 3) whose face f holds the uniform depth -distance[f]: a point
// whose largest offset from the centre is a is lit by the face that answers iff a < distance[f].
struct CubeFixture {
    explicit CubeFixture(const GeAffineMatrix3<float>& camera, const double (&distance)[6]) {
        RsScene::GeomInstanceList instances;
        RsScene::LightList lights;
        RsScene::CameraList cameras;
        RCShdPtr<RsScene> scene = makeShared<RsScene>(instances, lights, cameras);
        scene->_bounds = GeAlignedBox3<float>({-30.0f, -30.0f, -30.0f}, {30.0f, 20.0f, 40.0f});
        cube.setSize(64.0f);
        cube.setBias(0.0f);
        cube.setRange(1.0f);
        cube.setMapsCenter(centre, scene);
        cube.setCameraMatrix(camera);
        for (int f = 0; f < 6; ++f) {
            double* cells = cube.getMap(static_cast<RsCubeShadowMap::CubeFace>(f));
            std::fill(cells, cells + 64 * 64, -distance[f]);
        }
    }
    RsCubeShadowMap cube;
    GePoint3<float> centre{1.0f, 2.0f, 3.0f};
};

TEST(RsCubeShadowMapTest, TheFaceOfTheLargestCoordinateAnswers) {
    std::mt19937 rng(64);
    std::uniform_real_distribution<float> unit(-1.0f, 1.0f), reach(1.5f, 8.0f);
    const double distance[6] = {2.5, 3.5, 4.5, 5.5, 6.5, 7.5};
    GeAffineMatrix3<float> camera = GeAffineMatrix3<float>::makeRotation({0.3f, -0.5f, 0.8f}, 1.1f);
    camera.setTranslation({-2.0f, 0.5f, 4.0f});
    CubeFixture fixture(camera, distance);
    const GeAffineMatrix3<float> worldToCamera = camera.computeInverse();
    const GeAffineMatrix3<double> cameraToWorld(camera);
    const GePoint3<double> centre(fixture.centre);
    int checked = 0;
    for (int n = 0; n < 3000; ++n) {
        GeVector3<float> d{unit(rng), unit(rng), unit(rng)};
        d = d * (reach(rng) / std::max({std::fabs(d.x), std::fabs(d.y), std::fabs(d.z)}));
        const GePoint3<float> p = worldToCamera.transformPoint(fixture.centre + d);
        const GeVector3<double> q = cameraToWorld.transformPoint(GePoint3<double>(p)) - centre;
        const double c[3] = {q.x, q.y, q.z};
        int axis = 0;
        for (int a = 1; a < 3; ++a)
            if (std::fabs(c[a]) > std::fabs(c[axis])) axis = a;
        const double a = std::fabs(c[axis]);
        bool tie = false;
        for (int b = 0; b < 3; ++b) tie |= b != axis && a - std::fabs(c[b]) < 1e-4;
        static const int faces[3][2] = {{RsCubeShadowMap::FaceNegativeX, RsCubeShadowMap::FacePositiveX},
                                        {RsCubeShadowMap::FaceNegativeY, RsCubeShadowMap::FacePositiveY},
                                        {RsCubeShadowMap::FaceNegativeZ, RsCubeShadowMap::FacePositiveZ}};
        const double limit = distance[faces[axis][c[axis] > 0]];
        if (tie || std::fabs(a - limit) < 1e-3) continue;
        const Rgb expected(a < limit ? 1.0f : 0.0f);
        ASSERT_EQ(fixture.cube.computeFastShadow(p), expected) << q.x << ' ' << q.y << ' ' << q.z;
        // The filter divides a sum of float areas by their total: one within rounding.
        ASSERT_NEAR(fixture.cube.computeBestShadow(p).r, expected.r, 1e-6) << q.x << ' ' << q.y << ' ' << q.z;
        ++checked;
    }
    EXPECT_GT(checked, 2500);
}

TEST(RsCubeShadowMapTest, TiesGoToTheLaterAxis) {
    using C = RsCubeShadowMap;
    const struct {
        GeVector3<float> offset;
        C::CubeFace face;
    } cases[] = {
        {{2, 2, 2}, C::FacePositiveZ},   {{-2, -2, -2}, C::FaceNegativeZ}, {{2, -2, 2}, C::FacePositiveZ},
        {{2, 1, 2}, C::FacePositiveZ},   {{-2, 1, -2}, C::FaceNegativeZ},  {{0, 2, 2}, C::FacePositiveZ},
        {{2, 2, 1}, C::FacePositiveY},   {{-2, -2, 1}, C::FaceNegativeY},  {{2, -2, -1}, C::FaceNegativeY},
        {{-2, 1, 1}, C::FaceNegativeX},  {{2, 0, 0}, C::FacePositiveX},
    };
    for (const auto& t : cases) {
        // Only the expected face lights a point at distance 2.
        double distance[6] = {1, 1, 1, 1, 1, 1};
        distance[t.face] = 100;
        CubeFixture fixture({}, distance);
        const GePoint3<float> p = fixture.centre + t.offset;
        EXPECT_EQ(fixture.cube.computeFastShadow(p), Rgb(1.0f)) << t.offset.x << ' ' << t.offset.y << ' ' << t.offset.z;
    }
}

TEST(RsShadowMapTest, CopyingMovesTheMapAndCopiesTheRest) {
    std::mt19937 rng(65);
    std::uniform_real_distribution<float> unit(-1.0f, 1.0f);
    std::vector<GePoint3<float>> points(200);
    for (GePoint3<float>& p : points) p = {unit(rng), unit(rng), unit(rng)};
    const auto answers = [&](const RsShadowEvaluator& e) {
        std::vector<Rgb> a;
        for (const GePoint3<float>& p : points) {
            a.push_back(e.computeBestShadow(p));
            a.push_back(e.computeFastShadow(p));
        }
        return a;
    };
    const std::vector<Rgb> allLit(2 * points.size(), Rgb(1.0f));

    RsShadowMap source;
    makeIdentityMap(source, 16, rng);
    source.setBias(0.2f);
    source.setRange(3.0f);
    source.setMatrices(GeAffineMatrix3<float>::makeRotation({1, 2, 3}, 0.4f), GeProjectiveMatrix3<float>());
    source.setCameraMatrix(GeAffineMatrix3<float>::makeScale(0.8f, 1.1f, 1.0f));
    const std::vector<Rgb> before = answers(source);
    ASSERT_NE(before, allLit);
    RsShadowMap copy(source);
    EXPECT_EQ(answers(copy), before);
    EXPECT_EQ(answers(source), allLit);
    RsShadowMap assigned;
    assigned = copy;
    EXPECT_EQ(answers(assigned), before);
    EXPECT_EQ(answers(copy), allLit);

    // Face by face for the cube, with its camera matrix and centre.
    const double distance[6] = {0.5, 0.6, 0.7, 0.8, 0.9, 1.0};
    CubeFixture fixture(GeAffineMatrix3<float>::makeTranslation({0.5f, 2.0f, 2.5f}), distance);
    const std::vector<Rgb> cubeBefore = answers(fixture.cube);
    ASSERT_NE(cubeBefore, allLit);
    RsCubeShadowMap cubeCopy(fixture.cube);
    EXPECT_EQ(answers(cubeCopy), cubeBefore);
    EXPECT_EQ(answers(fixture.cube), allLit);
    RsCubeShadowMap cubeAssigned;
    cubeAssigned = cubeCopy;
    EXPECT_EQ(answers(cubeAssigned), cubeBefore);
    EXPECT_EQ(answers(cubeCopy), allLit);
}

}  // namespace
}  // namespace Zr
