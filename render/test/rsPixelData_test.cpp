// The planes of the pixel data: gradients of linear attributes, the depth slope, and the rules for
// triangles without area on the screen.
#include <gtest/gtest.h>

#include <cmath>
#include <random>
#include <vector>

#include "rsPixelData.h"

namespace Zr {
namespace {

RsPlainVertex plainAt(double x, double y, double q) {
    RsPlainVertex v;
    v._pixCoord = GeHomogeneousCoord3<double>(x, y, q, 1.0);
    v._w = q;
    v._eyeCoord = GePoint3<double>(q, 2 * q, -q);
    v._texCoord = GePoint3<double>(q, -3 * q, 1e9);  // the third component is not interpolated
    return v;
}

// Every field of a triangle whose attributes are a linear function of the screen recovers that
// function: gradients, value at the region origin, value at a placed pixel's centre.
TEST(RsPixelData, PlanesOfLinearAttributesAreThoseAttributes) {
    std::mt19937 rng(17);
    std::uniform_real_distribution<double> coord(-50, 150), coef(-2, 2);
    for (int n = 0; n < 200; ++n) {
        const double a = coef(rng), b = coef(rng), c = coef(rng) * 10;
        auto f = [&](double x, double y) { return a * x + b * y + c; };
        double x[3], y[3];
        for (int i = 0; i < 3; ++i) {
            x[i] = coord(rng);
            y[i] = coord(rng);
        }
        const double area = (x[1] - x[0]) * (y[2] - y[0]) - (x[2] - x[0]) * (y[1] - y[0]);
        if (std::abs(area) < 1.0) continue;
        const int originX = 20, originY = -10;
        const RsPixelData<RsPlainVertex> d(GePoint2<double>(x[0] - originX, y[0] - originY),
                                           plainAt(x[0], y[0], f(x[0], y[0])),
                                           plainAt(x[1], y[1], f(x[1], y[1])),
                                           plainAt(x[2], y[2], f(x[2], y[2])));
        const double tol = 1e-10 * (1 + std::abs(c) + 300 * (std::abs(a) + std::abs(b)));
        EXPECT_NEAR(d._w._dq_dx, a, tol);
        EXPECT_NEAR(d._w._dq_dy, b, tol);
        EXPECT_NEAR(d._w._q00, f(originX, originY), tol);
        EXPECT_NEAR(d._z._dq_dx, a, tol);
        EXPECT_NEAR(d._texCoord._dq_dy.x, b, tol);
        EXPECT_NEAR(d._texCoord._dq_dx.y, -3 * a, 3 * tol);
        EXPECT_NEAR(d._eyeCoord._dq_dy.y, 2 * b, 1e-4 * (1 + std::abs(b)));
        EXPECT_EQ(d._w._q, 0.0);

        RsPixelData<RsPlainVertex> placed = d;
        placed.place(7, 3);
        const double cx = originX + 7.5, cy = originY + 3.5;
        EXPECT_NEAR(placed._w._q, f(cx, cy), tol);
        EXPECT_NEAR(placed._texCoord._q.y, -3 * f(cx, cy), 3 * tol);
        EXPECT_NEAR(placed._eyeCoord._q.z, -f(cx, cy), 1e-3);
        placed.stepX();
        EXPECT_NEAR(placed._w._q, f(cx + 1, cy), tol);
        EXPECT_NEAR(placed._eyeCoord._q.x, f(cx + 1, cy), 1e-3);
    }
}

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
