// The pixel data that reaches a buffer: every attribute, set at the vertices from a linear function
// of the screen, must read that function at the centre of every pixel that a consumer steps to,
// however the spans are cut into blocks and column tiles.
#include <gtest/gtest.h>

#include <array>
#include <cmath>
#include <random>
#include <vector>

#include "rsRasterTestSupport.h"

namespace Zr {
namespace {

using namespace RsRasterTest;

struct Linear {
    double a = 0, b = 0, c = 0;
    double at(double x, double y) const { return a * x + b * y + c; }
};

// One linear function per scalar component of every attribute.
struct Functions {
    Linear w, z, eyeZ;
    std::array<Linear, 3> eye, tex, normal, binormal, tangent;

    explicit Functions(std::mt19937& rng) {
        std::uniform_real_distribution<double> slope(0.25, 0.5), offset(-5, 5);
        auto make = [&] {
            return Linear{slope(rng) * (rng() % 2 ? 1 : -1), slope(rng) * (rng() % 2 ? 1 : -1), offset(rng)};
        };
        w = make();
        z = make();
        eyeZ = make();
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

// The largest error seen for double and for float fields.
struct Errors {
    double doubles = 0;
    double floats = 0;
    double slope = 0;
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
    if constexpr (PixelData::kHasTexCoord) {
        dbl(d._texCoord._q.x, f.tex[0].at(x, y));
        dbl(d._texCoord._q.y, f.tex[1].at(x, y));
    }
    if constexpr (PixelData::kHasNormal) flt3(d._normal._q, f.normal);
    if constexpr (PixelData::kHasBinormal) flt3(d._binormal._q, f.binormal);
    if constexpr (PixelData::kHasTangent) flt3(d._tangent._q, f.tangent);
    ++e.pixels;
}

template <class V, class S>
struct Kind {
    using Vertex = V;
    using Span = S;
};

using Kinds = ::testing::Types<Kind<RsDepthVertex, RsPixelSpan<0, 0>>, Kind<RsPlainVertex, RsPixelSpan<0, 0>>,
                               Kind<RsTangentVertex, RsPixelSpan<0, 0>>,
                               Kind<RsNormalVertex, RsPixelSpan<4, 4>>,
                               Kind<RsTangentVertex, RsPixelSpan<4, 4>>>;

template <class K>
class RsRasterizerInterpolationTest : public ::testing::Test {};
TYPED_TEST_SUITE(RsRasterizerInterpolationTest, Kinds);

TYPED_TEST(RsRasterizerInterpolationTest, AttributesAreLinearAtEveryPixelWhateverTheTiling) {
    using Vertex = typename TypeParam::Vertex;
    using Span = typename TypeParam::Span;
    using H = Harness<Vertex, Span>;
    const GeRectangle<int> region{2, 42, 3, 33};
    std::mt19937 rng(11);
    struct Triangle {
        std::array<Pt, 3> p;
        Functions f;
    };
    std::vector<Triangle> triangles;
    for (int i = 0; i < 30; ++i) {
        // Large, medium and pixel-sized triangles.
        const double size = i % 3 == 0 ? 40 : (i % 3 == 1 ? 8 : 1.5);
        const Pt c{randomCoord(rng, 2, 42), randomCoord(rng, 3, 33)};
        Triangle t{{}, Functions(rng)};
        for (Pt& q : t.p) {
            q = {c.x + randomCoord(rng, -size, size), c.y + randomCoord(rng, -size, size)};
            q.x = std::clamp<i64>(q.x, 2 * kPixelUnit, 42 * kPixelUnit - 1);
            q.y = std::clamp<i64>(q.y, 3 * kPixelUnit, 33 * kPixelUnit - 1);
        }
        triangles.push_back(t);
    }
    std::vector<std::vector<int>> coverage;
    for (const auto& [blockWidth, blockHeight] :
         {std::pair{1000, 1000}, std::pair{1, 1}, std::pair{3, 5}, std::pair{8, 2}, std::pair{64, 64}}) {
        H h(region, blockWidth, blockHeight);
        Errors errors;
        for (const Triangle& t : triangles) {
            h.buffer().onPixel([&](int px, int py, const typename H::Buffer::PixelData& d) {
                measure(d, t.f, region.x0 + px + 0.5, region.y0 + py + 0.5, errors);
            });
            h.rasterizer().rasterizeTriangle(h.context(), attributedVertex<Vertex>(t.p[0], t.f),
                                             attributedVertex<Vertex>(t.p[1], t.f),
                                             attributedVertex<Vertex>(t.p[2], t.f));
        }
        SCOPED_TRACE(::testing::Message() << "blocks " << blockWidth << " x " << blockHeight);
        EXPECT_GT(errors.pixels, 1000);
        // Values reach about 40: double fields are exact to rounding, float fields to float
        // rounding of the set-up and of up to 40 steps.
        EXPECT_LT(errors.doubles, 1e-10);
        EXPECT_LT(errors.floats, 2e-4);
        EXPECT_LT(errors.slope, 1e-12);
        coverage.push_back(h.buffer().counts());
        EXPECT_EQ(coverage.back(), coverage.front()) << "coverage depends on the tiling";
    }
}

}  // namespace
}  // namespace Zr
