// Which samples the rasterizer covers: against an exact reference of the fill rule, triangle by
// triangle, and over meshes whose triangles share edges, at whole-pixel and both sub-pixel grains.
#include <gtest/gtest.h>

#include <array>
#include <cmath>
#include <random>
#include <vector>

#include "rsRasterTestSupport.h"

namespace Zr {
namespace {

using namespace RsRasterTest;

// Snaps a coordinate to the nearest sample centre of the grain, in 1/256 pixel.
inline i64 snapToSample(i64 v, int bits) {
    const i64 cell = kPixelUnit >> bits;
    return floorDiv(v, cell) * cell + cell / 2;
}

template <class V, class S>
struct Grain {
    using Vertex = V;
    using Span = S;
};

// Whole pixels from 3D vertices (double coordinates, float edges) and from 2D vertices (float
// throughout); 16 x 16 sub-cells from 3D vertices; 8 x 4 sub-cells from 2D vertices.
using Grains = ::testing::Types<Grain<RsDepthVertex, RsPixelSpan<0, 0>>,
                                Grain<Rs2DVertex, RsPixelSpan<0, 0>>,
                                Grain<RsPlainVertex, RsPixelSpan<4, 4>>,
                                Grain<Rs2DVertex, RsPixelSpan<3, 2>>>;

template <class G>
class RsRasterizerCoverageTest : public ::testing::Test {
protected:
    using H = Harness<typename G::Vertex, typename G::Span>;
    static constexpr int kXBits = H::kXBits;
    static constexpr int kYBits = H::kYBits;

    // A region of about the same number of samples at every grain, away from the origin so that
    // the rebasing is exercised.
    static GeRectangle<int> region(int pixelsX, int pixelsY) {
        return {13, 13 + (pixelsX >> kXBits), -7, -7 + (pixelsY >> kYBits)};
    }

