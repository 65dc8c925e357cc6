#pragma once
// Helpers of the renderer tests: a material whose colour is a constant or a function of the
// shading context, a float picture to render into, and makers of meshes, instances, scenes and
// projections.
#include <cmath>
#include <cstdint>
#include <cstring>
#include <functional>
#include <vector>

#include "coRgbaColorTyped.h"
#include "geAffineMatrix3.h"
#include "geProjectiveMatrix3.h"
#include "geRectangle.h"
#include "ixPixelFormat.h"
#include "ixTile.h"
#include "ixWriteGuard.h"
#include "rcShdPtr.h"
#include "rsGeomInstance.h"
#include "rsMaterialShader.h"
#include "rsRenderer.h"
#include "rsScene.h"
#include "sdMaterial.h"
#include "sdMeshBuilder.h"

namespace Zr::RenderTest {

using Rgba = CoRgbaColorTyped<float>;

// Answers `colour`, or probe(context) when a probe is given, so that a picture shows what the
// drawing paths handed to the shader at each pixel centre.
class ProbeMaterial : public RsMaterialShader {
public:
    struct Settings {
        Rgba colour{1.0f, 1.0f, 1.0f, 1.0f};
        std::function<Rgba(const RsShadingContext&)> probe;
        SdMaterial::TransferMode mode = SdMaterial::TransferMode::normal;
        unsigned int needed = 0;
        bool wireframe = false;
        bool screenSpace = true;
        float wireSize = 1.0f;
    };

    explicit ProbeMaterial(const Settings& settings) : RsMaterialShader(makeMaterial(settings)), _settings(settings) {}

    Rgba shade(RsShadingContext& context) override {
        return _settings.probe ? _settings.probe(context) : _settings.colour;
    }
    unsigned int getNeededContext() const override { return _settings.needed; }

protected:
    void lockMemoryImpl() override {}
    void unlockMemoryImpl() override {}

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

// The add mode with colour 1: a pixel's red is the number of fragments drawn there.
inline ProbeMaterial::Settings counting(unsigned int needed = 0) {
    ProbeMaterial::Settings settings;
    settings.mode = SdMaterial::TransferMode::add;
    settings.needed = needed;
    return settings;
}

// A float RGBA tile over rect, every pixel set to `initial`.
struct Picture {
    explicit Picture(const GeRectangle<int>& rect, const Rgba& initial = {0.0f, 0.0f, 0.0f, 0.0f})
        : tile(IxPixelFormat(IxPixelFormat::Comps(4), IxPixelFormat::Depth(32)), rect, initial), guard(tile) {}
    Rgba at(int x, int y) const {
        Rgba c;
        std::memcpy(&c, guard.getPixelAddress(x, y), sizeof(c));
        return c;
    }
    bool operator==(const Picture& o) const {
        const GeRectangle<int>& r = tile.getRectangle();
        for (int y = r.y0; y < r.y1; ++y)
            if (std::memcmp(guard.getPixelAddress(r.x0, y), o.guard.getPixelAddress(r.x0, y), 16 * r.getWidth()))
                return false;
        return true;
    }
    IxTile tile;
    IxWriteGuard guard;
};

inline RCShdPtr<const SdMesh> makeMesh(const std::vector<GePoint3<float>>& vertices,
                                       const std::vector<std::uint32_t>& triangles,
                                       const std::vector<GePoint3<float>>& texCoords = {}) {
    SdMeshBuilder builder;
    builder.setVertices(vertices).setTriangles(triangles);
    if (!texCoords.empty()) builder.addTextureChannel(texCoords);
    return builder.build();
}

inline RCShdPtr<RsGeomInstance> makeInstance(const RCShdPtr<const SdMesh>& mesh, const ProbeMaterial::Settings& settings,
                                             const GeAffineMatrix3<float>& matrix = GeAffineMatrix3<float>()) {
    return makeShared<RsGeomInstance>(matrix, mesh, RsGeomInstance::MaterialList{makeShared<ProbeMaterial>(settings)},
                                      RsGeomInstance::MaterialList{}, SdInstanceAttributes(), std::vector<unsigned int>{});
}

inline RCShdPtr<RsScene> makeScene(std::vector<RCShdPtr<RsGeomInstance>> instances) {
    RsScene::LightList lights;
    RsScene::CameraList cameras;
    return makeShared<RsScene>(instances, lights, cameras);
}

// Camera space to -1..1: a perspective of vertical opening fov (radians) and aspect 1.
inline GeProjectiveMatrix3<double> perspective(double fov, double n, double f) {
    const double c = 1.0 / std::tan(fov * 0.5);
    return GeProjectiveMatrix3<double>(c, 0, 0, 0, 0, c, 0, 0, 0, 0, (f + n) / (n - f), 2 * f * n / (n - f), 0, 0, -1, 0);
}

// Draws scene over rectangle into picture, whose tile may cover only a part of it.
inline void render(const RCShdPtr<RsScene>& scene, const GeProjectiveMatrix3<double>& projection,
                   const GeRectangle<int>& rectangle, Picture& picture) {
    RsRenderer().render(GeAffineMatrix3<float>(), projection, scene, rectangle, picture.guard);
}

}  // namespace Zr::RenderTest
