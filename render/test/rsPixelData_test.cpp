// The planes of the pixel data: the depth slope, and the rules for triangles without area on the
// screen (the rasterizer tests read the planes of the others at every pixel).
#include <gtest/gtest.h>

#include <cmath>
#include <vector>

#include "rsPixelData.h"

namespace Zr {
namespace {

// The depth plane keeps half the depth it gains across a pixel's diagonal; w has no slope.
TEST(RsPixelData, DepthSlopeIsHalfTheChangeAcrossTheDiagonal) {
    for (const auto& [a, b] : {std::pair{0.5, -0.25}, std::pair{-3.0, 1.0}, std::pair{0.0, 2.0}}) {
        auto at = [&](double x, double y) {
            RsNormalVertex v;
            v._pixCoord = GeHomogeneousCoord3<double>(x, y, a * x + b * y + 1, 1);
            return v;
        };
        const RsPixelData<RsNormalVertex> d(GePoint2<double>(0, 0), at(0, 0), at(10, 0), at(0, 10));
        EXPECT_DOUBLE_EQ(d._z._slope, (std::abs(a) + std::abs(b)) * 0.5);
        EXPECT_EQ(d._w._slope, 0.0);
    }
}

// Triangles without area get their gradients along the longest edge (edge i from vertex i to
// vertex i + 1), a reciprocal of zero counting as zero; when the longest edge is the closing one
// (2) the rule is not the mirror of the others, and its results are pinned here. Ties go to the
// edge with the lower number. A point, or a triangle below the area threshold, has no gradients
// and takes the value of its first vertex everywhere; just above the threshold a tiny triangle
// keeps its exact plane.
TEST(RsPixelData, TrianglesWithoutAreaGetGradientsAlongTheirLongestEdge) {
    struct Case {
        const char* what;
        double x[3], y[3], q[3];
        double dqdx, dqdy;
        double constantDqdx = 0, constantDqdy = 0;  // the gradients of a constant attribute
        bool degenerate = true;
    };
    const Case cases[] = {
        {"edge 0 longest", {0, 4, 2}, {0, 2, 1}, {1, 9, 5}, 2, 4},
        {"edge 1 longest", {2, 0, 4}, {1, 0, 2}, {5, 1, 9}, 2, 4},
        // Not even a constant keeps zero gradients under this rule.
        {"edge 2 longest, kept asymmetric", {0, 2, 4}, {0, 1, 2}, {1, 5, 9}, 12.25, -15.5, 2.25, -3.5},
        {"vertical edge 0", {1, 1, 1}, {0, 4, 1}, {2, 10, 4}, 0, 2},
        {"horizontal edge 0", {0, 4, 1}, {3, 3, 3}, {2, 10, 4}, 2, 0},
        {"tie of edges 1 and 2 goes to 1", {0, 0, 4}, {0, 0, 2}, {1, 3, 9}, 1.5, 3},
        {"tie of edges 0 and 2 goes to 0", {0, 4, 4}, {0, 2, 2}, {1, 9, 5}, 2, 4},
        {"point", {3, 3, 3}, {5, 5, 5}, {7, 8, 9}, 0, 0},
        {"below the threshold", {0, 5e-154, 0}, {0, 0, 5e-154}, {7, 8, 9}, 0, 0},
        // An edge whose squared length is the threshold exactly (2^-1017) still counts as a point.
        {"at the threshold", {0, 0x1p-509, 0}, {0, 0x1p-509, 0}, {7, 8, 9}, 0, 0},
        {"above the threshold", {0, 1e-153, 0}, {0, 0, 1e-153}, {0, 1e-153, 0}, 1, 0, 0, 0, false},
    };
    for (const Case& c : cases) {
        SCOPED_TRACE(c.what);
        RsDepthVertex v[3];
        for (int i = 0; i < 3; ++i) {
            v[i]._pixCoord = GeHomogeneousCoord3<double>(c.x[i], c.y[i], 0, 1);
            v[i]._eyeZ = c.q[i];
            v[i]._w = 1;
        }
        RsPixelData<RsDepthVertex> d(GePoint2<double>(c.x[0] - 1, c.y[0] - 2), v[0], v[1], v[2]);
        EXPECT_EQ(d._invDet == 1.0, c.degenerate);
        EXPECT_DOUBLE_EQ(d._eyeZ._dq_dx, c.dqdx);
        EXPECT_DOUBLE_EQ(d._eyeZ._dq_dy, c.dqdy);
        EXPECT_EQ(d._w._dq_dx, c.constantDqdx);
        EXPECT_EQ(d._w._dq_dy, c.constantDqdy);
        if (c.dqdx == 0 && c.dqdy == 0) {
            d.place(-40, 12);
            EXPECT_EQ(d._eyeZ._q, c.q[0]);
        }
    }
}

}  // namespace
}  // namespace Zr
