// The 2D buffer: plain and anti-aliased triangles in every format and mode against the fill rule,
// the coverage masks and the write formulas; clipping to the tile; nothing written outside it.
#include <gtest/gtest.h>

#include <array>
#include <random>

#include "exBase.h"
#include "pxImageTexture.h"
#include "rs2DBuffer.h"
#include "rsTestSupport.h"

namespace Zr {
namespace {

using namespace RsTest;

constexpr i64 u = kPixelUnit;

Rs2DVertex vertex(Pt p) { return makeVertex<Rs2DVertex>(p); }

// Triangles whose heights are powers of two and whose corners lie on a quarter-pixel grid inside
// r: every step of the rasterizer's walk is exact, so the exact reference holds bit for bit.
std::array<Pt, 3> exactTriangle(std::mt19937& rng, const GeRectangle<int>& r) {
    const i64 quarter = u / 4, height = i64(r.getHeight()) * u;
    const int kind = std::uniform_int_distribution<int>(0, 2)(rng);  // general, flat top, flat bottom
    i64 d = quarter << std::uniform_int_distribution<int>(0, 6)(rng);
    while ((kind == 0 ? 2 * d : d) >= height) d /= 2;
    const i64 room = (height - (kind == 0 ? 2 * d : d)) / quarter;
    const i64 top = r.y0 * u + quarter * std::uniform_int_distribution<i64>(0, room - 1)(rng);
    const std::array<i64, 3> ys = kind == 0 ? std::array<i64, 3>{top, top + d, top + 2 * d}
                                  : kind == 1 ? std::array<i64, 3>{top, top, top + d}
                                              : std::array<i64, 3>{top, top + d, top + d};
    std::uniform_int_distribution<i64> column(0, 4 * r.getWidth() - 1);
    std::array<Pt, 3> p;
    for (int i = 0; i < 3; ++i) p[i] = {r.x0 * u + quarter * column(rng), ys[i]};
    std::shuffle(p.begin(), p.end(), rng);
    return p;
}

Rgba randomColour(std::mt19937& rng) {
    std::uniform_real_distribution<float> v(0.0f, 1.0f);
    const float alpha = std::uniform_int_distribution<int>(0, 4)(rng) == 0 ? 0.0f : v(rng);
    return {v(rng), v(rng), v(rng), alpha};
}

// One buffer per format takes random triangles, plain and anti-aliased, with the colour and the
// mode changed between them; after each the whole tile must be the reference's, bit for bit.
TEST(Rs2DBuffer, RandomTrianglesMatchTheFillRuleMasksAndWriteFormulas) {
    const GeRectangle<int> rect{5, 45, -3, 33};
    std::mt19937 rng(77);
    for (const Format& format : allFormats()) {
        IxTile tile(format.pixelFormat(), rect, {});
        const IxWriteGuard g(tile);
        fillRandomValues(g, rng, 0.0f, 1.0f);
        FillReference reference(g);
        Rs2DBuffer buffer(tile, {}, false);
        for (int n = 0; n < 120; ++n) {
            const auto [a, b, c] = exactTriangle(rng, rect);
            const Rgba colour = randomColour(rng);
            const bool blending = n % 2 == 1, antialiased = n % 4 >= 2;
            buffer.setColor(colour);
            buffer.setBlending(blending);
            if (antialiased) {
                buffer.rasterizeUnclippedAATriangle(vertex(a), vertex(b), vertex(c));
                reference.fillAA(a, b, c, colour, blending, PxImageTexture::getAvgCacheBlockingSizeY());
            } else {
                buffer.rasterizeUnclippedTriangle(vertex(a), vertex(b), vertex(c));
                reference.fillPlain(a, b, c, colour, blending);
            }
            reference.expectEqual("format " + std::to_string(format.comps) + "x" + std::to_string(format.depth) +
                                  (antialiased ? " antialiased" : " plain") + (blending ? " blending" : " replacing") +
                                  " triangle " + std::to_string(n));
            if (::testing::Test::HasFatalFailure()) return;
        }
    }
}

// Big triangles that cross all four sides of the tile, drawn plain at alpha 0.5 with blending:
// each pixel is covered once exactly where the unclipped triangle covers it (0.5), never twice
// (0.75) by the fan of the clipped polygon; centres within rounding distance of an edge may go
// either way.
TEST(Rs2DBuffer, ClippedTrianglesCoverWhatTheUnclippedOnesCoverInTheTile) {
    const GeRectangle<int> rect{-6, 26, 10, 34};
    std::mt19937 rng(5);
    IxTile tile(IxPixelFormat(IxPixelFormat::ALPHA, IxPixelFormat::FLOAT32), rect, {});
    const IxWriteGuard g(tile);
    Rs2DBuffer buffer(tile, {1.0f, 1.0f, 1.0f, 0.5f}, true);
    for (int drawn = 0; drawn < 40;) {
        std::array<Pt, 3> p;
        for (Pt& q : p)
            q = {randomCoord(rng, rect.x0 - 30, rect.x1 + 30), randomCoord(rng, rect.y0 - 30, rect.y1 + 30)};
        const ReferenceTriangle ref(p[0], p[1], p[2], rect.x0, rect.y0, 0, 0);
        // Keep triangles whose coverage changes along each of the four border lines of pixels.
        const int w = rect.getWidth(), h = rect.getHeight();
        auto mixed = [&](int x, int y, int dx, int dy, int n) {
            int covered = 0;
            for (int i = 0; i < n; ++i) covered += ref.covers(x + i * dx, y + i * dy);
            return covered > 0 && covered < n;
        };
        if (!(mixed(0, 0, 1, 0, w) && mixed(0, h - 1, 1, 0, w) && mixed(0, 0, 0, 1, h) && mixed(w - 1, 0, 0, 1, h)))
            continue;
        ++drawn;
        fillRandomValues(g, rng, 0.0f, 0.0f);
        buffer.rasterizeUnclippedTriangle(vertex(p[0]), vertex(p[1]), vertex(p[2]));
        for (int y = 0; y < h; ++y)
            for (int x = 0; x < w; ++x) {
                const float got = pixelColour(g, rect.x0 + x, rect.y0 + y).a;
                double nearest = 1e300;
                for (int e = 0; e < 3; ++e) {
                    const double ax = toPixels(p[e].x), ay = toPixels(p[e].y);
                    const double dx = toPixels(p[(e + 1) % 3].x) - ax, dy = toPixels(p[(e + 1) % 3].y) - ay;
                    const double cx = rect.x0 + x + 0.5, cy = rect.y0 + y + 0.5;
                    nearest = std::min(nearest, std::abs((cx - ax) * dy - (cy - ay) * dx) / std::hypot(dx, dy));
                }
                const float want = ref.covers(x, y) ? 0.5f : 0.0f;
                ASSERT_TRUE(got == want || (nearest < 1e-3 && (got == 0.0f || got == 0.5f)))
                    << "pixel " << x << ", " << y << " of triangle " << drawn << ": " << got;
            }
    }
}

// Anti-aliased triangles at the tile's corners, along its top rows and as tall as the tile, some
// reaching outside it, and triangles of both kinds reaching a thousand billion billion pixels away:
// the sub-pixel spans of tall triangles arrive at rows above the tile, and a clipped vertex is
// only inside the tile when it is put on the limit it was made for. Nothing may be written
// outside the tile (under the address sanitizer a stray write fails); inside, alpha stays within
// [0, 1].
TEST(Rs2DBuffer, TrianglesWriteOnlyInsideTheTile) {
    const GeRectangle<int> rect{3, 40, -20, 50};
    std::mt19937 rng(9);
    std::uniform_real_distribution<float> far(-1e30f, 1e30f);
    for (const Format& format : {Format{4, 8}, Format{1, 32}, Format{3, 16}}) {
        IxTile tile(format.pixelFormat(), rect, {});
        const IxWriteGuard g(tile);
        Rs2DBuffer buffer(tile, {0.3f, 0.6f, 0.9f, 0.8f}, false);
        for (int n = 0; n < 300; ++n) {
            buffer.setBlending(n % 2 == 0);
            const double cx = n % 3 == 0 ? rect.x0 : n % 3 == 1 ? rect.x1 : (rect.x0 + rect.x1) * 0.5;
            const double cy = n % 5 < 3 ? rect.y0 : rect.y1;
            const double reach = n % 4 == 0 ? rect.getHeight() * 2.0 : 6.0;
            std::array<Pt, 3> p;
            for (Pt& q : p) q = {randomCoord(rng, cx - reach, cx + reach), randomCoord(rng, cy - 3, cy + reach)};
            buffer.rasterizeUnclippedAATriangle(vertex(p[0]), vertex(p[1]), vertex(p[2]));
            const Rs2DVertex a{far(rng), far(rng)}, b{far(rng), far(rng)}, c{far(rng), far(rng)};
            if (n % 2 == 0) buffer.rasterizeUnclippedTriangle(a, b, c);
            else buffer.rasterizeUnclippedAATriangle(a, b, c);
        }
        for (int y = rect.y0; y < rect.y1; ++y)
            for (int x = rect.x0; x < rect.x1; ++x) {
                const float a = pixelColour(g, x, y).a;
                ASSERT_TRUE(a >= 0.0f && a <= 1.0f) << x << ", " << y;
            }
    }
}

TEST(Rs2DBuffer, FormatsOutsideTheTableAbort) {
    IxTile complexTile(IxPixelFormat(IxPixelFormat::RGBA, IxPixelFormat::COMPLEX), {0, 4, 0, 4}, {});
    EXPECT_THROW(Rs2DBuffer(complexTile, {}, false), ExProgramAborted);
}

}  // namespace
}  // namespace Zr
