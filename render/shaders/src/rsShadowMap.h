#pragma once
// A light's shadow from one square map of depths seen from the light.
//
// Each cell holds the light camera's view-space z of the nearest surface (the light looks down
// its negative z axis, so a nearer surface has a greater z). A point of the render call's camera
// space is lit when its own view-space z, plus the bias, is greater than the stored depth.
//
// The map is filled by a depth buffer that writes straight into getMap's doubles, through the
// world-to-light matrix and the projection given to setMatrices. The queries use one folded
// matrix from the renderer's camera space to the map: x and y come out projected (before the
// division by w), z is the plain view-space z, since the projection's depth row is dropped.
// Order of set-up: setSize, then setMatrices, then setCameraMatrix, which folds the matrices.
//
// computeFastShadow tests the one cell under the point. computeBestShadow is a percentage-closer
// filter over a square of side twice the half range, each cell counting with the area it shares
// with the square; the part of the square outside the map neither lights nor shades
// (rsAreaFilter.h). A size that is not whole has its whole cells only: the fraction of a cell
// beyond them counts as off the map. A map that was never asked for (null) lights everything.
//
// Copying moves the cells (rsSquareShadowMap.h).
#include <ostream>

#include "coRgbColorTyped.h"
#include "geAffineMatrix3.h"
#include "gePoint3.h"
#include "geProjectiveMatrix3.h"
#include "rsSquareShadowMap.h"

namespace Zr {

// A new map is empty, of size 0, with identity matrices. Its implicit copying and moving are
// those of RsSquareShadowMap: they take the other map's cells over, leaving it with a null map.
class RsShadowMap : public RsSquareShadowMap<double> {
public:
    // The filtered answer: 1 where all of the filter square inside the map is lit, 0 where none
    // of it is, the lit fraction by area in between; the same in all three channels.
    CoRgbColorTyped<float> computeBestShadow(const GePoint3<float>& point) const override;
    // The one cell under the point: 1 lit, 0 shadowed; lit outside the map.
    CoRgbColorTyped<float> computeFastShadow(const GePoint3<float>& point) const override;

    // The size * size depths, row-major, allocated on first use and not cleared: the depth buffer
    // writes every cell.
    double* getMap();

    // A size equal to the current one within float tolerance changes nothing; any other drops the
    // map, so that the queries answer lit until it is rendered anew.
    void setSize(float size) { resize(size); }
    // The bias (setBias) is added to the query point's depth before it is compared.

    // The light's view from world space and its projection; folds them, dropping the projection's
    // depth row. Takes effect on the queries at the next setCameraMatrix.
    void setMatrices(const GeAffineMatrix3<float>& worldToShadowMap, const GeProjectiveMatrix3<float>& projection);
    // From the render call's camera space to world space; completes the query's matrix.
    void setCameraMatrix(const GeAffineMatrix3<float>& cameraToWorld);

    void dump(std::ostream& os) const;
};

}  // namespace Zr
