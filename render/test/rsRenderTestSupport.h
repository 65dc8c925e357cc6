#pragma once
// Helpers of the region and mesh drawing tests: a material of one constant colour (or of its
// texture coordinates), a buffer that records every fragment the drawing paths make, with a factory
// of a chosen region limit, and makers of meshes, instances and scenes.
#include <cmath>
#include <cstdint>
#include <map>
#include <memory>
#include <vector>

#include "coRgbaColorTyped.h"
#include "geAffineMatrix3.h"
#include "geFrustum.h"
#include "geProjectiveMatrix3.h"
#include "geRectangle.h"
#include "rcBase.h"
#include "rcShdPtr.h"
#include "rsCullAndSort.h"
#include "rsGeomInstance.h"
#include "rsMaterialShader.h"
#include "rsPixelData.h"
#include "rsPixelSpan.h"
#include "rsRasterizer.h"
#include "rsScene.h"
#include "rsSceneRenderer.h"
#include "rsShadingInputs.h"
#include "rsTransferFunc.h"
#include "rsVertices.h"
#include "sdMaterial.h"
#include "sdMeshBuilder.h"

namespace Zr::RenderTest {

// Answers one colour, or with texCoordColour the fragment's texture coordinates as (s, t, 0, 1).
// Counts its locks so that a test can see them balanced.
class ConstantMaterial : public RsMaterialShader {
public:
    struct Settings {
        CoRgbaColorTyped<float> colour{1.0f, 1.0f, 1.0f, 1.0f};
        SdMaterial::TransferMode mode = SdMaterial::TransferMode::normal;
        unsigned int needed = 0;
        bool texCoordColour = false;
        bool wireframe = false;
        bool screenSpace = true;
        float wireSize = 1.0f;
    };

    explicit ConstantMaterial(const Settings& settings)
        : RsMaterialShader(makeMaterial(settings)), _settings(settings) {}

    CoRgbaColorTyped<float> shade(RsShadingContext& context) override {
        if (_settings.texCoordColour)
            return {static_cast<float>(context._texCoord.x), static_cast<float>(context._texCoord.y), 0.0f,
                    1.0f};
        return _settings.colour;
    }
    unsigned int getNeededContext() const override { return _settings.needed; }

    int _locks = 0;
    int _unlocks = 0;

protected:
    void lockMemoryImpl() override { ++_locks; }
    void unlockMemoryImpl() override { ++_unlocks; }

private:
    static RCShdPtr<const SdMaterial> makeMaterial(const Settings& settings) {
        RCShdPtr<SdMaterial> material = makeShared<SdMaterial>();
        material->_transferMode = settings.mode;
        material->_wireframe = settings.wireframe;
        material->_screenSpace = settings.screenSpace;
        material->_wireSize = settings.wireSize;
        return material;
    }

    Settings _settings;
};

// One fragment as the drawing paths delivered it.
struct Fragment {
    double depth;
    CoRgbaColorTyped<float> colour;
    GePoint2<double> texCoord;
    GeLinearMatrix2<double> texDerivatives;
    GePoint3<float> eyeCoord;
    GeVector3<float> normal;
};

// Fragments per absolute pixel, over all regions of a render, in drawing order.
struct Recording {
    std::map<std::pair<int, int>, std::vector<Fragment>> pixels;
    std::vector<GeRectangle<int>> regions;  // in the order they were finalised
    int buffersAlive = 0;
    int maxBuffersAlive = 0;
    int outside = 0;  // fragments that landed outside their region: a clipping fault
};

// Shades every covered pixel like a fragment buffer and records the result.
class RecordingBuffer : public RCObject {
public:
    struct Context {
        RsTransferFunc::Function _transfer = nullptr;
        bool _canBeOpaque = false;
        mutable RsShadingContext _shadingContext;
        RsMaterialShader* _material = nullptr;
    };

    RecordingBuffer(const GeRectangle<int>& region, Recording& recording)
        : _region(region),
          _recording(recording),
          _plain(*this, &RecordingBuffer::drawSpan<RsPlainVertex>, region, 16, 16),
          _normal(*this, &RecordingBuffer::drawSpan<RsNormalVertex>, region, 16, 16),
          _tangent(*this, &RecordingBuffer::drawSpan<RsTangentVertex>, region, 16, 16) {
        if (++_recording.buffersAlive > _recording.maxBuffersAlive)
            _recording.maxBuffersAlive = _recording.buffersAlive;
    }
    ~RecordingBuffer() override { --_recording.buffersAlive; }

    GeRectangle<int> getPixelRegion() const { return _region; }

    template <class V>
    const auto& getRasterizer() const {
        if constexpr (std::is_same_v<V, RsPlainVertex>) return _plain;
        else if constexpr (std::is_same_v<V, RsNormalVertex>) return _normal;
        else return _tangent;
    }

