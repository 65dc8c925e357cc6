// Meshes made from arrays: normals against closed forms, bounding boxes against brute force,
// derived data added to a copy, face groups, texture channels and the walk over faces.
#include <gtest/gtest.h>

#include <cmath>
#include <cstdint>
#include <random>
#include <vector>

#include "exBase.h"
#include "sdMeshBuilder.h"

namespace Zr {
namespace {

constexpr double pi = 3.14159265358979323846;

// A UV sphere of radius 1 around the origin, faces wound counter-clockwise seen from outside.
// The poles are single vertices, so their fans have many thin triangles.
void makeSphere(int rings, int segments, std::vector<GePoint3<float>>& vertices,
                std::vector<std::uint32_t>& indices) {
    vertices.clear();
    indices.clear();
    vertices.emplace_back(0.0f, 0.0f, 1.0f);
    for (int r = 1; r < rings; ++r) {
        const double theta = pi * r / rings;
        for (int s = 0; s < segments; ++s) {
            const double phi = 2.0 * pi * s / segments;
            vertices.emplace_back(static_cast<float>(std::sin(theta) * std::cos(phi)),
                                  static_cast<float>(std::sin(theta) * std::sin(phi)),
                                  static_cast<float>(std::cos(theta)));
        }
    }
    vertices.emplace_back(0.0f, 0.0f, -1.0f);
    const std::uint32_t south = static_cast<std::uint32_t>(vertices.size() - 1);
    auto ring = [segments](int r, int s) {
        return static_cast<std::uint32_t>(1 + (r - 1) * segments + (s % segments));
    };
    for (int s = 0; s < segments; ++s) indices.insert(indices.end(), {0u, ring(1, s), ring(1, s + 1)});
    for (int r = 1; r < rings - 1; ++r) {
        for (int s = 0; s < segments; ++s) {
            indices.insert(indices.end(), {ring(r, s), ring(r + 1, s), ring(r + 1, s + 1)});
            indices.insert(indices.end(), {ring(r, s), ring(r + 1, s + 1), ring(r, s + 1)});
        }
    }
    for (int s = 0; s < segments; ++s) {
        indices.insert(indices.end(), {ring(rings - 1, s), south, ring(rings - 1, s + 1)});
    }
}

double dot(const GeVector3<float>& a, const GeVector3<float>& b) {
    return static_cast<double>(a.x) * b.x + static_cast<double>(a.y) * b.y + static_cast<double>(a.z) * b.z;
}

TEST(SdMeshBuilder, SmoothNormalsOfASphereAreItsPositions) {
    std::vector<GePoint3<float>> vertices;
    std::vector<std::uint32_t> indices;
    makeSphere(24, 32, vertices, indices);
    SdMeshBuilder builder;
    builder.setVertices(vertices).setTriangles(indices);
    RCShdPtr<SdMesh> mesh = builder.build();

    ASSERT_EQ(mesh->getNormalCount(), mesh->getVertexCount() + mesh->getFaceCount());
    for (SdMesh::FaceConstIterator it = mesh->beginFaces(); !it.atEnd(); ++it) {
        for (int c = 0; c < 3; ++c) {
            const GeVector3<float>& normal = mesh->getNormal(it->getNormalIndex(c));
            const GePoint3<float>& position = it->getVertex(c);
            EXPECT_NEAR(dot(normal, normal), 1.0, 1e-5);
            // Angle weighting makes the normal exact at the poles and on every ring by symmetry;
            // between rings the rings' spacing leaves a small tilt.
            EXPECT_GT(dot(normal, position.toVector()), 0.999);
        }
        // The face normal points outwards: the centroid lies on its positive side.
        const GeVector3<float> centroid =
            (it->getVertex(0).toVector() + it->getVertex(1).toVector() + it->getVertex(2).toVector()) *
            (1.0f / 3.0f);
        EXPECT_GT(dot(mesh->getNormal(it->getFaceNormalIndex()), centroid), 0.9);
    }
}

TEST(SdMeshBuilder, FaceNormalsFollowTheWinding) {
    // Random triangles laid in random planes: the corners lie on a circle in the plane spanned
    // by (a, b), at increasing angles within one turn, so they turn counter-clockwise seen from
    // the side of the plane's known normal a x b.
    std::mt19937 rng(42);
    std::uniform_real_distribution<double> unit(-1.0, 1.0), radius(0.1, 5.0), step(0.3, 2.0);
    std::vector<GePoint3<float>> vertices;
    std::vector<std::uint32_t> forward, backward;
    std::vector<GeVector3<double>> expected;
    for (std::uint32_t f = 0; f < 300; ++f) {
        GeVector3<double> n(unit(rng), unit(rng), unit(rng));
        if (n.length() < 0.1) n = GeVector3<double>(0, 0, 1);
        n = n * (1.0 / n.length());
        GeVector3<double> a = std::fabs(n.x) < 0.9 ? GeVector3<double>(1, 0, 0) : GeVector3<double>(0, 1, 0);
        a = a - n * a.dot(n);
        a = a * (1.0 / a.length());
        const GeVector3<double> b = n.cross(a);  // so that a x b = n
        const GeVector3<double> centre(10 * unit(rng), 10 * unit(rng), 10 * unit(rng));
        double angle = 2.0 * pi * unit(rng);
        const double r = radius(rng);
        for (int c = 0; c < 3; ++c) {
            const GeVector3<double> p = centre + a * (r * std::cos(angle)) + b * (r * std::sin(angle));
            vertices.emplace_back(static_cast<float>(p.x), static_cast<float>(p.y), static_cast<float>(p.z));
            angle += step(rng);  // three steps of at most 2 stay within one turn
        }
        forward.insert(forward.end(), {3 * f, 3 * f + 1, 3 * f + 2});
        backward.insert(backward.end(), {3 * f, 3 * f + 2, 3 * f + 1});
        expected.push_back(n);
    }
    RCShdPtr<SdMesh> a = SdMeshBuilder().setVertices(vertices).setTriangles(forward).build();
    RCShdPtr<SdMesh> b = SdMeshBuilder().setVertices(vertices).setTriangles(backward).build();
    for (unsigned int f = 0; f < a->getFaceCount(); ++f) {
        const GeVector3<float>& n = a->getNormal(a->getFace(f).getFaceNormalIndex());
        const GeVector3<float>& reversed = b->getNormal(b->getFace(f).getFaceNormalIndex());
        const GeVector3<float> truth(static_cast<float>(expected[f].x), static_cast<float>(expected[f].y),
                                     static_cast<float>(expected[f].z));
        EXPECT_NEAR(dot(n, truth), 1.0, 1e-4) << "face " << f;
        EXPECT_NEAR(dot(reversed, truth), -1.0, 1e-4) << "face " << f;
    }
}

TEST(SdMeshBuilder, VertexNormalsDoNotDependOnHowAFlatRegionIsCut) {
    // The corner (1, 1, 1) of a unit cube where three faces meet, each face cut differently:
    // one triangle, two triangles fanning from the corner, and three. Angle weighting gives the
    // diagonal whatever the cut; weighting by count or by area would not.
    const std::vector<GePoint3<float>> vertices = {
        {1, 1, 1},                     // 0: the corner
        {0, 1, 1}, {1, 0, 1},          // 1, 2: ends of the cube's edges along -x and -y
        {1, 1, 0},                     // 3: end of the edge along -z
        {0.2f, 1, 0.1f},               // 4: inside the face y = 1
        {1, 0.3f, 0}, {1, 0, 0.1f},    // 5, 6: inside the face x = 1
    };
    // Each face is a fan around the corner from one cube edge to the other, wound
    // counter-clockwise seen from outside the cube.
    const std::vector<std::uint32_t> indices = {
        0, 1, 2,                    // z = 1: one triangle
        0, 3, 4, 0, 4, 1,           // y = 1: two
        0, 2, 6, 0, 6, 5, 0, 5, 3,  // x = 1: three
    };
    RCShdPtr<SdMesh> mesh = SdMeshBuilder().setVertices(vertices).setTriangles(indices).build();
    const GeVector3<float>& corner = mesh->getNormal(mesh->getFace(0).getNormalIndex(0));
    const float k = static_cast<float>(1.0 / std::sqrt(3.0));
    EXPECT_NEAR(corner.x, k, 1e-6);
    EXPECT_NEAR(corner.y, k, 1e-6);
    EXPECT_NEAR(corner.z, k, 1e-6);
    // Every face normal points out of the cube along one axis.
    for (unsigned int f = 0; f < mesh->getFaceCount(); ++f) {
        const GeVector3<float>& n = mesh->getNormal(mesh->getFace(f).getFaceNormalIndex());
        EXPECT_NEAR(n.x + n.y + n.z, 1.0f, 1e-6);
        EXPECT_NEAR(dot(n, n), 1.0, 1e-6);
    }
}

TEST(SdMeshBuilder, GivenNormalsAreKeptAndDegenerateFacesGiveZero) {
    const std::vector<GePoint3<float>> vertices = {{0, 0, 0}, {1, 0, 0}, {0, 1, 0}, {2, 0, 0}, {5, 5, 5}};
    const std::vector<GeVector3<float>> given = {{0, 0, 1}, {0, 1, 0}, {1, 0, 0}, {0, 0, -1}, {0.6f, 0.8f, 0}};
    // The second face is a line (three collinear corners); vertex 4 has no face.
    const std::vector<std::uint32_t> indices = {0, 1, 2, 0, 1, 3};
    RCShdPtr<SdMesh> withGiven = SdMeshBuilder().setVertices(vertices).setTriangles(indices).setNormals(given).build();
    for (unsigned int v = 0; v < vertices.size(); ++v) EXPECT_EQ(withGiven->getNormal(v), given[v]);
    EXPECT_EQ(withGiven->getNormal(withGiven->getFace(1).getFaceNormalIndex()), GeVector3<float>(0, 0, 0));

    RCShdPtr<SdMesh> computed = SdMeshBuilder().setVertices(vertices).setTriangles(indices).build();
    EXPECT_EQ(computed->getNormal(3), GeVector3<float>(0, 0, 0));  // only on the line
    EXPECT_EQ(computed->getNormal(4), GeVector3<float>(0, 0, 0));  // on no face
    EXPECT_EQ(computed->getNormal(0), GeVector3<float>(0, 0, 1));
}

TEST(SdMeshBuilder, BoundingBoxIsTheSmallestBoxOfTheVertices) {
    std::mt19937 rng(3);
    std::uniform_real_distribution<float> coord(-50.0f, 50.0f);
    for (int trial = 0; trial < 20; ++trial) {
        std::vector<GePoint3<float>> vertices(1 + trial * 7);
        for (GePoint3<float>& v : vertices) v = GePoint3<float>(coord(rng), coord(rng), coord(rng));
        RCShdPtr<SdMesh> mesh = SdMeshBuilder().setVertices(vertices).build();
        GeAlignedBox3<float> box;
        mesh->getBoundingBox(box);
        // Every vertex inside, and each of the six sides touched by some vertex.
        bool touched[6] = {};
        for (const GePoint3<float>& v : vertices) {
            EXPECT_TRUE(box.contains(v));
            touched[0] |= v.x == box.xMin;
            touched[1] |= v.x == box.xMax;
            touched[2] |= v.y == box.yMin;
            touched[3] |= v.y == box.yMax;
            touched[4] |= v.z == box.zMin;
            touched[5] |= v.z == box.zMax;
        }
        for (bool side : touched) EXPECT_TRUE(side);
    }
    GeAlignedBox3<float> emptyBox(GePoint3<float>(0, 0, 0), GePoint3<float>(1, 1, 1));
    SdMeshBuilder().build()->getBoundingBox(emptyBox);
    EXPECT_TRUE(emptyBox.isEmpty());
}

TEST(SdMeshBuilder, DerivedDataIsAddedToACopy) {
    std::vector<GePoint3<float>> vertices;
    std::vector<std::uint32_t> indices;
    makeSphere(6, 8, vertices, indices);
    std::vector<GePoint3<float>> uv;
    for (const GePoint3<float>& v : vertices) uv.emplace_back(v.x * 0.5f + 0.5f, v.y * 0.5f + 0.5f, 0.0f);
    const unsigned int faceCount = static_cast<unsigned int>(indices.size() / 3);
    SdMeshBuilder builder;
    builder.setVertices(vertices).setTriangles(indices).addTextureChannel(uv);
    builder.addFaceGroup(10).addFaceGroup(faceCount - 10);
    RCShdPtr<const SdMesh> plain = builder.buildWithoutDerivedData();
    RCShdPtr<const SdMesh> complete = builder.build();

    EXPECT_EQ(plain->getNormalCount(), 0u);
    RCShdPtr<const SdMesh> derived = SdMeshBuilder().addDerivedDataChannel(*plain);
    EXPECT_EQ(derived->getChannelSet(), complete->getChannelSet());
    EXPECT_FALSE(plain->hasDerivedData());  // the source is untouched

    // Everything else is carried over, and the derived data is what build() makes directly.
    ASSERT_EQ(derived->getVertexCount(), plain->getVertexCount());
    ASSERT_EQ(derived->getFaceCount(), plain->getFaceCount());
    ASSERT_EQ(derived->getNormalCount(), complete->getNormalCount());
    for (unsigned int v = 0; v < plain->getVertexCount(); ++v) EXPECT_EQ(derived->getVertex(v), plain->getVertex(v));
    for (unsigned int n = 0; n < derived->getNormalCount(); ++n) EXPECT_EQ(derived->getNormal(n), complete->getNormal(n));
    for (SdMesh::FaceConstIterator d = derived->beginFaces(), p = plain->beginFaces(); !d.atEnd(); ++d, ++p) {
        for (int c = 0; c < 3; ++c) {
            EXPECT_EQ(d->getVertexIndex(c), p->getVertexIndex(c));
            EXPECT_EQ(d->getTextureIndex(c), p->getTextureIndex(c));
        }
    }
    ASSERT_EQ(derived->getFaceGroupCount(), 2u);
    EXPECT_EQ(derived->getFaceGroup(1)._firstFace, 10u);

    // Per-vertex normals of a plain mesh serve as the vertex normals of the copy.
    std::vector<GeVector3<float>> up(vertices.size(), GeVector3<float>(0, 0, 1));
    RCShdPtr<const SdMesh> plainWithNormals =
        SdMeshBuilder().setVertices(vertices).setTriangles(indices).setNormals(up).buildWithoutDerivedData();
    RCShdPtr<const SdMesh> derivedWithNormals = SdMeshBuilder().addDerivedDataChannel(*plainWithNormals);
    for (unsigned int v = 0; v < vertices.size(); ++v) EXPECT_EQ(derivedWithNormals->getNormal(v), up[v]);
}

TEST(SdMeshBuilder, FaceGroupsDefaultToOneAndMustCoverTheFaces) {
    const std::vector<GePoint3<float>> vertices = {{0, 0, 0}, {1, 0, 0}, {0, 1, 0}, {1, 1, 0}};
    const std::vector<std::uint32_t> indices = {0, 1, 2, 1, 3, 2, 0, 1, 3};

    RCShdPtr<SdMesh> single = SdMeshBuilder().setVertices(vertices).setTriangles(indices).build();
    ASSERT_EQ(single->getFaceGroupCount(), 1u);
    EXPECT_EQ(single->getFaceGroup(0)._faceCount, 3u);

    RCShdPtr<SdMesh> split =
        SdMeshBuilder().setVertices(vertices).setTriangles(indices).addFaceGroup(1).addFaceGroup(0).addFaceGroup(2).build();
    ASSERT_EQ(split->getFaceGroupCount(), 3u);
    const unsigned int firsts[] = {0, 1, 1};
    const unsigned int counts[] = {1, 0, 2};
    for (unsigned int g = 0; g < 3; ++g) {
        EXPECT_EQ(split->getFaceGroups()[g]._firstFace, firsts[g]);
        EXPECT_EQ(split->getFaceGroups()[g]._faceCount, counts[g]);
    }
    SdMeshBuilder tooFew;
    tooFew.setVertices(vertices).setTriangles(indices).addFaceGroup(2);
    EXPECT_THROW(tooFew.build(), ExAssertionFailed);
}

TEST(SdMeshBuilder, InconsistentArraysAreRejected) {
    const std::vector<GePoint3<float>> vertices = {{0, 0, 0}, {1, 0, 0}, {0, 1, 0}};
    struct Case {
        const char* what;
        void (*setUp)(SdMeshBuilder&);
    };
    const Case cases[] = {
        {"index out of range", [](SdMeshBuilder& b) { b.setTriangles({0, 1, 3}); }},
        {"indices not in threes", [](SdMeshBuilder& b) { b.setTriangles({0, 1}); }},
        {"normals not one per vertex", [](SdMeshBuilder& b) { b.setTriangles({0, 1, 2}).setNormals({{0, 0, 1}}); }},
        {"coordinates not one per vertex",
         [](SdMeshBuilder& b) { b.setTriangles({0, 1, 2}).addTextureChannel({{0, 0, 0}}); }},
        {"texture index out of range",
         [](SdMeshBuilder& b) { b.setTriangles({0, 1, 2}).addTextureChannel({{0, 0, 0}}, {0, 0, 1}); }},
        {"texture indices not three per face",
         [](SdMeshBuilder& b) { b.setTriangles({0, 1, 2}).addTextureChannel({{0, 0, 0}}, {0, 0}); }},
    };
    for (const Case& c : cases) {
        SCOPED_TRACE(c.what);
        SdMeshBuilder builder;
        builder.setVertices(vertices);
        c.setUp(builder);
        EXPECT_THROW(builder.build(), ExAssertionFailed);
        EXPECT_THROW(builder.buildWithoutDerivedData(), ExAssertionFailed);
    }
}

TEST(SdMeshBuilder, TextureChannelsKeepTheirOwnIndices) {
    // A quad of two faces whose texture has a seam: the corners share vertices but not
    // coordinates.
    const std::vector<GePoint3<float>> vertices = {{0, 0, 0}, {1, 0, 0}, {1, 1, 0}, {0, 1, 0}};
    const std::vector<GePoint3<float>> coords = {{0, 0, 0}, {1, 0, 0}, {1, 1, 0}, {0, 1, 0}, {0.5f, 0.5f, 7}};
    RCShdPtr<SdMesh> mesh = SdMeshBuilder()
                                .setVertices(vertices)
                                .setTriangles({0, 1, 2, 0, 2, 3})
                                .addTextureChannel(coords, {0, 1, 2, 4, 2, 3})
                                .addTextureChannel(vertices)
                                .build();
    ASSERT_EQ(mesh->getTextureChannelCount(), 2u);
    EXPECT_TRUE(mesh->getChannelSet().contains(SdChannelSet::textureChannel(0) | SdChannelSet::textureChannel(1)));
    EXPECT_EQ(mesh->getTextureCoordinateCount(), 5u);
    const SdMesh::Face second = mesh->getFace(1);
    EXPECT_EQ(mesh->getTextureCoordinates()[second.getTextureIndex(0)], GePoint3<float>(0.5f, 0.5f, 7));
    // The second channel is indexed like the vertices.
    EXPECT_EQ(mesh->getTextureChannel(1)._faces[1]._textureIndices[2], 3u);
}

TEST(SdMeshFace, IteratorWalksEveryFaceOnceFromAnyStart) {
    std::vector<GePoint3<float>> vertices;
    std::vector<std::uint32_t> indices;
    makeSphere(5, 7, vertices, indices);
    RCShdPtr<SdMesh> mesh = SdMeshBuilder().setVertices(vertices).setTriangles(indices).build();
    unsigned int visited = 0;
    for (SdMesh::FaceConstIterator it(mesh->getFace(0)); it != mesh->endFaces(); ++it, ++visited) {
        EXPECT_EQ(it->getIndex(), visited);
        EXPECT_EQ(it->getDerivedData(), mesh->getFaceDerivedData() + visited);
        for (int c = 0; c < 3; ++c) EXPECT_EQ(it->getVertexIndex(c), indices[3 * visited + c]);
    }
    EXPECT_EQ(visited, mesh->getFaceCount());
    unsigned int fromMiddle = 0;
    for (SdMesh::FaceConstIterator it(mesh->getFace(5)); !it.atEnd(); ++it) ++fromMiddle;
    EXPECT_EQ(fromMiddle, mesh->getFaceCount() - 5);
    EXPECT_TRUE(SdMesh::FaceConstIterator(mesh->getFace(1u << 31)) == mesh->endFaces());
}

}  // namespace
}  // namespace Zr
