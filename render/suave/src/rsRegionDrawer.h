#pragma once
// The drawing state of one region: the region's buffer, the vertex data of the instance being
// drawn, and the paths that take the faces of a mesh to the buffer's rasterizers.
//
// setInstance transforms the instance's vertices for this region (camera space, homogeneous pixel
// space, normals and, when a material needs them, tangents); drawFaces draws a range of faces with
// one material along one of six paths, chosen by what the material needs (a plain, normal or
// tangent vertex) and whether it is drawn as wires. Every path does the same per face:
//   back-face test -> vertices from the transformed arrays -> clipping in homogeneous space
//   -> perspective division -> a fan of triangles into the buffer's rasterizer for that vertex.
// Wire faces first become a ring of six triangles (rsWireRing.h), each of which then goes that way.
//
// Buffer provides: a Context type (the drawing context handed to its span methods, with the
// transfer function, _canBeOpaque, the shading context and the material), and
// getRasterizer<Vertex>() for the vertex kinds it draws.
//
// The vertex data is recomputed for every instance in every region: regions are small so that a
// buffer's memory stays bounded, and that matters more than the repeated transforms.
#include <algorithm>
#include <cmath>
#include <vector>

#include "assertions.h"
#include "geAffineMatrix3.h"
#include "geHomogeneousCoord3.h"
#include "gePoint3.h"
#include "geProjectiveMatrix3.h"
#include "geRectangle.h"
#include "geVector3.h"
#include "rcShdPtr.h"
#include "rsGeomInstance.h"
#include "rsMaterialShader.h"
#include "rsPolygonClipper.h"
#include "rsShadingContext.h"
#include "rsTransferFunc.h"
#include "rsVertexAttributes.h"
#include "rsVertices.h"
#include "rsWireRing.h"
#include "sdMesh.h"

namespace Zr {

template <class Buffer>
class RsRegionDrawer {
public:
    using Context = typename Buffer::Context;

    // The near and far planes are clipped only for instances whose box crosses them; the four
    // sides of the region always, so that nothing is drawn outside the buffer.
    static constexpr unsigned int sidePlanes = 0x0fu;
    static constexpr unsigned int depthPlanes = 0x30u;

    RsRegionDrawer(const RCShdPtr<Buffer>& buffer, const GeProjectiveMatrix3<float>* pixelMatrix,
                   const GeRectangle<int>& region, bool orthographic)
        : _buffer(buffer),
          _pixelMatrix(pixelMatrix),
          _bounds{static_cast<float>(region.x0), static_cast<float>(region.x1),
                  static_cast<float>(region.y0), static_cast<float>(region.y1)},
          _orthographic(orthographic),
          _clipperPlain(region),
          _clipperNormal(region),
          _clipperTangent(region),
          _clipperDepth(region) {}

    RsRegionDrawer(const RsRegionDrawer&) = delete;
    RsRegionDrawer& operator=(const RsRegionDrawer&) = delete;

