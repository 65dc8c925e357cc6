// Meshes made from arrays: normals against closed forms, derived data added to a copy, face groups,
// texture channels, bounding boxes and the checks of the input.
#include <gtest/gtest.h>

#include <cmath>
#include <cstdint>
#include <random>
#include <vector>

#include "exBase.h"
#include "sdMeshBuilder.h"

namespace Zr {
namespace {

double dot(const GeVector3<float>& a, const GeVector3<double>& b) { return a.x * b.x + a.y * b.y + a.z * b.z; }

// A face's normal is the normalised cross product (v1 - v0) x (v2 - v0), over random triangles.
TEST(SdMeshBuilder, FaceNormalsAreTheNormalisedCrossProductOfTheEdges) {
    std::mt19937 rng(42);
    std::uniform_real_distribution<float> coord(-5.0f, 5.0f);
    std::vector<GePoint3<float>> vertices(300);
    std::vector<std::uint32_t> indices(300);
    for (std::uint32_t i = 0; i < 300; ++i) {
        const float x = coord(rng), y = coord(rng);
        vertices[i] = GePoint3<float>(x, y, coord(rng)), indices[i] = i;
    }
    const RCShdPtr<SdMesh> mesh = SdMeshBuilder().setVertices(vertices).setTriangles(indices).build();
    const auto corner = [&](unsigned int i) { return GePoint3<double>(vertices[i]); };
    for (unsigned int f = 0; f < 100; ++f) {
        const auto n = (corner(3 * f + 1) - corner(3 * f)).cross(corner(3 * f + 2) - corner(3 * f)).getNormalized();
        EXPECT_NEAR(dot(mesh->getNormal(mesh->getFace(f).getFaceNormalIndex()), n), 1.0, 1e-4) << f;
    }
}

// The corner (1, 1, 1) of a unit cube where three faces meet, each cut differently: one triangle,
// two fanning from the corner, three. A face's normal follows its winding (counter-clockwise seen
// from outside here); angle weighting gives the corner the diagonal whatever the cut, weighting by
// count or by area would not. A face of no area has the zero normal and adds nothing; a vertex on
// no such face gets the zero normal; given normals are kept.
TEST(SdMeshBuilder, VertexNormalsWeighFacesByTheirAngleAtTheVertex) {
    const std::vector<GePoint3<float>> vertices = {
        {1, 1, 1}, {0, 1, 1}, {1, 0, 1}, {1, 1, 0}, {0.2f, 1, 0.1f}, {1, 0.3f, 0}, {1, 0, 0.1f}, {2, 1, 1}, {5, 5, 5}};
    // Fans around the corner from one cube edge to the other, counter-clockwise seen from outside,
    // then a face that is a line through the corner.
    const std::vector<std::uint32_t> indices = {0, 1, 2, 0, 3, 4, 0, 4, 1, 0, 2, 6, 0, 6, 5, 0, 5, 3, 0, 1, 7};
    const RCShdPtr<SdMesh> mesh = SdMeshBuilder().setVertices(vertices).setTriangles(indices).build();
    ASSERT_EQ(mesh->getNormalCount(), mesh->getVertexCount() + mesh->getFaceCount());
    const GeVector3<float>& corner = mesh->getNormal(mesh->getFace(0).getNormalIndex(0));
    const double k = 1.0 / std::sqrt(3.0);
    EXPECT_NEAR(dot(corner, {k, k, k}), 1.0, 1e-6) << corner;
    for (unsigned int f = 0; f + 1 < mesh->getFaceCount(); ++f) {
        const GeVector3<float>& n = mesh->getNormal(mesh->getFace(f).getFaceNormalIndex());
        EXPECT_NEAR(n.x + n.y + n.z, 1.0f, 1e-6);  // out of the cube along one axis
        EXPECT_NEAR(dot(n, {n.x, n.y, n.z}), 1.0, 1e-6);
    }
    EXPECT_EQ(mesh->getNormal(mesh->getFace(6).getFaceNormalIndex()), GeVector3<float>(0, 0, 0));
    EXPECT_EQ(mesh->getNormal(7), GeVector3<float>(0, 0, 0));  // only on the line
    EXPECT_EQ(mesh->getNormal(8), GeVector3<float>(0, 0, 0));  // on no face
    std::vector<GeVector3<float>> given(vertices.size(), GeVector3<float>(0.6f, 0.8f, 0));
    const RCShdPtr<SdMesh> kept = SdMeshBuilder().setVertices(vertices).setTriangles(indices).setNormals(given).build();
    for (unsigned int v = 0; v < vertices.size(); ++v) EXPECT_EQ(kept->getNormal(v), given[v]);
}

TEST(SdMeshBuilder, DerivedDataIsAddedToACopyAsBuildWouldMakeIt) {
    std::mt19937 rng(3);
    std::uniform_real_distribution<float> coord(-50.0f, 50.0f);
    std::vector<GePoint3<float>> vertices(30), uv;
    std::vector<std::uint32_t> indices;
    for (auto& v : vertices) v = GePoint3<float>(coord(rng), coord(rng), coord(rng)), uv.emplace_back(v.x, v.z, 0.0f);
    for (int i = 0; i < 120; ++i) indices.push_back(static_cast<std::uint32_t>(rng() % 30));
    SdMeshBuilder builder;
    builder.setVertices(vertices).setTriangles(indices).addTextureChannel(uv).addFaceGroup(10).addFaceGroup(30);
    const RCShdPtr<const SdMesh> plain = builder.buildWithoutDerivedData(), complete = builder.build();
    const RCShdPtr<const SdMesh> derived = SdMeshBuilder().addDerivedDataChannel(*plain);
    EXPECT_EQ(plain->getNormalCount(), 0u);
    EXPECT_FALSE(plain->hasDerivedData());  // the source is untouched
    EXPECT_EQ(derived->getChannelSet(), complete->getChannelSet());
    ASSERT_EQ(derived->getNormalCount(), complete->getNormalCount());
    for (unsigned int n = 0; n < derived->getNormalCount(); ++n)
        EXPECT_EQ(derived->getNormal(n), complete->getNormal(n)) << n;
    // Faces, reached by index or walked from any start up to the end, carry their own records:
    // vertex normals and texture coordinates indexed like the vertices, face normals after them.
    ASSERT_EQ(derived->getFaceCount(), 40u);
    unsigned int walked = 5;
    for (auto it = SdMesh::FaceConstIterator(derived->getFace(5)); it != derived->endFaces(); ++it) {
        EXPECT_EQ(it->getIndex(), walked++);
        EXPECT_EQ(it->getDerivedData(), derived->getFaceDerivedData() + it->getIndex());
    }
    EXPECT_EQ(walked, 40u);
    EXPECT_TRUE(SdMesh::FaceConstIterator(derived->getFace(1u << 31)) == derived->endFaces());
    for (unsigned int f = 0; f < 40; ++f) {
        const SdMesh::Face face = derived->getFace(f);
        EXPECT_EQ(face.getFaceNormalIndex(), 30 + f);
        for (int k = 0; k < 3; ++k) {
            EXPECT_EQ(face.getVertex(k), vertices[indices[3 * f + k]]);
            EXPECT_EQ(face.getNormalIndex(k) * 100 + face.getTextureIndex(k), indices[3 * f + k] * 101);
        }
    }
    ASSERT_EQ(derived->getFaceGroupCount(), 2u);
    EXPECT_EQ(derived->getFaceGroup(1)._firstFace, 10u);
    GeAlignedBox3<float> box, expected;
    derived->getBoundingBox(box);
    for (const auto& v : vertices) expected.grow(v);
    EXPECT_EQ(box, expected);
    // Per-vertex normals of a plain mesh serve as the vertex normals of the copy; a mesh that has
    // derived data is copied as it stands.
    std::vector<GeVector3<float>> up(vertices.size(), GeVector3<float>(0, 0, 1));
    const RCShdPtr<const SdMesh> upCopy = SdMeshBuilder().addDerivedDataChannel(
        *SdMeshBuilder().setVertices(vertices).setTriangles(indices).setNormals(up).buildWithoutDerivedData());
    for (unsigned int v = 0; v < vertices.size(); ++v) EXPECT_EQ(upCopy->getNormal(v), up[v]);
    EXPECT_EQ(SdMeshBuilder().addDerivedDataChannel(*upCopy)->getNormal(0), up[0]);
    SdMeshBuilder().build()->getBoundingBox(box);
    EXPECT_TRUE(box.isEmpty());
}

TEST(SdMeshBuilder, FaceGroupsDefaultToOneAndMustCoverTheFaces) {
    SdMeshBuilder builder;
    builder.setVertices({{0, 0, 0}, {1, 0, 0}, {0, 1, 0}, {1, 1, 0}});
    EXPECT_EQ(builder.build()->getFaceGroupCount(), 0u);
    builder.setTriangles({0, 1, 2, 1, 3, 2, 0, 1, 3});
    const RCShdPtr<SdMesh> single = builder.build();
    ASSERT_EQ(single->getFaceGroupCount(), 1u);
    EXPECT_TRUE(single->getFaceGroup(0)._firstFace == 0 && single->getFaceGroup(0)._faceCount == 3);
    const RCShdPtr<SdMesh> split = SdMeshBuilder(builder).addFaceGroup(1).addFaceGroup(0).addFaceGroup(2).build();
    ASSERT_EQ(split->getFaceGroupCount(), 3u);
    const unsigned int firsts[] = {0, 1, 1}, counts[] = {1, 0, 2};
    for (unsigned int g = 0; g < 3; ++g) {
        const auto& group = split->getFaceGroups()[g];
        EXPECT_TRUE(group._firstFace == firsts[g] && group._faceCount == counts[g]) << g;
    }
    EXPECT_THROW(builder.addFaceGroup(2).build(), ExAssertionFailed);
}

// A quad of two faces whose texture has a seam: the corners share vertices but not coordinates.
TEST(SdMeshBuilder, TextureChannelsKeepTheirOwnIndicesAndInconsistentArraysAreRejected) {
    const std::vector<GePoint3<float>> vertices = {{0, 0, 0}, {1, 0, 0}, {1, 1, 0}, {0, 1, 0}};
    const std::vector<GePoint3<float>> coords = {{0, 0, 0}, {1, 0, 0}, {1, 1, 0}, {0, 1, 0}, {0.5f, 0.5f, 7}};
    const RCShdPtr<SdMesh> mesh = SdMeshBuilder()
                                      .setVertices(vertices)
                                      .setTriangles({0, 1, 2, 0, 2, 3})
                                      .addTextureChannel(coords, {0, 1, 2, 4, 2, 3})
                                      .addTextureChannel(vertices)
                                      .build();
    ASSERT_EQ(mesh->getTextureChannelCount(), 2u);
    EXPECT_TRUE(mesh->getChannelSet().contains(SdChannelSet::textureChannel(0) | SdChannelSet::textureChannel(1)));
    EXPECT_EQ(mesh->getTextureCoordinateCount(), 5u);
    EXPECT_EQ(mesh->getTextureCoordinates()[mesh->getFace(1).getTextureIndex(0)], GePoint3<float>(0.5f, 0.5f, 7));
    EXPECT_EQ(mesh->getTextureChannel(1)._faces[1]._textureIndices[2], 3u);
    void (*const spoilers[])(SdMeshBuilder&) = {
        [](SdMeshBuilder& b) { b.setTriangles({0, 1, 3}); },  // index out of range
        [](SdMeshBuilder& b) { b.setTriangles({0, 1}); },     // not in threes
        [](SdMeshBuilder& b) { b.setTriangles({0, 1, 2}).setNormals({{0, 0, 1}}); },
        [](SdMeshBuilder& b) { b.setTriangles({0, 1, 2}).addTextureChannel({{0, 0, 0}}); },
        [](SdMeshBuilder& b) { b.setTriangles({0, 1, 2}).addTextureChannel({{0, 0, 0}}, {0, 0, 1}); },
        [](SdMeshBuilder& b) { b.setTriangles({0, 1, 2}).addTextureChannel({{0, 0, 0}}, {0, 0}); },
    };
    for (const auto& spoil : spoilers) {
        SdMeshBuilder builder;
        builder.setVertices({{0, 0, 0}, {1, 0, 0}, {0, 1, 0}});
        spoil(builder);
        EXPECT_THROW(builder.build(), ExAssertionFailed) << &spoil - spoilers;
        EXPECT_THROW(builder.buildWithoutDerivedData(), ExAssertionFailed) << &spoil - spoilers;
    }
}

}  // namespace
}  // namespace Zr
