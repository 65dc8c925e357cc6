// The rasterizer: which samples it covers against the exact fill rule, triangle by triangle and
// over fans whose triangles share edges, at whole-pixel and both sub-pixel grains; the pixel
// data that reaches the buffer; the rows at which 8 x 4 spans arrive; and the interrupt check once
// per scanline, after which a cancel leaves the rasterizer as good as new.
#include <gtest/gtest.h>

#include <array>
#include <cmath>
#include <random>
#include <vector>

#include "rsTestSupport.h"

namespace Zr {
namespace {

using namespace RsTest;

constexpr i64 u = kPixelUnit;

// Snaps a coordinate to the nearest sample centre of the grain, in 1/256 pixel.
i64 snapToSample(i64 v, int bits) {
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
using Grains = ::testing::Types<Grain<RsDepthVertex, RsPixelSpan<0, 0>>, Grain<Rs2DVertex, RsPixelSpan<0, 0>>,
                                Grain<RsTangentVertex, RsPixelSpan<4, 4>>, Grain<Rs2DVertex, RsPixelSpan<3, 2>>>;

template <class G>
class RsRasterizer : public ::testing::Test {
protected:
    using H = Harness<typename G::Vertex, typename G::Span>;
    static constexpr int kXBits = H::kXBits, kYBits = H::kYBits;

    // A region of about the same number of samples at every grain, away from the origin.
    static GeRectangle<int> region(int samplesX, int samplesY) {
        return {13, 13 + (samplesX >> kXBits), -7, -7 + (samplesY >> kYBits)};
    }

    // Compares what one triangle covered with the exact reference, sample by sample.
    static void expectMatchesReference(H& h, Pt a, Pt b, Pt c) {
        h._buffer.clear();
        h.draw(a, b, c);
        const ReferenceTriangle ref = h.reference(a, b, c);
        EXPECT_EQ(h._buffer._errors, 0);
        long inBox = 0;
        for (i64 sy = std::max<i64>(ref.rowBegin() - 2, 0); sy < std::min<i64>(ref.rowEnd() + 2, h._buffer._samplesY);
             ++sy)
            for (i64 sx = std::max<i64>(ref.colBegin() - 2, 0);
                 sx < std::min<i64>(ref.colEnd() + 2, h._buffer._samplesX); ++sx) {
                const int got = h._buffer.count(int(sx), int(sy));
                inBox += got;
                ASSERT_EQ(got, ref.covers(sx, sy) ? 1 : 0)
                    << "sample " << sx << ", " << sy << " of triangle (" << a.x << "," << a.y << ") (" << b.x << ","
                    << b.y << ") (" << c.x << "," << c.y << ") /256";
            }
        EXPECT_EQ(inBox, h._buffer._hits) << "samples covered outside the triangle's box";
    }

    // Checks a mesh drawn into h against its outline: every sample inside covered exactly once
    // and none outside; samples within rounding distance of the outline may go either way, but
    // are never covered twice. Returns the number of samples clearly inside.
    static long expectCoversOutlineOnce(H& h, const std::vector<Pt>& outline) {
        const double nearDistance = H::kSubPixel ? 1e-6 : 0.05;
        std::vector<Pt> w;
        for (const Pt& p : outline) w.push_back({walk(p.x, h._region.x0, kXBits), walk(p.y, h._region.y0, kYBits)});
        EXPECT_EQ(h._buffer._errors, 0);
        long inside = 0;
        for (int sy = 0; sy < h._buffer._samplesY; ++sy)
            for (int sx = 0; sx < h._buffer._samplesX; ++sx) {
                const double px = sx * double(kWalkUnit), py = sy * double(kWalkUnit);
                bool in = false;
                double nearest = 1e300;
                for (std::size_t i = 0, j = w.size() - 1; i < w.size(); j = i++) {
                    const double ax = double(w[j].x), ay = double(w[j].y), dx = double(w[i].x) - ax,
                                 dy = double(w[i].y) - ay;
                    if ((ay > py) != (ay + dy > py) && px < ax + (py - ay) * dx / dy) in = !in;
                    const double t = std::clamp(((px - ax) * dx + (py - ay) * dy) / (dx * dx + dy * dy), 0.0, 1.0);
                    nearest = std::min(nearest, std::hypot(px - ax - t * dx, py - ay - t * dy));
                }
                const int got = h._buffer.count(sx, sy);
                if (got > 1 || (nearest / kWalkUnit >= nearDistance && got != (in ? 1 : 0))) {
                    ADD_FAILURE() << "sample " << sx << ", " << sy << (in ? " inside" : " outside") << " covered "
                                  << got;
                    return inside;
                }
                inside += in && nearest / kWalkUnit >= nearDistance;
            }
        return inside;
    }

    // Draws (a, b, c) in a random one of its six vertex orders: both windings, any first vertex.
    static void drawShuffled(H& h, std::mt19937& rng, Pt a, Pt b, Pt c) {
        std::array<Pt, 3> p{a, b, c};
        std::shuffle(p.begin(), p.end(), rng);
        h.draw(p[0], p[1], p[2]);
    }

    static std::vector<std::array<Pt, 3>> randomTriangles(int count) {
        std::mt19937 rng(21);
        std::vector<std::array<Pt, 3>> triangles(count);
        for (int i = 0; i < count; ++i) {
            const double size = i % 2 ? 20 : 2;
            const Pt c{randomCoord(rng, size, 64 - size), randomCoord(rng, size, 48 - size)};
            for (Pt& p : triangles[i]) p = {c.x + randomCoord(rng, -size, size), c.y + randomCoord(rng, -size, size)};
        }
        return triangles;
    }
};

TYPED_TEST_SUITE(RsRasterizer, Grains);

// Edges whose heights are powers of two and corners on a quarter-pixel grid: every step of the
// walk is exact, so the fill rule must hold exactly, on edges, vertices, flat tops and bottoms.
TYPED_TEST(RsRasterizer, ExactInputsFollowTheFillRuleExactly) {
    const GeRectangle<int> region{13, 45, -7, 17};  // 32 x 24 pixels at every grain
    typename TestFixture::H h(region, 16, 8);
    std::mt19937 rng(1234);
    const i64 quarter = u / 4, height = i64(region.getHeight()) * u;
    std::uniform_int_distribution<int> heightExp(0, 5), shape(0, 2);
    std::uniform_int_distribution<i64> column(0, 4 * region.getWidth() - 1);
    for (int n = 0; n < 400 && !::testing::Test::HasFailure(); ++n) {
        const i64 d = quarter << heightExp(rng);
        const int kind = shape(rng);  // general, flat top, flat bottom
        const i64 top = region.y0 * u + quarter * std::uniform_int_distribution<i64>(
                                                      0, (height - (kind == 0 ? 2 * d : d)) / quarter - 1)(rng);
        std::array<i64, 3> ys = kind == 0   ? std::array<i64, 3>{top, top + d, top + 2 * d}
                                : kind == 1 ? std::array<i64, 3>{top, top, top + d}
                                            : std::array<i64, 3>{top, top + d, top + d};
        std::shuffle(ys.begin(), ys.end(), rng);
        std::array<Pt, 3> p;
        for (int i = 0; i < 3; ++i) p[i] = {region.x0 * u + quarter * column(rng), ys[i]};
        this->expectMatchesReference(h, p[0], p[1], p[2]);
    }
}

// Fans of triangles around a centre, sharing their edges, specks to large, drawn in random vertex
// orders into regions cut into blocks and tiles of many sizes: watertight.
TYPED_TEST(RsRasterizer, FansAreWatertight) {
    using H = typename TestFixture::H;
    std::mt19937 rng(42);
    const double sx = 1.0 / (1 << TestFixture::kXBits), sy = 1.0 / (1 << TestFixture::kYBits);
    long inside = 0;
    // Fans: radii in samples of the grain, points, region size in samples.
    const std::array<double, 4> fans[] = {
        {0.05, 0.4, 9, 64}, {0.5, 3, 7, 64}, {4, 30, 12, 160}, {60, 70, 5, 160}, {20, 70, 30, 160}};
    for (const auto& [radiusMin, radiusMax, points, samples] : fans)
        for (int rep = 0; rep < 6; ++rep) {
            const GeRectangle<int> region = TestFixture::region(int(samples), int(samples));
            H h(region, 3 + rep * 7, 1 + rep * 5);
            const bool snap = rep % 2 == 0;
            Pt centre{randomCoord(rng, region.x0 + region.getWidth() * 0.47, region.x0 + region.getWidth() * 0.53),
                      randomCoord(rng, region.y0 + region.getHeight() * 0.47, region.y0 + region.getHeight() * 0.53)};
            if (snap)
                centre = {snapToSample(centre.x, TestFixture::kXBits), snapToSample(centre.y, TestFixture::kYBits)};
            std::vector<double> angles;
            for (double gap = 10; gap >= 0.9 * M_PI;) {  // no gap of half a turn: the centre stays inside
                angles.clear();
                for (int i = 0; i < int(points); ++i)
                    angles.push_back(std::uniform_real_distribution<double>(0, 2 * M_PI)(rng));
                std::sort(angles.begin(), angles.end());
                gap = angles.front() + 2 * M_PI - angles.back();
                for (std::size_t i = 1; i < angles.size(); ++i) gap = std::max(gap, angles[i] - angles[i - 1]);
            }
            std::vector<Pt> outline;
            for (double a : angles) {
                const double r = std::uniform_real_distribution<double>(radiusMin, radiusMax)(rng);
                Pt p{centre.x + i64(std::cos(a) * r * sx * u), centre.y + i64(std::sin(a) * r * sy * u)};
                if (snap && outline.size() % 2 == 0)
                    p = {snapToSample(p.x, TestFixture::kXBits), snapToSample(p.y, TestFixture::kYBits)};
                outline.push_back(p);
            }
            for (std::size_t i = 0; i < outline.size(); ++i)
                this->drawShuffled(h, rng, centre, outline[i], outline[(i + 1) % outline.size()]);
            inside += this->expectCoversOutlineOnce(h, outline);
            if (::testing::Test::HasFailure()) return;
        }
    EXPECT_GT(inside, 10000);
}

// The interrupt check runs once per row (sub-row) from the exact ceiling of the top to that of the
// bottom, whatever the blocks, and not at all for a triangle that covers no row or has no area.
// A cancel thrown at any check leaves the rasterizer usable: what it draws next comes out as from
// a fresh one.
TYPED_TEST(RsRasterizer, ChecksInterruptsOncePerScanlineAndSurvivesACancel) {
    using H = typename TestFixture::H;
    const GeRectangle<int> region{0, 64, 0, 48};
    const RCShdPtr<CountingInterruptHandler> handler = makeShared<CountingInterruptHandler>();
    const InterruptHandlerScope scope(handler);
    H h(region, 4, 3);
    for (const auto& t : this->randomTriangles(60)) {
        const ReferenceTriangle ref = h.reference(t[0], t[1], t[2]);
        handler->_checks = 0;
        h.draw(t[0], t[1], t[2]);
        EXPECT_EQ(handler->_checks, ref.isValid() ? ref.rowEnd() - ref.rowBegin() : 0);
    }
    handler->_checks = 0;
    h.draw({u, u + 1}, {9 * u, u + 4}, {5 * u, u + 7});  // above the first sample row at any grain
    h.draw({u, u}, {3 * u, 5 * u}, {5 * u, 9 * u});
    EXPECT_EQ(handler->_checks, 0);

    const auto triangles = this->randomTriangles(12);
    H fresh(region, 5, 2);
    handler->_checks = 0;
    for (const auto& t : triangles) fresh.draw(t[0], t[1], t[2]);
    const long total = handler->_checks;
    ASSERT_GT(total, 20);
    for (long throwAt : {1L, 2L, 7L, total / 2, total}) {
        H cancelled(region, 5, 2);
        handler->_checks = 0;
        handler->_throwAt = throwAt;
        EXPECT_THROW(for (const auto& t : triangles) cancelled.draw(t[0], t[1], t[2]), ExRenderCancelled);
        handler->_throwAt = -1;
        cancelled._buffer.clear();
        for (const auto& t : triangles) cancelled.draw(t[0], t[1], t[2]);
        EXPECT_EQ(cancelled._buffer._counts, fresh._buffer._counts) << "after a cancel at check " << throwAt;
    }
}

// ---- The pixel data that reaches the buffer ------------------------------------------------------

struct Linear {
    double a = 0, b = 0, c = 0;
    double at(double x, double y) const { return a * x + b * y + c; }
};

// One linear function of the screen per scalar component of every attribute.
struct Functions {
    Linear w, z, eyeZ;
    std::array<Linear, 3> eye, tex, normal, binormal, tangent;
    explicit Functions(std::mt19937& rng) {
        std::uniform_real_distribution<double> slope(0.25, 0.5), offset(-5, 5);
        auto make = [&] {
            return Linear{slope(rng) * (rng() % 2 ? 1 : -1), slope(rng) * (rng() % 2 ? 1 : -1), offset(rng)};
        };
        w = make(), z = make(), eyeZ = make();
        for (auto* set : {&eye, &tex, &normal, &binormal, &tangent})
            for (Linear& l : *set) l = make();
    }
};

GePoint3<double> pointAt(const std::array<Linear, 3>& f, double x, double y) {
    return {f[0].at(x, y), f[1].at(x, y), f[2].at(x, y)};
}

template <class Vertex>
Vertex attributedVertex(Pt p, const Functions& f) {
    const double x = toPixels(p.x), y = toPixels(p.y);
    Vertex v = makeVertex<Vertex>(p, f.z.at(x, y));
    v._w = f.w.at(x, y);
    if constexpr (requires { v._eyeZ; }) v._eyeZ = f.eyeZ.at(x, y);
    if constexpr (requires { v._eyeCoord; }) v._eyeCoord = pointAt(f.eye, x, y);
    if constexpr (requires { v._texCoord; }) v._texCoord = pointAt(f.tex, x, y);
    if constexpr (requires { v._normal; }) v._normal = pointAt(f.normal, x, y);
    if constexpr (requires { v._binormal; }) v._binormal = pointAt(f.binormal, x, y);
    if constexpr (requires { v._tangent; }) v._tangent = pointAt(f.tangent, x, y);
    return v;
}

// The largest errors seen in double fields, float fields and the depth slope.
struct Errors {
    double doubles = 0, floats = 0, slope = 0;
    long pixels = 0;
};

template <class PixelData>
void measure(const PixelData& d, const Functions& f, double x, double y, Errors& e) {
    auto dbl = [&](double got, double want) { e.doubles = std::max(e.doubles, std::abs(got - want)); };
    auto flt3 = [&](const GePoint3<float>& got, const std::array<Linear, 3>& fn) {
        e.floats = std::max({e.floats, std::abs(got.x - fn[0].at(x, y)), std::abs(got.y - fn[1].at(x, y)),
                             std::abs(got.z - fn[2].at(x, y))});
    };
    if constexpr (PixelData::kHasW) dbl(d._w._q, f.w.at(x, y));
    if constexpr (PixelData::kHasZ) {
        dbl(d._z._q, f.z.at(x, y));
        e.slope = std::max(e.slope, std::abs(d._z._slope - (std::abs(f.z.a) + std::abs(f.z.b)) * 0.5));
    }
    if constexpr (PixelData::kHasEyeZ) dbl(d._eyeZ._q, f.eyeZ.at(x, y));
    if constexpr (PixelData::kHasEyeCoord) flt3(d._eyeCoord._q, f.eye);
    if constexpr (PixelData::kHasTexCoord)
        dbl(d._texCoord._q.x, f.tex[0].at(x, y)), dbl(d._texCoord._q.y, f.tex[1].at(x, y));
    if constexpr (PixelData::kHasNormal) flt3(d._normal._q, f.normal);
    if constexpr (PixelData::kHasBinormal) flt3(d._binormal._q, f.binormal);
    if constexpr (PixelData::kHasTangent) flt3(d._tangent._q, f.tangent);
    ++e.pixels;
}

template <class K>
class RsRasterizerPixelData : public ::testing::Test {};
using Kinds = ::testing::Types<Grain<RsDepthVertex, RsPixelSpan<0, 0>>, Grain<RsPlainVertex, RsPixelSpan<0, 0>>,
                               Grain<RsTangentVertex, RsPixelSpan<0, 0>>, Grain<RsNormalVertex, RsPixelSpan<4, 4>>,
                               Grain<RsTangentVertex, RsPixelSpan<4, 4>>>;
TYPED_TEST_SUITE(RsRasterizerPixelData, Kinds);

// Every attribute, set at the vertices from a linear function of the screen, reads that function
// at the centre of every pixel that a consumer steps to, however the spans are cut into blocks and
// tiles; the tiling changes no coverage either.
TYPED_TEST(RsRasterizerPixelData, AttributesAreLinearAtEveryPixelWhateverTheTiling) {
    using Vertex = typename TypeParam::Vertex;
    using H = Harness<Vertex, typename TypeParam::Span>;
    const GeRectangle<int> region{2, 42, 3, 33};
    std::mt19937 rng(11);
    std::vector<std::pair<std::array<Pt, 3>, Functions>> triangles;
    for (int i = 0; i < 30; ++i) {
        const double size = i % 3 == 0 ? 40 : (i % 3 == 1 ? 8 : 1.5);  // large, medium and pixel-sized
        const Pt c{randomCoord(rng, 2, 42), randomCoord(rng, 3, 33)};
        std::array<Pt, 3> p;
        for (Pt& q : p)
            q = {std::clamp<i64>(c.x + randomCoord(rng, -size, size), 2 * u, 42 * u - 1),
                 std::clamp<i64>(c.y + randomCoord(rng, -size, size), 3 * u, 33 * u - 1)};
        triangles.emplace_back(p, Functions(rng));
    }
    std::vector<int> coverage;
    for (const auto& [blockWidth, blockHeight] :
         {std::pair{1000, 1000}, std::pair{1, 1}, std::pair{3, 5}, std::pair{8, 2}, std::pair{64, 64}}) {
        H h(region, blockWidth, blockHeight);
        Errors errors;
        for (const auto& [p, f] : triangles) {
            h._buffer._onPixel = [&](int px, int py, const typename H::Buffer::PixelData& d) {
                measure(d, f, region.x0 + px + 0.5, region.y0 + py + 0.5, errors);
            };
            h._rasterizer.rasterizeTriangle(h._context, attributedVertex<Vertex>(p[0], f),
                                            attributedVertex<Vertex>(p[1], f), attributedVertex<Vertex>(p[2], f));
        }
        SCOPED_TRACE(::testing::Message() << "blocks " << blockWidth << " x " << blockHeight);
        EXPECT_GT(errors.pixels, 1000);
        // Values reach about 40: double fields are exact to rounding, float fields to the float
        // rounding of the set-up and of up to 40 steps.
        EXPECT_LT(errors.doubles, 1e-10);
        EXPECT_LT(errors.floats, 2e-4);
        EXPECT_LT(errors.slope, 1e-12);
        if (coverage.empty()) coverage = h._buffer._counts;
        EXPECT_EQ(h._buffer._counts, coverage) << "coverage depends on the tiling";
    }
}

// ---- How spans are handed over -------------------------------------------------------------------

// 8 x 4 spans come at the row that their last sub-scanline gives when shifted by the x bits, minus
// the rows before it in the block: a one-row triangle at pixel row r arrives at row r / 2, where
// a whole-pixel triangle of the same corners arrives at r.
TEST(RsRasterizerSpans, EightByFourSpansTakeTheXShiftForRows) {
    const GeRectangle<int> region{0, 32, 0, 64};
    using Buffer = RecordingBuffer<Rs2DVertex, RsPixelSpan<3, 2>>;
    using PlainBuffer = RecordingBuffer<Rs2DVertex, RsPixelSpan<0, 0>>;
    // Pixel rows of the triangle's samples, and the rows at which its spans arrive.
    for (const auto& [top, bottom, first, last] : {std::array<int, 4>{10, 10, 5, 5}, std::array<int, 4>{11, 11, 5, 5},
                                                   std::array<int, 4>{0, 0, 0, 0}, std::array<int, 4>{10, 13, 3, 6},
                                                   std::array<int, 4>{21, 30, 6, 15}}) {
        Buffer buffer(region);
        PlainBuffer plainBuffer(region);
        buffer._keepDeliveries = plainBuffer._keepDeliveries = true;
        const Rs2DVertex a{2.0f, top + 0.05f}, b{30.0f, top + 0.05f}, d{16.0f, bottom + 0.95f};
        Buffer::Rasterizer(buffer, &Buffer::drawSpan, region, 64, 64).rasterizeTriangle({}, a, b, d);
        PlainBuffer::Rasterizer(plainBuffer, &PlainBuffer::drawSpan, region, 64, 64).rasterizeTriangle({}, a, b, d);
        ASSERT_EQ(int(buffer._deliveries.size()), bottom - top + 1);
        EXPECT_EQ(buffer._deliveries.front().row, first);
        EXPECT_EQ(buffer._deliveries.back().row, last);
        EXPECT_EQ(plainBuffer._deliveries.front().row, top);
        EXPECT_EQ(plainBuffer._deliveries.back().row, bottom);
    }
}

}  // namespace
}  // namespace Zr
