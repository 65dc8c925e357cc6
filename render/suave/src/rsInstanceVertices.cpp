#include "rsInstanceVertices.h"

#include <algorithm>
#include <cmath>

#include "assertions.h"
#include "rsGeomInstance.h"

namespace Zr {

namespace {

constexpr const char* kSourceFile = "render\\suave\\src\\rsInstanceVertices";

GeVector3<float> normalizedOrSame(const GeVector3<float>& v) {
    const float length = v.length();
    return length != 0.0f ? v / length : v;
}

}  // namespace

RsInstanceVertices::RsInstanceVertices(const RsGeomInstance& instance,
                                       const GeProjectiveMatrix3<float>& pixelMatrix, bool withNormals,
                                       bool withTangents)
    : _mesh(instance._mesh) {
    const SdMesh& mesh = *_mesh;
    // The scene builder completes every mesh with its normals and face normals.
    ZR_ASSERT_AT(mesh.hasDerivedData(), kSourceFile, __LINE__);
    _hasTexCoords = mesh.getTextureCoordinateCount() != 0 && mesh.getTextureFaces() != nullptr;

    const GeAffineMatrix3<float>& toCamera = instance._toCamera;
    const unsigned int vertexCount = mesh.getVertexCount();
    _cameraPositions.reserve(vertexCount);
    _pixelPositions.reserve(vertexCount);
    const GePoint3<float>* vertices = mesh.getVertices();
    for (unsigned int i = 0; i < vertexCount; ++i) {
        const GePoint3<float> p = toCamera.transformPoint(vertices[i]);
        _cameraPositions.push_back(p);
        _pixelPositions.push_back(pixelMatrix.transform(p));
    }

    if (withNormals) {
        // The inverse transpose of the transform, so that normals stay perpendicular to the
        // surface under scaling and shear; not normalised here.
        const GeAffineMatrix3<float> normalMatrix = toCamera.computeInverse();
        const unsigned int normalCount = mesh.getNormalCount();
        _cameraNormals.reserve(normalCount);
        const GeVector3<float>* normals = mesh.getNormals();
        for (unsigned int i = 0; i < normalCount; ++i) _cameraNormals.push_back(normalMatrix.mulOnRight(normals[i]));
    }
    if (withTangents) computeTangents();
    computeBlockBoxes();
}

void RsInstanceVertices::prepareTangents() {
    if (!_tangentsReady) computeTangents();
}

// Per-normal surface directions along the first texture channel's u (_tangentsU) and v
// (_tangentsV), summed over the faces around each normal and normalised. A face's contribution is
// normalised on its own and not divided by its texture-space determinant, so that large and small
// faces weigh alike and a face of zero texture area adds nothing.
void RsInstanceVertices::computeTangents() {
    const SdMesh& mesh = *_mesh;
    const unsigned int normalCount = mesh.getNormalCount();
    _tangentsU.assign(normalCount, GeVector3<float>(0.0f, 0.0f, 0.0f));
    _tangentsV.assign(normalCount, GeVector3<float>(0.0f, 0.0f, 0.0f));
    for (SdMesh::FaceConstIterator it = mesh.beginFaces(); !it.atEnd(); ++it) {
        const SdMesh::Face& face = *it;
        const GePoint3<float>& p0 = _cameraPositions[face.getVertexIndex(0)];
        const GeVector3<float> e1 = _cameraPositions[face.getVertexIndex(1)] - p0;
        const GeVector3<float> e2 = _cameraPositions[face.getVertexIndex(2)] - p0;
        GePoint3<float> t[3] = {{1.0f, 0.0f, 0.0f}, {0.0f, 1.0f, 0.0f}, {0.0f, 0.0f, 1.0f}};
        if (_hasTexCoords)
            for (int c = 0; c < 3; ++c) t[c] = mesh.getTextureCoordinates()[face.getTextureIndex(c)];
        const float du1 = t[1].x - t[0].x, du2 = t[2].x - t[0].x;
        const float dv1 = t[1].y - t[0].y, dv2 = t[2].y - t[0].y;
        const GeVector3<float> a = normalizedOrSame(e2 * dv1 - e1 * dv2);
        const GeVector3<float> b = normalizedOrSame(e2 * du1 - e1 * du2);
        for (int c = 0; c < 3; ++c) {
            const unsigned int ni = face.getNormalIndex(c);
            _tangentsU[ni] += a;
            _tangentsV[ni] += b;
        }
    }
    for (GeVector3<float>& u : _tangentsU) u = normalizedOrSame(u);
    for (GeVector3<float>& v : _tangentsV) v = normalizedOrSame(v);
    _tangentsReady = true;
}

void RsInstanceVertices::computeBlockBoxes() {
    const SdMesh& mesh = *_mesh;
    const unsigned int faceCount = mesh.getFaceCount();
    _blockBoxes.assign((faceCount + kFacesPerBlock - 1) / kFacesPerBlock, Box{1.0, 0.0, 1.0, 0.0});
    if (faceCount == 0) return;
    const double inf = HUGE_VAL;
    Box box{inf, -inf, inf, -inf};
    bool bounded = true;
    for (SdMesh::FaceConstIterator it = mesh.beginFaces(); !it.atEnd(); ++it) {
        for (int c = 0; c < 3; ++c) {
            const GeHomogeneousCoord3<float>& p = _pixelPositions[it->getVertexIndex(c)];
            const double w = p.w;
            const double x = p.x / w;
            const double y = p.y / w;
            // A vertex at or behind the eye projects nowhere sensible, and a non-finite one
            // compares with nothing: such a block is never skipped.
            if (!(w > 0.0) || !std::isfinite(x) || !std::isfinite(y)) bounded = false;
            box = {std::min(box.x0, x), std::max(box.x1, x), std::min(box.y0, y), std::max(box.y1, y)};
        }
        const unsigned int index = it->getIndex();
        if (index % kFacesPerBlock == kFacesPerBlock - 1 || index + 1 == faceCount) {
            if (bounded) _blockBoxes[index / kFacesPerBlock] = box;
            box = {inf, -inf, inf, -inf};
            bounded = true;
        }
    }
    const std::size_t blocks = _blockBoxes.size();
    _groupBoxes.resize((blocks + kBlocksPerGroup - 1) / kBlocksPerGroup);
    for (std::size_t g = 0; g < _groupBoxes.size(); ++g) {
        Box group{inf, -inf, inf, -inf};
        for (std::size_t b = g * kBlocksPerGroup; b < std::min(blocks, (g + 1) * kBlocksPerGroup); ++b) {
            const Box& block = _blockBoxes[b];
            if (block.x0 > block.x1) {
                group = Box{1.0, 0.0, 1.0, 0.0};
                break;
            }
            group = {std::min(group.x0, block.x0), std::max(group.x1, block.x1), std::min(group.y0, block.y0),
                     std::max(group.y1, block.y1)};
        }
        _groupBoxes[g] = group;
    }
}

unsigned int RsInstanceVertices::nextFaceNear(unsigned int face, unsigned int end,
                                              const GeRectangle<int>& region) const {
    constexpr unsigned int kFacesPerGroup = kFacesPerBlock * kBlocksPerGroup;
    while (face < end) {
        if (misses(_groupBoxes[face / kFacesPerGroup], region)) {
            face = (face / kFacesPerGroup + 1) * kFacesPerGroup;
        } else if (misses(_blockBoxes[face / kFacesPerBlock], region)) {
            face = (face / kFacesPerBlock + 1) * kFacesPerBlock;
        } else {
            return face;
        }
    }
    return end;
}

bool RsInstanceVertices::misses(const Box& box, const GeRectangle<int>& region) {
    if (box.x0 > box.x1) return false;
    // The clipper tests x - x0 * w < 0 on the undivided coordinates; the margin, far above the
    // rounding of either form, makes sure that a box passed over here is one whose every vertex
    // fails that test.
    const auto margin = [](double limit) { return 1e-6 * (1.0 + std::fabs(limit)); };
    const double x0 = region.x0, x1 = region.x1, y0 = region.y0, y1 = region.y1;
    return box.x1 < x0 - margin(x0) || box.x0 > x1 + margin(x1) || box.y1 < y0 - margin(y0) ||
           box.y0 > y1 + margin(y1);
}

}  // namespace Zr