    // Makes the vertex data of the instance ready. Scene drawing passes withNormals and
    // withDepthOffset true and withTangents when a material of the instance needs a tangent frame.
    void setInstance(const RCShdPtr<RsGeomInstance>& instance, bool withNormals, bool withTangents,
                     bool withDepthOffset) {
        const RsGeomInstance& geom = *instance;
        _drawFrontFaces = geom._drawFrontFaces;
        _drawBackFaces = geom._drawBackFaces;
        _depthOffset = withDepthOffset ? static_cast<float>(geom._renderOrder) : 0.0f;
        _receivesShadows = geom._receivesShadows;
        const unsigned int planes = (geom._clipMask & depthPlanes) | sidePlanes;
        _clipperPlain.setClipFlags(planes);
        _clipperNormal.setClipFlags(planes);
        _clipperTangent.setClipFlags(planes);
        _clipperDepth.setClipFlags(planes);

        _mesh = geom._mesh;
        const SdMesh& mesh = *_mesh;
        // The scene builder completes every mesh with its normals and face normals.
        ZR_ASSERT_AT(mesh.hasDerivedData(), "render\\suave\\src\\rsRegionDrawer", __LINE__);
        _hasTexCoords = mesh.getTextureCoordinateCount() != 0 && mesh.getTextureFaces() != nullptr;
        const GeAffineMatrix3<float>& toCamera = geom._toCamera;
        _normalMatrix = toCamera.computeInverse();

        const unsigned int vertexCount = mesh.getVertexCount();
        _cameraPositions.clear();
        _pixelPositions.clear();
        _cameraPositions.reserve(vertexCount);
        _pixelPositions.reserve(vertexCount);
        const GePoint3<float>* vertices = mesh.getVertices();
        for (unsigned int i = 0; i < vertexCount; ++i) {
            const GePoint3<float> p = toCamera.transformPoint(vertices[i]);
            _cameraPositions.push_back(p);
            _pixelPositions.push_back(_pixelMatrix->transform(p));
        }

        _cameraNormals.clear();
        if (withNormals) {
            const unsigned int normalCount = mesh.getNormalCount();
            _cameraNormals.reserve(normalCount);
            const GeVector3<float>* normals = mesh.getNormals();
            // The inverse transpose of the transform, so that normals stay perpendicular to the
            // surface under scaling and shear; not normalised here.
            for (unsigned int i = 0; i < normalCount; ++i)
                _cameraNormals.push_back(_normalMatrix.mulOnRight(normals[i]));
        }
        _tangentsReady = false;
        if (withTangents) computeTangents(mesh);
    }

    // Draws faces firstFace up to but not including endFace (both clamped to the mesh) with the
    // material, which is locked in memory meanwhile.
    void drawFaces(const RCShdPtr<RsMaterialShader>& material, unsigned int firstFace,
                   unsigned int endFace) {
        _material = material;
        RsMaterialShader& shader = *_material;
        const SdMaterial::TransferMode mode = shader.getTransferMode();
        _context._transfer = RsTransferFunc::getFunction(mode);
        _context._canBeOpaque = RsTransferFunc::canBeOpaque(mode);
        _context._material = &shader;
        _context._shadingContext._receivesShadows = _receivesShadows;
        _context._shadingContext._orthographic = _orthographic;

        shader.lockMemory();
        struct Unlock {
            RsMaterialShader& shader;
            ~Unlock() { shader.unlockMemory(); }
        } unlock{shader};

        const unsigned int needed = shader.getNeededContext();
        const bool tangents = (needed & RsShadingContext::needsTangents) != 0;
        const bool normals = (needed & RsShadingContext::needsNormal) != 0;
        if (tangents && !_tangentsReady) computeTangents(*_mesh);
        if (shader.isWireframe()) {
            const bool screenSpace = shader.isScreenSpace();
            float wireSize = shader.getWireSize();
            if (screenSpace) wireSize *= 0.75f;
            if (tangents)
                drawWireFacesTangent(firstFace, endFace, screenSpace, wireSize);
            else if (normals)
                drawWireFacesNormal(firstFace, endFace, screenSpace, wireSize);
            else
                drawWireFacesPlain(firstFace, endFace, screenSpace, wireSize);
        } else {
            if (tangents)
                drawFacesTangent(firstFace, endFace);
            else if (normals)
                drawFacesNormal(firstFace, endFace);
            else
                drawFacesPlain(firstFace, endFace);
        }
    }

