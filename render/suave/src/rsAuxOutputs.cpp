#include "rsAuxOutputs.h"

#include <algorithm>
#include <cmath>
#include <functional>

#include "rsFZBuffer.h"
#include "rsFZBufferFactory.h"
#include "rsGeomInstance.h"
#include "rsMaterialShader.h"
#include "rsPixelMatrix.h"

namespace Zr {

RsAuxOutputs::RsAuxOutputs(const GeRectangle<int>& region, bool surface, bool deep)
    : _region(region), _surface(surface), _deep(deep) {}

float RsAuxOutputs::getObjectIdOf(const RsGeomInstance& instance) const {
    const auto it = _objectIds.find(&instance);
    return it == _objectIds.end() ? 0.0f : it->second;
}

float RsAuxOutputs::getMaterialIdOf(const RsMaterialShader& material) const {
    const auto it = _materialIds.find(material.getMaterial().get());
    return it == _materialIds.end() ? 0.0f : it->second;
}

void RsAuxOutputs::begin(const RsScene& scene, const GeAffineMatrix3<float>& worldToCamera,
                         const GeProjectiveMatrix3<double>& projection) {
    const std::size_t pixels = std::size_t(std::max(0, _region.x1 - _region.x0)) *
                               std::size_t(std::max(0, _region.y1 - _region.y0));
    // The threshold of 1 means the opaque test's tolerance: an alpha a hair below 1 counts.
    _minAlpha = _threshold * (1.0f - 1.1920929e-7f);
    _nearest.assign(_surface ? pixels : 0, kNone);
    for (std::vector<float>* channel : {&_z, &_objectId, &_materialId}) channel->assign(_surface ? pixels : 0, 0.0f);
    _normal.assign(_surface ? 3 * pixels : 0, 0.0f);
    _position.assign(_surface ? 3 * pixels : 0, 0.0f);
    _texCoord.assign(_surface ? 2 * pixels : 0, 0.0f);
    _deepOffsets.assign(_deep ? pixels : 0, 0);
    _deepCounts.assign(_deep ? pixels : 0, 0);
    _deepSamples.clear();
    _fragmentIds.clear();
    // Room for one fragment per pixel of a region, so that the span methods seldom grow it.
    if (_deep) _fragmentIds.reserve(std::min<std::size_t>(pixels, RsFZBufferFactory::kMaxArea));

    _worldToCamera = worldToCamera;
    _cameraToWorld = worldToCamera.computeInverse();
    _a = projection(2, 2);
    _b = projection(2, 3);
    _c = projection(3, 2);
    _e = projection(3, 3);

    _objectIds.clear();
    _materialIds.clear();
    _objectNames.clear();
    _materialNames.clear();
    float object = 0.0f;
    for (const RCShdPtr<RsGeomInstance>& instance : scene._geomInstances) {
        const RsGeomInstance& geom = *instance;
        _objectIds.emplace(&geom, object += 1.0f);
        _objectNames.push_back(geom._name);
        for (const RCShdPtr<RsMaterialShader>& material : geom._materials) {
            const SdMaterial* key = material->getMaterial().get();
            if (_materialIds.emplace(key, static_cast<float>(_materialIds.size() + 1)).second)
                _materialNames.push_back(key != nullptr ? key->_name : std::string());
        }
    }
}

void RsAuxOutputs::setMotionTarget(const RsScene& later, const GeAffineMatrix3<float>& laterWorldToCamera,
                                   const GeProjectiveMatrix3<double>& laterProjection) {
    _surface = true;
    _hasTarget = true;
    _laterMatrices.clear();
    for (const RCShdPtr<RsGeomInstance>& instance : later._geomInstances) _laterMatrices.push_back(instance->_matrix);
    _laterWorldToCamera = laterWorldToCamera;
    _laterProjection = laterProjection;
}

void RsAuxOutputs::beginMotion(const RsScene& scene, const GeRectangle<int>& rectangle) {
    _toLaterPixels.clear();
    _motion.assign(_hasTarget ? 2 * _objectId.size() : 0, 0.0f);
    if (!_hasTarget) return;
    const GeProjectiveMatrix3<double> view = rsPixelMatrix<double>(_laterProjection, rectangle) *
                                             GeProjectiveMatrix3<double>(GeAffineMatrix3<double>(_laterWorldToCamera));
    for (std::size_t i = 0; i < scene._geomInstances.size(); ++i) {
        // A point of the instance now, carried to the same point of the instance later.
        const GeAffineMatrix3<double> now(scene._geomInstances[i]->_matrix);
        const GeAffineMatrix3<double> move = i < _laterMatrices.size()
                                                 ? GeAffineMatrix3<double>(_laterMatrices[i]) * now.computeInverse()
                                                 : GeAffineMatrix3<double>();
        _toLaterPixels.push_back(view * move);
    }
}

void RsAuxOutputs::recordMotion(std::size_t index, const GePoint3<float>& world, double pixelX, double pixelY) {
    const std::size_t object = std::size_t(_objectId[index]) - 1;
    if (object >= _toLaterPixels.size()) return;
    const GeHomogeneousCoord3<double> later =
        _toLaterPixels[object].transform(GePoint3<double>(world.x, world.y, world.z));
    if (!(later.w > 0.0)) return;
    _motion[2 * index] = static_cast<float>(later.x / later.w - pixelX);
    _motion[2 * index + 1] = static_cast<float>(later.y / later.w - pixelY);
}

float RsAuxOutputs::eyeDepthOf(double pixelDepth) const {
    // Undo the viewport (0..1 from -1..1) and the projection's z and w rows.
    const double d = 2.0 * pixelDepth - 1.0;
    const double z = (_b - d * _e) / (d * _c - _a);
    return static_cast<float>(-z);
}

void RsAuxOutputs::finishRegion(const RsFZBuffer& buffer) {
    const int width = buffer.getWidth(), height = buffer.getHeight();
    if (_surface) {
        for (int row = 0; row < height; ++row) {
            const std::size_t first = indexOf(buffer.getX(), buffer.getY() + row);
            for (int x = 0; x < width; ++x) {
                const std::size_t i = first + std::size_t(x);
                if (_nearest[i] == kNone) continue;
                float* p = &_position[3 * i];
                float* n = &_normal[3 * i];
                _z[i] = -p[2];
                const GePoint3<float> world = _cameraToWorld.transformPoint(GePoint3<float>(p[0], p[1], p[2]));
                p[0] = world.x;
                p[1] = world.y;
                p[2] = world.z;
                // Normals go back through the transpose of the world-to-camera map.
                const GeVector3<float> m = _worldToCamera.mulOnRight(GeVector3<float>(n[0], n[1], n[2]));
                const float length = std::sqrt(m.x * m.x + m.y * m.y + m.z * m.z);
                const float scale = length > 0.0f ? 1.0f / length : 0.0f;
                n[0] = m.x * scale;
                n[1] = m.y * scale;
                n[2] = m.z * scale;
                if (_hasTarget) recordMotion(i, world, buffer.getX() + x + 0.5, buffer.getY() + row + 0.5);
            }
        }
    }
    if (_deep) {
        // The IDs of a fragment are found by its address among those the buffer made.
        const auto before = [](const FragmentIds& a, const FragmentIds& b) {
            return std::less<const RsFragment*>()(a.fragment, b.fragment);
        };
        std::sort(_fragmentIds.begin(), _fragmentIds.end(), before);
        RsFragment* const* lists = buffer.getLists();
        for (int row = 0; row < height; ++row) {
            const std::size_t first = indexOf(buffer.getX(), buffer.getY() + row);
            for (int x = 0; x < width; ++x) {
                const std::size_t i = first + std::size_t(x);
                const std::size_t offset = _deepSamples.size();
                for (const RsFragment* f = lists[std::size_t(row) * std::size_t(width) + std::size_t(x)]; f != nullptr;
                     f = f->_next) {
                    // What the fragment lays over nothing is its share of the pixel.
                    CoRgbaColorTyped<float> alone(0.0f, 0.0f, 0.0f, 1.0f);
                    f->_transfer(f->_color, CoRgbaColorTyped<float>(0.0f, 0.0f, 0.0f, 0.0f), alone);
                    const float z = eyeDepthOf(f->_depth);
                    const auto ids =
                        std::lower_bound(_fragmentIds.begin(), _fragmentIds.end(), FragmentIds{f, 0.0f, 0.0f}, before);
                    const bool known = ids != _fragmentIds.end() && ids->fragment == f;
                    _deepSamples.push_back({z, z, alone.r, alone.g, alone.b, alone.a, known ? ids->objectId : 0.0f,
                                            known ? ids->materialId : 0.0f});
                }
                // The list runs from far to near; the samples run nearest first.
                std::reverse(_deepSamples.begin() + std::ptrdiff_t(offset), _deepSamples.end());
                _deepOffsets[i] = static_cast<std::uint32_t>(offset);
                _deepCounts[i] = static_cast<std::uint32_t>(_deepSamples.size() - offset);
            }
        }
        _fragmentIds.clear();
    }
}

}  // namespace Zr
