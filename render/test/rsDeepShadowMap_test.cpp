// Deep shadow maps: curves resolved from random stacks of coloured transmitting cards drawn by a deep
// pass against the running product of their layers, cut at total blackness; the queries through
// random matrices and biases against the step function of each cell, and the filter per channel
// against the supersampled mean.
#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <random>
#include <vector>

#include "rsDeepShadowMap.h"
#include "rsShadowPass.h"
#include "rsTestSupport.h"

namespace Zr {
namespace {

using namespace RsTest;
using Rgb = CoRgbColorTyped<float>;
using Element = RsTransmittanceFunction::Element;
using M = GeAffineMatrix3<float>;

// The step function of a curve, as defined: 1 up to and including the first element's depth, then
// each element's transmittance up to and including the next one's depth.
Rgb stepAt(const std::vector<Element>& curve, double depth) {
    Rgb value(1.0f);
    for (const Element& e : curve)
        if (e.depth < depth) value = e.transmittance;
    return value;
}

TEST(RsDeepShadowMap, RandomStacksGiveTheProductOfTheirLayersCutAtBlackness) {
    std::mt19937 rng(61);
    std::uniform_real_distribution<float> unit(0.0f, 1.0f);
    const int size = 8;
    // A parallel view down -z from 0.5 to 10.5: depth 0.5 z_ndc + 0.5.
    const GeProjectiveMatrix3<float> projection{1, 0, 0, 0, 0, 1, 0, 0, 0, 0, -0.2f, -1.1f, 0, 0, 0, 1};
    for (int trial = 0; trial < 30; ++trial) {
        struct Layer { int x0, x1, y0, y1; float z; Rgb colour; };
        std::vector<Layer> layers;
        std::vector<RCShdPtr<RsGeomInstance>> cards;
        for (int k = 0; k < 7; ++k) {
            Layer l{int(rng() % 7), 0, int(rng() % 7), 0, -1.0f - 0.7f * k, Rgb(unit(rng), unit(rng), unit(rng))};
            l.x1 = l.x0 + 1 + int(rng() % (size - l.x0)), l.y1 = l.y0 + 1 + int(rng() % (size - l.y0));
            const int kind = int(rng() % 8);  // black, one black channel, tiny, or plain
            if (kind == 0) l.colour = Rgb(0.0f);
            if (kind == 1) l.colour.r = 0.0f;
            if (kind == 2) l.colour = Rgb(1e-7f, 0.5f, 1e-7f);
            layers.push_back(l);
            // Cells of the parallel map are 0.25 wide: the card's edges lie on cell borders.
            const float cx = (l.x0 + l.x1) / 8.0f - 1.0f, cy = (l.y0 + l.y1) / 8.0f - 1.0f;
            const float hx = (l.x1 - l.x0) / 8.0f, hy = (l.y1 - l.y0) / 8.0f;
            MaterialSettings s(Rgba(l.colour.r, l.colour.g, l.colour.b, kind == 0 ? 1.0f : 0.5f));
            cards.push_back(caster(makeMesh({{-hx, -hy, 0}, {hx, -hy, 0}, {hx, hy, 0}, {-hx, hy, 0}}, {0, 1, 2, 0, 2, 3}),
                                   GeAffineMatrix3<float>::makeTranslation({cx, cy, l.z}), makeShared<TestMaterial>(),
                                   makeShared<TestMaterial>(s)));
        }
        std::shuffle(cards.begin(), cards.end(), rng);
        RsDeepShadowMap map;
        map.setSize(size);
        map.setMatrices({}, projection);
        map.allocateMap();
        RsShadowPass::renderDeepMap(map, makeScene(cards));
        for (int y = 0; y < size; ++y) {
            for (int x = 0; x < size; ++x) {
                // Nearest first: the product of the layers up to the first that leaves all black.
                std::vector<Element> want;
                Rgb passed(1.0f);
                for (const Layer& l : layers) {
                    if (x < l.x0 || x >= l.x1 || y < l.y0 || y >= l.y1 || passed == Rgb(0.0f)) continue;
                    passed = passed * l.colour;
                    want.push_back({float(0.5 * (-0.2 * l.z - 1.1) + 0.5), passed});
                }
                const RsTransmittanceFunction& f = map.getMap()[y * size + x];
                ASSERT_EQ(f.getSize(), int(want.size())) << x << ',' << y;
                for (int i = 0; i < f.getSize(); ++i) {
                    const Element& e = f.getElements()[i];
                    ASSERT_NEAR(e.depth, want[i].depth, 1e-6);
                    ASSERT_EQ(e.transmittance, want[i].transmittance) << x << ',' << y << ' ' << i;
                    // A surface at an element's depth is not shaded by that element.
                    ASSERT_EQ(f.getTransmittance(e.depth), i == 0 ? Rgb(1.0f) : f.getElements()[i - 1].transmittance);
                }
                for (int n = 0; n < 8; ++n) {
                    const float d = unit(rng);
                    ASSERT_EQ(f.getTransmittance(d), stepAt(want, d)) << d;
                }
            }
        }
    }
}

// Random light views, cameras, biases and perspective projections over cells of random curves,
// worked forward in double (the bias moves the point towards the light before its depth is
// projected; its place in the map stays); the map is used through a copy. Near-ties are passed
// over. A square touching the map in no area is lit.
TEST(RsDeepShadowMap, QueriesMatchTheCellsCurvesThroughRandomMatrices) {
    std::mt19937 rng(62);
    std::uniform_real_distribution<float> unit(-1.0f, 1.0f);
    for (int trial = 0; trial < 8; ++trial) {
        const int size = trial % 2 ? 12 : 5;
        const GeAffineMatrix3<float> light = randomMove(rng, unit), camera = randomMove(rng, unit);
        const GeProjectiveMatrix3<float> projection = randomFrustum(rng, unit, 20);
        const float bias = trial == 0 ? 0.0f : 0.5f * unit(rng), range = 3.0f * (unit(rng) + 1.0f);
        RsDeepShadowMap source;
        source.setSize(size);
        source.setBias(bias);
        source.setRange(range);
        source.setMatrices(light, projection);
        source.setBias(0.3f);  // folded only by the next setMatrices
        source.setCameraMatrix(camera);
        source.allocateMap();
        std::vector<std::vector<Element>> curves(size * size);
        for (int c = 0; c < size * size; ++c) {
            float d = 0.5f + 0.2f * unit(rng);
            for (int k = int(rng() % 3); k > 0; --k, d += 0.1f + 0.1f * unit(rng))
                curves[c].push_back({d, Rgb(unit(rng) + 1, unit(rng) + 1, unit(rng) + 1) * 0.5f});
            source.setFunction(c, curves[c].data(), int(curves[c].size()));
        }
        RsDeepShadowMap map(source);
        const GeAffineMatrix3<float> viewToCamera = (light * camera).computeInverse();
        for (int n = 0; n < 100; ++n) {
            const float z = -2.0f - 10.0f * (unit(rng) + 1), x = 1.2f * z * unit(rng), y = 1.2f * z * unit(rng);
            const GePoint3<float> p = viewToCamera.transformPoint({x, y, z});
            GePoint3<double> q = GeAffineMatrix3<double>(light).transformPoint(
                GeAffineMatrix3<double>(camera).transformPoint(GePoint3<double>(p)));
            const GeHomogeneousCoord3<double> c = GeProjectiveMatrix3<double>(projection).transform(q);
            const double u = (c.x / c.w + 1.0) * size / 2, v = (c.y / c.w + 1.0) * size / 2;
            q.z += bias;  // the depth only: the point's place in the map stays
            const GeHomogeneousCoord3<double> b = GeProjectiveMatrix3<double>(projection).transform(q);
            const double depth = 0.5 * b.z / b.w + 0.5;
            const bool in = u >= 0 && u < size && v >= 0 && v < size;
            bool exact = std::fabs(u - std::round(u)) > 1e-3 && std::fabs(v - std::round(v)) > 1e-3;
            const auto value = [&](int cell, int channel) {
                for (const Element& e : curves[cell]) exact &= std::fabs(e.depth - depth) > 1e-4;
                const Rgb s = stepAt(curves[cell], depth);
                return double(channel == 0 ? s.r : channel == 1 ? s.g : s.b);
            };
            const Rgb fast = map.computeFastShadow(p);
            if (in) value(int(v) * size + int(u), 0);
            if (exact) {
                const Rgb want = in ? stepAt(curves[int(v) * size + int(u)], depth) : Rgb(1.0f);
                ASSERT_EQ(fast, want) << u << ' ' << v << ' ' << depth;
            }
            ASSERT_EQ(source.computeFastShadow(p), Rgb(1.0f)) << "the copy left curves behind";
            const Rgb best = map.computeBestShadow(p);
            for (int ch = 0; ch < 3; ++ch) {
                exact = true;
                const double want = supersampledMean(size, u, v, range / 2.0, 1.0, [&](int cell) { return value(cell, ch); });
                if (!exact) break;
                ASSERT_NEAR(ch == 0 ? best.r : ch == 1 ? best.g : best.b, want, 2e-3) << u << ' ' << v;
            }
        }
    }
    RsDeepShadowMap edge;
    edge.setSize(8.0f);
    edge.setRange(1.0f);
    edge.allocateMap();
    const Element black{-1.0f, Rgb(0.0f)};
    for (int c = 0; c < 64; ++c) edge.setFunction(c, &black, 1);
    EXPECT_EQ(edge.computeBestShadow({-0.7f / 4, -0.5f / 4 - 1.0f, 0}), Rgb(1.0f));  // (3.3, -0.5), half width 0.5
    EXPECT_EQ(edge.computeBestShadow({0, 0, 0}), Rgb(0.0f));
}

// The depth range of a single deep map, fitted along random light views to random boxes in front of
// the light: every corner of the box lies inside it, the nearest and the farthest only just.
TEST(RsDeepShadowMap, TheFittedDepthRangeHoldsTheSceneJustInside) {
    std::mt19937 rng(63);
    std::uniform_real_distribution<float> unit(-1.0f, 1.0f);
    for (int trial = 0; trial < 200; ++trial) {
        const bool perspective = trial % 2;
        const GePoint3<float> lo(5 * unit(rng), 5 * unit(rng), -20 + 5 * unit(rng));
        const GePoint3<float> hi(lo.x + 3 + 3 * unit(rng), lo.y + 3 + 3 * unit(rng), trial % 3 ? lo.z + 4 : lo.z);
        const RCShdPtr<RsScene> scene = makeScene({makeInstance(makeBoxMesh(lo, hi))});
        const M worldToLight = M::makeRotation({unit(rng), unit(rng), 5.0f}, 0.3f * unit(rng));
        GeProjectiveMatrix3<float> projection;
        ASSERT_TRUE(RsShadowPass::fitDeepProjection(worldToLight, GeScale3<float>(0.3f, 0.3f, 1.0f), perspective,
                                                    *scene, projection));
        // The range's ends in front of the light, from the projection's depth row.
        const double a = projection(2, 2), b = projection(2, 3);
        const double n = perspective ? b / (a - 1) : (b + 1) / a, f = perspective ? b / (a + 1) : (b - 1) / a;
        double nearest = 1e9, farthest = -1e9;
        for (int c = 0; c < 8; ++c) {
            const double d = -GeAffineMatrix3<double>(worldToLight).transformPoint(cornerOf({lo, hi}, c)).z;
            nearest = std::min(nearest, d), farthest = std::max(farthest, d);
        }
        const double slack = 1e-4 + 2e-5 * farthest;  // the margin, and float rounding
        EXPECT_TRUE(nearest - n > 0 && nearest - n < slack && f - farthest > 0 && f - farthest < slack)
            << trial << ' ' << nearest - n << ' ' << f - farthest;
    }
    GeProjectiveMatrix3<float> projection;
    EXPECT_FALSE(RsShadowPass::fitDeepProjection({}, {}, true, *makeScene({}), projection));
    EXPECT_FALSE(RsShadowPass::fitDeepProjection(M::makeTranslation({0, 0, 30}), {}, true,
                                                 *makeScene({makeInstance(card(1))}), projection));
}

}  // namespace
}  // namespace Zr