    // The per-instance data, for the depth paths and for diagnostics.
    const RCShdPtr<Buffer>& getBuffer() const { return _buffer; }
    const RCShdPtr<const SdMesh>& getMesh() const { return _mesh; }
    const std::vector<GePoint3<float>>& getCameraPositions() const { return _cameraPositions; }
    const std::vector<GeHomogeneousCoord3<float>>& getPixelPositions() const { return _pixelPositions; }
    const std::vector<GeVector3<float>>& getCameraNormals() const { return _cameraNormals; }
    const std::vector<GeVector3<float>>& getTangentsU() const { return _tangentsU; }
    const std::vector<GeVector3<float>>& getTangentsV() const { return _tangentsV; }
    float getDepthOffset() const { return _depthOffset; }
    bool isOrthographic() const { return _orthographic; }
    RsPolygonClipper<RsDepthVertex>& getDepthClipper() { return _clipperDepth; }

private:
    void drawFacesPlain(unsigned int first, unsigned int end) { drawSolidFaces<RsPlainVertex>(first, end); }
    void drawFacesNormal(unsigned int first, unsigned int end) { drawSolidFaces<RsNormalVertex>(first, end); }
    void drawFacesTangent(unsigned int first, unsigned int end) { drawSolidFaces<RsTangentVertex>(first, end); }
    void drawWireFacesPlain(unsigned int first, unsigned int end, bool screenSpace, float size) {
        drawWireFaces<RsPlainVertex>(first, end, screenSpace, size);
    }
    void drawWireFacesNormal(unsigned int first, unsigned int end, bool screenSpace, float size) {
        drawWireFaces<RsNormalVertex>(first, end, screenSpace, size);
    }
    void drawWireFacesTangent(unsigned int first, unsigned int end, bool screenSpace, float size) {
        drawWireFaces<RsTangentVertex>(first, end, screenSpace, size);
    }

    // Calls draw for each face of the clamped range, in order.
    template <class Draw>
    void forEachFace(unsigned int first, unsigned int end, Draw&& draw) {
        const SdMesh& mesh = *_mesh;
        const unsigned int count = mesh.getFaceCount();
        end = std::min(end, count);
        for (SdMesh::FaceConstIterator it(mesh.getFace(first)); it->getIndex() < end; ++it) draw(*it);
    }

    template <class V>
    void drawSolidFaces(unsigned int first, unsigned int end) {
        RsPolygonClipper<V>& clipper = clipperFor<V>();
        forEachFace(first, end, [&](const SdMesh::Face& face) {
            if (clipper.isOutside(GeHomogeneousCoord3<double>(_pixelPositions[face.getVertexIndex(0)]),
                                  GeHomogeneousCoord3<double>(_pixelPositions[face.getVertexIndex(1)]),
                                  GeHomogeneousCoord3<double>(_pixelPositions[face.getVertexIndex(2)])))
                return;
            V corners[3]{};
            if (!prepareFace(face, corners)) return;
            clipper.setTriangle(corners[0], corners[1], corners[2]);
            drawPolygon(clipper);
        });
    }

    template <class V>
    void drawWireFaces(unsigned int first, unsigned int end, bool screenSpace, float wireSize) {
        RsPolygonClipper<V>& clipper = clipperFor<V>();
        forEachFace(first, end, [&](const SdMesh::Face& face) {
            V ring[6]{};
            if (!prepareFace(face, ring)) return;
            ring[3] = ring[0];
            ring[4] = ring[1];
            ring[5] = ring[2];
            if (screenSpace)
                rsMakeWireRingInScreenSpace(ring, wireSize);
            else
                rsMakeWireRingInEyeSpace(ring, wireSize);
            for (const auto& t : rsWireRingTriangles) {
                clipper.setTriangle(ring[t[0]], ring[t[1]], ring[t[2]]);
                drawPolygon(clipper);
            }
        });
    }