    template <class V>
    void drawSpan(const Context& context, int row, const RsPixelSpan<0, 0>& span, RsPixelData<V>& data) {
        for (int x = span._x1; x < span._x2; ++x) {
            const int px = _region.x0 + x, py = _region.y0 + row;
            rsFillShadingContext(context._shadingContext, data);
            Fragment f{};
            f.depth = data._z._q;
            f.colour = context._material->shade(context._shadingContext);
            f.texCoord = context._shadingContext._texCoord;
            f.texDerivatives = context._shadingContext._texCoordDerivatives;
            f.eyeCoord = context._shadingContext._eyeCoord;
            if constexpr (RsPixelData<V>::kHasNormal) f.normal = context._shadingContext._normal;
            if (!_region.contains(px, py)) ++_recording.outside;
            _pending[{px, py}].push_back(f);
            data.stepX();
        }
    }

    void finalize() {
        for (auto& [pixel, fragments] : _pending)
            for (const Fragment& f : fragments) _recording.pixels[pixel].push_back(f);
        _recording.regions.push_back(_region);
        _pending.clear();
    }

private:
    GeRectangle<int> _region;
    Recording& _recording;
    std::map<std::pair<int, int>, std::vector<Fragment>> _pending;
    RsRasterizer<RecordingBuffer, RsPlainVertex, RsPixelSpan<0, 0>> _plain;
    RsRasterizer<RecordingBuffer, RsNormalVertex, RsPixelSpan<0, 0>> _normal;
    RsRasterizer<RecordingBuffer, RsTangentVertex, RsPixelSpan<0, 0>> _tangent;
};

class RecordingFactory {
public:
    RecordingFactory(const GeRectangle<int>& pixelRegion, int maxArea, Recording& recording)
        : _pixelRegion(pixelRegion), _maxArea(maxArea), _recording(recording) {}

    GeRectangle<int> getPixelRegion() const { return _pixelRegion; }
    int getMaxArea() const { return _maxArea; }
    int getKernelSize() const { return 0; }
    RCShdPtr<RecordingBuffer> createBuffer(const GeRectangle<int>& region) {
        return makeShared<RecordingBuffer>(region, _recording);
    }

private:
    GeRectangle<int> _pixelRegion;
    int _maxArea;
    Recording& _recording;
};

// A mesh of the given vertices and triangles, with derived data and optional texture coordinates.
inline RCShdPtr<const SdMesh> makeMesh(const std::vector<GePoint3<float>>& vertices,
                                       const std::vector<std::uint32_t>& triangles,
                                       const std::vector<GePoint3<float>>& texCoords = {}) {
    SdMeshBuilder builder;
    builder.setVertices(vertices).setTriangles(triangles);
    if (!texCoords.empty()) builder.addTextureChannel(texCoords);
    return builder.build();
}

inline RCShdPtr<RsGeomInstance> makeInstance(const RCShdPtr<const SdMesh>& mesh,
                                             const RCShdPtr<RsMaterialShader>& material,
                                             const GeAffineMatrix3<float>& matrix = GeAffineMatrix3<float>(),
                                             std::int32_t renderOrder = 0) {
    SdInstanceAttributes attributes;
    attributes._renderOrder = renderOrder;
    return makeShared<RsGeomInstance>(matrix, mesh, RsGeomInstance::MaterialList{material},
                                      RsGeomInstance::MaterialList{}, attributes, std::vector<unsigned int>{});
}

inline RCShdPtr<RsScene> makeScene(std::vector<RCShdPtr<RsGeomInstance>> instances) {
    RsScene::LightList lights;
    RsScene::CameraList cameras;
    return makeShared<RsScene>(instances, lights, cameras);
}

// A perspective projection of the given vertical field of view (radians), aspect 1, near n, far f.
inline GeProjectiveMatrix3<double> perspective(double fov, double n, double f) {
    const double c = 1.0 / std::tan(fov * 0.5);
    return GeProjectiveMatrix3<double>(c, 0, 0, 0,  //
                                       0, c, 0, 0,  //
                                       0, 0, (f + n) / (n - f), 2 * f * n / (n - f),  //
                                       0, 0, -1, 0);
}

// Draws scene through the scene renderer into recording buffers of at most maxArea pixels each;
// returns the number of fragments that landed outside their region.
inline int renderRecording(const RCShdPtr<RsScene>& scene, const GeAffineMatrix3<float>& worldToCamera,
                           const GeProjectiveMatrix3<double>& projection, const GeRectangle<int>& rectangle,
                           int maxArea, Recording& recording) {
    RecordingFactory factory(rectangle, maxArea, recording);
    RsSceneRenderer<RecordingFactory> renderer(factory);
    renderer.setup(worldToCamera, projection, rectangle);
    RsGeomInstanceList instances;
    const GeFrustum<double> frustum(projection);
    cullAndSortInstances(scene, true, frustum, worldToCamera, instances);
    renderer.renderRegion(instances, rectangle);
    return recording.outside;
}

}  // namespace Zr::RenderTest
