#pragma once
// One render call's drawing of a scene into the pixel region of a buffer factory: the matrices of
// the view, and the division of the region into pieces small enough for one buffer each.
//
// A region whose area is within the factory's getMaxArea is drawn as one; a larger one is cut into
// four at its middle, recursively. Each quadrant is grown by the factory's kernel size towards the
// middle, so that with a filter the quadrants overlap by twice that and each holds the fragments
// that its filter footprint reads. The instances' vertex data is made once, before the first
// region (rsInstanceVertices.h). One region's buffer exists at a time: it is created, every
// instance of the list is drawn into it, it is finalised into the output and released before the
// next region starts.
#include <ostream>
#include <utility>
#include <vector>

#include "assertions.h"
#include "geAffineMatrix3.h"
#include "geProjectiveMatrix3.h"
#include "geRectangle.h"
#include "rcShdPtr.h"
#include "rsCullAndSort.h"
#include "rsGeomInstance.h"
#include "rsInstanceVertices.h"
#include "rsPixelMatrix.h"
#include "rsRegionDrawer.h"
#include "rsShadingContext.h"

namespace Zr {

template <class Factory>
class RsSceneRenderer {
public:
    using Buffer = typename Factory::Buffer;

    explicit RsSceneRenderer(Factory& factory) : _factory(&factory) {}

    // Takes the view of the call. The pixel matrix maps camera space onto the pixels of rectangle:
    // the projection to -1..1 first, then x and y onto the rectangle and depth onto 0..1.
    void setup(const GeAffineMatrix3<float>& worldToCamera, const GeProjectiveMatrix3<double>& projection,
               const GeRectangle<int>& rectangle) {
        _worldToCamera = worldToCamera;
        _projection = projection;
        _region = rectangle;
        _pixelMatrix = rsPixelMatrix<float>(projection, rectangle);
        _orthographic = projection(3, 2) == 0.0;
    }

    // Draws the instances into region. Their vertex data is made once for the call; the region
    // is then divided while its area exceeds the factory's limit.
    void renderRegion(const RsGeomInstanceList& instances, const GeRectangle<int>& region) {
        std::vector<RsInstanceVertices> vertices;
        vertices.reserve(instances.size());
        for (const RCShdPtr<RsGeomInstance>& instance : instances)
            vertices.emplace_back(*instance, _pixelMatrix, true, needsTangents(*instance));
        renderPieces(instances, vertices, region);
    }

    // The shadow pass of a light: draws the instances into the factory's whole pixel region as one
    // region, however large, since a map must not be cut. A depth buffer takes the faces' depths
    // alone; a fragment buffer draws each face group with the instance's shadow shader, whose
    // colour is what the surface lets through. No instance is offset in depth.
    void renderShadowPass(const RsGeomInstanceList& instances) {
        std::vector<RsInstanceVertices> vertices;
        vertices.reserve(instances.size());
        for (const RCShdPtr<RsGeomInstance>& instance : instances)
            vertices.emplace_back(*instance, _pixelMatrix, true, false);
        _shadowPass = true;
        renderLeaf(instances, vertices, _factory->getPixelRegion());
    }

    const GeProjectiveMatrix3<double>& getProjection() const { return _projection; }
    const GeAffineMatrix3<float>& getWorldToCamera() const { return _worldToCamera; }