    // Compares what one triangle covered with the reference, sample by sample. Where the
    // arithmetic is exact no difference is allowed; otherwise a difference must lie within the
    // rounding bound of an edge.
    static void expectMatchesReference(H& h, Pt a, Pt b, Pt c, bool exact, int& nearEdgeMisses) {
        h.buffer().clear();
        h.draw(a, b, c);
        const ReferenceTriangle ref = h.reference(a, b, c);
        const double bound = exact ? 0.0 : H::roundingBound(ref);
        ASSERT_EQ(h.buffer().outOfRange(), 0);
        ASSERT_EQ(h.buffer().interiorViolations(), 0);
        long inBox = 0;
        const i64 y0 = std::max<i64>(ref.rowBegin() - 2, 0);
        const i64 y1 = std::min<i64>(ref.rowEnd() + 2, h.buffer().samplesY());
        const i64 x0 = std::max<i64>(ref.colBegin() - 2, 0);
        const i64 x1 = std::min<i64>(ref.colEnd() + 2, h.buffer().samplesX());
        for (i64 sy = y0; sy < y1; ++sy) {
            for (i64 sx = x0; sx < x1; ++sx) {
                const int got = h.buffer().count(static_cast<int>(sx), static_cast<int>(sy));
                inBox += got;
                const int expected = ref.covers(sx, sy) ? 1 : 0;
                if (got == expected) continue;
                ASSERT_LE(got, 1) << "sample covered twice at " << sx << ", " << sy;
                ASSERT_FALSE(exact) << "sample " << sx << ", " << sy << " got " << got
                                    << " expected " << expected << " for triangle (" << a.x << ","
                                    << a.y << ") (" << b.x << "," << b.y << ") (" << c.x << ","
                                    << c.y << ") /256";
                ASSERT_LT(ref.horizontalDistance(sx, sy), bound)
                    << "sample " << sx << ", " << sy << " far from every edge";
                ++nearEdgeMisses;
            }
        }
        ASSERT_EQ(inBox, h.buffer().hits()) << "samples covered outside the triangle's box";
    }
};

TYPED_TEST_SUITE(RsRasterizerCoverageTest, Grains);

// Triangles whose edges all have a power of two as height and whose corners lie on a quarter-pixel
// grid: every step of the walk is exact, so the rasterizer must implement the fill rule exactly,
// including samples on edges, on vertices, on flat tops and flat bottoms.
TYPED_TEST(RsRasterizerCoverageTest, ExactInputsFollowTheFillRuleExactly) {
    using H = typename TestFixture::H;
    const GeRectangle<int> region{13, 45, -7, 17};  // 32 x 24 pixels at every grain
    H h(region, 16, 8);
    std::mt19937 rng(1234);
    const i64 quarter = kPixelUnit / 4;
    const i64 height = static_cast<i64>(region.getHeight()) * kPixelUnit;
    std::uniform_int_distribution<int> heightExp(0, 5);  // edge heights of 1/4 to 8 pixels
    std::uniform_int_distribution<int> shape(0, 2);
    std::uniform_int_distribution<i64> column(0, 4 * region.getWidth() - 1);
    int misses = 0;
    for (int n = 0; n < 400; ++n) {
        const i64 d = quarter << heightExp(rng);
        const int kind = shape(rng);
        const i64 extent = kind == 0 ? 2 * d : d;
        const i64 yTop =
            region.y0 * kPixelUnit +
            quarter * std::uniform_int_distribution<i64>(0, (height - extent) / quarter - 1)(rng);
        std::array<i64, 3> ys;
        if (kind == 0) ys = {yTop, yTop + d, yTop + 2 * d};  // general
        else if (kind == 1) ys = {yTop, yTop, yTop + d};     // flat top
        else ys = {yTop, yTop + d, yTop + d};                // flat bottom
        std::shuffle(ys.begin(), ys.end(), rng);
        std::array<Pt, 3> p;
        for (int i = 0; i < 3; ++i) p[i] = {region.x0 * kPixelUnit + quarter * column(rng), ys[i]};
        this->expectMatchesReference(h, p[0], p[1], p[2], true, misses);
        if (::testing::Test::HasFatalFailure()) return;
    }
}

// Triangles anywhere on the 1/256 grid, from slivers and specks to the whole region, with corners
// often on sample centres: any difference from the exact rule is a rounding of an edge, within the
// bound of the float (whole pixels) or double (sub-pixels) walk.
TYPED_TEST(RsRasterizerCoverageTest, GeneralInputsFollowTheFillRuleUpToRounding) {
    using H = typename TestFixture::H;
    const GeRectangle<int> region = TestFixture::region(96, 64);
    H h(region, 64, 64);
    std::mt19937 rng(99);
    std::uniform_int_distribution<int> sizeKind(0, 3);
    // Sizes are in samples of the grain, so that each grain sees specks and large triangles.
    const double toPixelsX = 1.0 / (1 << TestFixture::kXBits);
    const double toPixelsY = 1.0 / (1 << TestFixture::kYBits);
    const double x0 = region.x0, x1 = region.x1, y0 = region.y0, y1 = region.y1;
    int misses = 0;
    for (int n = 0; n < 300; ++n) {
        std::array<Pt, 3> p;
        const int kind = sizeKind(rng);
        if (kind == 0) {
            for (Pt& q : p) q = {randomCoord(rng, x0, x1), randomCoord(rng, y0, y1)};
        } else {
            const double size = kind == 1 ? 0.3 : (kind == 2 ? 3.0 : 20.0);
            const double sx = size * toPixelsX, sy = size * toPixelsY;
            const Pt c{randomCoord(rng, x0 + sx, x1 - sx), randomCoord(rng, y0 + sy, y1 - sy)};
            for (Pt& q : p) q = {c.x + randomCoord(rng, -sx, sx), c.y + randomCoord(rng, -sy, sy)};
        }
        for (Pt& q : p) {
            if (rng() % 3 == 0) q.x = snapToSample(q.x, TestFixture::kXBits);
            if (rng() % 3 == 0) q.y = snapToSample(q.y, TestFixture::kYBits);
            q.x = std::clamp<i64>(q.x, region.x0 * kPixelUnit, region.x1 * kPixelUnit - 1);
            q.y = std::clamp<i64>(q.y, region.y0 * kPixelUnit, region.y1 * kPixelUnit - 1);
        }
        this->expectMatchesReference(h, p[0], p[1], p[2], false, misses);
        if (::testing::Test::HasFatalFailure()) return;
    }
    // The rounding cases are rare.
    EXPECT_LT(misses, 50);
}

// Zero-area triangles draw nothing: one row, the same ceiling of all three y values, and
// collinear corners in every direction.
TYPED_TEST(RsRasterizerCoverageTest, DegenerateTrianglesDrawNothing) {
    using H = typename TestFixture::H;
    const GeRectangle<int> region = TestFixture::region(64, 48);
    H h(region, 8, 8);
    const i64 u = kPixelUnit;
    const i64 ox = region.x0 * u, oy = region.y0 * u;
    const i64 cellY = u >> TestFixture::kYBits;
    const std::vector<std::array<Pt, 3>> cases = {
        {Pt{ox + u, oy + 2 * u}, Pt{ox + 5 * u, oy + 2 * u}, Pt{ox + 3 * u, oy + 2 * u}},  // one row
        // All y within one sample row: above the centre of the same cell.
        {Pt{ox + u, oy + cellY / 2 + 1}, Pt{ox + 9 * u, oy + cellY / 2 + 3},
         Pt{ox + 4 * u, oy + cellY / 2 + cellY}},
        {Pt{ox + u, oy + u}, Pt{ox + 3 * u, oy + 5 * u}, Pt{ox + 5 * u, oy + 9 * u}},   // collinear
        {Pt{ox + 9 * u, oy + u}, Pt{ox + 5 * u, oy + 5 * u}, Pt{ox + u, oy + 9 * u}},   // collinear
        {Pt{ox + 3 * u, oy + u}, Pt{ox + 3 * u, oy + 9 * u}, Pt{ox + 3 * u, oy + 4 * u}},  // vertical
        {Pt{ox + 3 * u, oy + 3 * u}, Pt{ox + 3 * u, oy + 3 * u}, Pt{ox + 3 * u, oy + 3 * u}},  // point
    };
    for (const auto& c : cases) {
        h.buffer().clear();
        h.draw(c[0], c[1], c[2]);
        h.draw(c[2], c[0], c[1]);
        h.draw(c[1], c[0], c[2]);
        EXPECT_EQ(h.buffer().calls(), 0);
        EXPECT_EQ(h.buffer().hits(), 0);
    }
}

// Meshes whose triangles share edges: every sample inside the outline is covered exactly once and
// none outside, whatever the winding and vertex order of each triangle. Samples within rounding
// distance of the outline may go either way, but are never covered twice.
// Returns the number of samples found clearly inside.
template <class H>
long expectCoversOutlineOnce(H& h, const std::vector<Pt>& outline, double nearDistance) {
    const GeRectangle<int> region = h.region();
    std::vector<Pt> w;
    for (const Pt& p : outline)
        w.push_back({walk(p.x, region.x0, H::kXBits), walk(p.y, region.y0, H::kYBits)});
    EXPECT_EQ(h.buffer().outOfRange(), 0);
    EXPECT_EQ(h.buffer().interiorViolations(), 0);
    long inside = 0;
    for (int sy = 0; sy < h.buffer().samplesY(); ++sy) {
        for (int sx = 0; sx < h.buffer().samplesX(); ++sx) {
            const double px = sx * double(kWalkUnit), py = sy * double(kWalkUnit);
            bool in = false;
            double nearest = 1e300;
            for (std::size_t i = 0, j = w.size() - 1; i < w.size(); j = i++) {
                const double ax = double(w[j].x), ay = double(w[j].y);
                const double bx = double(w[i].x), by = double(w[i].y);
                if ((ay > py) != (by > py) && px < ax + (py - ay) * (bx - ax) / (by - ay)) in = !in;
                const double dx = bx - ax, dy = by - ay;
                const double t = std::clamp(((px - ax) * dx + (py - ay) * dy) / (dx * dx + dy * dy), 0.0, 1.0);
                nearest = std::min(nearest, std::hypot(px - ax - t * dx, py - ay - t * dy));
            }
            const int got = h.buffer().count(sx, sy);
            if (got > 1) {
                ADD_FAILURE() << "sample " << sx << ", " << sy << " covered " << got << " times";
                return inside;
            }
            if (nearest / kWalkUnit < nearDistance) continue;
            if (got != (in ? 1 : 0)) {
                ADD_FAILURE() << "sample " << sx << ", " << sy << (in ? " inside" : " outside")
                              << " covered " << got << " times";
                return inside;
            }
            inside += in;
        }
    }
    return inside;
}

template <class H>
double nearOutline() {
    return H::kSubPixel ? 1e-6 : 0.05;
}

// Draws (a, b, c) in a random one of its six vertex orders: both windings, any first vertex.
template <class H>
void drawShuffled(H& h, std::mt19937& rng, Pt a, Pt b, Pt c) {
    std::array<Pt, 3> p{a, b, c};
    std::shuffle(p.begin(), p.end(), rng);
    h.draw(p[0], p[1], p[2]);
}

TYPED_TEST(RsRasterizerCoverageTest, RandomFansAreWatertight) {
    using H = typename TestFixture::H;
    std::mt19937 rng(42);
    struct Case {
        double radiusMin, radiusMax;  // in pixels of the region's grain
        int points;
        int regionSamples;
    };
    const std::vector<Case> cases = {
        {0.05, 0.4, 9, 64}, {0.5, 3, 7, 64}, {4, 30, 12, 160}, {60, 70, 5, 160}, {20, 70, 30, 160},
    };
    long inside = 0;
    for (const Case& c : cases) {
        for (int rep = 0; rep < 6; ++rep) {
            const GeRectangle<int> region = TestFixture::region(c.regionSamples, c.regionSamples);
            // The fan's sizes scale with the grain, so that a sub-pixel fan covers as many samples.
            const double scale = 1.0 / (1 << TestFixture::kXBits);
            const double scaleY = 1.0 / (1 << TestFixture::kYBits);
            H h(region, 3 + rep * 7, 1 + rep * 5);
            const double cxLo = region.x0 + region.getWidth() * 0.47, cxHi = region.x0 + region.getWidth() * 0.53;
            const double cyLo = region.y0 + region.getHeight() * 0.47, cyHi = region.y0 + region.getHeight() * 0.53;
            Pt center{randomCoord(rng, cxLo, cxHi), randomCoord(rng, cyLo, cyHi)};
            const bool snap = rep % 2 == 0;
            if (snap) center = {snapToSample(center.x, TestFixture::kXBits), snapToSample(center.y, TestFixture::kYBits)};
            std::vector<double> angles;
            do {
                angles.clear();
                for (int i = 0; i < c.points; ++i)
                    angles.push_back(std::uniform_real_distribution<double>(0, 2 * M_PI)(rng));
                std::sort(angles.begin(), angles.end());
                double gap = angles.front() + 2 * M_PI - angles.back();
                for (std::size_t i = 1; i < angles.size(); ++i) gap = std::max(gap, angles[i] - angles[i - 1]);
                if (gap < 0.9 * M_PI) break;
            } while (true);
            std::vector<Pt> outline;
            for (double a : angles) {
                const double r = std::uniform_real_distribution<double>(c.radiusMin, c.radiusMax)(rng);
                Pt p{center.x + static_cast<i64>(std::cos(a) * r * scale * kPixelUnit),
                     center.y + static_cast<i64>(std::sin(a) * r * scaleY * kPixelUnit)};
                if (snap && outline.size() % 2 == 0)
                    p = {snapToSample(p.x, TestFixture::kXBits), snapToSample(p.y, TestFixture::kYBits)};
                outline.push_back(p);
            }
            for (std::size_t i = 0; i < outline.size(); ++i)
                drawShuffled(h, rng, center, outline[i], outline[(i + 1) % outline.size()]);
            inside += expectCoversOutlineOnce(h, outline, nearOutline<H>());
            if (::testing::Test::HasFailure()) return;
        }
    }
    EXPECT_GT(inside, 10000);
}

TYPED_TEST(RsRasterizerCoverageTest, PerturbedGridsAreWatertight) {
    using H = typename TestFixture::H;
    std::mt19937 rng(7);
    struct Case {
        int cellsX, cellsY;
        double cell;  // in samples of the grain
        int regionSamples;
    };
    const std::vector<Case> cases = {{12, 10, 0.7, 64}, {9, 7, 6.5, 96}, {3, 2, 44, 160}};
    long inside = 0;
    for (const Case& c : cases) {
        for (int rep = 0; rep < 4; ++rep) {
            const GeRectangle<int> region = TestFixture::region(c.regionSamples, c.regionSamples);
            H h(region, 2 + rep * 9, 3 + rep * 4);
            const double sx = 1.0 / (1 << TestFixture::kXBits), sy = 1.0 / (1 << TestFixture::kYBits);
            const double hx = c.cell * sx, hy = c.cell * sy;
            // Far enough inside that the perturbed border stays in the region.
            const Pt origin{randomCoord(rng, region.x0 + 0.25 * hx + 1 * sx, region.x0 + 0.25 * hx + 2 * sx),
                            randomCoord(rng, region.y0 + 0.25 * hy + 1 * sy, region.y0 + 0.25 * hy + 2 * sy)};
            // Snapping moves a vertex by up to half a sample: only on cells large enough that the
            // grid cannot fold, and with less perturbation.
            const bool snap = rep % 2 == 1 && c.cell > 6;
            const double jitter = snap ? 0.15 : 0.2;
            std::vector<Pt> grid;
            for (int j = 0; j <= c.cellsY; ++j) {
                for (int i = 0; i <= c.cellsX; ++i) {
                    Pt p{origin.x + static_cast<i64>(i * hx * kPixelUnit) + randomCoord(rng, -jitter * hx, jitter * hx),
                         origin.y + static_cast<i64>(j * hy * kPixelUnit) + randomCoord(rng, -jitter * hy, jitter * hy)};
                    if (snap && (i + j) % 2 == 0)
                        p = {snapToSample(p.x, TestFixture::kXBits), snapToSample(p.y, TestFixture::kYBits)};
                    grid.push_back(p);
                }
            }
            auto at = [&](int i, int j) { return grid[static_cast<std::size_t>(j * (c.cellsX + 1) + i)]; };
            for (int j = 0; j < c.cellsY; ++j) {
                for (int i = 0; i < c.cellsX; ++i) {
                    const Pt a = at(i, j), b = at(i + 1, j), d = at(i, j + 1), e = at(i + 1, j + 1);
                    if (rng() % 2) {
                        drawShuffled(h, rng, a, b, e);
                        drawShuffled(h, rng, a, e, d);
                    } else {
                        drawShuffled(h, rng, a, b, d);
                        drawShuffled(h, rng, b, e, d);
                    }
                }
            }
            std::vector<Pt> outline;
            for (int i = 0; i < c.cellsX; ++i) outline.push_back(at(i, 0));
            for (int j = 0; j < c.cellsY; ++j) outline.push_back(at(c.cellsX, j));
            for (int i = c.cellsX; i > 0; --i) outline.push_back(at(i, c.cellsY));
            for (int j = c.cellsY; j > 0; --j) outline.push_back(at(0, j));
            inside += expectCoversOutlineOnce(h, outline, nearOutline<H>());
            if (::testing::Test::HasFailure()) return;
        }
    }
    EXPECT_GT(inside, 10000);
}

// A fan over a large region at whole-pixel grain: triangles of tens of thousands of pixels, many
// blocks and column tiles, still each pixel once.
TEST(RsRasterizerCoverage, HugeFanAtPixelGrainIsWatertight) {
    using H = Harness<RsPlainVertex, RsPixelSpan<0, 0>>;
    const GeRectangle<int> region{-300, 724, 100, 868};
    H h(region, 64, 64);
    std::mt19937 rng(5);
    const Pt center{212 * kPixelUnit + 128, 484 * kPixelUnit + 128};
    std::vector<Pt> outline;
    for (int i = 0; i < 7; ++i) {
        const double a = (i + std::uniform_real_distribution<double>(0.1, 0.9)(rng)) * 2 * M_PI / 7;
        const double r = std::uniform_real_distribution<double>(300, 370)(rng);
        outline.push_back({center.x + static_cast<i64>(std::cos(a) * r * kPixelUnit),
                           center.y + static_cast<i64>(std::sin(a) * r * kPixelUnit)});
    }
    for (std::size_t i = 0; i < outline.size(); ++i)
        drawShuffled(h, rng, center, outline[i], outline[(i + 1) % outline.size()]);
    EXPECT_GT(expectCoversOutlineOnce(h, outline, 0.05), 300000);
}

}  // namespace
}  // namespace Zr
