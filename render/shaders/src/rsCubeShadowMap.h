#pragma once
// The shadow of a light that shines in all directions: six square depth maps (RsShadowMap)
// around a centre, one per axis direction; rsCubeMap.h tells how a face is chosen and placed.
#include "rsCubeShadowEvaluator.h"
#include "rsShadowMap.h"

namespace Zr {

// A new cube map has six empty faces, the identity camera matrix and the centre at the origin. Its
// implicit copying moves each face's map (as the face's copying does); every other member is
// copied.
class RsCubeShadowMap : public RsCubeShadowEvaluator<RsShadowMap> {
public:
    // The face's depths, allocated on first use.
    double* getMap(CubeFace face) { return _faces[face].getMap(); }
};

}  // namespace Zr