    void dump(std::ostream& os) const {
        os << " _factory: " << static_cast<const void*>(_factory) << " _region:";
        _region.dump(os);
        os << " _projection:";
        _projection.dump(os);
        os << " _pixelMatrix:";
        _pixelMatrix.dump(os);
        os << " _worldToCamera:";
        _worldToCamera.dump(os);
        os << " _orthographic: " << _orthographic;
    }

private:
    void renderPieces(const RsGeomInstanceList& instances, std::vector<RsInstanceVertices>& vertices,
                      const GeRectangle<int>& region) {
        const long long area = static_cast<long long>(region.x1 - region.x0) *
                               static_cast<long long>(region.y1 - region.y0);
        if (area <= _factory->getMaxArea()) {
            renderLeaf(instances, vertices, region);
            return;
        }
        const int k = _factory->getKernelSize();
        const int mx = static_cast<int>((static_cast<double>(region.x0) + region.x1) * 0.5);
        const int my = static_cast<int>((static_cast<double>(region.y0) + region.y1) * 0.5);
        renderPieces(instances, vertices, GeRectangle<int>(region.x0, mx + k, region.y0, my + k));
        renderPieces(instances, vertices, GeRectangle<int>(mx - k, region.x1, region.y0, my + k));
        renderPieces(instances, vertices, GeRectangle<int>(region.x0, mx + k, my - k, region.y1));
        renderPieces(instances, vertices, GeRectangle<int>(mx - k, region.x1, my - k, region.y1));
    }

    void renderLeaf(const RsGeomInstanceList& instances, std::vector<RsInstanceVertices>& vertices,
                    const GeRectangle<int>& region) {
        RCShdPtr<Buffer> buffer(_factory->createBuffer(region));  // depth factories hand out a plain pointer
        {
            RsRegionDrawer<Buffer> drawer(buffer, region, _orthographic);
            if constexpr (requires { _factory->getAuxOutputs(); })
                if (!_shadowPass) drawer.setAuxOutputs(_factory->getAuxOutputs());
            for (std::size_t i = 0; i < instances.size(); ++i) {
                if constexpr (requires { requires Buffer::kDepthOnly; })
                    drawDepthInstance(drawer, *instances[i], vertices[i]);
                else
                    drawInstance(drawer, *instances[i], vertices[i]);
            }
            buffer->finalize();
        }
    }

    // True when a material of the instance shades with a tangent frame.
    static bool needsTangents(const RsGeomInstance& geom) {
        const unsigned int groups = geom._mesh->getFaceGroupCount();
        const RsGeomInstance::MaterialList& materials = geom._materials;
        if (materials.empty()) return false;
        for (unsigned int g = 0; g < groups; ++g)
            if ((materials[g % materials.size()]->getNeededContext() & RsShadingContext::needsTangents) != 0)
                return true;
        return false;
    }

    void drawInstance(RsRegionDrawer<Buffer>& drawer, const RsGeomInstance& geom, RsInstanceVertices& vertices) {
        const SdMesh& mesh = *geom._mesh;
        const unsigned int groups = mesh.getFaceGroupCount();
        const RsGeomInstance::MaterialList& materials = _shadowPass ? geom._shadowMaterials : geom._materials;
        const std::size_t materialCount = materials.size();
        // Face group g takes material g modulo the count, which needs a material.
        constexpr const char* kSourceFile = "render\\suave\\src\\rsSceneRenderer";
        ZR_ASSERT_AT(groups == 0 || materialCount != 0, kSourceFile, __LINE__);
        drawer.setInstance(geom, vertices, !_shadowPass);
        for (unsigned int g = 0; g < groups; ++g) {
            const SdMeshTypes::FaceGroup& group = mesh.getFaceGroup(g);
            drawer.drawFaces(materials[g % materialCount], group._firstFace,
                             group._firstFace + group._faceCount);
        }
    }

    // A depth buffer takes every face of the instance as depth alone, with no material.
    static void drawDepthInstance(RsRegionDrawer<Buffer>& drawer, const RsGeomInstance& geom,
                                  RsInstanceVertices& vertices) {
        drawer.setInstance(geom, vertices, false);
        drawer.drawDepthFaces(0, geom._mesh->getFaceCount());
    }

    Factory* _factory;
    GeRectangle<int> _region;
    GeProjectiveMatrix3<double> _projection;
    GeProjectiveMatrix3<float> _pixelMatrix;
    GeAffineMatrix3<float> _worldToCamera;
    bool _orthographic = false;
    bool _shadowPass = false;  // drawing a light's map rather than the camera's picture
};

}  // namespace Zr
