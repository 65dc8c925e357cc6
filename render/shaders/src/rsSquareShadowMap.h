#pragma once
// What the two square shadow maps of a light (RsShadowMap of depths, RsDeepShadowMap of
// transmittance curves) share: size * size cells of type Cell seen from the light, the light's
// view and projection, the matrix that the queries fold from the render call's camera space to
// the map, the bias, the filter's half range, and how a query point finds its cell.
//
// Copying moves: construction from, and assignment of, a non-const map take its cells over and
// leave it with none, while all other members are copied. The cells are dropped whenever the
// size changes, so that the queries answer lit until they are rendered anew.
#include <cstddef>
#include <memory>
#include <ostream>
#include <utility>

#include "geAffineMatrix3.h"
#include "geProjectiveMatrix3.h"
#include "rsShadowEvaluator.h"
#include "rsTolerance.h"

namespace Zr {

template <class Cell>
class RsSquareShadowMap : public RsShadowEvaluator {
public:
    float getSize() const { return _size; }
    // The filter's full width in map cells.
    void setRange(float range) { _halfRange = range * 0.5f; }
    // Stored as given; each map tells how it applies it.
    void setBias(float bias) { _bias = bias; }

    const GeAffineMatrix3<float>& getWorldToShadowMapMatrix() const { return _worldToShadowMap; }
    const GeProjectiveMatrix3<float>& getProjectionMatrix() const { return _projection; }

protected:
    RsSquareShadowMap() = default;
    ~RsSquareShadowMap() override = default;

    RsSquareShadowMap(RsSquareShadowMap& other) : RsShadowEvaluator(other) { takeFrom(other); }
    RsSquareShadowMap(RsSquareShadowMap&& other) : RsShadowEvaluator(other) { takeFrom(other); }
    RsSquareShadowMap& operator=(RsSquareShadowMap& other) {
        if (this != &other) takeFrom(other);
        return *this;
    }
    RsSquareShadowMap& operator=(RsSquareShadowMap&& other) { return *this = other; }

    // A size equal to the current one within float tolerance changes nothing and answers false;
    // any other drops the cells and answers true.
    bool resize(float size) {
        if (RsTolerance::isEqual(size, _size)) return false;
        _map.reset();
        _halfSize = 0.5f * size;
        _size = size;
        _intSize = static_cast<int>(size);
        return true;
    }

    // Keeps the light's view from world space and its projection, as given.
    void keepMatrices(const GeAffineMatrix3<float>& worldToShadowMap, const GeProjectiveMatrix3<float>& projection) {
        _worldToShadowMap = worldToShadowMap;
        _projection = projection;
    }

    std::size_t getCellCount() const { return static_cast<std::size_t>(_intSize) * _intSize; }

    // The row-major index of the whole cell under (u, v) in cells, or -1 off the map's whole
    // cells. Written as the negation of "inside" so that a coordinate that is not a number also
    // counts as off the map.
    int cellIndex(float u, float v) const {
        const float extent = static_cast<float>(_intSize);
        if (!(u >= 0.0f && u < extent && v >= 0.0f && v < extent)) return -1;
        return static_cast<int>(v) * _intSize + static_cast<int>(u);
    }

    // The cells' address, the four matrices, the sizes and the bias: how the maps' dumps begin.
    void dumpShared(std::ostream& os) const {
        os << " _map: " << static_cast<const void*>(_map.get()) << " _cameraToMap:";
        _cameraToMap.dump(os);
        os << " _worldToMap:";
        _worldToMap.dump(os);
        os << " _worldToShadowMap:";
        _worldToShadowMap.dump(os);
        os << " _projection:";
        _projection.dump(os);
        os << " _size: " << _size << " _halfSize: " << _halfSize << " _intSize: " << _intSize << " _bias: " << _bias;
    }

    std::unique_ptr<Cell[]> _map;
    GeProjectiveMatrix3<float> _cameraToMap;
    GeProjectiveMatrix3<float> _worldToMap;
    float _halfSize = 0.0f;
    int _intSize = 0;
    // Set by the light before any query; zero until then.
    float _bias = 0.0f;
    float _halfRange = 0.0f;

private:
    void takeFrom(RsSquareShadowMap& other) {
        _map = std::move(other._map);
        _cameraToMap = other._cameraToMap;
        _worldToMap = other._worldToMap;
        _worldToShadowMap = other._worldToShadowMap;
        _projection = other._projection;
        _size = other._size;
        _halfSize = other._halfSize;
        _intSize = other._intSize;
        _bias = other._bias;
        _halfRange = other._halfRange;
    }

    GeAffineMatrix3<float> _worldToShadowMap;
    GeProjectiveMatrix3<float> _projection;
    float _size = 0.0f;
};

}  // namespace Zr
