#pragma once
// An indexed triangle mesh in object space. Its arrays are contiguous and immutable once built
// (SdMeshBuilder makes meshes):
//
// - vertices: positions;
// - normals: directions, indexed by the derived face data;
// - faces: three vertex indices each (SdMeshTypes::FaceImp);
// - derived face data, one record per face, or none: three corner normal indices and the index of
//   the face normal, all into the normal array;
// - face groups: runs of consecutive faces, each drawn with one material of the instance;
// - texture channels: each an array of three-float coordinates with one index record per face
//   (SdMeshTypes::TextureFaceImp). The first channel is the one that shading and tangents use.
//
// SdMesh::Face is a light view of one face with pointers to its records, and FaceConstIterator
// walks faces in order.
#include <cstddef>
#include <vector>

#include "geAlignedBox3.h"
#include "gePoint3.h"
#include "geVector3.h"
#include "sdChannelSet.h"
#include "sdMeshTypes.h"
#include "sdObject.h"

namespace Zr {

class SdMeshBuilder;

class SdMesh : public SdObject {
public:
    using RttiClassType = RttiGenType1<SdMesh, SdObject>;
    const RttiType<SdObject>& getType() const override { return RttiClassType::getInstance(); }

    using Index = SdMeshTypes::Index;

    // What SdMeshBuilder::addDerivedDataChannel adds: the normals, and per face its corner normal
    // indices and face normal index.
    struct FaceDerivedData {
        Index _normalIndices[3];
        Index _faceNormalIndex;
    };

    struct TextureChannel {
        std::vector<GePoint3<float>> _coordinates;
        std::vector<SdMeshTypes::TextureFaceImp> _faces;  // one per face of the mesh
    };

    class Face;
    class FaceConstIterator;

    // The channels of the derived face data.
    static constexpr SdChannelSet DERIVED_DATA =
        SdChannelSet(SdChannelSet::normals) | SdChannelSet(SdChannelSet::faceNormals) |
        SdChannelSet(SdChannelSet::cornerNormals);

    // The box of all vertices; the empty box for a mesh without vertices.
    virtual void getBoundingBox(GeAlignedBox3<float>& box) const;

    SdChannelSet getChannelSet() const { return _channels; }
    bool hasDerivedData() const { return _channels.contains(DERIVED_DATA); }

    unsigned int getVertexCount() const { return static_cast<unsigned int>(_vertices.size()); }
    const GePoint3<float>* getVertices() const { return _vertices.data(); }
    const GePoint3<float>& getVertex(unsigned int index) const { return _vertices[index]; }

    unsigned int getNormalCount() const { return static_cast<unsigned int>(_normals.size()); }
    const GeVector3<float>* getNormals() const { return _normals.data(); }
    const GeVector3<float>& getNormal(unsigned int index) const { return _normals[index]; }

    unsigned int getFaceCount() const { return static_cast<unsigned int>(_faces.size()); }
    const SdMeshTypes::FaceImp* getFaces() const { return _faces.data(); }
    // One record per face, or null when the mesh has no derived data.
    const FaceDerivedData* getFaceDerivedData() const {
        return _derivedData.empty() ? nullptr : _derivedData.data();
    }

    unsigned int getFaceGroupCount() const { return static_cast<unsigned int>(_faceGroups.size()); }
    const SdMeshTypes::FaceGroup* getFaceGroups() const { return _faceGroups.data(); }
    const SdMeshTypes::FaceGroup& getFaceGroup(unsigned int index) const { return _faceGroups[index]; }

    unsigned int getTextureChannelCount() const {
        return static_cast<unsigned int>(_textureChannels.size());
    }
    const TextureChannel& getTextureChannel(unsigned int index) const { return _textureChannels[index]; }
    // The coordinates of the first texture channel: null and 0 without texture channels.
    const GePoint3<float>* getTextureCoordinates() const;
    unsigned int getTextureCoordinateCount() const;
    // The index records of the first texture channel, one per face, or null.
    const SdMeshTypes::TextureFaceImp* getTextureFaces() const;

