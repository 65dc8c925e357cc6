#include "sdMesh.h"

#include <algorithm>
#include <utility>

namespace Zr {

SdMesh::SdMesh(std::vector<GePoint3<float>> vertices, std::vector<GeVector3<float>> normals,
               std::vector<SdMeshTypes::FaceImp> faces, std::vector<FaceDerivedData> derivedData,
               std::vector<SdMeshTypes::FaceGroup> faceGroups,
               std::vector<TextureChannel> textureChannels, bool withDerivedData)
    : _vertices(std::move(vertices)),
      _normals(std::move(normals)),
      _faces(std::move(faces)),
      _derivedData(std::move(derivedData)),
      _faceGroups(std::move(faceGroups)),
      _textureChannels(std::move(textureChannels)) {
    if (!_vertices.empty()) _channels |= SdChannelSet::vertices;
    if (!_faces.empty()) _channels |= SdChannelSet::faces;
    if (!_normals.empty()) _channels |= SdChannelSet::normals;
    // A mesh of no faces has all of its (no) derived records once they were made.
    if (withDerivedData) _channels |= DERIVED_DATA;
    const int channelCount = std::min<int>(static_cast<int>(_textureChannels.size()),
                                           SdChannelSet::maxTextureChannels);
    for (int i = 0; i < channelCount; ++i) _channels |= SdChannelSet::textureChannel(i);

    for (const GePoint3<float>& vertex : _vertices) _boundingBox.grow(vertex);
}

void SdMesh::getBoundingBox(GeAlignedBox3<float>& box) const { box = _boundingBox; }

const GePoint3<float>* SdMesh::getTextureCoordinates() const {
    if (_textureChannels.empty() || _textureChannels.front()._coordinates.empty()) return nullptr;
    return _textureChannels.front()._coordinates.data();
}

unsigned int SdMesh::getTextureCoordinateCount() const {
    if (_textureChannels.empty()) return 0;
    return static_cast<unsigned int>(_textureChannels.front()._coordinates.size());
}

const SdMeshTypes::TextureFaceImp* SdMesh::getTextureFaces() const {
    if (_textureChannels.empty() || _textureChannels.front()._faces.empty()) return nullptr;
    return _textureChannels.front()._faces.data();
}

SdMesh::Face SdMesh::getFace(unsigned int index) const {
    const unsigned int clamped = std::min(index, getFaceCount());
    const FaceDerivedData* derived = getFaceDerivedData();
    const SdMeshTypes::TextureFaceImp* texture = getTextureFaces();
    return Face(*this, clamped, _faces.data() + clamped, derived ? derived + clamped : nullptr,
                texture ? texture + clamped : nullptr);
}

SdMesh::FaceConstIterator SdMesh::beginFaces() const { return FaceConstIterator(getFace(0)); }

SdMesh::FaceConstIterator SdMesh::endFaces() const {
    return FaceConstIterator(getFace(getFaceCount()));
}

}  // namespace Zr
