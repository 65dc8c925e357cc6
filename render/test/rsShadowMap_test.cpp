// Shadow maps, copied or assigned before use (copying moves the cells): both queries through random
// matrices against brute force, a supersampled integral for the filter; size changes; the cube's face.
#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <random>
#include <tuple>
#include <vector>

#include "geAlignedBox3.h"
#include "rsCubeShadowMap.h"
#include "rsShadowMap.h"
#include "rsTestSupport.h"

namespace Zr {
namespace {

using Rgb = CoRgbColorTyped<float>;

// Random views, cameras, biases, depths and projections with any depth row (the map keeps view depth),
// worked forward in double: the single sample tests the cell under the point (lit off the map), the
// filter (sometimes of no width) is the lit area of its square in the map. Near-ties are passed over.
TEST(RsShadowMapTest, QueriesMatchBruteForceThroughRandomMatrices) {
    std::mt19937 rng(63);
    std::uniform_real_distribution<float> unit(-1.0f, 1.0f);
    for (int trial = 0; trial < 10; ++trial) {
        const int size = trial % 2 ? 24 : 5;
        const GeAffineMatrix3<float> light = RsTest::randomMove(rng, unit), camera = RsTest::randomMove(rng, unit);
        GeProjectiveMatrix3<float> projection = RsTest::randomFrustum(rng, unit, 50);
        for (int k : {2, 6, 10, 14}) projection._m[k] = 7 * unit(rng);
        const float bias = 0.1f * unit(rng), range = 3.0f * (unit(rng) + 1.0f);
        RsShadowMap source, map;
        source.setSize(size);
        source.setBias(bias);
        source.setMatrices(light, projection);
        source.setCameraMatrix(camera);
        source.setRange(range);  // the copy's until the 20th point
        std::vector<double> cells(size * size);
        for (double& d : cells) d = -5.0 + 4.0 * unit(rng);
        std::copy(cells.begin(), cells.end(), source.getMap());
        RsShadowMap copy(source);
        map = copy;
        const GeAffineMatrix3<float> viewToCamera = (light * camera).computeInverse();
        for (int n = 0; n < 200; ++n) {
            const float depth = -5.0f + 4.0f * unit(rng), x = 1.6f * depth * unit(rng), y = 1.6f * depth * unit(rng);
            const GePoint3<float> p = viewToCamera.transformPoint({x, y, depth});
            const GePoint3<double> q = GeAffineMatrix3<double>(light).transformPoint(
                GeAffineMatrix3<double>(camera).transformPoint(GePoint3<double>(p)));
            const GeHomogeneousCoord3<double> c = GeProjectiveMatrix3<double>(projection).transform(q);
            const double u = (c.x / c.w + 1.0) * size / 2, v = (c.y / c.w + 1.0) * size / 2, z = q.z + bias;
            const auto nearBorder = [](double t) { return std::fabs(t - std::round(t)) < 1e-3; };
            const bool in = u >= 0 && u < size && v >= 0 && v < size;
            const double stored = in ? cells[static_cast<int>(v) * size + static_cast<int>(u)] : 0.0;
            const bool exact = !nearBorder(u) && !nearBorder(v) && !(in && std::fabs(z - stored) < 1e-3);
            ASSERT_TRUE(!exact || map.computeFastShadow(p) == Rgb(!in || z > stored ? 1.0f : 0.0f)) << u << ' ' << v;
            ASSERT_TRUE(source.computeFastShadow(p) == Rgb(1.0f) && copy.computeBestShadow(p) == Rgb(1.0f));
            const double r = n < 20 ? range / 2.0 : n % 4 ? 3.0 * (unit(rng) + 1.0) / 2 : 0.0;
            if (n >= 20) map.setRange(static_cast<float>(2 * r));
            if (r == 0 && !exact) continue;
            // The sampling errs by 1e-4 per cell border; the square's far end stops 0.001 short.
            const auto lit = [&](int c) { return z > cells[c] ? 1.0 : 0.0; };
            ASSERT_NEAR(map.computeBestShadow(p).r, RsTest::supersampledMean(size, u, v, r, 1.0, lit), 2e-3) << u;
        }
    }
}

// A size equal within float tolerance keeps the rendered map; another drops it: lit until rendered
// anew, then in cells of the new size. A point at exactly the stored depth is in shadow; one on the far
// edges is lit.
TEST(RsShadowMapTest, SetSizeKeepsTheMapOnlyForTheSameSize) {
    RsShadowMap map;
    map.setSize(8.0f);
    double* cells = map.getMap();
    std::fill_n(cells, 64, HUGE_VAL);
    for (float same : {8.0f, std::nextafter(8.0f, 9.0f), std::nextafter(8.0f, 7.0f)}) {
        map.setSize(same);
        EXPECT_TRUE(map.computeFastShadow({0, 0, 0}) == Rgb(0.0f) && map.getMap() == cells) << same;
    }
    map.setSize(9.0f);
    EXPECT_TRUE(map.computeFastShadow({0, 0, 0}) == Rgb(1.0f) && map.computeBestShadow({0, 0, 0}) == Rgb(1.0f));
    std::fill_n(cells = map.getMap(), 81, 0.0);
    cells[80] = 0.5;
    // Both queries' answer, -1 when they differ; by default below every depth, so that reading a cell shadows.
    const auto answer = [&](float x, float y, float z = -1e30f) {
        const Rgb fast = map.computeFastShadow({x, y, z});
        return fast == map.computeBestShadow({x, y, z}) ? fast.r : -1.0f;
    };
    EXPECT_TRUE(answer(0.95f, 0.95f, 0.5f) == 0.0f && answer(0.7f, 0.95f, 0.5f) == 1.0f);  // u = 8.775, 7.65
    for (float t = -0.9f; t < 1.0f; t += 0.2f) EXPECT_TRUE(answer(1, t) == 1.0f && answer(t, 1) == 1.0f) << t;
}

// Squares that meet the map in no area (along its top edge, from outside) are point samples, lit off
// the map rather than 0 / 0; a size that is not whole answers from its whole cells only, lit in the
// part cell beyond them. Identity matrices: u = 4.25 x + 4.25 for size 8.5.
TEST(RsShadowMapTest, ZeroAreaSquaresAndPartCellsAreOffTheMap) {
    RsShadowMap map;
    map.setSize(8.5f);
    std::fill_n(map.getMap(), 64, 1e30);  // everything in the cells is shadowed
    // x, y, filter width, lit: u = 3.3, v = -0.5 with half width 0.5 touches row 0 along a line;
    // u = 8.075 lies in the part cell, u = 7.8625 in the last whole one.
    for (const auto& [x, y, range, lit] : {std::tuple{-0.7f / 4.25f, -4.75f / 4.25f, 1.0f, 1.0f}, {0.9f, 0.0f, 0.0f, 1.0f},
                                            {0.0f, 0.9f, 0.0f, 1.0f}, {0.85f, 0.0f, 0.0f, 0.0f}, {0.0f, 0.85f, 0.0f, 0.0f}}) {
        map.setRange(range);
        EXPECT_EQ(map.computeBestShadow({x, y, 0}), Rgb(lit)) << x << ' ' << y;
        EXPECT_EQ(map.computeFastShadow({x, y, 0}), Rgb(lit)) << x << ' ' << y;
    }
}

// A cube map around (1, 2, 3), assigned from the one set up, whose face f holds the depth -distance[f]:
// a point whose largest offset from the centre is a is lit by the face that answers iff a < distance[f].
struct CubeFixture {
    CubeFixture(const GeAffineMatrix3<float>& camera, const double (&distance)[6]) {
        const RCShdPtr<RsScene> scene = RsTest::makeScene({});
        scene->_bounds = GeAlignedBox3<float>({-30.0f, -30.0f, -30.0f}, {30.0f, 20.0f, 40.0f});
        RsCubeShadowMap made;
        made.setSize(64.0f);
        made.setRange(1.0f);
        made.setMapsCenter(centre, scene);
        made.setCameraMatrix(camera);
        for (int f = 0; f < 6; ++f) std::fill_n(made.getMap(RsCubeShadowMap::CubeFace(f)), 64 * 64, -distance[f]);
        cube = made;
    }
    RsCubeShadowMap cube;
    GePoint3<float> centre{1.0f, 2.0f, 3.0f};
};

// Random points about a turned and moved camera, through a copy; ties, which go to the later axis;
// and a point on a diagonal, which lies inside its face only because faces open wider than 90 degrees.
TEST(RsCubeShadowMapTest, TheFaceOfTheLargestCoordinateAnswers) {
    using C = RsCubeShadowMap;
    std::mt19937 rng(64);
    std::uniform_real_distribution<float> unit(-1.0f, 1.0f), reach(1.5f, 8.0f);
    const double distance[6] = {2.5, 3.5, 4.5, 5.5, 6.5, 7.5};
    const GeAffineMatrix3<float> camera = GeAffineMatrix3<float>::makeTranslation({-2.0f, 0.5f, 4.0f}) *
                                          GeAffineMatrix3<float>::makeRotation({0.3f, -0.5f, 0.8f}, 1.1f);
    CubeFixture fixture(camera, distance);
    const C cube(fixture.cube);
    for (int n = 0; n < 3000; ++n) {
        GeVector3<float> d{unit(rng), unit(rng), unit(rng)};
        d = d * (reach(rng) / std::max({std::fabs(d.x), std::fabs(d.y), std::fabs(d.z)}));
        const GePoint3<float> p = camera.computeInverse().transformPoint(fixture.centre + d);
        const GeVector3<double> q = GeAffineMatrix3<double>(camera).transformPoint(GePoint3<double>(p)) -
                                    GePoint3<double>(fixture.centre);
        const double c[3] = {q.x, q.y, q.z};
        int axis = 0;
        for (int k = 1; k < 3; ++k) axis = std::fabs(c[k]) > std::fabs(c[axis]) ? k : axis;
        const C::CubeFace faces[3][2] = {{C::FaceNegativeX, C::FacePositiveX}, {C::FaceNegativeY, C::FacePositiveY},
                                         {C::FaceNegativeZ, C::FacePositiveZ}};
        const double a = std::fabs(c[axis]), limit = distance[faces[axis][c[axis] > 0]];
        bool tie = std::fabs(a - limit) < 1e-3;
        for (int b = 0; b < 3; ++b) tie |= b != axis && a - std::fabs(c[b]) < 1e-4;
        if (tie) continue;
        const Rgb expected(a < limit ? 1.0f : 0.0f);
        ASSERT_EQ(cube.computeFastShadow(p), expected) << q.x << ' ' << q.y << ' ' << q.z;
        ASSERT_NEAR(cube.computeBestShadow(p).r, expected.r, 1e-6) << q.x << ' ' << q.y << ' ' << q.z;
        ASSERT_EQ(fixture.cube.computeFastShadow(p), Rgb(1.0f)) << "the copy left cells behind";
    }
    const std::pair<GeVector3<float>, C::CubeFace> ties[] = {
        {{2, 2, 2}, C::FacePositiveZ}, {{-2, -2, -2}, C::FaceNegativeZ}, {{2, 1, 2}, C::FacePositiveZ},
        {{0, 2, 2}, C::FacePositiveZ}, {{2, 2, 1}, C::FacePositiveY},    {{2, -2, -1}, C::FaceNegativeY},
        {{-2, 1, 1}, C::FaceNegativeX}, {{2, 0, 0}, C::FacePositiveX}};
    for (const auto& [offset, face] : ties) EXPECT_EQ(C::chooseFace(offset), face) << offset.x << offset.y;
    const CubeFixture near({}, {1, 1, 1, 1, 1, 1});
    EXPECT_EQ(near.cube.computeFastShadow(near.centre + GeVector3<float>{-2, 2, 2}), Rgb(0.0f));
}

}  // namespace
}  // namespace Zr
