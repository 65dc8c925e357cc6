#pragma once
// A light's shadow from a deep shadow map: for each map pixel, the light that gets through as a
// step function of depth, per colour channel (rsTransmittanceFunction.h), so that coloured and
// semi-transparent casters tint and thin the light behind them.
//
// The map is made by a fragment buffer that draws the casters from the light with their shadow
// shaders and resolves each pixel's fragments into a curve (RsImageCreatorFZ::createDeepShadowMap).
// Its depth is the light projection's z / w remapped from -1..1 to 0..1, the fragment buffer's
// pixel depth, which grows away from the light: a point is shaded by what has a smaller depth.
// The bias moves the query point towards the light along the light's z axis before projection;
// its exact effect on the projected z and w is folded once by setMatrices into _biasZ and _biasW.
// Order of set-up: setSize, setBias, setRange, setMatrices, setCameraMatrix, allocateMap.
//
// The queries are those of RsShadowMap with a transmittance in place of the lit test: the single
// cell under the point, or the area-weighted filter square (rsAreaFilter.h).
//
// Copying moves the curves, with the storage of their elements (rsSquareShadowMap.h).
#include <memory>
#include <ostream>
#include <vector>

#include "coRgbColorTyped.h"
#include "geAffineMatrix3.h"
#include "gePoint3.h"
#include "geProjectiveMatrix3.h"
#include "rsSquareShadowMap.h"
#include "rsTransmittanceFunction.h"

namespace Zr {

class RsDeepShadowMap : public RsSquareShadowMap<RsTransmittanceFunction> {
public:
    using Element = RsTransmittanceFunction::Element;

    // No curves, size 0, identity matrices, no bias.
    RsDeepShadowMap();
    ~RsDeepShadowMap() override;

    RsDeepShadowMap(RsDeepShadowMap& other);
    RsDeepShadowMap(RsDeepShadowMap&& other);
    RsDeepShadowMap& operator=(RsDeepShadowMap& other);
    RsDeepShadowMap& operator=(RsDeepShadowMap&& other);

    // The filtered transmittance at the point: lit (1) where nothing is in front of it.
    CoRgbColorTyped<float> computeBestShadow(const GePoint3<float>& point) const override;
    // The transmittance of the one cell under the point; lit off the map.
    CoRgbColorTyped<float> computeFastShadow(const GePoint3<float>& point) const override;

    // Makes the curves size x size empty ones (everything lit); the memory of a former map of the
    // same size is used again.
    void allocateMap();
    // The curves, row-major; null before allocateMap.
    RsTransmittanceFunction* getMap() { return _map.get(); }
    const RsTransmittanceFunction* getMap() const { return _map.get(); }
    // Gives the function at index the curve of count elements, nearest first, copied into the
    // map's own storage.
    void setFunction(int index, const Element* elements, int count);

    // A size equal to the current one within float tolerance changes nothing; any other drops
    // the curves.
    void setSize(float size);
    // The bias (setBias) is in the light's view-space units, towards the light; folded by the
    // next setMatrices.
    void setMatrices(const GeAffineMatrix3<float>& worldToShadowMap, const GeProjectiveMatrix3<float>& projection);
    void setCameraMatrix(const GeAffineMatrix3<float>& cameraToWorld);

    void dump(std::ostream& os) const;

private:
    // Takes the other map's blocks over, leaving it with none, and copies the folded bias.
    void takeBlocksFrom(RsDeepShadowMap& other);
    void dropBlocks();
    // Makes _block a block with room for count elements after the current one.
    void nextBlock(int count);

    float _biasZ = 0.0f;
    float _biasW = 0.0f;
    // The elements of all curves, in blocks that never move. Blocks before _block are full,
    // _block is filled up to _blockUsed, and later ones are kept from a former rendering of a map
    // of this size, for the next one to fill again.
    struct Block {
        std::unique_ptr<Element[]> elements;
        int capacity;
    };
    std::vector<Block> _blocks;
    std::size_t _block = 0;
    int _blockUsed = 0;
};

}  // namespace Zr
