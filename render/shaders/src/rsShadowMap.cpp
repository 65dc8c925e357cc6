#include "rsShadowMap.h"

#include "rsAreaFilter.h"

namespace Zr {

namespace {

const CoRgbColorTyped<float> kLit(1.0f, 1.0f, 1.0f);
const CoRgbColorTyped<float> kShadowed(0.0f, 0.0f, 0.0f);

// Where a query point falls in the map: u and v in cells, z the depth to compare with.
struct MapPosition {
    float u;
    float v;
    float z;
};

// x and y are projected to cells (divided by w, scaled by half the size, moved to the corner);
// z, the view-space depth plus the bias, is not divided.
inline MapPosition toMap(const GeProjectiveMatrix3<float>& matrix, float halfSize, float bias,
                         const GePoint3<float>& p) {
    const float* m = matrix._m;
    MapPosition q;
    q.z = m[2] * p.x + m[6] * p.y + m[10] * p.z + m[14] + bias;
    const float k = halfSize / (m[3] * p.x + m[7] * p.y + m[11] * p.z + m[15]);
    q.u = (m[0] * p.x + m[4] * p.y + m[8] * p.z + m[12]) * k + halfSize;
    q.v = (m[1] * p.x + m[5] * p.y + m[9] * p.z + m[13]) * k + halfSize;
    return q;
}

}  // namespace

CoRgbColorTyped<float> RsShadowMap::computeFastShadow(const GePoint3<float>& point) const {
    if (!_map) return kLit;
    const MapPosition q = toMap(_cameraToMap, _halfSize, _bias, point);
    // Outside the map's cells nothing casts a shadow.
    const int index = cellIndex(q.u, q.v);
    if (index < 0) return kLit;
    return static_cast<double>(q.z) > _map[index] ? kLit : kShadowed;
}

CoRgbColorTyped<float> RsShadowMap::computeBestShadow(const GePoint3<float>& point) const {
    if (!_map) return kLit;
    const MapPosition q = toMap(_cameraToMap, _halfSize, _bias, point);
    // The comparison is made with the same depth in every cell; a lit cell counts 1.
    const double z = q.z;
    const double* cells = _map.get();
    const float lit = rsAreaFilter(q.u, q.v, _halfRange, _intSize, 1.0f,
                                   [z, cells](int index) { return z > cells[index] ? 1.0f : 0.0f; });
    return {lit, lit, lit};
}

double* RsShadowMap::getMap() {
    if (!_map) _map = std::make_unique_for_overwrite<double[]>(getCellCount());
    return _map.get();
}

void RsShadowMap::setMatrices(const GeAffineMatrix3<float>& worldToShadowMap,
                              const GeProjectiveMatrix3<float>& projection) {
    keepMatrices(worldToShadowMap, projection);
    // The map keeps view-space depth: the projection's depth row becomes the identity's, so that
    // z passes through unchanged while x, y and w are projected.
    GeProjectiveMatrix3<float> keepDepth = projection;
    keepDepth._m[2] = 0.0f;
    keepDepth._m[6] = 0.0f;
    keepDepth._m[10] = 1.0f;
    keepDepth._m[14] = 0.0f;
    _worldToMap = keepDepth * worldToShadowMap;
}

void RsShadowMap::setCameraMatrix(const GeAffineMatrix3<float>& cameraToWorld) {
    _cameraToMap = _worldToMap * cameraToWorld;
}

void RsShadowMap::dump(std::ostream& os) const {
    dumpShared(os);
    os << " _halfRange: " << _halfRange;
}

}  // namespace Zr