    // The back-face test, then the first three vertices of the face from the transformed arrays,
    // before clipping and division. False when the face is not to be drawn.
    template <class V>
    bool prepareFace(const SdMesh::Face& face, V* corners) const {
        const GeVector3<float>& faceNormal = _cameraNormals[face.getFaceNormalIndex()];
        bool front;
        if (_orthographic) {
            front = faceNormal.z > 0.0f;
        } else {
            // Facing the eye when the normal points against the direction from the eye to the
            // face; a face seen exactly edge-on is a back face.
            const GePoint3<float>& p = _cameraPositions[face.getVertexIndex(0)];
            front = faceNormal.x * p.x + faceNormal.y * p.y + faceNormal.z * p.z < 0.0f;
        }
        if (front ? !_drawFrontFaces : !_drawBackFaces) return false;

        const SdMesh& mesh = *_mesh;
        for (int c = 0; c < 3; ++c) {
            V& v = corners[c];
            const unsigned int vi = face.getVertexIndex(c);
            v._pixCoord = GeHomogeneousCoord3<double>(_pixelPositions[vi]);
            v._eyeCoord = GePoint3<double>(_cameraPositions[vi]);
            if constexpr (RsHasNormal<V>) {
                const unsigned int ni = face.getNormalIndex(c);
                const GeVector3<float>& n = _cameraNormals[ni];
                // A back face is shaded from behind: its normals turn towards the eye. 0 - x
                // keeps a zero component positive.
                v._normal = front ? GePoint3<double>(n.x, n.y, n.z)
                                  : GePoint3<double>(0.0 - n.x, 0.0 - n.y, 0.0 - n.z);
                if constexpr (RsHasTangentFrame<V>) {
                    const GeVector3<float>& u = _tangentsU[ni];
                    const GeVector3<float>& w = _tangentsV[ni];
                    v._binormal = GePoint3<double>(u.x, u.y, u.z);
                    v._tangent = GePoint3<double>(w.x, w.y, w.z);
                }
            }
            if (_hasTexCoords) {
                v._texCoord = GePoint3<double>(mesh.getTextureCoordinates()[face.getTextureIndex(c)]);
            } else {
                // Without texture coordinates the face's own barycentric frame stands in.
                v._texCoord = GePoint3<double>(c == 0 ? 1.0 : 0.0, c == 1 ? 1.0 : 0.0, c == 2 ? 1.0 : 0.0);
            }
        }
        return true;
    }

    // Clips the clipper's polygon, divides it by w and draws it as a fan from its first vertex.
    template <class V>
    void drawPolygon(RsPolygonClipper<V>& clipper) {
        const int count = clipper.clip();
        if (count < 3) return;
        for (int i = 0; i < count; ++i) rsDivideVertex(clipper.getVertex(i), _depthOffset);
        const auto& rasterizer = _buffer->template getRasterizer<V>();
        const V& apex = clipper.getVertex(0);
        for (int i = 1; i + 1 < count; ++i)
            rasterizer.rasterizeTriangle(_context, apex, clipper.getVertex(i), clipper.getVertex(i + 1));
    }

    // Per-normal surface directions along the first texture channel's u (_tangentsU) and v
    // (_tangentsV), summed over the faces around each normal and normalised. A face's
    // contribution is normalised on its own and not divided by its texture-space determinant, so
    // that large and small faces weigh alike and a face of zero texture area adds nothing.
    void computeTangents(const SdMesh& mesh) {
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

    static GeVector3<float> normalizedOrSame(const GeVector3<float>& v) {
        const float length = v.length();
        return length != 0.0f ? v / length : v;
    }

    template <class V>
    RsPolygonClipper<V>& clipperFor() {
        if constexpr (std::is_same_v<V, RsPlainVertex>) return _clipperPlain;
        else if constexpr (std::is_same_v<V, RsNormalVertex>) return _clipperNormal;
        else if constexpr (std::is_same_v<V, RsTangentVertex>) return _clipperTangent;
        else return _clipperDepth;
    }

    RCShdPtr<Buffer> _buffer;
    const GeProjectiveMatrix3<float>* _pixelMatrix;
    float _bounds[4];  // the region: x0, x1, y0, y1
    bool _orthographic;
    RsPolygonClipper<RsPlainVertex> _clipperPlain;
    RsPolygonClipper<RsNormalVertex> _clipperNormal;
    RsPolygonClipper<RsTangentVertex> _clipperTangent;
    RsPolygonClipper<RsDepthVertex> _clipperDepth;
    bool _drawFrontFaces = true;
    bool _drawBackFaces = true;
    float _depthOffset = 0.0f;
    bool _receivesShadows = true;
    bool _hasTexCoords = false;
    bool _tangentsReady = false;
    RCShdPtr<const SdMesh> _mesh;
    GeAffineMatrix3<float> _normalMatrix;
    std::vector<GePoint3<float>> _cameraPositions;
    std::vector<GeHomogeneousCoord3<float>> _pixelPositions;
    std::vector<GeVector3<float>> _cameraNormals;
    std::vector<GeVector3<float>> _tangentsU;
    std::vector<GeVector3<float>> _tangentsV;
    // The transfer function, _canBeOpaque, shading context and material that the span methods
    // read; filled by drawFaces.
    Context _context;
    RCShdPtr<RsMaterialShader> _material;
};

}  // namespace Zr
