#include "rsDeepShadowMap.h"

#include <algorithm>
#include <cstddef>
#include <utility>

#include "rsAreaFilter.h"

namespace Zr {

namespace {

using Rgb = CoRgbColorTyped<float>;

const Rgb kLit(1.0f, 1.0f, 1.0f);

// Elements per block of curve storage: a map's curves take few blocks.
constexpr int kBlockElements = 1 << 16;

// Where a query point falls in the map: u and v in cells, and its depth.
struct MapPosition {
    float u;
    float v;
    float depth;
};

inline MapPosition toMap(const GeProjectiveMatrix3<float>& matrix, float halfSize, float biasZ, float biasW,
                         const GePoint3<float>& p) {
    const float* m = matrix._m;
    const float w = m[3] * p.x + m[7] * p.y + m[11] * p.z + m[15];
    const float k = 1.0f / w;
    MapPosition q;
    q.u = (m[0] * p.x + m[4] * p.y + m[8] * p.z + m[12]) * k * halfSize + halfSize;
    q.v = (m[1] * p.x + m[5] * p.y + m[9] * p.z + m[13]) * k * halfSize + halfSize;
    q.depth = (m[2] * p.x + m[6] * p.y + m[10] * p.z + m[14] + biasZ) / (biasW + w);
    return q;
}

}  // namespace

RsDeepShadowMap::RsDeepShadowMap() = default;

RsDeepShadowMap::~RsDeepShadowMap() = default;

RsDeepShadowMap::RsDeepShadowMap(RsDeepShadowMap& other) : RsSquareShadowMap(other) { takeBlocksFrom(other); }

RsDeepShadowMap::RsDeepShadowMap(RsDeepShadowMap&& other) : RsSquareShadowMap(other) { takeBlocksFrom(other); }

RsDeepShadowMap& RsDeepShadowMap::operator=(RsDeepShadowMap& other) {
    if (this != &other) {
        RsSquareShadowMap::operator=(other);
        takeBlocksFrom(other);
    }
    return *this;
}

RsDeepShadowMap& RsDeepShadowMap::operator=(RsDeepShadowMap&& other) { return *this = other; }

void RsDeepShadowMap::takeBlocksFrom(RsDeepShadowMap& other) {
    // The blocks move with the curves that point into them.
    _blocks = std::move(other._blocks);
    _block = other._block;
    _blockUsed = other._blockUsed;
    other._blocks.clear();
    other._block = 0;
    other._blockUsed = 0;
    _biasZ = other._biasZ;
    _biasW = other._biasW;
}

CoRgbColorTyped<float> RsDeepShadowMap::computeFastShadow(const GePoint3<float>& point) const {
    if (!_map) return kLit;
    const MapPosition q = toMap(_cameraToMap, _halfSize, _biasZ, _biasW, point);
    const int index = cellIndex(q.u, q.v);
    if (index < 0) return kLit;
    return _map[index].getTransmittance(q.depth);
}

CoRgbColorTyped<float> RsDeepShadowMap::computeBestShadow(const GePoint3<float>& point) const {
    if (!_map) return kLit;
    const MapPosition q = toMap(_cameraToMap, _halfSize, _biasZ, _biasW, point);
    const float depth = q.depth;
    const RsTransmittanceFunction* cells = _map.get();
    return rsAreaFilter(q.u, q.v, _halfRange, _intSize, kLit,
                        [depth, cells](int index) { return cells[index].getTransmittance(depth); });
}

void RsDeepShadowMap::dropBlocks() {
    _blocks.clear();
    _block = 0;
    _blockUsed = 0;
}

void RsDeepShadowMap::allocateMap() {
    const std::size_t cells = getCellCount();
    // A map is dropped whenever its size changes, so one that is there has this size.
    if (_map) std::fill_n(_map.get(), cells, RsTransmittanceFunction());
    else _map = std::make_unique<RsTransmittanceFunction[]>(cells);
    _block = 0;
    _blockUsed = 0;
}

void RsDeepShadowMap::nextBlock(int count) {
    const std::size_t next = _blocks.empty() ? 0 : _block + 1;
    if (next == _blocks.size() || _blocks[next].capacity < count) {
        // A curve longer than a block gets a block of its own length.
        const int capacity = std::max(count, kBlockElements);
        _blocks.insert(_blocks.begin() + static_cast<std::ptrdiff_t>(next),
                       Block{std::make_unique_for_overwrite<Element[]>(static_cast<std::size_t>(capacity)), capacity});
    }
    _block = next;
    _blockUsed = 0;
}

void RsDeepShadowMap::setFunction(int index, const Element* elements, int count) {
    if (count == 0) {
        _map[index].setFunction(nullptr, 0);
        return;
    }
    if (_blocks.empty() || count > _blocks[_block].capacity - _blockUsed) nextBlock(count);
    Element* const stored = _blocks[_block].elements.get() + _blockUsed;
    std::copy_n(elements, count, stored);
    _blockUsed += count;
    _map[index].setFunction(stored, count);
}

void RsDeepShadowMap::setSize(float size) {
    if (resize(size)) dropBlocks();
}

void RsDeepShadowMap::setMatrices(const GeAffineMatrix3<float>& worldToShadowMap,
                                  const GeProjectiveMatrix3<float>& projection) {
    keepMatrices(worldToShadowMap, projection);
    // z' = 0.5 z + 0.5 w: the projected depth from -1..1 to 0..1 once divided by w.
    GeProjectiveMatrix3<float> remap;
    remap._m[10] = 0.5f;
    remap._m[14] = 0.5f;
    _worldToMap = remap * projection * GeProjectiveMatrix3<float>(worldToShadowMap);
    // Moving the point by the bias along the light's z axis adds the bias times the projection's
    // z column to its projected z and w.
    const float* p = projection._m;
    _biasW = _bias * p[11];
    _biasZ = 0.5f * _bias * (p[10] + p[11]);
}

void RsDeepShadowMap::setCameraMatrix(const GeAffineMatrix3<float>& cameraToWorld) {
    _cameraToMap = _worldToMap * GeProjectiveMatrix3<float>(cameraToWorld);
}

void RsDeepShadowMap::dump(std::ostream& os) const {
    dumpShared(os);
    os << " _biasZ: " << _biasZ << " _biasW: " << _biasW << " _halfRange: " << _halfRange
       << " _blocks: " << _blocks.size();
}

}  // namespace Zr
