#pragma once
// The drawing state of one region: the region's buffer, the vertex data of the instance being
// drawn, and the paths that take the faces of a mesh to the buffer's rasterizers.
//
// setInstance takes the instance's vertex data, transformed once for the whole render call
// (rsInstanceVertices.h); drawFaces draws a range of faces with one material along one of six
// paths, chosen by what the material needs (a plain, normal or tangent vertex) and whether it is
// drawn as wires. Solid faces first pass the block test (runs of faces wholly beside the region
// are skipped); then every path does the same per face:
//   outside test -> back-face test -> vertices from the transformed arrays
//   -> clipping in homogeneous space -> perspective division
//   -> a fan of triangles into the buffer's rasterizer for that vertex.
// Wire faces first become a ring of six triangles (rsWireRing.h), each of which then goes that way.
//
// Buffer provides: a Context type (the drawing context handed to its span methods, with the
// transfer function, _canBeOpaque, the shading context and the material), and
// getRasterizer<Vertex>() for the vertex kinds it draws.
#include <algorithm>
#include <vector>

#include "geHomogeneousCoord3.h"
#include "gePoint3.h"
#include "geRectangle.h"
#include "geVector3.h"
#include "rcShdPtr.h"
#include "rsAuxOutputs.h"
#include "rsGeomInstance.h"
#include "rsInstanceVertices.h"
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
    static constexpr bool kIds = std::is_same_v<Context, RsDrawContext>;

    // The near and far planes are clipped only for instances whose box crosses them; the four
    // sides of the region always, so that nothing is drawn outside the buffer.
    static constexpr unsigned int sidePlanes = 0x0fu;
    static constexpr unsigned int depthPlanes = 0x30u;

    RsRegionDrawer(const RCShdPtr<Buffer>& buffer, const GeRectangle<int>& region, bool orthographic)
        : _buffer(buffer),
          _region(region),
          _orthographic(orthographic),
          _clipperPlain(region),
          _clipperNormal(region),
          _clipperTangent(region),
          _clipperDepth(region) {}

    RsRegionDrawer(const RsRegionDrawer&) = delete;
    RsRegionDrawer& operator=(const RsRegionDrawer&) = delete;

    // Takes the instance to draw next, with its vertex data for this render call. Scene drawing
    // passes withDepthOffset true.
    void setInstance(const RsGeomInstance& geom, RsInstanceVertices& vertices, bool withDepthOffset) {
        _drawFrontFaces = geom._drawFrontFaces;
        _drawBackFaces = geom._drawBackFaces;
        _depthOffset = withDepthOffset ? static_cast<float>(geom._renderOrder) : 0.0f;
        _receivesShadows = geom._receivesShadows;
        const unsigned int planes = (geom._clipMask & depthPlanes) | sidePlanes;
        _clipperPlain.setClipFlags(planes);
        _clipperNormal.setClipFlags(planes);
        _clipperTangent.setClipFlags(planes);
        _clipperDepth.setClipFlags(planes);
        _vertices = &vertices;
        if constexpr (kIds)
            if (_aux != nullptr) {
                _context._objectId = _aux->getObjectIdOf(geom);
                _context._hasTexCoords = vertices.hasTexCoords();
            }
    }

    // Renders with auxiliary outputs: the drawing context carries the IDs of instance and
    // material, and for the surface channels every face group is drawn with normals.
    void setAuxOutputs(const RsAuxOutputs* aux) {
        _aux = aux != nullptr && (aux->hasSurface() || aux->hasDeep()) ? aux : nullptr;
        _surfaceAux = _aux != nullptr && _aux->hasSurface();
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
        // The auxiliary outputs read the eye position and texture coordinates of every fragment.
        _context._needed = _surfaceAux ? needed | RsShadingContext::needsEyeCoord | RsShadingContext::needsTexCoord
                                           : needed;
        const bool tangents = (needed & RsShadingContext::needsTangents) != 0;
        const bool normals = (needed & RsShadingContext::needsNormal) != 0 || _surfaceAux;
        if constexpr (kIds)
            if (_aux != nullptr) _context._materialId = _aux->getMaterialIdOf(shader);
        if (tangents) _vertices->prepareTangents();
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

    // Shadow maps: draws faces firstFace up to endFace of the instance as depth alone, with no
    // material: the solid path's tests and clipping with depth vertices (eye z) into the buffer's
    // depth rasterizer.
    void drawDepthFaces(unsigned int firstFace, unsigned int endFace) {
        drawSolidFaces<RsDepthVertex>(firstFace, endFace);
    }

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

    // Calls draw for each face of [first, end) (end clamped to the mesh), in order; with
    // skipMisses, the blocks of faces that lie wholly beside the region are passed over.
    template <class Draw>
    void forEachFace(unsigned int first, unsigned int end, bool skipMisses, Draw&& draw) {
        const SdMesh& mesh = _vertices->getMesh();
        end = std::min(end, mesh.getFaceCount());
        constexpr unsigned int block = RsInstanceVertices::kFacesPerBlock;
        unsigned int start = first;
        while (start < end) {
            if (skipMisses) {
                start = _vertices->nextFaceNear(start, end, _region);
                if (start >= end) return;
            }
            const unsigned int stop = std::min(end, (start / block + 1) * block);
            for (SdMesh::FaceConstIterator it(mesh.getFace(start)); it->getIndex() < stop; ++it) draw(*it);
            start = stop;
        }
    }

    template <class V>
    void drawSolidFaces(unsigned int first, unsigned int end) {
        RsPolygonClipper<V>& clipper = clipperFor<V>();
        const std::vector<GeHomogeneousCoord3<float>>& pixels = _vertices->getPixelPositions();
        forEachFace(first, end, true, [&](const SdMesh::Face& face) {
            if (clipper.isOutside(GeHomogeneousCoord3<double>(pixels[face.getVertexIndex(0)]),
                                  GeHomogeneousCoord3<double>(pixels[face.getVertexIndex(1)]),
                                  GeHomogeneousCoord3<double>(pixels[face.getVertexIndex(2)])))
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
        // The ring's corners are the face's own or mixtures of them with weights in [0, 1], so the
        // ring lies within its face and a block beside the region holds no ring that reaches it;
        // only an eye-space ring of negative size grows outwards, and then every face is tried.
        const bool ringsInsideFaces = screenSpace || !(wireSize < 0.0f);
        forEachFace(first, end, ringsInsideFaces, [&](const SdMesh::Face& face) {
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
        const RsInstanceVertices& data = *_vertices;
        const std::vector<GePoint3<float>>& positions = data.getCameraPositions();
        const std::vector<GeVector3<float>>& normals = data.getCameraNormals();
        const GeVector3<float>& faceNormal = normals[face.getFaceNormalIndex()];
        bool front;
        if (_orthographic) {
            front = faceNormal.z > 0.0f;
        } else {
            // Facing the eye when the normal points against the direction from the eye to the
            // face; a face seen exactly edge-on is a back face.
            const GePoint3<float>& p = positions[face.getVertexIndex(0)];
            front = faceNormal.x * p.x + faceNormal.y * p.y + faceNormal.z * p.z < 0.0f;
        }
        if (front ? !_drawFrontFaces : !_drawBackFaces) return false;

        for (int c = 0; c < 3; ++c) {
            V& v = corners[c];
            const unsigned int vi = face.getVertexIndex(c);
            v._pixCoord = GeHomogeneousCoord3<double>(data.getPixelPositions()[vi]);
            if constexpr (RsHasEyeZ<V>) v._eyeZ = positions[vi].z;  // a depth vertex has nothing more
            else v._eyeCoord = GePoint3<double>(positions[vi]);
            if constexpr (RsHasNormal<V>) {
                const unsigned int ni = face.getNormalIndex(c);
                const GeVector3<float>& n = normals[ni];
                // A back face is shaded from behind: its normals turn towards the eye. 0 - x
                // keeps a zero component positive.
                v._normal = front ? GePoint3<double>(n.x, n.y, n.z)
                                  : GePoint3<double>(0.0 - n.x, 0.0 - n.y, 0.0 - n.z);
                if constexpr (RsHasTangentFrame<V>) {
                    const GeVector3<float>& u = data.getTangentsU()[ni];
                    const GeVector3<float>& w = data.getTangentsV()[ni];
                    v._binormal = GePoint3<double>(u.x, u.y, u.z);
                    v._tangent = GePoint3<double>(w.x, w.y, w.z);
                }
            }
            if constexpr (RsHasTexCoord<V>) {
                if (data.hasTexCoords()) {
                    v._texCoord = GePoint3<double>(data.getMesh().getTextureCoordinates()[face.getTextureIndex(c)]);
                } else {
                    // Without texture coordinates the face's own barycentric frame stands in.
                    v._texCoord = GePoint3<double>(c == 0 ? 1.0 : 0.0, c == 1 ? 1.0 : 0.0, c == 2 ? 1.0 : 0.0);
                }
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

    template <class V>
    RsPolygonClipper<V>& clipperFor() {
        if constexpr (std::is_same_v<V, RsPlainVertex>) return _clipperPlain;
        else if constexpr (std::is_same_v<V, RsNormalVertex>) return _clipperNormal;
        else if constexpr (std::is_same_v<V, RsDepthVertex>) return _clipperDepth;
        else {
            static_assert(std::is_same_v<V, RsTangentVertex>, "no clipper for this vertex kind");
            return _clipperTangent;
        }
    }

    RCShdPtr<Buffer> _buffer;
    GeRectangle<int> _region;
    bool _orthographic;
    RsPolygonClipper<RsPlainVertex> _clipperPlain;
    RsPolygonClipper<RsNormalVertex> _clipperNormal;
    RsPolygonClipper<RsTangentVertex> _clipperTangent;
    RsPolygonClipper<RsDepthVertex> _clipperDepth;
    bool _drawFrontFaces = true;
    bool _drawBackFaces = true;
    float _depthOffset = 0.0f;
    bool _receivesShadows = true;
    RsInstanceVertices* _vertices = nullptr;
    // The transfer function, _canBeOpaque, shading context and material that the span methods
    // read; filled by drawFaces.
    Context _context;
    RCShdPtr<RsMaterialShader> _material;
    const RsAuxOutputs* _aux = nullptr;
    bool _surfaceAux = false;
};

}  // namespace Zr
