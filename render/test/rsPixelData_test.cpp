// The planes of the pixel data: gradients of linear attributes, the rules for triangles without
// area on the screen, the depth slope, what each vertex kind carries, and the debug printers.
#include <gtest/gtest.h>

#include <cmath>
#include <random>
#include <sstream>
#include <string>
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

// The depth plane keeps half the depth it gains across a pixel's diagonal.
TEST(RsPixelData, DepthSlopeIsHalfTheChangeAcrossTheDiagonal) {
    for (const auto& [a, b] : {std::pair{0.5, -0.25}, std::pair{-3.0, 1.0}, std::pair{0.0, 2.0}}) {
        auto z = [&](double x, double y) { return a * x + b * y + 1; };
        const RsPixelData<RsNormalVertex> d(GePoint2<double>(0, 0), [&] {
            RsNormalVertex v;
            v._pixCoord = GeHomogeneousCoord3<double>(0, 0, z(0, 0), 1);
            return v;
        }(), [&] {
            RsNormalVertex v;
            v._pixCoord = GeHomogeneousCoord3<double>(10, 0, z(10, 0), 1);
            return v;
        }(), [&] {
            RsNormalVertex v;
            v._pixCoord = GeHomogeneousCoord3<double>(0, 10, z(0, 10), 1);
            return v;
        }());
        EXPECT_DOUBLE_EQ(d._z._slope, (std::abs(a) + std::abs(b)) * 0.5);
        EXPECT_EQ(d._w._slope, 0.0);
    }
}

struct DegenerateCase {
    const char* what;
    double x[3], y[3];
    double q[3];
    double dqdx, dqdy;
    double constantDqdx = 0, constantDqdy = 0;  // the gradients of a constant attribute
};

// Triangles without area: gradients run along the longest edge (edge i from vertex i to vertex
// i + 1), a reciprocal of zero counting as zero; when the longest edge is the closing one (2) the
// rule is not the mirror of the others, and its results are pinned here. Ties go to the edge with
// the lower number. A point, or a triangle smaller than the threshold, has no gradients.
TEST(RsPixelData, TrianglesWithoutAreaGetGradientsAlongTheirLongestEdge) {
    const std::vector<DegenerateCase> cases = {
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
    };
    for (const DegenerateCase& c : cases) {
        SCOPED_TRACE(c.what);
        RsDepthVertex v[3];
        for (int i = 0; i < 3; ++i) {
            v[i]._pixCoord = GeHomogeneousCoord3<double>(c.x[i], c.y[i], 0, 1);
            v[i]._eyeZ = c.q[i];
            v[i]._w = 1;
        }
        RsPixelData<RsDepthVertex> d(GePoint2<double>(c.x[0] - 1, c.y[0] - 2), v[0], v[1], v[2]);
        EXPECT_EQ(d._invDet, 1.0);
        EXPECT_DOUBLE_EQ(d._eyeZ._dq_dx, c.dqdx);
        EXPECT_DOUBLE_EQ(d._eyeZ._dq_dy, c.dqdy);
        EXPECT_EQ(d._w._dq_dx, c.constantDqdx);
        EXPECT_EQ(d._w._dq_dy, c.constantDqdy);
        if (c.dqdx == 0 && c.dqdy == 0) {
            // The whole triangle takes the value of its first vertex.
            d.place(-40, 12);
            EXPECT_EQ(d._eyeZ._q, c.q[0]);
        }
    }
}

// Just above the threshold a tiny triangle still has an area and its exact gradients.
TEST(RsPixelData, TinyTriangleAboveThresholdKeepsItsPlane) {
    RsDepthVertex v[3];
    const double s = 1e-153;  // doubled area 1e-306
    const double xs[3] = {0, s, 0}, ys[3] = {0, 0, s};
    for (int i = 0; i < 3; ++i) {
        v[i]._pixCoord = GeHomogeneousCoord3<double>(xs[i], ys[i], 0, 1);
        v[i]._eyeZ = 0;
        v[i]._w = 1;
    }
    v[1]._eyeZ = 1e-153;  // dq/dx = 1
    const RsPixelData<RsDepthVertex> d(GePoint2<double>(0, 0), v[0], v[1], v[2]);
    EXPECT_NE(d._invDet, 1.0);
    EXPECT_DOUBLE_EQ(d._eyeZ._dq_dx, 1.0);
    EXPECT_DOUBLE_EQ(d._eyeZ._dq_dy, 0.0);
}