    // The face at index. An index at or past the face count gives the end face, which compares
    // equal to endFaces() and whose records must not be read.
    Face getFace(unsigned int index) const;
    FaceConstIterator beginFaces() const;
    FaceConstIterator endFaces() const;

private:
    friend class SdMeshBuilder;

    SdMesh(std::vector<GePoint3<float>> vertices, std::vector<GeVector3<float>> normals,
           std::vector<SdMeshTypes::FaceImp> faces, std::vector<FaceDerivedData> derivedData,
           std::vector<SdMeshTypes::FaceGroup> faceGroups,
           std::vector<TextureChannel> textureChannels, bool withDerivedData);

    std::vector<GePoint3<float>> _vertices;
    std::vector<GeVector3<float>> _normals;
    std::vector<SdMeshTypes::FaceImp> _faces;
    std::vector<FaceDerivedData> _derivedData;
    std::vector<SdMeshTypes::FaceGroup> _faceGroups;
    std::vector<TextureChannel> _textureChannels;
    SdChannelSet _channels;
    GeAlignedBox3<float> _boundingBox;
};

// One face: its mesh, its index and pointers to its three records. The derived-data and texture
// pointers are null when the mesh lacks those channels.
class SdMesh::Face {
public:
    Face(const SdMesh& mesh, unsigned int index, const SdMeshTypes::FaceImp* face,
         const SdMesh::FaceDerivedData* derived, const SdMeshTypes::TextureFaceImp* texture)
        : _mesh(&mesh), _index(index), _face(face), _derived(derived), _texture(texture) {}

    const SdMesh& getMesh() const { return *_mesh; }
    unsigned int getIndex() const { return _index; }

    Index getVertexIndex(int corner) const { return _face->_vertexIndices[corner]; }
    const GePoint3<float>& getVertex(int corner) const {
        return _mesh->getVertex(getVertexIndex(corner));
    }
    // Only with derived data.
    Index getNormalIndex(int corner) const { return _derived->_normalIndices[corner]; }
    Index getFaceNormalIndex() const { return _derived->_faceNormalIndex; }
    // Only with a first texture channel.
    Index getTextureIndex(int corner) const { return _texture->_textureIndices[corner]; }

    const SdMeshTypes::FaceImp* getFaceImp() const { return _face; }
    const SdMesh::FaceDerivedData* getDerivedData() const { return _derived; }
    const SdMeshTypes::TextureFaceImp* getTextureFaceImp() const { return _texture; }

    friend bool operator==(const Face& a, const Face& b) {
        return a._mesh == b._mesh && a._index == b._index;
    }
    friend bool operator!=(const Face& a, const Face& b) { return !(a == b); }

private:
    friend class SdMesh::FaceConstIterator;

    const SdMesh* _mesh;
    unsigned int _index;
    const SdMeshTypes::FaceImp* _face;
    const SdMesh::FaceDerivedData* _derived;
    const SdMeshTypes::TextureFaceImp* _texture;
};

// Walks the faces of a mesh in order from a given face; compares equal to the iterator of the
// same mesh and index.
class SdMesh::FaceConstIterator {
public:
    explicit FaceConstIterator(const Face& face) : _face(face) {}

    const Face& operator*() const { return _face; }
    const Face* operator->() const { return &_face; }
    FaceConstIterator& operator++() {
        ++_face._index;
        ++_face._face;
        // Channels the mesh lacks stay null.
        if (_face._derived) ++_face._derived;
        if (_face._texture) ++_face._texture;
        return *this;
    }
    bool atEnd() const { return _face._index >= _face._mesh->getFaceCount(); }

    friend bool operator==(const FaceConstIterator& a, const FaceConstIterator& b) {
        return a._face == b._face;
    }
    friend bool operator!=(const FaceConstIterator& a, const FaceConstIterator& b) {
        return !(a == b);
    }

private:
    Face _face;
};

}  // namespace Zr
