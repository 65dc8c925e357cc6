#include "sdMeshBuilder.h"

#include <cmath>
#include <utility>

#include "assertions.h"

namespace Zr {

namespace {

constexpr const char* kSourceFile = ".\\primitives/sdMeshBuilder.cpp";

// The vector arithmetic is spelled out on components, in double, so that normals of small or
// thin faces keep their precision.
struct Vec {
    double x, y, z;
};

Vec difference(const GePoint3<float>& a, const GePoint3<float>& b) {
    return Vec{static_cast<double>(a.x) - b.x, static_cast<double>(a.y) - b.y,
               static_cast<double>(a.z) - b.z};
}
Vec cross(const Vec& a, const Vec& b) {
    return Vec{a.y * b.z - a.z * b.y, a.z * b.x - a.x * b.z, a.x * b.y - a.y * b.x};
}
double dot(const Vec& a, const Vec& b) { return a.x * b.x + a.y * b.y + a.z * b.z; }
double length(const Vec& a) { return std::sqrt(dot(a, a)); }

// The unit vector along a, or zero for a zero (or not finite) a.
GeVector3<float> unitOrZero(const Vec& a) {
    const double len = length(a);
    if (!(len > 0.0) || !std::isfinite(len)) return GeVector3<float>{0.0f, 0.0f, 0.0f};
    return GeVector3<float>{static_cast<float>(a.x / len), static_cast<float>(a.y / len),
                            static_cast<float>(a.z / len)};
}

std::vector<SdMeshTypes::FaceImp> facesOf(const std::vector<std::uint32_t>& indices,
                                          std::size_t vertexCount) {
    ZR_ASSERT_AT(indices.size() % 3 == 0, kSourceFile, __LINE__);
    std::vector<SdMeshTypes::FaceImp> faces(indices.size() / 3);
    for (std::size_t f = 0; f < faces.size(); ++f) {
        for (int c = 0; c < 3; ++c) {
            const std::uint32_t index = indices[3 * f + c];
            ZR_ASSERT_AT(index < vertexCount, kSourceFile, __LINE__);
            faces[f]._vertexIndices[c] = index;
        }
    }
    return faces;
}

// The derived records for vertex normals at 0 .. vertexCount - 1 followed by the face normals.
std::vector<SdMesh::FaceDerivedData> derivedRecords(const std::vector<SdMeshTypes::FaceImp>& faces,
                                                    std::size_t vertexCount) {
    std::vector<SdMesh::FaceDerivedData> records(faces.size());
    for (std::size_t f = 0; f < faces.size(); ++f) {
        for (int c = 0; c < 3; ++c) records[f]._normalIndices[c] = faces[f]._vertexIndices[c];
        records[f]._faceNormalIndex = static_cast<SdMeshTypes::Index>(vertexCount + f);
    }
    return records;
}

}  // namespace

SdMeshBuilder& SdMeshBuilder::setVertices(std::vector<GePoint3<float>> vertices) {
    _vertices = std::move(vertices);
    return *this;
}

SdMeshBuilder& SdMeshBuilder::setTriangles(std::vector<std::uint32_t> indices) {
    _indices = std::move(indices);
    return *this;
}

SdMeshBuilder& SdMeshBuilder::setNormals(std::vector<GeVector3<float>> normals) {
    _normals = std::move(normals);
    return *this;
}

SdMeshBuilder& SdMeshBuilder::addTextureChannel(std::vector<GePoint3<float>> coordinates) {
    _textureChannels.push_back(PendingChannel{std::move(coordinates), {}});
    return *this;
}

SdMeshBuilder& SdMeshBuilder::addTextureChannel(std::vector<GePoint3<float>> coordinates,
                                                std::vector<std::uint32_t> indices) {
    _textureChannels.push_back(PendingChannel{std::move(coordinates), std::move(indices)});
    return *this;
}

SdMeshBuilder& SdMeshBuilder::addFaceGroup(unsigned int faceCount) {
    _groupSizes.push_back(faceCount);
    return *this;
}

void SdMeshBuilder::clear() { *this = SdMeshBuilder(); }

RCShdPtr<SdMesh> SdMeshBuilder::build() const { return make(true); }

RCShdPtr<SdMesh> SdMeshBuilder::buildWithoutDerivedData() const { return make(false); }

RCShdPtr<SdMesh> SdMeshBuilder::make(bool withDerivedData) const {
    const std::size_t vertexCount = _vertices.size();
    std::vector<SdMeshTypes::FaceImp> faces = facesOf(_indices, vertexCount);
    const std::size_t faceCount = faces.size();
    ZR_ASSERT_AT(_normals.empty() || _normals.size() == vertexCount, kSourceFile, __LINE__);

    std::vector<SdMeshTypes::FaceGroup> groups;
    if (_groupSizes.empty()) {
        if (faceCount > 0) {
            groups.push_back(SdMeshTypes::FaceGroup{0, static_cast<SdMeshTypes::Index>(faceCount)});
        }
    } else {
        std::size_t first = 0;
        for (unsigned int size : _groupSizes) {
            groups.push_back(SdMeshTypes::FaceGroup{static_cast<SdMeshTypes::Index>(first),
                                                    static_cast<SdMeshTypes::Index>(size)});
            first += size;
        }
        ZR_ASSERT_AT(first == faceCount, kSourceFile, __LINE__);
    }

    std::vector<SdMesh::TextureChannel> channels;
    channels.reserve(_textureChannels.size());
    for (const PendingChannel& pending : _textureChannels) {
        SdMesh::TextureChannel channel;
        channel._coordinates = pending._coordinates;
        if (pending._indices.empty()) {
            ZR_ASSERT_AT(pending._coordinates.size() == vertexCount, kSourceFile, __LINE__);
            channel._faces.resize(faceCount);
            for (std::size_t f = 0; f < faceCount; ++f) {
                for (int c = 0; c < 3; ++c) {
                    channel._faces[f]._textureIndices[c] = faces[f]._vertexIndices[c];
                }
            }
        } else {
            ZR_ASSERT_AT(pending._indices.size() == 3 * faceCount, kSourceFile, __LINE__);
            channel._faces.resize(faceCount);
            for (std::size_t f = 0; f < faceCount; ++f) {
                for (int c = 0; c < 3; ++c) {
                    const std::uint32_t index = pending._indices[3 * f + c];
                    ZR_ASSERT_AT(index < pending._coordinates.size(), kSourceFile, __LINE__);
                    channel._faces[f]._textureIndices[c] = index;
                }
            }
        }
        channels.push_back(std::move(channel));
    }

    std::vector<GeVector3<float>> normals = _normals;
    std::vector<SdMesh::FaceDerivedData> derived;
    if (withDerivedData) {
        if (normals.empty()) normals = computeSmoothNormals(_vertices, faces);
        std::vector<GeVector3<float>> faceNormals = computeFaceNormals(_vertices, faces);
        normals.insert(normals.end(), faceNormals.begin(), faceNormals.end());
        derived = derivedRecords(faces, vertexCount);
    }
    return RCShdPtr<SdMesh>(new SdMesh(_vertices, std::move(normals), std::move(faces),
                                       std::move(derived), std::move(groups), std::move(channels),
                                       withDerivedData));
}

RCShdPtr<SdMesh> SdMeshBuilder::addDerivedDataChannel(const SdMesh& mesh) const {
    std::vector<GeVector3<float>> normals;
    std::vector<SdMesh::FaceDerivedData> derived;
    if (mesh.hasDerivedData()) {
        normals = mesh._normals;
        derived = mesh._derivedData;
    } else {
        // Normals of a mesh without derived data have no indices of their own; they can only be
        // one per vertex. Anything else is not trusted and replaced.
        if (mesh._normals.size() == mesh._vertices.size() && !mesh._normals.empty()) {
            normals = mesh._normals;
        } else {
            normals = computeSmoothNormals(mesh._vertices, mesh._faces);
        }
        std::vector<GeVector3<float>> faceNormals = computeFaceNormals(mesh._vertices, mesh._faces);
        normals.insert(normals.end(), faceNormals.begin(), faceNormals.end());
        derived = derivedRecords(mesh._faces, mesh._vertices.size());
    }
    return RCShdPtr<SdMesh>(new SdMesh(mesh._vertices, std::move(normals), mesh._faces,
                                       std::move(derived), mesh._faceGroups,
                                       mesh._textureChannels, true));
}

std::vector<GeVector3<float>> SdMeshBuilder::computeFaceNormals(
    const std::vector<GePoint3<float>>& vertices, const std::vector<SdMeshTypes::FaceImp>& faces) {
    std::vector<GeVector3<float>> normals;
    normals.reserve(faces.size());
    for (const SdMeshTypes::FaceImp& face : faces) {
        const GePoint3<float>& v0 = vertices[face._vertexIndices[0]];
        const GePoint3<float>& v1 = vertices[face._vertexIndices[1]];
        const GePoint3<float>& v2 = vertices[face._vertexIndices[2]];
        normals.push_back(unitOrZero(cross(difference(v1, v0), difference(v2, v0))));
    }
    return normals;
}

std::vector<GeVector3<float>> SdMeshBuilder::computeSmoothNormals(
    const std::vector<GePoint3<float>>& vertices, const std::vector<SdMeshTypes::FaceImp>& faces) {
    std::vector<Vec> sums(vertices.size(), Vec{0.0, 0.0, 0.0});
    for (const SdMeshTypes::FaceImp& face : faces) {
        const GePoint3<float>* corners[3] = {&vertices[face._vertexIndices[0]],
                                             &vertices[face._vertexIndices[1]],
                                             &vertices[face._vertexIndices[2]]};
        const Vec normal = cross(difference(*corners[1], *corners[0]),
                                 difference(*corners[2], *corners[0]));
        const double area2 = length(normal);
        if (!(area2 > 0.0) || !std::isfinite(area2)) continue;
        for (int c = 0; c < 3; ++c) {
            const Vec toNext = difference(*corners[(c + 1) % 3], *corners[c]);
            const Vec toPrevious = difference(*corners[(c + 2) % 3], *corners[c]);
            // atan2 of the sine and cosine stays accurate for angles near 0 and pi.
            const double angle = std::atan2(length(cross(toNext, toPrevious)), dot(toNext, toPrevious));
            const double weight = angle / area2;
            Vec& sum = sums[face._vertexIndices[c]];
            sum.x += normal.x * weight;
            sum.y += normal.y * weight;
            sum.z += normal.z * weight;
        }
    }
    std::vector<GeVector3<float>> normals;
    normals.reserve(sums.size());
    for (const Vec& sum : sums) normals.push_back(unitOrZero(sum));
    return normals;
}

}  // namespace Zr