// What a vertex kind lacks takes no room: each pixel data is the gradient block and the planes its
// kind carries, in the fixed order of the fields.
struct PlainLayout {
    RsGradientBlock g;
    RsInterpolant<double> w, z;
    RsInterpolant<GePoint3<float>> eye;
    RsInterpolant<GePoint2<double>> tex;
};
struct NormalLayout {
    PlainLayout plain;
    RsInterpolant<GePoint3<float>> normal;
};
struct TangentLayout {
    PlainLayout plain;
    RsInterpolant<GePoint3<float>> normal, binormal, tangent;
};
static_assert(sizeof(RsPixelData<Rs2DVertex>) == sizeof(RsGradientBlock));
static_assert(sizeof(RsPixelData<RsDepthVertex>) == sizeof(RsGradientBlock) + 2 * sizeof(RsInterpolant<double>));
static_assert(sizeof(RsPixelData<RsPlainVertex>) == sizeof(PlainLayout));
static_assert(sizeof(RsPixelData<RsNormalVertex>) == sizeof(NormalLayout));
static_assert(sizeof(RsPixelData<RsTangentVertex>) == sizeof(TangentLayout));
static_assert(sizeof(RsNoInterpolant<>) == 1 && std::is_empty_v<RsNoInterpolant<3>>);

TEST(RsPixelData, FieldsFollowTheirFixedOrder) {
    RsPixelData<RsTangentVertex> d;
    const char* base = reinterpret_cast<const char*>(&d);
    const std::vector<std::ptrdiff_t> offsets = {
        reinterpret_cast<const char*>(&d._invDet) - base, reinterpret_cast<const char*>(&d._w) - base,
        reinterpret_cast<const char*>(&d._z) - base, reinterpret_cast<const char*>(&d._eyeCoord) - base,
        reinterpret_cast<const char*>(&d._texCoord) - base, reinterpret_cast<const char*>(&d._normal) - base,
        reinterpret_cast<const char*>(&d._binormal) - base, reinterpret_cast<const char*>(&d._tangent) - base};
    EXPECT_EQ(offsets.front(), 6 * static_cast<std::ptrdiff_t>(sizeof(double)));
    for (std::size_t i = 1; i < offsets.size(); ++i) EXPECT_LT(offsets[i - 1], offsets[i]);
}

template <class T>
std::string dumped(const T& value) {
    std::ostringstream os;
    value.dump(os);
    return os.str();
}

// Labels appear in order, each once; absent labels do not appear.
void expectLabelsInOrder(const std::string& text, const std::vector<std::string>& present,
                         const std::vector<std::string>& absent) {
    std::size_t at = 0;
    for (const std::string& label : present) {
        const std::size_t found = text.find(label, at);
        ASSERT_NE(found, std::string::npos) << label << " missing or out of order in: " << text;
        at = found + label.size();
    }
    for (const std::string& label : absent) EXPECT_EQ(text.find(label), std::string::npos) << label;
}

TEST(RsPixelData, DumpPrintersNameTheMembers) {
    RsPlainVertex v = plainAt(1, 2, 3);
    const RsPixelData<RsPlainVertex> plain(GePoint2<double>(0, 0), v, plainAt(5, 2, 1), plainAt(1, 7, 2));
    expectLabelsInOrder(dumped(plain),
                        {" _dx0: ", " _invDet: ", " _w = [ ", " _q: ", " _dq_dx: ", " _dq_dy: ", " _q00: ",
                         " ],", " _z = [ ", " ],", " _eyeCoord = [ ", " ],", " _texCoord = [ ", " ],"},
                        {" _eyeZ = [ ", " _normal = [ ", " _binormal = [ ", " _tangent = [ "});
    expectLabelsInOrder(dumped(RsPixelData<RsTangentVertex>()),
                        {" _w = [ ", " _z = [ ", " _eyeCoord = [ ", " _texCoord = [ ", " _normal = [ ",
                         " _binormal = [ ", " _tangent = [ "},
                        {" _eyeZ = [ "});
    expectLabelsInOrder(dumped(RsPixelData<RsDepthVertex>()), {" _w = [ ", " _eyeZ = [ "},
                        {" _z = [ ", " _eyeCoord = [ "});
    expectLabelsInOrder(dumped(RsPixelData<Rs2DVertex>()), {" _invDet: "}, {" = [ "});

    expectLabelsInOrder(dumped(v), {" _pixCoord: ", " _eyeCoord: ", " _texCoord: ", " _w: 3"}, {" _normal: "});
    expectLabelsInOrder(dumped(RsNormalVertex()), {" _pixCoord: ", " _eyeCoord: ", " _normal: ", " _texCoord: ", " _w: "},
                        {" _tangent: "});
    expectLabelsInOrder(dumped(RsTangentVertex()),
                        {" _pixCoord: ", " _eyeCoord: ", " _normal: ", " _binormal: ", " _tangent: ",
                         " _texCoord: ", " _w: "},
                        {});
    expectLabelsInOrder(dumped(RsDepthVertex()), {" _pixCoord: ", " _eyeZ: ", " _w: "}, {" _eyeCoord: "});
    EXPECT_EQ(dumped(Rs2DVertex{1.5f, -2.0f}), " _x: 1.5 _y: -2");
}

}  // namespace
}  // namespace Zr
