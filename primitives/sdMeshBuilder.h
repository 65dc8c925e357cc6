#pragma once
// Makes meshes, from a host's arrays or by completing a mesh with its derived data.
//
// From arrays:
//
//   SdMeshBuilder builder;
//   builder.setVertices(positions).setTriangles(indices);   // three indices per face
//   builder.setNormals(normals);                              // optional, one per vertex
//   builder.addTextureChannel(coordinates);                   // optional, one per vertex
//   builder.addFaceGroup(12).addFaceGroup(30);                // optional; default one group
//   RCShdPtr<SdMesh> mesh = builder.build();
//
// Normals. A face's normal follows its winding: it is the normalised cross product
// (v1 - v0) x (v2 - v0), so that the corners run counter-clockwise seen from where it points; a
// face of no area has the zero normal. The corners of a face use the vertex normals: the given
// ones, or, when none are given, smooth normals, each the normalised sum of the normals of the
// faces around the vertex weighted by the face's angle at the vertex. Angle weighting makes a
// vertex normal independent of how a flat region around it is cut into triangles. A vertex
// without a face of non-zero area gets the zero normal.
//
// The normal array of a mesh with derived data holds the vertex normals first (index = vertex
// index) and then one face normal per face (index = vertex count + face index).
//
// Inconsistent input (an index out of range, an array of the wrong length, face groups that do
// not add up to the faces) fails with ExAssertionFailed.
#include <cstdint>
#include <vector>

#include "gePoint3.h"
#include "geVector3.h"
#include "rcShdPtr.h"
#include "sdMesh.h"

namespace Zr {

class SdMeshBuilder {
public:
    SdMeshBuilder() = default;

    SdMeshBuilder& setVertices(std::vector<GePoint3<float>> vertices);
    // Three vertex indices per face.
    SdMeshBuilder& setTriangles(std::vector<std::uint32_t> indices);
    // One normal per vertex; without them the builder computes smooth normals.
    SdMeshBuilder& setNormals(std::vector<GeVector3<float>> normals);
    // A texture channel with one coordinate per vertex, indexed like the vertices.
    SdMeshBuilder& addTextureChannel(std::vector<GePoint3<float>> coordinates);
    // A texture channel with its own indices, three per face (an empty list means indexed like
    // the vertices).
    SdMeshBuilder& addTextureChannel(std::vector<GePoint3<float>> coordinates,
                                     std::vector<std::uint32_t> indices);
    // The next faceCount faces form a group. Without any group the mesh has one group of all
    // faces (none for a mesh without faces).
    SdMeshBuilder& addFaceGroup(unsigned int faceCount);
    // Forgets all arrays given so far.
    void clear();

    // A mesh of the arrays given, with its derived data.
    RCShdPtr<SdMesh> build() const;
    // The same without derived data; given normals are kept as the normal array.
    RCShdPtr<SdMesh> buildWithoutDerivedData() const;

    // A copy of mesh with its derived data made as described above, the mesh's normals serving
    // as the given vertex normals when it has one per vertex. A mesh that has derived data
    // already is copied as it stands.
    RCShdPtr<SdMesh> addDerivedDataChannel(const SdMesh& mesh) const;

    // The normals of the faces, by winding.
    static std::vector<GeVector3<float>> computeFaceNormals(
        const std::vector<GePoint3<float>>& vertices, const std::vector<SdMeshTypes::FaceImp>& faces);
    // The angle-weighted smooth normals of the vertices.
    static std::vector<GeVector3<float>> computeSmoothNormals(
        const std::vector<GePoint3<float>>& vertices, const std::vector<SdMeshTypes::FaceImp>& faces);

private:
    struct PendingChannel {
        std::vector<GePoint3<float>> _coordinates;
        std::vector<std::uint32_t> _indices;  // empty: indexed like the vertices
    };

    RCShdPtr<SdMesh> make(bool withDerivedData) const;

    std::vector<GePoint3<float>> _vertices;
    std::vector<std::uint32_t> _indices;
    std::vector<GeVector3<float>> _normals;
    std::vector<PendingChannel> _textureChannels;
    std::vector<unsigned int> _groupSizes;
};

}  // namespace Zr
