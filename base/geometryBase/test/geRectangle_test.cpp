#include <gtest/gtest.h>

#include "geInterval.h"
#include "geRectangle.h"
#include "geTestRandom.h"

namespace Zr {
namespace {

// Counts the integer pixels a half-open rectangle covers, one by one.
int countPixels(const GeRectangle<int>& r) {
    int n = 0;
    for (int y = -20; y < 20; ++y)
        for (int x = -20; x < 20; ++x) n += r.contains(x, y) ? 1 : 0;
    return n;
}

TEST(GeRectangleTest, MembersAreInTheOrderX0X1Y0Y1AndHalfOpen) {
    const GeRectangle<int> r{2, 10, -3, 4};
    EXPECT_EQ(r.getWidth(), 8);
    EXPECT_EQ(r.getHeight(), 7);
    EXPECT_TRUE(r.contains(2, -3));
    EXPECT_FALSE(r.contains(10, 0));
    EXPECT_FALSE(r.contains(5, 4));
    EXPECT_TRUE(r.contains(9, 3));
}

TEST(GeRectangleTest, AreaEmptinessAndIntersectionMatchPixelCounts) {
    GeTest::Random rnd(41);
    for (int trial = 0; trial < 300; ++trial) {
        const auto randomRect = [&rnd] {
            return GeRectangle<int>(rnd.uniformInt(-10, 10), rnd.uniformInt(-10, 10), rnd.uniformInt(-10, 10),
                                    rnd.uniformInt(-10, 10));
        };
        const auto a = randomRect();
        const auto b = randomRect();
        EXPECT_EQ(a.getArea(), countPixels(a)) << a;
        EXPECT_EQ(a.isEmpty(), countPixels(a) == 0) << a;
        // The intersection covers exactly the pixels in both.
        const auto both = a.intersect(b);
        int common = 0;
        for (int y = -20; y < 20; ++y)
            for (int x = -20; x < 20; ++x) {
                common += a.contains(x, y) && b.contains(x, y) ? 1 : 0;
                EXPECT_EQ(both.contains(x, y), a.contains(x, y) && b.contains(x, y));
            }
        EXPECT_EQ(both.getArea(), common);
        // The union covers all pixels of both non-empty operands.
        const auto any = a.unite(b);
        for (int y = -20; y < 20; ++y)
            for (int x = -20; x < 20; ++x)
                if (a.contains(x, y) || b.contains(x, y)) {
                    EXPECT_TRUE(any.contains(x, y));
                }
    }
}

TEST(GeIntervalTest, ClosedRangeWithEmptyGrowth) {
    const GeInterval<int> span(3, 7);
    EXPECT_TRUE(span.contains(3));
    EXPECT_TRUE(span.contains(7));
    EXPECT_FALSE(span.contains(8));
    EXPECT_EQ(span.getLength(), 4);
    EXPECT_FALSE(span.isEmpty());
    EXPECT_TRUE(GeInterval<int>(4, 3).isEmpty());
    GeInterval<float> grown = GeInterval<float>::makeEmpty();
    EXPECT_TRUE(grown.isEmpty());
    for (float v : {2.0F, -1.0F, 5.0F, 0.0F}) grown.grow(v);
    EXPECT_EQ(grown, GeInterval<float>(-1, 5));
    EXPECT_EQ(span.intersect(GeInterval<int>(5, 12)), GeInterval<int>(5, 7));
    EXPECT_TRUE(span.intersect(GeInterval<int>(8, 12)).isEmpty());
}

}  // namespace
}  // namespace Zr
