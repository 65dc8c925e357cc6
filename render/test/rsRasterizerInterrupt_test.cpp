// The interrupt check: once per scanline at whole pixels and once per sub-scanline on the
// sub-pixel paths, none for a triangle that is rejected; and a cancel thrown from it leaves the
// rasterizer as good as new.
#include <gtest/gtest.h>

#include <array>
#include <random>
#include <vector>

#include "rsRasterTestSupport.h"

namespace Zr {
namespace {

using namespace RsRasterTest;

template <class V, class S>
struct Grain {
    using Vertex = V;
    using Span = S;
};

using Grains = ::testing::Types<Grain<RsPlainVertex, RsPixelSpan<0, 0>>, Grain<Rs2DVertex, RsPixelSpan<0, 0>>,
                                Grain<RsTangentVertex, RsPixelSpan<4, 4>>,
                                Grain<Rs2DVertex, RsPixelSpan<3, 2>>>;

template <class G>
class RsRasterizerInterruptTest : public ::testing::Test {
protected:
    using H = Harness<typename G::Vertex, typename G::Span>;

    static std::vector<std::array<Pt, 3>> randomTriangles(int count) {
        std::mt19937 rng(21);
        std::vector<std::array<Pt, 3>> triangles;
        for (int i = 0; i < count; ++i) {
            std::array<Pt, 3> t;
            const double size = i % 2 ? 20 : 2;
            const Pt c{randomCoord(rng, size, 64 - size), randomCoord(rng, size, 48 - size)};
            for (Pt& p : t) p = {c.x + randomCoord(rng, -size, size), c.y + randomCoord(rng, -size, size)};
            triangles.push_back(t);
        }
        return triangles;
    }

    RCShdPtr<CountingInterruptHandler> _handler = makeShared<CountingInterruptHandler>();
};

TYPED_TEST_SUITE(RsRasterizerInterruptTest, Grains);

// The number of checks is the number of rows (sub-rows) from the exact ceiling of the top to that
// of the bottom, whatever the blocks.
TYPED_TEST(RsRasterizerInterruptTest, ChecksOncePerScanline) {
    using H = typename TestFixture::H;
    InterruptHandlerScope scope(this->_handler);
    const GeRectangle<int> region{0, 64, 0, 48};
    H h(region, 4, 3);
    for (const auto& t : this->randomTriangles(60)) {
        const ReferenceTriangle ref = h.reference(t[0], t[1], t[2]);
        this->_handler->reset();
        h.draw(t[0], t[1], t[2]);
        EXPECT_EQ(this->_handler->checks(), ref.isValid() ? ref.rowEnd() - ref.rowBegin() : 0);
    }
    // Rejected triangles are not walked: no row, or collinear corners.
    const i64 u = kPixelUnit;
    this->_handler->reset();
    h.draw({u, u + 1}, {9 * u, u + 4}, {5 * u, u + 7});  // above the first sample row at any grain
    h.draw({u, u}, {3 * u, 5 * u}, {5 * u, 9 * u});
    EXPECT_EQ(this->_handler->checks(), 0);
}

// A cancel thrown at any check leaves the rasterizer usable: the triangles drawn after it come out
// exactly as from a fresh rasterizer.
TYPED_TEST(RsRasterizerInterruptTest, CancelLeavesRasterizerUsable) {
    using H = typename TestFixture::H;
    const GeRectangle<int> region{0, 64, 0, 48};
    const auto triangles = this->randomTriangles(12);
    H fresh(region, 5, 2);
    long total = 0;
    {
        InterruptHandlerScope scope(this->_handler);
        this->_handler->reset();
        for (const auto& t : triangles) fresh.draw(t[0], t[1], t[2]);
        total = this->_handler->checks();
    }
    ASSERT_GT(total, 20);
    for (long throwAt : {1L, 2L, 7L, total / 2, total}) {
        H h(region, 5, 2);
        {
            InterruptHandlerScope scope(this->_handler);
            this->_handler->reset(throwAt);
            EXPECT_THROW(
                {
                    for (const auto& t : triangles) h.draw(t[0], t[1], t[2]);
                },
                ExRenderCancelled);
        }
        h.buffer().clear();
        for (const auto& t : triangles) h.draw(t[0], t[1], t[2]);
        EXPECT_EQ(h.buffer().counts(), fresh.buffer().counts()) << "after a cancel at check " << throwAt;
    }
}

}  // namespace
}  // namespace Zr
